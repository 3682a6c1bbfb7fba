#pragma once

#include "sgcore/plugin/sgguid.h"

#include <QJSEngine>
#include <QJSValue>
#include <QString>

#include <functional>

struct QMetaObject;
class QObject;

// Creates the objects of one class that a plug-in contributes, for the host's menus and for
// its script engines. Plug-ins derive from it (usually through SgTClassFactory<T>).
class SgClassFactory {
public:
    // `metaObject` describes the class the factory creates; it must outlive the factory.
    SgClassFactory(const QMetaObject *metaObject, const SgGUID &guid);
    virtual ~SgClassFactory();

    SgClassFactory(const SgClassFactory &) = delete;
    SgClassFactory &operator=(const SgClassFactory &) = delete;

    // Creates an object for a script's constructor call. The base ignores the engine and the
    // arguments and returns createInstance(). The caller owns the result.
    virtual QObject *createInstance(QJSEngine *engine, const QJSValueList &arguments);

    // Creates a new object with no parent; the caller owns it.
    virtual QObject *createInstance() = 0;

    // A second creation entry for hosts that create objects by class id; the base forwards to
    // createInstance().
    virtual QObject *createInstanceById();

    // Publishes the class to one script engine. The host calls it once for every engine it
    // sets up. The base publishes nothing; factories of scriptable classes extend it.
    virtual void registerClass(QJSEngine *engine);

    // The class's meta-object, its class name and its identifier.
    const QMetaObject *metaObject() const { return m_metaObject; }
    QString className() const;
    const SgGUID &getGUID() const { return m_guid; }

    // How objects handed to scripts are owned. Hosts start with JavaScriptOwnership; a plug-in
    // that hands out objects the host keeps sets CppOwnership so the collector never deletes them.
    static QJSEngine::ObjectOwnership s_ownership;

    // Sets every key of the enumerators that `metaObject` itself declares as a property of
    // `wrapper`, with its value, so scripts can write Class.Key. Cost: one property per key.
    static void registerEnumsOnClass(QJSEngine *engine, const QMetaObject *metaObject,
                                     QJSValue &wrapper);

    // Builds a script function that calls `construct` with the call's arguments and returns
    // its result; used with or without `new`. The function lives as long as the engine.
    static QJSValue
    newConstructorFunction(QJSEngine *engine,
                           std::function<QJSValue(QJSEngine *, const QJSValueList &)> construct);

private:
    const QMetaObject *m_metaObject = nullptr;
    SgGUID m_guid;
};
