#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/engine/sgdeltablock.h"

#include "sharedsource/engine/sgmorphloadlog.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/importer/sggeometryimporter.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgfigurejoint.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgfigurewelder.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/script/sgscript.h"

#include <QInputDialog>
#include <QMessageBox>
#include <QtDebug>

#include <algorithm>
#include <cmath>
#include <memory>
#include <vector>

namespace {

// Holds one reference on a mesh for a scope.
class MeshRef {
public:
    MeshRef() = default;
    explicit MeshRef(SgVertexMesh *mesh) : m_mesh(mesh) {
        if (m_mesh)
            m_mesh->ref();
    }
    // Adopts a mesh that already carries the caller's reference.
    static MeshRef adopt(SgVertexMesh *mesh) {
        MeshRef r;
        r.m_mesh = mesh;
        return r;
    }
    MeshRef(MeshRef &&other) noexcept : m_mesh(std::exchange(other.m_mesh, nullptr)) {}
    MeshRef &operator=(MeshRef &&other) noexcept {
        if (this != &other) {
            reset();
            m_mesh = std::exchange(other.m_mesh, nullptr);
        }
        return *this;
    }
    MeshRef(const MeshRef &) = delete;
    MeshRef &operator=(const MeshRef &) = delete;
    ~MeshRef() { reset(); }

    void reset() {
        if (m_mesh)
            m_mesh->unref();
        m_mesh = nullptr;
    }
    SgVertexMesh *get() const { return m_mesh; }
    explicit operator bool() const { return m_mesh != nullptr; }

private:
    SgVertexMesh *m_mesh = nullptr;
};

void hostLog(const QString &text) {
    if (sgApp)
        sgApp->log(text);
}

void statusLine(const QString &text) {
    if (sgApp)
        sgApp->statusLine(text, true);
}

void stepProgress() {
    if (sgApp && sgApp->isProgressActive())
        sgApp->stepProgress(1);
}

// The threshold a delta component must exceed (strictly), as a single float.
constexpr float kDeltaThreshold = 0.001f;
// Vertices per block of the quiet-block scan of computeDeltas.
constexpr size_t kScanBlock = 64;

enum class DeltaOutcome { Made, CountMismatch, NoDeltas, InvalidTarget };

// The deltas of `morph` against `base` with the outcome; see SgMorphLoader::computeDeltas.
std::unique_ptr<SgMorphDeltas> makeDeltas(const SgVertexMesh &base, const SgVertexMesh &morph,
                                          DeltaOutcome &outcome) {
    const int count = base.getVertexCount();
    if (count != morph.getVertexCount()) {
        outcome = DeltaOutcome::CountMismatch;
        return nullptr;
    }
    const SgVec3 *b = base.getVertices();
    const SgVec3 *m = morph.getVertices();
    const float *bf = reinterpret_cast<const float *>(b);
    const float *mf = reinterpret_cast<const float *>(m);
    const size_t n = size_t(count);

    std::unique_ptr<SgMorphDeltas> deltas;
    size_t used = 0;
    bool invalid = false;
    bool lastBlockAllMoved = false;
    int blockVertices[kScanBlock];
    SgVec3 blockDeltas[kScanBlock];
    for (size_t start = 0; start < n; start += kScanBlock) {
        const size_t end = std::min(start + kScanBlock, n);
        // After a block whose every vertex moved the next one most likely moves too: the scan
        // would only read it twice.
        if (end - start == kScanBlock && !lastBlockAllMoved) {
            // Most vertices of a morph target do not move: a branch-free pass over a full
            // block tells whether any component moved (or is not a number) at all.
            int moved = 0;
            const float *bb = bf + start * 3;
            const float *mb = mf + start * 3;
            for (size_t k = 0; k < kScanBlock * 3; ++k)
                moved |= !(std::fabs(mb[k] - bb[k]) <= kDeltaThreshold);
            if (!moved)
                continue;
        }
        if (!deltas) {
            // Room for every vertex from here on (reserved, not yet written); each block with
            // motion is made in the cache and then appended.
            deltas = std::make_unique<SgMorphDeltas>();
            deltas->setVertCount(count);
            deltas->reserve(int(n - start));
        }
        const size_t kept =
            sgWriteDeltaBlock(mf + start * 3, bf + start * 3, start, end - start, blockVertices,
                              reinterpret_cast<float *>(blockDeltas), kDeltaThreshold, invalid);
        deltas->vertexArray().insert(deltas->vertexArray().end(), blockVertices,
                                     blockVertices + kept);
        deltas->deltaArray().insert(deltas->deltaArray().end(), blockDeltas, blockDeltas + kept);
        used += kept;
        lastBlockAllMoved = kept == end - start;
    }
    if (invalid) {
        outcome = DeltaOutcome::InvalidTarget;
        return nullptr;
    }
    if (!deltas || used == 0) {
        outcome = DeltaOutcome::NoDeltas;
        return nullptr;
    }
    std::vector<int> &vertices = deltas->vertexArray();
    std::vector<SgVec3> &values = deltas->deltaArray();
    if (used < vertices.capacity() / 2) {
        vertices.shrink_to_fit();
        values.shrink_to_fit();
    }
    outcome = DeltaOutcome::Made;
    return deltas;
}

QString mismatchMessage() {
    return QStringLiteral("Vertex Count mismatch - delta calculation failed.");
}

QString invalidTargetMessage() {
    return QStringLiteral("Morph target has invalid coordinates - delta calculation failed.");
}

} // namespace

