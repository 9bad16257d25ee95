// Arbitrary-map reader on arbitrary bytes.
#include <cmath>
#include <cstddef>
#include <cstdint>

#include "files/curve_files.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    auto before = fuzz::ResetRecord();
    auto after = fuzz::ResetRecord();
    const FileResult result = ReadArbitraryMapBytes({data, size}, after->toneCurves);
    fuzz::RequireUntouched(result == FileResult::kOk, *before, *after);
    if (result == FileResult::kOk) {
        // Every entry is a level a map can produce, give or take the last ramp step.
        for (int c = 1; c < 4; ++c) {
            for (float v : after->toneCurves[c].data.samples) {
                if (!(v >= -1.0f && v <= 2.0f)) __builtin_trap();
            }
        }
    }
    return 0;
}
