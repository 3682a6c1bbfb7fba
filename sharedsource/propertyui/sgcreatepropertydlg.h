#pragma once

#include <QDialog>
#include <QList>
#include <QPoint>
#include <QStringList>
#include <optional>

#include "sgcore/scene/sglistiterator.h"

class QComboBox;
class QGroupBox;
class QGridLayout;
class QLabel;
class QLineEdit;
class QTreeWidgetItem;
class QVBoxLayout;
class SgBoolButton;
class SgBoolPropertyPage;
class SgColorPropertyPage;
class SgElement;
class SgEnumPropertyPage;
class SgFloatPropertyPage;
class SgImagePropertyPage;
class SgIntPropertyPage;
class SgMorphOptionsPage;
class SgNode;
class SgNodePropertyPage;
class SgNumericNodePropertyPage;
class SgNumericPropertyPage;
class SgProperty;
class SgPropertyPage;
class SgSkeleton;

// The modal dialog in which the user defines one new property: its type (one of nine), its
// identity (path, name, label) and the attributes of its type. On "Create" the input is validated;
// with create-on-accept the dialog then creates one property on every creation node, otherwise it
// only closes accepted and the caller asks `createProperty` for one unattached property.
//
// The dialog holds the base attributes (path, name, label, hidden, locked, can animate) and
// dispatches the rest to its pages (`SgPropertyPage`), one per group box: each page builds its
// rows, restores its defaults, saves and restores its values, and validates and configures the
// property of the types that show it. The window title is set at construction and kept current,
// so that the dialog run with `exec` shows it too.
//
// Every node, texture and property pointer the dialog holds is non-owning. Properties returned by
// `createProperty` belong to the caller; properties added to nodes belong to the nodes.
class SgCreatePropertyDlg : public QDialog {
    Q_OBJECT
public:
    // The type box's indices.
    enum PropertyType {
        FloatType = 0,
        IntType,
        BoolType,
        ColorType,
        EnumType,
        ImageType,
        NodeType,
        SkeletonType,
        NumericNodeType,
    };

    // The text of the enum list's placeholder row.
    static QString enumPlaceholderText();

    // `singleType` hides the type row and names the type in the title; `type` is the starting
    // type; `createOnAccept` creates on the creation nodes when "Create" succeeds;
    // `resetValuesOnShow` restores the defaults each time the dialog is shown through `show`.
    SgCreatePropertyDlg(QWidget *parent, const QString &name, bool singleType, int type,
                        bool createOnAccept, bool resetValuesOnShow);
    ~SgCreatePropertyDlg() override;

    // Sets the window title, restores the defaults when `resetValuesOnShow` is set, updates the
    // pages, saves the current values and shows the dialog. `exec` does none of this.
    virtual void show();

