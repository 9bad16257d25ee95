#include "refhost/host.h"

#include <cstdio>
#include <algorithm>
#include <atomic>
#include <cstring>

#include "refhost/effect_instance.h"
#include "sdk/ae_effect_ui.h"
#include "sdk/ae_suites.h"

namespace refhost {

namespace {

std::atomic<Host*> g_current{nullptr};  // the host the module's C callbacks reach

Host& Current() { return *g_current.load(); }

// ---- utility callbacks: host memory handles

PF_Handle HostNewHandle(A_u_longlong size) { return Current().heap().New(static_cast<size_t>(size)); }
void* HostLockHandle(PF_Handle handle) { return Current().heap().Lock(handle); }
void HostUnlockHandle(PF_Handle handle) { Current().heap().Unlock(handle); }
void HostDisposeHandle(PF_Handle handle) { Current().heap().Dispose(handle); }
A_u_longlong HostGetHandleSize(PF_Handle handle) { return Current().heap().Size(handle); }
PF_Err HostResizeHandle(A_u_longlong size, PF_Handle* handle) {
    if (!handle) return PF_Err_BAD_CALLBACK_PARAM;
    return Current().heap().Resize(*handle, static_cast<size_t>(size)) ? PF_Err_NONE : PF_Err_OUT_OF_MEMORY;
}

// ---- interaction callbacks

CallContext* ContextOf(PF_ProgPtr effect_ref) { return reinterpret_cast<CallContext*>(effect_ref); }

PF_Err HostAddParam(PF_ProgPtr effect_ref, PF_ParamIndex index, PF_ParamDefPtr def) {
    CallContext* context = ContextOf(effect_ref);
    if (!context || !context->host || !def) return PF_Err_BAD_CALLBACK_PARAM;
    return context->host->AddParam(index, def);
}

PF_Err HostRegisterUi(PF_ProgPtr effect_ref, PF_CustomUIInfo* info) {
    CallContext* context = ContextOf(effect_ref);
    if (!context || !context->host || !info) return PF_Err_BAD_CALLBACK_PARAM;
    return context->host->RegisterUi(info);
}

PF_Err CheckoutParam(PF_ProgPtr effect_ref, PF_ParamIndex index, A_long, A_long, A_u_long, PF_ParamDef* param) {
    CallContext* context = ContextOf(effect_ref);
    if (!context || !context->instance || !param) return PF_Err_BAD_CALLBACK_PARAM;
    return context->instance->CheckoutParam(index, param, context->job);
}

PF_Err CheckinParam(PF_ProgPtr effect_ref, PF_ParamDef* param) {
    CallContext* context = ContextOf(effect_ref);
    if (!context || !context->instance || !param) return PF_Err_BAD_CALLBACK_PARAM;
    return context->instance->CheckinParam(param, context->job);
}

// fill: a null colour fills with zero (transparent black) pixels, a null rectangle the whole world.
PF_Err Fill(PF_ProgPtr effect_ref, const PF_Pixel* color, const PF_Rect* rect, PF_EffectWorld* world) {
    CallContext* context = ContextOf(effect_ref);
    if (!context || !world) return PF_Err_BAD_CALLBACK_PARAM;
    WorldLayout layout = WorldLayout::kArgb8;
    if (!context->host->WorldLayoutOf(world, &layout)) {
        layout = (world->world_flags & PF_WorldFlag_DEEP) ? WorldLayout::kArgb16 : WorldLayout::kArgb8;
    }
    const PF_Rect whole = {0, 0, world->width, world->height};
    PF_Rect area = rect ? *rect : whole;
    area.left = std::max(area.left, 0);
    area.top = std::max(area.top, 0);
    area.right = std::min(area.right, world->width);
    area.bottom = std::min(area.bottom, world->height);
    const uint32_t bytes = LayoutBytesPerPixel(layout);
    for (A_long y = area.top; y < area.bottom; ++y) {
        auto* row = reinterpret_cast<uint8_t*>(world->data) + static_cast<ptrdiff_t>(y) * world->rowbytes;
        for (A_long x = area.left; x < area.right; ++x) {
            uint8_t* pixel = row + static_cast<size_t>(x) * bytes;
            if (!color) {
                std::memset(pixel, 0, bytes);
            } else if (layout == WorldLayout::kArgb8) {
                pixel[0] = color->alpha, pixel[1] = color->red, pixel[2] = color->green, pixel[3] = color->blue;
            } else {
                return PF_Err_BAD_CALLBACK_PARAM;  // coloured fills of deep worlds are not needed here
            }
        }
    }
    return PF_Err_NONE;
}

// ---- the suite directory

SPErr BasicAcquireSuite(const char* name, int32_t version, const void** suite) {
    return Current().AcquireSuite(name, version, suite);
}
SPErr BasicReleaseSuite(const char* name, int32_t version) { return Current().ReleaseSuite(name, version); }
SPBoolean BasicIsEqual(const char* a, const char* b) { return a && b && std::strcmp(a, b) == 0; }
SPErr BasicAllocateBlock(size_t size, void** block) {
    *block = std::malloc(size);
    return *block ? kSPNoError : 1;
}
SPErr BasicFreeBlock(void* block) {
    std::free(block);
    return kSPNoError;
}
SPErr BasicReallocateBlock(void* block, size_t size, void** newBlock) {
    *newBlock = std::realloc(block, size);
    return *newBlock ? kSPNoError : 1;
}
SPErr BasicUndefined() { return kSPNoError; }

// ---- "AEGP Utility Suite"

A_Err RegisterWithAEGP(AEGP_GlobalRefcon, const A_char* name, AEGP_PluginID* id) {
    Current().Register(name, id);
    return 0;
}

AEGP_UtilitySuite5 MakeUtilitySuite() {
    AEGP_UtilitySuite5 suite{};
    suite.AEGP_RegisterWithAEGP = RegisterWithAEGP;
    return suite;
}

// ---- "AEGP Memory Suite": the same handles as the utility callbacks, with an allocation name

A_Err NewMemHandle(AEGP_PluginID, const A_char* what, AEGP_MemSize size, AEGP_MemFlag flags, AEGP_MemHandle* handle) {
    void** h = Current().heap().New(size, what);
    if (!h) return PF_Err_OUT_OF_MEMORY;
    if (flags & AEGP_MemFlag_CLEAR) std::memset(*h, 0, size);
    *handle = reinterpret_cast<AEGP_MemHandle>(h);
    return 0;
}
A_Err FreeMemHandle(AEGP_MemHandle handle) {
    Current().heap().Dispose(reinterpret_cast<void**>(handle));
    return 0;
}
A_Err LockMemHandle(AEGP_MemHandle handle, void** pointer) {
    *pointer = Current().heap().Lock(reinterpret_cast<void**>(handle));
    return *pointer ? 0 : PF_Err_BAD_CALLBACK_PARAM;
}
A_Err UnlockMemHandle(AEGP_MemHandle handle) {
    Current().heap().Unlock(reinterpret_cast<void**>(handle));
    return 0;
}
A_Err GetMemHandleSize(AEGP_MemHandle handle, AEGP_MemSize* size) {
    *size = static_cast<AEGP_MemSize>(Current().heap().Size(reinterpret_cast<void**>(handle)));
    return 0;
}

AEGP_MemorySuite1 MakeMemorySuite() {
    AEGP_MemorySuite1 suite{};
    suite.AEGP_NewMemHandle = NewMemHandle;
    suite.AEGP_FreeMemHandle = FreeMemHandle;
    suite.AEGP_LockMemHandle = LockMemHandle;
    suite.AEGP_UnlockMemHandle = UnlockMemHandle;
    suite.AEGP_GetMemHandleSize = GetMemHandleSize;
    return suite;
}

// ---- "PF World Suite" version 2

PF_Err WorldGetPixelFormat(const PF_EffectWorld* world, PF_PixelFormat* format) {
    if (!world || !format) return PF_Err_BAD_CALLBACK_PARAM;
    WorldLayout layout;
    if (Current().WorldLayoutOf(world, &layout)) {
        *format = WorldSuiteAnswer(layout);
        return *format ? PF_Err_NONE : PF_Err_BAD_CALLBACK_PARAM;
    }
    *format = (world->world_flags & PF_WorldFlag_DEEP) ? PF_PixelFormat_ARGB64 : PF_PixelFormat_ARGB32;
    return PF_Err_NONE;
}

PF_WorldSuite2 MakeWorldSuite() {
    PF_WorldSuite2 suite{};
    suite.PF_GetPixelFormat = WorldGetPixelFormat;
    return suite;
}

// ---- "PF Pixel Format Suite" version 1

PF_Err AddSupportedPixelFormat(PF_ProgPtr, PrPixelFormat format) {
    Current().AddPixelFormat(format);
    return PF_Err_NONE;
}
PF_Err ClearSupportedPixelFormats(PF_ProgPtr) {
    Current().ClearPixelFormats();
    return PF_Err_NONE;
}
PF_Err PixelFormatGetPixelFormat(PF_EffectWorld* world, PrPixelFormat* format) {
    if (!world || !format) return PF_Err_BAD_CALLBACK_PARAM;
    WorldLayout layout;
    if (Current().pixelFormatOverride() != 0) {
        *format = Current().pixelFormatOverride();
        return PF_Err_NONE;
    }
    // A world the host did not make reads as its most common layout.
    *format = Current().WorldLayoutOf(world, &layout) ? PixelFormatSuiteAnswer(layout) : PrPixelFormat_BGRA_4444_8u;
    return *format ? PF_Err_NONE : PF_Err_BAD_CALLBACK_PARAM;
}

PF_PixelFormatSuite1 MakePixelFormatSuite() {
    PF_PixelFormatSuite1 suite{};
    suite.AddSupportedPixelFormat = AddSupportedPixelFormat;
    suite.ClearSupportedPixelFormats = ClearSupportedPixelFormats;
    suite.GetPixelFormat = PixelFormatGetPixelFormat;
    return suite;
}

// ---- "PF AE App Suite" version 6: the panel colours

PF_Err AppGetBgColor(PF_App_Color* color) {
    uint16_t background[3];
    uint16_t text[3];
    Current().AppColors(background, text);
    *color = {background[0], background[1], background[2]};
    return PF_Err_NONE;
}
PF_Err AppGetColor(PF_App_ColorType type, PF_App_Color* color) {
    uint16_t background[3];
    uint16_t text[3];
    Current().AppColors(background, text);
    *color = type == PF_App_Color_TEXT ? PF_App_Color{text[0], text[1], text[2]}
                                       : PF_App_Color{background[0], background[1], background[2]};
    return PF_Err_NONE;
}

PFAppSuite4 MakeAppSuite() {
    PFAppSuite4 suite{};
    suite.PF_AppGetBgColor = AppGetBgColor;
    suite.PF_AppGetColor = AppGetColor;
    return suite;
}

const AEGP_UtilitySuite5 kUtilitySuite = MakeUtilitySuite();
const AEGP_MemorySuite1 kMemorySuite = MakeMemorySuite();
const PF_WorldSuite2 kWorldSuite = MakeWorldSuite();
const PF_PixelFormatSuite1 kPixelFormatSuite = MakePixelFormatSuite();
const PFAppSuite4 kAppSuite = MakeAppSuite();

std::string SuiteKey(const char* name, int32_t version) { return std::string(name) + "/" + std::to_string(version); }

void HookMessage(void*, const char* text, int kind) { Current().RecordMessage(text, kind); }
void HookDebug(void*, const char* line) { Current().RecordDebug(line); }
void HookAbout(void*, void*) { Current().RecordAbout(); }
const char* HookFileDialog(void*, int save, const char* filter, const char* title) {
    return Current().AnswerFileDialog(save, filter, title);
}

}  // namespace

Host* Host::Current() { return g_current.load(); }

Host::Host(HostPersona persona) : m_persona(std::move(persona)) {
    g_current = this;
    m_basic.AcquireSuite = BasicAcquireSuite;
    m_basic.ReleaseSuite = BasicReleaseSuite;
    m_basic.IsEqual = BasicIsEqual;
    m_basic.AllocateBlock = BasicAllocateBlock;
    m_basic.FreeBlock = BasicFreeBlock;
    m_basic.ReallocateBlock = BasicReallocateBlock;
    m_basic.Undefined = BasicUndefined;
    m_utils.host_new_handle = HostNewHandle;
    m_utils.host_lock_handle = HostLockHandle;
    m_utils.host_unlock_handle = HostUnlockHandle;
    m_utils.host_dispose_handle = HostDisposeHandle;
    m_utils.host_get_handle_size = HostGetHandleSize;
    m_utils.host_resize_handle = HostResizeHandle;
    m_utils.fill = Fill;
    m_setupContext = {this, nullptr, nullptr};
    InitInData();
}

Host::~Host() {
    for (PF_ParamDef& def : m_paramDefs) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) m_heap.Dispose(def.u.arb_d.dephault);
    }
    UnloadModule();
    Host* self = this;
    g_current.compare_exchange_strong(self, nullptr);
}

