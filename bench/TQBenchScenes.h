#pragma once
// The dense scene as the view benchmarks lay it out, and how they put it in a curve set.

#include <memory>
#include <vector>

#include "host/TQHostDenseScene.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"

// 300 plain Bezier curves of 20 keyframes across 20 s in one object, each a wave of +-0.08
// in a band of its own, 0.2 apart (curve c lies about c * 0.2).
inline constexpr size_t kTQBenchStackedCurves = 300;
inline constexpr size_t kTQBenchStackedKeyframes = 20;
inline constexpr double kTQBenchStackedSeconds = 20.0;
inline constexpr double kTQBenchStackedBand = 0.2;

inline TQHostDenseSceneLayout TQBenchStackedCurvesLayout() {
    return {.objects = 1,
            .channelsPerObject = kTQBenchStackedCurves,
            .keyframesPerChannel = kTQBenchStackedKeyframes,
            .seconds = kTQBenchStackedSeconds,
            .channels = TQHostDenseChannels::Plain,
            .bandSpacing = kTQBenchStackedBand,
            .amplitude = 0.08};
}

// Appends every channel of every object of the scene to the set, in order, through the
// controller (so each comes in as an enabled item). Answers the channels.
inline std::vector<TQChannel*> TQBenchAppendAllChannels(TQCurveEditorCtrlBase& ctrl,
                                                        TQHostScene& scene,
                                                        const TQCurveSetPtr& set) {
    std::vector<TQChannel*> channels;
    for (TQChannelObjectRootBase* object : scene.objects()) {
        std::vector<TQChannelBase*> flat;
        object->getAllDescendantsFlattened(flat, 0, true);
        for (TQChannelBase* c : flat) {
            channels.push_back(static_cast<TQChannel*>(c));
            ctrl.appendChannel(channels.back(), set);
        }
    }
    return channels;
}
