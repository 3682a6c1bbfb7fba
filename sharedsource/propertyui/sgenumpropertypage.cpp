#include "sharedsource/propertyui/sgenumpropertypage.h"

#include "sgcore/properties/sgenumproperty.h"
#include "sgcore/widgets/sgenumslider.h"
#include "sgcore/widgets/sgstyle.h"

#include <QButtonGroup>
#include <QGridLayout>
#include <QHeaderView>
#include <QPushButton>
#include <QSignalBlocker>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace {
constexpr int IndexColumn = 0;
constexpr int LabelColumn = 1;
} // namespace

QString SgEnumPropertyPage::placeholderText() {
    return QStringLiteral("<Double-Click to Add/Rename>");
}

SgEnumPropertyPage::SgEnumPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Enum Attributes"), QStringLiteral("SgEnumAttribs")) {
    m_list = new QTreeWidget(this);
    m_list->setObjectName(QStringLiteral("SgEnumAttrib"));
    m_list->setColumnCount(2);
    m_list->setHeaderLabels({tr("Int Val"), tr("Enumerated Type")});
    m_list->header()->setStretchLastSection(true);
    m_list->header()->setSectionResizeMode(IndexColumn, QHeaderView::ResizeToContents);
    m_list->setAllColumnsShowFocus(true);
    m_list->setRootIsDecorated(false);
    m_list->setSortingEnabled(false);
    m_list->setEditTriggers(QAbstractItemView::NoEditTriggers);
    m_list->setFixedHeight(100);
    grid()->addWidget(m_list, 0, 1);

    auto *buttonBox = new QGroupBox(this);
    buttonBox->setObjectName(QStringLiteral("SgUpDownButtonGroup"));
    buttonBox->setFlat(true);
    auto *column = new QVBoxLayout(buttonBox);
    column->setContentsMargins(0, 0, 0, 0);
    auto *buttons = new QButtonGroup(buttonBox);
    const auto addButton = [&](const QString &name, const QIcon &icon) {
        auto *button = new QPushButton(icon, QString(), buttonBox);
        button->setObjectName(name);
        buttons->addButton(button);
        column->addWidget(button);
        return button;
    };
    m_up = addButton(QStringLiteral("SgMoveEnumUpButton"),
                     SgStyle::customIcon(SgStyle::UpArrowPixmap));
    m_down = addButton(QStringLiteral("SgMoveEnumDownButton"),
                       SgStyle::customIcon(SgStyle::DownArrowPixmap));
    m_delete = addButton(QStringLiteral("SgDeleteEnumDownButton"),
                         SgStyle::actionIcon(QStringLiteral("SgDeleteAction")));
    grid()->addWidget(buttonBox, 0, 2);

    m_value = new SgEnumSlider(this, QStringLiteral("SgEnumAttrib"));
    m_default = new SgEnumSlider(this, QStringLiteral("SgDefaultEnumAttrib"));
    addRow(1, tr("Value:"), QStringLiteral("SgEnumValueLabel"), m_value);
    addRow(2, tr("Default Value:"), QStringLiteral("SgDefaultEnumValueLabel"), m_default);
    addPlaceholder();
}

QStringList SgEnumPropertyPage::labels() const {
    QStringList labels;
    for (int row = 0; row + 1 < m_list->topLevelItemCount(); ++row)
        labels.append(m_list->topLevelItem(row)->text(LabelColumn));
    return labels;
}

bool SgEnumPropertyPage::hasItems() const {
    return m_value->count() > 0;
}

void SgEnumPropertyPage::configure(SgEnumProperty *property) const {
    for (const QString &label : labels())
        property->addItem(label, -1);
    property->setValue(m_value->currentIndex());
    property->setDefaultValue(m_default->currentIndex());
}

QTreeWidgetItem *SgEnumPropertyPage::placeholder() const {
    return m_list->topLevelItem(m_list->topLevelItemCount() - 1);
}

void SgEnumPropertyPage::addPlaceholder() {
    const QSignalBlocker blocker(m_list);
    auto *item = new QTreeWidgetItem(m_list);
    item->setText(LabelColumn, placeholderText());
    item->setFlags(item->flags() | Qt::ItemIsEditable);
}

