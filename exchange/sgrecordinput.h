#pragma once

#include <QByteArray>

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <stdexcept>

static_assert(std::endian::native == std::endian::little,
              "exchange records are little-endian; this build copies values as they lie in memory");

// Raised when a record does not hold what it claims: a value past its end, a negative count,
// a count whose bytes exceed what remains, or an index out of range.
class SgRecordError : public std::runtime_error {
public:
    explicit SgRecordError(const char *what) : std::runtime_error(what) {}
};

// A bounded little-endian cursor over untrusted bytes of known size. Every read checks the
// bytes that remain first and throws `SgRecordError` instead of reading past the end; each
// byte is read once, so a source that changes under the reader cannot defeat a check.
class SgRecordInput {
public:
    // `source` must hold `size` readable bytes for the cursor's lifetime.
    SgRecordInput(const void *source, std::size_t size)
        : m_next(static_cast<const unsigned char *>(source)), m_end(m_next + size) {}

    // Bytes not read yet.
    std::size_t remaining() const { return static_cast<std::size_t>(m_end - m_next); }

    // Takes the next `bytes` bytes and returns their address; throws when fewer remain.
    const unsigned char *take(std::size_t bytes) {
        if (bytes > remaining())
            throw SgRecordError("record ends early");
        const unsigned char *at = m_next;
        m_next += bytes;
        return at;
    }

    void skip(std::size_t bytes) { take(bytes); }
    std::uint8_t byte() { return *take(1); }
    std::int32_t int32() { return load<std::int32_t>(); }
    std::uint32_t uint32() { return load<std::uint32_t>(); }
    float float32() { return load<float>(); }

    // Reads an i32 count of items of `itemBytes` bytes each that follow in the record; rejects
    // a negative count and one whose items cannot fit in the bytes that remain (so a caller may
    // allocate for the count).
    std::int32_t count(std::size_t itemBytes) {
        const std::int32_t n = int32();
        if (n < 0)
            throw SgRecordError("negative count");
        if (itemBytes != 0 && static_cast<std::size_t>(n) > remaining() / itemBytes)
            throw SgRecordError("count exceeds the record");
        return n;
    }

    // An exchange string: i32 length, then that many 8-bit characters.
    QByteArray string() {
        const std::int32_t length = count(1);
        return QByteArray(reinterpret_cast<const char *>(take(static_cast<std::size_t>(length))),
                          length);
    }

private:
    template <typename T> T load() {
        T value;
        std::memcpy(&value, take(sizeof(T)), sizeof(T));
        return value;
    }

    const unsigned char *m_next;
    const unsigned char *m_end;
};
