#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/engine/sgdeltablock.h"
#include "sharedsource/engine/sgfacegroupcache.h"
#include "sharedsource/engine/sgmorphloaderquestions.h"

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

enum class DeltaOutcome { Made, CountMismatch, NoDeltas, InvalidTarget, InvalidBase };

bool allFinite(const SgVertexMesh &mesh) {
    const float *f = reinterpret_cast<const float *>(mesh.getVertices());
    return std::all_of(f, f + size_t(mesh.getVertexCount()) * 3,
                       [](float x) { return std::isfinite(x); });
}

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
        // Rare, so the side at fault is looked up only now: a broken node mesh is not the
        // target's fault.
        outcome = allFinite(base) ? DeltaOutcome::InvalidTarget : DeltaOutcome::InvalidBase;
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

QString invalidBaseMessage() {
    return QStringLiteral("Base geometry has invalid coordinates - delta calculation failed.");
}

} // namespace

struct SgMorphLoader::NodePlan {
    SgNode *node = nullptr;
    SgObject *object = nullptr;
    std::unique_ptr<SgMorphDeltas> deltas;
    QString failure; // for PlanResult::Failed: what the run's log says
};

SgMorphLoader::SgMorphLoader() : QObject(nullptr) {
    // The change signals carry these pointers; registering them lets queued connections and
    // signal spies take them.
    qRegisterMetaType<SgNode *>();
    qRegisterMetaType<SgNumericProperty *>();
}

