#pragma once

#include "sgcore/geometry/sgbox3.h"

#include <QWidget>

#include <vector>

class SgNode;
class SgScene;

// A plain front view (x to the right, y up) of the scene's current geometry, morphs and poses
// applied, drawn as facet edges. Meshes above `kEdgeLimit` facets are drawn as points.
//
// Framing: the view shows a fixed box of the scene, fitted to the widget, so that a morph
// that grows or shrinks the figure shows as a change of size (the view does not refit on
// every change). The box is set by `frameAll` (every visible node) and `frameSelection` (the
// selected nodes; a selected figure brings its bones), and is fitted to the first geometry
// the view shows.
//
// The selected nodes are drawn last, in a bright colour and a wider line, so that a prop
// placed over a figure never hides the selected one.
class SgMeshView : public QWidget {
    Q_OBJECT
public:
    static constexpr int kEdgeLimit = 200000;

    explicit SgMeshView(SgScene *scene, QWidget *parent = nullptr);

    QSize sizeHint() const override { return {480, 480}; }

    // The scene box the view shows (empty until framed).
    SgBox3 framedBox() const { return m_frame; }

public slots:
    // Frames every visible node with geometry; with none, the next geometry shown is framed.
    void frameAll();
    // Frames the selected nodes; with nothing selected (or nothing to draw) frames all.
    void frameSelection();

protected:
    void paintEvent(QPaintEvent *event) override;

private:
    bool isSelected(const SgNode *node) const;
    // The box of the drawable nodes, only the selected ones with `selectedOnly`.
    SgBox3 boundsOf(bool selectedOnly) const;

    SgScene *m_scene;
    SgBox3 m_frame;
};
