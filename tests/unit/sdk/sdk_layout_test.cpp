// Every SDK header compiled together (their static_asserts pin sizes and offsets), plus the facts the
// asserts cannot see: signedness, byte order of packed codes, and one record read from raw bytes laid
// out the way a host writes them.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <vector>

#include "sdk/ae_config.h"
#include "sdk/ae_effect.h"
#include "sdk/ae_effect_ui.h"
#include "sdk/ae_suites.h"
#include "sdk/drawbot_suites.h"
#include "sdk/pipl.h"
#include "sdk/sp_basic.h"

namespace {

template <typename T>
void Put(std::vector<uint8_t>& bytes, size_t offset, T value) {
    std::memcpy(bytes.data() + offset, &value, sizeof value);
}

TEST(SdkLayout, PixelFormatCodesSpellTheirLettersInMemoryOrder) {
    const struct {
        PF_PixelFormat code;
        const char* letters;
    } cases[] = {
        {PrPixelFormat_VUYA_4444_32f, "VUya"}, {PrPixelFormat_BGRA_4444_32f, "BGra"},
        {PrPixelFormat_VUYA_4444_8u, "vuya"},  {PrPixelFormat_BGRA_4444_8u, "bgra"},
        {PF_PixelFormat_ARGB64, "ae16"},       {PF_PixelFormat_ARGB128, "ae32"},
    };
    for (const auto& c : cases) {
        char bytes[4];
        std::memcpy(bytes, &c.code, 4);
        EXPECT_EQ(0, std::memcmp(bytes, c.letters, 4)) << c.letters;
    }
}

TEST(SdkLayout, SignedFieldsStaySigned) {
    // The arbitrary id is 16-bit signed; rowbytes is negative for bottom-up layers.
    PF_ArbParamsExtra extra{};
    const uint16_t allOnes = 0xFFFF;
    std::memcpy(reinterpret_cast<uint8_t*>(&extra) + 4, &allOnes, 2);
    EXPECT_EQ(-1, extra.id);

    PF_LayerDef layer{};
    layer.rowbytes = -4096;
    EXPECT_LT(layer.rowbytes, 0);
    EXPECT_EQ(-1, PF_LayerDefault_MYSELF);
    EXPECT_EQ(-1, PF_Param_RESERVED);
    EXPECT_EQ(-1, PF_App_Color_NONE);
    EXPECT_LT(PF_OutFlag_AUDIO_EFFECT_ONLY, 0);  // bit 31 of a signed word
}

TEST(SdkLayout, InDataReadsFieldsWhereTheHostWritesThem) {
    std::vector<uint8_t> bytes(sizeof(PF_InData), 0);
    Put<int16_t>(bytes, 196, 13);          // version.major
    Put<int16_t>(bytes, 198, 28);          // version.minor
    Put<int32_t>(bytes, 204, 0x46585443);  // appl_id 'FXTC'
    Put<int32_t>(bytes, 244, PF_Field_UPPER);
    Put<int32_t>(bytes, 232, 900);                                       // total_time
    Put<int32_t>(bytes, 300, 10);                                        // pixel_aspect_ratio.num
    Put<uint32_t>(bytes, 304, 11);                                       // pixel_aspect_ratio.den
    Put<void*>(bytes, 312, reinterpret_cast<void*>(uintptr_t{0x1000}));  // global_data
    Put<void*>(bytes, 384, reinterpret_cast<void*>(uintptr_t{0x2000}));  // pica_basicP

    PF_InData in{};
    std::memcpy(&in, bytes.data(), sizeof in);
    EXPECT_EQ(13, in.version.major);
    EXPECT_EQ(28, in.version.minor);
    EXPECT_EQ(0x46585443, in.appl_id);
    EXPECT_EQ(PF_Field_UPPER, in.field);
    EXPECT_EQ(900, in.total_time);
    EXPECT_EQ(10, in.pixel_aspect_ratio.num);
    EXPECT_EQ(11u, in.pixel_aspect_ratio.den);
    EXPECT_EQ(reinterpret_cast<PF_Handle>(uintptr_t{0x1000}), in.global_data);
    EXPECT_EQ(reinterpret_cast<SPBasicSuite*>(uintptr_t{0x2000}), in.pica_basicP);
}

TEST(SdkLayout, ParamDefIdAndChangeFlagsShareOneWord) {
    PF_ParamDef def{};
    def.uu.id = 0x7;
    EXPECT_EQ(0x7, def.uu.change_flags);
    def.uu.change_flags = PF_ChangeFlag_CHANGED_VALUE;
    EXPECT_EQ(1, def.uu.id);
}

TEST(SdkLayout, EffectVersionWordPacksEachFieldInItsBits) {
    EXPECT_EQ(0x00185724u, PF_Version(3, 0, 10, PF_Stage_RELEASE, 292));
    EXPECT_EQ(0x1FFu, PF_Version(0, 0, 0, 0, 0xFFFF));                // build masked to 9 bits
    EXPECT_EQ(0x3u << 9, PF_Version(0, 0, 0, 7, 0));                  // stage masked to 2 bits
    EXPECT_EQ((1u << 26) | (0x1u << 19), PF_Version(9, 0, 0, 0, 0));  // version 9: high bits at 26
}

}  // namespace
