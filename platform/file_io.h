// Whole-file reads and writes for the file readers and writers: the bytes in one go, or the
// system's own error code. Both backends speak Win32 error codes (POSIX maps errno onto them), so
// a caller that reports "the Win32 error code" does so the same way everywhere.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace vt {

inline constexpr uint32_t kFileErrorNone = 0;
inline constexpr uint32_t kFileErrorNotFound = 2;        // ERROR_FILE_NOT_FOUND
inline constexpr uint32_t kFileErrorPathNotFound = 3;    // ERROR_PATH_NOT_FOUND
inline constexpr uint32_t kFileErrorTooManyOpen = 4;     // ERROR_TOO_MANY_OPEN_FILES
inline constexpr uint32_t kFileErrorAccessDenied = 5;    // ERROR_ACCESS_DENIED
inline constexpr uint32_t kFileErrorOutOfMemory = 8;     // ERROR_NOT_ENOUGH_MEMORY
inline constexpr uint32_t kFileErrorWriteProtect = 19;   // ERROR_WRITE_PROTECT
inline constexpr uint32_t kFileErrorGeneral = 31;        // ERROR_GEN_FAILURE
inline constexpr uint32_t kFileErrorSharing = 32;        // ERROR_SHARING_VIOLATION
inline constexpr uint32_t kFileErrorDiskFull = 112;      // ERROR_DISK_FULL
inline constexpr uint32_t kFileErrorNameTooLong = 206;   // ERROR_FILENAME_EXCED_RANGE

enum class FileShare : uint8_t {
    kShared,     // others may read and write meanwhile
    kExclusive,  // no sharing at all while the file is read
};

// Reads at most maxBytes from the start of an existing file into *bytes. *complete (may be null)
// tells whether that was the whole file. Returns 0 or the system's error code; *bytes is empty then.
uint32_t ReadFileBytes(const char* path, size_t maxBytes, FileShare share, std::vector<uint8_t>* bytes,
                       bool* complete);

// Creates or replaces the file with size bytes. Returns 0 or the system's error code.
uint32_t WriteFileBytes(const char* path, const void* data, size_t size);

}  // namespace vt
