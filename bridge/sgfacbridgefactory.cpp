#include "bridge/sgfacbridgefactory.h"

#include "sgcore/plugin/sgplugin.h"

#include <QMetaType>

SgFacBridgeFactory *SgFacBridgeFactory::s_instance = nullptr;
int SgFacBridgeFactory::s_metaTypeId = 0;
int SgFacBridgeFactory::s_metaTypeRegistrations = 0;

SgFacBridgeFactory::SgFacBridgeFactory(const SgGUID &guid, SgPlugin *plugin)
    : SgTClassFactory<SgFacBridge>(guid) {
    s_instance = this;
    SgClassFactory::s_ownership = QJSEngine::CppOwnership;
    if (plugin)
        plugin->addClassFactory(this);
}

SgFacBridgeFactory::~SgFacBridgeFactory() {
    if (s_instance == this)
        s_instance = nullptr;
}

QObject *SgFacBridgeFactory::createInstance() {
    return new SgFacBridge();
}

QObject *SgFacBridgeFactory::createInstanceById() {
    return createInstance();
}

void SgFacBridgeFactory::registerClass(QJSEngine *engine) {
    SgClassFactory::registerClass(engine);
    if (!engine)
        return;
    if (s_metaTypeId == 0) {
        s_metaTypeId = qRegisterMetaType<SgFacBridge *>("SgFacBridge*");
        ++s_metaTypeRegistrations;
    }
    QJSValue constructor = newConstructorFunction(engine, &SgFacBridgeFactory::construct);
    registerEnumsOnClass(engine, metaObject(), constructor);
    // An existing global of that name is replaced, so re-registering an engine is harmless.
    engine->globalObject().setProperty(className(), constructor);
}

QJSValue SgFacBridgeFactory::construct(QJSEngine *engine, const QJSValueList &arguments) {
    if (!s_instance || !engine)
        return QJSValue();
    QObject *object = s_instance->createInstance(engine, arguments);
    if (!object)
        return QJSValue();
    QJSEngine::setObjectOwnership(object, SgClassFactory::s_ownership);
    QJSValue wrapper = engine->newQObject(object);
    registerEnumsOnClass(engine, &SgFacBridge::staticMetaObject, wrapper);
    return wrapper;
}
