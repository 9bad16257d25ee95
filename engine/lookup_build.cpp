// The lookup rebuild, the only writer of EngineParams and the tables. Every decision that depends
// on the settings is made here once per change (stage flags, reciprocals, sines and cosines, end
// values and slopes, the third channel set folded into the RGB set, tables packed and composed for
// fewer reads per pixel), so the kernel only indexes.
// The published set is owned here and swapped atomically; the render serialisation (renderLock or
// entryLock) keeps rebuilds one at a time, the atomic pointer keeps readers on a whole set.
#include "engine/lookup_build.h"

#include <atomic>
#include <cmath>
#include <cstring>
#include <new>

#include "engine/curves.h"
#include "engine/engine_memory.h"
#include "engine/kernel_paths_internal.h"
#include "files/preferences.h"
#include "platform/ui.h"

namespace vt {

namespace {

constexpr char kCalcArrayMessage[] = "Insufficient memory for calcArray during parameter update";
constexpr char kMasterLookupMessage[] = "Insufficient memory for masterLookup during parameter update";

constexpr float kLevelStep = 1.0f / kLookupSteps;
constexpr float kDegreesToRadians = 0.01745329f;
constexpr float kTinyDifference = 1e-9f;     // stands in for a zero levels difference
constexpr float kSteepMidpoint = 1e6f;       // exponent of a midpoint at or beyond the white point
constexpr float kHardKeyInverse = 1e30f;     // 1 / softness^2 for a zero softness: a hard key edge

// The tables packed four floats per level for the kernel (EngineParams), in their order.
enum PackedTable : int {
    kPackedTonal = 0,
    kPackedHue,
    kPackedSetGamma,  // [set][colour]
    kPackedCount = kPackedSetGamma + kChannelSetCount * kColourCount,
};

// Every table of a set lives in one block, at these slots of kLookupSize floats.
enum TableSlot : int {
    kSlotWeightShadows = 0,
    kSlotWeightMidtones,
    kSlotWeightHighlights,
    kSlotTonal,                      // 4, by stored range
    kSlotSetGamma = kSlotTonal + 4,  // [set][range][colour]
    kSlotToneCurve = kSlotSetGamma + kChannelSetCount * 4 * kColourCount,
    kSlotHueShift = kSlotToneCurve + kColourCount,
    kSlotHueSaturation,
    kSlotHueLuma,
    kSlotLevels,                                               // by colour
    kSlotSecondaryGamma = kSlotLevels + kColourCount,          // by record
    kSlotChannelTail = kSlotSecondaryGamma + kSecondaryCount,  // by colour
    kSlotPacked = kSlotChannelTail + kColourCount,             // four slots per packed table
    kSlotCount = kSlotPacked + 4 * kPackedCount,
};

// The published set. Written by Update (one at a time, under the render serialisation), read by
// every render through CurrentEngineSet.
std::atomic<std::shared_ptr<const EngineSet>> g_published;
std::atomic<uint64_t> g_rebuildCount{0};

inline bool AnyOf(const bool (&values)[kRangeCount], int first, int last) {
    for (int r = first; r <= last; ++r) {
        if (values[r]) return true;
    }
    return false;
}

inline float NanSafeMax0(float v) { return v > 0.0f ? v : 0.0f; }

ExtrapolatedTable Extrapolated(const float* table, float end, float slope) { return {table, end, slope, end - slope}; }

// End value T[16383]; slope over the last eight steps.
ExtrapolatedTable WithEnds(const float* table) {
    return Extrapolated(table, table[kLookupSteps - 1], (table[kLookupSteps - 1] - table[kLookupSteps - 9]) * 2048.0f);
}

// Tone curves take their slope over the last 1/128 of the range.
ExtrapolatedTable WithToneCurveEnds(const float* table) {
    return Extrapolated(table, table[kLookupSteps - 1], (table[kLookupSteps] - table[kLookupSteps - 128]) * 128.0f);
}

// T[i] = (i / 16384)^exponent through the shared log2 of each level in log2Level.
void FillPowerTable(float* table, double exponent, const float* log2Level) {
    if (exponent == 1.0) {
        for (int i = 0; i < kLookupSize; ++i) table[i] = static_cast<float>(i) * kLevelStep;
        return;
    }
    table[0] = static_cast<float>(std::pow(0.0, exponent));
    for (int i = 1; i < kLookupSteps; ++i) table[i] = std::exp2(static_cast<float>(exponent * log2Level[i]));
    table[kLookupSteps] = 1.0f;
}

// The chroma direction of a fully saturated hue at half lightness, as 16-bit HSL gives it.
void WheelChromaPoint(float angleDegrees, float* u, float* v) {
    // Angles outside one turn wrap; a non-finite angle counts as 0 (a 16-bit hue cannot hold it).
    double a = std::isfinite(angleDegrees) ? std::fmod(static_cast<double>(angleDegrees), 360.0) : 0.0;
    if (a < 0.0) a += 360.0;
    const uint32_t hue16 = static_cast<uint32_t>(65535.0 * (360.0 - a) / 360.0);
    const double h = hue16 / 65535.0;
    const double l = 32767.0 / 65535.0;
    const double q = l < 0.5 ? l * 2.0 : l + 1.0 - l;
    const double p = 2.0 * l - q;
    auto channel = [&](double t) {
        if (t < 0.0) t += 1.0;
        if (t > 1.0) t -= 1.0;
        double value;
        if (6.0 * t < 1.0) {
            value = p + (q - p) * 6.0 * t;
        } else if (2.0 * t < 1.0) {
            value = q;
        } else if (3.0 * t < 2.0) {
            value = p + (q - p) * (2.0 / 3.0 - t) * 6.0;
        } else {
            value = p;
        }
        double scaled = value * 65535.0 + 1e-7;  // exact 16-bit results must not truncate one below
        if (scaled < 0.0) scaled = 0.0;
        if (scaled > 65535.0) scaled = 65535.0;
        return static_cast<float>(static_cast<uint32_t>(scaled) / 65535.0);
    };
    const float r = channel(h + 1.0 / 3.0);
    const float g = channel(h);
    const float b = channel(h - 1.0 / 3.0);
    *u = -0.147407f * r - 0.289391f * g + 0.436798f * b;
    *v = 0.614777f * r - 0.514799f * g - 0.099978f * b;
}

float VibranceFactor(float v) { return v >= 0.0f ? 1.0f + v / 100.0f : ((v + 100.0f) * 0.63f + 37.0f) / 100.0f; }

// The contrast curve around 0.5; exponents are bounded so that no setting divides by zero or
// raises 0 to a negative power: Contrast below -100 flattens like -100, above 100 steps like 100.
double ContrastExponent(float c) {
    if (c < 0.0f) return c > -1.0f ? 1.0 + c : 0.0;
    if (c < 1.0f) return 1.0 / (1.0 - c);
    return 127.0;
}

double ContrastCurve(double u, double exponent) {
    double m = u <= 0.5 ? u : 1.0 - u;
    if (!(m > 0.0)) m = 0.0;
    double y = exponent == 1.0 ? m : 0.5 * std::pow(2.0 * m, exponent);
    return u > 0.5 ? 1.0 - y : y;
}

bool TonalCurveActive(const TonalRange& t) {
    return t.contrast != 0.0f || t.contrastCenter != 0.5f || t.gamma != 1.0f || t.brightness != 0.0f;
}

class Builder {
public:
    Builder(const CorrectionSettings& work, const EffectiveFlags& effective, EngineSet* set, const EngineSet* previous,
            const float* log2Level)
        : m_work(work), m_effective(effective), m_set(set), m_p(set->params), m_previous(previous),
          m_log2Level(log2Level) {}

