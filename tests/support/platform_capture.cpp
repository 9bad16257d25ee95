#include "tests/support/platform_capture.h"

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

void OnMessage(void*, const char* text, int kind) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_messages.push_back({kind, text});
}

void OnDebug(void*, const char* line) {
    std::lock_guard<std::mutex> guard(g_mutex);
    g_debugLines.emplace_back(line);
}

void Install() {
    VtPlatformHooks hooks{};
    hooks.size = sizeof hooks;
    hooks.message = OnMessage;
    hooks.debug = OnDebug;
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
