#include "sgcore/io/sgscenefile.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgmorphdeltafile.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/io/sgscenefilewriter.h"
#include "sgcore/materials/sgdefaultmaterial.h"
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

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

#include <functional>
#include <memory>
#include <vector>

namespace {

// Raised inside the loader to abandon the whole file with a message.
struct LoadError {
    QString text;
};

[[noreturn]] void fail(const QString &where, const QString &what) {
    throw LoadError{where.isEmpty() ? what : where + QStringLiteral(": ") + what};
}

// One loading run: builds the nodes apart from the scene, then hands them over at once.
class Loader {
public:
    Loader(const QString &baseDir, SgScene *scene) : m_baseDir(baseDir), m_scene(scene) {}

    ~Loader() {
        for (const auto &entry : m_links) {
            delete entry.second;
        }
        // Nodes not handed to the scene (a failed load) are deleted, leaves first.
        for (auto it = m_created.rbegin(); it != m_created.rend(); ++it) {
            delete *it;
        }
    }

    int load(const QJsonObject &root) {
        const QJsonValue version = root.value(QStringLiteral("scenara"));
        if (!version.isDouble() || version.toInt() != 1) {
            fail(QString(), QStringLiteral("not a scene file of version 1 (key \"scenara\")"));
        }
        const QJsonValue nodes = root.value(QStringLiteral("nodes"));
        if (!nodes.isArray()) {
            fail(QString(), QStringLiteral("\"nodes\" must be an array"));
        }
        const QJsonArray list = nodes.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            loadNode(list.at(i), QStringLiteral("nodes[%1]").arg(i));
        }
        for (const auto &resolve : m_deferred) {
            resolve();
        }
        for (auto &[channel, link] : m_links) {
            channel->insertController(link);
            link = nullptr;
        }
        for (SgNode *n : m_created) {
            if (!n->getParent() || n->getParent()->getScene() == m_scene) {
                m_scene->addNode(n, true);
            }
        }
        const int added = static_cast<int>(m_created.size());
        m_created.clear();
        return added;
    }

private:
    static QJsonObject objectAt(const QJsonValue &v, const QString &where) {
        if (!v.isObject()) {
            fail(where, QStringLiteral("must be an object"));
        }
        return v.toObject();
    }

    static QString requiredString(const QJsonObject &o, const char *key, const QString &where) {
        const QJsonValue v = o.value(QLatin1String(key));
        if (!v.isString() || v.toString().isEmpty()) {
            fail(where,
                 QStringLiteral("\"%1\" must be a non-empty string").arg(QLatin1String(key)));
        }
        return v.toString();
    }

    static QString optionalString(const QJsonObject &o, const char *key, const QString &where) {
        const QJsonValue v = o.value(QLatin1String(key));
        if (v.isUndefined() || v.isNull()) {
            return QString();
        }
        if (!v.isString()) {
            fail(where, QStringLiteral("\"%1\" must be a string").arg(QLatin1String(key)));
        }
        return v.toString();
    }

    static bool optionalBool(const QJsonObject &o, const char *key, bool fallback,
                             const QString &where) {
        const QJsonValue v = o.value(QLatin1String(key));
        if (v.isUndefined()) {
            return fallback;
        }
        if (!v.isBool()) {
            fail(where, QStringLiteral("\"%1\" must be true or false").arg(QLatin1String(key)));
        }
        return v.toBool();
    }

    static double optionalNumber(const QJsonObject &o, const char *key, double fallback,
                                 const QString &where) {
        const QJsonValue v = o.value(QLatin1String(key));
        if (v.isUndefined()) {
            return fallback;
        }
        if (!v.isDouble()) {
            fail(where, QStringLiteral("\"%1\" must be a number").arg(QLatin1String(key)));
        }
        return v.toDouble();
    }

    static std::vector<double> numbers(const QJsonValue &v, int count, const QString &where,
                                       const char *key) {
        if (!v.isArray() || v.toArray().size() != count) {
            fail(where, QStringLiteral("\"%1\" must be an array of %2 numbers")
                            .arg(QLatin1String(key))
                            .arg(count));
        }
        std::vector<double> out;
        for (const QJsonValue &e : v.toArray()) {
            if (!e.isDouble()) {
                fail(where, QStringLiteral("\"%1\" must be an array of %2 numbers")
                                .arg(QLatin1String(key))
                                .arg(count));
            }
            out.push_back(e.toDouble());
        }
        return out;
    }

