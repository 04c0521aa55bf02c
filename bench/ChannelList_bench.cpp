// The channel list beside the full editor on the stress scene (100 objects of 30 channels,
// 1,000,000 keyframes), the All set over every object: 3,000 channel rows under 100 objects.
// The list is 300 points wide and 600 tall (30 rows in view); a drawing pass prepares every
// cell of the rows that wait for a redraw and are in view, as the widget's painting asks.
//
// BM_ChannelListBuild: the list's update (the rows reloaded from the set, every object opened,
// each item's selection from its row's) and the drawing pass that shows it. Target: at most
// 20 ms.
//
// BM_ChannelListAfterDragStep: after a drag step changed one channel, the editor's notify of
// kTQNotifyChannelsChanging and the drawing pass: only the rows it marked are asked for again.
// Target: at most 2 ms.
#include <benchmark/benchmark.h>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/channellist/TQCurveEditorChannelList.h"
#include "src/channellist/TQCurveEditorListController.h"
#include "src/editor/TQCurveEditorCtrl.h"
#include "src/editor/TQCurveEditorView.h"

namespace {

struct ListEditor {
    TQHostAppDelegate host;
    RWStubViewHost viewHost{2000.0, 600.0, 1.0};
    TQCurveEditorView view;
    TQCurveEditorCtrl ctrl;
    TQCurveEditorChannelList list;
    TQCurveEditorListController controller;
    int64_t cellsDrawn = 0;

    ListEditor() {
        TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel, TQHostStressSceneLayout());
        view.setViewHost(&viewHost);
        const CMTimeRange range = host.displayRange();
        view.setTotalRange(&range.start, &range.duration);
        list.addStandardColumns();
        list.setCurveListController(&controller);
        controller.setMainCurveEditorController(&ctrl);
        controller.setOutlineView(&list);
        controller.awakeFromNib();
        ctrl.init();
        ctrl.setAppDelegate(&host);
        ctrl.setView(&view);
        TQCurveEditorOutlets outlets;
        outlets.verticalScroller = std::make_shared<RWZoomScroller>();
        outlets.curveSetsPopUp = std::make_shared<RWPopUpButton>();
        outlets.channels = &list;
        outlets.channelsList = &controller;
        ctrl.connectOutlets(outlets);
        ctrl.setupController();
        ctrl.viewDidLoad();
        host.addNotificationReceiver(&ctrl);
        list.setVisibleRect(CGRectMake(0, 0, 300, 600));
        view.drawProjection();
        std::vector<TQChannelBase*> all;
        for (TQChannelObjectRootBase* object : host.scene().objects()) all.push_back(object);
        host.setSelectedObjects(all);
        ctrl.showAll();
    }
    ~ListEditor() {
        host.removeNotificationReceiver(&ctrl);
        view.setViewHost(nullptr);
    }
    void draw() {
        list.displayIfNeeded([&](RWCell&, const CGRect&, int64_t, int64_t) { ++cellsDrawn; });
    }
};

ListEditor& editor() {
    static ListEditor e;
    return e;
}

void BM_ChannelListBuild(benchmark::State& state) {
    ListEditor& e = editor();
    for (auto _ : state) {
        e.controller.update();
        e.draw();
    }
    state.counters["rows"] = static_cast<double>(e.list.numberOfRows());
}
BENCHMARK(BM_ChannelListBuild)->Unit(benchmark::kMillisecond);

void BM_ChannelListAfterDragStep(benchmark::State& state) {
    ListEditor& e = editor();
    e.controller.update();
    e.draw();
    TQChannel* dragged = nullptr;
    for (const TQCurveEditorItemPtr& item : e.ctrl.selectedCurveSet()->allItems())
        if ((dragged = item->channel())) break;
    e.cellsDrawn = 0;
    for (auto _ : state) {
        dragged->noteWillChange(true);
        e.ctrl.notify(kTQNotifyChannelsChanging);
        e.draw();
    }
    state.counters["rows"] = static_cast<double>(e.list.numberOfRows());
    state.counters["cells/step"] =
        static_cast<double>(e.cellsDrawn) / static_cast<double>(state.iterations());
}
BENCHMARK(BM_ChannelListAfterDragStep)->Unit(benchmark::kMicrosecond);

}  // namespace
