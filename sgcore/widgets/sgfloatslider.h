#pragma once

#include "sgcore/widgets/sgnumberslider.h"

// The host's slider for a 32-bit float value, with a text field that accepts typed numbers when
// text editing is on (the default). The slider spans -1 to 1 until `setRange` changes it; values
// outside the span are kept as they are.
class SgFloatSlider : public SgNumberSlider {
    Q_OBJECT
public:
    explicit SgFloatSlider(QWidget *parent = nullptr, const QString &name = QString());
    ~SgFloatSlider() override;

    float getValue() const { return float(number()); }

    // The slider's span; ignored unless `min` < `max`.
    void setRange(float min, float max) { setNumberRange(min, max); }

public slots:
    // Sets the value exactly; emits `valueChanged` when it changes.
    void setValue(float value) { setNumber(value); }

signals:
    void valueChanged(float value);

protected:
    QString formatNumber(double value) const override;
    bool parseNumber(const QString &text, double &value) const override;
};
