// The editor's saved trees: what the state and the set list write, and how they read files
// of this and of older versions.
#include <gtest/gtest.h>

#include <string>

#include "host/TQHostProjectFile.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "platform/ui/RWServices.h"
#include "src/curvesets/TQCurveEditorState.h"
#include "src/curvesets/TQCurveSetListSerializer.h"

namespace {

// The error's text, empty when there is none.
std::string textOf(const std::optional<BNSerializerError>& error) {
    return error ? error->text() : std::string();
}

// Every test runs on user defaults of its own.
class SavedTreesTest : public ::testing::Test {
protected:
    void SetUp() override { RWInstallServices({.userDefaults = &_defaults}); }
    void TearDown() override { RWResetServices(); }

    template <class Tree>
    static std::string write(Tree& tree) {
        std::string text;
        BNStringSink sink(text);
        BNSerializerWriteStream stream(sink);
        tree.writeHeader(stream, false);
        tree.writeBody(stream, false, true, true);
        stream.closeElement();
        EXPECT_EQ(textOf(stream.finish()), "");
        return text;
    }
    // Reads a document into the state and `list`, at 30 frames a second; an error fails.
    void read(const std::string& text, TQCurveEditorState& state, int32_t version = 5) {
        EXPECT_EQ(textOf(TQHostReadEditorTrees(text, state, list, version, CMTimeMake(1, 30))), "");
    }

