// Our declarations of the host's effect interface: primitive types, command and error codes, flags,
// the parameter and layer records, the interaction and utility callbacks, PF_InData / PF_OutData and
// the entry-point type. Names, values and field order follow the host SDK; every layout is pinned by
// static_asserts so the Win64 module and the Linux reference host agree byte for byte.
#pragma once

#include <cstddef>
#include <cstdint>

#include "sdk/ae_config.h"

struct SPBasicSuite;

extern "C" {

// ---------------------------------------------------------------------------------------------------
// Primitive types. Fixed width everywhere: `long` is 32 bits on Win64 and 64 on Linux.

typedef int32_t A_long;
typedef uint32_t A_u_long;
typedef int16_t A_short;
typedef uint16_t A_u_short;
typedef char A_char;
typedef uint8_t A_u_char;
typedef uint8_t A_Boolean;
typedef double A_FpLong;
typedef float A_FpShort;
typedef int64_t A_intptr_t;
typedef uint64_t A_u_longlong;
typedef A_long A_Err;

typedef A_char PF_Boolean;
typedef A_FpLong PF_FpLong;
typedef A_FpShort PF_FpShort;
typedef A_long PF_Fixed;  // 16.16 fixed point
typedef A_u_long PF_UFixed;
typedef void** PF_Handle;
typedef PF_Handle PF_ArbitraryH;
typedef struct PF_ProgressInfo* PF_ProgPtr;  // opaque effect reference (effect_ref)

typedef A_long PF_ParamIndex;
typedef A_long PF_ParamValue;
typedef A_long PF_Err;
typedef A_long PF_Cmd;
typedef A_long PF_OutFlags;
typedef A_long PF_OutFlags2;
typedef A_long PF_InFlags;
typedef A_long PF_ParamType;
typedef A_long PF_ParamFlags;
typedef A_long PF_ParamUIFlags;
typedef A_long PF_ChangeFlags;
typedef A_short PF_ValueDisplayFlags;
typedef A_u_long PF_FSliderFlags;
typedef A_long PF_Quality;
typedef A_long PF_Field;
typedef A_long PF_Stage;
typedef A_long PF_WorldFlags;
typedef A_long PF_ChannelMask;
typedef A_short PF_RenderOutputFlags;
typedef A_long PF_PixelFormat;
typedef A_long PrPixelFormat;  // a 32-bit enum in the host SDK
typedef A_long PF_FunctionSelector;
typedef A_long PF_ArbCompareResult;
typedef A_long PF_ArbPrintFlags;
typedef A_long PF_PlatDataID;
typedef A_u_long PF_PathID;
typedef A_short PF_App_ColorType;

typedef A_long PF_CustomEventFlags;
typedef A_long PF_WindowType;
typedef A_long PF_EventType;
typedef A_long PF_EventOutFlags;
typedef A_long PF_EventInFlags;
typedef A_long PF_EffectArea;
typedef A_long PF_Modifiers;
typedef A_long PF_UIAlignment;
typedef A_long PF_CursorType;

// Host callbacks the module never calls keep their slot with this placeholder type.
typedef void(SPAPI* PF_UnusedProc)(void);

// ---------------------------------------------------------------------------------------------------
// Commands. The numbering is fixed by the host and must not change.

constexpr PF_Cmd PF_Cmd_ABOUT = 0;
constexpr PF_Cmd PF_Cmd_GLOBAL_SETUP = 1;
constexpr PF_Cmd PF_Cmd_UNUSED_0 = 2;
constexpr PF_Cmd PF_Cmd_GLOBAL_SETDOWN = 3;
constexpr PF_Cmd PF_Cmd_PARAMS_SETUP = 4;
constexpr PF_Cmd PF_Cmd_SEQUENCE_SETUP = 5;
constexpr PF_Cmd PF_Cmd_SEQUENCE_RESETUP = 6;
constexpr PF_Cmd PF_Cmd_SEQUENCE_FLATTEN = 7;
constexpr PF_Cmd PF_Cmd_SEQUENCE_SETDOWN = 8;
constexpr PF_Cmd PF_Cmd_DO_DIALOG = 9;
constexpr PF_Cmd PF_Cmd_FRAME_SETUP = 10;
constexpr PF_Cmd PF_Cmd_RENDER = 11;
constexpr PF_Cmd PF_Cmd_FRAME_SETDOWN = 12;
constexpr PF_Cmd PF_Cmd_USER_CHANGED_PARAM = 13;
constexpr PF_Cmd PF_Cmd_UPDATE_PARAMS_UI = 14;
constexpr PF_Cmd PF_Cmd_EVENT = 15;
constexpr PF_Cmd PF_Cmd_GET_EXTERNAL_DEPENDENCIES = 16;
constexpr PF_Cmd PF_Cmd_COMPLETELY_GENERAL = 17;
constexpr PF_Cmd PF_Cmd_QUERY_DYNAMIC_FLAGS = 18;
constexpr PF_Cmd PF_Cmd_AUDIO_RENDER = 19;
constexpr PF_Cmd PF_Cmd_AUDIO_SETUP = 20;
constexpr PF_Cmd PF_Cmd_AUDIO_SETDOWN = 21;
constexpr PF_Cmd PF_Cmd_ARBITRARY_CALLBACK = 22;
constexpr PF_Cmd PF_Cmd_SMART_PRE_RENDER = 23;
constexpr PF_Cmd PF_Cmd_SMART_RENDER = 24;
constexpr PF_Cmd PF_Cmd_RESERVED1 = 25;
constexpr PF_Cmd PF_Cmd_RESERVED2 = 26;
constexpr PF_Cmd PF_Cmd_RESERVED3 = 27;
constexpr PF_Cmd PF_Cmd_GET_FLATTENED_SEQUENCE_DATA = 28;
constexpr PF_Cmd PF_Cmd_TRANSLATE_PARAMS_TO_PREFS = 29;
constexpr PF_Cmd PF_Cmd_RESERVED4 = 30;
constexpr PF_Cmd PF_Cmd_SMART_RENDER_GPU = 31;
constexpr PF_Cmd PF_Cmd_GPU_DEVICE_SETUP = 32;
constexpr PF_Cmd PF_Cmd_GPU_DEVICE_SETDOWN = 33;
constexpr PF_Cmd PF_Cmd_NUM_CMDS = 34;

// ---------------------------------------------------------------------------------------------------
// Error codes.

constexpr PF_Err PF_Err_NONE = 0;
constexpr PF_Err PF_Err_OUT_OF_MEMORY = 4;
constexpr PF_Err PF_FIRST_ERR = 512;
constexpr PF_Err PF_Err_INTERNAL_STRUCT_DAMAGED = PF_FIRST_ERR;
constexpr PF_Err PF_Err_INVALID_INDEX = PF_FIRST_ERR + 1;
constexpr PF_Err PF_Err_UNRECOGNIZED_PARAM_TYPE = PF_FIRST_ERR + 2;
constexpr PF_Err PF_Err_INVALID_CALLBACK = PF_FIRST_ERR + 3;
constexpr PF_Err PF_Err_BAD_CALLBACK_PARAM = PF_FIRST_ERR + 4;
constexpr PF_Err PF_Interrupt_CANCEL = PF_FIRST_ERR + 5;
constexpr PF_Err PF_Err_CANNOT_PARSE_KEYFRAME_TEXT = PF_FIRST_ERR + 6;

// ---------------------------------------------------------------------------------------------------
// Out-flags (global setup), out-flags2, in-flags.

constexpr PF_OutFlags PF_OutFlag_NONE = 0;
constexpr PF_OutFlags PF_OutFlag_KEEP_RESOURCE_OPEN = 1 << 0;
constexpr PF_OutFlags PF_OutFlag_WIDE_TIME_INPUT = 1 << 1;
constexpr PF_OutFlags PF_OutFlag_NON_PARAM_VARY = 1 << 2;
constexpr PF_OutFlags PF_OutFlag_RESERVED6 = 1 << 3;
constexpr PF_OutFlags PF_OutFlag_SEQUENCE_DATA_NEEDS_FLATTENING = 1 << 4;
constexpr PF_OutFlags PF_OutFlag_I_DO_DIALOG = 1 << 5;
constexpr PF_OutFlags PF_OutFlag_USE_OUTPUT_EXTENT = 1 << 6;
constexpr PF_OutFlags PF_OutFlag_SEND_DO_DIALOG = 1 << 7;
constexpr PF_OutFlags PF_OutFlag_DISPLAY_ERROR_MESSAGE = 1 << 8;
constexpr PF_OutFlags PF_OutFlag_I_EXPAND_BUFFER = 1 << 9;
constexpr PF_OutFlags PF_OutFlag_PIX_INDEPENDENT = 1 << 10;
constexpr PF_OutFlags PF_OutFlag_I_WRITE_INPUT_BUFFER = 1 << 11;
constexpr PF_OutFlags PF_OutFlag_I_SHRINK_BUFFER = 1 << 12;
constexpr PF_OutFlags PF_OutFlag_WORKS_IN_PLACE = 1 << 13;
constexpr PF_OutFlags PF_OutFlag_RESERVED8 = 1 << 14;
constexpr PF_OutFlags PF_OutFlag_CUSTOM_UI = 1 << 15;
constexpr PF_OutFlags PF_OutFlag_RESERVED7 = 1 << 16;
constexpr PF_OutFlags PF_OutFlag_REFRESH_UI = 1 << 17;
constexpr PF_OutFlags PF_OutFlag_NOP_RENDER = 1 << 18;
constexpr PF_OutFlags PF_OutFlag_I_USE_SHUTTER_ANGLE = 1 << 19;
constexpr PF_OutFlags PF_OutFlag_I_USE_AUDIO = 1 << 20;
constexpr PF_OutFlags PF_OutFlag_I_AM_OBSOLETE = 1 << 21;
constexpr PF_OutFlags PF_OutFlag_FORCE_RERENDER = 1 << 22;
constexpr PF_OutFlags PF_OutFlag_PiPL_OVERRIDES_OUTDATA_OUTFLAGS = 1 << 23;
constexpr PF_OutFlags PF_OutFlag_I_HAVE_EXTERNAL_DEPENDENCIES = 1 << 24;
constexpr PF_OutFlags PF_OutFlag_DEEP_COLOR_AWARE = 1 << 25;
constexpr PF_OutFlags PF_OutFlag_SEND_UPDATE_PARAMS_UI = 1 << 26;
constexpr PF_OutFlags PF_OutFlag_AUDIO_FLOAT_ONLY = 1 << 27;
constexpr PF_OutFlags PF_OutFlag_AUDIO_IIR = 1 << 28;
constexpr PF_OutFlags PF_OutFlag_I_SYNTHESIZE_AUDIO = 1 << 29;
constexpr PF_OutFlags PF_OutFlag_AUDIO_EFFECT_TOO = 1 << 30;
constexpr PF_OutFlags PF_OutFlag_AUDIO_EFFECT_ONLY = static_cast<PF_OutFlags>(0x80000000u);

constexpr PF_OutFlags2 PF_OutFlag2_NONE = 0;
constexpr PF_OutFlags2 PF_OutFlag2_SUPPORTS_QUERY_DYNAMIC_FLAGS = 1 << 0;
constexpr PF_OutFlags2 PF_OutFlag2_I_USE_3D_CAMERA = 1 << 1;
constexpr PF_OutFlags2 PF_OutFlag2_I_USE_3D_LIGHTS = 1 << 2;
constexpr PF_OutFlags2 PF_OutFlag2_PARAM_GROUP_START_COLLAPSED_FLAG = 1 << 3;
constexpr PF_OutFlags2 PF_OutFlag2_I_AM_THREADSAFE = 1 << 4;
constexpr PF_OutFlags2 PF_OutFlag2_CAN_COMBINE_WITH_DESTINATION = 1 << 5;
constexpr PF_OutFlags2 PF_OutFlag2_DOESNT_NEED_EMPTY_PIXELS = 1 << 6;
constexpr PF_OutFlags2 PF_OutFlag2_REVEALS_ZERO_ALPHA = 1 << 7;
constexpr PF_OutFlags2 PF_OutFlag2_PRESERVES_FULLY_OPAQUE_PIXELS = 1 << 8;
constexpr PF_OutFlags2 PF_OutFlag2_SUPPORTS_SMART_RENDER = 1 << 10;
constexpr PF_OutFlags2 PF_OutFlag2_RESERVED9 = 1 << 11;
constexpr PF_OutFlags2 PF_OutFlag2_FLOAT_COLOR_AWARE = 1 << 12;
constexpr PF_OutFlags2 PF_OutFlag2_I_USE_COLORSPACE_ENUMERATION = 1 << 13;
constexpr PF_OutFlags2 PF_OutFlag2_I_AM_DEPRECATED = 1 << 14;
constexpr PF_OutFlags2 PF_OutFlag2_PPRO_DO_NOT_CLONE_SEQUENCE_DATA_FOR_RENDER = 1 << 15;
constexpr PF_OutFlags2 PF_OutFlag2_RESERVED10 = 1 << 16;
constexpr PF_OutFlags2 PF_OutFlag2_AUTOMATIC_WIDE_TIME_INPUT = 1 << 17;
constexpr PF_OutFlags2 PF_OutFlag2_I_USE_TIMECODE = 1 << 18;
constexpr PF_OutFlags2 PF_OutFlag2_DEPENDS_ON_UNREFERENCED_MASKS = 1 << 19;
constexpr PF_OutFlags2 PF_OutFlag2_OUTPUT_IS_WATERMARKED = 1 << 20;

constexpr PF_InFlags PF_InFlag_NONE = 0;

// ---------------------------------------------------------------------------------------------------
// Parameters: types, flags, UI flags, change flags, slider helpers, text limits.

constexpr PF_ParamType PF_Param_RESERVED = -1;
constexpr PF_ParamType PF_Param_LAYER = 0;
constexpr PF_ParamType PF_Param_SLIDER = 1;
constexpr PF_ParamType PF_Param_FIX_SLIDER = 2;
constexpr PF_ParamType PF_Param_ANGLE = 3;
constexpr PF_ParamType PF_Param_CHECKBOX = 4;
constexpr PF_ParamType PF_Param_COLOR = 5;
constexpr PF_ParamType PF_Param_POINT = 6;
constexpr PF_ParamType PF_Param_POPUP = 7;
constexpr PF_ParamType PF_Param_CUSTOM = 8;
constexpr PF_ParamType PF_Param_NO_DATA = 9;
constexpr PF_ParamType PF_Param_FLOAT_SLIDER = 10;
constexpr PF_ParamType PF_Param_ARBITRARY_DATA = 11;
constexpr PF_ParamType PF_Param_PATH = 12;
constexpr PF_ParamType PF_Param_GROUP_START = 13;
constexpr PF_ParamType PF_Param_GROUP_END = 14;
constexpr PF_ParamType PF_Param_BUTTON = 15;
constexpr PF_ParamType PF_Param_RESERVED2 = 16;
constexpr PF_ParamType PF_Param_RESERVED3 = 17;
constexpr PF_ParamType PF_Param_POINT_3D = 18;

constexpr PF_ParamFlags PF_ParamFlag_NONE = 0;
constexpr PF_ParamFlags PF_ParamFlag_RESERVED1 = 0x01;
constexpr PF_ParamFlags PF_ParamFlag_CANNOT_TIME_VARY = 0x02;
constexpr PF_ParamFlags PF_ParamFlag_CANNOT_INTERP = 0x04;
constexpr PF_ParamFlags PF_ParamFlag_COLLAPSE_TWIRLY = 0x20;
constexpr PF_ParamFlags PF_ParamFlag_START_COLLAPSED = PF_ParamFlag_COLLAPSE_TWIRLY;
constexpr PF_ParamFlags PF_ParamFlag_SUPERVISE = 0x40;
constexpr PF_ParamFlags PF_ParamFlag_USE_VALUE_FOR_OLD_PROJECTS = 0x80;
constexpr PF_ParamFlags PF_ParamFlag_EXCLUDE_FROM_HAVE_INPUTS_CHANGED = 0x100;
constexpr PF_ParamFlags PF_ParamFlag_SKIP_REVEAL_WHEN_UNHIDDEN = 0x200;

constexpr PF_ParamUIFlags PF_PUI_NONE = 0;
constexpr PF_ParamUIFlags PF_PUI_TOPIC = 0x001;
constexpr PF_ParamUIFlags PF_PUI_CONTROL = 0x002;
constexpr PF_ParamUIFlags PF_PUI_STD_CONTROL_ONLY = 0x004;
constexpr PF_ParamUIFlags PF_PUI_NO_ECW_UI = 0x008;
constexpr PF_ParamUIFlags PF_PUI_ECW_SEPARATOR = 0x010;
constexpr PF_ParamUIFlags PF_PUI_DISABLED = 0x020;
constexpr PF_ParamUIFlags PF_PUI_DONT_ERASE_TOPIC = 0x040;
constexpr PF_ParamUIFlags PF_PUI_DONT_ERASE_CONTROL = 0x080;
constexpr PF_ParamUIFlags PF_PUI_RADIO_BUTTON = 0x100;
constexpr PF_ParamUIFlags PF_PUI_INVISIBLE = 0x200;

constexpr PF_ChangeFlags PF_ChangeFlag_NONE = 0;
constexpr PF_ChangeFlags PF_ChangeFlag_CHANGED_VALUE = 0x1;
constexpr PF_ChangeFlags PF_ChangeFlag_RESERVED = 0x2;
constexpr PF_ChangeFlags PF_ChangeFlag_SET_TO_VARY = 0x4;
constexpr PF_ChangeFlags PF_ChangeFlag_SET_TO_CONSTANT = 0x8;

constexpr PF_FSliderFlags PF_FSliderFlag_NONE = 0;
constexpr PF_FSliderFlags PF_FSliderFlag_WANT_PHASE = 1;

constexpr PF_ValueDisplayFlags PF_ValueDisplayFlag_NONE = 0;
constexpr PF_ValueDisplayFlags PF_ValueDisplayFlag_PERCENT = 1;
constexpr PF_ValueDisplayFlags PF_ValueDisplayFlag_PIXEL = 2;

constexpr A_short PF_Precision_INTEGER = 0;
constexpr A_short PF_Precision_TENTHS = 1;
constexpr A_short PF_Precision_HUNDREDTHS = 2;
constexpr A_short PF_Precision_THOUSANDTHS = 3;
constexpr A_short PF_Precision_TEN_THOUSANDTHS = 4;

constexpr float AEFX_AUDIO_DEFAULT_CURVE_TOLERANCE = 0.05f;

constexpr A_long PF_MAX_EFFECT_NAME_LEN = 31;
constexpr A_long PF_MAX_EFFECT_CATEGORY_NAME_LEN = 31;
constexpr A_long PF_MAX_EFFECT_PARAM_NAME_LEN = 31;
constexpr A_long PF_MAX_PARAM_DESCRIPTION_LEN = 31;
constexpr A_long PF_MAX_PARAM_VALUE_LEN = 31;
constexpr A_long PF_MAX_EFFECT_MSG_LEN = 255;

constexpr A_long PF_LayerDefault_MYSELF = -1;
constexpr A_long PF_LayerDefault_NONE = 0;

// ---------------------------------------------------------------------------------------------------
// Custom UI: event mask, window types, events, event flags, panel areas, modifiers, cursors.

constexpr PF_CustomEventFlags PF_CustomEFlag_NONE = 0;
constexpr PF_CustomEventFlags PF_CustomEFlag_COMP = 0x1;
constexpr PF_CustomEventFlags PF_CustomEFlag_LAYER = 0x2;
constexpr PF_CustomEventFlags PF_CustomEFlag_EFFECT = 0x4;
constexpr PF_CustomEventFlags PF_CustomEFlag_PREVIEW = 0x8;

constexpr PF_WindowType PF_Window_NONE = -1;
constexpr PF_WindowType PF_Window_COMP = 0;
constexpr PF_WindowType PF_Window_LAYER = 1;
constexpr PF_WindowType PF_Window_EFFECT = 2;
constexpr PF_WindowType PF_Window_PREVIEW = 3;

constexpr PF_EventType PF_Event_NONE = -1;
constexpr PF_EventType PF_Event_NEW_CONTEXT = 0;
constexpr PF_EventType PF_Event_ACTIVATE = 1;
constexpr PF_EventType PF_Event_DO_CLICK = 2;
constexpr PF_EventType PF_Event_DRAG = 3;
constexpr PF_EventType PF_Event_DRAW = 4;
constexpr PF_EventType PF_Event_DEACTIVATE = 5;
constexpr PF_EventType PF_Event_CLOSE_CONTEXT = 6;
constexpr PF_EventType PF_Event_IDLE = 7;
constexpr PF_EventType PF_Event_KEYDOWN_OBSOLETE = 8;
constexpr PF_EventType PF_Event_ADJUST_CURSOR = 9;
constexpr PF_EventType PF_Event_KEYDOWN = 10;
constexpr PF_EventType PF_Event_MOUSE_EXITED = 11;

constexpr PF_EventOutFlags PF_EO_NONE = 0;
constexpr PF_EventOutFlags PF_EO_HANDLED_EVENT = 0x1;
constexpr PF_EventOutFlags PF_EO_ALWAYS_UPDATE = 0x2;
constexpr PF_EventOutFlags PF_EO_NEVER_UPDATE = 0x4;
constexpr PF_EventOutFlags PF_EO_UPDATE_NOW = 0x8;

constexpr PF_EventInFlags PF_EI_NONE = 0;
constexpr PF_EventInFlags PF_EI_DONT_DRAW = 0x1;

constexpr PF_EffectArea PF_EA_NONE = 0;
constexpr PF_EffectArea PF_EA_PARAM_TITLE = 1;
constexpr PF_EffectArea PF_EA_CONTROL = 2;

constexpr PF_Modifiers PF_Mod_NONE = 0x0000;
constexpr PF_Modifiers PF_Mod_CMD_CTRL_KEY = 0x0100;  // Cmd on the Mac, Ctrl on Windows
constexpr PF_Modifiers PF_Mod_SHIFT_KEY = 0x0200;
constexpr PF_Modifiers PF_Mod_CAPS_LOCK_KEY = 0x0400;
constexpr PF_Modifiers PF_Mod_OPT_ALT_KEY = 0x0800;
constexpr PF_Modifiers PF_Mod_MAC_CONTROL_KEY = 0x1000;

constexpr PF_UIAlignment PF_UIAlignment_NONE = 0;
constexpr PF_UIAlignment PF_UIAlignment_TOP = 0x1;
constexpr PF_UIAlignment PF_UIAlignment_LEFT = 0x2;
constexpr PF_UIAlignment PF_UIAlignment_BOTTOM = 0x4;
constexpr PF_UIAlignment PF_UIAlignment_RIGHT = 0x8;

constexpr A_u_long PF_CONTEXT_MAGIC = 0x05ea771e;

constexpr PF_CursorType PF_Cursor_NONE = 0;
constexpr PF_CursorType PF_Cursor_CUSTOM = 1;
constexpr PF_CursorType PF_Cursor_ARROW = 2;
constexpr PF_CursorType PF_Cursor_HOLLOW_ARROW = 3;
constexpr PF_CursorType PF_Cursor_WATCH_N_WAIT = 4;
constexpr PF_CursorType PF_Cursor_MAGNIFY = 5;
constexpr PF_CursorType PF_Cursor_MAGNIFY_PLUS = 6;
constexpr PF_CursorType PF_Cursor_MAGNIFY_MINUS = 7;
constexpr PF_CursorType PF_Cursor_CROSSHAIRS = 8;
constexpr PF_CursorType PF_Cursor_CROSS_RECT = 9;
constexpr PF_CursorType PF_Cursor_CROSS_OVAL = 10;
constexpr PF_CursorType PF_Cursor_CROSS_ROTATE = 11;
constexpr PF_CursorType PF_Cursor_PAN = 12;
constexpr PF_CursorType PF_Cursor_EYEDROPPER = 13;
constexpr PF_CursorType PF_Cursor_HAND = 14;

// ---------------------------------------------------------------------------------------------------
// Arbitrary-data callbacks.

constexpr PF_FunctionSelector PF_Arbitrary_NEW_FUNC = 0;
constexpr PF_FunctionSelector PF_Arbitrary_DISPOSE_FUNC = 1;
constexpr PF_FunctionSelector PF_Arbitrary_COPY_FUNC = 2;
constexpr PF_FunctionSelector PF_Arbitrary_FLAT_SIZE_FUNC = 3;
constexpr PF_FunctionSelector PF_Arbitrary_FLATTEN_FUNC = 4;
constexpr PF_FunctionSelector PF_Arbitrary_UNFLATTEN_FUNC = 5;
constexpr PF_FunctionSelector PF_Arbitrary_INTERP_FUNC = 6;
constexpr PF_FunctionSelector PF_Arbitrary_COMPARE_FUNC = 7;
constexpr PF_FunctionSelector PF_Arbitrary_PRINT_SIZE_FUNC = 8;
constexpr PF_FunctionSelector PF_Arbitrary_PRINT_FUNC = 9;
constexpr PF_FunctionSelector PF_Arbitrary_SCAN_FUNC = 10;

constexpr PF_ArbCompareResult PF_ArbCompare_EQUAL = 0;
constexpr PF_ArbCompareResult PF_ArbCompare_LESS = 1;
constexpr PF_ArbCompareResult PF_ArbCompare_MORE = 2;
constexpr PF_ArbCompareResult PF_ArbCompare_NOT_EQUAL = 3;

constexpr PF_ArbPrintFlags PF_ArbPrint_NONE = 0;
constexpr PF_ArbPrintFlags PF_ArbPrint_ABBREVIATED = 1;

// ---------------------------------------------------------------------------------------------------
// Other enumerations.

constexpr PF_Field PF_Field_FRAME = 0;
constexpr PF_Field PF_Field_UPPER = 1;
constexpr PF_Field PF_Field_LOWER = 2;

constexpr PF_WorldFlags PF_WorldFlag_DEEP = 0x1;
constexpr PF_WorldFlags PF_WorldFlag_WRITEABLE = 0x2;

constexpr PF_Stage PF_Stage_DEVELOP = 0;
constexpr PF_Stage PF_Stage_ALPHA = 1;
constexpr PF_Stage PF_Stage_BETA = 2;
constexpr PF_Stage PF_Stage_RELEASE = 3;

constexpr PF_Quality PF_Quality_DRAWING_AUDIO = -1;
constexpr PF_Quality PF_Quality_LO = 0;
constexpr PF_Quality PF_Quality_HI = 1;

constexpr PF_ChannelMask PF_ChannelMask_ALPHA = 0x1;
constexpr PF_ChannelMask PF_ChannelMask_RED = 0x2;
constexpr PF_ChannelMask PF_ChannelMask_GREEN = 0x4;
constexpr PF_ChannelMask PF_ChannelMask_BLUE = 0x8;
constexpr PF_ChannelMask PF_ChannelMask_ARGB = 0xF;

constexpr PF_RenderOutputFlags PF_RenderOutputFlag_RETURNS_EXTRA_PIXELS = 0x1;
constexpr PF_RenderOutputFlags PF_RenderOutputFlag_RESERVED = 0x2;

constexpr PF_App_ColorType PF_App_Color_NONE = -1;
constexpr PF_App_ColorType PF_App_Color_FRAME = 0;
constexpr PF_App_ColorType PF_App_Color_FILL = 1;
constexpr PF_App_ColorType PF_App_Color_TEXT = 2;
constexpr PF_App_ColorType PF_App_Color_LIGHT_TINGE = 3;
constexpr PF_App_ColorType PF_App_Color_DARK_TINGE = 4;
constexpr PF_App_ColorType PF_App_Color_HILITE = 5;
constexpr PF_App_ColorType PF_App_Color_SHADOW = 6;

// Effect version word: build 0..8, stage 9..10, bug-fix 11..14, sub-version 15..18, version 19..21,
// and the version's higher bits at 26..29.
constexpr A_u_long PF_Version(A_u_long vers, A_u_long subvers, A_u_long bugvers, A_u_long stage, A_u_long build) {
    return ((vers >> 3) & 0xF) << 26 | (vers & 0x7) << 19 | (subvers & 0xF) << 15 | (bugvers & 0xF) << 11 |
           (stage & 0x3) << 9 | (build & 0x1FF);
}

// ---------------------------------------------------------------------------------------------------
// Pixel formats. The host builds these codes with the first letter in the lowest byte, so the word's
// bytes in little-endian memory spell the letters in order (unlike a compiler multi-character literal).

constexpr A_long PF_MakePixelFormatFourcc(char c0, char c1, char c2, char c3) {
    return static_cast<A_long>(
        static_cast<uint32_t>(static_cast<uint8_t>(c0)) | static_cast<uint32_t>(static_cast<uint8_t>(c1)) << 8 |
        static_cast<uint32_t>(static_cast<uint8_t>(c2)) << 16 | static_cast<uint32_t>(static_cast<uint8_t>(c3)) << 24);
}

constexpr PF_PixelFormat PF_PixelFormat_ARGB32 = PF_MakePixelFormatFourcc('a', 'r', 'g', 'b');
constexpr PF_PixelFormat PF_PixelFormat_ARGB64 = PF_MakePixelFormatFourcc('a', 'e', '1', '6');
constexpr PF_PixelFormat PF_PixelFormat_ARGB128 = PF_MakePixelFormatFourcc('a', 'e', '3', '2');
constexpr PF_PixelFormat PF_PixelFormat_BGRA32 = PF_MakePixelFormatFourcc('b', 'g', 'r', 'a');
constexpr PF_PixelFormat PF_PixelFormat_VUYA32 = PF_MakePixelFormatFourcc('v', 'u', 'y', 'a');
constexpr PF_PixelFormat PF_PixelFormat_INVALID = PF_MakePixelFormatFourcc('b', 'a', 'd', 'f');

constexpr PrPixelFormat PrPixelFormat_BGRA_4444_8u = PF_MakePixelFormatFourcc('b', 'g', 'r', 'a');
constexpr PrPixelFormat PrPixelFormat_VUYA_4444_8u = PF_MakePixelFormatFourcc('v', 'u', 'y', 'a');
constexpr PrPixelFormat PrPixelFormat_VUYA_4444_8u_709 = PF_MakePixelFormatFourcc('V', 'U', 'Y', 'A');
constexpr PrPixelFormat PrPixelFormat_ARGB_4444_8u = PF_MakePixelFormatFourcc('a', 'r', 'g', 'b');
constexpr PrPixelFormat PrPixelFormat_BGRA_4444_16u = PF_MakePixelFormatFourcc('B', 'g', 'r', 'a');
constexpr PrPixelFormat PrPixelFormat_VUYA_4444_16u = PF_MakePixelFormatFourcc('V', 'u', 'y', 'a');
constexpr PrPixelFormat PrPixelFormat_ARGB_4444_16u = PF_MakePixelFormatFourcc('A', 'r', 'g', 'b');
constexpr PrPixelFormat PrPixelFormat_BGRA_4444_32f = PF_MakePixelFormatFourcc('B', 'G', 'r', 'a');
constexpr PrPixelFormat PrPixelFormat_VUYA_4444_32f = PF_MakePixelFormatFourcc('V', 'U', 'y', 'a');
constexpr PrPixelFormat PrPixelFormat_VUYA_4444_32f_709 = PF_MakePixelFormatFourcc('v', 'U', 'Y', 'a');
constexpr PrPixelFormat PrPixelFormat_ARGB_4444_32f = PF_MakePixelFormatFourcc('A', 'R', 'g', 'b');

static_assert(PF_PixelFormat_ARGB32 == 0x62677261);
static_assert(PF_PixelFormat_BGRA32 == 0x61726762);
static_assert(PF_PixelFormat_VUYA32 == 0x61797576);
static_assert(PrPixelFormat_BGRA_4444_32f == 0x61724742);
static_assert(PrPixelFormat_VUYA_4444_32f == 0x61795556);
static_assert(PrPixelFormat_ARGB_4444_32f == 0x62675241);

// ---------------------------------------------------------------------------------------------------
// Small records.

struct PF_Point {
    A_long h;  // x
    A_long v;  // y
};
static_assert(sizeof(PF_Point) == 8);
static_assert(offsetof(PF_Point, h) == 0 && offsetof(PF_Point, v) == 4);

struct PF_LRect {
    A_long left;
    A_long top;
    A_long right;
    A_long bottom;
};
typedef PF_LRect PF_Rect;
typedef PF_LRect PF_UnionableRect;
static_assert(sizeof(PF_LRect) == 16);
static_assert(offsetof(PF_LRect, left) == 0 && offsetof(PF_LRect, top) == 4);
static_assert(offsetof(PF_LRect, right) == 8 && offsetof(PF_LRect, bottom) == 12);

struct PF_RationalScale {
    A_long num;
    A_u_long den;
};
static_assert(sizeof(PF_RationalScale) == 8);
static_assert(offsetof(PF_RationalScale, num) == 0 && offsetof(PF_RationalScale, den) == 4);

struct PF_SpecVersion {
    A_short major;
    A_short minor;
};
static_assert(sizeof(PF_SpecVersion) == 4);
static_assert(offsetof(PF_SpecVersion, major) == 0 && offsetof(PF_SpecVersion, minor) == 2);

struct PF_Pixel {
    A_u_char alpha;
    A_u_char red;
    A_u_char green;
    A_u_char blue;
};
typedef PF_Pixel PF_Pixel8;
typedef PF_Pixel* PF_PixelPtr;
static_assert(sizeof(PF_Pixel) == 4);
static_assert(offsetof(PF_Pixel, alpha) == 0 && offsetof(PF_Pixel, red) == 1);
static_assert(offsetof(PF_Pixel, green) == 2 && offsetof(PF_Pixel, blue) == 3);

struct PF_Pixel16 {
    A_u_short alpha;
    A_u_short red;
    A_u_short green;
    A_u_short blue;
};
static_assert(sizeof(PF_Pixel16) == 8);
static_assert(offsetof(PF_Pixel16, alpha) == 0 && offsetof(PF_Pixel16, red) == 2);
static_assert(offsetof(PF_Pixel16, green) == 4 && offsetof(PF_Pixel16, blue) == 6);

struct PF_PixelFloat {
    PF_FpShort alpha;
    PF_FpShort red;
    PF_FpShort green;
    PF_FpShort blue;
};
typedef PF_PixelFloat PF_Pixel32;
static_assert(sizeof(PF_PixelFloat) == 16);
static_assert(offsetof(PF_PixelFloat, alpha) == 0 && offsetof(PF_PixelFloat, red) == 4);
static_assert(offsetof(PF_PixelFloat, green) == 8 && offsetof(PF_PixelFloat, blue) == 12);

struct PF_App_Color {
    A_u_short red;
    A_u_short green;
    A_u_short blue;
};
static_assert(sizeof(PF_App_Color) == 6);
static_assert(offsetof(PF_App_Color, red) == 0 && offsetof(PF_App_Color, green) == 2);
static_assert(offsetof(PF_App_Color, blue) == 4);

struct PF_SoundFormatInfo {
    PF_FpLong rateF;
    A_short num_channels;
    A_short format;
    A_short sample_size;
};
static_assert(sizeof(PF_SoundFormatInfo) == 16);
static_assert(offsetof(PF_SoundFormatInfo, rateF) == 0);
static_assert(offsetof(PF_SoundFormatInfo, num_channels) == 8);
static_assert(offsetof(PF_SoundFormatInfo, format) == 10);
static_assert(offsetof(PF_SoundFormatInfo, sample_size) == 12);

struct PF_SoundWorld {
    PF_SoundFormatInfo fi;
    A_long num_samples;
    void* dataP;
};
static_assert(sizeof(PF_SoundWorld) == 32);
static_assert(offsetof(PF_SoundWorld, fi) == 0);
static_assert(offsetof(PF_SoundWorld, num_samples) == 16);
static_assert(offsetof(PF_SoundWorld, dataP) == 24);

struct PF_UserChangedParamExtra {
    PF_ParamIndex param_index;
};
static_assert(sizeof(PF_UserChangedParamExtra) == 4);
static_assert(offsetof(PF_UserChangedParamExtra, param_index) == 0);

// ---------------------------------------------------------------------------------------------------
// Layers (the input parameter, the output, and worlds of the smart-render callbacks).

struct PF_LayerDef {
    void* reserved0;
    void* reserved1;
    PF_WorldFlags world_flags;
    PF_PixelPtr data;
    A_long rowbytes;  // may be negative (bottom-up layers)
    A_long width;
    A_long height;
    PF_UnionableRect extent_hint;
    void* platform_ref;
    A_long reserved_long1;
    void* reserved_long4;
    PF_RationalScale pix_aspect_ratio;
    void* reserved_long2;
    A_long origin_x;
    A_long origin_y;
    A_long reserved_long3;
    A_long dephault;
};
typedef PF_LayerDef PF_EffectWorld;
static_assert(sizeof(PF_LayerDef) == 120);
static_assert(offsetof(PF_LayerDef, reserved0) == 0);
static_assert(offsetof(PF_LayerDef, reserved1) == 8);
static_assert(offsetof(PF_LayerDef, world_flags) == 16);
static_assert(offsetof(PF_LayerDef, data) == 24);
static_assert(offsetof(PF_LayerDef, rowbytes) == 32);
static_assert(offsetof(PF_LayerDef, width) == 36);
static_assert(offsetof(PF_LayerDef, height) == 40);
static_assert(offsetof(PF_LayerDef, extent_hint) == 44);
static_assert(offsetof(PF_LayerDef, platform_ref) == 64);
static_assert(offsetof(PF_LayerDef, reserved_long1) == 72);
static_assert(offsetof(PF_LayerDef, reserved_long4) == 80);
static_assert(offsetof(PF_LayerDef, pix_aspect_ratio) == 88);
static_assert(offsetof(PF_LayerDef, reserved_long2) == 96);
static_assert(offsetof(PF_LayerDef, origin_x) == 104);
static_assert(offsetof(PF_LayerDef, origin_y) == 108);
static_assert(offsetof(PF_LayerDef, reserved_long3) == 112);
static_assert(offsetof(PF_LayerDef, dephault) == 116);

// ---------------------------------------------------------------------------------------------------
// Parameter definitions.

struct PF_SliderDef {
    PF_ParamValue value;
    A_char value_str[PF_MAX_PARAM_VALUE_LEN + 1];
    A_char value_desc[PF_MAX_PARAM_DESCRIPTION_LEN + 1];
    PF_ParamValue valid_min;
    PF_ParamValue valid_max;
    PF_ParamValue slider_min;
    PF_ParamValue slider_max;
    PF_ParamValue dephault;
};
static_assert(sizeof(PF_SliderDef) == 88);
static_assert(offsetof(PF_SliderDef, value_str) == 4);
static_assert(offsetof(PF_SliderDef, value_desc) == 36);
static_assert(offsetof(PF_SliderDef, valid_min) == 68);
static_assert(offsetof(PF_SliderDef, dephault) == 84);

struct PF_FixedSliderDef {
    PF_Fixed value;
    A_char value_str[PF_MAX_PARAM_VALUE_LEN + 1];
    A_char value_desc[PF_MAX_PARAM_DESCRIPTION_LEN + 1];
    PF_Fixed valid_min;
    PF_Fixed valid_max;
    PF_Fixed slider_min;
    PF_Fixed slider_max;
    PF_Fixed dephault;
    A_short precision;
    A_short display_flags;
};
static_assert(sizeof(PF_FixedSliderDef) == 92);
static_assert(offsetof(PF_FixedSliderDef, dephault) == 84);
static_assert(offsetof(PF_FixedSliderDef, precision) == 88);
static_assert(offsetof(PF_FixedSliderDef, display_flags) == 90);

struct PF_AngleDef {
    PF_Fixed value;
    PF_Fixed dephault;
    PF_Fixed valid_min;
    PF_Fixed valid_max;
};
static_assert(sizeof(PF_AngleDef) == 16);

struct PF_CheckBoxDef {
    A_long value;
    PF_Boolean dephault;
    A_char reserved;
    A_short reserved1;
    union {
        const A_char* nameptr;  // label text beside the box
    } u;
};
static_assert(sizeof(PF_CheckBoxDef) == 16);
static_assert(offsetof(PF_CheckBoxDef, value) == 0);
static_assert(offsetof(PF_CheckBoxDef, dephault) == 4);
static_assert(offsetof(PF_CheckBoxDef, reserved) == 5);
static_assert(offsetof(PF_CheckBoxDef, reserved1) == 6);
static_assert(offsetof(PF_CheckBoxDef, u) == 8);

struct PF_ColorDef {
    PF_Pixel value;
    PF_Pixel dephault;
};
static_assert(sizeof(PF_ColorDef) == 8);

struct PF_PointDef {
    PF_Fixed x_value;
    PF_Fixed y_value;
    A_char reserved[3];
    PF_Boolean restrict_bounds;
    PF_Fixed x_dephault;
    PF_Fixed y_dephault;
};
static_assert(sizeof(PF_PointDef) == 20);
static_assert(offsetof(PF_PointDef, restrict_bounds) == 11);
static_assert(offsetof(PF_PointDef, x_dephault) == 12);

struct PF_PopupDef {
    A_long value;  // counts from 1
    A_short num_choices;
    A_short dephault;
    union {
        const A_char* namesptr;  // choices separated by '|'
    } u;
};
static_assert(sizeof(PF_PopupDef) == 16);
static_assert(offsetof(PF_PopupDef, value) == 0);
static_assert(offsetof(PF_PopupDef, num_choices) == 4);
static_assert(offsetof(PF_PopupDef, dephault) == 6);
static_assert(offsetof(PF_PopupDef, u) == 8);

// The value is double precision, the range and default single precision.
struct PF_FloatSliderDef {
    PF_FpLong value;
    PF_FpLong phase;
    A_char value_desc[PF_MAX_PARAM_DESCRIPTION_LEN + 1];
    PF_FpShort valid_min;
    PF_FpShort valid_max;
    PF_FpShort slider_min;
    PF_FpShort slider_max;
    PF_FpShort dephault;
    A_short precision;
    PF_ValueDisplayFlags display_flags;
    PF_FSliderFlags fs_flags;
    PF_FpShort curve_tolerance;
    PF_Boolean useExponent;  // the exponent pair is read only by the Premiere family
    PF_FpShort exponent;
};
static_assert(sizeof(PF_FloatSliderDef) == 88);
static_assert(offsetof(PF_FloatSliderDef, value) == 0);
static_assert(offsetof(PF_FloatSliderDef, phase) == 8);
static_assert(offsetof(PF_FloatSliderDef, value_desc) == 16);
static_assert(offsetof(PF_FloatSliderDef, valid_min) == 48);
static_assert(offsetof(PF_FloatSliderDef, valid_max) == 52);
static_assert(offsetof(PF_FloatSliderDef, slider_min) == 56);
static_assert(offsetof(PF_FloatSliderDef, slider_max) == 60);
static_assert(offsetof(PF_FloatSliderDef, dephault) == 64);
static_assert(offsetof(PF_FloatSliderDef, precision) == 68);
static_assert(offsetof(PF_FloatSliderDef, display_flags) == 70);
static_assert(offsetof(PF_FloatSliderDef, fs_flags) == 72);
static_assert(offsetof(PF_FloatSliderDef, curve_tolerance) == 76);
static_assert(offsetof(PF_FloatSliderDef, useExponent) == 80);
static_assert(offsetof(PF_FloatSliderDef, exponent) == 84);

struct PF_ArbitraryDef {
    A_short id;
    A_short pad;
    PF_ArbitraryH dephault;  // owned by the host once add_param returns
    PF_ArbitraryH value;     // null at add_param time
    void* refconPV;
};
static_assert(sizeof(PF_ArbitraryDef) == 32);
static_assert(offsetof(PF_ArbitraryDef, id) == 0);
static_assert(offsetof(PF_ArbitraryDef, pad) == 2);
static_assert(offsetof(PF_ArbitraryDef, dephault) == 8);
static_assert(offsetof(PF_ArbitraryDef, value) == 16);
static_assert(offsetof(PF_ArbitraryDef, refconPV) == 24);

struct PF_PathDef {
    PF_PathID path_id;
    A_long reserved0;
    A_long dephault;
};
static_assert(sizeof(PF_PathDef) == 12);

struct PF_ButtonDef {
    PF_ParamValue value;
    union {
        const A_char* namesptr;
    } u;
};
static_assert(sizeof(PF_ButtonDef) == 16);
static_assert(offsetof(PF_ButtonDef, u) == 8);

struct PF_Point3DDef {
    PF_FpLong x_value;
    PF_FpLong y_value;
    PF_FpLong z_value;
    PF_FpLong x_dephault;
    PF_FpLong y_dephault;
    PF_FpLong z_dephault;
    A_char reserved[16];
};
static_assert(sizeof(PF_Point3DDef) == 64);
static_assert(offsetof(PF_Point3DDef, reserved) == 48);

union PF_ParamDefUnion {
    PF_LayerDef ld;
    PF_SliderDef sd;
    PF_FixedSliderDef fd;
    PF_AngleDef ad;
    PF_CheckBoxDef bd;
    PF_ColorDef cd;
    PF_PointDef td;
    PF_PopupDef pd;
    PF_FloatSliderDef fs_d;
    PF_ArbitraryDef arb_d;
    PF_PathDef path_d;
    PF_ButtonDef button_d;
    PF_Point3DDef point3d_d;
};
static_assert(sizeof(PF_ParamDefUnion) == 120);

struct PF_ParamDef {
    union {
        A_long id;                    // at add_param time
        PF_ChangeFlags change_flags;  // at every other time
    } uu;
    PF_ParamUIFlags ui_flags;
    A_short ui_width;  // only with PF_PUI_CONTROL
    A_short ui_height;
    PF_ParamType param_type;
    A_char name[32];
    PF_ParamFlags flags;
    A_long unused;
    PF_ParamDefUnion u;
};
typedef PF_ParamDef* PF_ParamDefPtr;
typedef PF_ParamDef** PF_ParamList;  // params[0] is the input layer
static_assert(sizeof(PF_ParamDef) == 176);
static_assert(offsetof(PF_ParamDef, uu) == 0);
static_assert(offsetof(PF_ParamDef, ui_flags) == 4);
static_assert(offsetof(PF_ParamDef, ui_width) == 8);
static_assert(offsetof(PF_ParamDef, ui_height) == 10);
static_assert(offsetof(PF_ParamDef, param_type) == 12);
static_assert(offsetof(PF_ParamDef, name) == 16);
static_assert(offsetof(PF_ParamDef, flags) == 48);
static_assert(offsetof(PF_ParamDef, unused) == 52);
static_assert(offsetof(PF_ParamDef, u) == 56);

// ---------------------------------------------------------------------------------------------------
// Interaction callbacks (in_data->inter).

struct PF_CustomUIInfo;

struct PF_InteractCallbacks {
    // `param` must not point into the params array the host passed in.
    PF_Err(SPAPI* checkout_param)(PF_ProgPtr effect_ref, PF_ParamIndex index, A_long what_time, A_long time_step,
                                  A_u_long time_scale, PF_ParamDef* param);
    PF_Err(SPAPI* checkin_param)(PF_ProgPtr effect_ref, PF_ParamDef* param);
    // index -1 appends.
    PF_Err(SPAPI* add_param)(PF_ProgPtr effect_ref, PF_ParamIndex index, PF_ParamDefPtr def);
    PF_Err(SPAPI* abort)(PF_ProgPtr effect_ref);
    PF_Err(SPAPI* progress)(PF_ProgPtr effect_ref, A_long current, A_long total);
    PF_Err(SPAPI* register_ui)(PF_ProgPtr effect_ref, PF_CustomUIInfo* cust_info);
    PF_UnusedProc checkout_layer_audio;
    PF_UnusedProc checkin_layer_audio;
    PF_UnusedProc get_audio_data;
    void* reserved_str[3];
    void* reserved[10];
};
static_assert(sizeof(PF_InteractCallbacks) == 176);
static_assert(offsetof(PF_InteractCallbacks, checkout_param) == 0);
static_assert(offsetof(PF_InteractCallbacks, checkin_param) == 8);
static_assert(offsetof(PF_InteractCallbacks, add_param) == 16);
static_assert(offsetof(PF_InteractCallbacks, abort) == 24);
static_assert(offsetof(PF_InteractCallbacks, progress) == 32);
static_assert(offsetof(PF_InteractCallbacks, register_ui) == 40);
static_assert(offsetof(PF_InteractCallbacks, checkout_layer_audio) == 48);
static_assert(offsetof(PF_InteractCallbacks, checkin_layer_audio) == 56);
static_assert(offsetof(PF_InteractCallbacks, get_audio_data) == 64);
static_assert(offsetof(PF_InteractCallbacks, reserved_str) == 72);
static_assert(offsetof(PF_InteractCallbacks, reserved) == 96);

// ---------------------------------------------------------------------------------------------------
// Utility callbacks (in_data->utils).

struct PF_ANSICallbacks {
    A_FpLong(SPAPI* atan)(A_FpLong);
    A_FpLong(SPAPI* atan2)(A_FpLong y, A_FpLong x);
    A_FpLong(SPAPI* ceil)(A_FpLong);
    A_FpLong(SPAPI* cos)(A_FpLong);
    A_FpLong(SPAPI* exp)(A_FpLong);
    A_FpLong(SPAPI* fabs)(A_FpLong);
    A_FpLong(SPAPI* floor)(A_FpLong);
    A_FpLong(SPAPI* fmod)(A_FpLong x, A_FpLong y);
    A_FpLong(SPAPI* hypot)(A_FpLong x, A_FpLong y);
    A_FpLong(SPAPI* log)(A_FpLong);
    A_FpLong(SPAPI* log10)(A_FpLong);
    A_FpLong(SPAPI* pow)(A_FpLong x, A_FpLong y);
    A_FpLong(SPAPI* sin)(A_FpLong);
    A_FpLong(SPAPI* sqrt)(A_FpLong);
    A_FpLong(SPAPI* tan)(A_FpLong);
    int(SPAPI* sprintf)(A_char*, const A_char*, ...);
    A_char*(SPAPI* strcpy)(A_char*, const A_char*);
    A_FpLong(SPAPI* asin)(A_FpLong);
    A_FpLong(SPAPI* acos)(A_FpLong);
    A_long ansi_procs[1];
};
static_assert(sizeof(PF_ANSICallbacks) == 160);
static_assert(offsetof(PF_ANSICallbacks, acos) == 144);
static_assert(offsetof(PF_ANSICallbacks, ansi_procs) == 152);

struct PF_ColorCallbacks {
    PF_UnusedProc RGBtoHLS;
    PF_UnusedProc HLStoRGB;
    PF_UnusedProc RGBtoYIQ;
    PF_UnusedProc YIQtoRGB;
    PF_UnusedProc Luminance;
    PF_UnusedProc Hue;
    PF_UnusedProc Lightness;
    PF_UnusedProc Saturation;
};
static_assert(sizeof(PF_ColorCallbacks) == 64);

struct PF_UtilCallbacks {
    PF_UnusedProc begin_sampling;
    PF_UnusedProc subpixel_sample;
    PF_UnusedProc area_sample;
    void* get_batch_func_is_deprecated;
    PF_UnusedProc end_sampling;
    PF_UnusedProc composite_rect;
    PF_UnusedProc blend;
    PF_UnusedProc convolve;
    PF_UnusedProc copy;
    // A null colour fills with zero pixels; a null rectangle fills the whole world.
    PF_Err(SPAPI* fill)(PF_ProgPtr effect_ref, const PF_Pixel* color, const PF_Rect* dst_rect, PF_EffectWorld* world);
    PF_UnusedProc gaussian_kernel;
    PF_UnusedProc iterate;
    PF_UnusedProc premultiply;
    PF_UnusedProc premultiply_color;
    PF_UnusedProc new_world;
    PF_UnusedProc dispose_world;
    PF_UnusedProc iterate_origin;
    PF_UnusedProc iterate_lut;
    PF_UnusedProc transfer_rect;
    PF_UnusedProc transform_world;
    PF_Handle(SPAPI* host_new_handle)(A_u_longlong size);
    void*(SPAPI* host_lock_handle)(PF_Handle pf_handle);
    void(SPAPI* host_unlock_handle)(PF_Handle pf_handle);
    void(SPAPI* host_dispose_handle)(PF_Handle pf_handle);
    PF_UnusedProc get_callback_addr;
    PF_UnusedProc app;
    PF_ANSICallbacks ansi;
    PF_ColorCallbacks colorCB;
    PF_Err(SPAPI* get_platform_data)(PF_ProgPtr effect_ref, PF_PlatDataID which, void* data);
    A_u_longlong(SPAPI* host_get_handle_size)(PF_Handle pf_handle);
    PF_UnusedProc iterate_origin_non_clip_src;
    PF_UnusedProc iterate_generic;
    PF_Err(SPAPI* host_resize_handle)(A_u_longlong new_sizeL, PF_Handle* handleP);
    PF_UnusedProc subpixel_sample16;
    PF_UnusedProc area_sample16;
    PF_UnusedProc fill16;
    PF_UnusedProc premultiply_color16;
    PF_UnusedProc iterate16;
    PF_UnusedProc iterate_origin16;
    PF_UnusedProc iterate_origin_non_clip_src16;
    PF_UnusedProc get_pixel_data8;
    PF_UnusedProc get_pixel_data16;
    A_long reserved[1];
};
static_assert(sizeof(PF_UtilCallbacks) == 552);
static_assert(offsetof(PF_UtilCallbacks, begin_sampling) == 0);
static_assert(offsetof(PF_UtilCallbacks, get_batch_func_is_deprecated) == 24);
static_assert(offsetof(PF_UtilCallbacks, fill) == 72);
static_assert(offsetof(PF_UtilCallbacks, transform_world) == 152);
static_assert(offsetof(PF_UtilCallbacks, host_new_handle) == 160);
static_assert(offsetof(PF_UtilCallbacks, host_lock_handle) == 168);
static_assert(offsetof(PF_UtilCallbacks, host_unlock_handle) == 176);
static_assert(offsetof(PF_UtilCallbacks, host_dispose_handle) == 184);
static_assert(offsetof(PF_UtilCallbacks, get_callback_addr) == 192);
static_assert(offsetof(PF_UtilCallbacks, app) == 200);
static_assert(offsetof(PF_UtilCallbacks, ansi) == 208);
static_assert(offsetof(PF_UtilCallbacks, colorCB) == 368);
static_assert(offsetof(PF_UtilCallbacks, get_platform_data) == 432);
static_assert(offsetof(PF_UtilCallbacks, host_get_handle_size) == 440);
static_assert(offsetof(PF_UtilCallbacks, iterate_origin_non_clip_src) == 448);
static_assert(offsetof(PF_UtilCallbacks, iterate_generic) == 456);
static_assert(offsetof(PF_UtilCallbacks, host_resize_handle) == 464);
static_assert(offsetof(PF_UtilCallbacks, subpixel_sample16) == 472);
static_assert(offsetof(PF_UtilCallbacks, get_pixel_data8) == 528);
static_assert(offsetof(PF_UtilCallbacks, get_pixel_data16) == 536);
static_assert(offsetof(PF_UtilCallbacks, reserved) == 544);

// ---------------------------------------------------------------------------------------------------
// The host's parameter blocks.

struct PF_InData {
    PF_InteractCallbacks inter;
    PF_UtilCallbacks* utils;
    PF_ProgPtr effect_ref;
    PF_Quality quality;
    PF_SpecVersion version;
    A_long serial_num;
    A_long appl_id;
    A_long num_params;
    A_long reserved;
    A_long what_cpu;
    A_long what_fpu;
    A_long current_time;
    A_long time_step;
    A_long total_time;
    A_long local_time_step;
    A_u_long time_scale;
    PF_Field field;
    PF_Fixed shutter_angle;
    A_long width;
    A_long height;
    PF_Rect extent_hint;
    A_long output_origin_x;
    A_long output_origin_y;
    PF_RationalScale downsample_x;
    PF_RationalScale downsample_y;
    PF_RationalScale pixel_aspect_ratio;
    PF_InFlags in_flags;
    PF_Handle global_data;
    PF_Handle sequence_data;
    PF_Handle frame_data;
    A_long start_sampL;
    A_long dur_sampL;
    A_long total_sampL;
    PF_SoundWorld src_snd;
    SPBasicSuite* pica_basicP;
    A_long pre_effect_source_origin_x;
    A_long pre_effect_source_origin_y;
    PF_Fixed shutter_phase;
};
static_assert(sizeof(PF_InData) == 408);
static_assert(offsetof(PF_InData, inter) == 0);
static_assert(offsetof(PF_InData, utils) == 176);
static_assert(offsetof(PF_InData, effect_ref) == 184);
static_assert(offsetof(PF_InData, quality) == 192);
static_assert(offsetof(PF_InData, version) == 196);
static_assert(offsetof(PF_InData, version) + offsetof(PF_SpecVersion, minor) == 198);
static_assert(offsetof(PF_InData, serial_num) == 200);
static_assert(offsetof(PF_InData, appl_id) == 204);
static_assert(offsetof(PF_InData, num_params) == 208);
static_assert(offsetof(PF_InData, reserved) == 212);
static_assert(offsetof(PF_InData, what_cpu) == 216);
static_assert(offsetof(PF_InData, what_fpu) == 220);
static_assert(offsetof(PF_InData, current_time) == 224);
static_assert(offsetof(PF_InData, time_step) == 228);
static_assert(offsetof(PF_InData, total_time) == 232);
static_assert(offsetof(PF_InData, local_time_step) == 236);
static_assert(offsetof(PF_InData, time_scale) == 240);
static_assert(offsetof(PF_InData, field) == 244);
static_assert(offsetof(PF_InData, shutter_angle) == 248);
static_assert(offsetof(PF_InData, width) == 252);
static_assert(offsetof(PF_InData, height) == 256);
static_assert(offsetof(PF_InData, extent_hint) == 260);
static_assert(offsetof(PF_InData, output_origin_x) == 276);
static_assert(offsetof(PF_InData, output_origin_y) == 280);
static_assert(offsetof(PF_InData, downsample_x) == 284);
static_assert(offsetof(PF_InData, downsample_y) == 292);
static_assert(offsetof(PF_InData, pixel_aspect_ratio) == 300);
static_assert(offsetof(PF_InData, in_flags) == 308);
static_assert(offsetof(PF_InData, global_data) == 312);
static_assert(offsetof(PF_InData, sequence_data) == 320);
static_assert(offsetof(PF_InData, frame_data) == 328);
static_assert(offsetof(PF_InData, start_sampL) == 336);
static_assert(offsetof(PF_InData, dur_sampL) == 340);
static_assert(offsetof(PF_InData, total_sampL) == 344);
static_assert(offsetof(PF_InData, src_snd) == 352);
static_assert(offsetof(PF_InData, pica_basicP) == 384);
static_assert(offsetof(PF_InData, pre_effect_source_origin_x) == 392);
static_assert(offsetof(PF_InData, pre_effect_source_origin_y) == 396);
static_assert(offsetof(PF_InData, shutter_phase) == 400);

struct PF_OutData {
    A_u_long my_version;
    A_char name[32];
    PF_Handle global_data;
    A_long num_params;
    PF_Handle sequence_data;
    A_long flat_sdata_size;  // obsolete
    PF_Handle frame_data;
    A_long width;
    A_long height;
    PF_Point origin;
    PF_OutFlags out_flags;
    A_char return_msg[PF_MAX_EFFECT_MSG_LEN + 1];
    A_long start_sampL;
    A_long dur_sampL;
    PF_SoundWorld dest_snd;
    PF_OutFlags2 out_flags2;
};
static_assert(sizeof(PF_OutData) == 408);
static_assert(offsetof(PF_OutData, my_version) == 0);
static_assert(offsetof(PF_OutData, name) == 4);
static_assert(offsetof(PF_OutData, global_data) == 40);
static_assert(offsetof(PF_OutData, num_params) == 48);
static_assert(offsetof(PF_OutData, sequence_data) == 56);
static_assert(offsetof(PF_OutData, flat_sdata_size) == 64);
static_assert(offsetof(PF_OutData, frame_data) == 72);
static_assert(offsetof(PF_OutData, width) == 80);
static_assert(offsetof(PF_OutData, height) == 84);
static_assert(offsetof(PF_OutData, origin) == 88);
static_assert(offsetof(PF_OutData, out_flags) == 96);
static_assert(offsetof(PF_OutData, return_msg) == 100);
static_assert(offsetof(PF_OutData, start_sampL) == 356);
static_assert(offsetof(PF_OutData, dur_sampL) == 360);
static_assert(offsetof(PF_OutData, dest_snd) == 368);
static_assert(offsetof(PF_OutData, out_flags2) == 400);

// ---------------------------------------------------------------------------------------------------
// Arbitrary-data callbacks (extra of PF_Cmd_ARBITRARY_CALLBACK). Handles handed out through the `out`
// members below belong to the caller.

struct PF_ArbParamsExtra {
    PF_FunctionSelector which_function;
    A_short id;  // the arbitrary id given at add_param time
    A_short padding;
    union {
        struct {
            void* refconPV;
            PF_ArbitraryH* arbPH;  // out
        } new_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH arbH;
        } dispose_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH src_arbH;
            PF_ArbitraryH* dst_arbPH;  // out
        } copy_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH arbH;
            A_u_long* flat_data_sizePLu;  // out
        } flat_size_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH arbH;
            A_u_long buf_sizeLu;
            void* flat_dataPV;  // allocated by the host, buf_sizeLu bytes
        } flatten_func_params;
        struct {
            void* refconPV;
            A_u_long buf_sizeLu;
            const void* flat_dataPV;
            PF_ArbitraryH* arbPH;  // out
        } unflatten_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH left_arbH;
            PF_ArbitraryH right_arbH;
            PF_FpLong tF;             // 0..1
            PF_ArbitraryH* interpPH;  // out
        } interp_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH a_arbH;
            PF_ArbitraryH b_arbH;
            PF_ArbCompareResult* compareP;  // out
        } compare_func_params;
        struct {
            void* refconPV;
            PF_ArbitraryH arbH;
            A_u_long* print_sizePLu;  // out
        } print_size_func_params;
        struct {
            void* refconPV;
            PF_ArbPrintFlags print_flags;
            PF_ArbitraryH arbH;
            A_u_long print_sizeLu;
            A_char* print_bufferPC;
        } print_func_params;
        struct {
            void* refconPV;
            const A_char* bufPC;
            A_u_long bytes_to_scanLu;
            PF_ArbitraryH* arbPH;  // out
        } scan_func_params;
    } u;
};

