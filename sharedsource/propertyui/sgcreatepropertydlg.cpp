#include "sharedsource/propertyui/sgcreatepropertydlg.h"

#include "sgcore/app/sgapp.h"
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
#include "sharedsource/propertyui/sgboolpropertypage.h"
#include "sharedsource/propertyui/sgcolorpropertypage.h"
#include "sharedsource/propertyui/sgenumpropertypage.h"
#include "sharedsource/propertyui/sgfloatpropertypage.h"
#include "sharedsource/propertyui/sgimagepropertypage.h"
#include "sharedsource/propertyui/sgintpropertypage.h"
#include "sharedsource/propertyui/sgmorphoptionspage.h"
#include "sharedsource/propertyui/sgnodepropertypage.h"
#include "sharedsource/propertyui/sgnumericnodepropertypage.h"
#include "sharedsource/propertyui/sgnumericpropertypage.h"
#include "sharedsource/propertyui/sgpropertyrange.h"

#include <QButtonGroup>
#include <QComboBox>
#include <QCursor>
#include <QEvent>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QMessageBox>
#include <QPushButton>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace {

constexpr int LabelWidth = SgPropertyPage::LabelWidth;

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
    return SgEnumPropertyPage::placeholderText();
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
    buildPages();
    buildButtonRow();
    restoreDefaults();
    updateDisplay();
}

SgCreatePropertyDlg::~SgCreatePropertyDlg() = default;

int SgCreatePropertyDlg::currentType() const {
    return m_typeBox->currentIndex();
}

// ---------------------------------------------------------------------------------------------
// Building

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
    m_basePage = new QGroupBox(tr("Base Attributes"), this);
    m_basePage->setObjectName(QStringLiteral("SgUniversalPropSettingsBox"));
    m_basePage->setFixedWidth(500);
    auto *grid = new QGridLayout(m_basePage);
    grid->setSpacing(5);
    grid->setColumnStretch(1, 1);
    m_pathDefaults = new QComboBox(m_basePage);
    m_pathDefaults->setObjectName(QStringLiteral("SgPathDefaults"));
    m_pathDefaults->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    const auto edit = [this](const char *name) {
        auto *line = new QLineEdit(m_basePage);
        line->setObjectName(QLatin1String(name));
        return line;
    };
    m_pathEdit = edit("SgPathAttrib");
    m_nameEdit = edit("SgPropertyInternalNameAttrib");
    m_labelEdit = edit("SgPropertyLabelAttrib");
    const auto yesNo = [this](const char *name) {
        auto *button = new SgBoolButton(m_basePage, QLatin1String(name), tr("No"), tr("Yes"));
        button->setFixedWidth(LabelWidth);
        return button;
    };
    m_hidden = yesNo("SgPropertyHiddenAttrib");
    m_locked = yesNo("SgPropertyLockedAttrib");
    m_canAnimate = yesNo("SgPropertyAnimationAttrib");

    const struct {
        QString text;
        const char *name;
        QWidget *widget;
    } rows[] = {
        {tr("Path Defaults:"), "SgPathDefaultsLabel", m_pathDefaults},
        {tr("Path:"), "SgPathLabel", m_pathEdit},
        {tr("Name:"), "SgInternalNameLabel", m_nameEdit},
        {tr("Label:"), "SgPropertyLabel", m_labelEdit},
        {tr("Hidden:"), "SgPropertyHiddenLabel", m_hidden},
        {tr("Locked:"), "SgPropertyLockedLabel", m_locked},
        {tr("Can Animate:"), "SgPropertyAnimationLabel", m_canAnimate},
    };
    int row = 0;
    for (const auto &entry : rows) {
        auto *label = new QLabel(entry.text, m_basePage);
        label->setObjectName(QLatin1String(entry.name));
        label->setMinimumWidth(LabelWidth);
        grid->addWidget(label, row, 0);
        const bool fixed = entry.widget->maximumWidth() < QWIDGETSIZE_MAX;
        grid->addWidget(entry.widget, row++, 1, fixed ? Qt::AlignLeft : Qt::Alignment());
        m_baseLabels.append(label);
    }
    m_pathLabel = m_baseLabels[1];
    m_mainLayout->addWidget(m_basePage);

    connect(m_pathDefaults, &QComboBox::textActivated, m_pathEdit, &QLineEdit::setText);
    // The label is filled in when the name edit loses focus (see eventFilter).
    m_nameEdit->installEventFilter(this);
}

