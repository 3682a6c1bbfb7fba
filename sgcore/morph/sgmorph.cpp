#include "sgcore/morph/sgmorph.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/morph/sgfigurejoint.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgnode.h"

SgMorph::SgMorph(const QString &name, SgMorphDeltas *deltas)
    : SgModifier(name), m_channel(new SgFloatProperty(name)), m_deltas(deltas) {
    addProperty(m_channel);
}

SgMorph::~SgMorph() = default;

void SgMorph::setName(const QString &name) {
    SgModifier::setName(name);
    m_channel->setName(name);
}

void SgMorph::setDeltas(SgMorphDeltas *deltas) {
    m_deltas.reset(deltas);
}

bool SgMorph::isAfterJoint() const {
    const auto *object = dynamic_cast<const SgObject *>(getElementParent());
    if (!object)
        return false;
    const int joint = SgFigureJoint::findJointIndex(object);
    return joint >= 0 && object->getModifierIndex(this) > joint;
}

void SgMorph::apply(SgVertexMesh *mesh, SgNode *node) const {
    applyWeighted(mesh, node, 1.0f);
}

void SgMorph::applyInverse(SgVertexMesh *mesh, SgNode *node) const {
    applyWeighted(mesh, node, -1.0f);
}

void SgMorph::applyWeighted(SgVertexMesh *mesh, SgNode *node, float sign) const {
    if (!mesh || !m_deltas || m_deltas->isEmpty())
        return;
    const float weight = sign * m_channel->getValue();
    if (weight == 0.0f)
        return;
    if (node && isAfterJoint() && !node->getLocalRot().isIdentity()) {
        const SgQuat rotation = node->getLocalRot();
        SgVec3 *points = mesh->getVertices();
        const int count = mesh->getVertexCount();
        const auto &vertices = m_deltas->vertices();
        const auto &deltas = m_deltas->deltas();
        for (size_t i = 0; i < vertices.size(); ++i) {
            if (vertices[i] < count)
                points[vertices[i]] += rotation.multPnt(deltas[i]) * weight;
        }
        return;
    }
    m_deltas->apply(mesh->getVertices(), mesh->getVertexCount(), weight);
}
