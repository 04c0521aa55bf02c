#pragma once
// Shared set-up of the engine and view tests: a scene with one bare object, a recording
// delegate that answers for the host, a controller, a view on a stub view host (800 x 400
// points at scale 1, showing 0..10 s by -1..1), and a mutable curve set that the controller
// has selected. Helpers build channels with keyframes, their items, and selection entries.
// Tests whose point is a real undo put the reference host behind the recorder
// (WithReferenceHost); the scene is then the host's.
//
// The controller is made in SetUp by makeController(), so a test fixture can derive and hand
// in a subclass (FrameGridController puts times on a 1/30 s grid, as the full editor does).
// Times are built in the channels' timescale, 0x40000 per second.

#include <gtest/gtest.h>

#include <cstdio>
#include <initializer_list>
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "platform/channels/TQChannelObjectRootBase.h"
#include "platform/channels/testing/CurveCatalogue.h"
#include "platform/ui/testing/RWTestDoubles.h"
#include "src/engine/TQCurveEditorCtrlBase.h"
#include "src/view/TQCurveEditorViewBase.h"
#include "tests/support/TQRecordingAppDelegate.h"

namespace engine_test {

inline constexpr int kTimescale = 0x40000;
// Tolerance for values that went through a few multiplications and divisions.
inline constexpr double kValueTolerance = 1e-9;

inline CMTime seconds(double s) { return TQTarnTimeForChannelSeconds(s, kTimescale); }

// Rounds to the nearest frame of 1/30 s, the way the full editor's time grid does.
class FrameGridController : public TQCurveEditorCtrlBase {
public:
    CMTime convertToCurveEditorAxis(CMTime time) const override {
        return BN_CMTimeFloorToSampleDuration(BN_CMTimeSaferAdd(time, CMTimeMake(1, 60)),
                                              CMTimeMake(1, 30));
    }
    bool shouldConstrainToFrames() const override { return true; }
};

// The channel named `name` anywhere under `root` (a snapshot, say).
inline TQChannel& named(TQChannelBase& root, const std::string& name) {
    std::vector<TQChannelBase*> all;
    static_cast<TQChannelFolder&>(root).getAllDescendantsFlattened(all, 0, true);
    for (TQChannelBase* c : all)
        if (c->getName() == name) return static_cast<TQChannel&>(*c);
    throw std::invalid_argument("no channel " + name);
}

// Every channel under `root`: name (initial value), then each keyframe as time=value
// [interpolation, Locked, Disabled, Broken, handles], for failure messages.
inline std::string describe(const TQChannelBase& root) {
    std::vector<TQChannelBase*> all;
    static_cast<const TQChannelFolder&>(root).getAllDescendantsFlattened(all, 0, true);
    std::string out;
    for (const TQChannelBase* node : all) {
        const auto* c = dynamic_cast<const TQChannel*>(node);
        if (!c) continue;
        out += "\n  " + c->getName() + " (" + std::to_string(c->getInitialValue()) + "):";
        for (TQKeyframeHandle h : c->getKeyframes(false)) {
            CMTime t = kCMTimeInvalid;
            double v = 0.0;
            c->getKeyframe(h, &t, &v);
            double iu = 0, iv = 0, ou = 0, ov = 0;
            c->getKeyframeInputTangents(h, &iu, &iv);
            c->getKeyframeOutputTangents(h, &ou, &ov);
            char text[200];
            std::snprintf(text, sizeof text, " %lld/%d%s=%g[%u%s%s%s (%g,%g) (%g,%g)]",
                          static_cast<long long>(t.value), t.timescale,
                          t.flags == kCMTimeFlags_Valid ? "" : "~", v,
                          c->getKeyframeInterpolation(h), c->getKeyframeLocked(h) ? "L" : "",
                          c->getKeyframeEnabled(h) ? "" : "D",
                          c->getKeyframeTangentsBroken(h) ? "B" : "", iu, iv, ou, ov);
            out += text;
        }
    }
    return out;
}

class EngineFixture : public ::testing::Test {
protected:
    void SetUp() override {
        auto root = std::make_unique<TQChannelObjectRootBase>("Object", 1);
        if (TQHostAppDelegate* host = referenceHost()) {
            recorder.forwardTo(host);
            object = host->scene().adoptObject(std::move(root));
        } else {
            scene = std::make_unique<TQChannelFolder>("Scene", 0);
            object = static_cast<TQChannelObjectRootBase*>(scene->addChild(std::move(root)));
            recorder.answers.sceneChannelRoot = scene.get();
        }
        controllerPtr = makeController();
        controllerPtr->init();
        controllerPtr->setAppDelegate(&recorder);
        view.setViewHost(&viewHost);
        view.setClock(&clock);
        view.setTimer(&timer);
        view.setController(controllerPtr.get());
        controllerPtr->setView(&view);
        view.setCurrentViewVolume(CGRectMake(0.0, -1.0, 10.0, 2.0));
        view.setOriginalViewVolume(CGRectMake(0.0, -1.0, 10.0, 2.0));
        view.drawProjection();
        set = std::make_shared<TQCurveSetMutable>();
        set->initWithName("Test", &recorder);
        controllerPtr->setSelectedCurveSet(set);
        recorder.clearCalls();
    }

