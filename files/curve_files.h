// Curve files for the curve control's menu: the point-curve format (.acv, read and written), the
// arbitrary-map format (.amp), and the load and save dialogs that also reach the LUT readers.
// Every reader takes the four tone curves Master, Red, Green, Blue (four consecutive records).
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "engine/correction_settings.h"
#include "files/file_result.h"

namespace vt {

inline constexpr char kLoadCurveTitle[] = "Load Curve";
inline constexpr char kSaveCurveTitle[] = "Save Curve";
inline constexpr char kSaveCurveInitialName[] = "Untitled Curve";
inline constexpr char kCurveDefaultExtension[] = "acv";

// The save refusals: a point-curve file holds 2 to 16 points per curve and no tables.
inline constexpr char kTableCurvesNotSavedMessage[] =
    "Curves loaded from a LUT or map file cannot be saved as a curve file.";
inline constexpr char kInvalidCurveNotSavedMessage[] =
    "A curve holds an invalid number of points and cannot be saved as a curve file.";

inline constexpr int kMapSize = 256;
inline constexpr int kMaxMaps = 4;

// The readers of the open dialog's type list, in its order; the index is the filter's.
enum class CurveFileType : int32_t {
    kPointCurve = 0,    // "Curve Files", .acv
    kArbitraryMap = 1,  // "Arbitrary Map Files", .amp
    kQuantelLut = 2,    // "Quantel iQ 1D LUT Files", .txt
    kAutodeskLut = 3,   // "Autodesk 1D LUT Files", .lut
    kAnyFile = 4,       // "All Documents": loads nothing
};

// Point-curve file: version 1 or 4; curves beyond the fourth are not read. A curve must hold 2 to
// 16 points: any other count refuses the whole file (-50). Nothing changes unless all is read.
FileResult ReadPointCurveBytes(std::span<const uint8_t> bytes, CurveRecord* curves);
FileResult ReadPointCurveFile(const char* path, CurveRecord* curves);

// Version 1, five curves: the four given and a two-point identity. Curves that have no point-curve
// form (table curves, counts outside 2 to 16) refuse the whole save with -50 and write nothing.
FileResult WritePointCurveBytes(const CurveRecord* curves, std::vector<uint8_t>* bytes);
FileResult WritePointCurveFile(const char* path, const CurveRecord* curves);

// Arbitrary-map file: up to four maps of 256 bytes (composite, then red, green, blue). A file
// without one whole map changes nothing (-39).
FileResult ReadArbitraryMapBytes(std::span<const uint8_t> bytes, CurveRecord* curves);
FileResult ReadArbitraryMapFile(const char* path, CurveRecord* curves);

// The reader the open dialog's filter would choose for this file name (by its extension);
// kAnyFile when none would.
CurveFileType CurveFileTypeForPath(std::string_view path);

// Runs the reader of that type. *message (may be null) receives the text the module shows for the
// result, null when it shows none (the point-curve and map readers fail silently).
FileResult ReadCurveFile(CurveFileType type, const char* path, CurveRecord* curves, const char** message = nullptr);

// The text shown when saving fails, null when nothing is shown.
const char* SaveCurvesMessage(const CurveRecord* curves, FileResult result);

// The curve menu's "Load Curves": the open dialog, then the reader of the chosen filter; its
// messages are shown here. Cancel changes nothing.
void LoadCurvesFile(CurveRecord* curves);

// The curve menu's "Save Curves": the save dialog, then the point-curve writer.
void SaveCurvesFile(const CurveRecord* curves);

// For callers outside a dialog (the command-line tool): load a file of the given type into the
// tone curves and, on success, turn both curves-section enables on as the menu does; save the four
// tone curves as a point-curve file. The outcome carries the code and the module's message.
FileOutcome LoadCurvesFromPath(const char* path, CorrectionSettings* settings, CurveFileType type);
FileOutcome SaveCurvesToPath(const char* path, const CorrectionSettings& settings);

}  // namespace vt