void SgCreatePropertyDlg::buildPages() {
    m_imagePage = new SgImagePropertyPage(this);
    m_nodePage = new SgNodePropertyPage(this);
    m_numericPage = new SgNumericPropertyPage(this);
    m_floatPage = new SgFloatPropertyPage(this);
    m_numericNodePage = new SgNumericNodePropertyPage(this);
    m_intPage = new SgIntPropertyPage(this);
    m_boolPage = new SgBoolPropertyPage(this);
    m_colorPage = new SgColorPropertyPage(this);
    m_enumPage = new SgEnumPropertyPage(this);
    m_morphOptionsPage = new SgMorphOptionsPage(this);
    for (SgPropertyPage *page : allPages()) {
        m_mainLayout->addWidget(page);
        page->hide();
    }
    connectEnumEditor();
}

QList<SgPropertyPage *> SgCreatePropertyDlg::allPages() const {
    return {m_imagePage, m_nodePage, m_numericPage, m_floatPage, m_numericNodePage,
            m_intPage,   m_boolPage, m_colorPage,   m_enumPage,  m_morphOptionsPage};
}

void SgCreatePropertyDlg::connectEnumEditor() {
    QTreeWidget *list = m_enumPage->list();
    connect(list, &QTreeWidget::itemDoubleClicked, this,
            [this, list](QTreeWidgetItem *item, int column) {
                beginRenameEnum(item, list->viewport()->mapFromGlobal(QCursor::pos()), column);
            });
    // Programmatic changes of the list block its signals, so that only the user's edits arrive.
    connect(list, &QTreeWidget::itemChanged, this, [this](QTreeWidgetItem *item, int column) {
        renameEnum(item, column, item->text(column));
    });
    connect(m_enumPage->upButton(), &QPushButton::clicked, this, &SgCreatePropertyDlg::moveEnumUp);
    connect(m_enumPage->downButton(), &QPushButton::clicked, this,
            &SgCreatePropertyDlg::moveEnumDown);
    connect(m_enumPage->deleteButton(), &QPushButton::clicked, this,
            &SgCreatePropertyDlg::removeEnum);
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
    QList<QLabel *> labels = m_baseLabels;
    for (SgPropertyPage *page : allPages())
        labels += page->rowLabels();
    int width = LabelWidth;
    for (const QLabel *label : std::as_const(labels))
        width = qMax(width, label->sizeHint().width());
    for (QLabel *label : std::as_const(labels))
        label->setMinimumWidth(width);
}

bool SgCreatePropertyDlg::eventFilter(QObject *watched, QEvent *event) {
    if (watched == m_nameEdit && event->type() == QEvent::FocusOut)
        autoFillPropLabel();
    return QDialog::eventFilter(watched, event);
}

// ---------------------------------------------------------------------------------------------
// Showing

void SgCreatePropertyDlg::updateTitle() {
    const QString middle =
        m_singleType ? QStringLiteral(" ") + m_typeBox->currentText() + QStringLiteral(" ")
                     : QStringLiteral(" ");
    setWindowTitle(tr("Create") + middle + tr("Property"));
}

void SgCreatePropertyDlg::show() {
    updateTitle();
    if (m_resetValuesOnShow)
        restoreDefaults();
    updateDisplay();
    saveCurrentValues();
    QDialog::show();
}

QList<SgPropertyPage *> SgCreatePropertyDlg::pagesOfType(int type) const {
    switch (type) {
    case FloatType:
        return {m_numericPage, m_floatPage, m_morphOptionsPage};
    case IntType:
        return {m_numericPage, m_intPage};
    case BoolType:
        return {m_boolPage};
    case ColorType:
        return {m_colorPage};
    case EnumType:
        return {m_enumPage};
    case ImageType:
        return {m_imagePage};
    case NodeType:
    case SkeletonType:
        return {m_nodePage};
    case NumericNodeType:
        return {m_numericPage, m_floatPage, m_numericNodePage};
    default:
        return {};
    }
}

void SgCreatePropertyDlg::updateDisplay() {
    const int type = currentType();
    const QList<SgPropertyPage *> shown = pagesOfType(type);
    for (SgPropertyPage *page : allPages())
        page->setVisible(shown.contains(page));
    m_typeRow->setVisible(!m_singleType);
    m_basePage->show();
    m_buttonRow->show();
    if (type == SkeletonType || type == NodeType)
        m_nodePage->setSkeletonMode(type == SkeletonType);
    alignLabelColumns();
    updateTitle();
    fillChoosers();
    m_nodePage->clearChoice();
}

