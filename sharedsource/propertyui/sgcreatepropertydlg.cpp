#include "sharedsource/propertyui/sgcreatepropertydlg.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgmodifier.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgboolproperty.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgenumproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgimageproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/properties/sgnodeproperty.h"
#include "sgcore/properties/sgnumericnodeproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/properties/sgskeletonproperty.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/widgets/sgboolbutton.h"
#include "sgcore/widgets/sgcolorwgt.h"
#include "sgcore/widgets/sgenumslider.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sgcore/widgets/sgimagemenu.h"
#include "sgcore/widgets/sgintslider.h"
#include "sgcore/widgets/sgnodemenu.h"
#include "sgcore/widgets/sgstyle.h"

#include <QButtonGroup>
#include <QCheckBox>
#include <QComboBox>
#include <QCursor>
#include <QEvent>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QMessageBox>
#include <QPushButton>
#include <QSignalBlocker>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace {

constexpr int LabelWidth = 100;
constexpr int IndexColumn = 0;
constexpr int LabelColumn = 1;

// Restores a flag when leaving the scope.
class FlagOverride {
public:
    FlagOverride(bool &flag, bool value) : m_flag(flag), m_saved(flag) { m_flag = value; }
    ~FlagOverride() { m_flag = m_saved; }

private:
    bool &m_flag;
    bool m_saved;
};

} // namespace

QString SgCreatePropertyDlg::enumPlaceholderText() {
    return QStringLiteral("<Double-Click to Add/Rename>");
}

SgCreatePropertyDlg::SgCreatePropertyDlg(QWidget *parent, const QString &name, bool singleType,
                                         int type, bool createOnAccept, bool resetValuesOnShow)
    : QDialog(parent, Qt::WindowTitleHint | Qt::MSWindowsFixedSizeDialogHint),
      m_singleType(singleType), m_createOnAccept(createOnAccept),
      m_resetValuesOnShow(resetValuesOnShow) {
    setObjectName(name);
    setModal(true);
    m_mainLayout = new QVBoxLayout(this);
    m_mainLayout->setContentsMargins(5, 5, 5, 5);
    m_mainLayout->setSizeConstraint(QLayout::SetFixedSize);
    buildTypeRow();
    m_typeBox->setCurrentIndex(type);
    m_mainLayout->addWidget(m_typeRow);
    buildBasePage();
    buildImagePage();
    buildNodePage();
    buildNumericPage();
    buildFloatPage();
    buildNumericNodePage();
    buildIntPage();
    buildBoolPage();
    buildColorPage();
    buildEnumPage();
    buildAdditionalOptionsPage();
    buildButtonRow();
    alignLabelColumns();
    setModal(true);
    restoreDefaults();
    updateDisplay();
}

SgCreatePropertyDlg::~SgCreatePropertyDlg() = default;

int SgCreatePropertyDlg::currentType() const {
    return m_typeBox->currentIndex();
}

// ---------------------------------------------------------------------------------------------
// Pages

QGroupBox *SgCreatePropertyDlg::newPage(const QString &title, const QString &name,
                                        QGridLayout *&grid) {
    auto *page = new QGroupBox(title, this);
    page->setObjectName(name);
    grid = new QGridLayout(page);
    grid->setSpacing(5);
    grid->setColumnStretch(1, 1);
    m_mainLayout->addWidget(page);
    return page;
}

QLabel *SgCreatePropertyDlg::addRow(QGridLayout *grid, int row, const QString &text,
                                    const QString &labelName, QWidget *widget) {
    auto *label = new QLabel(text, grid->parentWidget());
    label->setObjectName(labelName);
    // At least the common label width, wider when the text (or its translation) needs it.
    label->setMinimumWidth(LabelWidth);
    grid->addWidget(label, row, 0);
    // A widget of fixed width (the yes/no buttons) sits at the start of its column.
    const bool fixed = widget->sizePolicy().horizontalPolicy() == QSizePolicy::Fixed;
    grid->addWidget(widget, row, 1, fixed ? Qt::AlignLeft : Qt::Alignment());
    m_labels.append(label);
    return label;
}

SgBoolButton *SgCreatePropertyDlg::newYesNoButton(QWidget *parent, const QString &name) {
    auto *button = new SgBoolButton(parent, name, tr("No"), tr("Yes"));
    button->setFixedWidth(LabelWidth);
    return button;
}

SgFloatSlider *SgCreatePropertyDlg::newFloatSlider(QWidget *parent, const QString &name) {
    auto *slider = new SgFloatSlider(parent, name);
    slider->setTextEditable(true);
    return slider;
}

SgIntSlider *SgCreatePropertyDlg::newIntSlider(QWidget *parent, const QString &name,
                                               bool textEditable) {
    auto *slider = new SgIntSlider(parent, name);
    slider->setTextEditable(textEditable);
    return slider;
}

void SgCreatePropertyDlg::buildTypeRow() {
    m_typeRow = new QWidget(this);
    m_typeRow->setObjectName(QStringLiteral("SgPropTypeBox"));
    auto *row = new QHBoxLayout(m_typeRow);
    row->setContentsMargins(0, 0, 0, 0);
    auto *label = new QLabel(tr("Property Type: "), m_typeRow);
    label->setObjectName(QStringLiteral("SgPropTypeLabel"));
    m_typeBox = new QComboBox(m_typeRow);
    m_typeBox->setObjectName(QStringLiteral("SgCreatePropertyTypeBox"));
    m_typeBox->addItems({tr("Float"), tr("Int"), tr("Bool"), tr("Color"), tr("Enum"), tr("Image"),
                         tr("Node"), tr("Skeleton"), tr("Numeric Node")});
    row->addWidget(label);
    row->addWidget(m_typeBox);
    row->addWidget(new QWidget(m_typeRow), 1);
    connect(m_typeBox, &QComboBox::activated, this, &SgCreatePropertyDlg::updateDisplay);
}

