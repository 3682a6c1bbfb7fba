#pragma once

#include <QList>
#include <QObject>
#include <QString>

class SgFaceGroupCache;
class SgFileIOSettings;
class SgMorphDeltas;
class SgMorphLoaderQuestions;
class SgMorphLoadLog;
class SgNode;
class SgNumericProperty;
class SgObject;
class SgVertexMesh;

// One morph source's settings and the engine that turns target geometry into morphs.
//
// Target geometry comes from a file (read through the host's import manager) or from memory
// (the bridge's returned mesh). For each target node the loader finds the matching geometry
// (on the node-list entries a bone matches the face group of its name, a figure the group
// "BODY", any other node the whole mesh by vertex order), checks the vertex count, computes the
// per-vertex deltas against the node's own mesh, optionally undoes the node's deformations
// first, creates or updates an `SgMorph` modifier and links its value channel to a control
// property through an `SgERCLink`.
//
// Progress goes to the host log (per-node details), the host status line (load and vertex-count
// problems) and the run's `SgMorphLoadLog` (one entry per source or node list).
//
// A run over a node list is all or nothing: every node's morph is worked out before the scene
// changes, and a node whose target cannot be used (coordinates that are not finite numbers, a
// vertex count that does not match) fails the whole source, with nothing made and nothing
// removed. Nodes that only have nothing to take (no face group, no motion) are skipped.
//
// Questions to the user (a new morph name, a pose file that does not load) go through
// `SgMorphLoaderQuestions`; by default they are the host's modal dialogs.
//
// Ownership: the control node is never owned. An unplaced control property (one without an
// owner, or owned by an `SgMorph` that is on no object) belongs to the loader and is deleted
// when it is replaced, when placing it fails and when the loader is destroyed.
//
// Main (GUI) thread only.
class SgMorphLoader : public QObject {
    Q_OBJECT
public:
    // Override modes.
    enum Override : short {
        MakeUnique = 0,     // ask for a new name while a morph of the name exists
        DeltasAndLinks = 1, // replace the existing morph's deltas and drop its controllers
        DeltasOnly = 2      // replace the existing morph's deltas and keep its links
    };

    SgMorphLoader();
    ~SgMorphLoader() override;

    // ---- Getters (one per setting) ----
    bool createControl() const { return m_createControl; }                   // default true
    bool useCustomValue() const { return m_useCustomValue; }                 // default false
    bool useCustomLabel() const { return m_useCustomLabel; }                 // default false
    bool applyAfterJoint() const { return m_applyAfterJoint; }               // default false
    bool hideSecondary() const { return m_hideSecondary; }                   // default false
    bool reverseModifiers() const { return m_reverseModifiers; }             // default false
    float customValue() const { return m_customValue; }                      // default 1.0
    QString filename() const { return m_filename; }                          // default empty
    QString morphGroup() const { return m_morphGroup; }                      // default empty
    QString customLabel() const { return m_customLabel; }                    // default empty
    QString morphName() const { return m_morphName; }                        // default empty
    SgNode *controlNode() const { return m_controlNode; }                    // default none
    SgNumericProperty *controlProperty() const { return m_controlProperty; } // default none
    bool scenaraExported() const { return m_scenaraExported; }               // default false
    bool ignoredInvisibleNodes() const { return m_ignoredInvisibleNodes; }   // default true
    bool weldedGeometry() const { return m_weldedGeometry; }                 // default false
    bool removedUnusedVertices() const { return m_removedUnusedVertices; }   // default false
    bool fourthWeldFlag() const { return m_fourthWeldFlag; }                 // default false
    QString poseFile() const { return m_poseFile; }                          // default empty
    short ercType() const { return m_ercType; }              // default 0 ("ERC[DeltaAdd]")
    short override() const { return m_override; }            // default 0 (MakeUnique)
    bool cleanUpOrphans() const { return m_cleanUpOrphans; } // default true

    // The label that morph channels get when "use custom label" is on: the custom label when it
    // is not empty, else the morph name.
    QString label() const;