    RWMemoryUserDefaults _defaults;
    TQCurveSetListSerializer list;
};

using Rect = BNRect<double>;
// The flags a state keeps: auto-zoom, snapping, ghosts, waveform, keyframes locked in time.
auto flags(const TQCurveEditorState& s) {
    return std::tuple(s.autoZoom(), s.snapping(), s.snapshotChannels(), s.displayAudioWaveform(),
                      s.lockKeyframesInTime());
}

TEST_F(SavedTreesTest, state__writesTopEdgeAndEndAndReadsOlderFramesAndPartsOfAVolume) {
    TQCurveEditorState state;
    state.setCurrentViewVolume(BNRect<double>(1, 2, 3, 4));
    state.setDisplayRange(CMTimeRangeMake(CMTimeMake(10, 30), CMTimeMake(5, 30)));
    state.setSnapping(true);
    const std::string text = write(state);

    EXPECT_NE(text.find("originx=\"1\" originy=\"6\" width=\"3\" height=\"4\""), std::string::npos)
        << "originy is the top edge:\n"
        << text;
    EXPECT_NE(text.find("in=\"10/30\" out=\"15/30\""), std::string::npos)
        << "out is start plus duration:\n"
        << text;
    size_t last = 0;
    for (const char* child :
         {"<autozoom>", "<snapping>true", "<displayAudioWaveform>", "<lockKeyframesInTime>",
          "<displayRange ", "<currentviewvolume ", "<snapshotChannels>"}) {
        const size_t at = text.find(child);
        ASSERT_NE(at, std::string::npos) << child;
        EXPECT_GT(at, last) << child << " is out of order";
        last = at;
    }

    // Reading it back is the project file's round trip.

    // From (0, 1) by 10 x 5: the right edge stays at 10; the top edge stays at 6, or moves to 3.
    for (const auto& [attribute, x, y, w, h] : {std::tuple{"originx='2'", 2, 1, 8, 5},
                                                {"height='2'", 0, 4, 10, 2},
                                                {"originy='3'", 0, -2, 10, 5}}) {
        TQCurveEditorState partial;
        partial.setCurrentViewVolume(BNRect<double>(0, 1, 10, 5));
        read(std::string("<curveeditor><currentviewvolume ") + attribute + "/></curveeditor>",
             partial);
        EXPECT_EQ(partial.currentViewVolume(), Rect(x, y, w, h)) << attribute;
    }

    const std::string doc = "<curveeditor><displayRange in='10' out='20'/></curveeditor>";
    TQCurveEditorState old, refused, noOut;
    read(doc, old, 4);
    // The duration is counted from frame 0, not from the start; old files read so.
    EXPECT_EQ(std::pair(old.displayRange().start, old.displayRange().duration),
              std::pair(CMTimeMake(10, 30), CMTimeMake(18, 30)));
    EXPECT_NE(
        textOf(TQHostReadEditorTrees(doc, refused, list, 5, CMTimeMake(1, 30))).find("\"in\""),
        std::string::npos)
        << "from version 5 on, the range holds times, not frame numbers";
    read("<curveeditor><displayRange in='7/2'/></curveeditor>", noOut);
    EXPECT_EQ(noOut.displayRange().start, CMTimeMake(7, 2));
    EXPECT_FALSE(CMTIME_IS_VALID(noOut.displayRange().duration))
        << "without \"out\" the duration stays as it was";
}

TEST_F(SavedTreesTest, state__flagsFollowTheDefaultsAndCopiesLeaveTheRangeUnset) {
    _defaults.setBool(true, kTQPreferenceCurveEditorAutoZoom);
    _defaults.setBool(true, kTQPreferenceCurveEditorLockKeyframesInTime);
    TQCurveEditorState state;
    EXPECT_EQ(flags(state), std::tuple(true, false, false, false, true));
    EXPECT_FALSE(state.hasDisplayRange()) << "a new state's range is unset";

    state.setSnapshotChannels(true);
    state.setDisplayAudioWaveform(true);
    EXPECT_TRUE(_defaults.boolForKey(kTQPreferenceCurveEditorSnapshotChannels) &&
                _defaults.boolForKey(kTQPreferenceCurveEditorDisplayAudioWaveform));

    read("<curveeditor><autozoom>false</autozoom><snapping>true</snapping></curveeditor>", state);
    EXPECT_EQ(flags(state), std::tuple(false, true, true, true, true));
    EXPECT_TRUE(_defaults.boolForKey(kTQPreferenceCurveEditorAutoZoom) &&
                !_defaults.boolForKey(kTQPreferenceCurveEditorSnapping))
        << "a read changes the object, never the defaults";

    state.setDisplayRange(CMTimeRangeMake(kCMTimeZero, CMTimeMake(4, 1)));
    state.setCurrentViewVolume(BNRect<double>(1, 2, 3, 4));
    const TQCurveEditorState copy(state);
    EXPECT_FALSE(copy.hasDisplayRange()) << "a copy leaves the range unset";
    EXPECT_TRUE(CMTimeIdentical(copy.displayRange().start, kCMTimeInvalid));
    EXPECT_EQ(copy.currentViewVolume(), Rect(1, 2, 3, 4));
    EXPECT_EQ(flags(copy), flags(state));
}

TEST_F(SavedTreesTest, list__writesColourIndexAsItemsAndReadsItAsSets) {
    TQCurveSetListSerializer written;
    auto* set = new TQCurveSetSerializer("Arms");
    auto* item = new TQCurveEditorItemSerializer;
    item->setChannelRef(TQChannelRef("./1/100/101/2"));
    item->setColorIndex(5);
    set->addChannel(item);
    written.addCurveSet(set);
    written.setSelectedCurveSet(13);
    const std::string text = write(written);
    for (const char* part :
         {"<curvesets selected=\"13\">",
          "<curveset name=\"Arms\" shortcut=\"\" relative=\"false\">", "<channel colorindex=\"5\">",
          "<channelref>./1/100/101/2</channelref>"})
        EXPECT_NE(text.find(part), std::string::npos) << part << " in\n" << text;

    // Older files name the colour "enabled"; "colorindex" wins when both are there. Unknown
    // elements are skipped at every level.
    TQCurveEditorState unused;
    read(
        "<curvesets selected='4'>"
        "  <curveset name='Old' shortcut='q' relative='true'>"
        "    <channel enabled='1'><channelref>./2/7</channelref></channel>"
        "    <channel enabled='1' colorindex='6'><extra/><channelref>./2/8</channelref></channel>"
        "    <channel><channelref>not a path</channelref></channel>"
        "    <unknown><channel colorindex='9'/></unknown>"
        "  </curveset>"
        "  <somethingelse name='x'/>"
        "</curvesets>",
        unused);
    EXPECT_EQ(list.getSelectedCurveSet(), 4u) << "the host reads \"selected\" and hands it on";
    ASSERT_EQ(list.curveSets().size(), 1u);
    const TQCurveSetSerializer& old = *list.curveSets()[0];
    EXPECT_EQ(std::tuple(old._name, old._shortcut, old._relative), std::tuple("Old", "q", true))
        << "reading takes the shortcut that writing never sets";
    ASSERT_EQ(old._channels.size(), 4u) << "a channel inside an unknown element still counts";
    EXPECT_EQ(std::tuple(old._channels[0]->getColorIndex(), old._channels[0]->getChannelRef(),
                         old._channels[1]->getColorIndex(), old._channels[1]->getChannelRef()),
              std::tuple(1u, "./2/7", 6u, "./2/8"));
    EXPECT_EQ(old._channels[2]->getChannelRef(), "not a path") << "kept as text";
    EXPECT_EQ(old._channels[3]->getColorIndex(), 9u);

    list.clear();
    EXPECT_TRUE(list.curveSets().empty() && list.getSelectedCurveSet() == 4u)
        << "clear keeps the selected number";
}

}  // namespace
