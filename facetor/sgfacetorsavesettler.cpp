#include "facetor/sgfacetorsavesettler.h"

#include <QFileInfo>
#include <QTimer>

#include <algorithm>

SgFacetorSaveSettler::SgFacetorSaveSettler(int settleMs, QObject *parent)
    : QObject(parent), m_settleMs(std::max(settleMs, 1)) {
    m_timer = new QTimer(this);
    // A few looks per settle time, so that a save is noticed soon after it has settled.
    m_timer->setInterval(std::clamp(m_settleMs / 5, 5, 100));
    connect(m_timer, &QTimer::timeout, this, &SgFacetorSaveSettler::check);
}

SgFacetorSaveSettler::Look SgFacetorSaveSettler::lookAt(const QString &path) {
    const QFileInfo info(path);
    Look look;
    look.exists = info.exists();
    if (look.exists) {
        look.size = info.size();
        look.modified = info.lastModified();
        look.changed = info.metadataChangeTime();
    }
    return look;
}

void SgFacetorSaveSettler::watch(const QString &path) {
    markHandled(path);
    if (!m_timer->isActive())
        m_timer->start();
}

void SgFacetorSaveSettler::markHandled(const QString &path) {
    Watched &file = m_files[path];
    file.handled = file.seen = lookAt(path);
    file.same.start();
}

void SgFacetorSaveSettler::check() {
    // Told after the walk: a receiver may watch or mark files.
    QStringList settledPaths;
    for (auto it = m_files.begin(); it != m_files.end(); ++it) {
        Watched &file = it.value();
        const Look now = lookAt(it.key());
        if (!(now == file.seen)) {
            file.seen = now;
            file.same.restart();
            continue;
        }
        if (!now.exists || now == file.handled || file.same.elapsed() < m_settleMs)
            continue;
        file.handled = now;
        settledPaths.append(it.key());
    }
    for (const QString &path : settledPaths)
        emit settled(path);
}
