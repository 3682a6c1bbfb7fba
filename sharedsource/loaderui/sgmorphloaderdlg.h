#pragma once

#include "sgcore/widgets/sgbasicdialog.h"
#include "sharedsource/loaderui/sgmorphconfiguration.h"

#include <memory>

class QComboBox;
class QLabel;
class QTextBrowser;
class SgFileIOPresetWidget;
class SgMorphFileItem;
class SgMorphSourceList;
class SgNode;
class SgVertexMesh;

// "Target Importer": the morph loader dialog. In file mode (no geometry given) the user picks
// geometry files, import options and the nodes to load onto, edits each source's settings and
// can save and load configuration files. In bridge mode the list holds the one in-memory
// source given at construction and an "Action:" box offers the four bridge actions.
//
// Accepting with a morph action runs every source into one load log, replaces the options page
// by the log page and keeps the dialog open; the next "Ok" accepts when the log holds no
// warning or error and rejects otherwise. After the run, Escape and the window's close box end
// the dialog as that second "Ok" does (the run has happened: it cannot be cancelled). Other
// actions accept at once.
//
// Application settings: group "TargetImporter" with "Preset", "Nodes" and "LastDirectory"; the
// default group's "LastDirectory" for saving configurations.
class SgMorphLoaderDlg : public SgBasicDialog {
    Q_OBJECT
public:
    // A null `mesh` selects file mode. With `offerPrimarySelection` false the nodes box is fixed
    // on "Selected Node (Vertex Only)". `mesh` is referenced while listed; `node` is not owned.
    SgMorphLoaderDlg(QWidget *parent, bool offerPrimarySelection, SgVertexMesh *mesh, SgNode *node);
    ~SgMorphLoaderDlg() override;

    // The chosen action: "Create Morph" (the default), "Create Prop", "Create Morph And Copy
    // Materials" or "Copy Materials".
    QString actionText() const { return m_action; }

    // The list of sources and the configuration reader/writer that works on it.
    SgMorphSourceList *sourceList() const { return m_sourceList; }
    SgMorphConfiguration &configuration() { return *m_configuration; }
    bool relativePaths() const { return m_configuration->relativePaths(); }
    bool saveObjectConfigurations() const { return m_configuration->saveObjectConfigurations(); }

    // The configuration operations (see SgMorphConfiguration); saving and loading run through
    // the slots below in normal use.
    void saveObjectConfiguration(const QString &path, SgMorphFileItem *source, const QString &base);
    void saveProjectConfiguration(const QString &path);
    void loadConfigurationFile(const QString &path, const QString &base);

public slots:
    // First acceptance with a morph action: the run; afterwards the close (see class comment).
    void accept() override;
    // Before the run: cancels. After the run: as the second "Ok".
    void reject() override;

    void chooseFiles();
    void clearList();
    void removeItem();
    void moveUp();
    void moveDown();
    void loadConfiguration();
    void saveConfiguration();
    void actionChanged(QString string);
    void saveObjectsOnly();

private:
    void buildGeometryBox(QWidget *page, bool offerPrimarySelection);
    void buildActionRow(QWidget *page);
    void buildFileButtons(QWidget *page);
    void buildListButtons(QWidget *page);
    void buildLogPage();
    void run();
    void closeAfterRun();
    int nodeMode() const;
    void registerHelp(QObject *object);

    bool m_ran = false;
    bool m_closeAccepts = false;
    QWidget *m_optionsPage = nullptr;
    QWidget *m_logPage = nullptr;
    SgFileIOPresetWidget *m_presetWidget = nullptr;
    SgMorphSourceList *m_sourceList = nullptr;
    QComboBox *m_nodesBox = nullptr;
    QTextBrowser *m_logView = nullptr;
    QLabel *m_logHeading = nullptr;
    SgVertexMesh *m_mesh = nullptr;
    QComboBox *m_actionBox = nullptr;
    QString m_action;
    std::unique_ptr<SgMorphConfiguration> m_configuration;
};
