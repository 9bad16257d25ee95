// Read-only access to the registry values the module consults (preferences, the colour-space
// setting of one host family, the full-interface application's installation folder).
#pragma once

#include <cstddef>
#include <cstdint>

namespace vt {

enum class RegistryRoot : uint8_t { kCurrentUser, kLocalMachine };

// Registry value types, with the Windows numbering.
enum class RegistryType : uint32_t { kNone = 0, kString = 1, kBinary = 3, kDword = 4 };

struct RegistryKey;  // opaque

inline constexpr uint32_t kRegistryReadAccess = 0x20019;  // KEY_READ

// Opens an existing key. Returns null when it does not exist or cannot be read.
RegistryKey* OpenRegistryKey(RegistryRoot root, const char* path, uint32_t access = kRegistryReadAccess);

// Opens a key for reading, creating it when it is missing (as the preferences reader does).
RegistryKey* CreateRegistryKey(RegistryRoot root, const char* path);

void CloseRegistryKey(RegistryKey* key);

enum class RegistryResult : uint8_t { kOk, kMissing, kTooLarge };

// Copies a value into buffer (capacity bytes) and sets *size to the bytes stored and *type to its
// type. kTooLarge when the value does not fit: the buffer is then left untouched.
RegistryResult QueryRegistryValue(RegistryKey* key, const char* name, void* buffer, uint32_t capacity,
                                  uint32_t* size, RegistryType* type);

}  // namespace vt

namespace vt {

// Where the registry this build reads lives, for people: the registry-export file's path on POSIX
// (empty when no path can be formed), "the Windows registry" on Windows.
void DescribeRegistryLocation(char* buffer, size_t capacity);

}  // namespace vt
