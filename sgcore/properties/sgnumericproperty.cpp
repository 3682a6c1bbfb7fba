#include "sgcore/properties/sgnumericproperty.h"

#include "sgcore/properties/sgcontroller.h"
#include "sgcore/scene/sgresult.h"

#include <algorithm>

SgNumericProperty::SgNumericProperty() = default;
SgNumericProperty::SgNumericProperty(const QString &name) : SgProperty(name) {}
SgNumericProperty::~SgNumericProperty() {
    removeAllControllers();
}

float SgNumericProperty::getValue() const {
    float v = m_value;
    if (!m_evaluating && !m_controllers.empty()) {
        m_evaluating = true;
        for (const SgController *c : m_controllers) {
            v = c->evaluate(v, *this);
        }
        m_evaluating = false;
    }
    if (m_clamped) {
        v = std::clamp(v, std::min(m_min, m_max), std::max(m_min, m_max));
    }
    return v;
}

int SgNumericProperty::insertController(SgController *controller, int index) {
    if (!controller ||
        std::find(m_controllers.begin(), m_controllers.end(), controller) != m_controllers.end()) {
        return SgResult::Failed;
    }
    if (index < 0 || index > getControllerCount()) {
        index = getControllerCount();
    }
    m_controllers.insert(m_controllers.begin() + index, controller);
    return SgResult::Ok;
}

SgController *SgNumericProperty::getController(int index) const {
    return index >= 0 && index < getControllerCount() ? m_controllers[size_t(index)] : nullptr;
}

int SgNumericProperty::removeController(SgController *controller) {
    SgController *c = takeController(controller);
    if (!c) {
        return SgResult::Failed;
    }
    delete c;
    return SgResult::Ok;
}

SgController *SgNumericProperty::takeController(SgController *controller) {
    auto it = std::find(m_controllers.begin(), m_controllers.end(), controller);
    if (!controller || it == m_controllers.end()) {
        return nullptr;
    }
    m_controllers.erase(it);
    return controller;
}

void SgNumericProperty::removeAllControllers() {
    std::vector<SgController *> old;
    old.swap(m_controllers);
    for (SgController *c : old) {
        delete c;
    }
}

SgNumericProperty *SgNumericProperty::getLinkProperty() const {
    for (const SgController *c : m_controllers) {
        if (SgNumericProperty *p = c->getLinkProperty()) {
            return p;
        }
    }
    return nullptr;
}
