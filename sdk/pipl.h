// The binary property list ("PiPL", resource 16000) a host reads before it loads an effect: a
// compile-time writer that turns a table of properties into the resource bytes, and a bounds-checked
// reader the reference host uses to find the entry point. Header-only.
//
// Layout (little-endian):
//   u16 reserved = 1 | u32 version = 0 | u32 count | count x property
//   property: u32 vendor | u32 key | u32 id = 0 | u32 length | length bytes of data
// Vendor and key are four-character codes held as c0<<24 | c1<<16 | c2<<8 | c3, so 'kind' appears in
// the file as "dnik". The length is the data length rounded up to a multiple of 4; the data is
// zero-padded to it.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

// ---------------------------------------------------------------------------------------------------
// Codes and sizes.

constexpr uint32_t PiplFourcc(const char (&code)[5]) {
    return static_cast<uint32_t>(static_cast<uint8_t>(code[0])) << 24 |
           static_cast<uint32_t>(static_cast<uint8_t>(code[1])) << 16 |
           static_cast<uint32_t>(static_cast<uint8_t>(code[2])) << 8 |
           static_cast<uint32_t>(static_cast<uint8_t>(code[3]));
}

constexpr int32_t kPiplResourceId = 16000;
constexpr const char* kPiplResourceType = "PiPL";
constexpr uint16_t kPiplReservedWord = 1;
constexpr uint32_t kPiplVersion = 0;
constexpr size_t kPiplHeaderSize = 10;
constexpr size_t kPiplPropertyHeaderSize = 16;
// Far above any real effect's list; bounds what a reader will accept before it allocates.
constexpr size_t kPiplMaxBytes = 64 * 1024;
// A Pascal string (length byte + 255 characters) is the longest payload the writer builds.
constexpr size_t kPiplMaxPayload = 256;

// Effect properties all carry this vendor code.
constexpr uint32_t kPiplVendor8BIM = PiplFourcc("8BIM");

constexpr uint32_t kPiplKind = PiplFourcc("kind");
constexpr uint32_t kPiplName = PiplFourcc("name");
constexpr uint32_t kPiplCategory = PiplFourcc("catg");
constexpr uint32_t kPiplCodeWin64X86 = PiplFourcc("8664");
constexpr uint32_t kPiplPiplVersion = PiplFourcc("ePVR");
constexpr uint32_t kPiplEffectSpecVersion = PiplFourcc("eSVR");
constexpr uint32_t kPiplEffectVersion = PiplFourcc("eVER");
constexpr uint32_t kPiplEffectInfoFlags = PiplFourcc("eINF");
constexpr uint32_t kPiplGlobalOutFlags = PiplFourcc("eGLO");
constexpr uint32_t kPiplGlobalOutFlags2 = PiplFourcc("eGL2");
constexpr uint32_t kPiplMatchName = PiplFourcc("eMNA");
constexpr uint32_t kPiplReservedInfo = PiplFourcc("aeFL");
// Value of the 'kind' property for an effect.
constexpr uint32_t kPiplKindEffect = PiplFourcc("eFKT");

constexpr uint32_t PiplPaddedLength(uint32_t length) { return (length + 3u) & ~3u; }

// ---------------------------------------------------------------------------------------------------
// Writer. Payload builders run at compile time only; a payload that does not fit stops the build at
// the call of PiplPayloadDoesNotFit, which is deliberately never defined.

void PiplPayloadDoesNotFit();

struct PiplPayload {
    std::array<uint8_t, kPiplMaxPayload> bytes{};
    uint32_t size = 0;
};

struct PiplProperty {
    uint32_t key;
    PiplPayload payload;
    uint32_t vendor = kPiplVendor8BIM;
    uint32_t id = 0;
};

consteval PiplPayload PiplU32(uint32_t value) {
    PiplPayload p;
    for (int i = 0; i < 4; ++i) p.bytes[static_cast<size_t>(i)] = static_cast<uint8_t>(value >> (8 * i));
    p.size = 4;
    return p;
}

