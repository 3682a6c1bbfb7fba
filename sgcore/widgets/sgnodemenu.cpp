#include "sgcore/widgets/sgnodemenu.h"

#include "sgcore/scene/sgnode.h"

SgNodeMenu::SgNodeMenu(QWidget *parent, const QString &name, bool offerNone)
    : QComboBox(parent), m_offerNone(offerNone) {
    setObjectName(name);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setNodes({});
    connect(this, &QComboBox::activated, this, [this] { emit nodeChosen(getCurrentNode()); });
}

SgNodeMenu::~SgNodeMenu() = default;

void SgNodeMenu::setNodes(const QList<SgNode *> &nodes) {
    SgNode *current = getCurrentNode();
    clear();
    m_nodes.clear();
    if (m_offerNone)
        addItem(tr("None"));
    for (SgNode *node : nodes) {
        if (!node)
            continue;
        m_nodes.append(node);
        addItem(node->getLabel());
    }
    if (!setCurrentNode(current))
        setCurrentNode(nullptr);
}

SgNode *SgNodeMenu::getCurrentNode() const {
    return m_nodes.value(currentIndex() - offset(), nullptr);
}

bool SgNodeMenu::setCurrentNode(SgNode *node) {
    const qsizetype index = node ? m_nodes.indexOf(node) : -1;
    if (index >= 0) {
        setCurrentIndex(int(index) + offset());
        return true;
    }
    setCurrentIndex(m_offerNone ? 0 : -1);
    return node == nullptr;
}