    void Run() {
        PointTables();
        ComputeStageFlags();
        TonalScalars();
        TonalTables();
        HueWheels();
        ChannelSets();
        ToneCurves();
        HueCurves();
        LumaRanges();
        Levels();
        Secondaries();
        Limiter();
        if (m_work.autoCorrectA != 0.0f) m_p.autoKnee = 1.0f - 0.4f * m_work.autoCorrectA;
        ChannelTail();
        PackTables();
    }

private:
    float* Slot(int slot) { return m_set->storage.get() + static_cast<size_t>(slot) * kLookupSize; }
    float* PackedSlot(int packed) { return Slot(kSlotPacked + 4 * packed); }

    // The contents a table had in the previous set, for a builder that ran out of memory; without a
    // previous set, fill() writes a neutral table.
    template <class Fill>
    void KeepPrevious(int slot, Fill fill) {
        if (m_previous != nullptr) {
            std::memcpy(Slot(slot), m_previous->storage.get() + static_cast<size_t>(slot) * kLookupSize,
                        sizeof(float) * kLookupSize);
        } else {
            fill(Slot(slot));
        }
    }

    void PointTables() {
        m_p.weightShadows = Slot(kSlotWeightShadows);
        m_p.weightMidtones = Slot(kSlotWeightMidtones);
        m_p.weightHighlights = Slot(kSlotWeightHighlights);
        for (int r = 0; r < 4; ++r) m_p.tonal[r].table = Slot(kSlotTonal + r);
        for (int s = 0; s < kChannelSetCount; ++s) {
            for (int r = 0; r < 4; ++r) {
                for (int c = 0; c < kColourCount; ++c) m_p.setGamma[s][r][c].table = Slot(SetSlot(s, r, c));
            }
        }
        for (int c = 0; c < kColourCount; ++c) {
            m_p.toneCurve[c].table = Slot(kSlotToneCurve + c);
            m_p.levels[c].table = Slot(kSlotLevels + c);
        }
        m_p.hueShift = Slot(kSlotHueShift);
        m_p.hueSaturation = Slot(kSlotHueSaturation);
        m_p.hueLuma = Slot(kSlotHueLuma);
        for (int k = 0; k < kSecondaryCount; ++k) m_p.secondaryGamma[k].table = Slot(kSlotSecondaryGamma + k);
        for (int c = 0; c < kColourCount; ++c) m_p.channelTail[c] = Slot(kSlotChannelTail + c);
        m_p.tonalPacked = PackedSlot(kPackedTonal);
        m_p.huePacked = PackedSlot(kPackedHue);
        for (int s = 0; s < kChannelSetCount; ++s) {
            for (int c = 0; c < kColourCount; ++c) m_p.setGammaPacked[s][c] = PackedSlot(PackedSetSlot(s, c));
        }
    }

