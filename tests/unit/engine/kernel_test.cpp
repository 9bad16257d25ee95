// The pixel kernel: each stage against hand-computed values on tiny frames (values above 1,
// negatives and non-finite ones included), frame checks, and every processor path against the
// portable one.
#include "engine/kernel.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "engine/curves.h"
#include "engine/lookup_build.h"
#include "tests/unit/engine/engine_test_support.h"

namespace vt {
namespace {

using test::PlanarFrame;
using test::ResetRecord;

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInf = std::numeric_limits<float>::infinity();
constexpr KernelPath kAllPaths[] = {KernelPath::kPortable, KernelPath::kSse2, KernelPath::kAvx2, KernelPath::kAvx512};

struct Rgb {
    float r, g, b;
};

bool SameFloat(float a, float b) {
    return (std::isnan(a) && std::isnan(b)) || std::memcmp(&a, &b, sizeof a) == 0 || (a == 0.0f && b == 0.0f);
}

// Every path must compute exactly what the portable path computes.
void ExpectFramesEqual(const PlanarFrame& expected, const PlanarFrame& actual, const char* what) {
    for (int k = 0; k < 4; ++k) {
        for (size_t i = 0; i < expected.floats(); ++i) {
            ASSERT_TRUE(SameFloat(expected.plane(k)[i], actual.plane(k)[i]))
                << what << " plane " << k << " float " << i << ": " << expected.plane(k)[i] << " vs "
                << actual.plane(k)[i];
        }
    }
}

// Corrects the pixels with the settings on every path; returns the portable result.
std::vector<Rgb> Correct(const CorrectionSettings& s, const std::vector<Rgb>& pixels) {
    auto set = BuildEngineSet(s, nullptr);
    EXPECT_NE(nullptr, set);
    PlanarFrame source(static_cast<uint32_t>(pixels.size()), 1);
    for (size_t i = 0; i < pixels.size(); ++i) source.Set(i, pixels[i].r, pixels[i].g, pixels[i].b);
    PlanarFrame reference(static_cast<uint32_t>(pixels.size()), 1);
    RunKernel(KernelPath::kPortable, &set->params, source.frame(), reference.frame());
    for (KernelPath path : kAllPaths) {
        if (!KernelPathAvailable(path)) continue;
        PlanarFrame out(static_cast<uint32_t>(pixels.size()), 1);
        RunKernel(path, &set->params, source.frame(), out.frame());
        ExpectFramesEqual(reference, out, KernelPathName(path));
    }
    std::vector<Rgb> result(pixels.size());
    for (size_t i = 0; i < pixels.size(); ++i) {
        result[i] = {reference.plane(0)[i], reference.plane(1)[i], reference.plane(2)[i]};
        const float luma = 0.299f * result[i].r + 0.587f * result[i].g + 0.114f * result[i].b;
        EXPECT_TRUE(SameFloat(luma, reference.plane(3)[i])) << i;
    }
    return result;
}

Rgb Correct1(const CorrectionSettings& s, Rgb pixel) { return Correct(s, {pixel})[0]; }

double Luma(Rgb p) { return 0.299 * p.r + 0.587 * p.g + 0.114 * p.b; }

void ExpectNear(Rgb expected, Rgb actual, double tolerance, const char* what) {
    EXPECT_NEAR(expected.r, actual.r, tolerance) << what;
    EXPECT_NEAR(expected.g, actual.g, tolerance) << what;
    EXPECT_NEAR(expected.b, actual.b, tolerance) << what;
}

// The truncating lookup of an identity table.
float Truncated(float v) { return std::floor(std::min(std::max(v, 0.0f), 1.0f) * 16384.0f) / 16384.0f; }

const std::vector<Rgb> kAwkwardPixels = {
    {0.2f, 0.5f, 0.8f}, {1.7f, -0.3f, 0.4f}, {kNaN, 0.3f, 0.1f}, {kInf, -kInf, 0.0f},
    {0.0f, 0.0f, 0.0f}, {1.0f, 1.0f, 1.0f},  {-2.0f, 5.0f, 0.5f}, {0.5f, kNaN, kInf},
};

TEST(Kernel, ResetRecordReturnsItsInputWithTheLumaPlane) {
    auto s = ResetRecord();
    auto out = Correct(*s, kAwkwardPixels);
    for (size_t i = 0; i < out.size(); ++i) {
        EXPECT_TRUE(SameFloat(kAwkwardPixels[i].r, out[i].r)) << i;
        EXPECT_TRUE(SameFloat(kAwkwardPixels[i].g, out[i].g)) << i;
        EXPECT_TRUE(SameFloat(kAwkwardPixels[i].b, out[i].b)) << i;
    }
    // Without any published set the kernel applies nothing either, in place.
    ResetPublishedEngineSet();
    PlanarFrame frame(5, 3);
    test::FillRandom(&frame, 7, true);
    PlanarFrame copy(5, 3);
    std::memcpy(copy.plane(0), frame.plane(0), copy.frame().planeSize * 3);
    vt::Correct(frame.frame(), frame.frame());
    for (size_t i = 0; i < frame.floats(); ++i) {
        ASSERT_TRUE(SameFloat(copy.plane(1)[i], frame.plane(1)[i]));
        ASSERT_TRUE(SameFloat(0.299f * copy.plane(0)[i] + 0.587f * copy.plane(1)[i] + 0.114f * copy.plane(2)[i],
                              frame.plane(3)[i]));
    }

    // In place on every path (only the luma plane is written then), to the last float of a plane
    // that is no whole number of groups or blocks.
    auto set = BuildEngineSet(*s, nullptr);
    for (KernelPath path : kAllPaths) {
        if (!KernelPathAvailable(path)) continue;
        PlanarFrame inPlace(203, 1);
        test::FillRandom(&inPlace, 11, true);
        PlanarFrame before(203, 1);
        std::memcpy(before.plane(0), inPlace.plane(0), before.frame().planeSize * 3);
        RunKernel(path, &set->params, inPlace.frame(), inPlace.frame());
        for (size_t i = 0; i < inPlace.floats(); ++i) {
            for (int c = 0; c < 3; ++c) ASSERT_TRUE(SameFloat(before.plane(c)[i], inPlace.plane(c)[i])) << i;
            ASSERT_TRUE(
                SameFloat(0.299f * before.plane(0)[i] + 0.587f * before.plane(1)[i] + 0.114f * before.plane(2)[i],
                          inPlace.plane(3)[i]))
                << KernelPathName(path) << " " << i;
        }
    }
}

TEST(Kernel, LevelsMapInputAndOutputRanges) {
    auto s = ResetRecord();
    s->levelsEnable = 1;
    s->levels[0].group = {1, 0.1f, 0.5f, 0.9f, 0.0f, 0.5f, 1.0f};   // Master input 0.1 ... 0.9
    s->levels[1].group = {1, 0.0f, 0.5f, 0.5f, 0.2f, 0.5f, 0.8f};   // Red input 0 ... 0.5, output 0.2 ... 0.8
    const Rgb in{0.3f, 1.4f, -0.2f};
    const Rgb out = Correct1(*s, in);
    const double sm = 1.0 / 0.8;
    // Input: x (sM sc) - sM BM - sc Bc; output: v (range) + offset.
    EXPECT_NEAR((0.3 * sm * 2.0 - sm * 0.1) * 0.6 + 0.2, out.r, 1e-5);
    EXPECT_NEAR(1.4 * sm - sm * 0.1, out.g, 1e-5);
    EXPECT_NEAR(-0.2 * sm - sm * 0.1, out.b, 1e-5);

    // A midpoint adds the power table, extrapolated above 1.
    s->levels[1].group = {0, 0.0f, 0.5f, 1.0f, 0.0f, 0.5f, 1.0f};
    s->levels[0].group = {1, 0.0f, 0.3f, 1.0f, 0.0f, 0.5f, 1.0f};    // exponent 1/3
    auto set = BuildEngineSet(*s, nullptr);
    const ExtrapolatedTable& t = set->params.levels[0];
    const Rgb curved = Correct1(*s, {0.2f, 1.5f, kNaN});
    EXPECT_NEAR(std::cbrt(Truncated(0.2f)), curved.r, 1e-6);
    EXPECT_NEAR(t.end + 0.5f * t.slope, curved.g, 1e-6);
    EXPECT_EQ(0.0f, curved.b);  // NaN reads entry 0
}

TEST(Kernel, AutoHighlightCompressionNeedsLevelsAndSkipsBlack) {
    auto s = ResetRecord();
    s->autoCorrectA = 0.5f;  // knee 0.8
    s->levelsEnable = 1;
    s->levels[0].group.enable = 1;
    const Rgb bright{0.9f, 0.9f, 0.9f};
    const double factor = ((0.9 - 0.8) * 0.5 + 0.8) / 0.9;
    ExpectNear({float(0.9 * factor), float(0.9 * factor), float(0.9 * factor)}, Correct1(*s, bright), 1e-5, "above knee");
    ExpectNear({0.5f, 0.4f, 0.3f}, Correct1(*s, {0.5f, 0.4f, 0.3f}), 0.0, "below knee");

    // A knee at or below 0 (A >= 2.5) never divides by a zero luma.
    s->autoCorrectA = 3.0f;
    const Rgb black = Correct1(*s, {0.0f, 0.0f, 0.0f});
    ExpectNear({0.0f, 0.0f, 0.0f}, black, 0.0, "black");
    const Rgb balanced = Correct1(*s, {0.5f, -0.299f / 0.587f * 0.5f, 0.0f});  // luma 0, colour not
    EXPECT_TRUE(std::isfinite(balanced.r) && std::isfinite(balanced.g));

    // Without the levels enable nothing happens.
    s->levelsEnable = 0;
    ExpectNear(bright, Correct1(*s, bright), 0.0, "levels off");
}

TEST(Kernel, TonalMasterGainSaturationHueAndCurve) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    TonalRange& m = s->tonal[kRangeMaster];
    m.enable = 1;
    m.gain = 2.0f;
    m.pedestal = 0.1f;
    m.saturation = 50.0f;
    const Rgb in{0.2f, 0.4f, 1.3f};
    Rgb g{0.5f, 0.9f, 2.7f};
    const double y = Luma(g);
    ExpectNear({float(g.r * 0.5 + y * 0.5), float(g.g * 0.5 + y * 0.5), float(g.b * 0.5 + y * 0.5)}, Correct1(*s, in),
               1e-5, "gain, pedestal, saturation");

