#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"

#include "sharedsource/propertyui/sgpropertygroupmenu.h"

#include <QComboBox>
#include <QLineEdit>
#include <QVBoxLayout>

SgCreatePropertyGroupDlg::SgCreatePropertyGroupDlg(QWidget *parent, const QString &name)
    : SgBasicDialog(parent, name) {
    setWindowTitle(tr("Create Property Group"));
    m_pathBox = new QComboBox(this);
    m_pathBox->setObjectName(QStringLiteral("TICreatePropGroupList"));
    QStringList paths;
    SgPropertyGroupMenu::collectGroupPaths(paths);
    m_pathBox->addItems(paths);
    addWidget(m_pathBox);
    m_pathEdit = new QLineEdit(this);
    m_pathEdit->setObjectName(QStringLiteral("TICreatePropGroupEdit"));
    addWidget(m_pathEdit);
    bodyLayout()->addStretch(100);
    connect(m_pathBox, &QComboBox::textActivated, this, &SgCreatePropertyGroupDlg::setGroup);
}

SgCreatePropertyGroupDlg::~SgCreatePropertyGroupDlg() = default;

void SgCreatePropertyGroupDlg::setGroup(QString group) {
    m_pathEdit->setText(group);
}

void SgCreatePropertyGroupDlg::apply() {
    m_group = m_pathEdit->text();
}
