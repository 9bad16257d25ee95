// Captures what the platform layer's message boxes and debugger output receive, for the life of
// the object, in tests that link the platform layer directly.
#pragma once

#include <string>
#include <vector>

namespace vt::test {

struct CapturedMessage {
    int kind;
    std::string text;
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
};

}  // namespace vt::test