SgMorphLoader::~SgMorphLoader() {
    discardControlProperty();
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
// Questions

SgMorphLoaderQuestions &SgMorphLoader::questions() const {
    return m_questions ? *m_questions : SgMorphLoaderQuestions::dialogs();
}

bool SgMorphLoader::applyPose() {
    if (!m_reverseModifiers || m_poseFile.isEmpty() || m_poseFile == QLatin1String("None"))
        return true;
    SgScript script;
    if (script.loadFromFile(m_poseFile, true)) {
        script.execute();
        return true;
    }
    return questions().continueWithoutPose(m_poseFile, m_morphName);
}

bool SgMorphLoader::resolveNameClash(const QList<SgNode *> &nodes, SgMorphLoadLog &log) {
    if (m_override != MakeUnique)
        return true;
    const auto clashes = [this](SgNode *node) {
        SgObject *object = node ? node->getObject() : nullptr;
        return object && dynamic_cast<SgMorph *>(object->findModifier(m_morphName)) != nullptr;
    };
    // A blank answer names no morph: it is asked again like a name that is taken.
    bool asked = false;
    while ((asked && m_morphName.trimmed().isEmpty()) ||
           std::any_of(nodes.begin(), nodes.end(), clashes)) {
        if (!askNewName()) {
            log.addWarning(QStringLiteral("User cancelled."));
            return false;
        }
        asked = true;
    }
    return true;
}

bool SgMorphLoader::askNewName() {
    QString name;
    if (!questions().askNewMorphName(m_morphName, name))
        return false;
    setMorphName(name);
    return true;
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

void SgMorphLoader::createMorphForNode(SgVertexMesh *geometry, SgNode *node, SgMorphLoadLog &log) {
    m_linkFailureLogged = false;
    if (!resolveNameClash({node}, log))
        return;
    NodePlan plan;
    const PlanResult result = planMorph(node, geometry, nullptr, plan);
    if (result == PlanResult::Planned) {
        prepareControlProperty();
        SgNumericProperty *channel = applyMorph(plan);
        log.addMessage(QStringLiteral("Created morph successfully."));
        if (m_createControl && channel)
            setupMorph(channel, &log);
    } else if (result == PlanResult::Failed && !plan.failure.isEmpty()) {
        log.addError(plan.failure + QStringLiteral(" No morph created."));
    } else {
        log.addWarning(QStringLiteral("Geometry did not match, failed to create morph."));
    }
    stepProgress();
}

void SgMorphLoader::createMorphForNodes(SgVertexMesh *geometry, const QList<SgNode *> &nodes,
                                        SgMorphLoadLog &log) {
    m_linkFailureLogged = false;
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

    // Every node's deltas first: one failed target leaves the scene as it was.
    SgFaceGroupCache groups;
    std::vector<NodePlan> plans;
    QList<SgNode *> skipped;
    for (qsizetype i = 0; i < nodes.size(); ++i) {
        NodePlan plan;
        const PlanResult result = planMorph(nodes[i], target.get(), &groups, plan);
        stepProgress();
        if (result == PlanResult::Failed) {
            for (qsizetype rest = i + 1; rest < nodes.size(); ++rest)
                stepProgress();
            log.addError(plan.failure + QStringLiteral(" No morphs created."));
            return;
        }
        if (result == PlanResult::Planned)
            plans.push_back(std::move(plan));
        else if (nodes[i])
            skipped.append(nodes[i]);
    }
    if (plans.empty()) {
        log.addWarning(QStringLiteral("Geometry did not match, no morphs created."));
        return;
    }

    prepareControlProperty();
    std::vector<SgNumericProperty *> channels;
    for (NodePlan &plan : plans) {
        if (SgNumericProperty *channel = applyMorph(plan))
            channels.push_back(channel);
    }
    log.addMessage(QStringLiteral("Created morph successfully."));
    cleanUpOrphans(skipped, log);
    if (m_createControl) {
        for (SgNumericProperty *channel : channels)
            setupMorph(channel, &log);
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
    else if (outcome == DeltaOutcome::InvalidBase)
        statusLine(invalidBaseMessage());
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

SgVertexMesh *SgMorphLoader::groupGeometry(SgNode *node, SgVertexMesh *geometry,
                                           SgFaceGroupCache *groups) {
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

    SgFaceGroupCache ownGroups;
    const std::vector<int32_t> *vertices =
        (groups ? groups : &ownGroups)->groupVertices(mesh, group);
    if (!vertices)
        return nullptr;
    auto *result = new SgPolyMesh;
    SgVec3 *out = result->setVertexArray(int(vertices->size()));
    const SgVec3 *in = mesh->getVertices();
    for (size_t i = 0; i < vertices->size(); ++i)
        out[i] = in[(*vertices)[i]];
    result->ref();
    return result;
}

bool SgMorphLoader::cleanUpOrphan(SgNode *node, SgObject *object) {
    if (m_override == MakeUnique || !m_cleanUpOrphans || !object)
        return false;
    if (node == m_controlNode && (m_createControl || m_override != DeltasAndLinks))
        return false;
    auto *morph = dynamic_cast<SgMorph *>(object->findModifier(m_morphName));
    if (!morph || morph->getValueChannel()->getLinkProperty())
        return false;
    // The loader's own control property must not be deleted under it.
    if (morph->getValueChannel() == m_controlProperty)
        return false;
    return object->removeModifier(morph) == SgResult::Ok;
}

void SgMorphLoader::cleanUpOrphans(const QList<SgNode *> &nodes, SgMorphLoadLog &log) {
    for (SgNode *node : nodes) {
        if (!cleanUpOrphan(node, node->getObject()))
            continue;
        const QString text =
            QStringLiteral("Removed orphaned morph %1 from %2.").arg(m_morphName, node->getLabel());
        hostLog(text);
        log.addMessage(text);
    }
}

SgMorphLoader::PlanResult SgMorphLoader::planMorph(SgNode *node, SgVertexMesh *geometry,
                                                   SgFaceGroupCache *groups, NodePlan &plan) {
    if (!node)
        return PlanResult::Skipped;
    plan.node = node;
    hostLog(QStringLiteral("Creating morph for %1...").arg(node->getLabel()));

    MeshRef morphMesh =
        groups ? MeshRef::adopt(groupGeometry(node, geometry, groups)) : MeshRef(geometry);
    plan.object = node->getObject();
    if (!plan.object) {
        hostLog(QStringLiteral("No object found, skipping node."));
        return PlanResult::Skipped;
    }
    if (!morphMesh) {
        hostLog(QStringLiteral("No morph geometry found, skipping node."));
        return PlanResult::Skipped;
    }
    SgShape *shape = plan.object->getCurrentShape();
    SgVertexMesh *base = shape ? shape->getGeometry() : nullptr;
    SgVertexMesh *reference = m_reverseModifiers ? plan.object->getCachedGeom() : base;
    if (!base || !reference) {
        hostLog(QStringLiteral("No geometry found on the node, skipping node."));
        return PlanResult::Skipped;
    }
    if (reference->getVertexCount() != morphMesh.get()->getVertexCount()) {
        statusLine(QStringLiteral("Vertex Count mismatch %1:%2 (Base:Morph).")
                       .arg(reference->getVertexCount())
                       .arg(morphMesh.get()->getVertexCount()));
        plan.failure = QStringLiteral("The vertex count of %1 does not match the target "
                                      "(%2:%3, Base:Morph).")
                           .arg(node->getLabel())
                           .arg(reference->getVertexCount())
                           .arg(morphMesh.get()->getVertexCount());
        return PlanResult::Failed;
    }

    const auto noDeltas = [&]() {
        hostLog(QStringLiteral("No deltas for morph, skipping node."));
        return PlanResult::Skipped;
    };
    const auto invalid = [&](DeltaOutcome outcome) {
        const bool ownGeometry = outcome == DeltaOutcome::InvalidBase;
        statusLine(ownGeometry ? invalidBaseMessage() : invalidTargetMessage());
        plan.failure = ownGeometry
                           ? QStringLiteral("The geometry of %1 has coordinates that are not "
                                            "finite numbers.")
                                 .arg(node->getLabel())
                           : QStringLiteral("The target for %1 has coordinates that are not "
                                            "finite numbers.")
                                 .arg(node->getLabel());
        hostLog(plan.failure);
        return PlanResult::Failed;
    };

    DeltaOutcome outcome = DeltaOutcome::NoDeltas;
    std::unique_ptr<SgMorphDeltas> deltas = makeDeltas(*reference, *morphMesh.get(), outcome);
    if (outcome == DeltaOutcome::InvalidTarget || outcome == DeltaOutcome::InvalidBase)
        return invalid(outcome);
    if (!deltas)
        return noDeltas();

    if (m_reverseModifiers) {
        if (m_applyAfterJoint) {
            deltas->rotate(node->getLocalRot().inverse());
        } else {
            std::unique_ptr<SgVertexMesh> reversed(morphMesh.get()->clone());
            reversed->transform(node->getWSTransform().inverse());
            const auto &modifiers = plan.object->getModifiers();
            for (auto it = modifiers.rbegin(); it != modifiers.rend(); ++it)
                (*it)->applyInverse(reversed.get(), node);
            reversed->translate(node->getOrigin());
            std::unique_ptr<SgMorphDeltas> restDeltas = makeDeltas(*base, *reversed, outcome);
            if (outcome == DeltaOutcome::InvalidTarget || outcome == DeltaOutcome::InvalidBase)
                return invalid(outcome);
            if (!restDeltas)
                return noDeltas();
            restDeltas->filter([&](int vertex) { return deltas->hasVertex(vertex); });
            if (restDeltas->getNumEntries() < 1)
                return noDeltas();
            deltas = std::move(restDeltas);
        }
    }
    hostLog(QStringLiteral("Morph contains %1 deltas").arg(deltas->getNumEntries()));
    plan.deltas = std::move(deltas);
    return PlanResult::Planned;
}

SgNumericProperty *SgMorphLoader::applyMorph(NodePlan &plan) {
    SgObject *object = plan.object;
    auto *existing = dynamic_cast<SgMorph *>(object->findModifier(m_morphName));
    SgMorph *morph = nullptr;
    if (existing && m_override == DeltasAndLinks) {
        existing->getValueChannel()->removeAllControllers();
        existing->setDeltas(plan.deltas.release());
        morph = existing;
    } else if (existing && m_override == DeltasOnly) {
        existing->setDeltas(plan.deltas.release());
        morph = existing;
    } else {
        morph = new SgMorph(m_morphName, plan.deltas.release());
        SgFloatProperty *value = morph->getValueChannel();
        value->setPath(m_morphGroup);
        value->setMin(-1.0f);
        value->setMax(1.0f);
        value->setIsClamped(true);
        int index = -1;
        if (auto *bone = dynamic_cast<SgBone *>(plan.node)) {
            const int joint = SgFigureJoint::findJoint(bone);
            if (joint >= 0)
                index = joint + (m_applyAfterJoint ? 1 : 0);
        }
        // A new morph has no parent and is in no stack: adding it cannot be refused.
        if (object->addModifier(morph, index) != 0) {
            delete morph;
            return nullptr;
        }
    }
    SgNumericProperty *channel = morph->getValueChannel();
    if (m_createControl && !m_controlProperty && plan.node == m_controlNode)
        setControlProperty(channel);
    return channel;
}

bool SgMorphLoader::createMorph(SgNode *node, SgVertexMesh *geometry, bool matchGroups,
                                SgNumericProperty *&channel) {
    SgFaceGroupCache groups;
    NodePlan plan;
    channel = nullptr;
    if (planMorph(node, geometry, matchGroups ? &groups : nullptr, plan) != PlanResult::Planned)
        return false;
    channel = applyMorph(plan);
    return channel != nullptr;
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

void SgMorphLoader::linkFailed(const char *warning, const QString &logText, SgMorphLoadLog *log) {
    qWarning("%s", warning);
    if (log && !m_linkFailureLogged) {
        log->addWarning(logText);
        m_linkFailureLogged = true;
    }
}

void SgMorphLoader::setupMorph(SgNumericProperty *channel, SgMorphLoadLog *log) {
    if (!channel || channel == m_controlProperty)
        return;
    if (!m_controlProperty) {
        if (!m_controlNode) {
            // The settings show "- none -" for the node: unlinked morphs are what was asked for.
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
            if (!namesake) {
                linkFailed("The control node's property of the morph's name is not a float "
                           "property - control link could not be created.",
                           QStringLiteral("The property %1 on %2 is not a float property: the "
                                          "morph is not linked to a control property.")
                               .arg(m_morphName, m_controlNode->getLabel()),
                           log);
                return;
            }
            setControlProperty(namesake);
        } else {
            delete property;
            linkFailed("Error adding control property to node - control link could not be "
                       "created.",
                       QStringLiteral("The control property %1 could not be added to %2: the "
                                      "morph is not linked to a control property.")
                           .arg(m_morphName, m_controlNode->getLabel()),
                       log);
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
