// The project file: a round trip of everything a document holds, and damaged files refused
// whole, leaving the open document as it was.
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostProjectFile.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelTypes.h"
#include "platform/channels/TQFactory.h"

namespace {

// The error's text for a failure message, empty when there is none.
std::string textOf(const std::optional<BNSerializerError>& error) {
    return error ? error->text() : std::string();
}

std::string written(TQHostProject& project) {
    std::string text;
    BNStringSink sink(text);
    const auto error = project.write(sink);
    EXPECT_FALSE(error) << textOf(error);
    return text;
}

// What the document holds beside its objects' state (operator== leaves identity out), as text:
// every node's name, id, class, own offset, extent and label, and a channel's default, slider
// maximum and rig flag; the host's times in their own timescales, numbers and flags; the
// editor's settings and the curve sets with their items.
std::string documentText(TQHostAppDelegate& h, TQHostProject& p) {
    std::ostringstream out;
    out.precision(17);
    const auto time = [&](const CMTime& t) {
        out << " " << t.value << "/" << t.timescale << "/" << t.flags << "@" << t.epoch;
    };
    const std::function<void(const TQChannelBase*)> identity = [&](const TQChannelBase* node) {
        if (!node) return void(out << "(empty)\n");
        const TQFactoryId factory = TQChannelFactoryIdOf(node);
        out << node->getName() << " " << node->getChannelId() << " " << factory.word0 << "-"
            << factory.word1 << " " << node->getXAxisLabel();
        for (const CMTime& t :
             {node->ownTimeOffset(), node->timeExtent().start, node->timeExtent().duration})
            time(t);
        if (const auto* c = dynamic_cast<const TQChannel*>(node))
            out << " " << c->getDefaultValue() << " " << c->sliderMaximum() << " " << c->isRigged();
        out << "\n";
        if (const auto* folder = dynamic_cast<const TQChannelFolder*>(node))
            for (size_t i = 0; i < folder->numberOfChildren(); ++i) identity(folder->getChild(i));
    };
    for (const TQChannelBase* object : h.scene().objects()) identity(object);
    for (const CMTime& t : {h.getFrameDuration(), h.displayRange().start, h.displayRange().duration,
                            h.currentTime(), h.secondsPerTextStep()})
        time(t);
    const TQCurveEditorState& s = p.editorState();
    out << " " << h.firstFrameNumber() << " " << h.startTimecode() << " "
        << h.shouldDisplayTimeAsFrames() << s.autoZoom() << s.snapping() << s.snapshotChannels()
        << s.displayAudioWaveform() << s.lockKeyframesInTime();
    for (const TQChannelBase* object : h.selectedObjectsRootChannels())
        out << " selected " << object->getChannelId();
    out << " sets, selected " << p.curveSets().getSelectedCurveSet();
    for (const TQCurveSetSerializer* set : p.curveSets().curveSets()) {
        out << "\n" << set->_name << "|" << set->_shortcut << "|" << set->_relative;
        for (const TQCurveEditorItemSerializer* item : set->_channels)
            out << " " << item->getChannelRef() << ":" << item->getColorIndex();
    }
    return out.str();
}

// The sample piece, with every field the piece leaves at its default set to something else.
void makeDocument(TQHostAppDelegate& host, TQHostProject& project) {
    TQHostLoadSampleScene(host, TQHostObjectFamily::Kestrel);
    std::vector<TQChannelObjectRootBase*> objects = host.scene().objects();
    ASSERT_GE(objects.size(), 3u);
    std::vector<TQChannelBase*> all;
    objects[0]->getAllDescendantsFlattened(all, 0, false);
    auto* channel = dynamic_cast<TQChannel*>(all.front());
    ASSERT_NE(channel, nullptr);
    const CMTime t1 = CMTimeMake(1001, 30000);  // a timescale other than the piece's
    TQKeyframeHandle a = channel->setKeyframe(t1, 1.0 / 3.0);
    channel->setKeyframeLocked(a, true);
    channel->setKeyframeTangentsBroken(a, true);
    channel->setKeyframeTangentsScaled(a, true);
    channel->setKeyframeInputTangents(a, -0.1, 1e-300);
    TQKeyframeHandle b = channel->setKeyframe(CMTimeMake(7, 3), -0.0);
    channel->setKeyframeEnabled(b, false);
    channel->setKeyframeInterpolation(b, kTQInterpolationEaseIn);
    channel->cloneKeyframe(b, CMTimeMake(7, 3));  // two keyframes that met
    channel->setExtrapolation(kTQExtrapolationPingPong, kTQExtrapolationBefore);
    channel->setExtrapolation(kTQExtrapolationProgressive, kTQExtrapolationAfter);
    channel->setDefaultInterpolation(kTQInterpolationCatmullRom);
    channel->setRigged(true);
    channel->setSliderMaximum(12.5);
    channel->setXAxisLabel("Position & <size>");
    channel->setFlag(kTQChannelFlagShowFlattened | (uint64_t{1} << 63));
    channel->getImpl()->range().setRange(-3.25, 1e308);
    channel->getInfo()->tickStep = 0.1;
    auto* second = dynamic_cast<TQChannel*>(all.back());
    ASSERT_NE(second, nullptr);
    second->setAnimationEnabled(false);
    second->setInitialValue(0.1 + 0.2);
    auto noise = std::make_unique<TQNoiseBehavior>(0.5, 3.0, 77);
    noise->setSelected(true);
    noise->setEnabled(false);
    second->addBehavior(std::move(noise));
    objects[1]->setLocked(true, false);
    objects[1]->setFoldFlag(kTQFoldFlagCollapsed);
    objects[1]->addChild(nullptr);  // an empty slot
    objects[2]->setTimeOffset(CMTimeMake(-5, 7));

    host.setFrameDuration(CMTimeMake(1001, 24000));
    host.setDisplayRange(CMTimeRangeMake(CMTimeMake(-1, 2), CMTimeMake(37, 5)));
    host.setCurrentTime(CMTimeMake(3, 4));
    host.setFirstFrameNumber(1);
    host.setStartTimecode(86400);
    host.setSecondsPerTextStep(CMTimeMake(1, 2));
    host.setDisplayTimeAsFrames(true);
    host.setSelectedObjects({objects[2], objects[0]});

    TQCurveEditorState& state = project.editorState();
    state.setAutoZoom(true);
    state.setSnapping(false);
    state.setSnapshotChannels(true);
    state.setDisplayAudioWaveform(false);
    state.setLockKeyframesInTime(true);
    state.setCurrentViewVolume(BNRect<double>(-0.5, 2.0, 0.1, 1e-9));

    TQCurveSetListSerializer& sets = project.curveSets();
    sets.setSelectedCurveSet(12);
    for (int s = 0; s < 2; ++s) {
        auto* set = new TQCurveSetSerializer("Set \"" + std::to_string(s) + "\" <&>");
        set->setRelative(s == 1);
        set->setShortcut(s == 0 ? "k" : "");
        for (int i = 0; i < 3; ++i) {
            auto* item = new TQCurveEditorItemSerializer;
            item->setChannelRef(TQChannelRef("./1/100/101/" + std::to_string(i + 1)));
            item->setColorIndex(static_cast<uint32_t>(s * 10 + i));
            set->addChannel(item);
        }
        sets.addCurveSet(set);
    }
}

TEST(TQHostProjectFileTest, roundTrip__everyChannelFieldTimeSettingAndBothTrees) {
    TQHostAppDelegate host;
    TQHostProject project(host);
    makeDocument(host, project);
    const std::string text = written(project);

    TQHostAppDelegate other(TQHostObjectFamily::Other);
    TQHostProject reopened(other);
    const auto error = reopened.read(text);
    ASSERT_FALSE(error) << textOf(error);

    EXPECT_TRUE(other.isKestrel());
    const auto a = host.scene().objects();
    const auto b = other.scene().objects();
    ASSERT_EQ(b.size(), a.size());
    for (size_t i = 0; i < a.size(); ++i)
        EXPECT_TRUE(*b[i] == *a[i]) << "object " << a[i]->getName() << " changed on the way";
    EXPECT_EQ(documentText(other, reopened), documentText(host, project));
    EXPECT_EQ(other.version(), kTQHostProjectVersion);
    EXPECT_EQ(other.getCurveSetListSerializer(), &reopened.curveSets());
    EXPECT_FALSE(other.undoStack().canUndo()) << "loading is no undoable step";
    // The range travels as start and end, so its duration comes back equal, in the end's
    // timescale.
    const TQCurveEditorState& sb = reopened.editorState();
    EXPECT_TRUE(CMTimeIdentical(sb.displayRange().start, host.displayRange().start));
    EXPECT_EQ(sb.displayRange().duration, host.displayRange().duration);
    // The top edge makes the trip as a sum: y comes back through (y + h) - h.
    EXPECT_EQ(sb.currentViewVolume(), BNRect<double>(-0.5, (2.0 + 1e-9) - 1e-9, 0.1, 1e-9));
    EXPECT_EQ(written(reopened), text) << "a reopened project must save as it was read";
}

// Replaces the first `from` after `after` by `to`.
std::string replaced(std::string text, const std::string& from, const std::string& to,
                     const std::string& after = "") {
    const size_t start = after.empty() ? 0 : text.find(after);
    const size_t at = text.find(from, start == std::string::npos ? 0 : start);
    if (at == std::string::npos) return "the mutation missed: " + from;
    return text.replace(at, from.size(), to);
}

TEST(TQHostProjectFileTest, read__damagedFilesLoadNothing) {
    TQHostAppDelegate source;
    TQHostProject sourceProject(source);
    makeDocument(source, sourceProject);
    const std::string good = written(sourceProject);

    std::string deep = good;
    std::string nest;
    for (int i = 0; i < 300; ++i) nest += "<x>";  // unknown in a tree, so only depth stops it
    deep.insert(deep.find("<curveeditor>") + 13, nest);
    const std::string laughs =
        "<!DOCTYPE project [<!ENTITY a \"aaaaaaaaaa\"><!ENTITY b \"&a;&a;&a;&a;&a;&a;\">]>";

    struct Case {
        const char* what;
        std::string text;
        const char* message;  // a part of the message
    };
    const std::vector<Case> cases = {
        {"truncated", good.substr(0, good.find("<curveeditor>")), "no element found"},
        {"bad XML", replaced(good, "<key ", "<key <"), "not well-formed"},
        {"foreign", "<svg width=\"10\"/>", "not a project"},
        {"newer version", replaced(good, "version=\"5\"", "version=\"6\""), "newer"},
        {"unknown element", replaced(good, "<key ", "<keyframe "), "\"keyframe\" is not expected"},
        {"element out of place", replaced(good, "<key ", "<timing ", "<scene>"), "not expected"},
        {"child of a leaf", replaced(good, "/>", "><key/></key>", "<key "), "not expected"},
        {"section order", replaced(good, "<timing ", "<selection/><timing "), "out of place"},
        {"missing attribute", replaced(good, " v=\"", " w=\"", "<key "),
         "\"v\" of \"key\" is missing"},
        {"number out of range", replaced(good, " i=\"", " i=\"99999999999", "<key "),
         "out of range"},
        {"double out of range", replaced(good, " v=\"", " v=\"1e400", "<key "), "out of range"},
        {"zero timescale", replaced(good, "/262144\"", "/0\"", "<key "), "timescale"},
        {"time that is no number",
         replaced(good, "frameduration=\"1001/24000\"", "frameduration=\"indefinite\""),
         "not a number"},
        {"unknown class",
         replaced(good, "factory=\"229211d70b00de81-", "factory=\"329211d70b00de81-"),
         "unknown class"},
        {"unknown interpolation", replaced(good, " i=\"", " i=\"2", "<key "),
         "no interpolation code"},
        {"keyframes out of order", replaced(good, "t=\"", "t=\"99999", "<key "), "earlier"},
        {"unknown behaviour", replaced(good, "kind=\"Noise\"", "kind=\"Wobble\""), "unknown"},
        {"selection names nothing", replaced(good, "ref=\"./", "ref=\"./99"), "no object"},
        {"duplicate object id",
         replaced(
             good, "<scene>",
             "<scene>" + good.substr(good.find("<channel "), good.find("</channel>\n    <channel") -
                                                                 good.find("<channel ") + 10)),
         "two objects"},
        {"deep nesting", deep, "nested deeper"},
        {"billion laughs", replaced(good, "<project", laughs + "<project"),
         "document type declarations"},
        {"bad value in a tree", replaced(good, "<autozoom>true", "<autozoom>perhaps"),
         "not a value"},
    };

    TQHostAppDelegate host;
    TQHostProject project(host);
    TQHostLoadSampleScene(host, TQHostObjectFamily::Other);
    project.editorState().setCurrentViewVolume(BNRect<double>(1, 2, 3, 4));
    project.curveSets().addCurveSet(new TQCurveSetSerializer("Mine"));
    const std::string before = written(project);
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        ASSERT_EQ(c.text.find("the mutation missed"), std::string::npos) << c.text;
        const auto error = project.read(c.text);
        ASSERT_TRUE(error) << "a damaged project was read";
        EXPECT_GT(error.value_or(BNSerializerError{}).line, 0u) << textOf(error);
        EXPECT_GT(error.value_or(BNSerializerError{}).column, 0u) << textOf(error);
        EXPECT_NE(textOf(error).find(c.message), std::string::npos) << textOf(error);
        EXPECT_EQ(written(project), before) << "the open document changed";
    }

