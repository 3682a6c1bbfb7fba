#pragma once

#include <QByteArray>

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <stdexcept>

static_assert(std::endian::native == std::endian::little,
              "exchange records are little-endian; this build copies values as they lie in memory");

// Raised when a record would grow past the room its destination has; `inString` tells whether
// the value that did not fit was a string.
class SgRecordOverflow : public std::runtime_error {
public:
    explicit SgRecordOverflow(bool inString = false)
        : std::runtime_error("exchange record overflows its destination"), m_inString(inString) {}
    bool inString() const { return m_inString; }

private:
    bool m_inString;
};

// A bounded little-endian cursor over a destination of fixed capacity: each value is copied
// straight to its place, packed, and no write ever goes past the capacity (an attempt throws
// `SgRecordOverflow` and leaves the destination beyond the cursor untouched). Every call costs
// a bounds check and a copy of the value's bytes.
class SgRecordOutput {
public:
    // `destination` must hold `capacity` writable bytes for the cursor's lifetime.
    SgRecordOutput(void *destination, std::size_t capacity)
        : m_begin(static_cast<unsigned char *>(destination)), m_next(m_begin),
          m_end(m_begin + capacity) {}

    // Bytes written so far.
    std::size_t written() const { return static_cast<std::size_t>(m_next - m_begin); }
    // Bytes still free.
    std::size_t remaining() const { return static_cast<std::size_t>(m_end - m_next); }

    // Claims the next `bytes` bytes and returns their address for the caller to fill; throws
    // `SgRecordOverflow` when fewer remain.
    unsigned char *claim(std::size_t bytes) {
        if (bytes > remaining())
            throw SgRecordOverflow();
        unsigned char *at = m_next;
        m_next += bytes;
        return at;
    }

    void putByte(std::uint8_t value) { *claim(1) = value; }
    void putInt32(std::int32_t value) { std::memcpy(claim(4), &value, 4); }
    void putUInt32(std::uint32_t value) { std::memcpy(claim(4), &value, 4); }
    void putFloat(float value) { std::memcpy(claim(4), &value, 4); }
    void putBytes(const void *bytes, std::size_t count) {
        if (count != 0)
            std::memcpy(claim(count), bytes, count);
    }

    // An exchange string: its signed 32-bit length, then its 8-bit characters, no terminator.
    void putString(const QByteArray &text) {
        const auto length = static_cast<std::size_t>(text.size());
        if (length > INT32_MAX || length + 4 > remaining())
            throw SgRecordOverflow(true);
        putInt32(static_cast<std::int32_t>(length));
        putBytes(text.constData(), length);
    }

private:
    unsigned char *m_begin;
    unsigned char *m_next;
    unsigned char *m_end;
};
