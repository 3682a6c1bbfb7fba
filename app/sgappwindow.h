#pragma once

#include <QMainWindow>

class QMenu;
class SgAction;
class SgLogPane;
class SgMeshView;
class SgNode;
class SgProgressView;
class SgPropertyPanel;
class SgSceneTree;

// The application's main window: the scene as a tree (left), a front view of the scene's
// current geometry (centre), the property panel of the primary selection (right), the log pane
// fed by the host log (bottom), the status line, and a progress dialog for the host's progress
// runs. Plug-in actions are placed with `addPluginAction`.
//
// Menus: "File > Open Scene...", "Save Scene", "Save Scene As..." (scene files with the user's
// morphs, control properties, props and materials), "Export OBJ..." (the primary selection's
// current geometry with an MTL file), "Preferences...", "Quit"; "View > Frame Selection",
// "Frame All"; "Edit > Delete" (the selected props and figures); "Tools > Target Importer..."
// (morph targets from geometry files onto the selection).
//
// Unsaved changes: any change to the scene (nodes added or removed, scene updates, values set
// in the property panel) marks the scene modified ("*" in the title). Closing the window or
// opening another scene then asks "Save", "Discard" or "Cancel"; the calls a script or test
// makes directly (`openScene`, `saveScene`) never ask.
//
// It registers itself as the host's main window (`sgApp->getInterface()`); `sgApp` must exist.
class SgAppWindow : public QMainWindow {
    Q_OBJECT
public:
    explicit SgAppWindow(QWidget *parent = nullptr);
    ~SgAppWindow() override;

    // Puts a plug-in action in the menu given by its default menu path ("&Scripts/Plug-ins"),
    // in a sub-menu named after its category (`getActionGroup`), and on the tool bar of that
    // category (or its default tool bar when it names one); then calls its `init`.
    void addPluginAction(SgAction *action);

    // Loads a scene file into the scene (replacing it); false with a warning box and a log line
    // when the file cannot be loaded, the scene then left as it was. With `quiet` no box is
    // shown.
    bool openScene(const QString &path, bool quiet = false);
    // Saves the scene to `path` (the current scene file when empty) and makes it the current
    // scene file; false with a log line (and a warning box unless `quiet`) when it fails.
    bool saveScene(const QString &path = QString(), bool quiet = false);
    // The scene file the scene was opened from or saved to last ("" for a new scene).
    QString scenePath() const { return m_scenePath; }
    bool isSceneModified() const { return m_modified; }
    // Asks "Save", "Discard" or "Cancel" when the scene has unsaved changes: true when the
    // caller may go on (nothing to save, saved, or discarded), false on "Cancel" or a failed
    // or cancelled save.
    bool maybeSaveChanges();
    // Removes the selected nodes other than bones (a bone goes only with its figure) through the
    // scene, with their descendants, so that every holder of a node hears of it. With `ask`
    // the user confirms first. Returns how many selected nodes were removed.
    int deleteSelection(bool ask = true);
    // Writes the primary selection's current geometry to `path`; false with a log line when
    // there is nothing selected or the file cannot be written.
    bool exportSelection(const QString &path, bool quiet = false);

    SgSceneTree *sceneTree() const { return m_tree; }
    SgPropertyPanel *propertyPanel() const { return m_panel; }
    SgLogPane *logPane() const { return m_log; }
    SgMeshView *meshView() const { return m_view; }
    SgProgressView *progressView() const { return m_progress; }
    // The menu at a "/"-separated path of titles, created on demand.
    QMenu *menuAt(const QString &path);

protected:
    void closeEvent(QCloseEvent *event) override;

private slots:
    void openSceneDialog();
    // "Save Scene As...": asks for a file; true when the scene was saved.
    bool saveSceneAsDialog();
    void preferencesDialog();
    void markModified();
    void exportObjDialog();
    // "Tools > Target Importer...": the morph loader dialog in file mode on the current
    // selection, so that many targets load in one run.
    void openTargetImporter();
    void primaryChanged();

private:
    void buildMenus();
    void setModified(bool modified);
    void updateTitle();

    SgSceneTree *m_tree = nullptr;
    SgPropertyPanel *m_panel = nullptr;
    SgLogPane *m_log = nullptr;
    SgMeshView *m_view = nullptr;
    SgProgressView *m_progress = nullptr;
    SgNode *m_panelNode = nullptr;
    QString m_scenePath;
    bool m_modified = false;
};