    // Unknown elements inside the editor's trees are skipped, not refused.
    const std::string strange =
        replaced(replaced(good, "<autozoom>", "<mystery a=\"1\"><deeper/></mystery><autozoom>"),
                 "<channelref>", "<colour>red</colour><channelref>");
    const auto error = project.read(strange);
    EXPECT_FALSE(error) << textOf(error);
    EXPECT_EQ(written(project), good);
}

TEST(TQHostProjectFileTest, save__replacesTheFileOnlyWhenComplete) {
    TQHostAppDelegate host;
    TQHostProject project(host);
    makeDocument(host, project);
    const std::string path = testing::TempDir() + "project_save_test.xml";
    ASSERT_FALSE(project.save(path));
    const std::string saved = written(project);

    // A document the writer refuses (a behaviour it does not know) leaves the file alone.
    struct Wobble final : TQChannelBehavior {
        double apply(double, double value) const override { return value; }
        std::unique_ptr<TQChannelBehavior> clone() const override {
            return std::make_unique<Wobble>();
        }
        bool equals(const TQChannelBehavior& other) const override {
            return dynamic_cast<const Wobble*>(&other) != nullptr;
        }
        BNString kindName() const override { return "Wobble"; }
    };
    std::vector<TQChannelBase*> all;
    host.scene().objects().front()->getAllDescendantsFlattened(all, 0, false);
    dynamic_cast<TQChannel*>(all.front())->addBehavior(std::make_unique<Wobble>());
    const auto refused = project.save(path);
    ASSERT_TRUE(refused);
    EXPECT_NE(textOf(refused).find("Wobble"), std::string::npos);
    EXPECT_FALSE(std::filesystem::exists(path + ".saving")) << "the partial file is removed";
    TQHostAppDelegate other;
    TQHostProject reopened(other);
    const auto error = reopened.open(path);
    ASSERT_FALSE(error) << textOf(error);
    EXPECT_EQ(written(reopened), saved) << "the old file must be intact";
    std::remove(path.c_str());
}

}  // namespace
