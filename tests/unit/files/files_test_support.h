// Shared by the file reader tests: test data, scratch files, and records to read into.
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <string>
#include <vector>

#include "engine/correction_settings.h"
#include "files/preferences.h"

namespace vt::test {

inline std::string DataPath(const std::string& relative) {
    const char* root = std::getenv("VT_TEST_DATA");
    return std::string(root ? root : VT_TEST_DATA_DIR) + "/" + relative;
}

inline std::vector<uint8_t> ReadBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    EXPECT_TRUE(in.good()) << path;
    return std::vector<uint8_t>(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

inline std::vector<uint8_t> DataBytes(const std::string& relative) { return ReadBytes(DataPath(relative)); }

inline std::vector<uint8_t> TextBytes(const std::string& text) { return std::vector<uint8_t>(text.begin(), text.end()); }

// A folder of its own for each test, removed afterwards.
class ScratchFolder {
public:
    ScratchFolder() {
        const auto* info = ::testing::UnitTest::GetInstance()->current_test_info();
        m_path = std::filesystem::temp_directory_path() /
                 ("vt_files_" + std::string(info->test_suite_name()) + "_" + info->name());
        std::filesystem::remove_all(m_path);
        std::filesystem::create_directories(m_path);
    }
    ~ScratchFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(m_path, ignored);
    }
    std::string Path(const std::string& name) const { return (m_path / name).string(); }
    std::string Write(const std::string& name, const std::vector<uint8_t>& bytes) const {
        const std::string path = Path(name);
        std::ofstream out(path, std::ios::binary);
        out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
        return path;
    }

private:
    std::filesystem::path m_path;
};

inline Preferences TestPreferences() {
    Preferences prefs{};
    prefs.videoSystem = 2;
    prefs.limiterDefault = 0;
    prefs.videoWhiteLevel = 255;
    prefs.videoMaxLevel = 255;
    return prefs;
}

// A full reset record on the heap (records are 33 KB).
inline std::unique_ptr<CorrectionSettings> ResetRecord() {
    auto settings = std::make_unique<CorrectionSettings>();
    std::memset(settings.get(), 0, sizeof(CorrectionSettings));
    ResetSettings(settings.get(), kMaskAll, TestPreferences());
    return settings;
}

inline bool SameBytes(const void* a, const void* b, size_t size) { return std::memcmp(a, b, size) == 0; }

}  // namespace vt::test
