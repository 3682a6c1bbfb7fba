// A user's sitting, replayed from a seed: the application's window with the bridge in this
// process and the real reference modeler, driven by a random sequence of user actions (send,
// send again while linked, select, reload the scene, remove a node, answer dialogs now or hold
// one open past the modeler's host time-out, kill the modeler or make it quit, start a second
// host). After every step one check: no poll step blocks the GUI thread longer than 100 ms, nor
// does the event loop stand still while a dialog waits; every figure holds each morph on all
// its bones or on none; no modeler gave up on a live host; every node sent reaches a modeler or
// is reported. At the end a last Send reaches a modeler and nothing of the keys is left.
//
// SG_USAGE_SEED replays a run (the seed is printed first); SG_USAGE_STEPS sets its length
// (default 250; a soak: SG_USAGE_STEPS=5000).

#include "app/sgappwindow.h"
#include "tests/e2e/e2etestbridge.h"
#include "tests/support/sgtestprocess.h"
#include "tests/support/sgtestscene.h"

#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QApplication>
#include <QComboBox>
#include <QDialog>
#include <QElapsedTimer>
#include <QHash>
#include <QInputDialog>
#include <QMap>
#include <QMessageBox>
#include <QPushButton>
#include <QRandomGenerator>
#include <QRegularExpression>
#include <QSet>
#include <QTimer>

#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <functional>
#include <random>
#include <thread>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

namespace {

constexpr qint64 kBlockLimitMs = 100;
// Four idle notices (one per 500 ms) fit in the modeler's host time-out, so that a loaded
// machine that delays one or two of them does not make a live host look dead.
constexpr int kModelerHostTimeoutMs = 2000;
constexpr int kHeldDialogMs = 2600; // past the modeler's host time-out

// A second thread of this process that wakes every 2 ms and adds up the time it could not. A
// stall that it saw as well is the machine's (the process was not scheduled), not a block of the
// GUI thread: only what is left of a GUI stall after the witness's stalls meanwhile counts
// against the host.
class StallWitness {
public:
    StallWitness() : m_thread([this] { run(); }) {}
    ~StallWitness() {
        m_stop = true;
        m_thread.join();
    }
    // How long the witness has stood still so far, in ms.
    qint64 stalledMs() const { return m_stalledMs; }

private:
    void run() {
        QElapsedTimer clock;
        clock.start();
        for (qint64 last = 0; !m_stop;) {
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
            const qint64 now = clock.elapsed();
            if (now - last > 20)
                m_stalledMs += now - last;
            last = now;
        }
    }

    std::atomic<qint64> m_stalledMs{0};
    std::atomic<bool> m_stop{false};
    std::thread m_thread;
};
// A node sent while linked reaches the same live modeler within this time.
constexpr int kDeliveryMs = 2000;
const QString kOutside8Bit = QString::fromUtf8("Kiste\u2013A");

// The sitting: the window, the bridge, the modeler's log, the answers to dialogs, and what was
// seen so far.
class Sitting : public QObject {
public:
    explicit Sitting(quint32 seed)
        : m_modeler(FACETOR_BIN_DIR,
                    {{"FACETOR_EDIT", "move=0,0.1,0"},
                     {"FACETOR_HOST_TIMEOUT", QByteArray::number(kModelerHostTimeoutMs)},
                     {"FACETOR_LINK_TIMEOUT", "5000"}}),
          m_random(seed) {
        reload();
        m_window.show();
        m_bridge.timePolls([this](qint64 ns) { timedPoll(ns); });
        connect(&m_heartbeat, &QTimer::timeout, this, &Sitting::beat);
        connect(&m_answerer, &QTimer::timeout, this, &Sitting::answer);
        connect(sgApp->getScene(), &SgScene::nodeRemoved, this, &Sitting::nodeRemoved);
        m_heartbeat.start(5);
        m_answerer.start(10);
        m_beatClock.start();
    }
    QString modelerLog() const { return m_modeler.log(); }
    QStringList &faults() { return m_faults; }

    // One random step: an action from the table, then a short while of the event loop.
    void step(int index) {
        struct Action {
            const char *name;
            int weight;
            std::function<void()> run;
        };
        const std::vector<Action> actions = {
            {"send", 30,
             [this] {
                 selectSome();
                 sendSelection();
             }},
            {"select", 10, [this] { selectSome(); }},
            {"reload", 4, [this] { reload(); }},
            {"remove", 6, [this] { removeSome(); }},
            {"hold the next dialog", 3, [this] { m_holdNext = true; }},
            {"kill the modeler", 3, [this] { signalModeler(SIGKILL); }},
            {"quit the modeler", 2, [this] { signalModeler(SIGTERM); }},
            {"second host", 4, [this] { secondHost(); }},
            {"wait", 12, [this] { sgTestIdle(pick(100, 600)); }},
        };
        std::vector<int> weights;
        for (const Action &action : actions)
            weights.push_back(action.weight);
        const Action &action = actions.at(
            std::discrete_distribution<size_t>(weights.begin(), weights.end())(m_random));
        m_step = QStringLiteral("step %1 (%2)").arg(index).arg(QString::fromLatin1(action.name));
        ++m_counts[action.name];
        action.run();
        // The driver's own work is not the event loop standing still.
        m_beatClock.restart();
        m_witnessAtBeat = m_witness.stalledMs();
        sgTestIdle(pick(20, 150));
        check();
    }

