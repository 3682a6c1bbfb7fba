#pragma once

#include <QPushButton>

// A two-state push button that shows one text per state ("No"/"Yes" by default). Clicking it
// flips the state; `toggled(bool)` reports every change, by click or by `setOn`.
class SgBoolButton : public QPushButton {
    Q_OBJECT
public:
    // `name` becomes the object name; `offText` and `onText` are the texts of the two states.
    // The button starts off.
    explicit SgBoolButton(QWidget *parent = nullptr, const QString &name = QString(),
                          const QString &offText = QStringLiteral("No"),
                          const QString &onText = QStringLiteral("Yes"));
    ~SgBoolButton() override;

    // The current state: true when on.
    bool isOn() const { return isChecked(); }

    // The texts shown for the off and on states.
    QString offText() const { return m_offText; }
    QString onText() const { return m_onText; }

    // Replaces the two texts and updates the shown one.
    void setStateTexts(const QString &offText, const QString &onText);

public slots:
    // Sets the state; emits `toggled` when it changes.
    void setOn(bool on) { setChecked(on); }

private:
    void showStateText();

    QString m_offText;
    QString m_onText;
};
