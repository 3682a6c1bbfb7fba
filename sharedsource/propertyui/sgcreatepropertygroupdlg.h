#pragma once

#include "sgcore/widgets/sgbasicdialog.h"

class QComboBox;
class QLineEdit;

// The dialog behind "Create..." of the property group menu: a box of the selection's group paths
// and an edit in which a path is picked (from the box) or typed. Accepting takes the edit's text
// as the group path; cancelling leaves the path as it was set.
class SgCreatePropertyGroupDlg : public SgBasicDialog {
    Q_OBJECT
public:
    SgCreatePropertyGroupDlg(QWidget *parent, const QString &name);
    ~SgCreatePropertyGroupDlg() override;

    // The group path: empty at first, set by `setGroupPath`, replaced by the edit's text on
    // acceptance.
    QString getGroup() const { return m_group; }
    // Sets the group path without touching the edit.
    void setGroupPath(const QString &group) { m_group = group; }

public slots:
    // Puts `group` into the path edit.
    void setGroup(QString group);

protected:
    void apply() override;

private:
    QString m_group;
    QLineEdit *m_pathEdit = nullptr;
    QComboBox *m_pathBox = nullptr;
};
