#include "sgcore/widgets/sgbasicdialog.h"

#include <QDialogButtonBox>
#include <QPushButton>
#include <QVBoxLayout>

SgBasicDialog::SgBasicDialog(QWidget *parent, const QString &name) : QDialog(parent) {
    setObjectName(name);
    setModal(true);
    auto *outer = new QVBoxLayout(this);
    m_body = new QVBoxLayout;
    outer->addLayout(m_body);
    m_buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
    m_buttons->button(QDialogButtonBox::Ok)->setText(tr("Ok"));
    m_buttons->button(QDialogButtonBox::Ok)->setDefault(true);
    outer->addWidget(m_buttons);
    connect(m_buttons, &QDialogButtonBox::accepted, this, &SgBasicDialog::accept);
    connect(m_buttons, &QDialogButtonBox::rejected, this, &SgBasicDialog::reject);
}

SgBasicDialog::~SgBasicDialog() = default;

void SgBasicDialog::addWidget(QWidget *widget) {
    m_body->addWidget(widget);
}

void SgBasicDialog::accept() {
    apply();
    QDialog::accept();
}

void SgBasicDialog::apply() {}
