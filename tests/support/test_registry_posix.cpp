// The POSIX registry is a registry-export file named by VELATONE_REGISTRY: write one per test.
#include "tests/support/test_registry.h"

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>

namespace vt::test {

namespace {

std::string Escape(const std::string& text) {
    std::string out;
    for (char c : text) {
        if (c == '\\' || c == '"') out.push_back('\\');
        out.push_back(c);
    }
    return out;
}

std::string HexBytes(const std::vector<uint8_t>& bytes) {
    std::string out;
    char item[4];
    for (size_t i = 0; i < bytes.size(); ++i) {
        std::snprintf(item, sizeof item, "%02x", bytes[i]);
        if (i) out.push_back(',');
        out += item;
    }
    return out;
}

}  // namespace

TestRegistry::TestRegistry() {
    char pattern[] = "/tmp/vt-registry-XXXXXX";
    const int fd = mkstemp(pattern);
    if (fd >= 0) close(fd);
    m_path = pattern;
    setenv("VELATONE_REGISTRY", m_path.c_str(), 1);
    Apply();
}

TestRegistry::~TestRegistry() {
    std::remove(m_path.c_str());
    unsetenv("VELATONE_REGISTRY");
}

void TestRegistry::SetDword(const std::string& key, const std::string& name, uint32_t value, bool machine) {
    m_values.push_back({machine, key, name, 4,
                        {uint8_t(value), uint8_t(value >> 8), uint8_t(value >> 16), uint8_t(value >> 24)}, false});
}

void TestRegistry::SetString(const std::string& key, const std::string& name, const std::string& value, bool machine) {
    std::vector<uint8_t> bytes(value.begin(), value.end());
    bytes.push_back(0);
    m_values.push_back({machine, key, name, 1, bytes, false});
}

void TestRegistry::SetRaw(const std::string& key, const std::string& name, uint32_t type,
                          const std::vector<uint8_t>& bytes, bool machine) {
    m_values.push_back({machine, key, name, type, bytes, false});
}

void TestRegistry::AddKey(const std::string& key, bool machine) { m_values.push_back({machine, key, "", 0, {}, true}); }

bool TestRegistry::SetRawFileText(const std::string& text) {
    m_rawText = text;
    m_haveRawText = true;
    return true;
}

void TestRegistry::Apply() {
    std::ofstream out(m_path, std::ios::binary | std::ios::trunc);
    if (m_haveRawText) {
        out << m_rawText;
        return;
    }
    out << "Windows Registry Editor Version 5.00\r\n";
    std::map<std::string, std::vector<const Value*>> byKey;
    for (const Value& value : m_values) {
        byKey[(value.machine ? "HKEY_LOCAL_MACHINE\\" : "HKEY_CURRENT_USER\\") + value.key].push_back(&value);
    }
    for (const auto& [key, values] : byKey) {
        out << "\r\n[" << key << "]\r\n";
        for (const Value* value : values) {
            if (value->keyOnly) continue;
            out << '"' << Escape(value->name) << "\"=";
            if (value->type == 4 && value->bytes.size() == 4) {
                char text[16];
                const uint32_t number = value->bytes[0] | value->bytes[1] << 8 | value->bytes[2] << 16 |
                                        uint32_t(value->bytes[3]) << 24;
                std::snprintf(text, sizeof text, "dword:%08x", number);
                out << text;
            } else if (value->type == 3) {
                out << "hex:" << HexBytes(value->bytes);
            } else {
                char prefix[16];
                std::snprintf(prefix, sizeof prefix, "hex(%x):", value->type);
                out << prefix << HexBytes(value->bytes);
            }
            out << "\r\n";
        }
    }
}

}  // namespace vt::test
