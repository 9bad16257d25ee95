// DebugLog's line format is shared by every backend: "tag: ( ) message", each part cut to fit.
#include "platform/ui.h"

#include <cstdio>

namespace vt {

namespace {
constexpr size_t kDebugLineSize = 256;
}  // namespace

void DebugLog(const char* tag, const char* format, ...) {
    char message[kDebugLineSize];
    va_list args;
    va_start(args, format);
    std::vsnprintf(message, sizeof message, format, args);
    va_end(args);
    char line[kDebugLineSize];
    // A longer line is cut to the buffer, as the system's own formatter would.
    if (std::snprintf(line, sizeof line, "%s: (%s %s) %s", tag ? tag : "", "", "", message) < 0) return;
    DebugOutput(line);
}

}  // namespace vt
