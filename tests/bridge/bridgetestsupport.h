#pragma once

// Shared set-up of the bridge tests: one QApplication and one host application per process,
// settings in a temporary file, and a fail-safe that closes modal boxes a test forgot.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/scene/sgscene.h"

#include <QApplication>
#include <QDir>
#include <QElapsedTimer>
#include <QPointer>
#include <QTemporaryDir>
#include <QTimer>
#include <QWidget>

#include <functional>

namespace bridgetest {

// The process's QApplication and SgApp, made on first use.
inline SgApp *app() {
    static int argc = 1;
    static char name[] = "bridge-test";
    static char *argv[] = {name, nullptr};
    static QApplication *qapp = new QApplication(argc, argv);
    static QTemporaryDir settingsDir;
    static SgApp *host = [] {
        SgAppSettings::setFileName(settingsDir.filePath(QStringLiteral("scenara.ini")));
        return new SgApp();
    }();
    (void)qapp;
    return host;
}

// Answers the next modal box with `answer` (called with the box) once it is up. A fail-safe
// closes any modal still open after `failSafeMs`, so a broken test fails instead of hanging.
inline void answerModal(std::function<void(QWidget *)> answer, int failSafeMs = 5000) {
    auto *timer = new QTimer;
    QObject::connect(timer, &QTimer::timeout, [timer, answer] {
        if (QWidget *modal = QApplication::activeModalWidget()) {
            timer->stop();
            timer->deleteLater();
            answer(modal);
        }
    });
    timer->start(10);
    QPointer<QTimer> watch(timer);
    QTimer::singleShot(failSafeMs, [watch] {
        if (watch)
            watch->deleteLater();
        for (int i = 0; i < 5; ++i)
            if (QWidget *modal = QApplication::activeModalWidget())
                modal->close();
    });
}

// Runs the event loop until `done` holds or `timeoutMs` passes; returns `done()`.
inline bool waitUntil(const std::function<bool()> &done, int timeoutMs) {
    QElapsedTimer timer;
    timer.start();
    while (!done() && timer.elapsed() < timeoutMs)
        QApplication::processEvents(QEventLoop::AllEvents, 5);
    return done();
}

} // namespace bridgetest

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgnode.h"

#include <initializer_list>

namespace bridgetest {

// A polygon mesh with the given vertices and one facet over all of them, in material 0.
inline SgPolyMesh *makeMesh(std::initializer_list<SgVec3> vertices) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *v = mesh->setVertexArray(int(vertices.size()));
    for (const SgVec3 &vertex : vertices)
        *v++ = vertex;
    mesh->activateMaterial(0);
    mesh->startFace();
    for (int i = 0; i < int(vertices.size()); ++i)
        mesh->addFaceEdge(i);
    mesh->finishFace();
    mesh->finishEdit();
    return mesh;
}

// A shape named `name` holding `mesh` with one material named `material`.
inline SgPolyShape *makeShape(const QString &name, SgPolyMesh *mesh,
                              const QString &material = QStringLiteral("Skin")) {
    auto *shape = new SgPolyShape(name);
    shape->setPolyMesh(mesh);
    shape->addMaterial(new SgDefaultMaterial(material));
    return shape;
}

// A prop node labelled `name` whose object shows a triangle around `at`.
inline SgNode *makeProp(const QString &name, SgVec3 at = SgVec3()) {
    auto *object = new SgObject(name);
    object->addShape(
        makeShape(name, makeMesh({SgVec3(at.x, at.y, at.z), SgVec3(at.x + 10, at.y, at.z),
                                  SgVec3(at.x, at.y + 10, at.z)})));
    auto *node = new SgNode(name);
    node->setObject(object);
    return node;
}

} // namespace bridgetest
