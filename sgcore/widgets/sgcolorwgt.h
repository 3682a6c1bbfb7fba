#pragma once

#include <QColor>
#include <QPushButton>

// The host's colour field: a button filled with the colour; clicking it opens the colour picker.
class SgColorWgt : public QPushButton {
    Q_OBJECT
public:
    // Starts black.
    explicit SgColorWgt(QWidget *parent = nullptr, const QString &name = QString());
    ~SgColorWgt() override;

    QColor getColor() const { return m_color; }

public slots:
    // Sets the colour; emits `colorChanged` when it changes.
    void setColor(const QColor &color);

    // Opens the modal colour picker and takes its colour unless it is cancelled.
    void pickColor();

signals:
    void colorChanged(const QColor &color);

private:
    void showColor();

    QColor m_color = Qt::black;
};
