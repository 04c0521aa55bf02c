// One drag step of the box tool through the view, as a mouse event reaches it: the corner
// moves, every frozen keypoint is mapped through the new box and written back with its
// handles (inside the host's value announcements), and every curve is resampled for the next
// frame. The scene: the dense scene's plain channels, 50 of 120 Bezier keyframes across 20 s
// (6000 keypoints), all caught by a band of the box tool; the top-right corner is dragged to
// and fro, so every keypoint but those on the fixed corner moves at every step.
//
// Target: under 8 ms per step.
#include <benchmark/benchmark.h>

#include "bench/TQBenchView.h"

namespace {

constexpr double kWidth = 2000.0;
constexpr size_t kChannels = 50;
constexpr double kDuration = 20.0;
constexpr double kBand = 0.2;
constexpr double kTop = kBand * kChannels + 0.5;  // above every curve

struct BoxScene : TQBenchGestureView {
    BoxScene()
        : TQBenchGestureView({.objects = 1,
                              .channelsPerObject = kChannels,
                              .keyframesPerChannel = 120,
                              .seconds = kDuration,
                              .channels = TQHostDenseChannels::Plain,
                              .bandSpacing = kBand,
                              .amplitude = 0.08},
                             kWidth, 600.0, kTop + 0.5) {
        ctrl.setCurrentTool(TQTool::kBox);
        // A band over everything leaves the box around every keypoint.
        view.mouseDown(at(RWEventType::LeftMouseDown, 0.0, kTop));
        dragTo(kDuration, -0.5);
        view.mouseUp(at(RWEventType::LeftMouseUp, kDuration, -0.5));
        frame();
    }

    // What the next frame would sample: every curve the step left dirty, across the view.
    void resample() {
        const CMTime step =
            TQTarnTimeForChannelSeconds(kDuration / kWidth, kTQCurveEditorTimescale);
        for (const TQCurveEditorItemPtr& item : set->allItems()) {
            auto* channelItem = static_cast<TQCurveEditorChannelItem*>(item.get());
            if (!channelItem->originalCurveDirty()) continue;
            const CMTime* u = nullptr;
            const double* v = nullptr;
            unsigned number = static_cast<unsigned>(kWidth);
            ctrl.getSamples(item.get(), kTQSamplesOriginalCurve, kCMTimeZero, step, &u, &v,
                            &number);
            benchmark::DoNotOptimize(v);
        }
    }
};

void BM_BoxDragStep(benchmark::State& state) {
    BoxScene scene;
    const CGPoint corner = scene.view.fourCornersTopRight();
    scene.view.mouseDown(scene.at(RWEventType::LeftMouseDown, corner.x, corner.y));
    bool out = true;
    for (auto _ : state) {
        // A few pixels in and out: the box shrinks and grows a little at each step.
        scene.dragTo(out ? corner.x - 0.05 : corner.x - 0.1, out ? corner.y + 0.02 : corner.y);
        scene.resample();
        out = !out;
    }
    state.counters["keypoints"] = static_cast<double>(scene.ctrl.deformKeys().size());
    scene.view.mouseUp(scene.at(RWEventType::LeftMouseUp, corner.x, corner.y));
}
BENCHMARK(BM_BoxDragStep)->Unit(benchmark::kMillisecond);

}  // namespace