void SgCreatePropertyDlg::buildBasePage() {
    QGridLayout *grid = nullptr;
    m_basePage = newPage(tr("Base Attributes"), QStringLiteral("SgUniversalPropSettingsBox"), grid);
    m_basePage->setFixedWidth(500);
    m_pathDefaults = new QComboBox(m_basePage);
    m_pathDefaults->setObjectName(QStringLiteral("SgPathDefaults"));
    m_pathDefaults->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    m_pathEdit = new QLineEdit(m_basePage);
    m_pathEdit->setObjectName(QStringLiteral("SgPathAttrib"));
    m_nameEdit = new QLineEdit(m_basePage);
    m_nameEdit->setObjectName(QStringLiteral("SgPropertyInternalNameAttrib"));
    m_labelEdit = new QLineEdit(m_basePage);
    m_labelEdit->setObjectName(QStringLiteral("SgPropertyLabelAttrib"));
    m_hidden = newYesNoButton(m_basePage, QStringLiteral("SgPropertyHiddenAttrib"));
    m_locked = newYesNoButton(m_basePage, QStringLiteral("SgPropertyLockedAttrib"));
    m_canAnimate = newYesNoButton(m_basePage, QStringLiteral("SgPropertyAnimationAttrib"));

    addRow(grid, 0, tr("Path Defaults:"), QStringLiteral("SgPathDefaultsLabel"), m_pathDefaults);
    m_pathLabel = addRow(grid, 1, tr("Path:"), QStringLiteral("SgPathLabel"), m_pathEdit);
    addRow(grid, 2, tr("Name:"), QStringLiteral("SgInternalNameLabel"), m_nameEdit);
    addRow(grid, 3, tr("Label:"), QStringLiteral("SgPropertyLabel"), m_labelEdit);
    addRow(grid, 4, tr("Hidden:"), QStringLiteral("SgPropertyHiddenLabel"), m_hidden);
    addRow(grid, 5, tr("Locked:"), QStringLiteral("SgPropertyLockedLabel"), m_locked);
    addRow(grid, 6, tr("Can Animate:"), QStringLiteral("SgPropertyAnimationLabel"), m_canAnimate);

    connect(m_pathDefaults, &QComboBox::textActivated, m_pathEdit, &QLineEdit::setText);
    // The label is filled in when the name edit loses focus (see eventFilter).
    m_nameEdit->installEventFilter(this);
}

void SgCreatePropertyDlg::buildImagePage() {
    QGridLayout *grid = nullptr;
    m_imagePage = newPage(tr("Image Attributes"), QStringLiteral("SgImagePropertyAttribs"), grid);
    m_imageMenu = new SgImageMenu(m_imagePage, QStringLiteral("SgImageAttrib"));
    addRow(grid, 0, tr("Image:"), QStringLiteral("SgImageLabel"), m_imageMenu);
    m_imagePage->hide();
}

void SgCreatePropertyDlg::buildNodePage() {
    QGridLayout *grid = nullptr;
    m_nodePage = newPage(tr("Node Attributes"), QStringLiteral("SgNodePropertyAttribs"), grid);
    m_nodeMenu = new SgNodeMenu(m_nodePage, QStringLiteral("SgNodeAttrib"), true);
    m_defaultNodeMenu = new SgNodeMenu(m_nodePage, QStringLiteral("SgDefaultNodeAttrib"), true);
    m_nodeLabel = addRow(grid, 0, tr("Node:"), QStringLiteral("SgNodeLabel"), m_nodeMenu);
    m_defaultNodeLabel = addRow(grid, 1, tr("Default Node:"), QStringLiteral("SgDefaultNodeLabel"),
                                m_defaultNodeMenu);
    m_nodePage->hide();
}

void SgCreatePropertyDlg::buildNumericPage() {
    QGridLayout *grid = nullptr;
    m_numericPage =
        newPage(tr("Numeric Attributes"), QStringLiteral("SgNumericPropertyAttribs"), grid);
    m_obeyLimits = newYesNoButton(m_numericPage, QStringLiteral("SgObeyLimitsAttrib"));
    addRow(grid, 0, tr("Obey Limits:"), QStringLiteral("SgObeyLimitsPropertyLabel"), m_obeyLimits);
    grid->addWidget(new QWidget(m_numericPage), 1, 1);
    m_numericPage->hide();
}

void SgCreatePropertyDlg::buildFloatPage() {
    QGridLayout *grid = nullptr;
    m_floatPage = newPage(tr("Float Attributes"), QStringLiteral("SgFloatAttribs"), grid);
    m_floatValue = newFloatSlider(m_floatPage, QStringLiteral("SgFloatVal"));
    m_floatDefault = newFloatSlider(m_floatPage, QStringLiteral("SgDefaultFloatVal"));
    m_floatMin = newFloatSlider(m_floatPage, QStringLiteral("SgFloatMinAttrib"));
    m_floatMax = newFloatSlider(m_floatPage, QStringLiteral("SgFloatMaxAttrib"));
    m_floatSensitivity = newFloatSlider(m_floatPage, QStringLiteral("SgFloatSensitivityAttrib"));
    m_displayAsPercent = newYesNoButton(m_floatPage, QStringLiteral("SgDisplayAsPercentAttrib"));
    addRow(grid, 0, tr("Value:"), QStringLiteral("SgFloatValueLabel"), m_floatValue);
    addRow(grid, 1, tr("Default Value:"), QStringLiteral("SgDefaultFloatValueLabel"),
           m_floatDefault);
    addRow(grid, 2, tr("Min:"), QStringLiteral("SgFloatMinPropertyLabel"), m_floatMin);
    addRow(grid, 3, tr("Max:"), QStringLiteral("SgFloatMaxPropertyLabel"), m_floatMax);
    addRow(grid, 4, tr("Sensitivity:"), QStringLiteral("SgFloatSensitivityPropertyLabel"),
           m_floatSensitivity);
    addRow(grid, 5, tr("Display As Percent:"), QStringLiteral("SgDisplayAsPercentLabel"),
           m_displayAsPercent);
    m_floatPage->hide();
}

