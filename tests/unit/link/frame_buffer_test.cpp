#include "link/frame_buffer.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "link/pixel_convert.h"
#include "resample/resample.h"

namespace vt {
namespace {

struct Geometry {
    uint32_t format, width, rowBytes, planes;
};

TEST(FrameBuffer, RowBytesAndPlanesFollowTheFormat) {
    const Geometry cases[] = {
        {kFormatPlanarFloat, 1, 16, 4}, {kFormatPlanarFloat, 2, 16, 4}, {kFormatPlanarFloat, 3, 16, 4},
        {kFormatPlanarFloat, 5, 32, 4}, {kFormatBgra8, 5, 20, 1},       {kFormatArgbFloat, 5, 128, 1},
        {kFormatBgraFloat, 4, 64, 1},   {kFormatArgb8, 5, 32, 4},       {kFormatArgb16, 9, 48, 4},
    };
    for (const Geometry& c : cases) {
        FrameBuffer f;
        ASSERT_EQ(FBNewFrameBuffer(c.width, 3, &f, c.format), 0);
        EXPECT_EQ(f.width, c.width);
        EXPECT_EQ(f.height, 3u);
        EXPECT_EQ(f.format, c.format);
        EXPECT_EQ(f.rowBytes, c.rowBytes) << "format " << c.format << " width " << c.width;
        EXPECT_EQ(f.planes, c.planes);
        EXPECT_EQ(f.planeSize, c.rowBytes * 3);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(f.data) % 16, 0u);
        EXPECT_NE(f.rawStore, nullptr);
        EXPECT_EQ(f.flags, 0u);
        FBDisposeFrameBuffer(&f);
        EXPECT_EQ(f.data, nullptr);
    }
}

TEST(FrameBuffer, SamplingFieldsDependOnWidth) {
    FrameBuffer f;
    ASSERT_EQ(FBNewFrameBuffer(768, 1, &f, kFormatPlanarFloat), 0);
    EXPECT_EQ(f.sampling[0], 3u);
    EXPECT_EQ(f.sampling[1], 1u);
    EXPECT_EQ(f.sampling[2], 2u);
    FBDisposeFrameBuffer(&f);
    ASSERT_EQ(FBNewFrameBuffer(769, 1, &f, kFormatPlanarFloat), 0);
    EXPECT_EQ(f.sampling[0], 1u);
    EXPECT_EQ(f.sampling[1], 1u);
    EXPECT_EQ(f.sampling[2], 1u);
    FBDisposeFrameBuffer(&f);
}

// A host allocator that records its calls.
struct HostMemory {
    std::vector<size_t> sizes;
    std::vector<void*> given, returned;
    bool fail = false;

