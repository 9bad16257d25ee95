// Lines of a text file as the LUT readers see them, and the fields of a line as the "%s" and
// "%ld" conversions read them. The reader owns its fixed line buffer and the cut rule.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

namespace vt {

class LineReader {
public:
    // A longer line is cut after this many characters; the rest forms the next line.
    static constexpr size_t kLineCapacity = 255;

    explicit LineReader(std::span<const uint8_t> text) : m_text(text) {}

    // Reads the next line, converted to lower case. A line ends at LF, CR, CR LF or LF CR. False
    // when the text ends before the line does, the last line of the text included.
    bool Next();

    std::string_view line() const { return std::string_view(m_line, m_length); }
    int lineNumber() const { return m_lineNumber; }

private:
    std::span<const uint8_t> m_text;
    size_t m_position = 0;
    int m_lineNumber = 0;
    size_t m_length = 0;
    char m_line[kLineCapacity + 1] = {};
};

// The fields of one line, from left to right: blanks are skipped before each field, a word runs
// to the next blank, a number is an optional sign and decimal digits (what follows them is left
// for the next field).
class FieldScanner {
public:
    explicit FieldScanner(std::string_view text) : m_text(text) {}

    // False when only blanks remain.
    bool Word(std::string_view* word);
    // False when no digits follow, or the number does not fit 64 bits; nothing is consumed then.
    bool Long(int64_t* value);

private:
    void SkipBlanks();
    std::string_view m_text;
    size_t m_position = 0;
};

// The first word of a line; empty when the line is blank.
std::string_view FirstWord(std::string_view line);

}  // namespace vt
