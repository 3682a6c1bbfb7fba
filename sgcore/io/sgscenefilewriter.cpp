#include "sgcore/io/sgscenefilewriter.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/io/sgmorphdeltafile.h"
#include "sgcore/io/sgobjwriter.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/materials/sgtexture.h"
#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgboolproperty.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgenumproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgimageproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/properties/sgnumericnodeproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/properties/sgskeletonproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QFileInfo>
#include <QJsonDocument>

namespace {

struct SaveError {
    QString text;
};

QJsonArray vec3(const SgVec3 &v) {
    return {double(v.x), double(v.y), double(v.z)};
}

// 0 to 255 per component; whole numbers where the colour has 8-bit precision, so that colours
// with finer steps come back exactly.
QJsonArray color(const QColor &c) {
    const QRgba64 rgba = c.rgba64();
    QJsonArray out;
    for (const quint16 component : {rgba.red(), rgba.green(), rgba.blue()}) {
        if (component % 257 == 0)
            out.append(component / 257);
        else
            out.append(double(component) * 255.0 / 65535.0);
    }
    return out;
}

QString fileStem(const QString &name) {
    QString stem = name;
    for (QChar &c : stem)
        if (!c.isLetterOrNumber() && c != QLatin1Char('-') && c != QLatin1Char('_'))
            c = QLatin1Char('_');
    return stem.isEmpty() ? QStringLiteral("node") : stem;
}

// The parent the file can name: one in the same scene.
SgNode *parentInScene(const SgNode *node) {
    SgNode *parent = node->getParent();
    return parent && parent->getScene() == node->getScene() ? parent : nullptr;
}

void putIfSet(QJsonObject &o, const char *key, bool value, bool fallback) {
    if (value != fallback)
        o.insert(QLatin1String(key), value);
}

} // namespace

bool SgSceneFileWriter::save(const SgScene *scene, const QString &path) {
    m_error.clear();
    m_written.clear();
    m_done.clear();
    m_usedNames.clear();
    const QFileInfo info(path);
    m_sceneFolder = info.absoluteDir();
    m_geometryFolderName = info.completeBaseName() + QStringLiteral("-geometry");
    m_geometryFolder = QDir(m_sceneFolder.filePath(m_geometryFolderName));
    try {
        if (!scene)
            throw SaveError{QStringLiteral("no scene to save")};
        QJsonArray nodes;
        for (SgNode *node : scene->getNodes())
            writeInOrder(node, nodes);
        QJsonObject root;
        root.insert(QStringLiteral("scenara"), 1);
        root.insert(QStringLiteral("nodes"), nodes);
        QString error;
        if (!SgFileIO::writeWholeFile(path, QJsonDocument(root).toJson(), &error))
            throw SaveError{QStringLiteral("cannot write the file (%1)").arg(error)};
    } catch (const SaveError &e) {
        m_error = path + QStringLiteral(": ") + e.text;
        return false;
    }
    return true;
}

// A node after its parent (the loader resolves a parent among the nodes before it); a bone
// with its figure.
void SgSceneFileWriter::writeInOrder(SgNode *node, QJsonArray &out) {
    if (auto *bone = dynamic_cast<SgBone *>(node); bone && bone->getSkeleton())
        node = bone->getSkeleton();
    if (m_done.contains(node))
        return;
    m_done.insert(node);
    if (SgNode *parent = parentInScene(node))
        writeInOrder(parent, out);
    auto *figure = dynamic_cast<SgSkeleton *>(node);
    out.append(figure ? figureEntry(figure) : nodeEntry(node));
}

void SgSceneFileWriter::writeCommon(SgNode *node, QJsonObject &o) {
    o.insert(QStringLiteral("name"), node->getName());
    if (node->getLabel() != node->getName())
        o.insert(QStringLiteral("label"), node->getLabel());
    if (!(node->getOrigin() == SgVec3()))
        o.insert(QStringLiteral("origin"), vec3(node->getOrigin()));
    putIfSet(o, "hidden", node->isHidden(), false);
    const QJsonArray props = properties(node);
    if (!props.isEmpty())
        o.insert(QStringLiteral("properties"), props);
    const QStringList groups = node->getPropertyGroups()->getAllPaths();
    if (!groups.isEmpty())
        o.insert(QStringLiteral("groups"), QJsonArray::fromStringList(groups));
}

