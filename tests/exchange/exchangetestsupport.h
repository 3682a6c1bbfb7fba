#pragma once

#include "exchange/sgexchangereader.h"
#include "exchange/sgexchangewriter.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgmaterial.h"
#include "tests/support/sgtestscene.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <cstdint>
#include <cstring>
#include <memory>

// Helpers shared by the exchange tests.
namespace exchangetest {

// The host log so far, and forgetting it.
inline QStringList logLines() {
    return sgApp->getMessageSink()->logLines();
}
inline void clearLog() {
    sgApp->getMessageSink()->clear();
}
// The application's temporary folder (the test main makes a fresh one per program).
inline QString tempPath() {
    return sgApp->getTempPath();
}

// A material with none of the standard properties.
class BareMaterial : public SgMaterial {
public:
    explicit BareMaterial(const QString &name) : SgMaterial(name) {}
    SgMaterial *clone() const override { return new BareMaterial(getName()); }
};

// Measures and writes the record of `node`; `measured` receives the measured size.
inline QByteArray writeNode(SgNode *node, const QString &trailer = QString(),
                            std::int32_t *measured = nullptr) {
    SgExchangeWriter writer(node, trailer);
    if (measured)
        *measured = writer.getSize();
    QByteArray bytes(writer.getSize(), '\x7f');
    bytes.truncate(writer.write(bytes.data()));
    return bytes;
}

// Reads the returned record `bytes` from a heap block of exactly their size, so that a read
// past it is caught; `trailer` receives the record's trailer.
inline std::unique_ptr<SgPolyShape> readRecord(const QByteArray &bytes,
                                               QString *trailer = nullptr) {
    const std::unique_ptr<char[]> block(new char[size_t(bytes.size())]);
    std::memcpy(block.get(), bytes.constData(), size_t(bytes.size()));
    QString text;
    SgExchangeReader reader(block.get(), size_t(bytes.size()));
    std::unique_ptr<SgPolyShape> shape(reader.readShape(text));
    if (trailer)
        *trailer = text;
    return shape;
}

} // namespace exchangetest
