// Messages for the user (modal boxes) and diagnostics for the developer (debugger output).
// Every subsystem reports through these two; the backend decides where they go.
#pragma once

#include <cstdarg>

namespace vt {

// Kinds of ShowMessage: each selects the icon of the box.
enum MessageKind : int { kMessagePlain = 0, kMessageWarning = 1, kMessageError = 2, kMessageInfo = 3 };

// A modal message box without owner window and without a caption of its own.
void ShowMessage(const char* text, int kind);

// Sends one line to the debugger output, as it is.
void DebugOutput(const char* text);

// Formats "tag: ( ) message" (message at most 255 characters) and sends it to the debugger output.
void DebugLog(const char* tag, const char* format, ...)
#if defined(__GNUC__)
    __attribute__((format(printf, 2, 3)))
#endif
    ;

}  // namespace vt

namespace vt {

// The window in front when a command arrives; the about box is owned by it.
void* GetForegroundWindowHandle();

// Runs the about box modally, owned by owner (may be null).
void ShowAboutDialog(void* owner);

}  // namespace vt
