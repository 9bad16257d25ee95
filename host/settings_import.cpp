#include "host/settings_import.h"

#include <cstring>

#include "host/global_state.h"
#include "host/locked_handle.h"
#include "host/params.h"

namespace vt {

PF_Err ImportSettings(const CommandContext& context) {
    auto* request = static_cast<SettingsImportRequest*>(context.extra);
    if (!request || request->command != 0) return PF_Err_NONE;
    if (!context.in_data->sequence_data) {
        request->result = kImportNoSequenceData;
        return PF_Err_NONE;
    }
    if (request->size != kParametersSize || !request->data) {
        request->result = kImportBadRecord;
        return PF_Err_NONE;
    }
    // The record goes into the value of the "Parameters" parameter; without one that can hold it,
    // the request is refused like a bad record rather than written anywhere else.
    const uint32_t index = context.global->idToIndex[kIdParameters];
    PF_ParamDef* parameters = (context.params && index > 0 && index < kParamTableSize) ? context.params[index] : nullptr;
    LockedHandle value(context.in_data, parameters && parameters->param_type == PF_Param_ARBITRARY_DATA
                                            ? parameters->u.arb_d.value
                                            : nullptr);
    if (value.size() < kParametersSize) {
        request->result = kImportBadRecord;
        return PF_Err_NONE;
    }
    // The parameter is not marked changed: the next render takes the new record.
    std::memcpy(value.get(), request->data, kParametersSize);
    request->result = 0;
    return PF_Err_NONE;
}

}  // namespace vt
