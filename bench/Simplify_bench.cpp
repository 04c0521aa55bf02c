// Simplifying the reference curves of platform/channels/testing/ReferenceCurves.h over their
// whole span, as the editor's simplify panel does, to a given worst value error. The time is
// one simplifyCurve on a fresh copy; the counters tell what it made:
//   keyframes   keyframes after the simplification
//   worstError  the largest difference from the curve before, measured at every frame
//   allowed     the worst error asked for
//   backward    Bezier segments whose handles run back in time (want 0)
//
//   BM_SimplifyNoisySine       100,000 frames at 30 fps, worst error 0.05
//                              (aim: at most 4,500 keyframes in at most 200 ms)
//   BM_SimplifyCatmullRomKeys  500 keyframes, about 3,000 frames, 0.001 of the range
//                              (aim: at most 500 keyframes, which it was made from)
//   BM_SimplifySketchedStroke  300 keyframes, one per frame, 0.01 of the range
//                              (aim: at most 35 keyframes)
//   BM_SimplifyLongSparse      5 keyframes spread over 22 minutes (a keypoint dragged far
//                              out, its handle pulled long), about 40,000 frames, 0.0001 of
//                              the range (was seconds before the placement sampled its layers)
// The argument is the smoothness in frames: 0, the panel's default, and 3.

#include <benchmark/benchmark.h>

#include <memory>

#include "platform/channels/testing/ReferenceCurves.h"

namespace {

using namespace reference_curves;

int64_t frameOf(const CMTime& t) { return t.value * kFps / t.timescale; }

// `error` is in the curve's units, or a fraction of its height when ofHeight.
void simplifyReference(benchmark::State& state, const TQChannel& curve, double error,
                       bool ofHeight) {
    const int smoothness = int(state.range(0));
    const CMTime start = curve.getKeyframeMinTime();
    const CMTime end = curve.getKeyframeMaxTime();
    const int64_t first = frameOf(start);
    const int64_t last = frameOf(end);
    const double h = height(curve, first, last);
    const double allowed = ofHeight ? error * h : error;
    const double tolerance = allowed / h * 100.0;
    std::unique_ptr<TQChannel> result;
    for (auto _ : state) {
        state.PauseTiming();
        result.reset(static_cast<TQChannel*>(curve.cloneChannel()));
        state.ResumeTiming();
        result->simplifyCurve(start, end, frameDuration(), kTQSimplifyBezier, smoothness, tolerance,
                              kTQSimplifyOnFrames);
        benchmark::ClobberMemory();
    }
    state.counters["keyframes"] = double(result->numberOfKeyframes());
    state.counters["worstError"] = worstFrameError(curve, *result, first, last);
    state.counters["allowed"] = allowed;
    state.counters["backward"] = double(backwardSegments(*result));
}

void BM_SimplifyNoisySine(benchmark::State& state) {
    static const std::unique_ptr<TQChannel> curve = noisySine();
    simplifyReference(state, *curve, 0.05, false);
}
BENCHMARK(BM_SimplifyNoisySine)->Arg(0)->Arg(3)->Unit(benchmark::kMillisecond);

void BM_SimplifyCatmullRomKeys(benchmark::State& state) {
    static const std::unique_ptr<TQChannel> curve = catmullRomKeys();
    simplifyReference(state, *curve, 0.001, true);
}
BENCHMARK(BM_SimplifyCatmullRomKeys)->Arg(0)->Arg(3)->Unit(benchmark::kMillisecond);

void BM_SimplifySketchedStroke(benchmark::State& state) {
    static const std::unique_ptr<TQChannel> curve = sketchedStroke();
    simplifyReference(state, *curve, 0.01, true);
}
BENCHMARK(BM_SimplifySketchedStroke)->Arg(0)->Arg(3)->Unit(benchmark::kMillisecond);

}  // namespace

void BM_SimplifyLongSparse(benchmark::State& state) {
    static const std::unique_ptr<TQChannel> curve = [] {
        auto c = std::make_unique<TQChannel>("long sparse", 1, 0.0);
        const int64_t frames[] = {0, 30, 60, 90, 40'500};
        const double values[] = {0.0, 1.0, -0.5, 0.25, 3.0};
        for (size_t i = 0; i < std::size(frames); ++i) c->setKeyframe(frame(frames[i]), values[i]);
        const TQKeyframeHandle h = c->getKeyframe(frame(90));
        c->setKeyframeOutputTangents(h, 400.0, 30.0);
        return c;
    }();
    simplifyReference(state, *curve, 0.0001, true);
}
BENCHMARK(BM_SimplifyLongSparse)->Arg(0)->Arg(3)->Unit(benchmark::kMillisecond);
