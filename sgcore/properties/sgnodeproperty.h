#pragma once

#include "sgcore/properties/sgproperty.h"

class SgNode;

// A property whose value is a scene node (not owned; may be null).
class SgNodeProperty : public SgProperty {
public:
    SgNodeProperty() = default;
    explicit SgNodeProperty(const QString &name) : SgProperty(name) {}

    SgNode *getValue() const { return m_value; }
    // Sets the value; returns false (and keeps the old value) when `node` is not accepted.
    virtual bool setValue(SgNode *node);
    SgNode *getDefaultValue() const { return m_default; }
    virtual bool setDefaultValue(SgNode *node);

protected:
    // Whether the property takes `node` as value; the base takes any node and null.
    virtual bool accepts(SgNode *node) const;

private:
    SgNode *m_value = nullptr;
    SgNode *m_default = nullptr;
};