    static SgVec3 optionalVec3(const QJsonObject &o, const char *key, const QString &where) {
        const QJsonValue v = o.value(QLatin1String(key));
        if (v.isUndefined()) {
            return {};
        }
        const std::vector<double> n = numbers(v, 3, where, key);
        return {float(n[0]), float(n[1]), float(n[2])};
    }

    static QColor colorOf(const QJsonValue &v, const QString &where, const char *key) {
        const std::vector<double> n = numbers(v, 3, where, key);
        for (double c : n) {
            if (c < 0 || c > 255) {
                fail(where,
                     QStringLiteral("\"%1\" components must be 0 to 255").arg(QLatin1String(key)));
            }
        }
        return QColor::fromRgbF(float(n[0] / 255.0), float(n[1] / 255.0), float(n[2] / 255.0));
    }

    QString resolvePath(const QString &file) const {
        return QDir::isAbsolutePath(file) ? file : QDir(m_baseDir).filePath(file);
    }

    // The mesh of a whole OBJ file, read once per run.
    SgObjReader &readerFor(const QString &file, const QString &where) {
        const QString path = QDir::cleanPath(resolvePath(file));
        auto it = m_readers.find(path);
        if (it != m_readers.end()) {
            return *it->second;
        }
        auto reader = std::make_unique<SgObjReader>();
        if (!reader->readFile(path)) {
            fail(where, reader->getErrorString());
        }
        SgObjReader &ref = *reader;
        m_readers.emplace(path, std::move(reader));
        return ref;
    }

    SgPolyShape *loadGeometry(const QJsonValue &v, const QString &name, const QString &where) {
        QString file;
        QString group;
        if (v.isString()) {
            file = v.toString();
        } else if (v.isObject()) {
            file = requiredString(v.toObject(), "file", where);
            group = optionalString(v.toObject(), "group", where);
        } else {
            fail(where, QStringLiteral("\"geometry\" must be a file name or an object"));
        }
        SgObjReader &reader = readerFor(file, where);
        const SgPolyMesh *source = reader.getMesh();
        SgPolyMesh *mesh = nullptr;
        if (group.isEmpty()) {
            mesh = source->clonePolyMesh();
        } else {
            const int g = source->findFaceGroup(group);
            if (g < 0) {
                fail(where, QStringLiteral("no face group \"%1\" in %2").arg(group, file));
            }
            mesh = extractGroup(*source, g);
        }
        auto *shape = new SgPolyShape(name);
        shape->setPolyMesh(mesh);
        for (const QString &m : reader.getMaterialNames()) {
            shape->addMaterial(new SgDefaultMaterial(m));
        }
        return shape;
    }

    // The facets of one group with only the vertices they use, in ascending source order.
    static SgPolyMesh *extractGroup(const SgPolyMesh &source, int group) {
        const std::vector<int32_t> used = source.getFaceGroupVertices(group);
        std::vector<int32_t> newIndex(size_t(source.getVertexCount()), -1);
        auto *mesh = new SgPolyMesh;
        mesh->beginEdit(true);
        SgVec3 *dst = mesh->setVertexArray(static_cast<int>(used.size()));
        for (size_t i = 0; i < used.size(); ++i) {
            newIndex[size_t(used[i])] = static_cast<int32_t>(i);
            dst[i] = source.getVertices()[used[i]];
        }
        if (const SgMap *uvs = source.getUVList()) {
            mesh->setUVList(new SgMap(*uvs));
        }
        auto add = [&](const SgFaceCorner *c, int n, int material) {
            mesh->activateMaterial(material);
            mesh->startFace();
            for (int k = 0; k < n; ++k) {
                mesh->addFaceEdge(newIndex[size_t(c[k].vertex)], c[k].uv, c[k].third);
            }
            mesh->finishFace();
        };
        for (int i = 0; i < source.getTriangleCount(); ++i) {
            if (source.getTriangleGroup(i) == group) {
                add(source.getTriangleCorners(i), 3, source.getTriangleMaterial(i));
            }
        }
        for (int i = 0; i < source.getQuadCount(); ++i) {
            if (source.getQuadGroup(i) == group) {
                add(source.getQuadCorners(i), 4, source.getQuadMaterial(i));
            }
        }
        for (int i = 0; i < source.getPolygonCount(); ++i) {
            if (source.getPolygonGroup(i) == group) {
                add(source.getPolygonCorners(i), source.getPolygonCornerCount(i),
                    source.getPolygonMaterial(i));
            }
        }
        mesh->finishEdit();
        return mesh;
    }

