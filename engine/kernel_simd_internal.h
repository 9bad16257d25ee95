// Lane types for the kernel body, one definition per processor target. The including file names
// the namespace (VT_KERNEL_NS) so each target's copy stays apart from the others at link time;
// VT_KERNEL_PORTABLE selects plain C++ whatever the compiler's target.
//
// Every operation has one meaning on all targets, NaN included, so the paths agree bit for bit:
// Min(a, b) = a < b ? a : b, Max(a, b) = a > b ? a : b (the SSE rule), comparisons are ordered
// (false for NaN), and a table index is always taken from a value already clamped to [0, 1].
// No header with inline functions of its own may be included here or in the body: an inline function
// compiled with wider instructions could be picked by the linker for every caller.
#pragma once

#include <cstdint>

#if !defined(VT_KERNEL_PORTABLE)
#include <immintrin.h>
#endif
#if defined(VT_KERNEL_AVX512) && !defined(__AVX512F__)
#error "the AVX-512 kernel needs -mavx512f"
#endif
#if defined(VT_KERNEL_AVX2) && !(defined(__AVX2__) && defined(__FMA__))
#error "the AVX2 kernel needs -mavx2 -mfma"
#endif

namespace vt {
namespace VT_KERNEL_NS {
namespace {

#if defined(VT_KERNEL_PORTABLE)

constexpr int kLanes = 4;
struct F {
    float v[kLanes];
};
struct M {
    bool v[kLanes];
};
struct I {
    int32_t v[kLanes];
};

#define VT_LANEWISE_F(expr) \
    F out;                  \
    for (int l = 0; l < kLanes; ++l) out.v[l] = (expr);    \
    return out
#define VT_LANEWISE_M(expr) \
    M out;                  \
    for (int l = 0; l < kLanes; ++l) out.v[l] = (expr);    \
    return out

inline F Splat(float x) { VT_LANEWISE_F(x); }
inline F Load(const float* p) { VT_LANEWISE_F(p[l]); }
inline void Store(float* p, F a) {
    for (int l = 0; l < kLanes; ++l) p[l] = a.v[l];
}
inline F operator+(F a, F b) { VT_LANEWISE_F(a.v[l] + b.v[l]); }
inline F operator-(F a, F b) { VT_LANEWISE_F(a.v[l] - b.v[l]); }
inline F operator*(F a, F b) { VT_LANEWISE_F(a.v[l] * b.v[l]); }
inline F operator/(F a, F b) { VT_LANEWISE_F(a.v[l] / b.v[l]); }
inline F Min(F a, F b) { VT_LANEWISE_F(a.v[l] < b.v[l] ? a.v[l] : b.v[l]); }
inline F Max(F a, F b) { VT_LANEWISE_F(a.v[l] > b.v[l] ? a.v[l] : b.v[l]); }
inline F Abs(F a) { VT_LANEWISE_F(__builtin_fabsf(a.v[l])); }
inline F Sqrt(F a) { VT_LANEWISE_F(__builtin_sqrtf(a.v[l])); }
inline M operator<(F a, F b) { VT_LANEWISE_M(a.v[l] < b.v[l]); }
inline M operator<=(F a, F b) { VT_LANEWISE_M(a.v[l] <= b.v[l]); }
inline M operator>(F a, F b) { VT_LANEWISE_M(a.v[l] > b.v[l]); }
inline M operator>=(F a, F b) { VT_LANEWISE_M(a.v[l] >= b.v[l]); }
inline M operator==(F a, F b) { VT_LANEWISE_M(a.v[l] == b.v[l]); }
inline M operator!=(F a, F b) { VT_LANEWISE_M(a.v[l] != b.v[l]); }
inline M operator&(M a, M b) { VT_LANEWISE_M(a.v[l] && b.v[l]); }
inline M operator|(M a, M b) { VT_LANEWISE_M(a.v[l] || b.v[l]); }
inline M AndNot(M a, M b) { VT_LANEWISE_M(a.v[l] && !b.v[l]); }  // a and not b
inline F Select(M m, F a, F b) { VT_LANEWISE_F(m.v[l] ? a.v[l] : b.v[l]); }
inline bool Any(M m) {
    for (int l = 0; l < kLanes; ++l) {
        if (m.v[l]) return true;
    }
    return false;
}
// The table index trunc(u * 16384) of a level u already in [0, 1].
inline I ToIndex(F u) {
    I out;
    for (int l = 0; l < kLanes; ++l) out.v[l] = static_cast<int32_t>(u.v[l] * 16384.0f);
    return out;
}
inline F Gather(const float* table, I index) { VT_LANEWISE_F(table[index.v[l]]); }

#undef VT_LANEWISE_F
#undef VT_LANEWISE_M

#elif defined(VT_KERNEL_AVX512)

constexpr int kLanes = 16;
struct F {
    __m512 v;
};
struct M {
    __mmask16 v;
};
struct I {
    __m512i v;
};

inline F Splat(float x) { return {_mm512_set1_ps(x)}; }
inline F Load(const float* p) { return {_mm512_loadu_ps(p)}; }
inline void Store(float* p, F a) { _mm512_storeu_ps(p, a.v); }
inline F operator+(F a, F b) { return {_mm512_add_ps(a.v, b.v)}; }
inline F operator-(F a, F b) { return {_mm512_sub_ps(a.v, b.v)}; }
inline F operator*(F a, F b) { return {_mm512_mul_ps(a.v, b.v)}; }
inline F operator/(F a, F b) { return {_mm512_div_ps(a.v, b.v)}; }
inline F Min(F a, F b) { return {_mm512_min_ps(a.v, b.v)}; }
inline F Max(F a, F b) { return {_mm512_max_ps(a.v, b.v)}; }
inline F Abs(F a) { return {_mm512_abs_ps(a.v)}; }
inline F Sqrt(F a) { return {_mm512_sqrt_ps(a.v)}; }
inline M operator<(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_LT_OQ)}; }
inline M operator<=(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_LE_OQ)}; }
inline M operator>(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_GT_OQ)}; }
inline M operator>=(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_GE_OQ)}; }
inline M operator==(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_EQ_OQ)}; }
inline M operator!=(F a, F b) { return {_mm512_cmp_ps_mask(a.v, b.v, _CMP_NEQ_UQ)}; }
inline M operator&(M a, M b) { return {static_cast<__mmask16>(a.v & b.v)}; }
inline M operator|(M a, M b) { return {static_cast<__mmask16>(a.v | b.v)}; }
inline M AndNot(M a, M b) { return {static_cast<__mmask16>(a.v & ~b.v)}; }
inline F Select(M m, F a, F b) { return {_mm512_mask_blend_ps(m.v, b.v, a.v)}; }
inline bool Any(M m) { return m.v != 0; }
inline I ToIndex(F u) { return {_mm512_cvttps_epi32(_mm512_mul_ps(u.v, _mm512_set1_ps(16384.0f)))}; }
inline F Gather(const float* table, I index) { return {_mm512_i32gather_ps(index.v, table, 4)}; }

