// The effect's parameters: one table in the order the host shows them, with stable ids that
// projects store. The correction itself lives in the "Parameters" arbitrary value; the sliders
// mirror parts of it.
#pragma once

#include <cstdint>
#include <span>

#include "host/commands.h"
#include "sdk/ae_effect.h"

namespace vt {

inline constexpr int kParamCount = 123;       // not counting the input layer at index 0
inline constexpr int kHostParamCount = 124;   // with it

// Stable ids the module refers to by name.
inline constexpr uint32_t kIdParameters = 1;
inline constexpr uint32_t kIdSimplifiedGroup = 2;
inline constexpr uint32_t kIdHueOffset = 45;
inline constexpr uint32_t kIdCurves = 104;
inline constexpr uint32_t kIdEnableLimiter = 106;
inline constexpr uint32_t kIdVideoSystem = 115;
inline constexpr uint32_t kIdShowLimiterPreview = 116;
inline constexpr uint32_t kIdLevelsAutoCorrect = 118;

inline constexpr uint32_t kParametersSize = 33556;
inline constexpr uint32_t kHueOffsetSize = 52;
inline constexpr uint32_t kCurvesSize = 16432;

// What a row needs beyond the table's fixed values.
enum class ParamSpecial : uint8_t {
    kNone,
    kParametersControl,  // 55 pixels high in the Premiere family, 51 elsewhere
    kSimplifiedGroup,    // no name in Avid hosts
    kLimiterDefault,     // checkbox value from the preferences
    kVideoSystem,        // popup value from the default settings' video system
};

struct ParamRow {
    uint32_t id;
    PF_ParamType type;
    const char* name;
    PF_ParamFlags flags;
    PF_ParamUIFlags uiFlags;
    int16_t uiWidth;
    int16_t uiHeight;
    float validMin;
    float validMax;
    float sliderMin;
    float sliderMax;
    float defaultValue;  // float sliders, checkboxes and popups
    int16_t precision;
    int16_t arbitraryId;
    uint32_t arbitrarySize;
    const char* choices;  // popups: "A|B|C"
    int16_t choiceCount;
    ParamSpecial special;
};

// The rows in the order of their host index (row i is index i + 1).
std::span<const ParamRow> ParamTable();

// PF_Cmd_PARAMS_SETUP: declares every parameter and fills the id tables.
PF_Err ParamsSetup(const CommandContext& context);

}  // namespace vt
