#include "refhost/property_list.h"

#include <cstdio>

#include "sdk/pipl.h"

namespace refhost {

namespace {

std::string KeyText(uint32_t key) {
    std::string text(4, ' ');
    for (int i = 0; i < 4; ++i) text[static_cast<size_t>(i)] = static_cast<char>((key >> (24 - 8 * i)) & 0xFF);
    return text;
}

uint32_t ReadU32(const std::vector<uint8_t>& data) {
    if (data.size() < 4) return 0;
    return uint32_t{data[0]} | uint32_t{data[1]} << 8 | uint32_t{data[2]} << 16 | uint32_t{data[3]} << 24;
}

std::string Hex(uint32_t value) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%08X", value);
    return text;
}

std::string PascalText(const std::vector<uint8_t>& data) {
    if (data.empty()) return {};
    const size_t length = data[0] < data.size() ? data[0] : data.size() - 1;
    return "\"" + std::string(reinterpret_cast<const char*>(data.data()) + 1, length) + "\"";
}

const char* ReadResultText(PiplReadResult result) {
    switch (result) {
        case PiplReadResult::kOk: return "ok";
        case PiplReadResult::kTruncated: return "a property runs past the end";
        case PiplReadResult::kBadHeader: return "not a property list header";
        case PiplReadResult::kTooLarge: return "larger than a property list can be";
        case PiplReadResult::kTrailingBytes: return "bytes after the last property";
    }
    return "unreadable";
}

}  // namespace

bool DecodePropertyList(const std::vector<uint8_t>& bytes, std::vector<PiplEntry>* entries, std::string* error) {
    std::vector<PiplRecord> records;
    const PiplReadResult result = ReadPipl(bytes, records);
    if (result != PiplReadResult::kOk) {
        *error = std::string("malformed effect property list: ") + ReadResultText(result);
        return false;
    }
    entries->clear();
    for (const PiplRecord& record : records) {
        if (record.vendor != kPiplVendor8BIM) continue;
        entries->push_back({KeyText(record.key), std::vector<uint8_t>(record.data.begin(), record.data.end())});
    }
    return true;
}

std::string PropertyLabel(const std::string& key) {
    struct Label { const char* key; const char* label; };
    constexpr Label kLabels[] = {
        {"kind", "kind"}, {"name", "name"}, {"catg", "category"}, {"8664", "entry point (x64)"},
        {"ePVR", "property-list version"}, {"eSVR", "effect API version"}, {"eVER", "effect version"},
        {"eINF", "info flags"}, {"eGLO", "global out-flags"}, {"eGL2", "global out-flags2"},
        {"eMNA", "match name"}, {"aeFL", "effect info flags"},
    };
    for (const Label& label : kLabels) {
        if (key == label.key) return label.label;
    }
    return "unknown";
}

std::string DescribeEffectVersion(uint32_t version) {
    static const char* const kStages[] = {"develop", "alpha", "beta", "release"};
    const uint32_t build = version & 0x1FF;
    const uint32_t stage = (version >> 9) & 0x3;
    const uint32_t bugfix = (version >> 11) & 0xF;
    const uint32_t sub = (version >> 15) & 0xF;
    const uint32_t major = ((version >> 19) & 0x7) | (((version >> 26) & 0xF) << 3);
    char text[96];
    std::snprintf(text, sizeof text, "%u.%u.%u %s build %u (%s)", major, sub, bugfix, kStages[stage], build,
                  Hex(version).c_str());
    return text;
}

std::string DescribeProperty(const PiplEntry& entry) {
    const std::string& key = entry.key;
    if (key == "name" || key == "catg" || key == "eMNA") return PascalText(entry.data);
    if (key == "8664") {
        std::string text;
        for (uint8_t c : entry.data) {
            if (c == 0) break;
            text.push_back(static_cast<char>(c));
        }
        return "\"" + text + "\"";
    }
    const uint32_t value = ReadU32(entry.data);
    if (key == "kind") {
        const std::string kind = std::string(1, static_cast<char>(value >> 24)) + static_cast<char>(value >> 16) +
                                 static_cast<char>(value >> 8) + static_cast<char>(value);
        return kind + (kind == "eFKT" ? " (effect)" : "");
    }
    if (key == "ePVR" || key == "eSVR") {
        return std::to_string(value & 0xFFFF) + "." + std::to_string(value >> 16);
    }
    if (key == "eVER") return DescribeEffectVersion(value);
    return Hex(value);
}

}  // namespace refhost
