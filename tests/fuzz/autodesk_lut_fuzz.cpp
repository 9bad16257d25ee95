// Autodesk LUT reader on arbitrary text.
#include <cstddef>
#include <cstdint>

#include "files/lut_files.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    vt::fuzz::FuzzLutReader(vt::ReadAutodeskLutBytes, data, size);
    return 0;
}
