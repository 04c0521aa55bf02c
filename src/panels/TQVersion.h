#pragma once
// The framework's version, taken from the project's version when the build was configured.

// Comparable as a number: major * 10000 + minor * 100 + patch (10203.0 for 1.2.3).
extern const double VantaCurveEditorVersionNumber;
// "major.minor.patch".
extern const char VantaCurveEditorVersionString[];
