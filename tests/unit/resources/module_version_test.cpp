// The version resource of the Windows module: the about box and the system's file properties read
// it, and it must agree with the version the module reports to hosts.
#include <gtest/gtest.h>

#include <string>

#include "resources/effect_pipl.h"
#include "tests/support/module_version.h"
#include "tests/unit/resources/module_path.h"

namespace vt {
namespace {

constexpr char kProductVersionPath[] = "\\StringFileInfo\\040904b0\\ProductVersion";

TEST(ModuleVersion, ProductVersionStringIsTheReleaseNumber) {
    std::string text;
    ASSERT_TRUE(test::ReadModuleVersionString(test::BuiltModulePath(), kProductVersionPath, &text));
    EXPECT_EQ(text, "3.0.10");
    ASSERT_TRUE(test::ReadModuleVersionString(test::BuiltModulePath(), "\\StringFileInfo\\040904b0\\FileVersion", &text));
    EXPECT_EQ(text, "3.0.10.292");
}

TEST(ModuleVersion, FixedFieldsAgreeWithTheEffectVersionWord) {
    test::ModuleFixedVersion version;
    ASSERT_TRUE(test::ReadModuleFixedVersion(test::BuiltModulePath(), &version));
    EXPECT_EQ(version.fileVersionMs, (3u << 16) | 0u);
    EXPECT_EQ(version.fileVersionLs, (10u << 16) | 292u);
    EXPECT_EQ(version.productVersionMs, version.fileVersionMs);
    EXPECT_EQ(version.productVersionLs, version.fileVersionLs);
    EXPECT_EQ(version.fileFlags, 0u) << "a release build is not marked pre-release";
    EXPECT_EQ(version.fileType, 2u) << "a DLL";
    EXPECT_EQ(PF_Version(version.fileVersionMs >> 16, version.fileVersionMs & 0xFFFF, version.fileVersionLs >> 16,
                         PF_Stage_RELEASE, version.fileVersionLs & 0xFFFF),
              kEffectVersion);
}

}  // namespace
}  // namespace vt
