#pragma once

#include <QGroupBox>
#include <QList>

class QGridLayout;
class QLabel;
class SgBoolButton;

// One page of the Create Property dialog: a group box whose grid has a label in column 0 and
// the editing widget in column 1 on each row. A page builds its rows, restores its defaults,
// saves the values shown when the dialog is shown and puts them back on "Cancel"; the pages of
// a type also validate and configure the property the dialog creates.
//
// Labels are at least `LabelWidth` wide and as wide as their text needs; the dialog gives the
// labels of all pages one common width so that the editing widgets line up.
class SgPropertyPage : public QGroupBox {
    Q_OBJECT
public:
    static constexpr int LabelWidth = 100;

    SgPropertyPage(QWidget *parent, const QString &title, const QString &name);
    ~SgPropertyPage() override;

    // The labels of the page's rows.
    const QList<QLabel *> &rowLabels() const { return m_labels; }

    virtual void restoreDefaults() = 0;
    virtual void saveValues() = 0;
    virtual void restoreValues() = 0;

protected:
    QGridLayout *grid() const { return m_grid; }
    // Adds the row `row` with a label and `widget`; a widget of fixed width sits at the start of
    // its column.
    QLabel *addRow(int row, const QString &text, const QString &labelName, QWidget *widget);
    // A two-state button `LabelWidth` wide reading `offText`/`onText` ("No"/"Yes").
    SgBoolButton *newStateButton(const QString &name, const QString &offText,
                                 const QString &onText);
    SgBoolButton *newYesNoButton(const QString &name);

private:
    QGridLayout *m_grid = nullptr;
    QList<QLabel *> m_labels;
};
