#include "files/lut_files.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "files/line_reader.h"
#include "tests/unit/files/files_test_support.h"

namespace vt {
namespace {

using test::DataBytes;
using test::DataPath;
using test::TextBytes;

struct Curves {
    Curves() : settings(test::ResetRecord()) {}
    CurveRecord* get() { return settings->toneCurves; }
    float Entry(int curve, int j) const { return settings->toneCurves[curve].data.samples[j]; }
    bool Untouched() const {
        const auto reset = test::ResetRecord();
        return test::SameBytes(settings->toneCurves, reset->toneCurves, sizeof reset->toneCurves);
    }
    std::unique_ptr<CorrectionSettings> settings;
};

// The numbers of a LUT text after its header, read independently of the reader under test.
std::vector<int> NumbersAfter(const std::vector<uint8_t>& bytes, int skipWords) {
    std::vector<int> numbers;
    std::string text(bytes.begin(), bytes.end());
    size_t at = 0;
    int word = 0;
    while (at < text.size()) {
        const size_t start = text.find_first_not_of(" \t\r\n", at);
        if (start == std::string::npos) break;
        const size_t end = text.find_first_of(" \t\r\n", start);
        if (word++ >= skipWords) numbers.push_back(std::stoi(text.substr(start, end - start)));
        at = end == std::string::npos ? text.size() : end;
    }
    return numbers;
}

std::string AutodeskText(int channels, int entries, const std::vector<int>& values, const char* newline = "\n") {
    std::string text = "LUT: " + std::to_string(channels) + " " + std::to_string(entries) + newline + newline;
    for (int v : values) text += std::to_string(v) + newline;
    return text;
}

std::vector<int> Ramp(int count, int step, int channels = 3) {
    std::vector<int> values;
    for (int c = 0; c < channels; ++c) {
        for (int e = 0; e < count; ++e) values.push_back(e * step + c);
    }
    return values;
}

void ExpectFailure(const std::vector<uint8_t>& bytes, FileResult (*read)(std::span<const uint8_t>, CurveRecord*,
                                                                           const char**),
                   FileResult result, const char* message, const std::string& label) {
    Curves curves;
    const char* shown = "unset";
    EXPECT_EQ(read(bytes, curves.get(), &shown), result) << label;
    EXPECT_STREQ(shown, message) << label;
    EXPECT_TRUE(curves.Untouched()) << label;
}

// ------------------------------------------------------------------------------------------------
// Autodesk

TEST(AutodeskLut, EightBitRealFileExpandsEachValueOverFourEntries) {
    const std::vector<uint8_t> bytes = DataBytes("autodesk_lut/logtolin_8to8.lut");
    const std::vector<int> values = NumbersAfter(bytes, 4);  // "lut:", 3, 256, 256
    ASSERT_EQ(values.size(), 768u);
    Curves curves;
    const char* message = "unset";
    ASSERT_EQ(ReadAutodeskLutBytes(bytes, curves.get(), &message), FileResult::kOk);
    EXPECT_EQ(message, nullptr);
    for (int c = 0; c < 3; ++c) {
        for (int e = 0; e < 256; ++e) {
            const int* v = &values[256 * c];
            const double step = e < 255 ? (v[e + 1] - v[e]) / 4.0 : (v[e] - v[e - 1]) / 4.0;
            for (int m = 0; m < 4; ++m) {
                ASSERT_FLOAT_EQ(curves.Entry(1 + c, 4 * e + m), static_cast<float>((v[e] + m * step) / 255.0))
                    << c << " " << e << " " << m;
            }
        }
    }
    for (int j = 0; j < kCurveSampleCount; ++j) ASSERT_FLOAT_EQ(curves.Entry(0, j), static_cast<float>(j / 1023.0));
    for (int c = 0; c < 4; ++c) EXPECT_EQ(curves.settings->toneCurves[c].flags, kCurveFlagSampled);
}

TEST(AutodeskLut, RealFileOf4096EntriesAveragesFourValuesPerEntry) {
    const std::vector<uint8_t> bytes = DataBytes("autodesk_lut/Test_12to16fp.lut");
    const std::vector<int> values = NumbersAfter(bytes, 3);
    ASSERT_EQ(values.size(), 3u * 4096);
    Curves curves;
    ASSERT_EQ(ReadAutodeskLutBytes(bytes, curves.get()), FileResult::kOk);
    for (int c = 0; c < 3; ++c) {
        for (int j = 0; j < kCurveSampleCount; ++j) {
            const int* v = &values[4096 * c + 4 * j];
            const double mean = (v[0] + v[1] + v[2] + v[3]) / 4.0;
            ASSERT_FLOAT_EQ(curves.Entry(1 + c, j), static_cast<float>(mean / 65535.0)) << c << " " << j;
        }
    }
}

TEST(AutodeskLut, SixteenBitLutOf65536EntriesAveragesSixtyFour) {
    // The size of the largest real LUTs (2 MB of text), generated.
    std::vector<int> values;
    for (int c = 0; c < 3; ++c) {
        for (int e = 0; e < 65536; ++e) values.push_back(c == 2 ? 65535 - e : e);
    }
    Curves curves;
    ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(3, 65536, values)), curves.get()), FileResult::kOk);
    for (int j : {0, 1, 511, 1023}) {
        const double mean = 64.0 * j + 31.5;
        EXPECT_FLOAT_EQ(curves.Entry(1, j), static_cast<float>(mean / 65535.0));
        EXPECT_FLOAT_EQ(curves.Entry(3, j), static_cast<float>((65535 - mean) / 65535.0));
    }
}

