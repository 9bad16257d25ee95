#include "tests/support/platform_capture.h"

#include <deque>
#include <mutex>

#include "platform/host_hooks.h"

extern "C" void VelatoneInstallPlatformHooks(const VtPlatformHooks* hooks);

namespace vt::test {

namespace {

std::mutex g_mutex;  // guards the records below
std::vector<CapturedMessage> g_messages;
std::vector<std::string> g_debugLines;
std::string g_commandLine;
std::string g_executablePath;
bool g_haveIdentity = false;
std::deque<std::optional<std::string>> g_dialogAnswers;
std::string g_lastAnswer;  // the answer handed out last; kept until the next dialog
std::vector<CapturedDialog> g_dialogs;

void OnMessage(void*, const char* text, int kind) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_messages.push_back({kind, text});
}

void OnDebug(void*, const char* line) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_debugLines.emplace_back(line);
}

const char* OnFileDialog(void*, int save, const char* filter, const char* title) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_dialogs.push_back({save != 0, filter ? filter : "", title ? title : ""});
    if (g_dialogAnswers.empty()) return nullptr;
    const std::optional<std::string> answer = g_dialogAnswers.front();
    g_dialogAnswers.pop_front();
    if (!answer) return nullptr;
    g_lastAnswer = *answer;
    return g_lastAnswer.c_str();
}

void Install() {
    VtPlatformHooks hooks{};
    hooks.size = sizeof hooks;
    hooks.message = OnMessage;
    hooks.debug = OnDebug;
    hooks.fileDialog = OnFileDialog;
    if (g_haveIdentity) {
        hooks.commandLine = g_commandLine.c_str();
        hooks.executablePath = g_executablePath.c_str();
    }
    VelatoneInstallPlatformHooks(&hooks);
}

}  // namespace

PlatformCapture::PlatformCapture() {
    {
        std::lock_guard<std::mutex> guard(g_mutex);
        g_messages.clear();
        g_debugLines.clear();
        g_haveIdentity = false;
        g_dialogAnswers.clear();
        g_dialogs.clear();
    }
    Install();
}

PlatformCapture::~PlatformCapture() { VelatoneInstallPlatformHooks(nullptr); }

std::vector<CapturedMessage> PlatformCapture::Messages() const {
    std::lock_guard<std::mutex> guard(g_mutex);
    return g_messages;
}

std::vector<std::string> PlatformCapture::DebugLines() const {
    std::lock_guard<std::mutex> guard(g_mutex);
    return g_debugLines;
}

void PlatformCapture::SetIdentity(const std::string& commandLine, const std::string& executablePath) {
    g_commandLine = commandLine;
    g_executablePath = executablePath;
    g_haveIdentity = true;
    Install();
}

}  // namespace vt::test

namespace vt::test {

void PlatformCapture::ScriptFileDialogs(const std::vector<std::optional<std::string>>& answers) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_dialogAnswers.assign(answers.begin(), answers.end());
}

std::vector<CapturedDialog> PlatformCapture::FileDialogs() const {
    std::lock_guard<std::mutex> guard(g_mutex);
    return g_dialogs;
}

}  // namespace vt::test
