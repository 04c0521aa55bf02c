#pragma once
// Shared set-up of the engine and view tests: a scene with one bare object, a recording
// delegate that answers for the host, a controller, a view on a stub view host (800 x 400
// points at scale 1, showing 0..10 s by -1..1), and a mutable curve set that the controller
// has selected. Tests whose point is a real undo put the reference host behind the recorder
// (WithReferenceHost); the scene is then the host's.
//
// Scenes and selections are written as text (build, select): channels in sceneText's form,
// entries as selectionText prints them. The controller is made in SetUp by makeController(),
// so a test can hand in a subclass (FrameGridController puts times on a 1/30 s grid, as the
// full editor does). Times are built in the channels' timescale, 0x40000 per second.

#include <gtest/gtest.h>

#include <initializer_list>
#include <map>
#include <memory>
#include <sstream>
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
#include "tests/support/SceneText.h"
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

// A channel that logs every moveKeyframe as "name@source time", so that a test sees the order
// of the moves.
class MoveLoggingChannel : public TQChannel {
public:
    MoveLoggingChannel(const std::string& name, TQChannelId id, std::string* log)
        : TQChannel(name, id), _log(log) {}
    void moveKeyframe(const CMTime* from, const CMTime* to, bool keepBoth) override {
        std::ostringstream out;
        out << (_log->empty() ? "" : " ") << getName() << "@" << CMTimeGetSeconds(*from);
        *_log += out.str();
        TQChannel::moveKeyframe(from, to, keepBoth);
    }
    // Of the same class, so that an undo can assign a snapshot back.
    TQChannelBase* cloneChannel() const override {
        auto* clone = new MoveLoggingChannel(getName(), getChannelId(), _log);
        clone->copyIdentityFrom(*this);
        copyConfigurationTo(*clone);
        clone->assignState(*this);
        return clone;
    }

private:
    std::string* _log;
};

