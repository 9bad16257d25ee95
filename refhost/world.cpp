#include "refhost/world.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace refhost {

namespace {

// Rows padded to 16 bytes beyond the pixels, as hosts pad theirs.
constexpr size_t kRowPadding = 16;

float Clamp01(float v) { return std::isnan(v) ? 0.0f : std::min(1.0f, std::max(0.0f, v)); }

template <typename T>
T Rounded(float v, float scale, float lo, float hi) {
    return static_cast<T>(std::lround(std::min(hi, std::max(lo, v * scale))));
}

// A chroma difference (±0.5 full swing) as an 8-bit studio-range code around 128.
uint8_t Chroma8(float v) { return static_cast<uint8_t>(std::lround(std::min(240.0f, std::max(16.0f, 128 + v * 224)))); }

// BT.601 in studio range, the host's side of the luma-chroma layouts.
struct YCbCr {
    float y, cb, cr;  // y in 0..1 for 0..100 IRE; cb, cr centred on 0 (±0.5 full swing)
};

YCbCr ToYCbCr(float r, float g, float b) {
    const float y = 0.299f * r + 0.587f * g + 0.114f * b;
    return {y, (b - y) * 0.564334f, (r - y) * 0.713267f};
}

void FromYCbCr(const YCbCr& c, float* r, float* g, float* b) {
    *r = c.y + 1.402f * c.cr;
    *g = c.y - 0.344136f * c.cb - 0.714136f * c.cr;
    *b = c.y + 1.772f * c.cb;
}

}  // namespace

const char* LayoutName(WorldLayout layout) {
    switch (layout) {
        case WorldLayout::kArgb8: return "argb8";
        case WorldLayout::kArgb16: return "argb16";
        case WorldLayout::kArgbFloat: return "argb32";
        case WorldLayout::kBgra8: return "bgra8";
        case WorldLayout::kBgraFloat: return "bgra32";
        case WorldLayout::kVuya8: return "vuya8";
        case WorldLayout::kVuyaFloat: return "vuya32";
        case WorldLayout::kVuya422: return "vuya422";
    }
    return "?";
}

bool ParseLayout(const std::string& layout, int depth, WorldLayout* out) {
    if (layout == "argb") {
        if (depth == 8) *out = WorldLayout::kArgb8;
        else if (depth == 16) *out = WorldLayout::kArgb16;
        else if (depth == 32) *out = WorldLayout::kArgbFloat;
        else return false;
        return true;
    }
    if (layout == "bgra" || layout == "vuya") {
        const bool bgra = layout == "bgra";
        if (depth == 8) *out = bgra ? WorldLayout::kBgra8 : WorldLayout::kVuya8;
        else if (depth == 32) *out = bgra ? WorldLayout::kBgraFloat : WorldLayout::kVuyaFloat;
        else return false;
        return true;
    }
    if (layout == "vuya422" && (depth == 16 || depth == 8)) {
        *out = WorldLayout::kVuya422;
        return true;
    }
    return false;
}

int LayoutDepth(WorldLayout layout) {
    switch (layout) {
        case WorldLayout::kArgb16:
        case WorldLayout::kVuya422: return 16;
        case WorldLayout::kArgbFloat:
        case WorldLayout::kBgraFloat:
        case WorldLayout::kVuyaFloat: return 32;
        default: return 8;
    }
}

uint32_t LayoutBytesPerPixel(WorldLayout layout) {
    switch (layout) {
        case WorldLayout::kArgb16: return 8;
        case WorldLayout::kArgbFloat:
        case WorldLayout::kBgraFloat:
        case WorldLayout::kVuyaFloat: return 16;
        default: return 4;
    }
}

int32_t PixelFormatSuiteAnswer(WorldLayout layout) {
    switch (layout) {
        case WorldLayout::kArgb8: return PrPixelFormat_ARGB_4444_8u;
        case WorldLayout::kArgbFloat: return PrPixelFormat_ARGB_4444_32f;
        case WorldLayout::kBgra8: return PrPixelFormat_BGRA_4444_8u;
        case WorldLayout::kBgraFloat: return PrPixelFormat_BGRA_4444_32f;
        case WorldLayout::kVuya8:
        case WorldLayout::kVuya422: return PrPixelFormat_VUYA_4444_8u;
        case WorldLayout::kVuyaFloat: return PrPixelFormat_VUYA_4444_32f;
        case WorldLayout::kArgb16: return 0;
    }
    return 0;
}

