#include "sgcore/widgets/sgfloatslider.h"

#include <cmath>
#include <limits>

SgFloatSlider::SgFloatSlider(QWidget *parent, const QString &name)
    : SgNumberSlider(parent, name, false, -1.0, 1.0) {
    connect(this, &SgNumberSlider::numberChanged, this,
            [this](double value) { emit valueChanged(float(value)); });
    setNumber(0.0);
}

SgFloatSlider::~SgFloatSlider() = default;

QString SgFloatSlider::formatNumber(double value) const {
    return QString::number(float(value), 'g', 6);
}

bool SgFloatSlider::parseNumber(const QString &text, double &value) const {
    bool ok = false;
    const float parsed = float(text.toDouble(&ok));
    if (!ok || !std::isfinite(parsed))
        return false;
    value = parsed;
    return true;
}
