// PNG images are decoded by GDI+, which is started once at global setup and, as the host may load
// the module again at any time, never shut down.
#include "platform/png.h"

#include <windows.h>
#include <objidl.h>
#include <gdiplus.h>

#include <cstring>

namespace vt {

static_assert(sizeof(Gdiplus::GdiplusStartupInput) == kDecoderStartupInputSize);

bool StartPngDecoding(unsigned char* startupInput, uintptr_t* token) {
    if (token) *token = 0;
    if (!startupInput || !token) return false;
    // All defaults: version 1, no debug callback, with the background thread and external codecs.
    const Gdiplus::GdiplusStartupInput defaults;
    std::memcpy(startupInput, &defaults, sizeof defaults);
    ULONG_PTR started = 0;
    if (Gdiplus::GdiplusStartup(&started, reinterpret_cast<const Gdiplus::GdiplusStartupInput*>(startupInput),
                                nullptr) != Gdiplus::Ok) {
        return false;
    }
    *token = started;
    return true;
}

}  // namespace vt
