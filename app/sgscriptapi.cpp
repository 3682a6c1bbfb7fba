#include "app/sgscriptapi.h"

#include "app/sgbridgewatch.h"
#include "app/sgmodalanswerer.h"
#include "app/sgobjexport.h"
#include "app/sgpluginhost.h"
#include "app/sgscriptrunner.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgmodifier.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QJSEngine>
#include <QTimer>

#include <cmath>
#include <cstdio>
#include <limits>

SgNode *sgFindNodeByLabel(const QString &label) {
    return sgApp ? sgApp->getScene()->findNodeByLabel(label) : nullptr;
}

namespace {

QString kindOf(const SgNode *node) {
    if (dynamic_cast<const SgSkeleton *>(node))
        return QStringLiteral("figure");
    if (dynamic_cast<const SgBone *>(node))
        return QStringLiteral("bone");
    return node->getObject() ? QStringLiteral("prop") : QStringLiteral("node");
}

// Every element whose numeric properties count as the node's: the node, its object and the
// object's modifiers, in that order.
QList<SgElement *> propertyOwners(SgNode *node) {
    QList<SgElement *> owners{node};
    if (SgObject *object = node->getObject()) {
        owners.append(object);
        for (SgModifier *modifier : object->getModifiers())
            owners.append(modifier);
    }
    return owners;
}

SgNumericProperty *findNumeric(SgNode *node, const QString &name) {
    for (SgElement *owner : propertyOwners(node))
        for (SgProperty *property : owner->getProperties())
            if (auto *numeric = dynamic_cast<SgNumericProperty *>(property))
                if (numeric->getName() == name || numeric->getLabel() == name)
                    return numeric;
    return nullptr;
}

QJSValue describeProperty(QJSEngine *engine, const SgElement *owner, const SgNumericProperty *p) {
    QJSValue out = engine->newObject();
    out.setProperty(QStringLiteral("name"), p->getName());
    out.setProperty(QStringLiteral("label"), p->getLabel());
    out.setProperty(QStringLiteral("owner"), owner->getName());
    out.setProperty(QStringLiteral("value"), double(p->getValue()));
    out.setProperty(QStringLiteral("rawValue"), double(p->getRawValue()));
    out.setProperty(QStringLiteral("defaultValue"), double(p->getDefaultValue()));
    out.setProperty(QStringLiteral("min"), double(p->getMin()));
    out.setProperty(QStringLiteral("max"), double(p->getMax()));
    out.setProperty(QStringLiteral("clamped"), p->isClamped());
    out.setProperty(QStringLiteral("path"), p->getPath());
    out.setProperty(QStringLiteral("hidden"), p->isHidden());
    out.setProperty(QStringLiteral("controllers"), p->getControllerCount());
    return out;
}

} // namespace

// ---- app ----------------------------------------------------------------------------------

SgScriptApp::SgScriptApp(SgScriptRunner *runner, SgModalAnswerer *answerer,
                         const SgPluginHost *plugins, const QStringList &arguments, QObject *parent)
    : QObject(parent), m_runner(runner), m_answerer(answerer), m_plugins(plugins),
      m_arguments(arguments) {}

QStringList SgScriptApp::hostArguments() const {
    return sgApp->getCommandArguments();
}

void SgScriptApp::print(const QString &text) const {
    std::printf("%s\n", qPrintable(text));
    std::fflush(stdout);
}

QObject *SgScriptApp::action(const QString &name) const {
    for (SgAction *action : m_plugins->actions()) {
        if (action->text() == name || action->objectName() == name ||
            QString::fromLatin1(action->metaObject()->className()) == name) {
            // Returned without a parent, it would otherwise belong to the script's collector.
            QJSEngine::setObjectOwnership(action, QJSEngine::CppOwnership);
            return action;
        }
    }
    return nullptr;
}

QStringList SgScriptApp::actionNames() const {
    QStringList names;
    for (SgAction *action : m_plugins->actions())
        names.append(action->text());
    return names;
}