    static int SetSlot(int set, int range, int colour) { return kSlotSetGamma + (set * 4 + range) * kColourCount + colour; }
    static int PackedSetSlot(int set, int colour) { return kPackedSetGamma + set * kColourCount + colour; }

    const ChannelSet& SetOf(int set) const { return set == kSetRgb ? m_work.rgbSet : m_work.secondSet; }

    bool SetRangeEffective(int set, int range) const {
        return set == kSetRgb ? m_effective.rgbRange[range] || m_effective.thirdSetRange[range]
                              : m_effective.secondSetRange[range];
    }

    bool RangeHasGamma(int set, int range) const {
        for (int c = 0; c < kChannelCount; ++c) {
            if (SetOf(set).range[range].channel[c].gamma != 1.0f) return true;
            if (set == kSetRgb && m_work.thirdSet.range[range].channel[c].gamma != 1.0f) return true;
        }
        return false;
    }

    void ComputeStageFlags() {
        vt::StageFlags& f = m_p.flags;
        const CorrectionSettings& w = m_work;
        f.tonalRanges = AnyOf(m_effective.tonalRange, kRangeHighlights, kRangeShadows);
        if (f.tonalRanges) {
            for (int r = kRangeHighlights; r <= kRangeShadows; ++r) {
                const TonalRange& t = w.tonal[r];
                f.tonalHueRotation |= t.hue != 0.0f;
                f.tonalGain |= t.gain != 1.0f;
                f.tonalPedestal |= t.pedestal != 0.0f;
                f.tonalCurve |= TonalCurveActive(t);
                f.tonalSaturation |= t.saturation != 100.0f;
                f.tonalVibrance |= VibranceFactor(t.vibrance) != 1.0f;
            }
        }
        f.tonalMaster = m_effective.tonalRange[kRangeMaster];
        if (f.tonalMaster) {
            const TonalRange& t = w.tonal[kRangeMaster];
            f.masterHueRotation = t.hue != 0.0f;
            f.masterCurve = TonalCurveActive(t);
            f.masterSaturation = t.saturation != 100.0f;
            f.masterVibrance = VibranceFactor(t.vibrance) != 1.0f;
        }
        f.hueWheels = m_effective.hueWheels;
        for (int k = 0; k < kHueWheelCount; ++k) f.wheelActive[k] = f.hueWheels && w.hueWheels[k].amount != 0.0f;

        for (int s = 0; s < kChannelSetCount; ++s) {
            for (int r = kRangeHighlights; r <= kRangeShadows; ++r) {
                if (!SetRangeEffective(s, r)) continue;
                f.setRanges[s] = 1;
                if (RangeHasGamma(s, r)) f.setRangesGamma[s] = 1;
            }
            f.setMaster[s] = SetRangeEffective(s, kRangeMaster);
            f.setMasterGamma[s] = f.setMaster[s] && RangeHasGamma(s, kRangeMaster);
        }
        f.rgbRangesPresent = f.setRanges[kSetRgb];

        // The levels section enable is copied; a section without enabled groups holds identity values.
        f.levels = w.levelsEnable != 0;
        if (f.levels) {
            for (int g = 0; g < 4; ++g) f.levelsGamma |= w.levels[g].group.inputMidpoint != 0.5f;
        }
        // Auto highlight compression belongs to the levels: it works only while they are enabled.
        f.autoCompress = f.levels && w.autoCorrectA != 0.0f;
        f.toneCurves = m_effective.toneCurves;
        f.hueCurves = m_effective.hueCurves;
        f.lumaRanges = m_effective.lumaRanges;
        for (int k = 0; k < kSecondaryCount; ++k) {
            f.secondary[k] = m_effective.secondary[k];
            f.secondaries |= f.secondary[k];
        }
        f.limiter = m_effective.limiter;
        f.softClip = f.limiter && w.enableSoftClip != 0;
        f.limiterPreview = w.showLimiterPreview != 0;
        f.rangeWeights = f.tonalRanges || f.wheelActive[kWheelShadows] || f.wheelActive[kWheelMidtones] ||
                         f.wheelActive[kWheelHighlights] || f.setRanges[kSetRgb] || f.setRanges[kSetSecond];
    }

