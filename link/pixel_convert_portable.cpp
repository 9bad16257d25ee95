// Row converters between host pixels and the planar float working format, written once over the
// vector width and compiled once per processor target (pixel_convert_avx2.cpp and
// pixel_convert_avx512.cpp include this file with their own namespace and width). Built on its
// own it is the portable four-wide path every x86-64 processor runs, plus the pixel-by-pixel
// reference the vector paths must equal.
//
// Every formula is one template used by both the single-pixel and the vector code, so the two
// evaluate the same operations in the same order; the build turns off floating-point
// contraction for this directory, which keeps the results identical on every target.
#ifndef VT_CONVERT_NS
#define VT_CONVERT_NS convert_portable
#define VT_CONVERT_WIDTH 4
#define VT_CONVERT_WITH_SCALAR 1
#endif

#include "link/pixel_convert_internal.h"

#include <cstring>
#include <utility>

#if defined(__FMA__)
#include <immintrin.h>
#endif

namespace vt::VT_CONVERT_NS {
namespace {

template <int W>
struct Vec {
    typedef float F __attribute__((vector_size(W * 4)));
    typedef int32_t I __attribute__((vector_size(W * 4)));
    typedef uint32_t U __attribute__((vector_size(W * 4)));
};

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

// Two-source shuffles on vectors of W lanes: even and odd lanes of the concatenation, and the
// interleaving of the low or high halves.
template <class T, size_t... I>
inline T EvenLanes(T a, T b, std::index_sequence<I...>) {
    return __builtin_shufflevector(a, b, (2 * I)...);
}
template <class T, size_t... I>
inline T OddLanes(T a, T b, std::index_sequence<I...>) {
    return __builtin_shufflevector(a, b, (2 * I + 1)...);
}
template <class T, size_t... I>
inline T InterleaveLow(T a, T b, std::index_sequence<I...>) {
    constexpr size_t w = sizeof...(I);
    return __builtin_shufflevector(a, b, ((I % 2) ? w + I / 2 : I / 2)...);
}
template <class T, size_t... I>
inline T InterleaveHigh(T a, T b, std::index_sequence<I...>) {
    constexpr size_t w = sizeof...(I);
    return __builtin_shufflevector(a, b, ((I % 2) ? w + w / 2 + I / 2 : w / 2 + I / 2)...);
}
// Lane i takes lane i & ~1 (the first of its pair) or i | 1 (the second).
template <class T, size_t... I>
inline T PairFirst(T a, std::index_sequence<I...>) {
    return __builtin_shufflevector(a, a, (I & ~size_t{1})...);
}
template <class T, size_t... I>
inline T PairSecond(T a, std::index_sequence<I...>) {
    return __builtin_shufflevector(a, a, (I | size_t{1})...);
}
// Even lanes from a, odd lanes from b's previous lane: the chroma word of each 4:2:2 pair.
template <class T, size_t... I>
inline T PairChroma(T a, T b, std::index_sequence<I...>) {
    constexpr size_t w = sizeof...(I);
    return __builtin_shufflevector(a, b, ((I % 2) ? w + I - 1 : I)...);
}

// Four vectors of W lanes holding W four-channel pixels become one vector per channel, and back.
template <int W>
inline void Deinterleave4(const float* p, typename Vec<W>::F c[4]) {
    using F = typename Vec<W>::F;
    constexpr auto seq = std::make_index_sequence<W>{};
    const F v0 = Load<F>(p), v1 = Load<F>(p + W), v2 = Load<F>(p + 2 * W), v3 = Load<F>(p + 3 * W);
    const F a01 = EvenLanes(v0, v1, seq), b01 = OddLanes(v0, v1, seq);
    const F a23 = EvenLanes(v2, v3, seq), b23 = OddLanes(v2, v3, seq);
    c[0] = EvenLanes(a01, a23, seq);
    c[2] = OddLanes(a01, a23, seq);
    c[1] = EvenLanes(b01, b23, seq);
    c[3] = OddLanes(b01, b23, seq);
}

template <int W>
inline void Interleave4(const typename Vec<W>::F c[4], float* p) {
    using F = typename Vec<W>::F;
    constexpr auto seq = std::make_index_sequence<W>{};
    const F x02lo = InterleaveLow(c[0], c[2], seq), x02hi = InterleaveHigh(c[0], c[2], seq);
    const F x13lo = InterleaveLow(c[1], c[3], seq), x13hi = InterleaveHigh(c[1], c[3], seq);
    Store(p, InterleaveLow(x02lo, x13lo, seq));
    Store(p + W, InterleaveHigh(x02lo, x13lo, seq));
    Store(p + 2 * W, InterleaveLow(x02hi, x13hi, seq));
    Store(p + 3 * W, InterleaveHigh(x02hi, x13hi, seq));
}

// ---- formulas, for float and for vectors of float ----

// NaN becomes lo: the comparison fails, as the vector max instruction also answers.
template <class T>
inline T ClampRange(T x, float lo, float hi) {
    const T y = x > lo ? x : lo;
    return y < hi ? y : hi;
}

template <class T>
inline T AtMost(T x, float hi) {
    return x < hi ? x : hi;
}

#if defined(__FMA__)
inline Vec<4>::F FusedMulAdd(Vec<4>::F a, Vec<4>::F b, Vec<4>::F c) {
    return (Vec<4>::F)_mm_fmadd_ps((__m128)a, (__m128)b, (__m128)c);
}
#if VT_CONVERT_WIDTH >= 8
inline Vec<8>::F FusedMulAdd(Vec<8>::F a, Vec<8>::F b, Vec<8>::F c) {
    return (Vec<8>::F)_mm256_fmadd_ps((__m256)a, (__m256)b, (__m256)c);
}
#endif
#if VT_CONVERT_WIDTH >= 16
inline Vec<16>::F FusedMulAdd(Vec<16>::F a, Vec<16>::F b, Vec<16>::F c) {
    return (Vec<16>::F)_mm512_fmadd_ps((__m512)a, (__m512)b, (__m512)c);
}
#endif
#endif

// x / d as a correctly rounded division. Vector division is slow on wide paths; there one
// multiplication by the rounded reciprocal and one fused correction step give the same quotient
// for every value these conversions can produce (the tests check each such domain whole).
template <class T>
inline T Divide(T x, float d, float reciprocal) {
#if defined(__FMA__)
    if constexpr (sizeof(T) > sizeof(float)) {
        const T dv = T{} + d;
        const T rv = T{} + reciprocal;
        const T q = x * rv;
        const T e = FusedMulAdd(-q, dv, x);
        return FusedMulAdd(e, rv, q);
    }
#endif
    (void)reciprocal;
    return x / d;
}

template <class T>
inline T Divide255(T x) {
    return Divide(x, 255.0f, 1.0f / 255.0f);
}

template <class T>
struct Rgbl {
    T r, g, b, l;
};

template <class T>
inline T Luma(T r, T g, T b) {
    return 0.299f * r + 0.587f * g + 0.114f * b;
}

template <class T>
inline Rgbl<T> FromBytes(T r, T g, T b) {
    r = Divide255(r);
    g = Divide255(g);
    b = Divide255(b);
    return {r, g, b, Luma(r, g, b)};
}

constexpr float kInv32768 = 3.0517578e-5f;  // 1 / 32768

template <class T>
inline Rgbl<T> FromWords(T r, T g, T b) {
    r = AtMost(r * kInv32768, 1.0f);
    g = AtMost(g * kInv32768, 1.0f);
    b = AtMost(b * kInv32768, 1.0f);
    return {r, g, b, Luma(r, g, b)};
}

template <class T>
inline Rgbl<T> FromFloats(T r, T g, T b) {
    return {r, g, b, Luma(r, g, b)};
}

// BT.601 studio-range bytes.
template <class T>
inline Rgbl<T> FromVuyaBytes(T yByte, T uByte, T vByte) {
    const T y = (yByte - 16.0f) * 1.1643828f;
    const T u = uByte - 128.0f;
    const T v = vByte - 128.0f;
    return {Divide255(y + 1.5960274f * v), Divide255(y - 0.39176172f * u - 0.81296875f * v),
            Divide255(y + 2.0172305f * u), Divide255(y)};
}

template <class T>
inline Rgbl<T> FromVuyaFloats(T yIn, T u, T v) {
    const T y = yIn * 1.1643828f;
    return {y + 1.5960274f * v, y - 0.39176172f * u - 0.81296875f * v, y + 2.0172305f * u, y};
}

// 4:2:2 coefficients with the 1/64 scale folded in (exact: a power of two).
struct Coeffs422 {
    float y, rCr, gCb, gCr, bCb;
};
constexpr Coeffs422 k601 = {0.00114155f / 64, 0.00156473f / 64, 0.00038408f / 64, 0.000797027f / 64,
                            0.00197768f / 64};
constexpr Coeffs422 k709 = {0.00114155f / 64, 0.00175759f / 64, 0.000209067f / 64, 0.00052246f / 64,
                            0.00207098f / 64};

template <class T>
inline Rgbl<T> From422(T yWord, T cbWord, T crWord, const Coeffs422& k) {
    const T y = yWord - 4096.0f;
    const T cb = cbWord - 32768.0f;
    const T cr = crWord - 32768.0f;
    return {y * k.y + cr * k.rCr, y * k.y - cb * k.gCb - cr * k.gCr, y * k.y + cb * k.bCb,
            Divide(y, 56064.0f, 1.0f / 56064.0f)};
}

template <class T>
inline T ToByteLevel(T c) {
    return ClampRange(c + 0.001953125f, 0.0f, 1.0f) * 255.0f;  // + 1/512
}

template <class T>
inline T ToWordLevel(T c) {
    return ClampRange(c, 0.0f, 1.0f) * 32768.0f;
}

template <class T>
struct Yuv {
    T y, u, v;
};

template <class T>
inline Yuv<T> ToVuyaFloats(T r, T g, T b) {
    return {0.25678906f * r + 0.50412893f * g + 0.09790625f * b,
            -0.14822266f * r - 0.2909922f * g + 0.43921483f * b,
            0.43921483f * r - 0.36778906f * g - 0.07142578f * b};
}

template <class T>
inline Yuv<T> ToVuyaBytes(T r, T g, T b) {
    const Yuv<T> f = ToVuyaFloats(r, g, b);
    return {ClampRange(255.0f * f.y + 16.0f, 1.0f, 254.0f), ClampRange(255.0f * f.u + 128.0f, 1.0f, 254.0f),
            ClampRange(255.0f * f.v + 128.0f, 1.0f, 254.0f)};
}

struct Matrix422 {
    float yr, yg, yb, cbr, cbg, crg, crb;
};
constexpr Matrix422 kTo601 = {16763.137f, 32909.566f, 6391.296f, -9675.997f, -18996.002f, -24009.244f, -4662.755f};
constexpr Matrix422 kTo709 = {11919.206f, 40096.973f, 4047.8208f, -6570.0166f, -22101.982f, -26042.95f, -2629.0503f};

// Y, Cb, Cr levels of a 4:2:2 word, already clamped to 1..65472.
template <class T>
inline Yuv<T> To422(T r, T g, T b, const Matrix422& m) {
    r = AtMost(r, 1.0f);
    g = AtMost(g, 1.0f);
    b = AtMost(b, 1.0f);
    return {ClampRange(m.yr * r + m.yg * g + m.yb * b + 4096.0f, 1.0f, 65472.0f),
            ClampRange(m.cbr * r + m.cbg * g + 28672.0f * b + 32768.0f, 1.0f, 65472.0f),
            ClampRange(28672.0f * r + m.crg * g + m.crb * b + 32768.0f, 1.0f, 65472.0f)};
}

inline uint32_t Trunc(float x) {
    return static_cast<uint32_t>(static_cast<int32_t>(x));
}

template <int W>
inline typename Vec<W>::U Trunc(typename Vec<W>::F x) {
    return (typename Vec<W>::U)__builtin_convertvector(x, typename Vec<W>::I);
}

template <int W>
inline typename Vec<W>::F ToFloat(typename Vec<W>::U x) {
    return __builtin_convertvector((typename Vec<W>::I)x, typename Vec<W>::F);
}

// ---- layouts ----

struct Planes {
    float* r;
    float* g;
    float* b;
    float* l;
};

struct ConstPlanes {
    const float* r;
    const float* g;
    const float* b;
};

template <class T>
inline void Put(const Planes& p, uint32_t x, const Rgbl<T>& v) {
    if constexpr (sizeof(T) == sizeof(float)) {
        p.r[x] = v.r;
        p.g[x] = v.g;
        p.b[x] = v.b;
        p.l[x] = v.l;
    } else {
        Store(p.r + x, v.r);
        Store(p.g + x, v.g);
        Store(p.b + x, v.b);
        Store(p.l + x, v.l);
    }
}

inline float Byte(const uint8_t* p, int i) {
    return static_cast<float>(p[i]);
}

inline float Word(const uint8_t* p, int i) {
    uint16_t w;
    std::memcpy(&w, p + 2 * i, 2);
    return static_cast<float>(w);
}

inline float Float(const uint8_t* p, int i) {
    float f;
    std::memcpy(&f, p + 4 * i, 4);
    return f;
}

inline void PutFloats(uint8_t* p, float c0, float c1, float c2, float c3) {
    const float v[4] = {c0, c1, c2, c3};
    std::memcpy(p, v, sizeof v);
}

inline void PutWords(uint8_t* p, uint32_t w0, uint32_t w1) {
    const uint32_t v[2] = {w0, w1};
    std::memcpy(p, v, sizeof v);
}

// Byte k of each little-endian 32-bit pixel.
template <int W>
inline typename Vec<W>::F ByteLane(typename Vec<W>::U w, int k) {
    return ToFloat<W>((w >> (8 * k)) & 255u);
}

template <int W>
inline typename Vec<W>::U PackBytes(typename Vec<W>::U b0, typename Vec<W>::U b1, typename Vec<W>::U b2,
                                    typename Vec<W>::U b3) {
    return b0 | (b1 << 8) | (b2 << 16) | (b3 << 24);
}

// 8-bit layouts: the byte index of R, G, B (or V, U, Y) in a pixel, and where alpha sits.
template <int kR, int kG, int kB, int kA>
struct Bytes4 {
    static constexpr uint32_t kBytes = 4;
    static constexpr uint32_t kAlphaMask = 0xffu << (8 * kA);