QJsonObject SgSceneFileWriter::nodeEntry(SgNode *node) {
    QJsonObject o;
    const bool hasGeometry = node->getObject() && node->getObject()->getCurrentShape();
    o.insert(QStringLiteral("kind"), hasGeometry ? QStringLiteral("prop") : QStringLiteral("node"));
    writeCommon(node, o);
    if (SgNode *parent = parentInScene(node))
        o.insert(QStringLiteral("parent"), parent->getName());
    if (hasGeometry)
        writeGeometry(node, fileStem(node->getName()), o);
    return o;
}

QJsonObject SgSceneFileWriter::figureEntry(SgSkeleton *figure) {
    QJsonObject o;
    o.insert(QStringLiteral("kind"), QStringLiteral("figure"));
    writeCommon(figure, o);
    if (SgNode *parent = parentInScene(figure))
        o.insert(QStringLiteral("parent"), parent->getName());
    if (SgSkeleton *target = figure->getFollowTarget())
        o.insert(QStringLiteral("followTarget"), target->getName());
    QJsonArray bones;
    for (SgBone *bone : figure->getAllBones()) {
        m_done.insert(bone);
        QJsonObject b;
        writeCommon(bone, b);
        if (bone->getParent() && bone->getParent() != figure)
            b.insert(QStringLiteral("parent"), bone->getParent()->getName());
        if (bone->getObject() && bone->getObject()->getCurrentShape())
            writeGeometry(
                bone, fileStem(figure->getName()) + QLatin1Char('-') + fileStem(bone->getName()),
                b);
        bones.append(b);
    }
    o.insert(QStringLiteral("bones"), bones);
    return o;
}

QString SgSceneFileWriter::freeFileName(const QString &stem, const QString &suffix) {
    QString name = stem + suffix;
    for (int n = 2; m_usedNames.contains(name.toLower()); ++n)
        name = QStringLiteral("%1-%2%3").arg(stem).arg(n).arg(suffix);
    m_usedNames.insert(name.toLower());
    return name;
}

void SgSceneFileWriter::writeGeometry(SgNode *node, const QString &stem, QJsonObject &o) {
    const SgShape *shape = node->getObject()->getCurrentShape();
    const auto *mesh = dynamic_cast<const SgPolyMesh *>(shape->getGeometry());
    if (mesh == nullptr)
        throw SaveError{
            QStringLiteral("the geometry of \"%1\" is not a polygon mesh").arg(node->getLabel())};
    if (!m_geometryFolder.exists() && !m_geometryFolder.mkpath(QStringLiteral(".")))
        throw SaveError{
            QStringLiteral("cannot make the folder %1").arg(m_geometryFolder.absolutePath())};
    SgObjWriter writer;
    writer.comment(QStringLiteral("Scenara scene geometry of %1").arg(node->getLabel()));
    // Every material and face group is named before the facets, so that reading the file
    // gives them back in the same index order, unused ones included.
    QStringList materialNames;
    for (const SgMaterial *material : shape->getAllMaterials()) {
        materialNames.append(material->getName());
        writer.material(material->getName());
    }
    for (int g = 0; g < mesh->getFaceGroupCount(); ++g)
        writer.group(mesh->getFaceGroupName(g));
    writer.vertices(reinterpret_cast<const float *>(mesh->getVertices()),
                    size_t(mesh->getVertexCount()));
    if (const SgMap *uvs = mesh->getUVList())
        writer.uvs(reinterpret_cast<const float *>(uvs->values().data()), uvs->values().size());
    writer.facets(*mesh, materialNames, 0, 0, true);
    const QString name = freeFileName(stem, QStringLiteral(".obj"));
    const QString path = m_geometryFolder.filePath(name);
    if (!writer.save(path))
        throw SaveError{QStringLiteral("cannot write %1 (%2)").arg(path, writer.errorString())};
    m_written.append(path);
    o.insert(QStringLiteral("geometry"), m_geometryFolderName + QLatin1Char('/') + name);
    const QJsonArray materialList = materials(shape);
    if (!materialList.isEmpty())
        o.insert(QStringLiteral("materials"), materialList);
    const QJsonArray morphList = morphs(node, name.chopped(4));
    if (!morphList.isEmpty())
        o.insert(QStringLiteral("morphs"), morphList);
}

