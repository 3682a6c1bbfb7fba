#include "sharedsource/loaderui/sgmorphloaderdlg.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/widgets/sgfileiopresetwidget.h"
#include "sgcore/widgets/sgopenfilesdialog.h"
#include "sharedsource/engine/sgmorphloadlog.h"
#include "sharedsource/loaderui/sgconfigurationsaveoptionsdlg.h"
#include "sharedsource/loaderui/sgexistingfolder.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QFileDialog>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QStyle>
#include <QTextBrowser>
#include <QVBoxLayout>

namespace {
const QString s_group = QStringLiteral("TargetImporter");
const QString s_lastDirectory = QStringLiteral("LastDirectory");
const QString s_configurationFilter = QStringLiteral("Configuration files (*.scx )");

QPushButton *makeButton(QWidget *parent, const QString &text, const QString &name) {
    auto *button = new QPushButton(text, parent);
    button->setObjectName(name);
    return button;
}
} // namespace

SgMorphLoaderDlg::SgMorphLoaderDlg(QWidget *parent, bool offerPrimarySelection, SgVertexMesh *mesh,
                                   SgNode *node)
    : SgBasicDialog(parent, QStringLiteral("Morph Loader")), m_mesh(mesh),
      m_action(QStringLiteral("Create Morph")) {
    setWindowTitle(tr("Target Importer"));
    registerHelp(this);
    const int metric = qMax(0, style()->pixelMetric(QStyle::PM_CustomBase));
    m_optionsPage = new QWidget(this);
    auto *layout = new QVBoxLayout(m_optionsPage);
    layout->setContentsMargins(metric, metric, metric, metric);
    layout->setSpacing(metric);
    addWidget(m_optionsPage);
    registerHelp(m_optionsPage);
    if (!m_mesh) {
        buildGeometryBox(m_optionsPage, offerPrimarySelection);
        buildFileButtons(m_optionsPage);
    } else {
        buildActionRow(m_optionsPage);
    }
    m_sourceList = new SgMorphSourceList(m_optionsPage, QStringLiteral("MorphLoaderSourceList"));
    layout->addWidget(m_sourceList, 100);
    registerHelp(m_sourceList);
    m_configuration = std::make_unique<SgMorphConfiguration>(m_sourceList, this);
    if (m_mesh)
        m_sourceList->addMesh(m_mesh, node);
    connect(m_sourceList, &SgMorphSourceList::saveObject, this, &SgMorphLoaderDlg::saveObjectsOnly);
    if (!m_mesh)
        buildListButtons(m_optionsPage);
    buildLogPage();
}

SgMorphLoaderDlg::~SgMorphLoaderDlg() = default;

void SgMorphLoaderDlg::registerHelp(QObject *object) {
    if (SgHelpMgr *help = sgApp ? sgApp->getHelpMgr() : nullptr)
        help->setOnlineHelp(object);
}

