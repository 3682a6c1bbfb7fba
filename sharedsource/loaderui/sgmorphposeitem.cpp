#include "sharedsource/loaderui/sgmorphposeitem.h"

#include "sharedsource/loaderui/sgexistingfolder.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/script/sgscript.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgloaderwarning.h"

#include <QDropEvent>
#include <QFileDialog>
#include <QMenu>
#include <QMimeData>
#include <QUrl>

namespace {
constexpr int NoneId = 0;
constexpr int BrowseId = 1;
const QString NoPose = QStringLiteral("None");
const QString LastDirectoryKey = QStringLiteral("LastDirectory");
} // namespace

SgMorphPoseItem::SgMorphPoseItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Pose:"));
    setText(1, tr("None"));
}

void SgMorphPoseItem::selectPose(const QString &path) {
    setText(1, path);
    loader()->setPoseFile(path);
}

void SgMorphPoseItem::showEditor(const QPoint &position, int) {
    if (!isEnabled())
        return;
    QMenu menu(menuParent());
    addMenuItem(menu, tr("None"), NoneId);
    menu.addSeparator();
    addMenuItem(menu, tr("Browse..."), BrowseId);
    switch (runMenu(menu, position)) {
    case NoneId:
        selectPose(NoPose);
        break;
    case BrowseId:
        selectPose(browseForPose());
        break;
    default:
        break;
    }
}

QString SgMorphPoseItem::browseForPose() const {
    SgAppSettings settings;
    const QString directory = settings.getString(LastDirectoryKey, QString());
    const QString filter =
        tr("Pose files (*.%1 *.%2 *.%3 *.%4)")
            .arg(SgScript::s_VarnScriptBinaryExtension,
                 SgScript::s_VarnScriptEncryptedBinaryExtension,
                 SgScript::s_VarnScript1TextExtension, SgScript::s_VarnScript2TextExtension);
    QWidget *parent = sgApp->getInterface();
    QFileDialog dialog(parent ? parent : sgApp->getDialogParent(), tr("Choose a Pose file"),
                       sgExistingFolder(directory), filter);
    dialog.setObjectName(QStringLiteral("open file dialog"));
    dialog.setFileMode(QFileDialog::ExistingFile);
    QString path;
    if (dialog.exec() == QDialog::Accepted)
        path = dialog.selectedFiles().value(0);
    if (path.isEmpty())
        return NoPose;
    settings.setString(LastDirectoryKey, SgFileIO::getFilePath(path));
    return path;
}

void SgMorphPoseItem::setValueText(const QString &text) {
    selectPose(text);
}

void SgMorphPoseItem::dropped(QDropEvent *event) {
    QString file;
    for (const QUrl &url : event->mimeData()->urls()) {
        file = url.toLocalFile();
        if (!file.isEmpty())
            break;
    }
    if (file.isEmpty())
        return;
    event->acceptProposedAction();
    if (SgScript::isScriptFile(file)) {
        selectPose(file);
        return;
    }
    sgLoaderWarning(tr("Error loading files"),
                    tr("Some Files dropped in the Morph Loader could not be imported as Pose "
                       "files:") +
                        QStringLiteral("\n\t%1").arg(file));
}
