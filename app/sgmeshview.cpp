#include "app/sgmeshview.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QPainter>

#include <algorithm>
#include <vector>

namespace {

// The current geometry of a node the view draws, or null.
const SgVertexMesh *drawnGeometry(SgNode *node) {
    SgObject *object = node->getObject();
    if (object == nullptr || node->isHidden() || object->getCurrentShape() == nullptr)
        return nullptr;
    return object->getCachedGeom();
}

void drawEdges(QPainter &painter, const SgPolyMesh &mesh, const std::vector<QPointF> &mapped) {
    auto polygon = [&](const SgFaceCorner *corners, int count) {
        QPointF points[SgPolyMesh::kMaxPolygonCorners];
        int n = 0;
        for (int k = 0; k < count; ++k) {
            const int v = corners[k].vertex;
            if (v >= 0 && size_t(v) < mapped.size())
                points[n++] = mapped[size_t(v)];
        }
        if (n >= 2)
            painter.drawPolygon(points, n);
    };
    for (int i = 0; i < mesh.getTriangleCount(); ++i)
        polygon(mesh.getTriangleCorners(i), 3);
    for (int i = 0; i < mesh.getQuadCount(); ++i)
        polygon(mesh.getQuadCorners(i), 4);
    for (int i = 0; i < mesh.getPolygonCount(); ++i)
        polygon(mesh.getPolygonCorners(i), mesh.getPolygonCornerCount(i));
}

} // namespace

SgMeshView::SgMeshView(SgScene *scene, QWidget *parent) : QWidget(parent), m_scene(scene) {
    setObjectName(QStringLiteral("SgMeshView"));
    setAutoFillBackground(true);
    QPalette p = palette();
    p.setColor(QPalette::Window, QColor(40, 44, 52));
    setPalette(p);
    connect(m_scene, &SgScene::sceneUpdated, this, qOverload<>(&QWidget::update));
    connect(m_scene, &SgScene::selectionChanged, this, qOverload<>(&QWidget::update));
    connect(m_scene, &SgScene::nodeAdded, this, qOverload<>(&QWidget::update));
    connect(m_scene, &SgScene::nodeRemoved, this, qOverload<>(&QWidget::update));
}

bool SgMeshView::isSelected(const SgNode *node) const {
    return m_scene->isSelected(node) ||
           (node->getSkeleton() && m_scene->isSelected(node->getSkeleton()));
}

SgBox3 SgMeshView::boundsOf(bool selectedOnly) const {
    SgBox3 box;
    for (SgNode *node : m_scene->getNodes()) {
        if (selectedOnly && !isSelected(node))
            continue;
        if (const SgVertexMesh *geometry = drawnGeometry(node))
            for (const SgVec3 &p : geometry->vertices())
                box.extend(p);
    }
    return box;
}

void SgMeshView::frameAll() {
    m_frame = boundsOf(false);
    update();
}

void SgMeshView::frameSelection() {
    m_frame = boundsOf(true);
    if (m_frame.isEmpty())
        m_frame = boundsOf(false);
    update();
}

void SgMeshView::paintEvent(QPaintEvent *) {
    if (m_frame.isEmpty())
        m_frame = boundsOf(false);
    if (m_frame.isEmpty())
        return;
    const float width = std::max(m_frame.max.x - m_frame.min.x, 1e-6f);
    const float height = std::max(m_frame.max.y - m_frame.min.y, 1e-6f);
    const double margin = 12.0;
    const double scale =
        std::min((this->width() - 2 * margin) / width, (this->height() - 2 * margin) / height);
    const SgVec3 centre = m_frame.getCenter();

    // Unselected nodes first, the selected ones over them.
    std::vector<SgNode *> order;
    for (SgNode *node : m_scene->getNodes())
        if (!isSelected(node))
            order.push_back(node);
    const size_t firstSelected = order.size();
    for (SgNode *node : m_scene->getNodes())
        if (isSelected(node))
            order.push_back(node);

    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing, true);
    painter.setBrush(Qt::NoBrush);
    std::vector<QPointF> mapped;
    for (size_t n = 0; n < order.size(); ++n) {
        SgNode *node = order[n];
        const SgVertexMesh *geometry = drawnGeometry(node);
        if (geometry == nullptr)
            continue;
        const bool selected = n >= firstSelected;
        painter.setPen(selected ? QPen(QColor(255, 196, 64), 1.6) : QPen(QColor(120, 160, 200), 0));
        const std::vector<SgVec3> &points = geometry->vertices();
        mapped.resize(points.size());
        for (size_t i = 0; i < points.size(); ++i)
            mapped[i] = QPointF(this->width() / 2.0 + (points[i].x - centre.x) * scale,
                                this->height() / 2.0 - (points[i].y - centre.y) * scale);
        const auto *mesh =
            dynamic_cast<const SgPolyMesh *>(node->getObject()->getCurrentShape()->getGeometry());
        if (mesh && mesh->getFacetCount() <= kEdgeLimit)
            drawEdges(painter, *mesh, mapped);
        else
            painter.drawPoints(mapped.data(), int(mapped.size()));
    }
}
