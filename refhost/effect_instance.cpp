#include "refhost/effect_instance.h"

#include <algorithm>
#include <cstring>

namespace refhost {

namespace {

constexpr A_short kParametersArbId = 1;

PF_Handle CopyHandle(HandleHeap& heap, PF_Handle source) {
    if (!source) return nullptr;
    const size_t size = heap.Size(source);
    PF_Handle copy = heap.New(size);
    if (!copy) return nullptr;
    std::memcpy(heap.Lock(copy), heap.Lock(source), size);
    heap.Unlock(copy);
    heap.Unlock(source);
    return copy;
}

}  // namespace

EffectInstance::EffectInstance(Host& host) : m_host(host) {
    m_context = {&host, this, nullptr};
    m_params = host.paramDefs();
    for (PF_ParamDef& def : m_params) {
        // Each instance holds its own value of every arbitrary parameter: a copy of the default,
        // made by the effect as hosts ask it to.
        if (def.param_type == PF_Param_ARBITRARY_DATA) {
            def.u.arb_d.value = CopyValue(def.u.arb_d.id, def.u.arb_d.dephault);
            if (!def.u.arb_d.value) def.u.arb_d.value = CopyHandle(host.heap(), def.u.arb_d.dephault);
        }
    }
}

EffectInstance::~EffectInstance() {
    if (m_sequence) Setdown();
    for (auto& [frame, value] : m_keyframes) DisposeValue(kParametersArbId, value);
    for (PF_ParamDef& def : m_params) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) DisposeValue(def.u.arb_d.id, def.u.arb_d.value);
    }
}

// A value handed out with an error is the host's all the same: it is disposed of here.
PF_Handle EffectInstance::KeepOnSuccess(PF_Err err, PF_Handle value) {
    if (err == PF_Err_NONE) return value;
    if (value && m_host.heap().IsLive(value)) m_host.heap().Dispose(value);
    return nullptr;
}

PF_Err EffectInstance::Arbitrary(PF_ArbParamsExtra* extra) {
    CallContext context{&m_host, this, nullptr};
    PF_InData inData = m_host.MakeInData(&context, m_sequence);
    std::vector<PF_ParamDef*> pointers = PointerArray(m_params);
    return m_host.CallWith(&inData, PF_Cmd_ARBITRARY_CALLBACK, pointers.data(), nullptr, extra);
}

PF_Handle EffectInstance::NewValue(A_short arbId, PF_Err* err) {
    PF_ArbParamsExtra extra{};
    PF_Handle result = nullptr;
    extra.which_function = PF_Arbitrary_NEW_FUNC;
    extra.id = arbId;
    extra.u.new_func_params.arbPH = &result;
    const PF_Err e = Arbitrary(&extra);
    if (err) *err = e;
    return KeepOnSuccess(e, result);
}

PF_Handle EffectInstance::CopyValue(A_short arbId, PF_Handle source, PF_Err* err) {
    PF_ArbParamsExtra extra{};
    PF_Handle result = nullptr;
    extra.which_function = PF_Arbitrary_COPY_FUNC;
    extra.id = arbId;
    extra.u.copy_func_params.src_arbH = source;
    extra.u.copy_func_params.dst_arbPH = &result;
    const PF_Err e = Arbitrary(&extra);
    if (err) *err = e;
    return KeepOnSuccess(e, result);
}

void EffectInstance::DisposeValue(A_short arbId, PF_Handle value) {
    if (!value) return;
    PF_ArbParamsExtra extra{};
    extra.which_function = PF_Arbitrary_DISPOSE_FUNC;
    extra.id = arbId;
    extra.u.dispose_func_params.arbH = value;
    // A module that cannot answer leaves the value to the host.
    if (Arbitrary(&extra) != PF_Err_NONE || m_host.heap().IsLive(value)) m_host.heap().Dispose(value);
}

