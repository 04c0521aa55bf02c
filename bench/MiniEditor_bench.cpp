// The mini editor and the curve strip as an inspector shows them, at a backing scale of 2: an
// over-range pair whose two component curves have 24 Bezier keyframes each, a few selected.
//
// BM_MiniEditorFrame: one frame of the inspector's curve view (219 x 145 points) after a row
// changed the curves, so that both are sampled again: what each step of a row's drag costs.
// BM_StripFrame: the strip (180 x 18 points) samples the first component again and draws.
//
// Targets: a mini editor frame at most 1 ms, a strip at most 0.3 ms.
#include <benchmark/benchmark.h>

#include <cmath>
#include <memory>

#include "bench/TQBenchView.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/TQChannelTypes.h"
#include "src/mini/TQMiniCurveEditorInspector.h"
#include "src/mini/TQMiniCurveEditorStripView.h"

namespace {

constexpr int kKeyframes = 24;

CMTime position(double p) { return TQTarnTimeForChannelSeconds(p, 0x40000); }

struct MiniScene : TQMiniCurveEditorStripSource {
    TQHostAppDelegate host;
    RWManualClock clock;
    RWManualTimer timer{clock};
    RWStubViewHost viewHost{219.0, 145.0, 2.0};
    TQBenchDiscardingEncoder encoder{438.0, 290.0};
    TQMiniCurveEditorInspector editor{&host};
    TQChannel2DOverRange* pair = nullptr;

    MiniScene() {
        auto root = std::make_unique<TQChannelObjectRootBase>("Object", 1);
        TQChannelObjectRootBase* object = host.scene().adoptObject(std::move(root));
        pair = static_cast<TQChannel2DOverRange*>(
            object->addChild(std::make_unique<TQChannel2DOverRange>("Gradient", 11)));
        for (int i = 0; i < kKeyframes; ++i) {
            const double p = static_cast<double>(i) / (kKeyframes - 1);
            pair->getXChannel()->setKeyframe(position(p), std::sin(p * 9.0) * 40.0);
            pair->getYChannel()->setKeyframe(position(p), std::cos(p * 7.0) * 25.0);
        }
        TQMiniCurveEditorView& view = editor.curveEditorView();
        view.setViewHost(&viewHost);
        view.setClock(&clock);
        view.setTimer(&timer);
        editor.setChannel(pair);
        view.selectAll();
        frame();
    }
    ~MiniScene() override { editor.curveEditorView().setViewHost(nullptr); }

    bool frame() {
        clock.advance(1.0);
        return editor.curveEditorView().displayLayer(&encoder);
    }
    TQChannelBase* associatedChannel() const override { return pair; }
    TQMiniCurveEditor* getMiniCurveEditor() const override {
        return const_cast<TQMiniCurveEditorInspector*>(&editor);
    }
};

void BM_MiniEditorFrame(benchmark::State& state) {
    MiniScene scene;
    for (auto _ : state) {
        scene.editor.curveEditorView().setAllOriginalCurveDirty(1);
        if (!scene.frame()) state.SkipWithError("the frame was held back");
    }
    state.counters["primitives"] =
        static_cast<double>(scene.editor.curveEditorView().primitives().size());
}
BENCHMARK(BM_MiniEditorFrame)->Unit(benchmark::kMicrosecond);

void BM_StripFrame(benchmark::State& state) {
    MiniScene scene;
    RWStubViewHost stripHost{180.0, 18.0, 2.0};
    TQBenchDiscardingEncoder stripEncoder{360.0, 36.0};
    TQMiniCurveEditorStripView strip;
    strip.setViewHost(&stripHost);
    strip.setController(&scene);
    for (auto _ : state) {
        strip.sample();
        if (!strip.drawInView(stripEncoder)) state.SkipWithError("no drawable");
    }
    state.counters["samples"] = strip.numberOfSamples();
}
BENCHMARK(BM_StripFrame)->Unit(benchmark::kMicrosecond);

}  // namespace
