// Gesture steps through the curve view, as mouse events reach it: a rubber-band step and an
// edit drag step. The scene: the dense scene's 300 stacked curves of 20 Bezier keyframes
// (6000 keypoints, TQBenchScenes.h) in a view 2000 x 600 points, one frame drawn so that the
// hit tests have primitives.
//
// BM_BandStep: one drag step of a band that covers every keypoint: the rectangle test over
// every channel's keypoint quads, the entries it makes, and the new selection.
// BM_ShiftBandStep: the same with Shift over a selection of every other keypoint, so that
// each step inverts the membership of 6000 keypoints.
// BM_DragStepThroughView: one drag step of all 6000 keypoints selected (selection repair,
// scroll band, moveSelected and the value announcements), with no frame in between.
//
// Targets: a band step under 5 ms, a drag step of 6000 keypoints under 10 ms.
#include <benchmark/benchmark.h>

#include "bench/TQBenchView.h"

namespace {

constexpr double kDuration = kTQBenchStackedSeconds;
// Above every curve.
constexpr double kTop = kTQBenchStackedBand * kTQBenchStackedCurves + 0.5;

// 300 stacked curves in a view 2000 x 600 points, with an empty unit on top for gestures
// that start on nothing.
struct GestureScene : TQBenchGestureView {
    GestureScene()
        : TQBenchGestureView(TQBenchStackedCurvesLayout(), 2000.0, 600.0,
                             kTQBenchStackedBand * kTQBenchStackedCurves + 1.0) {}
};

void bandSteps(benchmark::State& state, uint64_t mods) {
    GestureScene scene;
    if (mods & RWEventModifierFlagShift) {
        // Every other keypoint selected before the band.
        scene.view.selectAll();
        auto& entries = scene.view.getSelection()->getSelectionArray();
        for (size_t i = 0, j = 0; i < entries.size(); i += 2) entries[j++] = entries[i];
        entries.resize((entries.size() + 1) / 2);
    }
    scene.view.mouseDown(scene.at(RWEventType::LeftMouseDown, 0.01, kTop, mods));
    bool out = true;
    for (auto _ : state) {
        // Back and forth between a band over everything and one a little smaller.
        scene.dragTo(out ? kDuration - 0.01 : kDuration - 0.5, -0.5, mods);
        out = !out;
    }
    state.counters["selected"] = static_cast<double>(scene.view.getSelection()->size());
    scene.view.mouseUp(scene.at(RWEventType::LeftMouseUp, kDuration - 0.01, -0.5, mods));
}

void BM_BandStep(benchmark::State& state) { bandSteps(state, 0); }
BENCHMARK(BM_BandStep)->Unit(benchmark::kMillisecond);

void BM_ShiftBandStep(benchmark::State& state) { bandSteps(state, RWEventModifierFlagShift); }
BENCHMARK(BM_ShiftBandStep)->Unit(benchmark::kMillisecond);

void BM_DragStepThroughView(benchmark::State& state) {
    GestureScene scene;
    scene.view.selectAll();
    // A press on a selected keypoint keeps the selection and makes that keypoint primary.
    TQChannel* first = scene.set->allItems().front()->channel();
    CMTime keyTime = kCMTimeInvalid;
    double v = 0.0;
    first->getKeyframe(first->getKeyframes(false)[kTQBenchStackedKeyframes / 2], &keyTime, &v);
    const double t = CMTimeGetSeconds(keyTime);
    scene.view.mouseDown(scene.at(RWEventType::LeftMouseDown, t, v));
    bool forward = true;
    for (auto _ : state) {
        // A third of a frame to and fro: every keypoint moves, none meets another.
        scene.dragTo(forward ? t + 0.011 : t, v);
        forward = !forward;
    }
    state.counters["keypoints"] = static_cast<double>(scene.view.getSelection()->size());
    scene.view.mouseUp(scene.at(RWEventType::LeftMouseUp, t, v));
}
BENCHMARK(BM_DragStepThroughView)->Unit(benchmark::kMillisecond);

}  // namespace
