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
#include <memory>
#include <optional>

namespace enginetest {

// Meshes start with no reference: `hold` takes one for the holder's life, as an owner does.
struct Unref {
    void operator()(SgRefCountedItem *item) const { item->unref(); }
};
template <typename Mesh> std::unique_ptr<Mesh, Unref> hold(Mesh *mesh) {
    mesh->ref();
    return std::unique_ptr<Mesh, Unref>(mesh);
}

// Answers the loader's name questions without dialogs: each takes the next of `names` (nullopt
// cancels; none left cancels too) and records the name it was asked about. Pose questions are
// answered by the host's box (test_reverse).
struct ScriptedQuestions : SgMorphLoaderQuestions {
    std::deque<std::optional<QString>> names;
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
    bool continueWithoutPose(const QString &, const QString &) override { return false; }
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
