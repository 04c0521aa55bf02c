#pragma once
// Codes that the engine, the views and their hosts pass to each other as plain numbers. The
// values are fixed: hosts store tool ids in their controls, and times and tolerances must
// agree between the engine and the view.

#include <cstdint>

// The tool of a curve editor, as getCurrentTool answers it. A host may hand in another id;
// the views then do nothing with the mouse.
enum class TQTool : uint32_t {
    kEdit = 0,
    kSketch = 1,
    kBox = 2,
};

// Which cached curve getSamples serves: bit 0 of its flag.
enum : char {
    kTQSamplesOriginalCurve = 0,
    kTQSamplesProcessedCurve = 1,
};

// The timescale of every time the editor makes from a world x (seconds on its axis).
inline constexpr int32_t kTQCurveEditorTimescale = 0x40000;

// A double whose magnitude is below this counts as zero.
inline constexpr double kTQZeroTolerance = 1e-7;
