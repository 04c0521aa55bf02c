// The reference host: the scene's object model in both families, selection and change
// tracking; the sample piece moves as an animator keyed it, and the dense scene has the size it
// was asked for and is the same scene for the same seed; the owner-ticked playback clock; the
// delivery of words to receivers, re-entrant posts and registration changes during delivery.
// Undo and redo through the delegate operations, as the framework drives them; the records
// number every distinct whole scene, so a step that restores one channel and breaks another
// shows.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <numbers>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostDenseScene.h"
#include "host/TQHostNotificationCenter.h"
#include "host/TQHostPlaybackClock.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannel.h"
#include "platform/channels/TQChannelTypes.h"
#include "tests/support/StepScript.h"
#include "tests/support/TextBaseline.h"

namespace {

class SceneFamilies : public ::testing::TestWithParam<TQHostObjectFamily> {};

// A channel class whose allocator hands the last freed address to the next channel, as a
// real allocator may at any time.
class ReusedAddressChannel : public TQChannel {
public:
    using TQChannel::TQChannel;
    static void* operator new(std::size_t size) {
        if (slotTaken || size > sizeof(slot)) return ::operator new(size);
        slotTaken = true;
        return slot;
    }
    static void operator delete(void* p) {
        if (p == slot)
            slotTaken = false;
        else
            ::operator delete(p);
    }
    static bool inSlot(const void* p) { return p == slot; }
    // Of this class, so that undo can assign the snapshot back.
    TQChannelBase* cloneChannel() const override {
        auto* clone = new ReusedAddressChannel(getName(), getChannelId());
        clone->copyIdentityFrom(*this);
        copyConfigurationTo(*clone);
        clone->assignState(*this);
        return clone;
    }

private:
    alignas(TQChannel) static inline unsigned char slot[sizeof(TQChannel)];
    static inline bool slotTaken = false;
};

TEST_P(SceneFamilies, typedChannels__giveEveryDowncastSomethingToFind) {
    TQHostScene scene(GetParam());
    TQChannelBase* object = scene.addObject("A");
    const TQHostTypedChannelPaths& paths = TQHostTypedPaths(GetParam());
    auto at = [&](const BNString& path) { return TQChannelRef(path).getChannel(object); };

    EXPECT_TRUE(dynamic_cast<TQChannelBool*>(at(paths.visible)) &&
                dynamic_cast<TQChannelDecibel*>(at(paths.volume)) &&
                dynamic_cast<TQChannel2D*>(at(paths.offset)) &&
                dynamic_cast<TQChannel2DOverRange*>(at(paths.gradient)) &&
                dynamic_cast<TQChannelScaleOverRange*>(at(paths.taper)) &&
                dynamic_cast<TQChannelCurve*>(at(paths.softness)) &&
                dynamic_cast<TQChannelBlindData*>(at(paths.fontIndex)));
    auto* orientation = dynamic_cast<TQChannelRotation3D*>(at(paths.orientation));
    ASSERT_NE(orientation, nullptr);
    EXPECT_TRUE(orientation->isQuaternionMode());
    EXPECT_NE(dynamic_cast<TQChannelAngle*>(orientation->getAngleChannel(kTQComponentZ)), nullptr);
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SceneFamilies,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

// The words the host posts, in order.
struct Words : TQNotificationReceiver {
    std::vector<TQNotificationWord> seen;
    void notify(TQNotificationWord word) override { seen.push_back(word); }
};

constexpr TQHostObjectFamily kFamily = TQHostObjectFamily::Kestrel;

// Logs every word with its own tag, and runs a script of steps (joined by ",") on the first
// word it hears.
struct Receiver : TQNotificationReceiver {
    Receiver(std::string& log, char tag, std::function<void(std::string)>& run)
        : log(log), tag(tag), run(run) {}
    void notify(TQNotificationWord word) override {
        log += (std::ostringstream() << " " << tag << std::hex << word).str();
        if (!onFirst.empty()) run(std::exchange(onFirst, std::string()));
    }
    std::string& log;
    char tag;
    std::function<void(std::string)>& run;
    std::string onFirst;
};

struct HostRow {
    const char* name;
    const char* script;
};

// A script of the calls the framework and a user make ("begin Move; will x; key x 1 2; end;
// undo") on the sample piece, and after each step what an Edit menu and the host's listeners
// see; a line shows only what changed. Steps joined by "&" are one line, so that no read of
// the history between them settles a step waiting for its "after" state. Short names for the
// nodes: the objects o0..o3, the first object's position x y z, their compound p and its
// opacity op, the second's x1.
class HostScript : public ::testing::TestWithParam<HostRow> {
protected:
    void SetUp() override {
        TQHostLoadSampleScene(host, kFamily);
        host.addNotificationReceiver(&words);
        host.registerUndoClient(&owner, &client);
        const auto objects = host.scene().objects();
        const auto& positions = TQHostPropertyPaths(kFamily, TQHostProperty::Position);
        for (size_t i = 0; i < objects.size(); ++i) named["o" + std::to_string(i)] = objects[i];
        named["x"] = TQChannelRef(positions[0]).getChannel(objects[0]);
        named["y"] = TQChannelRef(positions[1]).getChannel(objects[0]);
        named["z"] = TQChannelRef(positions[2]).getChannel(objects[0]);
        named["p"] = named["x"]->getParent();
        named["op"] = TQChannelRef(TQHostPropertyPaths(kFamily, TQHostProperty::Opacity)[0])
                          .getChannel(objects[0]);
        named["x1"] = TQChannelRef(positions[0]).getChannel(objects[1]);
        named["null"] = nullptr;
    }
    void TearDown() override {
        host.unregisterUndoClient(&owner);
        for (Receiver* r : {&a, &b, &c}) host.notificationCenter().removeReceiver(r);
        host.removeNotificationReceiver(&words);
    }
    struct Client : TQHostUndoClient {
        int value = 0;
        std::any captureUndoState(uint32_t, uint32_t) override { return value; }
        void restoreUndoState(uint32_t, uint32_t, const std::any& state) override {
            value = std::any_cast<int>(state);
        }
    };

    // "3" seconds, "1/24" exactly, "invalid", "indefinite".
    CMTime when(size_t i) const {
        const std::string w = args.word(i);
        if (w == "invalid" || w == "indefinite")
            return w == "invalid" ? kCMTimeInvalid : kCMTimeIndefinite;
        const size_t slash = w.find('/');
        return CMTimeMake(std::stoll(w),
                          slash == std::string::npos ? 1 : std::stoi(w.substr(slash + 1)));
    }
    Receiver* receiver(const std::string& tag) {
        return tag == "a" ? &a : tag == "b" ? &b : tag == "c" ? &c : nullptr;
    }
    TQChannel* channel(size_t i) { return static_cast<TQChannel*>(named.at(args.word(i))); }
    std::string nameOf(const TQChannelBase* node) const {
        for (const auto& [name, known] : named)
            if (known == node) return name;
        return node->getName();
    }
    // The step's text after its first n words.
    std::string after(size_t n) const {
        std::string out = args.rest;
        for (; n > 0; --n) out.erase(0, out.find(' ') + 1);
        return out;
    }
    static std::string seconds(const CMTime& t) {
        std::ostringstream out;
        out.precision(12);
        out << CMTimeGetSeconds(t);
        return out.str();
    }

    // Every field a step may change, as name and value.
    std::vector<std::pair<std::string, std::string>> state() {
        // The titles first: reading the history settles a step waiting for its after state,
        // and the Edit menu's title is what a host reads first.
        const std::string undoTitle = host.undoDescription(), redoTitle = host.redoDescription();
        TQHostUndoStack& history = host.undoStack();
        const TQHostNotificationCenter& words = host.notificationCenter();
        std::string receivers = std::to_string(words.receiverCount());
        for (const char* tag : {"a", "b", "c"})
            if (words.hasReceiver(receiver(tag))) receivers += std::string(" ") + tag;
        if (words.isDelivering()) receivers += ", delivering";
        std::string was, selected = " -", asked, times = seconds(host.currentTime()), modified;
        // The modified channels as the host answers them: where each reference leads now.
        for (const TQChannelRef& ref : host.modifiedChannels())
            modified += " " + nameOf(ref.getChannel(host.sceneChannelRoot()));
        for (const auto& [name, node] : named) {
            if (host.wasChannelModified(node)) was += " " + name;
            if (host.isObjectSelected(node)) asked += " " + name;
        }
        if (!host.selectedObjectsRootChannels().empty()) selected.clear();
        for (TQChannelBase* object : host.selectedObjectsRootChannels())
            selected += " " + nameOf(object);
        if (host.isPlaying()) times += " playing";
        for (TQChannelObjectRootBase* object : host.scene().objects())
            if (CMTimeCompare(object->getRootCurrentTime(false), host.currentTime()) != 0)
                times +=
                    ", " + nameOf(object) + " at " + seconds(object->getRootCurrentTime(false));
        size_t scene = 0;
        while (scene < scenes.size() && !(*scenes[scene] == *host.sceneChannelRoot())) ++scene;
        if (scene == scenes.size()) scenes.emplace_back(host.sceneChannelRoot()->cloneChannel());
        return {
            {"open", std::to_string(history.depth())},
            {"can", std::string(host.canUndo() ? "u" : "") + (host.canRedo() ? "r" : "-")},
            {"undo", std::to_string(history.undoCount()) + " " + undoTitle},
            {"redo", std::to_string(history.redoCount()) + " " + redoTitle},
            {"at", std::to_string(history.position())},
            {"scene", std::to_string(scene)},
            {"modified", modified.empty() ? "-" : modified},
            {"was", was.empty() ? " -" : was},
            {"sel", selected + " /" + asked + (host.objectsSelectedInScene() ? "" : " none")},
            {"time", times},
            {"range", seconds(host.playRange().start) + "+" + seconds(host.playRange().duration)},
            {"client", std::to_string(client.value)},
            {"receivers", receivers},
            {"delivered", std::to_string(words.deliveredWordCount())}};
    }

    TQHostAppDelegate host;
    Words words;
    std::map<std::string, TQChannelBase*> named;
    tests_support::StepArgs args;
    Client client;
    int owner = 0, stranger = 0;  // any object's address names an undo client's owner
    std::vector<std::unique_ptr<TQChannelBase>> scenes;  // equal scenes share a number
    std::string note;                                    // what a step answered
    std::string heard;
    std::function<void(std::string)> run;
    Receiver a{heard, 'a', run}, b{heard, 'b', run}, c{heard, 'c', run};
};

TEST_P(HostScript, steps) {
    auto refused = [&](bool done) { note = done ? "" : "refused"; };
    const tests_support::Steps steps = {
        {"begin", [&] { host.startCaptureModifiedChannels(args.rest); }},
        {"end", [&] { host.endCaptureModifiedChannels(); }},
        {"will", [&] { host.willChangeChannel(channel(0)); }},
        {"willset", [&] { host.willSetChannelValue(channel(0)); }},
        // Channel changes as the channels announce them, with no call to the host.
        {"note", [&] { named.at(args.word(0))->noteWillChange(true); }},
        {"key",
         [&] {
             channel(0)->noteWillChange(true);
             channel(0)->setKeyframe(when(1), args.number(2));
         }},
        {"add",
         [&] {
             const CMTime at = when(1);
             channel(0)->noteWillChange(true);
             channel(0)->addKeyframe(&at);
         }},
        {"del",
         [&] {
             channel(0)->noteWillChange(true);
             channel(0)->deleteKeyframe(channel(0)->getKeyframes(false).front());
         }},
        // One framework-style edit: a keyframe at 4.5 s with a value, in a bracket of its own.
        {"edit",
         [&] {
             host.startCaptureModifiedChannels(after(2));
             host.willChangeChannel(channel(0));
             host.willSetChannelValue(channel(0));
             channel(0)->noteWillChange(true);
             channel(0)->setKeyframe(CMTimeMake(9, 2), args.number(1));
             host.endCaptureModifiedChannels();
         }},
        {"addstep", [&] { host.addChannelToUndo(channel(0), after(1)); }},
        {"client", [&] { client.value = static_cast<int>(args.number(0)); }},
        {"clientstep", [&] { host.addToUndo(&owner, 1, 0, args.rest); }},
        {"stranger", [&] { host.addToUndo(&stranger, 2, 1, args.rest); }},
        {"unregister", [&] { host.unregisterUndoClient(&owner); }},
        {"undo", [&] { refused(host.undo()); }},
        {"redo", [&] { refused(host.redo()); }},
        {"redotitle", [&] { note = host.redoDescription(); }},
        {"levels", [&] { host.undoStack().setLevelsOfUndo(static_cast<size_t>(args.number(0))); }},
        {"reset", [&] { host.resetModifiedChannels(); }},
        // A node loses its name, and the nodes below it theirs, before it goes.
        {"remove",
         [&] {
             TQChannelBase* node = named.at(args.word(0));
             std::erase_if(named, [&](const auto& entry) {
                 const TQChannelBase* below = entry.second;
                 while (below && below != node) below = below->getParent();
                 return below != nullptr;
             });
             auto* folder = static_cast<TQChannelFolder*>(node->getParent());
             refused(folder == host.sceneChannelRoot() ? host.removeObject(node)
                                                       : folder->removeChild(node));
         }},
        // A channel of the class that hands the next channel the last freed address.
        {"child",
         [&] {
             TQChannelBase* made =
                 static_cast<TQChannelFolder*>(named.at(args.word(0)))
                     ->addChild(std::unique_ptr<TQChannelBase>(new ReusedAddressChannel(
                         args.word(1), static_cast<TQChannelId>(args.number(2)))));
             named[args.word(1)] = made;
             note = ReusedAddressChannel::inSlot(made) ? "at the reused address" : "";
         }},
        {"listen",
         [&] {
             for (const std::string& tag : args.words)
                 host.notificationCenter().addReceiver(receiver(tag));
         }},
        {"unlisten",
         [&] {
             for (const std::string& tag : args.words)
                 host.notificationCenter().removeReceiver(receiver(tag));
         }},
        {"then", [&] { receiver(args.word(0))->onFirst = after(1); }},
        {"post",
         [&] {
             host.postNotification(
                 static_cast<TQNotificationWord>(std::stoul(args.word(0), nullptr, 16)));
         }},
        {"select", [&] { host.selectObject(named.at(args.word(0)), args.word(1) == "extend"); }},
        {"clear", [&] { host.clearObjectSelection(); }},
        {"time", [&] { host.setCurrentTime(when(0)); }},
        {"play", [&] { host.play(); }},
        {"abort", [&] { host.abort(); }},
        {"loop", [&] { host.clock().setLooping(args.word(0) == "on"); }},
        {"tick",
         [&] {
             for (int n = args.words.size() > 1 ? static_cast<int>(args.number(1)) : 1; n > 0; --n)
                 host.tick(when(0));
         }},
        {"range", [&] { refused(host.setPlayRange(CMTimeRangeMake(when(0), when(1)))); }},
        {"display", [&] { refused(host.setDisplayRange(CMTimeRangeMake(when(0), when(1)))); }},
        {"step", [&] { refused(host.stepFrames(static_cast<int64_t>(args.number(0)))); }},
        {"toend", [&] { refused(host.goToEnd()); }},
        {"text", [&] { note = host.timeText(when(0)); }},
        {"timecode", [&] { host.setStartTimecode(static_cast<uint32_t>(args.number(0))); }},
        {"asframes", [&] { host.setDisplayTimeAsFrames(true); }},
        {"firstframe", [&] { host.setFirstFrameNumber(static_cast<uint32_t>(args.number(0))); }},
    };
    run = [&](std::string script) {
        std::ranges::replace(script, ',', ';');
        tests_support::runSteps(script, args, steps);
    };
    std::map<std::string, std::string> shown;
    std::string record;
    auto line = [&](const std::string& label) {
        record += label + (note.empty() ? "" : " -> " + note) + ":";
        for (auto [field, value] : state()) {
            value.erase(0, value.find_first_not_of(' '));
            value.erase(value.find_last_not_of(' ') + 1);
            if (std::exchange(shown[field], value) != value) record += " | " + field + " " + value;
        }
        // The words posted, a run of one word as "word*count".
        std::ostringstream said;
        for (size_t i = 0, n = 1; i < words.seen.size(); i += n, n = 1) {
            while (i + n < words.seen.size() && words.seen[i + n] == words.seen[i]) ++n;
            said << " 0x" << std::hex << words.seen[i] << std::dec;
            if (n > 1) said << "*" << n;
        }
        if (!said.str().empty()) record += " | words" + said.str();
        if (!heard.empty()) record += " | heard" + std::exchange(heard, std::string());
        record += "\n";
        words.seen.clear();
        note.clear();
    };
    line("load");
    std::istringstream script(GetParam().script);
    for (std::string step; std::getline(script, step, ';');) {
        step.erase(0, step.find_first_not_of(' '));
        std::string joined = step;
        std::ranges::replace(joined, '&', ';');
        tests_support::runSteps(joined, args, steps);
        line(step);
    }
    EXPECT_TRUE(tests_support::matchesBaselineBlock("host-steps", GetParam().name, record,
                                                    "host/tests/baselines"));
}

// Each row pins what a careless change to the history, the tracker or the clock would break.
const HostRow kHostRows[] = {
    // The inner end must not close the step, and no undo while one is open; a stray end is
    // tolerated. An empty step is neither kept nor a position, and does not clear redo; a kept
    // one does, and is a new position. The oldest steps go past the levels of undo.
    {"brackets",
     "begin Delete Keypoint; begin Inner; will x; del x; end; end; undo; end; "
     "edit x 1 First; edit y 2 Second; undo; "
     "begin Move Keypoint & will x & willset x & end; willset x & will x; redo; undo; "
     "begin Open; undo; end; edit op 0.5 Third; redo; "
     "levels 2; edit x 4 Fourth; undo; undo; undo"},
    // A change inside a bracket that never announced itself to the host is still taken; a
    // channel added to undo outside one takes its after state when the history is next read,
    // and is dropped when it never changed.
    {"capture",
     "begin Nudge & key op 1 0.25 & end; addstep y Add keypoint & will y & add y 7/3; "
     "undo; undo; redo; redo; addstep x Add keypoint"},
    // Changes with no bracket (a Control band's flatten) are one step until the history is read,
    // by any of its readers.
    {"unbracketed", "key x 1 -3 & key y 1 -3; undo; redo; undo; key z 2 1 & redotitle"},
    // A client's step restores through its owner, joins an open bracket, and goes with the
    // client; a bracket with channels stays without it; a stranger's step is not taken.
    {"clientStep",
     "client 1; clientstep Curve Editor Undo Remove Channel; client 2; undo; redo; "
     "begin Box Edit & clientstep Curve Editor Undo Box Edit & client 3 & will x & "
     "key x 3 -9 & end; undo; unregister; stranger Curve Editor Undo New Curve Set"},
    // Undo marks what it restored modified and posts that channels changed.
    {"undoMarksAndPosts", "edit op 0.1 Edit; reset; undo"},
    // Exactly what changed since the last reset, the object holding it too; a compound
    // announced as a whole covers its components; a removed channel's reference leads nowhere.
    {"modifiedSet", "note x & note z & note x; reset; note p; remove o0"},
    // Selection words only for a change; abort stops playback.
    {"selectionAndTime",
     "select o1 extend; select o1 extend; clear; time 3; play & tick 1/30; abort"},
    // A channel at the address another had is tracked and undone as a channel of its own.
    {"reusedAddress",
     "begin Replace & child o0 A 9000 & note A & remove A; child o1 B 9001; key B 1 5 & end; "
     "undo"},
    // A word posted inside a delivery waits until the current one reached everyone; receivers
    // removed during a delivery hear nothing more of it, and one added hears the next word.
    {"notifications",
     "listen a b a null; then a post 20000; post 4; unlisten a b; listen a b c; "
     "then a unlisten b a; post 8; then c listen b, post 2; post 10; unlisten a"},
    // Frames inside the play range, which is not the display range: 1/30 s in the clock's
    // timescale is just short of it, and in frame 1 all the same. A word for each move but the
    // step past the end; the time as timecode or frame numbers.
    {"transport",
     "range 0 2; display 1/2 1/2; time 8738/262144; step 1; step -100; toend; step 1; "
     "text 12/30; timecode 108000; text 12/30; asframes & firstframe 1; text 12/30"},
    // A stopped clock does not move, bad input is refused, play starts at the range; the loop
    // is exact, reaching the end wraps to the start, and without looping it rests on the end.
    {"clock",
     "range 1 2; tick 1/2; play; tick 1/4; tick -1/4; tick invalid; time invalid; range 0 0; "
     "range indefinite 1; tick 1/24 1000; time 5/2; tick 1/2; loop off; tick 7; play"},
};

INSTANTIATE_TEST_SUITE_P(Rows, HostScript, ::testing::ValuesIn(kHostRows),
                         [](const auto& row) { return std::string(row.param.name); });

constexpr double kTolerance = 1e-6;

std::vector<TQChannel*> channelsOf(const TQHostScene& scene) {
    std::vector<TQChannel*> out;
    for (TQChannelObjectRootBase* object : scene.objects()) {
        std::vector<TQChannelBase*> channels;
        object->getAllDescendantsFlattened(channels, 0, true);
        for (TQChannelBase* c : channels) out.push_back(static_cast<TQChannel*>(c));
    }
    return out;
}

class SamplePiece : public ::testing::TestWithParam<TQHostObjectFamily> {
protected:
    TQChannel* channel(const char* object, TQHostProperty property, size_t axis = 0) {
        return dynamic_cast<TQChannel*>(
            TQChannelRef(TQHostPropertyPaths(GetParam(), property).at(axis))
                .getChannel(host.scene().objectNamed(object)));
    }
    static double at(const TQChannel* c, double seconds) {
        return c->getCurveValue(CMTimeMakeWithSeconds(seconds, 0x40000));
    }
    // The largest (sign 1) or smallest (sign -1) value over a span, sampled finely.
    static double peak(const TQChannel* c, double from, double to, double sign) {
        double best = -INFINITY;
        for (double t = from; t <= to; t += 1.0 / 240.0) best = std::max(best, sign * at(c, t));
        return sign * best;
    }
    TQHostAppDelegate host;
};

TEST_P(SamplePiece, piece__titleFliesInAndPopsLogoBouncesAndSpinsOneBehaviour) {
    TQHostLoadSampleScene(host, GetParam());
    EXPECT_EQ(CMTimeGetSeconds(host.displayRange().duration), 6.0);
    EXPECT_EQ(host.selectedObjectsRootChannels(),
              std::vector<TQChannelBase*>{host.scene().objectNamed(kTQHostSampleTitleObject)});
    EXPECT_FALSE(host.canUndo());
    size_t behaviours = 0;
    for (TQChannel* c : channelsOf(host.scene())) behaviours += c->numberOfBehaviors();
    EXPECT_EQ(behaviours, 1u) << "the logo's sway is the one behaviour";

    const TQChannel* x = channel(kTQHostSampleTitleObject, TQHostProperty::Position);
    const TQChannel* scale = channel(kTQHostSampleTitleObject, TQHostProperty::Scale);
    EXPECT_LT(at(x, 0.0), -960.0) << "the title starts outside a 1920-wide picture";
    EXPECT_GT(at(x, 0.75), -25.0) << "and slows into its rest";
    EXPECT_NEAR(peak(x, 0.8, 5.0, 1), 0.0, kTolerance) << "where it stays";
    EXPECT_GT(peak(scale, 0.3, 0.8, 1), 1.1) << "its scale overshoots";
    EXPECT_NEAR(at(scale, 1.2), 1.0, kTolerance);

    const TQChannel* y = channel(kTQHostSampleBehaviorObject, TQHostProperty::Position, 1);
    const double floor = at(y, 3.0);
    EXPECT_GE(peak(y, 1.0, 6.0, -1), floor - kTolerance) << "the logo never sinks through";
    EXPECT_GT(peak(y, 1.5, 2.0, 1), peak(y, 2.0, 2.3, 1)) << "each bounce lower";
    const auto& rotation = TQHostPropertyPaths(GetParam(), TQHostProperty::Rotation);
    const TQChannel* spin =
        channel(kTQHostSampleBehaviorObject, TQHostProperty::Rotation, rotation.size() - 1);
    EXPECT_NEAR(at(spin, 2.0), std::numbers::pi, 1e-9);
    EXPECT_NEAR(at(spin, 5.9), at(spin, 3.9), 1e-9) << "the turn repeats past its keys";
}

INSTANTIATE_TEST_SUITE_P(BothFamilies, SamplePiece,
                         ::testing::Values(TQHostObjectFamily::Kestrel, TQHostObjectFamily::Other));

TEST(DenseScene, sizeAndSeed__asAskedAndTheSameForTheSameSeed) {
    const struct {
        TQHostObjectFamily family;
        TQHostDenseSceneLayout layout;
        size_t channels;  // in the objects, animated or not
        size_t keyframes;
    } cases[] = {
        {TQHostObjectFamily::Other, {.objects = 3, .keyframesPerChannel = 7}, 90, 630},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .channelsPerObject = 4}, 58, 800},
        {TQHostObjectFamily::Kestrel, {.objects = 2, .totalKeyframes = 1001}, 60, 1001},
        {TQHostObjectFamily::Other,
         {.objects = 1, .channelsPerObject = 50, .channels = TQHostDenseChannels::Plain},
         50,
         5000},
    };
    for (const auto& c : cases) {
        TQHostScene scene(c.family), again(c.family);
        TQHostPopulateDenseScene(scene, c.layout);
        TQHostPopulateDenseScene(again, c.layout);
        const auto channels = channelsOf(scene), twins = channelsOf(again);
        ASSERT_EQ(channels.size(), c.channels);
        size_t keyframes = 0;
        for (size_t i = 0; i < channels.size(); ++i) {
            keyframes += channels[i]->numberOfKeyframes();
            EXPECT_TRUE(*channels[i] == *twins[i]) << "channel " << i << " differs, same seed";
        }
        EXPECT_EQ(keyframes, c.keyframes);
    }
    const TQHostDenseSceneLayout stress = TQHostStressSceneLayout();
    EXPECT_EQ(stress.objects * stress.channelsPerObject, 3000u);
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 0), 334u) << "the remainder goes first";
    EXPECT_EQ(TQHostDenseKeyframesOfChannel(stress, 2999), 333u);
}

}  // namespace
