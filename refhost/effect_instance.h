// One applied instance of the effect, as a host keeps it: its own parameter values (with its own
// arbitrary-data values), its sequence data through setup, flatten, resetup and setdown, and the
// renders it asks of the module.
#pragma once

#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "refhost/host.h"
#include "refhost/world.h"

namespace refhost {

// What one smart render asked of the host, for tests.
struct RenderJob {
    World* input = nullptr;
    World* output = nullptr;
    PF_RenderRequest request{};
    int layerCheckouts = 0;
    int pixelCheckouts = 0;
    int outputCheckouts = 0;
    int paramCheckouts = 0;
    int paramCheckins = 0;
    std::vector<PF_ParamDef> params;  // the parameters as they stood when the render began
};

class EffectInstance {
public:
    // The host must have run ParamsSetup.
    explicit EffectInstance(Host& host);
    ~EffectInstance();
    EffectInstance(const EffectInstance&) = delete;
    EffectInstance& operator=(const EffectInstance&) = delete;

    // Sequence data through its life.
    PF_Err Setup();
    PF_Err Setdown();
    // Flattens and returns the stored bytes (the handle stays the instance's, now flat).
    PF_Err Flatten(std::vector<uint8_t>* stored);
    // Resetup on the instance's own (flattened) handle, or on stored bytes from a project.
    PF_Err Resetup();
    PF_Err Resetup(const std::vector<uint8_t>& stored);
    PF_Handle sequence() const { return m_sequence; }

    // Parameters by host index (1 ... count-1; 0 is the input layer).
    int count() const { return static_cast<int>(m_params.size()); }
    const PF_ParamDef& param(int index) const { return m_params[static_cast<size_t>(index)]; }
    PF_ParamDef& param(int index) { return m_params[static_cast<size_t>(index)]; }
    int IndexOfId(uint32_t id) const;
    // "Group/Name" as the panel shows it: "HSL/Master/Saturation", "Limiter/Enable Limiter".
    int FindByPath(const std::string& path) const;
    std::string PathOf(int index) const;

    // Sets a slider, checkbox or popup as a user would, then tells the module (as the host does
    // for supervised parameters). Returns the module's answer.
    PF_Err SetValue(int index, double value);
    PF_Err UserChanged(int index);
    // Change flags the module set on the last call, then cleared.
    std::vector<int> TakeChangedParams();

    // The "Parameters" value's bytes.
    std::vector<uint8_t> Settings() const;
    void SetSettings(const std::vector<uint8_t>& bytes);

    // The arbitrary values, handled as a host does: through the effect's own callbacks.
    // A new value of the arbitrary parameter with this id (null on failure).
    PF_Handle NewValue(A_short arbId, PF_Err* err = nullptr);
    PF_Handle CopyValue(A_short arbId, PF_Handle source, PF_Err* err = nullptr);
    void DisposeValue(A_short arbId, PF_Handle value);
    // Flat bytes of a value, as saved in a project.
    PF_Err FlattenValue(A_short arbId, PF_Handle value, std::vector<uint8_t>* flat);
    PF_Handle UnflattenValue(A_short arbId, const std::vector<uint8_t>& flat, PF_Err* err = nullptr);
    PF_Err CompareValues(A_short arbId, PF_Handle a, PF_Handle b, PF_ArbCompareResult* result);
    // The text form for copy and paste.
    PF_Err PrintValue(A_short arbId, PF_Handle value, std::string* text);
    PF_Handle ScanValue(A_short arbId, const std::string& text, PF_Err* err = nullptr);
    PF_Handle InterpolateValues(A_short arbId, PF_Handle left, PF_Handle right, double t, PF_Err* err = nullptr);

    // Keyframes of the "Parameters" value: settings records at frames. Renders of a frame take the
    // value the effect interpolates there (held before the first key and after the last).
    void SetKeyframes(const std::vector<std::pair<int, std::vector<uint8_t>>>& keys);
    PF_Err SetTimeFromKeyframes(int frame);

    PF_Err SmartRender(World& input, World& output, RenderJob* job = nullptr);
    // The classic render; hints default to the whole worlds.
    PF_Err Render(World& input, World& output, const PF_Rect* inputHint = nullptr, const PF_Rect* outputHint = nullptr);

    // Callbacks of the module during this instance's calls.
    PF_Err CheckoutParam(PF_ParamIndex index, PF_ParamDef* param, RenderJob* job);
    PF_Err CheckinParam(PF_ParamDef* param, RenderJob* job);

    Host& host() { return m_host; }

private:
    PF_Err CallLocked(PF_Cmd cmd, void* extra, PF_ParamDef** params = nullptr, PF_LayerDef* output = nullptr,
                      RenderJob* job = nullptr);
    PF_Err Arbitrary(PF_ArbParamsExtra* extra);
    PF_Handle KeepOnSuccess(PF_Err err, PF_Handle value);
    std::vector<PF_ParamDef*> PointerArray(std::vector<PF_ParamDef>& params);
    // Copies of the parameters for one render, with their own copy of each arbitrary value.
    std::vector<PF_ParamDef> SnapshotParams();
    void DisposeSnapshot(std::vector<PF_ParamDef>& params);

    Host& m_host;
    CallContext m_context{};
    PF_Handle m_sequence = nullptr;
    mutable std::mutex m_mutex;  // guards m_params, m_sequence for calls from several threads
    std::vector<PF_ParamDef> m_params;
    std::vector<std::pair<int, PF_Handle>> m_keyframes;  // frame, flat-loaded value; in frame order
};

}  // namespace refhost
