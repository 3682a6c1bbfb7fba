#pragma once

#include <QIcon>
#include <QProxyStyle>

// The host's widget style: the platform style plus the host's own pixmaps, available both through
// `standardIcon` (when the style is installed) and through the static accessors (always).
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
};
