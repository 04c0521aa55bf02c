// The editor's saved trees: what the state and the set list write, and how they read files
// of this and of older versions.
#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "host/TQHostProjectFile.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "platform/ui/RWServices.h"
#include "src/curvesets/TQCurveEditorState.h"
#include "src/curvesets/TQCurveSetListSerializer.h"
#include "tests/support/TextBaseline.h"

namespace {

// The error's text, empty when there is none.
std::string textOf(const std::optional<BNSerializerError>& error) {
    return error ? error->text() : std::string();
}

std::string timeText(CMTime t) {
    return CMTIME_IS_VALID(t) ? std::to_string(t.value) + "/" + std::to_string(t.timescale)
                              : "unset";
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

// What a state and a set list write, recorded in baselines/saved_trees.txt: originy is the
// top edge, out is the start plus the duration, the children in their fixed order; a set's
// items carry their colour index.
TEST_F(SavedTreesTest, written__as_recorded) {
    TQCurveEditorState state;
    state.setCurrentViewVolume(BNRect<double>(1, 2, 3, 4));
    state.setDisplayRange(CMTimeRangeMake(CMTimeMake(10, 30), CMTimeMake(5, 30)));
    state.setSnapping(true);
    TQCurveSetListSerializer written;
    auto* set = new TQCurveSetSerializer("Arms");
    auto* item = new TQCurveEditorItemSerializer;
    item->setChannelRef(TQChannelRef("./1/100/101/2"));
    item->setColorIndex(5);
    set->addChannel(item);
    written.addCurveSet(set);
    written.setSelectedCurveSet(13);
    EXPECT_TRUE(tests_support::matchesBaseline("saved_trees", write(state) + "\n" + write(written),
                                               "src/curvesets/tests/baselines"));
    written.clear();
    EXPECT_TRUE(written.curveSets().empty() && written.getSelectedCurveSet() == 13u)
        << "clear keeps the selected number";
}

struct Document {
    const char* name;
    const char* text;
    int32_t version;
};

void PrintTo(const Document& d, std::ostream* os) { *os << d.name; }

class SavedDocuments : public SavedTreesTest, public ::testing::WithParamInterface<Document> {};

// Each document read into a state whose volume is (1, 1) by 9 x 5, at 30 frames a second;
// the record (baselines/saved_documents.txt) holds the error, the state's volume, range and
// flags, and the set list read.
TEST_P(SavedDocuments, read__as_recorded) {
    TQCurveEditorState state;
    state.setCurrentViewVolume(BNRect<double>(1, 1, 9, 5));
    const std::string error = textOf(
        TQHostReadEditorTrees(GetParam().text, state, list, GetParam().version, CMTimeMake(1, 30)));
    const Rect v = state.currentViewVolume();
    const auto [autoZoom, snapping, ghosts, waveform, locked] = flags(state);
    std::ostringstream out;
    out << "error: " << error << "\nvolume " << v.x << "," << v.y << " " << v.width << "x"
        << v.height << "\nrange " << timeText(state.displayRange().start) << " for "
        << timeText(state.displayRange().duration) << "\nflags " << autoZoom << snapping << ghosts
        << waveform << locked << "\nselected set " << list.getSelectedCurveSet() << "\n";
    for (const TQCurveSetSerializer* set : list.curveSets()) {
        out << "set " << set->_name << " key '" << set->_shortcut << "' relative " << set->_relative
            << ":";
        for (const TQCurveEditorItemSerializer* c : set->_channels)
            out << " " << c->getChannelRef() << "#" << c->getColorIndex();
        out << "\n";
    }
    EXPECT_TRUE(tests_support::matchesBaselineBlock("saved_documents", GetParam().name, out.str(),
                                                    "src/curvesets/tests/baselines"));
}

INSTANTIATE_TEST_SUITE_P(
    Editor, SavedDocuments,
    ::testing::Values(
        // Parts of a volume: the right edge stays at 10; the top edge stays at 6, or moves to 3.
        Document{"originx", "<curveeditor><currentviewvolume originx='2'/></curveeditor>", 5},
        Document{"height", "<curveeditor><currentviewvolume height='2'/></curveeditor>", 5},
        Document{"originy", "<curveeditor><currentviewvolume originy='3'/></curveeditor>", 5},
        // Before version 5 the range holds frame numbers, and the duration is counted from
        // frame 0, not from the start: old files read so. From 5 on they are refused.
        Document{"framesBefore5", "<curveeditor><displayRange in='10' out='20'/></curveeditor>", 4},
        Document{"framesRefused", "<curveeditor><displayRange in='10' out='20'/></curveeditor>", 5},
        // Without "out" the duration stays as it was.
        Document{"noOut", "<curveeditor><displayRange in='7/2'/></curveeditor>", 5},
        // Older files name the colour "enabled"; "colorindex" wins when both are there.
        // Unknown elements are skipped at every level, a channel inside one still counts; the
        // shortcut that writing never sets is read; a path is kept as text.
        Document{"olderList",
                 "<curvesets selected='4'>"
                 "  <curveset name='Old' shortcut='q' relative='true'>"
                 "    <channel enabled='1'><channelref>./2/7</channelref></channel>"
                 "    <channel enabled='1' colorindex='6'><extra/>"
                 "<channelref>./2/8</channelref></channel>"
                 "    <channel><channelref>not a path</channelref></channel>"
                 "    <unknown><channel colorindex='9'/></unknown>"
                 "  </curveset>"
                 "  <somethingelse name='x'/>"
                 "</curvesets>",
                 5}),
    [](const auto& p) { return std::string(p.param.name); });

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

}  // namespace
