#include "platform/posix/reg_file.h"

#include <algorithm>
#include <charconv>

namespace vt::posix {

namespace {

constexpr std::string_view kHeader = "Windows Registry Editor Version 5.00";
constexpr std::string_view kHeaderOld = "REGEDIT4";

char LowerAscii(char c) { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c; }

std::string LowerCopy(std::string_view text) {
    std::string out(text);
    std::transform(out.begin(), out.end(), out.begin(), LowerAscii);
    return out;
}

std::string_view Trim(std::string_view text) {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) text.remove_prefix(1);
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t' || text.back() == '\r')) text.remove_suffix(1);
    return text;
}

// Spells out the abbreviated roots the way the registry editor exports them.
std::string NormaliseKeyPath(std::string_view path) {
    std::string lowered = LowerCopy(path);
    const std::pair<std::string_view, std::string_view> roots[] = {
        {"hkcu", "hkey_current_user"}, {"hklm", "hkey_local_machine"}};
    for (const auto& [shortName, longName] : roots) {
        if (lowered.size() >= shortName.size() && lowered.compare(0, shortName.size(), shortName) == 0 &&
            (lowered.size() == shortName.size() || lowered[shortName.size()] == '\\')) {
            lowered = std::string(longName) + lowered.substr(shortName.size());
        }
    }
    while (!lowered.empty() && lowered.back() == '\\') lowered.pop_back();
    return lowered;
}

// Reads a quoted string starting at text[0] == '"'; handles \\ and \" escapes.
// Returns the characters consumed, or 0 when the string is not closed.
size_t ReadQuoted(std::string_view text, std::string* out) {
    out->clear();
    for (size_t i = 1; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '\\' && i + 1 < text.size()) {
            out->push_back(text[++i]);
        } else if (c == '"') {
            return i + 1;
        } else {
            out->push_back(c);
        }
    }
    return 0;
}

bool ParseHexBytes(std::string_view text, std::vector<uint8_t>* out) {
    out->clear();
    text = Trim(text);
    if (text.empty()) return true;
    size_t start = 0;
    while (start <= text.size()) {
        size_t comma = text.find(',', start);
        if (comma == std::string_view::npos) comma = text.size();
        const std::string_view item = Trim(text.substr(start, comma - start));
        unsigned value = 0;
        const auto [end, error] = std::from_chars(item.data(), item.data() + item.size(), value, 16);
        if (item.empty() || item.size() > 2 || error != std::errc() || end != item.data() + item.size()) return false;
        out->push_back(static_cast<uint8_t>(value));
        start = comma + 1;
    }
    return true;
}

// Parses the part after '=' of a value line into *value. Returns a reason on failure.
const char* ParseValueData(std::string_view data, RegValue* value) {
    data = Trim(data);
    if (data.empty()) return "missing value data";
    if (data.front() == '"') {
        std::string text;
        const size_t used = ReadQuoted(data, &text);
        if (used == 0) return "unterminated string";
        if (!Trim(data.substr(used)).empty()) return "text after the string";
        value->type = RegistryType::kString;
        value->data.assign(text.begin(), text.end());
        value->data.push_back(0);  // a string value is stored with its terminating zero
        return nullptr;
    }
    const std::string lowered = LowerCopy(data);
    if (lowered.rfind("dword:", 0) == 0) {
        const std::string_view digits = Trim(data.substr(6));
        uint32_t number = 0;
        const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, 16);
        if (digits.empty() || digits.size() > 8 || error != std::errc() || end != digits.data() + digits.size()) {
            return "malformed dword";
        }
        value->type = RegistryType::kDword;
        value->data.resize(4);
        for (int i = 0; i < 4; ++i) value->data[i] = static_cast<uint8_t>(number >> (8 * i));
        return nullptr;
    }
    if (lowered.rfind("hex:", 0) == 0) {
        value->type = RegistryType::kBinary;
        return ParseHexBytes(data.substr(4), &value->data) ? nullptr : "malformed hex bytes";
    }
    if (lowered.rfind("hex(", 0) == 0) {
        const size_t close = lowered.find("):");
        if (close == std::string::npos) return "malformed hex type";
        const std::string_view typeDigits = std::string_view(lowered).substr(4, close - 4);
        uint32_t type = 0;
        const auto [end, error] = std::from_chars(typeDigits.data(), typeDigits.data() + typeDigits.size(), type, 16);
        if (typeDigits.empty() || error != std::errc() || end != typeDigits.data() + typeDigits.size()) {
            return "malformed hex type";
        }
        value->type = static_cast<RegistryType>(type);
        return ParseHexBytes(data.substr(close + 2), &value->data) ? nullptr : "malformed hex bytes";
    }
    if (data == "-") return "value deletion is not supported";
    return "unknown value type";
}

}  // namespace