// The face groups of the geometry of the current node-list run, gathered once: the vertices
// of every group in ascending order. Matching a hundred bones thus costs one pass over the
// facets instead of one per bone.
struct SgMorphLoader::GroupIndex {
    const SgPolyMesh *mesh = nullptr;
    std::vector<std::vector<int32_t>> groups;
};

SgMorphLoader::SgMorphLoader() : QObject(nullptr) {
    // The change signals carry these pointers; registering them lets queued connections and
    // signal spies take them.
    qRegisterMetaType<SgNode *>();
    qRegisterMetaType<SgNumericProperty *>();
}

SgMorphLoader::~SgMorphLoader() {
    discardControlProperty();
    delete m_groupIndex;
}

QString SgMorphLoader::label() const {
    return m_customLabel.isEmpty() ? m_morphName : m_customLabel;
}

// Stores `value` in `member` and emits `signal` only when it changed.
template <typename T, typename Signal>
static void storeAndNotify(SgMorphLoader *loader, T &member, const T &value, Signal signal) {
    if (member == value)
        return;
    member = value;
    emit(loader->*signal)(value);
}

void SgMorphLoader::setCreateControl(bool on) {
    storeAndNotify(this, m_createControl, on, &SgMorphLoader::createControlChanged);
}

void SgMorphLoader::setUseCustomValue(bool on) {
    storeAndNotify(this, m_useCustomValue, on, &SgMorphLoader::useCustomValueChanged);
}

void SgMorphLoader::setUseCustomLabel(bool on) {
    storeAndNotify(this, m_useCustomLabel, on, &SgMorphLoader::useCustomLabelChanged);
}

void SgMorphLoader::setApplyAfterJoint(bool on) {
    storeAndNotify(this, m_applyAfterJoint, on, &SgMorphLoader::applyAfterJointChanged);
}

void SgMorphLoader::setHideSecondary(bool on) {
    storeAndNotify(this, m_hideSecondary, on, &SgMorphLoader::hideSecondaryChanged);
}

void SgMorphLoader::setReverseModifiers(bool on) {
    storeAndNotify(this, m_reverseModifiers, on, &SgMorphLoader::reverseModifiersChanged);
}

void SgMorphLoader::setCustomValue(float value) {
    storeAndNotify(this, m_customValue, value, &SgMorphLoader::customValueChanged);
}

void SgMorphLoader::setFilename(const QString &fileName) {
    storeAndNotify(this, m_filename, fileName, &SgMorphLoader::filenameChanged);
}

void SgMorphLoader::setMorphGroup(const QString &group) {
    storeAndNotify(this, m_morphGroup, group, &SgMorphLoader::morphGroupChanged);
}

void SgMorphLoader::setCustomLabel(const QString &label) {
    storeAndNotify(this, m_customLabel, label, &SgMorphLoader::customLabelChanged);
}

void SgMorphLoader::setMorphName(const QString &name) {
    storeAndNotify(this, m_morphName, name, &SgMorphLoader::morphNameChanged);
}

void SgMorphLoader::setControlNode(SgNode *node) {
    storeAndNotify(this, m_controlNode, node, &SgMorphLoader::controlNodeChanged);
}

void SgMorphLoader::setControlProperty(SgNumericProperty *property) {
    if (property == m_controlProperty)
        return;
    discardControlProperty();
    m_controlProperty = property;
    emit controlPropertyChanged(property);
}

