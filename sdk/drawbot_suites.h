// The host's drawing interface for custom controls: opaque references, geometry and colour records,
// and the Draw, Supplier, Surface and Path suites. Drawing is only allowed while handling
// PF_Event_DRAW; the draw reference comes from the custom-UI suite (ae_suites.h).
#pragma once

#include <cstddef>
#include <cstdint>

#include "sdk/ae_config.h"
#include "sdk/sp_basic.h"

extern "C" {

typedef struct DRAWBOT_OpaqueDrawRef* DRAWBOT_DrawRef;
typedef struct DRAWBOT_OpaqueSupplierRef* DRAWBOT_SupplierRef;
typedef struct DRAWBOT_OpaqueSurfaceRef* DRAWBOT_SurfaceRef;
typedef struct DRAWBOT_OpaquePenRef* DRAWBOT_PenRef;
typedef struct DRAWBOT_OpaqueBrushRef* DRAWBOT_BrushRef;
typedef struct DRAWBOT_OpaquePathRef* DRAWBOT_PathRef;
typedef struct DRAWBOT_OpaqueImageRef* DRAWBOT_ImageRef;
typedef struct DRAWBOT_OpaqueFontRef* DRAWBOT_FontRef;
// Pens, brushes, fonts, images and paths are all released through ReleaseObject as this type.
typedef struct DRAWBOT_OpaqueObjectRef* DRAWBOT_ObjectRef;

typedef uint16_t DRAWBOT_UTF16Char;
typedef uint8_t DRAWBOT_Boolean;

typedef int32_t DRAWBOT_PixelLayout;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_24RGB = 0;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_24BGR = 1;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32RGB = 2;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32BGR = 3;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32ARGB_Straight = 4;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32ARGB_Premul = 5;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32BGRA_Straight = 6;
constexpr DRAWBOT_PixelLayout kDRAWBOT_PixelLayout_32BGRA_Premul = 7;

typedef int32_t DRAWBOT_AntiAliasPolicy;
constexpr DRAWBOT_AntiAliasPolicy kDRAWBOT_AntiAliasPolicy_None = 0;
constexpr DRAWBOT_AntiAliasPolicy kDRAWBOT_AntiAliasPolicy_Med = 1;
constexpr DRAWBOT_AntiAliasPolicy kDRAWBOT_AntiAliasPolicy_High = 2;
constexpr DRAWBOT_AntiAliasPolicy kDRAWBOT_AntiAliasPolicy_Default = kDRAWBOT_AntiAliasPolicy_None;

typedef int32_t DRAWBOT_InterpolationPolicy;
constexpr DRAWBOT_InterpolationPolicy kDRAWBOT_InterpolationPolicy_None = 0;
constexpr DRAWBOT_InterpolationPolicy kDRAWBOT_InterpolationPolicy_Med = 1;
constexpr DRAWBOT_InterpolationPolicy kDRAWBOT_InterpolationPolicy_High = 2;
constexpr DRAWBOT_InterpolationPolicy kDRAWBOT_InterpolationPolicy_Default = kDRAWBOT_InterpolationPolicy_None;

typedef int32_t DRAWBOT_FillType;
constexpr DRAWBOT_FillType kDRAWBOT_FillType_EvenOdd = 0;
constexpr DRAWBOT_FillType kDRAWBOT_FillType_Winding = 1;
constexpr DRAWBOT_FillType kDRAWBOT_FillType_Default = kDRAWBOT_FillType_Winding;

typedef int32_t DRAWBOT_TextAlignment;
constexpr DRAWBOT_TextAlignment kDRAWBOT_TextAlignment_Left = 0;
constexpr DRAWBOT_TextAlignment kDRAWBOT_TextAlignment_Center = 1;
constexpr DRAWBOT_TextAlignment kDRAWBOT_TextAlignment_Right = 2;
constexpr DRAWBOT_TextAlignment kDRAWBOT_TextAlignment_Default = kDRAWBOT_TextAlignment_Left;

typedef int32_t DRAWBOT_TextTruncation;
constexpr DRAWBOT_TextTruncation kDRAWBOT_TextTruncation_None = 0;
constexpr DRAWBOT_TextTruncation kDRAWBOT_TextTruncation_End = 1;
constexpr DRAWBOT_TextTruncation kDRAWBOT_TextTruncation_EndEllipsis = 2;
constexpr DRAWBOT_TextTruncation kDRAWBOT_TextTruncation_PathEllipsis = 3;

// Channels in 0..1.
struct DRAWBOT_ColorRGBA {
    float red;
    float green;
    float blue;
    float alpha;
};
static_assert(sizeof(DRAWBOT_ColorRGBA) == 16);
static_assert(offsetof(DRAWBOT_ColorRGBA, red) == 0 && offsetof(DRAWBOT_ColorRGBA, green) == 4);
static_assert(offsetof(DRAWBOT_ColorRGBA, blue) == 8 && offsetof(DRAWBOT_ColorRGBA, alpha) == 12);

struct DRAWBOT_PointF32 {
    float x;
    float y;
};
static_assert(sizeof(DRAWBOT_PointF32) == 8);
static_assert(offsetof(DRAWBOT_PointF32, x) == 0 && offsetof(DRAWBOT_PointF32, y) == 4);

// Width and height, not right and bottom.
struct DRAWBOT_RectF32 {
    float left;
    float top;
    float width;
    float height;
};
static_assert(sizeof(DRAWBOT_RectF32) == 16);
static_assert(offsetof(DRAWBOT_RectF32, left) == 0 && offsetof(DRAWBOT_RectF32, top) == 4);
static_assert(offsetof(DRAWBOT_RectF32, width) == 8 && offsetof(DRAWBOT_RectF32, height) == 12);

struct DRAWBOT_Rect32 {
    int32_t left;
    int32_t top;
    int32_t width;
    int32_t height;
};
static_assert(sizeof(DRAWBOT_Rect32) == 16);
static_assert(offsetof(DRAWBOT_Rect32, left) == 0 && offsetof(DRAWBOT_Rect32, top) == 4);
static_assert(offsetof(DRAWBOT_Rect32, width) == 8 && offsetof(DRAWBOT_Rect32, height) == 12);

// Row-vector form: the linear part in mat[0][0], mat[0][1], mat[1][0], mat[1][1]; the translation in
// mat[2][0] (x) and mat[2][1] (y); mat[2][2] = 1.
struct DRAWBOT_MatrixF32 {
    float mat[3][3];
};
static_assert(sizeof(DRAWBOT_MatrixF32) == 36);

constexpr const char* kDRAWBOT_DrawSuite = "DRAWBOT Draw Suite";
constexpr int32_t kDRAWBOT_DrawSuite_Version1 = 1;
constexpr const char* kDRAWBOT_SupplierSuite = "DRAWBOT Supplier Suite";
constexpr int32_t kDRAWBOT_SupplierSuite_Version1 = 1;
constexpr const char* kDRAWBOT_SurfaceSuite = "DRAWBOT Surface Suite";
constexpr int32_t kDRAWBOT_SurfaceSuite_Version1 = 1;
constexpr const char* kDRAWBOT_PathSuite = "DRAWBOT Path Suite";
constexpr int32_t kDRAWBOT_PathSuite_Version1 = 1;

struct DRAWBOT_DrawbotSuite1 {
    SPErr(SPAPI* GetSupplier)(DRAWBOT_DrawRef in_drawbot_ref, DRAWBOT_SupplierRef* out_supplierP);
    SPErr(SPAPI* GetSurface)(DRAWBOT_DrawRef in_drawbot_ref, DRAWBOT_SurfaceRef* out_surfaceP);
};
static_assert(sizeof(DRAWBOT_DrawbotSuite1) == 16);
static_assert(offsetof(DRAWBOT_DrawbotSuite1, GetSurface) == 8);

struct DRAWBOT_SupplierSuite1 {
    SPErr(SPAPI* NewPen)(DRAWBOT_SupplierRef in_supplier_ref, const DRAWBOT_ColorRGBA* in_colorP, float in_size,
                         DRAWBOT_PenRef* out_penP);
    SPErr(SPAPI* NewBrush)(DRAWBOT_SupplierRef in_supplier_ref, const DRAWBOT_ColorRGBA* in_colorP,
                           DRAWBOT_BrushRef* out_brushP);
    SPErr(SPAPI* SupportsText)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_Boolean* out_supports_textB);
    SPErr(SPAPI* GetDefaultFontSize)(DRAWBOT_SupplierRef in_supplier_ref, float* out_font_sizeF);
    SPErr(SPAPI* NewDefaultFont)(DRAWBOT_SupplierRef in_supplier_ref, float in_font_sizeF, DRAWBOT_FontRef* out_fontP);
    SPErr(SPAPI* NewImageFromBuffer)(DRAWBOT_SupplierRef in_supplier_ref, int32_t in_width, int32_t in_height,
                                     int32_t in_row_bytes, DRAWBOT_PixelLayout in_pl, const void* in_dataP,
                                     DRAWBOT_ImageRef* out_imageP);
    SPErr(SPAPI* NewPath)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_PathRef* out_pathP);
    SPErr(SPAPI* SupportsPixelLayoutBGRA)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_Boolean* out_supports_bgraPB);
    SPErr(SPAPI* PrefersPixelLayoutBGRA)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_Boolean* out_prefers_bgraPB);
    SPErr(SPAPI* SupportsPixelLayoutARGB)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_Boolean* out_supports_argbPB);
    SPErr(SPAPI* PrefersPixelLayoutARGB)(DRAWBOT_SupplierRef in_supplier_ref, DRAWBOT_Boolean* out_prefers_argbPB);
    SPErr(SPAPI* RetainObject)(DRAWBOT_ObjectRef in_obj_ref);
    SPErr(SPAPI* ReleaseObject)(DRAWBOT_ObjectRef in_obj_ref);
};
static_assert(sizeof(DRAWBOT_SupplierSuite1) == 104);
static_assert(offsetof(DRAWBOT_SupplierSuite1, NewImageFromBuffer) == 40);
static_assert(offsetof(DRAWBOT_SupplierSuite1, NewPath) == 48);
static_assert(offsetof(DRAWBOT_SupplierSuite1, ReleaseObject) == 96);

