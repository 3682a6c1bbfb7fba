#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Pose:" row: a pose script that the run applies before loading the source, used only
// while "Reverse Deformations:" is yes. The file is chosen with a file dialog or dropped onto
// the row.
class SgMorphPoseItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Shows "None".
    SgMorphPoseItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows `path` and stores it as the pose file ("None" for no pose).
    void selectPose(const QString &path);

    // Only while enabled: a popup with "None" (no pose) and "Browse...", which opens a file
    // dialog in the remembered "LastDirectory" and remembers the chosen file's folder.
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 17; }
    QString settingKey() const override { return QStringLiteral("Pose"); }
    QString valueText() const override { return text(1); }
    // `selectPose`.
    void setValueText(const QString &text) override;
    // Takes the first dropped local file as the pose when it is a script file; otherwise warns
    // with "Error loading files" and keeps the pose.
    void dropped(QDropEvent *event) override;

private:
    QString browseForPose() const;
};
