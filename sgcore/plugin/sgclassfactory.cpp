#include "sgcore/plugin/sgclassfactory.h"

#include "sgcore/plugin/sgscriptconstructor.h"

#include <QMetaEnum>
#include <QMetaObject>

QJSEngine::ObjectOwnership SgClassFactory::s_ownership = QJSEngine::JavaScriptOwnership;

SgClassFactory::SgClassFactory(const QMetaObject *metaObject, const SgGUID &guid)
    : m_metaObject(metaObject), m_guid(guid) {}

SgClassFactory::~SgClassFactory() = default;

QObject *SgClassFactory::createInstance(QJSEngine *, const QJSValueList &) {
    return createInstance();
}

QObject *SgClassFactory::createInstanceById() {
    return createInstance();
}

void SgClassFactory::registerClass(QJSEngine *) {}

QString SgClassFactory::className() const {
    return m_metaObject ? QString::fromLatin1(m_metaObject->className()) : QString();
}

void SgClassFactory::registerEnumsOnClass(QJSEngine *engine, const QMetaObject *metaObject,
                                          QJSValue &wrapper) {
    if (!engine || !metaObject || !wrapper.isObject())
        return;
    for (int e = metaObject->enumeratorOffset(); e < metaObject->enumeratorCount(); ++e) {
        const QMetaEnum metaEnum = metaObject->enumerator(e);
        for (int k = 0; k < metaEnum.keyCount(); ++k)
            wrapper.setProperty(QString::fromLatin1(metaEnum.key(k)), metaEnum.value(k));
    }
}

QJSValue SgClassFactory::newConstructorFunction(
    QJSEngine *engine, std::function<QJSValue(QJSEngine *, const QJSValueList &)> construct) {
    if (!engine)
        return QJSValue();
    // The target is a child of the engine, so it lives exactly as long as the engine does.
    auto *target = new SgScriptConstructor(engine, std::move(construct));
    QJSEngine::setObjectOwnership(target, QJSEngine::CppOwnership);
    const QJSValue bind = engine->evaluate(
        QStringLiteral("(function (target) { return function () {"
                       " return target.construct(Array.prototype.slice.call(arguments)); }; })"));
    return bind.call({engine->newQObject(target)});
}