PF_Err EffectInstance::FlattenValue(A_short arbId, PF_Handle value, std::vector<uint8_t>* flat) {
    PF_ArbParamsExtra extra{};
    A_u_long size = 0;
    extra.which_function = PF_Arbitrary_FLAT_SIZE_FUNC;
    extra.id = arbId;
    extra.u.flat_size_func_params.arbH = value;
    extra.u.flat_size_func_params.flat_data_sizePLu = &size;
    if (const PF_Err err = Arbitrary(&extra)) return err;
    flat->assign(size, 0);
    extra = PF_ArbParamsExtra{};
    extra.which_function = PF_Arbitrary_FLATTEN_FUNC;
    extra.id = arbId;
    extra.u.flatten_func_params.arbH = value;
    extra.u.flatten_func_params.buf_sizeLu = size;
    extra.u.flatten_func_params.flat_dataPV = flat->data();
    return Arbitrary(&extra);
}

PF_Handle EffectInstance::UnflattenValue(A_short arbId, const std::vector<uint8_t>& flat, PF_Err* err) {
    PF_ArbParamsExtra extra{};
    PF_Handle result = nullptr;
    extra.which_function = PF_Arbitrary_UNFLATTEN_FUNC;
    extra.id = arbId;
    extra.u.unflatten_func_params.buf_sizeLu = static_cast<A_u_long>(flat.size());
    extra.u.unflatten_func_params.flat_dataPV = flat.data();
    extra.u.unflatten_func_params.arbPH = &result;
    const PF_Err e = Arbitrary(&extra);
    if (err) *err = e;
    return KeepOnSuccess(e, result);
}

PF_Err EffectInstance::CompareValues(A_short arbId, PF_Handle a, PF_Handle b, PF_ArbCompareResult* result) {
    PF_ArbParamsExtra extra{};
    extra.which_function = PF_Arbitrary_COMPARE_FUNC;
    extra.id = arbId;
    extra.u.compare_func_params.a_arbH = a;
    extra.u.compare_func_params.b_arbH = b;
    extra.u.compare_func_params.compareP = result;
    return Arbitrary(&extra);
}

PF_Err EffectInstance::PrintValue(A_short arbId, PF_Handle value, std::string* text) {
    PF_ArbParamsExtra extra{};
    A_u_long size = 0;
    extra.which_function = PF_Arbitrary_PRINT_SIZE_FUNC;
    extra.id = arbId;
    extra.u.print_size_func_params.arbH = value;
    extra.u.print_size_func_params.print_sizePLu = &size;
    if (const PF_Err err = Arbitrary(&extra)) return err;
    std::vector<char> buffer(size + 1, '\0');
    extra = PF_ArbParamsExtra{};
    extra.which_function = PF_Arbitrary_PRINT_FUNC;
    extra.id = arbId;
    extra.u.print_func_params.print_flags = PF_ArbPrint_NONE;
    extra.u.print_func_params.arbH = value;
    extra.u.print_func_params.print_sizeLu = size;
    extra.u.print_func_params.print_bufferPC = buffer.data();
    if (const PF_Err err = Arbitrary(&extra)) return err;
    text->assign(buffer.data(), strnlen(buffer.data(), size));
    return PF_Err_NONE;
}

PF_Handle EffectInstance::ScanValue(A_short arbId, const std::string& text, PF_Err* err) {
    PF_ArbParamsExtra extra{};
    PF_Handle result = nullptr;
    extra.which_function = PF_Arbitrary_SCAN_FUNC;
    extra.id = arbId;
    extra.u.scan_func_params.bufPC = text.data();
    extra.u.scan_func_params.bytes_to_scanLu = static_cast<A_u_long>(text.size());
    extra.u.scan_func_params.arbPH = &result;
    const PF_Err e = Arbitrary(&extra);
    if (err) *err = e;
    return KeepOnSuccess(e, result);
}

