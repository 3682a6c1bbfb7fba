// Test entry for the morph source tests: one application and one host for the whole run, with
// the host's settings in a temporary file.
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"

#include <QApplication>
#include <QTemporaryDir>
#include <gtest/gtest.h>

int main(int argc, char **argv) {
    QApplication app(argc, argv);
    QTemporaryDir settingsDir;
    SgAppSettings::setFileName(settingsDir.filePath("scenara.ini"));
    SgApp host;
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
