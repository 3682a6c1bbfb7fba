// One QApplication and one host application for every engine test.

#include "sgcore/app/sgapp.h"

#include <QApplication>

#include <gtest/gtest.h>

namespace {
class ApplicationEnvironment : public ::testing::Environment {
public:
    void SetUp() override {
        static int argc = 1;
        static char name[] = "engine_tests";
        static char *argv[] = {name, nullptr};
        m_qt = new QApplication(argc, argv);
        m_app = new SgApp;
    }
    void TearDown() override {
        delete m_app;
        delete m_qt;
    }

private:
    QApplication *m_qt = nullptr;
    SgApp *m_app = nullptr;
};

[[maybe_unused]] const auto *s_environment =
    ::testing::AddGlobalTestEnvironment(new ApplicationEnvironment);
} // namespace