void SgCreatePropertyDlg::buildNumericNodePage() {
    QGridLayout *grid = nullptr;
    m_numericNodePage =
        newPage(tr("Numeric Node Attributes"), QStringLiteral("SgNumericNodeAttribs"), grid);
    m_numericNodeMenu =
        new SgNodeMenu(m_numericNodePage, QStringLiteral("SgNumericNodeAttrib"), true);
    m_requiresNode = newYesNoButton(m_numericNodePage, QStringLiteral("SgRequiresNodeAttrib"));
    addRow(grid, 0, tr("Node:"), QStringLiteral("SgNumericNodePropertyLabel"), m_numericNodeMenu);
    addRow(grid, 1, tr("Requires Node:"), QStringLiteral("SgRequiresNodePropertyLabel"),
           m_requiresNode);
    m_numericNodePage->hide();
}

void SgCreatePropertyDlg::buildIntPage() {
    QGridLayout *grid = nullptr;
    m_intPage = newPage(tr("Int Attributes"), QStringLiteral("SgIntAttribs"), grid);
    m_intValue = newIntSlider(m_intPage, QStringLiteral("SgIntVal"), true);
    m_intDefault = newIntSlider(m_intPage, QStringLiteral("SgDefaultIntVal"), true);
    m_intMin = newIntSlider(m_intPage, QStringLiteral("SgIntMinAttrib"), true);
    m_intMax = newIntSlider(m_intPage, QStringLiteral("SgIntMaxAttrib"), false);
    m_intSensitivity = newIntSlider(m_intPage, QStringLiteral("SgIntSensitivityAttrib"), true);
    addRow(grid, 0, tr("Value:"), QStringLiteral("SgIntValueLabel"), m_intValue);
    addRow(grid, 1, tr("Default Value:"), QStringLiteral("SgDefaultIntValueLabel"), m_intDefault);
    addRow(grid, 2, tr("Min:"), QStringLiteral("SgIntMinPropertyLabel"), m_intMin);
    addRow(grid, 3, tr("Max:"), QStringLiteral("SgIntMaxPropertyLabel"), m_intMax);
    addRow(grid, 4, tr("Sensitivity:"), QStringLiteral("SgIntSensitivityPropertyLabel"),
           m_intSensitivity);
    m_intPage->hide();
}

void SgCreatePropertyDlg::buildBoolPage() {
    QGridLayout *grid = nullptr;
    m_boolPage = newPage(tr("Bool Attributes"), QStringLiteral("SgBoolAttribs"), grid);
    m_boolValue =
        new SgBoolButton(m_boolPage, QStringLiteral("SgBoolValueAttrib"), tr("Off"), tr("On"));
    m_boolValue->setFixedWidth(LabelWidth);
    m_boolDefault = new SgBoolButton(m_boolPage, QStringLiteral("SgDefaultBoolValueAttrib"),
                                     tr("Off"), tr("On"));
    m_boolDefault->setFixedWidth(LabelWidth);
    addRow(grid, 0, tr("Value:"), QStringLiteral("SgBoolValueLabel"), m_boolValue);
    addRow(grid, 1, tr("Default Value:"), QStringLiteral("SgDefaultBoolValueLabel"), m_boolDefault);
    m_boolPage->hide();
}

void SgCreatePropertyDlg::buildColorPage() {
    QGridLayout *grid = nullptr;
    m_colorPage = newPage(tr("Color Attributes"), QStringLiteral("SgColorAttribs"), grid);
    m_color = new SgColorWgt(m_colorPage, QStringLiteral("SgColorAttrib"));
    m_defaultColor = new SgColorWgt(m_colorPage, QStringLiteral("SgDefaultColorAttrib"));
    m_color->setColor(Qt::black);
    m_defaultColor->setColor(Qt::black);
    addRow(grid, 0, tr("Color:"), QStringLiteral("SgColorLabel"), m_color);
    addRow(grid, 1, tr("Default Color:"), QStringLiteral("SgDefaultColorLabel"), m_defaultColor);
    m_colorPage->hide();
}

void SgCreatePropertyDlg::buildEnumPage() {
    QGridLayout *grid = nullptr;
    m_enumPage = newPage(tr("Enum Attributes"), QStringLiteral("SgEnumAttribs"), grid);

    m_enumList = new QTreeWidget(m_enumPage);
    m_enumList->setObjectName(QStringLiteral("SgEnumAttrib"));
    m_enumList->setColumnCount(2);
    m_enumList->setHeaderLabels({tr("Int Val"), tr("Enumerated Type")});
    m_enumList->header()->setStretchLastSection(true);
    m_enumList->setAllColumnsShowFocus(true);
    m_enumList->setRootIsDecorated(false);
    m_enumList->setSortingEnabled(false);
    m_enumList->setEditTriggers(QAbstractItemView::NoEditTriggers);
    m_enumList->setFixedHeight(100);
    grid->addWidget(m_enumList, 0, 1);

    auto *buttonBox = new QGroupBox(m_enumPage);
    buttonBox->setObjectName(QStringLiteral("SgUpDownButtonGroup"));
    buttonBox->setFlat(true);
    auto *buttonColumn = new QVBoxLayout(buttonBox);
    buttonColumn->setContentsMargins(0, 0, 0, 0);
    auto *buttons = new QButtonGroup(buttonBox);
    auto addButton = [&](const QString &name, const QIcon &icon,
                         void (SgCreatePropertyDlg::*slot)()) {
        auto *button = new QPushButton(icon, QString(), buttonBox);
        button->setObjectName(name);
        buttons->addButton(button);
        buttonColumn->addWidget(button);
        connect(button, &QPushButton::clicked, this, slot);
    };
    addButton(QStringLiteral("SgMoveEnumUpButton"), SgStyle::customIcon(SgStyle::UpArrowPixmap),
              &SgCreatePropertyDlg::moveEnumUp);
    addButton(QStringLiteral("SgMoveEnumDownButton"), SgStyle::customIcon(SgStyle::DownArrowPixmap),
              &SgCreatePropertyDlg::moveEnumDown);
    addButton(QStringLiteral("SgDeleteEnumDownButton"),
              SgStyle::actionIcon(QStringLiteral("SgDeleteAction")),
              &SgCreatePropertyDlg::removeEnum);
    grid->addWidget(buttonBox, 0, 2);

    m_enumValue = new SgEnumSlider(m_enumPage, QStringLiteral("SgEnumAttrib"));
    m_enumDefault = new SgEnumSlider(m_enumPage, QStringLiteral("SgDefaultEnumAttrib"));
    addRow(grid, 1, tr("Value:"), QStringLiteral("SgEnumValueLabel"), m_enumValue);
    addRow(grid, 2, tr("Default Value:"), QStringLiteral("SgDefaultEnumValueLabel"), m_enumDefault);

    addDefaultEnumItem();
    connect(m_enumList, &QTreeWidget::itemDoubleClicked, this,
            [this](QTreeWidgetItem *item, int column) {
                beginRenameEnum(item, m_enumList->viewport()->mapFromGlobal(QCursor::pos()),
                                column);
            });
    // Programmatic changes of the list block its signals, so that only the user's edits arrive.
    connect(m_enumList, &QTreeWidget::itemChanged, this, [this](QTreeWidgetItem *item, int column) {
        renameEnum(item, column, item->text(column));
    });
    m_enumPage->hide();
}

