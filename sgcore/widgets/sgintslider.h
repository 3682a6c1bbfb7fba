#pragma once

#include "sgcore/widgets/sgnumberslider.h"

// The host's slider for a 32-bit signed integer value, with a text field that accepts typed
// numbers when text editing is on (the default). The slider spans -10 to 10 until `setRange`
// changes it; values outside the span are kept as they are.
class SgIntSlider : public SgNumberSlider {
    Q_OBJECT
public:
    explicit SgIntSlider(QWidget *parent = nullptr, const QString &name = QString());
    ~SgIntSlider() override;

    int getValue() const { return int(number()); }

    // The slider's span; ignored unless `min` < `max`.
    void setRange(int min, int max) { setNumberRange(min, max); }

public slots:
    // Sets the value; emits `valueChanged` when it changes.
    void setValue(int value) { setNumber(value); }

signals:
    void valueChanged(int value);

protected:
    QString formatNumber(double value) const override;
    bool parseNumber(const QString &text, double &value) const override;
};