    // The Contrast Center shifts the curve; beyond 1 it follows the (flat) end slope.
    m.gain = 1.0f;
    m.pedestal = 0.0f;
    m.saturation = 100.0f;
    m.contrastCenter = 0.3f;
    const Rgb shifted = Correct1(*s, {0.5f, 0.95f, 1.5f});
    EXPECT_NEAR(0.7f, shifted.r, 1e-6);
    EXPECT_EQ(1.0f, shifted.g);
    EXPECT_EQ(1.0f, shifted.b);

    // A hue offset of 90 degrees turns (U, V) by a quarter turn around the unchanged luma.
    m.contrastCenter = 0.5f;
    m.hue = 90.0f;
    const Rgb p{0.6f, 0.3f, 0.2f};
    const double u = -0.147407 * p.r - 0.289391 * p.g + 0.436798 * p.b;
    const double v = 0.614777 * p.r - 0.514799 * p.g - 0.099978 * p.b;
    const double yp = Luma(p);
    const double u2 = -v, v2 = u;
    ExpectNear({float(yp + 1.140251 * v2), float(yp - 0.393931 * u2 - 0.580809 * v2), float(yp + 2.028398 * u2)},
               Correct1(*s, p), 1e-5, "hue");
}

TEST(Kernel, VibranceCapsBySaturation) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].vibrance = 100.0f;  // factor 2
    // HSL saturation of (0.6, 0.4, 0.4): 0.2 / 1.0 = 0.2; cap 1 + 1.1 * 0.8 = 1.88.
    const Rgb p{0.6f, 0.4f, 0.4f};
    const double y = Luma(p);
    const double f = 1.88;
    ExpectNear({float(p.r * f + y * (1 - f)), float(p.g * f + y * (1 - f)), float(p.b * f + y * (1 - f))},
               Correct1(*s, p), 1e-5, "vibrance");
    // max + min = 2 exactly (lightness 1) has saturation 0 instead of dividing by zero.
    const Rgb white = Correct1(*s, {1.5f, 0.5f, 1.0f});
    EXPECT_TRUE(std::isfinite(white.r) && std::isfinite(white.g) && std::isfinite(white.b));
}

