#pragma once

#include <QString>

// Shows a modal warning box with `title`, `text` and the single button "Ok", parented to the
// host's dialog parent, and returns when the user closes it.
void sgLoaderWarning(const QString &title, const QString &text);
