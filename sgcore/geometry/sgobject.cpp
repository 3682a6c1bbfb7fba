#include "sgcore/geometry/sgobject.h"

#include "sgcore/geometry/sgmodifier.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgvertexmesh.h"

#include <algorithm>

SgObject::SgObject() = default;
SgObject::SgObject(const QString &name) : SgElement(name) {}

SgObject::~SgObject() {
    if (m_cache) {
        m_cache->unref();
    }
    for (SgModifier *m : m_modifiers) {
        delete m;
    }
    for (SgShape *s : m_shapes) {
        delete s;
    }
}

int SgObject::addShape(SgShape *shape, int index) {
    if (!shape || std::find(m_shapes.begin(), m_shapes.end(), shape) != m_shapes.end()) {
        return SgResult::Failed;
    }
    if (index < 0 || index > getShapeCount()) {
        index = getShapeCount();
    }
    m_shapes.insert(m_shapes.begin() + index, shape);
    shape->setElementParent(this);
    if (m_current < 0) {
        m_current = 0;
    } else if (index <= m_current) {
        ++m_current;
    }
    return SgResult::Ok;
}

SgShape *SgObject::getShape(int index) const {
    return index >= 0 && index < getShapeCount() ? m_shapes[size_t(index)] : nullptr;
}

int SgObject::removeShape(SgShape *shape) {
    auto it = std::find(m_shapes.begin(), m_shapes.end(), shape);
    if (!shape || it == m_shapes.end()) {
        return SgResult::Failed;
    }
    const int index = static_cast<int>(it - m_shapes.begin());
    m_shapes.erase(it);
    delete shape;
    if (index < m_current || m_current >= getShapeCount()) {
        --m_current;
    }
    if (m_current < 0 && !m_shapes.empty()) {
        m_current = 0;
    }
    return SgResult::Ok;
}

SgShape *SgObject::getCurrentShape() const {
    return getShape(m_current);
}

void SgObject::setCurrentShape(int index) {
    if (index >= 0 && index < getShapeCount()) {
        m_current = index;
    }
}

int SgObject::addModifier(SgModifier *modifier, int index) {
    if (!modifier || modifier->getElementParent() ||
        std::find(m_modifiers.begin(), m_modifiers.end(), modifier) != m_modifiers.end()) {
        return SgResult::Failed;
    }
    if (index < 0 || index > getModifierCount()) {
        index = getModifierCount();
    }
    m_modifiers.insert(m_modifiers.begin() + index, modifier);
    modifier->setElementParent(this);
    return SgResult::Ok;
}

int SgObject::removeModifier(SgModifier *modifier) {
    SgModifier *m = takeModifier(modifier);
    if (!m) {
        return SgResult::Failed;
    }
    delete m;
    return SgResult::Ok;
}

SgModifier *SgObject::takeModifier(SgModifier *modifier) {
    auto it = std::find(m_modifiers.begin(), m_modifiers.end(), modifier);
    if (!modifier || it == m_modifiers.end()) {
        return nullptr;
    }
    m_modifiers.erase(it);
    modifier->setElementParent(nullptr);
    return modifier;
}

SgModifier *SgObject::getModifier(int index) const {
    return index >= 0 && index < getModifierCount() ? m_modifiers[size_t(index)] : nullptr;
}

int SgObject::getModifierIndex(const SgModifier *modifier) const {
    auto it = std::find(m_modifiers.begin(), m_modifiers.end(), modifier);
    return it == m_modifiers.end() ? -1 : static_cast<int>(it - m_modifiers.begin());
}

SgModifier *SgObject::findModifier(const QString &name) const {
    for (SgModifier *m : m_modifiers) {
        if (m->getName() == name) {
            return m;
        }
    }
    return nullptr;
}

SgVertexMesh *SgObject::getCachedGeom() {
    const SgShape *shape = getCurrentShape();
    const SgVertexMesh *base = shape ? shape->getGeometry() : nullptr;
    if (!base) {
        return nullptr;
    }
    if (!m_cache || m_cacheBase != base || m_cache->getVertexCount() != base->getVertexCount()) {
        if (m_cache) {
            m_cache->unref();
        }
        m_cache = base->clone();
        m_cache->ref();
        m_cacheBase = base;
    } else {
        // Only the positions change between calls; facets of the clone stay as they were.
        m_cache->vertices() = base->vertices();
    }
    for (const SgModifier *m : m_modifiers) {
        m->apply(m_cache, m_node);
    }
    return m_cache;
}
