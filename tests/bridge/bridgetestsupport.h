#pragma once

// Helpers of the bridge tests: answering modal boxes, waiting on the event loop, and small
// scenes.

#include "sgcore/app/sgapp.h"
#include "sgcore/scene/sgscene.h"

#include <QApplication>
#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QTemporaryDir>
#include <QTimer>
#include <QWidget>

#include <functional>

#include <cerrno>
#include <csignal>

#include <unistd.h>

namespace bridgetest {

// The host application, made by the test main before any test runs.
inline SgApp *app() {
    return sgApp;
}

inline const QString kAnswerTimerName = QStringLiteral("bridgetestModalAnswer");

// Answers the next modal box with `answer` (called with the box) once it is up. The test
// main's fail-safe closes a modal that nobody answers.
inline void answerModal(std::function<void(QWidget *)> answer) {
    auto *timer = new QTimer(qApp);
    timer->setObjectName(kAnswerTimerName);
    QObject::connect(timer, &QTimer::timeout, [timer, answer] {
        if (QWidget *modal = QApplication::activeModalWidget()) {
            timer->stop();
            timer->deleteLater();
            answer(modal);
        }
    });
    timer->start(10);
}

// Drops the answers still waiting for a modal box and returns how many there were, so that
// an answer meant for one test never reaches the next (nor the variables it has left).
inline int cancelPendingAnswers() {
    const QList<QTimer *> pending =
        qApp->findChildren<QTimer *>(kAnswerTimerName, Qt::FindDirectChildrenOnly);
    int count = 0;
    for (QTimer *timer : pending) {
        if (timer->isActive())
            ++count;
        delete timer;
    }
    return count;
}

// Whether the process has ended (a zombie that nobody has reaped yet counts as ended).
inline bool processGone(qint64 pid) {
    if (pid <= 0 || (::kill(pid_t(pid), 0) != 0 && errno == ESRCH))
        return true;
    QFile stat(QStringLiteral("/proc/%1/stat").arg(pid));
    if (!stat.open(QIODevice::ReadOnly))
        return true;
    const QByteArray line = stat.readAll();
    const qsizetype close = line.lastIndexOf(')');
    return close > 0 && line.size() > close + 2 && line[close + 2] == 'Z';
}

// Runs the event loop until `done` holds or `timeoutMs` passes; returns `done()`.
inline bool waitUntil(const std::function<bool()> &done, int timeoutMs) {
    QElapsedTimer timer;
    timer.start();
    while (!done() && timer.elapsed() < timeoutMs)
        QApplication::processEvents(QEventLoop::AllEvents, 5);
    return done();
}

// The files of a segment key in the shared-memory folder (data, "-ref" and "-lock" objects)
// of this user and of this test namespace (SG_SHM_TEST_NAMESPACE). Looking at the folder,
// rather than opening the segment, leaves no handle behind.
inline QStringList segmentFiles(const char *key) {
    const QString prefix =
        QStringLiteral("sgsharedmemory-") + QString::fromLatin1(QByteArray(key).toHex());
    const QByteArray space = qgetenv("SG_SHM_TEST_NAMESPACE");
    const QString suffix = QStringLiteral("-u%1").arg(geteuid()) +
                           (space.isEmpty() ? QString() : "-" + QString::fromUtf8(space));
    QStringList files;
    for (const QString &file :
         QDir(QStringLiteral("/dev/shm")).entryList({prefix + QLatin1Char('*')}, QDir::Files))
        if (file.endsWith(suffix))
            files << file;
    return files;
}

// Whether the data object of a segment key exists.
inline bool segmentExists(const char *key) {
    const QString prefix =
        QStringLiteral("sgsharedmemory-") + QString::fromLatin1(QByteArray(key).toHex());
    for (const QString &file : segmentFiles(key))
        if (!file.contains(QLatin1String("-ref")) && !file.contains(QLatin1String("-lock")))
            return true;
    return false;
}

} // namespace bridgetest

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgskeleton.h"

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

// A figure labelled `name` whose two bones, hip and then thigh, show separate triangles.
inline SgSkeleton *makeFigure(const QString &name) {
    auto *figure = new SgSkeleton(name);
    auto *hip = new SgBone(QStringLiteral("hip"));
    auto *thigh = new SgBone(QStringLiteral("thigh"));
    figure->addBone(hip);
    figure->addBone(thigh, hip);
    float offset = 0;
    for (SgBone *bone : {hip, thigh}) {
        auto *object = new SgObject(bone->getName());
        object->addShape(
            makeShape(bone->getName(),
                      makeMesh({{offset, 100, 3.25f}, {offset + 7, 100, 0}, {offset, 112.5f, 0}})));
        bone->setObject(object);
        offset += 20;
    }
    return figure;
}

} // namespace bridgetest
