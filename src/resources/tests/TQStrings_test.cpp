#include "src/resources/TQStrings.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <regex>
#include <set>
#include <sstream>

namespace {

// The keys the framework's sources name: every quoted text of the framework that reads like a
// key of the table. A key removed or misspelt shows up on screen as the raw key.
std::set<BNString> keysNamedInSources() {
    std::set<BNString> keys;
    const std::regex key(
        R"re("((Undo|Anim Menu|Anim Tool Tip|Curve Editor|Mini Curve Editor) [^"\\]+)")re");
    const char* root = std::getenv("VCE_SOURCE_DIR");
    std::error_code noSources;
    for (const auto& file : std::filesystem::recursive_directory_iterator(
             std::filesystem::path(root ? root : ".") / "src", noSources)) {
        const std::string path = file.path().string(), ext = file.path().extension().string();
        if (path.find("/tests/") != path.npos || path.find("/resources/") != path.npos ||
            (ext != ".cpp" && ext != ".h"))
            continue;
        const std::string text = (std::ostringstream() << std::ifstream(file.path()).rdbuf()).str();
        for (std::sregex_iterator m(text.begin(), text.end(), key), end; m != end; ++m)
            keys.insert((*m)[1]);
    }
    return keys;
}

// A parse as text: "key=text" per entry, then the number of errors and the first one.
std::string parsed(std::string_view source) {
    const TQStringsTable::ParseResult r = TQStringsTable::parse(source);
    std::string out;
    for (const auto& e : r.entries)
        out += e.key + "=" + e.text + "@" + std::to_string(e.line) + " ";
    return out + "| " + std::to_string(r.errors.size()) +
           (r.errors.empty() ? "" : " " + r.errors[0]);
}

TEST(StringsTable, builtIn__everyKeyTheFrameworkNamesHasATextThatReadsRight) {
    const TQStringsTable::ParseResult table =
        TQStringsTable::parse(TQStringsTable::builtInSource());
    EXPECT_TRUE(table.errors.empty()) << table.errors.front();
    std::set<BNString> seen;
    for (const auto& entry : table.entries) {
        EXPECT_TRUE(seen.insert(entry.key).second && !entry.text.empty() && entry.text != entry.key)
            << entry.key;
        const bool undo =
            entry.key.rfind("Undo ", 0) == 0 || entry.key.find(" Undo ") != BNString::npos;
        EXPECT_FALSE(undo && entry.text.rfind("Undo", 0) == 0)
            << entry.key << " repeats the word the Edit menu adds";
    }
    EXPECT_EQ(TQLocalizedStringKeys(), std::vector<BNString>(seen.begin(), seen.end()))
        << "sorted, each once";
    const std::set<BNString> named = keysNamedInSources();
    ASSERT_GT(named.size(), 40u) << "the framework's sources were not found";
    for (const BNString& key : named)
        EXPECT_TRUE(TQHasLocalizedString(key)) << "missing key \"" << key << "\"";

    EXPECT_EQ(TQLocalizedString("Undo Move Keypoint"), "Move Keypoint");
    EXPECT_EQ(TQLocalizedString("No Such Key"), "No Such Key") << "a missing key answers itself";
    EXPECT_EQ(TQLocalizedString("Curve Editor Curve Set Copy").front(), ' ')
        << "the copy suffix is appended with no blank, so it must bring its own";
    EXPECT_TRUE(std::regex_match(TQLocalizedString("Curve Editor Coordinates Format"),
                                 std::regex("[^%]*%s[^%]*%[-0-9.]*f[^%]*")))
        << "the time text, then the value";
}

TEST(StringsTable, parse__escapesCommentsAndErrorsReportedAndSkipped) {
    EXPECT_EQ(parsed("/* header\n lines */\n\"a\" = \"say \\\"hi\\\"\";  // "
                     "end\n\"b\"=\"x\\\\y\\n\\tz\";\n"),
              "a=say \"hi\"@3 b=x\\y\n\tz@4 | 0");
    EXPECT_EQ(parsed("\"a\" = \"1\";\n\"a\" = \"2\";\n"),
              "a=1@1 | 1 line 2: duplicate key \"a\" (first defined at line 1)")
        << "the first wins";
    EXPECT_EQ(parsed("\"a\" \"1\";\n\"b\" = \"2\";\n\"c\" = \"3\"\n\"d\" = \"4\";").substr(0, 20),
              "b=2@2 d=4@4 | 2 line")
        << "a missing '=' or ';' is skipped, what follows still loads";
    EXPECT_EQ(parsed("\"a\" = \"open\n\"b\" = \"\\q\";\n/* never closed").substr(0, 11),
              "| 3 line 1:")
        << "an unterminated text, an unknown escape, an unterminated comment";
    EXPECT_EQ(parsed("\"\" = \"x\";").substr(0, 11), "| 1 line 1:") << "an empty key";
}

}  // namespace
