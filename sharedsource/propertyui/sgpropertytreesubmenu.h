#pragma once

#include <QList>
#include <QMenu>
#include <QString>

class SgElement;
class SgNumericProperty;
class SgPropertyGroup;

// One level of the property tree menu: "Create...", a separator, one sub-menu per child group
// (ids 4096 upward) and one entry per numeric property of the group (ids 0 upward, dense over the
// listed properties; other properties are skipped). A choice anywhere below reaches the top level
// through the re-emitted `propertySelected` and `createProperty` signals.
class SgPropertyTreeSubMenu : public QMenu {
    Q_OBJECT
public:
    static constexpr int FirstGroupId = 4096;
    static constexpr int CreateId = 0x2000;
    static constexpr int NoneId = 0x3000;
    static constexpr int TextId = 0x4000;

    // A group level: lists `group` (when given) and takes its path.
    SgPropertyTreeSubMenu(SgPropertyGroup *group, QWidget *parent, const QString &name);
    // The top level: "Create...", the entry `text` and the top-level groups of `element`'s tree
    // ("- none -" without an element). Its path is empty and it lists no properties.
    SgPropertyTreeSubMenu(const QString &text, SgElement *element, QWidget *parent,
                          const QString &name);
    ~SgPropertyTreeSubMenu() override;

    // The level's group path (empty at the top level) and its listed properties, in item order.
    QString groupPath() const { return m_path; }
    const QList<SgNumericProperty *> &levelProperties() const { return m_properties; }

signals:
    void propertySelected(SgNumericProperty *prop);
    void createProperty(QString group);

private slots:
    void itemActivated(int id);

private:
    QAction *addItem(const QString &text, int id);
    void addGroupMenus(SgPropertyGroup *firstGroup);
    void buildGroupLevel(SgPropertyGroup *group);

    QString m_path;
    QList<SgNumericProperty *> m_properties;
};
