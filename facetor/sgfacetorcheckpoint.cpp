#include "facetor/sgfacetorcheckpoint.h"

#include <QByteArray>
#include <QRandomGenerator>
#include <QThread>

#include <cstring>

namespace {

struct Settings {
    QByteArray pauseAt = qgetenv("FACETOR_PAUSE_AT");
    int jitterMs = qEnvironmentVariableIntValue("FACETOR_PAUSE_JITTER_MS");
};

const Settings &settings() {
    static const Settings values;
    return values;
}

std::function<void(const QString &)> &reporter() {
    static std::function<void(const QString &)> report;
    return report;
}

} // namespace

void SgFacetorCheckpoint::setReporter(std::function<void(const QString &)> report) {
    reporter() = std::move(report);
}

void SgFacetorCheckpoint::reach(const char *name) {
    const Settings &chosen = settings();
    if (chosen.jitterMs > 0)
        QThread::msleep(QRandomGenerator::global()->bounded(chosen.jitterMs + 1));
    if (chosen.pauseAt.isEmpty() || std::strcmp(chosen.pauseAt.constData(), name) != 0)
        return;
    if (reporter())
        reporter()(QStringLiteral("paused %1").arg(QLatin1String(name)));
    // Only a signal that cannot be caught ends the wait: SIGTERM and SIGINT merely ask the
    // modeler to quit at its next poll, which never comes.
    for (;;)
        QThread::sleep(3600);
}
