// The full editor's update cycle on the stress scene (100 objects of 30 channels, 1,000,000
// keyframes), with the editor as the host sets it up: the timeline view on a view host 2000
// points wide, the vertical scroller, the pop-up, the controller hearing the host's words.
//
// BM_NotifyAfterDragStep: the whole notify of one kTQNotifyChannelsChanged word after a drag
// step changed one channel (the host marks it modified), with the All set selected over 1, 10
// or 100 objects. Nothing is resampled: that is the next frame's. The second argument is 1
// when the view has the keyboard focus, as it has during a drag in it; 0 for a change made
// elsewhere (the channel list), after which a view that zooms by itself fits the curves
// again. Target: at most 1 ms.
//
// BM_ObjectSelectionChange: the host's selection moves from one group of objects to another
// (1 or 10 objects, the same count each time) and its word reaches the controller, which
// rebuilds the selected automatic set (0 All, 1 Animated) and brings the controls in step.
// Target: at most 5 ms.
#include <benchmark/benchmark.h>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

namespace {

constexpr double kViewWidth = 2000.0;

struct Editor {
    TQHostAppDelegate host;
    RWStubViewHost viewHost{kViewWidth, 600.0, 1.0};
    TQCurveEditorView view;
    TQCurveEditorCtrl ctrl;
    std::vector<TQChannelObjectRootBase*> objects;

    Editor() {
        TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel, TQHostStressSceneLayout());
        objects = host.scene().objects();
        view.setViewHost(&viewHost);
        const CMTimeRange range = host.displayRange();
        view.setTotalRange(&range.start, &range.duration);
        ctrl.init();
        ctrl.setAppDelegate(&host);
        ctrl.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.verticalScroller = std::make_shared<RWZoomScroller>();
        outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
        ctrl.connectOutlets(outlets);
        ctrl.setupController();
        ctrl.viewDidLoad();
        host.addNotificationReceiver(&ctrl);
        view.drawProjection();
    }
    ~Editor() {
        host.removeNotificationReceiver(&ctrl);
        view.setViewHost(nullptr);
    }
    // Objects [first, first + count), wrapping round the scene.
    std::vector<TQChannelBase*> group(size_t first, size_t count) const {
        std::vector<TQChannelBase*> out;
        for (size_t i = 0; i < count; ++i) out.push_back(objects[(first + i) % objects.size()]);
        return out;
    }
};

// Built once: the scene takes seconds to build, and each benchmark leaves it as it found it.
Editor& editor() {
    static Editor e;
    return e;
}

void BM_NotifyAfterDragStep(benchmark::State& state) {
    Editor& e = editor();
    const auto selected = static_cast<size_t>(state.range(0));
    e.view.setIsInCurveEditor(state.range(1) != 0 ? 1 : 0);
    e.host.setSelectedObjects(e.group(0, selected));
    e.ctrl.showAll();
    // A channel of the first object, as a drag step announces it.
    TQChannel* dragged = nullptr;
    for (const TQCurveEditorItemPtr& item : e.ctrl.selectedCurveSet()->allItems()) {
        dragged = item->channel();
        if (dragged) break;
    }
    if (!dragged) {
        state.SkipWithError("the set shows no channel");
        return;
    }
    for (auto _ : state) {
        dragged->noteWillChange(true);
        e.ctrl.notify(kTQNotifyChannelsChanged);
    }
    state.counters["items"] = static_cast<double>(e.ctrl.numberOfChannelItems());
}
BENCHMARK(BM_NotifyAfterDragStep)
    ->ArgsProduct({{1, 10, 100}, {1, 0}})
    ->Unit(benchmark::kMicrosecond);

void BM_ObjectSelectionChange(benchmark::State& state) {
    Editor& e = editor();
    const auto count = static_cast<size_t>(state.range(1));
    if (state.range(0) == 0)
        e.ctrl.showAll();
    else
        e.ctrl.showAnimated();
    size_t first = 0;
    for (auto _ : state) {
        first = (first + count) % e.objects.size();
        e.host.setSelectedObjects(e.group(first, count));
    }
    state.counters["items"] = static_cast<double>(e.ctrl.numberOfChannelItems());
}
BENCHMARK(BM_ObjectSelectionChange)->ArgsProduct({{0, 1}, {1, 10}})->Unit(benchmark::kMillisecond);

}  // namespace
