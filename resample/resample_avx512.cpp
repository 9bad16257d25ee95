// The resampler's passes compiled for processors with AVX-512 (F, BW, DQ, VL): sixteen floats per step.
#define VT_RESAMPLE_NS resample_avx512
#define VT_RESAMPLE_WIDTH 16
#include "resample/resample_portable.cpp"
