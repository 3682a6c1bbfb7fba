#include "sgcore/script/sgscriptsceneapi.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QQuaternion>

#include <cmath>

SgScriptSceneApi::SgScriptSceneApi(QObject *parent) : QObject(parent) {}

SgNode *SgScriptSceneApi::findNode(const QString &name) {
    SgScene *scene = sgApp ? sgApp->getScene() : nullptr;
    if (!scene)
        return nullptr;
    if (SgNode *node = scene->findNodeByName(name))
        return node;
    return scene->findNodeByLabel(name);
}

void SgScriptSceneApi::log(const QString &text) {
    if (sgApp)
        sgApp->log(text);
}

void SgScriptSceneApi::print(const QString &text) {
    log(text);
}

bool SgScriptSceneApi::setRotation(const QString &node, double x, double y, double z) {
    SgNode *target = findNode(node);
    if (!target || !std::isfinite(x) || !std::isfinite(y) || !std::isfinite(z))
        return false;
    const QQuaternion q = QQuaternion::fromEulerAngles(float(x), float(y), float(z));
    target->setLocalRot(SgQuat(q.x(), q.y(), q.z(), q.scalar()));
    return true;
}

bool SgScriptSceneApi::setRotationQuat(const QString &node, double x, double y, double z,
                                       double w) {
    SgNode *target = findNode(node);
    const double length = std::sqrt(x * x + y * y + z * z + w * w);
    if (!target || !std::isfinite(length) || length == 0.0)
        return false;
    target->setLocalRot(
        SgQuat(float(x / length), float(y / length), float(z / length), float(w / length)));
    return true;
}

bool SgScriptSceneApi::setValue(const QString &node, const QString &property, double value) {
    SgNode *target = findNode(node);
    if (!target || !std::isfinite(value))
        return false;
    auto *numeric = dynamic_cast<SgNumericProperty *>(target->findProperty(property));
    if (!numeric) {
        for (SgProperty *candidate : target->getProperties()) {
            if (candidate->getLabel() == property) {
                numeric = dynamic_cast<SgNumericProperty *>(candidate);
                break;
            }
        }
    }
    if (!numeric)
        return false;
    numeric->setValue(float(value));
    return true;
}

bool SgScriptSceneApi::setMorph(const QString &node, const QString &morph, double value) {
    SgNode *target = findNode(node);
    SgObject *object = target ? target->getObject() : nullptr;
    auto *modifier = object ? dynamic_cast<SgMorph *>(object->findModifier(morph)) : nullptr;
    if (!modifier || !std::isfinite(value))
        return false;
    modifier->getValueChannel()->setValue(float(value));
    return true;
}

bool SgScriptSceneApi::resetPose(const QString &node) {
    SgNode *target = findNode(node);
    if (!target)
        return false;
    target->setLocalRot(SgQuat());
    if (auto *figure = dynamic_cast<SgSkeleton *>(target)) {
        for (SgBone *bone : figure->getAllBones())
            bone->setLocalRot(SgQuat());
    }
    return true;
}