    // The last Send of the sitting: whatever was sent before reaches a modeler, which then
    // quits with the host.
    void finish() {
        m_step = QStringLiteral("finish");
        // The last Send is the user's: no modeler dies under it and no dialog is held.
        m_finishing = true;
        m_holdNext = false;
        if (sgApp->getScene()->getNodeCount() == 0)
            reload();
        sgApp->getScene()->selectNode(sgApp->getScene()->getNode(0));
        sendSelection();
        const bool settled = sgTestWaitUntil(
            [this] {
                updatePending();
                return m_bridge.isActive() && m_pending.isEmpty() &&
                       m_bridge.sendList().count() == 0 && !m_bridge.isExchangeBusy() &&
                       m_bridge.pendingImports() == 0;
            },
            20000);
        if (!settled)
            fault(QStringLiteral("the last Send did not reach a modeler: pending %1")
                      .arg(QStringList(m_pending.keys()).join(", ")));
        const qint64 pid = m_bridge.modelerProcessId();
        m_bridge.closing();
        if (!sgTestWaitUntil([this] { return !m_bridge.isActive(); }, 5000))
            fault(QStringLiteral("the modeler did not quit with the host"));
        sgTestWaitUntil([pid] { return sgTestProcessGone(pid); }, 5000);
        check();
    }

    QString figures() const {
        QStringList counts;
        for (auto it = m_counts.begin(); it != m_counts.end(); ++it)
            counts << QStringLiteral("%1 %2").arg(it.key()).arg(it.value());
        const QString log = modelerLog();
        return QStringLiteral("actions: %1; modelers linked %2, nodes received %3, returns %4; "
                              "dialogs %5 (held %6); worst poll step %7 ms, worst event-loop "
                              "gap in a dialog %8 ms, worst gap overall %9 ms (the machine's "
                              "own stalls up to %10 ms)")
            .arg(counts.join(", "))
            .arg(log.count(QStringLiteral(" linked\n")))
            .arg(log.count(QStringLiteral(" received ")))
            .arg(log.count(QRegularExpression(QStringLiteral(" returned \\S.* vertices="))))
            .arg(m_dialogs)
            .arg(m_held)
            .arg(double(m_worstPollNs) / 1e6, 0, 'f', 1)
            .arg(m_worstDialogGapMs)
            .arg(m_worstGapMs)
            .arg(m_worstMachineStallMs);
    }

private:
    int pick(int from, int to) { return int(m_random.bounded(from, to)); }

    void fault(const QString &what) {
        if (m_faults.size() < 20)
            m_faults << QStringLiteral("%1: %2").arg(m_step, what);
    }

    // The part of a stall of the GUI thread since the last heartbeat that the machine does not
    // explain.
    qint64 ownStall(qint64 stallMs) {
        const qint64 machine = m_witness.stalledMs() - m_witnessAtBeat;
        m_worstMachineStallMs = std::max(m_worstMachineStallMs, machine);
        return stallMs - machine;
    }

    // Every poll step is timed.
    void timedPoll(qint64 ns) {
        m_worstPollNs = std::max(m_worstPollNs, ns);
        if (ns > kBlockLimitMs * 1000000 && ownStall(ns / 1000000) > kBlockLimitMs)
            fault(QStringLiteral("a poll step took %1 ms").arg(double(ns) / 1e6));
    }

    void beat() {
        const qint64 gap = m_beatClock.restart();
        m_worstGapMs = std::max(m_worstGapMs, gap);
        if (QApplication::activeModalWidget() != nullptr) {
            m_worstDialogGapMs = std::max(m_worstDialogGapMs, gap);
            if (gap > kBlockLimitMs && ownStall(gap) > kBlockLimitMs)
                fault(QStringLiteral("the event loop stood still %1 ms while a dialog waited")
                          .arg(gap));
        }
        m_witnessAtBeat = m_witness.stalledMs();
    }

    // ---- actions -----------------------------------------------------------------------

