// Every Qt test needs one QApplication for the whole run; a global environment makes it
// before the first test and deletes it after the last. The tests run on the offscreen
// platform, so nothing is shown.
#include <gtest/gtest.h>

#include <QApplication>

#include <cstdlib>
#include <memory>

namespace {

class QtApplicationEnvironment final : public ::testing::Environment {
public:
    void SetUp() override {
        // A run outside ctest has no display either.
        if (!std::getenv("QT_QPA_PLATFORM")) setenv("QT_QPA_PLATFORM", "offscreen", 0);
        _app = std::make_unique<QApplication>(_argc, _argv);
    }
    void TearDown() override { _app.reset(); }

private:
    int _argc = 1;
    char _name[16] = "vce_qt_tests";
    char* _argv[2] = {_name, nullptr};
    std::unique_ptr<QApplication> _app;
};

[[maybe_unused]] ::testing::Environment* const gQtEnvironment =
    ::testing::AddGlobalTestEnvironment(new QtApplicationEnvironment);

}  // namespace