std::string DecodeRegFileBytes(std::span<const uint8_t> bytes) {
    std::string text;
    if (bytes.size() >= 2 && bytes[0] == 0xFF && bytes[1] == 0xFE) {
        text.reserve(bytes.size() / 2);
        for (size_t i = 2; i + 1 < bytes.size(); i += 2) {
            const unsigned unit = bytes[i] | (bytes[i + 1] << 8);
            text.push_back(unit < 0x80 ? static_cast<char>(unit) : '?');
        }
        return text;
    }
    size_t start = 0;
    if (bytes.size() >= 3 && bytes[0] == 0xEF && bytes[1] == 0xBB && bytes[2] == 0xBF) start = 3;
    text.assign(reinterpret_cast<const char*>(bytes.data()) + start, bytes.size() - start);
    return text;
}

std::string RegKeyPath(RegistryRoot root, std::string_view path) {
    const std::string_view rootName =
        root == RegistryRoot::kCurrentUser ? "HKEY_CURRENT_USER\\" : "HKEY_LOCAL_MACHINE\\";
    return NormaliseKeyPath(std::string(rootName) + std::string(path));
}

std::vector<RegKey> ParseRegFile(std::string_view text, const RegSkipReporter& onSkip) {
    std::vector<RegKey> keys;
    RegKey* current = nullptr;
    auto skip = [&](int line, const char* reason) {
        if (onSkip) onSkip(line, reason);
    };

    size_t position = 0;
    int lineNumber = 0;
    while (position < text.size()) {
        // Gather one logical line: a trailing backslash continues it on the next physical line.
        std::string logical;
        const int firstLine = lineNumber + 1;
        while (position < text.size()) {
            size_t end = text.find('\n', position);
            if (end == std::string_view::npos) end = text.size();
            std::string_view physical = Trim(text.substr(position, end - position));
            position = end + 1;
            ++lineNumber;
            if (!physical.empty() && physical.back() == '\\' && physical.front() != '[') {
                physical.remove_suffix(1);
                logical.append(physical);
                continue;
            }
            logical.append(physical);
            break;
        }
        const std::string_view line = Trim(logical);
        if (line.empty() || line.front() == ';') continue;
        if (line == kHeader || line == kHeaderOld) continue;
        if (line.front() == '[') {
            if (line.back() != ']' || line.size() < 3) {
                skip(firstLine, "malformed key line");
                current = nullptr;
                continue;
            }
            if (line[1] == '-') {
                skip(firstLine, "key deletion is not supported");
                current = nullptr;
                continue;
            }
            const std::string path = NormaliseKeyPath(line.substr(1, line.size() - 2));
            auto found = std::find_if(keys.begin(), keys.end(), [&](const RegKey& k) { return k.path == path; });
            if (found == keys.end()) {
                keys.push_back(RegKey{path, {}});
                current = &keys.back();
            } else {
                current = &*found;
            }
            continue;
        }
        if (!current) {
            skip(firstLine, "value outside a key");
            continue;
        }
        RegValue value;
        size_t nameEnd = 0;
        if (line.front() == '@') {
            nameEnd = 1;
        } else if (line.front() == '"') {
            nameEnd = ReadQuoted(line, &value.name);
            if (nameEnd == 0) {
                skip(firstLine, "unterminated value name");
                continue;
            }
        } else {
            skip(firstLine, "not a key or a value");
            continue;
        }
        const std::string_view rest = Trim(line.substr(nameEnd));
        if (rest.empty() || rest.front() != '=') {
            skip(firstLine, "missing '='");
            continue;
        }
        if (const char* reason = ParseValueData(rest.substr(1), &value)) {
            skip(firstLine, reason);
            continue;
        }
        const std::string lowered = LowerCopy(value.name);
        auto same = std::find_if(current->values.begin(), current->values.end(),
                                 [&](const RegValue& v) { return LowerCopy(v.name) == lowered; });
        if (same == current->values.end()) {
            current->values.push_back(std::move(value));
        } else {
            *same = std::move(value);
        }
    }
    return keys;
}

}  // namespace vt::posix