QJSValue SgScriptApp::waitForBridge(QObject *bridge, int timeoutMs, const QJSValue &callback) {
    QJSEngine *engine = qjsEngine(this);
    // A promise with its resolve function handed out, so that C++ can settle it later.
    QJSValue pair = engine->evaluate(
        QStringLiteral("(function(){ var r; var p = new Promise(function(res){ r = res; });"
                       " return [p, r]; })()"));
    if (bridge != nullptr && bridge->parent() == nullptr)
        adopt(bridge);
    auto *watch = new SgBridgeWatch(m_runner, bridge, timeoutMs, pair.property(1), callback, this);
    connect(sgApp->getScene(), &SgScene::sceneUpdated, watch, &SgBridgeWatch::sceneChanged);
    return pair.property(0);
}

void SgScriptApp::later(int ms, const QJSValue &callback) {
    m_runner->beginWait();
    QTimer::singleShot(qMax(ms, 0), this, [this, callback] {
        m_runner->callBack(callback, {});
        m_runner->endWait();
    });
}

bool SgScriptApp::exportObj(const QString &label, const QString &path) const {
    QString error;
    SgNode *node = sgFindNodeByLabel(label);
    if (node == nullptr)
        error = QStringLiteral("No node labelled %1 to export.").arg(label);
    else if (SgObjExport::exportNode(node, path, &error))
        return true;
    sgApp->log(error);
    return false;
}

QVariant SgScriptApp::setting(const QString &key, const QVariant &defaultValue) const {
    return SgAppSettings().getValue(key, defaultValue);
}

void SgScriptApp::setSetting(const QString &key, const QVariant &value) const {
    SgAppSettings settings;
    settings.setValue(key, value);
    settings.sync();
}

void SgScriptApp::onQuestion(const QJSValue &handler) {
    m_answerer->setHandler(handler);
}

QStringList SgScriptApp::logLines() const {
    return sgApp->getMessageSink()->logLines();
}

QString SgScriptApp::tempPath() const {
    return sgApp->getTempPath();
}

void SgScriptApp::fail(const QString &message) const {
    m_runner->fail(message);
}

void SgScriptApp::exit(int status) const {
    m_runner->exit(status);
}

void SgScriptApp::adopt(QObject *object) {
    // The plug-ins' own actions belong to their loaders.
    for (SgAction *action : m_plugins->actions())
        if (action == object)
            return;
    if (object != nullptr && object->parent() == nullptr)
        object->setParent(m_runner);
}

// ---- scene --------------------------------------------------------------------------------

SgScriptScene::SgScriptScene(QObject *parent) : QObject(parent) {}

bool SgScriptScene::load(const QString &path) {
    SgScene *scene = sgApp->getScene();
    scene->clear();
    SgSceneFile file;
    if (!file.load(path, scene)) {
        m_error = file.getErrorString();
        sgApp->log(QStringLiteral("Could not open the scene: %1").arg(m_error));
        return false;
    }
    m_error.clear();
    scene->update();
    return true;
}

bool SgScriptScene::save(const QString &path) {
    SgSceneFile file;
    if (!file.save(path, sgApp->getScene())) {
        m_error = file.getErrorString();
        sgApp->log(QStringLiteral("Could not save the scene: %1").arg(m_error));
        return false;
    }
    m_error.clear();
    return true;
}

QStringList SgScriptScene::labels() const {
    QStringList out;
    for (SgNode *node : sgApp->getScene()->getNodes())
        out.append(node->getLabel());
    return out;
}

QStringList SgScriptScene::figures() const {
    QStringList out;
    for (SgSkeleton *figure : sgApp->getScene()->getSkeletons())
        out.append(figure->getLabel());
    return out;
}