#elif defined(VT_KERNEL_AVX2)

constexpr int kLanes = 8;
struct F {
    __m256 v;
};
struct M {
    __m256 v;
};
struct I {
    __m256i v;
};

inline F Splat(float x) { return {_mm256_set1_ps(x)}; }
inline F Load(const float* p) { return {_mm256_loadu_ps(p)}; }
inline void Store(float* p, F a) { _mm256_storeu_ps(p, a.v); }
inline F operator+(F a, F b) { return {_mm256_add_ps(a.v, b.v)}; }
inline F operator-(F a, F b) { return {_mm256_sub_ps(a.v, b.v)}; }
inline F operator*(F a, F b) { return {_mm256_mul_ps(a.v, b.v)}; }
inline F operator/(F a, F b) { return {_mm256_div_ps(a.v, b.v)}; }
inline F Min(F a, F b) { return {_mm256_min_ps(a.v, b.v)}; }
inline F Max(F a, F b) { return {_mm256_max_ps(a.v, b.v)}; }
inline F Abs(F a) { return {_mm256_andnot_ps(_mm256_set1_ps(-0.0f), a.v)}; }
inline F Sqrt(F a) { return {_mm256_sqrt_ps(a.v)}; }
inline M operator<(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_LT_OQ)}; }
inline M operator<=(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_LE_OQ)}; }
inline M operator>(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_GT_OQ)}; }
inline M operator>=(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_GE_OQ)}; }
inline M operator==(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_EQ_OQ)}; }
inline M operator!=(F a, F b) { return {_mm256_cmp_ps(a.v, b.v, _CMP_NEQ_UQ)}; }
inline M operator&(M a, M b) { return {_mm256_and_ps(a.v, b.v)}; }
inline M operator|(M a, M b) { return {_mm256_or_ps(a.v, b.v)}; }
inline M AndNot(M a, M b) { return {_mm256_andnot_ps(b.v, a.v)}; }
inline F Select(M m, F a, F b) { return {_mm256_blendv_ps(b.v, a.v, m.v)}; }
inline bool Any(M m) { return _mm256_movemask_ps(m.v) != 0; }
inline I ToIndex(F u) { return {_mm256_cvttps_epi32(_mm256_mul_ps(u.v, _mm256_set1_ps(16384.0f)))}; }
inline F Gather(const float* table, I index) { return {_mm256_i32gather_ps(table, index.v, 4)}; }