void SgMorphLoader::setOverride(short mode) {
    const short stored = (mode < 0 || mode > 2) ? short(0) : mode;
    storeAndNotify(this, m_override, stored, &SgMorphLoader::overrideChanged);
}

// ---------------------------------------------------------------------------------------------
// Control property ownership

bool SgMorphLoader::isPlaced(SgNumericProperty *property) const {
    if (!property || !property->getOwner())
        return false;
    if (auto *morph = dynamic_cast<SgMorph *>(property->getOwner()))
        return morph->getElementParent() != nullptr;
    return true;
}

void SgMorphLoader::discardControlProperty() {
    SgNumericProperty *property = std::exchange(m_controlProperty, nullptr);
    if (!property)
        return;
    SgElement *owner = property->getOwner();
    if (!owner) {
        delete property;
        return;
    }
    auto *morph = dynamic_cast<SgMorph *>(owner);
    if (morph && !morph->getElementParent())
        delete morph;
}

// ---------------------------------------------------------------------------------------------
// Pose step

bool SgMorphLoader::applyPose() {
    if (!m_reverseModifiers || m_poseFile.isEmpty() || m_poseFile == QLatin1String("None"))
        return true;
    SgScript script;
    if (script.loadFromFile(m_poseFile, true)) {
        script.execute();
        return true;
    }
    const QString text = tr("Failed to load the pose file: \n") + m_poseFile + "\n" +
                         tr("For the morph: ") + m_morphName + "\n\n" +
                         tr("Do you wish to continue loading this morph?");
    const auto answer = QMessageBox::question(nullptr, tr("Pose File Error"), text,
                                              QMessageBox::Ok | QMessageBox::No, QMessageBox::Ok);
    return answer == QMessageBox::Ok;
}

// ---------------------------------------------------------------------------------------------
// Entry points

void SgMorphLoader::loadMorphForNode(const SgFileIOSettings &importOptions, SgNode *node,
                                     SgMorphLoadLog &log) {
    log.addMessage(QStringLiteral("Loading morph %1...").arg(m_morphName));
    MeshRef geometry = MeshRef::adopt(loadGeometry(importOptions));
    if (!geometry) {
        log.addError(QStringLiteral("Could not load geometry from file."));
        return;
    }
    createMorphForNode(geometry.get(), node, log);
}

void SgMorphLoader::loadMorphForNodes(const SgFileIOSettings &importOptions,
                                      const QList<SgNode *> &nodes, SgMorphLoadLog &log) {
    log.addMessage(QStringLiteral("Loading morph %1...").arg(m_morphName));
    MeshRef geometry = MeshRef::adopt(loadGeometry(importOptions));
    if (!geometry) {
        log.addError(QStringLiteral("Could not load geometry from file."));
        return;
    }
    createMorphForNodes(geometry.get(), nodes, log);
}

bool SgMorphLoader::resolveNameClash(const QList<SgNode *> &nodes, SgMorphLoadLog &log) {
    if (m_override != MakeUnique)
        return true;
    const auto clashes = [this](SgNode *node) {
        SgObject *object = node ? node->getObject() : nullptr;
        return object && dynamic_cast<SgMorph *>(object->findModifier(m_morphName)) != nullptr;
    };
    while (std::any_of(nodes.begin(), nodes.end(), clashes)) {
        if (!askNewName()) {
            log.addWarning(QStringLiteral("User cancelled."));
            return false;
        }
    }
    return true;
}

bool SgMorphLoader::askNewName() {
    bool ok = false;
    const QString name = QInputDialog::getText(
        sgApp ? sgApp->getDialogParent() : nullptr, tr("Morph Already Exists"),
        tr("A morph named \"%1\" already exists. Please enter a new name for the morph:")
            .arg(m_morphName),
        QLineEdit::Normal, QString(), &ok);
    if (!ok)
        return false;
    setMorphName(name);
    return true;
}

void SgMorphLoader::createMorphForNode(SgVertexMesh *geometry, SgNode *node, SgMorphLoadLog &log) {
    if (!resolveNameClash({node}, log))
        return;
    prepareControlProperty();
    SgNumericProperty *channel = nullptr;
    if (createMorph(node, geometry, false, channel)) {
        log.addMessage(QStringLiteral("Created morph successfully."));
        if (m_createControl && channel)
            setupMorph(channel);
    } else {
        log.addWarning(QStringLiteral("Geometry did not match, failed to create morph."));
    }
    stepProgress();
}

