#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class QCheckBox;

// "Additional Options" of the float type: "Create as empty morph" and, enabled only while that
// is checked, "Create morph after joint".
class SgMorphOptionsPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgMorphOptionsPage(QWidget *parent);

    bool createAsMorph() const;
    // Where the empty morph goes in the modifier stack: -1 (the end) after the joint, else 0.
    int morphIndex() const;

    // "Create as empty morph" keeps its state across defaults, as the dialog always did; it is
    // saved and put back with the other values.
    void restoreDefaults() override {}
    void saveValues() override;
    void restoreValues() override;

private:
    QCheckBox *m_createAsMorph = nullptr;
    QCheckBox *m_afterJoint = nullptr;
    bool m_saved = false;
};
