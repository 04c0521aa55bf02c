// The demo's tests run with the Qt services installed, as the demo does.
#include "qt/tests/QtApplicationEnvironment.h"

[[maybe_unused]] static ::testing::Environment* const gDemoEnvironment =
    ::testing::AddGlobalTestEnvironment(new QtApplicationEnvironment("vce_demo_tests", true));