void SgMorphLoaderDlg::buildGeometryBox(QWidget *page, bool offerPrimarySelection) {
    auto *box = new QGroupBox(tr("Geometry:"), page);
    auto *boxLayout = new QVBoxLayout(box);
    m_presetWidget = new SgFileIOPresetWidget(box, SgFileIOPresetWidget::ImportConversion,
                                              QStringLiteral("SgTargetImporter"));
    SgAppSettings settings(s_group);
    m_presetWidget->setPreset(settings.getString(QStringLiteral("Preset")));
    boxLayout->addWidget(m_presetWidget);
    page->layout()->addWidget(box);
    auto *label = new QLabel(tr("Load Morphs for:"), page);
    m_nodesBox = new QComboBox(page);
    m_nodesBox->setObjectName(QStringLiteral("MorphLoaderNodes"));
    m_nodesBox->setEditable(false);
    m_nodesBox->addItem(tr("All Group / Bone Matches in Figure"));
    m_nodesBox->addItem(tr("Group / Bone Matches for Selected Nodes"));
    if (offerPrimarySelection) {
        m_nodesBox->addItem(tr("Primary Selection (Vertex Only)"));
        // A stored index outside the box (a damaged settings file) falls back to the first.
        const int stored = settings.getInt(QStringLiteral("Nodes"), 0);
        m_nodesBox->setCurrentIndex(stored >= 0 && stored < m_nodesBox->count() ? stored : 0);
    } else {
        // The fixed choice wins over the stored index: the box is disabled, so the user could
        // not see or undo a different stored mode.
        m_nodesBox->addItem(tr("Selected Node (Vertex Only)"));
        m_nodesBox->setCurrentIndex(2);
        m_nodesBox->setEnabled(false);
    }
    page->layout()->addWidget(label);
    page->layout()->addWidget(m_nodesBox);
    for (QObject *object : {static_cast<QObject *>(box), static_cast<QObject *>(m_presetWidget),
                            static_cast<QObject *>(label), static_cast<QObject *>(m_nodesBox)})
        registerHelp(object);
}

void SgMorphLoaderDlg::buildActionRow(QWidget *page) {
    auto *row = new QHBoxLayout;
    auto *label = new QLabel(tr("Action:"), page);
    m_actionBox = new QComboBox(page);
    m_actionBox->setObjectName(QStringLiteral("FcBridgehAction"));
    m_actionBox->setEditable(false);
    m_actionBox->addItems({tr("Create Morph"), tr("Create Prop"),
                           tr("Create Morph And Copy Materials"), tr("Copy Materials")});
    row->addWidget(label);
    row->addWidget(m_actionBox);
    row->addStretch();
    static_cast<QVBoxLayout *>(page->layout())->addLayout(row);
    connect(m_actionBox, &QComboBox::textActivated, this, &SgMorphLoaderDlg::actionChanged);
    registerHelp(label);
    registerHelp(m_actionBox);
}

void SgMorphLoaderDlg::buildFileButtons(QWidget *page) {
    auto *row = new QHBoxLayout;
    auto *choose = makeButton(page, tr("Choose Files..."), QStringLiteral("MorphLoaderBrowseBtn"));
    auto *load = makeButton(page, tr("Load Configuration..."),
                            QStringLiteral("MorphLoaderLoadConfigurationBtn"));
    auto *save = makeButton(page, tr("Save Configuration..."),
                            QStringLiteral("MorphLoaderSaveConfigurationBtn"));
    row->addWidget(choose);
    row->addStretch();
    row->addSpacing(qMax(0, style()->pixelMetric(QStyle::PM_CustomBase)));
    row->addWidget(load);
    row->addWidget(save);
    static_cast<QVBoxLayout *>(page->layout())->addLayout(row);
    connect(choose, &QPushButton::clicked, this, &SgMorphLoaderDlg::chooseFiles);
    connect(load, &QPushButton::clicked, this, &SgMorphLoaderDlg::loadConfiguration);
    connect(save, &QPushButton::clicked, this, &SgMorphLoaderDlg::saveConfiguration);
    for (QObject *object : {choose, load, save})
        registerHelp(object);
}

void SgMorphLoaderDlg::buildListButtons(QWidget *page) {
    auto *row = new QHBoxLayout;
    const struct {
        QString text;
        QString name;
        void (SgMorphLoaderDlg::*slot)();
    } buttons[] = {
        {tr("Clear List"), QStringLiteral("MorphLoaderClearBtn"), &SgMorphLoaderDlg::clearList},
        {tr("Remove"), QStringLiteral("MorphLoaderRemoveBtn"), &SgMorphLoaderDlg::removeItem},
        {tr("Move Up"), QStringLiteral("MorphLoaderMoveUpBtn"), &SgMorphLoaderDlg::moveUp},
        {tr("Move Down"), QStringLiteral("MorphLoaderMoveDownBtn"), &SgMorphLoaderDlg::moveDown},
    };
    for (const auto &entry : buttons) {
        QPushButton *button = makeButton(page, entry.text, entry.name);
        row->addWidget(button);
        connect(button, &QPushButton::clicked, this, entry.slot);
        registerHelp(button);
    }
    static_cast<QVBoxLayout *>(page->layout())->addLayout(row);
}

