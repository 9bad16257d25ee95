// Registry contents for a test: values are gathered, then written where the platform's registry
// reads them (a registry-export file on POSIX, the real registry on Windows), and removed again
// when the object goes away.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace vt::test {

class TestRegistry {
public:
    TestRegistry();
    ~TestRegistry();
    TestRegistry(const TestRegistry&) = delete;
    TestRegistry& operator=(const TestRegistry&) = delete;

    // Values go under HKEY_CURRENT_USER\<key>, or HKEY_LOCAL_MACHINE\<key> with machine = true.
    void SetDword(const std::string& key, const std::string& name, uint32_t value, bool machine = false);
    void SetString(const std::string& key, const std::string& name, const std::string& value, bool machine = false);
    // Raw bytes with a registry type (1 text, 3 binary, 4 dword): lets a test store a text without
    // its terminating zero, or a value of the wrong size.
    void SetRaw(const std::string& key, const std::string& name, uint32_t type, const std::vector<uint8_t>& bytes,
                bool machine = false);
    // A key that exists with no values.
    void AddKey(const std::string& key, bool machine = false);

    // Writes everything set so far, replacing what an earlier Apply wrote.
    void Apply();

    // The raw text of the registry file, for malformed-file tests; Apply writes it as is. Returns
    // false where the registry is not a file (Windows): the test has nothing to exercise there.
    bool SetRawFileText(const std::string& text);

private:
    struct Value {
        bool machine;
        std::string key;
        std::string name;
        uint32_t type;
        std::vector<uint8_t> bytes;
        bool keyOnly;
    };
    std::vector<Value> m_values;
    std::string m_rawText;
    bool m_haveRawText = false;
    std::string m_path;
};

}  // namespace vt::test
