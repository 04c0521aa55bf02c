// Refreshing an automatic curve set, as the editor does when the host's object selection
// changes, on the stress scene (100 objects of 30 channels, 1,000,000 keyframes): the folders
// of the selected objects are built, filtered by the set's rule and, for Animated and
// Modified, validated against the items they replace. Arguments: the set (0 All, 1 Animated,
// 2 Modified, 3 Position), then how many objects are selected.
//
// Target: a selection change that refreshes the selected set within 5 ms (the set's own work
// is measured here; the editor's update around it is not).
#include <benchmark/benchmark.h>

#include <memory>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "src/curvesets/TQAutomaticCurveSets.h"

namespace {

// Built once: the scene takes a while, and no benchmark changes it.
TQHostAppDelegate& stressHost() {
    static TQHostAppDelegate host;
    static const bool loaded = [] {
        TQHostLoadDenseScene(host, TQHostObjectFamily::Kestrel, TQHostStressSceneLayout());
        return true;
    }();
    (void)loaded;
    return host;
}

TQCurveSetPtr makeSet(int64_t kind, TQHostAppDelegate& host) {
    TQCurveSetPtr set;
    switch (kind) {
        case 0: set = std::make_shared<TQCurveSetAll>(); break;
        case 1: set = std::make_shared<TQCurveSetAnimated>(); break;
        case 2: set = std::make_shared<TQCurveSetModified>(); break;
        default: set = std::make_shared<TQCurveSetPosition>(); break;
    }
    set->initWithName("Set", &host);
    return set;
}

void BM_RefreshAutomaticSet(benchmark::State& state) {
    TQHostAppDelegate& host = stressHost();
    const std::vector<TQChannelObjectRootBase*> objects = host.scene().objects();
    const auto selected = static_cast<size_t>(state.range(1));
    host.setSelectedObjects(
        std::vector<TQChannelBase*>(objects.begin(), objects.begin() + long(selected)));
    const TQCurveSetPtr set = makeSet(state.range(0), host);
    constexpr uint32_t kSamples = 2000;  // a view 2000 points wide
    set->refresh(kSamples, false);
    for (auto _ : state) set->refresh(kSamples, false);
    state.counters["items"] = static_cast<double>(set->numberOfChannelItems());
}
BENCHMARK(BM_RefreshAutomaticSet)
    ->ArgsProduct({{0, 1, 2, 3}, {1, 10, 100}})
    ->Unit(benchmark::kMillisecond);

}  // namespace
