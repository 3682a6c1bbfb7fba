#pragma once

#include <QIcon>
#include <QProxyStyle>

// The host's widget style: the platform style plus the host's own pixmaps, available both through
// `standardIcon` (when the style is installed) and through the static accessors (always), and
// the host's dialog spacing as its custom pixel metric. `SgApp` installs it as the application
// style when the application has widgets.
class SgStyle : public QProxyStyle {
    Q_OBJECT
public:
    // Custom standard pixmaps of the host.
    static constexpr int UpArrowPixmap = QStyle::SP_CustomBase + 0x11;
    static constexpr int DownArrowPixmap = QStyle::SP_CustomBase + 0x12;

    SgStyle();
    ~SgStyle() override;

    // The icon of one of the custom pixmaps above; a null icon for any other value.
    static QIcon customIcon(int pixmap);

    // The icon the host shows for an action name ("SgDeleteAction", "SgMoveUpAction",
    // "SgMoveDownAction"); a null icon for an unknown name.
    static QIcon actionIcon(const QString &actionName);

    QIcon standardIcon(StandardPixmap standardIcon, const QStyleOption *option = nullptr,
                       const QWidget *widget = nullptr) const override;

    // The host's custom metric (`PM_CustomBase`): the margin and spacing of the host's dialogs,
    // `DialogSpacing` pixels. Every other metric is the platform style's.
    static constexpr int DialogSpacing = 6;
    int pixelMetric(PixelMetric metric, const QStyleOption *option = nullptr,
                    const QWidget *widget = nullptr) const override;
};
