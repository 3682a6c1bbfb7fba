#include "bridge/sgbridgemorphdlg.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgnode.h"

#include <QCheckBox>
#include <QComboBox>
#include <QDialogButtonBox>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QVBoxLayout>

namespace {

// One row of the settings box: a plain widget with a horizontal layout.
QHBoxLayout *addRow(QGroupBox *box, const QString &label) {
    auto *row = new QWidget(box);
    auto *layout = new QHBoxLayout(row);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(new QLabel(label, row));
    box->layout()->addWidget(row);
    return layout;
}

} // namespace

SgBridgeMorphDlg::SgBridgeMorphDlg(const QString &label, QWidget *parent, SgNode *node)
    : SgBasicDialog(parent, QStringLiteral("Create Morph")),
      m_action(QStringLiteral("Create Morph")) {
    auto *box = new QGroupBox(tr("Morph Settings:"), this);
    new QVBoxLayout(box);

    QHBoxLayout *actionRow = addRow(box, tr("Action:"));
    m_actionCombo = new QComboBox(box);
    m_actionCombo->setObjectName(QStringLiteral("FcBridgehAction"));
    m_actionCombo->setEditable(false);
    m_actionCombo->addItems({QStringLiteral("Create Morph"), QStringLiteral("Create Prop"),
                             QStringLiteral("Create Morph And Copy Materials"),
                             QStringLiteral("Copy Materials")});
    actionRow->addWidget(m_actionCombo);
    actionRow->addStretch();

    QHBoxLayout *groupRow = addRow(box, tr("Group Path:"));
    m_groupCombo = new QComboBox(box);
    m_groupCombo->setObjectName(QStringLiteral("FcBridgeMorphGroup"));
    m_groupCombo->setEditable(true);
    groupRow->addWidget(m_groupCombo);
    groupRow->addStretch();

    QHBoxLayout *nameRow = addRow(box, tr("Morph Name:"));
    m_nameEdit = new QLineEdit(box);
    m_nameEdit->setObjectName(QStringLiteral("FcBridgeMorphName"));
    m_nameEdit->setText(QStringLiteral("My Morph"));
    nameRow->addWidget(m_nameEdit);

    QHBoxLayout *overrideRow = addRow(box, tr("Override Existing Morph?"));
    m_overrideBox = new QCheckBox(box);
    m_overrideBox->setObjectName(QStringLiteral("FcOverrideExistingCheck"));
    m_overrideBox->setChecked(false);
    overrideRow->addWidget(m_overrideBox);
    overrideRow->addStretch(3);

    addWidget(box);

    m_groupCombo->addItem(QStringLiteral("Morphs/FacetorBridge"));
    if (node) {
        if (SgPropertyGroupTree *groups = node->getPropertyGroups())
            m_groupCombo->addItems(groups->getAllPaths());
    }
    m_groupCombo->setCurrentIndex(0);

    connect(m_actionCombo, &QComboBox::textActivated, this, &SgBridgeMorphDlg::actionChanged);
    connect(m_nameEdit, &QLineEdit::textChanged, this, &SgBridgeMorphDlg::updateOkButton);

    setWindowTitle(tr("Action for ") + label);
    resize(minimumSizeHint().expandedTo(QSize(300, 100)));

    SgHelpMgr *help = sgApp->getHelpMgr();
    help->setOnlineHelp(m_nameEdit);
    help->setOnlineHelp(m_groupCombo);
    help->setOnlineHelp(m_overrideBox);
    help->setOnlineHelp(m_actionCombo);
}

SgBridgeMorphDlg::~SgBridgeMorphDlg() = default;

void SgBridgeMorphDlg::actionChanged(const QString &) {
    m_action = m_actionCombo->currentText();
    const bool morph = m_action.contains(QLatin1String("Morph"));
    m_groupCombo->setEnabled(morph);
    m_nameEdit->setEnabled(morph);
    m_overrideBox->setEnabled(morph);
    updateOkButton();
}

void SgBridgeMorphDlg::updateOkButton() {
    // A blank name would make a morph named "": a morph action needs a name.
    const bool morph = m_action.contains(QLatin1String("Morph"));
    if (QPushButton *ok = buttonBox()->button(QDialogButtonBox::Ok))
        ok->setEnabled(!morph || !m_nameEdit->text().trimmed().isEmpty());
}

void SgBridgeMorphDlg::apply() {
    if (!m_groupCombo || !m_nameEdit || !m_overrideBox)
        return;
    m_groupPath = m_groupCombo->currentText().replace(QLatin1Char('\\'), QLatin1Char('/'));
    m_morphName = m_nameEdit->text();
    m_override = m_overrideBox->isChecked();
}