    void TonalScalars() {
        for (int r = 0; r < 4; ++r) {
            const TonalRange& t = m_work.tonal[r];
            const float theta = t.hue * kDegreesToRadians;
            m_p.tonalHue[r] = t.hue;
            m_p.tonalCos[r] = static_cast<float>(std::cos(static_cast<double>(theta)));
            m_p.tonalSin[r] = static_cast<float>(std::sin(static_cast<double>(theta)));
            m_p.tonalContrast[r] = t.contrast / 100.0f;
            m_p.tonalBrightness[r] = t.brightness / 200.0f;
            m_p.tonalInverseGamma[r] = 1.0f / t.gamma;
            m_p.tonalVibrance[r] = VibranceFactor(t.vibrance);
            m_p.tonalSaturation[r] = t.saturation / 100.0f;
            m_p.tonalDesaturation[r] = 1.0f - m_p.tonalSaturation[r];
            m_p.tonalGain[r] = t.gain;
            m_p.tonalPedestal[r] = t.pedestal;
            m_p.tonalOffset[r] = 0.5f - t.contrastCenter;
        }
    }

    // The four contrast curves are chained Master, Shadows, Midtones, Highlights: each range's
    // input is the previous range's contrast output, before brightness and gamma.
    void TonalTables() {
        static constexpr int kChain[4] = {kRangeMaster, kRangeShadows, kRangeMidtones, kRangeHighlights};
        double exponent[4];
        for (int r = 0; r < 4; ++r) exponent[r] = ContrastExponent(m_p.tonalContrast[r]);
        float* table[4];
        for (int r = 0; r < 4; ++r) table[r] = Slot(kSlotTonal + r);
        for (int i = 0; i < kLookupSize; ++i) {
            double y = static_cast<double>(static_cast<float>(i) * kLevelStep);
            for (int r : kChain) {
                y = ContrastCurve(y + m_p.tonalOffset[r], exponent[r]);
                const double b = m_p.tonalBrightness[r];
                // Brightness below -200 would make z negative and its power NaN; it stops at black.
                const float z = NanSafeMax0(static_cast<float>(b < 0.0 ? (b + 1.0) * y : (1.0 - y) * b + y));
                const float g = m_p.tonalInverseGamma[r];
                table[r][i] = g == 1.0f ? z : std::pow(z, g);
            }
        }
        for (int r = 0; r < 4; ++r) m_p.tonal[r] = WithEnds(table[r]);
    }

    void HueWheels() {
        for (int k = 0; k < kHueWheelCount; ++k) {
            WheelChromaPoint(m_work.hueWheels[k].angle, &m_p.wheelU[k], &m_p.wheelV[k]);
            m_p.wheelGain[k] = m_work.hueWheels[k].amount / 3.0f;
        }
    }