#define VT_ARB_OFFSET(member, field) \
    (offsetof(PF_ArbParamsExtra, u) + offsetof(decltype(PF_ArbParamsExtra::u.member), field))
static_assert(sizeof(PF_ArbParamsExtra) == 48);
static_assert(offsetof(PF_ArbParamsExtra, which_function) == 0);
static_assert(offsetof(PF_ArbParamsExtra, id) == 4);
static_assert(offsetof(PF_ArbParamsExtra, padding) == 6);
static_assert(offsetof(PF_ArbParamsExtra, u) == 8);
static_assert(VT_ARB_OFFSET(new_func_params, refconPV) == 8);
static_assert(VT_ARB_OFFSET(new_func_params, arbPH) == 16);
static_assert(VT_ARB_OFFSET(dispose_func_params, arbH) == 16);
static_assert(VT_ARB_OFFSET(copy_func_params, src_arbH) == 16);
static_assert(VT_ARB_OFFSET(copy_func_params, dst_arbPH) == 24);
static_assert(VT_ARB_OFFSET(flat_size_func_params, arbH) == 16);
static_assert(VT_ARB_OFFSET(flat_size_func_params, flat_data_sizePLu) == 24);
static_assert(VT_ARB_OFFSET(flatten_func_params, arbH) == 16);
static_assert(VT_ARB_OFFSET(flatten_func_params, buf_sizeLu) == 24);
static_assert(VT_ARB_OFFSET(flatten_func_params, flat_dataPV) == 32);
static_assert(VT_ARB_OFFSET(unflatten_func_params, buf_sizeLu) == 16);
static_assert(VT_ARB_OFFSET(unflatten_func_params, flat_dataPV) == 24);
static_assert(VT_ARB_OFFSET(unflatten_func_params, arbPH) == 32);
static_assert(VT_ARB_OFFSET(interp_func_params, left_arbH) == 16);
static_assert(VT_ARB_OFFSET(interp_func_params, right_arbH) == 24);
static_assert(VT_ARB_OFFSET(interp_func_params, tF) == 32);
static_assert(VT_ARB_OFFSET(interp_func_params, interpPH) == 40);
static_assert(VT_ARB_OFFSET(compare_func_params, a_arbH) == 16);
static_assert(VT_ARB_OFFSET(compare_func_params, b_arbH) == 24);
static_assert(VT_ARB_OFFSET(compare_func_params, compareP) == 32);
static_assert(VT_ARB_OFFSET(print_size_func_params, arbH) == 16);
static_assert(VT_ARB_OFFSET(print_size_func_params, print_sizePLu) == 24);
static_assert(VT_ARB_OFFSET(print_func_params, print_flags) == 16);
static_assert(VT_ARB_OFFSET(print_func_params, arbH) == 24);
static_assert(VT_ARB_OFFSET(print_func_params, print_sizeLu) == 32);
static_assert(VT_ARB_OFFSET(print_func_params, print_bufferPC) == 40);
static_assert(VT_ARB_OFFSET(scan_func_params, bufPC) == 16);
static_assert(VT_ARB_OFFSET(scan_func_params, bytes_to_scanLu) == 24);
static_assert(VT_ARB_OFFSET(scan_func_params, arbPH) == 32);
#undef VT_ARB_OFFSET