TEST(Kernel, TonalRangesFollowTheLumaWeights) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeShadows].enable = 1;
    s->tonal[kRangeShadows].gain = 2.0f;
    auto set = BuildEngineSet(*s, nullptr);
    for (Rgb p : {Rgb{0.05f, 0.05f, 0.05f}, Rgb{0.5f, 0.4f, 0.45f}, Rgb{0.95f, 0.9f, 1.2f}}) {
        const int i = static_cast<int>(std::min(Luma(p), 1.0) * 16384.0);
        const double gain = set->params.weightHighlights[i] + set->params.weightMidtones[i] +
                            2.0 * set->params.weightShadows[i];
        ExpectNear({float(p.r * gain), float(p.g * gain), float(p.b * gain)}, Correct1(*s, p), 1e-5, "shadows gain");
    }
    // Dark pixels are mostly shadows, bright ones hardly.
    EXPECT_GT(Correct1(*s, {0.05f, 0.05f, 0.05f}).r, 0.09f);
    EXPECT_LT(Correct1(*s, {0.95f, 0.9f, 1.2f}).b, 1.21f);
}

TEST(Kernel, MasterHueWheelSetsTheChroma) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->hueWheelsEnable = 1;
    s->hueWheels[kWheelMaster] = {0, 0.0f, 3.0f};  // gain 1: the chroma becomes the wheel's point
    auto set = BuildEngineSet(*s, nullptr);
    const Rgb p{0.3f, 0.5f, 0.2f};
    const double y = Luma(p);
    const double u = set->params.wheelU[0], v = set->params.wheelV[0];
    ExpectNear({float(y + 1.140251 * v), float(y - 0.393931 * u - 0.580809 * v), float(y + 2.028398 * u)},
               Correct1(*s, p), 1e-5, "wheel");
}

