// The PF and AEGP suites the effect acquires through SPBasicSuite, each as the host's table of
// function pointers in its fixed order, with the suite's name and version number. A suite's version
// number is not the digit in its struct name ("PF AE App Suite" version 6 is PFAppSuite4). Functions
// the module never calls keep their slot as PF_UnusedProc.
#pragma once

#include <cstddef>
#include <cstdint>

#include "sdk/ae_config.h"
#include "sdk/ae_effect.h"
#include "sdk/ae_effect_ui.h"
#include "sdk/drawbot_suites.h"

extern "C" {

// ---------------------------------------------------------------------------------------------------
// AEGP types and constants.

typedef A_long AEGP_PluginID;
typedef A_long AEGP_Command;
typedef A_long AEGP_MenuID;
typedef A_long AEGP_InstalledEffectKey;
typedef A_long AEGP_EffectIndex;
typedef A_u_long AEGP_MemSize;  // 32-bit, unlike host_new_handle's size
typedef A_long AEGP_MemFlag;
typedef A_short AEGP_ItemType;
typedef A_long AEGP_ItemFlags;
typedef A_long AEGP_EffectFlags;
typedef A_long AEGP_RenderQueueState;
typedef A_long PF_NewWorldFlags;
typedef A_char PF_TimeDisplayFormat;

typedef struct AEGP_OpaqueGlobalRefcon* AEGP_GlobalRefcon;
typedef struct AEGP_OpaqueMem** AEGP_MemHandle;
typedef struct AEGP_OpaqueLayer* AEGP_LayerH;
typedef struct AEGP_OpaqueEffectRef* AEGP_EffectRefH;
typedef struct AEGP_OpaqueProject* AEGP_ProjectH;
typedef struct AEGP_OpaqueItem* AEGP_ItemH;
typedef struct AEGP_OpaqueFootage* AEGP_FootageH;
typedef struct AEGP_OpaqueComp* AEGP_CompH;
// Host-defined error-reporting state; only ever passed by pointer.
struct AEGP_ErrReportState;

struct A_Time {
    A_long value;
    A_u_long scale;
};
static_assert(sizeof(A_Time) == 8);
static_assert(offsetof(A_Time, value) == 0 && offsetof(A_Time, scale) == 4);

constexpr A_long AEGP_MAX_PLUGIN_NAME_SIZE = 32;

constexpr AEGP_MemFlag AEGP_MemFlag_NONE = 0x0;
constexpr AEGP_MemFlag AEGP_MemFlag_CLEAR = 0x1;
constexpr AEGP_MemFlag AEGP_MemFlag_QUIET = 0x2;

constexpr AEGP_ItemType AEGP_ItemType_NONE = 0;
constexpr AEGP_ItemType AEGP_ItemType_FOLDER = 1;
constexpr AEGP_ItemType AEGP_ItemType_COMP = 2;
constexpr AEGP_ItemType AEGP_ItemType_SOLID_defunct = 3;
constexpr AEGP_ItemType AEGP_ItemType_FOOTAGE = 4;
constexpr AEGP_ItemType AEGP_ItemType_NUM_TYPES1 = 5;

constexpr AEGP_ItemFlags AEGP_ItemFlag_MISSING = 0x1;
constexpr AEGP_ItemFlags AEGP_ItemFlag_HAS_PROXY = 0x2;
constexpr AEGP_ItemFlags AEGP_ItemFlag_USING_PROXY = 0x4;
constexpr AEGP_ItemFlags AEGP_ItemFlag_MISSING_PROXY = 0x8;
constexpr AEGP_ItemFlags AEGP_ItemFlag_HAS_VIDEO = 0x10;
constexpr AEGP_ItemFlags AEGP_ItemFlag_HAS_AUDIO = 0x20;
constexpr AEGP_ItemFlags AEGP_ItemFlag_STILL = 0x40;
constexpr AEGP_ItemFlags AEGP_ItemFlag_HAS_ACTIVE_AUDIO = 0x80;

constexpr AEGP_EffectFlags AEGP_EffectFlags_NONE = 0;
constexpr AEGP_EffectFlags AEGP_EffectFlags_ACTIVE = 0x1;
constexpr AEGP_EffectFlags AEGP_EffectFlags_AUDIO_ONLY = 0x2;
constexpr AEGP_EffectFlags AEGP_EffectFlags_AUDIO_TOO = 0x4;
constexpr AEGP_EffectFlags AEGP_EffectFlags_MISSING = 0x8;

constexpr AEGP_RenderQueueState AEGP_RenderQueueState_STOPPED = 0;
constexpr AEGP_RenderQueueState AEGP_RenderQueueState_PAUSED = 1;
constexpr AEGP_RenderQueueState AEGP_RenderQueueState_RENDERING = 2;

constexpr PF_TimeDisplayFormat PF_TimeDisplayFormat_TIMECODE = 0;
constexpr PF_TimeDisplayFormat PF_TimeDisplayFormat_FRAMES = 1;
constexpr PF_TimeDisplayFormat PF_TimeDisplayFormat_FEET_AND_FRAMES = 2;  // Adv Time Suite 1 only

// ---------------------------------------------------------------------------------------------------
// "PF World Suite" version 2.

constexpr const char* kPFWorldSuite = "PF World Suite";
constexpr int32_t kPFWorldSuiteVersion2 = 2;

struct PF_WorldSuite2 {
    PF_Err(SPAPI* PF_NewWorld)(PF_ProgPtr effect_ref, A_long widthL, A_long heightL, PF_Boolean clear_pixB,
                               PF_PixelFormat pixel_format, PF_EffectWorld* worldP);
    PF_Err(SPAPI* PF_DisposeWorld)(PF_ProgPtr effect_ref, PF_EffectWorld* worldP);
    PF_Err(SPAPI* PF_GetPixelFormat)(const PF_EffectWorld* worldP, PF_PixelFormat* pixel_formatP);
};
static_assert(sizeof(PF_WorldSuite2) == 24);
static_assert(offsetof(PF_WorldSuite2, PF_GetPixelFormat) == 16);

// ---------------------------------------------------------------------------------------------------
// "PF Pixel Format Suite" version 1: the Premiere family's table (the same name at version 2 is a
// different, two-function table).

constexpr const char* kPFPixelFormatSuite = "PF Pixel Format Suite";
constexpr int32_t kPFPixelFormatSuiteVersion1 = 1;

struct PF_PixelFormatSuite1 {
    PF_Err(SPAPI* AddSupportedPixelFormat)(PF_ProgPtr effect_ref, PrPixelFormat pixelFormat);
    PF_Err(SPAPI* ClearSupportedPixelFormats)(PF_ProgPtr effect_ref);
    PF_Err(SPAPI* NewWorldOfPixelFormat)(PF_ProgPtr effect_ref, A_u_long width, A_u_long height, PF_NewWorldFlags flags,
                                         PrPixelFormat pixelFormat, PF_EffectWorld* world);
    PF_Err(SPAPI* DisposeWorld)(PF_ProgPtr effect_ref, PF_EffectWorld* world);
    PF_Err(SPAPI* GetPixelFormat)(PF_EffectWorld* inWorld, PrPixelFormat* pixelFormat);
    PF_Err(SPAPI* GetBlackForPixelFormat)(PrPixelFormat pixelFormat, void* pixelData);
    PF_Err(SPAPI* GetWhiteForPixelFormat)(PrPixelFormat pixelFormat, void* pixelData);
    PF_Err(SPAPI* ConvertColorToPixelFormattedData)(PrPixelFormat pixelFormat, float alpha, float red, float green,
                                                    float blue, void* pixelData);
};
static_assert(sizeof(PF_PixelFormatSuite1) == 64);
static_assert(offsetof(PF_PixelFormatSuite1, AddSupportedPixelFormat) == 0);
static_assert(offsetof(PF_PixelFormatSuite1, ClearSupportedPixelFormats) == 8);
static_assert(offsetof(PF_PixelFormatSuite1, GetPixelFormat) == 32);

// ---------------------------------------------------------------------------------------------------
// "PF AE App Suite" version 6 = PFAppSuite4. Version 7 inserts a function at index 2, so the indices
// below hold for version 6 only.

constexpr const char* kPFAppSuite = "PF AE App Suite";
constexpr int32_t kPFAppSuiteVersion4 = 6;

struct PFAppSuite4 {
    PF_Err(SPAPI* PF_AppGetBgColor)(PF_App_Color* bg_colorP);
    PF_Err(SPAPI* PF_AppGetColor)(PF_App_ColorType color_type, PF_App_Color* app_colorP);
    PF_UnusedProc PF_GetPersonalInfo;
    PF_UnusedProc PF_GetFontStyleSheet;
    PF_Err(SPAPI* PF_SetCursor)(PF_CursorType cursor);
    PF_Err(SPAPI* PF_IsRenderEngine)(PF_Boolean* render_enginePB);
    PF_UnusedProc PF_AppColorPickerDialog;
    PF_Err(SPAPI* PF_GetMouse)(PF_Point* pointP);
    // Only while handling a non-draw event; a null rectangle invalidates the whole pane.
    PF_Err(SPAPI* PF_InvalidateRect)(const PF_ContextH contextH, const PF_Rect* rectP0);
    PF_Err(SPAPI* PF_ConvertLocalToGlobal)(const PF_Point* localP, PF_Point* globalP);
    PF_UnusedProc PF_GetColorAtGlobalPoint;
};
static_assert(sizeof(PFAppSuite4) == 88);
static_assert(offsetof(PFAppSuite4, PF_AppGetBgColor) == 0);
static_assert(offsetof(PFAppSuite4, PF_AppGetColor) == 8);
static_assert(offsetof(PFAppSuite4, PF_SetCursor) == 32);
static_assert(offsetof(PFAppSuite4, PF_GetMouse) == 56);
static_assert(offsetof(PFAppSuite4, PF_InvalidateRect) == 64);

// ---------------------------------------------------------------------------------------------------
// "PF AE Adv Time Suite" versions 1 and 2: the same functions; they differ in the time-display record.

constexpr const char* kPFAdvTimeSuite = "PF AE Adv Time Suite";
constexpr int32_t kPFAdvTimeSuiteVersion1 = 1;
constexpr int32_t kPFAdvTimeSuiteVersion2 = 2;

struct PF_TimeDisplayPref {
    A_char time_display_format;
    A_char framemax;
    A_char nondrop30;
    A_char frames_per_foot;
};
static_assert(sizeof(PF_TimeDisplayPref) == 4);
static_assert(offsetof(PF_TimeDisplayPref, time_display_format) == 0);
static_assert(offsetof(PF_TimeDisplayPref, framemax) == 1);
static_assert(offsetof(PF_TimeDisplayPref, nondrop30) == 2);
static_assert(offsetof(PF_TimeDisplayPref, frames_per_foot) == 3);

struct PF_TimeDisplayPrefVersion2 {
    A_char display_mode;
    A_char framemax;
    A_char frames_per_foot;
    A_char frames_start;
    A_Boolean nondrop30B;
    A_Boolean honor_source_timecodeB;
    A_Boolean use_feet_framesB;
};
static_assert(sizeof(PF_TimeDisplayPrefVersion2) == 7);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, display_mode) == 0);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, framemax) == 1);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, frames_per_foot) == 2);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, frames_start) == 3);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, nondrop30B) == 4);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, honor_source_timecodeB) == 5);
static_assert(offsetof(PF_TimeDisplayPrefVersion2, use_feet_framesB) == 6);