void SgCreatePropertyDlg::buildAdditionalOptionsPage() {
    m_additionalOptionsPage = new QGroupBox(tr("Additional Options"), this);
    m_additionalOptionsPage->setObjectName(QStringLiteral("SgAdditionalOptions"));
    auto *column = new QVBoxLayout(m_additionalOptionsPage);
    m_createAsMorph = new QCheckBox(tr("Create as empty morph"), m_additionalOptionsPage);
    m_createAsMorph->setObjectName(QStringLiteral("SgCreateAsMorphOption"));
    m_createAfterJoint = new QCheckBox(tr("Create morph after joint"), m_additionalOptionsPage);
    m_createAfterJoint->setObjectName(QStringLiteral("SgCreateAfterJointOption"));
    m_createAfterJoint->setChecked(false);
    m_createAfterJoint->setEnabled(false);
    column->addWidget(m_createAsMorph);
    column->addWidget(m_createAfterJoint);
    connect(m_createAsMorph, &QCheckBox::toggled, m_createAfterJoint, &QCheckBox::setEnabled);
    m_mainLayout->addWidget(m_additionalOptionsPage);
    m_additionalOptionsPage->hide();
}

void SgCreatePropertyDlg::buildButtonRow() {
    m_buttonRow = new QGroupBox(this);
    m_buttonRow->setObjectName(QStringLiteral("SgCreatePropAcceptRejectBox"));
    m_buttonRow->setFlat(true);
    auto *row = new QHBoxLayout(m_buttonRow);
    auto *buttons = new QButtonGroup(m_buttonRow);
    row->addWidget(new QWidget(m_buttonRow), 1);
    auto *create = new QPushButton(tr("Create"), m_buttonRow);
    create->setObjectName(QStringLiteral("SgCreatePropButton"));
    create->setMinimumWidth(LabelWidth);
    create->setDefault(true);
    auto *cancel = new QPushButton(tr("Cancel"), m_buttonRow);
    cancel->setObjectName(QStringLiteral("SgCancelCreatePropButton"));
    cancel->setMinimumWidth(LabelWidth);
    buttons->addButton(create);
    buttons->addButton(cancel);
    row->addWidget(create);
    row->addWidget(cancel);
    connect(create, &QPushButton::clicked, this, &SgCreatePropertyDlg::acceptButtonClicked);
    connect(cancel, &QPushButton::clicked, this, &SgCreatePropertyDlg::resetValues);
    m_mainLayout->addWidget(m_buttonRow);
}

void SgCreatePropertyDlg::alignLabelColumns() {
    // Every page's labels share one column width, so the editing widgets of all pages line up.
    int width = LabelWidth;
    for (const QLabel *label : std::as_const(m_labels))
        width = qMax(width, label->sizeHint().width());
    for (QLabel *label : std::as_const(m_labels))
        label->setMinimumWidth(width);
}

bool SgCreatePropertyDlg::eventFilter(QObject *watched, QEvent *event) {
    if (watched == m_nameEdit && event->type() == QEvent::FocusOut)
        autoFillPropLabel();
    return QDialog::eventFilter(watched, event);
}

// ---------------------------------------------------------------------------------------------
// Showing

void SgCreatePropertyDlg::show() {
    const QString middle =
        m_singleType ? QStringLiteral(" ") + m_typeBox->currentText() + QStringLiteral(" ")
                     : QStringLiteral(" ");
    setWindowTitle(tr("Create") + middle + tr("Property"));
    if (m_resetValuesOnShow)
        restoreDefaults();
    updateDisplay();
    saveCurrentValues();
    QDialog::show();
}

void SgCreatePropertyDlg::updateDisplay() {
    const int type = currentType();
    for (QWidget *page : {m_imagePage, m_nodePage, m_numericPage, m_floatPage, m_numericNodePage,
                          m_intPage, m_boolPage, m_colorPage, m_enumPage, m_additionalOptionsPage})
        page->hide();
    QList<QWidget *> shown;
    switch (type) {
    case FloatType:
        shown = {m_numericPage, m_floatPage, m_additionalOptionsPage};
        break;
    case IntType:
        shown = {m_numericPage, m_intPage};
        break;
    case BoolType:
        shown = {m_boolPage};
        break;
    case ColorType:
        shown = {m_colorPage};
        break;
    case EnumType:
        shown = {m_enumPage};
        break;
    case ImageType:
        shown = {m_imagePage};
        break;
    case NodeType:
    case SkeletonType:
        shown = {m_nodePage};
        break;
    case NumericNodeType:
        shown = {m_numericPage, m_floatPage, m_numericNodePage};
        break;
    default:
        break;
    }
    for (QWidget *page : shown)
        page->show();
    m_typeRow->setVisible(!m_singleType);
    m_basePage->show();
    m_buttonRow->show();

    if (type == SkeletonType) {
        m_nodeLabel->setText(tr("Skeleton:"));
        m_defaultNodeLabel->setText(tr("Default Skeleton:"));
        m_nodePage->setTitle(tr("Skeleton Attributes"));
    } else if (type == NodeType) {
        m_nodeLabel->setText(tr("Node:"));
        m_defaultNodeLabel->setText(tr("Default Node:"));
        m_nodePage->setTitle(tr("Node Attributes"));
    }
    alignLabelColumns();
    fillChoosers();
    m_nodeMenu->setCurrentNode(nullptr);
    m_defaultNodeMenu->setCurrentNode(nullptr);
}

