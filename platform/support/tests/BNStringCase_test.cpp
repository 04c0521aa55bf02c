#include "platform/support/BNStringCase.h"

#include <gtest/gtest.h>

namespace {

TEST(BNStringCaseTest, lowercase__everyCharacterByItsOwnMappingAndForeignBytesKept) {
    struct Case {
        const char* text;
        const char* lower;
    };
    const Case cases[] = {
        {"", ""},
        {"Curve SET 2", "curve set 2"},
        {"ÀÉÎÕÜ", "àéîõü"},                        // two-byte forms
        {"ĀĂĄ", "āăą"},                            // a run of every second code point
        {"ΣΑΣ", "σασ"},                            // each character on its own: no final sigma
        {"Ω", "ω"},                                // U+2126 OHM SIGN, three bytes
        {"İ", "i\xCC\x87"},                        // one character becomes two
        {"\xF0\x90\x90\x80", "\xF0\x90\x90\xA8"},  // U+10400, beyond the 16-bit plane
        {"A\xFF"
         "B\xC3",
         "a\xFF"
         "b\xC3"},                   // not UTF-8: kept byte for byte
        {"\xC0\x81Z", "\xC0\x81z"},  // an overlong form is no character
    };
    for (const Case& c : cases) EXPECT_EQ(BNLowercaseString(c.text), c.lower) << c.text;
}

TEST(BNStringCaseTest, firstUTF16Unit__aCharacterNotAByte) {
    EXPECT_EQ(BNFirstUTF16Unit(""), 0);
    EXPECT_EQ(BNFirstUTF16Unit("u"), 'u');
    EXPECT_EQ(BNFirstUTF16Unit("é"), 0x00E9);
    EXPECT_EQ(BNFirstUTF16Unit("€uro"), 0x20AC);
    EXPECT_EQ(BNFirstUTF16Unit("\xF0\x90\x90\xA8"), 0xD801) << "the high surrogate";
    EXPECT_EQ(BNFirstUTF16Unit("\xFF"), 0xFFFD);
}

}  // namespace