void SgMorphLoader::createMorphForNodes(SgVertexMesh *geometry, const QList<SgNode *> &nodes,
                                        SgMorphLoadLog &log) {
    if (!resolveNameClash(nodes, log))
        return;

    MeshRef target(geometry);
    const SgBoneList bones =
        m_scenaraExported && geometry ? SgFigureWelder::getOrderedBones(nodes) : SgBoneList();
    // Without bones among the targets (a prop) the host exported the node's own geometry, not a
    // welded figure: there is nothing to un-weld and the geometry is used as it is.
    if (!bones.isEmpty()) {
        SgFigureWelder welder(bones, m_ignoredInvisibleNodes, m_weldedGeometry,
                              m_removedUnusedVertices, m_fourthWeldFlag, 0);
        SgVertexMesh *unwelded = welder.unWeld(geometry);
        const bool usable = unwelded && (unwelded->getKind() == SgVertexMesh::VertexMeshKind ||
                                         unwelded->getKind() == SgVertexMesh::PolyMeshKind);
        if (unwelded && !usable)
            delete unwelded;
        target = MeshRef(usable ? unwelded : nullptr);
    }

    prepareControlProperty();
    std::vector<SgNumericProperty *> channels;
    for (SgNode *node : nodes) {
        SgNumericProperty *channel = nullptr;
        if (createMorph(node, target.get(), true, channel))
            channels.push_back(channel);
        stepProgress();
    }
    delete std::exchange(m_groupIndex, nullptr);

    if (channels.empty()) {
        log.addWarning(QStringLiteral("Geometry did not match, no morphs created."));
        return;
    }
    log.addMessage(QStringLiteral("Created morph successfully."));
    if (m_createControl) {
        for (SgNumericProperty *channel : channels)
            setupMorph(channel);
    }
}

// ---------------------------------------------------------------------------------------------
// Steps

SgMorphDeltas *SgMorphLoader::computeDeltas(const SgVertexMesh &base, const SgVertexMesh &morph) {
    DeltaOutcome outcome = DeltaOutcome::NoDeltas;
    std::unique_ptr<SgMorphDeltas> deltas = makeDeltas(base, morph, outcome);
    if (outcome == DeltaOutcome::CountMismatch)
        statusLine(mismatchMessage());
    else if (outcome == DeltaOutcome::InvalidTarget)
        statusLine(invalidTargetMessage());
    return deltas.release();
}

SgVertexMesh *SgMorphLoader::loadGeometry(const SgFileIOSettings &importOptions) {
    SgImportMgr *manager = sgApp ? sgApp->getImportMgr() : nullptr;
    SgImporter *importer = manager ? manager->findImporter(m_filename) : nullptr;
    if (!importer) {
        statusLine(QStringLiteral("Failed to find an importer for %1.").arg(m_filename));
        return nullptr;
    }
    auto *geometryImporter = dynamic_cast<SgGeometryImporter *>(importer);
    if (!geometryImporter) {
        statusLine(
            QStringLiteral("The importer for %1 is not a geometry importer.").arg(m_filename));
        return nullptr;
    }
    SgFileIOSettings options;
    if (!geometryImporter->getDefaultOptions(options, 0))
        return nullptr;
    options.fromString(importOptions.toString());

    statusLine(QStringLiteral("Loading Morph: %1").arg(SgFileIO::getShortFileName(m_filename)));
    SgShape *shape = nullptr;
    if (geometryImporter->importGeometry(m_filename, shape, options) != 0) {
        delete shape;
        statusLine(QStringLiteral("Failed to load morph source file: %1").arg(m_filename));
        return nullptr;
    }
    SgVertexMesh *mesh = shape ? shape->getGeometry() : nullptr;
    if (!mesh) {
        delete shape;
        statusLine(
            QStringLiteral("Invalid geometry loaded from morph source file: %1").arg(m_filename));
        return nullptr;
    }
    mesh->ref();
    delete shape;
    return mesh;
}