void Host::InitInData() {
    m_inData = PF_InData{};
    m_inData.utils = &m_utils;
    m_inData.effect_ref = reinterpret_cast<PF_ProgPtr>(&m_setupContext);
    m_inData.inter.add_param = HostAddParam;
    m_inData.inter.register_ui = HostRegisterUi;
    m_inData.inter.checkout_param = CheckoutParam;
    m_inData.inter.checkin_param = CheckinParam;
    m_inData.quality = PF_Quality_HI;
    m_inData.version.major = m_persona.apiMajor;
    m_inData.version.minor = m_persona.apiMinor;
    m_inData.appl_id = m_persona.applId;
    m_inData.time_scale = 24;
    m_inData.time_step = 1;
    m_inData.local_time_step = 1;
    m_inData.total_time = 240;
    m_inData.downsample_x = {1, 1};
    m_inData.downsample_y = {1, 1};
    m_inData.pixel_aspect_ratio = {1, 1};
    m_inData.pica_basicP = &m_basic;
}

bool Host::LoadModule(const std::string& path, std::string* error) {
    UnloadModule();
    std::vector<uint8_t> bytes;
    if (!ReadModulePropertyList(path, &bytes, error)) return false;
    std::vector<PiplEntry> entries;
    if (!DecodePropertyList(bytes, &entries, error)) return false;
    std::string entryName;
    for (const PiplEntry& entry : entries) {
        if (entry.key == "8664") entryName.assign(reinterpret_cast<const char*>(entry.data.data()),
                                                  strnlen(reinterpret_cast<const char*>(entry.data.data()), entry.data.size()));
    }
    if (entryName.empty()) {
        *error = path + ": the property list names no 64-bit entry point";
        return false;
    }
    if (!m_library.Open(path, error)) return false;
    m_entry = reinterpret_cast<PF_FilterProc>(m_library.Symbol(entryName.c_str()));
    if (!m_entry) {
        *error = path + " does not export " + entryName;
        m_library.Close();
        return false;
    }
    m_modulePath = path;
    m_properties = std::move(entries);
    m_entryPointName = entryName;
    InstallPlatformHooks();
    return true;
}

