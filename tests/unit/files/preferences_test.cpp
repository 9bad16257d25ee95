#include "files/preferences.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "tests/support/test_registry.h"

namespace vt {
namespace {

Preferences Read() {
    Preferences prefs;
    std::memset(&prefs, 0x5A, sizeof prefs);  // nothing may survive from before the read
    ReadPreferences(&prefs);
    return prefs;
}

TEST(Preferences, EmptyKeyGivesEveryDefault) {
    test::TestRegistry registry;
    const Preferences p = Read();
    EXPECT_EQ(p.toolTipsEnable, 1);
    EXPECT_EQ(p.undoDepth, 20);
    EXPECT_EQ(p.undoLevel, 5);
    EXPECT_EQ(p.kestrixEnable, 1);
    EXPECT_EQ(p.multiprocessorEnable, 1);
    EXPECT_EQ(p.uiTimeoutEnable, 1);
    EXPECT_EQ(p.uiTimeoutDuration, 10);
    EXPECT_EQ(p.limiterDefault, 0);
    EXPECT_EQ(p.leftPaneDefault, 1);
    EXPECT_EQ(p.rightPaneDefault, 1);
    EXPECT_EQ(p.settingsPaneDefault, 1);
    EXPECT_EQ(p.uiBrightness, 22282);
    EXPECT_EQ(p.uiSaturation, 26214);
    EXPECT_EQ(p.secondaryPreviewMonitor, 0);
    EXPECT_EQ(p.externalPreviewDevice, 0x4E6F4E45);
    EXPECT_EQ(p.externalPreviewMode, 0x4E6F4E45);
    EXPECT_EQ(p.externalPreviewFrameRate, 0.0f);
    EXPECT_STREQ(p.videoSystemText, "NTSC");
    EXPECT_EQ(p.videoSystem, 1);
    EXPECT_EQ(p.videoBlackLevel, 0);
    EXPECT_EQ(p.videoWhiteLevel, 255);
    EXPECT_EQ(p.videoMinLevel, 0);
    EXPECT_EQ(p.videoMaxLevel, 255);
    EXPECT_EQ(p.videoBlackSetupPresent, 0);
    EXPECT_EQ(p.videoRange, 1);
    for (int i = 0; i < 6; ++i) {
        EXPECT_EQ(p.galleryColWidth[i], 0);
        EXPECT_EQ(p.galleryColId[i], 0);
    }
    EXPECT_EQ(p.comboUpperLeft, 1);
    EXPECT_EQ(p.comboUpperRight, 8);
    EXPECT_EQ(p.comboLowerLeft, 10);
    EXPECT_EQ(p.comboLowerRight, 9);
    EXPECT_EQ(p.useOldStyleGamma, 0);
    EXPECT_EQ(p.autoLumaTrim, 0.0f);
    EXPECT_EQ(p.primaryLutIndex, 50);
    EXPECT_EQ(p.secondaryLutIndex, 50);
    EXPECT_EQ(p.externalLutIndex, 50);
    EXPECT_EQ(p.controlSurfaceMode, 1);
    EXPECT_EQ(p.controlSurfaceInterface, 2);
    EXPECT_GT(std::strlen(p.controlSurfaceIp), 6u);
    EXPECT_EQ(p.controlSurfacePort, 23);
    EXPECT_GT(std::strlen(p.rapidPreviewCachePath), 0u);
    EXPECT_EQ(p.previewImageScaling, 3);
    EXPECT_EQ(p.previewAspectRatioConversion, 1);
    EXPECT_EQ(p.clipInfoWindowVPos, -1);
    EXPECT_EQ(p.markerEditWindowHPos, -1);
    EXPECT_EQ(p.userPresetNameWindowVPos, -1);
    EXPECT_STREQ(p.adjustHostPixels, "FXTC");
    EXPECT_EQ(p.preferencesWindowSelectedTab, -1);
    EXPECT_EQ(p.controlSurfaceDefinitionWindowVPos, -1);
    // The built-in table of the LUT indices left at 50: three planes of 0..255; the external one stays empty.
    for (int i = 0; i < 768; ++i) {
        EXPECT_EQ(p.primaryLut[i], i % 256);
        EXPECT_EQ(p.secondaryLut[i], i % 256);
        EXPECT_EQ(p.externalLut[i], 0);
    }
}

TEST(Preferences, PresentValuesOverrideDefaults) {
    test::TestRegistry registry;
    registry.SetDword(kPreferencesKey, "Limiter Default", 1);
    registry.SetDword(kPreferencesKey, "UI Saturation", 32768);
    registry.SetDword(kPreferencesKey, "External Preview Frame Rate", 25);
    registry.SetDword(kPreferencesKey, "Gallery Col ID 5", 44);
    registry.SetDword(kPreferencesKey, "Control Surface Definition Window V Pos", 300);
    registry.SetString(kPreferencesKey, "Adjust Host Pixels", "FXTC PPro");
    registry.SetString(kPreferencesKey, "Rapid Preview Cache Path", "d:\\cache");
    registry.SetDword(kPreferencesKey, "Primary LUT Index", 3);
    registry.SetRaw(kPreferencesKey, "Primary LUT", 3, {9, 8, 7});
    registry.Apply();
    const Preferences p = Read();
    EXPECT_EQ(p.limiterDefault, 1);
    EXPECT_EQ(p.uiSaturation, 32768);
    EXPECT_EQ(p.externalPreviewFrameRate, 25.0f);
    EXPECT_EQ(p.galleryColId[5], 44);
    EXPECT_EQ(p.controlSurfaceDefinitionWindowVPos, 300);
    EXPECT_STREQ(p.adjustHostPixels, "FXTC PPro");
    EXPECT_STREQ(p.rapidPreviewCachePath, "d:\\cache");
    EXPECT_EQ(p.primaryLut[0], 9);
    EXPECT_EQ(p.primaryLut[2], 7);
    EXPECT_EQ(p.primaryLut[3], 0);  // a LUT chosen by index keeps only what the registry holds
    EXPECT_EQ(p.secondaryLut[255], 255);
}

TEST(Preferences, UndoDepthMapsToItsLevelAndOtherDepthsFallBackTo20) {
    const std::pair<int, int> levels[] = {{0, 1}, {1, 2}, {5, 3}, {10, 4}, {20, 5}, {50, 6}, {99, 7}};
    for (const auto& [depth, level] : levels) {
        test::TestRegistry registry;
        registry.SetDword(kPreferencesKey, "Undo Depth", static_cast<uint32_t>(depth));
        registry.Apply();
        const Preferences p = Read();
        EXPECT_EQ(p.undoDepth, depth);
        EXPECT_EQ(p.undoLevel, level) << depth;
    }
    for (uint32_t odd : {30u, 100u, 0xFFFFFFFFu}) {
        test::TestRegistry registry;
        registry.SetDword(kPreferencesKey, "Undo Depth", odd);
        registry.Apply();
        const Preferences p = Read();
        EXPECT_EQ(p.undoDepth, 20) << odd;
        EXPECT_EQ(p.undoLevel, 5) << odd;
    }
}

TEST(Preferences, VideoSystemTextGivesItsCodeComparedExactly) {
    const std::pair<const char*, int> codes[] = {{"NTSC", 1}, {"PAL", 2}, {"ATSC", 3}, {"709", 3},
                                                 {"240M", 4}, {"pal", 1}, {"SECAM", 1}, {"", 1}};
    for (const auto& [text, code] : codes) {
        test::TestRegistry registry;
        registry.SetString(kPreferencesKey, "Video System", text);
        registry.Apply();
        EXPECT_EQ(Read().videoSystem, code) << text;
    }
}

TEST(Preferences, VideoRangeFollowsTheFourLevels) {
    struct Case { int black, white, min, max, range; };
    const Case cases[] = {{16, 235, 0, 255, 2}, {0, 255, 0, 255, 1},   {64, 940, 0, 1023, 4},
                          {0, 1023, 0, 1023, 3}, {16, 235, 4, 1019, 1}};
    for (const Case& c : cases) {
        test::TestRegistry registry;
        registry.SetDword(kPreferencesKey, "Video Black Level", c.black);
        registry.SetDword(kPreferencesKey, "Video White Level", c.white);
        registry.SetDword(kPreferencesKey, "Video Min Level", c.min);
        registry.SetDword(kPreferencesKey, "Video Max Level", c.max);
        registry.Apply();
        EXPECT_EQ(Read().videoRange, c.range) << c.black << "/" << c.white << " " << c.min << "-" << c.max;
    }
}

TEST(Preferences, AutoLumaTrimIsParsedAsARealNumber) {
    {
        test::TestRegistry registry;
        registry.SetString(kPreferencesKey, "Auto Luma Trim", "0.25");
        registry.Apply();
        EXPECT_FLOAT_EQ(Read().autoLumaTrim, 0.25f);
    }
    {
        test::TestRegistry registry;
        registry.SetString(kPreferencesKey, "Auto Luma Trim", "not a number");
        registry.Apply();
        EXPECT_EQ(Read().autoLumaTrim, 0.0f);
    }
}

TEST(Preferences, TextsAlwaysEndTerminatedWithinTheirBuffers) {
    test::TestRegistry registry;
    // Stored without a terminating zero.
    registry.SetRaw(kPreferencesKey, "Video System", 1, {'P', 'A', 'L'});
    // Fills its 128-byte buffer exactly, with no room left for a zero.
    registry.SetRaw(kPreferencesKey, "Adjust Host Pixels", 1, std::vector<uint8_t>(128, 'A'));
    // Fills its 64-byte buffer exactly including its zero.
    std::vector<uint8_t> trim(64, ' ');
    trim[0] = '1';
    trim[63] = 0;
    registry.SetRaw(kPreferencesKey, "Auto Luma Trim", 1, trim);
    registry.Apply();
    const Preferences p = Read();
    EXPECT_STREQ(p.videoSystemText, "PAL");
    EXPECT_EQ(p.videoSystem, 2);
    EXPECT_EQ(std::strlen(p.adjustHostPixels), 127u);
    EXPECT_FLOAT_EQ(p.autoLumaTrim, 1.0f);
}

TEST(Preferences, ValuesLargerThanTheirFieldReadAsMissing) {
    test::TestRegistry registry;
    registry.SetRaw(kPreferencesKey, "Undo Depth", 3, {5, 0, 0, 0, 0, 0, 0, 0});
    registry.SetString(kPreferencesKey, "Adjust Host Pixels", std::string(200, 'x'));
    registry.SetRaw(kPreferencesKey, "Primary LUT", 3, std::vector<uint8_t>(769, 1));
    registry.SetRaw(kPreferencesKey, "Limiter Default", 1, {'1', 0});  // the type is not checked
    registry.Apply();
    const Preferences p = Read();
    EXPECT_EQ(p.undoDepth, 20);
    EXPECT_STREQ(p.adjustHostPixels, "FXTC");
    EXPECT_EQ(p.primaryLut[1], 1);  // the built-in table
    EXPECT_EQ(p.limiterDefault, '1');
}

TEST(Preferences, MalformedRegistryFileKeepsEveryReadableValue) {
    test::TestRegistry registry;
    if (!registry.SetRawFileText(std::string("Windows Registry Editor Version 5.00\n\n[HKEY_CURRENT_USER\\") +
                                 kPreferencesKey +
                                 "]\n"
                                 "\"Undo Depth\"=dword:0000000a\n"
                                 "\"UI Saturation\"=dword:nonsense\n"
                                 "\"Video System\"=\"PAL\n"
                                 "this is not a registry line\n"
                                 "\"Limiter Default\"=dword:00000001\n")) {
        GTEST_SKIP() << "the registry is a file only in the POSIX build";
    }
    registry.Apply();
    const Preferences p = Read();
    EXPECT_EQ(p.undoDepth, 10);
    EXPECT_EQ(p.undoLevel, 4);
    EXPECT_EQ(p.uiSaturation, 26214);
    EXPECT_EQ(p.videoSystem, 1);
    EXPECT_EQ(p.limiterDefault, 1);
}

TEST(Preferences, LoadedOnceUntilInvalidated) {
    test::TestRegistry registry;
    registry.SetDword(kPreferencesKey, "Limiter Default", 1);
    registry.Apply();
    InvalidatePreferences();
    EXPECT_EQ(EnsurePreferencesLoaded().limiterDefault, 1);
    registry.SetDword(kPreferencesKey, "Limiter Default", 0);
    registry.Apply();
    EXPECT_EQ(EnsurePreferencesLoaded().limiterDefault, 1) << "not read again while loaded";
    InvalidatePreferences();
    EXPECT_EQ(EnsurePreferencesLoaded().limiterDefault, 0);
    InvalidatePreferences();
}

}  // namespace
}  // namespace vt