SgVertexMesh *SgMorphLoader::groupGeometry(SgNode *node, SgVertexMesh *geometry) {
    auto *mesh = dynamic_cast<SgPolyMesh *>(geometry);
    const bool bone = dynamic_cast<SgBone *>(node) != nullptr;
    const bool figure = !bone && dynamic_cast<SgSkeleton *>(node) != nullptr;
    if (!geometry || !mesh || (!bone && !figure)) {
        if (geometry)
            geometry->ref();
        return geometry;
    }
    int group = -1;
    if (bone) {
        group = mesh->findFaceGroup(node->getName());
        if (group < 0)
            group = mesh->findFaceGroup(node->getLabel());
    } else {
        group = mesh->findFaceGroup(QStringLiteral("BODY"));
    }
    if (group < 0)
        return nullptr;

    if (!m_groupIndex || m_groupIndex->mesh != mesh) {
        delete m_groupIndex;
        m_groupIndex = new GroupIndex{mesh, mesh->getAllFaceGroupVertices()};
    }
    if (size_t(group) >= m_groupIndex->groups.size())
        return nullptr;
    const std::vector<int32_t> &vertices = m_groupIndex->groups[size_t(group)];
    auto *result = new SgPolyMesh;
    SgVec3 *out = result->setVertexArray(int(vertices.size()));
    const SgVec3 *in = mesh->getVertices();
    for (size_t i = 0; i < vertices.size(); ++i)
        out[i] = in[vertices[i]];
    result->ref();
    return result;
}

void SgMorphLoader::cleanUpOrphan(SgNode *node, SgObject *object) {
    if (m_override == MakeUnique || !m_cleanUpOrphans || !object)
        return;
    if (node == m_controlNode && (m_createControl || m_override != DeltasAndLinks))
        return;
    auto *morph = dynamic_cast<SgMorph *>(object->findModifier(m_morphName));
    if (!morph || morph->getValueChannel()->getLinkProperty())
        return;
    // The loader's own control property must not be deleted under it.
    if (morph->getValueChannel() == m_controlProperty)
        return;
    object->removeModifier(morph);
}

bool SgMorphLoader::createMorph(SgNode *node, SgVertexMesh *geometry, bool matchGroups,
                                SgNumericProperty *&channel) {
    channel = nullptr;
    if (!node)
        return false;
    hostLog(QStringLiteral("Creating morph for %1...").arg(node->getLabel()));

    MeshRef morphMesh =
        matchGroups ? MeshRef::adopt(groupGeometry(node, geometry)) : MeshRef(geometry);
    SgObject *object = node->getObject();
    if (!object) {
        hostLog(QStringLiteral("No object found, skipping node."));
        return false;
    }
    if (!morphMesh) {
        cleanUpOrphan(node, object);
        hostLog(QStringLiteral("No morph geometry found, skipping node."));
        return false;
    }
    SgShape *shape = object->getCurrentShape();
    SgVertexMesh *base = shape ? shape->getGeometry() : nullptr;
    if (!base)
        return false;
    SgVertexMesh *reference = m_reverseModifiers ? object->getCachedGeom() : base;
    if (!reference)
        return false;
    if (reference->getVertexCount() != morphMesh.get()->getVertexCount()) {
        statusLine(QStringLiteral("Vertex Count mismatch %1:%2 (Base:Morph).")
                       .arg(reference->getVertexCount())
                       .arg(morphMesh.get()->getVertexCount()));
        return false;
    }

    const auto noDeltas = [&]() {
        cleanUpOrphan(node, object);
        hostLog(QStringLiteral("No deltas for morph, skipping node."));
        return false;
    };
    const auto invalidTarget = [&]() {
        statusLine(invalidTargetMessage());
        hostLog(QStringLiteral("Morph target has invalid coordinates, skipping node."));
        return false;
    };

    DeltaOutcome outcome = DeltaOutcome::NoDeltas;
    std::unique_ptr<SgMorphDeltas> deltas = makeDeltas(*reference, *morphMesh.get(), outcome);
    if (outcome == DeltaOutcome::InvalidTarget)
        return invalidTarget();
    if (!deltas)
        return noDeltas();

    if (m_reverseModifiers) {
        if (m_applyAfterJoint) {
            deltas->rotate(node->getLocalRot().inverse());
        } else {
            std::unique_ptr<SgVertexMesh> reversed(morphMesh.get()->clone());
            reversed->transform(node->getWSTransform().inverse());
            const auto &modifiers = object->getModifiers();
            for (auto it = modifiers.rbegin(); it != modifiers.rend(); ++it)
                (*it)->applyInverse(reversed.get(), node);
            reversed->translate(node->getOrigin());
            std::unique_ptr<SgMorphDeltas> restDeltas = makeDeltas(*base, *reversed, outcome);
            if (outcome == DeltaOutcome::InvalidTarget)
                return invalidTarget();
            if (!restDeltas)
                return noDeltas();
            restDeltas->filter([&](int vertex) { return deltas->hasVertex(vertex); });
            if (restDeltas->getNumEntries() < 1)
                return noDeltas();
            deltas = std::move(restDeltas);
        }
    }
    hostLog(QStringLiteral("Morph contains %1 deltas").arg(deltas->getNumEntries()));

    auto *existing = dynamic_cast<SgMorph *>(object->findModifier(m_morphName));
    SgMorph *morph = nullptr;
    bool isNew = false;
    if (existing && m_override == DeltasAndLinks) {
        existing->getValueChannel()->removeAllControllers();
        existing->setDeltas(deltas.release());
        morph = existing;
    } else if (existing && m_override == DeltasOnly) {
        existing->setDeltas(deltas.release());
        morph = existing;
    } else {
        morph = new SgMorph(m_morphName, deltas.release());
        SgFloatProperty *value = morph->getValueChannel();
        value->setPath(m_morphGroup);
        value->setMin(-1.0f);
        value->setMax(1.0f);
        value->setIsClamped(true);
        isNew = true;
    }

    if (isNew) {
        int index = -1;
        if (auto *bone = dynamic_cast<SgBone *>(node)) {
            const int joint = SgFigureJoint::findJoint(bone);
            if (joint >= 0)
                index = joint + (m_applyAfterJoint ? 1 : 0);
        }
        if (object->addModifier(morph, index) != 0) {
            delete morph;
            return false;
        }
    }
    channel = morph->getValueChannel();
    if (m_createControl && !m_controlProperty && node == m_controlNode)
        setControlProperty(channel);
    return true;
}

