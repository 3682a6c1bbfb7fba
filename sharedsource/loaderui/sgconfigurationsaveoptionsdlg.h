#pragma once

#include "sgcore/widgets/sgbasicdialog.h"

class QCheckBox;
class QGroupBox;
class QRadioButton;

// "Project Save Options": asks, before a project configuration is saved, whether each source's
// own object configuration is written too and whether paths are stored relative to the
// project's folder or absolute. The widgets always start checked on "Save Object
// Configurations" and "Save with Relative Paths"; the answers are read after `exec`.
class SgConfigurationSaveOptionsDlg : public SgBasicDialog {
    Q_OBJECT
public:
    explicit SgConfigurationSaveOptionsDlg(QWidget *parent);
    ~SgConfigurationSaveOptionsDlg() override;

    bool saveObjectConfigurations() const { return m_saveObjectConfigurations; }
    bool relativePaths() const { return m_relativePaths; }
    // Whether the user accepted the dialog.
    bool applied() const { return m_applied; }

protected:
    // Takes the answers out of the widgets.
    void apply() override;

private:
    bool m_saveObjectConfigurations = true;
    bool m_relativePaths = true;
    bool m_applied = false;
    QGroupBox *m_options = nullptr;
    QRadioButton *m_relative = nullptr;
    QRadioButton *m_absolute = nullptr;
    QCheckBox *m_saveObjects = nullptr;
};