struct PF_AdvTimeSuite1 {
    PF_Err(SPAPI* PF_FormatTimeActiveItem)(A_long time_valueUL, A_u_long time_scaleL, PF_Boolean durationB,
                                           A_char* time_buf);
    PF_Err(SPAPI* PF_FormatTime)(PF_InData* in_data, PF_EffectWorld* world, A_long time_valueUL, A_u_long time_scaleL,
                                 PF_Boolean durationB, A_char* time_buf);
    PF_Err(SPAPI* PF_FormatTimePlus)(PF_InData* in_data, PF_EffectWorld* world, A_long time_valueUL,
                                     A_u_long time_scaleL, PF_Boolean comp_timeB, PF_Boolean durationB,
                                     A_char* time_buf);
    PF_Err(SPAPI* PF_GetTimeDisplayPref)(PF_TimeDisplayPref* tdp, A_long* starting_frame_num);
};
static_assert(sizeof(PF_AdvTimeSuite1) == 32);
static_assert(offsetof(PF_AdvTimeSuite1, PF_GetTimeDisplayPref) == 24);

struct PF_AdvTimeSuite2 {
    PF_Err(SPAPI* PF_FormatTimeActiveItem)(A_long time_valueUL, A_u_long time_scaleL, PF_Boolean durationB,
                                           A_char* time_buf);
    PF_Err(SPAPI* PF_FormatTime)(PF_InData* in_data, PF_EffectWorld* world, A_long time_valueUL, A_u_long time_scaleL,
                                 PF_Boolean durationB, A_char* time_buf);
    PF_Err(SPAPI* PF_FormatTimePlus)(PF_InData* in_data, PF_EffectWorld* world, A_long time_valueUL,
                                     A_u_long time_scaleL, PF_Boolean comp_timeB, PF_Boolean durationB,
                                     A_char* time_buf);
    PF_Err(SPAPI* PF_GetTimeDisplayPref)(PF_TimeDisplayPrefVersion2* tdp, A_long* starting_frame_num);
};
static_assert(sizeof(PF_AdvTimeSuite2) == 32);
static_assert(offsetof(PF_AdvTimeSuite2, PF_GetTimeDisplayPref) == 24);

