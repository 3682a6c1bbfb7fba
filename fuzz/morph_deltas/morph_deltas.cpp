// Feeds arbitrary bytes to SgMorphDeltaFile::readBuffer against a mesh of 64 vertices. A read
// either fails with a message that names the source and a line, or yields entries strictly
// ascending below the vertex count.
#include "sgcore/io/sgmorphdeltafile.h"
#include "sgcore/morph/sgmorphdeltas.h"

#include <QByteArray>
#include <QString>

#include <cstdio>
#include <cstdlib>
#include <memory>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    constexpr int kVertices = 64;
    QString error;
    std::unique_ptr<SgMorphDeltas> deltas(SgMorphDeltaFile::readBuffer(
        QByteArray::fromRawData(reinterpret_cast<const char *>(data), qsizetype(size)), kVertices,
        QStringLiteral("m.deltas"), error));
    if (!deltas) {
        if (!error.startsWith(QStringLiteral("m.deltas:"))) {
            std::fprintf(stderr, "bad failure report: %s\n", qPrintable(error));
            std::abort();
        }
        return 0;
    }
    int last = -1;
    for (int i = 0; i < deltas->getNumEntries(); ++i) {
        if (deltas->getVertex(i) <= last || deltas->getVertex(i) >= kVertices)
            std::abort();
        last = deltas->getVertex(i);
    }
    return 0;
}
