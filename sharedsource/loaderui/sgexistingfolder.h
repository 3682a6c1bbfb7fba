#pragma once

#include <QString>

// The folder a file chooser should open in for `path`: `path` itself when it is an existing
// folder, else its nearest existing parent folder, else the home folder. A chooser given a
// folder that does not exist takes its last name for a file name and types it into its name
// field; a remembered folder may have been removed since.
QString sgExistingFolder(const QString &path);
