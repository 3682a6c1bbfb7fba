#pragma once

#include "sgcore/materials/sgmaterial.h"
#include "tests/support/sgtestscene.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <cstdint>
#include <vector>

class SgNode;
class SgPolyMesh;
class SgShape;
struct SgVec2;
struct SgVec3;

// Helpers shared by the exchange tests.
namespace exchangetest {

// The host log so far, and forgetting it.
QStringList logLines();
void clearLog();
// The application's temporary folder (the test main makes a fresh one per program).
QString tempPath();

// A material with none of the standard properties.
class BareMaterial : public SgMaterial {
public:
    explicit BareMaterial(const QString &name) : SgMaterial(name) {}
    SgMaterial *clone() const override { return new BareMaterial(getName()); }
};

// Measures and writes the record of `node`; `measured` receives the measured size.
QByteArray writeNode(SgNode *node, const QString &trailer = QString(),
                     std::int32_t *measured = nullptr);

} // namespace exchangetest
