// Shared by the engine tests and benchmarks: settings records for typical grades, and planar float
// frames that own their pixels.
#pragma once

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <random>
#include <vector>

#include "engine/correction_settings.h"
#include "files/preferences.h"
#include "link/frame_buffer.h"

namespace vt::test {

inline std::unique_ptr<CorrectionSettings> ResetRecord() {
    auto s = std::make_unique<CorrectionSettings>();
    std::memset(s.get(), 0, sizeof(CorrectionSettings));
    Preferences prefs{};
    prefs.videoSystem = 1;
    prefs.videoWhiteLevel = 255;
    prefs.videoMaxLevel = 255;
    ResetSettings(s.get(), kMaskAll, prefs);
    return s;
}

inline void SetPoints(CurveRecord* c, std::initializer_list<std::pair<float, float>> points) {
    ResetCurveRecord(c, 0.0f, 1.0f);
    int i = 0;
    for (auto [x, y] : points) {
        c->data.points.x[i] = x;
        c->data.points.y[i] = y;
        ++i;
    }
    c->data.points.count = i;
}

inline void SetTriplet(ChannelTriplet* t, float gain, float gamma, float pedestal) {
    t->gain = gain;
    t->gamma = gamma;
    t->pedestal = pedestal;
}

// Every group enabled with values away from identity: every stage of the kernel runs.
inline void EnableEverything(CorrectionSettings* s) {
    s->masterEnable = 1;
    s->tonalEnable = 1;
    for (int r = 0; r < 4; ++r) {
        TonalRange& t = s->tonal[r];
        t.enable = 1;
        t.hue = 5.0f + 7.0f * r;
        t.saturation = 90.0f + 5.0f * r;
        t.vibrance = r % 2 ? -20.0f : 15.0f;
        t.brightness = 4.0f - 3.0f * r;
        t.contrast = 10.0f + 5.0f * r;
        t.contrastCenter = 0.45f + 0.03f * r;
        t.gain = 0.95f + 0.04f * r;
        t.gamma = 0.9f + 0.07f * r;
        t.pedestal = 0.01f * (r - 1);
    }
    s->hueWheelsEnable = 1;
    for (int w = 0; w < 4; ++w) {
        s->hueWheels[w].angle = 30.0f + 80.0f * w;
        s->hueWheels[w].amount = 0.05f + 0.03f * w;
    }
    ChannelSet* sets[3] = {&s->rgbSet, &s->secondSet, &s->thirdSet};
    for (int k = 0; k < 3; ++k) {
        sets[k]->enable = 1;
        for (int r = 0; r < 4; ++r) {
            ChannelRange& range = sets[k]->range[r];
            range.enable = 1;
            for (int c = 0; c < 4; ++c) {
                SetTriplet(&range.channel[c], 0.97f + 0.02f * c + 0.01f * k, 0.93f + 0.03f * c + 0.02f * r,
                           0.005f * (c - 1.5f));
            }
        }
    }
    s->levelsEnable = 1;
    for (int g = 0; g < 4; ++g) {
        LevelsGroup& l = s->levels[g].group;
        l.enable = 1;
        l.inputBlack = 0.02f + 0.01f * g;
        l.inputMidpoint = 0.45f + 0.04f * g;
        l.inputWhite = 0.97f - 0.01f * g;
        l.outputBlack = 0.01f * g;
        l.outputWhite = 1.0f - 0.02f * g;
    }
    s->autoCorrectA = 0.3f;
    s->curvesEnable = 1;
    s->toneCurvesEnable = 1;
    SetPoints(&s->toneCurves[0], {{0.0f, 0.02f}, {0.25f, 0.22f}, {0.5f, 0.52f}, {0.75f, 0.8f}, {1.0f, 0.98f}});
    SetPoints(&s->toneCurves[1], {{0.0f, 0.0f}, {0.3f, 0.33f}, {0.7f, 0.72f}, {1.0f, 1.0f}});
    SetPoints(&s->toneCurves[2], {{0.0f, 0.01f}, {0.5f, 0.48f}, {1.0f, 0.99f}});
    SetPoints(&s->toneCurves[3], {{0.05f, 0.0f}, {0.4f, 0.38f}, {0.8f, 0.83f}, {1.0f, 1.0f}});
    s->hueCurvesEnable = 1;
    SetPoints(&s->hueCurves[0], {{0.0f, 0.5f}, {0.3f, 0.55f}, {0.6f, 0.47f}, {1.0f, 0.5f}});
    SetPoints(&s->hueCurves[1], {{0.0f, 0.5f}, {0.4f, 0.6f}, {0.8f, 0.45f}, {1.0f, 0.5f}});
    SetPoints(&s->hueCurves[2], {{0.0f, 0.5f}, {0.5f, 0.53f}, {1.0f, 0.5f}});
    s->lumaRangesEnable = 1;
    s->shadowsPoint = 0.25f;
    s->shadowsSoftness = 0.4f;
    s->highlightsPoint = 0.75f;
    s->highlightsSoftness = 0.35f;
    s->secondariesEnable = 1;
    s->secondariesEnable2 = 1;
    for (int k = 0; k < kSecondaryCount; ++k) {
        SecondaryRecord& r = s->secondaries[k];
        r.enable = 1;
        r.lumaTolerance = 0.2f;
        r.chromaTolerance = 0.15f;
        r.softness = 0.3f;
        r.modeEnable = k >= 3;
        r.mode = static_cast<uint32_t>(k - 3 > 0 ? k - 3 : 0);
        r.invertKey = k == 2;
        r.hueRotation = 10.0f * k;
        r.saturation = 110.0f;
        r.hueShiftAngle = 40.0f * k;
        r.hueShiftAmount = 0.2f;
        for (int j = 0; j < 4; ++j) {
            r.reference[j].enable = j <= k % 4;
            r.reference[j].red = 0.2f + 0.15f * j;
            r.reference[j].green = 0.5f - 0.1f * j;
            r.reference[j].blue = 0.3f + 0.05f * k;
        }
        r.gain = 1.05f;
        r.gamma = 0.9f;
        r.pedestal = 0.01f;
    }
    s->enableLimiter = 1;
    s->enableSoftClip = 1;
    s->limitMethod = 3;
}

// A grade the size of a typical filter chain: levels, four tone curves, Master contrast, brightness,
// gamma, saturation and hue, vibrance, colour balance through the RGB range gains, and the limiter.
inline void EnableTypicalGrade(CorrectionSettings* s) {
    s->levelsEnable = 1;
    s->levels[0].group = {1, 0.06f, 0.5f, 0.94f, 0.02f, 0.5f, 0.98f};
    s->curvesEnable = 1;
    s->toneCurvesEnable = 1;
    SetPoints(&s->toneCurves[0], {{0.0f, 0.0f}, {0.25f, 0.2f}, {0.75f, 0.8f}, {1.0f, 1.0f}});
    SetPoints(&s->toneCurves[1], {{0.0f, 0.0f}, {0.5f, 0.55f}, {1.0f, 1.0f}});
    SetPoints(&s->toneCurves[2], {{0.0f, 0.0f}, {0.5f, 0.5f}, {1.0f, 1.0f}});
    SetPoints(&s->toneCurves[3], {{0.0f, 0.0f}, {0.5f, 0.45f}, {1.0f, 1.0f}});
    s->masterEnable = 1;
    s->tonalEnable = 1;
    TonalRange& m = s->tonal[kRangeMaster];
    m.enable = 1;
    m.contrast = 10.0f;
    m.brightness = 4.0f;
    m.gamma = 1.1f;
    m.saturation = 120.0f * 1.1f;
    m.hue = 10.0f;
    m.vibrance = 30.0f;
    s->rgbSet.enable = 1;
    s->rgbSet.range[kRangeShadows].enable = 1;
    s->rgbSet.range[kRangeShadows].channel[kChannelRed].gain = 1.1f;
    s->rgbSet.range[kRangeMidtones].enable = 1;
    s->rgbSet.range[kRangeMidtones].channel[kChannelGreen].gain = 0.95f;
    s->rgbSet.range[kRangeHighlights].enable = 1;
    s->rgbSet.range[kRangeHighlights].channel[kChannelBlue].gain = 1.1f;
    s->enableLimiter = 1;
    s->limitMethod = 3;
}

// A format-203 frame that owns its pixel store.
class PlanarFrame {
public:
    PlanarFrame(uint32_t width, uint32_t height, uint32_t extraRowBytes = 0) {
        m_frame.width = width;
        m_frame.height = height;
        m_frame.rowBytes = width * 4 + extraRowBytes;
        m_frame.format = kFormatPlanarFloat;
        m_frame.planes = 4;
        m_frame.planeSize = m_frame.rowBytes * height;
        m_store.assign(static_cast<size_t>(m_frame.planeSize), 0.0f);  // four planes of planeSize bytes
        m_frame.data = reinterpret_cast<uint8_t*>(m_store.data());
    }
    FrameBuffer& frame() { return m_frame; }
    size_t floats() const { return m_frame.planeSize / 4; }
    float* plane(int k) { return PlanePointer(m_frame, k); }
    const float* plane(int k) const { return PlanePointer(m_frame, k); }
    void Set(size_t i, float r, float g, float b) {
        plane(0)[i] = r;
        plane(1)[i] = g;
        plane(2)[i] = b;
    }

private:
    FrameBuffer m_frame{};
    std::vector<float> m_store;
};

// Values a float frame may hold: mostly in [0, 1], some beyond it, and a few non-finite.
inline float RandomPixelValue(std::mt19937& rng, bool specials) {
    std::uniform_real_distribution<float> unit(0.0f, 1.0f);
    const float pick = unit(rng);
    if (specials && pick < 0.01f) return std::numeric_limits<float>::quiet_NaN();
    if (specials && pick < 0.02f) return std::numeric_limits<float>::infinity();
    if (specials && pick < 0.03f) return -std::numeric_limits<float>::infinity();
    if (pick < 0.08f) return -0.3f * unit(rng);
    if (pick < 0.16f) return 1.0f + 0.6f * unit(rng);
    if (pick < 0.18f) return 0.0f;
    if (pick < 0.20f) return 1.0f;
    return unit(rng);
}

inline void FillRandom(PlanarFrame* f, uint32_t seed, bool specials) {
    std::mt19937 rng(seed);
    for (size_t i = 0; i < f->floats(); ++i) {
        f->Set(i, RandomPixelValue(rng, specials), RandomPixelValue(rng, specials), RandomPixelValue(rng, specials));
    }
}

// A frame like footage: smooth gradients and shapes with a little grain, mostly within [0, 1] with
// some highlights above it.
inline void FillNatural(PlanarFrame* f, uint32_t seed) {
    std::mt19937 rng(seed);
    std::normal_distribution<float> grain(0.0f, 0.01f);
    const FrameBuffer& fb = f->frame();
    const uint32_t stride = fb.rowBytes / 4;
    for (uint32_t y = 0; y < fb.height; ++y) {
        for (uint32_t x = 0; x < stride; ++x) {
            const float u = static_cast<float>(x) / static_cast<float>(fb.width);
            const float v = static_cast<float>(y) / static_cast<float>(fb.height);
            const float r = 0.5f + 0.45f * std::sin(6.0f * u + 2.0f * v) + grain(rng);
            const float g = 0.4f + 0.35f * std::cos(4.0f * v - 3.0f * u) + 0.2f * u + grain(rng);
            const float b = 0.3f + 0.3f * std::sin(9.0f * u * v + 1.0f) + 0.25f * v + grain(rng);
            f->Set(static_cast<size_t>(y) * stride + x, r, g, b);
        }
    }
}

}  // namespace vt::test
