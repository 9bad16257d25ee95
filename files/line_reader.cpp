// Line splitting with the cut rule, and field scanning without the C library's locale or its
// unbounded "%s".
#include "files/line_reader.h"

#include <charconv>

namespace vt {

namespace {

bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\v' || c == '\f' || c == '\r'; }

char Lower(uint8_t c) { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : static_cast<char>(c); }

}  // namespace

bool LineReader::Next() {
    m_length = 0;
    m_line[0] = '\0';
    while (m_position < m_text.size()) {
        const uint8_t c = m_text[m_position];
        if (c == '\n' || c == '\r') {
            ++m_position;
            // The other character of a CR LF or LF CR pair belongs to the same line end.
            const uint8_t pair = c == '\n' ? '\r' : '\n';
            if (m_position < m_text.size() && m_text[m_position] == pair) ++m_position;
            ++m_lineNumber;
            return true;
        }
        if (m_length == kLineCapacity) {
            ++m_lineNumber;
            return true;  // cut: the rest forms the next line
        }
        m_line[m_length++] = Lower(c);
        m_line[m_length] = '\0';
        ++m_position;
    }
    return false;
}

void FieldScanner::SkipBlanks() {
    while (m_position < m_text.size() && IsBlank(m_text[m_position])) ++m_position;
}

bool FieldScanner::Word(std::string_view* word) {
    SkipBlanks();
    const size_t start = m_position;
    while (m_position < m_text.size() && !IsBlank(m_text[m_position])) ++m_position;
    if (m_position == start) return false;
    if (word) *word = m_text.substr(start, m_position - start);
    return true;
}

bool FieldScanner::Long(int64_t* value) {
    SkipBlanks();
    size_t at = m_position;
    bool negative = false;
    if (at < m_text.size() && (m_text[at] == '+' || m_text[at] == '-')) {
        negative = m_text[at] == '-';
        ++at;
    }
    // from_chars reads the magnitude as unsigned so that the most negative value still fits.
    uint64_t magnitude = 0;
    const char* begin = m_text.data() + at;
    const char* end = m_text.data() + m_text.size();
    const auto [next, error] = std::from_chars(begin, end, magnitude, 10);
    if (error != std::errc() || next == begin) return false;
    const uint64_t limit = negative ? uint64_t{1} << 63 : (uint64_t{1} << 63) - 1;
    if (magnitude > limit) return false;
    if (value) {
        *value = negative ? static_cast<int64_t>(0 - magnitude) : static_cast<int64_t>(magnitude);
    }
    m_position = static_cast<size_t>(next - m_text.data());
    return true;
}

std::string_view FirstWord(std::string_view line) {
    FieldScanner scanner(line);
    std::string_view word;
    return scanner.Word(&word) ? word : std::string_view();
}

}  // namespace vt
