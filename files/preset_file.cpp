// The settings preset reader.
//
// File: magic 0x11223344, version (1, 2, 3 or 5), then sections until the end of the file:
//     u32 tag, u32 length, payload
// Every value is a big-endian 32-bit word: an integer, an IEEE float ("raw", stored as it is) or a
// signed 16.16 fixed-point number ("fixed", stored as its float value). Known tags have a payload
// of fixed size whatever the length says; unknown tags are skipped by their length.
#include "files/preset_file.h"

#include <cstddef>
#include <cstring>
#include <string>

#include "files/byte_cursor.h"
#include "platform/dialogs.h"
#include "platform/file_io.h"
#include "platform/ui.h"

namespace vt {

namespace {

constexpr FileTypeFilter kPresetFilters[] = {{"Velatone Settings (*.vtpreset)", "*.vtpreset"},
                                             {"All Files (*.*)", "*.*"}};

constexpr uint32_t kCurveRecordWords = sizeof(CurveRecord) / 4;        // 1,027
constexpr uint32_t kSecondaryWords = sizeof(SecondaryRecord) / 4;      // 31
constexpr uint32_t kAuxiliaryWords = sizeof(AuxiliaryRecord) / 4;      // 115
constexpr uint32_t kOldSecondaryWords27 = 27;
constexpr uint32_t kOldSecondaryWords30 = 30;
constexpr uint32_t kOldCurveWords = 35;

struct TagSize {
    uint32_t tag;
    uint32_t bytes;
};

constexpr TagSize kPayloadSizes[] = {
    {1, 4 * 36},   {2, 4 * 52},   {3, 4 * 52},     {4, 4 * 52},    {5, 52},       {6, 5 * 32},    {7, 4 * 140},
    {8, 3 * 12},   {9, 24},       {10, 6 * 108},   {12, 36},       {13, 28},      {14, 4},        {15, 4},
    {16, 4},       {17, 4},       {18, 4},         {19, 4},        {20, 4},       {21, 4},        {22, 4},
    {23, 4},       {24, 4},       {25, 4},         {26, 6 * 120},  {27, 4 * 4108}, {28, 4},       {29, 4 * 40},
    {30, 4 * 52},  {31, 4 * 52},  {32, 4 * 52},    {33, 52},       {35, 6 * 124}, {36, 4},        {37, 6 * 460},
    {39, 40},      {40, 3 * 4108}, {41, 4},        {42, 4},        {43, 16},
};

// Writes one section's payload into the record word by word. Only words the payload really holds
// are written: a truncated section changes no more than it carried.
class SectionWriter {
public:
    SectionWriter(CorrectionSettings* settings, std::span<const uint8_t> payload)
        : m_record(reinterpret_cast<uint8_t*>(settings)), m_payload(payload) {}

    size_t words() const { return m_payload.size() / 4; }
    bool Has(size_t word) const { return word < words(); }

    uint32_t Word(size_t word) const {
        const uint8_t* p = m_payload.data() + word * 4;
        return (uint32_t{p[0]} << 24) | (uint32_t{p[1]} << 16) | (uint32_t{p[2]} << 8) | uint32_t{p[3]};
    }

    void Put(size_t offset, uint32_t value) { std::memcpy(m_record + offset, &value, 4); }
    void PutFloat(size_t offset, float value) { std::memcpy(m_record + offset, &value, 4); }

    void Raw(size_t word, size_t offset) {
        if (Has(word)) Put(offset, Word(word));
    }
    void RawRun(size_t firstWord, size_t offset, size_t count) {
        for (size_t i = 0; i < count; ++i) Raw(firstWord + i, offset + 4 * i);
    }
    void Fixed(size_t word, size_t offset) {
        if (Has(word)) PutFloat(offset, FixedToFloat(Word(word)));
    }
    void FixedRun(size_t firstWord, size_t offset, size_t count) {
        for (size_t i = 0; i < count; ++i) Fixed(firstWord + i, offset + 4 * i);
    }
    // An enable taken from any non-zero word.
    void Flag(size_t word, size_t offset) {
        if (Has(word)) Put(offset, Word(word) != 0 ? 1u : 0u);
    }