    // ---- Setters ----
    // Setters with a change signal store the value and emit only when it differs.
    void setCreateControl(bool on);
    void setUseCustomValue(bool on);
    void setUseCustomLabel(bool on);
    void setApplyAfterJoint(bool on);
    void setHideSecondary(bool on);
    void setReverseModifiers(bool on);
    void setCustomValue(float value);
    void setFilename(const QString &fileName);
    void setMorphGroup(const QString &group);
    void setCustomLabel(const QString &label);
    void setMorphName(const QString &name);
    void setControlNode(SgNode *node);
    // A different property first discards an unplaced current one (deletes it, or the control
    // morph that carries it). The loader takes ownership of `property` while it is unplaced.
    void setControlProperty(SgNumericProperty *property);
    // Values above 2 are stored as 0 (MakeUnique); the stored value is emitted.
    void setOverride(short mode);

    // Setters without a signal just store. The five figure options describe geometry that the
    // host exported as one welded figure mesh; they are handed to the figure welder that
    // un-welds it on the node-list entries.
    void setScenaraExported(bool on) { m_scenaraExported = on; }
    void setIgnoredInvisibleNodes(bool on) { m_ignoredInvisibleNodes = on; }
    void setWeldedGeometry(bool on) { m_weldedGeometry = on; }
    void setRemovedUnusedVertices(bool on) { m_removedUnusedVertices = on; }
    void setFourthWeldFlag(bool on) { m_fourthWeldFlag = on; }
    void setPoseFile(const QString &path) { m_poseFile = path; }
    // 0 to 5, the `SgERCLink` type passed unchanged.
    void setErcType(short type) { m_ercType = type; }
    void setCleanUpOrphans(bool on) { m_cleanUpOrphans = on; }

    // Who answers the run's questions; null (the default) asks with the host's dialogs. Not
    // owned: it must outlive the runs that use it.
    void setQuestions(SgMorphLoaderQuestions *questions) { m_questions = questions; }

    // ---- Entry points ----
    // The pose step, run by the source list before each source: with reverse deformations on
    // and a pose file other than empty or "None", loads the file as a host script and runs it.
    // A file that does not load asks "Pose File Error" through the questions (going on without
    // the pose: true; not: false, skip this source). Otherwise true.
    bool applyPose();

    // Loads the file `filename()` through the host importer (with `importOptions` copied over
    // the importer's defaults) and makes a morph on `node` from the whole geometry by vertex
    // order. Logs "Loading morph %1...", then "Could not load geometry from file." or the
    // outcome of `createMorphForNode`. Cost: the file read plus O(vertices).
    void loadMorphForNode(const SgFileIOSettings &importOptions, SgNode *node, SgMorphLoadLog &log);
    // As `loadMorphForNode`, for a node list with bone and figure group matching
    // (`createMorphForNodes`).
    void loadMorphForNodes(const SgFileIOSettings &importOptions, const QList<SgNode *> &nodes,
                           SgMorphLoadLog &log);

    // From geometry in memory, one node, no group matching. `geometry` is not consumed (the
    // caller keeps its reference). Logs "Created morph successfully." or the warning "Geometry
    // did not match, failed to create morph." ("User cancelled." when the new-name question is
    // cancelled; an error naming the geometry when coordinates are not finite numbers).
    void createMorphForNode(SgVertexMesh *geometry, SgNode *node, SgMorphLoadLog &log);
    // From geometry in memory over a node list, with bone and figure group matching and, when
    // "Scenara exported" is on, un-welding through the figure welder first. Every node's deltas
    // are worked out first; a node whose target fails (see the class comment) ends the source
    // with one error and no change to the scene. Otherwise logs "Created morph successfully."
    // when any node got a morph, else "Geometry did not match, no morphs created."; then runs
    // the orphan clean-up on the nodes that got no morph (only after a run that made morphs;
    // each removed morph is named in the log) and links every new channel to the control
    // property (when create control is on). Cost: linear in the facets and vertices, not in
    // nodes times facets.
    void createMorphForNodes(SgVertexMesh *geometry, const QList<SgNode *> &nodes,
                             SgMorphLoadLog &log);

    // ---- Steps (public for the tools and tests that drive them one by one) ----
    // The deltas of `morph` against `base`: an entry (i, morph[i] - base[i]) for every vertex
    // whose difference exceeds 0.001 in some axis (strictly). None (nullptr) when the counts
    // differ (status line "Vertex Count mismatch - delta calculation failed."), when no vertex
    // moved, and when a difference is not finite (status line "Morph target has invalid
    // coordinates - delta calculation failed.", or "Base geometry has invalid coordinates -
    // delta calculation failed." when the fault is in `base`). The caller owns the result.
    // O(vertices).
    static SgMorphDeltas *computeDeltas(const SgVertexMesh &base, const SgVertexMesh &morph);

