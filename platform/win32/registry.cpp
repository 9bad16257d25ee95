// Registry reads through the system registry. Keys are opened for reading only; the one key the
// module creates when missing is its preferences key, which it still only reads.
#include "platform/registry.h"

#include <cstdio>

#include <windows.h>

#include <cstring>
#include <memory>
#include <new>

namespace vt {

struct RegistryKey {
    HKEY handle;
};

namespace {

static_assert(kRegistryReadAccess == KEY_READ);
static_assert(static_cast<uint32_t>(RegistryType::kString) == REG_SZ &&
              static_cast<uint32_t>(RegistryType::kBinary) == REG_BINARY &&
              static_cast<uint32_t>(RegistryType::kDword) == REG_DWORD);

HKEY RootKey(RegistryRoot root) { return root == RegistryRoot::kLocalMachine ? HKEY_LOCAL_MACHINE : HKEY_CURRENT_USER; }

RegistryKey* Wrap(HKEY handle) {
    auto* key = new (std::nothrow) RegistryKey{handle};
    if (!key) RegCloseKey(handle);
    return key;
}

}  // namespace

RegistryKey* OpenRegistryKey(RegistryRoot root, const char* path, uint32_t access) {
    HKEY handle = nullptr;
    if (RegOpenKeyExA(RootKey(root), path ? path : "", 0, access, &handle) != ERROR_SUCCESS) return nullptr;
    return Wrap(handle);
}

RegistryKey* CreateRegistryKey(RegistryRoot root, const char* path) {
    HKEY handle = nullptr;
    if (RegCreateKeyExA(RootKey(root), path ? path : "", 0, nullptr, REG_OPTION_NON_VOLATILE, kRegistryReadAccess,
                        nullptr, &handle, nullptr) != ERROR_SUCCESS) {
        return nullptr;
    }
    return Wrap(handle);
}

void CloseRegistryKey(RegistryKey* key) {
    if (!key) return;
    RegCloseKey(key->handle);
    delete key;
}

RegistryResult QueryRegistryValue(RegistryKey* key, const char* name, void* buffer, uint32_t capacity,
                                  uint32_t* size, RegistryType* type) {
    if (!key || !name) return RegistryResult::kMissing;
    // The system may write into the buffer before it finds that the value does not fit, so the value
    // is read into scratch space and copied only when it is whole.
    unsigned char local[1024];
    std::unique_ptr<unsigned char[]> heap;
    unsigned char* scratch = local;
    if (capacity > sizeof local) {
        heap.reset(new (std::nothrow) unsigned char[capacity]);
        if (!heap) return RegistryResult::kMissing;
        scratch = heap.get();
    }
    DWORD valueType = REG_NONE;
    DWORD valueSize = capacity;
    const LSTATUS status = RegQueryValueExA(key->handle, name, nullptr, &valueType, scratch, &valueSize);
    if (status == ERROR_MORE_DATA) return RegistryResult::kTooLarge;
    if (status != ERROR_SUCCESS || valueSize > capacity) return RegistryResult::kMissing;
    if (valueSize > 0) std::memcpy(buffer, scratch, valueSize);
    if (size) *size = valueSize;
    if (type) *type = static_cast<RegistryType>(valueType);
    return RegistryResult::kOk;
}

void DescribeRegistryLocation(char* buffer, size_t capacity) {
    if (capacity == 0) return;
    std::snprintf(buffer, capacity, "%s", "the Windows registry");
}

}  // namespace vt