    // Gains multiply and pedestals add over the range's Master channel; the third set folds into the
    // RGB set the same way, so the kernel applies the two as one. Gammas compose too: every gamma of
    // the colour, its range's Master channel and (for the RGB set) the third set's matching two is
    // applied in turn, which is one power with the product of their reciprocals. At reset values
    // every factor is 1, so the tables are the identity.
    void ChannelSets() {
        for (int s = 0; s < kChannelSetCount; ++s) {
            const ChannelSet& cs = SetOf(s);
            for (int r = 0; r < 4; ++r) {
                const ChannelRange& range = cs.range[r];
                const ChannelRange& third = m_work.thirdSet.range[r];
                const bool buildGamma = (r == kRangeMaster) ? m_p.flags.setMasterGamma[s] : m_p.flags.setRangesGamma[s];
                for (int c = 0; c < kColourCount; ++c) {
                    const ChannelTriplet& colour = range.channel[1 + c];
                    const ChannelTriplet& master = range.channel[kChannelMaster];
                    float gain = colour.gain * master.gain;
                    float pedestal = colour.pedestal + master.pedestal;
                    double exponent = (1.0 / colour.gamma) * (1.0 / master.gamma);
                    if (s == kSetRgb) {
                        const ChannelTriplet& thirdColour = third.channel[1 + c];
                        const ChannelTriplet& thirdMaster = third.channel[kChannelMaster];
                        gain *= thirdColour.gain * thirdMaster.gain;
                        pedestal += thirdColour.pedestal + thirdMaster.pedestal;
                        exponent *= (1.0 / thirdColour.gamma) * (1.0 / thirdMaster.gamma);
                    }
                    m_p.setGain[s][r][c] = gain;
                    m_p.setPedestal[s][r][c] = pedestal;
                    if (buildGamma) {
                        float* t = Slot(SetSlot(s, r, c));
                        FillPowerTable(t, exponent, m_log2Level);
                        m_p.setGamma[s][r][c] = WithEnds(t);
                    }
                }
            }
        }
    }

    void ToneCurves() {
        if (!m_p.flags.toneCurves) return;
        auto keepAll = [&] {
            for (int c = 0; c < kColourCount; ++c) {
                KeepPrevious(kSlotToneCurve + c, [](float* t) {
                    for (int j = 0; j < kLookupSize; ++j) t[j] = static_cast<float>(j) * kLevelStep;
                });
                m_p.toneCurve[c] = WithToneCurveEnds(Slot(kSlotToneCurve + c));
            }
        };
        std::unique_ptr<float[]> masterLookup = AllocateFloats(kLookupSize, "masterLookup");
        if (!masterLookup) {
            ShowMessage(kMasterLookupMessage, kMessageWarning);
            keepAll();
            return;
        }
        // Without its Master curve no channel can be composed; all three keep their tables.
        if (!BuildCurveTable(m_work.toneCurves[kChannelMaster], masterLookup.get())) {
            keepAll();
            return;
        }
        for (int c = 0; c < kColourCount; ++c) {
            float* t = Slot(kSlotToneCurve + c);
            if (BuildCurveTable(m_work.toneCurves[1 + c], t)) {
                // A channel curve applies first and the Master curve second.
                for (int j = 0; j < kLookupSize; ++j) {
                    const float v = t[j] > 0.0f ? (t[j] < 1.0f ? t[j] : 1.0f) : 0.0f;
                    t[j] = masterLookup[static_cast<int>(v * kLookupSteps + 0.5f)];
                }
            } else {
                KeepPrevious(kSlotToneCurve + c, [](float* table) {
                    for (int j = 0; j < kLookupSize; ++j) table[j] = static_cast<float>(j) * kLevelStep;
                });
            }
            m_p.toneCurve[c] = WithToneCurveEnds(t);
        }
    }

    void HueCurves() {
        if (!m_p.flags.hueCurves) return;
        for (int k = 0; k < kHueCurveCount; ++k) {
            const int slot = kSlotHueShift + k;
            float* t = Slot(slot);
            if (!BuildCurveTable(m_work.hueCurves[k], t)) {
                const float neutral = k == kHueCurveShift ? 0.0f : 1.0f;
                KeepPrevious(slot, [neutral](float* table) {
                    for (int j = 0; j < kLookupSize; ++j) table[j] = neutral;
                });
                continue;
            }
            // The shift table holds a hue offset in turns (0.5 stored means none); the gain tables
            // hold a factor (0.5 stored means 1).
            if (k == kHueCurveShift) {
                for (int j = 0; j < kLookupSize; ++j) t[j] -= 0.5f;
            } else {
                for (int j = 0; j < kLookupSize; ++j) t[j] *= 2.0f;
            }
        }
    }

