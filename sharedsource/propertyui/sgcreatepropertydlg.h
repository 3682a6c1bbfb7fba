#pragma once

#include <QColor>
#include <QDialog>
#include <QList>
#include <QPoint>
#include <QStringList>
#include <optional>

#include "sgcore/scene/sglistiterator.h"

class QCheckBox;
class QComboBox;
class QGroupBox;
class QGridLayout;
class QLabel;
class QLineEdit;
class QTreeWidget;
class QTreeWidgetItem;
class QVBoxLayout;
class SgBoolButton;
class SgColorWgt;
class SgElement;
class SgEnumSlider;
class SgFloatSlider;
class SgImageMenu;
class SgIntSlider;
class SgNode;
class SgNodeMenu;
class SgProperty;
class SgSkeleton;
class SgTexture;

// The modal dialog in which the user defines one new property: its type (one of nine), its
// identity (path, name, label) and the attributes of its type. On "Create" the input is validated;
// with create-on-accept the dialog then creates one property on every creation node, otherwise it
// only closes accepted and the caller asks `createProperty` for one unattached property.
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
    struct SavedValues {
        QString path, name, label;
        bool hidden = false, locked = false, canAnimate = true, obeyLimits = true;
        bool displayAsPercent = true, boolValue = false, boolDefault = false, requiresNode = false;
        bool emptyMorph = false;
        float floatValue = 0, floatDefault = 0, floatMin = -1, floatMax = 1, floatSensitivity = 0;
        qint32 intValue = 0, intDefault = 0, intMin = -1, intMax = 1, intSensitivity = 1;
        qint32 enumValue = 0, enumDefault = 0;
        QColor color, defaultColor;
        QStringList enumLabels;
        SgTexture *image = nullptr;
        SgNode *node = nullptr, *defaultNode = nullptr, *numericNode = nullptr;
    };

    // Page building.
    QGroupBox *newPage(const QString &title, const QString &name, QGridLayout *&grid);
    QLabel *addRow(QGridLayout *grid, int row, const QString &text, const QString &labelName,
                   QWidget *widget);
    SgBoolButton *newYesNoButton(QWidget *parent, const QString &name);
    SgFloatSlider *newFloatSlider(QWidget *parent, const QString &name);
    SgIntSlider *newIntSlider(QWidget *parent, const QString &name, bool textEditable);
    void buildTypeRow();
    void buildBasePage();
    void buildImagePage();
    void buildNodePage();
    void buildNumericPage();
    void buildFloatPage();
    void buildNumericNodePage();
    void buildIntPage();
    void buildBoolPage();
    void buildColorPage();
    void buildEnumPage();
    void buildAdditionalOptionsPage();
    void buildButtonRow();
    void alignLabelColumns();

    // State.
    void restoreDefaults();
    void clearEnumList();
    QStringList enumLabels() const;
    QTreeWidgetItem *enumPlaceholder() const;
    void renumberEnumRows();
    void swapEnumLabels(QTreeWidgetItem *upper, QTreeWidgetItem *lower);
    void fillChoosers();
    void configureFloat(SgProperty *property) const;
    void configureBase(SgProperty *property) const;
    void warn(const QString &text);
    QList<SgNode *> sceneNodes() const;
    QList<SgNode *> sceneSkeletons() const;

    // Pages, type row and main layout.
    QWidget *m_typeRow = nullptr;
    QGroupBox *m_basePage = nullptr, *m_imagePage = nullptr, *m_nodePage = nullptr;
    QGroupBox *m_numericPage = nullptr, *m_floatPage = nullptr, *m_numericNodePage = nullptr;
    QGroupBox *m_intPage = nullptr, *m_boolPage = nullptr, *m_colorPage = nullptr;
    QGroupBox *m_enumPage = nullptr, *m_additionalOptionsPage = nullptr, *m_buttonRow = nullptr;
    QVBoxLayout *m_mainLayout = nullptr;

    QComboBox *m_typeBox = nullptr;
    QComboBox *m_pathDefaults = nullptr;
    QCheckBox *m_createAsMorph = nullptr;
    QCheckBox *m_createAfterJoint = nullptr;

    bool m_singleType = false;
    bool m_defaultLabelSet = false;
    bool m_defaultNameSet = false;
    QList<SgNode *> m_creationNodes;
    bool m_createOnAccept = false;
    bool m_resetValuesOnShow = false;

    // Caller-given contents of the node and default node menus (none: the scene's).
    std::optional<QList<SgNode *>> m_nodeMenuNodes;
    std::optional<QList<SgNode *>> m_skeletonMenuNodes;

    // Page widgets.
    QTreeWidget *m_enumList = nullptr;
    SgEnumSlider *m_enumValue = nullptr, *m_enumDefault = nullptr;
    SgColorWgt *m_color = nullptr, *m_defaultColor = nullptr;
    SgBoolButton *m_boolValue = nullptr, *m_boolDefault = nullptr;
    QLabel *m_nodeLabel = nullptr, *m_defaultNodeLabel = nullptr;
    SgNodeMenu *m_nodeMenu = nullptr, *m_defaultNodeMenu = nullptr, *m_numericNodeMenu = nullptr;
    SgBoolButton *m_requiresNode = nullptr;
    SgBoolButton *m_obeyLimits = nullptr;
    SgFloatSlider *m_floatMin = nullptr, *m_floatMax = nullptr, *m_floatSensitivity = nullptr;
    SgFloatSlider *m_floatValue = nullptr, *m_floatDefault = nullptr;
    SgBoolButton *m_displayAsPercent = nullptr;
    SgIntSlider *m_intMin = nullptr, *m_intMax = nullptr, *m_intSensitivity = nullptr;
    SgIntSlider *m_intValue = nullptr, *m_intDefault = nullptr;
    SgImageMenu *m_imageMenu = nullptr;
    SgBoolButton *m_hidden = nullptr, *m_locked = nullptr, *m_canAnimate = nullptr;
    QLineEdit *m_pathEdit = nullptr, *m_nameEdit = nullptr, *m_labelEdit = nullptr;
    QLabel *m_pathLabel = nullptr;
    QList<QLabel *> m_labels;

    SavedValues m_saved;
};