    static void ImportOne(const uint8_t* p, const Planes& out, uint32_t x) {
        const uint8_t* q = p + 4 * x;
        Put(out, x, FromBytes(Byte(q, kR), Byte(q, kG), Byte(q, kB)));
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        const auto w = Load<typename Vec<W>::U>(p + 4 * x);
        Put(out, x, FromBytes(ByteLane<W>(w, kR), ByteLane<W>(w, kG), ByteLane<W>(w, kB)));
    }
    static void ExportOne(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        uint8_t* q = p + 4 * x;
        q[kR] = static_cast<uint8_t>(Trunc(ToByteLevel(in.r[x])));
        q[kG] = static_cast<uint8_t>(Trunc(ToByteLevel(in.g[x])));
        q[kB] = static_cast<uint8_t>(Trunc(ToByteLevel(in.b[x])));
        q[kA] = 255;
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        using U = typename Vec<W>::U;
        U c[4];
        c[kR] = Trunc<W>(ToByteLevel(Load<F>(in.r + x)));
        c[kG] = Trunc<W>(ToByteLevel(Load<F>(in.g + x)));
        c[kB] = Trunc<W>(ToByteLevel(Load<F>(in.b + x)));
        c[kA] = U{} + 255u;
        Store(p + 4 * x, PackBytes<W>(c[0], c[1], c[2], c[3]));
    }
};

using Argb8 = Bytes4<1, 2, 3, 0>;
using Bgra8 = Bytes4<2, 1, 0, 3>;

struct Vuya8 {
    static constexpr uint32_t kBytes = 4;
    static constexpr uint32_t kAlphaMask = 0xff000000u;

