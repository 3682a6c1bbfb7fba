#pragma once

#include <QString>

#include <cstddef>
#include <memory>

class SgPolyMesh;
class SgPolyShape;
class SgRecordInput;

// Reads the exchange record that the modeler returns (name, vertices, UVs, the returned
// materials block, facets, trailer) into a new host shape: an SgPolyShape with an SgPolyMesh.
//
// The record comes from another program, so the reader trusts nothing in it: every count and
// string length is checked against the bytes that remain before anything is read or allocated,
// and a facet corner must name an existing vertex and UV, a facet an existing material. A record
// that fails any check (or ends early) gives no shape, the log line "Error reading memory map",
// and leaves nothing behind: materials and images are made only once the whole record is read.
class SgExchangeReader {
public:
    // `record` holds `size` readable bytes (the data segment's size) while the reader reads.
    // The reader owns nothing.
    SgExchangeReader(const void *record, std::size_t size) : m_record(record), m_size(size) {}

    // Builds the shape, which the caller then owns, and stores the record's trailer string in
    // `trailer`. Null (trailer untouched) when the record address is null or the record is bad.
    // O(record bytes); vertices are scaled by 10 into host units.
    SgPolyShape *readShape(QString &trailer) const;

private:
    std::unique_ptr<SgPolyShape> readRecord(QString &trailer) const;

    const void *m_record;
    std::size_t m_size;
};