// ---------------------------------------------------------------------------------------------------
// "PF Effect Custom UI Suite" version 1.

constexpr const char* kPFEffectCustomUISuite = "PF Effect Custom UI Suite";
constexpr int32_t kPFEffectCustomUISuiteVersion1 = 1;

struct PF_EffectCustomUISuite1 {
    // The reference may come back null.
    PF_Err(SPAPI* PF_GetDrawingReference)(const PF_ContextH effect_contextH, DRAWBOT_DrawRef* referenceP0);
};
static_assert(sizeof(PF_EffectCustomUISuite1) == 8);

// ---------------------------------------------------------------------------------------------------
// "AEGP Utility Suite" version 11 = AEGP_UtilitySuite5.

constexpr const char* kAEGPUtilitySuite = "AEGP Utility Suite";
constexpr int32_t kAEGPUtilitySuiteVersion5 = 11;

struct AEGP_UtilitySuite5 {
    A_Err(SPAPI* AEGP_ReportInfo)(AEGP_PluginID aegp_plugin_id, const A_char* info_stringZ);
    A_Err(SPAPI* AEGP_GetDriverPluginInitFuncVersion)(A_short* major_versionPS, A_short* minor_versionPS);
    A_Err(SPAPI* AEGP_GetDriverImplementationVersion)(A_short* major_versionPS, A_short* minor_versionPS);
    A_Err(SPAPI* AEGP_StartQuietErrors)(AEGP_ErrReportState* err_stateP);
    A_Err(SPAPI* AEGP_EndQuietErrors)(A_Boolean report_quieted_errorsB, AEGP_ErrReportState* err_stateP);
    A_Err(SPAPI* AEGP_GetLastErrorMessage)(A_long buffer_size, A_char* error_string, A_Err* error_num);
    // Must be balanced by AEGP_EndUndoGroup.
    A_Err(SPAPI* AEGP_StartUndoGroup)(const A_char* undo_nameZ);
    A_Err(SPAPI* AEGP_EndUndoGroup)(void);
    A_Err(SPAPI* AEGP_RegisterWithAEGP)(AEGP_GlobalRefcon global_refcon, const A_char* plugin_nameZ,
                                        AEGP_PluginID* plugin_id);
    PF_UnusedProc AEGP_GetMainHWND;
    PF_UnusedProc AEGP_ShowHideAllFloaters;
    PF_UnusedProc AEGP_PaintPalGetForeColor;
    PF_UnusedProc AEGP_PaintPalGetBackColor;
    PF_UnusedProc AEGP_PaintPalSetForeColor;
    PF_UnusedProc AEGP_PaintPalSetBackColor;
    PF_UnusedProc AEGP_CharPalGetFillColor;
    PF_UnusedProc AEGP_CharPalGetStrokeColor;
    PF_UnusedProc AEGP_CharPalSetFillColor;
    PF_UnusedProc AEGP_CharPalSetStrokeColor;
    PF_UnusedProc AEGP_CharPalIsFillColorUIFrontmost;
    PF_UnusedProc AEGP_ConvertFpLongToHSFRatio;
    PF_UnusedProc AEGP_ConvertHSFRatioToFpLong;
    PF_UnusedProc AEGP_CauseIdleRoutinesToBeCalled;
    PF_UnusedProc AEGP_GetSuppressInteractiveUI;
    PF_UnusedProc AEGP_WriteToOSConsole;
    PF_UnusedProc AEGP_WriteToDebugLog;
    PF_UnusedProc AEGP_IsScriptingAvailable;
    PF_UnusedProc AEGP_ExecuteScript;
    PF_UnusedProc AEGP_HostIsActivated;
    PF_UnusedProc AEGP_GetPluginPlatformRef;
    PF_UnusedProc AEGP_UpdateFontList;
};
static_assert(sizeof(AEGP_UtilitySuite5) == 31 * 8);
static_assert(offsetof(AEGP_UtilitySuite5, AEGP_StartUndoGroup) == 48);
static_assert(offsetof(AEGP_UtilitySuite5, AEGP_EndUndoGroup) == 56);
static_assert(offsetof(AEGP_UtilitySuite5, AEGP_RegisterWithAEGP) == 64);
static_assert(offsetof(AEGP_UtilitySuite5, AEGP_UpdateFontList) == 240);