TEST(AutodeskLut, TheLargestValueChoosesTheInputRange) {
    struct Case {
        int largest;
        double divisor;
    };
    for (const Case& c : {Case{255, 255.0}, Case{256, 1023.0}, Case{1023, 1023.0}, Case{1024, 4095.0},
                          Case{4095, 4095.0}, Case{4096, 65535.0}, Case{70000, 65535.0}}) {
        std::vector<int> values = Ramp(4, 1);
        values[11] = c.largest;
        Curves curves;
        ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(3, 4, values)), curves.get()), FileResult::kOk);
        // Four entries: value 3 of blue starts at table entry 768. Values above 16 bits are clamped.
        const double stored = c.largest > 65535 ? 65535.0 : c.largest;
        EXPECT_FLOAT_EQ(curves.Entry(3, 768), static_cast<float>(stored / c.divisor)) << c.largest;
        EXPECT_FLOAT_EQ(curves.Entry(1, 256), static_cast<float>(1.0 / c.divisor)) << c.largest;
    }
}

TEST(AutodeskLut, CountsThatDoNotDivide1024StillSpreadOverTheWholeTable) {
    Curves curves;
    ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(3, 3, {0, 100, 200, 0, 100, 200, 0, 100, 200})),
                                   curves.get()),
              FileResult::kOk);
    // Three values, a straight line: the table is that line over all 1,024 entries.
    for (int j = 0; j < kCurveSampleCount; ++j) {
        ASSERT_NEAR(curves.Entry(1, j), (j * 3.0 / 1024.0) * 100.0 / 255.0, 1e-5) << j;
    }
    Curves more;
    std::vector<int> values = Ramp(1500, 1);
    ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(3, 1500, values)), more.get()), FileResult::kOk);
    EXPECT_NEAR(more.Entry(1, 1023), 1499.0 / 4095.0, 2.0 / 4095.0);
}

TEST(AutodeskLut, BlankLinesAndCommentsBetweenValuesAreIgnored) {
    const std::vector<int> values = Ramp(256, 3);
    Curves plain;
    ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(3, 256, values)), plain.get()), FileResult::kOk);
    std::string text = "# made by hand\n\nLUT: 3 256\n\n";
    for (size_t i = 0; i < values.size(); ++i) {
        if (i % 50 == 0) text += "# channel part\n\n   \n";
        text += "  " + std::to_string(values[i]) + "\r\n";
    }
    Curves commented;
    ASSERT_EQ(ReadAutodeskLutBytes(TextBytes(text), commented.get()), FileResult::kOk);
    EXPECT_TRUE(test::SameBytes(plain.get(), commented.get(), 4 * sizeof(CurveRecord)));
}

