#pragma once

#include <QAction>
#include <QString>

// An action that a plug-in adds to the host: a QAction whose triggering calls executeAction()
// and whose toggling calls toggleAction(). The host reads the category, menu path, tool bar and
// shortcut to place it.
class SgAction : public QAction {
    Q_OBJECT
public:
    // `text` is the menu text; `iconName` names an icon of the host's theme (may be empty).
    explicit SgAction(const QString &text, const QString &iconName = QString(),
                      QObject *parent = nullptr);
    ~SgAction() override;

    // The group the action is listed under in the host's action lists. Default "Plug-ins".
    virtual QString getActionGroup() const;
    // Where the host puts the action in its menus, "&Scripts/Plug-ins" unless overridden.
    virtual QString getDefaultMenuPath() const;
    // The tool bar the action appears on; empty for none (the default).
    virtual QString getDefaultToolBar() const;
    // The shortcut; empty for none (the default).
    virtual QString getDefaultAccel() const;
    // Called by the host once the action has been placed. The default does nothing.
    virtual void init();
    // Called when the host's style changes. The default does nothing.
    virtual void styleChange();
    // Called when the host's help changes. The default does nothing.
    virtual void updateOnlineHelp();

    const QString &getIconName() const { return m_iconName; }

public slots:
    // The action was triggered. The default does nothing.
    virtual void executeAction();
    // A checkable action was toggled. The default does nothing.
    virtual void toggleAction(bool onOff);

private:
    QString m_iconName;
};