void SgCreatePropertyDlg::fillChoosers() {
    switch (currentType()) {
    case NumericNodeType:
        m_numericNodePage->fillChooser(sceneNodes());
        break;
    case NodeType:
        m_nodePage->fillChoosers(m_nodeMenuNodes.value_or(sceneNodes()));
        break;
    case SkeletonType:
        m_nodePage->fillChoosers(m_skeletonMenuNodes.value_or(sceneSkeletons()));
        break;
    case ImageType:
        m_imagePage->fillChooser();
        break;
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
    if (type == FloatType)
        valid &= m_floatPage->checkRange(m_numericPage->obeyLimits(), message);
    else if (type == IntType)
        valid &= m_intPage->checkRange(m_numericPage->obeyLimits(), message);
    else if (type == EnumType && !m_enumPage->hasItems())
        valid = false;
    if (valid) {
        accept();
        return true;
    }
    warn(message);
    return false;
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
    SgProperty *property = createTypedProperty(owner);
    if (property)
        configureBase(property);
    return property;
}

// A new property of the current type, configured by the type's pages (the base step follows).
SgProperty *SgCreatePropertyDlg::createTypedProperty(SgElement **owner) const {
    switch (currentType()) {
    case FloatType: {
        SgFloatProperty *property = nullptr;
        if (m_morphOptionsPage->createAsMorph()) {
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
        m_floatPage->configure(property, m_numericPage->obeyLimits());
        return property;
    }
    case IntType: {
        auto *property = new SgIntProperty;
        m_intPage->configure(property);
        return property;
    }
    case BoolType: {
        auto *property = new SgBoolProperty;
        m_boolPage->configure(property);
        return property;
    }
    case ColorType: {
        auto *property = new SgColorProperty;
        m_colorPage->configure(property);
        return property;
    }
    case EnumType: {
        auto *property = new SgEnumProperty;
        m_enumPage->configure(property);
        return property;
    }
    case ImageType: {
        auto *property = new SgImageProperty;
        m_imagePage->configure(property);
        return property;
    }
    case NodeType:
    case SkeletonType: {
        auto *property = currentType() == NodeType ? new SgNodeProperty : new SgSkeletonProperty;
        m_nodePage->configure(property);
        return property;
    }
    case NumericNodeType: {
        auto *property = new SgNumericNodeProperty;
        m_numericNodePage->configure(property);
        m_floatPage->configure(property, m_numericPage->obeyLimits());
        return property;
    }
    default:
        return nullptr;
    }
}

void SgCreatePropertyDlg::createProperties() {
    if (!validate())
        return;
    const int morphIndex = m_morphOptionsPage->morphIndex();
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
    for (SgPropertyPage *page : allPages())
        page->restoreDefaults();
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
    m_saved = {m_pathEdit->text(), m_nameEdit->text(), m_labelEdit->text(),
               m_hidden->isOn(),   m_locked->isOn(),   m_canAnimate->isOn()};
    for (SgPropertyPage *page : allPages())
        page->saveValues();
}

void SgCreatePropertyDlg::resetValues() {
    if (!m_resetValuesOnShow) {
        m_pathEdit->setText(m_saved.path);
        m_nameEdit->setText(m_saved.name);
        m_labelEdit->setText(m_saved.label);
        m_hidden->setOn(m_saved.hidden);
        m_locked->setOn(m_saved.locked);
        m_canAnimate->setOn(m_saved.canAnimate);
        for (SgPropertyPage *page : allPages())
            page->restoreValues();
    }
    reject();
}

// ---------------------------------------------------------------------------------------------
// The enum list editor (see SgEnumPropertyPage)

void SgCreatePropertyDlg::addDefaultEnumItem() {
    m_enumPage->addPlaceholder();
}

void SgCreatePropertyDlg::beginRenameEnum(QTreeWidgetItem *item, QPoint, int col) {
    m_enumPage->beginRename(item, col);
}

void SgCreatePropertyDlg::renameEnum(QTreeWidgetItem *item, int, QString text) {
    m_enumPage->rename(item, text);
}

void SgCreatePropertyDlg::moveEnumUp() {
    m_enumPage->moveUp();
}

void SgCreatePropertyDlg::moveEnumDown() {
    m_enumPage->moveDown();
}

void SgCreatePropertyDlg::removeEnum() {
    m_enumPage->remove();
}
