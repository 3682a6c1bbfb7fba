#include "sgcore/widgets/sgcolorwgt.h"

#include <QColorDialog>

SgColorWgt::SgColorWgt(QWidget *parent, const QString &name) : QPushButton(parent) {
    setObjectName(name);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    connect(this, &QPushButton::clicked, this, &SgColorWgt::pickColor);
    showColor();
}

SgColorWgt::~SgColorWgt() = default;

void SgColorWgt::setColor(const QColor &color) {
    if (color == m_color)
        return;
    m_color = color;
    showColor();
    emit colorChanged(m_color);
}

void SgColorWgt::pickColor() {
    const QColor picked = QColorDialog::getColor(m_color, this);
    if (picked.isValid())
        setColor(picked);
}

void SgColorWgt::showColor() {
    setText(m_color.name());
    // The text takes the contrasting shade so that it stays readable on any fill.
    const QString ink =
        m_color.lightness() < 128 ? QStringLiteral("white") : QStringLiteral("black");
    setStyleSheet(QStringLiteral("background-color: %1; color: %2;").arg(m_color.name(), ink));
}