    void LumaRanges() {
        if (!HCurve(m_work.shadowsPoint, m_work.shadowsSoftness, m_work.highlightsPoint, m_work.highlightsSoftness,
                    Slot(kSlotWeightShadows), Slot(kSlotWeightMidtones), Slot(kSlotWeightHighlights))) {
            // Without a previous set every level counts as midtones.
            KeepPrevious(kSlotWeightShadows, [](float* t) { std::memset(t, 0, sizeof(float) * kLookupSize); });
            KeepPrevious(kSlotWeightMidtones, [](float* t) {
                for (int j = 0; j < kLookupSize; ++j) t[j] = 1.0f;
            });
            KeepPrevious(kSlotWeightHighlights, [](float* t) { std::memset(t, 0, sizeof(float) * kLookupSize); });
        }
    }

    void Levels() {
        if (!m_p.flags.levels) return;
        float slope[4], exponent[4], outRange[4];
        for (int g = 0; g < 4; ++g) {
            const LevelsGroup& lg = m_work.levels[g].group;
            const float difference = lg.inputWhite != lg.inputBlack ? lg.inputWhite - lg.inputBlack : kTinyDifference;
            slope[g] = 1.0f / difference;
            // The midpoint's position uses the same guarded difference, so equal ends never divide by 0.
            const float p = (lg.inputMidpoint - lg.inputBlack) / difference;
            if (p == 0.5f) {
                exponent[g] = 1.0f;
            } else if (p < 0.5f) {
                exponent[g] = 1.0f / (1.0f + (0.5f - p) * 5.0f * 2.0f);
            } else {
                // A midpoint at or beyond the white point would give a zero or negative exponent
                // denominator; it counts as the steepest midpoint instead.
                const float denominator = 1.0f - (p - 0.5f) * 2.0f;
                exponent[g] = denominator > 0.0f ? 1.0f / denominator : kSteepMidpoint;
            }
            const float o = lg.outputWhite - lg.outputBlack;
            outRange[g] = o != 0.0f ? o : kTinyDifference;
        }
        const LevelsGroup& m = m_work.levels[kChannelMaster].group;
        for (int c = 0; c < kColourCount; ++c) {
            const LevelsGroup& lg = m_work.levels[1 + c].group;
            m_p.levelsSlope[c] = slope[0] * slope[1 + c];
            m_p.levelsOffset[c] = -slope[0] * m.inputBlack - slope[1 + c] * lg.inputBlack;
            m_p.levelsRange[c] = outRange[0] * outRange[1 + c];
            m_p.levelsOutputOffset[c] = lg.outputBlack + m.outputBlack;
            if (m_p.flags.levelsGamma) {
                float* t = Slot(kSlotLevels + c);
                FillPowerTable(t, static_cast<double>(exponent[1 + c]) * exponent[0], m_log2Level);
                m_p.levels[c] = WithEnds(t);
            }
        }
    }

