#pragma once

#include <QDialog>

class QCheckBox;
class QLineEdit;

// "Preferences...": the application settings a user of the bridge needs, in the default group
// of the application settings:
//   "FacetorInstallPath"  the folder that holds the modeler program (used when the environment
//                         variable FACETOR_INSTALL_PATH is not set)
//   "FacetorBridgeTools"  1: returned geometry opens the "Target Importer" dialog; 0: the small
//                         "Action for" dialog
// The dialog shows the stored values; "OK" writes them, "Cancel" changes nothing.
class SgPreferencesDlg : public QDialog {
    Q_OBJECT
public:
    explicit SgPreferencesDlg(QWidget *parent = nullptr);

    QLineEdit *installPathEdit() const { return m_installPath; }
    QCheckBox *bridgeToolsBox() const { return m_bridgeTools; }

    // Writes the shown values into the application settings.
    void store() const;

    void accept() override;

private slots:
    void browse();

private:
    QLineEdit *m_installPath = nullptr;
    QCheckBox *m_bridgeTools = nullptr;
};