    // The current type (the type box's index) and the creation nodes, for callers and tests.
    int currentType() const;
    const QList<SgNode *> &getCreationNodes() const { return m_creationNodes; }

public slots:
    void setCreateOnAccept(bool create);
    void setResetValuesOnShow(bool reset);
    // Puts `name` into the name edit; it survives the next restore of defaults once.
    void setDefaultName(QString name);
    // Puts `name` into the label edit; it survives the next restore of defaults once.
    void setDefaultLabel(QString name);
    // Replaces the path defaults by `list` and selects its first item (or "" for an empty list).
    void setPathDefaults(QStringList list);
    // Path defaults from the creation nodes: every path of the first node's group tree and the
    // first path of every further node's tree, each once, sorted.
    void setPathDefaults();
    // Selects `path` in the path defaults (appending it when absent) and puts it into the path
    // edit.
    void setDefaultPath(QString path);
    // Hides (true) or shows the path edit and its label; the path defaults box stays.
    void setPathReadOnly(bool readOnly);
    // Replaces the creation nodes by `list`, in order, without null entries and repeats.
    void setCreationNodes(SgNodeList &list);
    // Appends `node` unless it is null or already a creation node.
    void insertCreationNode(SgNode *node);
    // Makes `node` the only creation node unless it is null.
    void setCreationNode(SgNode *node);
    // Give the nodes (or skeletons) that the node and default node menus offer for the node
    // (skeleton) type, in place of every node (skeleton) of the scene. The menus are refilled at
    // once when that type is current.
    void setNodeMenu(SgNodeListIterator &nodes);
    void setNodeMenu(SgNodeList &nodes);
    void setSkeletonMenu(SgSkeletonListIterator &skels);
    void setSkeletonMenu(SgSkeletonList &skels);
    // Validates and, on success, creates one property (or empty morph) on every creation node.
    // A node that refuses it gets a warning; the others still get theirs.
    void createProperties();
    // One new, unattached property configured from the dialog; `owner`, when given, receives the
    // new morph of "Create as empty morph" (else null). Null when the morph has no value channel.
    SgProperty *createProperty(SgElement **owner);
    SgProperty *createProperty();

private slots:
    bool validate();
    void autoFillPropLabel();
    void acceptButtonClicked();
    void updateDisplay();
    void saveCurrentValues();
    void resetValues();
    void beginRenameEnum(QTreeWidgetItem *item, QPoint, int col);
    void renameEnum(QTreeWidgetItem *item, int col, QString text);
    void moveEnumUp();
    void moveEnumDown();
    void removeEnum();
    void addDefaultEnumItem();

protected:
    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    // The base attributes' values as saved when the dialog is shown.
    struct BaseValues {
        QString path, name, label;
        bool hidden = false, locked = false, canAnimate = true;
    };

    void buildTypeRow();
    void buildBasePage();
    void buildPages();
    void buildButtonRow();
    void connectEnumEditor();
    void alignLabelColumns();
    void updateTitle();
    // The pages the current type shows, in the dialog's order.
    QList<SgPropertyPage *> pagesOfType(int type) const;
    QList<SgPropertyPage *> allPages() const;

    void restoreDefaults();
    void fillChoosers();
    SgProperty *createTypedProperty(SgElement **owner) const;
    void configureBase(SgProperty *property) const;
    void warn(const QString &text);
    QList<SgNode *> sceneNodes() const;
    QList<SgNode *> sceneSkeletons() const;

    // Type row, base attributes, button row and main layout.
    QWidget *m_typeRow = nullptr;
    QGroupBox *m_basePage = nullptr, *m_buttonRow = nullptr;
    QVBoxLayout *m_mainLayout = nullptr;
    QComboBox *m_typeBox = nullptr;
    QComboBox *m_pathDefaults = nullptr;
    SgBoolButton *m_hidden = nullptr, *m_locked = nullptr, *m_canAnimate = nullptr;
    QLineEdit *m_pathEdit = nullptr, *m_nameEdit = nullptr, *m_labelEdit = nullptr;
    QLabel *m_pathLabel = nullptr;
    QList<QLabel *> m_baseLabels;

    // The pages, in the dialog's order.
    SgImagePropertyPage *m_imagePage = nullptr;
    SgNodePropertyPage *m_nodePage = nullptr;
    SgNumericPropertyPage *m_numericPage = nullptr;
    SgFloatPropertyPage *m_floatPage = nullptr;
    SgNumericNodePropertyPage *m_numericNodePage = nullptr;
    SgIntPropertyPage *m_intPage = nullptr;
    SgBoolPropertyPage *m_boolPage = nullptr;
    SgColorPropertyPage *m_colorPage = nullptr;
    SgEnumPropertyPage *m_enumPage = nullptr;
    SgMorphOptionsPage *m_morphOptionsPage = nullptr;

    bool m_singleType = false;
    bool m_defaultLabelSet = false;
    bool m_defaultNameSet = false;
    QList<SgNode *> m_creationNodes;
    bool m_createOnAccept = false;
    bool m_resetValuesOnShow = false;

    // Caller-given contents of the node and default node menus (none: the scene's).
    std::optional<QList<SgNode *>> m_nodeMenuNodes;
    std::optional<QList<SgNode *>> m_skeletonMenuNodes;

    BaseValues m_saved;
};
