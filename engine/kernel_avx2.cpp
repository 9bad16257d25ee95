// The kernel body compiled for the avx2 target (see CMakeLists.txt for its flags).
#include "engine/kernel_paths_internal.h"

#define VT_KERNEL_AVX2 1
#define VT_KERNEL_NS kernel_avx2
#include "engine/kernel_body_internal.h"