// ---------------------------------------------------------------------------------------------
// Control property and links

void SgMorphLoader::prepareControlProperty() {
    SgNumericProperty *property = m_controlProperty;
    if (!property || isPlaced(property))
        return;
    if (auto *morph = dynamic_cast<SgMorph *>(property->getOwner())) {
        if (!m_controlNode) {
            qWarning("No control node in SgMorphLoader::prepareControlProperty()!");
            discardControlProperty();
            return;
        }
        SgObject *object = m_controlNode->getObject();
        if (!object) {
            object = new SgObject;
            m_controlNode->setObject(object);
        }
        if (object->addModifier(morph, -1) != 0) {
            qDebug("Could not add the control morph to the node in "
                   "SgMorphLoader::prepareControlProperty()!");
            discardControlProperty();
        }
        return;
    }
    if (!m_controlNode) {
        qWarning("No control node in SgMorphLoader::prepareControlProperty()!");
        discardControlProperty();
        return;
    }
    const int result = m_controlNode->addProperty(property);
    if (result == SgResult::Ok)
        return;
    if (result == SgResult::NameExists) {
        auto *namesake =
            dynamic_cast<SgNumericProperty *>(m_controlNode->findProperty(property->getName()));
        discardControlProperty();
        setControlProperty(namesake);
        return;
    }
    qDebug("Could not add the control property to the node in "
           "SgMorphLoader::prepareControlProperty()!");
    discardControlProperty();
}

void SgMorphLoader::setupMorph(SgNumericProperty *channel) {
    if (!channel || channel == m_controlProperty)
        return;
    if (!m_controlProperty) {
        if (!m_controlNode) {
            qWarning("No control node in SgMorphLoader::setupMorph() - control link could not "
                     "be created.");
            return;
        }
        auto *property = new SgFloatProperty(m_morphName);
        property->setLabel(m_morphName);
        property->setPath(m_morphGroup);
        property->setDisplayAsPercent(true);
        property->setMin(-1.0f);
        property->setMax(1.0f);
        property->setIsUserProperty(true);
        const int result = m_controlNode->addProperty(property);
        if (result == SgResult::Ok) {
            setControlProperty(property);
        } else if (result == SgResult::NameExists) {
            delete property;
            auto *namesake =
                dynamic_cast<SgFloatProperty *>(m_controlNode->findProperty(m_morphName));
            if (!namesake)
                return;
            setControlProperty(namesake);
        } else {
            delete property;
            qWarning("Error adding control property to node - control link could not be "
                     "created.");
            return;
        }
    }

    const float scale = m_useCustomValue ? m_customValue : 1.0f;
    bool linked = false;
    if (m_override == DeltasOnly) {
        for (SgController *controller : channel->getControllers()) {
            auto *link = dynamic_cast<SgERCLink *>(controller);
            if (link && link->getProperty() == m_controlProperty) {
                linked = true;
                break;
            }
        }
    }
    if (!linked)
        channel->insertController(new SgERCLink(m_ercType, m_controlProperty, scale, 0.0f), -1);
    if (m_hideSecondary)
        channel->setHidden(true);
    if (m_useCustomLabel)
        channel->setLabel(label());
}
