// What only the Win32 backend has: the real registry, which the tests write and must leave as they
// found it, values of the local machine, texts stored by other programs without a terminator, and
// the temporary-files folder in its long form.
#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>

#include "platform/process.h"
#include "platform/registry.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

constexpr char kOuterKey[] = "Software\\Velatone Tests\\Win32";
constexpr char kNewKey[] = "Software\\Velatone Tests Fresh\\Nested\\Key";

bool ReadDword(RegistryRoot root, const char* path, const char* name, uint32_t* value) {
    RegistryKey* key = OpenRegistryKey(root, path);
    if (!key) return false;
    uint32_t size = 0;
    RegistryType type = RegistryType::kNone;
    const bool ok = QueryRegistryValue(key, name, value, sizeof *value, &size, &type) == RegistryResult::kOk;
    CloseRegistryKey(key);
    return ok;
}

TEST(Win32Registry, TestValuesAreUndoneAndCreatedKeysRemoved) {
    test::TestRegistry outer;
    outer.SetDword(kOuterKey, "Kept", 1);
    outer.Apply();
    {
        test::TestRegistry inner;
        inner.SetDword(kOuterKey, "Added", 2);
        inner.SetDword(kNewKey, "Deep", 3);
        inner.Apply();
        uint32_t value = 0;
        EXPECT_FALSE(ReadDword(RegistryRoot::kCurrentUser, kOuterKey, "Kept", &value))
            << "a written key holds only the test's values";
        ASSERT_TRUE(ReadDword(RegistryRoot::kCurrentUser, kNewKey, "Deep", &value));
        EXPECT_EQ(value, 3u);
    }
    uint32_t value = 0;
    ASSERT_TRUE(ReadDword(RegistryRoot::kCurrentUser, kOuterKey, "Kept", &value));
    EXPECT_EQ(value, 1u);
    EXPECT_FALSE(ReadDword(RegistryRoot::kCurrentUser, kOuterKey, "Added", &value));
    EXPECT_EQ(OpenRegistryKey(RegistryRoot::kCurrentUser, "Software\\Velatone Tests Fresh"), nullptr)
        << "every key the test created is gone, its parents too";
}

TEST(Win32Registry, LocalMachineValuesAndUnterminatedTexts) {
    test::TestRegistry registry;
    registry.SetDword(kOuterKey, "Flags", 3, /*machine=*/true);
    registry.SetRaw(kOuterKey, "Bare", 1, {'P', 'A', 'L'});
    registry.Apply();
    uint32_t flags = 0;
    ASSERT_TRUE(ReadDword(RegistryRoot::kLocalMachine, kOuterKey, "Flags", &flags));
    EXPECT_EQ(flags, 3u);
    EXPECT_FALSE(ReadDword(RegistryRoot::kCurrentUser, kOuterKey, "Flags", &flags)) << "the roots are apart";

    RegistryKey* key = OpenRegistryKey(RegistryRoot::kCurrentUser, kOuterKey);
    ASSERT_NE(key, nullptr);
    char text[8];
    std::memset(text, 'z', sizeof text);
    uint32_t size = 0;
    RegistryType type = RegistryType::kNone;
    ASSERT_EQ(QueryRegistryValue(key, "Bare", text, sizeof text, &size, &type), RegistryResult::kOk);
    EXPECT_EQ(size, 3u) << "no terminator is counted that was never stored";
    EXPECT_EQ(type, RegistryType::kString);
    EXPECT_EQ(std::string(text, 3), "PAL");
    // Exactly as large as the value: it fits.
    ASSERT_EQ(QueryRegistryValue(key, "Bare", text, 3, &size, &type), RegistryResult::kOk);
    EXPECT_EQ(QueryRegistryValue(key, "Bare", text, 2, &size, &type), RegistryResult::kTooLarge);
    CloseRegistryKey(key);
}

TEST(Win32Process, TempFolderIsAnExistingFolderInItsLongForm) {
    char folder[260];
    std::memset(folder, 'z', sizeof folder);
    GetTempFolder(folder, sizeof folder);
    ASSERT_GT(std::strlen(folder), 0u);
    EXPECT_TRUE(std::filesystem::is_directory(folder)) << folder;
    EXPECT_EQ(std::strchr(folder, '~'), nullptr) << folder;

    char tiny[4];
    std::memset(tiny, 'z', sizeof tiny);
    GetTempFolder(tiny, sizeof tiny);
    EXPECT_LT(std::strlen(tiny), sizeof tiny);
}

}  // namespace
}  // namespace vt
