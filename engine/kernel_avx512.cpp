// The kernel body compiled for the avx512 target (see CMakeLists.txt for its flags).
#include "engine/kernel_paths_internal.h"

#define VT_KERNEL_AVX512 1
#define VT_KERNEL_NS kernel_avx512
#include "engine/kernel_body_internal.h"