void Host::UnloadModule() {
    m_entry = nullptr;
    m_library.Close();
    m_properties.clear();
    m_entryPointName.clear();
}

void Host::InstallPlatformHooks() {
    ModuleSinks sinks{};
    sinks.context = this;
    sinks.message = HookMessage;
    sinks.debug = HookDebug;
    sinks.about = HookAbout;
    sinks.fileDialog = HookFileDialog;
    sinks.commandLine = m_persona.commandLine.c_str();
    sinks.executablePath = m_persona.executablePath.c_str();
    InstallModuleSinks(m_library, sinks);
}

PF_Err Host::Call(PF_Cmd cmd, PF_ParamDef** params, PF_LayerDef* output, void* extra) {
    g_current = this;
    if (!m_entry) return PF_Err_INVALID_CALLBACK;
    // Each call gets its own copy of the blocks, as a host calling from several threads does; what
    // the module wrote into them is kept afterwards.
    PF_InData inData;
    PF_OutData outData;
    {
        std::lock_guard<std::mutex> guard(m_blocksMutex);
        inData = m_inData;
        outData = m_outData;
    }
    const PF_Err err = m_entry(cmd, &inData, &outData, params, output, extra);
    std::lock_guard<std::mutex> guard(m_blocksMutex);
    m_inData = inData;
    m_outData = outData;
    return err;
}

