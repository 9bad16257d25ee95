// Image buffers as a host hands them to an effect: a PF_EffectWorld over pixels of one of the
// layouts the effect accepts, with the host's own conversions from and to straight RGBA floats.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "sdk/ae_effect.h"

namespace refhost {

enum class WorldLayout : uint8_t {
    kArgb8,      // After Effects 8-bit: A, R, G, B bytes
    kArgb16,     // After Effects 16-bit: A, R, G, B in 0..32768
    kArgbFloat,  // After Effects 32-bit float
    kBgra8,      // Premiere family 8-bit
    kBgraFloat,  // Premiere family float
    kVuya8,      // Premiere family 8-bit luma-chroma, BT.601 studio range
    kVuyaFloat,  // Premiere family float luma-chroma
    kVuya422,    // 16-bit 4:2:2 luma-chroma pairs, behind the colour-space registry setting
};

// "argb8", "argb16", "argb32", "bgra8", "bgra32", "vuya8", "vuya32", "vuya422"
const char* LayoutName(WorldLayout layout);
bool ParseLayout(const std::string& layout, int depth, WorldLayout* out);
int LayoutDepth(WorldLayout layout);
uint32_t LayoutBytesPerPixel(WorldLayout layout);
// The answer of the host's suites for such a world: the pixel-format suite's (Premiere family)
// and the world suite's (After Effects); 0 where that suite cannot describe it.
int32_t PixelFormatSuiteAnswer(WorldLayout layout);
int32_t WorldSuiteAnswer(WorldLayout layout);

class World {
public:
    World(WorldLayout layout, int32_t width, int32_t height);
    World(const World&) = delete;
    World& operator=(const World&) = delete;
    // Moving keeps the pixel store (and so the world's data pointer) where it is.
    World(World&&) = default;

    PF_EffectWorld* get() { return &m_world; }
    const PF_EffectWorld* get() const { return &m_world; }
    WorldLayout layout() const { return m_layout; }
    int32_t width() const { return m_world.width; }
    int32_t height() const { return m_world.height; }
    uint8_t* row(int32_t y) { return m_pixels.data() + static_cast<size_t>(y) * m_rowBytes; }
    const uint8_t* row(int32_t y) const { return m_pixels.data() + static_cast<size_t>(y) * m_rowBytes; }
    const std::vector<uint8_t>& bytes() const { return m_pixels; }
    std::vector<uint8_t>& bytes() { return m_pixels; }

    // Straight (unassociated) RGBA floats, four per pixel, row after row.
    void FromRgba(const std::vector<float>& rgba);
    std::vector<float> ToRgba() const;

private:
    WorldLayout m_layout;
    size_t m_rowBytes;
    std::vector<uint8_t> m_pixels;
    PF_EffectWorld m_world{};
};

}  // namespace refhost
