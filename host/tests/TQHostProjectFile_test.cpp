// The project file: a round trip of everything a document holds, and damaged files refused
// whole, leaving the open document as it was.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "host/TQHostAppDelegate.h"
#include "host/TQHostProjectFile.h"
#include "host/TQHostSampleScene.h"
#include "platform/channels/TQChannelTypes.h"
#include "tests/support/TextBaseline.h"

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

// A project with every field a document has set to something other than its default: the
// sample piece with keyframes in several timescales, locked, broken, scaled, disabled and met,
// both extrapolations, flags, a behaviour, a locked and collapsed object with an empty slot,
// an object with a time offset; the host's times and settings; the editor's settings and two
// curve sets, with names and a label that need escaping.
std::string projectText() {
    std::ifstream file(tests_support::baselinePath("host/tests/baselines", "project"));
    return (std::ostringstream() << file.rdbuf()).str();
}

// Reads `text` into the project; a failure carries the error.
::testing::AssertionResult read(TQHostProject& project, const std::string& text) {
    const auto error = project.read(text);
    if (error) return ::testing::AssertionFailure() << textOf(error);
    return ::testing::AssertionSuccess();
}

TEST(TQHostProjectFileTest, roundTrip__everyChannelFieldTimeSettingAndBothTrees) {
    const std::string text = projectText();
    TQHostAppDelegate host(TQHostObjectFamily::Other), other(TQHostObjectFamily::Other);
    TQHostProject project(host), reopened(other);
    ASSERT_TRUE(read(project, text));
    EXPECT_EQ(written(project), text) << "a project must save as it was read";
    ASSERT_TRUE(read(reopened, written(project)));

    EXPECT_TRUE(other.isKestrel());
    const auto a = host.scene().objects();
    const auto b = other.scene().objects();
    ASSERT_EQ(b.size(), 4u);
    ASSERT_EQ(a.size(), 4u);
    for (size_t i = 0; i < a.size(); ++i)
        EXPECT_TRUE(*b[i] == *a[i]) << "object " << a[i]->getName() << " changed on the way";
    EXPECT_EQ(other.version(), kTQHostProjectVersion);
    EXPECT_EQ(other.getCurveSetListSerializer(), &reopened.curveSets());
    EXPECT_FALSE(other.undoStack().canUndo()) << "loading is no undoable step";
    // The range travels as start and end, so its duration comes back equal, in the end's
    // timescale.
    const TQCurveEditorState& sb = reopened.editorState();
    EXPECT_TRUE(CMTimeIdentical(sb.displayRange().start, CMTimeMake(-1, 2)));
    EXPECT_EQ(sb.displayRange().duration, CMTimeMake(37, 5));
    // The top edge makes the trip as a sum: y comes back through (y + h) - h.
    EXPECT_EQ(sb.currentViewVolume(), BNRect<double>(-0.5, (2.0 + 1e-9) - 1e-9, 0.1, 1e-9));
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
    const std::string good = projectText();

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
    ASSERT_TRUE(read(project, projectText()));
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