    static void ImportOne(const uint8_t* p, const Planes& out, uint32_t x) {
        const uint8_t* q = p + 4 * x;
        Put(out, x, FromVuyaBytes(Byte(q, 2), Byte(q, 1), Byte(q, 0)));
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        const auto w = Load<typename Vec<W>::U>(p + 4 * x);
        Put(out, x, FromVuyaBytes(ByteLane<W>(w, 2), ByteLane<W>(w, 1), ByteLane<W>(w, 0)));
    }
    static void ExportOne(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        const Yuv<float> c = ToVuyaBytes(in.r[x], in.g[x], in.b[x]);
        uint8_t* q = p + 4 * x;
        q[0] = static_cast<uint8_t>(Trunc(c.v));
        q[1] = static_cast<uint8_t>(Trunc(c.u));
        q[2] = static_cast<uint8_t>(Trunc(c.y));
        q[3] = 255;
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        using U = typename Vec<W>::U;
        const Yuv<F> c = ToVuyaBytes(Load<F>(in.r + x), Load<F>(in.g + x), Load<F>(in.b + x));
        Store(p + 4 * x, PackBytes<W>(Trunc<W>(c.v), Trunc<W>(c.u), Trunc<W>(c.y), U{} + 255u));
    }
};

// Four u16 A, R, G, B: two little-endian words per pixel, A | R << 16 and G | B << 16.
struct Argb16 {
    static constexpr uint32_t kBytes = 8;

