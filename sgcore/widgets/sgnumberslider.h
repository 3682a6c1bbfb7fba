#pragma once

#include <QWidget>

class QLineEdit;
class QSlider;

// Common part of the host's number sliders: a text field that shows the value (and accepts a typed
// value when text editing is on) beside a slider that spans a display range. The value itself is
// not limited by that range: a value outside it pins the slider at its end. The derived classes fix
// the number type (`SgFloatSlider`, `SgIntSlider`).
class SgNumberSlider : public QWidget {
    Q_OBJECT
public:
    ~SgNumberSlider() override;

    // Whether typed text is accepted. When off, the text field only shows the value.
    bool isTextEditable() const;
    void setTextEditable(bool editable);

    // The text field and the slider, for tests and for callers that style them.
    QLineEdit *textField() const { return m_text; }
    QSlider *slider() const { return m_slider; }

signals:
    // Emitted on every change of the value, by the user or by the program.
    void numberChanged(double value);

protected:
    // `integral` selects whole numbers; `rangeMin` < `rangeMax` is the slider's starting span.
    SgNumberSlider(QWidget *parent, const QString &name, bool integral, double rangeMin,
                   double rangeMax);

    double number() const { return m_value; }
    void setNumber(double value);
    void setNumberRange(double rangeMin, double rangeMax);
    double numberRangeMin() const { return m_rangeMin; }
    double numberRangeMax() const { return m_rangeMax; }

    // The text shown for a value, and the value read from typed text (false when it is no number).
    virtual QString formatNumber(double value) const = 0;
    virtual bool parseNumber(const QString &text, double &value) const = 0;

private:
    void takeTypedText();
    void takeSliderPosition(int position);
    void showNumber();

    static constexpr int SliderSteps = 1000;

    QLineEdit *m_text = nullptr;
    QSlider *m_slider = nullptr;
    bool m_integral = false;
    double m_value = 0.0;
    double m_rangeMin = 0.0;
    double m_rangeMax = 1.0;
    bool m_showing = false;
};