PF_Handle EffectInstance::InterpolateValues(A_short arbId, PF_Handle left, PF_Handle right, double t, PF_Err* err) {
    PF_ArbParamsExtra extra{};
    PF_Handle result = nullptr;
    extra.which_function = PF_Arbitrary_INTERP_FUNC;
    extra.id = arbId;
    extra.u.interp_func_params.left_arbH = left;
    extra.u.interp_func_params.right_arbH = right;
    extra.u.interp_func_params.tF = t;
    extra.u.interp_func_params.interpPH = &result;
    const PF_Err e = Arbitrary(&extra);
    if (err) *err = e;
    return KeepOnSuccess(e, result);
}

void EffectInstance::SetKeyframes(const std::vector<std::pair<int, std::vector<uint8_t>>>& keys) {
    for (auto& [frame, value] : m_keyframes) DisposeValue(kParametersArbId, value);
    m_keyframes.clear();
    for (const auto& [frame, bytes] : keys) {
        // Keyframe values come from the project as flat bytes: the effect unflattens them.
        if (PF_Handle value = UnflattenValue(kParametersArbId, bytes)) m_keyframes.emplace_back(frame, value);
    }
    std::sort(m_keyframes.begin(), m_keyframes.end(),
              [](const auto& a, const auto& b) { return a.first < b.first; });
}

PF_Err EffectInstance::SetTimeFromKeyframes(int frame) {
    if (m_keyframes.empty()) return PF_Err_NONE;
    PF_Handle value = nullptr;
    PF_Err err = PF_Err_NONE;
    if (frame <= m_keyframes.front().first) {
        value = CopyValue(kParametersArbId, m_keyframes.front().second, &err);
    } else if (frame >= m_keyframes.back().first) {
        value = CopyValue(kParametersArbId, m_keyframes.back().second, &err);
    } else {
        size_t k = 1;
        while (m_keyframes[k].first < frame) ++k;
        const auto& [leftFrame, left] = m_keyframes[k - 1];
        const auto& [rightFrame, right] = m_keyframes[k];
        const double t = static_cast<double>(frame - leftFrame) / static_cast<double>(rightFrame - leftFrame);
        value = InterpolateValues(kParametersArbId, left, right, t, &err);
    }
    if (!value) return err != PF_Err_NONE ? err : PF_Err_OUT_OF_MEMORY;
    const int index = IndexOfId(1);
    std::lock_guard<std::mutex> guard(m_mutex);
    PF_Handle& slot = m_params[static_cast<size_t>(index)].u.arb_d.value;
    m_host.heap().Dispose(slot);
    slot = value;
    return PF_Err_NONE;
}

std::vector<PF_ParamDef*> EffectInstance::PointerArray(std::vector<PF_ParamDef>& params) {
    std::vector<PF_ParamDef*> pointers;
    for (PF_ParamDef& def : params) pointers.push_back(&def);
    return pointers;
}

PF_Err EffectInstance::CallLocked(PF_Cmd cmd, void* extra, PF_ParamDef** params, PF_LayerDef* output,
                                  RenderJob* job) {
    CallContext context{&m_host, this, job};
    PF_InData inData = m_host.MakeInData(&context, m_sequence);
    std::vector<PF_ParamDef*> pointers;
    if (!params) {
        pointers = PointerArray(m_params);
        params = pointers.data();
    }
    const PF_Err err = m_host.CallWith(&inData, cmd, params, output, extra);
    return err;
}

PF_Err EffectInstance::Setup() {
    std::lock_guard<std::mutex> guard(m_mutex);
    const PF_Err err = CallLocked(PF_Cmd_SEQUENCE_SETUP, nullptr);
    if (err == PF_Err_NONE) m_sequence = m_host.lastOutSequence();
    return err;
}

PF_Err EffectInstance::Setdown() {
    std::lock_guard<std::mutex> guard(m_mutex);
    const PF_Err err = CallLocked(PF_Cmd_SEQUENCE_SETDOWN, nullptr);
    m_sequence = nullptr;
    return err;
}

