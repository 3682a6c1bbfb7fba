#pragma once

#include <QWidget>

class SgNode;
class SgScene;

// A plain front view (x to the right, y up) of the scene's current geometry, morphs and poses
// applied, drawn as facet edges fitted to the widget; the selected nodes are highlighted. It is
// enough to see a morph move as its slider moves. Meshes above `kEdgeLimit` facets are drawn as
// points.
class SgMeshView : public QWidget {
    Q_OBJECT
public:
    static constexpr int kEdgeLimit = 200000;

    explicit SgMeshView(SgScene *scene, QWidget *parent = nullptr);

    QSize sizeHint() const override { return {480, 480}; }

protected:
    void paintEvent(QPaintEvent *event) override;

private:
    SgScene *m_scene;
};