    void applyMaterials(SgShape *shape, const QJsonObject &o, const QString &where) {
        const QJsonValue v = o.value(QStringLiteral("materials"));
        if (v.isUndefined()) {
            return;
        }
        if (!v.isArray()) {
            fail(where, QStringLiteral("\"materials\" must be an array"));
        }
        const QJsonArray list = v.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            const QString at = where + QStringLiteral(".materials[%1]").arg(i);
            const QJsonObject m = objectAt(list.at(i), at);
            const QString name = requiredString(m, "name", at);
            auto *material = dynamic_cast<SgDefaultMaterial *>(shape->findMaterial(name));
            if (!material) {
                continue;
            }
            if (m.contains(QStringLiteral("diffuse"))) {
                material->setDiffuseColor(
                    colorOf(m.value(QStringLiteral("diffuse")), at, "diffuse"));
            }
            if (m.contains(QStringLiteral("specular"))) {
                material->setSpecularColor(
                    colorOf(m.value(QStringLiteral("specular")), at, "specular"));
            }
            material->setGlossinessStrength(
                float(optionalNumber(m, "glossiness", material->getGlossinessStrength(), at)));
            material->setOpacityStrength(
                float(optionalNumber(m, "opacity", material->getOpacityStrength(), at)));
            material->setBumpStrength(
                float(optionalNumber(m, "bump", material->getBumpStrength(), at)));
            const QString diffuseMap = optionalString(m, "diffuseMap", at);
            if (!diffuseMap.isEmpty()) {
                material->setColorMap(textureFor(diffuseMap));
            }
            const QString bumpMap = optionalString(m, "bumpMap", at);
            if (!bumpMap.isEmpty()) {
                if (SgFloatProperty *bump = material->getBumpControl()) {
                    bump->setMapValue(textureFor(bumpMap));
                    bump->setMapped(true);
                }
            }
        }
    }

    SgTexture *textureFor(const QString &file) {
        return sgApp ? sgApp->getImageMgr()->getImage(QDir::cleanPath(resolvePath(file))) : nullptr;
    }

    // A node of this file by name, else a bone of this file's figures, else a scene label.
    SgNode *findNode(const QString &name) const {
        for (SgNode *n : m_created) {
            if (n->getName() == name && !dynamic_cast<SgBone *>(n)) {
                return n;
            }
        }
        for (SgNode *n : m_created) {
            if (n->getName() == name) {
                return n;
            }
        }
        return m_scene->findNodeByLabel(name);
    }

    void loadCommon(SgNode *node, const QJsonObject &o, const QString &where) {
        const QString label = optionalString(o, "label", where);
        if (!label.isEmpty()) {
            node->setLabel(label);
        }
        node->setOrigin(optionalVec3(o, "origin", where));
        node->setHidden(optionalBool(o, "hidden", false, where));
        loadProperties(node, o, where);
    }

    void loadNode(const QJsonValue &v, const QString &where) {
        const QJsonObject o = objectAt(v, where);
        const QString kind = requiredString(o, "kind", where);
        const QString name = requiredString(o, "name", where);
        SgNode *node = nullptr;
        if (kind == QLatin1String("figure")) {
            node = loadFigure(o, name, where);
        } else if (kind == QLatin1String("prop") || kind == QLatin1String("node")) {
            node = new SgNode(name);
            m_created.push_back(node);
            loadCommon(node, o, where);
            if (kind == QLatin1String("prop")) {
                if (!o.contains(QStringLiteral("geometry"))) {
                    fail(where, QStringLiteral("a prop needs \"geometry\""));
                }
                auto *object = new SgObject(name);
                SgPolyShape *shape = loadGeometry(o.value(QStringLiteral("geometry")), name, where);
                object->addShape(shape);
                node->setObject(object);
                applyMaterials(shape, o, where);
                loadMorphs(node, o, where);
            }
        } else {
            fail(where, QStringLiteral("unknown kind \"%1\"").arg(kind));
        }
        const QString parent = optionalString(o, "parent", where);
        if (!parent.isEmpty()) {
            SgNode *p = findNode(parent);
            if (!p || p == node) {
                fail(where, QStringLiteral("unknown parent \"%1\"").arg(parent));
            }
            node->setParent(p);
        }
    }

    SgNode *loadFigure(const QJsonObject &o, const QString &name, const QString &where) {
        auto *figure = new SgSkeleton(name);
        m_created.push_back(figure);
        loadCommon(figure, o, where);
        const QJsonValue bones = o.value(QStringLiteral("bones"));
        if (!bones.isArray()) {
            fail(where, QStringLiteral("a figure needs \"bones\" (an array)"));
        }
        QHash<QString, SgBone *> byName;
        const QJsonArray list = bones.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            const QString at = where + QStringLiteral(".bones[%1]").arg(i);
            const QJsonObject b = objectAt(list.at(i), at);
            const QString boneName = requiredString(b, "name", at);
            if (byName.contains(boneName)) {
                fail(at, QStringLiteral("bone \"%1\" appears twice").arg(boneName));
            }
            auto *bone = new SgBone(boneName);
            m_created.push_back(bone);
            const QString parent = optionalString(b, "parent", at);
            SgNode *parentNode = figure;
            if (!parent.isEmpty()) {
                parentNode = byName.value(parent, nullptr);
                if (!parentNode) {
                    fail(at, QStringLiteral("unknown parent bone \"%1\"").arg(parent));
                }
            }
            figure->addBone(bone, parentNode);
            byName.insert(boneName, bone);
            loadCommon(bone, b, at);
            if (b.contains(QStringLiteral("geometry"))) {
                auto *object = new SgObject(boneName);
                SgPolyShape *shape =
                    loadGeometry(b.value(QStringLiteral("geometry")), boneName, at);
                object->addShape(shape);
                bone->setObject(object);
                applyMaterials(shape, o, where);
                applyMaterials(shape, b, at);
                loadMorphs(bone, b, at);
            }
        }
        const QString follow = optionalString(o, "followTarget", where);
        if (!follow.isEmpty()) {
            m_deferred.push_back([this, figure, follow, where] {
                auto *target = dynamic_cast<SgSkeleton *>(findNode(follow));
                if (!target || target == figure) {
                    fail(where, QStringLiteral("unknown follow target \"%1\"").arg(follow));
                }
                figure->setFollowTarget(target);
            });
        }
        return figure;
    }

    void loadProperties(SgNode *node, const QJsonObject &o, const QString &where) {
        const QJsonValue groups = o.value(QStringLiteral("groups"));
        if (!groups.isUndefined()) {
            if (!groups.isArray()) {
                fail(where, QStringLiteral("\"groups\" must be an array of paths"));
            }
            for (const QJsonValue &g : groups.toArray()) {
                if (!g.isString()) {
                    fail(where, QStringLiteral("\"groups\" must be an array of paths"));
                }
                node->getPropertyGroups()->addGroup(g.toString());
            }
        }
        const QJsonValue props = o.value(QStringLiteral("properties"));
        if (props.isUndefined()) {
            return;
        }
        if (!props.isArray()) {
            fail(where, QStringLiteral("\"properties\" must be an array"));
        }
        const QJsonArray list = props.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            const QString at = where + QStringLiteral(".properties[%1]").arg(i);
            SgProperty *p = makeProperty(objectAt(list.at(i), at), at);
            const int result = node->addProperty(p);
            if (result != SgResult::Ok) {
                const QString pname = p->getName();
                delete p;
                fail(at,
                     QStringLiteral("property \"%1\" cannot be added (%2)").arg(pname).arg(result));
            }
        }
    }

    void setNumeric(SgNumericProperty *p, const QJsonObject &o, const QString &at) {
        p->setMin(float(optionalNumber(o, "min", p->getMin(), at)));
        p->setMax(float(optionalNumber(o, "max", p->getMax(), at)));
        p->setValue(float(optionalNumber(o, "value", p->getRawValue(), at)));
        p->setDefaultValue(float(optionalNumber(o, "default", p->getDefaultValue(), at)));
        p->setIsClamped(optionalBool(o, "clamped", p->isClamped(), at));
        p->setSensitivity(float(optionalNumber(o, "sensitivity", p->getSensitivity(), at)));
        p->setDisplayAsPercent(optionalBool(o, "percent", p->getDisplayAsPercent(), at));
    }

    void deferNode(const QJsonObject &o, const char *key, const QString &at,
                   std::function<bool(SgNode *)> set) {
        const QString name = optionalString(o, key, at);
        if (name.isEmpty()) {
            return;
        }
        m_deferred.push_back([this, name, at, set, key] {
            SgNode *n = findNode(name);
            if (!n || !set(n)) {
                fail(at, QStringLiteral("\"%1\": unknown or unsuitable node \"%2\"")
                             .arg(QLatin1String(key), name));
            }
        });
    }

    SgProperty *makeProperty(const QJsonObject &o, const QString &at) {
        const QString type = requiredString(o, "type", at);
        const QString name = requiredString(o, "name", at);
        std::unique_ptr<SgProperty> p;
        if (type == QLatin1String("float")) {
            auto *f = new SgFloatProperty(name);
            p.reset(f);
            setNumeric(f, o, at);
            loadLinks(f, o, at);
        } else if (type == QLatin1String("int")) {
            auto *n = new SgIntProperty(name);
            p.reset(n);
            setNumeric(n, o, at);
            loadLinks(n, o, at);
        } else if (type == QLatin1String("numericNode")) {
            auto *n = new SgNumericNodeProperty(name);
            p.reset(n);
            setNumeric(n, o, at);
            loadLinks(n, o, at);
            n->setMustHaveNode(optionalBool(o, "mustHaveNode", false, at));
            deferNode(o, "node", at, [n](SgNode *node) {
                n->setNode(node);
                return true;
            });
        } else if (type == QLatin1String("bool")) {
            auto *b = new SgBoolProperty(name);
            p.reset(b);
            b->setBoolValue(optionalBool(o, "value", false, at));
            b->setDefaultValue(optionalBool(o, "default", false, at) ? 1 : 0);
        } else if (type == QLatin1String("color")) {
            auto *c = new SgColorProperty(name);
            p.reset(c);
            if (o.contains(QStringLiteral("value"))) {
                c->setColorValue(colorOf(o.value(QStringLiteral("value")), at, "value"));
            }
            if (o.contains(QStringLiteral("default"))) {
                c->setDefaultValue(
                    colorOf(o.value(QStringLiteral("default")), at, "default").rgb());
            }
        } else if (type == QLatin1String("enum")) {
            auto *e = new SgEnumProperty(name);
            p.reset(e);
            const QJsonValue items = o.value(QStringLiteral("items"));
            if (!items.isUndefined() && !items.isArray()) {
                fail(at, QStringLiteral("\"items\" must be an array of labels"));
            }
            for (const QJsonValue &item : items.toArray()) {
                e->addItem(item.toString());
            }
            e->setValue(int(optionalNumber(o, "value", 0, at)));
            e->setDefaultValue(int(optionalNumber(o, "default", 0, at)));
        } else if (type == QLatin1String("image")) {
            auto *i = new SgImageProperty(name);
            p.reset(i);
            const QString file = optionalString(o, "value", at);
            if (!file.isEmpty()) {
                i->setValue(textureFor(file));
            }
        } else if (type == QLatin1String("node") || type == QLatin1String("skeleton")) {
            SgNodeProperty *n = type == QLatin1String("node") ? new SgNodeProperty(name)
                                                              : new SgSkeletonProperty(name);
            p.reset(n);
            deferNode(o, "value", at, [n](SgNode *node) { return n->setValue(node); });
            deferNode(o, "default", at, [n](SgNode *node) { return n->setDefaultValue(node); });
        } else {
            fail(at, QStringLiteral("unknown property type \"%1\"").arg(type));
        }
        applyCommon(p.get(), o, at);
        return p.release();
    }

    static void applyCommon(SgProperty *p, const QJsonObject &o, const QString &at) {
        const QString label = optionalString(o, "label", at);
        if (!label.isEmpty()) {
            p->setLabel(label);
        }
        p->setPath(optionalString(o, "path", at));
        p->setHidden(optionalBool(o, "hidden", false, at));
        p->lock(optionalBool(o, "locked", false, at));
        p->setCanAnimate(optionalBool(o, "canAnimate", true, at));
        p->setIsUserProperty(optionalBool(o, "user", false, at));
    }

    // ERC links on a numeric property, resolved once every node of the file exists. The link
    // is made only then, so that a failed load leaves no controller behind.
    void loadLinks(SgNumericProperty *channel, const QJsonObject &o, const QString &where) {
        const QJsonValue v = o.value(QStringLiteral("links"));
        if (v.isUndefined()) {
            return;
        }
        if (!v.isArray()) {
            fail(where, QStringLiteral("\"links\" must be an array"));
        }
        const QJsonArray list = v.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            const QString at = where + QStringLiteral(".links[%1]").arg(i);
            const QJsonObject l = objectAt(list.at(i), at);
            const QString nodeName = requiredString(l, "node", at);
            const QString morphName = optionalString(l, "morph", at);
            const QString propertyName = requiredString(l, "property", at);
            const double type = optionalNumber(l, "type", int(SgERCLink::DeltaAdd), at);
            if (type != double(int(type)) || type < int(SgERCLink::DeltaAdd) ||
                type > int(SgERCLink::Add)) {
                fail(at, QStringLiteral("\"type\" must be a link type from 0 to 5"));
            }
            const float scale = float(optionalNumber(l, "scale", 1.0, at));
            const float offset = float(optionalNumber(l, "offset", 0.0, at));
            m_deferred.push_back([=, this] {
                SgNumericProperty *control = findControl(nodeName, morphName, propertyName);
                if (!control) {
                    fail(at, QStringLiteral("unknown control property \"%1\" on \"%2\"")
                                 .arg(propertyName, nodeName));
                }
                m_links.push_back({channel, new SgERCLink(int(type), control, scale, offset)});
            });
        }
    }

    SgNumericProperty *findControl(const QString &nodeName, const QString &morphName,
                                   const QString &propertyName) const {
        SgNode *node = findNode(nodeName);
        SgElement *owner = node;
        if (node && !morphName.isEmpty()) {
            SgObject *object = node->getObject();
            owner = object ? dynamic_cast<SgMorph *>(object->findModifier(morphName)) : nullptr;
        }
        return owner ? dynamic_cast<SgNumericProperty *>(owner->findProperty(propertyName))
                     : nullptr;
    }

    void loadMorphs(SgNode *node, const QJsonObject &o, const QString &where) {
        const QJsonValue v = o.value(QStringLiteral("morphs"));
        if (v.isUndefined()) {
            return;
        }
        if (!v.isArray()) {
            fail(where, QStringLiteral("\"morphs\" must be an array"));
        }
        const QJsonArray list = v.toArray();
        for (qsizetype i = 0; i < list.size(); ++i) {
            const QString at = where + QStringLiteral(".morphs[%1]").arg(i);
            const QJsonObject m = objectAt(list.at(i), at);
            auto *morph = new SgMorph(requiredString(m, "name", at));
            node->getObject()->addModifier(morph);
            const QString label = optionalString(m, "label", at);
            if (!label.isEmpty()) {
                morph->setLabel(label);
            }
            if (m.contains(QStringLiteral("deltas"))) {
                morph->setDeltas(loadDeltas(m, node, at));
            }
            const QJsonValue channel = m.value(QStringLiteral("channel"));
            if (!channel.isUndefined()) {
                const QString channelAt = at + QStringLiteral(".channel");
                const QJsonObject c = objectAt(channel, channelAt);
                setNumeric(morph->getValueChannel(), c, channelAt);
                applyCommon(morph->getValueChannel(), c, channelAt);
                loadLinks(morph->getValueChannel(), c, channelAt);
            }
        }
    }

    // Deltas from a deltas file ("deltas" names it), or as parallel arrays: "vertices"
    // (ascending indices below "vertexCount", which is the vertex count of the node's geometry)
    // and "deltas" (x, y, z per vertex).
    SgMorphDeltas *loadDeltas(const QJsonObject &m, SgNode *node, const QString &at) const {
        const SgVertexMesh *geometry = node->getObject()->getCurrentShape()->getGeometry();
        const int meshCount = geometry ? geometry->getVertexCount() : 0;
        const double count = optionalNumber(m, "vertexCount", meshCount, at);
        if (count != meshCount) {
            fail(at, QStringLiteral("\"vertexCount\" %1 does not match the geometry's %2 vertices")
                         .arg(count)
                         .arg(meshCount));
        }
        const QJsonValue vertices = m.value(QStringLiteral("vertices"));
        const QJsonValue deltas = m.value(QStringLiteral("deltas"));
        if (deltas.isString()) {
            QString error;
            SgMorphDeltas *read = SgMorphDeltaFile::read(
                QDir::cleanPath(resolvePath(deltas.toString())), meshCount, error);
            if (!read) {
                fail(at, error);
            }
            return read;
        }
        if (!vertices.isArray() || !deltas.isArray() ||
            deltas.toArray().size() != 3 * vertices.toArray().size()) {
            fail(at, QStringLiteral("\"vertices\" and \"deltas\" must be arrays of n indices "
                                    "and 3 n numbers"));
        }
        auto result = std::make_unique<SgMorphDeltas>();
        result->setVertCount(meshCount);
        const QJsonArray v = vertices.toArray();
        const QJsonArray d = deltas.toArray();
        result->reserve(int(v.size()));
        int last = -1;
        for (qsizetype i = 0; i < v.size(); ++i) {
            const double index = v.at(i).toDouble(-1);
            if (!v.at(i).isDouble() || index != double(int(index)) || index <= last ||
                index >= meshCount) {
                fail(at, QStringLiteral("\"vertices\"[%1] must be a vertex index above the one "
                                        "before it and below %2")
                             .arg(i)
                             .arg(meshCount));
            }
            last = int(index);
            const QJsonValue x = d.at(3 * i), y = d.at(3 * i + 1), z = d.at(3 * i + 2);
            if (!x.isDouble() || !y.isDouble() || !z.isDouble()) {
                fail(at, QStringLiteral("\"deltas\" must hold numbers only"));
            }
            result->addDelta(
                last, SgVec3(float(x.toDouble()), float(y.toDouble()), float(z.toDouble())), false);
        }
        return result.release();
    }

    QString m_baseDir;
    SgScene *m_scene;
    std::vector<SgNode *> m_created;
    std::vector<std::function<void()>> m_deferred;
    // Links made by the deferred steps, attached to their channels once every step passed.
    std::vector<std::pair<SgNumericProperty *, SgERCLink *>> m_links;
    std::map<QString, std::unique_ptr<SgObjReader>> m_readers;
};

} // namespace