    void TearDown() override {
        view.setController(nullptr);
        view.setViewHost(nullptr);
        controllerPtr->setView(nullptr);
    }

    virtual std::unique_ptr<TQCurveEditorCtrlBase> makeController() {
        return std::make_unique<TQCurveEditorCtrlBase>();
    }
    // The reference host behind the recorder; none here.
    virtual TQHostAppDelegate* referenceHost() { return nullptr; }

    TQCurveEditorCtrlBase& ctrl() { return *controllerPtr; }

    // A plain channel under `parent` (the object when null) with keyframes (seconds, value).
    TQChannel* addChannel(const char* name, std::initializer_list<std::pair<double, double>> keys,
                          TQChannelFolder* parent = nullptr) {
        TQChannelFolder* into = parent ? parent : object;
        auto* c = static_cast<TQChannel*>(
            into->addChild(std::make_unique<TQChannel>(name, nextChannelId++)));
        for (const auto& [t, v] : keys) c->setKeyframe(seconds(t), v);
        return c;
    }

    // A plain channel under the object holding the catalogue's curve `curve`.
    TQChannel* addCurve(const char* name, const char* curve) {
        auto* c = static_cast<TQChannel*>(
            object->addChild(std::make_unique<TQChannel>(name, nextChannelId++)));
        curve_catalogue::fill(*c, curve);
        return c;
    }

    // A compound of `components` plain channels under the object, each with the same keys.
    TQCompoundChannel* addCompound(const char* name, int components, bool linked,
                                   std::initializer_list<std::pair<double, double>> keys) {
        auto* compound = static_cast<TQCompoundChannel*>(
            object->addChild(std::make_unique<TQCompoundChannel>(name, nextChannelId++)));
        compound->setLinked(linked);
        static const char* const names[] = {"X", "Y", "Z", "W"};
        for (int i = 0; i < components && i < 4; ++i) addChannel(names[i], keys, compound);
        return compound;
    }

    // The channel's item, appended to the set through the controller.
    TQCurveEditorChannelItemPtr addItem(TQChannel* channel) {
        auto item =
            std::dynamic_pointer_cast<TQCurveEditorChannelItem>(ctrl().appendChannel(channel, set));
        recorder.clearCalls();
        return item;
    }

