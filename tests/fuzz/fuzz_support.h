// Shared by the fuzz targets: a reset record to read into, without touching the registry.
#pragma once

#include <cstdint>
#include <cstring>
#include <memory>

#include "engine/correction_settings.h"
#include "files/preferences.h"

namespace vt::fuzz {

inline const Preferences& FuzzPreferences() {
    static const Preferences prefs = [] {
        Preferences p{};
        p.videoSystem = 1;
        p.videoWhiteLevel = 255;
        p.videoMaxLevel = 255;
        return p;
    }();
    return prefs;
}

inline std::unique_ptr<CorrectionSettings> ResetRecord() {
    auto settings = std::make_unique<CorrectionSettings>();
    std::memset(settings.get(), 0, sizeof(CorrectionSettings));
    ResetSettings(settings.get(), kMaskAll, FuzzPreferences());
    return settings;
}

// A reader's failure must leave the curves as they were.
inline void RequireUntouched(bool ok, const CorrectionSettings& before, const CorrectionSettings& after) {
    if (!ok && std::memcmp(before.toneCurves, after.toneCurves, sizeof before.toneCurves) != 0) __builtin_trap();
}

// A sampled curve record must hold 1,024 samples; a point record at most 16 points after a reader.
inline void RequireCurvesInRange(const CorrectionSettings& s) {
    for (const CurveRecord& curve : s.toneCurves) {
        if ((curve.flags & kCurveFlagSampled) == 0 && curve.data.points.count > kCurvePointCapacity) __builtin_trap();
    }
}

}  // namespace vt::fuzz
