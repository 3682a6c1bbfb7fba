#include "sgcore/widgets/sgenumslider.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QSlider>

SgEnumSlider::SgEnumSlider(QWidget *parent, const QString &name) : QWidget(parent) {
    setObjectName(name);
    auto *row = new QHBoxLayout(this);
    row->setContentsMargins(0, 0, 0, 0);
    m_label = new QLabel(this);
    m_label->setMinimumWidth(90);
    m_slider = new QSlider(Qt::Horizontal, this);
    row->addWidget(m_label);
    row->addWidget(m_slider, 1);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    connect(m_slider, &QSlider::valueChanged, this, [this](int position) {
        if (!m_showing)
            setCurrent(position);
    });
    showItems();
}

SgEnumSlider::~SgEnumSlider() = default;

int SgEnumSlider::addItem(const QString &label) {
    m_items.append(label);
    if (m_current < 0)
        setCurrent(0);
    else
        showItems();
    return count() - 1;
}

bool SgEnumSlider::renameItem(int index, const QString &label) {
    if (index < 0 || index >= count())
        return false;
    m_items[index] = label;
    showItems();
    return true;
}

bool SgEnumSlider::removeItem(int index) {
    if (index < 0 || index >= count())
        return false;
    m_items.removeAt(index);
    int current = m_current;
    if (current > index || current >= count())
        --current;
    if (current != m_current)
        setCurrent(current);
    else
        showItems();
    return true;
}

void SgEnumSlider::clear() {
    m_items.clear();
    setCurrent(-1);
}

void SgEnumSlider::setCurrentIndex(int index) {
    if (index >= 0 && index < count())
        setCurrent(index);
}

void SgEnumSlider::setCurrent(int index) {
    const bool changed = index != m_current;
    m_current = index;
    showItems();
    if (changed)
        emit currentIndexChanged(m_current);
}

void SgEnumSlider::showItems() {
    m_showing = true;
    m_slider->setEnabled(count() > 1);
    m_slider->setRange(0, std::max(0, count() - 1));
    m_slider->setValue(std::max(0, m_current));
    m_label->setText(m_items.value(m_current));
    m_showing = false;
}