PF_Err EffectInstance::Flatten(std::vector<uint8_t>* stored) {
    std::lock_guard<std::mutex> guard(m_mutex);
    const PF_Err err = CallLocked(PF_Cmd_SEQUENCE_FLATTEN, nullptr);
    if (err != PF_Err_NONE) return err;
    m_sequence = m_host.lastOutSequence();
    HandleHeap& heap = m_host.heap();
    const size_t size = heap.Size(m_sequence);
    const auto* bytes = static_cast<const uint8_t*>(heap.Lock(m_sequence));
    stored->assign(bytes, bytes + size);
    heap.Unlock(m_sequence);
    return err;
}

PF_Err EffectInstance::Resetup() {
    std::lock_guard<std::mutex> guard(m_mutex);
    const PF_Err err = CallLocked(PF_Cmd_SEQUENCE_RESETUP, nullptr);
    m_sequence = m_host.lastOutSequence();
    return err;
}

PF_Err EffectInstance::Resetup(const std::vector<uint8_t>& stored) {
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        if (m_sequence) m_host.heap().Dispose(m_sequence);
        m_sequence = stored.empty() ? nullptr : m_host.heap().New(stored.size());
        if (m_sequence) {
            std::memcpy(m_host.heap().Lock(m_sequence), stored.data(), stored.size());
            m_host.heap().Unlock(m_sequence);
        }
    }
    return Resetup();
}

int EffectInstance::IndexOfId(uint32_t id) const {
    const std::vector<uint32_t>& ids = m_host.paramIds();
    for (size_t i = 1; i < ids.size(); ++i) {
        if (ids[i] == id) return static_cast<int>(i);
    }
    return -1;
}

std::string EffectInstance::PathOf(int index) const {
    std::vector<std::string> groups;
    for (int i = 1; i < index && i < count(); ++i) {
        const PF_ParamDef& def = m_params[static_cast<size_t>(i)];
        if (def.param_type == PF_Param_GROUP_START) groups.emplace_back(def.name);
        if (def.param_type == PF_Param_GROUP_END && !groups.empty()) groups.pop_back();
    }
    // The outer "Simplified Interface" group holds everything; panel paths start below it.
    std::string path;
    for (size_t g = groups.empty() ? 0 : 1; g < groups.size(); ++g) path += groups[g] + "/";
    return path + m_params[static_cast<size_t>(index)].name;
}

int EffectInstance::FindByPath(const std::string& path) const {
    for (int i = 1; i < count(); ++i) {
        const PF_ParamDef& def = m_params[static_cast<size_t>(i)];
        if (def.param_type == PF_Param_GROUP_START || def.param_type == PF_Param_GROUP_END) continue;
        if (PathOf(i) == path) return i;
    }
    return -1;
}

PF_Err EffectInstance::SetValue(int index, double value) {
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        PF_ParamDef& def = m_params[static_cast<size_t>(index)];
        switch (def.param_type) {
            case PF_Param_FLOAT_SLIDER: def.u.fs_d.value = value; break;
            case PF_Param_CHECKBOX: def.u.bd.value = value != 0 ? 1 : 0; break;
            case PF_Param_POPUP: def.u.pd.value = static_cast<A_long>(value); break;
            default: return PF_Err_BAD_CALLBACK_PARAM;
        }
    }
    return UserChanged(index);
}

PF_Err EffectInstance::UserChanged(int index) {
    std::lock_guard<std::mutex> guard(m_mutex);
    if (!(m_params[static_cast<size_t>(index)].flags & PF_ParamFlag_SUPERVISE)) return PF_Err_NONE;
    PF_UserChangedParamExtra extra{index};
    return CallLocked(PF_Cmd_USER_CHANGED_PARAM, &extra);
}

