// Test entry for widget tests: one QApplication and one host application for the whole run.
#include "sgcore/app/sgapp.h"

#include <QApplication>
#include <gtest/gtest.h>

int main(int argc, char **argv) {
    QApplication app(argc, argv);
    SgApp host;
    ::testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
