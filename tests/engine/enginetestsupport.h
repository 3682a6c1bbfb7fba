#pragma once

// Shared set-up of the engine tests: the per-test application state and scripted answers to
// the loader's questions. Scenes are built with the builders of tests/support/sgtestscene.h.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloaderquestions.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestscene.h"

#include <gtest/gtest.h>

#include <deque>
#include <optional>

namespace enginetest {

// Answers the loader's questions without dialogs: each name question takes the next of `names`
// (nullopt cancels; none left cancels too) and records the name it was asked about; each pose
// question takes the next of `poses` (none left: false).
struct ScriptedQuestions : SgMorphLoaderQuestions {
    std::deque<std::optional<QString>> names;
    std::deque<bool> poses;
    QStringList askedAbout;

    bool askNewMorphName(const QString &name, QString &newName) override {
        askedAbout << name;
        if (names.empty() || !names.front()) {
            names.clear();
            return false;
        }
        newName = *names.front();
        names.pop_front();
        return true;
    }
    bool continueWithoutPose(const QString &poseFile, const QString &) override {
        askedAbout << poseFile;
        const bool answer = !poses.empty() && poses.front();
        if (!poses.empty())
            poses.pop_front();
        return answer;
    }
};

// The per-test application state: the scene emptied and the message sink cleared.
class EngineTest : public ::testing::Test {
protected:
    void SetUp() override {
        sgApp->getScene()->clear();
        sgApp->getMessageSink()->clear();
    }
    void TearDown() override { sgApp->getScene()->clear(); }

    static SgScene *scene() { return sgApp->getScene(); }
    static QStringList logLines() { return sgApp->getMessageSink()->logLines(); }
    static QStringList statusLines() { return sgApp->getMessageSink()->statusLines(); }
};

} // namespace enginetest