void SgCreatePropertyDlg::fillChoosers() {
    switch (currentType()) {
    case NumericNodeType:
        m_numericNodeMenu->setNodes(sceneNodes());
        break;
    case NodeType: {
        const QList<SgNode *> nodes = m_nodeMenuNodes.value_or(sceneNodes());
        m_nodeMenu->setNodes(nodes);
        m_defaultNodeMenu->setNodes(nodes);
        break;
    }
    case SkeletonType: {
        const QList<SgNode *> skeletons = m_skeletonMenuNodes.value_or(sceneSkeletons());
        m_nodeMenu->setNodes(skeletons);
        m_defaultNodeMenu->setNodes(skeletons);
        break;
    }
    case ImageType: {
        QList<SgTexture *> images;
        if (SgImageMgr *manager = sgApp->getImageMgr()) {
            for (int i = 0; i < manager->getImageCount(); ++i)
                images.append(manager->getImageAt(i));
        }
        m_imageMenu->setImages(images);
        break;
    }
    default:
        break;
    }
}

QList<SgNode *> SgCreatePropertyDlg::sceneNodes() const {
    QList<SgNode *> nodes;
    SgScene *scene = sgApp->getScene();
    if (!scene)
        return nodes;
    for (SgNodeListIterator it = scene->nodeListIterator(); it.hasNext();)
        nodes.append(it.next());
    return nodes;
}

QList<SgNode *> SgCreatePropertyDlg::sceneSkeletons() const {
    QList<SgNode *> skeletons;
    SgScene *scene = sgApp->getScene();
    if (!scene)
        return skeletons;
    for (SgSkeletonListIterator it = scene->skeletonListIterator(); it.hasNext();)
        skeletons.append(it.next());
    return skeletons;
}

// ---------------------------------------------------------------------------------------------
// Caller configuration

void SgCreatePropertyDlg::setCreateOnAccept(bool create) {
    m_createOnAccept = create;
}

void SgCreatePropertyDlg::setResetValuesOnShow(bool reset) {
    m_resetValuesOnShow = reset;
}

void SgCreatePropertyDlg::setDefaultName(QString name) {
    m_nameEdit->setText(name);
    m_defaultNameSet = true;
}

void SgCreatePropertyDlg::setDefaultLabel(QString name) {
    m_labelEdit->setText(name);
    m_defaultLabelSet = true;
}

void SgCreatePropertyDlg::setPathDefaults(QStringList list) {
    m_pathDefaults->clear();
    m_pathDefaults->addItems(list);
    setDefaultPath(list.isEmpty() ? QString() : list.first());
}

void SgCreatePropertyDlg::setPathDefaults() {
    QStringList paths;
    for (qsizetype i = 0; i < m_creationNodes.size(); ++i) {
        SgPropertyGroupTree *groups = m_creationNodes[i]->getPropertyGroups();
        if (!groups)
            continue;
        const QStringList nodePaths = groups->getAllPaths();
        if (i == 0) {
            paths = nodePaths;
        } else if (!nodePaths.isEmpty() && !paths.contains(nodePaths.first())) {
            paths.append(nodePaths.first());
        }
    }
    paths.sort();
    setPathDefaults(paths);
}

void SgCreatePropertyDlg::setDefaultPath(QString path) {
    int index = -1;
    for (int i = 0; i < m_pathDefaults->count() && index < 0; ++i) {
        if (m_pathDefaults->itemText(i) == path)
            index = i;
    }
    if (index < 0) {
        m_pathDefaults->addItem(path);
        index = m_pathDefaults->count() - 1;
    }
    m_pathDefaults->setCurrentIndex(index);
    m_pathEdit->setText(path);
}

void SgCreatePropertyDlg::setPathReadOnly(bool readOnly) {
    m_pathEdit->setVisible(!readOnly);
    m_pathLabel->setVisible(!readOnly);
}

void SgCreatePropertyDlg::setCreationNodes(SgNodeList &list) {
    m_creationNodes.clear();
    for (SgNode *node : list)
        insertCreationNode(node);
}

void SgCreatePropertyDlg::insertCreationNode(SgNode *node) {
    if (node && !m_creationNodes.contains(node))
        m_creationNodes.append(node);
}

void SgCreatePropertyDlg::setCreationNode(SgNode *node) {
    if (node)
        m_creationNodes = {node};
}

void SgCreatePropertyDlg::setNodeMenu(SgNodeListIterator &nodes) {
    QList<SgNode *> list;
    while (nodes.hasNext())
        list.append(nodes.next());
    setNodeMenu(list);
}

void SgCreatePropertyDlg::setNodeMenu(SgNodeList &nodes) {
    m_nodeMenuNodes = nodes;
    if (currentType() == NodeType)
        updateDisplay();
}

void SgCreatePropertyDlg::setSkeletonMenu(SgSkeletonListIterator &skels) {
    SgSkeletonList list;
    while (skels.hasNext())
        list.append(skels.next());
    setSkeletonMenu(list);
}

void SgCreatePropertyDlg::setSkeletonMenu(SgSkeletonList &skels) {
    QList<SgNode *> nodes;
    for (SgSkeleton *skeleton : skels)
        nodes.append(skeleton);
    m_skeletonMenuNodes = nodes;
    if (currentType() == SkeletonType)
        updateDisplay();
}

// ---------------------------------------------------------------------------------------------
// Validation and creation

