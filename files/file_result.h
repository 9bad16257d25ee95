// The result codes of the file readers and writers, and what a caller outside the module (the
// command-line tool) gets back from the path-level entry points: the code and the module's message.
#pragma once

#include <cstdint>
#include <string>

namespace vt {

enum class [[nodiscard]] FileResult : int16_t {
    kOk = 0,
    kEndOfFile = -39,          // the end of the file came before all required data
    kCannotOpen = -43,         // the file cannot be opened (or written)
    kUnsupported = -50,        // unsupported or unusable content
    kOutOfMemory = -108,
    kCancelled = -128,         // the user cancelled a file dialog
    kNotSettingsFile = -2041,  // not a settings preset file
};

inline constexpr int32_t ResultCode(FileResult result) { return static_cast<int32_t>(result); }

struct FileOutcome {
    FileResult result = FileResult::kOk;
    int32_t code = 0;     // the operation's own result code: the FileResult, or the system's error code
    std::string message;  // what the module shows the user; empty when it shows nothing
};

}  // namespace vt
