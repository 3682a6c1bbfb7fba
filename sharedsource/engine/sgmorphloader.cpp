#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/engine/sgmorphloadlog.h"

struct SgMorphLoader::GroupIndex {};

SgMorphLoader::SgMorphLoader() : QObject(nullptr) {}

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

void SgMorphLoader::discardControlProperty() {
    m_controlProperty = nullptr;
}

// The engine's steps arrive with the host's scene and geometry classes; until then every entry
// point reports that it made nothing.
bool SgMorphLoader::applyPose() {
    return true;
}

void SgMorphLoader::loadMorphForNode(const SgFileIOSettings &, SgNode *, SgMorphLoadLog &log) {
    log.addMessage(QStringLiteral("Loading morph %1...").arg(m_morphName));
    log.addError(QStringLiteral("Could not load geometry from file."));
}

void SgMorphLoader::loadMorphForNodes(const SgFileIOSettings &, const QList<SgNode *> &,
                                      SgMorphLoadLog &log) {
    log.addMessage(QStringLiteral("Loading morph %1...").arg(m_morphName));
    log.addError(QStringLiteral("Could not load geometry from file."));
}

void SgMorphLoader::createMorphForNode(SgVertexMesh *, SgNode *, SgMorphLoadLog &log) {
    log.addWarning(QStringLiteral("Geometry did not match, failed to create morph."));
}

void SgMorphLoader::createMorphForNodes(SgVertexMesh *, const QList<SgNode *> &,
                                        SgMorphLoadLog &log) {
    log.addWarning(QStringLiteral("Geometry did not match, no morphs created."));
}

SgMorphDeltas *SgMorphLoader::computeDeltas(const SgVertexMesh &, const SgVertexMesh &) {
    return nullptr;
}

SgVertexMesh *SgMorphLoader::loadGeometry(const SgFileIOSettings &) {
    return nullptr;
}

SgVertexMesh *SgMorphLoader::groupGeometry(SgNode *, SgVertexMesh *) {
    return nullptr;
}

bool SgMorphLoader::createMorph(SgNode *, SgVertexMesh *, bool, SgNumericProperty *&channel) {
    channel = nullptr;
    return false;
}

void SgMorphLoader::prepareControlProperty() {}

void SgMorphLoader::setupMorph(SgNumericProperty *) {}
