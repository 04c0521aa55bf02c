// Items resolve their channel through a TQChannelRef against the host's scene root at every
// access; a drag makes thousands of such resolutions. This measures one pass over the items
// of a relative set spanning several objects (about 300 channel items).
#include <benchmark/benchmark.h>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostSampleScene.h"
#include "src/curvesets/TQCurveSet.h"

namespace {

void BM_ResolveItemChannels(benchmark::State& state) {
    TQHostAppDelegate host;
    TQHostSampleSceneSpec spec;
    spec.objects = 14;
    TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel, spec);
    const std::vector<TQChannelObjectRootBase*> objects = host.scene().objects();
    host.scene().setSelection(std::vector<TQChannelBase*>(objects.begin(), objects.end()));
    auto set = std::make_shared<TQCurveSet>();
    set->initWithName("All", &host);
    set->refresh(0, false);  // absolute: keeps nothing; build roots by hand below
    for (TQChannelBase* object : host.selectedObjectsRootChannels()) {
        auto root = std::make_shared<TQCurveEditorFolderItem>();
        root->initWithChannel(object, 0, &host, 1);
        set->addRootItem(root);
    }
    const std::vector<TQCurveEditorItemPtr> items = set->allItems();
    for (auto _ : state) {
        size_t live = 0;
        for (const TQCurveEditorItemPtr& item : items) live += item->channel() != nullptr;
        benchmark::DoNotOptimize(live);
    }
    state.counters["items"] = static_cast<double>(items.size());
    state.SetItemsProcessed(state.iterations() * static_cast<int64_t>(items.size()));
}
BENCHMARK(BM_ResolveItemChannels)->Unit(benchmark::kMicrosecond);

}  // namespace
