#pragma once
// The sample project: a six-second motion-graphics piece at 30 frames per second, authored as
// an animator would key it, on the channels (ids and names) of the scene's object family.
//
//   "Title"        flies in from the left with a hard ease into its rest, its scale pops up
//                  past full size and settles (overshoot), it fades in; at 5 s it leaves
//                  to the right and fades out
//   "Logo"         drops in at 1 s and bounces to rest, squashing at each contact; it spins
//                  for ever (a two-second turn repeated by its extrapolation) around an
//                  offset pivot set by a single keypoint; an oscillate behaviour sways it
//                  sideways with no keypoint on that channel
//   "Lower Third"  slides in from the left and later out again, leaning (shear, where the
//                  family has it) while it moves, with a fade at each end; its layer starts
//                  1 s into the piece (time offset 1 s), and its height is set without a
//                  keypoint, off the default
//   "Background"   drifts slowly (linear, extrapolated both ways), pushes in, turns a
//                  little, runs a speed ramp on its retiming and fades its music out; its
//                  opacity is dimmed without a keypoint
//
// So every automatic set finds something on some object: Position, Scale, Rotation, Opacity,
// Pivot and Retiming on both families, Shear on the kestrel family only; Animated and
// Modified differ on the single keypoint, the value set without a keypoint and the resting
// components of the spinning compound. Keyframes sit on frames, in channel time, timescale
// 0x40000.

#include "host/TQHostScene.h"

class TQHostAppDelegate;

inline constexpr const char* kTQHostSampleTitleObject = "Title";
inline constexpr const char* kTQHostSampleBehaviorObject = "Logo";
inline constexpr const char* kTQHostSampleOffsetObject = "Lower Third";
// In the kestrel family its rotation blends as quaternions: no Exp or Log interpolation there.
inline constexpr const char* kTQHostSampleQuaternionObject = "Background";

// Frames per second of the piece, and its length.
inline constexpr int kTQHostSampleFramesPerSecond = 30;
inline constexpr int kTQHostSampleFrames = 6 * kTQHostSampleFramesPerSecond;

// Appends the four objects of the piece, in the order above, to the scene.
void TQHostPopulateSampleScene(TQHostScene& scene);

// Replaces the host's scene by the piece in the given family: display and play range 0-6 s, frame
// duration 1/30 s, playhead at 0, the title selected; undo history and modified set start
// empty, and kTQNotifySceneChanged is posted.
void TQHostLoadSampleScene(TQHostAppDelegate& host, TQHostObjectFamily family);
