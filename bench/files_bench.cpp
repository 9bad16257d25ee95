// Reading the largest LUTs, merging a preset, and the arbitrary value's per-keyframe work:
// interpolation (once per frame between keys), printing and scanning (copy and paste).
#include <benchmark/benchmark.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "engine/correction_settings.h"
#include "files/lut_files.h"
#include "files/preferences.h"
#include "files/preset_file.h"
#include "host/arb_data.h"

namespace {

std::unique_ptr<vt::CorrectionSettings> ResetRecord() {
    auto s = std::make_unique<vt::CorrectionSettings>();
    std::memset(s.get(), 0, sizeof *s);
    vt::Preferences prefs{};
    prefs.videoSystem = 1;
    vt::ResetSettings(s.get(), vt::kMaskAll, prefs);
    return s;
}

// A 16-bit Autodesk LUT of 65,536 entries per channel, laid out as real ones are (2 MB).
std::vector<uint8_t> LargeLut() {
    std::string text = "LUT: 3 65536\n\n";
    char line[32];
    for (int c = 0; c < 3; ++c) {
        for (int e = 0; e < 65536; ++e) {
            std::snprintf(line, sizeof line, "%10d\n", (e * 7 + c) % 65536);
            text += line;
        }
    }
    return std::vector<uint8_t>(text.begin(), text.end());
}

void BM_ReadAutodeskLut65536(benchmark::State& state) {
    const std::vector<uint8_t> bytes = LargeLut();
    auto settings = ResetRecord();
    for (auto _ : state) {
        benchmark::DoNotOptimize(vt::ReadAutodeskLutBytes(bytes, settings->toneCurves));
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * bytes.size()));
}
BENCHMARK(BM_ReadAutodeskLut65536)->Unit(benchmark::kMillisecond);

void BM_MergeWholeRecordPreset(benchmark::State& state) {
    // Every raw section of a full record: the curves, the secondaries and the auxiliary records.
    std::vector<uint8_t> bytes = {0x11, 0x22, 0x33, 0x44, 0, 0, 0, 5};
    for (uint32_t tag : {27u, 40u, 29u, 30u, 31u, 32u, 33u, 35u, 37u, 39u, 6u}) {
        const uint32_t size = vt::PresetPayloadSize(tag);
        for (uint32_t word : {tag, size}) {
            for (int shift = 24; shift >= 0; shift -= 8) bytes.push_back(static_cast<uint8_t>(word >> shift));
        }
        bytes.resize(bytes.size() + size, 0x3F);
    }
    auto settings = ResetRecord();
    for (auto _ : state) {
        benchmark::DoNotOptimize(vt::MergeSettingsPreset(bytes, settings.get()));
    }
}
BENCHMARK(BM_MergeWholeRecordPreset)->Unit(benchmark::kMicrosecond);

void BM_InterpolateSettings(benchmark::State& state) {
    auto left = ResetRecord();
    auto right = ResetRecord();
    for (auto& range : right->rgbSet.range) range.channel[1].gain = 1.5f;
    right->tonal[1].saturation = 150.0f;
    auto out = ResetRecord();
    double t = 0.0;
    for (auto _ : state) {
        vt::InterpolateSettings(out.get(), *left, *right, t);
        t = t < 1.0 ? t + 0.01 : 0.0;
        benchmark::ClobberMemory();
    }
}
BENCHMARK(BM_InterpolateSettings)->Unit(benchmark::kMicrosecond);

void BM_PrintAndScanSettings(benchmark::State& state) {
    auto settings = ResetRecord();
    std::vector<char> text(vt::kPrintSize);
    auto scanned = ResetRecord();
    for (auto _ : state) {
        const size_t length = vt::PrintSettingsText(
            {reinterpret_cast<const uint8_t*>(settings.get()), vt::kSettingsSize}, text.data(), text.size());
        benchmark::DoNotOptimize(vt::ScanSettingsText(text.data(), length, scanned.get()));
    }
}
BENCHMARK(BM_PrintAndScanSettings)->Unit(benchmark::kMicrosecond);

}  // namespace