void SgCreatePropertyDlg::warn(const QString &text) {
    QMessageBox box(QMessageBox::Warning, tr("Create Property"), text, QMessageBox::NoButton, this);
    QPushButton *ok = box.addButton(tr("Ok"), QMessageBox::AcceptRole);
    box.setDefaultButton(ok);
    box.exec();
}

namespace {

// Appends the range lines of a numeric type: min above max always; value and default outside
// the range only when the limits are obeyed. Equal values pass.
template <typename T>
bool checkRange(T min, T max, T value, T defaultValue, bool obeyLimits, QString &message) {
    bool valid = true;
    if (max < min) {
        message += SgCreatePropertyDlg::tr("   - Min is greater than Max\n");
        valid = false;
    }
    if (obeyLimits) {
        if (value < min || value > max) {
            message += SgCreatePropertyDlg::tr("   - Value is not within limits\n");
            valid = false;
        }
        if (defaultValue < min || defaultValue > max) {
            message += SgCreatePropertyDlg::tr("   - Default Value is not within limits\n");
            valid = false;
        }
    }
    return valid;
}

} // namespace

bool SgCreatePropertyDlg::validate() {
    QString message = tr("Could not create properties for the following reasons:\n");
    bool valid = true;
    if (m_creationNodes.isEmpty()) {
        message += tr("   - No nodes have been specified\n");
        valid = false;
    }
    if (m_nameEdit->text().trimmed().isEmpty()) {
        message += tr("   - Name cannot be empty\n");
        valid = false;
    }
    if (m_labelEdit->text().trimmed().isEmpty()) {
        message += tr("   - Label cannot be empty\n");
        valid = false;
    }
    const int type = currentType();
    if (type == FloatType) {
        valid &=
            checkRange(m_floatMin->getValue(), m_floatMax->getValue(), m_floatValue->getValue(),
                       m_floatDefault->getValue(), m_obeyLimits->isOn(), message);
    } else if (type == IntType) {
        valid &= checkRange(m_intMin->getValue(), m_intMax->getValue(), m_intValue->getValue(),
                            m_intDefault->getValue(), m_obeyLimits->isOn(), message);
    } else if (type == EnumType && m_enumValue->count() == 0) {
        valid = false;
    }
    if (valid) {
        accept();
        return true;
    }
    warn(message);
    return false;
}

void SgCreatePropertyDlg::configureFloat(SgProperty *property) const {
    auto *numeric = static_cast<SgFloatProperty *>(property);
    numeric->setValue(m_floatValue->getValue());
    numeric->setDefaultValue(m_floatDefault->getValue());
    numeric->setMin(m_floatMin->getValue());
    numeric->setMax(m_floatMax->getValue());
    numeric->setSensitivity(m_floatSensitivity->getValue());
    numeric->setDisplayAsPercent(m_displayAsPercent->isOn());
    numeric->setIsClamped(m_obeyLimits->isOn());
}

void SgCreatePropertyDlg::configureBase(SgProperty *property) const {
    SgElement *owner = property->getOwner();
    if (!owner || !dynamic_cast<SgModifier *>(owner))
        property->setName(m_nameEdit->text());
    property->setPath(m_pathEdit->text());
    property->setLabel(m_labelEdit->text());
    property->setHidden(m_hidden->isOn());
    property->lock(m_locked->isOn());
    property->setCanAnimate(m_canAnimate->isOn());
    property->setIsUserProperty(true);
}

SgProperty *SgCreatePropertyDlg::createProperty() {
    return createProperty(nullptr);
}

SgProperty *SgCreatePropertyDlg::createProperty(SgElement **owner) {
    if (owner)
        *owner = nullptr;
    SgProperty *property = nullptr;
    switch (currentType()) {
    case FloatType:
        if (m_createAsMorph->isChecked()) {
            auto *morph = new SgMorph;
            morph->setName(m_nameEdit->text());
            property = morph->getValueChannel();
            if (!property) {
                // A morph without a value channel cannot be configured or driven: it is not
                // handed out (and not leaked).
                delete morph;
                return nullptr;
            }
            if (owner)
                *owner = morph;
        } else {
            property = new SgFloatProperty;
        }
        configureFloat(property);
        break;
    case IntType: {
        auto *intProperty = new SgIntProperty;
        intProperty->setValue(m_intValue->getValue());
        intProperty->setDefaultValue(m_intDefault->getValue());
        intProperty->setMin(m_intMin->getValue());
        intProperty->setMax(m_intMax->getValue());
        intProperty->setSensitivity(m_intSensitivity->getValue());
        property = intProperty;
        break;
    }
    case BoolType: {
        auto *boolProperty = new SgBoolProperty;
        boolProperty->setBoolValue(m_boolValue->isOn());
        boolProperty->setDefaultValue(m_boolDefault->isOn() ? 1 : 0);
        property = boolProperty;
        break;
    }
    case ColorType: {
        auto *colorProperty = new SgColorProperty;
        colorProperty->setColorValue(m_color->getColor());
        colorProperty->setDefaultValue(m_defaultColor->getColor().rgb());
        property = colorProperty;
        break;
    }
    case EnumType: {
        auto *enumProperty = new SgEnumProperty;
        for (const QString &label : enumLabels())
            enumProperty->addItem(label, -1);
        enumProperty->setValue(m_enumValue->currentIndex());
        enumProperty->setDefaultValue(m_enumDefault->currentIndex());
        property = enumProperty;
        break;
    }
    case ImageType: {
        auto *imageProperty = new SgImageProperty;
        imageProperty->setValue(m_imageMenu->getCurrentImage());
        property = imageProperty;
        break;
    }
    case NodeType:
    case SkeletonType: {
        auto *nodeProperty =
            currentType() == NodeType ? new SgNodeProperty : new SgSkeletonProperty;
        nodeProperty->setValue(m_nodeMenu->getCurrentNode());
        nodeProperty->setDefaultValue(m_defaultNodeMenu->getCurrentNode());
        property = nodeProperty;
        break;
    }
    case NumericNodeType: {
        auto *numericNode = new SgNumericNodeProperty;
        numericNode->setNode(m_numericNodeMenu->getCurrentNode());
        numericNode->setMustHaveNode(m_requiresNode->isOn());
        configureFloat(numericNode);
        property = numericNode;
        break;
    }
    default:
        return nullptr;
    }
    configureBase(property);
    return property;
}