// ---------------------------------------------------------------------------------------------------
// "AEGP Memory Suite" version 1.

constexpr const char* kAEGPMemorySuite = "AEGP Memory Suite";
constexpr int32_t kAEGPMemorySuiteVersion1 = 1;

struct AEGP_MemorySuite1 {
    A_Err(SPAPI* AEGP_NewMemHandle)(AEGP_PluginID plugin_id, const A_char* whatZ, AEGP_MemSize size, AEGP_MemFlag flags,
                                    AEGP_MemHandle* memPH);
    A_Err(SPAPI* AEGP_FreeMemHandle)(AEGP_MemHandle memH);
    // Locks nest.
    A_Err(SPAPI* AEGP_LockMemHandle)(AEGP_MemHandle memH, void** ptr_to_ptr);
    A_Err(SPAPI* AEGP_UnlockMemHandle)(AEGP_MemHandle memH);
    A_Err(SPAPI* AEGP_GetMemHandleSize)(AEGP_MemHandle memH, AEGP_MemSize* sizeP);
    A_Err(SPAPI* AEGP_ResizeMemHandle)(const A_char* whatZ, AEGP_MemSize new_size, AEGP_MemHandle memH);
    A_Err(SPAPI* AEGP_SetMemReportingOn)(A_Boolean turn_OnB);
    A_Err(SPAPI* AEGP_GetMemStats)(AEGP_PluginID plugin_id, A_long* countPL, A_long* sizePL);
};
static_assert(sizeof(AEGP_MemorySuite1) == 64);
static_assert(offsetof(AEGP_MemorySuite1, AEGP_NewMemHandle) == 0);
static_assert(offsetof(AEGP_MemorySuite1, AEGP_FreeMemHandle) == 8);
static_assert(offsetof(AEGP_MemorySuite1, AEGP_LockMemHandle) == 16);
static_assert(offsetof(AEGP_MemorySuite1, AEGP_UnlockMemHandle) == 24);
static_assert(offsetof(AEGP_MemorySuite1, AEGP_GetMemHandleSize) == 32);