    // A keypoint entry for the keyframe at `t` seconds (channel time), its time and value
    // stored as a pick would store them.
    static TQCurveSelectionPtr keypointEntry(const TQCurveEditorChannelItemPtr& item, double t) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item->channelId());
        TQChannel* c = item->channel();
        const TQKeyframeHandle h = c ? c->getKeyframe(seconds(t)) : nullptr;
        entry->setHandle(h);
        entry->setFlags(TQSelectionKeypoint);
        CMTime time = kCMTimeInvalid;
        double value = 0.0;
        if (c && c->getKeyframe(h, &time, &value)) entry->setKeypointUV(time, value);
        return entry;
    }

    static TQCurveSelectionPtr tangentEntry(const TQCurveEditorChannelItemPtr& item, double t,
                                            bool output) {
        auto entry = keypointEntry(item, t);
        entry->setFlags(output ? TQSelectionOutTangent : TQSelectionInTangent);
        return entry;
    }

    static TQCurveSelectionPtr curveEntry(const TQCurveEditorChannelItemPtr& item) {
        auto entry = std::make_shared<TQCurveSelection>();
        entry->setCurveId(item->channelId());
        entry->setFlags(TQSelectionCurve);
        return entry;
    }

    // Keyframe times of the channel in seconds, in order.
    static std::vector<double> keyTimes(const TQChannel* channel) {
        std::vector<double> out;
        for (TQKeyframeHandle h : channel->getKeyframes(false)) {
            CMTime t = kCMTimeInvalid;
            channel->getKeyframe(h, &t, nullptr);
            out.push_back(CMTimeGetSeconds(t));
        }
        return out;
    }

    static double keyValueAt(const TQChannel* channel, double t) {
        double v = 0.0;
        channel->getKeyframe(channel->getKeyframe(seconds(t)), nullptr, &v);
        return v;
    }

    // What the host sees of a one-shot edit bracket under `description` over the channels
    // named, in order of first appearance, closed by its post.
    static std::vector<std::string> oneShotBracket(const std::string& description,
                                                   const std::vector<std::string>& channels) {
        std::vector<std::string> out{"startCaptureModifiedChannels(" + description + ")"};
        for (const auto& c : channels) out.push_back("willChangeChannel(" + c + ")");
        for (const auto& c : channels) out.push_back("willSetChannelValue(" + c + ")");
        for (auto c = channels.rbegin(); c != channels.rend(); ++c)
            out.push_back("didSetChannelValue(" + *c + ")");
        for (auto c = channels.rbegin(); c != channels.rend(); ++c)
            out.push_back("didChangeChannel(" + *c + ")");
        out.insert(out.end(), {"endCaptureModifiedChannels()", "postNotification(0x8)"});
        return out;
    }

    // The object's whole tree as it stands now, to compare with operator== later.
    std::unique_ptr<TQChannelBase> snapshot() const {
        return std::unique_ptr<TQChannelBase>(object->cloneChannel());
    }

    // The object's tree equals `want` in its whole animation state.
    ::testing::AssertionResult sceneIs(const TQChannelBase& want) const {
        if (*object == want) return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure()
               << "scene differs:" << describe(*object) << "\nwanted:" << describe(want);
    }

    // The view's own selection, filled with the entries.
    TQCurveSelectionList* selectInView(std::initializer_list<TQCurveSelectionPtr> entries) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (const auto& e : entries) list->addSelection(e);
        return list;
    }

    std::unique_ptr<TQChannelFolder> scene;  // without a reference host
    TQRecordingAppDelegate recorder;
    RWManualClock clock;
    RWManualTimer timer{clock};
    RWStubViewHost viewHost{800.0, 400.0, 1.0};
    TQCurveEditorViewBase view;
    std::unique_ptr<TQCurveEditorCtrlBase> controllerPtr;
    TQCurveSetMutablePtr set;
    TQChannelObjectRootBase* object = nullptr;
    TQChannelId nextChannelId = 5000;
};

// A fixture of these tests with the reference host, and its undo, behind the recorder. The
// host goes before the fixture's controller and view: TearDown detaches them first.
template <class Fixture>
class WithReferenceHost : public Fixture {
protected:
    TQHostAppDelegate* referenceHost() override { return &host; }
    TQHostAppDelegate host;
};

}  // namespace engine_test