    void Secondaries() {
        for (int k = 0; k < kSecondaryCount; ++k) {
            if (!m_p.flags.secondary[k]) continue;
            const SecondaryRecord& r = m_work.secondaries[k];
            SecondaryParams& s = m_p.secondary[k];
            // Modes beyond the four known ones correct, like mode 0.
            s.mode = (r.modeEnable != 0 && r.mode <= 3) ? static_cast<uint8_t>(r.mode) : 0;
            s.invert = r.invertKey != 0;
            s.lumaTolerance = r.lumaTolerance;
            s.chromaTolerance2 = r.chromaTolerance * r.chromaTolerance;
            // A zero (or vanishing) softness makes a hard key edge instead of dividing by zero.
            const float softness2 = r.softness * r.softness;
            const float inverse = softness2 > 0.0f ? 1.0f / softness2 : kHardKeyInverse;
            s.inverseSoftness2 = inverse < kHardKeyInverse ? inverse : kHardKeyInverse;
            const float phi = r.hueRotation * kDegreesToRadians;
            s.cosAngle = static_cast<float>(std::cos(static_cast<double>(phi)));
            s.sinAngle = static_cast<float>(std::sin(static_cast<double>(phi)));
            s.saturation = r.saturation / 100.0f;
            s.chromaKeyBase = 1.0f + s.chromaTolerance2 * s.inverseSoftness2;
            s.lumaKeyBase = 1.0f + s.lumaTolerance * s.inverseSoftness2;
            s.gain = r.gain;
            s.pedestal = r.pedestal;
            s.gammaActive = r.gamma != 1.0f;
            if (s.gammaActive) {
                float* t = Slot(kSlotSecondaryGamma + k);
                FillPowerTable(t, 1.0 / static_cast<double>(r.gamma), m_log2Level);
                m_p.secondaryGamma[k] = WithEnds(t);
            }
            WheelChromaPoint(r.hueShiftAngle, &s.shiftU, &s.shiftV);
            s.shiftGain = r.hueShiftAmount / 3.0f;
            // U2 = U1 s + (Ut - U1 s) t = U1 s (1 - t) + Ut t, with U1 the rotated chroma.
            const float keep = s.saturation * (1.0f - s.shiftGain);
            s.cosMix = s.cosAngle * keep;
            s.sinMix = s.sinAngle * keep;
            s.shiftMixU = s.shiftU * s.shiftGain;
            s.shiftMixV = s.shiftV * s.shiftGain;
            for (int j = 0; j < 4; ++j) {
                const ReferenceColour& ref = r.reference[j];
                s.referenceEnable[j] = ref.enable != 0;
                s.referenceY[j] = 0.299f * ref.red + 0.587f * ref.green + 0.114f * ref.blue;
                s.referenceU[j] = 0.436798f * ref.blue - (0.147407f * ref.red + 0.289391f * ref.green);
                s.referenceV[j] = 0.614777f * ref.red - 0.5147996f * ref.green - 0.099978f * ref.blue;
            }
        }
    }

    void Limiter() {
        if (!m_p.flags.limiter) return;
        const CorrectionSettings& w = m_work;
        const float setup = w.videoBlackSetupPresent != 0 ? 0.075f : 0.0f;
        // A Video Max Level of 0 names no scale; the levels then count as full range.
        float b = 0.0f;
        float white = 1.0f;
        if (w.videoMaxLevel != 0) {
            b = static_cast<float>(w.videoBlackLevel) / static_cast<float>(w.videoMaxLevel);
            white = static_cast<float>(w.videoWhiteLevel) / static_cast<float>(w.videoMaxLevel);
        }
        const float k = (white - b) / (1.0f - setup);
        m_p.compositeMax = (w.chromaMaxLimit - 100.0f * setup) * k + 100.0f * b;
        m_p.compositeMin = (w.chromaMinLimit - 100.0f * setup) * k + 100.0f * b;
        m_p.hardClip = (w.lumaHardClipLevel / 100.0f - setup) * k + b;
        m_p.softKnee = (w.softClipKneeLevel / 100.0f - setup) * k + b;
        m_p.softWhite = (w.softClipWhiteLevel / 100.0f - setup) * k + b;
        m_p.softMax = (w.softClipMaxLevel / 100.0f - setup) * k + b;
        // A max level equal to the knee leaves no room to roll off: levels above the knee hold at it.
        const float span = m_p.softMax - m_p.softKnee;
        m_p.softRatio = span != 0.0f ? (m_p.softWhite - m_p.softKnee) / span : 0.0f;
        m_p.limitMethod = w.limitMethod;
        m_p.videoSystem = w.videoSystem;
    }

    // The Master ranges of both sets and the tone curves act on each channel alone, one after the
    // other: from their first table on, the chain is a function of that table's entry, so it
    // composes into one table per colour, built with the kernel's own arithmetic.
    void ChannelTail() {
        vt::StageFlags& f = m_p.flags;
        if (f.setMasterGamma[kSetRgb]) {
            f.channelTail = 1;
        } else if (f.setMasterGamma[kSetSecond]) {
            f.channelTail = 2;
        } else if (f.toneCurves) {
            f.channelTail = 3;
        } else {
            return;
        }
        // A chain of one table and nothing after it is that table already.
        const int tables = f.setMasterGamma[kSetRgb] + f.setMasterGamma[kSetSecond] + f.toneCurves;
        const bool gainBetween = f.channelTail == 1 && f.setMaster[kSetSecond];
        if (tables < 2 && !gainBetween) return;
        f.channelTailComposed = 1;
        float* const composed[kColourCount] = {Slot(kSlotChannelTail), Slot(kSlotChannelTail + 1),
                                               Slot(kSlotChannelTail + 2)};
        kernel_portable::ComposeChannelTails(m_p, composed);
    }

