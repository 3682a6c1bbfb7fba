#include "sharedsource/propertyui/sgnumericnodepropertypage.h"

#include "sgcore/properties/sgnumericnodeproperty.h"
#include "sgcore/widgets/sgboolbutton.h"
#include "sgcore/widgets/sgnodemenu.h"

SgNumericNodePropertyPage::SgNumericNodePropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Numeric Node Attributes"),
                     QStringLiteral("SgNumericNodeAttribs")) {
    m_node = new SgNodeMenu(this, QStringLiteral("SgNumericNodeAttrib"), true);
    m_requiresNode = newYesNoButton(QStringLiteral("SgRequiresNodeAttrib"));
    addRow(0, tr("Node:"), QStringLiteral("SgNumericNodePropertyLabel"), m_node);
    addRow(1, tr("Requires Node:"), QStringLiteral("SgRequiresNodePropertyLabel"), m_requiresNode);
}

void SgNumericNodePropertyPage::fillChooser(const QList<SgNode *> &nodes) {
    m_node->setNodes(nodes);
}

void SgNumericNodePropertyPage::configure(SgNumericNodeProperty *property) const {
    property->setNode(m_node->getCurrentNode());
    property->setMustHaveNode(m_requiresNode->isOn());
}

void SgNumericNodePropertyPage::restoreDefaults() {
    m_node->setCurrentNode(nullptr);
    m_requiresNode->setOn(false);
}

void SgNumericNodePropertyPage::saveValues() {
    m_savedNode = m_node->getCurrentNode();
    m_savedRequires = m_requiresNode->isOn();
}

void SgNumericNodePropertyPage::restoreValues() {
    m_node->setCurrentNode(m_savedNode);
    m_requiresNode->setOn(m_savedRequires);
}
