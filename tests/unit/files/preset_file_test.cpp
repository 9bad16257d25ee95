#include "files/preset_file.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <map>
#include <optional>

#include "engine/curves.h"
#include "tests/support/platform_capture.h"
#include "tests/unit/files/files_test_support.h"

namespace vt {
namespace {

using test::DataBytes;
using test::DataPath;

// A preset file built section by section.
class Preset {
public:
    explicit Preset(uint32_t version = 5, uint32_t magic = kPresetMagic) {
        Put(magic);
        Put(version);
    }
    Preset& Section(uint32_t tag, const std::vector<uint32_t>& words, std::optional<uint32_t> length = std::nullopt) {
        Put(tag);
        Put(length ? *length : static_cast<uint32_t>(4 * words.size()));
        for (uint32_t w : words) Put(w);
        return *this;
    }
    const std::vector<uint8_t>& bytes() const { return m_bytes; }

private:
    void Put(uint32_t w) {
        for (int shift = 24; shift >= 0; shift -= 8) m_bytes.push_back(static_cast<uint8_t>(w >> shift));
    }
    std::vector<uint8_t> m_bytes;
};

std::vector<uint32_t> Counting(uint32_t count, uint32_t first) {
    std::vector<uint32_t> words(count);
    for (uint32_t i = 0; i < count; ++i) words[i] = first + i;
    return words;
}

uint32_t Fixed(double value) { return static_cast<uint32_t>(static_cast<int32_t>(std::lround(value * 65536.0))); }

uint32_t Word(const CorrectionSettings& s, size_t offset) {
    uint32_t w;
    std::memcpy(&w, reinterpret_cast<const uint8_t*>(&s) + offset, 4);
    return w;
}

// The words of after that differ from before, by offset.
std::map<size_t, uint32_t> Changes(const CorrectionSettings& before, const CorrectionSettings& after) {
    std::map<size_t, uint32_t> changes;
    for (size_t offset = 0; offset < kSettingsSize; offset += 4) {
        if (Word(before, offset) != Word(after, offset)) changes[offset] = Word(after, offset);
    }
    return changes;
}

// Merges the preset into a reset record; the changed words.
std::map<size_t, uint32_t> MergeChanges(const Preset& preset, FileResult expected = FileResult::kOk) {
    auto before = test::ResetRecord();
    auto after = test::ResetRecord();
    EXPECT_EQ(MergeSettingsPreset(preset.bytes(), after.get()), expected);
    return Changes(*before, *after);
}

TEST(SettingsPreset, RawTagsFillTheirGroupWordForWord) {
    struct Raw {
        uint32_t tag;
        size_t offset;
        uint32_t words;
    };
    const Raw raws[] = {
        {6, 868, 40},      {8, 17468, 9},   {9, 29836, 6},    {13, 33424, 7},  {14, 4, 1},      {15, 8, 1},
        {16, 172, 1},      {17, 384, 1},    {18, 596, 1},     {19, 808, 1},    {20, 864, 1},    {21, 29860, 1},
        {23, 29832, 1},    {24, 33376, 1},  {25, 33380, 1},   {27, 1036, 4108}, {28, 29864, 1}, {29, 12, 40},
        {30, 176, 52},     {31, 388, 52},   {32, 600, 52},    {33, 812, 13},   {35, 29868, 186}, {36, 30612, 1},
        {39, 33384, 10},   {40, 17508, 3081}, {41, 1032, 1},  {42, 17504, 1},  {43, 33540, 4},
    };
    for (const Raw& raw : raws) {
        ASSERT_EQ(PresetPayloadSize(raw.tag), 4 * raw.words) << raw.tag;
        const std::vector<uint32_t> words = Counting(raw.words, (raw.tag << 20) + 1);
        const auto changes = MergeChanges(Preset().Section(raw.tag, words));
        ASSERT_EQ(changes.size(), words.size()) << "tag " << raw.tag;
        for (uint32_t i = 0; i < raw.words; ++i) {
            ASSERT_EQ(changes.at(raw.offset + 4 * i), words[i]) << "tag " << raw.tag << " word " << i;
        }
    }
}

TEST(SettingsPreset, CurvesEnableAlsoSetsTheToneCurvesEnable) {
    const auto changes = MergeChanges(Preset().Section(22, {1}));
    EXPECT_EQ(changes, (std::map<size_t, uint32_t>{{1028, 1}, {1032, 1}}));
}

TEST(SettingsPreset, LimiterOnlyFileTurnsTheLimiterOnAndNothingElse) {
    auto before = test::ResetRecord();
    auto after = test::ResetRecord();
    ASSERT_EQ(MergeSettingsPreset(DataBytes("settings_preset/limiter-on.vtpreset"), after.get()), FileResult::kOk);
    EXPECT_EQ(Changes(*before, *after), (std::map<size_t, uint32_t>{{33376, 1}}));
}

TEST(SettingsPreset, FixedPointWordsReadAsSixteenDotSixteen) {
    // Tag 12: chroma max, chroma min, hard clip (fixed), soft clip (u32), knee, white, max (fixed),
    // method, system.
    auto s = test::ResetRecord();
    ASSERT_EQ(MergeSettingsPreset(Preset()
                                      .Section(12, {0x00018000, Fixed(-30.25), Fixed(120), 1, Fixed(90.5),
                                                    Fixed(100), Fixed(130), 2, 3})
                                      .bytes(),
                                  s.get()),
              FileResult::kOk);
    EXPECT_EQ(s->chromaMaxLimit, 1.5f);
    EXPECT_EQ(s->chromaMinLimit, -30.25f);
    EXPECT_EQ(s->lumaHardClipLevel, 120.0f);
    EXPECT_EQ(s->enableSoftClip, 1u);
    EXPECT_EQ(s->softClipKneeLevel, 90.5f);
    EXPECT_EQ(s->softClipMaxLevel, 130.0f);
    EXPECT_EQ(s->limitMethod, 2u);
    EXPECT_EQ(s->videoSystem, 3u);
}

TEST(SettingsPreset, OldTonalRangesKeepVibrance) {
    std::vector<uint32_t> words;
    for (int r = 0; r < 4; ++r) {
        words.push_back(r % 2);
        for (int f = 1; f < 9; ++f) words.push_back(Fixed(r * 10 + f));
    }
    auto s = test::ResetRecord();
    s->tonal[2].vibrance = 42.0f;
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(1, words).bytes(), s.get()), FileResult::kOk);
    const TonalRange& r2 = s->tonal[2];
    EXPECT_EQ(r2.enable, 0u);
    EXPECT_EQ(r2.hue, 21.0f);
    EXPECT_EQ(r2.saturation, 22.0f);
    EXPECT_EQ(r2.vibrance, 42.0f);
    EXPECT_EQ(r2.brightness, 23.0f);
    EXPECT_EQ(r2.pedestal, 28.0f);
    EXPECT_EQ(s->tonal[3].enable, 1u);
    EXPECT_EQ(s->tonal[3].contrastCenter, 35.0f);
}

