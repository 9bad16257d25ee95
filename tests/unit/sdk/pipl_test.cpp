// The effect's property list against bytes written out by hand, and the reader against that list and
// against damaged copies of it.
#include "sdk/pipl.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string_view>
#include <vector>

#include "resources/effect_pipl.h"

namespace {

// Header, then per property: vendor "MIB8", key reversed, id 0, padded length, data.
// clang-format off
const std::vector<uint8_t> kExpected = {
    0x01, 0x00, 0x00, 0x00, 0x00, 0x00, 0x0C, 0x00, 0x00, 0x00,
    // kind = eFKT
    'M', 'I', 'B', '8', 'd', 'n', 'i', 'k', 0, 0, 0, 0, 4, 0, 0, 0, 'T', 'K', 'F', 'e',
    // name
    'M', 'I', 'B', '8', 'e', 'm', 'a', 'n', 0, 0, 0, 0, 20, 0, 0, 0,
    17, 'O', 'r', 'v', 'a', 'n', 'e', ' ', 'V', 'e', 'l', 'a', 't', 'o', 'n', 'e', ' ', '3', 0, 0,
    // catg
    'M', 'I', 'B', '8', 'g', 't', 'a', 'c', 0, 0, 0, 0, 8, 0, 0, 0, 6, 'O', 'r', 'v', 'a', 'n', 'e', 0,
    // 8664
    'M', 'I', 'B', '8', '4', '6', '6', '8', 0, 0, 0, 0, 16, 0, 0, 0,
    'E', 'n', 't', 'r', 'y', 'P', 'o', 'i', 'n', 't', 'F', 'u', 'n', 'c', 0, 0,
    // ePVR 2.0
    'M', 'I', 'B', '8', 'R', 'V', 'P', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 2, 0, 0, 0,
    // eSVR 13.0
    'M', 'I', 'B', '8', 'R', 'V', 'S', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 13, 0, 0, 0,
    // eVER 0x00185724
    'M', 'I', 'B', '8', 'R', 'E', 'V', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 0x24, 0x57, 0x18, 0x00,
    // eINF 0
    'M', 'I', 'B', '8', 'F', 'N', 'I', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 0, 0, 0, 0,
    // eGLO 0x02008471
    'M', 'I', 'B', '8', 'O', 'L', 'G', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 0x71, 0x84, 0x00, 0x02,
    // eGL2 0x00001409
    'M', 'I', 'B', '8', '2', 'L', 'G', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 0x09, 0x14, 0x00, 0x00,
    // eMNA
    'M', 'I', 'B', '8', 'A', 'N', 'M', 'e', 0, 0, 0, 0, 24, 0, 0, 0,
    20, 'O', 'R', 'V', 'A', 'N', 'E', ' ', 'V', 'T', ' ', 'V', 'e', 'l', 'a', 't', 'o', 'n', 'e', ' ', '2', 0, 0, 0,
    // aeFL 8
    'M', 'I', 'B', '8', 'L', 'F', 'e', 'a', 0, 0, 0, 0, 4, 0, 0, 0, 8, 0, 0, 0,
};
// clang-format on

std::vector<uint8_t> EffectBytes() { return {vt::kEffectPiplBytes.begin(), vt::kEffectPiplBytes.end()}; }

TEST(EffectPipl, BytesMatchTheHandWrittenList) {
    EXPECT_EQ(kExpected, EffectBytes());
    const auto view = vt::EffectPiplBytes();
    EXPECT_EQ(kExpected, std::vector<uint8_t>(view.begin(), view.end()));
}

TEST(EffectPipl, ReaderReturnsEveryPropertyInOrder) {
    std::vector<PiplRecord> records;
    ASSERT_EQ(PiplReadResult::kOk, ReadPipl(vt::kEffectPiplBytes, records));
    const uint32_t keys[] = {kPiplKind,           kPiplName,
                             kPiplCategory,       kPiplCodeWin64X86,
                             kPiplPiplVersion,    kPiplEffectSpecVersion,
                             kPiplEffectVersion,  kPiplEffectInfoFlags,
                             kPiplGlobalOutFlags, kPiplGlobalOutFlags2,
                             kPiplMatchName,      kPiplReservedInfo};
    ASSERT_EQ(std::size(keys), records.size());
    for (size_t i = 0; i < records.size(); ++i) {
        EXPECT_EQ(keys[i], records[i].key) << i;
        EXPECT_EQ(kPiplVendor8BIM, records[i].vendor) << i;
        EXPECT_EQ(0u, records[i].id) << i;
        EXPECT_EQ(0u, records[i].data.size() % 4) << i;
    }

    auto u32 = [&](uint32_t key) {
        uint32_t value = 0xDEADBEEF;
        const PiplRecord* record = FindPiplProperty(records, key);
        EXPECT_NE(nullptr, record);
        if (record) {
            EXPECT_TRUE(PiplReadU32(*record, value));
        }
        return value;
    };
    EXPECT_EQ(kPiplKindEffect, u32(kPiplKind));
    EXPECT_EQ(2u, u32(kPiplPiplVersion));
    EXPECT_EQ(13u, u32(kPiplEffectSpecVersion));
    EXPECT_EQ(0x00185724u, u32(kPiplEffectVersion));
    EXPECT_EQ(0u, u32(kPiplEffectInfoFlags));
    EXPECT_EQ(0x02008471u, u32(kPiplGlobalOutFlags));
    EXPECT_EQ(0x00001409u, u32(kPiplGlobalOutFlags2));
    EXPECT_EQ(8u, u32(kPiplReservedInfo));

    std::string_view text;
    ASSERT_TRUE(PiplReadCString(*FindPiplProperty(records, kPiplCodeWin64X86), text));
    EXPECT_EQ("EntryPointFunc", text);
    ASSERT_TRUE(PiplReadPascalString(*FindPiplProperty(records, kPiplName), text));
    EXPECT_EQ("Orvane Velatone 3", text);
    ASSERT_TRUE(PiplReadPascalString(*FindPiplProperty(records, kPiplCategory), text));
    EXPECT_EQ("Orvane", text);
    ASSERT_TRUE(PiplReadPascalString(*FindPiplProperty(records, kPiplMatchName), text));
    EXPECT_EQ("ORVANE VT Velatone 2", text);
    EXPECT_EQ(nullptr, FindPiplProperty(records, PiplFourcc("eURL")));
    EXPECT_EQ(nullptr, FindPiplProperty(records, kPiplKind, PiplFourcc("ADBE")));
}

TEST(PiplReader, EveryTruncationIsRejected) {
    const std::vector<uint8_t> full = EffectBytes();
    for (size_t size = 0; size < full.size(); ++size) {
        // A copy of exactly `size` bytes, so a sanitizer sees any read past the end.
        const std::vector<uint8_t> cut(full.begin(), full.begin() + static_cast<std::ptrdiff_t>(size));
        std::vector<PiplRecord> records(1);
        EXPECT_NE(PiplReadResult::kOk, ReadPipl(cut, records)) << size;
        EXPECT_TRUE(records.empty()) << size;
    }
}

TEST(PiplReader, RejectsDamagedHeadersAndLengths) {
    std::vector<PiplRecord> records;
    auto read = [&](std::vector<uint8_t> bytes) { return ReadPipl(bytes, records); };

    std::vector<uint8_t> bytes = EffectBytes();
    bytes[0] = 2;  // reserved word
    EXPECT_EQ(PiplReadResult::kBadHeader, read(bytes));

    bytes = EffectBytes();
    bytes[2] = 1;  // version
    EXPECT_EQ(PiplReadResult::kBadHeader, read(bytes));

    bytes = EffectBytes();
    bytes[6] = 0xFF, bytes[7] = 0xFF, bytes[8] = 0xFF, bytes[9] = 0xFF;  // count far beyond the input
    EXPECT_EQ(PiplReadResult::kTooLarge, read(bytes));

    bytes = EffectBytes();
    bytes[6] = 13;  // one property more than present
    EXPECT_EQ(PiplReadResult::kTruncated, read(bytes));

    bytes = EffectBytes();
    bytes[10 + 12] = 0xF0, bytes[10 + 13] = 0xFF, bytes[10 + 14] = 0xFF, bytes[10 + 15] = 0xFF;  // 'kind' length
    EXPECT_EQ(PiplReadResult::kTruncated, read(bytes));

    bytes = EffectBytes();
    bytes.insert(bytes.end(), {0, 0, 0});  // alignment padding is tolerated
    EXPECT_EQ(PiplReadResult::kOk, read(bytes));
    EXPECT_EQ(12u, records.size());
    bytes.push_back(0);
    EXPECT_EQ(PiplReadResult::kTrailingBytes, read(bytes));
    bytes = EffectBytes();
    bytes.push_back(1);
    EXPECT_EQ(PiplReadResult::kTrailingBytes, read(bytes));

    bytes.assign(kPiplMaxBytes + 1, 0);
    EXPECT_EQ(PiplReadResult::kTooLarge, read(bytes));
}

TEST(PiplReader, StringReadersStayInsideTheProperty) {
    const uint8_t noTerminator[] = {'a', 'b', 'c', 'd'};
    const uint8_t longPascal[] = {4, 'a', 'b', 'c'};
    const uint8_t fullPascal[] = {3, 'a', 'b', 'c'};
    PiplRecord record;
    std::string_view text = "untouched";

    record.data = noTerminator;
    EXPECT_FALSE(PiplReadCString(record, text));
    record.data = longPascal;
    EXPECT_FALSE(PiplReadPascalString(record, text));
    record.data = {};
    EXPECT_FALSE(PiplReadPascalString(record, text));
    uint32_t value = 7;
    EXPECT_FALSE(PiplReadU32(record, value));
    EXPECT_EQ(7u, value);
    EXPECT_EQ("untouched", text);

    record.data = fullPascal;
    ASSERT_TRUE(PiplReadPascalString(record, text));
    EXPECT_EQ("abc", text);
}

TEST(PiplWriter, PadsEachPayloadToFourBytes) {
    static constexpr std::array<PiplProperty, 2> kProperties = {{
        {PiplFourcc("name"), PiplPascalString("abcd")},  // 5 bytes -> 8
        {PiplFourcc("eINF"), PiplU16(0x0102)},           // 2 bytes -> 4
    }};
    constexpr auto bytes = WritePipl<PiplSize(kProperties)>(kProperties);
    static_assert(bytes.size() == 10 + 16 + 8 + 16 + 4);
    // clang-format off
  const std::vector<uint8_t> expected = {
      1, 0, 0, 0, 0, 0, 2, 0, 0, 0,
      'M', 'I', 'B', '8', 'e', 'm', 'a', 'n', 0, 0, 0, 0, 8, 0, 0, 0, 4, 'a', 'b', 'c', 'd', 0, 0, 0,
      'M', 'I', 'B', '8', 'F', 'N', 'I', 'e', 0, 0, 0, 0, 4, 0, 0, 0, 0x02, 0x01, 0, 0,
  };
    // clang-format on
    EXPECT_EQ(expected, std::vector<uint8_t>(bytes.begin(), bytes.end()));
}

}  // namespace
