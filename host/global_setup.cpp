#include "host/global_setup.h"

#include <cstdio>
#include <cstring>

#include "files/preferences.h"
#include "host/global_state.h"
#include "host/host_id.h"
#include "host/processor_dispatch.h"
#include "host/suites.h"
#include "platform/registry.h"
#include "platform/ui.h"
#include "resources/effect_pipl.h"
#include "sdk/ae_suites.h"

namespace vt {

namespace {

constexpr char kCineformKey[] = "SOFTWARE\\CineForm\\Colorspace";
constexpr char kCineformFlags[] = "Flags";

constexpr PF_OutFlags kGlobalOutFlags = PF_OutFlag_KEEP_RESOURCE_OPEN | PF_OutFlag_SEQUENCE_DATA_NEEDS_FLATTENING |
                                        PF_OutFlag_I_DO_DIALOG | PF_OutFlag_USE_OUTPUT_EXTENT |
                                        PF_OutFlag_PIX_INDEPENDENT | PF_OutFlag_CUSTOM_UI |
                                        PF_OutFlag_DEEP_COLOR_AWARE;
constexpr PF_OutFlags2 kGlobalOutFlags2 =
    PF_OutFlag2_SUPPORTS_QUERY_DYNAMIC_FLAGS | PF_OutFlag2_PARAM_GROUP_START_COLLAPSED_FLAG;
constexpr PF_OutFlags2 kSmartRenderOutFlags2 = PF_OutFlag2_SUPPORTS_SMART_RENDER | PF_OutFlag2_FLOAT_COLOR_AWARE;
constexpr int32_t kSmartRenderApi = (12 << 16) + 10;  // smart render is offered from API 12.10 on

static_assert(kGlobalOutFlags == 0x2008471);
static_assert(kGlobalOutFlags == kEffectGlobalOutFlags, "the property list must declare what global setup does");
static_assert((kGlobalOutFlags2 | kSmartRenderOutFlags2) == kEffectGlobalOutFlags2);

// Pixel formats offered to hosts with a pixel-format suite, most preferred first.
constexpr PrPixelFormat kSupportedPixelFormats[] = {
    PrPixelFormat_VUYA_4444_32f, PrPixelFormat_BGRA_4444_32f, PrPixelFormat_VUYA_4444_8u, PrPixelFormat_BGRA_4444_8u};

void RegisterWithHost(GlobalState* global, PF_OutData* out_data) {
    SuiteRef<AEGP_UtilitySuite5> utility(global->basicSuite, kAEGPUtilitySuite, kAEGPUtilitySuiteVersion5);
    if (!utility) return;
    AEGP_PluginID id = 0;
    if (utility->AEGP_RegisterWithAEGP(reinterpret_cast<AEGP_GlobalRefcon>(out_data->global_data), kPluginName,
                                       &id) == 0) {
        global->pluginId = id;
    }
}

void ProbeWorldSuite(GlobalState* global) {
    if (global->hostId != kHostAfterEffects) return;
    SuiteRef<PF_WorldSuite2> world(global->basicSuite, kPFWorldSuite, kPFWorldSuiteVersion2);
    global->hasWorldSuite2 = world ? 1 : 0;
}

void DeclarePixelFormats(GlobalState* global, PF_InData* in_data) {
    SuiteRef<PF_PixelFormatSuite1> formats(global->basicSuite, kPFPixelFormatSuite, kPFPixelFormatSuiteVersion1);
    if (!formats) return;
    formats->ClearSupportedPixelFormats(in_data->effect_ref);
    for (PrPixelFormat format : kSupportedPixelFormats) formats->AddSupportedPixelFormat(in_data->effect_ref, format);
}

// The colour-space setting of one codec family decides how 8-bit VUYA frames are read.
void ReadCineformSetting(GlobalState* global) {
    if (global->hostId != kHostPremiere) return;
    RegistryKey* key = OpenRegistryKey(RegistryRoot::kLocalMachine, kCineformKey, kRegistryReadAccess);
    if (!key) return;
    global->cineformPresent = 1;
    uint32_t flags = 0;
    uint32_t size = 0;
    RegistryType type = RegistryType::kNone;
    if (QueryRegistryValue(key, kCineformFlags, &flags, sizeof flags, &size, &type) == RegistryResult::kOk &&
        size != 0 && (flags == 2 || flags == 3)) {
        global->cineformMatrix = 1;
    }
    CloseRegistryKey(key);
}

}  // namespace

PF_Err GlobalSetup(PF_InData* in_data, PF_OutData* out_data) {
    if (!in_data || !out_data || !in_data->utils) return PF_Err_INTERNAL_STRUCT_DAMAGED;
    out_data->my_version = kEffectVersion;
    char line[128];
    std::snprintf(line, sizeof line, "Velatone: Version = %lu, API %d.%d\n", static_cast<unsigned long>(kEffectVersion),
                  in_data->version.major, in_data->version.minor);
    DebugOutput(line);
    out_data->out_flags2 |= kGlobalOutFlags2;
    out_data->out_flags |= kGlobalOutFlags;
    if ((int32_t{in_data->version.major} << 16) + in_data->version.minor >= kSmartRenderApi) {
        out_data->out_flags2 |= kSmartRenderOutFlags2;
    }
    EnsurePreferencesLoaded();

    PF_Handle handle = in_data->utils->host_new_handle(sizeof(GlobalState));
    if (!handle) return PF_Err_OUT_OF_MEMORY;
    out_data->global_data = handle;
    auto* global = static_cast<GlobalState*>(in_data->utils->host_lock_handle(handle));
    if (!global) {
        in_data->utils->host_dispose_handle(handle);
        out_data->global_data = nullptr;
        return PF_Err_OUT_OF_MEMORY;
    }
    std::memset(global, 0, sizeof *global);
    global->hostId = IdentifyHost();
    global->refCount = 1;
    InitializeLock(&global->renderLock);
    InitializeLock(&global->entryLock);
    global->basicSuite = in_data->pica_basicP;
    RegisterWithHost(global, out_data);
    ProbeWorldSuite(global);
    DeclarePixelFormats(global, in_data);
    ReadCineformSetting(global);
    InitProcessorDispatch();
    StartPngDecoding(global->decoderStartupInput, &global->decoderToken);
    in_data->utils->host_unlock_handle(handle);
    return PF_Err_NONE;
}

PF_Err GlobalSetdown(PF_InData* in_data, PF_OutData* /*out_data*/) {
    if (!in_data || !in_data->global_data || !in_data->utils) return PF_Err_NONE;
    auto* global = static_cast<GlobalState*>(in_data->utils->host_lock_handle(in_data->global_data));
    if (!global) return PF_Err_NONE;
    const bool last = global->refCount <= 1;
    if (!last) --global->refCount;
    if (last) {
        global->refCount = 0;
        // A lock must be deleted before the memory holding it goes back to the host: the system
        // keeps live critical sections on a process-wide list.
        DeleteLock(&global->renderLock);
        DeleteLock(&global->entryLock);
    }
    in_data->utils->host_unlock_handle(in_data->global_data);
    if (last) in_data->utils->host_dispose_handle(in_data->global_data);
    return PF_Err_NONE;
}

}  // namespace vt
