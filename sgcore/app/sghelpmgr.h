#pragma once

#include <QList>
#include <QObject>
#include <QPointer>

// The application's online help registry: actions and widgets register themselves so that
// the help system can find them. This host records what was registered.
class SgHelpMgr {
public:
    // Records `object` (null is ignored; a second registration of the same object is kept once).
    void setOnlineHelp(QObject *object);
    // Whether `object` was registered (and still exists).
    bool isRegistered(const QObject *object) const;
    // Everything registered that still exists, in registration order.
    QList<QObject *> getRegistered() const;

private:
    QList<QPointer<QObject>> m_objects;
};
