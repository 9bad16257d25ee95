// The conversions compiled for processors with AVX-512 (F, BW, DQ, VL): sixteen pixels per step.
#define VT_CONVERT_NS convert_avx512
#define VT_CONVERT_WIDTH 16
#include "link/pixel_convert_portable.cpp"
