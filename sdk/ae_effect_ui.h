// Custom-UI records: the event block of PF_Cmd_EVENT (context, event union, effect-panel window info,
// coordinate callbacks) and the registration record passed to register_ui. The event constants live
// in ae_effect.h.
#pragma once

#include <cstddef>
#include <cstdint>

#include "sdk/ae_config.h"
#include "sdk/ae_effect.h"
#include "sdk/drawbot_suites.h"

extern "C" {

typedef A_long PF_KeyCode;

struct PF_FixedPoint {
    PF_Fixed x;
    PF_Fixed y;
};
static_assert(sizeof(PF_FixedPoint) == 8);

struct PF_FloatMatrix {
    PF_FpLong mat[3][3];
};
static_assert(sizeof(PF_FloatMatrix) == 72);

// Owned by the host; the module reads it through the handle only. Newer hosts append a field, so the
// module never copies or allocates one.
struct PF_Context {
    A_u_long magic;  // PF_CONTEXT_MAGIC
    PF_WindowType w_type;
    void* reserved_flt;
    A_intptr_t plugin_state[4];
    DRAWBOT_DrawRef reserved_drawref;
    void* reserved_paneP;
};
typedef PF_Context** PF_ContextH;
static_assert(sizeof(PF_Context) == 64);
static_assert(offsetof(PF_Context, magic) == 0);
static_assert(offsetof(PF_Context, w_type) == 4);
static_assert(offsetof(PF_Context, reserved_flt) == 8);
static_assert(offsetof(PF_Context, plugin_state) == 16);
static_assert(offsetof(PF_Context, reserved_drawref) == 48);
static_assert(offsetof(PF_Context, reserved_paneP) == 56);

// Also carries PF_Event_DRAG. The module writes continue_refcon, send_drag; the host sets last_time
// when the button is released.
struct PF_DoClickEventInfo {
    A_u_long when;
    PF_Point screen_point;
    A_long num_clicks;
    PF_Modifiers modifiers;
    A_intptr_t continue_refcon[4];
    PF_Boolean send_drag;
    PF_Boolean last_time;
};
static_assert(sizeof(PF_DoClickEventInfo) == 64);
static_assert(offsetof(PF_DoClickEventInfo, when) == 0);
static_assert(offsetof(PF_DoClickEventInfo, screen_point) == 4);
static_assert(offsetof(PF_DoClickEventInfo, num_clicks) == 12);
static_assert(offsetof(PF_DoClickEventInfo, modifiers) == 16);
static_assert(offsetof(PF_DoClickEventInfo, continue_refcon) == 24);
static_assert(offsetof(PF_DoClickEventInfo, send_drag) == 56);
static_assert(offsetof(PF_DoClickEventInfo, last_time) == 57);

struct PF_DrawEventInfo {
    PF_UnionableRect update_rect;
    A_long depth;
};
static_assert(sizeof(PF_DrawEventInfo) == 20);
static_assert(offsetof(PF_DrawEventInfo, update_rect) == 0);
static_assert(offsetof(PF_DrawEventInfo, depth) == 16);

struct PF_KeyDownEvent {
    A_u_long when;
    PF_Point screen_point;
    PF_KeyCode key_code;
    PF_Modifiers modifiers;
};
static_assert(sizeof(PF_KeyDownEvent) == 20);
static_assert(offsetof(PF_KeyDownEvent, screen_point) == 4);
static_assert(offsetof(PF_KeyDownEvent, key_code) == 12);
static_assert(offsetof(PF_KeyDownEvent, modifiers) == 16);

struct PF_AdjustCursorEventInfo {
    PF_Point screen_point;
    PF_Modifiers modifiers;
    PF_CursorType set_cursor;  // PF_Cursor_NONE leaves the host's cursor
};
static_assert(sizeof(PF_AdjustCursorEventInfo) == 16);
static_assert(offsetof(PF_AdjustCursorEventInfo, screen_point) == 0);
static_assert(offsetof(PF_AdjustCursorEventInfo, modifiers) == 8);
static_assert(offsetof(PF_AdjustCursorEventInfo, set_cursor) == 12);

union PF_EventUnion {
    PF_DoClickEventInfo do_click;
    PF_DrawEventInfo draw;
    PF_KeyDownEvent key_down;
    PF_AdjustCursorEventInfo adjust_cursor;
};
static_assert(sizeof(PF_EventUnion) == 64);

struct PF_EffectWindowInfo {
    PF_ParamIndex index;
    PF_EffectArea area;
    PF_UnionableRect current_frame;  // the whole frame of the current area, in panel pixels
    PF_UnionableRect param_title_frame;
    A_long horiz_offset;
};
static_assert(sizeof(PF_EffectWindowInfo) == 44);
static_assert(offsetof(PF_EffectWindowInfo, index) == 0);
static_assert(offsetof(PF_EffectWindowInfo, area) == 4);
static_assert(offsetof(PF_EffectWindowInfo, current_frame) == 8);
static_assert(offsetof(PF_EffectWindowInfo, param_title_frame) == 24);
static_assert(offsetof(PF_EffectWindowInfo, horiz_offset) == 40);

// Coordinate conversions between layer, composition and screen; refcon is passed back as given.
struct PF_EventCallbacks {
    void* refcon;
    PF_Err(SPAPI* layer_to_comp)(void* refcon, PF_ContextH context, A_long curr_time, A_long time_scale,
                                 PF_FixedPoint* pt);
    PF_Err(SPAPI* comp_to_layer)(void* refcon, PF_ContextH context, A_long curr_time, A_long time_scale,
                                 PF_FixedPoint* pt);
    PF_Err(SPAPI* get_comp2layer_xform)(void* refcon, PF_ContextH context, A_long curr_time, A_long time_scale,
                                        A_long* exists, PF_FloatMatrix* comp2layer);
    PF_Err(SPAPI* get_layer2comp_xform)(void* refcon, PF_ContextH context, A_long curr_time, A_long time_scale,
                                        PF_FloatMatrix* layer2comp);
    PF_Err(SPAPI* source_to_frame)(void* refcon, PF_ContextH context, PF_FixedPoint* pt);
    PF_Err(SPAPI* frame_to_source)(void* refcon, PF_ContextH context, PF_FixedPoint* pt);
    PF_Err(SPAPI* info_draw_color)(void* refcon, PF_Pixel color);
    PF_Err(SPAPI* info_draw_text)(void* refcon, const A_char* text1Z0, const A_char* text2Z0);
};
static_assert(sizeof(PF_EventCallbacks) == 72);
static_assert(offsetof(PF_EventCallbacks, refcon) == 0);
static_assert(offsetof(PF_EventCallbacks, layer_to_comp) == 8);
static_assert(offsetof(PF_EventCallbacks, info_draw_text) == 64);

struct PF_EventExtra {
    PF_ContextH contextH;
    PF_EventType e_type;
    PF_EventUnion u;
    PF_EffectWindowInfo effect_win;
    PF_EventCallbacks cbs;
    PF_EventInFlags evt_in_flags;
    PF_EventOutFlags evt_out_flags;
};
static_assert(sizeof(PF_EventExtra) == 208);
static_assert(offsetof(PF_EventExtra, contextH) == 0);
static_assert(offsetof(PF_EventExtra, e_type) == 8);
static_assert(offsetof(PF_EventExtra, u) == 16);
static_assert(offsetof(PF_EventExtra, effect_win) == 80);
static_assert(offsetof(PF_EventExtra, cbs) == 128);
static_assert(offsetof(PF_EventExtra, evt_in_flags) == 200);
static_assert(offsetof(PF_EventExtra, evt_out_flags) == 204);

struct PF_CustomUIInfo {
    A_long reserved;
    PF_CustomEventFlags events;
    A_long comp_ui_width;
    A_long comp_ui_height;
    PF_UIAlignment comp_ui_alignment;
    A_long layer_ui_width;
    A_long layer_ui_height;
    PF_UIAlignment layer_ui_alignment;
    A_long preview_ui_width;
    A_long preview_ui_height;
    PF_UIAlignment preview_ui_alignment;
};
static_assert(sizeof(PF_CustomUIInfo) == 44);
static_assert(offsetof(PF_CustomUIInfo, reserved) == 0);
static_assert(offsetof(PF_CustomUIInfo, events) == 4);
static_assert(offsetof(PF_CustomUIInfo, comp_ui_width) == 8);
static_assert(offsetof(PF_CustomUIInfo, comp_ui_height) == 12);
static_assert(offsetof(PF_CustomUIInfo, comp_ui_alignment) == 16);
static_assert(offsetof(PF_CustomUIInfo, layer_ui_width) == 20);
static_assert(offsetof(PF_CustomUIInfo, layer_ui_height) == 24);
static_assert(offsetof(PF_CustomUIInfo, layer_ui_alignment) == 28);
static_assert(offsetof(PF_CustomUIInfo, preview_ui_width) == 32);
static_assert(offsetof(PF_CustomUIInfo, preview_ui_height) == 36);
static_assert(offsetof(PF_CustomUIInfo, preview_ui_alignment) == 40);

}  // extern "C"
