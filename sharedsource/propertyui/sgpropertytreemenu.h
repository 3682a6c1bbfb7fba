#pragma once

#include "sharedsource/propertyui/sgpropertytreesubmenu.h"

#include <QPoint>

// The chooser of a morph's control property: the element's property groups as nested sub-menus
// of their numeric properties, an entry (the construction text) that selects no separate
// property, and "Create..." at every level, which opens the Create Property dialog preset to the
// level's path ("Morphs/Morph Loader" at the top). A created property is not added to the element:
// `chooseProperty` hands it to the caller, who owns it from then on.
class SgPropertyTreeMenu : public SgPropertyTreeSubMenu {
    Q_OBJECT
public:
    // The path preset of a property created from the top level.
    static QString defaultCreatePath();

    SgPropertyTreeMenu(const QString &text, SgElement *element, QWidget *parent,
                       const QString &name);
    ~SgPropertyTreeMenu() override;

    // Runs the menu modally at `position`. A dismissed menu returns `current`; any chosen item
    // returns the selected property: `current` unless the item selected another one (null for the
    // construction-text entry, the new property after a successful "Create...").
    SgNumericProperty *chooseProperty(SgNumericProperty *current, const QPoint &position);

private slots:
    void setSelectedProperty(SgNumericProperty *prop);
    void doCreateProperty(QString group);

private:
    QString m_text;
    SgElement *m_element = nullptr;
    SgNumericProperty *m_selected = nullptr;
};
