// The reference host: loads an effect module as a host application does and plays the host's
// side of the effect SDK (memory handles, in/out data, the suite directory and its suites),
// presenting itself as one of the host applications the effect recognises.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "refhost/handles.h"
#include "refhost/world.h"
#include "refhost/persona.h"
#include "refhost/module_file.h"
#include "sdk/ae_effect.h"
#include "sdk/sp_basic.h"

namespace refhost {

class EffectInstance;
struct RenderJob;

// What a callback's effect_ref points at: the host, and the instance and render it is made for.
struct CallContext {
    class Host* host;
    EffectInstance* instance;
    RenderJob* job;
};

struct Message {
    int kind;  // 1 warning, 2 error, 3 information, other: no icon
    std::string text;
};

// One property of the module's effect property list, decoded.
struct PiplEntry {
    std::string key;  // four characters: "kind", "name", "8664", ...
    std::vector<uint8_t> data;
};

class Host {
public:
    explicit Host(HostPersona persona);
    ~Host();
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    // The host the C callbacks of the module reach; the most recently created live Host.
    static Host* Current();

    // Reads the property list from the file, loads the code and resolves the entry point it names.
    bool LoadModule(const std::string& path, std::string* error);
    void UnloadModule();

    const HostPersona& persona() const { return m_persona; }
    const std::vector<PiplEntry>& properties() const { return m_properties; }
    const std::string& entryPointName() const { return m_entryPointName; }
    const std::string& modulePath() const { return m_modulePath; }

    // Calls the entry point with the host's in/out data.
    PF_Err Call(PF_Cmd cmd, PF_ParamDef** params = nullptr, PF_LayerDef* output = nullptr, void* extra = nullptr);
    // Global setup: keeps out_data->global_data for the following commands, as hosts do.
    PF_Err GlobalSetup();
    PF_Err GlobalSetdown();

    PF_InData& inData() { return m_inData; }
    PF_OutData& outData() { return m_outData; }
    HandleHeap& heap() { return m_heap; }
    PF_FilterProc entryPoint() const { return m_entry; }

    // What the module told the host.
    std::vector<Message> messages() const;
    std::vector<std::string> debugLines() const;
    void ClearRecords();
    void SetEchoMessages(bool echo) { m_echoMessages = echo; }
    // Called on the module's thread for each message box, while the module waits for it to close.
    void SetMessageCallback(std::function<void(const Message&)> callback) { m_onMessage = std::move(callback); }
    int aboutBoxesShown() const { return m_aboutBoxes; }
    // File dialogs the module opens are answered from this queue, in order; an empty queue cancels.
    void QueueFileDialogAnswer(const std::string& path) { m_dialogAnswers.push_back(path); }
    // The titles of the dialogs the module opened.
    std::vector<std::string> fileDialogsShown() const;
    const char* AnswerFileDialog(int save, const char* filter, const char* title);
    const std::vector<int32_t>& pixelFormats() const { return m_pixelFormats; }
    int pixelFormatClears() const { return m_pixelFormatClears; }
    const std::string& registeredName() const { return m_registeredName; }
    int32_t pluginId() const { return m_pluginId; }
    // Suite acquisitions not yet released, by "name/version".
    std::map<std::string, int> outstandingSuites() const;
    int suiteAcquisitions() const { return m_suiteAcquisitions; }

    // Test controls.
    void SetSuiteOffered(const std::string& name, int32_t version, bool offered);
    // Makes the pixel-format suite name this format for every world (0: answer truthfully).
    void SetPixelFormatOverride(int32_t format) { m_pixelFormatOverride = format; }
    int32_t pixelFormatOverride() const { return m_pixelFormatOverride; }