#elif defined(VT_KERNEL_SSE2)  // the x86-64 baseline

constexpr int kLanes = 4;
struct F {
    __m128 v;
};
struct M {
    __m128 v;
};
struct I {
    int32_t v[4];
};

inline F Splat(float x) { return {_mm_set1_ps(x)}; }
inline F Load(const float* p) { return {_mm_loadu_ps(p)}; }
inline void Store(float* p, F a) { _mm_storeu_ps(p, a.v); }
inline F operator+(F a, F b) { return {_mm_add_ps(a.v, b.v)}; }
inline F operator-(F a, F b) { return {_mm_sub_ps(a.v, b.v)}; }
inline F operator*(F a, F b) { return {_mm_mul_ps(a.v, b.v)}; }
inline F operator/(F a, F b) { return {_mm_div_ps(a.v, b.v)}; }
inline F Min(F a, F b) { return {_mm_min_ps(a.v, b.v)}; }
inline F Max(F a, F b) { return {_mm_max_ps(a.v, b.v)}; }
inline F Abs(F a) { return {_mm_andnot_ps(_mm_set1_ps(-0.0f), a.v)}; }
inline F Sqrt(F a) { return {_mm_sqrt_ps(a.v)}; }
inline M operator<(F a, F b) { return {_mm_cmplt_ps(a.v, b.v)}; }
inline M operator<=(F a, F b) { return {_mm_cmple_ps(a.v, b.v)}; }
inline M operator>(F a, F b) { return {_mm_cmpgt_ps(a.v, b.v)}; }
inline M operator>=(F a, F b) { return {_mm_cmpge_ps(a.v, b.v)}; }
inline M operator==(F a, F b) { return {_mm_cmpeq_ps(a.v, b.v)}; }
inline M operator!=(F a, F b) { return {_mm_cmpneq_ps(a.v, b.v)}; }
inline M operator&(M a, M b) { return {_mm_and_ps(a.v, b.v)}; }
inline M operator|(M a, M b) { return {_mm_or_ps(a.v, b.v)}; }
inline M AndNot(M a, M b) { return {_mm_andnot_ps(b.v, a.v)}; }
inline F Select(M m, F a, F b) { return {_mm_or_ps(_mm_and_ps(m.v, a.v), _mm_andnot_ps(m.v, b.v))}; }
inline bool Any(M m) { return _mm_movemask_ps(m.v) != 0; }
// Four scalar loads: SSE2 has no gather. The indices go through memory once and serve every table.
inline I ToIndex(F u) {
    I out;
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out.v), _mm_cvttps_epi32(_mm_mul_ps(u.v, _mm_set1_ps(16384.0f))));
    return out;
}
inline F Gather(const float* table, I index) {
    return {_mm_setr_ps(table[index.v[0]], table[index.v[1]], table[index.v[2]], table[index.v[3]])};
}

#else
#error "no kernel target selected"
#endif

// Entry i of a packed table holds four floats; GatherPacked reads the entry of each lane's index
// and returns its four values as four vectors. One 16-byte load per lane (and a transpose) costs
// less than four gathers, and the four values share a cache line.
struct Quad {
    F v[4];
};

#if defined(VT_KERNEL_PORTABLE)

