// The version resource of a module file, read the way the system's file properties read it.
// Windows only: the POSIX module carries no version resource.
#pragma once

#include <cstdint>
#include <string>

namespace vt::test {

struct ModuleFixedVersion {
    uint32_t fileVersionMs = 0;  // major << 16 | minor
    uint32_t fileVersionLs = 0;  // bug-fix << 16 | build
    uint32_t productVersionMs = 0;
    uint32_t productVersionLs = 0;
    uint32_t fileFlags = 0;
    uint32_t fileType = 0;
};

// A string of the version resource, e.g. "\\StringFileInfo\\040904b0\\ProductVersion". False when the
// file has no version resource or the string is absent.
bool ReadModuleVersionString(const std::string& path, const std::string& subBlock, std::string* text);

// The fixed part of the version resource; false when there is none.
bool ReadModuleFixedVersion(const std::string& path, ModuleFixedVersion* version);

}  // namespace vt::test