// ---------------------------------------------------------------------------------------------------
// Smart render (extra of PF_Cmd_SMART_PRE_RENDER and PF_Cmd_SMART_RENDER). Newer hosts append fields to
// the input records and to PF_PreRenderCallbacks; the module only reads the leading fields declared
// here, so these records must never be allocated or copied whole on the module's side.

struct PF_RenderRequest {
    PF_LRect rect;
    PF_Field field;
    PF_ChannelMask channel_mask;
    PF_Boolean preserve_rgb_of_zero_alpha;
    A_char unused[3];
    A_long reserved[4];
};
static_assert(sizeof(PF_RenderRequest) == 44);
static_assert(offsetof(PF_RenderRequest, rect) == 0);
static_assert(offsetof(PF_RenderRequest, field) == 16);
static_assert(offsetof(PF_RenderRequest, channel_mask) == 20);
static_assert(offsetof(PF_RenderRequest, preserve_rgb_of_zero_alpha) == 24);
static_assert(offsetof(PF_RenderRequest, unused) == 25);
static_assert(offsetof(PF_RenderRequest, reserved) == 28);

struct PF_PreRenderInput {
    PF_RenderRequest output_request;
    A_short bitdepth;
};
static_assert(sizeof(PF_PreRenderInput) == 48);
static_assert(offsetof(PF_PreRenderInput, output_request) == 0);
static_assert(offsetof(PF_PreRenderInput, bitdepth) == 44);