void SgEnumPropertyPage::clear() {
    {
        const QSignalBlocker blocker(m_list);
        m_list->clear();
    }
    m_value->clear();
    m_default->clear();
    addPlaceholder();
}

void SgEnumPropertyPage::beginRename(QTreeWidgetItem *item, int column) {
    if (item && column == LabelColumn)
        m_list->editItem(item, LabelColumn);
}

void SgEnumPropertyPage::rename(QTreeWidgetItem *item, const QString &text) {
    if (!item)
        return;
    const int row = m_list->indexOfTopLevelItem(item);
    if (row < 0)
        return;
    if (item != placeholder()) {
        m_value->renameItem(row, text);
        m_default->renameItem(row, text);
        return;
    }
    const int index = m_value->addItem(text);
    m_default->addItem(text);
    {
        const QSignalBlocker blocker(m_list);
        item->setText(IndexColumn, QString::number(index));
    }
    addPlaceholder();
}

void SgEnumPropertyPage::swapLabels(QTreeWidgetItem *upper, QTreeWidgetItem *lower) {
    const int upperRow = m_list->indexOfTopLevelItem(upper);
    const QString upperLabel = upper->text(LabelColumn);
    const QString lowerLabel = lower->text(LabelColumn);
    {
        const QSignalBlocker blocker(m_list);
        upper->setText(LabelColumn, lowerLabel);
        lower->setText(LabelColumn, upperLabel);
    }
    for (SgEnumSlider *slider : {m_value, m_default}) {
        slider->renameItem(upperRow, lowerLabel);
        slider->renameItem(upperRow + 1, upperLabel);
    }
}

void SgEnumPropertyPage::moveUp() {
    QTreeWidgetItem *current = m_list->currentItem();
    if (!current || current == placeholder())
        return;
    const int row = m_list->indexOfTopLevelItem(current);
    if (row <= 0)
        return;
    QTreeWidgetItem *previous = m_list->topLevelItem(row - 1);
    swapLabels(previous, current);
    m_list->setCurrentItem(previous);
}

void SgEnumPropertyPage::moveDown() {
    QTreeWidgetItem *current = m_list->currentItem();
    if (!current)
        return;
    const int row = m_list->indexOfTopLevelItem(current);
    QTreeWidgetItem *next = m_list->topLevelItem(row + 1);
    if (row < 0 || !next || next == placeholder())
        return;
    swapLabels(current, next);
    m_list->setCurrentItem(next);
}

void SgEnumPropertyPage::remove() {
    QTreeWidgetItem *current = m_list->currentItem();
    if (!current || current == placeholder())
        return;
    const int row = m_list->indexOfTopLevelItem(current);
    if (row < 0)
        return;
    {
        const QSignalBlocker blocker(m_list);
        delete current;
    }
    m_value->removeItem(row);
    m_default->removeItem(row);
    renumber();
}

void SgEnumPropertyPage::renumber() {
    const QSignalBlocker blocker(m_list);
    for (int row = 0; row + 1 < m_list->topLevelItemCount(); ++row)
        m_list->topLevelItem(row)->setText(IndexColumn, QString::number(row));
}

void SgEnumPropertyPage::restoreDefaults() {
    clear();
}

void SgEnumPropertyPage::saveValues() {
    m_savedLabels = labels();
    if (!m_savedLabels.isEmpty()) {
        m_savedValue = m_value->currentIndex();
        m_savedDefault = m_default->currentIndex();
    }
}

void SgEnumPropertyPage::restoreValues() {
    clear();
    for (const QString &label : std::as_const(m_savedLabels)) {
        QTreeWidgetItem *row = placeholder();
        {
            const QSignalBlocker blocker(m_list);
            row->setText(LabelColumn, label);
        }
        rename(row, label);
    }
    if (!m_savedLabels.isEmpty()) {
        m_value->setCurrentIndex(m_savedValue);
        m_default->setCurrentIndex(m_savedDefault);
    }
}
