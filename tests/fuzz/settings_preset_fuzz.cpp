// Preset reader on arbitrary bytes; the tone and hue curves it stored are then built into tables,
// which must stay inside their 16,385 entries whatever the file held.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

#include "engine/curves.h"
#include "files/preset_file.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    const auto reset = fuzz::ResetRecord();
    auto settings = fuzz::ResetRecord();
    const FileResult result = MergeSettingsPreset({data, size}, settings.get());
    if (result == FileResult::kNotSettingsFile && std::memcmp(reset.get(), settings.get(), sizeof *reset) != 0) {
        __builtin_trap();
    }
    std::vector<float> table(kLookupSize);
    auto build = [&](const CurveRecord& curve, const CurveRecord& original) {
        if (std::memcmp(&curve, &original, sizeof curve) != 0) (void)BuildCurveTable(curve, table.data());
    };
    for (int c = 0; c < kToneCurveCount; ++c) build(settings->toneCurves[c], reset->toneCurves[c]);
    for (int c = 0; c < kHueCurveCount; ++c) build(settings->hueCurves[c], reset->hueCurves[c]);
    return 0;
}