// The channel named `name` anywhere under `root` (a snapshot, say).
inline TQChannel& named(TQChannelBase& root, const std::string& name) {
    std::vector<TQChannelBase*> all;
    static_cast<TQChannelFolder&>(root).getAllDescendantsFlattened(all, 0, true);
    for (TQChannelBase* c : all)
        if (c->getName() == name) return static_cast<TQChannel&>(*c);
    throw std::invalid_argument("no channel " + name);
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
        auto* c = static_cast<TQChannel*>(
            (parent ? parent : object)
                ->addChild(std::make_unique<TQChannel>(name, nextChannelId++)));
        for (const auto& [t, v] : keys) c->setKeyframe(seconds(t), v);
        return c;
    }

    // A plain channel under the object holding the catalogue's curve `curve`.
    TQChannel* addCurve(const char* name, const char* curve) {
        TQChannel* c = addChannel(name, {});
        curve_catalogue::fill(*c, curve);
        return c;
    }

    // A compound of `components` plain channels under the object, each with the same keys.
    TQCompoundChannel* addCompound(const char* name, int components, bool linked,
                                   std::initializer_list<std::pair<double, double>> keys) {
        auto* compound = static_cast<TQCompoundChannel*>(
            object->addChild(std::make_unique<TQCompoundChannel>(name, nextChannelId++)));
        compound->setLinked(linked);
        static const char* const names[] = {"X", "Y", "Z"};
        for (int i = 0; i < components && i < 3; ++i) addChannel(names[i], keys, compound);
        return compound;
    }

    // The channel's item, appended to the set through the controller.
    TQCurveEditorChannelItemPtr addItem(TQChannel* channel) {
        auto item =
            std::dynamic_pointer_cast<TQCurveEditorChannelItem>(ctrl().appendChannel(channel, set));
        recorder.clearCalls();
        return item;
    }

    // Channels that log their moves into `moves`, and their items, from text in sceneText's
    // form: "A*2: 1=0/1! 2=1L(-0.5,0|0.5,0)b; Pos.X: 31/30=0" is A with its item at scale 2,
    // a linear disabled keyframe and a locked one with broken handles, and X in the linked
    // compound Pos with a keyframe at 31/30 s.
    void build(const std::string& text) {
        std::map<std::string, TQCompoundChannel*> compounds;
        std::istringstream in(text);
        for (std::string part; std::getline(in, part, ';');) {
            std::istringstream words(part);
            std::string name;
            words >> name;
            name.pop_back();
            TQChannelFolder* parent = object;
            if (const size_t dot = name.find('.'); dot < name.find('*')) {
                auto*& compound = compounds[name.substr(0, dot)];
                if (!compound) compound = addCompound(name.substr(0, dot).c_str(), 0, true, {});
                parent = compound;
                name = name.substr(dot + 1);
            }
            const size_t star = name.find('*');
            auto* c = static_cast<TQChannel*>(parent->addChild(std::make_unique<MoveLoggingChannel>(
                name.substr(0, star), nextChannelId++, &moves)));
            std::string keys;
            std::getline(words, keys);
            addKeys(*c, keys, kTimescale);
            items.push_back(addItem(c));
            items.back()->setScaleY(star == name.npos ? 1.0 : std::stod(name.substr(star + 1)));
            items.back()->setOffsetY(0.0);
        }
    }

    // The item of the channel named `name`, built by build().
    TQCurveEditorChannelItemPtr item(const std::string& name) const {
        for (const auto& i : items)
            if (i->channel() && i->channel()->getName() == name) return i;
        throw std::invalid_argument("no item " + name);
    }

    // The view's selection from text, as selectionText prints it.
    TQCurveSelectionList* select(const std::string& entries) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        std::istringstream in(entries);
        for (std::string e; in >> e;) list->addSelection(entry(e));
        return list;
    }
    TQCurveSelectionPtr entry(const std::string& e) const {
        const size_t at = e.find_first_of("@<>~");
        const auto i = item(e.substr(0, at));
        if (e[at] == '~') return curveEntry(i);
        const double t = std::stod(e.substr(at + 1));
        return e[at] == '@' ? keypointEntry(i, t) : tangentEntry(i, t, e[at] == '>');
    }

    // The view's own selection as text, the primary entry first: "A@1" a keypoint of A at
    // 1 s, "A>1" and "A<1" its output and input handles, "A~" the curve.
    std::string selectionText() {
        std::ostringstream out;
        for (const auto& e : view.getSelection()->getSelectionArray()) {
            const auto i = controllerPtr->channelItemWithIdentifier(e->getCurveId());
            const TQChannel* c = i ? i->channel() : nullptr;
            CMTime t = kCMTimeInvalid;
            const bool live = c && c->getKeyframe(e->getHandle(), &t, nullptr);
            out << (out.tellp() > 0 ? " " : "") << (c ? c->getName() : "?")
                << (e->isCurve()                             ? "~"
                    : e->getFlags() == TQSelectionOutTangent ? ">"
                    : e->getFlags() == TQSelectionInTangent  ? "<"
                                                             : "@");
            if (!e->isCurve()) live ? out << CMTimeGetSeconds(t) : out << "stale";
        }
        return out.str();
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
    // The view's own selection, filled with the entries.
    TQCurveSelectionList* selectInView(std::initializer_list<TQCurveSelectionPtr> entries) {
        TQCurveSelectionList* list = view.getSelection();
        list->reset();
        for (const auto& e : entries) list->addSelection(e);
        return list;
    }

    // The object's whole tree as it stands now, to compare with operator== later.
    std::unique_ptr<TQChannelBase> snapshot() const {
        return std::unique_ptr<TQChannelBase>(object->cloneChannel());
    }
    // The object's tree equals `want` in its whole animation state.
    ::testing::AssertionResult sceneIs(const TQChannelBase& want) const {
        if (*object == want) return ::testing::AssertionSuccess();
        return ::testing::AssertionFailure() << "scene differs:\n  " << sceneText(*object, true)
                                             << "\nwanted:\n  " << sceneText(want, true);
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
    std::vector<TQCurveEditorChannelItemPtr> items;  // made by build
    std::string moves;                               // logged by build's channels
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
