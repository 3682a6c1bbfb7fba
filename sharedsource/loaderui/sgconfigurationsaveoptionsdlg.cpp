#include "sharedsource/loaderui/sgconfigurationsaveoptionsdlg.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sghelpmgr.h"

#include <QButtonGroup>
#include <QCheckBox>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QRadioButton>
#include <QVBoxLayout>

SgConfigurationSaveOptionsDlg::SgConfigurationSaveOptionsDlg(QWidget *parent)
    : SgBasicDialog(parent, QStringLiteral("Configuration Save Options")) {
    setWindowTitle(tr("Project Save Options"));
    auto *page = new QWidget(this);
    auto *pageLayout = new QVBoxLayout(page);
    m_options = new QGroupBox(tr("Options:"), page);
    auto *strip = new QHBoxLayout(m_options);
    m_saveObjects = new QCheckBox(tr("Save Object Configurations"), m_options);
    m_saveObjects->setObjectName(QStringLiteral("MorphLoaderSaveObjectConfigurationCheckBox"));
    m_saveObjects->setChecked(true);
    m_relative = new QRadioButton(tr("Save with Relative Paths"), m_options);
    m_relative->setObjectName(QStringLiteral("MorphLoaderRelativePathButton"));
    m_relative->setChecked(true);
    m_absolute = new QRadioButton(tr("Save with Absolute Paths"), m_options);
    m_absolute->setObjectName(QStringLiteral("MorphLoaderAbsolutePathButton"));
    auto *exclusive = new QButtonGroup(m_options);
    exclusive->addButton(m_relative);
    exclusive->addButton(m_absolute);
    strip->addWidget(m_saveObjects);
    strip->addWidget(m_relative);
    strip->addWidget(m_absolute);
    pageLayout->addWidget(m_options);
    addWidget(page);
    if (SgHelpMgr *help = sgApp ? sgApp->getHelpMgr() : nullptr) {
        for (QObject *object :
             {static_cast<QObject *>(this), static_cast<QObject *>(m_options),
              static_cast<QObject *>(m_saveObjects), static_cast<QObject *>(m_relative),
              static_cast<QObject *>(m_absolute)})
            help->setOnlineHelp(object);
    }
}

SgConfigurationSaveOptionsDlg::~SgConfigurationSaveOptionsDlg() = default;

void SgConfigurationSaveOptionsDlg::apply() {
    m_applied = true;
    m_saveObjectConfigurations = m_saveObjects->isChecked();
    m_relativePaths = m_relative->isChecked();
}