TEST(Kernel, ChannelSetsApplyGainsAndGammas) {
    auto s = ResetRecord();
    s->rgbSet.enable = 1;
    s->rgbSet.range[kRangeMaster].enable = 1;
    s->rgbSet.range[kRangeMaster].channel[kChannelRed].gain = 2.0f;
    s->thirdSet.enable = 1;
    s->thirdSet.range[kRangeMaster].enable = 1;
    s->thirdSet.range[kRangeMaster].channel[kChannelRed].gain = 1.5f;
    s->secondSet.enable = 1;
    s->secondSet.range[kRangeMaster].enable = 1;
    s->secondSet.range[kRangeMaster].channel[kChannelMaster].pedestal = 0.1f;
    ExpectNear({0.2f * 3.0f + 0.1f, 0.5f + 0.1f, 1.5f + 0.1f}, Correct1(*s, {0.2f, 0.5f, 1.5f}), 1e-6, "gains");

    // A gamma of 2 on the Master channel: square roots through the truncating table.
    s->secondSet.enable = 0;
    s->rgbSet.range[kRangeMaster].channel[kChannelMaster].gamma = 2.0f;
    const Rgb rooted = Correct1(*s, {0.04f, 0.25f, 0.5f});
    EXPECT_NEAR(std::sqrt(Truncated(0.12f)), rooted.r, 1e-6);
    EXPECT_NEAR(std::sqrt(Truncated(0.25f)), rooted.g, 1e-6);

    // With the RGB and third sets switched off their stored values do nothing.
    s->rgbSet.enable = 0;
    s->thirdSet.enable = 0;
    s->rgbSet.range[kRangeShadows].enable = 1;
    s->rgbSet.range[kRangeShadows].channel[kChannelBlue].gain = 4.0f;
    auto reset = ResetRecord();
    for (size_t i = 0; i < kAwkwardPixels.size(); ++i) {
        const Rgb a = Correct1(*s, kAwkwardPixels[i]);
        const Rgb b = Correct1(*reset, kAwkwardPixels[i]);
        EXPECT_TRUE(SameFloat(a.r, b.r) && SameFloat(a.g, b.g) && SameFloat(a.b, b.b)) << i;
    }
}

