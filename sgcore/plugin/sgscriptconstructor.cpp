#include "sgcore/plugin/sgscriptconstructor.h"

#include <QJSEngine>

SgScriptConstructor::SgScriptConstructor(QJSEngine *engine, Construct construct)
    : QObject(engine), m_engine(engine), m_construct(std::move(construct)) {}

QJSValue SgScriptConstructor::construct(const QJSValue &arguments) {
    if (!m_construct)
        return QJSValue();
    QJSValueList list;
    const int count = arguments.property(QStringLiteral("length")).toInt();
    for (int i = 0; i < count; ++i)
        list.append(arguments.property(quint32(i)));
    return m_construct(m_engine, list);
}