    static void ImportOne(const uint8_t* p, const Planes& out, uint32_t x) {
        const uint8_t* q = p + 8 * x;
        Put(out, x, FromWords(Word(q, 1), Word(q, 2), Word(q, 3)));
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        using U = typename Vec<W>::U;
        constexpr auto seq = std::make_index_sequence<W>{};
        const U v0 = Load<U>(p + 8 * x), v1 = Load<U>(p + 8 * x + 4 * W);
        const U ar = EvenLanes(v0, v1, seq), gb = OddLanes(v0, v1, seq);
        Put(out, x, FromWords(ToFloat<W>(ar >> 16), ToFloat<W>(gb & 0xffffu), ToFloat<W>(gb >> 16)));
    }
    static void ExportOne(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        const uint32_t r = Trunc(ToWordLevel(in.r[x])), g = Trunc(ToWordLevel(in.g[x])),
                       b = Trunc(ToWordLevel(in.b[x]));
        PutWords(p + 8 * x, 32767u | (r << 16), g | (b << 16));
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        constexpr auto seq = std::make_index_sequence<W>{};
        const auto r = Trunc<W>(ToWordLevel(Load<F>(in.r + x)));
        const auto g = Trunc<W>(ToWordLevel(Load<F>(in.g + x)));
        const auto b = Trunc<W>(ToWordLevel(Load<F>(in.b + x)));
        const auto ar = 32767u | (r << 16), gb = g | (b << 16);
        Store(p + 8 * x, InterleaveLow(ar, gb, seq));
        Store(p + 8 * x + 4 * W, InterleaveHigh(ar, gb, seq));
    }
};

// Four floats per pixel; kR, kG, kB, kA give each channel's position.
template <int kR, int kG, int kB, int kA>
struct Floats4 {
    static constexpr uint32_t kBytes = 16;