typedef void(SPAPI* PF_DeletePreRenderDataFunc)(void* pre_render_data);

struct PF_PreRenderOutput {
    PF_LRect result_rect;
    PF_LRect max_result_rect;
    PF_Boolean solid;
    PF_Boolean reserved;
    PF_RenderOutputFlags flags;
    void* pre_render_data;
    PF_DeletePreRenderDataFunc delete_pre_render_data_func;
};
static_assert(sizeof(PF_PreRenderOutput) == 56);
static_assert(offsetof(PF_PreRenderOutput, result_rect) == 0);
static_assert(offsetof(PF_PreRenderOutput, max_result_rect) == 16);
static_assert(offsetof(PF_PreRenderOutput, solid) == 32);
static_assert(offsetof(PF_PreRenderOutput, reserved) == 33);
static_assert(offsetof(PF_PreRenderOutput, flags) == 34);
static_assert(offsetof(PF_PreRenderOutput, pre_render_data) == 40);
static_assert(offsetof(PF_PreRenderOutput, delete_pre_render_data_func) == 48);

struct PF_CheckoutResult {
    PF_LRect result_rect;
    PF_LRect max_result_rect;
    PF_RationalScale par;
    PF_Boolean solid;
    PF_Boolean reservedB[3];
    A_long ref_width;
    A_long ref_height;
    A_long reserved[6];
};
static_assert(sizeof(PF_CheckoutResult) == 76);
static_assert(offsetof(PF_CheckoutResult, result_rect) == 0);
static_assert(offsetof(PF_CheckoutResult, max_result_rect) == 16);
static_assert(offsetof(PF_CheckoutResult, par) == 32);
static_assert(offsetof(PF_CheckoutResult, solid) == 40);
static_assert(offsetof(PF_CheckoutResult, reservedB) == 41);
static_assert(offsetof(PF_CheckoutResult, ref_width) == 44);
static_assert(offsetof(PF_CheckoutResult, ref_height) == 48);
static_assert(offsetof(PF_CheckoutResult, reserved) == 52);

