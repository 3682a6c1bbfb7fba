#include "sgcore/widgets/sgintslider.h"

SgIntSlider::SgIntSlider(QWidget *parent, const QString &name)
    : SgNumberSlider(parent, name, true, -10.0, 10.0) {
    connect(this, &SgNumberSlider::numberChanged, this,
            [this](double value) { emit valueChanged(int(value)); });
    setNumber(0.0);
}

SgIntSlider::~SgIntSlider() = default;

QString SgIntSlider::formatNumber(double value) const {
    return QString::number(qint64(value));
}

bool SgIntSlider::parseNumber(const QString &text, double &value) const {
    bool ok = false;
    const int parsed = text.toInt(&ok);
    if (!ok)
        return false;
    value = parsed;
    return true;
}
