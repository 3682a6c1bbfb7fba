#pragma once

#include <QString>
#include <QStringList>

class QWidget;

// The main window's open-files dialog: lets the user choose one or more existing files.
class SgOpenFilesDialog {
public:
    // Runs a modal file dialog titled `caption` in the folder `directory` with the name filter
    // `filter` (entries separated by ";;"), parented to `parent`. True when the user accepted;
    // `files` then holds the chosen paths (absolute, "/" separators), otherwise it is cleared.
    static bool doOpenFilesDialog(QStringList &files, const QString &caption,
                                  const QString &directory, const QString &filter, QWidget *parent);
};