    static void ImportOne(const uint8_t* p, const Planes& out, uint32_t x) {
        const uint8_t* q = p + 16 * x;
        Put(out, x, FromFloats(Float(q, kR), Float(q, kG), Float(q, kB)));
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        typename Vec<W>::F c[4];
        Deinterleave4<W>(reinterpret_cast<const float*>(p + 16 * x), c);
        Put(out, x, FromFloats(c[kR], c[kG], c[kB]));
    }
    static void ExportOne(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        float c[4];
        c[kR] = in.r[x];
        c[kG] = in.g[x];
        c[kB] = in.b[x];
        c[kA] = 1.0f;
        PutFloats(p + 16 * x, c[0], c[1], c[2], c[3]);
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        F c[4];
        c[kR] = Load<F>(in.r + x);
        c[kG] = Load<F>(in.g + x);
        c[kB] = Load<F>(in.b + x);
        c[kA] = F{} + 1.0f;
        Interleave4<W>(c, reinterpret_cast<float*>(p + 16 * x));
    }
};

using ArgbFloat = Floats4<1, 2, 3, 0>;
using BgraFloat = Floats4<2, 1, 0, 3>;

struct VuyaFloat {
    static constexpr uint32_t kBytes = 16;

    static void ImportOne(const uint8_t* p, const Planes& out, uint32_t x) {
        const uint8_t* q = p + 16 * x;
        Put(out, x, FromVuyaFloats(Float(q, 2), Float(q, 1), Float(q, 0)));
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        typename Vec<W>::F c[4];
        Deinterleave4<W>(reinterpret_cast<const float*>(p + 16 * x), c);
        Put(out, x, FromVuyaFloats(c[2], c[1], c[0]));
    }
    static void ExportOne(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        const Yuv<float> c = ToVuyaFloats(in.r[x], in.g[x], in.b[x]);
        PutFloats(p + 16 * x, c.v, c.u, c.y, 1.0f);
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        const Yuv<F> y = ToVuyaFloats(Load<F>(in.r + x), Load<F>(in.g + x), Load<F>(in.b + x));
        const F c[4] = {y.v, y.u, y.y, F{} + 1.0f};
        Interleave4<W>(c, reinterpret_cast<float*>(p + 16 * x));
    }
};

// 4:2:2 in pairs of 32-bit words: Y0 | Cr << 16, then Y1 | Cb << 16. The vector code runs on
// whole pairs (every vector width is even); a row of odd width ends in a lone pixel that has
// only its first word: it borrows Cb from the pair before it (neutral chroma in a one-pixel row)
// and exports only that word, so no row is read or written past its width.
template <const Coeffs422& kIn, const Matrix422& kOut>
struct Yuv422 {
    static constexpr uint32_t kBytes = 4;

