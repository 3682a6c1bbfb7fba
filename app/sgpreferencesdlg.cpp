#include "app/sgpreferencesdlg.h"

#include "sgcore/app/sgappsettings.h"

#include <QCheckBox>
#include <QDialogButtonBox>
#include <QFileDialog>
#include <QFormLayout>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QVBoxLayout>

namespace {
const QString kInstallPath = QStringLiteral("FacetorInstallPath");
const QString kBridgeTools = QStringLiteral("FacetorBridgeTools");
} // namespace

SgPreferencesDlg::SgPreferencesDlg(QWidget *parent) : QDialog(parent) {
    setObjectName(QStringLiteral("SgPreferencesDlg"));
    setWindowTitle(tr("Preferences"));
    const SgAppSettings settings;

    m_installPath = new QLineEdit(settings.getString(kInstallPath), this);
    m_installPath->setObjectName(QStringLiteral("SgPrefInstallPath"));
    m_installPath->setMinimumWidth(fontMetrics().horizontalAdvance(QLatin1Char('x')) * 40);
    m_installPath->setToolTip(
        tr("The folder that holds the Facetor program. The environment variable "
           "FACETOR_INSTALL_PATH takes precedence when it is set."));
    auto *browse = new QPushButton(tr("Browse..."), this);
    browse->setObjectName(QStringLiteral("SgPrefBrowse"));
    connect(browse, &QPushButton::clicked, this, &SgPreferencesDlg::browse);
    auto *pathRow = new QHBoxLayout;
    pathRow->addWidget(m_installPath, 1);
    pathRow->addWidget(browse);

    m_bridgeTools = new QCheckBox(tr("Open returned geometry in the Target Importer dialog"), this);
    m_bridgeTools->setObjectName(QStringLiteral("SgPrefBridgeTools"));
    m_bridgeTools->setChecked(settings.getInt(kBridgeTools, 0) != 0);
    m_bridgeTools->setToolTip(tr("Otherwise a small dialog asks what to make of it: a morph, a "
                                 "prop or a copy of the materials."));

    auto *form = new QFormLayout;
    form->addRow(tr("Facetor install folder:"), pathRow);
    form->addRow(QString(), m_bridgeTools);

    auto *buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);

    auto *layout = new QVBoxLayout(this);
    layout->addLayout(form);
    layout->addStretch(1);
    layout->addWidget(buttons);
}

void SgPreferencesDlg::store() const {
    SgAppSettings settings;
    settings.setString(kInstallPath, m_installPath->text().trimmed());
    settings.setInt(kBridgeTools, m_bridgeTools->isChecked() ? 1 : 0);
    settings.sync();
}

void SgPreferencesDlg::accept() {
    store();
    QDialog::accept();
}

void SgPreferencesDlg::browse() {
    const QString folder = QFileDialog::getExistingDirectory(this, tr("Facetor install folder"),
                                                             m_installPath->text());
    if (!folder.isEmpty())
        m_installPath->setText(folder);
}
