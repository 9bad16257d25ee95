// The point-curve and arbitrary-map formats, and the curve menu's load and save dialogs.
//
// Point-curve file (.acv), big-endian 16-bit integers:
//     version (1 or 4), curve count, then per curve: point count, and per point output, input (0-255)
// Arbitrary-map file (.amp): up to four 256-byte maps, composite first, then red, green, blue.
#include "files/curve_files.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "files/byte_cursor.h"
#include "files/lut_files.h"
#include "platform/dialogs.h"
#include "platform/file_io.h"
#include "platform/ui.h"

namespace vt {

namespace {

// The open dialog's type list; the order fixes the reader (CurveFileType). The type codes are the
// files' creator-style codes, kept with their entries.
struct CurveFileKind {
    const char* typeCode;
    FileTypeFilter filter;
};
constexpr CurveFileKind kLoadKinds[] = {
    {"CSB8", {"Curve Files", "*.acv"}},
    {"TLB8", {"Arbitrary Map Files", "*.amp"}},
    {"TXET", {"Quantel iQ 1D LUT Files", "*.txt"}},
    {"TXET", {"Autodesk 1D LUT Files", "*.lut"}},
    {"????", {"All Documents", "*.*"}},
};
constexpr int kLoadKindCount = static_cast<int>(std::size(kLoadKinds));
static_assert(kLoadKindCount == static_cast<int>(CurveFileType::kAnyFile) + 1);

constexpr FileTypeFilter kLoadFilters[] = {kLoadKinds[0].filter, kLoadKinds[1].filter, kLoadKinds[2].filter,
                                           kLoadKinds[3].filter, kLoadKinds[4].filter};
constexpr FileTypeFilter kSaveFilters[] = {{"Curves (*.acv)", "*.acv"}, {"All Files (*.*)", "*.*"}};

constexpr int16_t kWrittenVersion = 1;
constexpr int16_t kWrittenCurveCount = 5;
constexpr int kMinPoints = 2;

// The most a point-curve file can usefully hold: version, count and four curves of 16 points.
// Anything later is never read.
constexpr size_t kPointCurveReadBytes = 4 + 4 * (2 + 4 * kCurvePointCapacity);

FileDialogRequest LoadRequest() {
    return {false, kLoadCurveTitle, kCurveDefaultExtension, nullptr, kLoadFilters, kLoadKindCount, kOpenDialogFlags};
}

FileDialogRequest SaveRequest() {
    return {true,        kSaveCurveTitle, kCurveDefaultExtension, kSaveCurveInitialName,
            kSaveFilters, static_cast<int>(std::size(kSaveFilters)), kSaveDialogFlags};
}

bool ValidPointCount(int32_t count) { return count >= kMinPoints && count <= kCurvePointCapacity; }

// A level in [0, 1] as a file value 0-255, truncated toward zero. Values outside the range (and
// NaN) are clamped first: the conversion of an out-of-range float to an integer is undefined.
int16_t ToFileValue(float level) {
    const float scaled = level * 255.0f;
    if (!(scaled > 0.0f)) return 0;
    if (scaled >= 255.0f) return 255;
    return static_cast<int16_t>(scaled);
}

void PutBE16(std::vector<uint8_t>* bytes, int16_t value) {
    const auto v = static_cast<uint16_t>(value);
    bytes->push_back(static_cast<uint8_t>(v >> 8));
    bytes->push_back(static_cast<uint8_t>(v & 0xFF));
}

// The four table entries that stand for one map value: a ramp from map[s] towards map[s + 1]; the
// last value carries the slope of the last pair on (rather than turning back towards map[254]).
void ExpandMapValue(const uint8_t* map, int s, float* entries) {
    const double value = map[s];
    const double step = s < kMapSize - 1 ? (map[s + 1] - value) / 4.0 : (value - map[kMapSize - 2]) / 4.0;
    for (int k = 0; k < 4; ++k) entries[k] = static_cast<float>((value + k * step) / 255.0);
}

FileResult ReadFileThen(const char* path, size_t maxBytes, CurveRecord* curves,
                        FileResult (*read)(std::span<const uint8_t>, CurveRecord*)) {
    std::vector<uint8_t> bytes;
    const uint32_t error = ReadFileBytes(path, maxBytes, FileShare::kShared, &bytes, nullptr);
    if (error == kFileErrorOutOfMemory) return FileResult::kOutOfMemory;
    if (error != kFileErrorNone) return FileResult::kCannotOpen;
    return read(bytes, curves);
}

}  // namespace

FileResult ReadPointCurveBytes(std::span<const uint8_t> bytes, CurveRecord* curves) {
    if (curves == nullptr) return FileResult::kUnsupported;
    ByteCursor cursor(bytes);
    int16_t version = 0;
    int16_t curveCount = 0;
    if (!cursor.ReadBE16(version)) return FileResult::kEndOfFile;
    // Another version is not a point-curve file this reader knows: nothing changes, and the caller
    // is told so rather than given success.
    if (version != 1 && version != 4) return FileResult::kUnsupported;
    if (!cursor.ReadBE16(curveCount)) return FileResult::kEndOfFile;
    const int taken = std::clamp<int>(curveCount, 0, kToneCurveCount);

    struct Curve {
        int16_t count;
        float x[kCurvePointCapacity];
        float y[kCurvePointCapacity];
    } read[kToneCurveCount];
    for (int c = 0; c < taken; ++c) {
        if (!cursor.ReadBE16(read[c].count)) return FileResult::kEndOfFile;
        // A record holds 2 to 16 points; a file that needs more (or names fewer) cannot be loaded
        // without changing the curve, so it is refused whole.
        if (!ValidPointCount(read[c].count)) return FileResult::kUnsupported;
        for (int i = 0; i < read[c].count; ++i) {
            int16_t output = 0;
            int16_t input = 0;
            if (!cursor.ReadBE16(output) || !cursor.ReadBE16(input)) return FileResult::kEndOfFile;
            read[c].x[i] = static_cast<float>(input / 255.0);
            read[c].y[i] = static_cast<float>(output / 255.0);
        }
    }
    // Points are stored as read (no sorting, no clamping); the table flags stay as they are.
    for (int c = 0; c < taken; ++c) {
        CurvePoints& points = curves[c].data.points;
        points.count = read[c].count;
        std::copy(read[c].x, read[c].x + read[c].count, points.x);
        std::copy(read[c].y, read[c].y + read[c].count, points.y);
    }
    return FileResult::kOk;
}

FileResult ReadPointCurveFile(const char* path, CurveRecord* curves) {
    return ReadFileThen(path, kPointCurveReadBytes, curves, ReadPointCurveBytes);
}

FileResult WritePointCurveBytes(const CurveRecord* curves, std::vector<uint8_t>* bytes) {
    if (curves == nullptr || bytes == nullptr) return FileResult::kUnsupported;
    // A table curve has no point count (its first sample lies there), and a count outside 2-16
    // would have the writer read past the point arrays.
    for (int c = 0; c < kToneCurveCount; ++c) {
        if ((curves[c].flags & kCurveFlagSampled) != 0) return FileResult::kUnsupported;
        if (!ValidPointCount(curves[c].data.points.count)) return FileResult::kUnsupported;
    }
    bytes->clear();
    try {
        PutBE16(bytes, kWrittenVersion);
        PutBE16(bytes, kWrittenCurveCount);
        for (int c = 0; c < kToneCurveCount; ++c) {
            const CurvePoints& points = curves[c].data.points;
            PutBE16(bytes, static_cast<int16_t>(points.count));
            for (int i = 0; i < points.count; ++i) {
                PutBE16(bytes, ToFileValue(points.y[i]));
                PutBE16(bytes, ToFileValue(points.x[i]));
            }
        }
        // The fifth curve: a two-point identity.
        for (int16_t value : {int16_t{2}, int16_t{0}, int16_t{0}, int16_t{255}, int16_t{255}}) PutBE16(bytes, value);
    } catch (const std::bad_alloc&) {
        bytes->clear();
        return FileResult::kOutOfMemory;
    }
    return FileResult::kOk;
}

FileResult WritePointCurveFile(const char* path, const CurveRecord* curves) {
    std::vector<uint8_t> bytes;
    const FileResult result = WritePointCurveBytes(curves, &bytes);
    if (result != FileResult::kOk) return result;
    // A file that could not be written whole counts as one that could not be opened.
    if (WriteFileBytes(path, bytes.data(), bytes.size()) != kFileErrorNone) return FileResult::kCannotOpen;
    return FileResult::kOk;
}

FileResult ReadArbitraryMapBytes(std::span<const uint8_t> bytes, CurveRecord* curves) {
    if (curves == nullptr) return FileResult::kUnsupported;
    const int maps = static_cast<int>(std::min<size_t>(bytes.size() / kMapSize, kMaxMaps));
    if (maps == 0) return FileResult::kEndOfFile;
    const uint8_t* map[kMaxMaps] = {};
    for (int m = 0; m < maps; ++m) map[m] = bytes.data() + static_cast<size_t>(m) * kMapSize;

    float tables[3][kCurveSampleCount];
    for (int i = 0; i < kMapSize; ++i) {
        // Red goes through map 2 after the composite map, green through map 3, blue through map 4;
        // a channel whose map is missing takes the composite map alone.
        const int composed = map[0][i];
        for (int channel = 0; channel < 3; ++channel) {
            const uint8_t* own = map[channel + 1];
            float* entries = &tables[channel][4 * i];
            if (own) {
                ExpandMapValue(own, composed, entries);
            } else {
                ExpandMapValue(map[0], i, entries);
            }
        }
    }
    CommitTableCurves(curves, tables);
    return FileResult::kOk;
}

FileResult ReadArbitraryMapFile(const char* path, CurveRecord* curves) {
    return ReadFileThen(path, static_cast<size_t>(kMapSize) * kMaxMaps, curves, ReadArbitraryMapBytes);
}

CurveFileType CurveFileTypeForPath(std::string_view path) {
    return static_cast<CurveFileType>(FilterIndexForPath(LoadRequest(), std::string(path)));
}

FileResult ReadCurveFile(CurveFileType type, const char* path, CurveRecord* curves, const char** message) {
    if (message) *message = nullptr;
    switch (type) {
        case CurveFileType::kPointCurve: return ReadPointCurveFile(path, curves);
        case CurveFileType::kArbitraryMap: return ReadArbitraryMapFile(path, curves);
        case CurveFileType::kQuantelLut: return ReadQuantelLut(path, curves, message);
        case CurveFileType::kAutodeskLut: return ReadAutodeskLut(path, curves, message);
        case CurveFileType::kAnyFile: break;
    }
    return FileResult::kUnsupported;
}

const char* SaveCurvesMessage(const CurveRecord* curves, FileResult result) {
    if (result != FileResult::kUnsupported || curves == nullptr) return nullptr;
    for (int c = 0; c < kToneCurveCount; ++c) {
        if ((curves[c].flags & kCurveFlagSampled) != 0) return kTableCurvesNotSavedMessage;
    }
    return kInvalidCurveNotSavedMessage;
}

void LoadCurvesFile(CurveRecord* curves) {
    std::string path;
    int filterIndex = 0;
    if (!ShowFileDialog(LoadRequest(), &path, &filterIndex)) return;
    if (filterIndex < 0 || filterIndex >= kLoadKindCount) return;
    const char* message = nullptr;
    const FileResult result = ReadCurveFile(static_cast<CurveFileType>(filterIndex), path.c_str(), curves, &message);
    if (message) ShowMessage(message, kMessageWarning);
    if (result != FileResult::kOk) DebugLog("Velatone", "curve file not loaded: %d", ResultCode(result));
}

void SaveCurvesFile(const CurveRecord* curves) {
    // Curves without a point-curve form are refused before the user picks a file for them.
    std::vector<uint8_t> probe;
    const FileResult writable = WritePointCurveBytes(curves, &probe);
    if (writable != FileResult::kOk) {
        if (const char* message = SaveCurvesMessage(curves, writable)) ShowMessage(message, kMessageWarning);
        return;
    }
    std::string path;
    if (!ShowFileDialog(SaveRequest(), &path, nullptr)) return;
    const FileResult result = WritePointCurveFile(path.c_str(), curves);
    if (result != FileResult::kOk) DebugLog("Velatone", "curve file not saved: %d", ResultCode(result));
}

FileOutcome LoadCurvesFromPath(const char* path, CorrectionSettings* settings, CurveFileType type) {
    FileOutcome outcome;
    if (settings == nullptr) {
        outcome.result = FileResult::kUnsupported;
    } else {
        const char* message = nullptr;
        outcome.result = ReadCurveFile(type, path, settings->toneCurves, &message);
        if (message) outcome.message = message;
        if (outcome.result == FileResult::kOk) {
            settings->curvesEnable = 1;
            settings->toneCurvesEnable = 1;
        }
    }
    outcome.code = ResultCode(outcome.result);
    return outcome;
}

FileOutcome SaveCurvesToPath(const char* path, const CorrectionSettings& settings) {
    FileOutcome outcome;
    outcome.result = WritePointCurveFile(path, settings.toneCurves);
    outcome.code = ResultCode(outcome.result);
    if (const char* message = SaveCurvesMessage(settings.toneCurves, outcome.result)) outcome.message = message;
    return outcome;
}

}  // namespace vt
