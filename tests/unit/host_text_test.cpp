// Host text: UTF-8/UTF-16 conversion with broken input, the string classes'
// length-limited copies, and the charset-tagged string's search.
#include "zrstring.h"

#include <gtest/gtest.h>
#include <string>

namespace {

// Each maximal broken run becomes one U+FFFD; the byte that broke a sequence
// starts afresh.
TEST(HostText, ConversionsReplaceBrokenText) {
    const std::pair<std::string, std::u16string> cases[] = {
        {"abc", u"abc"},
        {"", u""},
        {"\xC3\xA9", u"\u00E9"},
        {"\xE2\x82\xAC", u"\u20AC"},
        {"\xF0\x9F\x98\x80", u"\U0001F600"},
        {"\xF4\x8F\xBF\xBF", u"\U0010FFFF"},
        {"a\x80z", u"a\uFFFDz"}, // a lone continuation
        {"\xFF", u"\uFFFD"},
        {"\xC0\x80", u"\uFFFD\uFFFD"},                     // overlong
        {"\xE0\x80\x80", u"\uFFFD\uFFFD\uFFFD"},           // overlong
        {"\xED\xA0\x80", u"\uFFFD\uFFFD\uFFFD"},           // an encoded surrogate
        {"\xF4\x90\x80\x80", u"\uFFFD\uFFFD\uFFFD\uFFFD"}, // beyond Unicode
        {"ab\xE2\x82", u"ab\uFFFD"},                       // cut short at the end
        {"\xE2\x82-", u"\uFFFD-"},                         // ... before ASCII
        {"\xF0\x9F\xC3\xA9", u"\uFFFD\u00E9"},             // ... before a lead byte
    };
    for (const auto& [utf8, utf16] : cases) {
        EXPECT_EQ(zrUtf8ToUtf16(utf8), utf16) << ::testing::PrintToString(utf8);
        ZrWString w;
        w.Assign(utf8.c_str(), ZR_CSET_FILESYSTEM, -1);
        EXPECT_EQ(w.str(), utf16);
    }
    const std::string text = "Grüße, 世界 \xF0\x9F\x98\x80 end";
    EXPECT_EQ(zrUtf16ToUtf8(zrUtf8ToUtf16(text)), text);

    // A lone surrogate becomes U+FFFD.
    const char16_t high = 0xD83D, low = 0xDE00;
    const std::pair<std::u16string, std::string> encodes[] = {
        {std::u16string{u'a', high}, "a\xEF\xBF\xBD"},
        {std::u16string{low, u'-'}, "\xEF\xBF\xBD-"},
        {std::u16string{high, u'x'}, "\xEF\xBF\xBDx"},
        {std::u16string{low, high}, "\xEF\xBF\xBD\xEF\xBF\xBD"},
    };
    for (const auto& [utf16, utf8] : encodes) {
        EXPECT_EQ(zrUtf16ToUtf8(utf16), utf8) << ::testing::PrintToString(utf8);
        ZrString s;
        s.Assign(utf16.c_str(), ZR_CSET_DEFAULT, static_cast<int>(utf16.size()));
        EXPECT_EQ(s.str(), utf8);
    }
}

TEST(HostText, LengthLimitedCopiesAndTaggedSearch) {
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