PF_InData Host::MakeInData(CallContext* context, PF_Handle sequence) const {
    PF_InData inData;
    {
        std::lock_guard<std::mutex> guard(m_blocksMutex);
        inData = m_inData;
    }
    inData.effect_ref = reinterpret_cast<PF_ProgPtr>(context);
    inData.sequence_data = sequence;
    inData.num_params = static_cast<A_long>(m_paramDefs.size());
    return inData;
}

PF_Err Host::CallWith(PF_InData* inData, PF_Cmd cmd, PF_ParamDef** params, PF_LayerDef* output, void* extra) {
    g_current = this;
    if (!m_entry) return PF_Err_INVALID_CALLBACK;
    PF_OutData out;
    {
        std::lock_guard<std::mutex> guard(m_blocksMutex);
        out = m_outData;
    }
    out.sequence_data = nullptr;
    const PF_Err err = m_entry(cmd, inData, &out, params, output, extra);
    m_lastOutSequence = out.sequence_data;
    m_lastOutFlags = out.out_flags;
    return err;
}

PF_Err Host::ParamsSetup() {
    for (PF_ParamDef& def : m_paramDefs) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) m_heap.Dispose(def.u.arb_d.dephault);
    }
    m_paramDefs.assign(1, PF_ParamDef{});
    m_paramIds.assign(1, 0);
    m_paramDefs[0].param_type = PF_Param_LAYER;
    m_uiRegistrations = 0;
    m_outData.num_params = 0;
    const PF_Err err = Call(PF_Cmd_PARAMS_SETUP);
    m_declaredParamCount = m_outData.num_params;
    return err;
}

