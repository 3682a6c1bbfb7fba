#include "sharedsource/engine/sgmorphloaderquestions.h"

#include "sgcore/app/sgapp.h"

#include <QCoreApplication>
#include <QInputDialog>
#include <QMessageBox>

namespace {

QString tr(const char *text) {
    return QCoreApplication::translate("SgMorphLoader", text);
}

class SgMorphLoaderDialogs final : public SgMorphLoaderQuestions {
public:
    bool askNewMorphName(const QString &name, QString &newName) override {
        bool ok = false;
        newName = QInputDialog::getText(
            sgApp ? sgApp->getDialogParent() : nullptr, tr("Morph Already Exists"),
            tr("A morph named \"%1\" already exists. Please enter a new name for the morph:")
                .arg(name),
            QLineEdit::Normal, QString(), &ok);
        return ok;
    }

    bool continueWithoutPose(const QString &poseFile, const QString &morphName) override {
        const QString text = tr("Failed to load the pose file: \n") + poseFile + "\n" +
                             tr("For the morph: ") + morphName + "\n\n" +
                             tr("Do you wish to continue loading this morph?");
        const auto answer =
            QMessageBox::question(nullptr, tr("Pose File Error"), text,
                                  QMessageBox::Ok | QMessageBox::No, QMessageBox::Ok);
        return answer == QMessageBox::Ok;
    }
};

} // namespace

SgMorphLoaderQuestions &SgMorphLoaderQuestions::dialogs() {
    static SgMorphLoaderDialogs instance;
    return instance;
}
