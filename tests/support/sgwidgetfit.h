#pragma once

// A check that a window shows its whole text, for tests that open a dialog at its default size.

#include <QStringList>

class QWidget;

// Walks every visible label, button, check box, combo box, group box title, header section and
// tree or list row (every column, expanded rows included) under `root` and returns one line per
// text that does not fit its space:
//   <what> <object name or class> "<text>": needs <N> px, has <M> px
// A text does not fit when it is wider than its widget's contents, wider than its column, or
// reaches past the right edge of a view's viewport; a word-wrapped label does not fit when its
// wrapped text is taller than the label. Empty when everything fits.
//
// `root` must be shown (offscreen is enough) so that its layout has run; the function shows and
// changes nothing. Cost: one size hint per widget and per visible row and column.
QStringList sgCutTexts(QWidget *root);
