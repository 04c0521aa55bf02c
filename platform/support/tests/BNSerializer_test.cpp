#include <gtest/gtest.h>

#include <bit>
#include <cfloat>
#include <cmath>
#include <limits>
#include <memory>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "platform/support/BNSerializerReadStream.h"
#include "platform/support/BNSerializerWriteStream.h"
#include "tests/support/TextBaseline.h"

namespace {

// The error's text for a failure message, empty when there is none.
std::string textOf(const std::optional<BNSerializerError>& error) {
    return error ? error->text() : std::string();
}

// A small two-level document: a shelf of books, each with notes.
enum : uint32_t { kShelf = 10, kBook, kNote };
enum : uint32_t { kTitle = 1, kPrice, kPublished, kCopies, kInPrint };

const BNScopeEntry kShelfTable[] = {{"shelf", kShelf, 0},
                                    {"book", kBook, 0},
                                    {"title", kBook, kTitle},
                                    {"price", kBook, kPrice},
                                    {"published", kBook, kPublished},
                                    {"copies", kBook, kCopies},
                                    {"inprint", kBook, kInPrint},
                                    {nullptr, 0, 0}};
const BNScope kShelfScope(kShelfTable);

const BNScopeEntry kBookTable[] = {{"note", kNote, 0}, {nullptr, 0, 0}};
const BNScope kBookScope(kBookTable);

struct Book final : BNSerializer {
    BNString title;
    double price = 0.0;
    CMTime published = kCMTimeInvalid;
    uint32_t copies = 0;
    bool inPrint = false;
    std::vector<BNString> notes;

    // Everything a book holds: the price by its bits, the time by every field.
    auto fields() const {
        return std::tuple(title, std::bit_cast<uint64_t>(price), published.value,
                          published.timescale, published.flags, published.epoch, copies, inPrint,
                          notes);
    }

    void writeHeader(BNSerializerWriteStream& s, bool) override {
        s.pushScope(kShelfScope);
        s.openElement(kBook);
        s.setAttributeString(kTitle, title);
        s.setAttributeDouble(kPrice, price);
        s.setAttributeTime(kPublished, published);
        s.setAttributeUInt32(kCopies, copies);
        s.setAttributeBool(kInPrint, inPrint);
        s.popScope();
    }
    void writeBody(BNSerializerWriteStream& s, bool, bool, bool) override {
        s.pushScope(kBookScope);
        for (const BNString& note : notes) {
            s.openElement(kNote);
            s.writeString(note);
            s.closeElement();
        }
        s.popScope();
    }
    bool parseBegin(BNSerializerReadStream& s) override {
        s.pushScope(kBookScope);
        return true;
    }
    bool parseEnd(BNSerializerReadStream&) override { return true; }
    bool parseElement(BNSerializerReadStream& s, BNStreamElement& e) override {
        if (e.elementId() == kNote) s.getAsString(e, notes.emplace_back());
        return false;
    }
};

struct Shelf final : BNSerializer {
    std::vector<std::unique_ptr<Book>> books;
    std::vector<BNString> seen;  // every element name handed to this handler
    bool skipChildren = false;

