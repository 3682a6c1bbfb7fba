#include "sgcore/widgets/sgstyle.h"

#include <QPainter>
#include <QPainterPath>
#include <QPixmap>

namespace {

constexpr int IconSize = 16;

QPixmap blankPixmap() {
    QPixmap pixmap(IconSize, IconSize);
    pixmap.fill(Qt::transparent);
    return pixmap;
}

// A filled triangle pointing up or down.
QIcon arrowIcon(bool up) {
    QPixmap pixmap = blankPixmap();
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    QPainterPath path;
    if (up) {
        path.moveTo(8, 3);
        path.lineTo(14, 12);
        path.lineTo(2, 12);
    } else {
        path.moveTo(2, 4);
        path.lineTo(14, 4);
        path.lineTo(8, 13);
    }
    path.closeSubpath();
    painter.fillPath(path, QColor(40, 40, 40));
    return QIcon(pixmap);
}

// A red cross.
QIcon deleteIcon() {
    QPixmap pixmap = blankPixmap();
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(QPen(QColor(200, 30, 30), 2.5, Qt::SolidLine, Qt::RoundCap));
    painter.drawLine(3, 3, 13, 13);
    painter.drawLine(13, 3, 3, 13);
    return QIcon(pixmap);
}

} // namespace

SgStyle::SgStyle() = default;

SgStyle::~SgStyle() = default;

QIcon SgStyle::customIcon(int pixmap) {
    if (pixmap == UpArrowPixmap)
        return arrowIcon(true);
    if (pixmap == DownArrowPixmap)
        return arrowIcon(false);
    return QIcon();
}

QIcon SgStyle::actionIcon(const QString &actionName) {
    if (actionName == QLatin1String("SgDeleteAction"))
        return deleteIcon();
    if (actionName == QLatin1String("SgMoveUpAction"))
        return arrowIcon(true);
    if (actionName == QLatin1String("SgMoveDownAction"))
        return arrowIcon(false);
    return QIcon();
}

QIcon SgStyle::standardIcon(StandardPixmap standardIcon, const QStyleOption *option,
                            const QWidget *widget) const {
    const QIcon custom = customIcon(standardIcon);
    if (!custom.isNull())
        return custom;
    return QProxyStyle::standardIcon(standardIcon, option, widget);
}

int SgStyle::pixelMetric(PixelMetric metric, const QStyleOption *option,
                         const QWidget *widget) const {
    if (metric == PM_CustomBase)
        return DialogSpacing;
    return QProxyStyle::pixelMetric(metric, option, widget);
}
