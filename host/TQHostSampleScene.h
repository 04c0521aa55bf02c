#pragma once
// The sample scene that tests, benchmarks and the demo share: a few objects of the scene's
// family, each with a few hundred keyframes spread over the first ten seconds across every
// interpolation kind, built from a seeded generator so that every run builds the same scene.
//
//   "Title"        plain keyframes
//   "Logo"         an oscillate behaviour on its position X, a noise behaviour on its opacity
//   "Background"   (kestrel family) its rotation blends as quaternions: no Exp or Log there
//   "Lower Third"  starts one second late: its root carries a time offset of 1 s
//   further objects ("Object 5", ...) are plain, like "Title"
//
// Keyframes sit on frames of 1/30 s, in channel time, with timescale 0x40000.

#include <cstddef>
#include <cstdint>

#include "host/TQHostScene.h"

class TQHostAppDelegate;

struct TQHostSampleSceneSpec {
    size_t objects = 4;
    uint32_t seed = 1;
    // Multiplies every channel's keyframe count (1: a few hundred keyframes per object).
    double density = 1.0;
};

inline constexpr const char* kTQHostSampleBehaviorObject = "Logo";
inline constexpr const char* kTQHostSampleQuaternionObject = "Background";
inline constexpr const char* kTQHostSampleOffsetObject = "Lower Third";

// Appends the sample objects to the scene.
void TQHostPopulateSampleScene(TQHostScene& scene, const TQHostSampleSceneSpec& spec = {});

// Replaces the host's scene by the sample scene in the given family: display range 0-10 s,
// frame duration 1/30 s, playhead at 0, the first object selected; undo history and modified
// set start empty.
void TQHostLoadSampleScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                           const TQHostSampleSceneSpec& spec = {});
