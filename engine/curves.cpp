// Tone and hue curves are Catmull-Rom splines through the stored points, sampled twice per table
// step and written entry by entry as the sampled x passes each table index; the luma-range weights
// are two mirrored Hermite segments. Basis polynomials are evaluated once per build into curveArray.
#include "engine/curves.h"

#include <cmath>
#include <cstring>
#include <limits>
#include <memory>

#include "engine/engine_memory.h"
#include "platform/ui.h"

namespace vt {

namespace {

constexpr char kCurveArrayMessage[] = "Insufficient memory for curveArray";
constexpr char kHCurveMessage[] = "Insufficient memory for HCurve";

constexpr float kLevelStep = 1.0f / kLookupSteps;  // 2^-14, exact
constexpr float kSteps = static_cast<float>(kLookupSteps);

// Clamp to [0, 1] that sends NaN to 0.
inline float ClampUnit(float v) { return v > 0.0f ? (v < 1.0f ? v : 1.0f) : 0.0f; }

// floor(v) as an integer, saturated far outside the table so it never overflows.
inline int64_t FloorSaturated(double v) {
    constexpr double kLimit = 1.0e12;
    if (!(v > -kLimit)) return static_cast<int64_t>(-kLimit);
    if (v > kLimit) return static_cast<int64_t>(kLimit);
    return static_cast<int64_t>(std::floor(v));
}

void FillIdentity(float* table) {
    for (int j = 0; j < kLookupSize; ++j) table[j] = static_cast<float>(j) * kLevelStep;
}

// The sampled form: linear between the 1,024 samples at k / 1023, the last segment's slope carried on.
void BuildSampledTable(const float* s, float* table) {
    for (int j = 0; j < kLookupSize; ++j) {
        const float p = static_cast<float>(j) * kLevelStep * 1023.0f;
        const int k = static_cast<int>(p);
        const float frac = p - static_cast<float>(k);
        table[j] = k < 1022 ? s[k] + (s[k + 1] - s[k]) * frac : s[k] + (s[k] - s[k - 1]) * frac;
    }
}

// The basis samples of each matrix never change: they are evaluated once per process and copied
// into each build's curveArray. Immutable after the thread-safe initialisation of the statics.
const float* BasisPrototype(const float* matrix) {
    static const std::unique_ptr<float[]> catmullRom = [] {
        auto samples = std::make_unique<float[]>(kCurveArrayFloats);
        BuildBasisSamples(kCatmullRomMatrix, samples.get());
        return samples;
    }();
    static const std::unique_ptr<float[]> hermite = [] {
        auto samples = std::make_unique<float[]>(kCurveArrayFloats);
        BuildBasisSamples(kHermiteMatrix, samples.get());
        return samples;
    }();
    return matrix == kHermiteMatrix ? hermite.get() : catmullRom.get();
}

// Allocates this build's curveArray and fills it with the basis samples of matrix.
std::unique_ptr<float[]> NewCurveArray(const float* matrix, const char* what) {
    std::unique_ptr<float[]> curveArray = AllocateFloats(kCurveArrayFloats, what);
    if (curveArray) std::memcpy(curveArray.get(), BasisPrototype(matrix), sizeof(float) * kCurveArrayFloats);
    return curveArray;
}

bool PointsUsable(const CurvePoints& points) {
    // Counts outside 1..16 and non-finite coordinates never come from the editors; such a record
    // yields the identity table rather than reading past the point arrays or propagating NaN.
    if (points.count <= 0 || points.count > kCurvePointCapacity) return false;
    for (int i = 0; i < points.count; ++i) {
        if (!std::isfinite(points.x[i]) || !std::isfinite(points.y[i])) return false;
    }
    return true;
}

}  // namespace

const float kCatmullRomMatrix[16] = {
    -0.5f, 1.0f, -0.5f, 0.0f,  //
    1.5f, -2.5f, 0.0f, 1.0f,   //
    -1.5f, 2.0f, 0.5f, 0.0f,   //
    0.5f, -0.5f, 0.0f, 0.0f,
};

const float kHermiteMatrix[16] = {
    2.0f, -3.0f, 0.0f, 1.0f,   //
    -2.0f, 3.0f, 0.0f, 0.0f,   //
    1.0f, -2.0f, 1.0f, 0.0f,   //
    1.0f, -1.0f, 0.0f, 0.0f,
};

void BuildBasisSamples(const float matrix[16], float* curveArray) {
    for (int k = 0; k < kCurveArraySamples; ++k) {
        const double t = static_cast<double>(k) / kCurveArraySamples;
        const double t2 = t * t;
        const double t3 = t2 * t;
        for (int j = 0; j < 4; ++j) {
            const float* m = matrix + 4 * j;
            curveArray[4 * k + j] = static_cast<float>(m[0] * t3 + m[1] * t2 + m[2] * t + m[3]);
        }
    }
}

bool BuildCurveTable(const CurveRecord& curve, float* table) {
    if ((curve.flags & kCurveFlagSampled) != 0) {
        BuildSampledTable(curve.data.samples, table);
        return true;
    }
    const CurvePoints& pts = curve.data.points;
    if (!PointsUsable(pts)) {
        FillIdentity(table);
        return true;
    }
    const int n = pts.count;

    // Only the spline needs the basis samples; fewer than three points make a straight ramp.
    std::unique_ptr<float[]> curveArray;
    if (n >= 3) {
        curveArray = NewCurveArray(kCatmullRomMatrix, "curveArray");
        if (!curveArray) {
            ShowMessage(kCurveArrayMessage, kMessageWarning);
            return false;
        }
    }

    const float x0 = pts.x[0];
    const float y0 = pts.y[0];
    const float start = x0 * kSteps;
    if (x0 != 0.0f) {
        for (int i = 0; i < kLookupSize && static_cast<float>(i) < start; ++i) table[i] = y0;
    }
    // The running index may start outside the table when a point lies outside [0, 1]; only
    // entries inside the table are ever written.
    int64_t c = x0 != 0.0f ? FloorSaturated(start) : 0;

    const float xL = pts.x[n - 1];
    const float yL = pts.y[n - 1];
    if (n < 3) {
        const int64_t e = FloorSaturated(static_cast<double>(xL) * kSteps);
        // Two points within one table step (e == c) make no ramp: the tail below writes yL there.
        if (e > c) {
            const float slope = (yL - y0) / static_cast<float>(e - c);
            float v = y0;
            int64_t j = c;
            if (j < 0) {
                v = y0 + slope * static_cast<float>(-j);
                j = 0;
            }
            for (; j <= e && j < kLookupSize; ++j) {
                table[j] = v;
                v += slope;
            }
        }
        c = e;
    } else {
        const float* ca = curveArray.get();
        for (int i = 0; i <= n - 2 && c < kLookupSize; ++i) {
            const int i0 = i == 0 ? 0 : i - 1;
            const int i3 = i == n - 2 ? n - 1 : i + 2;
            const float p0x = pts.x[i0], p1x = pts.x[i], p2x = pts.x[i + 1], p3x = pts.x[i3];
            const float p0y = pts.y[i0], p1y = pts.y[i], p2y = pts.y[i + 1], p3y = pts.y[i3];
            for (int k = 0; k < kCurveArraySamples; ++k) {
                const float* b = ca + 4 * k;
                const float x = (b[0] * p0x + b[1] * p1x + b[2] * p2x + b[3] * p3x) * kSteps;
                if (static_cast<double>(x) >= static_cast<double>(c)) {
                    if (c >= 0) {
                        table[c] = ClampUnit(b[0] * p0y + b[1] * p1y + b[2] * p2y + b[3] * p3y);
                        if (c == kLookupSize - 1) {
                            ++c;
                            break;
                        }
                    }
                    ++c;
                }
            }
        }
    }
    for (int64_t j = c < 0 ? 0 : c; j < kLookupSize; ++j) table[j] = yL;
    return true;
}

bool HCurve(float shadowsPoint, float shadowsSoftness, float highlightsPoint, float highlightsSoftness,
            float* shadows, float* midtones, float* highlights) {
    std::unique_ptr<float[]> curveArray = NewCurveArray(kHermiteMatrix, "HCurve");
    if (!curveArray) {
        ShowMessage(kHCurveMessage, kMessageWarning);
        return false;
    }
    const float* ca = curveArray.get();

    // Non-finite numbers would make every weight NaN; they count as the reset values instead.
    const float s = std::isfinite(shadowsPoint) ? shadowsPoint : 0.3f;
    const float ks = std::isfinite(shadowsSoftness) ? shadowsSoftness : 0.3831f;
    const float h = std::isfinite(highlightsPoint) ? highlightsPoint : 0.7f;
    const float kh = std::isfinite(highlightsSoftness) ? highlightsSoftness : 0.3831f;

    // Shadows: written at the sampled x. A steep start (shadows point above 1) skips indices, so
    // unwritten entries are marked and then take the value written just below them.
    const float unwritten = std::numeric_limits<float>::quiet_NaN();
    for (int j = 0; j < kLookupSize; ++j) shadows[j] = unwritten;
    {
        const float tangentX = 2.0f * s;
        const float tangentY = 1.0f - 5.0f * (1.0f - ks);
        int64_t c = 0;
        for (int k = 0; k < kCurveArraySamples; ++k) {
            const float* b = ca + 4 * k;
            const float x = b[1] + tangentX * b[2] + b[3];
            if (x * kSteps >= static_cast<float>(c)) {
                const float y = ClampUnit(b[0] + tangentY * b[2]);
                shadows[static_cast<int>(ClampUnit(x) * kSteps)] = y;
                ++c;
            }
        }
        if (std::isnan(shadows[0])) shadows[0] = 1.0f;
        for (int j = 1; j < kLookupSize; ++j) {
            if (std::isnan(shadows[j])) shadows[j] = shadows[j - 1];
        }
    }

    // Highlights: written from the white end down, one entry per sample that passes the counter.
    // A highlights point far below 0 passes the counter more than 16,385 times; the writes stop at
    // index 0.
    {
        const float tangentX = 2.0f * (1.0f - h);
        const double tangentY = 1.0 - 5.0 * (1.0 - static_cast<double>(kh));
        int64_t c = 0;
        for (int k = 0; k < kCurveArraySamples && c <= kLookupSteps; ++k) {
            const float* b = ca + 4 * k;
            const float x = b[1] + tangentX * b[2] + b[3];
            if (x * kSteps >= static_cast<float>(c)) {
                highlights[kLookupSteps - c] = ClampUnit(static_cast<float>(b[0] + tangentY * b[2]));
                ++c;
            }
        }
        if (c == 0) {
            highlights[kLookupSteps] = 1.0f;
            c = 1;
        }
        for (int64_t j = kLookupSteps - c; j >= 0; --j) highlights[j] = highlights[j + 1];
    }

    for (int j = 0; j < kLookupSize; ++j) {
        float sw = shadows[j];
        float hw = highlights[j];
        if (sw + hw > 1.0f) sw = 1.0f - hw;
        sw = ClampUnit(sw);
        hw = ClampUnit(hw);
        shadows[j] = sw;
        highlights[j] = hw;
        midtones[j] = ClampUnit(1.0f - (sw + hw));
    }
    return true;
}

}  // namespace vt