void SgCreatePropertyDlg::createProperties() {
    if (!validate())
        return;
    const int morphIndex =
        m_createAfterJoint->isEnabled() && m_createAfterJoint->isChecked() ? -1 : 0;
    for (SgNode *node : std::as_const(m_creationNodes)) {
        SgElement *owner = nullptr;
        SgProperty *property = createProperty(&owner);
        if (auto *morph = dynamic_cast<SgMorph *>(owner)) {
            SgObject *object = node->getObject();
            if (!object) {
                object = new SgObject;
                node->setObject(object);
            }
            if (object->addModifier(morph, morphIndex) != 0) {
                warn(tr("Unable to add modifier to ") + node->getName() + tr(" node"));
                delete morph;
            }
        } else if (property && node->addProperty(property) != 0) {
            warn(tr("Unable to add property to ") + node->getName() + tr(" node"));
            delete property;
        }
    }
}

void SgCreatePropertyDlg::acceptButtonClicked() {
    if (m_createOnAccept)
        createProperties();
    else
        validate();
}

void SgCreatePropertyDlg::autoFillPropLabel() {
    if (m_labelEdit->text().isEmpty())
        m_labelEdit->setText(m_nameEdit->text());
}

// ---------------------------------------------------------------------------------------------
// Defaults, saving and cancelling

void SgCreatePropertyDlg::restoreDefaults() {
    clearEnumList();
    m_color->setColor(Qt::black);
    m_defaultColor->setColor(Qt::black);
    m_boolValue->setOn(false);
    m_boolDefault->setOn(false);
    m_nodeMenu->setCurrentNode(nullptr);
    m_defaultNodeMenu->setCurrentNode(nullptr);
    m_numericNodeMenu->setCurrentNode(nullptr);
    m_requiresNode->setOn(false);
    m_obeyLimits->setOn(true);
    m_floatMin->setValue(-1.0f);
    m_floatMax->setValue(1.0f);
    m_floatSensitivity->setValue(0.04f);
    m_floatValue->setValue(0.0f);
    m_floatDefault->setValue(0.0f);
    m_displayAsPercent->setOn(true);
    m_intMin->setValue(-1);
    m_intMax->setValue(1);
    m_intSensitivity->setValue(1);
    m_intValue->setValue(0);
    m_intDefault->setValue(0);
    m_imageMenu->setCurrentImage(nullptr);
    m_hidden->setOn(false);
    m_locked->setOn(false);
    m_canAnimate->setOn(true);
    if (m_defaultNameSet)
        m_defaultNameSet = false;
    else
        m_nameEdit->clear();
    if (m_defaultLabelSet)
        m_defaultLabelSet = false;
    else
        m_labelEdit->clear();
    FlagOverride saving(m_resetValuesOnShow, false);
    saveCurrentValues();
}

void SgCreatePropertyDlg::saveCurrentValues() {
    if (m_resetValuesOnShow)
        return;
    m_saved.path = m_pathEdit->text();
    m_saved.name = m_nameEdit->text();
    m_saved.label = m_labelEdit->text();
    m_saved.hidden = m_hidden->isOn();
    m_saved.locked = m_locked->isOn();
    m_saved.canAnimate = m_canAnimate->isOn();
    m_saved.obeyLimits = m_obeyLimits->isOn();
    m_saved.displayAsPercent = m_displayAsPercent->isOn();
    m_saved.boolValue = m_boolValue->isOn();
    m_saved.boolDefault = m_boolDefault->isOn();
    m_saved.requiresNode = m_requiresNode->isOn();
    m_saved.emptyMorph = m_createAsMorph->isChecked();
    m_saved.floatValue = m_floatValue->getValue();
    m_saved.floatDefault = m_floatDefault->getValue();
    m_saved.floatMin = m_floatMin->getValue();
    m_saved.floatMax = m_floatMax->getValue();
    m_saved.floatSensitivity = m_floatSensitivity->getValue();
    m_saved.intValue = m_intValue->getValue();
    m_saved.intDefault = m_intDefault->getValue();
    m_saved.intMin = m_intMin->getValue();
    m_saved.intMax = m_intMax->getValue();
    m_saved.intSensitivity = m_intSensitivity->getValue();
    m_saved.color = m_color->getColor();
    m_saved.defaultColor = m_defaultColor->getColor();
    m_saved.enumLabels = enumLabels();
    if (!m_saved.enumLabels.isEmpty()) {
        m_saved.enumValue = m_enumValue->currentIndex();
        m_saved.enumDefault = m_enumDefault->currentIndex();
    }
    m_saved.image = m_imageMenu->getCurrentImage();
    m_saved.node = m_nodeMenu->getCurrentNode();
    m_saved.defaultNode = m_defaultNodeMenu->getCurrentNode();
    m_saved.numericNode = m_numericNodeMenu->getCurrentNode();
}

