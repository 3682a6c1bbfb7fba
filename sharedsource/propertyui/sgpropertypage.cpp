#include "sharedsource/propertyui/sgpropertypage.h"

#include "sgcore/widgets/sgboolbutton.h"

#include <QGridLayout>
#include <QLabel>

SgPropertyPage::SgPropertyPage(QWidget *parent, const QString &title, const QString &name)
    : QGroupBox(title, parent) {
    setObjectName(name);
    m_grid = new QGridLayout(this);
    m_grid->setSpacing(5);
    m_grid->setColumnStretch(1, 1);
}

SgPropertyPage::~SgPropertyPage() = default;

QLabel *SgPropertyPage::addRow(int row, const QString &text, const QString &labelName,
                               QWidget *widget) {
    auto *label = new QLabel(text, this);
    label->setObjectName(labelName);
    label->setMinimumWidth(LabelWidth);
    m_grid->addWidget(label, row, 0);
    const bool fixed = widget->maximumWidth() < QWIDGETSIZE_MAX;
    m_grid->addWidget(widget, row, 1, fixed ? Qt::AlignLeft : Qt::Alignment());
    m_labels.append(label);
    return label;
}

SgBoolButton *SgPropertyPage::newStateButton(const QString &name, const QString &offText,
                                             const QString &onText) {
    auto *button = new SgBoolButton(this, name, offText, onText);
    button->setFixedWidth(LabelWidth);
    return button;
}

SgBoolButton *SgPropertyPage::newYesNoButton(const QString &name) {
    return newStateButton(name, tr("No"), tr("Yes"));
}