    void reload() {
        m_window.openScene(QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json"), true);
        // A label outside 8 bits travels changed and must still find its node.
        sgApp->getScene()->addNode(sgTestProp(kOutside8Bit, {3, 0, 0}));
    }

    void selectSome() {
        SgScene *scene = sgApp->getScene();
        scene->clearSelection();
        const int count = scene->getNodeCount();
        for (int i = pick(0, 3); count > 0 && i > 0; --i)
            scene->selectNode(scene->getNode(pick(0, count)), true);
    }

    void sendSelection() {
        const QSet<SgNode *> before(m_bridge.sendList().begin(), m_bridge.sendList().end());
        m_bridge.executeAction();
        updatePending();
        for (SgNode *node : m_bridge.sendList())
            if (!before.contains(node) && !m_pending.contains(node->getLabel()))
                m_pending.insert(node->getLabel(),
                                 {receivedCount(node->getLabel(), modelerLog()), -1, {}});
    }

    void removeSome() {
        SgScene *scene = sgApp->getScene();
        QList<SgNode *> topLevel;
        for (SgNode *node : scene->getNodes())
            if (node->getParent() == nullptr)
                topLevel << node;
        if (topLevel.size() <= 1) {
            reload();
            return;
        }
        scene->removeNode(topLevel.at(pick(0, int(topLevel.size()))));
    }

    void signalModeler(int signal) {
        const qint64 pid = m_bridge.modelerProcessId();
        if (pid > 0 && !sgTestProcessGone(pid))
            ::kill(pid_t(pid), signal);
    }

    void secondHost() {
        SgScene *scene = sgApp->getScene();
        if (!m_bridge.isActive() || scene->getNodeCount() == 0)
            return;
        scene->selectNode(scene->getNode(pick(0, scene->getNodeCount())));
        const int lines = int(sgApp->getMessageSink()->logLines().size());
        E2eBridge second;
        second.executeAction();
        const QStringList log = sgApp->getMessageSink()->logLines().mid(lines);
        if (second.isActive() || second.modelerProcessId() != 0 ||
            !log.contains(QStringLiteral("Facetor is linked to another Scenara.")))
            fault(QStringLiteral("a second host did not leave the link alone"));
    }

    // ---- dialogs ----------------------------------------------------------------------

    void answer() {
        QWidget *modal = QApplication::activeModalWidget();
        if (modal == nullptr) {
            m_answering = nullptr;
            return;
        }
        if (modal != m_answering) {
            m_answering = modal;
            ++m_dialogs;
            const bool hold = std::exchange(m_holdNext, false);
            m_held += hold ? 1 : 0;
            m_answerAt.start();
            m_answerAfterMs = hold ? kHeldDialogMs : pick(0, 150);
            // Now and then the modeler dies while the user reads a dialog.
            if (pick(0, 20) == 0 && !m_finishing)
                signalModeler(SIGKILL);
            return;
        }
        if (m_answerAt.elapsed() < m_answerAfterMs)
            return;
        m_answering = nullptr;
        if (auto *box = qobject_cast<QMessageBox *>(modal)) {
            box->button(pick(0, 2) ? QMessageBox::Yes : QMessageBox::No)->click();
        } else if (auto *input = qobject_cast<QInputDialog *>(modal)) {
            input->setTextValue(QStringLiteral("Morph%1").arg(++m_names));
            pick(0, 8) ? input->accept() : input->reject();
        } else if (auto *combo = modal->findChild<QComboBox *>(QStringLiteral("FcBridgehAction"))) {
            static const QStringList kActions = {
                "Create Morph", "Create Morph",   "Create Morph",
                "Create Prop",  "Copy Materials", "Create Morph And Copy Materials"};
            const QString action = kActions.at(pick(0, int(kActions.size())));
            combo->setCurrentIndex(combo->findText(action));
            emit combo->textActivated(action);
            pick(0, 10) ? qobject_cast<QDialog *>(modal)->accept()
                        : qobject_cast<QDialog *>(modal)->reject();
        } else {
            fault(QStringLiteral("an unexpected dialog \"%1\"").arg(modal->windowTitle()));
            if (auto *dialog = qobject_cast<QDialog *>(modal))
                dialog->reject();
        }
    }

    // ---- the check ---------------------------------------------------------------------

    // How often a modeler has received the node labelled `label` (named as it travelled, in
    // 8 bits).
    static int receivedCount(const QString &label, const QString &log) {
        const QString travelled = QString::fromLatin1(label.toLatin1());
        return int(log.count(QStringLiteral(" received %1 vertices=").arg(travelled)));
    }

    // A pending label is done once a modeler has received it again, or the host has said that
    // it could not be sent. One that the same live modeler has not received for a while is a
    // Send that never reached it.
    void updatePending() {
        const QString log = modelerLog();
        const QStringList hostLog = sgApp->getMessageSink()->logLines();
        const qint64 pid = m_bridge.isActive() ? m_bridge.modelerProcessId() : 0;
        for (auto it = m_pending.begin(); it != m_pending.end();) {
            const QString label = it.key();
            const bool received = receivedCount(label, log) > it->received;
            if (received ||
                hostLog.contains(QStringLiteral("Could not send %1 to Facetor.").arg(label))) {
                it = m_pending.erase(it);
                continue;
            }
            if (pid == 0 || pid != it->modeler) {
                it->modeler = pid;
                it->since.start();
            } else if (it->since.elapsed() > kDeliveryMs && !sgTestProcessGone(pid)) {
                fault(
                    QStringLiteral("%1, sent while linked, never reached the modeler").arg(label));
                it->since.start();
            }
            ++it;
        }
    }

    void nodeRemoved(SgNode *node) {
        // A node the user removed before it went out is not owed to the modeler.
        if (sgApp->getScene()->findNodeByLabel(node->getLabel()) == nullptr)
            m_pending.remove(node->getLabel());
    }

    void check() {
        // Each morph of a return is on every bone of its figure, or on none.
        for (SgSkeleton *figure : sgApp->getScene()->getSkeletons()) {
            QHash<QString, int> bonesWith;
            const SgBoneList bones = figure->getAllBones();
            for (SgBone *bone : bones) {
                SgObject *object = bone->getObject();
                for (int i = 0; object && i < object->getModifierCount(); ++i)
                    if (auto *morph = dynamic_cast<SgMorph *>(object->getModifier(i)))
                        ++bonesWith[morph->getName()];
            }
            for (auto it = bonesWith.begin(); it != bonesWith.end(); ++it)
                if (it.value() != int(bones.size()))
                    fault(QStringLiteral("the morph %1 is on %2 of the %3 bones of %4")
                              .arg(it.key())
                              .arg(it.value())
                              .arg(bones.size())
                              .arg(figure->getLabel()));
        }
        if (modelerLog().contains(QStringLiteral("error the host has sent nothing")))
            fault(QStringLiteral("a modeler took the live host for dead"));
        updatePending();
    }

    StallWitness m_witness;
    qint64 m_witnessAtBeat = 0;
    qint64 m_worstMachineStallMs = 0;
    SgTestModeler m_modeler;
    QRandomGenerator m_random;
    SgAppWindow m_window;
    E2eBridge m_bridge;
    QTimer m_heartbeat;
    QTimer m_answerer;
    QElapsedTimer m_beatClock;
    QElapsedTimer m_answerAt;
    QWidget *m_answering = nullptr;
    int m_answerAfterMs = 0;
    bool m_holdNext = false;
    bool m_finishing = false;
    int m_dialogs = 0;
    int m_held = 0;
    int m_names = 0;
    qint64 m_worstPollNs = 0;
    qint64 m_worstDialogGapMs = 0;
    qint64 m_worstGapMs = 0;
    QString m_step;
    QStringList m_faults;
    QMap<QString, int> m_counts;
    // Labels sent and not yet received: how often they had been received before, and since
    // when the modeler linked now has owed them.
    struct Pending {
        int received = 0;
        qint64 modeler = -1;
        QElapsedTimer since;
    };
    QHash<QString, Pending> m_pending;
};

} // namespace

TEST(UsageTest, ASittingKeepsTheLinkWholeAndTheSceneSound) {
    sgTestSetStuckLimit(0); // a sitting lasts as long as its steps; each step checks itself
    const quint32 seed = qEnvironmentVariableIsSet("SG_USAGE_SEED")
                             ? qEnvironmentVariable("SG_USAGE_SEED").toUInt()
                             : QRandomGenerator::global()->generate();
    const int steps = qEnvironmentVariableIsSet("SG_USAGE_STEPS")
                          ? qEnvironmentVariableIntValue("SG_USAGE_STEPS")
                          : 250;
    std::printf("usage test: seed %u (SG_USAGE_SEED=%u replays it), %d steps\n", seed, seed, steps);
    std::fflush(stdout);
    SCOPED_TRACE(seed);
    sgApp->getScene()->clear();
    sgApp->getMessageSink()->clear();
    ASSERT_TRUE(e2eNothingLeft(0));
    QElapsedTimer clock;
    clock.start();
    QString figures;
    {
        Sitting sitting(seed);
        for (int i = 1; i <= steps && sitting.faults().isEmpty(); ++i)
            sitting.step(i);
        sitting.finish();
        figures = sitting.figures();
        EXPECT_TRUE(sitting.faults().isEmpty()) << sitting.faults().join('\n').toStdString() << "\n"
                                                << sitting.modelerLog().right(4000).toStdString();
    }
    sgApp->getScene()->clear();
    EXPECT_TRUE(e2eNothingLeft(3000));
    std::printf("usage test: seed %u, %d steps in %lld ms; %s\n", seed, steps, clock.elapsed(),
                qPrintable(figures));
}