void SgMorphLoaderDlg::buildLogPage() {
    m_logPage = new QWidget(this);
    auto *layout = new QVBoxLayout(m_logPage);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    m_logHeading = new QLabel(tr("Loading Morphs..."), m_logPage);
    m_logHeading->setObjectName(QStringLiteral("MorphLoaderLogHeading"));
    m_logView = new QTextBrowser(m_logPage);
    m_logView->setObjectName(QStringLiteral("MorphLoaderLog"));
    layout->addWidget(m_logHeading);
    layout->addWidget(m_logView, 100);
    m_logPage->hide();
    addWidget(m_logPage);
    registerHelp(m_logPage);
    registerHelp(m_logView);
}

// ---------------------------------------------------------------------------------------------
// Acceptance and the run

void SgMorphLoaderDlg::accept() {
    if (!m_action.contains(QLatin1String("Morph"))) {
        SgBasicDialog::accept();
        return;
    }
    if (m_ran) {
        closeAfterRun();
        return;
    }
    run();
}

void SgMorphLoaderDlg::reject() {
    if (m_ran)
        closeAfterRun();
    else
        SgBasicDialog::reject();
}

void SgMorphLoaderDlg::closeAfterRun() {
    if (m_closeAccepts)
        SgBasicDialog::accept();
    else
        SgBasicDialog::reject();
}

int SgMorphLoaderDlg::nodeMode() const {
    if (!m_nodesBox)
        return 1;
    return qBound(0, m_nodesBox->currentIndex(), 2);
}

void SgMorphLoaderDlg::run() {
    SgAppSettings settings(s_group);
    SgMorphLoadLog log;
    m_optionsPage->hide();
    m_logPage->show();
    buttonBox()->button(QDialogButtonBox::Cancel)->setEnabled(false);
    buttonBox()->button(QDialogButtonBox::Ok)->setText(tr("Ok"));
    SgFileIOSettings options;
    if (m_presetWidget) {
        settings.setString(QStringLiteral("Preset"), m_presetWidget->presetName());
        settings.setInt(QStringLiteral("Nodes"), m_nodesBox->currentIndex());
        settings.sync();
        m_presetWidget->getAllSettings(options, false);
    } else {
        options.setValue(QStringLiteral("LatAxis"), QStringLiteral("X"));
        options.setValue(QStringLiteral("VertAxis"), QStringLiteral("Y"));
        options.setValue(QStringLiteral("DepthAxis"), QStringLiteral("Z"));
        options.setValue(QStringLiteral("InvertLatAxis"), false);
        options.setValue(QStringLiteral("InvertVertAxis"), false);
        options.setValue(QStringLiteral("InvertDepthAxis"), false);
        options.setValue(QStringLiteral("Scale"), 1.0);
        options.setValue(QStringLiteral("Preset"), QStringLiteral("Custom"));
    }
    m_sourceList->createMorphs(options, nodeMode(), log);
    m_logView->setHtml(log.toHtml());
    m_ran = true;
    m_closeAccepts = !log.hasProblems();
    m_logHeading->setText(m_closeAccepts ? tr("Morphs Loaded:")
                                         : tr("Morphs Loaded, with Warnings or Errors:"));
}

// ---------------------------------------------------------------------------------------------
// Slots