void SgCreatePropertyDlg::resetValues() {
    if (!m_resetValuesOnShow) {
        m_pathEdit->setText(m_saved.path);
        m_nameEdit->setText(m_saved.name);
        m_labelEdit->setText(m_saved.label);
        m_hidden->setOn(m_saved.hidden);
        m_locked->setOn(m_saved.locked);
        m_canAnimate->setOn(m_saved.canAnimate);
        m_obeyLimits->setOn(m_saved.obeyLimits);
        m_displayAsPercent->setOn(m_saved.displayAsPercent);
        m_boolValue->setOn(m_saved.boolValue);
        m_boolDefault->setOn(m_saved.boolDefault);
        m_requiresNode->setOn(m_saved.requiresNode);
        m_createAsMorph->setChecked(m_saved.emptyMorph);
        m_floatValue->setValue(m_saved.floatValue);
        m_floatDefault->setValue(m_saved.floatDefault);
        m_floatMin->setValue(m_saved.floatMin);
        m_floatMax->setValue(m_saved.floatMax);
        m_floatSensitivity->setValue(m_saved.floatSensitivity);
        m_intValue->setValue(m_saved.intValue);
        m_intDefault->setValue(m_saved.intDefault);
        m_intMin->setValue(m_saved.intMin);
        m_intMax->setValue(m_saved.intMax);
        m_intSensitivity->setValue(m_saved.intSensitivity);
        m_color->setColor(m_saved.color);
        m_defaultColor->setColor(m_saved.defaultColor);
        clearEnumList();
        for (const QString &label : std::as_const(m_saved.enumLabels)) {
            QTreeWidgetItem *placeholder = enumPlaceholder();
            {
                const QSignalBlocker blocker(m_enumList);
                placeholder->setText(LabelColumn, label);
            }
            renameEnum(placeholder, LabelColumn, label);
        }
        if (!m_saved.enumLabels.isEmpty()) {
            m_enumValue->setCurrentIndex(m_saved.enumValue);
            m_enumDefault->setCurrentIndex(m_saved.enumDefault);
        }
        m_imageMenu->setCurrentImage(m_saved.image);
        m_nodeMenu->setCurrentNode(m_saved.node);
        m_defaultNodeMenu->setCurrentNode(m_saved.defaultNode);
        m_numericNodeMenu->setCurrentNode(m_saved.numericNode);
    }
    reject();
}

// ---------------------------------------------------------------------------------------------
// The enum list editor. Row k of the list is item k of both enum sliders, followed by one
// placeholder row. After a removal the rows below are renumbered, so that every row's "Int Val"
// is always its slider index and later edits address the right slider item.

void SgCreatePropertyDlg::clearEnumList() {
    {
        const QSignalBlocker blocker(m_enumList);
        m_enumList->clear();
    }
    m_enumValue->clear();
    m_enumDefault->clear();
    addDefaultEnumItem();
}

QStringList SgCreatePropertyDlg::enumLabels() const {
    QStringList labels;
    for (int row = 0; row + 1 < m_enumList->topLevelItemCount(); ++row)
        labels.append(m_enumList->topLevelItem(row)->text(LabelColumn));
    return labels;
}

QTreeWidgetItem *SgCreatePropertyDlg::enumPlaceholder() const {
    return m_enumList->topLevelItem(m_enumList->topLevelItemCount() - 1);
}

void SgCreatePropertyDlg::addDefaultEnumItem() {
    const QSignalBlocker blocker(m_enumList);
    auto *item = new QTreeWidgetItem(m_enumList);
    item->setText(LabelColumn, enumPlaceholderText());
    item->setFlags(item->flags() | Qt::ItemIsEditable);
}

void SgCreatePropertyDlg::beginRenameEnum(QTreeWidgetItem *item, QPoint, int col) {
    if (item && col == LabelColumn)
        m_enumList->editItem(item, LabelColumn);
}

void SgCreatePropertyDlg::renameEnum(QTreeWidgetItem *item, int, QString text) {
    if (!item)
        return;
    const int row = m_enumList->indexOfTopLevelItem(item);
    if (row < 0)
        return;
    if (item != enumPlaceholder()) {
        m_enumValue->renameItem(row, text);
        m_enumDefault->renameItem(row, text);
        return;
    }
    const int index = m_enumValue->addItem(text);
    m_enumDefault->addItem(text);
    {
        const QSignalBlocker blocker(m_enumList);
        item->setText(IndexColumn, QString::number(index));
    }
    addDefaultEnumItem();
}

void SgCreatePropertyDlg::swapEnumLabels(QTreeWidgetItem *upper, QTreeWidgetItem *lower) {
    const int upperRow = m_enumList->indexOfTopLevelItem(upper);
    const QString upperLabel = upper->text(LabelColumn);
    const QString lowerLabel = lower->text(LabelColumn);
    {
        const QSignalBlocker blocker(m_enumList);
        upper->setText(LabelColumn, lowerLabel);
        lower->setText(LabelColumn, upperLabel);
    }
    for (SgEnumSlider *slider : {m_enumValue, m_enumDefault}) {
        slider->renameItem(upperRow, lowerLabel);
        slider->renameItem(upperRow + 1, upperLabel);
    }
}

void SgCreatePropertyDlg::moveEnumUp() {
    QTreeWidgetItem *current = m_enumList->currentItem();
    if (!current || current == enumPlaceholder())
        return;
    const int row = m_enumList->indexOfTopLevelItem(current);
    if (row <= 0)
        return;
    QTreeWidgetItem *previous = m_enumList->topLevelItem(row - 1);
    swapEnumLabels(previous, current);
    m_enumList->setCurrentItem(previous);
}

void SgCreatePropertyDlg::moveEnumDown() {
    QTreeWidgetItem *current = m_enumList->currentItem();
    if (!current)
        return;
    const int row = m_enumList->indexOfTopLevelItem(current);
    QTreeWidgetItem *next = m_enumList->topLevelItem(row + 1);
    if (row < 0 || !next || next == enumPlaceholder())
        return;
    swapEnumLabels(current, next);
    m_enumList->setCurrentItem(next);
}

void SgCreatePropertyDlg::removeEnum() {
    QTreeWidgetItem *current = m_enumList->currentItem();
    if (!current || current == enumPlaceholder())
        return;
    const int row = m_enumList->indexOfTopLevelItem(current);
    if (row < 0)
        return;
    {
        const QSignalBlocker blocker(m_enumList);
        delete current;
    }
    m_enumValue->removeItem(row);
    m_enumDefault->removeItem(row);
    renumberEnumRows();
}

void SgCreatePropertyDlg::renumberEnumRows() {
    const QSignalBlocker blocker(m_enumList);
    for (int row = 0; row + 1 < m_enumList->topLevelItemCount(); ++row)
        m_enumList->topLevelItem(row)->setText(IndexColumn, QString::number(row));
}
