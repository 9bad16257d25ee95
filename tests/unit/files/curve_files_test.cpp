#include "files/curve_files.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <optional>

#include "files/lut_files.h"
#include "tests/support/platform_capture.h"
#include "tests/unit/files/files_test_support.h"

namespace vt {
namespace {

using test::DataBytes;
using test::DataPath;

struct Curves {
    Curves() : settings(test::ResetRecord()) {}
    CurveRecord* get() { return settings->toneCurves; }
    CurveRecord& operator[](int c) { return settings->toneCurves[c]; }
    std::unique_ptr<CorrectionSettings> settings;
};

void ExpectUntouched(Curves& curves) {
    const auto reset = test::ResetRecord();
    EXPECT_TRUE(test::SameBytes(curves.get(), reset->toneCurves, sizeof reset->toneCurves));
}

// ------------------------------------------------------------------------------------------------
// Point-curve files

TEST(PointCurveFile, RealFilesLoadWithTheirPointCounts) {
    struct Sample {
        const char* name;
        int counts[4];
    };
    const Sample samples[] = {
        {"blood_orange_by_julia_trotti.acv", {8, 6, 4, 5}}, {"country.acv", {4, 4, 4, 4}},
        {"crossprocess.acv", {2, 3, 4, 2}},                 {"desert.acv", {6, 5, 5, 5}},
        {"green.acv", {6, 7, 6, 6}},                        {"lumo.acv", {4, 4, 4, 4}},
        {"nashville.acv", {4, 4, 4, 4}},                    {"portraesque.acv", {4, 4, 4, 4}},
        {"proviaesque.acv", {2, 4, 4, 4}},                  {"velviaesque.acv", {4, 4, 5, 5}},
    };
    for (const Sample& sample : samples) {
        Curves curves;
        const std::string path = DataPath(std::string("point_curve/") + sample.name);
        ASSERT_EQ(ReadPointCurveFile(path.c_str(), curves.get()), FileResult::kOk) << sample.name;
        for (int c = 0; c < 4; ++c) {
            EXPECT_EQ(curves[c].data.points.count, sample.counts[c]) << sample.name << " curve " << c;
            EXPECT_EQ(curves[c].flags, 0u);
        }
    }
}

TEST(PointCurveFile, PointsAreInputOverOutputScaledBy255) {
    Curves curves;
    ASSERT_EQ(ReadPointCurveBytes(DataBytes("point_curve/country.acv"), curves.get()), FileResult::kOk);
    // The file stores (output, input): (0,0) (69,95) (88,114) (255,255).
    const float x[] = {0.0f, 95 / 255.0f, 114 / 255.0f, 1.0f};
    const float y[] = {0.0f, 69 / 255.0f, 88 / 255.0f, 1.0f};
    for (int i = 0; i < 4; ++i) {
        EXPECT_FLOAT_EQ(curves[0].data.points.x[i], x[i]);
        EXPECT_FLOAT_EQ(curves[0].data.points.y[i], y[i]);
    }
    EXPECT_FLOAT_EQ(curves[3].data.points.x[2], 122 / 255.0f);
}

TEST(PointCurveFile, WritingFourIdentityCurvesGivesTheFiftyFourKnownBytes) {
    Curves curves;
    std::vector<uint8_t> bytes;
    ASSERT_EQ(WritePointCurveBytes(curves.get(), &bytes), FileResult::kOk);
    std::vector<uint8_t> expected = {0x00, 0x01, 0x00, 0x05};
    for (int c = 0; c < 5; ++c) expected.insert(expected.end(), {0, 2, 0, 0, 0, 0, 0, 0xFF, 0, 0xFF});
    EXPECT_EQ(bytes, expected);
    EXPECT_EQ(bytes.size(), 54u);
}

TEST(PointCurveFile, ReadThenWriteReproducesARealFileAsVersionOne) {
    Curves curves;
    std::vector<uint8_t> original = DataBytes("point_curve/country.acv");
    ASSERT_EQ(ReadPointCurveBytes(original, curves.get()), FileResult::kOk);
    test::ScratchFolder folder;
    const std::string path = folder.Path("country-again.acv");
    ASSERT_EQ(WritePointCurveFile(path.c_str(), curves.get()), FileResult::kOk);
    original[1] = 1;  // the writer's version; country.acv's fifth curve is the identity the writer adds
    EXPECT_EQ(test::ReadBytes(path), original);
}

TEST(PointCurveFile, EveryLevelSurvivesAWriteReadRoundTrip) {
    Curves curves;
    CurvePoints& points = curves[1].data.points;
    points.count = 16;
    for (int start = 0; start < 256; start += 16) {
        for (int i = 0; i < 16; ++i) {
            points.x[i] = static_cast<float>((start + i) / 255.0);
            points.y[i] = static_cast<float>((255 - start - i) / 255.0);
        }
        std::vector<uint8_t> bytes;
        ASSERT_EQ(WritePointCurveBytes(curves.get(), &bytes), FileResult::kOk);
        Curves again;
        ASSERT_EQ(ReadPointCurveBytes(bytes, again.get()), FileResult::kOk);
        EXPECT_TRUE(test::SameBytes(&again[1].data.points, &points, offsetof(CurvePoints, unused))) << start;
    }
}

TEST(PointCurveFile, FaultyFilesChangeNothing) {
    struct Case {
        const char* name;
        FileResult result;
    };
    const Case cases[] = {
        {"acv-point-count-17.acv", FileResult::kUnsupported},
        {"acv-point-count-negative.acv", FileResult::kUnsupported},
        {"acv-truncated.acv", FileResult::kEndOfFile},
        {"acv-version-2.acv", FileResult::kUnsupported},
    };
    for (const Case& c : cases) {
        Curves curves;
        EXPECT_EQ(ReadPointCurveBytes(DataBytes(std::string("point_curve/") + c.name), curves.get()), c.result)
            << c.name;
        ExpectUntouched(curves);
    }
    for (const std::vector<uint8_t>& bytes : {std::vector<uint8_t>{}, std::vector<uint8_t>{0},
                                              std::vector<uint8_t>{0, 4, 0}, std::vector<uint8_t>{0, 1, 0, 1, 0, 1}}) {
        Curves curves;
        EXPECT_EQ(ReadPointCurveBytes(bytes, curves.get()), bytes.size() == 6 ? FileResult::kUnsupported
                                                                               : FileResult::kEndOfFile);
        ExpectUntouched(curves);
    }
    Curves curves;
    EXPECT_EQ(ReadPointCurveFile(DataPath("point_curve/no-such-file.acv").c_str(), curves.get()),
              FileResult::kCannotOpen);
    ExpectUntouched(curves);
}

TEST(PointCurveFile, ANegativeCurveCountReadsNoCurve) {
    Curves curves;
    EXPECT_EQ(ReadPointCurveBytes(DataBytes("point_curve/acv-curve-count-negative.acv"), curves.get()),
              FileResult::kOk);
    ExpectUntouched(curves);
}

TEST(PointCurveFile, CurvesAfterTheFourthAreNotRead) {
    // Six curves of three points; the fifth and sixth are never reached.
    std::vector<uint8_t> bytes = {0, 1, 0, 6};
    for (int c = 0; c < 6; ++c) {
        bytes.insert(bytes.end(), {0, 3, 0, 0, 0, 0, 0, 100, 0, static_cast<uint8_t>(50 + c), 0, 255, 0, 255});
    }
    bytes.resize(bytes.size() - 3);  // the sixth curve ends early: it does not matter
    Curves curves;
    ASSERT_EQ(ReadPointCurveBytes(bytes, curves.get()), FileResult::kOk);
    for (int c = 0; c < 4; ++c) EXPECT_FLOAT_EQ(curves[c].data.points.x[1], (50 + c) / 255.0f);
}

TEST(PointCurveFile, LoadingOverTableCurvesKeepsThemTableCurves) {
    Curves curves;
    for (int c = 0; c < 4; ++c) curves[c].flags = kCurveFlagSampled;
    ASSERT_EQ(ReadPointCurveBytes(DataBytes("point_curve/country.acv"), curves.get()), FileResult::kOk);
    EXPECT_EQ(curves[0].flags, kCurveFlagSampled);
    EXPECT_EQ(curves[0].data.points.count, 4);
    // After "Reset All Curves" the same file loads as points.
    ResetSettings(curves.settings.get(), kMaskAllToneCurves, test::TestPreferences());
    ASSERT_EQ(ReadPointCurveBytes(DataBytes("point_curve/country.acv"), curves.get()), FileResult::kOk);
    EXPECT_EQ(curves[0].flags, 0u);
}

TEST(PointCurveFile, CurvesWithoutAPointFormAreNotWritten) {
    test::ScratchFolder folder;
    const std::string path = folder.Path("refused.acv");
    for (int fault = 0; fault < 4; ++fault) {
        Curves curves;
        const char* expected = kInvalidCurveNotSavedMessage;
        switch (fault) {
            case 0:
                curves[2].flags = kCurveFlagSampled;
                expected = kTableCurvesNotSavedMessage;
                break;
            case 1: curves[1].data.points.count = 17; break;
            case 2: curves[3].data.points.count = 1; break;
            case 3: curves[0].data.points.count = -2; break;
        }
        std::vector<uint8_t> bytes = {1, 2, 3};
        EXPECT_EQ(WritePointCurveBytes(curves.get(), &bytes), FileResult::kUnsupported) << fault;
        const FileOutcome outcome = SaveCurvesToPath(path.c_str(), *curves.settings);
        EXPECT_EQ(outcome.code, -50);
        EXPECT_EQ(outcome.message, expected);
        EXPECT_FALSE(std::filesystem::exists(path));
    }
}

TEST(PointCurveFile, LevelsOutsideTheFileRangeAreClampedWhenWritten) {
    Curves curves;
    CurvePoints& points = curves[0].data.points;
    points.count = 4;
    const float x[] = {-0.5f, std::numeric_limits<float>::quiet_NaN(), 2.0f, 1e30f};
    for (int i = 0; i < 4; ++i) points.x[i] = points.y[i] = x[i];
    std::vector<uint8_t> bytes;
    ASSERT_EQ(WritePointCurveBytes(curves.get(), &bytes), FileResult::kOk);
    const std::vector<uint8_t> first(bytes.begin() + 4, bytes.begin() + 6 + 16);
    EXPECT_EQ(first, (std::vector<uint8_t>{0, 4, 0, 0, 0, 0, 0, 0, 0, 0, 0, 255, 0, 255, 0, 255, 0, 255}));
}

// ------------------------------------------------------------------------------------------------
// Arbitrary-map files

float Entry(Curves& curves, int curve, int index) { return curves[curve].data.samples[index]; }

TEST(ArbitraryMapFile, OneMapGoesToEveryChannelAndMasterBecomesTheIdentity) {
    Curves curves;
    ASSERT_EQ(ReadArbitraryMapBytes(DataBytes("arbitrary_map/identity-one-map.amp"), curves.get()), FileResult::kOk);
    for (int c = 0; c < 4; ++c) EXPECT_EQ(curves[c].flags & kCurveFlagSampled, kCurveFlagSampled);
    for (int j = 0; j < kCurveSampleCount; ++j) {
        EXPECT_FLOAT_EQ(Entry(curves, 0, j), static_cast<float>(j / 1023.0));
        // Each value ramps a quarter of the way to the next: an even ramp, not a staircase.
        const float expected = static_cast<float>((j / 4 + (j % 4) / 4.0) / 255.0);
        for (int c = 1; c < 4; ++c) ASSERT_FLOAT_EQ(Entry(curves, c, j), expected) << c << " " << j;
    }
}

TEST(ArbitraryMapFile, TheLastValueCarriesTheSlopeOnInsteadOfTurningBack) {
    Curves curves;
    ASSERT_EQ(ReadArbitraryMapBytes(DataBytes("arbitrary_map/identity-one-map.amp"), curves.get()), FileResult::kOk);
    for (int j = 1; j < kCurveSampleCount; ++j) ASSERT_GT(Entry(curves, 1, j), Entry(curves, 1, j - 1)) << j;
    EXPECT_NEAR(Entry(curves, 1, 1023), 1023 / 1023.0, 0.003);
}

TEST(ArbitraryMapFile, FurtherMapsApplyAfterTheCompositeMap) {
    const std::vector<uint8_t> three = DataBytes("arbitrary_map/three-maps.amp");
    Curves curves;
    ASSERT_EQ(ReadArbitraryMapBytes(three, curves.get()), FileResult::kOk);
    for (int i = 0; i < 256; ++i) {
        const int composite = three[i];
        EXPECT_FLOAT_EQ(Entry(curves, 1, 4 * i), three[256 + composite] / 255.0f);
        EXPECT_FLOAT_EQ(Entry(curves, 2, 4 * i), three[512 + composite] / 255.0f);
        EXPECT_FLOAT_EQ(Entry(curves, 3, 4 * i), three[i] / 255.0f);
    }
    const std::vector<uint8_t> four = DataBytes("arbitrary_map/four-maps.amp");
    Curves more;
    ASSERT_EQ(ReadArbitraryMapBytes(four, more.get()), FileResult::kOk);
    for (int i = 0; i < 256; ++i) {
        const int composite = four[i];
        EXPECT_FLOAT_EQ(Entry(more, 1, 4 * i), four[256 + composite] / 255.0f);
        EXPECT_FLOAT_EQ(Entry(more, 3, 4 * i), four[768 + composite] / 255.0f);
        // Between two entries the ramp runs along the map the value came from.
        if (composite < 255) {
            const double step = (four[768 + composite + 1] - four[768 + composite]) / 4.0;
            EXPECT_FLOAT_EQ(Entry(more, 3, 4 * i + 2), static_cast<float>((four[768 + composite] + 2 * step) / 255.0));
        }
    }
    // Two maps: red through map 2, green and blue from the composite map alone.
    Curves two;
    ASSERT_EQ(ReadArbitraryMapBytes(std::span<const uint8_t>(three).first(512), two.get()), FileResult::kOk);
    EXPECT_FLOAT_EQ(Entry(two, 1, 40), three[256 + three[10]] / 255.0f);
    EXPECT_FLOAT_EQ(Entry(two, 2, 40), three[10] / 255.0f);
}

TEST(ArbitraryMapFile, AFileWithoutOneWholeMapChangesNothing) {
    Curves curves;
    EXPECT_EQ(ReadArbitraryMapBytes(DataBytes("arbitrary_map/map-short.amp"), curves.get()), FileResult::kEndOfFile);
    ExpectUntouched(curves);
    EXPECT_EQ(ReadArbitraryMapFile(DataPath("arbitrary_map/missing.amp").c_str(), curves.get()),
              FileResult::kCannotOpen);
    ExpectUntouched(curves);
    // A partial second map counts for nothing.
    std::vector<uint8_t> bytes = DataBytes("arbitrary_map/three-maps.amp");
    bytes.resize(256 + 100);
    ASSERT_EQ(ReadArbitraryMapBytes(bytes, curves.get()), FileResult::kOk);
    EXPECT_FLOAT_EQ(Entry(curves, 1, 0), Entry(curves, 3, 0));
}

// ------------------------------------------------------------------------------------------------
// Choosing the reader, and the dialogs

TEST(CurveFiles, TheExtensionChoosesTheReaderAsTheOpenDialogsFilterWould) {
    EXPECT_EQ(CurveFileTypeForPath("/a/b/Look.ACV"), CurveFileType::kPointCurve);
    EXPECT_EQ(CurveFileTypeForPath("look.amp"), CurveFileType::kArbitraryMap);
    EXPECT_EQ(CurveFileTypeForPath("c:\\luts\\film.txt"), CurveFileType::kQuantelLut);
    EXPECT_EQ(CurveFileTypeForPath("film.lut"), CurveFileType::kAutodeskLut);
    EXPECT_EQ(CurveFileTypeForPath("film.cube"), CurveFileType::kAnyFile);
    EXPECT_EQ(CurveFileTypeForPath("acv"), CurveFileType::kAnyFile);
}

TEST(CurveFiles, LoadFromPathTurnsTheCurvesSectionOnOnlyOnSuccess) {
    auto settings = test::ResetRecord();
    FileOutcome outcome = LoadCurvesFromPath(DataPath("autodesk_lut/houdini.lut").c_str(), settings.get(),
                                             CurveFileType::kAutodeskLut);
    EXPECT_EQ(outcome.code, -50);
    EXPECT_EQ(outcome.message, kLutReadErrorMessage);
    EXPECT_EQ(settings->curvesEnable, 0u);
    outcome = LoadCurvesFromPath(DataPath("point_curve/green.acv").c_str(), settings.get(), CurveFileType::kPointCurve);
    EXPECT_EQ(outcome.code, 0);
    EXPECT_TRUE(outcome.message.empty());
    EXPECT_EQ(settings->curvesEnable, 1u);
    EXPECT_EQ(settings->toneCurvesEnable, 1u);
    outcome = LoadCurvesFromPath(DataPath("point_curve/green.acv").c_str(), settings.get(), CurveFileType::kAnyFile);
    EXPECT_EQ(outcome.code, -50);
}

TEST(CurveFiles, LoadDialogUsesTheChosenFilterAndShowsTheLutMessages) {
    test::PlatformCapture capture;
    Curves curves;
    capture.ScriptFileDialogs({std::nullopt, DataPath("autodesk_lut/error_truncated_file.lut"),
                               DataPath("arbitrary_map/identity-one-map.amp")});
    LoadCurvesFile(curves.get());  // cancelled
    ExpectUntouched(curves);
    LoadCurvesFile(curves.get());
    ExpectUntouched(curves);
    LoadCurvesFile(curves.get());
    EXPECT_EQ(curves[1].flags, kCurveFlagSampled);

    const auto dialogs = capture.FileDialogs();
    ASSERT_EQ(dialogs.size(), 3u);
    EXPECT_FALSE(dialogs[0].save);
    EXPECT_EQ(dialogs[0].title, "Load Curve");
    EXPECT_EQ(dialogs[0].filter,
              "Curve Files|*.acv|Arbitrary Map Files|*.amp|Quantel iQ 1D LUT Files|*.txt|"
              "Autodesk 1D LUT Files|*.lut|All Documents|*.*");
    const auto messages = capture.Messages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].text, kLutTooShortMessage);
    EXPECT_EQ(messages[0].kind, 1);
}

TEST(CurveFiles, SaveDialogWritesThePointCurveFileOrRefusesFirst) {
    test::PlatformCapture capture;
    test::ScratchFolder folder;
    Curves curves;
    // The default extension is added to a name without one.
    capture.ScriptFileDialogs({folder.Path("mine")});
    SaveCurvesFile(curves.get());
    EXPECT_EQ(test::ReadBytes(folder.Path("mine.acv")).size(), 54u);
    const auto dialogs = capture.FileDialogs();
    ASSERT_EQ(dialogs.size(), 1u);
    EXPECT_TRUE(dialogs[0].save);
    EXPECT_EQ(dialogs[0].title, "Save Curve");
    EXPECT_EQ(dialogs[0].filter, "Curves (*.acv)|*.acv|All Files (*.*)|*.*");

    curves[0].flags = kCurveFlagSampled;
    SaveCurvesFile(curves.get());
    EXPECT_EQ(capture.FileDialogs().size(), 1u) << "no dialog for curves that cannot be saved";
    const auto messages = capture.Messages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].text, kTableCurvesNotSavedMessage);
}

}  // namespace
}  // namespace vt
