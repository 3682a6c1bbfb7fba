#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class QLabel;
class SgNode;
class SgNodeMenu;
class SgNodeProperty;

// "Node Attributes" (or "Skeleton Attributes"): the node and the default node, each chosen in
// a node menu (the node and skeleton types share this page).
class SgNodePropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgNodePropertyPage(QWidget *parent);

    // Titles and labels for nodes ("Node:") or skeletons ("Skeleton:").
    void setSkeletonMode(bool skeletons);
    // Both menus offer `nodes`, with nothing chosen.
    void fillChoosers(const QList<SgNode *> &nodes);
    void clearChoice();
    // The value and the default (either may be null).
    void configure(SgNodeProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgNodeMenu *m_node = nullptr, *m_default = nullptr;
    QLabel *m_nodeLabel = nullptr, *m_defaultLabel = nullptr;
    SgNode *m_savedNode = nullptr, *m_savedDefault = nullptr;
};
