#pragma once

#include <QDialog>

class QDialogButtonBox;
class QVBoxLayout;

// The host's base for modal dialogs: a body that callers fill with `addWidget`, and an
// "Ok"/"Cancel" button row below it. Accepting the dialog calls `apply()` before the dialog
// closes, so `exec()` returns 1 only after `apply()` has run.
class SgBasicDialog : public QDialog {
    Q_OBJECT
public:
    // `name` becomes the dialog's object name.
    explicit SgBasicDialog(QWidget *parent = nullptr, const QString &name = QString());
    ~SgBasicDialog() override;

    // Appends a widget to the dialog's body, above the button row.
    void addWidget(QWidget *widget);

    // The body layout, for callers that lay out more than a list of widgets.
    QVBoxLayout *bodyLayout() const { return m_body; }

    // The "Ok"/"Cancel" button box.
    QDialogButtonBox *buttonBox() const { return m_buttons; }

public slots:
    // Calls `apply()` and then closes the dialog with the result Accepted.
    void accept() override;

protected:
    // Takes the values out of the widgets; called on acceptance. The base does nothing.
    virtual void apply();

private:
    QVBoxLayout *m_body = nullptr;
    QDialogButtonBox *m_buttons = nullptr;
};