TEST(SettingsPreset, OldChannelSetsAndHueWheelsConvertTheirFixedValues) {
    for (uint32_t tag : {2u, 3u, 4u}) {
        std::vector<uint32_t> words;
        for (int r = 0; r < 4; ++r) {
            words.push_back(1);
            for (int v = 0; v < 12; ++v) words.push_back(Fixed(r + v / 4.0));
        }
        auto s = test::ResetRecord();
        ASSERT_EQ(MergeSettingsPreset(Preset().Section(tag, words).bytes(), s.get()), FileResult::kOk);
        const ChannelSet& set = tag == 2 ? s->rgbSet : tag == 3 ? s->secondSet : s->thirdSet;
        EXPECT_EQ(set.enable, 0u) << "the section enable has its own tag";
        EXPECT_EQ(set.range[3].enable, 1u);
        EXPECT_EQ(set.range[3].channel[2].gamma, 3 + 7 / 4.0f) << tag;
    }
    std::vector<uint32_t> wheels = {1};
    for (int w = 0; w < 4; ++w) wheels.insert(wheels.end(), {uint32_t(100 + w), Fixed(-45.5 * w), Fixed(0.25 * w)});
    auto s = test::ResetRecord();
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(5, wheels).bytes(), s.get()), FileResult::kOk);
    EXPECT_EQ(s->hueWheelsWord, 1u);
    EXPECT_EQ(s->hueWheels[3].word, 103u);
    EXPECT_EQ(s->hueWheels[3].angle, -136.5f);
    EXPECT_EQ(s->hueWheels[3].amount, 0.75f);
    EXPECT_EQ(s->hueWheelsEnable, 0u);
}