std::vector<int> EffectInstance::TakeChangedParams() {
    std::lock_guard<std::mutex> guard(m_mutex);
    std::vector<int> changed;
    for (int i = 1; i < count(); ++i) {
        PF_ParamDef& def = m_params[static_cast<size_t>(i)];
        if (def.uu.change_flags & PF_ChangeFlag_CHANGED_VALUE) changed.push_back(i);
        def.uu.change_flags = 0;
    }
    return changed;
}

std::vector<uint8_t> EffectInstance::Settings() const {
    std::lock_guard<std::mutex> guard(m_mutex);
    const int index = IndexOfId(1);
    if (index < 0) return {};
    PF_Handle value = m_params[static_cast<size_t>(index)].u.arb_d.value;
    HandleHeap& heap = const_cast<Host&>(m_host).heap();
    const auto* bytes = static_cast<const uint8_t*>(heap.Lock(value));
    std::vector<uint8_t> copy(bytes, bytes + heap.Size(value));
    heap.Unlock(value);
    return copy;
}

void EffectInstance::SetSettings(const std::vector<uint8_t>& bytes) {
    std::lock_guard<std::mutex> guard(m_mutex);
    const int index = IndexOfId(1);
    if (index < 0) return;
    PF_Handle& value = m_params[static_cast<size_t>(index)].u.arb_d.value;
    HandleHeap& heap = m_host.heap();
    if (heap.Size(value) != bytes.size()) {
        heap.Dispose(value);
        value = heap.New(bytes.size());
    }
    std::memcpy(heap.Lock(value), bytes.data(), bytes.size());
    heap.Unlock(value);
}

std::vector<PF_ParamDef> EffectInstance::SnapshotParams() {
    std::lock_guard<std::mutex> guard(m_mutex);
    std::vector<PF_ParamDef> copy = m_params;
    for (PF_ParamDef& def : copy) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) def.u.arb_d.value = CopyHandle(m_host.heap(), def.u.arb_d.value);
    }
    return copy;
}

void EffectInstance::DisposeSnapshot(std::vector<PF_ParamDef>& params) {
    for (PF_ParamDef& def : params) {
        if (def.param_type == PF_Param_ARBITRARY_DATA) m_host.heap().Dispose(def.u.arb_d.value);
    }
}

PF_Err EffectInstance::CheckoutParam(PF_ParamIndex index, PF_ParamDef* param, RenderJob* job) {
    if (!job || index < 0 || static_cast<size_t>(index) >= job->params.size()) return PF_Err_BAD_CALLBACK_PARAM;
    ++job->paramCheckouts;
    *param = job->params[static_cast<size_t>(index)];
    return PF_Err_NONE;
}

PF_Err EffectInstance::CheckinParam(PF_ParamDef*, RenderJob* job) {
    if (job) ++job->paramCheckins;
    return PF_Err_NONE;
}

namespace {

CallContext* ContextOf(PF_ProgPtr effect_ref) { return reinterpret_cast<CallContext*>(effect_ref); }

PF_Err CheckoutLayer(PF_ProgPtr effect_ref, PF_ParamIndex index, A_long, const PF_RenderRequest* request, A_long,
                     A_long, A_u_long, PF_CheckoutResult* result) {
    RenderJob* job = ContextOf(effect_ref)->job;
    if (!job || index != 0 || !request || !result) return PF_Err_BAD_CALLBACK_PARAM;
    ++job->layerCheckouts;
    job->request = *request;
    const PF_LRect bounds = {0, 0, job->input->width(), job->input->height()};
    *result = PF_CheckoutResult{};
    result->result_rect = {std::max(bounds.left, request->rect.left), std::max(bounds.top, request->rect.top),
                           std::min(bounds.right, request->rect.right), std::min(bounds.bottom, request->rect.bottom)};
    result->max_result_rect = bounds;
    result->par = {1, 1};
    result->ref_width = bounds.right;
    result->ref_height = bounds.bottom;
    return PF_Err_NONE;
}

PF_Err CheckoutLayerPixels(PF_ProgPtr effect_ref, A_long, PF_EffectWorld** pixels) {
    RenderJob* job = ContextOf(effect_ref)->job;
    if (!job || !pixels) return PF_Err_BAD_CALLBACK_PARAM;
    ++job->pixelCheckouts;
    *pixels = job->input->get();
    return PF_Err_NONE;
}

PF_Err CheckinLayerPixels(PF_ProgPtr, A_long) { return PF_Err_NONE; }

PF_Err CheckoutOutput(PF_ProgPtr effect_ref, PF_EffectWorld** output) {
    RenderJob* job = ContextOf(effect_ref)->job;
    if (!job || !output) return PF_Err_BAD_CALLBACK_PARAM;
    ++job->outputCheckouts;
    *output = job->output->get();
    return PF_Err_NONE;
}

}  // namespace

