#include "qt/tests/QtApplicationEnvironment.h"

[[maybe_unused]] static ::testing::Environment* const gQtEnvironment =
    ::testing::AddGlobalTestEnvironment(new QtApplicationEnvironment("vce_qt_tests", false));
