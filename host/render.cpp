#include "host/render.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "engine/correction_settings.h"
#include "engine/kernel.h"
#include "engine/lookup_build.h"
#include "host/global_state.h"
#include "host/locked_handle.h"
#include "host/memory.h"
#include "host/params.h"
#include "host/pixel_format.h"
#include "host/sequence_state.h"
#include "link/frame_buffer.h"
#include "link/pixel_convert.h"
#include "platform/lock.h"
#include "platform/ui.h"

namespace vt {

namespace {

constexpr char kNoSequenceData[] = "Sequence data is not allocated in Render";
constexpr char kFrameBufferFailed[] = "Frame buffer allocation failed in Render";
constexpr char kUnalignedPixels[] = "Host allocator returned unaligned pixel pointer";
constexpr char kFrameBufferName[] = "Frame Buffer";
constexpr A_long kInputCheckoutId = 1;

struct HostAllocator {
    const GlobalState* global;
    const PF_InData* in_data;
};

void* AllocateFromHost(size_t size, const char* what, void* context) {
    const auto* host = static_cast<const HostAllocator*>(context);
    return AllocateBlock(host->global, host->in_data, size, what);
}

void FreeToHost(void* block, void* context) {
    const auto* host = static_cast<const HostAllocator*>(context);
    FreeBlock(host->global, host->in_data, block);
}

// The settings record held by an arbitrary parameter's value, when it is whole.
CorrectionSettings* SettingsOf(const LockedHandle& value) { return value.as<CorrectionSettings>(); }

}  // namespace

PF_Err RenderFrame(const RenderArea& area, uint32_t formatCode, uint32_t bytesPerPixel, const EngineSet* tables,
                   GlobalState* global, const PF_InData* in_data) {
    if (area.width <= 0 || area.height <= 0) return PF_Err_NONE;
    HostAllocator host{global, in_data};
    const bool hostMemory = global->hostId == kHostAfterEffects || global->hostId == kHostPremiere;
    FrameBuffer frame{};
    const uint32_t width = static_cast<uint32_t>(area.width);
    const uint32_t height = static_cast<uint32_t>(area.height);
    // The import writes every row of every plane, padding included: a heap store need not be cleared first.
    const int32_t made = hostMemory ? FBNewFrameBuffer(width, height, &frame, kFormatPlanarFloat, AllocateFromHost,
                                                       kFrameBufferName, &host)
                                    : FBNewUnclearedFrameBuffer(width, height, &frame, kFormatPlanarFloat);
    if (made != 0) {
        ShowMessage(kFrameBufferFailed, kMessageWarning);
        return PF_Err_NONE;
    }
    if (reinterpret_cast<uintptr_t>(frame.data) % 16 != 0) ShowMessage(kUnalignedPixels, kMessagePlain);

    const uint8_t* input = area.inputPixels + area.inputRowBytes * area.inputY +
                           static_cast<ptrdiff_t>(area.inputX) * bytesPerPixel;
    uint8_t* output = area.outputPixels + area.outputRowBytes * area.outputY +
                      static_cast<ptrdiff_t>(area.outputX) * bytesPerPixel;
    FBImportPixels(input, area.inputRowBytes, formatCode, &frame);
    if (tables) {
        RunKernel(ActiveKernelPath(), &tables->params, frame, frame);
    } else {
        Correct(frame, frame);
    }
    FBExportPixels(&frame, output, area.outputRowBytes, formatCode);
    FBCopyAlpha(input, area.inputRowBytes, output, area.outputRowBytes, static_cast<uint32_t>(area.width),
                static_cast<uint32_t>(area.height), formatCode);
    FBDisposeFrameBuffer(&frame, hostMemory ? FreeToHost : nullptr, &host);
    return PF_Err_NONE;
}

PF_Err SmartPreRender(const CommandContext& context) {
    const auto* extra = static_cast<PF_PreRenderExtra*>(context.extra);
    const PF_InData* in_data = context.in_data;
    if (!extra || !extra->input || !extra->output || !extra->cb || !extra->cb->checkout_layer) {
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    }
    PF_RenderRequest request = extra->input->output_request;
    PF_CheckoutResult result{};
    const PF_Err err = extra->cb->checkout_layer(in_data->effect_ref, 0, kInputCheckoutId, &request,
                                                 in_data->current_time, in_data->time_step, in_data->time_scale,
                                                 &result);
    extra->output->result_rect = result.result_rect;
    extra->output->max_result_rect = result.max_result_rect;
    extra->output->solid = result.solid;
    return err;
}

PF_Err SmartRender(const CommandContext& context) {
    const auto* extra = static_cast<PF_SmartRenderExtra*>(context.extra);
    const PF_InData* in_data = context.in_data;
    if (!extra || !extra->cb || !extra->cb->checkout_layer_pixels || !extra->cb->checkout_output ||
        !in_data->inter.checkout_param || !in_data->inter.checkin_param) {
        return PF_Err_INTERNAL_STRUCT_DAMAGED;
    }
    PF_EffectWorld* input = nullptr;
    PF_EffectWorld* output = nullptr;
    if (const PF_Err err = extra->cb->checkout_layer_pixels(in_data->effect_ref, kInputCheckoutId, &input)) return err;
    if (const PF_Err err = extra->cb->checkout_output(in_data->effect_ref, &output)) return err;
    if (!input || !output) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    PF_ParamDef parameters{};
    if (const PF_Err err = in_data->inter.checkout_param(in_data->effect_ref, 1, in_data->current_time,
                                                         in_data->time_step, in_data->time_scale, &parameters)) {
        return err;
    }
    PF_Err result = PF_Err_NONE;
    {
        GlobalState* global = context.global;
        uint32_t code = 0;
        uint32_t bytesPerPixel = 0;
        result = QueryPixelFormat(input, global, &code, &bytesPerPixel);
        LockedHandle value(in_data,
                           parameters.param_type == PF_Param_ARBITRARY_DATA ? parameters.u.arb_d.value : nullptr);
        CorrectionSettings* settings = SettingsOf(value);
        if (result == PF_Err_NONE) {
            std::shared_ptr<const EngineSet> tables;
            if (in_data->sequence_data && settings) tables = ApplySettings(in_data->sequence_data, settings, global, in_data);
            // The input may be smaller than the output the host asks for: only pixels both hold are read.
            RenderArea area{reinterpret_cast<const uint8_t*>(input->data), input->rowbytes,
                            reinterpret_cast<uint8_t*>(output->data), output->rowbytes,
                            std::min(output->width, input->width), std::min(output->height, input->height),
                            0, 0, 0, 0};
            result = RenderFrame(area, code, bytesPerPixel, tables.get(), global, in_data);
        }
    }
    const PF_Err checkin = in_data->inter.checkin_param(in_data->effect_ref, &parameters);
    return result != PF_Err_NONE ? result : checkin;
}

PF_Err Render(const CommandContext& context) {
    PF_InData* in_data = context.in_data;
    GlobalState* global = context.global;
    PF_ParamDef** params = context.params;
    PF_EffectWorld* output = context.output;
    if (!global || !params || !params[0] || !output) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    PF_EffectWorld* input = &params[0]->u.ld;

    LockGuard render(&global->renderLock);
    uint32_t code = 0;
    uint32_t bytesPerPixel = 0;
    if (const PF_Err err = QueryPixelFormat(output, global, &code, &bytesPerPixel)) return err;

    RenderArea area{reinterpret_cast<const uint8_t*>(input->data), input->rowbytes, reinterpret_cast<uint8_t*>(output->data),
                    output->rowbytes, output->width, output->height, 0, 0, 0, 0};
    if (!global->hasWorldSuite2) {
        const PF_Rect& hint = in_data->extent_hint;
        const PF_Rect& outHint = output->extent_hint;
        if (hint.left != outHint.left || hint.top != outHint.top || hint.right != outHint.right ||
            hint.bottom != outHint.bottom) {
            if (in_data->utils->fill) in_data->utils->fill(in_data->effect_ref, nullptr, &outHint, output);
        }
        const int32_t x0 = hint.left & ~15;
        const int32_t y0 = hint.top;
        // The hint is the host's word; the region never reaches outside either world.
        const int32_t right = std::min({hint.right, input->width, output->width});
        const int32_t bottom = std::min({hint.bottom, input->height, output->height});
        area.width = std::max(x0, 0) < right ? right - std::max(x0, 0) : 0;
        area.height = std::max(y0, 0) < bottom ? bottom - std::max(y0, 0) : 0;
        area.inputX = area.outputX = std::max(x0, 0);
        area.inputY = area.outputY = std::max(y0, 0);
    } else {
        area.width = std::min(output->width, input->width);
        area.height = std::min(output->height, input->height);
    }

    PF_ParamDef* parameters = params[1];
    LockedHandle value(in_data, parameters && parameters->param_type == PF_Param_ARBITRARY_DATA
                                    ? parameters->u.arb_d.value
                                    : nullptr);
    CorrectionSettings* settings = SettingsOf(value);
    if (settings) {
        SwapSettingsIfForeign(settings);
        ParamsToSettings(settings, params, global);
    }
    std::shared_ptr<const EngineSet> tables;
    if (!in_data->sequence_data) {
        ShowMessage(kNoSequenceData, kMessageWarning);
    } else if (settings) {
        tables = ApplySettings(in_data->sequence_data, settings, global, in_data);
    }
    return RenderFrame(area, code, bytesPerPixel, tables.get(), global, in_data);
}

}  // namespace vt