PF_Err EffectInstance::SmartRender(World& input, World& output, RenderJob* job) {
    RenderJob local;
    if (!job) job = &local;
    job->input = &input;
    job->output = &output;
    m_host.RegisterWorld(input.get(), input.layout());
    m_host.RegisterWorld(output.get(), output.layout());

    CallContext context{&m_host, this, job};
    PF_InData inData;
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        inData = m_host.MakeInData(&context, m_sequence);
        job->params = m_params;
    }

    PF_PreRenderInput preInput{};
    preInput.output_request.rect = {0, 0, output.width(), output.height()};
    preInput.output_request.channel_mask = PF_ChannelMask_ARGB;
    preInput.bitdepth = static_cast<short>(LayoutDepth(input.layout()));
    PF_PreRenderOutput preOutput{};
    PF_PreRenderCallbacks preCallbacks{};
    preCallbacks.checkout_layer = CheckoutLayer;
    PF_PreRenderExtra preExtra{&preInput, &preOutput, &preCallbacks};
    PF_Err err = m_host.CallWith(&inData, PF_Cmd_SMART_PRE_RENDER, nullptr, nullptr, &preExtra);
    if (err == PF_Err_NONE) {
        PF_SmartRenderInput renderInput{};
        renderInput.output_request = preInput.output_request;
        renderInput.bitdepth = preInput.bitdepth;
        PF_SmartRenderCallbacks callbacks{CheckoutLayerPixels, CheckinLayerPixels, CheckoutOutput};
        PF_SmartRenderExtra extra{&renderInput, &callbacks};
        err = m_host.CallWith(&inData, PF_Cmd_SMART_RENDER, nullptr, nullptr, &extra);
    }
    m_host.UnregisterWorld(input.get());
    m_host.UnregisterWorld(output.get());
    return err;
}

PF_Err EffectInstance::Render(World& input, World& output, const PF_Rect* inputHint, const PF_Rect* outputHint) {
    m_host.RegisterWorld(input.get(), input.layout());
    m_host.RegisterWorld(output.get(), output.layout());
    std::vector<PF_ParamDef> params = SnapshotParams();
    params[0].param_type = PF_Param_LAYER;
    params[0].u.ld = *input.get();
    std::vector<PF_ParamDef*> pointers = PointerArray(params);

    CallContext context{&m_host, this, nullptr};
    PF_InData inData;
    {
        std::lock_guard<std::mutex> guard(m_mutex);
        inData = m_host.MakeInData(&context, m_sequence);
    }
    const PF_Rect whole = {0, 0, input.width(), input.height()};
    inData.extent_hint = inputHint ? *inputHint : whole;
    params[0].u.ld.extent_hint = inData.extent_hint;
    output.get()->extent_hint = outputHint ? *outputHint : PF_Rect{0, 0, output.width(), output.height()};
    inData.width = input.width();
    inData.height = input.height();
    const PF_Err err = m_host.CallWith(&inData, PF_Cmd_RENDER, pointers.data(), output.get(), nullptr);
    DisposeSnapshot(params);
    m_host.UnregisterWorld(input.get());
    m_host.UnregisterWorld(output.get());
    return err;
}

}  // namespace refhost
