// The kernel body compiled for the portable target (see CMakeLists.txt for its flags).
#include "engine/kernel_paths_internal.h"

#define VT_KERNEL_PORTABLE 1
#define VT_KERNEL_NS kernel_portable
#include "engine/kernel_body_internal.h"