    static float FixedToFloat(uint32_t word) {
        return static_cast<float>(static_cast<double>(static_cast<int32_t>(word)) / 65536.0);
    }

private:
    uint8_t* m_record;
    std::span<const uint8_t> m_payload;
};

constexpr size_t TonalOffset(int r) { return offsetof(CorrectionSettings, tonal) + sizeof(TonalRange) * r; }
constexpr size_t SecondaryOffset(int k) {
    return offsetof(CorrectionSettings, secondaries) + sizeof(SecondaryRecord) * k;
}

// Old tonal range: enable, hue, saturation, brightness, contrast, centre, gain, gamma, pedestal;
// vibrance is not in this form.
void ApplyOldTonalRanges(SectionWriter& w) {
    for (int r = 0; r < kRangeCount; ++r) {
        const size_t first = 9 * r;
        const size_t base = TonalOffset(r);
        w.Raw(first, base + offsetof(TonalRange, enable));
        w.Fixed(first + 1, base + offsetof(TonalRange, hue));
        w.Fixed(first + 2, base + offsetof(TonalRange, saturation));
        w.FixedRun(first + 3, base + offsetof(TonalRange, brightness), 6);
    }
}

// Old channel range: enable, then twelve fixed values.
void ApplyOldChannelSet(SectionWriter& w, size_t setOffset) {
    for (int r = 0; r < kRangeCount; ++r) {
        const size_t base = setOffset + offsetof(ChannelSet, range) + sizeof(ChannelRange) * r;
        w.Raw(13 * r, base);
        w.FixedRun(13 * r + 1, base + 4, 12);
    }
}

// Old hue wheels: the flag, then per wheel its word, angle and amount.
void ApplyOldHueWheels(SectionWriter& w) {
    w.Raw(0, offsetof(CorrectionSettings, hueWheelsWord));
    for (int wheel = 0; wheel < kHueWheelCount; ++wheel) {
        const size_t base = offsetof(CorrectionSettings, hueWheels) + sizeof(HueWheel) * wheel;
        w.Raw(1 + 3 * wheel, base + offsetof(HueWheel, word));
        w.Fixed(2 + 3 * wheel, base + offsetof(HueWheel, angle));
        w.Fixed(3 + 3 * wheel, base + offsetof(HueWheel, amount));
    }
}

// Old tone curve (35 words): a skipped word, the curve word, the point count, 16 x and 16 y, all
// raw; the curve becomes a point curve once its count is read.
void ApplyOldToneCurves(SectionWriter& w) {
    for (int c = 0; c < kToneCurveCount; ++c) {
        const size_t first = kOldCurveWords * c;
        const size_t base = offsetof(CorrectionSettings, toneCurves) + sizeof(CurveRecord) * c;
        w.Raw(first + 1, base + offsetof(CurveRecord, curveWord));
        w.Raw(first + 2, base + offsetof(CurveRecord, data.points.count));
        if (w.Has(first + 2)) w.Put(base + offsetof(CurveRecord, flags), 0);
        w.RawRun(first + 3, base + offsetof(CurveRecord, data.points.x), kCurvePointCapacity);
        w.RawRun(first + 3 + kCurvePointCapacity, base + offsetof(CurveRecord, data.points.y), kCurvePointCapacity);
    }
}

// The words of the old secondary forms that both share: r0-r4, r6-r27 from w0-w26.
void ApplyOldSecondaryCommon(SectionWriter& w, size_t first, size_t base) {
    w.Raw(first, base);
    w.FixedRun(first + 1, base + 4, 3);
    w.Flag(first + 4, base + 16);
    w.Raw(first + 5, base + 24);
    w.FixedRun(first + 6, base + 28, 2);
    w.Raw(first + 8, base + 36);
    w.FixedRun(first + 9, base + 40, 2);
    w.RawRun(first + 11, base + 48, 16);
}

// The second secondaries enable is set when any record read turns itself on.
void MarkSecondariesEnabled(SectionWriter& w, size_t recordWords) {
    for (int k = 0; k < kSecondaryCount; ++k) {
        const size_t first = recordWords * k;
        if (w.Has(first) && w.Word(first) != 0) w.Put(offsetof(CorrectionSettings, secondariesEnable2), 1);
    }
}

// 27-word secondaries: mode 1, gain and gamma 1, pedestal 0 for each record read whole.
void ApplySecondaries27(SectionWriter& w) {
    for (int k = 0; k < kSecondaryCount; ++k) {
        const size_t first = kOldSecondaryWords27 * k;
        const size_t base = SecondaryOffset(k);
        ApplyOldSecondaryCommon(w, first, base);
        if (w.Has(first + kOldSecondaryWords27 - 1)) {
            w.Put(base + offsetof(SecondaryRecord, mode), 1);
            w.PutFloat(base + offsetof(SecondaryRecord, gain), 1.0f);
            w.PutFloat(base + offsetof(SecondaryRecord, gamma), 1.0f);
            w.PutFloat(base + offsetof(SecondaryRecord, pedestal), 0.0f);
        }
    }
    MarkSecondariesEnabled(w, kOldSecondaryWords27);
}

// 30-word secondaries: the mode keeps its value; gain, gamma and pedestal are in the file.
void ApplySecondaries30(SectionWriter& w) {
    for (int k = 0; k < kSecondaryCount; ++k) {
        const size_t first = kOldSecondaryWords30 * k;
        const size_t base = SecondaryOffset(k);
        ApplyOldSecondaryCommon(w, first, base);
        w.FixedRun(first + 27, base + offsetof(SecondaryRecord, gain), 3);
    }
    MarkSecondariesEnabled(w, kOldSecondaryWords30);
}

// Old limiter: three fixed levels, the soft-clip enable, three fixed levels, method, system.
void ApplyOldLimiter(SectionWriter& w) {
    w.FixedRun(0, offsetof(CorrectionSettings, chromaMaxLimit), 3);
    w.Raw(3, offsetof(CorrectionSettings, enableSoftClip));
    w.FixedRun(4, offsetof(CorrectionSettings, softClipKneeLevel), 3);
    w.Raw(7, offsetof(CorrectionSettings, limitMethod));
    w.Raw(8, offsetof(CorrectionSettings, videoSystem));
}

// The auxiliary records as they are, except words 3 and 13 to 18 of each, which keep their values.
void ApplyAuxiliaries(SectionWriter& w) {
    for (int k = 0; k < kSecondaryCount; ++k) {
        const size_t first = kAuxiliaryWords * k;
        const size_t base = offsetof(CorrectionSettings, auxiliaries) + sizeof(AuxiliaryRecord) * k;
        for (size_t i = 0; i < kAuxiliaryWords; ++i) {
            if (i == 3 || (i >= 13 && i <= 18)) continue;
            w.Raw(first + i, base + 4 * i);
        }
    }
}

void ApplySection(uint32_t tag, std::span<const uint8_t> payload, CorrectionSettings* settings) {
    SectionWriter w(settings, payload);
    switch (tag) {
        case 1: ApplyOldTonalRanges(w); break;
        case 2: ApplyOldChannelSet(w, offsetof(CorrectionSettings, rgbSet)); break;
        case 3: ApplyOldChannelSet(w, offsetof(CorrectionSettings, secondSet)); break;
        case 4: ApplyOldChannelSet(w, offsetof(CorrectionSettings, thirdSet)); break;
        case 5: ApplyOldHueWheels(w); break;
        case 6: w.RawRun(0, offsetof(CorrectionSettings, levelsWord), 40); break;
        case 7: ApplyOldToneCurves(w); break;
        case 8: w.RawRun(0, offsetof(CorrectionSettings, toneCurvesTail), 9); break;
        case 9: w.RawRun(0, offsetof(CorrectionSettings, lumaRangesWords), 6); break;
        case 10: ApplySecondaries27(w); break;
        case 12: ApplyOldLimiter(w); break;
        case 13: w.RawRun(0, offsetof(CorrectionSettings, limiterExtension), 7); break;
        case 14: w.Raw(0, offsetof(CorrectionSettings, masterEnable)); break;
        case 15: w.Raw(0, offsetof(CorrectionSettings, tonalEnable)); break;
        case 16: w.Raw(0, offsetof(CorrectionSettings, rgbSet.enable)); break;
        case 17: w.Raw(0, offsetof(CorrectionSettings, secondSet.enable)); break;
        case 18: w.Raw(0, offsetof(CorrectionSettings, thirdSet.enable)); break;
        case 19: w.Raw(0, offsetof(CorrectionSettings, hueWheelsEnable)); break;
        case 20: w.Raw(0, offsetof(CorrectionSettings, levelsEnable)); break;
        case 21: w.Raw(0, offsetof(CorrectionSettings, secondariesEnable)); break;
        case 22:
            w.Raw(0, offsetof(CorrectionSettings, curvesEnable));
            w.Raw(0, offsetof(CorrectionSettings, toneCurvesEnable));
            break;
        case 23: w.Raw(0, offsetof(CorrectionSettings, lumaRangesEnable)); break;
        case 24: w.Raw(0, offsetof(CorrectionSettings, enableLimiter)); break;
        case 25: w.Raw(0, offsetof(CorrectionSettings, showLimiterPreview)); break;
        case 26: ApplySecondaries30(w); break;
        case 27: w.RawRun(0, offsetof(CorrectionSettings, toneCurves), kToneCurveCount * kCurveRecordWords); break;
        case 28: w.Raw(0, offsetof(CorrectionSettings, secondariesEnable2)); break;
        case 29: w.RawRun(0, offsetof(CorrectionSettings, tonal), kRangeCount * sizeof(TonalRange) / 4); break;
        case 30: w.RawRun(0, offsetof(CorrectionSettings, rgbSet.range), kRangeCount * sizeof(ChannelRange) / 4); break;
        case 31: w.RawRun(0, offsetof(CorrectionSettings, secondSet.range), kRangeCount * sizeof(ChannelRange) / 4); break;
        case 32: w.RawRun(0, offsetof(CorrectionSettings, thirdSet.range), kRangeCount * sizeof(ChannelRange) / 4); break;
        case 33: w.RawRun(0, offsetof(CorrectionSettings, hueWheelsWord), 13); break;
        case 35: w.RawRun(0, offsetof(CorrectionSettings, secondaries), kSecondaryCount * kSecondaryWords); break;
        case 36: w.Raw(0, offsetof(CorrectionSettings, secondariesWord)); break;
        case 37: ApplyAuxiliaries(w); break;
        case 39: w.RawRun(0, offsetof(CorrectionSettings, chromaMaxLimit), 10); break;
        case 40: w.RawRun(0, offsetof(CorrectionSettings, hueCurves), kHueCurveCount * kCurveRecordWords); break;
        case 41: w.Raw(0, offsetof(CorrectionSettings, toneCurvesEnable)); break;
        case 42: w.Raw(0, offsetof(CorrectionSettings, hueCurvesEnable)); break;
        case 43: w.RawRun(0, offsetof(CorrectionSettings, autoCorrectA), 4); break;
        default: break;
    }
}

FileOutcome Outcome(FileResult result, int32_t code) {
    FileOutcome outcome;
    outcome.result = result;
    outcome.code = code;
    if (result == FileResult::kNotSettingsFile) outcome.message = kInvalidSettingsFileMessage;
    return outcome;
}

// Reads the file: the result and, when it cannot be read, the system's error code.
FileResult ReadPresetFile(const char* path, CorrectionSettings* settings, uint32_t* systemError) {
    *systemError = kFileErrorNone;
    std::vector<uint8_t> bytes;
    bool complete = false;
    uint32_t error = ReadFileBytes(path, kMaxPresetFileBytes, FileShare::kExclusive, &bytes, &complete);
    if (error == kFileErrorNone && !complete) error = kFileErrorOutOfMemory;
    if (error != kFileErrorNone) {
        *systemError = error;
        return FileResult::kCannotOpen;
    }
    return MergeSettingsPreset(bytes, settings);
}

}  // namespace

uint32_t PresetPayloadSize(uint32_t tag) {
    for (const TagSize& entry : kPayloadSizes) {
        if (entry.tag == tag) return entry.bytes;
    }
    return 0;
}

FileResult MergeSettingsPreset(std::span<const uint8_t> bytes, CorrectionSettings* settings) {
    if (settings == nullptr) return FileResult::kUnsupported;
    ByteCursor cursor(bytes);
    uint32_t magic = 0;
    uint32_t version = 0;
    if (!cursor.ReadBE32(magic) || !cursor.ReadBE32(version) || magic != kPresetMagic) {
        return FileResult::kNotSettingsFile;
    }
    if (version != 1 && version != 2 && version != 3 && version != 5) return FileResult::kNotSettingsFile;

    uint32_t tag = 0;
    while (cursor.ReadBE32(tag)) {
        uint32_t length = 0;
        if (!cursor.ReadBE32(length)) break;
        const uint32_t size = PresetPayloadSize(tag);
        if (size == 0) {
            // The length is unsigned and may run past the end: the skip stops there.
            if (!cursor.Skip(length)) break;
            continue;
        }
        const std::span<const uint8_t> payload = cursor.Take(size);
        ApplySection(tag, payload, settings);
        if (payload.size() < size) break;
    }
    return FileResult::kOk;
}

int32_t ReadSettingsPreset(const char* path, CorrectionSettings* settings) {
    uint32_t systemError = kFileErrorNone;
    const FileResult result = ReadPresetFile(path, settings, &systemError);
    if (result == FileResult::kCannotOpen) return static_cast<int32_t>(systemError);
    return ResultCode(result);
}

FileResult LoadSettingsPreset(CorrectionSettings* settings) {
    const FileDialogRequest request{false,          kLoadSettingsTitle, kPresetExtension + 1, nullptr,
                                    kPresetFilters, 2,                  kOpenDialogFlags};
    std::string path;
    if (!ShowFileDialog(request, &path, nullptr)) return FileResult::kCancelled;
    uint32_t systemError = kFileErrorNone;
    const FileResult result = ReadPresetFile(path.c_str(), settings, &systemError);
    if (result == FileResult::kNotSettingsFile) ShowMessage(kInvalidSettingsFileMessage, kMessageWarning);
    if (result == FileResult::kCannotOpen) {
        DebugLog("Velatone", "settings file not opened: error %u", static_cast<unsigned>(systemError));
    }
    return result;
}

FileOutcome LoadPresetFromPath(const char* path, CorrectionSettings* settings) {
    uint32_t systemError = kFileErrorNone;
    const FileResult result = ReadPresetFile(path, settings, &systemError);
    return Outcome(result, result == FileResult::kCannotOpen ? static_cast<int32_t>(systemError) : ResultCode(result));
}

}  // namespace vt
