#include "sgcore/plugin/sgaction.h"

SgAction::SgAction(const QString &text, const QString &iconName, QObject *parent)
    : QAction(text, parent), m_iconName(iconName) {
    connect(this, &QAction::triggered, this, [this] { executeAction(); });
    connect(this, &QAction::toggled, this, [this](bool on) { toggleAction(on); });
}

SgAction::~SgAction() = default;

QString SgAction::getActionGroup() const {
    return QStringLiteral("Plug-ins");
}

QString SgAction::getDefaultMenuPath() const {
    return QStringLiteral("&Scripts/Plug-ins");
}

QString SgAction::getDefaultToolBar() const {
    return QString();
}

QString SgAction::getDefaultAccel() const {
    return QString();
}

void SgAction::init() {}

void SgAction::styleChange() {}

void SgAction::updateOnlineHelp() {}

void SgAction::executeAction() {}

void SgAction::toggleAction(bool) {}
