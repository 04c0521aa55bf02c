// One step of an edit drag as the view runs it on each mouse event: the value announcements,
// moveSelected on the selection, and the resampling of every affected curve for the next
// frame. The scene: the dense scene's plain channels, 50 of 1000 keyframes each (0.1 s
// apart), 20 keypoints selected on each (1000 in all), curves sampled at 2000 points. The
// selection moves back and forth by a third of a frame, so every step moves every keypoint
// and no two ever meet.
//
// Target: under 8 ms per step.
#include <benchmark/benchmark.h>

#include <memory>
#include <optional>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"

namespace {

constexpr int kTimescale = 0x40000;
constexpr size_t kChannels = 50;
constexpr size_t kKeyframesPerChannel = 1000;
constexpr size_t kSelectedPerChannel = 20;
constexpr unsigned kSamples = 2000;
constexpr double kKeySpacing = 0.1;

CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

struct DragScene {
    TQHostAppDelegate host;
    TQCurveEditorCtrlBase ctrl;
    TQCurveSetMutablePtr set = std::make_shared<TQCurveSetMutable>();
    TQCurveSelectionList selection;
    std::vector<TQCurveEditorItemPtr> items;
    CMTime anchorTime = kCMTimeZero;

    DragScene() {
        ctrl.init();
        ctrl.setAppDelegate(&host);
        set->initWithName("Drag", &host);
        ctrl.setSelectedCurveSet(set);
        TQHostPopulateDenseScene(host.scene(), {.objects = 1,
                                                .channelsPerObject = kChannels,
                                                .keyframesPerChannel = kKeyframesPerChannel,
                                                .seconds = kKeyframesPerChannel * kKeySpacing,
                                                .channels = TQHostDenseChannels::Plain,
                                                .bandSpacing = 1.0,
                                                .amplitude = 0.75});
        TQChannelObjectRootBase* object = host.scene().objects().front();
        for (size_t c = 0; c < kChannels; ++c) {
            auto* channel = static_cast<TQChannel*>(object->getChild(c));
            auto item = std::dynamic_pointer_cast<TQCurveEditorChannelItem>(
                ctrl.appendChannel(channel, set));
            item->setScaleY(1.0);
            item->setOffsetY(0.0);
            items.push_back(item);
            // Every 50th keyframe, staggered per channel.
            const std::vector<TQKeyframeHandle> keys = channel->getKeyframes(false);
            for (size_t s = 0; s < kSelectedPerChannel; ++s) {
                const size_t k = s * (kKeyframesPerChannel / kSelectedPerChannel) + c % 10;
                auto entry = std::make_shared<TQCurveSelection>();
                entry->setCurveId(item->channelId());
                entry->setFlags(TQSelectionKeypoint);
                entry->setHandle(keys[k]);
                CMTime t = kCMTimeInvalid;
                double v = 0.0;
                channel->getKeyframe(entry->getHandle(), &t, &v);
                entry->setKeypointUV(t, v);
                selection.addSelection(entry);
            }
        }
        selection.getSelectionArray()[0]->getKeypointUV(&anchorTime, nullptr);
        resample();
    }

    void resample() {
        const CMTime start = kCMTimeZero;
        const CMTime step = seconds(kKeyframesPerChannel * kKeySpacing / kSamples);
        for (const TQCurveEditorItemPtr& item : items) {
            auto* channelItem = static_cast<TQCurveEditorChannelItem*>(item.get());
            if (!channelItem->originalCurveDirty()) continue;
            const CMTime* u = nullptr;
            const double* v = nullptr;
            unsigned number = kSamples;
            ctrl.getSamples(item.get(), kTQSamplesOriginalCurve, start, step, &u, &v, &number);
            benchmark::DoNotOptimize(v);
        }
    }
};

void dragSteps(benchmark::State& state, bool withBrackets, bool withResampling) {
    DragScene scene;
    TQCurveSelectionList* list = &scene.selection;
    std::optional<TQChangeBracket> gesture;
    if (withBrackets) gesture.emplace(scene.ctrl, list, "Undo Move Keypoint");
    const CMTime there = BN_CMTimeSaferAdd(scene.anchorTime, CMTimeMake(1, 90));
    bool forward = true;
    for (auto _ : state) {
        {
            std::optional<TQModifyValueGuard> values;
            if (withBrackets) values.emplace(scene.ctrl, list);
            scene.ctrl.moveSelected(list, forward ? there : scene.anchorTime, 0.0, 1, 0);
        }
        if (withResampling) scene.resample();
        forward = !forward;
    }
    gesture.reset();
    state.counters["keypoints"] = static_cast<double>(list->size());
}

// The whole step, the host's value announcements included.
void BM_DragStep(benchmark::State& state) { dragSteps(state, true, true); }
BENCHMARK(BM_DragStep)->Unit(benchmark::kMillisecond);

// Without the host's announcements: moves and resampling.
void BM_DragStepEngineOnly(benchmark::State& state) { dragSteps(state, false, true); }
BENCHMARK(BM_DragStepEngineOnly)->Unit(benchmark::kMillisecond);

// The moves alone, for the split between moving and resampling.
void BM_DragStepMovesOnly(benchmark::State& state) { dragSteps(state, false, false); }
BENCHMARK(BM_DragStepMovesOnly)->Unit(benchmark::kMillisecond);

}  // namespace
