#pragma once

#include "exchange/sgexchangenode.h"

#include <QString>

#include <cstddef>

// Reads the record that the host writes for one node (the host-to-modeler layout: name,
// vertices, UVs, the long material entries, facets, trailer) from a segment of known size.
// Every count and string length is checked against the bytes that remain before anything is
// read or allocated; a record that does not fit, a negative count, an unknown facet type, a
// polygon with no corners or more than 255, a vertex or UV index out of range, or a material
// index not below the material count is rejected as a whole. Cost: one pass over the bytes.
class SgExchangeNodeReader {
public:
    // `data` points at `size` readable bytes (the attached data segment); the reader does not
    // own them and reads nothing before read().
    SgExchangeNodeReader(const void *data, std::size_t size);

    // Decodes the record into `node`. On failure returns false, leaves `node` empty and sets
    // errorString(). Bytes after the trailer are ignored.
    bool read(SgExchangeNode &node);

    // Why the last read failed ("" after a success).
    const QString &errorString() const { return m_error; }

    // Bytes consumed by the last successful read.
    std::size_t bytesRead() const { return m_pos; }

private:
    bool fail(const QString &why);
    bool need(std::size_t bytes);
    bool readByte(char &value);
    bool readInt(int32_t &value);
    bool readUInt(uint32_t &value);
    bool readFloats(float *values, std::size_t count);
    bool readString(QString &value);
    bool readCount(int32_t &count, std::size_t bytesPerItem, const char *what);
    bool readMaterial(SgExchangeNode::Material &material);
    bool readFacets(SgExchangeNode &node);

    const unsigned char *m_data = nullptr;
    std::size_t m_size = 0;
    std::size_t m_pos = 0;
    QString m_error;
};
