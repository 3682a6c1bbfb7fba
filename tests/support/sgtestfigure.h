#pragma once

// Test figures made in code (part of the `sgtestmain` library).
//
// sgTestMakeFigure(name, bones, rows) makes a figure (not added to any scene) whose bones form
// a chain: bone i ("bone<i>", label "Bone <i>") covers the strip x in [i, i + 1], y in
// [0, rows], as `rows` quads. Its vertices are the left column (x = i, y = 0 .. rows) followed
// by the right column (x = i + 1), 2 * (rows + 1) vertices, each with its own UV. Neighbouring
// bones share their seam column: the same positions, duplicated in each bone, exactly as a
// figure split into bones carries them. Even bones use material "Skin", odd bones "Cloth"
// (each bone's shape has both materials, in that order). Bone i's origin is (i, 0, 0); bone 0
// hangs below the figure, each further bone below the one before.
// With `unusedVertex` each bone gets one more vertex at (i + 0.5, -1, 0) that no facet uses.

#include <QString>

class SgSkeleton;

SgSkeleton *sgTestMakeFigure(const QString &name, int bones, int rows, bool unusedVertex = false);
