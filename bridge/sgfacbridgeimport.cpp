// The import of returned geometry onto a scene node whose label matches its name.

#include "bridge/sgfacbridge.h"

bool SgFacBridge::importReturnedShape(SgPolyShape *shape, SgNode *node) {
    // Turning a matched shape into a morph, a prop or a copy of materials is done by the morph
    // import, which lives elsewhere; until it is built in here a matched shape is left alone
    // and counts as dealt with, so it does not become a prop.
    return shape && node;
}
