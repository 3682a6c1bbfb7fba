#include "sharedsource/propertyui/sgpropertytreesubmenu.h"

#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgelement.h"

SgPropertyTreeSubMenu::SgPropertyTreeSubMenu(SgPropertyGroup *group, QWidget *parent,
                                             const QString &name)
    : QMenu(parent) {
    setObjectName(name);
    if (group) {
        m_path = group->getPath();
        buildGroupLevel(group);
    }
}

SgPropertyTreeSubMenu::SgPropertyTreeSubMenu(const QString &text, SgElement *element,
                                             QWidget *parent, const QString &name)
    : QMenu(parent) {
    setObjectName(name);
    addItem(tr("Create..."), CreateId);
    addSeparator();
    addItem(text, TextId);
    addSeparator();
    SgPropertyGroupTree *tree = element ? element->getPropertyGroups() : nullptr;
    if (tree)
        addGroupMenus(tree->getFirstChild());
    else
        addItem(tr("- none -"), NoneId);
}

SgPropertyTreeSubMenu::~SgPropertyTreeSubMenu() = default;

QAction *SgPropertyTreeSubMenu::addItem(const QString &text, int id) {
    QAction *action = addAction(text);
    action->setData(id);
    // Each level handles only its own items; sub-menus report through the re-emitted signals.
    connect(action, &QAction::triggered, this, [this, id] { itemActivated(id); });
    return action;
}

void SgPropertyTreeSubMenu::addGroupMenus(SgPropertyGroup *firstGroup) {
    int id = FirstGroupId;
    for (SgPropertyGroup *child = firstGroup; child; child = child->getNextSibling(), ++id) {
        auto *subMenu = new SgPropertyTreeSubMenu(child, this, QString());
        subMenu->setTitle(child->getName());
        addMenu(subMenu)->setData(id);
        connect(subMenu, &SgPropertyTreeSubMenu::propertySelected, this,
                &SgPropertyTreeSubMenu::propertySelected);
        connect(subMenu, &SgPropertyTreeSubMenu::createProperty, this,
                &SgPropertyTreeSubMenu::createProperty);
    }
}

void SgPropertyTreeSubMenu::buildGroupLevel(SgPropertyGroup *group) {
    addItem(tr("Create..."), CreateId);
    addSeparator();
    addGroupMenus(group->getFirstChild());
    for (SgProperty *property : group->getProperties()) {
        auto *numeric = dynamic_cast<SgNumericProperty *>(property);
        if (!numeric)
            continue;
        addItem(numeric->getLabel(), int(m_properties.size()));
        m_properties.append(numeric);
    }
}

void SgPropertyTreeSubMenu::itemActivated(int id) {
    if (id == CreateId)
        emit createProperty(m_path);
    else if (id == TextId)
        emit propertySelected(nullptr);
    else if (id >= 0 && id < FirstGroupId)
        emit propertySelected(m_properties.value(id, nullptr));
}
