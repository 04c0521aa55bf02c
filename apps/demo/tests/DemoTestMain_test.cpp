// One QApplication for the whole run, on the offscreen platform unless one was asked for.
#include <gtest/gtest.h>

#include <QApplication>

#include <cstdlib>
#include <memory>

#include "qt/TQQtServices.h"

namespace {

class DemoApplicationEnvironment final : public ::testing::Environment {
public:
    void SetUp() override {
        if (!std::getenv("QT_QPA_PLATFORM")) setenv("QT_QPA_PLATFORM", "offscreen", 0);
        _app = std::make_unique<QApplication>(_argc, _argv);
        _services = std::make_unique<TQQtServiceInstaller>();
    }
    void TearDown() override {
        _services.reset();
        _app.reset();
    }

private:
    int _argc = 1;
    char _name[16] = "vce_demo_tests";
    char* _argv[2] = {_name, nullptr};
    std::unique_ptr<QApplication> _app;
    std::unique_ptr<TQQtServiceInstaller> _services;
};

[[maybe_unused]] ::testing::Environment* const gDemoEnvironment =
    ::testing::AddGlobalTestEnvironment(new DemoApplicationEnvironment);

}  // namespace
