// A read position in a byte span whose every read checks what remains, for the binary readers.
// Nothing is read past the end: a read that does not fit fails and leaves the position alone.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace vt {

class ByteCursor {
public:
    explicit ByteCursor(std::span<const uint8_t> bytes) : m_bytes(bytes) {}

    size_t remaining() const { return m_bytes.size() - m_position; }
    size_t position() const { return m_position; }
    bool atEnd() const { return m_position == m_bytes.size(); }

    bool ReadBE16(int16_t& value) {
        if (remaining() < 2) return false;
        const uint8_t* p = m_bytes.data() + m_position;
        value = static_cast<int16_t>(static_cast<uint16_t>((p[0] << 8) | p[1]));
        m_position += 2;
        return true;
    }

    bool ReadBE32(uint32_t& value) {
        if (remaining() < 4) return false;
        const uint8_t* p = m_bytes.data() + m_position;
        value = (uint32_t{p[0]} << 24) | (uint32_t{p[1]} << 16) | (uint32_t{p[2]} << 8) | uint32_t{p[3]};
        m_position += 4;
        return true;
    }

    // Takes up to count bytes; a short span at the end of the bytes.
    std::span<const uint8_t> Take(size_t count) {
        const size_t n = count < remaining() ? count : remaining();
        std::span<const uint8_t> taken = m_bytes.subspan(m_position, n);
        m_position += n;
        return taken;
    }

    // Skips up to count bytes; false when fewer remained.
    bool Skip(uint64_t count) {
        if (count > remaining()) {
            m_position = m_bytes.size();
            return false;
        }
        m_position += static_cast<size_t>(count);
        return true;
    }

private:
    std::span<const uint8_t> m_bytes;
    size_t m_position = 0;
};

}  // namespace vt