TEST(AutodeskLut, FaultyFilesGiveTheirCodeAndMessageAndChangeNothing) {
    struct Case {
        const char* name;
        FileResult result;
        const char* message;
    };
    const Case cases[] = {
        {"error_truncated_file.lut", FileResult::kEndOfFile, kLutTooShortMessage},
        {"houdini.lut", FileResult::kUnsupported, kLutReadErrorMessage},  // a bare "LUT:" header
        {"legacy_flmlk_desat.lut", FileResult::kEndOfFile, kLutTooShortMessage},
        {"legacy_slog_to_log_v3_lustre.lut", FileResult::kEndOfFile, kLutTooShortMessage},
        {"lut-channels-2.lut", FileResult::kUnsupported, kLutTooFewChannelsMessage},
        {"lut-count-missing.lut", FileResult::kUnsupported, kLutReadErrorMessage},
        {"lut-entries-0.lut", FileResult::kUnsupported, kLutReadErrorMessage},
        {"lut-entries-1.lut", FileResult::kUnsupported, kLutReadErrorMessage},
        {"lut-count-2147483647.lut", FileResult::kOutOfMemory, kLutReadErrorMessage},
        {"lut-line-without-number.lut", FileResult::kUnsupported, kLutReadErrorMessage},
    };
    for (const Case& c : cases) {
        ExpectFailure(DataBytes(std::string("autodesk_lut/") + c.name), ReadAutodeskLutBytes, c.result, c.message,
                      c.name);
    }
    ExpectFailure(TextBytes("LUT: -4 256\n"), ReadAutodeskLutBytes, FileResult::kUnsupported,
                  kLutTooFewChannelsMessage, "negative channels");
    ExpectFailure(TextBytes("LUT: 3 -256\n"), ReadAutodeskLutBytes, FileResult::kUnsupported, kLutReadErrorMessage,
                  "negative entries");
    ExpectFailure(TextBytes("LUT: 3 99999999999999999999999\n"), ReadAutodeskLutBytes, FileResult::kUnsupported,
                  kLutReadErrorMessage, "entries beyond 64 bits");
    ExpectFailure({}, ReadAutodeskLutBytes, FileResult::kEndOfFile, kLutTooShortMessage, "empty");
    // The last line must end like every other; without its line end the file is short.
    std::string text = AutodeskText(3, 2, {1, 2, 3, 4, 5, 6});
    text.pop_back();
    ExpectFailure(TextBytes(text), ReadAutodeskLutBytes, FileResult::kEndOfFile, kLutTooShortMessage, "last line");

    Curves curves;
    const char* message = nullptr;
    EXPECT_EQ(ReadAutodeskLut(DataPath("autodesk_lut/missing.lut").c_str(), curves.get(), &message),
              FileResult::kCannotOpen);
    EXPECT_STREQ(message, kLutReadErrorMessage);
    EXPECT_TRUE(curves.Untouched());
}

TEST(AutodeskLut, FurtherChannelsAreNotRead) {
    std::vector<int> values = Ramp(4, 10, 4);
    values.resize(values.size() - 2);  // the fourth channel may even be cut short
    Curves curves;
    EXPECT_EQ(ReadAutodeskLutBytes(TextBytes(AutodeskText(5, 4, values)), curves.get()), FileResult::kOk);
}

// ------------------------------------------------------------------------------------------------
// Quantel

TEST(QuantelLut, RowsBecomeTheThreeChannelsScaledByTheirMaximum) {
    const std::vector<uint8_t> bytes = DataBytes("quantel_lut/ramp-256.txt");
    Curves curves;
    const char* message = "unset";
    ASSERT_EQ(ReadQuantelLutBytes(bytes, curves.get(), &message), FileResult::kOk);
    EXPECT_EQ(message, nullptr);
    // Row i is (4i, min(1023, 4i + 2), 1023 - 4i).
    for (int i = 0; i < 256; ++i) {
        EXPECT_FLOAT_EQ(curves.Entry(1, 4 * i), static_cast<float>(4 * i / 1023.0));
        EXPECT_FLOAT_EQ(curves.Entry(2, 4 * i), static_cast<float>(std::min(1023, 4 * i + 2) / 1023.0));
        EXPECT_FLOAT_EQ(curves.Entry(3, 4 * i), static_cast<float>((1023 - 4 * i) / 1023.0));
    }
    EXPECT_FLOAT_EQ(curves.Entry(1, 1), static_cast<float>(1 / 1023.0));
    // The last row carries the falling slope on downwards.
    EXPECT_LT(curves.Entry(3, 1023), curves.Entry(3, 1022));
    EXPECT_FLOAT_EQ(curves.Entry(0, 1023), 1.0f);
}

TEST(QuantelLut, HeaderLinesComeInAnyOrderAndCase) {
    std::string text = "GSIZE 2048\r\nTable Lut 2\r\n# a note\r\nGMax 4095\r\n\r\nR G B\r\n";
    for (int i = 0; i < 2048; ++i) {
        text += std::to_string(2 * i) + " " + std::to_string(i) + " 7\r\n";
    }
    Curves curves;
    ASSERT_EQ(ReadQuantelLutBytes(TextBytes(text), curves.get()), FileResult::kOk);
    EXPECT_FLOAT_EQ(curves.Entry(1, 10), static_cast<float>((40 + 42) / 2.0 / 4095.0));
    EXPECT_FLOAT_EQ(curves.Entry(2, 10), static_cast<float>((20 + 21) / 2.0 / 4095.0));
    EXPECT_FLOAT_EQ(curves.Entry(3, 1000), static_cast<float>(7 / 4095.0));
}

