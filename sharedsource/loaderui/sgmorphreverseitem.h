#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

class SgMorphPoseItem;

// The "Reverse Deformations:" row: whether the node's deformations are undone before the
// deltas are taken, with the dependent "Pose:" row, which is enabled, and accepts dropped
// files, only while it is yes.
class SgMorphReverseItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Creates "Pose:" below it (disabled, no dragging or dropping) and then shows the
    // loader's current choice.
    SgMorphReverseItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Enables "Pose:" and its dragging and dropping with the value, and writes it into the
    // loader.
    void setValue(bool on) override;
    int settingType() const override { return 10; }
    QString settingKey() const override { return QStringLiteral("ReverseDeformations"); }

    SgMorphPoseItem *poseItem() const { return m_pose; }

private:
    SgMorphPoseItem *m_pose;
};
