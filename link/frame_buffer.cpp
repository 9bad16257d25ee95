// Frame buffers: geometry by format, heap stores recycled through a small process-wide block
// cache, host stores through the render path's hooks, and FBCopyFrameBuffer with the resampler's
// grow-only work buffer.
#include "link/frame_buffer.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "link/pixel_convert.h"
#include "resample/resample.h"

namespace vt {
namespace {

constexpr char kResizeFloat1Failed[] = "ippiResizeSqrPixel_32f_C1R in Velatone FBCopyFrameBuffer failed with %d\n";
constexpr char kResizeByte4Failed[] = "ippiResizeSqrPixel_8u_C4R in Velatone FBCopyFrameBuffer failed with %d\n";
constexpr char kResizeFloat4Failed[] = "ippiResizeSqrPixel_32f_C4R in Velatone FBCopyFrameBuffer failed with %d\n";

constexpr uint64_t kSmallPlane = 0x20000;
constexpr uint64_t kSmallPlaneStore = 0x20010;
constexpr size_t kStoreAlign = 16;

// Status reported when the work buffer cannot be had.
constexpr int32_t kWorkBufferOutOfMemory = -108;

struct Geometry {
    uint32_t rowBytes;
    uint32_t planes;
    uint32_t planeSize;
    size_t total;  // bytes of pixel store
};

// Sizes past 32 bits cannot be described by the record: they fail as allocations do.
bool ComputeGeometry(uint32_t width, uint32_t height, uint32_t format, Geometry* g) {
    const uint64_t width4 = (static_cast<uint64_t>(width) + 3) & ~uint64_t{3};
    uint64_t rowBytes = width4 * 4;
    uint32_t planes = 4;
    if (format == kFormatBgra8) {
        rowBytes = static_cast<uint64_t>(width) * 4;
        planes = 1;
    } else if (format == kFormatArgbFloat || format == kFormatBgraFloat) {
        rowBytes = width4 * 16;
        planes = 1;
    }
    const uint64_t planeSize = rowBytes * height;
    if (rowBytes > UINT32_MAX || planeSize > UINT32_MAX) return false;
    const uint64_t perPlane = planeSize < kSmallPlane ? kSmallPlaneStore : planeSize;
    const uint64_t total = perPlane * planes;
    if (total > SIZE_MAX / 2) return false;
    g->rowBytes = static_cast<uint32_t>(rowBytes);
    g->planes = planes;
    g->planeSize = static_cast<uint32_t>(planeSize);
    g->total = static_cast<size_t>(total);
    return true;
}

void FillRecord(FrameBuffer* frame, uint32_t width, uint32_t height, uint32_t format, const Geometry& g) {
    frame->width = width;
    frame->height = height;
    frame->rowBytes = g.rowBytes;
    frame->format = format;
    frame->planes = g.planes;
    frame->planeSize = g.planeSize;
    if (width < 769) {
        frame->sampling[0] = 3;
        frame->sampling[1] = 1;
        frame->sampling[2] = 2;
    } else {
        frame->sampling[0] = frame->sampling[1] = frame->sampling[2] = 1;
    }
    frame->flags = 0;
}

// A lock for sections of a few dozen instructions; it needs no threading library, which the
// module does not link.
class SpinLock {
public:
    void Lock() {
        while (m_flag.test_and_set(std::memory_order_acquire)) {
            while (m_flag.test(std::memory_order_relaxed)) __builtin_ia32_pause();
        }
    }
    void Unlock() { m_flag.clear(std::memory_order_release); }

private:
    std::atomic_flag m_flag;
};

class SpinGuard {
public:
    explicit SpinGuard(SpinLock& lock) : m_lock(lock) { m_lock.Lock(); }
    ~SpinGuard() { m_lock.Unlock(); }
    SpinGuard(const SpinGuard&) = delete;
    SpinGuard& operator=(const SpinGuard&) = delete;

private:
    SpinLock& m_lock;
};

// Heap stores. Each block is [capacity, 16 bytes][store of capacity bytes]; rawStore points at
// the store, so disposal finds the capacity without asking anyone. Freed blocks wait in a small
// cache: a fresh page costs about 10 us to fault in, so a 2160p frame allocated and freed per
// render would cost 400 ms, while a reused block costs nothing.
constexpr size_t kBlockHeader = 16;
constexpr uint32_t kCacheMaxBlocks = 4;
constexpr size_t kCacheMaxBytes = size_t{640} << 20;

struct CachedBlock {
    uint8_t* store;
    size_t capacity;
};

SpinLock g_cacheLock;  // guards g_cache, g_cacheCount, g_cacheBytes
CachedBlock g_cache[kCacheMaxBlocks];
uint32_t g_cacheCount = 0;
size_t g_cacheBytes = 0;

size_t BlockCapacity(const uint8_t* store) {
    size_t capacity;
    std::memcpy(&capacity, store - kBlockHeader, sizeof capacity);
    return capacity;
}

void FreeBlock(uint8_t* store) {
    std::free(store - kBlockHeader);
}

// The smallest cached block that holds size bytes without wasting more than it uses.
uint8_t* TakeCachedBlock(size_t size) {
    SpinGuard guard(g_cacheLock);
    int best = -1;
    for (uint32_t i = 0; i < g_cacheCount; ++i) {
        const size_t capacity = g_cache[i].capacity;
        if (capacity < size || capacity / 2 > size) continue;
        if (best < 0 || capacity < g_cache[best].capacity) best = static_cast<int>(i);
    }
    if (best < 0) return nullptr;
    uint8_t* store = g_cache[best].store;
    g_cacheBytes -= g_cache[best].capacity;
    g_cache[best] = g_cache[--g_cacheCount];
    return store;
}

void ReleaseBlock(uint8_t* store) {
    const size_t capacity = BlockCapacity(store);
    uint8_t* evicted[kCacheMaxBlocks + 1];
    uint32_t evictedCount = 0;
    {
        SpinGuard guard(g_cacheLock);
        if (capacity > kCacheMaxBytes) {
            evicted[evictedCount++] = store;
        } else {
            // Make room by dropping the smallest blocks: large frames are the costly ones to refault.
            while (g_cacheCount > 0 && (g_cacheCount == kCacheMaxBlocks || g_cacheBytes + capacity > kCacheMaxBytes)) {
                uint32_t smallest = 0;
                for (uint32_t i = 1; i < g_cacheCount; ++i) {
                    if (g_cache[i].capacity < g_cache[smallest].capacity) smallest = i;
                }
                evicted[evictedCount++] = g_cache[smallest].store;
                g_cacheBytes -= g_cache[smallest].capacity;
                g_cache[smallest] = g_cache[--g_cacheCount];
            }
            g_cache[g_cacheCount++] = {store, capacity};
            g_cacheBytes += capacity;
        }
    }
    for (uint32_t i = 0; i < evictedCount; ++i) FreeBlock(evicted[i]);
}

uint8_t* NewBlock(size_t size, bool cleared) {
    if (uint8_t* store = TakeCachedBlock(size)) {
        if (cleared) std::memset(store, 0, size);
        return store;
    }
    void* block = cleared ? std::calloc(1, kBlockHeader + size) : std::malloc(kBlockHeader + size);
    if (block == nullptr) return nullptr;
    auto* store = static_cast<uint8_t*>(block) + kBlockHeader;
    std::memcpy(store - kBlockHeader, &size, sizeof size);
    return store;
}

int32_t NewHeapFrame(uint32_t width, uint32_t height, FrameBuffer* frame, uint32_t format, bool cleared) {
    if (frame == nullptr) return kFBOutOfMemory;
    *frame = FrameBuffer{};
    Geometry g;
    if (!ComputeGeometry(width, height, format, &g)) return kFBOutOfMemory;
    uint8_t* store = NewBlock(g.total + kStoreAlign, cleared);
    if (store == nullptr) return kFBOutOfMemory;
    const uintptr_t address = reinterpret_cast<uintptr_t>(store);
    frame->rawStore = store;
    frame->data = store + (kStoreAlign - address % kStoreAlign) % kStoreAlign;
    FillRecord(frame, width, height, format, g);
    return 0;
}

// ---- FBCopyFrameBuffer ----

// The resampler's work buffer: one per process, grown when a resize needs more. The flag is held
// for the whole resize; a caller that finds it taken (only possible when a new caller runs off the
// entry lock) uses a buffer of its own for that one call instead of waiting.
std::atomic_flag g_workBusy;
void* g_work = nullptr;     // guarded by g_workBusy
size_t g_workSize = 0;      // guarded by g_workBusy

// Whether each plane of a record holds its rows; records made here always do.
bool PlanesHoldRows(const FrameBuffer& f) {
    return static_cast<uint64_t>(f.planeSize) >= static_cast<uint64_t>(f.rowBytes) * f.height;
}

// Bytes of one pixel of a record's format within one plane.
uint32_t RecordPixelBytes(uint32_t format) {
    if (format == kFormatPlanarFloat) return 4;
    return HostBytesPerPixel(format);
}

// Whether a record's store takes height rows of width host pixels of its format, row bytes apart.
bool StoreTakesExport(const FrameBuffer& f) {
    const uint32_t bpp = HostBytesPerPixel(f.format);
    if (bpp == 0) return false;
    if (f.width == 0 || f.height == 0) return true;
    const uint64_t needed = static_cast<uint64_t>(f.rowBytes) * (f.height - 1) + static_cast<uint64_t>(f.width) * bpp;
    return needed <= static_cast<uint64_t>(f.planes) * f.planeSize;
}

// Records whose sizes and formats match: one copy when both are laid out alike, else row by row
// (a record not made here), never more than either holds.
void CopySameFormat(const FrameBuffer& src, FrameBuffer& dst) {
    if (src.rowBytes == dst.rowBytes && src.planes == dst.planes && src.planeSize == dst.planeSize &&
        static_cast<uint64_t>(dst.rowBytes) * dst.height == dst.planeSize) {
        std::memcpy(dst.data, src.data, static_cast<size_t>(dst.planes) * dst.rowBytes * dst.height);
        return;
    }
    const uint32_t bpp = RecordPixelBytes(src.format);
    if (bpp == 0 || !PlanesHoldRows(src) || !PlanesHoldRows(dst)) return;
    const uint64_t rowLength = static_cast<uint64_t>(src.width) * bpp;
    if (rowLength > src.rowBytes || rowLength > dst.rowBytes) return;
    const uint32_t planes = src.planes < dst.planes ? src.planes : dst.planes;
    for (uint32_t p = 0; p < planes; ++p) {
        for (uint32_t y = 0; y < src.height; ++y) {
            std::memcpy(dst.data + static_cast<size_t>(p) * dst.planeSize + static_cast<size_t>(y) * dst.rowBytes,
                        src.data + static_cast<size_t>(p) * src.planeSize + static_cast<size_t>(y) * src.rowBytes,
                        static_cast<size_t>(rowLength));
        }
    }
}

int32_t RunResize(ResampleKind kind, const ResampleImage& src, const ResampleImage& dst, double xFactor,
                  double yFactor) {
    const size_t needed = ResizeWorkSize(kind, src.width, src.height, dst.width, dst.height, xFactor, yFactor);
    if (needed == 0) return ResizeCubic(kind, src, dst, xFactor, yFactor, nullptr, 0);  // reports the fault
    if (g_workBusy.test_and_set(std::memory_order_acquire)) {
        void* own = std::malloc(needed);
        if (own == nullptr) return kWorkBufferOutOfMemory;
        const int32_t status = ResizeCubic(kind, src, dst, xFactor, yFactor, own, needed);
        std::free(own);
        return status;
    }
    int32_t status = kWorkBufferOutOfMemory;
    if (needed > g_workSize) {
        std::free(g_work);
        g_work = std::malloc(needed);
        g_workSize = g_work != nullptr ? needed : 0;
    }
    if (g_work != nullptr) status = ResizeCubic(kind, src, dst, xFactor, yFactor, g_work, g_workSize);
    g_workBusy.clear(std::memory_order_release);
    return status;
}

void Resize(const FrameBuffer& src, FrameBuffer& dst) {
    const double xFactor = static_cast<double>(dst.width) / src.width;
    const double yFactor = static_cast<double>(dst.height) / src.height;
    auto image = [](const FrameBuffer& f, int plane) {
        return ResampleImage{f.data + static_cast<size_t>(plane) * f.planeSize, f.rowBytes, f.width, f.height};
    };
    switch (src.format) {
        case kFormatPlanarFloat:
            if (src.planes < 4 || dst.planes < 4) return;
            for (int plane = 0; plane < 4; ++plane) {
                const int32_t status = RunResize(ResampleKind::kFloat1, image(src, plane), image(dst, plane), xFactor, yFactor);
                if (status != 0) {
                    std::printf(kResizeFloat1Failed, static_cast<int>(status));
                    return;
                }
            }
            return;
        case kFormatBgra8:
        case kFormatArgb8:
            if (const int32_t status = RunResize(ResampleKind::kByte4, image(src, 0), image(dst, 0), xFactor, yFactor)) {
                std::printf(kResizeByte4Failed, static_cast<int>(status));
            }
            return;
        case kFormatArgbFloat:
        case kFormatBgraFloat:
            if (const int32_t status = RunResize(ResampleKind::kFloat4, image(src, 0), image(dst, 0), xFactor, yFactor)) {
                std::printf(kResizeFloat4Failed, static_cast<int>(status));
            }
            return;
        default: return;
    }
}

}  // namespace

int32_t FBNewFrameBuffer(uint32_t width, uint32_t height, FrameBuffer* frame, uint32_t format, FBAllocator allocator,
                         const char* what, void* allocatorContext) {
    if (allocator == nullptr) return NewHeapFrame(width, height, frame, format, true);
    if (frame == nullptr) return kFBOutOfMemory;
    *frame = FrameBuffer{};
    Geometry g;
    if (!ComputeGeometry(width, height, format, &g)) return kFBOutOfMemory;
    // Host memory is used as it comes: the render path checks its alignment itself.
    void* store = allocator(g.total, what, allocatorContext);
    if (store == nullptr) return kFBOutOfMemory;
    frame->data = static_cast<uint8_t*>(store);
    FillRecord(frame, width, height, format, g);
    return 0;
}

int32_t FBNewUnclearedFrameBuffer(uint32_t width, uint32_t height, FrameBuffer* frame, uint32_t format) {
    return NewHeapFrame(width, height, frame, format, false);
}

// A heap store (rawStore set) goes back to the block cache whatever disposer is passed; a host
// store goes back through the disposer. A host store without a disposer is left alone: handing
// host memory to the heap would corrupt it.
void FBDisposeFrameBuffer(FrameBuffer* frame, FBDisposer disposer, void* disposerContext) {
    if (frame == nullptr) return;
    if ((frame->flags & kFBFlagStoreNotOwned) == 0) {
        if (frame->rawStore != nullptr) {
            ReleaseBlock(static_cast<uint8_t*>(frame->rawStore));
        } else if (frame->data != nullptr && disposer != nullptr) {
            disposer(frame->data, disposerContext);
        }
    }
    *frame = FrameBuffer{};
}

FBBlockCacheState FBQueryBlockCache() {
    SpinGuard guard(g_cacheLock);
    return {g_cacheCount, g_cacheBytes};
}

void FBTrimBlockCache() {
    CachedBlock blocks[kCacheMaxBlocks];
    uint32_t count;
    {
        SpinGuard guard(g_cacheLock);
        count = g_cacheCount;
        for (uint32_t i = 0; i < count; ++i) blocks[i] = g_cache[i];
        g_cacheCount = 0;
        g_cacheBytes = 0;
    }
    for (uint32_t i = 0; i < count; ++i) FreeBlock(blocks[i].store);
}

namespace {

// The cached blocks go back to the system when the module is unloaded (or the process ends), so
// that a host unloading the effect keeps no memory of it.
struct CacheReleaser {
    ~CacheReleaser() { FBTrimBlockCache(); }
} g_cacheReleaser;

}  // namespace

// A source that is not format 203 cannot be exported (its planes are not R, G, B floats), and a
// destination store too small for the export is not written: both leave the destination as it was.
void FBCopyFrameBuffer(const FrameBuffer* source, FrameBuffer* destination) {
    if (source == nullptr || destination == nullptr || source->data == nullptr || destination->data == nullptr) return;
    const FrameBuffer& src = *source;
    FrameBuffer& dst = *destination;
    if (src.width == dst.width && src.height == dst.height) {
        if (src.format == dst.format) {
            CopySameFormat(src, dst);
        } else if (src.format == kFormatPlanarFloat && StoreTakesExport(dst)) {
            FBExportPixels(&src, dst.data, dst.rowBytes, dst.format);
        }
        return;
    }
    if (src.format != dst.format || !PlanesHoldRows(src) || !PlanesHoldRows(dst)) return;
    Resize(src, dst);
}

}  // namespace vt