struct PF_PreRenderCallbacks {
    // index 0 is the input layer; checkout_idL is the module's own non-negative, unique id.
    PF_Err(SPAPI* checkout_layer)(PF_ProgPtr effect_ref, PF_ParamIndex index, A_long checkout_idL,
                                  const PF_RenderRequest* req, A_long what_time, A_long time_step, A_u_long time_scale,
                                  PF_CheckoutResult* checkout_result);
};
static_assert(sizeof(PF_PreRenderCallbacks) == 8);
static_assert(offsetof(PF_PreRenderCallbacks, checkout_layer) == 0);

struct PF_PreRenderExtra {
    PF_PreRenderInput* input;
    PF_PreRenderOutput* output;
    PF_PreRenderCallbacks* cb;
};
static_assert(sizeof(PF_PreRenderExtra) == 24);
static_assert(offsetof(PF_PreRenderExtra, input) == 0);
static_assert(offsetof(PF_PreRenderExtra, output) == 8);
static_assert(offsetof(PF_PreRenderExtra, cb) == 16);

struct PF_SmartRenderInput {
    PF_RenderRequest output_request;
    A_short bitdepth;
    void* pre_render_data;
};
static_assert(sizeof(PF_SmartRenderInput) == 56);
static_assert(offsetof(PF_SmartRenderInput, output_request) == 0);
static_assert(offsetof(PF_SmartRenderInput, bitdepth) == 44);
static_assert(offsetof(PF_SmartRenderInput, pre_render_data) == 48);

