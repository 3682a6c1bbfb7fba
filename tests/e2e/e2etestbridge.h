#pragma once

// What the end-to-end tests share: the bridge with the steps a user's clicks reach made
// callable, timed poll steps, and the morph a return leaves on a node.

#include "bridge/sgfacbridge.h"
#include "tests/support/sgtestprocess.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/scene/sgnode.h"

#include <QElapsedTimer>
#include <QTimer>

#include <functional>

#include <gtest/gtest.h>

class E2eBridge : public SgFacBridge {
public:
    using SgFacBridge::closing;
    using SgFacBridge::executeAction;

    // Runs the event loop until the link has ended and every return is imported.
    bool settles(int timeoutMs) {
        return sgTestWaitUntil([this] { return !isActive() && pendingImports() == 0; }, timeoutMs);
    }
    // From now on the poll timer runs each poll step through `took`, which learns how many
    // nanoseconds the step took.
    void timePolls(std::function<void(qint64)> took) {
        QObject::disconnect(pollTimer(), &QTimer::timeout, this, &SgFacBridge::checkSharedMap);
        connect(pollTimer(), &QTimer::timeout, this, [this, took] {
            QElapsedTimer clock;
            clock.start();
            checkSharedMap();
            took(clock.nsecsElapsed());
        });
    }
};

// The morph `name` on the node's object, or null.
inline SgMorph *e2eMorphOn(SgNode *node, const QString &name = QStringLiteral("MyMorph")) {
    return node && node->getObject()
               ? dynamic_cast<SgMorph *>(node->getObject()->findModifier(name))
               : nullptr;
}

inline int e2eModifierCount(const SgNode *node) {
    return node->getObject() ? node->getObject()->getModifierCount() : 0;
}

// Whether nothing of the bridge's keys is left in /dev/shm within `timeoutMs`; names what is.
inline testing::AssertionResult e2eNothingLeft(int timeoutMs = 2000) {
    if (sgTestWaitUntil([] { return sgTestLeftovers().isEmpty(); }, timeoutMs))
        return testing::AssertionSuccess();
    return testing::AssertionFailure() << "left: " << sgTestLeftovers().join(' ').toStdString();
}