    // PF_Cmd_PARAMS_SETUP: the effect declares its parameters; they are kept as the effect's
    // definitions, from which every instance takes its own values.
    PF_Err ParamsSetup();
    const std::vector<PF_ParamDef>& paramDefs() const { return m_paramDefs; }
    // The stable id each parameter was declared with, by host index.
    const std::vector<uint32_t>& paramIds() const { return m_paramIds; }
    int uiRegistrations() const { return m_uiRegistrations; }
    int32_t declaredParamCount() const { return m_declaredParamCount; }
    // The in-data a call for this instance and render uses (its own copy, so calls on several
    // threads do not share one).
    PF_InData MakeInData(CallContext* context, PF_Handle sequence) const;
    PF_Err CallWith(PF_InData* inData, PF_Cmd cmd, PF_ParamDef** params, PF_LayerDef* output, void* extra);
    // What the last CallWith left in its out-data.
    PF_Handle lastOutSequence() const { return m_lastOutSequence; }
    PF_OutFlags lastOutFlags() const { return m_lastOutFlags; }

    // Worlds the host hands out, with the layout its suites report for them.
    void RegisterWorld(const PF_EffectWorld* world, WorldLayout layout);
    void UnregisterWorld(const PF_EffectWorld* world);
    bool WorldLayoutOf(const PF_EffectWorld* world, WorldLayout* layout) const;

    // Interaction callbacks land here.
    PF_Err AddParam(PF_ParamIndex index, const PF_ParamDef* def);
    PF_Err RegisterUi(const PF_CustomUIInfo* info);

    // The module's callbacks land here (through static trampolines).
    SPErr AcquireSuite(const char* name, int32_t version, const void** suite);
    SPErr ReleaseSuite(const char* name, int32_t version);
    void RecordMessage(const char* text, int kind);
    void RecordDebug(const char* line);
    void RecordAbout() { ++m_aboutBoxes; }
    void AddPixelFormat(int32_t format) { m_pixelFormats.push_back(format); }
    void ClearPixelFormats() {
        ++m_pixelFormatClears;
        m_pixelFormats.clear();
    }
    void Register(const char* name, int32_t* id);
    void AppColors(uint16_t* background, uint16_t* text) const;

private:
    void InitInData();
    bool SuiteOffered(const std::string& name, int32_t version) const;
    void InstallPlatformHooks();

    HostPersona m_persona;
    HandleHeap m_heap;
    LoadedLibrary m_library;
    std::string m_modulePath;
    std::vector<PiplEntry> m_properties;
    std::string m_entryPointName;
    PF_FilterProc m_entry = nullptr;

    CallContext m_setupContext{};
    std::vector<PF_ParamDef> m_paramDefs;  // index 0 is the input layer
    std::vector<uint32_t> m_paramIds;
    int m_uiRegistrations = 0;
    int32_t m_declaredParamCount = 0;
    mutable std::mutex m_worldMutex;  // guards m_worlds
    std::map<const PF_EffectWorld*, WorldLayout> m_worlds;
    thread_local static inline PF_Handle m_lastOutSequence = nullptr;
    thread_local static inline PF_OutFlags m_lastOutFlags = 0;

    mutable std::mutex m_blocksMutex;  // guards m_inData and m_outData while calls copy them
    PF_InData m_inData{};
    PF_OutData m_outData{};
    PF_UtilCallbacks m_utils{};
    SPBasicSuite m_basic{};

    mutable std::mutex m_recordMutex;  // guards the records below
    std::vector<Message> m_messages;
    std::vector<std::string> m_debugLines;
    std::map<std::string, int> m_outstanding;
    int m_suiteAcquisitions = 0;
    std::map<std::string, bool> m_suiteOverrides;
    bool m_echoMessages = true;
    std::function<void(const Message&)> m_onMessage;
    int m_aboutBoxes = 0;
    std::vector<std::string> m_dialogAnswers;
    std::vector<std::string> m_dialogsShown;
    std::string m_lastDialogAnswer;
    std::vector<int32_t> m_pixelFormats;
    int m_pixelFormatClears = 0;
    std::string m_registeredName;
    int32_t m_pluginId = 0;
    int32_t m_pixelFormatOverride = 0;
};

// Decodes a property list's bytes; false with *error set when they are malformed.
bool DecodePropertyList(const std::vector<uint8_t>& bytes, std::vector<PiplEntry>* entries, std::string* error);

}  // namespace refhost
