// Point-curve reader on arbitrary bytes, then the writer on what was read.
#include <cstddef>
#include <cstdint>
#include <vector>

#include "files/curve_files.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    auto before = fuzz::ResetRecord();
    auto after = fuzz::ResetRecord();
    const FileResult result = ReadPointCurveBytes({data, size}, after->toneCurves);
    fuzz::RequireUntouched(result == FileResult::kOk, *before, *after);
    fuzz::RequireCurvesInRange(*after);
    std::vector<uint8_t> written;
    if (WritePointCurveBytes(after->toneCurves, &written) == FileResult::kOk) {
        auto again = fuzz::ResetRecord();
        if (ReadPointCurveBytes(written, again->toneCurves) != FileResult::kOk) __builtin_trap();
    }
    return 0;
}
