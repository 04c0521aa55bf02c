#include "src/resources/TQStrings.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace {

// Keys the framework looks up. A key removed or misspelt in the table shows up on screen as
// the raw key, so the table must hold every one of them.
const char* const kKeysInUse[] = {
    "Anim Menu Add Keyframe",
    "Anim Menu Delete Keyframe",
    "Anim Menu Disable Animation",
    "Anim Menu Ease Both",
    "Anim Menu Ease In",
    "Anim Menu Ease Out",
    "Anim Menu Enable Animation",
    "Anim Menu Extrapolation Constant",
    "Anim Menu Extrapolation Generate",
    "Anim Menu Extrapolation Linear",
    "Anim Menu Extrapolation Ping Pong",
    "Anim Menu Extrapolation Progressive",
    "Anim Menu Extrapolation Repeat",
    "Anim Menu Interpolation Bezier",
    "Anim Menu Interpolation Catmull Rom",
    "Anim Menu Interpolation Constant",
    "Anim Menu Interpolation Exp",
    "Anim Menu Interpolation Linear",
    "Anim Menu Interpolation Log",
    "Anim Menu Interpolation",
    "Anim Menu KEYFRAMES",
    "Anim Menu Lock Channel",
    "Anim Menu Next Keyframe",
    "Anim Menu Post Extrapolation",
    "Anim Menu Pre Extrapolation",
    "Anim Menu Previous Keyframe",
    "Anim Menu Reset Channel",
    "Anim Menu Set To Ghost",
    "Anim Menu Simplify Channel",
    "Anim Menu Unlock Channel",
    "Anim Tool Tip Add Keyframe",
    "Anim Tool Tip Delete Keyframe",
    "Anim Tool Tip Next Keyframe",
    "Anim Tool Tip Previous Keyframe",
    "Curve Editor Coordinates Format",
    "Curve Editor Curve Set Active",
    "Curve Editor Curve Set Add",
    "Curve Editor Curve Set Add/Remove",
    "Curve Editor Curve Set All",
    "Curve Editor Curve Set Animated",
    "Curve Editor Curve Set Copy",
    "Curve Editor Curve Set Exist",
    "Curve Editor Curve Set Manage",
    "Curve Editor Curve Set Modified",
    "Curve Editor Curve Set New",
    "Curve Editor Curve Set Opacity",
    "Curve Editor Curve Set Pivot",
    "Curve Editor Curve Set Position",
    "Curve Editor Curve Set Remove",
    "Curve Editor Curve Set Retiming",
    "Curve Editor Curve Set Rotation",
    "Curve Editor Curve Set Scale",
    "Curve Editor Curve Set Shear",
    "Curve Editor Curve Set Untitled",
    "Curve Editor Curve Set",
    "Curve Editor Flag Value Off",
    "Curve Editor Flag Value On",
    "Curve Editor Menu Add",
    "Curve Editor Menu Align",
    "Curve Editor Menu Break",
    "Curve Editor Menu Copy",
    "Curve Editor Menu Cut",
    "Curve Editor Menu Delete All",
    "Curve Editor Menu Delete",
    "Curve Editor Menu Disable",
    "Curve Editor Menu Enable",
    "Curve Editor Menu Link",
    "Curve Editor Menu Lock",
    "Curve Editor Menu Paste",
    "Curve Editor Menu Reverse",
    "Curve Editor Menu Unlock",
    "Curve Editor Number Format",
    "Curve Editor Time Format",
    "Curve Editor Undo Box Edit",
    "Curve Editor Undo New Curve Set",
    "Curve Editor Undo Remove Channel",
    "Mini Curve Editor Auto Fit Button",
    "Mini Curve Editor X Label",
    "Mini Curve Editor Y Label",
    "Undo Add keypoint",
    "Undo Align Tangents",
    "Undo Break Tangents",
    "Undo Chan Menu Add Keyframe",
    "Undo Chan Menu Delete Keyframe",
    "Undo Chan Menu Disable Animation",
    "Undo Chan Menu Enable Animation",
    "Undo Chan Menu Reset Channel",
    "Undo Chan Menu Set Channel To Ghost",
    "Undo Delete All Keypoints",
    "Undo Delete Keypoint",
    "Undo Disable Keypoint",
    "Undo Draw Curve",
    "Undo Duplicate",
    "Undo Ease Both",
    "Undo Ease In",
    "Undo Ease Out",
    "Undo Flatten Keypoint",
    "Undo Folder Reset",
    "Undo Generate Keypoints",
    "Undo Lock Keypoint",
    "Undo Move Curve",
    "Undo Move Keypoint",
    "Undo Reverse",
    "Undo Set Interpolation",
    "Undo Set Post Extrapolation",
    "Undo Set Pre Extrapolation",
    "Undo Set Tangents",
    "Undo Set Value",
    "Undo Simplify",
    "Undo Unlock Keypoint",
};

// printf conversions of a format text, in order ("%%" is not one).
std::string conversions(const std::string& format) {
    std::string out;
    for (std::size_t i = 0; i < format.size(); ++i) {
        if (format[i] != '%') continue;
        std::size_t j = i + 1;
        while (j < format.size() &&
               std::string_view("0123456789.-+ #").find(format[j]) != std::string_view::npos)
            ++j;
        if (j < format.size() && format[j] != '%') out.push_back(format[j]);
        i = j;
    }
    return out;
}

}  // namespace

