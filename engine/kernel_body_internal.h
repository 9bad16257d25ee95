// The pixel kernel's body: the fourteen stages in their fixed order, each gated by its flag, over
// blocks of lane groups. Included once per processor target (see kernel_simd_internal.h); reads only
// EngineParams and the tables, allocates nothing and takes no locks.
//
// Weighted sums over the three luma ranges are gathered before they are applied (Σ W c_r = c Σ W_r,
// and likewise for rotations and extrapolated lookups), so each range-weighted stage costs about
// what one range would; the results equal the per-range sums up to float rounding.
//
// Where a formula divides by a pixel's luma or by a limit (highlight compression, soft and hard clip,
// the composite limits) the division happens only where the divisor is non-zero; elsewhere the
// pixel passes unchanged. Every table index comes from a value clamped to [0, 1] with NaN sent to 0.
//
// Table reads dominate the cost, so the rebuild prepares fewer of them: tables read three at one
// level come packed side by side (one load per pixel), and the per-channel chain of the Master
// ranges and the tone curves comes composed into one table per colour. Both give exactly what the
// separate reads give.
#pragma once

#include "engine/engine_params.h"
#include "engine/kernel_paths_internal.h"
#include "engine/kernel_simd_internal.h"

namespace vt {
namespace VT_KERNEL_NS {
namespace {

// Hue wheels are stored Master, Shadows, Midtones, Highlights.
constexpr int kWheelIndexMaster = 0;
constexpr int kWheelIndexShadows = 1;
constexpr int kWheelIndexMidtones = 2;
constexpr int kWheelIndexHighlights = 3;

struct Pixel {
    F r, g, b;
};

struct Yuv {
    F y, u, v;
};

// The pixel's luma-range weights, indexed by stored range (1 Highlights, 2 Midtones, 3 Shadows),
// and their sum.
struct Weights {
    F w[4];
    F sum;
};

inline F Luma(const Pixel& p) { return Splat(0.299f) * p.r + Splat(0.587f) * p.g + Splat(0.114f) * p.b; }

inline Yuv ToYuv(const Pixel& p) {
    return {Luma(p), Splat(-0.147407f) * p.r - Splat(0.289391f) * p.g + Splat(0.436798f) * p.b,
            Splat(0.614777f) * p.r - Splat(0.514799f) * p.g - Splat(0.099978f) * p.b};
}

inline Pixel FromYuv(F y, F u, F v) {
    return {y + Splat(1.140251f) * v, y - Splat(0.393931f) * u - Splat(0.580809f) * v, y + Splat(2.028398f) * u};
}

inline Pixel SelectPixel(M m, const Pixel& a, const Pixel& b) {
    return {Select(m, a.r, b.r), Select(m, a.g, b.g), Select(m, a.b, b.b)};
}

inline Pixel Scale(const Pixel& p, F f) { return {p.r * f, p.g * f, p.b * f}; }

// [0, 1] with NaN sent to 0.
inline F ClampUnit(F v) { return Min(Max(v, Splat(0.0f)), Splat(1.0f)); }

inline I IndexOf(F v) { return ToIndex(ClampUnit(v)); }

// Truncating lookup up to level 1, the end value plus the end slope beyond it. Branch-free: in
// ordinary footage some lanes of most groups lie above 1, in no predictable way.
inline F LookupExtrapolated(const ExtrapolatedTable& t, F v) {
    const F inside = Gather(t.table, IndexOf(v));
    return Select(v > Splat(1.0f), v * Splat(t.slope) + Splat(t.base), inside);
}

// Σ W_r L_r(v) over Highlights, Midtones and Shadows, for tables read at the same level: packed
// holds their entries side by side, hi, mid and sh their end values and slopes.
inline F WeightedLookup(const float* packed, const ExtrapolatedTable& hi, const ExtrapolatedTable& mid,
                        const ExtrapolatedTable& sh, const Weights& w, F v) {
    const Quad t = GatherPacked(packed, IndexOf(v));
    const F inside = w.w[1] * t.v[0] + w.w[2] * t.v[1] + w.w[3] * t.v[2];
    // Lanes above 1 are rare in most footage: the extrapolation is worked out only when one is there.
    const M above = v > Splat(1.0f);
    if (!Any(above)) return inside;
    const F slope = w.w[1] * Splat(hi.slope) + w.w[2] * Splat(mid.slope) + w.w[3] * Splat(sh.slope);
    const F base = w.w[1] * Splat(hi.base) + w.w[2] * Splat(mid.base) + w.w[3] * Splat(sh.base);
    return Select(above, v * slope + base, inside);
}

inline F WeightedSum(const Weights& w, const float* values) {
    return w.w[1] * Splat(values[1]) + w.w[2] * Splat(values[2]) + w.w[3] * Splat(values[3]);
}

// HSL saturation. Grey pixels, pixels with L <= 0 and pixels whose max + min is exactly 2 (where the
// upper formula would divide by zero) have saturation 0.
inline F HslSaturation(F mx, F mn) {
    const F sum = mx + mn;
    const M low = sum <= Splat(1.0f);  // L <= 0.5
    const F denominator = Select(low, sum, Splat(2.0f) - sum);
    const M zero = (mx == mn) | (sum <= Splat(0.0f)) | (denominator == Splat(0.0f));
    return Select(zero, Splat(0.0f), (mx - mn) / Select(zero, Splat(1.0f), denominator));
}

inline F MaxOf(const Pixel& p) { return Max(Max(p.r, p.g), p.b); }
inline F MinOf(const Pixel& p) { return Min(Min(p.r, p.g), p.b); }

// The vibrance cap: 2.1 for a grey pixel, 1 for a fully saturated one.
inline F VibranceCap(const Pixel& p) {
    return Splat(2.1f) - Splat(1.1f) * HslSaturation(MaxOf(p), MinOf(p));
}

inline Pixel LoadPixel(const KernelPlanes& planes, size_t i) {
    return {Load(planes.source[0] + i), Load(planes.source[1] + i), Load(planes.source[2] + i)};
}

// Three gathers rather than one packed read: every later stage waits for the weights, and a packed
// read (indices through memory, loads, a transpose) takes longer to arrive (measured).
inline Weights RangeWeights(const EngineParams& p, const Pixel& px) {
    const I index = IndexOf(Luma(px));
    Weights w;
    w.w[0] = Splat(0.0f);
    w.w[1] = Gather(p.weightHighlights, index);
    w.w[2] = Gather(p.weightMidtones, index);
    w.w[3] = Gather(p.weightShadows, index);
    w.sum = w.w[1] + w.w[2] + w.w[3];
    return w;
}

inline void ApplyAutoCompression(const EngineParams& p, Pixel& px) {
    const F y = Luma(px);
    const F knee = Splat(p.autoKnee);
    const M m = (y >= knee) & (y != Splat(0.0f));
    if (!Any(m)) return;
    const F f = ((y - knee) * Splat(0.5f) + knee) / Select(m, y, Splat(1.0f));
    px = SelectPixel(m, Scale(px, f), px);
}

inline void ApplyLevelsInput(const EngineParams& p, Pixel& px) {
    px = {px.r * Splat(p.levelsSlope[0]) + Splat(p.levelsOffset[0]),
          px.g * Splat(p.levelsSlope[1]) + Splat(p.levelsOffset[1]),
          px.b * Splat(p.levelsSlope[2]) + Splat(p.levelsOffset[2])};
    if (p.flags.levelsGamma) {
        px = {LookupExtrapolated(p.levels[0], px.r), LookupExtrapolated(p.levels[1], px.g),
              LookupExtrapolated(p.levels[2], px.b)};
    }
}

// c <- c f + Y (weight - f) for every channel: saturation and vibrance, weighted or not.
inline Pixel MixWithLuma(const Pixel& px, F f, F lumaPart) {
    return {px.r * f + lumaPart, px.g * f + lumaPart, px.b * f + lumaPart};
}

// Each sub-step runs over the whole block before the next begins (see CorrectBlock).
inline void ApplyTonalRanges(const EngineParams& p, const Weights* w, Pixel* px, int n) {
    const StageFlags& f = p.flags;
    if (f.tonalHueRotation) {
        for (int g = 0; g < n; ++g) {
            const Yuv yuv = ToYuv(px[g]);
            const F cs = WeightedSum(w[g], p.tonalCos);
            const F sn = WeightedSum(w[g], p.tonalSin);
            px[g] = FromYuv(yuv.y * w[g].sum, yuv.u * cs - yuv.v * sn, yuv.u * sn + yuv.v * cs);
        }
    }
    if (f.tonalGain) {
        for (int g = 0; g < n; ++g) px[g] = Scale(px[g], WeightedSum(w[g], p.tonalGain));
    }
    if (f.tonalPedestal) {
        for (int g = 0; g < n; ++g) {
            const F pedestal = WeightedSum(w[g], p.tonalPedestal);
            px[g] = {px[g].r + pedestal, px[g].g + pedestal, px[g].b + pedestal};
        }
    }
    if (f.tonalCurve) {
        for (int g = 0; g < n; ++g) {
            px[g] = {WeightedLookup(p.tonalPacked, p.tonal[1], p.tonal[2], p.tonal[3], w[g], px[g].r),
                     WeightedLookup(p.tonalPacked, p.tonal[1], p.tonal[2], p.tonal[3], w[g], px[g].g),
                     WeightedLookup(p.tonalPacked, p.tonal[1], p.tonal[2], p.tonal[3], w[g], px[g].b)};
        }
    }
    if (f.tonalSaturation) {
        for (int g = 0; g < n; ++g) {
            const F s = WeightedSum(w[g], p.tonalSaturation);
            px[g] = MixWithLuma(px[g], s, Luma(px[g]) * (w[g].sum - s));
        }
    }
    if (f.tonalVibrance) {
        for (int g = 0; g < n; ++g) {
            const F cap = VibranceCap(px[g]);
            const F factor = w[g].w[1] * Min(Splat(p.tonalVibrance[1]), cap) +
                             w[g].w[2] * Min(Splat(p.tonalVibrance[2]), cap) +
                             w[g].w[3] * Min(Splat(p.tonalVibrance[3]), cap);
            px[g] = MixWithLuma(px[g], factor, Luma(px[g]) * (w[g].sum - factor));
        }
    }
}

inline void ApplyTonalMaster(const EngineParams& p, Pixel* px, int n) {
    const StageFlags& f = p.flags;
    if (f.masterHueRotation) {
        const F cs = Splat(p.tonalCos[0]);
        const F sn = Splat(p.tonalSin[0]);
        for (int g = 0; g < n; ++g) {
            const Yuv yuv = ToYuv(px[g]);
            px[g] = FromYuv(yuv.y, yuv.u * cs - yuv.v * sn, yuv.u * sn + yuv.v * cs);
        }
    }
    const F gain = Splat(p.tonalGain[0]);
    const F pedestal = Splat(p.tonalPedestal[0]);
    for (int g = 0; g < n; ++g) px[g] = {px[g].r * gain + pedestal, px[g].g * gain + pedestal, px[g].b * gain + pedestal};
    if (f.masterCurve) {
        const ExtrapolatedTable& t = p.tonal[0];
        for (int g = 0; g < n; ++g) {
            px[g] = {LookupExtrapolated(t, px[g].r), LookupExtrapolated(t, px[g].g), LookupExtrapolated(t, px[g].b)};
        }
    }
    if (f.masterSaturation) {
        for (int g = 0; g < n; ++g) {
            px[g] = MixWithLuma(px[g], Splat(p.tonalSaturation[0]), Luma(px[g]) * Splat(p.tonalDesaturation[0]));
        }
    }
    if (f.masterVibrance) {
        for (int g = 0; g < n; ++g) {
            const F factor = Min(Splat(p.tonalVibrance[0]), VibranceCap(px[g]));
            px[g] = MixWithLuma(px[g], factor, Luma(px[g]) * (Splat(1.0f) - factor));
        }
    }
}

inline void PullTowardsWheel(const EngineParams& p, int wheel, F weight, F& u, F& v) {
    if (!p.flags.wheelActive[wheel]) return;
    const F t = Splat(p.wheelGain[wheel]) * weight;
    u = u + (Splat(p.wheelU[wheel]) - u) * t;
    v = v + (Splat(p.wheelV[wheel]) - v) * t;
}

inline void ApplyHueWheels(const EngineParams& p, const Weights& w, Pixel& px) {
    Yuv yuv = ToYuv(px);
    PullTowardsWheel(p, kWheelIndexShadows, w.w[3], yuv.u, yuv.v);
    PullTowardsWheel(p, kWheelIndexMidtones, w.w[2], yuv.u, yuv.v);
    PullTowardsWheel(p, kWheelIndexHighlights, w.w[1], yuv.u, yuv.v);
    PullTowardsWheel(p, kWheelIndexMaster, Splat(1.0f), yuv.u, yuv.v);
    px = FromYuv(yuv.y, yuv.u, yuv.v);
}

inline F SetRangesChannel(const EngineParams& p, int set, int c, const Weights& w, F v) {
    const F gain = w.w[1] * Splat(p.setGain[set][1][c]) + w.w[2] * Splat(p.setGain[set][2][c]) +
                   w.w[3] * Splat(p.setGain[set][3][c]);
    const F pedestal = w.w[1] * Splat(p.setPedestal[set][1][c]) + w.w[2] * Splat(p.setPedestal[set][2][c]) +
                       w.w[3] * Splat(p.setPedestal[set][3][c]);
    v = v * gain + pedestal;
    if (!p.flags.setRangesGamma[set]) return v;
    return WeightedLookup(p.setGammaPacked[set][c], p.setGamma[set][1][c], p.setGamma[set][2][c], p.setGamma[set][3][c],
                          w, v);
}

inline void ApplyChannelSetRanges(const EngineParams& p, const Weights* w, Pixel* px, int n) {
    for (int set = 0; set < kChannelSetCount; ++set) {
        if (!p.flags.setRanges[set]) continue;
        for (int g = 0; g < n; ++g) {
            px[g] = {SetRangesChannel(p, set, 0, w[g], px[g].r), SetRangesChannel(p, set, 1, w[g], px[g].g),
                     SetRangesChannel(p, set, 2, w[g], px[g].b)};
        }
    }
}

inline F SetMasterAffine(const EngineParams& p, int set, int c, F v) {
    return v * Splat(p.setGain[set][0][c]) + Splat(p.setPedestal[set][0][c]);
}

// The per-channel chain after the range sets: RGB Master gain, pedestal and gamma, the same of the
// second set, the tone curve. Runs from step `from` (channelTail's numbering) on, step by step.
inline F ChannelTailSteps(const EngineParams& p, int c, F v, int from) {
    const StageFlags& f = p.flags;
    if (from <= 1 && f.setMasterGamma[kSetRgb]) v = LookupExtrapolated(p.setGamma[kSetRgb][0][c], v);
    if (from <= 2) {
        if (from == 1 && f.setMaster[kSetSecond]) v = SetMasterAffine(p, kSetSecond, c, v);
        if (f.setMasterGamma[kSetSecond]) v = LookupExtrapolated(p.setGamma[kSetSecond][0][c], v);
    }
    if (f.toneCurves) v = LookupExtrapolated(p.toneCurve[c], v);
    return v;
}

// The composed table serves every level up to 1; lanes above 1 take the chain step by step.
inline F ChannelTailLookup(const EngineParams& p, int c, F v) {
    const F inside = Gather(p.channelTail[c], IndexOf(v));
    const M above = v > Splat(1.0f);
    if (!Any(above)) return inside;
    return Select(above, ChannelTailSteps(p, c, v, p.flags.channelTail), inside);
}

inline void ApplyChannelTail(const EngineParams& p, Pixel* px, int n) {
    const StageFlags& f = p.flags;
    // Gains and pedestals ahead of the first table.
    for (int set = 0; set < kChannelSetCount; ++set) {
        if (!f.setMaster[set] || (set == kSetSecond && f.channelTail == 1)) continue;
        for (int g = 0; g < n; ++g) {
            px[g] = {SetMasterAffine(p, set, 0, px[g].r), SetMasterAffine(p, set, 1, px[g].g),
                     SetMasterAffine(p, set, 2, px[g].b)};
        }
    }
    if (f.channelTailComposed) {
        for (int g = 0; g < n; ++g) {
            px[g] = {ChannelTailLookup(p, 0, px[g].r), ChannelTailLookup(p, 1, px[g].g),
                     ChannelTailLookup(p, 2, px[g].b)};
        }
    } else if (f.channelTail != 0) {
        const int from = f.channelTail;
        for (int g = 0; g < n; ++g) {
            px[g] = {ChannelTailSteps(p, 0, px[g].r, from), ChannelTailSteps(p, 1, px[g].g, from),
                     ChannelTailSteps(p, 2, px[g].b, from)};
        }
    }
}

// One channel of HSL to RGB: t wraps once into [0, 1], then the piecewise hue function.
inline F HueChannel(F p, F qp, F q, F t) {
    t = Select(t < Splat(0.0f), t + Splat(1.0f), Select(t > Splat(1.0f), t - Splat(1.0f), t));
    const F six = Splat(6.0f) * t;
    const F rising = p + qp * six;
    const F falling = p + qp * (Splat(4.0f) - six);  // (2/3 - t) 6
    return Select(six < Splat(1.0f), rising, Select(six < Splat(3.0f), q, Select(six < Splat(4.0f), falling, p)));
}

inline void ApplyHueCurves(const EngineParams& p, Pixel& px) {
    const F mx = MaxOf(px);
    const F mn = MinOf(px);
    const F lightness = (mx + mn) * Splat(0.5f);
    const F saturation = HslSaturation(mx, mn);
    const M grey = mx == mn;
    const F inverseD = Splat(1.0f) / Select(grey, Splat(1.0f), mx - mn);
    F hr = (px.g - px.b) * inverseD + Splat(6.0f);
    hr = Select(hr >= Splat(6.0f), hr - Splat(6.0f), hr);
    const F hg = (px.b - px.r) * inverseD + Splat(2.0f);
    const F hb = (px.r - px.g) * inverseD + Splat(4.0f);
    const M redMax = px.r == mx;
    const M greenMax = AndNot(px.g == mx, redMax);
    const F sector = Select(redMax, hr, Select(greenMax, hg, hb));
    const F hue = Select(grey, Splat(0.0f), sector * Splat(1.0f / 6.0f));

    // The curves are drawn from cyan to cyan: position 0.5 is red.
    F position = hue + Splat(0.5f);
    position = Select(position > Splat(1.0f), position - Splat(1.0f), position);
    const Quad curve = GatherPacked(p.huePacked, IndexOf(position));
    const F h2 = hue + curve.v[0];
    const F s2 = saturation * curve.v[1];
    const F l2 = lightness * curve.v[2];

    const F q = Select(l2 < Splat(0.5f), (s2 + Splat(1.0f)) * l2, l2 + s2 - l2 * s2);
    const F pp = Splat(2.0f) * l2 - q;
    const F qp = q - pp;
    const Pixel coloured{HueChannel(pp, qp, q, h2 + Splat(1.0f / 3.0f)), HueChannel(pp, qp, q, h2),
                         HueChannel(pp, qp, q, h2 - Splat(1.0f / 3.0f))};
    px = SelectPixel(s2 == Splat(0.0f), Pixel{l2, l2, l2}, coloured);
}

inline void ApplyLevelsOutput(const EngineParams& p, Pixel& px) {
    px = {px.r * Splat(p.levelsRange[0]) + Splat(p.levelsOutputOffset[0]),
          px.g * Splat(p.levelsRange[1]) + Splat(p.levelsOutputOffset[1]),
          px.b * Splat(p.levelsRange[2]) + Splat(p.levelsOutputOffset[2])};
}

inline F SecondaryKey(const SecondaryParams& s, const Yuv& yuv) {
    const F inverseSoftness2 = Splat(s.inverseSoftness2);
    F key = Splat(0.0f);
    for (int j = 0; j < 4; ++j) {
        if (!s.referenceEnable[j]) continue;
        const F du = Splat(s.referenceU[j]) - yuv.u;
        const F dv = Splat(s.referenceV[j]) - yuv.v;
        const F chroma = ClampUnit(Splat(s.chromaKeyBase) - (du * du + dv * dv) * inverseSoftness2);
        const F luma = ClampUnit(Splat(s.lumaKeyBase) - Abs(Splat(s.referenceY[j]) - yuv.y) * inverseSoftness2);
        key = Max(key, chroma * luma);
    }
    return key;
}

inline void ApplySecondary(const EngineParams& p, int k, Pixel& px) {
    const SecondaryParams& s = p.secondary[k];
    const Yuv yuv = ToYuv(px);
    const F key = SecondaryKey(s, yuv);

    Yuv corrected;
    Yuv uncorrected;
    switch (s.mode) {
        case 1:
            corrected = yuv;
            uncorrected = {yuv.y, Splat(0.0f), Splat(0.0f)};
            break;
        case 2:
            corrected = yuv;
            uncorrected = ToYuv(Pixel{Max(px.r, Splat(0.6825f)), Splat(0.6825f) * px.g, Splat(0.6825f) * px.b});
            break;
        case 3:
            corrected = {Splat(1.0f), Splat(0.0f), Splat(0.0f)};
            uncorrected = {Splat(0.0f), Splat(0.0f), Splat(0.0f)};
            break;
        default: {
            F y1 = yuv.y * Splat(s.gain) + Splat(s.pedestal);
            if (s.gammaActive) y1 = LookupExtrapolated(p.secondaryGamma[k], y1);
            const F cs = Splat(s.cosMix);
            const F sn = Splat(s.sinMix);
            corrected = {y1, yuv.u * cs - yuv.v * sn + Splat(s.shiftMixU), yuv.u * sn + yuv.v * cs + Splat(s.shiftMixV)};
            uncorrected = yuv;
            break;
        }
    }
    // Without inversion the key selects the corrected colour, with it the uncorrected one.
    const Yuv& from = s.invert ? corrected : uncorrected;
    const Yuv& to = s.invert ? uncorrected : corrected;
    px = FromYuv(from.y + (to.y - from.y) * key, from.u + (to.u - from.u) * key, from.v + (to.v - from.v) * key);
}

inline void ApplySecondaries(const EngineParams& p, Pixel* px, int n) {
    for (int k = 0; k < 6; ++k) {
        if (!p.flags.secondary[k]) continue;
        for (int g = 0; g < n; ++g) ApplySecondary(p, k, px[g]);
    }
}

// Scales the pixel by numerator / y where y reaches the level (and is not 0).
inline void ClipAt(Pixel& px, F y, M reached, F numerator) {
    const M m = reached & (y != Splat(0.0f));
    if (!Any(m)) return;
    px = SelectPixel(m, Scale(px, numerator / Select(m, y, Splat(1.0f))), px);
}

inline void ApplyCompositeLimit(const EngineParams& p, int side, Pixel& px) {
    const F zero = Splat(0.0f);
    const F one = Splat(1.0f);
    const F hundred = Splat(100.0f);
    const uint32_t method = p.limitMethod;
    const Yuv yuv = ToYuv(px);
    const F u = yuv.u * hundred;
    const F v = yuv.v * hundred;
    const F q = Sqrt(Max(u * u + v * v, one));
    const F limit = Splat(side == 0 ? p.compositeMax : p.compositeMin);
    // top = 100 Y + Q must stay below the upper limit, bottom = 100 Y - Q above the lower one.
    const F level = side == 0 ? hundred * yuv.y + q : hundred * yuv.y - q;
    const M outside = side == 0 ? level >= limit : level <= limit;
    if (!Any(outside)) return;
    if (p.flags.limiterPreview) {
        px = SelectPixel(outside, Pixel{zero, zero, zero}, px);
    } else if (method == 2) {
        const M m = outside & (level != zero);
        px = SelectPixel(m, Scale(px, limit / Select(m, level, one)), px);
    } else if (method == 1 || method == 3) {
        // The lower factor is bounded at 0 like the upper one, so the chroma of very dark pixels
        // is removed rather than inverted.
        const F excess = side == 0 ? level - limit : limit - level;
        const F share = (side == 0 && method == 3) ? Splat(0.4f) * excess : excess;
        const F f = Max((q - share) / q, zero) * Splat(0.01f);
        Pixel reduced = FromYuv(yuv.y, f * u, f * v);
        if (side == 0 && method == 3) {
            // Smart Limit also scales by the limit over the level; a zero level keeps the
            // reduced chroma unscaled.
            const M nonZero = level != zero;
            reduced = SelectPixel(nonZero, Scale(reduced, limit / Select(nonZero, level, one)), reduced);
        }
        px = SelectPixel(outside, reduced, px);
    }
}

inline void ApplyLimiter(const EngineParams& p, Pixel* px, int n) {
    if (p.flags.softClip) {
        const F knee = Splat(p.softKnee);
        for (int g = 0; g < n; ++g) {
            const F y = Luma(px[g]);
            ClipAt(px[g], y, y >= knee, (y - knee) * Splat(p.softRatio) + knee);
        }
    }
    const F hard = Splat(p.hardClip);
    for (int g = 0; g < n; ++g) {
        const F y = Luma(px[g]);
        ClipAt(px[g], y, y >= hard, hard);
    }
    for (int g = 0; g < n; ++g) ApplyCompositeLimit(p, 0, px[g]);
    for (int g = 0; g < n; ++g) ApplyCompositeLimit(p, 1, px[g]);
}

// Writes the corrected pixel and its luma; without kRgb only the luma (R, G and B are already in
// place).
template <bool kRgb>
inline void StorePixel(const KernelPlanes& planes, size_t i, const Pixel& px) {
    if constexpr (kRgb) {
        Store(planes.destination[0] + i, px.r);
        Store(planes.destination[1] + i, px.g);
        Store(planes.destination[2] + i, px.b);
    }
    Store(planes.destination[3] + i, Luma(px));
}

// Groups corrected together, stage by stage. One group's path through all stages is a single long
// dependency chain (table reads, divisions); running each stage over several independent groups
// lets the processor overlap them, and keeps each stage's coefficients at hand.
constexpr int kBlockGroups = 8;

inline void CorrectBlock(const EngineParams& p, Pixel* px, int n) {
    const StageFlags& f = p.flags;
    Weights w[kBlockGroups];
    if (f.rangeWeights) {
        for (int k = 0; k < n; ++k) w[k] = RangeWeights(p, px[k]);
    }
    if (f.autoCompress) {
        for (int k = 0; k < n; ++k) ApplyAutoCompression(p, px[k]);
    }
    if (f.levels) {
        for (int k = 0; k < n; ++k) ApplyLevelsInput(p, px[k]);
    }
    if (f.tonalRanges) {
        ApplyTonalRanges(p, w, px, n);
    }
    if (f.tonalMaster) {
        ApplyTonalMaster(p, px, n);
    }
    if (f.hueWheels) {
        for (int k = 0; k < n; ++k) ApplyHueWheels(p, w[k], px[k]);
    }
    if (f.setRanges[kSetRgb] || f.setRanges[kSetSecond]) {
        ApplyChannelSetRanges(p, w, px, n);
    }
    if (f.setMaster[kSetRgb] || f.setMaster[kSetSecond] || f.channelTail != 0) {
        ApplyChannelTail(p, px, n);
    }
    if (f.hueCurves) {
        for (int k = 0; k < n; ++k) ApplyHueCurves(p, px[k]);
    }
    if (f.levels) {
        for (int k = 0; k < n; ++k) ApplyLevelsOutput(p, px[k]);
    }
    if (f.secondaries) {
        ApplySecondaries(p, px, n);
    }
    if (f.limiter) {
        ApplyLimiter(p, px, n);
    }
}

// One pass over the planes: whole blocks, whole groups, then the last few floats of a plane whose
// length is not a whole group through a padded group. Without kStages the pixels pass unchanged.
template <bool kStages, bool kRgb>
void PassOverPlanes(const EngineParams& p, const KernelPlanes& planes) {
    constexpr size_t kBlock = static_cast<size_t>(kLanes) * kBlockGroups;
    const size_t count = planes.count;
    const size_t fullBlocks = count - count % kBlock;
    Pixel px[kBlockGroups];
    for (size_t i = 0; i < fullBlocks; i += kBlock) {
        for (int k = 0; k < kBlockGroups; ++k) px[k] = LoadPixel(planes, i + static_cast<size_t>(k) * kLanes);
        if constexpr (kStages) CorrectBlock(p, px, kBlockGroups);
        for (int k = 0; k < kBlockGroups; ++k) StorePixel<kRgb>(planes, i + static_cast<size_t>(k) * kLanes, px[k]);
    }

    const size_t full = count - count % kLanes;
    const int groups = static_cast<int>((full - fullBlocks) / kLanes);
    const bool partial = full < count;
    if (groups == 0 && !partial) return;
    for (int k = 0; k < groups; ++k) px[k] = LoadPixel(planes, fullBlocks + static_cast<size_t>(k) * kLanes);
    if (partial) {
        float in[3][kLanes] = {};
        for (int c = 0; c < 3; ++c) {
            for (size_t l = 0; full + l < count; ++l) in[c][l] = planes.source[c][full + l];
        }
        const KernelPlanes padded{{in[0], in[1], in[2]}, {nullptr, nullptr, nullptr, nullptr}, kLanes};
        px[groups] = LoadPixel(padded, 0);
    }
    if constexpr (kStages) CorrectBlock(p, px, groups + (partial ? 1 : 0));
    for (int k = 0; k < groups; ++k) StorePixel<kRgb>(planes, fullBlocks + static_cast<size_t>(k) * kLanes, px[k]);
    if (partial) {
        float out[4][kLanes];
        const KernelPlanes padded{{nullptr, nullptr, nullptr}, {out[0], out[1], out[2], out[3]}, kLanes};
        StorePixel<true>(padded, 0, px[groups]);
        for (int c = kRgb ? 0 : 3; c < 4; ++c) {
            for (size_t l = 0; full + l < count; ++l) planes.destination[c][full + l] = out[c][l];
        }
    }
}

inline bool AnyStage(const StageFlags& f) {
    return f.autoCompress || f.levels || f.tonalRanges || f.tonalMaster || f.hueWheels || f.setRanges[kSetRgb] ||
           f.setRanges[kSetSecond] || f.setMaster[kSetRgb] || f.setMaster[kSetSecond] || f.channelTail || f.hueCurves ||
           f.secondaries || f.limiter;
}

}  // namespace

void CorrectPlanes(const EngineParams& params, const KernelPlanes& planes) {
    // A local copy of the block: nothing the loop stores can alias it, so its values may stay in
    // registers across groups.
    const EngineParams p = params;
    if (AnyStage(p.flags)) {
        PassOverPlanes<true, true>(p, planes);
        return;
    }
    // Nothing changes a pixel: only the luma plane is new, and in place (as the render runs) the
    // colour planes need not be written again.
    const bool inPlace = planes.source[0] == planes.destination[0] && planes.source[1] == planes.destination[1] &&
                         planes.source[2] == planes.destination[2];
    if (inPlace) {
        PassOverPlanes<false, false>(p, planes);
    } else {
        PassOverPlanes<false, true>(p, planes);
    }
}

}  // namespace VT_KERNEL_NS
}  // namespace vt
