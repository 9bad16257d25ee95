#include "resample/resample.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "resample/resample_internal.h"

namespace vt {
namespace {

uint32_t Channels(ResampleKind kind) {
    return kind == ResampleKind::kFloat1 ? 1 : 4;
}

uint32_t SampleBytes(ResampleKind kind) {
    return kind == ResampleKind::kByte4 ? 1 : 4;
}

// An image of one kind with padded rows, its samples read and written as doubles.
struct Image {
    ResampleKind kind;
    uint32_t width, height;
    ptrdiff_t rowBytes;
    std::vector<uint8_t> bytes;

    Image(ResampleKind k, uint32_t w, uint32_t h)
        : kind(k), width(w), height(h), rowBytes(w * Channels(k) * SampleBytes(k) + 24), bytes(rowBytes * h + 1, 0) {}
    ResampleImage View() { return {bytes.data(), rowBytes, width, height}; }
    uint8_t* At(uint32_t x, uint32_t y, uint32_t c) {
        return bytes.data() + y * rowBytes + (x * Channels(kind) + c) * SampleBytes(kind);
    }
    double Get(uint32_t x, uint32_t y, uint32_t c) {
        if (kind == ResampleKind::kByte4) return *At(x, y, c);
        float f;
        std::memcpy(&f, At(x, y, c), 4);
        return f;
    }
    void Put(uint32_t x, uint32_t y, uint32_t c, double v) {
        if (kind == ResampleKind::kByte4) {
            *At(x, y, c) = static_cast<uint8_t>(v);
        } else {
            const float f = static_cast<float>(v);
            std::memcpy(At(x, y, c), &f, 4);
        }
    }
    void Randomise(uint32_t seed) {
        std::mt19937 rng(seed);
        for (uint32_t y = 0; y < height; ++y)
            for (uint32_t x = 0; x < width; ++x)
                for (uint32_t c = 0; c < Channels(kind); ++c)
                    Put(x, y, c, kind == ResampleKind::kByte4 ? rng() % 256 : (rng() % 100000) / 100000.0);
    }
};

int32_t Resize(Image& src, Image& dst, double fx, double fy) {
    std::vector<uint8_t> work(ResizeWorkSize(src.kind, src.width, src.height, dst.width, dst.height, fx, fy) + 3);
    // An odd offset: the resampler aligns what it needs itself.
    return ResizeCubic(src.kind, src.View(), dst.View(), fx, fy, work.data() + 3, work.size() - 3);
}

// The resize written out as its definition: each output is the normalised double sum of the
// cubic kernel, stretched by 1 / factor when shrinking, over source samples with repeated edges.
double Direct(Image& src, double fx, double fy, uint32_t dx, uint32_t dy, uint32_t c) {
    auto weights = [](double factor, uint32_t d, uint32_t size, std::vector<std::pair<int64_t, double>>& out) {
        const double scale = std::min(factor, 1.0);
        const double centre = (d + 0.5) / factor - 0.5;
        out.clear();
        const double reach = 2.0 / scale + 2.0;
        for (int64_t j = static_cast<int64_t>(std::floor(centre - reach)); j <= centre + reach; ++j) {
            const double w = CubicKernel((j - centre) * scale);
            if (w != 0.0) out.push_back({std::clamp<int64_t>(j, 0, size - 1), w});
        }
    };
    std::vector<std::pair<int64_t, double>> wx, wy;
    weights(fx, dx, src.width, wx);
    weights(fy, dy, src.height, wy);
    double sum = 0, norm = 0;
    for (auto [y, a] : wy) {
        for (auto [x, b] : wx) {
            sum += a * b * src.Get(static_cast<uint32_t>(x), static_cast<uint32_t>(y), c);
            norm += a * b;
        }
    }
    return sum / norm;
}

TEST(CubicKernel, IsTheCubicConvolutionWithAMinusHalf) {
    EXPECT_EQ(CubicKernel(0.0), 1.0);
    EXPECT_EQ(CubicKernel(1.0), 0.0);
    EXPECT_EQ(CubicKernel(-2.0), 0.0);
    EXPECT_EQ(CubicKernel(3.0), 0.0);
    EXPECT_DOUBLE_EQ(CubicKernel(0.5), 0.5625);
    EXPECT_DOUBLE_EQ(CubicKernel(-1.5), -0.0625);
    for (double t = 0; t < 1; t += 0.125) {  // a partition of unity at every phase
        EXPECT_NEAR(CubicKernel(t - 1) + CubicKernel(t) + CubicKernel(t + 1) + CubicKernel(t - 2), 1.0, 1e-12);
    }
}

TEST(Resize, MatchesADirectEvaluationOfTheKernel) {
    struct Factors {
        uint32_t dw, dh;
    };
    for (ResampleKind kind : {ResampleKind::kFloat1, ResampleKind::kByte4, ResampleKind::kFloat4}) {
        Image src(kind, 23, 17);
        src.Randomise(11);
        for (Factors f : {Factors{6, 34}, Factors{46, 5}, Factors{12, 9}, Factors{39, 51}, Factors{23, 17},
                          Factors{7, 21}, Factors{1, 1}, Factors{64, 3}}) {
            Image dst(kind, f.dw, f.dh);
            const double fx = static_cast<double>(f.dw) / 23, fy = static_cast<double>(f.dh) / 17;
            ASSERT_EQ(Resize(src, dst, fx, fy), kResampleOk);
            for (uint32_t y = 0; y < f.dh; ++y) {
                for (uint32_t x = 0; x < f.dw; ++x) {
                    for (uint32_t c = 0; c < Channels(kind); ++c) {
                        const double want = Direct(src, fx, fy, x, y, c);
                        if (kind == ResampleKind::kByte4) {
                            // Rounded to the nearest code after float sums: at most one code away.
                            ASSERT_LE(std::fabs(dst.Get(x, y, c) - std::clamp(std::round(want), 0.0, 255.0)), 1.0);
                        } else {
                            // Single-precision weights and sums over at most 16 x 16 taps.
                            ASSERT_NEAR(dst.Get(x, y, c), want, 2e-6 * 16) << x << "," << y;
                        }
                    }
                }
            }
        }
    }
}

TEST(Resize, FactorOneIsAnExactCopy) {
    for (ResampleKind kind : {ResampleKind::kFloat1, ResampleKind::kByte4, ResampleKind::kFloat4}) {
        Image src(kind, 13, 5), dst(kind, 13, 5);
        src.Randomise(3);
        ASSERT_EQ(Resize(src, dst, 1.0, 1.0), kResampleOk);
        for (uint32_t y = 0; y < 5; ++y) {
            EXPECT_EQ(0, std::memcmp(src.At(0, y, 0), dst.At(0, y, 0), 13 * Channels(kind) * SampleBytes(kind)));
        }
    }
}

TEST(Resize, ConstantImagesStayConstantAndBytesStayInRange) {
    Image src(ResampleKind::kByte4, 9, 9), dst(ResampleKind::kByte4, 31, 4);
    for (uint32_t y = 0; y < 9; ++y)
        for (uint32_t x = 0; x < 9; ++x)
            for (uint32_t c = 0; c < 4; ++c) src.Put(x, y, c, c == 3 ? 255 : 77);
    ASSERT_EQ(Resize(src, dst, 31.0 / 9, 4.0 / 9), kResampleOk);
    for (uint32_t y = 0; y < 4; ++y)
        for (uint32_t x = 0; x < 31; ++x) {
            EXPECT_EQ(dst.Get(x, y, 0), 77);
            EXPECT_EQ(dst.Get(x, y, 3), 255);
        }
    // A hard edge overshoots through the negative lobes: bytes clamp instead of wrapping.
    Image edge(ResampleKind::kByte4, 4, 1), wide(ResampleKind::kByte4, 16, 1);
    for (uint32_t x = 0; x < 4; ++x)
        for (uint32_t c = 0; c < 4; ++c) edge.Put(x, 0, c, x < 2 ? 0 : 255);
    ASSERT_EQ(Resize(edge, wide, 4.0, 1.0), kResampleOk);
    for (uint32_t x = 0; x < 8; ++x) EXPECT_LE(wide.Get(x, 0, 0), 128) << x;
    for (uint32_t x = 8; x < 16; ++x) EXPECT_GE(wide.Get(x, 0, 0), 127) << x;
}

TEST(Resize, SinglePixelRowsColumnsAndImages) {
    for (ResampleKind kind : {ResampleKind::kFloat1, ResampleKind::kByte4, ResampleKind::kFloat4}) {
        Image one(kind, 1, 1), row(kind, 7, 1), col(kind, 1, 7);
        one.Put(0, 0, 0, kind == ResampleKind::kByte4 ? 200 : 0.75);
        Image big(kind, 5, 3);
        ASSERT_EQ(Resize(one, big, 5.0, 3.0), kResampleOk);
        for (uint32_t y = 0; y < 3; ++y)
            for (uint32_t x = 0; x < 5; ++x) EXPECT_EQ(big.Get(x, y, 0), one.Get(0, 0, 0));

        row.Randomise(4);
        Image rowOut(kind, 3, 2);
        ASSERT_EQ(Resize(row, rowOut, 3.0 / 7, 2.0), kResampleOk);
        col.Randomise(5);
        Image colOut(kind, 1, 2);
        ASSERT_EQ(Resize(col, colOut, 1.0, 2.0 / 7), kResampleOk);
        for (uint32_t c = 0; c < Channels(kind); ++c) {
            const double tol = kind == ResampleKind::kByte4 ? 1.0 : 1e-5;
            EXPECT_NEAR(rowOut.Get(1, 1, c), Direct(row, 3.0 / 7, 2.0, 1, 1, c), tol);
            EXPECT_NEAR(colOut.Get(0, 1, c), Direct(col, 1.0, 2.0 / 7, 0, 1, c), tol);
        }
    }
}

TEST(Resize, RejectsWhatItCannotDo) {
    Image src(ResampleKind::kFloat1, 8, 8), dst(ResampleKind::kFloat1, 4, 4);
    std::vector<uint8_t> work(ResizeWorkSize(ResampleKind::kFloat1, 8, 8, 4, 4, 0.5, 0.5));
    const auto run = [&](ResampleImage s, ResampleImage d, double fx, double fy, size_t size) {
        return ResizeCubic(ResampleKind::kFloat1, s, d, fx, fy, work.data(), size);
    };
    const ResampleImage s = src.View(), d = dst.View();
    EXPECT_EQ(run({nullptr, s.rowBytes, 8, 8}, d, 0.5, 0.5, work.size()), kResampleNullPointer);
    EXPECT_EQ(run(s, {nullptr, d.rowBytes, 4, 4}, 0.5, 0.5, work.size()), kResampleNullPointer);
    EXPECT_EQ(ResizeCubic(ResampleKind::kFloat1, s, d, 0.5, 0.5, nullptr, work.size()), kResampleNullPointer);
    EXPECT_EQ(run({s.pixels, s.rowBytes, 0, 8}, d, 0.5, 0.5, work.size()), kResampleBadSize);
    EXPECT_EQ(run({s.pixels, 31, 8, 8}, d, 0.5, 0.5, work.size()), kResampleBadSize);  // rows shorter than 8 floats
    EXPECT_EQ(run(s, {d.pixels, -64, 4, 4}, 0.5, 0.5, work.size()), kResampleBadSize);
    for (double bad : {0.0, -1.0, 1.0 / 2048, std::numeric_limits<double>::quiet_NaN(),
                       std::numeric_limits<double>::infinity()}) {
        EXPECT_EQ(run(s, d, bad, 0.5, work.size()), kResampleBadFactor) << bad;
        EXPECT_EQ(run(s, d, 0.5, bad, work.size()), kResampleBadFactor) << bad;
        EXPECT_EQ(ResizeWorkSize(ResampleKind::kFloat1, 8, 8, 4, 4, bad, 0.5), 0u);
    }
    EXPECT_EQ(run(s, d, 0.5, 0.5, work.size() - 1), kResampleSmallWorkBuffer);
    EXPECT_EQ(run(s, {d.pixels, d.rowBytes, 0, 4}, 0.5, 0.5, 0), kResampleOk);  // nothing to write
    EXPECT_EQ(ResizeWorkSize(ResampleKind::kFloat1, 0, 8, 4, 4, 0.5, 0.5), 0u);
}

TEST(Resize, FactorsThatDisagreeWithTheSizesStayInsideTheSource) {
    // Extreme mappings: every tap beyond the edges folds onto the edge sample.
    for (ResampleKind kind : {ResampleKind::kFloat1, ResampleKind::kByte4, ResampleKind::kFloat4}) {
        Image src(kind, 5, 4), dst(kind, 40, 30);
        src.Randomise(6);
        ASSERT_EQ(Resize(src, dst, 0.01, 0.002), kResampleOk);
        ASSERT_EQ(Resize(src, dst, 100.0, 0.5), kResampleOk);
        for (uint32_t c = 0; c < Channels(kind); ++c) {
            const double tol = kind == ResampleKind::kByte4 ? 1.0 : 1e-4;
            EXPECT_NEAR(dst.Get(39, 29, c), Direct(src, 100.0, 0.5, 39, 29, c), tol);
        }
    }
}

TEST(ResizePaths, ProcessorPathsEqualThePortableOne) {
    const ResampleLevel saved = CurrentResampleLevel();
    struct Shape {
        uint32_t sw, sh, dw, dh;
    };
    for (ResampleLevel level : {ResampleLevel::kAvx2, ResampleLevel::kAvx512}) {
        if (ResizePassFor(level) == nullptr) continue;
        for (ResampleKind kind : {ResampleKind::kFloat1, ResampleKind::kByte4, ResampleKind::kFloat4}) {
            for (Shape s : {Shape{67, 45, 17, 11}, Shape{33, 19, 66, 38}, Shape{41, 7, 29, 13}, Shape{1, 9, 5, 2}}) {
                Image src(kind, s.sw, s.sh), a(kind, s.dw, s.dh), b(kind, s.dw, s.dh);
                src.Randomise(s.sw * 7 + s.dh);
                const double fx = static_cast<double>(s.dw) / s.sw, fy = static_cast<double>(s.dh) / s.sh;
                ASSERT_TRUE(SetResampleLevel(ResampleLevel::kPortable));
                ASSERT_EQ(Resize(src, a, fx, fy), kResampleOk);
                ASSERT_TRUE(SetResampleLevel(level));
                ASSERT_EQ(Resize(src, b, fx, fy), kResampleOk);
                EXPECT_EQ(a.bytes, b.bytes) << "level " << static_cast<int>(level) << " kind " << static_cast<int>(kind)
                                            << " " << s.sw << "x" << s.sh << " -> " << s.dw << "x" << s.dh;
            }
        }
    }
    SetResampleLevel(saved);
}

}  // namespace
}  // namespace vt
