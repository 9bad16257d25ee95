// The text form's scan on arbitrary text (not terminated: the byte count is all there is); a text
// that scans is printed and scanned again to the same record.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

#include "host/arb_data.h"
#include "tests/fuzz/fuzz_support.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace vt;
    auto settings = fuzz::ResetRecord();
    const bool scanned = ScanSettingsText(reinterpret_cast<const char*>(data), size, settings.get());
    if (!scanned) return 0;
    std::vector<char> text(kPrintSize);
    const size_t length = PrintSettingsText({reinterpret_cast<const uint8_t*>(settings.get()), kSettingsSize},
                                            text.data(), text.size());
    auto again = fuzz::ResetRecord();
    if (!ScanSettingsText(text.data(), length, again.get())) __builtin_trap();
    if (std::memcmp(settings.get(), again.get(), kSettingsSize) != 0) __builtin_trap();
    return 0;
}
