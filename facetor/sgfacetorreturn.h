#pragma once

#include "exchange/sgexchangenode.h"

#include <QByteArray>

// Encodes geometry for the host in the modeler-to-host record layout (the short material
// entries), ready to be copied into the data segment.
class SgFacetorReturn {
public:
    // The whole record for `node`; corners without a UV in a node with UVs use UV 0.
    static QByteArray encode(const SgExchangeNode &node);
};
