#include "sgcore/scene/sgelement.h"

#include "sgcore/properties/sgproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"

#include <algorithm>

SgElement::SgElement() = default;
SgElement::SgElement(const QString &name) : SgBase(name) {}

SgElement::~SgElement() {
    m_groups.reset();
    for (SgProperty *p : m_properties) {
        p->setOwner(nullptr);
        delete p;
    }
}

int SgElement::addProperty(SgProperty *property) {
    if (!property || property->getOwner()) {
        return SgResult::Failed;
    }
    if (findProperty(property->getName())) {
        return SgResult::NameExists;
    }
    m_properties.push_back(property);
    property->setOwner(this);
    return SgResult::Ok;
}

SgProperty *SgElement::findProperty(const QString &name) const {
    for (SgProperty *p : m_properties) {
        if (p->getName() == name) {
            return p;
        }
    }
    return nullptr;
}

int SgElement::removeProperty(const QString &name) {
    SgProperty *p = takeProperty(findProperty(name));
    if (!p) {
        return SgResult::Failed;
    }
    delete p;
    return SgResult::Ok;
}

SgProperty *SgElement::takeProperty(SgProperty *property) {
    auto it = std::find(m_properties.begin(), m_properties.end(), property);
    if (!property || it == m_properties.end()) {
        return nullptr;
    }
    m_properties.erase(it);
    property->setOwner(nullptr);
    return property;
}

SgProperty *SgElement::getProperty(int index) const {
    return index >= 0 && index < getPropertyCount() ? m_properties[size_t(index)] : nullptr;
}

SgPropertyGroupTree *SgElement::getPropertyGroups() {
    if (!m_groups) {
        m_groups = std::make_unique<SgPropertyGroupTree>(this);
    }
    for (SgProperty *p : m_properties) {
        if (!p->getPath().isEmpty()) {
            m_groups->addGroup(p->getPath());
        }
    }
    return m_groups.get();
}
