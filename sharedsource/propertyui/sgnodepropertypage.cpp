#include "sharedsource/propertyui/sgnodepropertypage.h"

#include "sgcore/properties/sgnodeproperty.h"
#include "sgcore/widgets/sgnodemenu.h"

#include <QLabel>

SgNodePropertyPage::SgNodePropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Node Attributes"), QStringLiteral("SgNodePropertyAttribs")) {
    m_node = new SgNodeMenu(this, QStringLiteral("SgNodeAttrib"), true);
    m_default = new SgNodeMenu(this, QStringLiteral("SgDefaultNodeAttrib"), true);
    m_nodeLabel = addRow(0, tr("Node:"), QStringLiteral("SgNodeLabel"), m_node);
    m_defaultLabel =
        addRow(1, tr("Default Node:"), QStringLiteral("SgDefaultNodeLabel"), m_default);
}

void SgNodePropertyPage::setSkeletonMode(bool skeletons) {
    m_nodeLabel->setText(skeletons ? tr("Skeleton:") : tr("Node:"));
    m_defaultLabel->setText(skeletons ? tr("Default Skeleton:") : tr("Default Node:"));
    setTitle(skeletons ? tr("Skeleton Attributes") : tr("Node Attributes"));
}

void SgNodePropertyPage::fillChoosers(const QList<SgNode *> &nodes) {
    m_node->setNodes(nodes);
    m_default->setNodes(nodes);
}

void SgNodePropertyPage::clearChoice() {
    m_node->setCurrentNode(nullptr);
    m_default->setCurrentNode(nullptr);
}

void SgNodePropertyPage::configure(SgNodeProperty *property) const {
    property->setValue(m_node->getCurrentNode());
    property->setDefaultValue(m_default->getCurrentNode());
}

void SgNodePropertyPage::restoreDefaults() {
    clearChoice();
}

void SgNodePropertyPage::saveValues() {
    m_savedNode = m_node->getCurrentNode();
    m_savedDefault = m_default->getCurrentNode();
}

void SgNodePropertyPage::restoreValues() {
    m_node->setCurrentNode(m_savedNode);
    m_default->setCurrentNode(m_savedDefault);
}
