// The module's own image record and the codes of every pixel layout it meets. The render path
// converts host pixels into a planar float record (format 203), corrects it and converts back.
#pragma once

#include <cstddef>
#include <cstdint>

namespace vt {

// Pixel layouts, named by the code the module uses for them.
enum PixelFormatCode : uint32_t {
    kFormatArgb8 = 0x42475241,   // host: A, R, G, B bytes
    kFormatBgra8 = 32,           // host, and the 8-bit FrameBuffer: B, G, R, A bytes
    kFormatArgb16 = 200,         // host: four u16 A, R, G, B, 0..32768
    kFormatArgbFloat = 201,      // host: four f32 A, R, G, B
    kFormatPlanarFloat = 203,    // FrameBuffer only: planes R, G, B, luma of f32
    kFormatVuya8 = 207,          // host: V, U, Y, A bytes, BT.601 studio range
    kFormatVuyaFloat = 208,      // host: four f32 V, U, Y, A
    kFormatYuv422_601 = 209,     // host: 4:2:2 in u16 pairs, BT.601
    kFormatYuv422_709 = 210,     // host: as 209, BT.709
    kFormatBgraFloat = 215,      // host: four f32 B, G, R, A
};

// Allocation hooks: the render path hands in the host's memory, everyone else uses the heap.
using FBAllocator = void* (*)(size_t size, const char* what, void* context);
using FBDisposer = void (*)(void* block, void* context);

inline constexpr int32_t kFBOutOfMemory = -108;
inline constexpr uint32_t kFBFlagStoreNotOwned = 1;

struct FrameBuffer {
    uint32_t width;
    uint32_t height;
    uint32_t rowBytes;    // bytes from one row to the next within a plane
    uint32_t format;      // a PixelFormatCode
    uint8_t* data;        // first byte of plane 0, 16-byte aligned when the module allocates it
    uint32_t planes;      // 1 or 4
    uint32_t planeSize;   // rowBytes * height; plane k starts at data + k * planeSize
    uint32_t sampling[3];
    void* rawStore;       // the allocation data was aligned within
    uint32_t flags;       // kFBFlagStoreNotOwned: the pixel store belongs to someone else
};

// Fills *frame with a new pixel store of the given format. Returns 0, or kFBOutOfMemory with
// *frame zeroed. Without an allocator the process heap is used.
int32_t FBNewFrameBuffer(uint32_t width, uint32_t height, FrameBuffer* frame, uint32_t format,
                         FBAllocator allocator = nullptr, const char* what = nullptr,
                         void* allocatorContext = nullptr);

// Frees the pixel store (when owned) and zeroes the record. A null record is ignored.
void FBDisposeFrameBuffer(FrameBuffer* frame, FBDisposer disposer = nullptr, void* disposerContext = nullptr);

// As FBNewFrameBuffer from the heap, but a store taken from the block cache is not cleared: for
// callers that write every byte before reading any (FBImportPixels writes whole rows, the padding
// columns included). Clearing a 2160p working frame costs about 5 ms per render.
int32_t FBNewUnclearedFrameBuffer(uint32_t width, uint32_t height, FrameBuffer* frame, uint32_t format);

// Copies source into destination: a plain copy when size and format agree, an export from a
// format-203 source when only the formats differ, a cubic resize when only the sizes differ.
// Anything else leaves the destination untouched.
void FBCopyFrameBuffer(const FrameBuffer* source, FrameBuffer* destination);

// The heap stores of disposed frames are kept for reuse in a small process-wide cache.
struct FBBlockCacheState {
    uint32_t blocks;
    size_t bytes;
};
FBBlockCacheState FBQueryBlockCache();
// Returns every cached block to the system (global setdown, tests).
void FBTrimBlockCache();

inline float* PlanePointer(const FrameBuffer& frame, int plane) {
    return reinterpret_cast<float*>(frame.data + static_cast<size_t>(plane) * frame.planeSize);
}

}  // namespace vt
