#pragma once

#include "bridge/sgfacbridge.h"
#include "sgcore/plugin/sgtclassfactory.h"

class SgPlugin;

// Creates the bridge action for the host and publishes its constructor `SgFacBridge` to each
// of the host's script engines. One instance lives in the plug-in library for the whole
// process; constructing it adds it to `plugin` and makes objects handed to scripts owned by
// C++ (the script collector never deletes an action the host keeps).
class SgFacBridgeFactory : public SgTClassFactory<SgFacBridge> {
public:
    SgFacBridgeFactory(const SgGUID &guid, SgPlugin *plugin);
    ~SgFacBridgeFactory() override;

    // A new bridge with no parent; the caller owns it.
    QObject *createInstance() override;
    // The same as createInstance().
    QObject *createInstanceById() override;
    using SgClassFactory::createInstance;

    // Registers the pointer type "SgFacBridge*" (once per process) and installs the global
    // constructor `SgFacBridge` in `engine`.
    void registerClass(QJSEngine *engine) override;

    // The one factory of the process, null before it is constructed and after it is destroyed.
    static SgFacBridgeFactory *instance() { return s_instance; }
    // The meta-type id of "SgFacBridge*", 0 until the first registerClass.
    static int metaTypeId() { return s_metaTypeId; }
    // How often the meta-type has been registered in this process (1 after any number of
    // engines).
    static int metaTypeRegistrations() { return s_metaTypeRegistrations; }

private:
    // The script constructor: a new bridge from the factory, wrapped with C++ ownership.
    static QJSValue construct(QJSEngine *engine, const QJSValueList &arguments);

    static SgFacBridgeFactory *s_instance;
    static int s_metaTypeId;
    static int s_metaTypeRegistrations;
};