QString SgSceneFileWriter::filePath(const QString &file) const {
    const QString relative = m_sceneFolder.relativeFilePath(file);
    return relative.startsWith(QLatin1String("..")) ? file : relative;
}

QJsonArray SgSceneFileWriter::materials(const SgShape *shape) const {
    QJsonArray out;
    for (const SgMaterial *m : shape->getAllMaterials()) {
        const auto *material = dynamic_cast<const SgDefaultMaterial *>(m);
        if (material == nullptr)
            continue;
        QJsonObject o;
        o.insert(QStringLiteral("name"), material->getName());
        o.insert(QStringLiteral("diffuse"), color(material->getDiffuseColor()));
        o.insert(QStringLiteral("specular"), color(material->getSpecularColor()));
        o.insert(QStringLiteral("glossiness"), double(material->getGlossinessStrength()));
        o.insert(QStringLiteral("opacity"), double(material->getOpacityStrength()));
        o.insert(QStringLiteral("bump"), double(material->getBumpStrength()));
        if (const SgTexture *map = material->getColorMap())
            o.insert(QStringLiteral("diffuseMap"), filePath(map->getFileName()));
        if (const SgTexture *map = material->getBumpMap())
            o.insert(QStringLiteral("bumpMap"), filePath(map->getFileName()));
        out.append(o);
    }
    return out;
}

QJsonArray SgSceneFileWriter::morphs(SgNode *node, const QString &stem) {
    QJsonArray out;
    for (const SgModifier *modifier : node->getObject()->getModifiers())
        if (const auto *morph = dynamic_cast<const SgMorph *>(modifier))
            out.append(morphEntry(morph, stem));
    return out;
}

QJsonObject SgSceneFileWriter::morphEntry(const SgMorph *morph, const QString &stem) {
    QJsonObject o;
    o.insert(QStringLiteral("name"), morph->getName());
    if (morph->getLabel() != morph->getName())
        o.insert(QStringLiteral("label"), morph->getLabel());
    if (const SgMorphDeltas *deltas = morph->getDeltas()) {
        const QString name = freeFileName(stem + QLatin1Char('.') + fileStem(morph->getName()),
                                          QStringLiteral(".deltas"));
        const QString path = m_geometryFolder.filePath(name);
        QString error;
        if (!SgMorphDeltaFile::write(path, *deltas, error))
            throw SaveError{QStringLiteral("cannot write %1 (%2)").arg(path, error)};
        m_written.append(path);
        o.insert(QStringLiteral("vertexCount"), deltas->getVertCount());
        o.insert(QStringLiteral("deltas"), m_geometryFolderName + QLatin1Char('/') + name);
    }
    o.insert(QStringLiteral("channel"), propertyEntry(morph->getValueChannel()));
    return o;
}

QJsonArray SgSceneFileWriter::properties(const SgElement *element) const {
    QJsonArray out;
    for (const SgProperty *property : element->getProperties())
        out.append(propertyEntry(property));
    return out;
}