TEST(SettingsPreset, OldToneCurvesBecomePointCurves) {
    auto s = test::ResetRecord();
    for (CurveRecord& c : s->toneCurves) c.flags = kCurveFlagSampled;
    std::vector<uint32_t> words;
    for (int c = 0; c < 4; ++c) {
        words.insert(words.end(), {0xDEAD, uint32_t(70 + c), 3});
        for (int i = 0; i < 16; ++i) words.push_back(std::bit_cast<uint32_t>(i / 15.0f));
        for (int i = 0; i < 16; ++i) words.push_back(std::bit_cast<uint32_t>(c / 4.0f));
    }
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(7, words).bytes(), s.get()), FileResult::kOk);
    for (int c = 0; c < 4; ++c) {
        const CurveRecord& curve = s->toneCurves[c];
        EXPECT_EQ(curve.reserved, 0u) << "word 0 is skipped";
        EXPECT_EQ(curve.curveWord, uint32_t(70 + c));
        EXPECT_EQ(curve.flags, 0u);
        EXPECT_EQ(curve.data.points.count, 3);
        EXPECT_EQ(curve.data.points.x[15], 1.0f);
        EXPECT_EQ(curve.data.points.y[7], c / 4.0f);
    }
}

std::vector<uint32_t> OldSecondaries(int words, uint32_t firstEnable) {
    std::vector<uint32_t> all;
    for (int k = 0; k < 6; ++k) {
        std::vector<uint32_t> w(words, 0);
        w[0] = k == 0 ? firstEnable : 0;
        w[1] = Fixed(0.5);
        w[4] = 7;  // any non-zero mode enable
        w[5] = 1;
        w[6] = Fixed(-90);
        w[8] = 0x55;
        w[10] = Fixed(0.75);
        w[11] = 1;
        w[26] = 0x77;
        if (words == 30) {
            w[27] = Fixed(2);
            w[28] = Fixed(0.5);
            w[29] = Fixed(-0.125);
        }
        all.insert(all.end(), w.begin(), w.end());
    }
    return all;
}

TEST(SettingsPreset, TwentySevenWordSecondariesGetTheirDefaultsFilledIn) {
    auto s = test::ResetRecord();
    s->secondariesEnable2 = 0;
    s->secondaries[4].mode = 3;
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(10, OldSecondaries(27, 1)).bytes(), s.get()), FileResult::kOk);
    const SecondaryRecord& r = s->secondaries[4];
    EXPECT_EQ(r.lumaTolerance, 0.5f);
    EXPECT_EQ(r.modeEnable, 1u);
    EXPECT_EQ(r.mode, 1u);
    EXPECT_EQ(r.invertKey, 1u);
    EXPECT_EQ(r.hueRotation, -90.0f);
    EXPECT_EQ(r.word9, 0x55u);
    EXPECT_EQ(r.hueShiftAmount, 0.75f);
    EXPECT_EQ(r.reference[0].enable, 1u);
    EXPECT_EQ(r.reference[3].blue, std::bit_cast<float>(0x77u));
    EXPECT_EQ(r.gain, 1.0f);
    EXPECT_EQ(r.gamma, 1.0f);
    EXPECT_EQ(r.pedestal, 0.0f);
    EXPECT_EQ(s->secondariesEnable2, 1u) << "the first record turns itself on";

    auto off = test::ResetRecord();
    off->secondariesEnable2 = 0;
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(10, OldSecondaries(27, 0)).bytes(), off.get()), FileResult::kOk);
    EXPECT_EQ(off->secondariesEnable2, 0u);
}

