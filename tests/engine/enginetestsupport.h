#pragma once

// Shared set-up of the engine tests: small scenes built in code, and helpers that answer modal
// dialogs from inside their event loops (the test main closes any that stay open).

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloaderquestions.h"

#include <QApplication>
#include <QDialog>
#include <QInputDialog>
#include <QLineEdit>
#include <QMessageBox>
#include <QPushButton>
#include <QStringList>
#include <QTimer>

#include <gtest/gtest.h>

#include <deque>
#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace enginetest {

// Answers the next modal dialog with `answer` from inside its event loop (gives up after 5 s).
inline void whenModal(std::function<void(QWidget *)> answer) {
    auto *timer = new QTimer;
    auto ticks = std::make_shared<int>(0);
    QObject::connect(timer, &QTimer::timeout, [timer, ticks, answer]() {
        QWidget *modal = QApplication::activeModalWidget();
        if (modal || ++*ticks > 500) {
            timer->stop();
            timer->deleteLater();
        }
        if (modal)
            answer(modal);
    });
    timer->start(10);
}

// Types `text` into the next input dialog and accepts it (or cancels it when `accept` is false).
inline void answerInput(const QString &text, bool accept = true) {
    whenModal([text, accept](QWidget *modal) {
        auto *dialog = qobject_cast<QInputDialog *>(modal);
        if (!dialog) {
            modal->close();
            return;
        }
        if (accept) {
            dialog->setTextValue(text);
            dialog->accept();
        } else {
            dialog->reject();
        }
    });
}

// Presses `button` on the next message box; `seen` receives its title and text.
inline void answerMessageBox(QMessageBox::StandardButton button, QStringList *seen = nullptr) {
    whenModal([button, seen](QWidget *modal) {
        auto *box = qobject_cast<QMessageBox *>(modal);
        if (!box) {
            modal->close();
            return;
        }
        if (seen)
            *seen << box->windowTitle() << box->text();
        if (QAbstractButton *b = box->button(button))
            b->click();
        else
            box->close();
    });
}

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

// A polygon mesh of `count` vertices at (i, 2i, 3i) with quads over consecutive vertices.
inline SgPolyMesh *makeMesh(int count, float offset = 0.0f) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *v = mesh->setVertexArray(count);
    for (int i = 0; i < count; ++i)
        v[i] = SgVec3(float(i) + offset, 2.0f * float(i), 3.0f * float(i));
    for (int i = 0; i + 3 < count; i += 4) {
        mesh->startFace();
        for (int k = 0; k < 4; ++k)
            mesh->addFaceEdge(i + k);
        mesh->finishFace();
    }
    mesh->finishEdit();
    return mesh;
}

// A copy of `mesh`'s vertices (no facets), reference count 0.
inline SgPolyMesh *copyVertices(const SgVertexMesh &mesh) {
    auto *copy = new SgPolyMesh;
    SgVec3 *v = copy->setVertexArray(mesh.getVertexCount());
    for (int i = 0; i < mesh.getVertexCount(); ++i)
        v[i] = mesh.getVertex(i);
    return copy;
}

// A node with an object whose shape holds `mesh`.
template <typename Node = SgNode> Node *makeNodeWithMesh(const QString &name, SgVertexMesh *mesh) {
    auto *node = new Node(name);
    auto *object = new SgObject(name);
    auto *shape = new SgPolyShape(name);
    shape->setGeometry(mesh);
    object->addShape(shape);
    node->setObject(object);
    return node;
}

inline SgVertexMesh *baseOf(SgNode *node) {
    return node->getObject()->getCurrentShape()->getGeometry();
}

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
