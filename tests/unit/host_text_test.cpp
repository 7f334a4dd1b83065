// Host text: UTF-8/UTF-16 conversion with broken input, the string classes'
// length-limited copies, and the charset-tagged string's search.
#include "zrstring.h"

#include <gtest/gtest.h>
#include <string>

namespace {

struct DecodeCase {
    const char* name;
    std::string utf8;
    std::u16string utf16;
};

// Each maximal broken run becomes one U+FFFD; the byte that broke a sequence
// starts afresh.
const DecodeCase kDecodeCases[] = {
    {"Ascii", "abc", u"abc"},
    {"Empty", "", u""},
    {"TwoBytes", "\xC3\xA9", u"\u00E9"},
    {"ThreeBytes", "\xE2\x82\xAC", u"\u20AC"},
    {"FourBytes", "\xF0\x9F\x98\x80", u"\U0001F600"},
    {"LargestScalar", "\xF4\x8F\xBF\xBF", u"\U0010FFFF"},
    {"LoneContinuation", "a\x80z", u"a\uFFFDz"},
    {"InvalidLeadFF", "\xFF", u"\uFFFD"},
    {"OverlongTwoBytes", "\xC0\x80", u"\uFFFD\uFFFD"},
    {"OverlongThreeBytes", "\xE0\x80\x80", u"\uFFFD\uFFFD\uFFFD"},
    {"EncodedSurrogate", "\xED\xA0\x80", u"\uFFFD\uFFFD\uFFFD"},
    {"BeyondUnicode", "\xF4\x90\x80\x80", u"\uFFFD\uFFFD\uFFFD\uFFFD"},
    {"TruncatedAtEnd", "ab\xE2\x82", u"ab\uFFFD"},
    {"TruncatedBeforeAscii",
     "\xE2\x82"
     "A",
     u"\uFFFDA"},
    {"TruncatedBeforeLead", "\xF0\x9F\xC3\xA9", u"\uFFFD\u00E9"},
};

class Utf8Decode : public ::testing::TestWithParam<DecodeCase> {};

TEST_P(Utf8Decode, ReplacesBrokenSequences) {
    const auto& c = GetParam();
    EXPECT_EQ(zrUtf8ToUtf16(c.utf8), c.utf16);
    ZrWString w;
    w.Assign(c.utf8.c_str(), ZR_CSET_FILESYSTEM, -1);
    EXPECT_EQ(w.str(), c.utf16);
}

INSTANTIATE_TEST_SUITE_P(Host, Utf8Decode, ::testing::ValuesIn(kDecodeCases),
                         [](const auto& i) { return std::string(i.param.name); });

struct EncodeCase {
    const char* name;
    std::u16string utf16;
    std::string utf8;
};

const EncodeCase kEncodeCases[] = {
    {"Ascii", u"abc", "abc"},
    {"Bmp", u"\u00E9\u20AC", "\xC3\xA9\xE2\x82\xAC"},
    {"Pair", u"\U0001F600", "\xF0\x9F\x98\x80"},
    {"LoneHighAtEnd", std::u16string(u"a") + char16_t(0xD83D), "a\xEF\xBF\xBD"},
    {"LoneLow", std::u16string(1, char16_t(0xDE00)) + u"b",
     "\xEF\xBF\xBD"
     "b"},
    {"HighThenAscii", std::u16string(1, char16_t(0xD83D)) + u"x", "\xEF\xBF\xBDx"},
    {"LowThenHigh", std::u16string{char16_t(0xDC00), char16_t(0xD800)}, "\xEF\xBF\xBD\xEF\xBF\xBD"},
};

class Utf16Encode : public ::testing::TestWithParam<EncodeCase> {};

TEST_P(Utf16Encode, ReplacesLoneSurrogates) {
    const auto& c = GetParam();
    EXPECT_EQ(zrUtf16ToUtf8(c.utf16), c.utf8);
    ZrString s;
    s.Assign(c.utf16.c_str(), ZR_CSET_DEFAULT, static_cast<int>(c.utf16.size()));
    EXPECT_EQ(s.str(), c.utf8);
}

INSTANTIATE_TEST_SUITE_P(Host, Utf16Encode, ::testing::ValuesIn(kEncodeCases),
                         [](const auto& i) { return std::string(i.param.name); });

TEST(HostText, ValidTextRoundTrips) {
    const std::string text = "Grüße, 世界 \xF0\x9F\x98\x80 end";
    EXPECT_EQ(zrUtf16ToUtf8(zrUtf8ToUtf16(text)), text);
}

TEST(HostText, LengthLimitedCopiesStopAtTerminator) {
    ZrWString w;
    EXPECT_EQ(w.Assign("abcdef", ZR_CSET_DEFAULT, 3).str(), u"abc");
    // A length past the terminator must not read beyond it.
    EXPECT_EQ(w.Assign("ab\0cd", ZR_CSET_DEFAULT, 5).str(), u"ab");
    EXPECT_EQ(w.Assign(nullptr, ZR_CSET_DEFAULT, -1).str(), u"");
    EXPECT_EQ(w.CopyN(u"abcdef", 4, 0).str(), u"abcd");
    EXPECT_EQ(w.CopyN(u"ab", 10, 0).str(), u"ab");
    EXPECT_EQ(w.CopyN(u"ab", 0, 0).str(), u"");
    EXPECT_EQ(w.CopyN(nullptr, 3, 0).str(), u"");

    ZrString s;
    EXPECT_EQ(s.Assign(u"abcdef", ZR_CSET_DEFAULT, 2).str(), "ab");
    EXPECT_EQ(s.Assign(nullptr, ZR_CSET_DEFAULT, -1).str(), "");
    const ZrWString fromNull(static_cast<const ZrWChar*>(nullptr));
    EXPECT_TRUE(fromNull.empty());
    EXPECT_EQ(fromNull.c_str()[0], u'\0');
}

TEST(HostText, TaggedStringFindAndSubstr) {
    // The parser-diagnostic use: keep what follows "Message:".
    const ZrXString message(u"Fatal at 3 Message: bad tag", -1);
    const ZrXString marker("Message:", ZR_CSET_DEFAULT);
    const long at = message.find(marker, 0);
    ASSERT_EQ(at, 11);
    EXPECT_EQ(std::u16string(message.substr(at + 8).w_str()), u" bad tag");

    EXPECT_EQ(message.find(marker, at + 1), ZrXString::npos);
    EXPECT_EQ(message.find(marker, 1000), ZrXString::npos);
    EXPECT_EQ(message.find(ZrXString(""), message.size()), message.size());
    EXPECT_EQ(message.substr(1000).size(), 0);
    EXPECT_EQ(std::u16string(message.substr(0, 5).w_str()), u"Fatal");
    EXPECT_EQ(std::u16string(ZrXString(u"abcdef", 3).w_str()), u"abc");
    EXPECT_EQ(ZrXString(static_cast<const char*>(nullptr)).size(), 0);
    EXPECT_EQ(std::u16string(ZrXString("\xC3\xA9").w_str()), u"\u00E9");
}

} // namespace
