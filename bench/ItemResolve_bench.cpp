// Items resolve their channel through a TQChannelRef against the host's scene root at every
// access; a drag makes thousands of such resolutions. This measures one pass over the items
// of the All set spanning ten objects of the dense scene (300 channel items).
#include <benchmark/benchmark.h>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "src/curvesets/TQAutomaticCurveSets.h"

namespace {

void BM_ResolveItemChannels(benchmark::State& state) {
    TQHostAppDelegate host;
    TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel,
                         {.objects = 10, .channelsPerObject = 30, .keyframesPerChannel = 20});
    const std::vector<TQChannelObjectRootBase*> objects = host.scene().objects();
    host.setSelectedObjects(std::vector<TQChannelBase*>(objects.begin(), objects.end()));
    auto set = std::make_shared<TQCurveSetAll>();
    set->initWithName("All", &host);
    set->refresh(0, false);
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
