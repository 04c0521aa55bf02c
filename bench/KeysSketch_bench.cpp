// Steps of the keys and the sketch tool through the curve view, on the reference host.
//
// BM_NudgeStep: one arrow-key nudge of 6000 selected keypoints (the dense scene's 300
// stacked curves of 20 keyframes, all selected), a frame to the right and back by turns: the
// key's undo step with its channel records, the selection's repair, the offset of every
// keypoint and the word to the host. The history is emptied now and then, outside the
// measure, so that it does not grow without end.
// BM_SketchStep: one drag step of the sketch tool on a channel of 1000 keyframes (0.1 s
// apart), the pointer sweeping across it and back by one spacing a step: the erasure of what
// it passed, the keypoint it writes, and the value announcements.
//
// Targets: a nudge under 10 ms, a sketch step under 1 ms.
#include <benchmark/benchmark.h>

#include "bench/TQBenchView.h"

namespace {

struct KeyAction final : RWActionSender {
    int64_t tag() const override { return 0; }
};

void BM_NudgeStep(benchmark::State& state) {
    TQBenchGestureView scene(TQBenchStackedCurvesLayout(), 2000.0, 600.0,
                             kTQBenchStackedBand * kTQBenchStackedCurves + 1.0);
    scene.view.selectAll();
    KeyAction key;
    bool right = true;
    int64_t steps = 0;
    for (auto _ : state) {
        scene.view.performAction(right ? "nudgeRight:" : "nudgeLeft:", key);
        right = !right;
        if (++steps % 32 == 0) {
            state.PauseTiming();
            scene.host.undoStack().clear();
            state.ResumeTiming();
        }
    }
    state.counters["keypoints"] = static_cast<double>(scene.view.getSelection()->size());
}
BENCHMARK(BM_NudgeStep)->Unit(benchmark::kMillisecond);

constexpr size_t kSketchKeyframes = 1000;
constexpr double kSketchSeconds = 100.0;

void BM_SketchStep(benchmark::State& state) {
    TQBenchGestureView scene({.objects = 1,
                              .channelsPerObject = 1,
                              .keyframesPerChannel = kSketchKeyframes,
                              .seconds = kSketchSeconds,
                              .channels = TQHostDenseChannels::Plain,
                              .bandSpacing = 0.0,
                              .amplitude = 0.5},
                             2000.0, 600.0, 1.0);
    scene.set->allItems().front()->select(1);
    scene.ctrl.setCurrentTool(TQTool::kSketch);
    // Sweeps across the channel and back, a key spacing a step: each step passes over one
    // keyframe and writes one, so the channel keeps its size.
    constexpr double kStep = kSketchSeconds / kSketchKeyframes;
    double t = 1.0;
    double direction = 1.0;
    scene.view.mouseDown(scene.at(RWEventType::LeftMouseDown, t, 0.25));
    for (auto _ : state) {
        if (t + direction * kStep > kSketchSeconds - 1.0 || t + direction * kStep < 1.0)
            direction = -direction;
        t += direction * kStep;
        scene.dragTo(t, 0.25);
    }
    state.counters["keyframes"] = static_cast<double>(scene.channels.front()->numberOfKeyframes());
    scene.view.mouseUp(scene.at(RWEventType::LeftMouseUp, t, 0.25));
}
BENCHMARK(BM_SketchStep)->Unit(benchmark::kMicrosecond);

}  // namespace
