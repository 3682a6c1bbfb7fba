#include "app/sgmeshview.h"

#include "sgcore/geometry/sgbox3.h"
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
struct Drawn {
    const SgNode *node;
    std::vector<SgVec3> points;
    const SgPolyMesh *facets;
};

void drawEdges(QPainter &painter, const Drawn &item, const std::vector<QPointF> &mapped) {
    const SgPolyMesh *mesh = item.facets;
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
    for (int i = 0; i < mesh->getTriangleCount(); ++i)
        polygon(mesh->getTriangleCorners(i), 3);
    for (int i = 0; i < mesh->getQuadCount(); ++i)
        polygon(mesh->getQuadCorners(i), 4);
    for (int i = 0; i < mesh->getPolygonCount(); ++i)
        polygon(mesh->getPolygonCorners(i), mesh->getPolygonCornerCount(i));
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

void SgMeshView::paintEvent(QPaintEvent *) {
    std::vector<Drawn> items;
    SgBox3 box;
    for (SgNode *node : m_scene->getNodes()) {
        SgObject *object = node->getObject();
        if (object == nullptr || node->isHidden() || object->getCurrentShape() == nullptr)
            continue;
        const SgVertexMesh *current = object->getCachedGeom();
        if (current == nullptr)
            continue;
        Drawn item{node, current->vertices(),
                   dynamic_cast<const SgPolyMesh *>(object->getCurrentShape()->getGeometry())};
        for (const SgVec3 &p : item.points)
            box.extend(p);
        items.push_back(std::move(item));
    }
    if (items.empty() || box.isEmpty())
        return;
    const float width = std::max(box.max.x - box.min.x, 1e-6f);
    const float height = std::max(box.max.y - box.min.y, 1e-6f);
    const double margin = 12.0;
    const double scale =
        std::min((this->width() - 2 * margin) / width, (this->height() - 2 * margin) / height);
    const double cx = (box.min.x + box.max.x) / 2.0;
    const double cy = (box.min.y + box.max.y) / 2.0;

    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing, true);
    painter.setBrush(Qt::NoBrush);
    for (const Drawn &item : items) {
        const bool selected =
            m_scene->isSelected(item.node) ||
            (item.node->getSkeleton() && m_scene->isSelected(item.node->getSkeleton()));
        painter.setPen(QPen(selected ? QColor(255, 196, 64) : QColor(150, 190, 230), 0));
        std::vector<QPointF> mapped(item.points.size());
        for (size_t i = 0; i < item.points.size(); ++i)
            mapped[i] = QPointF(this->width() / 2.0 + (item.points[i].x - cx) * scale,
                                this->height() / 2.0 - (item.points[i].y - cy) * scale);
        if (item.facets && item.facets->getFacetCount() <= kEdgeLimit)
            drawEdges(painter, item, mapped);
        else
            painter.drawPoints(mapped.data(), int(mapped.size()));
    }
}
