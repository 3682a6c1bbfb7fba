#pragma once

#include "exchange/sgexchangenode.h"
#include "exchange/shm/sgcontrolrecord.h"

#include <QByteArray>
#include <QString>

#include <memory>
#include <optional>

class SgSharedMemory;

// The modeler's end of the two segments: it takes the host's messages from the host-to-modeler
// slot of the control record, posts its own into the modeler-to-host slot, reads node records
// from the data segment and writes returned geometry into it. Every control access waits at
// most 25 ms for the lock.
class SgFacetorLink {
public:
    SgFacetorLink();
    ~SgFacetorLink();

    // Attaches to the control segment once the host has set it up (its modeler-to-host flag
    // reads "taken"). False while it does not exist yet or is not set up; call again later.
    bool tryLink();
    bool isLinked() const { return m_linked; }

    // Posts a modeler-to-host message. False when not linked, the lock is not obtained, or the
    // host has not taken the previous message.
    bool post(SgModelerMessage code, int value = 0);

    // Whether the host has taken the last message posted (the modeler-to-host slot is free).
    // False when not linked or the lock is not obtained.
    bool hostTookLast();

    // Takes the waiting host-to-modeler message: its code (any byte), with its parameter in
    // `value`; none when no message waits or the lock is not obtained.
    std::optional<SgHostMessage> take(int &value);

    // Reads the node record the host has written (exists, attach, lock, read, unlock, detach,
    // release). False, with `error` set, when there is no segment or the record is malformed.
    bool readNode(SgExchangeNode &node, QString &error);

    // Creates the data segment with exactly `record`'s bytes, writes them under the lock and
    // keeps the segment until releaseData(). False when the segment cannot be created.
    bool writeRecord(const QByteArray &record);

    // Whether a data segment exists (held by either side).
    bool dataSegmentExists();

    // Whether the last writeRecord failed only because a data segment (or what is left of one
    // that its holder is removing) still exists, so that a later try can succeed.
    bool dataSegmentBusy() const;

    // Drops this process's hold on the data segment (detach and release when it exists).
    void releaseData();

    // Detaches from the control segment; it goes away when the host holds it no more.
    void unlink();

private:
    std::unique_ptr<SgSharedMemory> m_control;
    std::unique_ptr<SgSharedMemory> m_data;
    bool m_linked = false;
};
