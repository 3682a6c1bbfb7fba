#pragma once

#include <QString>

// The questions the morph loader asks its user during a run. The loader asks through this
// interface so that the caller decides how: the default asks with the host's modal dialogs; a
// batch tool or a test answers directly.
class SgMorphLoaderQuestions {
public:
    virtual ~SgMorphLoaderQuestions() = default;

    // "Morph Already Exists": a morph named `name` exists on a target node. True with the
    // user's new name in `newName`; false when the user cancels. The loader asks again while
    // the name is blank or still taken.
    virtual bool askNewMorphName(const QString &name, QString &newName) = 0;

    // "Pose File Error": the pose file `poseFile` of the morph `morphName` did not load. True
    // goes on without the pose; false skips the source.
    virtual bool continueWithoutPose(const QString &poseFile, const QString &morphName) = 0;

    // The default: QInputDialog and QMessageBox, as the host asks (one shared instance).
    static SgMorphLoaderQuestions &dialogs();
};