// ---------------------------------------------------------------------------------------------------
// "AEGP Effect Suite" version 1.

constexpr const char* kAEGPEffectSuite = "AEGP Effect Suite";
constexpr int32_t kAEGPEffectSuiteVersion1 = 1;

struct AEGP_EffectSuite1 {
    A_Err(SPAPI* AEGP_GetLayerNumEffects)(AEGP_LayerH layerH, A_long* num_effectsPL);
    A_Err(SPAPI* AEGP_GetLayerEffectByIndex)(AEGP_PluginID aegp_plugin_id, AEGP_LayerH layerH,
                                             AEGP_EffectIndex layer_effect_indexL, AEGP_EffectRefH* effectPH);
    A_Err(SPAPI* AEGP_GetInstalledKeyFromLayerEffect)(AEGP_EffectRefH effect_refH,
                                                      AEGP_InstalledEffectKey* installed_keyP);
    A_Err(SPAPI* AEGP_GetEffectParamUnionByIndex)(AEGP_PluginID aegp_plugin_id, AEGP_EffectRefH effect_refH,
                                                  PF_ParamIndex param_index, PF_ParamType* param_typeP,
                                                  PF_ParamDefUnion* uP0);
    A_Err(SPAPI* AEGP_GetEffectFlags)(AEGP_EffectRefH effect_refH, AEGP_EffectFlags* effect_flagsP);
    A_Err(SPAPI* AEGP_SetEffectFlags)(AEGP_EffectRefH effect_refH, AEGP_EffectFlags effect_flags_set_mask,
                                      AEGP_EffectFlags effect_flags);
    A_Err(SPAPI* AEGP_ReorderEffect)(AEGP_EffectRefH effect_refH, A_long effect_indexL);
    // The AEGP side of PF_Cmd_COMPLETELY_GENERAL: effect_extraPV arrives as the command's extra.
    A_Err(SPAPI* AEGP_EffectCallGeneric)(AEGP_PluginID aegp_plugin_id, AEGP_EffectRefH effect_refH,
                                         const A_Time* timePT, void* effect_extraPV);
    A_Err(SPAPI* AEGP_DisposeEffect)(AEGP_EffectRefH effect_refH);
    PF_UnusedProc AEGP_ApplyEffect;
    PF_UnusedProc AEGP_DeleteLayerEffect;
    PF_UnusedProc AEGP_GetNumInstalledEffects;
    PF_UnusedProc AEGP_GetNextInstalledEffect;
    PF_UnusedProc AEGP_GetEffectName;
    PF_UnusedProc AEGP_GetEffectMatchName;
    PF_UnusedProc AEGP_GetEffectCategory;
};
static_assert(sizeof(AEGP_EffectSuite1) == 16 * 8);
static_assert(offsetof(AEGP_EffectSuite1, AEGP_GetEffectFlags) == 32);
static_assert(offsetof(AEGP_EffectSuite1, AEGP_EffectCallGeneric) == 56);
static_assert(offsetof(AEGP_EffectSuite1, AEGP_DisposeEffect) == 64);

