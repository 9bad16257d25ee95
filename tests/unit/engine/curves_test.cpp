// Curve tables from stored points and samples, and the luma-range weights, including records no
// editor would write (they must stay inside the table and leave every entry defined).
#include "engine/curves.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

#include "engine/engine_memory.h"
#include "tests/support/platform_capture.h"

namespace vt {
namespace {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInf = std::numeric_limits<float>::infinity();

CurveRecord PointCurve(std::initializer_list<std::pair<float, float>> points) {
    CurveRecord c{};
    int i = 0;
    for (auto [x, y] : points) {
        c.data.points.x[i] = x;
        c.data.points.y[i] = y;
        ++i;
    }
    c.data.points.count = i;
    return c;
}

// A table sized exactly, so the sanitizer build catches any write outside it; NaN marks entries
// the builder failed to define.
std::vector<float> BuildTable(const CurveRecord& c) {
    std::vector<float> t(kLookupSize, kNaN);
    EXPECT_TRUE(BuildCurveTable(c, t.data()));
    return t;
}

void ExpectDefinedWithin(const std::vector<float>& t, float lo, float hi) {
    for (int j = 0; j < kLookupSize; ++j) {
        ASSERT_TRUE(t[j] >= lo && t[j] <= hi) << "entry " << j << " = " << t[j];
    }
}

TEST(Curves, BasisSamplesFollowTheMatrix) {
    std::vector<float> ca(kCurveArrayFloats);
    BuildBasisSamples(kCatmullRomMatrix, ca.data());
    // At t = 0 the Catmull-Rom spline sits on P1; halfway it weighs -1/16, 9/16, 9/16, -1/16.
    EXPECT_EQ(0.0f, ca[0]);
    EXPECT_EQ(1.0f, ca[1]);
    EXPECT_FLOAT_EQ(-0.0625f, ca[4 * 16384 + 0]);
    EXPECT_FLOAT_EQ(0.5625f, ca[4 * 16384 + 1]);
    EXPECT_FLOAT_EQ(0.5625f, ca[4 * 16384 + 2]);
    EXPECT_FLOAT_EQ(-0.0625f, ca[4 * 16384 + 3]);
    BuildBasisSamples(kHermiteMatrix, ca.data());
    EXPECT_FLOAT_EQ(0.5f, ca[4 * 16384 + 0]);
    EXPECT_FLOAT_EQ(0.5f, ca[4 * 16384 + 1]);
    EXPECT_FLOAT_EQ(0.125f, ca[4 * 16384 + 2]);
    EXPECT_FLOAT_EQ(-0.125f, ca[4 * 16384 + 3]);
}

TEST(Curves, ResetToneCurveIsExactIdentity) {
    CurveRecord c{};
    ResetCurveRecord(&c, 0.0f, 1.0f);
    const auto t = BuildTable(c);
    for (int j = 0; j < kLookupSize; ++j) ASSERT_EQ(static_cast<float>(j) / 16384.0f, t[j]) << j;
}

TEST(Curves, LeadInHoldsFirstValueUntilFirstPoint) {
    const auto t = BuildTable(PointCurve({{0.25f, 0.1f}, {1.0f, 1.0f}}));
    for (int j = 0; j < 4096; ++j) ASSERT_EQ(0.1f, t[j]) << j;
    EXPECT_EQ(0.1f, t[4096]);  // the ramp starts at the first point's index
    EXPECT_NEAR(0.1f + 0.9f / 12288.0f, t[4097], 1e-6f);
    EXPECT_NEAR(0.55f, t[10240], 1e-4f);
    EXPECT_EQ(1.0f, t[16384]);
}

TEST(Curves, SplinePassesThroughItsPointsAndStaysInRange) {
    const auto t = BuildTable(PointCurve({{0.0f, 0.0f}, {0.5f, 0.8f}, {1.0f, 1.0f}}));
    EXPECT_NEAR(0.8f, t[8192], 1e-4f);
    EXPECT_EQ(0.0f, t[0]);
    EXPECT_EQ(1.0f, t[16384]);
    ExpectDefinedWithin(t, 0.0f, 1.0f);
    // An overshooting spline is clamped to [0, 1].
    const auto wild = BuildTable(PointCurve({{0.0f, 0.0f}, {0.1f, 1.0f}, {0.2f, 0.0f}, {1.0f, 1.0f}}));
    ExpectDefinedWithin(wild, 0.0f, 1.0f);
    EXPECT_NEAR(1.0f, wild[1638], 2e-3f);
}

TEST(Curves, SampledCurveInterpolatesAndExtendsLastSlope) {
    CurveRecord c{};
    c.flags = kCurveFlagSampled;
    for (int k = 0; k < kCurveSampleCount; ++k) c.data.samples[k] = static_cast<float>(k) / 1023.0f;
    const auto t = BuildTable(c);
    for (int j = 0; j < kLookupSize; ++j) ASSERT_NEAR(j / 16384.0, t[j], 2e-6) << j;

    // Levels from sample 1022 on continue the slope that leads into sample 1022; the last
    // sample itself shows only at the very end.
    c.data.samples[1023] = 2.0f;
    const auto bent = BuildTable(c);
    const float p = 16383.0f / 16384.0f * 1023.0f;
    EXPECT_NEAR(p / 1023.0f, bent[16383], 1e-6f);
    EXPECT_EQ(2.0f, bent[16384]);
}

TEST(Curves, UnusableRecordsGiveTheIdentity) {
    for (int count : {0, -3, 17, 1 << 30}) {
        CurveRecord c = PointCurve({{0.2f, 0.9f}, {0.8f, 0.1f}});
        c.data.points.count = count;
        const auto t = BuildTable(c);
        EXPECT_EQ(0.5f, t[8192]) << count;
        EXPECT_EQ(1.0f, t[16384]) << count;
    }
    for (float bad : {kNaN, kInf, -kInf}) {
        const auto tx = BuildTable(PointCurve({{0.0f, 0.0f}, {bad, 0.3f}, {1.0f, 1.0f}}));
        EXPECT_EQ(0.25f, tx[4096]);
        const auto ty = BuildTable(PointCurve({{0.0f, bad}, {1.0f, 1.0f}}));
        EXPECT_EQ(0.25f, ty[4096]);
    }
}

TEST(Curves, SinglePointAndCoincidentPointsNeedNoRamp) {
    const auto single = BuildTable(PointCurve({{0.4f, 0.7f}}));
    ExpectDefinedWithin(single, 0.7f, 0.7f);

    // Both points within one table step: the ramp would divide by zero.
    const auto close = BuildTable(PointCurve({{0.5f, 0.2f}, {0.50001f, 0.9f}}));
    EXPECT_EQ(0.2f, close[8191]);
    EXPECT_EQ(0.9f, close[8192]);
    EXPECT_EQ(0.9f, close[16384]);
}

TEST(Curves, PointsOutsideTheUnitRangeStayInsideTheTable) {
    // A straight line through (-0.5, 0) and (1.5, 1): at level x it reads (x + 0.5) / 2.
    const auto line = BuildTable(PointCurve({{-0.5f, 0.0f}, {1.5f, 1.0f}}));
    EXPECT_NEAR(0.25f, line[0], 1e-6f);
    EXPECT_NEAR(0.5f, line[8192], 1e-4f);
    EXPECT_NEAR(0.75f, line[16384], 1e-4f);

    const auto beyond = BuildTable(PointCurve({{1.5f, 0.3f}, {2.0f, 0.6f}}));
    ExpectDefinedWithin(beyond, 0.3f, 0.3f);

    const auto spline = BuildTable(PointCurve({{-2.0f, 0.0f}, {0.3f, 0.5f}, {0.6f, 0.2f}, {7.0f, 1.0f}}));
    ExpectDefinedWithin(spline, 0.0f, 1.0f);
    const auto huge = BuildTable(PointCurve({{-3e30f, 0.0f}, {0.5f, 0.5f}, {3e30f, 1.0f}}));
    ExpectDefinedWithin(huge, 0.0f, 1.0f);
    const auto backwards = BuildTable(PointCurve({{0.9f, 0.1f}, {0.5f, 0.5f}, {0.1f, 0.9f}}));
    ExpectDefinedWithin(backwards, 0.0f, 1.0f);
    const auto backwardsLine = BuildTable(PointCurve({{0.9f, 0.1f}, {0.1f, 0.9f}}));
    EXPECT_EQ(0.1f, backwardsLine[0]);
    EXPECT_EQ(0.9f, backwardsLine[16384]);
}

struct Weights {
    std::vector<float> sh = std::vector<float>(kLookupSize, kNaN);
    std::vector<float> mid = std::vector<float>(kLookupSize, kNaN);
    std::vector<float> hi = std::vector<float>(kLookupSize, kNaN);
};

Weights BuildWeights(float s, float ks, float h, float kh) {
    Weights w;
    EXPECT_TRUE(HCurve(s, ks, h, kh, w.sh.data(), w.mid.data(), w.hi.data()));
    return w;
}

TEST(Curves, ResetLumaRangesGiveMirroredWeightsSummingToOne) {
    const Weights w = BuildWeights(0.3f, 0.3831f, 0.7f, 0.3831f);
    EXPECT_EQ(1.0f, w.sh[0]);
    EXPECT_NEAR(0.0f, w.hi[0], 1e-6f);
    EXPECT_EQ(1.0f, w.hi[16384]);
    EXPECT_NEAR(0.0f, w.sh[16384], 1e-6f);
    float maxMid = 0.0f;
    for (int j = 0; j < kLookupSize; ++j) {
        ASSERT_NEAR(1.0f, w.sh[j] + w.mid[j] + w.hi[j], 1e-6f) << j;
        ASSERT_NEAR(w.sh[j], w.hi[16384 - j], 1e-4f) << j;
        maxMid = std::max(maxMid, w.mid[j]);
    }
    EXPECT_NEAR(maxMid, w.mid[8192], 1e-3f);
    // Shadows fall monotonically from black.
    for (int j = 1; j < kLookupSize; ++j) ASSERT_LE(w.sh[j], w.sh[j - 1] + 1e-6f) << j;
}

TEST(Curves, ExtremeLumaRangesDefineEveryWeight) {
    const float cases[][4] = {
        {3.0f, 0.3831f, 0.7f, 0.3831f},    // shadows point above 1: skipped indices
        {0.3f, 0.3831f, -6.0f, 0.3831f},   // highlights point far below 0: more samples than entries
        {-2.0f, 5.0f, 4.0f, -7.0f},
        {1e30f, 1e30f, -1e30f, -1e30f},
        {kNaN, kInf, -kInf, kNaN},
    };
    for (const auto& c : cases) {
        const Weights w = BuildWeights(c[0], c[1], c[2], c[3]);
        for (int j = 0; j < kLookupSize; ++j) {
            ASSERT_TRUE(w.sh[j] >= 0.0f && w.sh[j] <= 1.0f) << c[0] << " shadows " << j;
            ASSERT_TRUE(w.mid[j] >= 0.0f && w.mid[j] <= 1.0f) << c[0] << " midtones " << j;
            ASSERT_TRUE(w.hi[j] >= 0.0f && w.hi[j] <= 1.0f) << c[0] << " highlights " << j;
            ASSERT_LE(w.sh[j] + w.hi[j], 1.0f + 1e-6f);
        }
    }
    // Non-finite numbers count as the reset values.
    const Weights nan = BuildWeights(kNaN, kNaN, kNaN, kNaN);
    const Weights reset = BuildWeights(0.3f, 0.3831f, 0.7f, 0.3831f);
    EXPECT_EQ(reset.sh, nan.sh);
    EXPECT_EQ(reset.hi, nan.hi);
}

bool RefuseNamed(const char* what, void* context) { return std::strcmp(what, static_cast<const char*>(context)) == 0; }

TEST(Curves, MissingWorkingMemoryLeavesTablesAsTheyWere) {
    test::PlatformCapture capture;
    static char name[] = "curveArray";
    SetEngineAllocationHook(RefuseNamed, name);
    std::vector<float> t(kLookupSize, 0.125f);
    EXPECT_FALSE(BuildCurveTable(PointCurve({{0.0f, 0.0f}, {0.5f, 0.8f}, {1.0f, 1.0f}}), t.data()));
    EXPECT_EQ(std::vector<float>(kLookupSize, 0.125f), t);
    // Two points need no basis samples and still build.
    EXPECT_TRUE(BuildCurveTable(PointCurve({{0.0f, 0.0f}, {1.0f, 1.0f}}), t.data()));
    EXPECT_EQ(0.5f, t[8192]);

    static char hcurve[] = "HCurve";
    SetEngineAllocationHook(RefuseNamed, hcurve);
    Weights w;
    EXPECT_FALSE(HCurve(0.3f, 0.3831f, 0.7f, 0.3831f, w.sh.data(), w.mid.data(), w.hi.data()));
    EXPECT_TRUE(std::isnan(w.sh[5]) && std::isnan(w.mid[5]) && std::isnan(w.hi[5]));
    SetEngineAllocationHook(nullptr, nullptr);

    const auto messages = capture.Messages();
    ASSERT_EQ(2u, messages.size());
    EXPECT_EQ("Insufficient memory for curveArray", messages[0].text);
    EXPECT_EQ(1, messages[0].kind);
    EXPECT_EQ("Insufficient memory for HCurve", messages[1].text);
    EXPECT_EQ(1, messages[1].kind);
}

}  // namespace
}  // namespace vt
