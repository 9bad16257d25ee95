// The two text 1D LUT formats the curve menu loads: Autodesk (.lut) and Quantel iQ (.txt). A LUT
// turns the Red, Green and Blue tone curves into 1,024-entry table curves and Master into the
// identity table; on any failure the curves are left as they were.
#pragma once

#include <cstdint>
#include <span>

#include "engine/correction_settings.h"
#include "files/file_result.h"

namespace vt {

inline constexpr char kLutTooShortMessage[] =
    "LUT file is too short. End of file encountered before all required data was found.";
inline constexpr char kLutTooFewChannelsMessage[] =
    "LUT file contains too few channels. At least three color channels must be defined.";
inline constexpr char kLutUnsupportedTypeMessage[] = "LUT file is of unsupported type.";
inline constexpr char kLutReadErrorMessage[] = "Error encountered while reading LUT file.";

// The most entries per channel a LUT may announce; a 16-bit LUT has 65,536.
inline constexpr int64_t kMaxLutEntries = int64_t{1} << 24;
// The largest LUT file read at all.
inline constexpr size_t kMaxLutFileBytes = size_t{256} << 20;

// curves points at the four tone curves Master, Red, Green, Blue. *message (may be null) receives
// the text to show the user on failure, null on success.
FileResult ReadAutodeskLutBytes(std::span<const uint8_t> bytes, CurveRecord* curves, const char** message = nullptr);
FileResult ReadQuantelLutBytes(std::span<const uint8_t> bytes, CurveRecord* curves, const char** message = nullptr);

// The same for a file; a file that cannot be opened gives -43 with the general read error text.
FileResult ReadAutodeskLut(const char* path, CurveRecord* curves, const char** message = nullptr);
FileResult ReadQuantelLut(const char* path, CurveRecord* curves, const char** message = nullptr);

// Resamples count values (count >= 2) onto the 1,024 entries of a table curve, each value divided
// by divisor: the mean of each run of values when there are at least 1,024, a ramp through them
// when fewer.
void ResampleToTable(const uint16_t* values, size_t count, double divisor, float* table);

// Turns Master into the identity table and Red, Green, Blue into the given tables; all four
// become table curves.
void CommitTableCurves(CurveRecord* curves, const float (&tables)[3][kCurveSampleCount]);

}  // namespace vt
