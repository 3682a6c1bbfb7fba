#pragma once

#include "sharedsource/engine/sgmorphloader.h"

#include <QTreeWidgetItem>

// A top-level row of the source list for one geometry file: column 0 shows the short file
// name, column 1 the full path. The row owns the source's loader and, below it, the tree of
// setting rows that edit the loader.
class SgMorphFileItem : public QTreeWidgetItem {
public:
    static constexpr int Type = 52429;

    // Inserts the row at the top of `list`, sets the loader's file name to `path`, its morph
    // name to the file's base name and its group to "Morphs/Morph Loader", and creates the
    // setting rows.
    SgMorphFileItem(QTreeWidget *list, const QString &path);
    // Deletes the setting rows before the loader they point to.
    ~SgMorphFileItem() override;

    SgMorphLoader &loader() { return m_loader; }
    const SgMorphLoader &loader() const { return m_loader; }

protected:
    // For rows of another source kind (`type`), shown as `path`.
    SgMorphFileItem(QTreeWidget *list, const QString &path, int type);

private:
    void createSettingRows();

    SgMorphLoader m_loader;
};
