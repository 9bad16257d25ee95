// The property list a host reads from the built module file, before it loads any code, is byte for
// byte the one the code declares: the ".pipl" section of the POSIX module, the PiPL resource of the
// Windows one.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "refhost/module_file.h"
#include "resources/effect_pipl.h"
#include "sdk/pipl.h"
#include "tests/unit/resources/module_path.h"

namespace vt {
namespace {

TEST(ModuleResources, PropertyListInTheFileIsTheDeclaredOne) {
    std::vector<uint8_t> bytes;
    std::string error;
    ASSERT_TRUE(refhost::ReadModulePropertyList(test::BuiltModulePath(), &bytes, &error)) << error;
    const std::span<const uint8_t> declared = EffectPiplBytes();
    EXPECT_EQ(bytes, std::vector<uint8_t>(declared.begin(), declared.end()));

    std::vector<PiplRecord> records;
    ASSERT_EQ(ReadPipl(bytes, records), PiplReadResult::kOk);
    const PiplRecord* entry = FindPiplProperty(records, kPiplCodeWin64X86);
    ASSERT_NE(entry, nullptr);
    std::string_view name;
    ASSERT_TRUE(PiplReadCString(*entry, name));
    EXPECT_EQ(name, "EntryPointFunc");
}

TEST(ModuleResources, MissingOrForeignFilesCarryNoPropertyList) {
    std::vector<uint8_t> bytes;
    std::string error;
    EXPECT_FALSE(refhost::ReadModulePropertyList(test::BuiltModulePath() + ".absent", &bytes, &error));
    EXPECT_FALSE(error.empty());
    EXPECT_TRUE(bytes.empty());
}

}  // namespace
}  // namespace vt