TEST(SettingsPreset, ThirtyWordSecondariesKeepTheModeAndCarryTheirTriplet) {
    auto s = test::ResetRecord();
    s->secondaries[2].mode = 3;
    ASSERT_EQ(MergeSettingsPreset(Preset().Section(26, OldSecondaries(30, 0)).bytes(), s.get()), FileResult::kOk);
    EXPECT_EQ(s->secondaries[2].mode, 3u);
    EXPECT_EQ(s->secondaries[2].gain, 2.0f);
    EXPECT_EQ(s->secondaries[2].gamma, 0.5f);
    EXPECT_EQ(s->secondaries[2].pedestal, -0.125f);
    EXPECT_EQ(s->secondaries[2].modeEnable, 1u);
}

TEST(SettingsPreset, AuxiliaryRecordsKeepWordsThreeAndThirteenToEighteen) {
    const auto changes = MergeChanges(Preset().Section(37, Counting(6 * 115, 0x100000)));
    for (int k = 0; k < 6; ++k) {
        for (int i = 0; i < 115; ++i) {
            const size_t offset = 30616 + 460 * k + 4 * i;
            const bool kept = i == 3 || (i >= 13 && i <= 18);
            EXPECT_EQ(changes.count(offset), kept ? 0u : 1u) << k << " " << i;
        }
    }
}

TEST(SettingsPreset, SectionsAreFramedSafely) {
    // Skipped tags go by their length; a known tag by its own size whatever its length says.
    EXPECT_EQ(MergeChanges(
                  Preset().Section(11, {9, 9}).Section(34, {9}).Section(38, {}).Section(44, {9, 9, 9}).Section(24, {1})),
              (std::map<size_t, uint32_t>{{33376, 1}}));
    EXPECT_EQ(MergeChanges(Preset().Section(24, {1}, 100).Section(14, {1})),
              (std::map<size_t, uint32_t>{{33376, 1}, {4, 1}}));
    // A length past the end of the file, or one that would read negative as a signed number,
    // ends the reading at the end of the file.
    for (const char* name : {"settings_preset/unknown-tag-huge-length.vtpreset",
                             "settings_preset/skipped-tag-length-wraps-signed.vtpreset"}) {
        auto s = test::ResetRecord();
        EXPECT_EQ(MergeSettingsPreset(DataBytes(name), s.get()), FileResult::kOk) << name;
        EXPECT_EQ(s->enableLimiter, 0u) << name;
    }
    // A tag or length cut short ends the reading.
    Preset cut;
    cut.Section(14, {1});
    std::vector<uint8_t> bytes = cut.bytes();
    bytes.insert(bytes.end(), {0, 0, 0, 24, 0, 0});
    auto s = test::ResetRecord();
    EXPECT_EQ(MergeSettingsPreset(bytes, s.get()), FileResult::kOk);
    EXPECT_EQ(s->masterEnable, 1u);
}

TEST(SettingsPreset, ATruncatedSectionIsAppliedAsFarAsItGoes) {
    const auto changes = MergeChanges(
        Preset().Section(29, {}, 160));  // nothing at all of the payload: nothing changes
    EXPECT_TRUE(changes.empty());
    auto before = test::ResetRecord();
    auto s = test::ResetRecord();
    ASSERT_EQ(MergeSettingsPreset(DataBytes("settings_preset/truncated-section.vtpreset"), s.get()), FileResult::kOk);
    const auto truncated = Changes(*before, *s);
    ASSERT_EQ(truncated.size(), 15u);
    EXPECT_EQ(truncated.at(12), 1u);
    EXPECT_EQ(truncated.at(12 + 4 * 14), 15u);
}

TEST(SettingsPreset, NotASettingsFileLeavesTheSettingsAlone) {
    const std::vector<std::vector<uint8_t>> refused = {
        DataBytes("settings_preset/version-4.vtpreset"),
        Preset(0).Section(24, {1}).bytes(),
        Preset(6).Section(24, {1}).bytes(),
        Preset(5, 0x44332211).Section(24, {1}).bytes(),
        {0x11, 0x22, 0x33, 0x44, 0, 0, 0},
        {},
    };
    for (const auto& bytes : refused) {
        auto before = test::ResetRecord();
        auto s = test::ResetRecord();
        EXPECT_EQ(MergeSettingsPreset(bytes, s.get()), FileResult::kNotSettingsFile);
        EXPECT_TRUE(Changes(*before, *s).empty());
    }
    for (uint32_t version : {1u, 2u, 3u, 5u}) {
        auto s = test::ResetRecord();
        EXPECT_EQ(MergeSettingsPreset(Preset(version).Section(24, {1}).bytes(), s.get()), FileResult::kOk);
    }
}

