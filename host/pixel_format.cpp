#include "host/pixel_format.h"

#include "host/global_state.h"
#include "host/suites.h"
#include "link/frame_buffer.h"
#include "sdk/ae_suites.h"

namespace vt {

namespace {

struct FormatAnswer {
    int32_t hostFormat;  // four characters in memory order
    uint32_t code;
    uint32_t bytesPerPixel;
};

// What the Premiere family's pixel-format suite may answer.
constexpr FormatAnswer kPixelFormatSuiteAnswers[] = {
    {PrPixelFormat_ARGB_4444_8u, kFormatArgb8, 4},      {PrPixelFormat_BGRA_4444_8u, kFormatBgra8, 4},
    {PrPixelFormat_ARGB_4444_32f, kFormatArgbFloat, 16}, {PrPixelFormat_BGRA_4444_32f, kFormatBgraFloat, 16},
    {PrPixelFormat_VUYA_4444_32f, kFormatVuyaFloat, 16}, {PrPixelFormat_VUYA_4444_8u, kFormatVuya8, 4},
};

// What the world suite may answer.
constexpr FormatAnswer kWorldSuiteAnswers[] = {
    {PF_PixelFormat_ARGB128, kFormatArgbFloat, 16},
    {PF_PixelFormat_ARGB64, kFormatArgb16, 8},
    {PF_PixelFormat_ARGB32, kFormatArgb8, 4},
};

template <size_t N>
PF_Err Answer(const FormatAnswer (&answers)[N], int32_t hostFormat, uint32_t* code, uint32_t* bytesPerPixel) {
    for (const FormatAnswer& answer : answers) {
        if (answer.hostFormat == hostFormat) {
            *code = answer.code;
            *bytesPerPixel = answer.bytesPerPixel;
            return PF_Err_NONE;
        }
    }
    return PF_Err_UNRECOGNIZED_PARAM_TYPE;
}

}  // namespace

PF_Err QueryPixelFormat(const PF_EffectWorld* world, const GlobalState* global, uint32_t* code,
                        uint32_t* bytesPerPixel) {
    if (!world) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    const SPBasicSuite* basic = global ? global->basicSuite : nullptr;
    if (basic) {
        SuiteRef<PF_PixelFormatSuite1> formats(basic, kPFPixelFormatSuite, kPFPixelFormatSuiteVersion1);
        PrPixelFormat format = 0;
        if (formats && formats->GetPixelFormat(const_cast<PF_EffectWorld*>(world), &format) == PF_Err_NONE) {
            const PF_Err err = Answer(kPixelFormatSuiteAnswers, format, code, bytesPerPixel);
            // With the codec family's colour-space setting present, its "vuya" worlds carry 4:2:2.
            if (err == PF_Err_NONE && *code == kFormatVuya8 && global->cineformPresent) {
                *code = global->cineformMatrix ? kFormatYuv422_709 : kFormatYuv422_601;
            }
            return err;
        }
        SuiteRef<PF_WorldSuite2> worlds(basic, kPFWorldSuite, kPFWorldSuiteVersion2);
        PF_PixelFormat worldFormat = 0;
        if (worlds && worlds->PF_GetPixelFormat(world, &worldFormat) == PF_Err_NONE) {
            return Answer(kWorldSuiteAnswers, worldFormat, code, bytesPerPixel);
        }
    }
    if (world->world_flags & PF_WorldFlag_DEEP) {
        *code = kFormatArgb16;
        *bytesPerPixel = 8;
    } else {
        *code = kFormatArgb8;
        *bytesPerPixel = 4;
    }
    return PF_Err_NONE;
}

}  // namespace vt
