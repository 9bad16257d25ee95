// Quantel LUT reader on arbitrary text.
#include <cmath>
#include <cstddef>
#include <cstdint>

#include "files/lut_files.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    auto before = fuzz::ResetRecord();
    auto after = fuzz::ResetRecord();
    const char* message = nullptr;
    const FileResult result = ReadQuantelLutBytes({data, size}, after->toneCurves, &message);
    fuzz::RequireUntouched(result == FileResult::kOk, *before, *after);
    // Every failure has its message, success none.
    if ((result == FileResult::kOk) != (message == nullptr)) __builtin_trap();
    if (result == FileResult::kOk) {
        for (const CurveRecord& curve : after->toneCurves) {
            for (float v : curve.data.samples) {
                if (!std::isfinite(v)) __builtin_trap();
            }
        }
    }
    return 0;
}