inline Quad GatherPacked(const float* packed, I index) {
    Quad out;
    for (int k = 0; k < 4; ++k) {
        for (int l = 0; l < kLanes; ++l) out.v[k].v[l] = packed[4 * static_cast<int64_t>(index.v[l]) + k];
    }
    return out;
}

#elif defined(VT_KERNEL_AVX512)

// Rows of four entries (lanes l, l + 4, l + 8, l + 12), transposed within each 128-bit lane.
inline Quad GatherPacked(const float* packed, I index) {
    alignas(64) int32_t ix[kLanes];
    _mm512_store_si512(ix, index.v);
    auto entry = [&](int l) { return _mm_loadu_ps(packed + 4 * static_cast<int64_t>(ix[l])); };
    auto rows = [&](int l) {
        __m512 r = _mm512_castps128_ps512(entry(l));
        r = _mm512_insertf32x4(r, entry(l + 4), 1);
        r = _mm512_insertf32x4(r, entry(l + 8), 2);
        return _mm512_insertf32x4(r, entry(l + 12), 3);
    };
    const __m512 a = rows(0), b = rows(1), c = rows(2), d = rows(3);
    const __m512d ab0 = _mm512_castps_pd(_mm512_unpacklo_ps(a, b));
    const __m512d ab1 = _mm512_castps_pd(_mm512_unpackhi_ps(a, b));
    const __m512d cd0 = _mm512_castps_pd(_mm512_unpacklo_ps(c, d));
    const __m512d cd1 = _mm512_castps_pd(_mm512_unpackhi_ps(c, d));
    return {{{_mm512_castpd_ps(_mm512_unpacklo_pd(ab0, cd0))},
             {_mm512_castpd_ps(_mm512_unpackhi_pd(ab0, cd0))},
             {_mm512_castpd_ps(_mm512_unpacklo_pd(ab1, cd1))},
             {_mm512_castpd_ps(_mm512_unpackhi_pd(ab1, cd1))}}};
}

#elif defined(VT_KERNEL_AVX2)

// Rows of two entries (lanes l, l + 4), transposed within each 128-bit lane.
inline Quad GatherPacked(const float* packed, I index) {
    alignas(32) int32_t ix[kLanes];
    _mm256_store_si256(reinterpret_cast<__m256i*>(ix), index.v);
    auto entry = [&](int l) { return _mm_loadu_ps(packed + 4 * static_cast<int64_t>(ix[l])); };
    auto rows = [&](int l) { return _mm256_insertf128_ps(_mm256_castps128_ps256(entry(l)), entry(l + 4), 1); };
    const __m256 a = rows(0), b = rows(1), c = rows(2), d = rows(3);
    const __m256d ab0 = _mm256_castps_pd(_mm256_unpacklo_ps(a, b));
    const __m256d ab1 = _mm256_castps_pd(_mm256_unpackhi_ps(a, b));
    const __m256d cd0 = _mm256_castps_pd(_mm256_unpacklo_ps(c, d));
    const __m256d cd1 = _mm256_castps_pd(_mm256_unpackhi_ps(c, d));
    return {{{_mm256_castpd_ps(_mm256_unpacklo_pd(ab0, cd0))},
             {_mm256_castpd_ps(_mm256_unpackhi_pd(ab0, cd0))},
             {_mm256_castpd_ps(_mm256_unpacklo_pd(ab1, cd1))},
             {_mm256_castpd_ps(_mm256_unpackhi_pd(ab1, cd1))}}};
}

#else  // SSE2

inline Quad GatherPacked(const float* packed, I index) {
    __m128 a = _mm_loadu_ps(packed + 4 * static_cast<int64_t>(index.v[0]));
    __m128 b = _mm_loadu_ps(packed + 4 * static_cast<int64_t>(index.v[1]));
    __m128 c = _mm_loadu_ps(packed + 4 * static_cast<int64_t>(index.v[2]));
    __m128 d = _mm_loadu_ps(packed + 4 * static_cast<int64_t>(index.v[3]));
    _MM_TRANSPOSE4_PS(a, b, c, d);
    return {{{a}, {b}, {c}, {d}}};
}

#endif

}  // namespace
}  // namespace VT_KERNEL_NS
}  // namespace vt