QJsonObject SgSceneFileWriter::propertyEntry(const SgProperty *property) const {
    QJsonObject o;
    auto nodeName = [](const SgNode *node) { return node ? node->getName() : QString(); };
    if (const auto *numeric = dynamic_cast<const SgNumericProperty *>(property)) {
        const auto *withNode = dynamic_cast<const SgNumericNodeProperty *>(property);
        o.insert(QStringLiteral("type"), withNode ? QStringLiteral("numericNode")
                                         : dynamic_cast<const SgIntProperty *>(property)
                                             ? QStringLiteral("int")
                                             : QStringLiteral("float"));
        o.insert(QStringLiteral("value"), double(numeric->getRawValue()));
        o.insert(QStringLiteral("default"), double(numeric->getDefaultValue()));
        o.insert(QStringLiteral("min"), double(numeric->getMin()));
        o.insert(QStringLiteral("max"), double(numeric->getMax()));
        o.insert(QStringLiteral("clamped"), numeric->isClamped());
        o.insert(QStringLiteral("sensitivity"), double(numeric->getSensitivity()));
        putIfSet(o, "percent", numeric->getDisplayAsPercent(), false);
        if (withNode) {
            putIfSet(o, "mustHaveNode", withNode->getMustHaveNode(), false);
            if (withNode->getNode())
                o.insert(QStringLiteral("node"), nodeName(withNode->getNode()));
        }
        const QJsonArray linkList = links(numeric);
        if (!linkList.isEmpty())
            o.insert(QStringLiteral("links"), linkList);
    } else if (const auto *b = dynamic_cast<const SgBoolProperty *>(property)) {
        o.insert(QStringLiteral("type"), QStringLiteral("bool"));
        o.insert(QStringLiteral("value"), b->getBoolValue());
        o.insert(QStringLiteral("default"), b->getDefaultValue() != 0);
    } else if (const auto *c = dynamic_cast<const SgColorProperty *>(property)) {
        o.insert(QStringLiteral("type"), QStringLiteral("color"));
        o.insert(QStringLiteral("value"), color(c->getColorValue()));
        o.insert(QStringLiteral("default"), color(QColor::fromRgb(c->getDefaultValue())));
    } else if (const auto *e = dynamic_cast<const SgEnumProperty *>(property)) {
        o.insert(QStringLiteral("type"), QStringLiteral("enum"));
        o.insert(QStringLiteral("items"), QJsonArray::fromStringList(e->getItems()));
        o.insert(QStringLiteral("value"), e->getValue());
        o.insert(QStringLiteral("default"), e->getDefaultValue());
    } else if (const auto *i = dynamic_cast<const SgImageProperty *>(property)) {
        o.insert(QStringLiteral("type"), QStringLiteral("image"));
        if (i->getValue())
            o.insert(QStringLiteral("value"), filePath(i->getValue()->getFileName()));
    } else if (const auto *n = dynamic_cast<const SgNodeProperty *>(property)) {
        o.insert(QStringLiteral("type"), dynamic_cast<const SgSkeletonProperty *>(property)
                                             ? QStringLiteral("skeleton")
                                             : QStringLiteral("node"));
        if (n->getValue())
            o.insert(QStringLiteral("value"), nodeName(n->getValue()));
        if (n->getDefaultValue())
            o.insert(QStringLiteral("default"), nodeName(n->getDefaultValue()));
    }
    o.insert(QStringLiteral("name"), property->getName());
    if (property->getLabel() != property->getName())
        o.insert(QStringLiteral("label"), property->getLabel());
    if (!property->getPath().isEmpty())
        o.insert(QStringLiteral("path"), property->getPath());
    putIfSet(o, "hidden", property->isHidden(), false);
    putIfSet(o, "locked", property->isLocked(), false);
    putIfSet(o, "canAnimate", property->canAnimate(), true);
    putIfSet(o, "user", property->isUserProperty(), false);
    return o;
}

// ERC links by the node and name of their control property; a control property that is a
// morph's value channel also names the morph. Links whose control property is gone are left
// out (they change nothing).
QJsonArray SgSceneFileWriter::links(const SgNumericProperty *property) const {
    QJsonArray out;
    for (const SgController *controller : property->getControllers()) {
        const auto *link = dynamic_cast<const SgERCLink *>(controller);
        const SgNumericProperty *control = link ? link->getProperty() : nullptr;
        if (control == nullptr)
            continue;
        QJsonObject o;
        SgElement *owner = control->getOwner();
        if (auto *morph = dynamic_cast<const SgMorph *>(owner)) {
            const auto *object = dynamic_cast<const SgObject *>(morph->getElementParent());
            if (object == nullptr || object->getNode() == nullptr)
                continue;
            o.insert(QStringLiteral("node"), object->getNode()->getName());
            o.insert(QStringLiteral("morph"), morph->getName());
        } else if (auto *node = dynamic_cast<const SgNode *>(owner)) {
            o.insert(QStringLiteral("node"), node->getName());
        } else {
            continue;
        }
        o.insert(QStringLiteral("property"), control->getName());
        o.insert(QStringLiteral("type"), link->getType());
        o.insert(QStringLiteral("scale"), double(link->getScale()));
        o.insert(QStringLiteral("offset"), double(link->getOffset()));
        out.append(o);
    }
    return out;
}