// ---------------------------------------------------------------------------------------------------
// "AEGP PF Interface Suite" version 1.

constexpr const char* kAEGPPFInterfaceSuite = "AEGP PF Interface Suite";
constexpr int32_t kAEGPPFInterfaceSuiteVersion1 = 1;

struct AEGP_PFInterfaceSuite1 {
    A_Err(SPAPI* AEGP_GetEffectLayer)(PF_ProgPtr effect_pp_ref, AEGP_LayerH* layerPH);
    // Dispose of the reference with AEGP_DisposeEffect.
    A_Err(SPAPI* AEGP_GetNewEffectForEffect)(AEGP_PluginID aegp_plugin_id, PF_ProgPtr effect_pp_ref,
                                             AEGP_EffectRefH* effect_refPH);
    A_Err(SPAPI* AEGP_ConvertEffectToCompTime)(PF_ProgPtr effect_pp_ref, A_long what_timeL, A_u_long time_scaleLu,
                                               A_Time* comp_timePT);
    A_Err(SPAPI* AEGP_GetEffectCamera)(PF_ProgPtr effect_pp_ref, const A_Time* comp_timePT,
                                       AEGP_LayerH* camera_layerPH);
    PF_UnusedProc AEGP_GetEffectCameraMatrix;
};
static_assert(sizeof(AEGP_PFInterfaceSuite1) == 40);
static_assert(offsetof(AEGP_PFInterfaceSuite1, AEGP_GetNewEffectForEffect) == 8);

