// One step of an edit drag as the view runs it on each mouse event: the value announcements,
// moveSelected on the selection, and the resampling of every affected curve for the next
// frame. The scene: 50 channels of 1000 keyframes each (0.1 s apart), 20 keypoints selected
// on each (1000 in all), curves sampled at 2000 points. The selection moves back and forth by
// a third of a frame, so every step moves every keypoint and no two ever meet.
//
// Target: under 8 ms per step.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <memory>
#include <optional>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "src/curvesets/TQCurveSet.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/engine/TQEditBrackets.h"

namespace {

constexpr int kTimescale = 0x40000;
constexpr int kChannels = 50;
constexpr int kKeyframesPerChannel = 1000;
constexpr int kSelectedPerChannel = 20;
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
        auto* object =
            host.scene().adoptObject(std::make_unique<TQChannelObjectRootBase>("Object", 1));
        for (int c = 0; c < kChannels; ++c) {
            char name[16];
            std::snprintf(name, sizeof name, "C%d", c);
            auto* channel = static_cast<TQChannel*>(object->addChild(
                std::make_unique<TQChannel>(name, static_cast<TQChannelId>(100 + c))));
            channel->setInterpolation(kTQInterpolationBezier);
            for (int k = 0; k < kKeyframesPerChannel; ++k)
                channel->setKeyframe(seconds(k * kKeySpacing), (k % 7) * 0.25 + c);
            auto item = std::dynamic_pointer_cast<TQCurveEditorChannelItem>(
                ctrl.appendChannel(channel, set));
            item->setScaleY(1.0);
            item->setOffsetY(0.0);
            items.push_back(item);
            // Every 50th keyframe, staggered per channel.
            for (int s = 0; s < kSelectedPerChannel; ++s) {
                const int k = s * (kKeyframesPerChannel / kSelectedPerChannel) + c % 10;
                auto entry = std::make_shared<TQCurveSelection>();
                entry->setCurveId(item->channelId());
                entry->setFlags(TQSelectionKeypoint);
                entry->setHandle(channel->getKeyframe(seconds(k * kKeySpacing)));
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