struct DRAWBOT_SurfaceSuite1 {
    SPErr(SPAPI* PushStateStack)(DRAWBOT_SurfaceRef in_surface_ref);
    SPErr(SPAPI* PopStateStack)(DRAWBOT_SurfaceRef in_surface_ref);
    SPErr(SPAPI* PaintRect)(DRAWBOT_SurfaceRef in_surface_ref, const DRAWBOT_ColorRGBA* in_colorP,
                            const DRAWBOT_RectF32* in_rectPR);
    SPErr(SPAPI* FillPath)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_BrushRef in_brush_ref,
                           DRAWBOT_PathRef in_path_ref, DRAWBOT_FillType in_fill_type);
    SPErr(SPAPI* StrokePath)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_PenRef in_pen_ref, DRAWBOT_PathRef in_path_ref);
    SPErr(SPAPI* Clip)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_SupplierRef in_supplier_ref,
                       const DRAWBOT_Rect32* in_rectPR);
    SPErr(SPAPI* GetClipBounds)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_Rect32* out_rectPR);
    SPErr(SPAPI* IsWithinClipBounds)(DRAWBOT_SurfaceRef in_surface_ref, const DRAWBOT_Rect32* in_rectPR,
                                     DRAWBOT_Boolean* out_withinPB);
    SPErr(SPAPI* Transform)(DRAWBOT_SurfaceRef in_surface_ref, const DRAWBOT_MatrixF32* in_matrixP);
    // The string is NUL-terminated UTF-16.
    SPErr(SPAPI* DrawString)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_BrushRef in_brush_ref,
                             DRAWBOT_FontRef in_font_ref, const DRAWBOT_UTF16Char* in_stringP,
                             const DRAWBOT_PointF32* in_originP, DRAWBOT_TextAlignment in_alignment,
                             DRAWBOT_TextTruncation in_truncation, float in_truncation_width);
    SPErr(SPAPI* DrawImage)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_ImageRef in_image_ref,
                            const DRAWBOT_PointF32* in_originP, float in_alpha);
    SPErr(SPAPI* SetInterpolationPolicy)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_InterpolationPolicy in_interp);
    SPErr(SPAPI* GetInterpolationPolicy)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_InterpolationPolicy* out_interpP);
    SPErr(SPAPI* SetAntiAliasPolicy)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_AntiAliasPolicy in_policy);
    SPErr(SPAPI* GetAntiAliasPolicy)(DRAWBOT_SurfaceRef in_surface_ref, DRAWBOT_AntiAliasPolicy* out_policyP);
    SPErr(SPAPI* Flush)(DRAWBOT_SurfaceRef in_surface_ref);
};
static_assert(sizeof(DRAWBOT_SurfaceSuite1) == 128);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, PaintRect) == 16);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, Transform) == 64);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, DrawString) == 72);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, DrawImage) == 80);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, SetAntiAliasPolicy) == 104);
static_assert(offsetof(DRAWBOT_SurfaceSuite1, Flush) == 120);

