#include "sgcore/widgets/sgnumberslider.h"

#include <QHBoxLayout>
#include <QLineEdit>
#include <QSignalBlocker>
#include <QSlider>
#include <algorithm>
#include <cmath>

SgNumberSlider::SgNumberSlider(QWidget *parent, const QString &name, bool integral, double rangeMin,
                               double rangeMax)
    : QWidget(parent), m_integral(integral), m_rangeMin(rangeMin), m_rangeMax(rangeMax) {
    setObjectName(name);
    auto *row = new QHBoxLayout(this);
    row->setContentsMargins(0, 0, 0, 0);
    m_text = new QLineEdit(this);
    m_text->setObjectName(name + QStringLiteral("Text"));
    m_text->setMaximumWidth(90);
    m_slider = new QSlider(Qt::Horizontal, this);
    m_slider->setObjectName(name + QStringLiteral("Slider"));
    m_slider->setRange(0, integral ? std::max(1, int(rangeMax - rangeMin)) : SliderSteps);
    row->addWidget(m_text);
    row->addWidget(m_slider, 1);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    connect(m_text, &QLineEdit::editingFinished, this, &SgNumberSlider::takeTypedText);
    connect(m_slider, &QSlider::valueChanged, this, &SgNumberSlider::takeSliderPosition);
    setTextEditable(true);
}

SgNumberSlider::~SgNumberSlider() = default;

bool SgNumberSlider::isTextEditable() const {
    return !m_text->isReadOnly();
}

void SgNumberSlider::setTextEditable(bool editable) {
    m_text->setReadOnly(!editable);
}

void SgNumberSlider::setNumber(double value) {
    if (m_integral)
        value = std::round(value);
    const bool changed = value != m_value;
    m_value = value;
    showNumber();
    if (changed)
        emit numberChanged(m_value);
}

void SgNumberSlider::setNumberRange(double rangeMin, double rangeMax) {
    if (!(rangeMin < rangeMax))
        return;
    m_rangeMin = rangeMin;
    m_rangeMax = rangeMax;
    if (m_integral) {
        // The handle moves to show the same value on the new span; it must not set the value.
        const QSignalBlocker blocker(m_slider);
        m_slider->setRange(0, int(std::min(rangeMax - rangeMin, 1.0e6)));
    }
    showNumber();
}

void SgNumberSlider::takeTypedText() {
    if (m_text->isReadOnly())
        return;
    // Text that still shows the current value changes nothing, so that rounding of the display
    // never alters a value that was set exactly.
    if (m_text->text() == formatNumber(m_value))
        return;
    double typed = 0.0;
    if (parseNumber(m_text->text().trimmed(), typed))
        setNumber(typed);
    else
        showNumber();
}

void SgNumberSlider::takeSliderPosition(int position) {
    if (m_showing)
        return;
    const double span = m_rangeMax - m_rangeMin;
    setNumber(m_rangeMin + span * position / m_slider->maximum());
}

void SgNumberSlider::showNumber() {
    m_showing = true;
    m_text->setText(formatNumber(m_value));
    const double span = m_rangeMax - m_rangeMin;
    const double fraction = std::clamp((m_value - m_rangeMin) / span, 0.0, 1.0);
    m_slider->setValue(int(std::lround(fraction * m_slider->maximum())));
    m_showing = false;
}