void SgMorphLoaderDlg::chooseFiles() {
    SgAppSettings settings(s_group);
    QString folder = settings.getString(s_lastDirectory);
    if (folder.isEmpty())
        folder = sgApp->getDocumentsPath();
    QString filter;
    sgApp->getImportMgr()->makeGeometryFileFilter(filter, QString(), true);
    QStringList files;
    if (!SgOpenFilesDialog::doOpenFilesDialog(files, tr("Select Geometry Files for Morphs"),
                                              sgExistingFolder(folder), filter, this))
        return;
    m_sourceList->addFiles(files);
    if (!files.isEmpty())
        settings.setString(s_lastDirectory, SgFileIO::getFilePath(files.first()));
}

void SgMorphLoaderDlg::clearList() {
    m_sourceList->clear();
}

void SgMorphLoaderDlg::removeItem() {
    m_sourceList->removeSelected();
}

void SgMorphLoaderDlg::moveUp() {
    m_sourceList->moveSelected(true);
}

void SgMorphLoaderDlg::moveDown() {
    m_sourceList->moveSelected(false);
}

void SgMorphLoaderDlg::loadConfiguration() {
    const QString folder = SgAppSettings(s_group).getString(s_lastDirectory);
    QFileDialog dialog(sgApp->getInterface(), tr("Choose a Configuration file"),
                       sgExistingFolder(folder), s_configurationFilter);
    dialog.setObjectName(QStringLiteral("Open file dialog"));
    dialog.setFileMode(QFileDialog::ExistingFiles);
    if (dialog.exec() != QDialog::Accepted)
        return;
    for (const QString &file : dialog.selectedFiles()) {
        const QString fileFolder = SgFileIO::getFilePath(file);
        SgAppSettings(s_group).setString(s_lastDirectory, fileFolder);
        loadConfigurationFile(file, fileFolder);
    }
}

void SgMorphLoaderDlg::saveConfiguration() {
    if (m_sourceList->topLevelItemCount() == 0)
        return;
    auto *options = new SgConfigurationSaveOptionsDlg(this);
    options->exec();
    const bool applied = options->applied();
    if (applied) {
        m_configuration->setSaveObjectConfigurations(options->saveObjectConfigurations());
        m_configuration->setRelativePaths(options->relativePaths());
    }
    delete options;
    if (!applied)
        return;
    SgAppSettings defaults;
    QFileDialog dialog(sgApp->getInterface(), tr("Choose a Configuration file"),
                       sgExistingFolder(defaults.getString(s_lastDirectory)),
                       s_configurationFilter);
    dialog.setObjectName(QStringLiteral("Save file dialog"));
    dialog.setAcceptMode(QFileDialog::AcceptSave);
    if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
        return;
    const QString path = dialog.selectedFiles().first();
    if (path.isEmpty())
        return;
    defaults.setString(s_lastDirectory, SgFileIO::getFilePath(path));
    saveProjectConfiguration(path);
}

void SgMorphLoaderDlg::actionChanged(QString) {
    if (!m_actionBox)
        return;
    m_action = m_actionBox->currentText();
    m_sourceList->setEnabled(m_action.contains(QLatin1String("Morph")));
}

void SgMorphLoaderDlg::saveObjectsOnly() {
    m_configuration->setRelativePaths(true);
    for (int i = 0; i < m_sourceList->topLevelItemCount(); ++i) {
        QTreeWidgetItem *row = m_sourceList->topLevelItem(i);
        if (!row->isSelected() || row->type() != SgMorphFileItem::Type)
            continue;
        const QString path = row->text(1);
        saveObjectConfiguration(path, static_cast<SgMorphFileItem *>(row),
                                SgFileIO::getFilePath(path));
    }
}

void SgMorphLoaderDlg::saveObjectConfiguration(const QString &path, SgMorphFileItem *source,
                                               const QString &base) {
    m_configuration->saveObjectConfiguration(path, source, base);
}

void SgMorphLoaderDlg::saveProjectConfiguration(const QString &path) {
    m_configuration->saveProjectConfiguration(path);
}

void SgMorphLoaderDlg::loadConfigurationFile(const QString &path, const QString &base) {
    m_configuration->loadConfigurationFile(path, base);
}
