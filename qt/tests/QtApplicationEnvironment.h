#pragma once
// Every Qt test needs one QApplication for the whole run; a global environment makes it
// before the first test and deletes it after the last, on the offscreen platform unless a run
// asks for another (a run outside ctest has no display either). It may install the Qt
// services for the run as well.
#include <gtest/gtest.h>

#include <QApplication>

#include <cstdlib>
#include <memory>
#include <string>

#include "qt/TQQtServices.h"

class QtApplicationEnvironment final : public ::testing::Environment {
public:
    QtApplicationEnvironment(const char* name, bool installServices)
        : _name(name), _installServices(installServices) {}
    void SetUp() override {
        if (!std::getenv("QT_QPA_PLATFORM")) setenv("QT_QPA_PLATFORM", "offscreen", 0);
        _app = std::make_unique<QApplication>(_argc, _argv);
        if (_installServices) _services = std::make_unique<TQQtServiceInstaller>();
    }
    void TearDown() override {
        _services.reset();
        _app.reset();
    }

private:
    std::string _name;
    bool _installServices;
    int _argc = 1;
    char* _argv[2] = {_name.data(), nullptr};
    std::unique_ptr<QApplication> _app;
    std::unique_ptr<TQQtServiceInstaller> _services;
};