struct DRAWBOT_PathSuite1 {
    SPErr(SPAPI* MoveTo)(DRAWBOT_PathRef in_path_ref, float in_x, float in_y);
    SPErr(SPAPI* LineTo)(DRAWBOT_PathRef in_path_ref, float in_x, float in_y);
    SPErr(SPAPI* BezierTo)(DRAWBOT_PathRef in_path_ref, const DRAWBOT_PointF32* in_pt1P,
                           const DRAWBOT_PointF32* in_pt2P, const DRAWBOT_PointF32* in_pt3P);
    SPErr(SPAPI* AddRect)(DRAWBOT_PathRef in_path_ref, const DRAWBOT_RectF32* in_rectPR);
    // Angles in degrees; a start of 0 with a sweep of 360 is a full circle.
    SPErr(SPAPI* AddArc)(DRAWBOT_PathRef in_path_ref, const DRAWBOT_PointF32* in_centerP, float in_radius,
                         float in_start_angle, float in_sweep);
    SPErr(SPAPI* Close)(DRAWBOT_PathRef in_path_ref);
};
static_assert(sizeof(DRAWBOT_PathSuite1) == 48);
static_assert(offsetof(DRAWBOT_PathSuite1, AddArc) == 32);
static_assert(offsetof(DRAWBOT_PathSuite1, Close) == 40);

}  // extern "C"