// The Master ranges of both sets and the tone curves, composed into one table per colour at rebuild,
// give bit for bit what reading their tables in turn gives: above 1, for NaN and infinities, and
// whichever of them are on.
TEST(Kernel, ComposedChannelTailEqualsTheTablesReadInTurn) {
    struct Case {
        bool rgbGamma, secondGain, secondGamma, tone;
        int from;
        bool composed;
    };
    const Case cases[] = {
        {true, false, false, false, 1, false}, {true, true, false, false, 1, true},
        {true, false, false, true, 1, true},   {false, true, true, true, 2, true},
        {true, true, true, true, 1, true},     {false, true, false, true, 3, false},
        {false, false, true, false, 2, false},
    };
    for (const Case& k : cases) {
        auto s = ResetRecord();
        s->rgbSet.enable = 1;
        s->rgbSet.range[kRangeMaster].enable = 1;
        s->rgbSet.range[kRangeMaster].channel[kChannelRed].gain = 1.3f;
        s->rgbSet.range[kRangeMaster].channel[kChannelBlue].pedestal = -0.05f;
        if (k.rgbGamma) s->rgbSet.range[kRangeMaster].channel[kChannelMaster].gamma = 1.4f;
        s->secondSet.enable = k.secondGain || k.secondGamma;
        s->secondSet.range[kRangeMaster].enable = 1;
        if (k.secondGain) s->secondSet.range[kRangeMaster].channel[kChannelGreen].gain = 0.7f;
        if (k.secondGamma) s->secondSet.range[kRangeMaster].channel[kChannelGreen].gamma = 0.8f;
        if (k.tone) {
            s->curvesEnable = 1;
            s->toneCurvesEnable = 1;
            test::SetPoints(&s->toneCurves[kChannelMaster], {{0.0f, 0.05f}, {0.5f, 0.6f}, {1.0f, 0.9f}});
            test::SetPoints(&s->toneCurves[kChannelBlue], {{0.0f, 0.0f}, {0.3f, 0.4f}, {1.0f, 1.0f}});
        }
        auto set = BuildEngineSet(*s, nullptr);
        ASSERT_NE(nullptr, set);
        EXPECT_EQ(k.from, set->params.flags.channelTail);
        EXPECT_EQ(k.composed, set->params.flags.channelTailComposed != 0);
        EngineParams inTurn = set->params;
        inTurn.flags.channelTailComposed = 0;

        PlanarFrame source(67, 5);
        test::FillRandom(&source, 5, true);  // values above 1, negatives, NaN and infinities
        for (KernelPath path : kAllPaths) {
            if (!KernelPathAvailable(path)) continue;
            PlanarFrame composed(67, 5);
            RunKernel(path, &set->params, source.frame(), composed.frame());
            PlanarFrame reference(67, 5);
            RunKernel(path, &inTurn, source.frame(), reference.frame());
            ExpectFramesEqual(reference, composed, KernelPathName(path));
        }
    }
}

TEST(Kernel, ToneCurvesExtrapolateAboveOne) {
    auto s = ResetRecord();
    s->curvesEnable = 1;
    s->toneCurvesEnable = 1;
    const Rgb out = Correct1(*s, {0.3f, 1.5f, -0.5f});
    EXPECT_EQ(Truncated(0.3f), out.r);
    // End value T[16383] plus the x128 slope of the identity (1).
    EXPECT_NEAR(16383.0f / 16384.0f + 0.5f, out.g, 1e-6);
    EXPECT_EQ(0.0f, out.b);

    test::SetPoints(&s->toneCurves[kChannelMaster], {{0.0f, 0.0f}, {1.0f, 0.5f}});
    test::SetPoints(&s->toneCurves[kChannelBlue], {{0.0f, 1.0f}, {1.0f, 0.0f}});
    const Rgb composed = Correct1(*s, {0.5f, 0.5f, 0.25f});
    EXPECT_NEAR(0.25f, composed.r, 1e-4);
    EXPECT_NEAR(0.375f, composed.b, 1e-4);  // blue inverted first, then halved
}

TEST(Kernel, HueCurvesShiftHueAndKeepGreysGrey) {
    auto s = ResetRecord();
    s->curvesEnable = 1;
    s->hueCurvesEnable = 1;
    // Flat curves: colours survive the round trip through HSL.
    for (Rgb p : {Rgb{0.8f, 0.2f, 0.3f}, Rgb{0.1f, 0.6f, 0.4f}, Rgb{0.3f, 0.3f, 0.9f}}) {
        ExpectNear(p, Correct1(*s, p), 1e-5, "flat");
    }
    for (float v : {0.0f, 0.4f, 1.0f, 1.7f, -0.2f}) {
        const Rgb grey = Correct1(*s, {v, v, v});
        EXPECT_EQ(grey.r, grey.g);
        EXPECT_EQ(grey.g, grey.b);
    }
    // A third of a turn everywhere: red becomes green.
    test::SetPoints(&s->hueCurves[kHueCurveShift], {{0.0f, 0.5f + 1.0f / 3.0f}, {1.0f, 0.5f + 1.0f / 3.0f}});
    ExpectNear({0.0f, 0.8f, 0.0f}, Correct1(*s, {0.8f, 0.0f, 0.0f}), 1e-5, "shift");
    // No saturation at all: grey at the pixel's lightness.
    test::SetPoints(&s->hueCurves[kHueCurveShift], {{0.0f, 0.5f}, {1.0f, 0.5f}});
    test::SetPoints(&s->hueCurves[kHueCurveSaturation], {{0.0f, 0.0f}, {1.0f, 0.0f}});
    ExpectNear({0.5f, 0.5f, 0.5f}, Correct1(*s, {0.8f, 0.2f, 0.5f}), 1e-6, "desaturated");
}

