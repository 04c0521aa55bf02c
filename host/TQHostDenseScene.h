#pragma once
// The dense scene that every benchmark builds: many objects, many animated channels, many
// keyframes, from a seeded generator, so that every run on every machine builds the same
// scene. Not meant to look like anything: it is load.
//
// Channels. With TQHostDenseChannels::Modelled each object is an object of the scene's
// family (TQHostObjectModel), so that the automatic curve sets find their paths; its
// keyframable channels are animated in tree order, and when the model holds fewer than asked
// for, plain channels in a folder "Dense" (id 900) under the object root make up the count.
// The model's channels beyond the count stay in their default state. With
// TQHostDenseChannels::Plain each object is a bare object root holding only plain channels
// ("C0", "C1", ... with ids 100, 101, ...), for measures of the editor's own work on uniform
// curves.
//
// Keyframes. Each animated channel gets its share of keyframes evenly spaced from time 0
// across `seconds` (the components of over-range pairs across their position range, 0 to 1),
// Bezier where the channel takes it, with flat handles (those of a keyframe added after all
// the others), values a smooth wave with a seeded random part:
//   value = default + bandSpacing * g + amplitude * w
// where g is the channel's index over the whole scene and w lies in [-1, 1]. A positive band
// spacing stacks the curves, each in a band of its own. Times are channel times of timescale
// 0x40000; more keyframes than ticks in the span would meet, and the later would replace the
// earlier.

#include <cstddef>
#include <cstdint>

#include "host/TQHostScene.h"

class TQHostAppDelegate;

enum class TQHostDenseChannels { Modelled, Plain };

struct TQHostDenseSceneLayout {
    size_t objects = 10;
    size_t channelsPerObject = 30;
    size_t keyframesPerChannel = 100;
    // When nonzero, the keyframes in all instead: spread as evenly as the channels allow, the
    // first channels of the scene taking one more.
    size_t totalKeyframes = 0;
    uint32_t seed = 1;
    double seconds = 20.0;
    TQHostDenseChannels channels = TQHostDenseChannels::Modelled;
    double bandSpacing = 0.0;
    double amplitude = 1.0;
};

// The stress scene: 100 objects of 30 channels, 1,000,000 keyframes in all.
TQHostDenseSceneLayout TQHostStressSceneLayout();

// The keyframes channel `index` (over the whole scene, from 0) gets.
size_t TQHostDenseKeyframesOfChannel(const TQHostDenseSceneLayout& layout, size_t index);

// Appends the objects ("Dense 1", "Dense 2", ...) to the scene.
void TQHostPopulateDenseScene(TQHostScene& scene, const TQHostDenseSceneLayout& layout);

// Replaces the host's scene by the dense scene in the given family: display and play range 0 to
// `seconds`, frame duration 1/30 s, playhead at 0, the first object selected; undo history and
// modified set start empty, and kTQNotifySceneChanged is posted.
void TQHostLoadDenseScene(TQHostAppDelegate& host, TQHostObjectFamily family,
                          const TQHostDenseSceneLayout& layout);
