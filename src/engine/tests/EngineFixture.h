#pragma once
// The engine fixture lives with the shared test support now; the Qt tests still include it
// from here.
#include "tests/support/EngineFixture.h"