int32_t WorldSuiteAnswer(WorldLayout layout) {
    switch (layout) {
        case WorldLayout::kArgb8: return PF_PixelFormat_ARGB32;
        case WorldLayout::kArgb16: return PF_PixelFormat_ARGB64;
        case WorldLayout::kArgbFloat: return PF_PixelFormat_ARGB128;
        default: return 0;
    }
}

World::World(WorldLayout layout, int32_t width, int32_t height) : m_layout(layout) {
    m_rowBytes = static_cast<size_t>(width) * LayoutBytesPerPixel(layout) + kRowPadding;
    m_pixels.assign(m_rowBytes * static_cast<size_t>(height), 0);
    m_world.data = reinterpret_cast<PF_PixelPtr>(m_pixels.data());
    m_world.rowbytes = static_cast<A_long>(m_rowBytes);
    m_world.width = width;
    m_world.height = height;
    m_world.extent_hint = {0, 0, width, height};
    m_world.pix_aspect_ratio = {1, 1};
    m_world.world_flags = PF_WorldFlag_WRITEABLE | (layout == WorldLayout::kArgb16 ? PF_WorldFlag_DEEP : 0);
}

void World::FromRgba(const std::vector<float>& rgba) {
    const int32_t w = width();
    for (int32_t y = 0; y < height(); ++y) {
        uint8_t* out = row(y);
        const float* in = rgba.data() + static_cast<size_t>(y) * static_cast<size_t>(w) * 4;
        for (int32_t x = 0; x < w; ++x) {
            const float r = in[4 * x], g = in[4 * x + 1], b = in[4 * x + 2], a = in[4 * x + 3];
            switch (m_layout) {
                case WorldLayout::kArgb8: {
                    uint8_t* p = out + 4 * x;
                    p[0] = Rounded<uint8_t>(a, 255, 0, 255);
                    p[1] = Rounded<uint8_t>(r, 255, 0, 255);
                    p[2] = Rounded<uint8_t>(g, 255, 0, 255);
                    p[3] = Rounded<uint8_t>(b, 255, 0, 255);
                    break;
                }
                case WorldLayout::kBgra8: {
                    uint8_t* p = out + 4 * x;
                    p[0] = Rounded<uint8_t>(b, 255, 0, 255);
                    p[1] = Rounded<uint8_t>(g, 255, 0, 255);
                    p[2] = Rounded<uint8_t>(r, 255, 0, 255);
                    p[3] = Rounded<uint8_t>(a, 255, 0, 255);
                    break;
                }
                case WorldLayout::kArgb16: {
                    uint16_t p[4] = {Rounded<uint16_t>(a, 32768, 0, 32768), Rounded<uint16_t>(r, 32768, 0, 32768),
                                     Rounded<uint16_t>(g, 32768, 0, 32768), Rounded<uint16_t>(b, 32768, 0, 32768)};
                    std::memcpy(out + 8 * x, p, sizeof p);
                    break;
                }
                case WorldLayout::kArgbFloat: {
                    const float p[4] = {a, r, g, b};
                    std::memcpy(out + 16 * x, p, sizeof p);
                    break;
                }
                case WorldLayout::kBgraFloat: {
                    const float p[4] = {b, g, r, a};
                    std::memcpy(out + 16 * x, p, sizeof p);
                    break;
                }
                case WorldLayout::kVuya8: {
                    const YCbCr c = ToYCbCr(Clamp01(r), Clamp01(g), Clamp01(b));
                    uint8_t* p = out + 4 * x;
                    p[0] = Chroma8(c.cr);
                    p[1] = Chroma8(c.cb);
                    p[2] = static_cast<uint8_t>(16 + std::lround(c.y * 219));
                    p[3] = Rounded<uint8_t>(a, 255, 0, 255);
                    break;
                }
                case WorldLayout::kVuyaFloat: {
                    const YCbCr c = ToYCbCr(r, g, b);
                    // Y 0..219/255, U and V within ±112/255.
                    const float p[4] = {c.cr * 224.0f / 255.0f, c.cb * 224.0f / 255.0f, c.y * 219.0f / 255.0f, a};
                    std::memcpy(out + 16 * x, p, sizeof p);
                    break;
                }
                case WorldLayout::kVuya422: {
                    if (x % 2 != 0) break;
                    const float* next = x + 1 < w ? in + 4 * (x + 1) : in + 4 * x;
                    const YCbCr c0 = ToYCbCr(Clamp01(r), Clamp01(g), Clamp01(b));
                    const YCbCr c1 = ToYCbCr(Clamp01(next[0]), Clamp01(next[1]), Clamp01(next[2]));
                    auto luma = [](float v) { return static_cast<uint32_t>(std::lround(4096 + v * 56064)); };
                    auto chroma = [](float v) { return static_cast<uint32_t>(std::lround(32768 + v * 57344)); };
                    const uint32_t words[2] = {luma(c0.y) | chroma((c0.cr + c1.cr) / 2) << 16,
                                               luma(c1.y) | chroma((c0.cb + c1.cb) / 2) << 16};
                    std::memcpy(out + 4 * x, words, x + 1 < w ? 8 : 4);
                    break;
                }
            }
        }
    }
}

