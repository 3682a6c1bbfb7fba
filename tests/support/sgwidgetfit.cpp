#include "tests/support/sgwidgetfit.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QApplication>
#include <QComboBox>
#include <QGroupBox>
#include <QHeaderView>
#include <QLabel>
#include <QLayout>
#include <QStyle>
#include <QStyleOptionComboBox>
#include <QTreeView>

namespace {

QString nameOf(const QObject *object) {
    return object->objectName().isEmpty() ? QString::fromLatin1(object->metaObject()->className())
                                          : object->objectName();
}

// `dimension` is "" for a width, " high" for a height.
void report(QStringList &out, const char *what, const QObject *object, const QString &text,
            int needed, int available, const char *dimension = "") {
    if (needed <= available)
        return;
    out << QStringLiteral("%1 %2 \"%3\": needs %4 px%5, has %6 px")
               .arg(QLatin1String(what), nameOf(object), text)
               .arg(needed)
               .arg(QLatin1String(dimension))
               .arg(available);
}

// A word-wrapped label does not fit when its wrapped text is taller than the label.
void checkLabel(QStringList &out, const QLabel *label) {
    const QString text = label->text().simplified();
    if (text.isEmpty())
        return;
    if (label->wordWrap())
        report(out, "label", label, text, label->heightForWidth(label->width()), label->height(),
               " high");
    else
        report(out, "label", label, text, label->sizeHint().width(), label->width());
}

void checkButton(QStringList &out, const QAbstractButton *button) {
    if (button->text().isEmpty())
        return;
    report(out, "button", button, button->text(), button->sizeHint().width(), button->width());
}

void checkCombo(QStringList &out, const QComboBox *combo) {
    const QString text = combo->currentText();
    if (text.isEmpty() || combo->isEditable())
        return;
    QStyleOptionComboBox option;
    option.initFrom(combo);
    option.currentText = text;
    const QRect field = combo->style()->subControlRect(QStyle::CC_ComboBox, &option,
                                                       QStyle::SC_ComboBoxEditField, combo);
    report(out, "combo box", combo, text, combo->fontMetrics().horizontalAdvance(text),
           field.width());
}

void checkGroupBox(QStringList &out, const QGroupBox *box) {
    if (box->title().isEmpty())
        return;
    // The title sits inside the frame, with a little room on both sides.
    const int needed = box->fontMetrics().horizontalAdvance(box->title()) + 16;
    report(out, "group box", box, box->title(), needed, box->width());
}

void checkHeader(QStringList &out, const QHeaderView *header) {
    const QAbstractItemModel *model = header->model();
    if (!model)
        return;
    for (int section = 0; section < header->count(); ++section) {
        if (header->isSectionHidden(section))
            continue;
        const QString text = model->headerData(section, header->orientation()).toString();
        if (text.isEmpty())
            continue;
        report(out, "header", header, text, header->sectionSizeHint(section),
               header->sectionSize(section));
    }
}

// Every row the view shows: top-level rows and, in a tree, the children of expanded rows.
void checkRows(QStringList &out, const QAbstractItemView *view, const QModelIndex &parent) {
    const QAbstractItemModel *model = view->model();
    const auto *tree = qobject_cast<const QTreeView *>(view);
    const int viewportWidth = view->viewport()->width();
    for (int row = 0; row < model->rowCount(parent); ++row) {
        if (tree && tree->isRowHidden(row, parent))
            continue;
        for (int column = 0; column < model->columnCount(parent); ++column) {
            if (tree && tree->isColumnHidden(column))
                continue;
            const QModelIndex index = model->index(row, column, parent);
            const QString text = index.data(Qt::DisplayRole).toString();
            if (text.isEmpty() || view->indexWidget(index))
                continue;
            const QRect rect = view->visualRect(index);
            const int available = std::min(rect.width(), viewportWidth - rect.left());
            report(
                out, "row", view,
                QStringLiteral("%1 | %2").arg(model->index(row, 0, parent).data().toString(), text),
                view->sizeHintForIndex(index).width(), available);
        }
        const QModelIndex first = model->index(row, 0, parent);
        if (tree && tree->isExpanded(first))
            checkRows(out, view, first);
    }
}

} // namespace

QStringList sgCutTexts(QWidget *root) {
    QStringList out;
    if (!root)
        return out;
    QApplication::processEvents();
    QList<QWidget *> widgets = root->findChildren<QWidget *>();
    widgets.prepend(root);
    for (const QWidget *widget : std::as_const(widgets)) {
        if (widget != root && !widget->isVisibleTo(root))
            continue;
        if (const auto *label = qobject_cast<const QLabel *>(widget))
            checkLabel(out, label);
        else if (const auto *button = qobject_cast<const QAbstractButton *>(widget))
            checkButton(out, button);
        else if (const auto *combo = qobject_cast<const QComboBox *>(widget))
            checkCombo(out, combo);
        else if (const auto *box = qobject_cast<const QGroupBox *>(widget))
            checkGroupBox(out, box);
        else if (const auto *header = qobject_cast<const QHeaderView *>(widget))
            checkHeader(out, header);
        else if (const auto *view = qobject_cast<const QAbstractItemView *>(widget);
                 view && view->model())
            checkRows(out, view, view->rootIndex());
    }
    return out;
}
