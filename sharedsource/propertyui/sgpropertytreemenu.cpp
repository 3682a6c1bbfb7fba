#include "sharedsource/propertyui/sgpropertytreemenu.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgnode.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"

QString SgPropertyTreeMenu::defaultCreatePath() {
    return QStringLiteral("Morphs/Morph Loader");
}

SgPropertyTreeMenu::SgPropertyTreeMenu(const QString &text, SgElement *element, QWidget *parent,
                                       const QString &name)
    : SgPropertyTreeSubMenu(text, element, parent, name), m_text(text), m_element(element) {
    connect(this, &SgPropertyTreeSubMenu::propertySelected, this,
            &SgPropertyTreeMenu::setSelectedProperty);
    connect(this, &SgPropertyTreeSubMenu::createProperty, this,
            &SgPropertyTreeMenu::doCreateProperty);
}

SgPropertyTreeMenu::~SgPropertyTreeMenu() = default;

SgNumericProperty *SgPropertyTreeMenu::chooseProperty(SgNumericProperty *current,
                                                      const QPoint &position) {
    m_selected = current;
    if (!exec(position))
        return current;
    return m_selected;
}

void SgPropertyTreeMenu::setSelectedProperty(SgNumericProperty *prop) {
    m_selected = prop;
}

void SgPropertyTreeMenu::doCreateProperty(QString group) {
    SgCreatePropertyDlg dialog(sgApp->getDialogParent(),
                               QStringLiteral("PropertyTreeMenuCreateDlg"), true,
                               SgCreatePropertyDlg::FloatType, false, true);
    SgPropertyGroupTree *tree = m_element ? m_element->getPropertyGroups() : nullptr;
    dialog.setPathDefaults(tree ? tree->getAllPaths() : QStringList());
    dialog.setDefaultPath(group.isEmpty() ? defaultCreatePath() : group);
    dialog.setDefaultName(m_text);
    dialog.setDefaultLabel(m_text);
    SgNodeList nodes;
    if (auto *node = dynamic_cast<SgNode *>(m_element))
        nodes.append(node);
    dialog.setCreationNodes(nodes);
    if (dialog.exec() != QDialog::Accepted)
        return;
    SgProperty *created = dialog.createProperty(nullptr);
    if (auto *numeric = dynamic_cast<SgNumericProperty *>(created))
        setSelectedProperty(numeric);
    else
        delete created;
}
