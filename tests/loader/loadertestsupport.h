#pragma once

// Shared drivers of the loader tests: the sources of a list, its setting rows found by their
// label, and a row's popup editor answered as a user would.

#include "sharedsource/loaderui/sgmorphsourceitem.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"
#include "tests/support/sgtestmodal.h"

#include <gtest/gtest.h>

// The paths of the list's sources, top first.
inline QStringList rowPaths(const QTreeWidget &list) {
    QStringList paths;
    for (int i = 0; i < list.topLevelItemCount(); ++i)
        paths.append(list.topLevelItem(i)->text(1));
    return paths;
}

// The setting row labelled `name`, or with the setting key `name`, below `top` (depth first), or
// null.
inline SgMorphSourceItem *findRow(QTreeWidgetItem *top, const QString &name) {
    for (int i = 0; i < top->childCount(); ++i) {
        auto *row = dynamic_cast<SgMorphSourceItem *>(top->child(i));
        if (row && (row->text(0) == name || row->settingKey() == name))
            return row;
        if (SgMorphSourceItem *found = findRow(top->child(i), name))
            return found;
    }
    return nullptr;
}

// Opens the editor of `row` as the list does on a right click over `column`, answering its
// popup with `entry` ("" dismisses it); returns the popup's entries.
inline QStringList editWithPopup(SgMorphSourceList &list, QTreeWidgetItem *row,
                                 const QString &entry, int column = 1) {
    QStringList seen;
    SgTestModalAnswer answer(
        sgTestChooseMenu(entry.isEmpty() ? QStringList() : QStringList{entry}, &seen));
    list.showContextMenu(row, list.viewport()->mapToGlobal(list.visualItemRect(row).center()),
                         column);
    EXPECT_TRUE(answer.answered()) << row->text(0).toStdString();
    return seen;
}