bool SgSceneFile::load(const QString &path, SgScene *scene) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        m_added = 0;
        m_error = QStringLiteral("%1: cannot open the file (%2)").arg(path, file.errorString());
        return false;
    }
    return loadFromData(file.readAll(), QFileInfo(path).absolutePath(), scene, path);
}

bool SgSceneFile::loadFromData(const QByteArray &json, const QString &baseDir, SgScene *scene,
                               const QString &sourceName) {
    m_added = 0;
    m_error.clear();
    if (!scene) {
        m_error = QStringLiteral("%1: no scene to load into").arg(sourceName);
        return false;
    }
    QJsonParseError parseError;
    const QJsonDocument doc = QJsonDocument::fromJson(json, &parseError);
    if (doc.isNull() || !doc.isObject()) {
        m_error = QStringLiteral("%1: not a JSON object (%2 at offset %3)")
                      .arg(sourceName, parseError.errorString())
                      .arg(parseError.offset);
        return false;
    }
    try {
        Loader loader(baseDir, scene);
        m_added = loader.load(doc.object());
    } catch (const LoadError &e) {
        m_error = sourceName + QStringLiteral(": ") + e.text;
        return false;
    }
    return true;
}

bool SgSceneFile::save(const QString &path, const SgScene *scene) {
    SgSceneFileWriter writer;
    m_added = 0;
    m_error.clear();
    if (!writer.save(scene, path)) {
        m_error = writer.getErrorString();
        return false;
    }
    return true;
}
