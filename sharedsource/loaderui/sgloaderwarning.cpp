#include "sharedsource/loaderui/sgloaderwarning.h"

#include "sgcore/app/sgapp.h"

#include <QCoreApplication>
#include <QMessageBox>

void sgLoaderWarning(const QString &title, const QString &text) {
    QMessageBox box(QMessageBox::Warning, title, text, QMessageBox::NoButton,
                    sgApp->getDialogParent());
    box.addButton(QCoreApplication::translate("SgMorphSourceList", "Ok"), QMessageBox::AcceptRole);
    box.exec();
}