QJSValue SgScriptScene::node(const QString &label) const {
    SgNode *node = sgFindNodeByLabel(label);
    if (node == nullptr)
        return QJSValue(QJSValue::NullValue);
    QJSEngine *engine = qjsEngine(this);
    QJSValue out = engine->newObject();
    out.setProperty(QStringLiteral("label"), node->getLabel());
    out.setProperty(QStringLiteral("name"), node->getName());
    out.setProperty(QStringLiteral("kind"), kindOf(node));
    out.setProperty(QStringLiteral("parent"),
                    node->getParent() ? node->getParent()->getLabel() : QString());
    out.setProperty(QStringLiteral("hidden"), node->isHidden());
    const SgVec3 origin = node->getOrigin();
    QJSValue originValue = engine->newArray(3);
    originValue.setProperty(0, double(origin.x));
    originValue.setProperty(1, double(origin.y));
    originValue.setProperty(2, double(origin.z));
    out.setProperty(QStringLiteral("origin"), originValue);
    int vertexCount = 0;
    if (SgObject *object = node->getObject())
        if (SgShape *shape = object->getCurrentShape())
            if (SgVertexMesh *mesh = shape->getGeometry())
                vertexCount = mesh->getVertexCount();
    out.setProperty(QStringLiteral("vertexCount"), vertexCount);
    if (auto *figure = dynamic_cast<SgSkeleton *>(node)) {
        QStringList bones;
        for (SgBone *bone : figure->getAllBones())
            bones.append(bone->getLabel());
        out.setProperty(QStringLiteral("bones"), engine->toScriptValue(bones));
    }
    QJSValue properties = engine->newArray();
    quint32 index = 0;
    for (SgElement *owner : propertyOwners(node))
        for (SgProperty *property : owner->getProperties())
            if (auto *numeric = dynamic_cast<SgNumericProperty *>(property))
                properties.setProperty(index++, describeProperty(engine, owner, numeric));
    out.setProperty(QStringLiteral("properties"), properties);
    QJSValue modifiers = engine->newArray();
    if (SgObject *object = node->getObject()) {
        quint32 m = 0;
        for (SgModifier *modifier : object->getModifiers()) {
            QJSValue entry = engine->newObject();
            entry.setProperty(QStringLiteral("name"), modifier->getName());
            entry.setProperty(QStringLiteral("label"), modifier->getLabel());
            entry.setProperty(QStringLiteral("morph"), modifier->isMorphModifier());
            if (auto *morph = dynamic_cast<SgMorph *>(modifier)) {
                const SgFloatProperty *channel = morph->getValueChannel();
                entry.setProperty(QStringLiteral("deltas"),
                                  morph->getDeltas() ? morph->getDeltas()->getNumEntries() : 0);
                entry.setProperty(QStringLiteral("label"), channel->getLabel());
                entry.setProperty(QStringLiteral("value"), double(channel->getValue()));
                entry.setProperty(QStringLiteral("hidden"), channel->isHidden());
                entry.setProperty(QStringLiteral("path"), channel->getPath());
                entry.setProperty(QStringLiteral("controllers"), channel->getControllerCount());
            }
            modifiers.setProperty(m++, entry);
        }
    }
    out.setProperty(QStringLiteral("modifiers"), modifiers);
    return out;
}

bool SgScriptScene::setValue(const QString &label, const QString &property, double value) const {
    SgNode *node = sgFindNodeByLabel(label);
    SgNumericProperty *numeric = node ? findNumeric(node, property) : nullptr;
    if (numeric == nullptr)
        return false;
    numeric->setValue(static_cast<float>(value));
    return true;
}

double SgScriptScene::value(const QString &label, const QString &property) const {
    SgNode *node = sgFindNodeByLabel(label);
    SgNumericProperty *numeric = node ? findNumeric(node, property) : nullptr;
    return numeric ? double(numeric->getValue()) : std::numeric_limits<double>::quiet_NaN();
}

void SgScriptScene::update() const {
    sgApp->getScene()->update();
}

// ---- selection ----------------------------------------------------------------------------

SgScriptSelection::SgScriptSelection(QObject *parent) : QObject(parent) {}

bool SgScriptSelection::select(const QString &label, bool add) const {
    SgNode *node = sgFindNodeByLabel(label);
    if (node == nullptr)
        return false;
    sgApp->getScene()->selectNode(node, add);
    return true;
}

void SgScriptSelection::clear() const {
    sgApp->getScene()->clearSelection();
}

QStringList SgScriptSelection::labels() const {
    QStringList out;
    for (SgNode *node : sgApp->getScene()->getSelectedNodes())
        out.append(node->getLabel());
    return out;
}

QString SgScriptSelection::primary() const {
    SgNode *node = sgApp->getScene()->getPrimarySelection();
    return node ? node->getLabel() : QString();
}
