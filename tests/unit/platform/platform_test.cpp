// The platform layer's services, as every caller sees them; the same tests run against each backend.
#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "platform/lock.h"
#include "platform/process.h"
#include "platform/registry.h"
#include "platform/ui.h"
#include "tests/support/platform_capture.h"
#include "tests/support/test_registry.h"

namespace vt {
namespace {

constexpr char kKey[] = "Software\\Velatone Tests\\Platform";

TEST(Lock, IsRecursiveAndExcludesOtherThreads) {
    CriticalSection lock{};
    ASSERT_TRUE(InitializeLock(&lock, kLockSpinCount));
    EnterLock(&lock);
    EnterLock(&lock);  // a critical section may be entered again by its owner
    std::atomic<bool> entered{false};
    std::thread other([&] {
        LockGuard guard(&lock);
        entered = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    LeaveLock(&lock);
    EXPECT_FALSE(entered.load()) << "still held once";
    LeaveLock(&lock);
    other.join();
    EXPECT_TRUE(entered.load());
    DeleteLock(&lock);
}

TEST(Registry, ReadsValuesOfEveryType) {
    test::TestRegistry registry;
    registry.SetDword(kKey, "Number", 0x1234);
    registry.SetString(kKey, "Text", "PAL");
    registry.SetRaw(kKey, "Bytes", 3, {1, 2, 3});
    registry.Apply();

    RegistryKey* key = OpenRegistryKey(RegistryRoot::kCurrentUser, kKey);
    ASSERT_NE(key, nullptr);
    uint32_t number = 0;
    uint32_t size = 0;
    RegistryType type = RegistryType::kNone;
    ASSERT_EQ(QueryRegistryValue(key, "Number", &number, sizeof number, &size, &type), RegistryResult::kOk);
    EXPECT_EQ(number, 0x1234u);
    EXPECT_EQ(size, 4u);
    EXPECT_EQ(type, RegistryType::kDword);

    char text[16] = {};
    ASSERT_EQ(QueryRegistryValue(key, "text", text, sizeof text, &size, &type), RegistryResult::kOk);
    EXPECT_STREQ(text, "PAL");
    EXPECT_EQ(size, 4u);  // with its terminating zero
    EXPECT_EQ(type, RegistryType::kString);

    uint8_t bytes[8] = {};
    ASSERT_EQ(QueryRegistryValue(key, "Bytes", bytes, sizeof bytes, &size, &type), RegistryResult::kOk);
    EXPECT_EQ(size, 3u);
    EXPECT_EQ(type, RegistryType::kBinary);
    EXPECT_EQ(bytes[2], 3);
    CloseRegistryKey(key);
}

TEST(Registry, MissingKeysValuesAndOversizedValues) {
    test::TestRegistry registry;
    registry.SetString(kKey, "Long", "0123456789");
    registry.Apply();
    EXPECT_EQ(OpenRegistryKey(RegistryRoot::kCurrentUser, "Software\\Velatone Tests\\Absent"), nullptr);
    EXPECT_EQ(OpenRegistryKey(RegistryRoot::kLocalMachine, kKey), nullptr);

    RegistryKey* key = OpenRegistryKey(RegistryRoot::kCurrentUser, kKey);
    ASSERT_NE(key, nullptr);
    char small[4] = {'a', 'b', 'c', 'd'};
    uint32_t size = 99;
    RegistryType type = RegistryType::kNone;
    EXPECT_EQ(QueryRegistryValue(key, "Long", small, sizeof small, &size, &type), RegistryResult::kTooLarge);
    EXPECT_EQ(std::string(small, 4), "abcd") << "an oversized value leaves the buffer untouched";
    EXPECT_EQ(QueryRegistryValue(key, "Absent", small, sizeof small, &size, &type), RegistryResult::kMissing);
    CloseRegistryKey(key);

    // Opening with creation gives a usable (empty) key where none exists.
    RegistryKey* created = CreateRegistryKey(RegistryRoot::kCurrentUser, "Software\\Velatone Tests\\Created");
    ASSERT_NE(created, nullptr);
    EXPECT_EQ(QueryRegistryValue(created, "Any", small, sizeof small, &size, &type), RegistryResult::kMissing);
    CloseRegistryKey(created);
}

TEST(Messages, EachKindReachesTheSinkWithItsText) {
    test::PlatformCapture capture;
    ShowMessage("careful", kMessageWarning);
    ShowMessage("broken", kMessageError);
    ShowMessage("note", kMessageInfo);
    ShowMessage("plain", 7);
    const std::vector<test::CapturedMessage> messages = capture.Messages();
    ASSERT_EQ(messages.size(), 4u);
    EXPECT_EQ(messages[0].kind, 1);
    EXPECT_EQ(messages[0].text, "careful");
    EXPECT_EQ(messages[1].kind, 2);
    EXPECT_EQ(messages[2].kind, 3);
    EXPECT_EQ(messages[3].kind, 7);
    EXPECT_EQ(messages[3].text, "plain");
}

TEST(DebugLog, FormatsTagTwoEmptyFieldsAndMessage) {
    test::PlatformCapture capture;
    DebugLog("Curves", "point %d of %s", 3, "red");
    const std::string long_text(400, 'x');
    DebugLog("Tag", "%s", long_text.c_str());
    const std::vector<std::string> lines = capture.DebugLines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0], "Curves: ( ) point 3 of red");
    EXPECT_EQ(lines[1].size(), 255u) << "a line is at most 256 bytes with its terminator";
    EXPECT_EQ(lines[1].rfind("Tag: ( ) xxx", 0), 0u);
}

TEST(Process, CommandLineAndPathsAreTerminatedWithinTheBuffer) {
    char buffer[8];
    std::memset(buffer, 'z', sizeof buffer);
    GetProcessCommandLine(buffer, sizeof buffer);
    EXPECT_LT(std::strlen(buffer), sizeof buffer);
    std::memset(buffer, 'z', sizeof buffer);
    GetProcessExecutablePath(buffer, sizeof buffer);
    EXPECT_LT(std::strlen(buffer), sizeof buffer);
    char path[512] = {};
    GetModuleFilePath(path, sizeof path);
    EXPECT_GT(std::strlen(path), 0u);
}

}  // namespace
}  // namespace vt
