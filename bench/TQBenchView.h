#pragma once
// The curve view as the view benchmarks drive it: an encoder that paints nothing, and a view
// on a dense scene that takes mouse events at world points.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "bench/TQBenchScenes.h"
#include "host/TQHostAppDelegate.h"
#include "platform/draw/HXDPrimitives.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"

// Takes the frame and paints nothing: what is measured is the view's own work.
class TQBenchDiscardingEncoder final : public HXDEncoder {
public:
    TQBenchDiscardingEncoder(double width, double height)
        : _target(static_cast<uint32_t>(width), static_cast<uint32_t>(height)) {}
    HXDTexture* nextDrawable() override { return &_target; }
    void beginEncoding(HXDTexture&, const HXDColor&) override {}
    void endEncoding() override {}
    void encodeMultiline(const HXDMultiline& m, const HXDRenderingContext&) override {
        benchmark::DoNotOptimize(&m);
    }
    void encodeQuadTexture(const HXDQuadTexture& q, const HXDRenderingContext&) override {
        benchmark::DoNotOptimize(&q);
    }
    void encodeScreenspaceQuad(const HXDScreenspaceQuad&, const HXDRenderingContext&) override {}
    void encodeMesh(const HXDMesh&, const HXDRenderingContext&) override {}
    void encodeText(const HXDText&, const HXDRenderingContext&) override {}

private:
    class Target final : public HXDTexture {
    public:
        Target(uint32_t width, uint32_t height) : _width(width), _height(height) {}
        uint32_t width() const override { return _width; }
        uint32_t height() const override { return _height; }

    private:
        uint32_t _width;
        uint32_t _height;
    } _target;
};

// The dense scene of `layout` in a view of width x height points at scale 1 that shows its whole
// span by the world height from -1 to `top`, through the reference host. Every channel is in
// the controller's set, auto-zoom and auto-pan are off so that gestures leave the volume
// alone, and one frame has been drawn, so that hit tests have primitives. The view and the
// controller are the base classes unless a benchmark names others.
template <class View, class Controller>
struct TQBenchViewScene {
    TQHostAppDelegate host;
    Controller ctrl;
    TQCurveSetMutablePtr set = std::make_shared<TQCurveSetMutable>();
    RWManualClock clock;
    RWManualTimer timer{clock};
    RWStubViewHost viewHost;
    View view;
    TQBenchDiscardingEncoder encoder;
    std::vector<TQChannel*> channels;

    // Past the view's 1/30 s gate on drag steps.
    static constexpr double kStep = 0.05;

    TQBenchViewScene(const TQHostDenseSceneLayout& layout, double width, double height, double top)
        : viewHost(width, height, 1.0), encoder(width, height) {
        ctrl.init();
        ctrl.setAppDelegate(&host);
        set->initWithName("Bench", &host);
        view.setViewHost(&viewHost);
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(&ctrl);
        ctrl.setView(&view);
        const CMTime start = TQTarnTimeForChannelSeconds(0.0, kTQCurveEditorTimescale);
        const CMTime duration =
            TQTarnTimeForChannelSeconds(layout.seconds, kTQCurveEditorTimescale);
        view.setDisplayRange(&start, &duration);
        view.setTotalRange(&start, &duration);
        view.setCurrentViewVolume(CGRectMake(0.0, -1.0, layout.seconds, top + 1.0));
        view.setOriginalViewVolume(view.getCurrentViewVolume());
        view.setAutoZoom(0);
        view.setAutoPan(0);
        ctrl.setSelectedCurveSet(set);
        TQHostPopulateDenseScene(host.scene(), layout);
        channels = TQBenchAppendAllChannels(ctrl, host.scene(), set);
        frame();
    }

    // Past the 1/30 s gate; false when the frame was held back all the same.
    bool frame() {
        clock.advance(1.0);
        return view.displayLayer(&encoder);
    }
    RWEvent at(RWEventType type, double t, double v, uint64_t mods = 0) const {
        return RWEvent::mouseEvent(type, view.getPointScreen(CGPointMake(t, v)), mods);
    }
    void dragTo(double t, double v, uint64_t mods = 0) {
        clock.advance(kStep);
        view.mouseDragged(at(RWEventType::LeftMouseDragged, t, v, mods));
    }
};

using TQBenchGestureView = TQBenchViewScene<TQCurveEditorViewBase, TQCurveEditorCtrlBase>;
