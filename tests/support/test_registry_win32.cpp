// The Windows registry itself: each key a test names is saved before it is first written (its values,
// or the fact that it was missing) and put back as it was when the object goes away, so a test run
// leaves the registry as it found it. A key the test writes holds only the test's values meanwhile.
#include "tests/support/test_registry.h"

#include <windows.h>

#include <cstdio>
#include <map>
#include <mutex>
#include <string>
#include <vector>

namespace vt::test {

namespace {

struct SavedValue {
    std::wstring name;
    DWORD type;
    std::vector<BYTE> data;
};

struct SavedKey {
    bool machine;
    std::string path;
    bool existed;
    std::string createdTop;  // when it did not exist: the outermost key that writing it creates
    std::vector<SavedValue> values;
};

// Per TestRegistry object; the class keeps no Windows state of its own.
std::mutex g_savedMutex;  // guards g_saved
std::map<const TestRegistry*, std::vector<SavedKey>> g_saved;

HKEY Root(bool machine) { return machine ? HKEY_LOCAL_MACHINE : HKEY_CURRENT_USER; }

void Complain(const char* what, const std::string& path, LSTATUS status) {
    std::fprintf(stderr, "TestRegistry: %s %s failed (%ld)\n", what, path.c_str(), static_cast<long>(status));
}

bool KeyExists(bool machine, const std::string& path) {
    HKEY key = nullptr;
    if (RegOpenKeyExA(Root(machine), path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return false;
    RegCloseKey(key);
    return true;
}

std::vector<SavedValue> ReadValues(HKEY key) {
    DWORD count = 0, longestName = 0, longestData = 0;
    if (RegQueryInfoKeyW(key, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, &count, &longestName,
                         &longestData, nullptr, nullptr) != ERROR_SUCCESS) {
        return {};
    }
    std::vector<SavedValue> values;
    std::vector<wchar_t> name(longestName + 1);
    std::vector<BYTE> data(longestData + 1);
    for (DWORD i = 0; i < count; ++i) {
        DWORD nameLength = static_cast<DWORD>(name.size());
        DWORD dataSize = static_cast<DWORD>(data.size());
        DWORD type = REG_NONE;
        if (RegEnumValueW(key, i, name.data(), &nameLength, nullptr, &type, data.data(), &dataSize) != ERROR_SUCCESS) {
            continue;
        }
        values.push_back({std::wstring(name.data(), nameLength), type, std::vector<BYTE>(data.begin(), data.begin() + dataSize)});
    }
    return values;
}

void DeleteValues(HKEY key) {
    for (const SavedValue& value : ReadValues(key)) RegDeleteValueW(key, value.name.c_str());
}

SavedKey Save(bool machine, const std::string& path) {
    SavedKey saved{machine, path, false, {}, {}};
    HKEY key = nullptr;
    if (RegOpenKeyExA(Root(machine), path.c_str(), 0, KEY_READ, &key) == ERROR_SUCCESS) {
        saved.existed = true;
        saved.values = ReadValues(key);
        RegCloseKey(key);
        return saved;
    }
    // Writing creates every missing key on the way; the outermost one is what restoring removes.
    for (size_t at = path.find('\\'); ; at = path.find('\\', at + 1)) {
        const std::string prefix = path.substr(0, at);
        if (!KeyExists(machine, prefix)) {
            saved.createdTop = prefix;
            break;
        }
        if (at == std::string::npos) break;
    }
    return saved;
}

void Restore(const SavedKey& saved) {
    if (!saved.existed) {
        if (!saved.createdTop.empty()) RegDeleteTreeA(Root(saved.machine), saved.createdTop.c_str());
        return;
    }
    HKEY key = nullptr;
    const LSTATUS status = RegOpenKeyExA(Root(saved.machine), saved.path.c_str(), 0, KEY_READ | KEY_SET_VALUE, &key);
    if (status != ERROR_SUCCESS) {
        Complain("reopening", saved.path, status);
        return;
    }
    DeleteValues(key);
    for (const SavedValue& value : saved.values) {
        RegSetValueExW(key, value.name.c_str(), 0, value.type, value.data.data(), static_cast<DWORD>(value.data.size()));
    }
    RegCloseKey(key);
}

// The system adds the terminator of a text whose caller "forgot" to count it when the byte after
// the data is zero (wine does the same): a sentinel after the data keeps an unterminated text, which
// some tests need, exactly as given.
LSTATUS WriteValue(HKEY key, const std::string& name, uint32_t type, const std::vector<uint8_t>& bytes) {
    std::vector<uint8_t> data(bytes);
    data.push_back('!');
    return RegSetValueExA(key, name.c_str(), 0, type, data.data(), static_cast<DWORD>(bytes.size()));
}

void RestoreAll(const TestRegistry* owner) {
    std::vector<SavedKey> saved;
    {
        std::lock_guard<std::mutex> guard(g_savedMutex);
        auto found = g_saved.find(owner);
        if (found == g_saved.end()) return;
        saved = std::move(found->second);
        g_saved.erase(found);
    }
    for (auto it = saved.rbegin(); it != saved.rend(); ++it) Restore(*it);
}

}  // namespace

TestRegistry::TestRegistry() = default;

TestRegistry::~TestRegistry() { RestoreAll(this); }

void TestRegistry::SetDword(const std::string& key, const std::string& name, uint32_t value, bool machine) {
    m_values.push_back({machine, key, name, REG_DWORD,
                        {uint8_t(value), uint8_t(value >> 8), uint8_t(value >> 16), uint8_t(value >> 24)}, false});
}

void TestRegistry::SetString(const std::string& key, const std::string& name, const std::string& value, bool machine) {
    std::vector<uint8_t> bytes(value.begin(), value.end());
    bytes.push_back(0);
    m_values.push_back({machine, key, name, REG_SZ, bytes, false});
}

void TestRegistry::SetRaw(const std::string& key, const std::string& name, uint32_t type,
                          const std::vector<uint8_t>& bytes, bool machine) {
    m_values.push_back({machine, key, name, type, bytes, false});
}

void TestRegistry::AddKey(const std::string& key, bool machine) { m_values.push_back({machine, key, "", 0, {}, true}); }

// The real registry is not a file: there is no raw text to write.
bool TestRegistry::SetRawFileText(const std::string& /*text*/) { return false; }

void TestRegistry::Apply() {
    RestoreAll(this);
    std::vector<SavedKey> saved;
    for (const Value& value : m_values) {
        bool known = false;
        for (const SavedKey& key : saved) known = known || (key.machine == value.machine && key.path == value.key);
        if (!known) saved.push_back(Save(value.machine, value.key));
    }
    {
        std::lock_guard<std::mutex> guard(g_savedMutex);
        g_saved[this] = saved;
    }
    for (const SavedKey& key : saved) {
        HKEY handle = nullptr;
        const LSTATUS status = RegCreateKeyExA(Root(key.machine), key.path.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                                               KEY_READ | KEY_SET_VALUE, nullptr, &handle, nullptr);
        if (status != ERROR_SUCCESS) {
            Complain("creating", key.path, status);
            continue;
        }
        DeleteValues(handle);
        for (const Value& value : m_values) {
            if (value.keyOnly || value.machine != key.machine || value.key != key.path) continue;
            const LSTATUS written = WriteValue(handle, value.name, value.type, value.bytes);
            if (written != ERROR_SUCCESS) Complain(("writing \"" + value.name + "\" in").c_str(), key.path, written);
        }
        RegCloseKey(handle);
    }
}

}  // namespace vt::test