// ---------------------------------------------------------------------------------------------------
// "AEGP Command Suite" version 1.

constexpr const char* kAEGPCommandSuite = "AEGP Command Suite";
constexpr int32_t kAEGPCommandSuiteVersion1 = 1;

struct AEGP_CommandSuite1 {
    A_Err(SPAPI* AEGP_GetUniqueCommand)(AEGP_Command* unique_commandP);
    A_Err(SPAPI* AEGP_InsertMenuCommand)(AEGP_Command command, const A_char* nameZ, AEGP_MenuID menu_id,
                                         A_long after_itemL);
    A_Err(SPAPI* AEGP_RemoveMenuCommand)(AEGP_Command command);
    A_Err(SPAPI* AEGP_SetMenuCommandName)(AEGP_Command command, const A_char* nameZ);
    A_Err(SPAPI* AEGP_EnableCommand)(AEGP_Command command);
    A_Err(SPAPI* AEGP_DisableCommand)(AEGP_Command command);
    A_Err(SPAPI* AEGP_CheckMarkMenuCommand)(AEGP_Command command, A_Boolean checkB);
    A_Err(SPAPI* AEGP_DoCommand)(AEGP_Command command);
};
static_assert(sizeof(AEGP_CommandSuite1) == 64);
static_assert(offsetof(AEGP_CommandSuite1, AEGP_DoCommand) == 56);

// ---------------------------------------------------------------------------------------------------
// Project walk: "AEGP Proj Suite", "AEGP Item Suite", "AEGP Footage Suite". These tables are longer
// than declared here; only their leading members are given, which the listed versions share. They are
// host-owned and only ever read through the pointer AcquireSuite returns.

constexpr const char* kAEGPProjSuite = "AEGP Proj Suite";
constexpr int32_t kAEGPProjSuiteVersion5 = 8;
constexpr int32_t kAEGPProjSuiteVersion6 = 9;

