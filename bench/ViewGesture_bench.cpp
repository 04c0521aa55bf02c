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

#include <memory>

#include "bench/TQBenchScenes.h"
#include "host/TQHostAppDelegate.h"
#include "platform/draw/HXDPrimitives.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

namespace {

constexpr int kTimescale = 0x40000;
constexpr double kWidth = 2000.0;
constexpr double kHeight = 600.0;
constexpr double kDuration = kTQBenchStackedSeconds;
// Above every curve.
constexpr double kTop = kTQBenchStackedBand * kTQBenchStackedCurves + 0.5;
constexpr double kStep = 0.05;  // past the view's 1/30 s gate on drag steps

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

class NullEncoder final : public HXDEncoder {
public:
    HXDTexture* nextDrawable() override { return &_target; }
    void beginEncoding(HXDTexture&, const HXDColor&) override {}
    void endEncoding() override {}
    void encodeMultiline(const HXDMultiline&, const HXDRenderingContext&) override {}
    void encodeQuadTexture(const HXDQuadTexture&, const HXDRenderingContext&) override {}
    void encodeScreenspaceQuad(const HXDScreenspaceQuad&, const HXDRenderingContext&) override {}
    void encodeMesh(const HXDMesh&, const HXDRenderingContext&) override {}
    void encodeText(const HXDText&, const HXDRenderingContext&) override {}

private:
    class Target final : public HXDTexture {
    public:
        uint32_t width() const override { return static_cast<uint32_t>(kWidth); }
        uint32_t height() const override { return static_cast<uint32_t>(kHeight); }
    } _target;
};

struct GestureScene {
    TQHostAppDelegate host;
    TQCurveEditorCtrlBase ctrl;
    TQCurveSetMutablePtr set = std::make_shared<TQCurveSetMutable>();
    RWManualClock clock;
    RWManualTimer timer{clock};
    RWStubViewHost viewHost{kWidth, kHeight, 1.0};
    TQCurveEditorViewBase view;
    NullEncoder encoder;

    GestureScene() {
        ctrl.init();
        ctrl.setAppDelegate(&host);
        set->initWithName("Gesture", &host);
        view.setViewHost(&viewHost);
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(&ctrl);
        ctrl.setView(&view);
        const CMTime start = seconds(0.0);
        const CMTime duration = seconds(kDuration);
        view.setDisplayRange(&start, &duration);
        view.setTotalRange(&start, &duration);
        // The top unit is empty, for gestures that start on nothing.
        view.setCurrentViewVolume(
            CGRectMake(0.0, -1.0, kDuration, kTQBenchStackedBand * kTQBenchStackedCurves + 2.0));
        view.setOriginalViewVolume(view.getCurrentViewVolume());
        view.setAutoZoom(0);
        view.setAutoPan(0);
        ctrl.setSelectedCurveSet(set);
        TQHostPopulateDenseScene(host.scene(), TQBenchStackedCurvesSpec());
        TQBenchAppendAllChannels(ctrl, host.scene(), set);
        frame();
    }

    void frame() {
        clock.advance(1.0);
        view.displayLayer(&encoder);
    }
    RWEvent at(RWEventType type, double t, double v, uint64_t mods = 0) const {
        return RWEvent::mouseEvent(type, view.getPointScreen(CGPointMake(t, v)), mods);
    }
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
        scene.clock.advance(kStep);
        // Back and forth between a band over everything and one a little smaller.
        scene.view.mouseDragged(scene.at(RWEventType::LeftMouseDragged,
                                         out ? kDuration - 0.01 : kDuration - 0.5, -0.5, mods));
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
        scene.clock.advance(kStep);
        // A third of a frame to and fro: every keypoint moves, none meets another.
        scene.view.mouseDragged(
            scene.at(RWEventType::LeftMouseDragged, forward ? t + 0.011 : t, v));
        forward = !forward;
    }
    state.counters["keypoints"] = static_cast<double>(scene.view.getSelection()->size());
    scene.view.mouseUp(scene.at(RWEventType::LeftMouseUp, t, v));
}
BENCHMARK(BM_DragStepThroughView)->Unit(benchmark::kMillisecond);

}  // namespace
