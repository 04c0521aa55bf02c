// One frame of the curve view and one pick over it. The scene: the dense scene's 300 stacked
// curves of 20 Bezier keyframes each (TQBenchScenes.h), in a view 2000 points wide, so that each curve is drawn through 2000
// cached samples (600,000 vertices a frame). The samples are fetched once, before timing: a
// frame rebuilds every primitive from the items' caches, as it does while nothing changes.
//
// BM_FrameBuild: displayLayer into an encoder that paints nothing (the frame's primitives:
// three multilines and 20 keypoint quads per curve, plus what the frame does around them).
// BM_TimelineFrameBuild: the same frame in the full editor's timeline view, with one curve
// selected, so that the timeline adds what it draws: the time grid, the value labels of the
// selected curve, the lines at both ends of its object's extent, and the value label of its
// dragged keypoint in timecode.
// BM_PickClosest: the point hit test with the closest flag over the frame's pickable
// primitives, at points that hit curves, keypoints and empty space.
//
// Targets: a frame build under 5 ms, the timeline's at most 0.5 ms more; one pick under 10 us.
#include <benchmark/benchmark.h>

#include <vector>

#include "bench/TQBenchView.h"
#include "src/editor/TQCurveEditorView.h"

namespace {

constexpr int kTimescale = 0x40000;
constexpr double kViewWidthPoints = 2000.0;
constexpr double kViewHeightPoints = 600.0;

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

// The stacked curves in a view 2000 points wide; the first frame has fetched and cached every
// curve's samples.
struct FrameScene : TQBenchGestureView {
    FrameScene()
        : TQBenchGestureView(TQBenchStackedCurvesLayout(), kViewWidthPoints, kViewHeightPoints,
                             kTQBenchStackedBand * kTQBenchStackedCurves + 1.0) {}
};

void BM_FrameBuild(benchmark::State& state) {
    FrameScene scene;
    for (auto _ : state) {
        if (!scene.frame()) state.SkipWithError("the frame was held back");
    }
    state.counters["primitives"] = static_cast<double>(scene.view.primitives().size());
}
BENCHMARK(BM_FrameBuild)->Unit(benchmark::kMillisecond);

// The controller shows the selected curves as the full editor's does: value labels appear for
// a single one.
class TimelineBenchCtrl : public TQCurveEditorCtrlBase {
public:
    uint32_t numberOfDisplayedChannels() const override { return numberOfSelectedChannels(); }
};

struct TimelineFrameScene : TQBenchViewScene<TQCurveEditorView, TimelineBenchCtrl> {
    TimelineFrameScene()
        : TQBenchViewScene(TQBenchStackedCurvesLayout(), kViewWidthPoints, kViewHeightPoints,
                           kTQBenchStackedBand * kTQBenchStackedCurves + 1.0) {
        // One curve selected, its middle keypoint being dragged (its label shows).
        const TQCurveEditorItemPtr item = set->channeItemAtIndex(kTQBenchStackedCurves / 2);
        item->select(1);
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setHandle(item->channel()->getKeyframes(false)[kTQBenchStackedKeyframes / 2]);
        entry->setFlags(TQSelectionKeypoint);
        entry->setCurveId(item->channelId());
        view.getSelection()->addSelection(entry);
        view.setPrintText(1);
        frame();
    }
};

void BM_TimelineFrameBuild(benchmark::State& state) {
    TimelineFrameScene scene;
    for (auto _ : state) {
        if (!scene.frame()) state.SkipWithError("the frame was held back");
    }
    size_t texts = 0;
    for (const auto& p : scene.view.primitives())
        texts += dynamic_cast<const HXDText*>(p.get()) ? 1 : 0;
    state.counters["primitives"] = static_cast<double>(scene.view.primitives().size());
    state.counters["texts"] = static_cast<double>(texts);
}
BENCHMARK(BM_TimelineFrameBuild)->Unit(benchmark::kMillisecond);

void BM_PickClosest(benchmark::State& state) {
    FrameScene scene;
    const HXDRenderController* rc = scene.view.renderController();
    const HXDPrimitiveArray& pickable = scene.view.selectionPrimitives();
    // Points on keypoints, on curves between them, and between the bands.
    std::vector<HXDFloat2> points;
    for (int i = 0; i < 64; ++i) {
        const TQChannel* channel =
            scene.channels[static_cast<size_t>(i * 37) % kTQBenchStackedCurves];
        CMTime t = kCMTimeInvalid;
        double v = 0.0;
        if (i % 3 == 0) {
            channel->getKeyframe(
                channel->getKeyframes(false)[static_cast<size_t>(i) % kTQBenchStackedKeyframes], &t,
                &v);
        } else {
            t = seconds(0.37 + i * 0.29);
            v = channel->getCurveValue(t) + (i % 4 == 3 ? kTQBenchStackedBand / 2.0 : 0.0);
        }
        const CGPoint p = scene.view.getPointScreen(CGPointMake(CMTimeGetSeconds(t), v));
        points.push_back(HXDFloat2{static_cast<float>(p.x), static_cast<float>(p.y)});
    }
    // The first pick after a frame builds the curves' indexes: not what a click costs.
    benchmark::DoNotOptimize(rc->newHitTestResultForPrimitives(
        pickable, rc->renderingContextForHitTestAtCoords(points[0]), true));
    size_t i = 0;
    size_t hits = 0;
    for (auto _ : state) {
        const auto context = rc->renderingContextForHitTestAtCoords(points[i++ & 63]);
        const auto result = rc->newHitTestResultForPrimitives(pickable, context, true);
        hits += result.size();
        benchmark::DoNotOptimize(result.data());
    }
    state.counters["pickable"] = static_cast<double>(pickable.size());
    state.counters["hitRate"] = static_cast<double>(hits) / static_cast<double>(state.iterations());
}
BENCHMARK(BM_PickClosest)->Unit(benchmark::kMicrosecond);

}  // namespace