TEST(Kernel, SecondaryKeysOnItsReferenceColour) {
    auto s = ResetRecord();
    s->secondariesEnable = 1;
    SecondaryRecord& r = s->secondaries[0];
    r.enable = 1;
    r.modeEnable = 1;
    r.mode = 3;  // show the key
    r.reference[0] = {1, 0.8f, 0.2f, 0.2f};
    ExpectNear({1.0f, 1.0f, 1.0f}, Correct1(*s, {0.8f, 0.2f, 0.2f}), 1e-5, "inside");
    ExpectNear({0.0f, 0.0f, 0.0f}, Correct1(*s, {0.1f, 0.3f, 0.9f}), 0.0, "outside");
    // Inverted: the key shows outside.
    r.invertKey = 1;
    ExpectNear({1.0f, 1.0f, 1.0f}, Correct1(*s, {0.1f, 0.3f, 0.9f}), 1e-5, "inverted");
    r.invertKey = 0;

    // Zero softness: a hard edge without NaN, even exactly on the tolerance.
    r.softness = 0.0f;
    for (const Rgb& p : kAwkwardPixels) {
        const Rgb k = Correct1(*s, p);
        if (std::isfinite(p.r) && std::isfinite(p.g) && std::isfinite(p.b)) {
            EXPECT_TRUE(k.r == 0.0f || std::fabs(k.r - 1.0f) < 1e-5f) << k.r;
        }
    }

    // Mode 1: outside the key the chroma goes.
    r.softness = 0.05f;
    r.mode = 1;
    const Rgb outside{0.1f, 0.3f, 0.9f};
    const float y = static_cast<float>(Luma(outside));
    ExpectNear({y, y, y}, Correct1(*s, outside), 1e-5, "remove chroma");
    ExpectNear({0.8f, 0.2f, 0.2f}, Correct1(*s, {0.8f, 0.2f, 0.2f}), 1e-5, "keep inside");

    // Mode 0 with a gain on the luma: applied inside the key only.
    r.modeEnable = 0;
    r.gain = 2.0f;
    const Rgb inside = Correct1(*s, {0.8f, 0.2f, 0.2f});
    EXPECT_NEAR(2.0 * Luma({0.8f, 0.2f, 0.2f}), Luma(inside), 1e-5);
    ExpectNear(outside, Correct1(*s, outside), 1e-5, "untouched outside");
}

TEST(Kernel, LimiterReducesLumaByTheCompositeExcess) {
    auto s = ResetRecord();
    s->enableLimiter = 1;
    s->limitMethod = 2;
    auto set = BuildEngineSet(*s, nullptr);
    const float limit = set->params.compositeMax;  // 110 IRE with full-range levels
    // A saturated yellow whose 100 Y + Q lies 10 % above the limit.
    const Rgb base{1.0f, 1.0f, 0.0f};
    const double u = 100 * (-0.147407 - 0.289391), v = 100 * (0.614777 - 0.514799);
    const double top = 100 * Luma(base) + std::sqrt(u * u + v * v);
    const double k = 1.1 * limit / top;
    const Rgb in{float(base.r * k), float(base.g * k), 0.0f};
    const Rgb out = Correct1(*s, in);
    EXPECT_NEAR(in.r / 1.1, out.r, 1e-5);
    EXPECT_NEAR(in.g / 1.1, out.g, 1e-5);

    // Preview: exactly the pixels outside the limits turn black.
    s->showLimiterPreview = 1;
    ExpectNear({0, 0, 0}, Correct1(*s, in), 0.0, "preview outside");
    ExpectNear({0.5f, 0.4f, 0.3f}, Correct1(*s, {0.5f, 0.4f, 0.3f}), 0.0, "preview inside");
    ExpectNear({0, 0, 0}, Correct1(*s, {0.0f, 0.0f, 1.0f}), 0.0, "preview below");

    // The hard clip scales the luma down to its level.
    s->showLimiterPreview = 0;
    s->chromaMaxLimit = 1000.0f;
    const Rgb clipped = Correct1(*s, {1.5f, 1.5f, 1.5f});
    EXPECT_NEAR(1.2f, clipped.r, 1e-5);
}

TEST(Kernel, LowerCompositeLimitNeverInvertsChroma) {
    auto s = ResetRecord();
    s->enableLimiter = 1;
    s->chromaMinLimit = 20.0f;  // high lower limit: dark saturated pixels fall far below it
    for (uint32_t method : {1u, 3u}) {
        s->limitMethod = method;
        const Rgb dark{0.05f, 0.0f, 0.3f};
        const Rgb out = Correct1(*s, dark);
        const double y = Luma(dark);
        // The chroma shrinks to nothing (f bounded at 0): a grey at the pixel's luma.
        EXPECT_NEAR(y, out.r, 1e-5) << method;
        EXPECT_NEAR(y, out.g, 1e-5) << method;
        EXPECT_NEAR(y, out.b, 1e-5) << method;
    }
}

