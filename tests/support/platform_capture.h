// Captures what the platform layer's message boxes and debugger output receive, for the life of
// the object, in tests that link the platform layer directly.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace vt::test {

struct CapturedMessage {
    int kind;
    std::string text;
};

// One file dialog the code under test showed.
struct CapturedDialog {
    bool save;
    std::string filter;  // description|pattern pairs
    std::string title;
};

class PlatformCapture {
public:
    PlatformCapture();
    ~PlatformCapture();
    PlatformCapture(const PlatformCapture&) = delete;
    PlatformCapture& operator=(const PlatformCapture&) = delete;

    std::vector<CapturedMessage> Messages() const;
    std::vector<std::string> DebugLines() const;
    // Presents another process identity to the module code under test.
    void SetIdentity(const std::string& commandLine, const std::string& executablePath);
    // Answers the coming file dialogs in turn: a path, or nullopt for cancel. Dialogs beyond the
    // script are cancelled.
    void ScriptFileDialogs(const std::vector<std::optional<std::string>>& answers);
    std::vector<CapturedDialog> FileDialogs() const;
};

}  // namespace vt::test