PF_Err Host::AddParam(PF_ParamIndex index, const PF_ParamDef* def) {
    if (index != -1) return PF_Err_BAD_CALLBACK_PARAM;  // only appending is offered
    PF_ParamDef copy = *def;
    // The id is read at declaration; afterwards the same field carries the change flags.
    m_paramIds.push_back(static_cast<uint32_t>(copy.uu.id));
    copy.uu.change_flags = PF_ChangeFlag_NONE;
    m_paramDefs.push_back(copy);
    return PF_Err_NONE;
}

PF_Err Host::RegisterUi(const PF_CustomUIInfo* info) {
    if (info->events != PF_CustomEFlag_EFFECT) return PF_Err_BAD_CALLBACK_PARAM;
    ++m_uiRegistrations;
    return PF_Err_NONE;
}

void Host::RegisterWorld(const PF_EffectWorld* world, WorldLayout layout) {
    std::lock_guard<std::mutex> guard(m_worldMutex);
    m_worlds[world] = layout;
}

void Host::UnregisterWorld(const PF_EffectWorld* world) {
    std::lock_guard<std::mutex> guard(m_worldMutex);
    m_worlds.erase(world);
}

bool Host::WorldLayoutOf(const PF_EffectWorld* world, WorldLayout* layout) const {
    std::lock_guard<std::mutex> guard(m_worldMutex);
    auto found = m_worlds.find(world);
    if (found == m_worlds.end()) return false;
    *layout = found->second;
    return true;
}

PF_Err Host::GlobalSetup() {
    m_outData = PF_OutData{};
    const PF_Err err = Call(PF_Cmd_GLOBAL_SETUP);
    m_inData.global_data = err == PF_Err_NONE ? m_outData.global_data : nullptr;
    return err;
}

PF_Err Host::GlobalSetdown() {
    const PF_Err err = Call(PF_Cmd_GLOBAL_SETDOWN);
    m_inData.global_data = nullptr;
    return err;
}

