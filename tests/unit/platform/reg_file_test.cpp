#include "platform/posix/reg_file.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

namespace vt::posix {
namespace {

const RegValue* Find(const std::vector<RegKey>& keys, const std::string& key, const std::string& name) {
    for (const RegKey& k : keys) {
        if (k.path != key) continue;
        for (const RegValue& v : k.values) {
            if (v.name == name) return &v;
        }
    }
    return nullptr;
}

constexpr char kKey[] = "hkey_current_user\\software\\orvane\\velatone 3\\plug-in\\settings";

TEST(RegFile, ReadsEveryValueForm) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n"
        "\r\n"
        "[HKEY_CURRENT_USER\\Software\\Orvane\\Velatone 3\\Plug-in\\Settings]\r\n"
        "\"Undo Depth\"=dword:0000001e\r\n"
        "\"Video System\"=\"PAL\"\r\n"
        "\"Path\"=\"c:\\\\temp \\\"x\\\"\"\r\n"
        "\"Primary LUT\"=hex:00,01,02,\\\r\n"
        "  03,ff\r\n"
        "\"Raw\"=hex(1):50,41,4c\r\n"
        "@=\"default\"\r\n";
    const std::vector<RegKey> keys = ParseRegFile(text);
    ASSERT_EQ(keys.size(), 1u);
    EXPECT_EQ(keys[0].path, kKey);

    const RegValue* depth = Find(keys, kKey, "Undo Depth");
    ASSERT_NE(depth, nullptr);
    EXPECT_EQ(depth->type, RegistryType::kDword);
    EXPECT_EQ(depth->data, (std::vector<uint8_t>{0x1e, 0, 0, 0}));

    const RegValue* system = Find(keys, kKey, "Video System");
    ASSERT_NE(system, nullptr);
    EXPECT_EQ(system->type, RegistryType::kString);
    EXPECT_EQ(system->data, (std::vector<uint8_t>{'P', 'A', 'L', 0}));

    const RegValue* path = Find(keys, kKey, "Path");
    ASSERT_NE(path, nullptr);
    EXPECT_EQ(std::string(path->data.begin(), path->data.end() - 1), "c:\\temp \"x\"");

    const RegValue* lut = Find(keys, kKey, "Primary LUT");
    ASSERT_NE(lut, nullptr);
    EXPECT_EQ(lut->type, RegistryType::kBinary);
    EXPECT_EQ(lut->data, (std::vector<uint8_t>{0, 1, 2, 3, 0xff}));

    const RegValue* raw = Find(keys, kKey, "Raw");
    ASSERT_NE(raw, nullptr);
    EXPECT_EQ(raw->type, RegistryType::kString);
    EXPECT_EQ(raw->data, (std::vector<uint8_t>{'P', 'A', 'L'}));  // no terminating zero

    EXPECT_NE(Find(keys, kKey, ""), nullptr);
}

TEST(RegFile, MalformedLinesAreSkippedAndReportedWithoutLosingOthers) {
    const std::string text =
        "Windows Registry Editor Version 5.00\n"
        "\"Orphan\"=dword:1\n"
        "[HKEY_CURRENT_USER\\A]\n"
        "\"Good 1\"=dword:00000001\n"
        "\"Bad dword\"=dword:zz\n"
        "\"Too long\"=dword:123456789\n"
        "\"Unterminated=\"x\"\n"
        "\"No equals\" dword:1\n"
        "\"Bad hex\"=hex:0g,01\n"
        "\"Bad type\"=qword:1\n"
        "garbage line\n"
        "[HKEY_CURRENT_USER\\B\n"
        "\"Good 2\"=\"two\"\n"
        "[HKEY_CURRENT_USER\\A]\n"
        "\"Good 3\"=dword:3\n";
    std::vector<std::pair<int, std::string>> skipped;
    const std::vector<RegKey> keys =
        ParseRegFile(text, [&](int line, const char* reason) { skipped.emplace_back(line, reason); });
    EXPECT_NE(Find(keys, "hkey_current_user\\a", "Good 1"), nullptr);
    EXPECT_NE(Find(keys, "hkey_current_user\\a", "Good 3"), nullptr);  // a key named twice merges
    // The value after a malformed key line has no key to go to.
    EXPECT_EQ(Find(keys, "hkey_current_user\\a", "Good 2"), nullptr);
    std::vector<int> lines;
    for (const auto& [line, reason] : skipped) lines.push_back(line);
    EXPECT_EQ(lines, (std::vector<int>{2, 5, 6, 7, 8, 9, 10, 11, 12, 13}));
}

TEST(RegFile, KeysAndNamesAreCaseInsensitiveAndRootsMayBeAbbreviated) {
    const std::vector<RegKey> keys = ParseRegFile("[HKCU\\Software\\X\\]\n\"Name\"=dword:2\n\"NAME\"=dword:5\n");
    ASSERT_EQ(keys.size(), 1u);
    EXPECT_EQ(keys[0].path, RegKeyPath(RegistryRoot::kCurrentUser, "SOFTWARE\\x"));
    ASSERT_EQ(keys[0].values.size(), 1u);  // the later value replaces the earlier one
    EXPECT_EQ(keys[0].values[0].data[0], 5);
}

TEST(RegFile, DecodesUtf16FilesAsTheRegistryEditorWritesThem) {
    const std::string ascii = "[HKEY_LOCAL_MACHINE\\K]\r\n\"V\"=dword:00000003\r\n";
    std::vector<uint8_t> bytes = {0xFF, 0xFE};
    for (char c : ascii) {
        bytes.push_back(static_cast<uint8_t>(c));
        bytes.push_back(0);
    }
    const std::vector<RegKey> keys = ParseRegFile(DecodeRegFileBytes(bytes));
    const RegValue* v = Find(keys, "hkey_local_machine\\k", "V");
    ASSERT_NE(v, nullptr);
    EXPECT_EQ(v->data[0], 3);
    EXPECT_EQ(DecodeRegFileBytes(std::vector<uint8_t>{0xEF, 0xBB, 0xBF, 'a'}), "a");
}

TEST(RegFile, TruncatedInputNeverReadsPastTheEnd) {
    const std::string full = "[HKEY_CURRENT_USER\\K]\n\"Name\"=hex:01,02,\\\n";
    for (size_t cut = 0; cut <= full.size(); ++cut) {
        const std::string part = full.substr(0, cut);
        ParseRegFile(part);  // must neither crash nor read beyond `part` (the sanitizer build checks)
    }
}

}  // namespace
}  // namespace vt::posix
