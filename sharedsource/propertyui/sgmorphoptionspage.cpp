#include "sharedsource/propertyui/sgmorphoptionspage.h"

#include <QCheckBox>
#include <QGridLayout>

SgMorphOptionsPage::SgMorphOptionsPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Additional Options"), QStringLiteral("SgAdditionalOptions")) {
    m_createAsMorph = new QCheckBox(tr("Create as empty morph"), this);
    m_createAsMorph->setObjectName(QStringLiteral("SgCreateAsMorphOption"));
    m_afterJoint = new QCheckBox(tr("Create morph after joint"), this);
    m_afterJoint->setObjectName(QStringLiteral("SgCreateAfterJointOption"));
    m_afterJoint->setChecked(false);
    m_afterJoint->setEnabled(false);
    grid()->addWidget(m_createAsMorph, 0, 0, 1, 2);
    grid()->addWidget(m_afterJoint, 1, 0, 1, 2);
    connect(m_createAsMorph, &QCheckBox::toggled, m_afterJoint, &QCheckBox::setEnabled);
}

bool SgMorphOptionsPage::createAsMorph() const {
    return m_createAsMorph->isChecked();
}

int SgMorphOptionsPage::morphIndex() const {
    return m_afterJoint->isEnabled() && m_afterJoint->isChecked() ? -1 : 0;
}

void SgMorphOptionsPage::saveValues() {
    m_saved = m_createAsMorph->isChecked();
}

void SgMorphOptionsPage::restoreValues() {
    m_createAsMorph->setChecked(m_saved);
}
