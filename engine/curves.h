// The curve builders: stored control points (or a sampled curve) become dense 16,385-entry tables
// over [0, 1], and the four luma-range numbers become the shadows, midtones and highlights weights.
// They run only inside the lookup rebuild, on the rebuilding thread.
#pragma once

#include <cstddef>
#include <cstdint>

#include "engine/correction_settings.h"

namespace vt {

inline constexpr int kLookupSteps = 16384;
inline constexpr int kLookupSize = kLookupSteps + 1;  // entry i stands for level i / 16384
inline constexpr int kCurveArraySamples = 32768;      // twice the table resolution
inline constexpr size_t kCurveArrayFloats = static_cast<size_t>(kCurveArraySamples) * 4;

// Rows b0..b3 of the basis polynomials; each row holds the coefficients of t^3, t^2, t, 1.
extern const float kCatmullRomMatrix[16];
extern const float kHermiteMatrix[16];

// Fills curveArray (32,768 samples of four floats) with the basis polynomials at t = k / 32768.
void BuildBasisSamples(const float matrix[16], float* curveArray);

// Builds the table of a stored curve. Returns false (after telling the user) when the working
// memory is missing; table is then left as it was.
bool BuildCurveTable(const CurveRecord& curve, float* table);

// Builds the three luma-range weight tables from the shadows point and softness and the highlights
// point and softness. Returns false (after telling the user) when the working memory is missing;
// the tables are then left as they were.
bool HCurve(float shadowsPoint, float shadowsSoftness, float highlightsPoint, float highlightsSoftness,
            float* shadows, float* midtones, float* highlights);

}  // namespace vt