struct PF_SmartRenderCallbacks {
    PF_Err(SPAPI* checkout_layer_pixels)(PF_ProgPtr effect_ref, A_long checkout_idL, PF_EffectWorld** pixels);
    PF_Err(SPAPI* checkin_layer_pixels)(PF_ProgPtr effect_ref, A_long checkout_idL);
    PF_Err(SPAPI* checkout_output)(PF_ProgPtr effect_ref, PF_EffectWorld** output);
};
static_assert(sizeof(PF_SmartRenderCallbacks) == 24);
static_assert(offsetof(PF_SmartRenderCallbacks, checkout_layer_pixels) == 0);
static_assert(offsetof(PF_SmartRenderCallbacks, checkin_layer_pixels) == 8);
static_assert(offsetof(PF_SmartRenderCallbacks, checkout_output) == 16);

struct PF_SmartRenderExtra {
    PF_SmartRenderInput* input;
    PF_SmartRenderCallbacks* cb;
};
static_assert(sizeof(PF_SmartRenderExtra) == 16);
static_assert(offsetof(PF_SmartRenderExtra, input) == 0);
static_assert(offsetof(PF_SmartRenderExtra, cb) == 8);

// ---------------------------------------------------------------------------------------------------
// The entry point. Exported with C linkage under the name the property list's '8664' entry gives.

typedef PF_Err(SPAPI* PF_FilterProc)(PF_Cmd cmd, PF_InData* in_data, PF_OutData* out_data, PF_ParamList params,
                                     PF_LayerDef* output, void* extra);

}  // extern "C"