    // Reads `filename()` through the import manager; none with a status-line message on
    // failure. The returned mesh carries one reference for the caller (`unref` it).
    SgVertexMesh *loadGeometry(const SgFileIOSettings &importOptions);

    // The geometry a node-list entry takes for `node`: for a bone the face group of its name
    // (failing that, of its label), for a figure the group "BODY", each as a new mesh of the
    // group's vertices in ascending source order; for any other node, or a geometry without
    // face groups, `geometry` itself. None when the group is missing. The result carries one
    // reference for the caller. O(facet corners of the group) after an O(facets) pass over the
    // mesh's groups, which `groups` keeps for the next calls of the run (without one, each call
    // makes its own).
    SgVertexMesh *groupGeometry(SgNode *node, SgVertexMesh *geometry,
                                SgFaceGroupCache *groups = nullptr);

    // Makes (or updates) the morph on one node; true on success, with the morph's value channel
    // in `channel`. Runs no orphan clean-up.
    bool createMorph(SgNode *node, SgVertexMesh *geometry, bool matchGroups,
                     SgNumericProperty *&channel);

    // Places the control property on the control node before a run (control morphs and free
    // properties); discards it when it cannot be placed.
    void prepareControlProperty();
    // Links one new morph channel to the control property, creating a control property on the
    // control node when there is none. A link that cannot be made is reported on the warning
    // channel and, when `log` is given, once per run as a warning in it.
    void setupMorph(SgNumericProperty *channel, SgMorphLoadLog *log = nullptr);

signals:
    void filenameChanged(QString);
    void morphNameChanged(QString);
    void morphGroupChanged(QString);
    void createControlChanged(bool);
    void controlNodeChanged(SgNode *);
    void controlPropertyChanged(SgNumericProperty *);
    void useCustomValueChanged(bool);
    void customValueChanged(float);
    void useCustomLabelChanged(bool);
    void customLabelChanged(QString);
    void hideSecondaryChanged(bool);
    void reverseModifiersChanged(bool);
    void overrideChanged(short);
    void applyAfterJointChanged(bool);

private:
    // One node's morph, worked out before anything in the scene changes.
    struct NodePlan;
    enum class PlanResult { Planned, Skipped, Failed };

    SgMorphLoaderQuestions &questions() const;
    bool askNewName();
    bool resolveNameClash(const QList<SgNode *> &nodes, SgMorphLoadLog &log);
    PlanResult planMorph(SgNode *node, SgVertexMesh *geometry, SgFaceGroupCache *groups,
                         NodePlan &plan);
    SgNumericProperty *applyMorph(NodePlan &plan);
    bool cleanUpOrphan(SgNode *node, SgObject *object);
    void cleanUpOrphans(const QList<SgNode *> &nodes, SgMorphLoadLog &log);
    void linkFailed(const char *warning, const QString &logText, SgMorphLoadLog *log);
    void discardControlProperty();
    bool isPlaced(SgNumericProperty *property) const;

    bool m_createControl = true;
    bool m_useCustomValue = false;
    bool m_useCustomLabel = false;
    bool m_applyAfterJoint = false;
    bool m_hideSecondary = false;
    bool m_reverseModifiers = false;
    float m_customValue = 1.0f;
    QString m_filename;
    QString m_morphGroup;
    QString m_customLabel;
    QString m_morphName;
    SgNode *m_controlNode = nullptr;
    SgNumericProperty *m_controlProperty = nullptr;
    bool m_scenaraExported = false;
    bool m_ignoredInvisibleNodes = true;
    bool m_weldedGeometry = false;
    bool m_removedUnusedVertices = false;
    bool m_fourthWeldFlag = false;
    QString m_poseFile;
    short m_ercType = 0;
    short m_override = 0;
    bool m_cleanUpOrphans = true;

    SgMorphLoaderQuestions *m_questions = nullptr;
    // Whether the current run's log already reports a link that could not be made.
    bool m_linkFailureLogged = false;
};