class BuiltInStringsTable : public ::testing::Test {
protected:
    const TQStringsTable::ParseResult parsed =
        TQStringsTable::parse(TQStringsTable::builtInSource());
};

TEST_F(BuiltInStringsTable, parse__noErrorsNoDuplicatesNoEmptyTexts) {
    for (const BNString& e : parsed.errors) ADD_FAILURE() << "strings table: " << e;
    ASSERT_FALSE(parsed.entries.empty()) << "the compiled-in table is empty";
    std::set<BNString> seen;
    for (const auto& entry : parsed.entries) {
        EXPECT_TRUE(seen.insert(entry.key).second) << "duplicate key " << entry.key;
        EXPECT_FALSE(entry.text.empty())
            << "empty text for key \"" << entry.key << "\" at line " << entry.line;
        EXPECT_NE(entry.text, entry.key) << "key \"" << entry.key << "\" has itself as text";
        if (entry.key.rfind("Undo ", 0) == 0 || entry.key.find(" Undo ") != BNString::npos) {
            EXPECT_NE(entry.text.rfind("Undo", 0), 0u)
                << "undo description \"" << entry.key << "\" repeats the word the Edit menu adds";
        }
    }
}

TEST_F(BuiltInStringsTable, keys__everyKeyInUseHasText) {
    for (const char* key : kKeysInUse)
        EXPECT_TRUE(TQHasLocalizedString(key)) << "missing key \"" << key << "\"";
    const std::vector<BNString> keys = TQLocalizedStringKeys();
    EXPECT_TRUE(std::is_sorted(keys.begin(), keys.end()));
    EXPECT_EQ(keys.size(), parsed.entries.size()) << "key listing and table disagree";
    EXPECT_EQ(keys.size(), std::size(kKeysInUse))
        << "the table holds keys nothing uses, or the list is stale";
}

TEST_F(BuiltInStringsTable, lookup__textsMissingKeysAndFormats) {
    EXPECT_EQ(TQLocalizedString("Undo Move Keypoint"), "Move Keypoint");
    EXPECT_EQ(TQLocalizedString("No Such Key"), "No Such Key") << "a missing key answers itself";
    EXPECT_EQ(TQLocalizedString(""), "");
    EXPECT_EQ(TQLocalizedString("Curve Editor Curve Set Copy").front(), ' ')
        << "the copy suffix is appended with no blank, so it must bring its own";
    EXPECT_EQ(conversions(TQLocalizedString("Curve Editor Time Format")), "f")
        << "takes the seconds";
    EXPECT_EQ(conversions(TQLocalizedString("Curve Editor Coordinates Format")), "sf")
        << "takes the time text, then the value";
}

class StringsTableParser : public ::testing::Test {};

TEST_F(StringsTableParser, parse__commentsAndEscapes) {
    const auto r = TQStringsTable::parse(
        "/* header\n spanning lines */\n"
        "\"a\" = \"say \\\"hi\\\"\";  // trailing\n"
        "\"b\"=\"x\\\\y\\n\\tz\";\n");
    ASSERT_TRUE(r.errors.empty()) << r.errors.front();
    ASSERT_EQ(r.entries.size(), 2u);
    EXPECT_EQ(r.entries[0].text, "say \"hi\"");
    EXPECT_EQ(r.entries[0].line, 3);
    EXPECT_EQ(r.entries[1].text, "x\\y\n\tz");
}

TEST_F(StringsTableParser, parse__errorsAreReportedAndSkipped) {
    {
        const auto r = TQStringsTable::parse("\"a\" = \"1\";\n\"a\" = \"2\";\n");
        ASSERT_EQ(r.errors.size(), 1u);
        EXPECT_NE(r.errors[0].find("duplicate key \"a\""), BNString::npos) << r.errors[0];
        ASSERT_EQ(r.entries.size(), 1u);
        EXPECT_EQ(r.entries[0].text, "1") << "the first definition wins";
    }
    {
        const auto r =
            TQStringsTable::parse("\"a\" \"1\";\n\"b\" = \"2\";\n\"c\" = \"3\"\n\"d\" = \"4\";");
        EXPECT_EQ(r.errors.size(), 2u) << "missing '=' and missing ';'";
        ASSERT_EQ(r.entries.size(), 2u) << "good statements after a bad one still load";
        EXPECT_EQ(r.entries[0].key, "b");
        EXPECT_EQ(r.entries[1].key, "d");
    }
    {
        const auto r = TQStringsTable::parse("\"a\" = \"open\n\"b\" = \"\\q\";\n/* never closed");
        EXPECT_EQ(r.errors.size(), 3u) << "unterminated text, unknown escape, unterminated comment";
        EXPECT_TRUE(r.entries.empty());
        EXPECT_EQ(r.errors[0].rfind("line 1:", 0), 0u) << r.errors[0];
    }
    {
        const auto r = TQStringsTable::parse("\"\" = \"x\";");
        EXPECT_EQ(r.errors.size(), 1u) << "empty key";
    }
}