TEST(QuantelLut, FaultyFilesGiveTheirCodeAndMessageAndChangeNothing) {
    struct Case {
        const char* name;
        FileResult result;
        const char* message;
    };
    const Case cases[] = {
        {"table-type-3.txt", FileResult::kUnsupported, kLutUnsupportedTypeMessage},
        {"gmax-0.txt", FileResult::kUnsupported, kLutReadErrorMessage},
        {"gsize-1.txt", FileResult::kUnsupported, kLutReadErrorMessage},
        {"rows-missing.txt", FileResult::kEndOfFile, kLutTooShortMessage},
    };
    for (const Case& c : cases) {
        ExpectFailure(DataBytes(std::string("quantel_lut/") + c.name), ReadQuantelLutBytes, c.result, c.message,
                      c.name);
    }
    const std::string header = "table lut 2\ngmax 255\ngsize 2\n";
    ExpectFailure(TextBytes("table lut\ngmax 255\ngsize 2\nr g b\n0 0 0\n1 1 1\n"), ReadQuantelLutBytes,
                  FileResult::kUnsupported, kLutUnsupportedTypeMessage, "table without its number");
    ExpectFailure(TextBytes("table lut 2\ngmax\ngsize 2\n"), ReadQuantelLutBytes, FileResult::kUnsupported,
                  kLutReadErrorMessage, "gmax without its number");
    ExpectFailure(TextBytes("table lut 2\ngsize 2\nr g b\n0 0 0\n"), ReadQuantelLutBytes, FileResult::kEndOfFile,
                  kLutTooShortMessage, "gmax never seen");
    ExpectFailure(TextBytes(header + "0 0 0\n1 1 1\n"), ReadQuantelLutBytes, FileResult::kEndOfFile,
                  kLutTooShortMessage, "no column heading");
    ExpectFailure(TextBytes(header + "r g b\n0 0 0\n1 1\n"), ReadQuantelLutBytes, FileResult::kUnsupported,
                  kLutReadErrorMessage, "row of two numbers");
    ExpectFailure(TextBytes("table lut 2\ngmax 255\ngsize 4000000000\nr g b\n0 0 0\n"), ReadQuantelLutBytes,
                  FileResult::kOutOfMemory, kLutReadErrorMessage, "huge gsize");
    ExpectFailure(TextBytes("table lut 2\ngmax -255\ngsize 2\nr g b\n0 0 0\n1 1 1\n"), ReadQuantelLutBytes,
                  FileResult::kUnsupported, kLutReadErrorMessage, "negative gmax");
}

// ------------------------------------------------------------------------------------------------
// Lines and fields

std::vector<std::string> Lines(const std::string& text, bool* ended) {
    const std::vector<uint8_t> bytes = TextBytes(text);
    LineReader reader(bytes);
    std::vector<std::string> lines;
    while (reader.Next()) lines.emplace_back(reader.line());
    *ended = reader.line().empty();
    return lines;
}

TEST(LineReader, EveryLineEndCountsOnceAndLinesAreLowerCase) {
    bool clean = false;
    EXPECT_EQ(Lines("A\nB\rC\r\nD\n\rE\n", &clean), (std::vector<std::string>{"a", "b", "c", "d", "e"}));
    EXPECT_EQ(Lines("a\n\nb\r\r\nc\n", &clean), (std::vector<std::string>{"a", "", "b", "", "c"}));
    EXPECT_EQ(Lines("LUT: 3\nlast line without end", &clean), (std::vector<std::string>{"lut: 3"}));
    EXPECT_EQ(Lines("", &clean), std::vector<std::string>{});
}

TEST(LineReader, LongLinesAreCutAfter255Characters) {
    bool clean = false;
    const std::string exact(255, 'x');
    EXPECT_EQ(Lines(exact + "\nnext\n", &clean), (std::vector<std::string>{exact, "next"}));
    const std::string longer(300, 'Y');
    EXPECT_EQ(Lines(longer + "\n", &clean), (std::vector<std::string>{std::string(255, 'y'), std::string(45, 'y')}));
}

TEST(FieldScanner, WordsAndNumbersReadAsTheirConversionsWould) {
    FieldScanner fields("  lut:\t3  -12 +7 12abc 9223372036854775808");
    std::string_view word;
    int64_t value = 0;
    ASSERT_TRUE(fields.Word(&word));
    EXPECT_EQ(word, "lut:");
    ASSERT_TRUE(fields.Long(&value));
    EXPECT_EQ(value, 3);
    ASSERT_TRUE(fields.Long(&value));
    EXPECT_EQ(value, -12);
    ASSERT_TRUE(fields.Long(&value));
    EXPECT_EQ(value, 7);
    ASSERT_TRUE(fields.Long(&value));
    EXPECT_EQ(value, 12);
    EXPECT_FALSE(fields.Long(&value)) << "letters are no number";
    ASSERT_TRUE(fields.Word(&word));
    EXPECT_EQ(word, "abc");
    EXPECT_FALSE(fields.Long(&value)) << "beyond 64 bits";
    EXPECT_EQ(FirstWord("   "), "");
    EXPECT_EQ(FirstWord(" # note"), "#");
}

}  // namespace
}  // namespace vt