    void writeHeader(BNSerializerWriteStream& s, bool) override {
        s.pushScope(kShelfScope);
        s.openElement(kShelf);
        s.popScope();
    }
    void writeBody(BNSerializerWriteStream& s, bool, bool, bool) override {
        s.pushScope(kShelfScope);
        for (const auto& book : books) {
            book->writeHeader(s, false);
            book->writeBody(s, false, true, true);
            s.closeElement();
        }
        s.popScope();
    }
    bool parseBegin(BNSerializerReadStream& s) override {
        s.pushScope(kShelfScope);
        return false;
    }
    bool parseEnd(BNSerializerReadStream&) override { return false; }
    bool parseElement(BNSerializerReadStream& s, BNStreamElement& e) override {
        seen.emplace_back(e.name());
        if (e.elementId() != kBook) return false;
        auto book = std::make_unique<Book>();
        s.getAttributeAsString(e, kTitle, book->title);
        e.getAttributeAsDouble(kPrice, book->price);
        e.getAttributeAsTime(kPublished, book->published);
        s.getAttributeAsUInt32(e, kCopies, book->copies);
        s.getAttributeAsBool(e, kInPrint, book->inPrint);
        s.pushHandler(book.get());
        books.push_back(std::move(book));
        return skipChildren;
    }
};

std::string write(Shelf& shelf) {
    std::string out;
    BNStringSink sink(out);
    BNSerializerWriteStream stream(sink);
    shelf.writeHeader(stream, false);
    shelf.writeBody(stream, false, true, true);
    stream.closeElement();
    const auto error = stream.finish();
    EXPECT_FALSE(error) << textOf(error);
    return out;
}

std::optional<BNSerializerError> read(std::string_view text, Shelf& shelf) {
    BNSerializerReadStream stream;
    return stream.read(text, shelf);
}

TEST(BNSerializerTest, roundTrip__textNumbersAndTimesComeBackExactly) {
    // Times with the rounded flag and with an epoch; titles with 2, 3 and 4-byte sequences.
    const std::vector<CMTime> times = {
        CMTimeMake(1001, 30000),
        CMTimeMake(-7, 262144),
        kCMTimeInvalid,
        kCMTimePositiveInfinity,
        kCMTimeNegativeInfinity,
        kCMTimeIndefinite,
        CMTime{5, 3, kCMTimeFlags_Valid | kCMTimeFlags_HasBeenRounded, 0},
        CMTime{INT64_MIN, 1, kCMTimeFlags_Valid, 2}};
    const std::vector<BNString> titles = {
        "Plain",      "Tom & Jerry <\"quoted\"> 'single'",         "tab\there\nline\r\nend",
        "  padded  ", "caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\xAC", ""};

    Shelf shelf;
    for (const double price : {0.1, 1.0 / 3.0, -0.0, 5e-324, DBL_MAX, -DBL_MIN, 1e21,
                               123456789.0125, HUGE_VAL, -HUGE_VAL, 2.2250738585072009e-308}) {
        const size_t i = shelf.books.size();
        auto book = std::make_unique<Book>();
        book->title = titles[i % titles.size()];
        book->price = price;
        book->published = times[i % times.size()];
        book->copies = i == 0 ? UINT32_MAX : static_cast<uint32_t>(i);
        book->inPrint = i % 2 == 1;
        book->notes = {"note <" + std::to_string(i) + ">", "  kept inner  space  "};
        shelf.books.push_back(std::move(book));
    }
    const std::string text = write(shelf);

    Shelf back;
    const auto error = read(text, back);
    ASSERT_FALSE(error) << textOf(error);
    ASSERT_EQ(back.books.size(), shelf.books.size());
    for (size_t i = 0; i < shelf.books.size(); ++i) {
        // Content is stripped at its ends: the inner blanks stay, the outer ones go.
        shelf.books[i]->notes[1] = "kept inner  space";
        EXPECT_EQ(back.books[i]->fields(), shelf.books[i]->fields()) << "book " << i;
    }
}

TEST(BNSerializerTest, writer__alwaysWritesWellFormedUtf8) {
    Shelf shelf;
    auto book = std::make_unique<Book>();
    // A control character, a stray continuation byte, a truncated sequence, an overlong
    // form, an encoded surrogate and U+FFFE: none of them may reach the file.
    book->title =
        "a\x01"
        "b\x80"
        "c\xE2\x82"
        "d\xC0\xAF"
        "e\xED\xA0\x80"
        "f\xEF\xBF\xBE";
    book->notes = {"\x1B[0m"};
    shelf.books.push_back(std::move(book));

    Shelf back;
    const auto error = read(write(shelf), back);
    ASSERT_FALSE(error) << "the reader refused what the writer wrote: " << textOf(error);
    ASSERT_EQ(back.books.size(), 1u);
    const std::string r = "\xEF\xBF\xBD";
    EXPECT_EQ(back.books[0]->title,
              "a" + r + "b" + r + "c" + r + r + "d" + r + r + "e" + r + r + r + "f" + r + r + r);
    EXPECT_EQ(back.books[0]->notes, std::vector<BNString>{r + "[0m"});
}

TEST(BNSerializerTest, reader__handlersScopesAndSkippedChildren) {
    const std::string doc =
        "<shelf>"
        "  <unknown><book title='inside an unknown element'/></unknown>"
        "  <book title='A' price='2.5'>"
        "    <note>first</note>"
        "    <book title='a book name is no element of the book scope'/>"
        "    <note>second<note>nested</note></note>"
        "  </book>"
        "  <book title='B'><note>seen only without skipping</note></book>"
        "</shelf>";
    Shelf shelf;
    ASSERT_FALSE(read(doc, shelf));
    // The unknown element reaches the handler with id 0; its child is still the shelf's.
    ASSERT_EQ(shelf.books.size(), 3u);
    EXPECT_EQ(shelf.books[0]->title, "inside an unknown element");
    EXPECT_EQ(shelf.books[1]->title, "A");
    EXPECT_EQ(shelf.books[1]->price, 2.5);
    EXPECT_EQ(shelf.books[1]->notes, (std::vector<BNString>{"first", "second", "nested"}))
        << "inside a book only the book's scope names elements; content is the text "
           "before the first child";
    EXPECT_EQ(shelf.books[2]->notes, std::vector<BNString>{"seen only without skipping"});
    EXPECT_EQ(shelf.seen, (std::vector<BNString>{"shelf", "unknown", "book", "book", "book"}));

    Shelf skipping;
    skipping.skipChildren = true;
    ASSERT_FALSE(read(doc, skipping));
    ASSERT_EQ(skipping.books.size(), 3u);
    EXPECT_TRUE(skipping.books[2]->notes.empty()) << "a true answer skips the children";
}

TEST(BNSerializerTest, reader__damagedDocumentsFailWithTheirPlace) {
    std::string deep;
    for (int i = 0; i < 300; ++i) deep += "<shelf>";
    const std::string laughs =
        "<?xml version=\"1.0\"?>\n"
        "<!DOCTYPE shelf [<!ENTITY a \"aaaaaaaaaa\"><!ENTITY b \"&a;&a;&a;&a;&a;&a;&a;\">]>\n"
        "<shelf><book title=\"&b;&b;&b;&b;&b;&b;\"/></shelf>";
    // Each document's error, with its line and column, is recorded in baselines/damaged.txt.
    const std::pair<const char*, std::string> cases[] = {
        {"empty", ""},
        {"truncated", "<shelf>\n  <book title='A'>"},
        {"mismatched tag", "<shelf>\n<book></shelf>"},
        {"two roots", "<shelf/><shelf/>"},
        {"unbound entity", "<shelf>&nope;</shelf>"},
        {"billion laughs", laughs},
        {"external entity", "<!DOCTYPE shelf SYSTEM \"file:///etc/passwd\"><shelf/>"},
        {"deep nesting", deep},
        {"not a number", "<shelf>\n <book price='cheap'/></shelf>"},
        {"double out of range", "<shelf><book price='1e999'/></shelf>"},
        {"uint32 out of range", "<shelf><book copies='4294967296'/></shelf>"},
        {"negative count", "<shelf><book copies='-1'/></shelf>"},
        {"padded number", "<shelf><book copies=' 1'/></shelf>"},
        {"zero timescale", "<shelf><book published='10/0'/></shelf>"},
        {"bad time", "<shelf><book published='10/3/1'/></shelf>"},
        {"bad bool", "<shelf><book inprint='maybe'/></shelf>"},
        {"duplicate attribute", "<shelf><book title='a' title='b'/></shelf>"}};
    std::string record;
    for (const auto& [what, doc] : cases) {
        Shelf shelf;
        const auto error = read(doc, shelf);
        const BNSerializerError e = error.value_or(BNSerializerError{});
        record += std::string(what) + (error ? ": " : ": read without complaint") +
                  std::to_string(e.line) + ":" + std::to_string(e.column) + " " + textOf(error) +
                  "\n";
    }
    EXPECT_TRUE(
        tests_support::matchesBaseline("damaged", record, "platform/support/tests/baselines"));
}

TEST(BNSerializerTest, writer__misuseIsReportedNotWritten) {
    auto expectRefused = [](const char* message, auto&& body) {
        std::string out;
        BNStringSink sink(out);
        BNSerializerWriteStream stream(sink);
        stream.pushScope(kShelfScope);
        body(stream);
        EXPECT_NE(textOf(stream.finish()).find(message), std::string::npos) << message;
    };
    expectRefused("after", [](BNSerializerWriteStream& s) {
        s.openElement(kBook);
        s.writeString("text");
        s.setAttributeBool(kInPrint, true);
    });
    expectRefused("element id 12", [](BNSerializerWriteStream& s) { s.openElement(kNote); });
    expectRefused("both content and children", [](BNSerializerWriteStream& s) {
        s.openElement(kShelf);
        s.openElement(kBook);
        s.closeElement();
        s.writeBool(true);
    });
}

}  // namespace