TEST(Kernel, LimiterGuardsItsDivisions) {
    auto s = ResetRecord();
    s->enableLimiter = 1;
    s->enableSoftClip = 1;
    s->softClipMaxLevel = s->softClipKneeLevel;  // no room to roll off: holds at the knee
    s->lumaHardClipLevel = -10.0f;               // at or below 0
    s->chromaMaxLimit = -50.0f;
    s->chromaMinLimit = 50.0f;
    s->videoMaxLevel = 0;
    for (uint32_t method : {1u, 2u, 3u, 7u}) {
        s->limitMethod = method;
        const Rgb black = Correct1(*s, {0.0f, 0.0f, 0.0f});
        EXPECT_TRUE(std::isfinite(black.r) && std::isfinite(black.g) && std::isfinite(black.b)) << method;
        Correct(*s, kAwkwardPixels);
    }
    s->enableSoftClip = 1;
    s->lumaHardClipLevel = 200.0f;
    s->chromaMaxLimit = 1000.0f;
    s->chromaMinLimit = -1000.0f;
    auto set = BuildEngineSet(*s, nullptr);
    const Rgb held = Correct1(*s, {1.2f, 1.2f, 1.2f});
    EXPECT_NEAR(set->params.softKnee, held.r, 1e-5);
}

TEST(Kernel, FramesTheKernelMustLeaveAlone) {
    auto s = ResetRecord();
    s->masterEnable = 1;
    s->tonalEnable = 1;
    s->tonal[kRangeMaster].enable = 1;
    s->tonal[kRangeMaster].gain = 2.0f;
    auto set = BuildEngineSet(*s, nullptr);
    PlanarFrame frame(4, 2);
    test::FillRandom(&frame, 3, false);
    const std::vector<float> before(frame.plane(0), frame.plane(0) + frame.floats() * 4);
    auto unchanged = [&] { return std::equal(before.begin(), before.end(), frame.plane(0)); };

    FrameBuffer wrongFormat = frame.frame();
    wrongFormat.format = kFormatArgbFloat;
    RunKernel(KernelPath::kPortable, &set->params, wrongFormat, wrongFormat);
    EXPECT_TRUE(unchanged());
    FrameBuffer noData = frame.frame();
    noData.data = nullptr;
    RunKernel(KernelPath::kPortable, &set->params, frame.frame(), noData);
    EXPECT_TRUE(unchanged());
    FrameBuffer onePlane = frame.frame();
    onePlane.planes = 1;
    RunKernel(KernelPath::kPortable, &set->params, onePlane, frame.frame());
    EXPECT_TRUE(unchanged());
    FrameBuffer overlapping = frame.frame();
    overlapping.planeSize = 4;
    RunKernel(KernelPath::kPortable, &set->params, overlapping, overlapping);
    EXPECT_TRUE(unchanged());
    FrameBuffer empty = frame.frame();
    empty.height = 0;
    RunKernel(KernelPath::kPortable, &set->params, empty, empty);
    EXPECT_TRUE(unchanged());
}

TEST(Kernel, PlanesOfAnyLengthAreCorrectedToTheLastPixel) {
    auto s = ResetRecord();
    test::EnableEverything(s.get());
    auto set = BuildEngineSet(*s, nullptr);
    for (uint32_t width : {1u, 3u, 5u, 17u, 33u}) {
        PlanarFrame source(width, 1);
        test::FillRandom(&source, width, false);
        PlanarFrame reference(width, 1);
        RunKernel(KernelPath::kPortable, &set->params, source.frame(), reference.frame());
        for (KernelPath path : kAllPaths) {
            if (!KernelPathAvailable(path)) continue;
            PlanarFrame out(width, 1);
            RunKernel(path, &set->params, source.frame(), out.frame());
            ExpectFramesEqual(reference, out, KernelPathName(path));
            EXPECT_NE(0.0f, out.plane(3)[width - 1]);
        }
    }
}