struct AEGP_ProjSuite5 {
    A_Err(SPAPI* AEGP_GetNumProjects)(A_long* num_projPL);
    A_Err(SPAPI* AEGP_GetProjectByIndex)(A_long proj_indexL, AEGP_ProjectH* projPH);
    PF_UnusedProc AEGP_GetProjectName;
    PF_UnusedProc AEGP_GetProjectPath;
    PF_UnusedProc AEGP_GetProjectRootFolder;
    PF_UnusedProc AEGP_SaveProjectToPath;
    PF_UnusedProc AEGP_GetProjectTimeDisplay;
    PF_UnusedProc AEGP_SetProjectTimeDisplay;
    PF_UnusedProc AEGP_ProjectIsDirty;
    PF_UnusedProc AEGP_SaveProjectAs;
    PF_UnusedProc AEGP_NewProject;
    PF_UnusedProc AEGP_OpenProjectFromPath;
    PF_UnusedProc AEGP_GetProjectBitDepth;
    PF_UnusedProc AEGP_SetProjectBitDepth;
};
static_assert(sizeof(AEGP_ProjSuite5) == 14 * 8);
static_assert(offsetof(AEGP_ProjSuite5, AEGP_GetProjectByIndex) == 8);

constexpr const char* kAEGPItemSuite = "AEGP Item Suite";
constexpr int32_t kAEGPItemSuiteVersion6 = 10;
constexpr int32_t kAEGPItemSuiteVersion7 = 11;
constexpr int32_t kAEGPItemSuiteVersion8 = 13;

// Leading members shared by versions 10, 11 and 13 (earlier versions lack the first two).
struct AEGP_ItemSuite6 {
    A_Err(SPAPI* AEGP_GetFirstProjItem)(AEGP_ProjectH projectH, AEGP_ItemH* itemPH);
    // next_itemPH comes back null after the last item.
    A_Err(SPAPI* AEGP_GetNextProjItem)(AEGP_ProjectH projectH, AEGP_ItemH itemH, AEGP_ItemH* next_itemPH);
    PF_UnusedProc AEGP_GetActiveItem;
    PF_UnusedProc AEGP_IsItemSelected;
    PF_UnusedProc AEGP_SelectItem;
    A_Err(SPAPI* AEGP_GetItemType)(AEGP_ItemH itemH, AEGP_ItemType* item_typeP);
    PF_UnusedProc AEGP_GetTypeName;
    PF_UnusedProc AEGP_GetItemName;
    PF_UnusedProc AEGP_SetItemName;
    PF_UnusedProc AEGP_GetItemID;
    A_Err(SPAPI* AEGP_GetItemFlags)(AEGP_ItemH itemH, AEGP_ItemFlags* item_flagsP);
};
static_assert(offsetof(AEGP_ItemSuite6, AEGP_GetFirstProjItem) == 0);
static_assert(offsetof(AEGP_ItemSuite6, AEGP_GetNextProjItem) == 8);
static_assert(offsetof(AEGP_ItemSuite6, AEGP_GetItemType) == 40);
static_assert(offsetof(AEGP_ItemSuite6, AEGP_GetItemFlags) == 80);

constexpr const char* kAEGPFootageSuite = "AEGP Footage Suite";
constexpr int32_t kAEGPFootageSuiteVersion5 = 11;

struct AEGP_FootageSuite5 {
    // Fails when the item is not footage.
    A_Err(SPAPI* AEGP_GetMainFootageFromItem)(AEGP_ItemH itemH, AEGP_FootageH* footagePH);
};
static_assert(offsetof(AEGP_FootageSuite5, AEGP_GetMainFootageFromItem) == 0);

// ---------------------------------------------------------------------------------------------------
// "AEGP Render Queue Suite" version 1.

constexpr const char* kAEGPRenderQueueSuite = "AEGP Render Queue Suite";
constexpr int32_t kAEGPRenderQueueSuiteVersion1 = 1;

struct AEGP_RenderQueueSuite1 {
    A_Err(SPAPI* AEGP_AddCompToRenderQueue)(AEGP_CompH compH, const A_char* pathZ);
    A_Err(SPAPI* AEGP_SetRenderQueueState)(AEGP_RenderQueueState state);
    A_Err(SPAPI* AEGP_GetRenderQueueState)(AEGP_RenderQueueState* stateP);
};
static_assert(sizeof(AEGP_RenderQueueSuite1) == 24);

}  // extern "C"