    static void* Allocate(size_t size, const char* what, void* context) {
        auto* self = static_cast<HostMemory*>(context);
        EXPECT_STREQ(what, "Frame Buffer");
        self->sizes.push_back(size);
        if (self->fail) return nullptr;
        void* p = ::operator new(size);
        self->given.push_back(p);
        return p;
    }
    static void Dispose(void* block, void* context) {
        static_cast<HostMemory*>(context)->returned.push_back(block);
        ::operator delete(block);
    }
};

TEST(FrameBuffer, HostAllocatorGetsPlaneStoresWithASmallPlaneMinimum) {
    HostMemory host;
    FrameBuffer f;
    ASSERT_EQ(FBNewFrameBuffer(10, 10, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host), 0);
    ASSERT_EQ(FBNewFrameBuffer(10, 10, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host), 0);
    EXPECT_EQ(host.sizes.back(), 4u * 0x20010);
    EXPECT_EQ(f.data, host.given.back());
    EXPECT_EQ(f.rawStore, nullptr);
    FBDisposeFrameBuffer(&f, HostMemory::Dispose, &host);
    ASSERT_EQ(host.returned.size(), 1u);
    EXPECT_EQ(host.returned[0], host.given[1]);
    HostMemory::Dispose(host.given[0], &host);

    ASSERT_EQ(FBNewFrameBuffer(512, 64, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host), 0);
    EXPECT_EQ(host.sizes.back(), 4u * 512 * 4 * 64);  // plane size exactly 0x20000: no minimum
    FBDisposeFrameBuffer(&f, HostMemory::Dispose, &host);
    ASSERT_EQ(FBNewFrameBuffer(100, 100, &f, kFormatBgra8, HostMemory::Allocate, "Frame Buffer", &host), 0);
    EXPECT_EQ(host.sizes.back(), 0x20010u);
    FBDisposeFrameBuffer(&f, HostMemory::Dispose, &host);

    host.fail = true;
    std::memset(&f, 0x77, sizeof f);
    EXPECT_EQ(FBNewFrameBuffer(8, 8, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host), kFBOutOfMemory);
    const FrameBuffer zero{};
    EXPECT_EQ(0, std::memcmp(&f, &zero, sizeof f));
}

TEST(FrameBuffer, SizesTheRecordCannotDescribeFailAsAllocations) {
    FrameBuffer f;
    HostMemory host;
    std::memset(&f, 0x77, sizeof f);
    EXPECT_EQ(FBNewFrameBuffer(0xFFFFFFFFu, 1, &f, kFormatPlanarFloat), kFBOutOfMemory);  // width rounds past 32 bits
    const FrameBuffer zero{};
    EXPECT_EQ(0, std::memcmp(&f, &zero, sizeof f));
    EXPECT_EQ(FBNewFrameBuffer(70000, 70000, &f, kFormatPlanarFloat), kFBOutOfMemory);  // plane size past 32 bits
    EXPECT_EQ(FBNewFrameBuffer(70000, 70000, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host),
              kFBOutOfMemory);
    EXPECT_TRUE(host.sizes.empty());
    EXPECT_EQ(FBNewFrameBuffer(4, 4, nullptr, kFormatPlanarFloat), kFBOutOfMemory);
    EXPECT_EQ(FBNewFrameBuffer(0, 0, &f, kFormatPlanarFloat), 0);  // empty frames are fine
    FBDisposeFrameBuffer(&f);
}

TEST(FrameBuffer, HeapStoresAreReusedAndClearedUnlessAskedNot) {
    FBTrimBlockCache();
    FrameBuffer f;
    ASSERT_EQ(FBNewFrameBuffer(1000, 300, &f, kFormatPlanarFloat), 0);
    void* first = f.rawStore;
    std::memset(f.data, 0xAB, 4 * size_t{f.planeSize});
    FBDisposeFrameBuffer(&f);
    EXPECT_EQ(FBQueryBlockCache().blocks, 1u);

    ASSERT_EQ(FBNewFrameBuffer(1000, 300, &f, kFormatPlanarFloat), 0);
    EXPECT_EQ(f.rawStore, first);
    EXPECT_EQ(FBQueryBlockCache().blocks, 0u);
    for (size_t i = 0; i < 4 * size_t{f.planeSize}; ++i) ASSERT_EQ(f.data[i], 0) << i;
    std::memset(f.data, 0xCD, 4 * size_t{f.planeSize});
    FBDisposeFrameBuffer(&f);

    ASSERT_EQ(FBNewUnclearedFrameBuffer(1000, 300, &f, kFormatPlanarFloat), 0);
    EXPECT_EQ(f.rawStore, first);
    EXPECT_EQ(f.data[0], 0xCD);
    FBDisposeFrameBuffer(&f);

    // A block much larger than the request stays for the frames it fits.
    ASSERT_EQ(FBNewFrameBuffer(8, 8, &f, kFormatPlanarFloat), 0);
    EXPECT_NE(f.rawStore, first);
    FBDisposeFrameBuffer(&f);
    FBTrimBlockCache();
    EXPECT_EQ(FBQueryBlockCache().blocks, 0u);
    EXPECT_EQ(FBQueryBlockCache().bytes, 0u);
}

TEST(FrameBuffer, BlockCacheIsBounded) {
    FBTrimBlockCache();
    FrameBuffer frames[7];
    for (uint32_t i = 0; i < 7; ++i) ASSERT_EQ(FBNewFrameBuffer(200 + 40 * i, 100, &frames[i], kFormatPlanarFloat), 0);
    for (FrameBuffer& f : frames) FBDisposeFrameBuffer(&f);
    const FBBlockCacheState state = FBQueryBlockCache();
    EXPECT_LE(state.blocks, 4u);
    EXPECT_GT(state.blocks, 0u);
    FBTrimBlockCache();
}

TEST(FrameBuffer, ConcurrentRendersShareTheCacheSafely) {
    std::atomic<int> failures{0};
    auto work = [&failures](uint32_t seed) {
        std::mt19937 rng(seed);
        for (int i = 0; i < 300; ++i) {
            FrameBuffer f;
            const uint32_t w = 64 + rng() % 3 * 64;
            if (FBNewFrameBuffer(w, 64, &f, kFormatPlanarFloat) != 0 || f.data[0] != 0) ++failures;
            std::memset(f.data, static_cast<int>(seed), 4 * size_t{f.planeSize});
            FBDisposeFrameBuffer(&f);
        }
    };
    std::thread a(work, 1), b(work, 2), c(work, 3);
    a.join();
    b.join();
    c.join();
    EXPECT_EQ(failures.load(), 0);
    FBTrimBlockCache();
}

TEST(FrameBuffer, DisposalLeavesStoresItDoesNotOwn) {
    FBDisposeFrameBuffer(nullptr);
    alignas(16) uint8_t pixels[64];
    FrameBuffer borrowed{};
    borrowed.data = pixels;
    borrowed.rawStore = pixels;  // freeing this would corrupt the stack
    borrowed.flags = kFBFlagStoreNotOwned;
    FBDisposeFrameBuffer(&borrowed);
    EXPECT_EQ(borrowed.data, nullptr);

    HostMemory host;
    FrameBuffer f;
    ASSERT_EQ(FBNewFrameBuffer(4, 4, &f, kFormatPlanarFloat, HostMemory::Allocate, "Frame Buffer", &host), 0);
    FrameBuffer copy = f;
    FBDisposeFrameBuffer(&copy);  // host memory and no disposer: never handed to the heap
    FBDisposeFrameBuffer(&f, HostMemory::Dispose, &host);
    EXPECT_EQ(host.returned.size(), 1u);
}

// ---- FBCopyFrameBuffer ----

struct Owned {
    FrameBuffer f{};
    Owned(uint32_t w, uint32_t h, uint32_t format) { EXPECT_EQ(FBNewFrameBuffer(w, h, &f, format), 0); }
    ~Owned() { FBDisposeFrameBuffer(&f); }
    size_t Bytes() const { return size_t{f.planes} * f.planeSize; }
    void Fill(uint32_t seed) {
        std::mt19937 rng(seed);
        if (f.format == kFormatPlanarFloat || f.format == kFormatArgbFloat || f.format == kFormatBgraFloat) {
            std::uniform_real_distribution<float> any(0.0f, 1.0f);
            auto* p = reinterpret_cast<float*>(f.data);
            for (size_t i = 0; i < Bytes() / 4; ++i) p[i] = any(rng);
        } else {
            for (size_t i = 0; i < Bytes(); ++i) f.data[i] = static_cast<uint8_t>(rng());
        }
    }
};

TEST(FrameBufferCopy, EqualSizeAndFormatIsAPlainCopy) {
    for (uint32_t format : {kFormatPlanarFloat, kFormatBgra8, kFormatArgbFloat}) {
        Owned a(13, 7, format), b(13, 7, format);
        a.Fill(1);
        FBCopyFrameBuffer(&a.f, &b.f);
        EXPECT_EQ(0, std::memcmp(a.f.data, b.f.data, a.Bytes()));
    }
}

TEST(FrameBufferCopy, DifferentFormatsExportFromTheWorkingFormatOnly) {
    Owned src(9, 5, kFormatPlanarFloat), dst(9, 5, kFormatBgra8), expected(9, 5, kFormatBgra8);
    src.Fill(2);
    FBCopyFrameBuffer(&src.f, &dst.f);
    FBExportPixels(&src.f, expected.f.data, expected.f.rowBytes, kFormatBgra8);
    EXPECT_EQ(0, std::memcmp(dst.f.data, expected.f.data, dst.Bytes()));

    Owned floats(9, 5, kFormatArgbFloat);
    FBCopyFrameBuffer(&src.f, &floats.f);
    EXPECT_EQ(reinterpret_cast<float*>(floats.f.data)[1], reinterpret_cast<float*>(src.f.data)[0]);

    // An 8-bit source has one plane: exporting it as R, G, B planes would read past its store.
    Owned bytes(9, 5, kFormatBgra8), target(9, 5, kFormatArgbFloat);
    bytes.Fill(3);
    target.Fill(4);
    const std::vector<uint8_t> before(target.f.data, target.f.data + target.Bytes());
    FBCopyFrameBuffer(&bytes.f, &target.f);
    EXPECT_EQ(0, std::memcmp(before.data(), target.f.data, before.size()));
}

TEST(FrameBufferCopy, DifferentSizesAndFormatsDoNothing) {
    Owned src(8, 8, kFormatPlanarFloat), dst(4, 4, kFormatBgra8);
    src.Fill(5);
    dst.Fill(6);
    const std::vector<uint8_t> before(dst.f.data, dst.f.data + dst.Bytes());
    FBCopyFrameBuffer(&src.f, &dst.f);
    FBCopyFrameBuffer(nullptr, &dst.f);
    FBCopyFrameBuffer(&src.f, nullptr);
    EXPECT_EQ(0, std::memcmp(before.data(), dst.f.data, before.size()));
}

TEST(FrameBufferCopy, ResizesEachKindThroughTheResampler) {
    struct Case {
        uint32_t format;
        ResampleKind kind;
        uint32_t planes;
        uint32_t bytesPerPixel;
    };
    for (const Case& c : {Case{kFormatPlanarFloat, ResampleKind::kFloat1, 4, 4}, Case{kFormatBgra8, ResampleKind::kByte4, 1, 4},
                          Case{kFormatArgb8, ResampleKind::kByte4, 4, 4}, Case{kFormatBgraFloat, ResampleKind::kFloat4, 1, 16}}) {
        Owned src(40, 24, c.format), dst(10, 30, c.format), expected(10, 30, c.format);
        src.Fill(7);
        FBCopyFrameBuffer(&src.f, &dst.f);
        const double fx = 10.0 / 40, fy = 30.0 / 24;
        const uint32_t planes = c.format == kFormatArgb8 ? 1 : c.planes;
        for (uint32_t p = 0; p < planes; ++p) {
            const ResampleImage in{src.f.data + p * size_t{src.f.planeSize}, src.f.rowBytes, 40, 24};
            const ResampleImage out{expected.f.data + p * size_t{expected.f.planeSize}, expected.f.rowBytes, 10, 30};
            std::vector<uint8_t> work(ResizeWorkSize(c.kind, 40, 24, 10, 30, fx, fy));
            ASSERT_EQ(ResizeCubic(c.kind, in, out, fx, fy, work.data(), work.size()), kResampleOk);
        }
        for (uint32_t p = 0; p < planes; ++p) {
            for (uint32_t y = 0; y < 30; ++y) {
                const size_t at = p * size_t{dst.f.planeSize} + y * size_t{dst.f.rowBytes};
                ASSERT_EQ(0, std::memcmp(dst.f.data + at, expected.f.data + at, 10 * c.bytesPerPixel)) << c.format;
            }
        }
    }
}

TEST(FrameBufferCopy, ResizeFailuresPrintTheirLine) {
    Owned src(0, 0, kFormatPlanarFloat), dst(4, 4, kFormatPlanarFloat);
    Owned src8(0, 3, kFormatBgra8), dst8(4, 4, kFormatBgra8);
    Owned srcF(3, 0, kFormatArgbFloat), dstF(4, 4, kFormatArgbFloat);
    testing::internal::CaptureStdout();
    FBCopyFrameBuffer(&src.f, &dst.f);
    FBCopyFrameBuffer(&src8.f, &dst8.f);
    FBCopyFrameBuffer(&srcF.f, &dstF.f);
    const std::string out = testing::internal::GetCapturedStdout();
    const std::string status = std::to_string(kResampleBadSize);
    EXPECT_EQ(out, "ippiResizeSqrPixel_32f_C1R in Velatone FBCopyFrameBuffer failed with " + status +
                       "\n"
                       "ippiResizeSqrPixel_8u_C4R in Velatone FBCopyFrameBuffer failed with " + status +
                       "\n"
                       "ippiResizeSqrPixel_32f_C4R in Velatone FBCopyFrameBuffer failed with " + status + "\n");
}

}  // namespace
}  // namespace vt
