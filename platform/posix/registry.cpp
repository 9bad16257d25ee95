// Registry reads from the registry-export file named by VELATONE_REGISTRY, else
// $XDG_CONFIG_HOME/velatone/registry.reg (or ~/.config/velatone/registry.reg). The file is read
// again at each key opening, so a changed file is seen at the next preferences reload.
#include "platform/registry.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "platform/posix/reg_file.h"
#include "platform/ui.h"

namespace vt {

struct RegistryKey {
    std::vector<posix::RegValue> values;
};

namespace {

std::string RegistryFilePath() {
    if (const char* path = std::getenv("VELATONE_REGISTRY"); path && *path) return path;
    if (const char* config = std::getenv("XDG_CONFIG_HOME"); config && *config) {
        return std::string(config) + "/velatone/registry.reg";
    }
    if (const char* home = std::getenv("HOME"); home && *home) return std::string(home) + "/.config/velatone/registry.reg";
    return {};
}

// Reads and parses the file; a missing file is an empty registry.
std::vector<posix::RegKey> LoadRegistry() {
    const std::string path = RegistryFilePath();
    if (path.empty()) return {};
    FILE* file = std::fopen(path.c_str(), "rb");
    if (!file) return {};
    std::vector<uint8_t> bytes;
    uint8_t chunk[65536];
    size_t got = 0;
    // Preference files are small; anything beyond a few megabytes is not a registry export.
    constexpr size_t kMaxRegistryFile = 16u << 20;
    while ((got = std::fread(chunk, 1, sizeof chunk, file)) > 0 && bytes.size() < kMaxRegistryFile) {
        bytes.insert(bytes.end(), chunk, chunk + got);
    }
    std::fclose(file);
    const std::string text = posix::DecodeRegFileBytes(bytes);
    return posix::ParseRegFile(text, [&](int line, const char* reason) {
        DebugLog("Registry", "%s line %d skipped: %s", path.c_str(), line, reason);
    });
}

RegistryKey* FindKey(RegistryRoot root, const char* path) {
    const std::string wanted = posix::RegKeyPath(root, path ? path : "");
    for (posix::RegKey& key : LoadRegistry()) {
        if (key.path == wanted) return new RegistryKey{std::move(key.values)};
    }
    return nullptr;
}

bool SameNameIgnoringCase(const std::string& a, const char* b) {
    const size_t length = std::strlen(b);
    if (a.size() != length) return false;
    for (size_t i = 0; i < length; ++i) {
        auto lower = [](char c) { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c; };
        if (lower(a[i]) != lower(b[i])) return false;
    }
    return true;
}

}  // namespace

void DescribeRegistryLocation(char* buffer, size_t capacity) {
    if (capacity == 0) return;
    std::snprintf(buffer, capacity, "%s", RegistryFilePath().c_str());
}

RegistryKey* OpenRegistryKey(RegistryRoot root, const char* path, uint32_t /*access*/) { return FindKey(root, path); }

RegistryKey* CreateRegistryKey(RegistryRoot root, const char* path) {
    // The file is never written: a missing key reads as an empty one.
    RegistryKey* key = FindKey(root, path);
    return key ? key : new RegistryKey{};
}

void CloseRegistryKey(RegistryKey* key) { delete key; }

RegistryResult QueryRegistryValue(RegistryKey* key, const char* name, void* buffer, uint32_t capacity,
                                  uint32_t* size, RegistryType* type) {
    if (!key || !name) return RegistryResult::kMissing;
    for (const posix::RegValue& value : key->values) {
        if (!SameNameIgnoringCase(value.name, name)) continue;
        if (value.data.size() > capacity) return RegistryResult::kTooLarge;
        if (!value.data.empty()) std::memcpy(buffer, value.data.data(), value.data.size());
        if (size) *size = static_cast<uint32_t>(value.data.size());
        if (type) *type = value.type;
        return RegistryResult::kOk;
    }
    return RegistryResult::kMissing;
}

}  // namespace vt
