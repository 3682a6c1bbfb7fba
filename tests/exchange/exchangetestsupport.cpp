#include "exchangetestsupport.h"

#include "exchange/sgexchangewriter.h"
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

} // namespace exchangetest
