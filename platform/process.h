// Facts about the process the module was loaded into.
#pragma once

#include <cstddef>

namespace vt {

// Copies the process command line into buffer (at most capacity - 1 characters, always terminated).
void GetProcessCommandLine(char* buffer, size_t capacity);

// Copies the path of the process's executable into buffer (always terminated).
void GetProcessExecutablePath(char* buffer, size_t capacity);

// Copies the path of the module file itself (the effect) into buffer (always terminated).
void GetModuleFilePath(char* buffer, size_t capacity);

}  // namespace vt

namespace vt {

// Copies the user's temporary-files folder (in its long form) into buffer; empty when the system
// names none.
void GetTempFolder(char* buffer, size_t capacity);

}  // namespace vt