consteval PiplPayload PiplU16(uint16_t value) {
    PiplPayload p;
    p.bytes[0] = static_cast<uint8_t>(value);
    p.bytes[1] = static_cast<uint8_t>(value >> 8);
    p.size = 2;
    return p;
}

// Two 16-bit halves, first then second (major, minor); reads back as a u32 equal to first + second<<16.
consteval PiplPayload PiplU16Pair(uint16_t first, uint16_t second) {
    PiplPayload p;
    p.bytes[0] = static_cast<uint8_t>(first);
    p.bytes[1] = static_cast<uint8_t>(first >> 8);
    p.bytes[2] = static_cast<uint8_t>(second);
    p.bytes[3] = static_cast<uint8_t>(second >> 8);
    p.size = 4;
    return p;
}

// Length byte followed by the characters, no terminator.
consteval PiplPayload PiplPascalString(std::string_view text) {
    if (text.size() > 255) PiplPayloadDoesNotFit();
    PiplPayload p;
    p.bytes[0] = static_cast<uint8_t>(text.size());
    for (size_t i = 0; i < text.size(); ++i) p.bytes[i + 1] = static_cast<uint8_t>(text[i]);
    p.size = static_cast<uint32_t>(text.size() + 1);
    return p;
}

// The characters followed by one NUL.
consteval PiplPayload PiplCString(std::string_view text) {
    if (text.size() + 1 > kPiplMaxPayload) PiplPayloadDoesNotFit();
    PiplPayload p;
    for (size_t i = 0; i < text.size(); ++i) p.bytes[i] = static_cast<uint8_t>(text[i]);
    p.size = static_cast<uint32_t>(text.size() + 1);
    return p;
}

constexpr size_t PiplSize(std::span<const PiplProperty> properties) {
    size_t size = kPiplHeaderSize;
    for (const PiplProperty& property : properties) {
        size += kPiplPropertyHeaderSize + PiplPaddedLength(property.payload.size);
    }
    return size;
}

namespace pipl_detail {

constexpr void PutU16(uint8_t* out, size_t& at, uint16_t value) {
    out[at++] = static_cast<uint8_t>(value);
    out[at++] = static_cast<uint8_t>(value >> 8);
}

constexpr void PutU32(uint8_t* out, size_t& at, uint32_t value) {
    for (int i = 0; i < 4; ++i) out[at++] = static_cast<uint8_t>(value >> (8 * i));
}

constexpr uint32_t GetU32(std::span<const uint8_t> bytes, size_t at) {
    return static_cast<uint32_t>(bytes[at]) | static_cast<uint32_t>(bytes[at + 1]) << 8 |
           static_cast<uint32_t>(bytes[at + 2]) << 16 | static_cast<uint32_t>(bytes[at + 3]) << 24;
}

}  // namespace pipl_detail

// Size must equal PiplSize(properties); the build fails otherwise.
template <size_t Size>
consteval std::array<uint8_t, Size> WritePipl(std::span<const PiplProperty> properties) {
    if (PiplSize(properties) != Size) PiplPayloadDoesNotFit();
    std::array<uint8_t, Size> out{};
    size_t at = 0;
    pipl_detail::PutU16(out.data(), at, kPiplReservedWord);
    pipl_detail::PutU32(out.data(), at, kPiplVersion);
    pipl_detail::PutU32(out.data(), at, static_cast<uint32_t>(properties.size()));
    for (const PiplProperty& property : properties) {
        const uint32_t padded = PiplPaddedLength(property.payload.size);
        pipl_detail::PutU32(out.data(), at, property.vendor);
        pipl_detail::PutU32(out.data(), at, property.key);
        pipl_detail::PutU32(out.data(), at, property.id);
        pipl_detail::PutU32(out.data(), at, padded);
        for (uint32_t i = 0; i < padded; ++i) {
            out[at++] = i < property.payload.size ? property.payload.bytes[i] : uint8_t{0};
        }
    }
    return out;
}

// ---------------------------------------------------------------------------------------------------
// Reader.

struct PiplRecord {
    uint32_t vendor = 0;
    uint32_t key = 0;
    uint32_t id = 0;
    std::span<const uint8_t> data;  // the stored (padded) length, pointing into the input
};

