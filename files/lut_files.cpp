// The Autodesk and Quantel 1D LUT readers. Both read the whole text through the line reader,
// collect every value first and write the curves only when all data was read.
//
// Autodesk (.lut): optional lines before a header "LUT: <channels> <entries>", then the channels
// one after the other, one integer per line; blank lines and "#" comments may stand anywhere:
//     LUT: 3 1024
//
//     0
//     4
//     ...
// Quantel iQ (.txt): header lines "table <word> 2", "gmax <maximum>" and "gsize <entries>" in any
// order, a column heading "r g b", then one row of three integers per entry.
#include "files/lut_files.h"

#include <algorithm>
#include <cmath>
#include <new>
#include <string_view>
#include <vector>

#include "files/line_reader.h"
#include "platform/file_io.h"

namespace vt {

namespace {

enum class LutFailure : uint8_t { kNone, kTooShort, kTooFewChannels, kUnsupportedType, kReadError };

struct LutStatus {
    FileResult result;
    LutFailure failure;
};

constexpr LutStatus kLutOk{FileResult::kOk, LutFailure::kNone};

const char* MessageFor(LutFailure failure) {
    switch (failure) {
        case LutFailure::kNone: return nullptr;
        case LutFailure::kTooShort: return kLutTooShortMessage;
        case LutFailure::kTooFewChannels: return kLutTooFewChannelsMessage;
        case LutFailure::kUnsupportedType: return kLutUnsupportedTypeMessage;
        case LutFailure::kReadError: return kLutReadErrorMessage;
    }
    return kLutReadErrorMessage;
}

FileResult Finish(LutStatus status, const char** message) {
    if (message) *message = MessageFor(status.failure);
    return status.result;
}

constexpr LutStatus TooShort() { return {FileResult::kEndOfFile, LutFailure::kTooShort}; }
constexpr LutStatus Unusable() { return {FileResult::kUnsupported, LutFailure::kReadError}; }
constexpr LutStatus OutOfMemory() { return {FileResult::kOutOfMemory, LutFailure::kReadError}; }

// Values are stored as unsigned 16-bit numbers; anything outside that range is clamped into it
// rather than wrapped, so a stray large number cannot turn into a small one.
uint16_t ToStored(int64_t value) { return static_cast<uint16_t>(std::clamp<int64_t>(value, 0, 65535)); }

// Blank lines and "#" comments between the values are passed over.
bool IsDataLine(std::string_view line) {
    const std::string_view word = FirstWord(line);
    return !word.empty() && word.front() != '#';
}

// The next line holding data; false at the end of the text.
bool NextDataLine(LineReader* lines) {
    while (lines->Next()) {
        if (IsDataLine(lines->line())) return true;
    }
    return false;
}

// Room for the announced values, but never more than the text could hold (each value takes at
// least two characters), so a huge count in a small file allocates nothing large.
size_t ReserveFor(int64_t announced, size_t textBytes) {
    const auto bound = static_cast<uint64_t>(textBytes / 2 + 1);
    return static_cast<size_t>(std::min<uint64_t>(static_cast<uint64_t>(announced), bound));
}

// The input range of an Autodesk LUT follows from its largest value.
double AutodeskDivisor(uint16_t largest) {
    if (largest < 256) return 255.0;
    if (largest < 1024) return 1023.0;
    if (largest < 4096) return 4095.0;
    return 65535.0;
}

LutStatus ReadAutodesk(std::span<const uint8_t> bytes, float (&tables)[3][kCurveSampleCount]) {
    LineReader lines(bytes);
    int64_t channels = 0;
    int64_t entries = 0;
    for (;;) {
        if (!lines.Next()) return TooShort();
        FieldScanner fields(lines.line());
        std::string_view word;
        if (!fields.Word(&word) || word != "lut:") continue;
        // A header without its numbers (a bare "LUT:") leaves nothing to size the data by.
        if (!fields.Long(&channels)) return Unusable();
        if (channels < 3) return {FileResult::kUnsupported, LutFailure::kTooFewChannels};
        if (!fields.Long(&entries)) return Unusable();
        break;
    }
    // One entry has no neighbour to ramp towards.
    if (entries < 2) return Unusable();
    if (entries > kMaxLutEntries) return OutOfMemory();

    std::vector<uint16_t> values[3];
    try {
        for (auto& channel : values) channel.reserve(ReserveFor(entries, bytes.size()));
        for (auto& channel : values) {
            for (int64_t e = 0; e < entries; ++e) {
                if (!NextDataLine(&lines)) return TooShort();
                FieldScanner fields(lines.line());
                int64_t value = 0;
                if (!fields.Long(&value)) return Unusable();
                channel.push_back(ToStored(value));
            }
        }
    } catch (const std::bad_alloc&) {
        return OutOfMemory();
    }
    uint16_t largest = 0;
    for (const auto& channel : values) largest = std::max(largest, *std::max_element(channel.begin(), channel.end()));
    const double divisor = AutodeskDivisor(largest);
    for (int c = 0; c < 3; ++c) ResampleToTable(values[c].data(), values[c].size(), divisor, tables[c]);
    return kLutOk;
}

LutStatus ReadQuantel(std::span<const uint8_t> bytes, float (&tables)[3][kCurveSampleCount]) {
    LineReader lines(bytes);
    bool haveTable = false;
    bool haveMaximum = false;
    bool haveSize = false;
    int64_t maximum = 0;
    int64_t entries = 0;
    while (!(haveTable && haveMaximum && haveSize)) {
        if (!lines.Next()) return TooShort();
        FieldScanner fields(lines.line());
        std::string_view word;
        if (!fields.Word(&word)) continue;
        if (word == "table") {
            int64_t type = 0;
            std::string_view name;
            // A "table" line without its number names no type this reader knows.
            if (!fields.Word(&name) || !fields.Long(&type) || type != 2) {
                return {FileResult::kUnsupported, LutFailure::kUnsupportedType};
            }
            haveTable = true;
        } else if (word == "gmax") {
            if (!fields.Long(&maximum)) return Unusable();
            haveMaximum = true;
        } else if (word == "gsize") {
            if (!fields.Long(&entries)) return Unusable();
            haveSize = true;
        }
    }
    if (maximum <= 0) return Unusable();  // every value is divided by it
    if (entries < 2) return Unusable();
    if (entries > kMaxLutEntries) return OutOfMemory();
    for (;;) {
        if (!lines.Next()) return TooShort();
        FieldScanner fields(lines.line());
        std::string_view first;
        std::string_view second;
        if (fields.Word(&first) && fields.Word(&second) && first == "r" && second == "g") break;
    }

    std::vector<uint16_t> values[3];
    try {
        for (auto& channel : values) channel.reserve(ReserveFor(entries, bytes.size() / 3));
        for (int64_t e = 0; e < entries; ++e) {
            if (!NextDataLine(&lines)) return TooShort();
            FieldScanner fields(lines.line());
            for (auto& channel : values) {
                int64_t value = 0;
                if (!fields.Long(&value)) return Unusable();
                channel.push_back(ToStored(value));
            }
        }
    } catch (const std::bad_alloc&) {
        return OutOfMemory();
    }
    const auto divisor = static_cast<double>(maximum);
    for (int c = 0; c < 3; ++c) ResampleToTable(values[c].data(), values[c].size(), divisor, tables[c]);
    return kLutOk;
}

FileResult ReadLutBytes(std::span<const uint8_t> bytes, CurveRecord* curves, const char** message,
                        LutStatus (*read)(std::span<const uint8_t>, float (&)[3][kCurveSampleCount])) {
    if (curves == nullptr) return Finish(Unusable(), message);
    float tables[3][kCurveSampleCount];
    const LutStatus status = read(bytes, tables);
    if (status.result == FileResult::kOk) CommitTableCurves(curves, tables);
    return Finish(status, message);
}

FileResult ReadLutFile(const char* path, CurveRecord* curves, const char** message,
                       FileResult (*readBytes)(std::span<const uint8_t>, CurveRecord*, const char**)) {
    std::vector<uint8_t> bytes;
    bool complete = false;
    const uint32_t error = ReadFileBytes(path, kMaxLutFileBytes, FileShare::kShared, &bytes, &complete);
    if (error == kFileErrorOutOfMemory || (error == kFileErrorNone && !complete)) {
        return Finish(OutOfMemory(), message);
    }
    if (error != kFileErrorNone) return Finish({FileResult::kCannotOpen, LutFailure::kReadError}, message);
    return readBytes(bytes, curves, message);
}

}  // namespace

void ResampleToTable(const uint16_t* values, size_t count, double divisor, float* table) {
    if (count >= static_cast<size_t>(kCurveSampleCount)) {
        // Entry j is the mean of the values from j * count / 1024 up to the next entry's start:
        // runs of exactly count / 1024 values when count is a multiple of 1024.
        for (size_t j = 0; j < static_cast<size_t>(kCurveSampleCount); ++j) {
            const size_t begin = j * count / kCurveSampleCount;
            const size_t end = (j + 1) * count / kCurveSampleCount;
            double sum = 0.0;
            for (size_t i = begin; i < end; ++i) sum += values[i];
            table[j] = static_cast<float>(sum / static_cast<double>(end - begin) / divisor);
        }
        return;
    }
    // Value e covers the entries from e * 1024 / count on, ramping towards value e + 1; the last
    // value carries on the slope of the last pair. Real-valued throughout, so a count that does
    // not divide 1024 still spreads over the whole table.
    for (size_t j = 0; j < static_cast<size_t>(kCurveSampleCount); ++j) {
        const double position = static_cast<double>(j) * static_cast<double>(count) / kCurveSampleCount;
        const auto e = static_cast<size_t>(position);
        const double fraction = position - static_cast<double>(e);
        const double value = values[e];
        const double step = e + 1 < count ? values[e + 1] - value : value - values[e - 1];
        table[j] = static_cast<float>((value + fraction * step) / divisor);
    }
}

void CommitTableCurves(CurveRecord* curves, const float (&tables)[3][kCurveSampleCount]) {
    for (int j = 0; j < kCurveSampleCount; ++j) {
        curves[kChannelMaster].data.samples[j] = static_cast<float>(j / 1023.0);
    }
    for (int c = 0; c < 3; ++c) {
        std::copy(tables[c], tables[c] + kCurveSampleCount, curves[kChannelRed + c].data.samples);
    }
    for (int c = 0; c < kToneCurveCount; ++c) curves[c].flags |= kCurveFlagSampled;
}

FileResult ReadAutodeskLutBytes(std::span<const uint8_t> bytes, CurveRecord* curves, const char** message) {
    return ReadLutBytes(bytes, curves, message, ReadAutodesk);
}

FileResult ReadQuantelLutBytes(std::span<const uint8_t> bytes, CurveRecord* curves, const char** message) {
    return ReadLutBytes(bytes, curves, message, ReadQuantel);
}

FileResult ReadAutodeskLut(const char* path, CurveRecord* curves, const char** message) {
    return ReadLutFile(path, curves, message, ReadAutodeskLutBytes);
}

FileResult ReadQuantelLut(const char* path, CurveRecord* curves, const char** message) {
    return ReadLutFile(path, curves, message, ReadQuantelLutBytes);
}

}  // namespace vt
