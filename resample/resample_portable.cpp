// The resampler's two passes, written once over the vector width and compiled once per processor
// target (resample_avx2.cpp and resample_avx512.cpp include this file with their own namespace and
// width). Built on its own it is the portable path, the reference the others must equal: each
// output is summed in the same order on every path, with contraction turned off by the build.
//
// Each output row first blends its source rows into one float row (the vertical pass, where the
// wide vectors pay), then each output pixel blends its taps from that row (the horizontal pass).
#ifndef VT_RESAMPLE_NS
#define VT_RESAMPLE_NS resample_portable
#define VT_RESAMPLE_WIDTH 4
#endif

#include "resample/resample_internal.h"

#include <immintrin.h>

#include <cstring>

namespace vt::VT_RESAMPLE_NS {
namespace {

constexpr int kWidth = VT_RESAMPLE_WIDTH;

typedef float VecF __attribute__((vector_size(kWidth * 4)));
typedef float Vec4 __attribute__((vector_size(16)));
typedef int32_t Vec4I __attribute__((vector_size(16)));

template <class T>
inline T Load(const void* p) {
    T v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

template <class T>
inline void Store(void* p, const T& v) {
    std::memcpy(p, &v, sizeof v);
}

inline VecF LoadWide(const float* p) {
    return Load<VecF>(p);
}

typedef int32_t VecI __attribute__((vector_size(kWidth * 4)));

// Bytes widened by hand: the compiler leaves a generic byte-to-float vector conversion scalar.
// (The zero-masked forms avoid GCC 12's false uninitialised warning in its AVX-512 header.)
inline VecF LoadWide(const uint8_t* p) {
#if VT_RESAMPLE_WIDTH == 16
    const VecI i = (VecI)_mm512_maskz_cvtepu8_epi32(0xffff, _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
#elif VT_RESAMPLE_WIDTH == 8
    const VecI i = (VecI)_mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
#else
    const __m128i zero = _mm_setzero_si128();
    const __m128i bytes = _mm_cvtsi32_si128(Load<int32_t>(p));
    const VecI i = (VecI)_mm_unpacklo_epi16(_mm_unpacklo_epi8(bytes, zero), zero);
#endif
    return __builtin_convertvector(i, VecF);
}

inline float LoadOne(const float* p) {
    return *p;
}

inline float LoadOne(const uint8_t* p) {
    return static_cast<float>(*p);
}

// row[i] = sum over k of w[k] * source row (first + k)[i], for the n samples of a row. The row is
// built in strips that stay in the first-level cache while each source row streams through them
// in order; every sample still sums its taps in order k = 0, 1, ...
template <class S>
void VerticalPass(const ResizeJob& job, uint32_t dy, float* row, size_t n) {
    constexpr size_t kStrip = 512;
    const uint32_t taps = job.y.taps;
    const float* w = job.y.weights + static_cast<size_t>(dy) * taps;
    const uint8_t* first = job.src + static_cast<ptrdiff_t>(job.y.start[dy]) * job.srcRowBytes;
    for (size_t begin = 0; begin < n; begin += kStrip) {
        const size_t end = begin + kStrip < n ? begin + kStrip : n;
        for (uint32_t k = 0; k < taps; ++k) {
            const S* in = reinterpret_cast<const S*>(first + k * job.srcRowBytes);
            const float wk = w[k];
            size_t i = begin;
            if (k == 0) {
                for (; i + kWidth <= end; i += kWidth) Store(row + i, wk * LoadWide(in + i));
                for (; i < end; ++i) row[i] = wk * LoadOne(in + i);
            } else {
                for (; i + kWidth <= end; i += kWidth) Store(row + i, Load<VecF>(row + i) + wk * LoadWide(in + i));
                for (; i < end; ++i) row[i] = row[i] + wk * LoadOne(in + i);
            }
        }
    }
}

inline float Dot(const float* w, const float* v, uint32_t taps) {
    float acc = w[0] * v[0];
    for (uint32_t k = 1; k < taps; ++k) acc = acc + w[k] * v[k];
    return acc;
}

inline Vec4 Dot4(const float* w, const float* v, uint32_t taps) {
    Vec4 acc = w[0] * Load<Vec4>(v);
    for (uint32_t k = 1; k < taps; ++k) acc = acc + w[k] * Load<Vec4>(v + 4 * k);
    return acc;
}

void HorizontalFloat1(const ResizeJob& job, const float* row, float* out) {
    const uint32_t taps = job.x.taps;
    for (uint32_t x = 0; x < job.dstWidth; ++x) {
        out[x] = Dot(job.x.weights + static_cast<size_t>(x) * taps, row + job.x.start[x], taps);
    }
}

void HorizontalFloat4(const ResizeJob& job, const float* row, float* out) {
    const uint32_t taps = job.x.taps;
    for (uint32_t x = 0; x < job.dstWidth; ++x) {
        Store(out + 4 * x, Dot4(job.x.weights + static_cast<size_t>(x) * taps, row + 4 * job.x.start[x], taps));
    }
}

// Rounded to nearest and held to 0..255: the kernel's negative lobes overshoot at edges.
void HorizontalByte4(const ResizeJob& job, const float* row, uint8_t* out) {
    const uint32_t taps = job.x.taps;
    for (uint32_t x = 0; x < job.dstWidth; ++x) {
        Vec4 v = Dot4(job.x.weights + static_cast<size_t>(x) * taps, row + 4 * job.x.start[x], taps) + 0.5f;
        v = v > 0.0f ? v : 0.0f;
        v = v < 255.0f ? v : 255.0f;
        const Vec4I c = __builtin_convertvector(v, Vec4I);
        const uint32_t packed = static_cast<uint32_t>(c[0]) | static_cast<uint32_t>(c[1]) << 8 |
                                static_cast<uint32_t>(c[2]) << 16 | static_cast<uint32_t>(c[3]) << 24;
        std::memcpy(out + 4 * x, &packed, 4);
    }
}

}  // namespace

void RunResize(const ResizeJob& job) {
    for (uint32_t dy = 0; dy < job.dstHeight; ++dy) {
        uint8_t* out = job.dst + static_cast<ptrdiff_t>(dy) * job.dstRowBytes;
        switch (job.kind) {
            case ResampleKind::kFloat1:
                VerticalPass<float>(job, dy, job.row, job.srcWidth);
                HorizontalFloat1(job, job.row, reinterpret_cast<float*>(out));
                break;
            case ResampleKind::kFloat4:
                VerticalPass<float>(job, dy, job.row, static_cast<size_t>(job.srcWidth) * 4);
                HorizontalFloat4(job, job.row, reinterpret_cast<float*>(out));
                break;
            case ResampleKind::kByte4:
                VerticalPass<uint8_t>(job, dy, job.row, static_cast<size_t>(job.srcWidth) * 4);
                HorizontalByte4(job, job.row, out);
                break;
        }
    }
}

}  // namespace vt::VT_RESAMPLE_NS
