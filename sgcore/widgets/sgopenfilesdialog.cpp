#include "sgcore/widgets/sgopenfilesdialog.h"

#include <QFileDialog>

bool SgOpenFilesDialog::doOpenFilesDialog(QStringList &files, const QString &caption,
                                          const QString &directory, const QString &filter,
                                          QWidget *parent) {
    files.clear();
    QFileDialog dialog(parent, caption, directory, filter);
    dialog.setObjectName(QStringLiteral("SgOpenFilesDialog"));
    dialog.setFileMode(QFileDialog::ExistingFiles);
    dialog.setAcceptMode(QFileDialog::AcceptOpen);
    if (dialog.exec() != QDialog::Accepted)
        return false;
    files = dialog.selectedFiles();
    return true;
}
