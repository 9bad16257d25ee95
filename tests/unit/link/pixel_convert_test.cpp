#include "link/pixel_convert.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "link/pixel_convert_internal.h"

namespace vt {
namespace {

constexpr uint32_t kAllCodes[] = {kFormatArgb8,  kFormatBgra8,      kFormatArgb16,     kFormatArgbFloat, kFormatBgraFloat,
                                  kFormatVuya8,  kFormatVuyaFloat,  kFormatYuv422_601, kFormatYuv422_709};

constexpr ConvertLevel kAllLevels[] = {ConvertLevel::kScalar, ConvertLevel::kVector4, ConvertLevel::kAvx2,
                                       ConvertLevel::kAvx512};

const float kNaN = std::numeric_limits<float>::quiet_NaN();
const float kInf = std::numeric_limits<float>::infinity();

// A working frame that frees itself.
struct Frame {
    FrameBuffer f{};
    Frame(uint32_t w, uint32_t h) { EXPECT_EQ(FBNewFrameBuffer(w, h, &f, kFormatPlanarFloat), 0); }
    ~Frame() { FBDisposeFrameBuffer(&f); }
    float* Row(int plane, uint32_t y) const {
        return reinterpret_cast<float*>(f.data + plane * size_t{f.planeSize} + y * size_t{f.rowBytes});
    }
    float At(int plane, uint32_t x, uint32_t y = 0) const { return Row(plane, y)[x]; }
    void Set(uint32_t x, float r, float g, float b) {
        Row(0, 0)[x] = r;
        Row(1, 0)[x] = g;
        Row(2, 0)[x] = b;
    }
};

// Runs the public conversions on one level, then restores the process's choice.
class LevelScope {
public:
    explicit LevelScope(ConvertLevel level) : m_saved(CurrentConvertLevel()) { m_ok = SetConvertLevel(level); }
    ~LevelScope() { SetConvertLevel(m_saved); }
    bool ok() const { return m_ok; }

private:
    ConvertLevel m_saved;
    bool m_ok;
};

template <class T>
std::vector<uint8_t> Bytes(std::initializer_list<T> values) {
    std::vector<uint8_t> out(values.size() * sizeof(T));
    std::memcpy(out.data(), values.begin(), out.size());
    return out;
}

template <class T>
T Read(const std::vector<uint8_t>& bytes, size_t index) {
    T v;
    std::memcpy(&v, bytes.data() + index * sizeof(T), sizeof(T));
    return v;
}

float Luma(float r, float g, float b) {
    return 0.299f * r + 0.587f * g + 0.114f * b;
}

void ExpectPixel(const Frame& frame, uint32_t x, float r, float g, float b, float l) {
    EXPECT_EQ(frame.At(0, x), r) << "R at " << x;
    EXPECT_EQ(frame.At(1, x), g) << "G at " << x;
    EXPECT_EQ(frame.At(2, x), b) << "B at " << x;
    EXPECT_EQ(frame.At(3, x), l) << "L at " << x;
}

TEST(PixelImport, EightBitLayoutsDivideBy255AndFillLuma) {
    Frame frame(1, 1);
    const float r = 255 / 255.0f, g = 128 / 255.0f, b = 0.0f;
    FBImportPixels(Bytes<uint8_t>({9, 255, 128, 0}).data(), 4, kFormatArgb8, &frame.f);
    ExpectPixel(frame, 0, r, g, b, Luma(r, g, b));
    FBImportPixels(Bytes<uint8_t>({0, 128, 255, 9}).data(), 4, kFormatBgra8, &frame.f);
    ExpectPixel(frame, 0, r, g, b, Luma(r, g, b));
}

TEST(PixelImport, SixteenBitScalesBy32768AndClampsAtOne) {
    Frame frame(1, 1);
    FBImportPixels(Bytes<uint16_t>({1, 40000, 16384, 32768}).data(), 8, kFormatArgb16, &frame.f);
    ExpectPixel(frame, 0, 1.0f, 0.5f, 1.0f, Luma(1.0f, 0.5f, 1.0f));  // luma from the clamped values
}

TEST(PixelImport, FloatLayoutsPassValuesThroughUnclamped) {
    Frame frame(1, 1);
    FBImportPixels(Bytes<float>({0.5f, -0.25f, 1.75f, 0.125f}).data(), 16, kFormatArgbFloat, &frame.f);
    ExpectPixel(frame, 0, -0.25f, 1.75f, 0.125f, Luma(-0.25f, 1.75f, 0.125f));
    FBImportPixels(Bytes<float>({0.125f, 1.75f, -0.25f, 0.5f}).data(), 16, kFormatBgraFloat, &frame.f);
    ExpectPixel(frame, 0, -0.25f, 1.75f, 0.125f, Luma(-0.25f, 1.75f, 0.125f));
}

TEST(PixelImport, StudioRangeVuyaGivesBt601Colours) {
    Frame frame(3, 1);
    // White, black and BT.601 red in 8-bit studio range (V, U, Y, A).
    FBImportPixels(Bytes<uint8_t>({128, 128, 235, 0, 128, 128, 16, 0, 240, 90, 81, 0}).data(), 12, kFormatVuya8,
                   &frame.f);
    for (int p = 0; p < 4; ++p) EXPECT_NEAR(frame.At(p, 0), 1.0f, 1e-6f);
    for (int p = 0; p < 4; ++p) EXPECT_EQ(frame.At(p, 1), 0.0f);
    EXPECT_NEAR(frame.At(0, 2), 1.0f, 0.01f);
    EXPECT_NEAR(frame.At(1, 2), 0.0f, 0.01f);
    EXPECT_NEAR(frame.At(2, 2), 0.0f, 0.01f);
    const float y = (81 - 16) * 1.1643828f;
    EXPECT_EQ(frame.At(0, 2), (y + 1.5960274f * 112) / 255);
    EXPECT_EQ(frame.At(1, 2), (y - 0.39176172f * -38 - 0.81296875f * 112) / 255);
    EXPECT_EQ(frame.At(2, 2), (y + 2.0172305f * -38) / 255);
    EXPECT_EQ(frame.At(3, 2), y / 255);

    const float vf = 0.25f, uf = -0.125f, yf = 0.5f;
    Frame one(1, 1);
    FBImportPixels(Bytes<float>({vf, uf, yf, 1.0f}).data(), 16, kFormatVuyaFloat, &one.f);
    const float yy = yf * 1.1643828f;
    ExpectPixel(one, 0, yy + 1.5960274f * vf, yy - 0.39176172f * uf - 0.81296875f * vf, yy + 2.0172305f * uf, yy);
}

TEST(PixelImport, FourTwoTwoPairsShareChromaWithTheirMatrix) {
    Frame frame(2, 1);
    // Y0 = 60160 (white), Y1 = 4096 (black); Cr = 32768 + 1000, Cb = 32768 - 2000.
    const uint32_t words[2] = {60160u | (33768u << 16), 4096u | (30768u << 16)};
    struct Matrix {
        uint32_t code;
        float rCr, gCb, gCr, bCb;
    };
    for (const Matrix& m : {Matrix{kFormatYuv422_601, 0.00156473f, 0.00038408f, 0.000797027f, 0.00197768f},
                            Matrix{kFormatYuv422_709, 0.00175759f, 0.000209067f, 0.00052246f, 0.00207098f}}) {
        FBImportPixels(words, 8, m.code, &frame.f);
        const float s = 1.0f / 64, ky = 0.00114155f * s;
        const float cr = 1000, cb = -2000;
        ExpectPixel(frame, 0, 56064 * ky + cr * (m.rCr * s), 56064 * ky - cb * (m.gCb * s) - cr * (m.gCr * s),
                    56064 * ky + cb * (m.bCb * s), 1.0f);
        ExpectPixel(frame, 1, cr * (m.rCr * s), -cb * (m.gCb * s) - cr * (m.gCr * s), cb * (m.bCb * s), 0.0f);
        EXPECT_NEAR(frame.At(0, 0), 1.0f + 1000 * m.rCr / 64, 1e-4f);
    }
}

TEST(PixelImport, ClearsPaddingAndIgnoresWhatItCannotConvert) {
    Frame frame(5, 2);
    for (int p = 0; p < 4; ++p) {
        for (uint32_t y = 0; y < 2; ++y) std::fill_n(frame.Row(p, y), frame.f.rowBytes / 4, kNaN);
    }
    const std::vector<uint8_t> pixels(5 * 2 * 4, 200);
    FBImportPixels(pixels.data(), 20, kFormatArgb8, &frame.f);
    for (int p = 0; p < 4; ++p) {
        for (uint32_t y = 0; y < 2; ++y) {
            EXPECT_NEAR(frame.At(p, 4, y), 200 / 255.0f, 1e-6f);
            for (uint32_t x = 5; x < 8; ++x) EXPECT_EQ(frame.At(p, x, y), 0.0f);
        }
    }

    const std::vector<uint8_t> before(frame.f.data, frame.f.data + 4 * size_t{frame.f.planeSize});
    FBImportPixels(pixels.data(), 20, 12345, &frame.f);  // unknown code
    FBImportPixels(nullptr, 20, kFormatArgb8, &frame.f);
    FBImportPixels(pixels.data(), 20, kFormatArgb8, nullptr);
    FrameBuffer wrong = frame.f;
    wrong.format = kFormatBgra8;  // an 8-bit record has one plane: importing would write past it
    FBImportPixels(pixels.data(), 20, kFormatArgb8, &wrong);
    wrong = frame.f;
    wrong.planes = 1;
    FBImportPixels(pixels.data(), 20, kFormatArgb8, &wrong);
    EXPECT_EQ(0, std::memcmp(before.data(), frame.f.data, before.size()));
}

TEST(PixelImport, NegativeRowBytesReadBottomUpWorlds) {
    Frame frame(1, 2);
    const uint8_t rows[8] = {0, 10, 10, 10, 0, 20, 20, 20};
    FBImportPixels(rows + 4, -4, kFormatArgb8, &frame.f);
    EXPECT_EQ(frame.At(0, 0, 0), 20 / 255.0f);
    EXPECT_EQ(frame.At(0, 0, 1), 10 / 255.0f);
}

TEST(PixelExport, EightBitAddsHalfACodeThenTruncatesAndClamps) {
    Frame frame(5, 1);
    const float values[5] = {0.998f, 0.999f, 1.5f, -0.2f, kNaN};
    const uint8_t expected[5] = {254, 255, 255, 0, 0};
    for (uint32_t x = 0; x < 5; ++x) frame.Set(x, values[x], values[(x + 1) % 5], values[(x + 2) % 5]);
    std::vector<uint8_t> out(20, 7);
    FBExportPixels(&frame.f, out.data(), 20, kFormatArgb8);
    for (uint32_t x = 0; x < 5; ++x) {
        EXPECT_EQ(out[4 * x + 0], 255);
        EXPECT_EQ(out[4 * x + 1], expected[x]);
        EXPECT_EQ(out[4 * x + 2], expected[(x + 1) % 5]);
        EXPECT_EQ(out[4 * x + 3], expected[(x + 2) % 5]);
    }
    FBExportPixels(&frame.f, out.data(), 20, kFormatBgra8);
    for (uint32_t x = 0; x < 5; ++x) {
        EXPECT_EQ(out[4 * x + 2], expected[x]);
        EXPECT_EQ(out[4 * x + 1], expected[(x + 1) % 5]);
        EXPECT_EQ(out[4 * x + 0], expected[(x + 2) % 5]);
        EXPECT_EQ(out[4 * x + 3], 255);
    }
}

TEST(PixelExport, SixteenBitScalesBy32768WithAlpha32767) {
    Frame frame(1, 1);
    frame.Set(0, 1.0f, 0.5f, -3.0f);
    std::vector<uint8_t> out(8);
    FBExportPixels(&frame.f, out.data(), 8, kFormatArgb16);
    EXPECT_EQ(Read<uint16_t>(out, 0), 32767);
    EXPECT_EQ(Read<uint16_t>(out, 1), 32768);
    EXPECT_EQ(Read<uint16_t>(out, 2), 16384);
    EXPECT_EQ(Read<uint16_t>(out, 3), 0);
    frame.Set(0, 7.0f, kNaN, 0.99999f);
    FBExportPixels(&frame.f, out.data(), 8, kFormatArgb16);
    EXPECT_EQ(Read<uint16_t>(out, 1), 32768);
    EXPECT_EQ(Read<uint16_t>(out, 2), 0);
    EXPECT_EQ(Read<uint16_t>(out, 3), 32767);
}

TEST(PixelExport, FloatLayoutsCopyWithOpaqueAlpha) {
    Frame frame(1, 1);
    frame.Set(0, -0.5f, 2.5f, 0.25f);
    std::vector<uint8_t> out(16);
    FBExportPixels(&frame.f, out.data(), 16, kFormatArgbFloat);
    EXPECT_EQ(out, Bytes<float>({1.0f, -0.5f, 2.5f, 0.25f}));
    FBExportPixels(&frame.f, out.data(), 16, kFormatBgraFloat);
    EXPECT_EQ(out, Bytes<float>({0.25f, 2.5f, -0.5f, 1.0f}));
}

TEST(PixelExport, VuyaBytesStayWithinOneTo254) {
    Frame frame(4, 1);
    frame.Set(0, 1.0f, 1.0f, 1.0f);
    frame.Set(1, 5.0f, 5.0f, 5.0f);
    frame.Set(2, -5.0f, -5.0f, -5.0f);
    frame.Set(3, 0.0f, 0.0f, 9.0f);  // far blue: U above range, V below
    std::vector<uint8_t> out(16);
    FBExportPixels(&frame.f, out.data(), 16, kFormatVuya8);
    // White: 255 * 0.85882424 + 16 is 234.99..., which single precision rounds to 235.
    EXPECT_EQ(out[2], 235);
    EXPECT_NEAR(out[0], 128, 1);  // grey chroma: the coefficients cancel to within a rounding
    EXPECT_NEAR(out[1], 128, 1);
    EXPECT_EQ(out[6], 254);
    EXPECT_EQ(out[10], 1);
    EXPECT_EQ(out[12], 1);    // V
    EXPECT_EQ(out[13], 254);  // U
    EXPECT_EQ(out[14], 240);  // Y: 255 * 0.09790625 * 9 + 16
    for (int x = 0; x < 4; ++x) EXPECT_EQ(out[4 * x + 3], 255);
}

TEST(PixelExport, VuyaFloatsAreUnclamped) {
    Frame frame(1, 1);
    frame.Set(0, 2.0f, -1.0f, 0.5f);
    std::vector<uint8_t> out(16);
    FBExportPixels(&frame.f, out.data(), 16, kFormatVuyaFloat);
    const float r = 2.0f, g = -1.0f, b = 0.5f;
    EXPECT_EQ(Read<float>(out, 2), 0.25678906f * r + 0.50412893f * g + 0.09790625f * b);
    EXPECT_EQ(Read<float>(out, 1), -0.14822266f * r - 0.2909922f * g + 0.43921483f * b);
    EXPECT_EQ(Read<float>(out, 0), 0.43921483f * r - 0.36778906f * g - 0.07142578f * b);
    EXPECT_EQ(Read<float>(out, 3), 1.0f);
}

TEST(PixelExport, FourTwoTwoWritesBothLumasAndTheFirstPixelsChroma) {
    Frame frame(3, 1);
    frame.Set(0, 1.0f, 0.0f, 0.0f);  // red: Cr high
    frame.Set(1, 0.0f, 0.0f, 1.0f);  // blue: its chroma is dropped
    frame.Set(2, 4.0f, 4.0f, 4.0f);  // limited to white, a lone last pixel
    std::vector<uint32_t> out(4, 0xdeadbeef);
    FBExportPixels(&frame.f, out.data(), 12, kFormatYuv422_601);
    EXPECT_EQ(out[0] & 0xffff, static_cast<uint32_t>(16763.137f + 4096.0f));
    EXPECT_EQ(out[0] >> 16, 61440u);  // Cr of red: 28672 + 32768
    EXPECT_EQ(out[1] & 0xffff, static_cast<uint32_t>(6391.296f + 4096.0f));
    EXPECT_EQ(out[1] >> 16, static_cast<uint32_t>(-9675.997f + 32768.0f));  // Cb of red, not of blue
    EXPECT_EQ(out[2] & 0xffff, static_cast<uint32_t>(16763.137f + 32909.566f + 6391.296f + 4096.0f));
    EXPECT_EQ(out[3], 0xdeadbeefu) << "a lone last pixel writes only its own word";

    frame.Set(0, -9.0f, -9.0f, -9.0f);
    frame.Set(1, 0.0f, 0.0f, 1.0f);
    FBExportPixels(&frame.f, out.data(), 12, kFormatYuv422_709);
    EXPECT_EQ(out[0] & 0xffff, 1u);
    EXPECT_NEAR(static_cast<double>(out[0] >> 16), 32768.0, 1.0);  // grey has no chroma, however dark
    EXPECT_EQ(out[1] & 0xffff, static_cast<uint32_t>(4047.8208f + 4096.0f));
}

TEST(PixelExport, UnknownCodeOrWrongRecordWritesNothing) {
    Frame frame(2, 1);
    std::vector<uint8_t> out(32, 0x5a);
    FBExportPixels(&frame.f, out.data(), 32, 777);
    FrameBuffer wrong = frame.f;
    wrong.format = kFormatArgbFloat;
    FBExportPixels(&wrong, out.data(), 32, kFormatArgb8);
    FBExportPixels(nullptr, out.data(), 32, kFormatArgb8);
    EXPECT_EQ(out, std::vector<uint8_t>(32, 0x5a));
}

TEST(PixelRoundTrip, EveryEightBitValueReturnsExactly) {
    for (ConvertLevel level : kAllLevels) {
        LevelScope scope(level);
        if (!scope.ok()) continue;
        for (uint32_t code : {kFormatArgb8, kFormatBgra8}) {
            Frame frame(256, 1);
            std::vector<uint8_t> in(256 * 4), out(256 * 4);
            for (uint32_t x = 0; x < 256; ++x) {
                in[4 * x + 0] = in[4 * x + 3] = 255;
                in[4 * x + 1] = static_cast<uint8_t>(x);
                in[4 * x + 2] = static_cast<uint8_t>(255 - x);
                (code == kFormatArgb8 ? in[4 * x + 3] : in[4 * x + 0]) = static_cast<uint8_t>(x * 7);
            }
            FBImportPixels(in.data(), 1024, code, &frame.f);
            FBExportPixels(&frame.f, out.data(), 1024, code);
            FBCopyAlpha(in.data(), 1024, out.data(), 1024, 256, 1, code);
            EXPECT_EQ(in, out) << "level " << static_cast<int>(level) << " code " << code;
        }
    }
}

TEST(PixelRoundTrip, FloatReturnsExactlyAndSixteenBitWithinOneCode) {
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> any(-2.0f, 3.0f);
    for (ConvertLevel level : kAllLevels) {
        LevelScope scope(level);
        if (!scope.ok()) continue;
        for (uint32_t code : {kFormatArgbFloat, kFormatBgraFloat}) {
            Frame frame(37, 3);
            std::vector<float> in(37 * 3 * 4), out(in.size());
            for (float& v : in) v = any(rng);
            FBImportPixels(in.data(), 37 * 16, code, &frame.f);
            FBExportPixels(&frame.f, out.data(), 37 * 16, code);
            FBCopyAlpha(in.data(), 37 * 16, out.data(), 37 * 16, 37, 3, code);
            EXPECT_EQ(0, std::memcmp(in.data(), out.data(), in.size() * 4));
        }
        Frame frame(32769, 1);
        std::vector<uint16_t> in(32769 * 4), out(in.size());
        for (uint32_t x = 0; x <= 32768; ++x) {
            in[4 * x] = static_cast<uint16_t>(x);
            in[4 * x + 1] = static_cast<uint16_t>(x);
            in[4 * x + 2] = static_cast<uint16_t>(32768 - x);
            in[4 * x + 3] = static_cast<uint16_t>(x / 2);
        }
        FBImportPixels(in.data(), 32769 * 8, kFormatArgb16, &frame.f);
        FBExportPixels(&frame.f, out.data(), 32769 * 8, kFormatArgb16);
        FBCopyAlpha(in.data(), 32769 * 8, out.data(), 32769 * 8, 32769, 1, kFormatArgb16);
        for (size_t i = 0; i < in.size(); ++i) ASSERT_LE(std::abs(in[i] - out[i]), 1) << i;
    }
}

TEST(PixelAlpha, EachLayoutTakesAlphaFromItsOwnPlace) {
    struct Case {
        uint32_t code;
        uint32_t bytes;
        uint32_t offset;
        uint32_t size;
    };
    const Case cases[] = {{kFormatArgb8, 4, 0, 1},      {kFormatBgra8, 4, 3, 1},      {kFormatVuya8, 4, 3, 1},
                          {kFormatArgb16, 8, 0, 2},     {kFormatArgbFloat, 16, 0, 4}, {kFormatVuyaFloat, 16, 12, 4},
                          {kFormatBgraFloat, 16, 12, 4}};
    std::mt19937 rng(9);
    for (ConvertLevel level : kAllLevels) {
        LevelScope scope(level);
        if (!scope.ok()) continue;
        for (const Case& c : cases) {
            const uint32_t w = 19, h = 3, inRow = w * c.bytes + 8, outRow = w * c.bytes + 4;
            std::vector<uint8_t> in(inRow * h), out(outRow * h);
            for (auto& b : in) b = static_cast<uint8_t>(rng());
            for (auto& b : out) b = static_cast<uint8_t>(rng());
            std::vector<uint8_t> expected = out;
            for (uint32_t y = 0; y < h; ++y) {
                for (uint32_t x = 0; x < w; ++x) {
                    std::memcpy(&expected[y * outRow + x * c.bytes + c.offset], &in[y * inRow + x * c.bytes + c.offset],
                                c.size);
                }
            }
            FBCopyAlpha(in.data(), inRow, out.data(), outRow, w, h, c.code);
            EXPECT_EQ(out, expected) << "code " << c.code;
        }
    }
    std::vector<uint8_t> in(64, 1), out(64, 2);
    FBCopyAlpha(in.data(), 32, out.data(), 32, 8, 2, kFormatYuv422_601);
    FBCopyAlpha(in.data(), 32, out.data(), 32, 8, 2, kFormatYuv422_709);
    FBCopyAlpha(in.data(), 32, out.data(), 32, 8, 2, 999);
    EXPECT_EQ(out, std::vector<uint8_t>(64, 2));
}

// Random host pixels of a layout: bytes, or floats with a few specials among ordinary values.
std::vector<uint8_t> RandomHostRow(uint32_t code, size_t bytes, std::mt19937& rng) {
    std::vector<uint8_t> v(bytes);
    if (HostBytesPerPixel(code) == 16) {
        std::uniform_real_distribution<float> any(-0.5f, 1.5f);
        for (size_t i = 0; i + 4 <= bytes; i += 4) {
            const uint32_t pick = rng() % 64;
            const float f = pick == 0 ? kNaN : pick == 1 ? kInf : pick == 2 ? -kInf : any(rng);
            std::memcpy(&v[i], &f, 4);
        }
    } else {
        for (auto& b : v) b = static_cast<uint8_t>(rng());
    }
    return v;
}

TEST(PixelPaths, VectorPathsEqualThePixelByPixelReference) {
    const ConvertKernels* scalar = ConvertKernelsFor(ConvertLevel::kScalar);
    std::mt19937 rng(17);
    std::uniform_real_distribution<float> level(-0.3f, 1.3f);
    for (ConvertLevel lv : {ConvertLevel::kVector4, ConvertLevel::kAvx2, ConvertLevel::kAvx512}) {
        const ConvertKernels* k = ConvertKernelsFor(lv);
        if (k == nullptr) continue;
        for (uint32_t code : kAllCodes) {
            const int index = HostLayoutIndex(code);
            const uint32_t bpp = HostBytesPerPixel(code);
            for (uint32_t w : {1u, 2u, 3u, 4u, 5u, 7u, 8u, 9u, 15u, 16u, 17u, 31u, 33u, 37u, 64u, 67u}) {
                const uint32_t h = 3;
                const ptrdiff_t row = w * bpp + 12;
                const std::vector<uint8_t> host = RandomHostRow(code, row * h, rng);
                Frame a(w, h), b(w, h);
                scalar->importFrame[index](host.data(), row, a.f);
                k->importFrame[index](host.data(), row, b.f);
                ASSERT_EQ(0, std::memcmp(a.f.data, b.f.data, 4 * size_t{a.f.planeSize}))
                    << k->name << " import code " << code << " width " << w;

                for (int p = 0; p < 3; ++p) {
                    for (uint32_t y = 0; y < h; ++y) {
                        for (uint32_t x = 0; x < w; ++x) {
                            const uint32_t pick = rng() % 50;
                            a.Row(p, y)[x] = pick == 0 ? kNaN : pick == 1 ? kInf : pick == 2 ? -kInf : level(rng);
                        }
                    }
                }
                std::vector<uint8_t> outA(row * h, 0x33), outB(row * h, 0x33);
                scalar->exportFrame[index](a.f, outA.data(), row);
                k->exportFrame[index](a.f, outB.data(), row);
                ASSERT_EQ(outA, outB) << k->name << " export code " << code << " width " << w;
            }
        }
    }
}

// The wide paths replace division by a reciprocal and one correction step: check every input the
// 8-bit luma-chroma import can meet, and every 4:2:2 luma word.
TEST(PixelPaths, WideDivisionMatchesOverWholeInputDomains) {
    const ConvertKernels* scalar = ConvertKernelsFor(ConvertLevel::kScalar);
    const int vuya = HostLayoutIndex(kFormatVuya8), yuv = HostLayoutIndex(kFormatYuv422_709);
    std::vector<uint8_t> host(65536 * 4);
    for (ConvertLevel lv : {ConvertLevel::kAvx2, ConvertLevel::kAvx512}) {
        const ConvertKernels* k = ConvertKernelsFor(lv);
        if (k == nullptr) continue;
        Frame a(65536, 1), b(65536, 1);
        for (uint32_t y = 0; y < 256; ++y) {
            for (uint32_t i = 0; i < 65536; ++i) {
                host[4 * i] = static_cast<uint8_t>(i);
                host[4 * i + 1] = static_cast<uint8_t>(i >> 8);
                host[4 * i + 2] = static_cast<uint8_t>(y);
            }
            scalar->importFrame[vuya](host.data(), 0, a.f);
            k->importFrame[vuya](host.data(), 0, b.f);
            ASSERT_EQ(0, std::memcmp(a.f.data, b.f.data, 4 * size_t{a.f.planeSize})) << k->name << " Y " << y;
        }
        for (uint32_t i = 0; i < 65536; ++i) {
            const uint32_t word = i | ((i * 31u) & 0xffffu) << 16;
            std::memcpy(&host[4 * i], &word, 4);
        }
        scalar->importFrame[yuv](host.data(), 0, a.f);
        k->importFrame[yuv](host.data(), 0, b.f);
        ASSERT_EQ(0, std::memcmp(a.f.data, b.f.data, 4 * size_t{a.f.planeSize})) << k->name;
    }
}

TEST(PixelPaths, OddFourTwoTwoRowsStayWithinTheirWidth) {
    for (ConvertLevel level : kAllLevels) {
        LevelScope scope(level);
        if (!scope.ok()) continue;
        for (uint32_t w : {1u, 3u, 9u, 17u}) {
            // Exactly w words: reading a pair's second word for the last pixel would overrun.
            std::vector<uint32_t> host(w);
            for (uint32_t x = 0; x < w; ++x) host[x] = (20000u + x) | (x % 2 ? 30000u : 40000u) << 16;
            Frame frame(w, 1);
            FBImportPixels(host.data(), w * 4, kFormatYuv422_601, &frame.f);
            Frame single(2, 1);
            const uint32_t cb = w >= 3 ? 30000u : 32768u;  // the previous pair's Cb, or neutral
            const uint32_t pair[2] = {host[w - 1], cb << 16};
            FBImportPixels(pair, 8, kFormatYuv422_601, &single.f);
            for (int p = 0; p < 4; ++p) EXPECT_EQ(frame.At(p, w - 1), single.At(p, 0)) << "width " << w;

            std::vector<uint32_t> out(w);
            FBExportPixels(&frame.f, out.data(), w * 4, kFormatYuv422_601);
        }
    }
}

}  // namespace
}  // namespace vt