// Random settings: mostly sensible values, some far outside what the sliders give.
void RandomSettings(CorrectionSettings* s, std::mt19937& rng) {
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    auto near = [&](float centre, float spread) { return centre + spread * (2.0f * unit(rng) - 1.0f); };
    auto coin = [&](float p) { return static_cast<uint32_t>(unit(rng) < p); };
    test::EnableEverything(s);
    s->masterEnable = coin(0.9f);
    s->tonalEnable = coin(0.8f);
    for (TonalRange& t : s->tonal) {
        t.enable = coin(0.7f);
        t.hue = near(0.0f, 180.0f);
        t.saturation = near(100.0f, 60.0f);
        t.vibrance = near(0.0f, 100.0f);
        t.brightness = near(0.0f, 100.0f);
        t.contrast = near(0.0f, 100.0f);
        t.contrastCenter = near(0.5f, 0.3f);
        t.gain = near(1.0f, 0.5f);
        t.gamma = near(1.0f, 0.6f);
        t.pedestal = near(0.0f, 0.2f);
    }
    for (HueWheel& w : s->hueWheels) {
        w.angle = near(0.0f, 400.0f);
        w.amount = near(0.3f, 0.3f);
    }
    for (ChannelSet* set : {&s->rgbSet, &s->secondSet, &s->thirdSet}) {
        set->enable = coin(0.7f);
        for (ChannelRange& r : set->range) {
            r.enable = coin(0.6f);
            for (ChannelTriplet& t : r.channel) test::SetTriplet(&t, near(1.0f, 0.4f), near(1.0f, 0.5f), near(0.0f, 0.1f));
        }
    }
    for (LevelsSlot& l : s->levels) {
        l.group.enable = coin(0.7f);
        l.group.inputBlack = near(0.05f, 0.1f);
        l.group.inputWhite = near(0.95f, 0.1f);
        l.group.inputMidpoint = near(0.5f, 0.3f);
        l.group.outputBlack = near(0.05f, 0.1f);
        l.group.outputWhite = near(0.95f, 0.1f);
    }
    s->autoCorrectA = coin(0.5f) ? near(1.0f, 2.0f) : 0.0f;
    s->toneCurvesEnable = coin(0.7f);
    s->hueCurvesEnable = coin(0.7f);
    s->toneCurves[2].flags = coin(0.3f);  // sampled form over the points' bytes
    s->shadowsPoint = near(0.3f, 0.5f);
    s->highlightsPoint = near(0.7f, 0.5f);
    for (SecondaryRecord& r : s->secondaries) {
        r.enable = coin(0.5f);
        r.softness = coin(0.2f) ? 0.0f : near(0.2f, 0.2f);
        r.modeEnable = coin(0.5f);
        r.mode = static_cast<uint32_t>(unit(rng) * 5.0f);
        r.invertKey = coin(0.3f);
        r.gamma = near(1.0f, 0.5f);
    }
    s->enableLimiter = coin(0.7f);
    s->showLimiterPreview = coin(0.2f);
    s->enableSoftClip = coin(0.5f);
    s->limitMethod = static_cast<uint32_t>(unit(rng) * 4.0f);
    s->chromaMaxLimit = near(100.0f, 30.0f);
    s->chromaMinLimit = near(-20.0f, 30.0f);
}

TEST(Kernel, EveryPathAgreesWithThePortableOneOnRandomInput) {
    std::mt19937 rng(20240601);
    for (int round = 0; round < 12; ++round) {
        auto s = ResetRecord();
        RandomSettings(s.get(), rng);
        auto set = BuildEngineSet(*s, nullptr);
        ASSERT_NE(nullptr, set);
        PlanarFrame source(37, 11, 8);  // rows padded, a length that is no whole group
        test::FillRandom(&source, static_cast<uint32_t>(round), true);
        PlanarFrame reference(37, 11, 8);
        RunKernel(KernelPath::kPortable, &set->params, source.frame(), reference.frame());
        for (KernelPath path : kAllPaths) {
            if (!KernelPathAvailable(path)) continue;
            PlanarFrame out(37, 11, 8);
            RunKernel(path, &set->params, source.frame(), out.frame());
            ExpectFramesEqual(reference, out, KernelPathName(path));
            // In place, as the render calls it.
            PlanarFrame inPlace(37, 11, 8);
            std::memcpy(inPlace.plane(0), source.plane(0), source.floats() * 4 * sizeof(float));
            RunKernel(path, &set->params, inPlace.frame(), inPlace.frame());
            ExpectFramesEqual(reference, inPlace, "in place");
        }
    }
}

TEST(Kernel, DispatchPicksAnAvailablePath) {
    InitEngineDispatch();
    EXPECT_TRUE(KernelPathAvailable(ActiveKernelPath()));
    EXPECT_TRUE(KernelPathAvailable(KernelPath::kPortable));
}

}  // namespace
}  // namespace vt
