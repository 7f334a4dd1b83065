// zrdict's JSON string escaping and UTF-8 conversions against nlohmann-json, which
// wrote zrdict's output before, and the host's own conversion: the same bytes,
// ill-formed text included.
#include "TextOutput.h"
#include "zrstring.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <random>

namespace {

using Json = nlohmann::ordered_json;

// What nlohmann-json writes inside the quotes, replacing ill-formed UTF-8.
std::string referenceEscape(const std::string& text) {
    const std::string quoted = Json(text).dump(-1, ' ', false, Json::error_handler_t::replace);
    return quoted.substr(1, quoted.size() - 2);
}

template <class Text> std::string escaped(const Text& text) {
    std::string out;
    appendJsonEscaped(out, text);
    return out;
}

TEST(Escaping, MatchesTheDocumentLibraryAndTheHostsConversion) {
    // Escapes; two, three and four bytes and the highest code point; stray
    // continuations, bytes that lead nothing, overlong forms, an encoded surrogate,
    // beyond Unicode; sequences cut short by ASCII, a quote, a new lead, the end.
    for (const char* text :
         {"order_1 + x", "a\"b\\c/", "\b\t\n\f\r", "\x01\x1f\x0b", "\x7f",
          "\xc3\xa9\xe2\x82\xac\xf0\x9f\x98\x80", "\xf4\x8f\xbf\xbf", "a\x80z", "\x80\xbf",
          "\xc0\xaf\xf5\xff", "\xe0\x80\xaf", "\xed\xa0\x80", "\xf4\x90\x80\x80", "\xe2\x82z",
          "\xf0\x9f\x98\"", "\xe2\xc3\xa9", "ab\xf0\x9f\x98"})
        EXPECT_EQ(escaped(std::string(text)), referenceEscape(text))
            << ::testing::PrintToString(text);
    EXPECT_EQ(escaped(std::string("\0\x01\"\xe2\x82z", 6)), "\\u0000\\u0001\\\"\xef\xbf\xbdz");

    // Random bytes, weighted towards lead and continuation bytes so that
    // well-formed and ill-formed sequences of every length turn up.
    std::mt19937 random(17);
    const unsigned char kPool[] = {'a',  '"',  '\\', 0x00, 0x1f, 0x7f, 0x80, 0x8f, 0x90,
                                   0x9f, 0xa0, 0xbf, 0xc0, 0xc2, 0xdf, 0xe0, 0xe1, 0xed,
                                   0xef, 0xf0, 0xf1, 0xf4, 0xf5, 0xff, '\n'};
    for (int round = 0; round < 20000; ++round) {
        std::string text(random() % 12, '\0');
        for (char& c : text)
            c = static_cast<char>(kPool[random() % sizeof kPool]);
        ASSERT_EQ(escaped(text), referenceEscape(text)) << ::testing::PrintToString(text);
    }

    // 16-bit text from the plug-in goes straight to the output: the same bytes as
    // converting it first (the host's conversion) and escaping the result. A high
    // surrogate at the end, a low one alone, a high one before a whole pair or ASCII.
    using namespace std::string_view_literals;
    const std::u16string_view cases[] = {
        u"plain",   u"caf\u00e9 \u20ac \U0001F600", u"\0\t\x1f\"\\"sv, u"a\xD83D",
        u"\xDE00-", u"\xD83D\xD83D\xDE00",          u"\xD83Dx\xDE00",  u"\xFFFF\xFFFE"};
    for (const std::u16string_view text : cases) {
        const std::string viaHost = zrUtf16ToUtf8(text);
        EXPECT_EQ(escaped(text), referenceEscape(viaHost)) << ::testing::PrintToString(viaHost);
        std::string converted;
        zrAppendUtf8(converted, text);
        EXPECT_EQ(converted, viaHost);
    }

    random.seed(29);
    const char16_t kPool16[] = {u'a',   u'"',   0x01,   0x7f,   0x80,   0x7ff,  0x800,
                                0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFD, 0xFFFF};
    for (int round = 0; round < 5000; ++round) {
        std::u16string text(random() % 8, u'\0');
        for (char16_t& c : text)
            c = kPool16[random() % (sizeof kPool16 / sizeof kPool16[0])];
        ASSERT_EQ(escaped(text), referenceEscape(zrUtf16ToUtf8(text)));
    }
}

} // namespace