bool Host::SuiteOffered(const std::string& name, int32_t version) const {
    const std::string key = name + "/" + std::to_string(version);
    if (auto found = m_suiteOverrides.find(key); found != m_suiteOverrides.end()) return found->second;
    if (name == kAEGPUtilitySuite && version == kAEGPUtilitySuiteVersion5) return m_persona.utilitySuite;
    if (name == kAEGPMemorySuite && version == kAEGPMemorySuiteVersion1) return m_persona.memorySuite;
    if (name == kPFWorldSuite && version == kPFWorldSuiteVersion2) return m_persona.worldSuite2;
    if (name == kPFPixelFormatSuite && version == kPFPixelFormatSuiteVersion1) return m_persona.pixelFormatSuite;
    if (name == kPFAppSuite && version == kPFAppSuiteVersion4) return m_persona.appSuite;
    return false;
}

void Host::SetSuiteOffered(const std::string& name, int32_t version, bool offered) {
    m_suiteOverrides[name + "/" + std::to_string(version)] = offered;
}

SPErr Host::AcquireSuite(const char* name, int32_t version, const void** suite) {
    if (!name || !suite) return 1;
    *suite = nullptr;
    const std::string suiteName(name);
    if (!SuiteOffered(suiteName, version)) return 1;
    if (suiteName == kAEGPUtilitySuite) *suite = &kUtilitySuite;
    else if (suiteName == kAEGPMemorySuite) *suite = &kMemorySuite;
    else if (suiteName == kPFWorldSuite) *suite = &kWorldSuite;
    else if (suiteName == kPFPixelFormatSuite) *suite = &kPixelFormatSuite;
    else if (suiteName == kPFAppSuite) *suite = &kAppSuite;
    if (!*suite) return 1;
    std::lock_guard<std::mutex> guard(m_recordMutex);
    ++m_outstanding[SuiteKey(name, version)];
    ++m_suiteAcquisitions;
    return kSPNoError;
}

SPErr Host::ReleaseSuite(const char* name, int32_t version) {
    if (!name) return 1;
    std::lock_guard<std::mutex> guard(m_recordMutex);
    auto found = m_outstanding.find(SuiteKey(name, version));
    if (found == m_outstanding.end() || found->second == 0) return 1;
    if (--found->second == 0) m_outstanding.erase(found);
    return kSPNoError;
}

std::map<std::string, int> Host::outstandingSuites() const {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    return m_outstanding;
}

void Host::RecordMessage(const char* text, int kind) {
    {
        std::lock_guard<std::mutex> guard(m_recordMutex);
        m_messages.push_back({kind, text ? text : ""});
    }
    if (m_onMessage) m_onMessage(Message{kind, text ? text : ""});
    if (!m_echoMessages) return;
    const char* label = kind == 1 ? "warning" : kind == 2 ? "error" : kind == 3 ? "info" : "message";
    std::fprintf(stderr, "%s: %s\n", label, text ? text : "");
}

void Host::RecordDebug(const char* line) {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    m_debugLines.emplace_back(line ? line : "");
}

std::vector<Message> Host::messages() const {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    return m_messages;
}

std::vector<std::string> Host::debugLines() const {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    return m_debugLines;
}

void Host::ClearRecords() {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    m_messages.clear();
    m_debugLines.clear();
}

const char* Host::AnswerFileDialog(int /*save*/, const char* /*filter*/, const char* title) {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    m_dialogsShown.emplace_back(title ? title : "");
    if (m_dialogAnswers.empty()) return nullptr;
    m_lastDialogAnswer = m_dialogAnswers.front();
    m_dialogAnswers.erase(m_dialogAnswers.begin());
    return m_lastDialogAnswer.c_str();
}

std::vector<std::string> Host::fileDialogsShown() const {
    std::lock_guard<std::mutex> guard(m_recordMutex);
    return m_dialogsShown;
}

void Host::Register(const char* name, int32_t* id) {
    m_registeredName = name ? name : "";
    m_pluginId = 7;  // any non-zero identifier the host chooses
    if (id) *id = m_pluginId;
}

void Host::AppColors(uint16_t* background, uint16_t* text) const {
    for (int i = 0; i < 3; ++i) {
        background[i] = m_persona.background[i];
        text[i] = m_persona.text[i];
    }
}

}  // namespace refhost
