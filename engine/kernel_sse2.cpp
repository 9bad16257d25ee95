// The kernel body compiled for the sse2 target (see CMakeLists.txt for its flags).
#include "engine/kernel_paths_internal.h"

#define VT_KERNEL_SSE2 1
#define VT_KERNEL_NS kernel_sse2
#include "engine/kernel_body_internal.h"
