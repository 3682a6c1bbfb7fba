#pragma once

#include "sgcore/widgets/sgbasicdialog.h"

#include <QString>

class QCheckBox;
class QComboBox;
class QLineEdit;
class SgNode;

// Asks what to do with geometry that came back from the modeler for one scene node: make a
// morph, a prop, a morph plus a copy of the materials, or only the copy; for a morph also its
// name, its property group path and whether an existing morph of that name is overridden.
// The dialog only collects the answer; the caller reads it after exec() returned 1.
class SgBridgeMorphDlg : public SgBasicDialog {
    Q_OBJECT
public:
    // `label` is the node's label (shown in the title); `node` may be null, in which case only
    // the default group path is offered.
    SgBridgeMorphDlg(const QString &label, QWidget *parent, SgNode *node);
    ~SgBridgeMorphDlg() override;

    // Values taken on acceptance.
    const QString &getMorphName() const { return m_morphName; }
    // The group path with backslashes turned into "/".
    const QString &getGroupPath() const { return m_groupPath; }
    // One of "Create Morph", "Create Prop", "Create Morph And Copy Materials", "Copy Materials";
    // kept current while the user picks.
    const QString &getActionText() const { return m_action; }
    bool getOverride() const { return m_override; }

protected slots:
    // Keeps the chosen action and enables the morph controls only for a morph action.
    void actionChanged(const QString &text);

protected:
    void apply() override;

private:
    // "Ok" is enabled unless a morph action is chosen with a blank morph name.
    void updateOkButton();

    QString m_morphName;
    QString m_groupPath;
    QString m_action;
    bool m_override = false;
    QComboBox *m_groupCombo = nullptr;
    QComboBox *m_actionCombo = nullptr;
    QLineEdit *m_nameEdit = nullptr;
    QCheckBox *m_overrideBox = nullptr;
};
