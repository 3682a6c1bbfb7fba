#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class SgNode;
class SgNodeMenu;
class SgNumericNodeProperty;

// "Numeric Node Attributes": the node the value comes from and whether one is required.
class SgNumericNodePropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgNumericNodePropertyPage(QWidget *parent);

    void fillChooser(const QList<SgNode *> &nodes);
    // The node and the requires-node flag (the float step follows).
    void configure(SgNumericNodeProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgNodeMenu *m_node = nullptr;
    SgBoolButton *m_requiresNode = nullptr;
    SgNode *m_savedNode = nullptr;
    bool m_savedRequires = false;
};
