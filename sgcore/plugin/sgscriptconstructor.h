#pragma once

#include <QJSValue>
#include <QObject>

#include <functional>

class QJSEngine;

// The native end of a script constructor function: scripts call `construct` with the
// arguments of their call, and it hands them to a C++ function. Made by
// SgClassFactory::newConstructorFunction; a child of its engine.
class SgScriptConstructor : public QObject {
    Q_OBJECT
public:
    using Construct = std::function<QJSValue(QJSEngine *, const QJSValueList &)>;

    SgScriptConstructor(QJSEngine *engine, Construct construct);

    // Calls the C++ function with the engine and the elements of the array `arguments`.
    Q_INVOKABLE QJSValue construct(const QJSValue &arguments);

private:
    QJSEngine *m_engine = nullptr;
    Construct m_construct;
};
