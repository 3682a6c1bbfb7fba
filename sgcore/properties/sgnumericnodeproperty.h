#pragma once

#include "sgcore/properties/sgfloatproperty.h"

class SgNode;
class SgPropertySettings;

// A float property tied to a scene node (not owned; may be null), optionally requiring one.
class SgNumericNodeProperty : public SgFloatProperty {
public:
    SgNumericNodeProperty() = default;
    explicit SgNumericNodeProperty(const QString &name) : SgFloatProperty(name) {}

    // Add the must-have-node flag to the numeric attributes (the node itself is not recorded).
    void getAttributes(SgPropertySettings &settings) const override;
    void setAttributes(const SgPropertySettings &settings) override;

    SgNode *getNode() const { return m_node; }
    void setNode(SgNode *node) { m_node = node; }
    bool getMustHaveNode() const { return m_mustHaveNode; }
    void setMustHaveNode(bool must) { m_mustHaveNode = must; }

private:
    SgNode *m_node = nullptr;
    bool m_mustHaveNode = false;
};
