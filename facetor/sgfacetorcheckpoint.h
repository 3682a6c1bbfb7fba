#pragma once

#include <QString>

#include <functional>

// Named points of the modeler's side of an exchange, at which a test can stop the modeler to
// kill it at a known moment: with the environment variable FACETOR_PAUSE_AT naming a point,
// the modeler reports "paused NAME" when it reaches that point and then sleeps until it is
// killed, holding whatever it holds there (a segment's lock included). With
// FACETOR_PAUSE_JITTER_MS set to n, every point also sleeps a random 0 to n milliseconds, so
// that a kill without a pause lands at varied moments. Without these variables a point costs
// one comparison. The product never sets them.
class SgFacetorCheckpoint {
public:
    // Where "paused NAME" goes (the modeler's log); called before the modeler sleeps.
    static void setReporter(std::function<void(const QString &)> reporter);

    // Marks the point `name`: pauses there for good when it is the chosen point.
    static void reach(const char *name);
};
