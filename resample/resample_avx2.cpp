// The resampler's passes compiled for processors with AVX2 and FMA: eight floats per step.
#define VT_RESAMPLE_NS resample_avx2
#define VT_RESAMPLE_WIDTH 8
#include "resample/resample_portable.cpp"
