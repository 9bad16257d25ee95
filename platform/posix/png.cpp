// The POSIX build decodes PNG images on demand; there is nothing to start.
#include "platform/png.h"

namespace vt {

bool StartPngDecoding(unsigned char* /*startupInput*/, uintptr_t* token) {
    if (token) *token = 0;
    return true;
}

}  // namespace vt