    // Three tables read at one level, side by side; the fourth value of an entry is 0.
    static void Pack(float* packed, const float* a, const float* b, const float* c) {
        for (int i = 0; i < kLookupSize; ++i) {
            packed[4 * i] = a[i];
            packed[4 * i + 1] = b[i];
            packed[4 * i + 2] = c[i];
            packed[4 * i + 3] = 0.0f;
        }
    }

    // Runs last, once every table it packs is final (kept from the previous set included).
    void PackTables() {
        const vt::StageFlags& f = m_p.flags;
        if (f.tonalCurve) {
            Pack(PackedSlot(kPackedTonal), m_p.tonal[kRangeHighlights].table, m_p.tonal[kRangeMidtones].table,
                 m_p.tonal[kRangeShadows].table);
        }
        if (f.hueCurves) Pack(PackedSlot(kPackedHue), m_p.hueShift, m_p.hueSaturation, m_p.hueLuma);
        for (int s = 0; s < kChannelSetCount; ++s) {
            if (!f.setRangesGamma[s]) continue;
            for (int c = 0; c < kColourCount; ++c) {
                Pack(PackedSlot(PackedSetSlot(s, c)), m_p.setGamma[s][kRangeHighlights][c].table,
                     m_p.setGamma[s][kRangeMidtones][c].table, m_p.setGamma[s][kRangeShadows][c].table);
            }
        }
    }

    const CorrectionSettings& m_work;
    const EffectiveFlags& m_effective;
    EngineSet* m_set;
    EngineParams& m_p;
    const EngineSet* m_previous;
    const float* m_log2Level;
};

}  // namespace

std::shared_ptr<const EngineSet> BuildEngineSet(const CorrectionSettings& settings, const EngineSet* previous) {
    // The working copy: every group whose flag is false is reset, so it contributes identity values
    // while the stored record keeps them. A disabled limiter's values are never read, so the copy
    // needs no preferences.
    auto work = std::unique_ptr<CorrectionSettings>(new (std::nothrow) CorrectionSettings(settings));
    std::unique_ptr<float[]> calcArray = AllocateFloats(kLookupSize, "calcArray");
    std::unique_ptr<float[]> storage =
        calcArray ? AllocateFloats(static_cast<size_t>(kSlotCount) * kLookupSize, "tables") : nullptr;
    std::shared_ptr<EngineSet> set(AllocationRefused("EngineSet") ? nullptr : new (std::nothrow) EngineSet());
    if (!work || !calcArray || !storage || !set) {
        ShowMessage(kCalcArrayMessage, kMessageWarning);
        return nullptr;
    }
    SwapSettingsIfForeign(work.get());
    const EffectiveFlags effective = EvaluateEffectiveFlags(*work);
    static const Preferences kNoPreferences{};
    ResetSettings(work.get(), DisabledGroupsMask(effective), kNoPreferences);

    // calcArray holds log2 of each level, shared by every power table of this rebuild.
    for (int i = 1; i < kLookupSize; ++i) calcArray[i] = std::log2(static_cast<float>(i) * kLevelStep);

    set->storage = std::move(storage);
    Builder(*work, effective, set.get(), previous, calcArray.get()).Run();
    return set;
}

void Update(const CorrectionSettings& settings) {
    g_rebuildCount.fetch_add(1, std::memory_order_relaxed);
    const std::shared_ptr<const EngineSet> previous = g_published.load(std::memory_order_acquire);
    std::shared_ptr<const EngineSet> next = BuildEngineSet(settings, previous.get());
    if (next) g_published.store(std::move(next), std::memory_order_release);
}

std::shared_ptr<const EngineSet> CurrentEngineSet() { return g_published.load(std::memory_order_acquire); }

uint64_t LookupRebuildCount() { return g_rebuildCount.load(std::memory_order_relaxed); }

void ResetPublishedEngineSet() {
    g_published.store(nullptr);
    g_rebuildCount.store(0);
}

}  // namespace vt