    static uint32_t WordAt(const uint8_t* p, uint32_t i) {
        uint32_t w;
        std::memcpy(&w, p + 4 * i, 4);
        return w;
    }
    // Pixels x (even) and x + 1, or x alone when it is the last of the row.
    static void ImportPair(const uint8_t* p, const Planes& out, uint32_t x, uint32_t width) {
        const uint32_t w0 = WordAt(p, x);
        const float cr = static_cast<float>(w0 >> 16);
        if (x + 1 < width) {
            const uint32_t w1 = WordAt(p, x + 1);
            const float cb = static_cast<float>(w1 >> 16);
            Put(out, x, From422(static_cast<float>(w0 & 0xffffu), cb, cr, kIn));
            Put(out, x + 1, From422(static_cast<float>(w1 & 0xffffu), cb, cr, kIn));
        } else {
            const float cb = x >= 2 ? static_cast<float>(WordAt(p, x - 1) >> 16) : 32768.0f;
            Put(out, x, From422(static_cast<float>(w0 & 0xffffu), cb, cr, kIn));
        }
    }
    template <int W>
    static void ImportWide(const uint8_t* p, const Planes& out, uint32_t x) {
        constexpr auto seq = std::make_index_sequence<W>{};
        const auto w = Load<typename Vec<W>::U>(p + 4 * x);
        Put(out, x, From422(ToFloat<W>(w & 0xffffu), ToFloat<W>(PairSecond(w, seq) >> 16),
                            ToFloat<W>(PairFirst(w, seq) >> 16), kIn));
    }
    static void ExportPair(const ConstPlanes& in, uint8_t* p, uint32_t x, uint32_t width) {
        const Yuv<float> a = To422(in.r[x], in.g[x], in.b[x], kOut);
        const uint32_t w0 = Trunc(a.y) | (Trunc(a.v) << 16);
        if (x + 1 < width) {
            const Yuv<float> b = To422(in.r[x + 1], in.g[x + 1], in.b[x + 1], kOut);
            PutWords(p + 4 * x, w0, Trunc(b.y) | (Trunc(a.u) << 16));
        } else {
            std::memcpy(p + 4 * x, &w0, 4);
        }
    }
    template <int W>
    static void ExportWide(const ConstPlanes& in, uint8_t* p, uint32_t x) {
        using F = typename Vec<W>::F;
        constexpr auto seq = std::make_index_sequence<W>{};
        const Yuv<F> c = To422(Load<F>(in.r + x), Load<F>(in.g + x), Load<F>(in.b + x), kOut);
        Store(p + 4 * x, Trunc<W>(c.y) | (PairChroma(Trunc<W>(c.v), Trunc<W>(c.u), seq) << 16));
    }
};

using Yuv601 = Yuv422<k601, kTo601>;
using Yuv709 = Yuv422<k709, kTo709>;

template <class L>
concept PairLayout = requires { &L::ImportPair; };

// ---- rows and frames ----

// kWidth 0 converts pixel by pixel; otherwise the widest vectors first, then four-wide, then the
// last one to three pixels singly.
template <class L, int kWidth>
void ImportRow(const uint8_t* p, const Planes& out, uint32_t width) {
    uint32_t x = 0;
    if constexpr (kWidth >= 16) {
        for (; x + 16 <= width; x += 16) L::template ImportWide<16>(p, out, x);
    }
    if constexpr (kWidth >= 8) {
        for (; x + 8 <= width; x += 8) L::template ImportWide<8>(p, out, x);
    }
    if constexpr (kWidth >= 4) {
        for (; x + 4 <= width; x += 4) L::template ImportWide<4>(p, out, x);
    }
    if constexpr (PairLayout<L>) {
        for (; x < width; x += 2) L::ImportPair(p, out, x, width);
    } else {
        for (; x < width; ++x) L::ImportOne(p, out, x);
    }
}

template <class L, int kWidth>
void ExportRow(const ConstPlanes& in, uint8_t* p, uint32_t width) {
    uint32_t x = 0;
    if constexpr (kWidth >= 16) {
        for (; x + 16 <= width; x += 16) L::template ExportWide<16>(in, p, x);
    }
    if constexpr (kWidth >= 8) {
        for (; x + 8 <= width; x += 8) L::template ExportWide<8>(in, p, x);
    }
    if constexpr (kWidth >= 4) {
        for (; x + 4 <= width; x += 4) L::template ExportWide<4>(in, p, x);
    }
    if constexpr (PairLayout<L>) {
        for (; x < width; x += 2) L::ExportPair(in, p, x, width);
    } else {
        for (; x < width; ++x) L::ExportOne(in, p, x);
    }
}

inline float* PlaneRow(const FrameBuffer& f, int plane, uint32_t y) {
    return reinterpret_cast<float*>(f.data + static_cast<size_t>(plane) * f.planeSize +
                                    static_cast<size_t>(y) * f.rowBytes);
}

template <class L, int kWidth>
void ImportFrame(const uint8_t* src, ptrdiff_t srcRowBytes, const FrameBuffer& f) {
    const uint32_t rowFloats = f.rowBytes / 4;
    for (uint32_t y = 0; y < f.height; ++y) {
        const Planes out = {PlaneRow(f, 0, y), PlaneRow(f, 1, y), PlaneRow(f, 2, y), PlaneRow(f, 3, y)};
        ImportRow<L, kWidth>(src + static_cast<ptrdiff_t>(y) * srcRowBytes, out, f.width);
        // The kernel works on whole groups of four: its padding lanes must hold numbers.
        for (uint32_t x = f.width; x < rowFloats; ++x) out.r[x] = out.g[x] = out.b[x] = out.l[x] = 0.0f;
    }
}

template <class L, int kWidth>
void ExportFrame(const FrameBuffer& f, uint8_t* dst, ptrdiff_t dstRowBytes) {
    for (uint32_t y = 0; y < f.height; ++y) {
        const ConstPlanes in = {PlaneRow(f, 0, y), PlaneRow(f, 1, y), PlaneRow(f, 2, y)};
        ExportRow<L, kWidth>(in, dst + static_cast<ptrdiff_t>(y) * dstRowBytes, f.width);
    }
}

// 8-bit layouts: whole pixels as 32-bit words, alpha taken through a mask.
template <uint32_t kMask, int kWidth>
void CopyAlphaBytes(const uint8_t* in, ptrdiff_t inRowBytes, uint8_t* out, ptrdiff_t outRowBytes, uint32_t width,
                    uint32_t height) {
    for (uint32_t y = 0; y < height; ++y) {
        const uint8_t* s = in + static_cast<ptrdiff_t>(y) * inRowBytes;
        uint8_t* d = out + static_cast<ptrdiff_t>(y) * outRowBytes;
        uint32_t x = 0;
        if constexpr (kWidth >= 4) {
            using U = typename Vec<kWidth>::U;
            for (; x + kWidth <= width; x += kWidth) {
                const U a = Load<U>(s + 4 * x), c = Load<U>(d + 4 * x);
                Store(d + 4 * x, (c & ~kMask) | (a & kMask));
            }
        }
        for (; x < width; ++x) {
            uint32_t a, c;
            std::memcpy(&a, s + 4 * x, 4);
            std::memcpy(&c, d + 4 * x, 4);
            c = (c & ~kMask) | (a & kMask);
            std::memcpy(d + 4 * x, &c, 4);
        }
    }
}

// Wider pixels: the alpha field (size bytes at offset) copied pixel by pixel.
template <uint32_t kPixelBytes, uint32_t kOffset, uint32_t kSize>
void CopyAlphaField(const uint8_t* in, ptrdiff_t inRowBytes, uint8_t* out, ptrdiff_t outRowBytes, uint32_t width,
                    uint32_t height) {
    for (uint32_t y = 0; y < height; ++y) {
        const uint8_t* s = in + static_cast<ptrdiff_t>(y) * inRowBytes + kOffset;
        uint8_t* d = out + static_cast<ptrdiff_t>(y) * outRowBytes + kOffset;
        for (uint32_t x = 0; x < width; ++x) std::memcpy(d + kPixelBytes * x, s + kPixelBytes * x, kSize);
    }
}

template <int kWidth>
constexpr ConvertKernels MakeKernels(const char* name) {
    return ConvertKernels{
        name,
        {ImportFrame<Argb8, kWidth>, ImportFrame<Bgra8, kWidth>, ImportFrame<Argb16, kWidth>,
         ImportFrame<ArgbFloat, kWidth>, ImportFrame<BgraFloat, kWidth>, ImportFrame<Vuya8, kWidth>,
         ImportFrame<VuyaFloat, kWidth>, ImportFrame<Yuv601, kWidth>, ImportFrame<Yuv709, kWidth>},
        {ExportFrame<Argb8, kWidth>, ExportFrame<Bgra8, kWidth>, ExportFrame<Argb16, kWidth>,
         ExportFrame<ArgbFloat, kWidth>, ExportFrame<BgraFloat, kWidth>, ExportFrame<Vuya8, kWidth>,
         ExportFrame<VuyaFloat, kWidth>, ExportFrame<Yuv601, kWidth>, ExportFrame<Yuv709, kWidth>},
        {CopyAlphaBytes<Argb8::kAlphaMask, kWidth>, CopyAlphaBytes<Bgra8::kAlphaMask, kWidth>,
         CopyAlphaField<8, 0, 2>, CopyAlphaField<16, 0, 4>, CopyAlphaField<16, 12, 4>,
         CopyAlphaBytes<Vuya8::kAlphaMask, kWidth>, CopyAlphaField<16, 12, 4>, nullptr, nullptr},
    };
}

#define VT_STRINGIFY2(x) #x
#define VT_STRINGIFY(x) VT_STRINGIFY2(x)

}  // namespace

extern const ConvertKernels kKernels = MakeKernels<VT_CONVERT_WIDTH>(VT_STRINGIFY(VT_CONVERT_NS));

}  // namespace vt::VT_CONVERT_NS

#if defined(VT_CONVERT_WITH_SCALAR)
namespace vt::convert_scalar {
extern const ConvertKernels kKernels = convert_portable::MakeKernels<0>("convert_scalar");
}  // namespace vt::convert_scalar
#endif
