#include "exchangetestsupport.h"

#include "exchange/sgexchangewriter.h"
#include "exchange/sgrecordinput.h"
#include "exchange/sgrecordoutput.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"

namespace exchangetest {

QStringList logLines() {
    return sgApp->getMessageSink()->logLines();
}
void clearLog() {
    sgApp->getMessageSink()->clear();
}
QString tempPath() {
    return sgApp->getTempPath();
}

QByteArray writeNode(SgNode *node, const QString &trailer, std::int32_t *measured) {
    SgExchangeWriter writer(node, trailer);
    if (measured)
        *measured = writer.getSize();
    QByteArray bytes(writer.getSize(), '\x7f');
    const std::int32_t written = writer.write(bytes.data());
    bytes.truncate(written);
    return bytes;
}

QByteArray toReturnRecord(const QByteArray &hostRecord) {
    SgRecordInput in(hostRecord.constData(), size_t(hostRecord.size()));
    QByteArray out(hostRecord.size() + 64, '\0');
    SgRecordOutput put(out.data(), size_t(out.size()));
    put.putString(in.string());
    const std::int32_t vertices = in.count(12);
    put.putInt32(vertices);
    put.putBytes(in.take(size_t(vertices) * 12), size_t(vertices) * 12);
    const std::int32_t uvs = in.count(8);
    put.putInt32(uvs);
    put.putBytes(in.take(size_t(uvs) * 8), size_t(uvs) * 8);
    const std::int32_t materials = in.int32();
    put.putInt32(materials);
    for (std::int32_t i = 0; i < materials; ++i) {
        put.putByte(in.byte()); // m
        put.putString(in.string());
        put.putByte(in.byte()); // c
        put.putBytes(in.take(12), 12);
        in.string(); // image folder
        put.putString(in.string());
        put.putByte(in.byte()); // s
        put.putBytes(in.take(12), 12);
        put.putBytes(in.take(15), 15); // g, t, b with their floats
        in.string();
        in.string();
        put.putString(QByteArray());
    }
    const size_t rest = in.remaining();
    put.putBytes(in.take(rest), rest); // facets and trailer as they stand
    out.truncate(qsizetype(put.written()));
    return out;
}

} // namespace exchangetest