enum class PiplReadResult : int16_t {
    kOk = 0,
    kTruncated = 1,      // a header or a property runs past the end of the input
    kBadHeader = 2,      // reserved word or version is not what a property list carries
    kTooLarge = 3,       // input above kPiplMaxBytes, or more properties than the input can hold
    kTrailingBytes = 4,  // bytes left over after the last property (beyond 3 bytes of zero padding)
};

// Parses the whole list into `records` (views into `bytes`). On failure `records` is left empty.
[[nodiscard]] inline PiplReadResult ReadPipl(std::span<const uint8_t> bytes, std::vector<PiplRecord>& records) {
    records.clear();
    if (bytes.size() > kPiplMaxBytes) return PiplReadResult::kTooLarge;
    if (bytes.size() < kPiplHeaderSize) return PiplReadResult::kTruncated;
    const uint16_t reserved = static_cast<uint16_t>(bytes[0] | bytes[1] << 8);
    const uint32_t version = pipl_detail::GetU32(bytes, 2);
    const uint32_t count = pipl_detail::GetU32(bytes, 6);
    if (reserved != kPiplReservedWord || version != kPiplVersion) return PiplReadResult::kBadHeader;
    // Every property needs at least its 16-byte header, so a larger count cannot be honest.
    if (count > (bytes.size() - kPiplHeaderSize) / kPiplPropertyHeaderSize) {
        return PiplReadResult::kTooLarge;
    }

    std::vector<PiplRecord> parsed;
    parsed.reserve(count);
    size_t at = kPiplHeaderSize;
    for (uint32_t i = 0; i < count; ++i) {
        if (bytes.size() - at < kPiplPropertyHeaderSize) return PiplReadResult::kTruncated;
        PiplRecord record;
        record.vendor = pipl_detail::GetU32(bytes, at);
        record.key = pipl_detail::GetU32(bytes, at + 4);
        record.id = pipl_detail::GetU32(bytes, at + 8);
        const uint32_t length = pipl_detail::GetU32(bytes, at + 12);
        at += kPiplPropertyHeaderSize;
        if (length > bytes.size() - at) return PiplReadResult::kTruncated;
        record.data = bytes.subspan(at, length);
        at += length;
        parsed.push_back(record);
    }
    const size_t rest = bytes.size() - at;
    if (rest > 3) return PiplReadResult::kTrailingBytes;
    for (size_t i = at; i < bytes.size(); ++i) {
        if (bytes[i] != 0) return PiplReadResult::kTrailingBytes;
    }
    records = std::move(parsed);
    return PiplReadResult::kOk;
}

// First record with this key (and the effect vendor), or null.
inline const PiplRecord* FindPiplProperty(std::span<const PiplRecord> records, uint32_t key,
                                          uint32_t vendor = kPiplVendor8BIM) {
    for (const PiplRecord& record : records) {
        if (record.key == key && record.vendor == vendor) return &record;
    }
    return nullptr;
}

[[nodiscard]] inline bool PiplReadU32(const PiplRecord& record, uint32_t& value) {
    if (record.data.size() < 4) return false;
    value = pipl_detail::GetU32(record.data, 0);
    return true;
}

// A NUL-terminated string ('8664'); false when the data holds no terminator.
[[nodiscard]] inline bool PiplReadCString(const PiplRecord& record, std::string_view& text) {
    for (size_t i = 0; i < record.data.size(); ++i) {
        if (record.data[i] == 0) {
            text = std::string_view(reinterpret_cast<const char*>(record.data.data()), i);
            return true;
        }
    }
    return false;
}

// A length-prefixed string ('name', 'catg', 'eMNA'); false when the length byte overruns the data.
[[nodiscard]] inline bool PiplReadPascalString(const PiplRecord& record, std::string_view& text) {
    if (record.data.empty()) return false;
    const size_t length = record.data[0];
    if (length > record.data.size() - 1) return false;
    text = std::string_view(reinterpret_cast<const char*>(record.data.data()) + 1, length);
    return true;
}