std::vector<float> World::ToRgba() const {
    const int32_t w = width();
    std::vector<float> rgba(static_cast<size_t>(w) * static_cast<size_t>(height()) * 4);
    for (int32_t y = 0; y < height(); ++y) {
        const uint8_t* in = row(y);
        float* out = rgba.data() + static_cast<size_t>(y) * static_cast<size_t>(w) * 4;
        for (int32_t x = 0; x < w; ++x) {
            float* o = out + 4 * x;
            switch (m_layout) {
                case WorldLayout::kArgb8: {
                    const uint8_t* p = in + 4 * x;
                    o[0] = p[1] / 255.0f, o[1] = p[2] / 255.0f, o[2] = p[3] / 255.0f, o[3] = p[0] / 255.0f;
                    break;
                }
                case WorldLayout::kBgra8: {
                    const uint8_t* p = in + 4 * x;
                    o[0] = p[2] / 255.0f, o[1] = p[1] / 255.0f, o[2] = p[0] / 255.0f, o[3] = p[3] / 255.0f;
                    break;
                }
                case WorldLayout::kArgb16: {
                    uint16_t p[4];
                    std::memcpy(p, in + 8 * x, sizeof p);
                    o[0] = p[1] / 32768.0f, o[1] = p[2] / 32768.0f, o[2] = p[3] / 32768.0f, o[3] = p[0] / 32768.0f;
                    break;
                }
                case WorldLayout::kArgbFloat: {
                    float p[4];
                    std::memcpy(p, in + 16 * x, sizeof p);
                    o[0] = p[1], o[1] = p[2], o[2] = p[3], o[3] = p[0];
                    break;
                }
                case WorldLayout::kBgraFloat: {
                    float p[4];
                    std::memcpy(p, in + 16 * x, sizeof p);
                    o[0] = p[2], o[1] = p[1], o[2] = p[0], o[3] = p[3];
                    break;
                }
                case WorldLayout::kVuya8: {
                    const uint8_t* p = in + 4 * x;
                    const YCbCr c{(p[2] - 16) / 219.0f, (p[1] - 128) / 224.0f, (p[0] - 128) / 224.0f};
                    FromYCbCr(c, &o[0], &o[1], &o[2]);
                    o[3] = p[3] / 255.0f;
                    break;
                }
                case WorldLayout::kVuyaFloat: {
                    float p[4];
                    std::memcpy(p, in + 16 * x, sizeof p);
                    const YCbCr c{p[2] * 255.0f / 219.0f, p[1] * 255.0f / 224.0f, p[0] * 255.0f / 224.0f};
                    FromYCbCr(c, &o[0], &o[1], &o[2]);
                    o[3] = p[3];
                    break;
                }
                case WorldLayout::kVuya422: {
                    const int32_t first = x & ~1;
                    uint32_t words[2] = {0, 0};
                    std::memcpy(words, in + 4 * first, first + 1 < w ? 8 : 4);
                    if (first + 1 >= w) words[1] = words[0];
                    const float luma = ((x == first ? words[0] : words[1]) & 0xFFFF) - 4096.0f;
                    const YCbCr c{luma / 56064.0f, ((words[1] >> 16) - 32768.0f) / 57344.0f,
                                  ((words[0] >> 16) - 32768.0f) / 57344.0f};
                    FromYCbCr(c, &o[0], &o[1], &o[2]);
                    o[3] = 1.0f;
                    break;
                }
            }
        }
    }
    return rgba;
}

}  // namespace refhost
