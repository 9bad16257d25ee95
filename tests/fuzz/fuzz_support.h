// Shared by the fuzz targets: a reset record to read into, without touching the registry.
#pragma once

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>

#include "engine/correction_settings.h"
#include "files/lut_files.h"
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

// One LUT reader on arbitrary text: a failure leaves the curves alone and says why; a success
// says nothing and holds only finite samples.
using LutReader = FileResult (*)(std::span<const uint8_t>, CurveRecord*, const char**);

inline void FuzzLutReader(LutReader reader, const uint8_t* data, size_t size) {
    auto before = ResetRecord();
    auto after = ResetRecord();
    const char* message = nullptr;
    const FileResult result = reader({data, size}, after->toneCurves, &message);
    RequireUntouched(result == FileResult::kOk, *before, *after);
    if ((result == FileResult::kOk) != (message == nullptr)) __builtin_trap();
    if (result != FileResult::kOk) return;
    for (const CurveRecord& curve : after->toneCurves) {
        for (float v : curve.data.samples) {
            if (!std::isfinite(v)) __builtin_trap();
        }
    }
}

}  // namespace vt::fuzz
