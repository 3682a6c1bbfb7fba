#pragma once

#include "exchange/sgexchangenode.h"

#include <QList>
#include <QString>

// A scripted edit that the modeler applies to a received node before it returns it, for tests
// and demonstrations. The script is a list of steps separated by ';', applied in order:
//   move=dx,dy,dz        add the offset to every vertex
//   scale=f              multiply every coordinate by f
//   vertex=i,dx,dy,dz    add the offset to vertex i only (ignored when there is no vertex i)
//   extra=x,y,z          add a vertex at x,y,z with a triangle over it and vertices 0 and 1
//                        (material 0; just the vertex when there are fewer than two)
//   name=TEXT            return the geometry under another name
//   diffuse=r,g,b        set the diffuse colour (0 to 1) of every material
// Offsets are in the modeler's units (the host's times 0.1).
class SgFacetorEdit {
public:
    // Parses `script`; false, with `error` set, on an unknown step or a bad number.
    bool parse(const QString &script, QString &error);

    bool isEmpty() const { return m_steps.isEmpty(); }

    // Applies every step to `node`.
    void apply(SgExchangeNode &node) const;

private:
    struct Step {
        QString kind;
        QList<float> numbers;
        QString text;
    };
    QList<Step> m_steps;
};