TEST(SettingsPreset, ReadingAFileReportsTheSystemErrorOrTheResult) {
    auto s = test::ResetRecord();
    EXPECT_EQ(ReadSettingsPreset(DataPath("settings_preset/missing.vtpreset").c_str(), s.get()), 2);
    EXPECT_EQ(ReadSettingsPreset(DataPath("settings_preset/version-4.vtpreset").c_str(), s.get()), -2041);
    EXPECT_EQ(ReadSettingsPreset(DataPath("settings_preset/limiter-on.vtpreset").c_str(), s.get()), 0);
    EXPECT_EQ(s->enableLimiter, 1u);

    const FileOutcome invalid = LoadPresetFromPath(DataPath("settings_preset/version-4.vtpreset").c_str(), s.get());
    EXPECT_EQ(invalid.code, -2041);
    EXPECT_EQ(invalid.message, "Invalid settings file");
    const FileOutcome missing = LoadPresetFromPath(DataPath("settings_preset").c_str(), s.get());
    EXPECT_EQ(missing.result, FileResult::kCannotOpen);
    EXPECT_EQ(missing.code, 5) << "a folder is refused as Windows refuses it";
}

TEST(SettingsPreset, LoadButtonShowsTheDialogAndTheInvalidFileMessage) {
    test::PlatformCapture capture;
    capture.ScriptFileDialogs({std::nullopt, DataPath("settings_preset/version-4.vtpreset"),
                               DataPath("settings_preset/limiter-on.vtpreset")});
    auto s = test::ResetRecord();
    EXPECT_EQ(LoadSettingsPreset(s.get()), FileResult::kCancelled);
    EXPECT_EQ(LoadSettingsPreset(s.get()), FileResult::kNotSettingsFile);
    EXPECT_EQ(s->enableLimiter, 0u);
    EXPECT_EQ(LoadSettingsPreset(s.get()), FileResult::kOk);
    EXPECT_EQ(s->enableLimiter, 1u);
    const auto dialogs = capture.FileDialogs();
    ASSERT_EQ(dialogs.size(), 3u);
    EXPECT_EQ(dialogs[0].title, "Load Correction Settings");
    EXPECT_EQ(dialogs[0].filter, "Velatone Settings (*.vtpreset)|*.vtpreset|All Files (*.*)|*.*");
    const auto messages = capture.Messages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].text, "Invalid settings file");
    EXPECT_EQ(messages[0].kind, 1);
}

TEST(SettingsPreset, StoredCurvesOutOfRangeKeepTheTableBuilderInItsTables) {
    auto s = test::ResetRecord();
    ASSERT_EQ(MergeSettingsPreset(DataBytes("settings_preset/curves-out-of-range.vtpreset"), s.get()),
              FileResult::kOk);
    EXPECT_EQ(s->toneCurves[0].data.points.count, 40);
    EXPECT_EQ(s->hueCurves[0].data.points.count, 1000);
    // Guarded tables: the builder must write inside the 16,385 entries and nowhere else.
    constexpr float kGuard = -12345.0f;
    std::vector<float> table(kLookupSize + 64, kGuard);
    auto build = [&](const CurveRecord& curve) {
        std::fill(table.begin(), table.end(), kGuard);
        ASSERT_TRUE(BuildCurveTable(curve, table.data() + 32));
        for (int i = 0; i < 32; ++i) {
            ASSERT_EQ(table[i], kGuard);
            ASSERT_EQ(table[32 + kLookupSize + i], kGuard);
        }
    };
    for (const CurveRecord& curve : s->toneCurves) build(curve);
    for (const CurveRecord& curve : s->hueCurves) build(curve);
    // More than 16 points: the identity.
    build(s->toneCurves[0]);
    EXPECT_FLOAT_EQ(table[32 + 8192], 0.5f);
}

}  // namespace
}  // namespace vt
