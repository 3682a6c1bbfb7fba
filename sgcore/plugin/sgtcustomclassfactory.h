#pragma once

#include "sgcore/plugin/sgclassfactory.h"

#include <QJSEngine>
#include <QJSValue>

// A class factory that knows its class T (a QObject with Q_OBJECT) and converts T pointers to
// and from script values. Plug-ins whose class is created in a special way derive from it.
template <typename T> class SgTCustomClassFactory : public SgClassFactory {
public:
    explicit SgTCustomClassFactory(const SgGUID &guid)
        : SgClassFactory(&T::staticMetaObject, guid) {}

    // Wraps `object` for `engine` with Qt (C++) ownership: the collector never deletes it.
    // Then publishes T's enumerators on the wrapper. A null object gives the script null.
    static QJSValue toScriptValue(QJSEngine *engine, T *object) {
        if (!engine || !object)
            return QJSValue(QJSValue::NullValue);
        QJSEngine::setObjectOwnership(object, QJSEngine::CppOwnership);
        QJSValue wrapper = engine->newQObject(object);
        registerEnumsOnClass(engine, &T::staticMetaObject, wrapper);
        return wrapper;
    }

    // The T that `value` wraps, or null when it wraps no object or an object of another class.
    static T *fromScriptValue(const QJSValue &value) {
        return qobject_cast<T *>(value.toQObject());
    }
};
