// The conversions compiled for processors with AVX2 and FMA: eight pixels per step.
#define VT_CONVERT_NS convert_avx2
#define VT_CONVERT_WIDTH 8
#include "link/pixel_convert_portable.cpp"
