#include "sgcore/app/sghelpmgr.h"

void SgHelpMgr::setOnlineHelp(QObject *object) {
    if (object && !isRegistered(object)) {
        m_objects.append(QPointer<QObject>(object));
    }
}

bool SgHelpMgr::isRegistered(const QObject *object) const {
    for (const QPointer<QObject> &p : m_objects) {
        if (p && p.data() == object) {
            return true;
        }
    }
    return false;
}

QList<QObject *> SgHelpMgr::getRegistered() const {
    QList<QObject *> out;
    for (const QPointer<QObject> &p : m_objects) {
        if (p) {
            out.append(p.data());
        }
    }
    return out;
}
