#include "tests/support/module_version.h"

#include <windows.h>

#include <vector>

namespace vt::test {

namespace {

bool ReadVersionBlock(const std::string& path, std::vector<char>* block) {
    DWORD ignored = 0;
    const DWORD size = GetFileVersionInfoSizeA(path.c_str(), &ignored);
    if (size == 0) return false;
    block->assign(size, 0);
    return GetFileVersionInfoA(path.c_str(), 0, size, block->data()) != FALSE;
}

}  // namespace

bool ReadModuleVersionString(const std::string& path, const std::string& subBlock, std::string* text) {
    std::vector<char> block;
    if (!ReadVersionBlock(path, &block)) return false;
    void* value = nullptr;
    UINT length = 0;
    if (!VerQueryValueA(block.data(), subBlock.c_str(), &value, &length) || !value) return false;
    // The length counts characters, with the terminator when the resource stores one.
    const char* characters = static_cast<const char*>(value);
    while (length > 0 && characters[length - 1] == '\0') --length;
    text->assign(characters, length);
    return true;
}

bool ReadModuleFixedVersion(const std::string& path, ModuleFixedVersion* version) {
    std::vector<char> block;
    if (!ReadVersionBlock(path, &block)) return false;
    void* value = nullptr;
    UINT length = 0;
    if (!VerQueryValueA(block.data(), "\\", &value, &length) || length < sizeof(VS_FIXEDFILEINFO)) return false;
    const auto* fixed = static_cast<const VS_FIXEDFILEINFO*>(value);
    if (fixed->dwSignature != 0xFEEF04BD) return false;
    version->fileVersionMs = fixed->dwFileVersionMS;
    version->fileVersionLs = fixed->dwFileVersionLS;
    version->productVersionMs = fixed->dwProductVersionMS;
    version->productVersionLs = fixed->dwProductVersionLS;
    version->fileFlags = fixed->dwFileFlags & fixed->dwFileFlagsMask;
    version->fileType = fixed->dwFileType;
    return true;
}

}  // namespace vt::test
