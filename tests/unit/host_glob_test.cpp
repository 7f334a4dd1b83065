// Host services: message formatting and delivery, case-blind comparison, boolean
// texts, file-name splitting and joining, parser-text copies.
#include "TestSupport.h"
#include "zrglob.h"

#include <climits>
#include <gtest/gtest.h>
#include <string>

namespace {

using zrtest::LogCapture;

// Formats through the narrow LogMessage and returns the delivered text.
template <typename... Args> std::string narrowFormat(const char* format, Args... args) {
    LogCapture log;
    ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, format, args...);
    return log.messages.size() == 1 ? log.messages[0].text : "<not one message>";
}

template <typename... Args> std::string wideFormat(const char16_t* format, Args... args) {
    ZrWString out;
    const int length = wsfmt(out, format, args...);
    EXPECT_EQ(length, out.length());
    return zrUtf16ToUtf8(out.view());
}

const char16_t* const kNullWide = nullptr;
const char* const kNullNarrow = nullptr;

// In narrow formats %S takes wide text, in wide ones narrow text.
TEST(HostGlob, FormattingSubstitutes) {
    const std::pair<std::string, const char*> cases[] = {
        {narrowFormat("a %s b", "Grüße"), "a Grüße b"},
        {narrowFormat("<%S>", u"wide\u00E9"), "<wideé>"},
        {narrowFormat("%s %S", kNullNarrow, kNullWide), "(null) (null)"},
        {narrowFormat("é %d €", 5), "é 5 €"},
        {wideFormat(u"[%s]", u"x\u00E9"), "[xé]"},
        {wideFormat(u"[%S]", "Grüße"), "[Grüße]"},
        {wideFormat(u"%s|%S", kNullWide, kNullNarrow), "(null)|(null)"},
        {narrowFormat("%03d %d %ld %u", -7, INT_MAX, LONG_MIN, UINT_MAX),
         "-07 2147483647 -9223372036854775808 4294967295"},
        {wideFormat(u"%d/%ld/%u", INT_MIN, 12L, 3u), "-2147483648/12/3"},
        {narrowFormat("%c%c%c", 'A', 0xE9, static_cast<char>(0xE9)), "Aéé"},
        {wideFormat(u"%c!", int(u'\u20AC')), "€!"},
        {narrowFormat("100%% of %d", 3), "100% of 3"},
        {wideFormat(u"%%s"), "%s"},
        {narrowFormat("%q %d", 5), "%q 5"}, // an unknown conversion takes no argument
        {narrowFormat("50%"), "50%"},
        {narrowFormat("[%10d][%-4s][%.2s][%.0s][%03s]", 42, "ab", "xyz", "x", "ab"),
         "[        42][ab  ][xy][][ ab]"},
    };
    for (const auto& [got, expected] : cases)
        EXPECT_EQ(got, expected);
}

TEST(HostLog, SinkGetsSeverityAndCodeStderrOtherwise) {
    LogCapture log;
    ZrGlob::LogMessage(ZR_SEV_ERROR, 19, u"%s", lgettext(u"wide"));
    ZrGlob::LogMessage(ZR_SEV_WARNING, 4, "narrow");
    EXPECT_EQ(log.lines(), "4 19 wide\n2 4 narrow\n");

    ZrLogSink previous = ZrGlob::SetLogSink(nullptr);
    ::testing::internal::CaptureStderr();
    ZrGlob::LogMessage(ZR_SEV_FATAL, 4, "broken %s", "doc");
    ZrGlob::LogMessage(7, 0, u"odd");
    const std::string err = ::testing::internal::GetCapturedStderr();
    ZrGlob::SetLogSink(previous);
    EXPECT_EQ(err, "fatal 4: broken doc\nseverity 7 0: odd\n");

    std::string words;
    for (int severity : {2, 4, 8, 512, 3})
        words += ZrGlob::SeverityWord(severity) + ";";
    EXPECT_EQ(words, "warning;error;fatal;notice;severity 3;");
}

TEST(HostGlob, CaseBlindCompareAndTruthWords) {
    EXPECT_EQ(ZrGlob::wcscmpi(u"FaLsE", u"false"), 0);
    EXPECT_EQ(ZrGlob::wcscmpi(u"\u00C9t\u00C9", u"\u00E9t\u00E9"), 0);
    // The multiplication and division signs are not a case pair.
    EXPECT_NE(ZrGlob::wcscmpi(u"\u00D7", u"\u00F7"), 0);
    EXPECT_EQ(ZrGlob::wcscmpi(nullptr, u""), 0);
    EXPECT_LT(ZrGlob::wcscmpi(u"abc", u"ABD"), 0);
    EXPECT_GT(ZrGlob::wcscmpi(u"abcd", u"ABC"), 0);
    EXPECT_LT(ZrGlob::wcscmpi(nullptr, u"a"), 0);

    // A value is true when, blanks aside and case-blind, it is one of the picture's true
    // words: its first, third, ... word.
    const char* const tf = "True.False.true.false."; // the last true word is empty
    for (const char* value : {"True", " true\t", "TRUE", ""})
        EXPECT_TRUE(ZrGlob::StrToBool(value, tf)) << value;
    for (const char* value : {"False", "1", static_cast<const char*>(nullptr)})
        EXPECT_FALSE(ZrGlob::StrToBool(value, tf)) << (value ? value : "(null)");
    EXPECT_TRUE(ZrGlob::StrToBool("1", "true.false.1.0"));
    EXPECT_FALSE(ZrGlob::StrToBool("0", "true.false.1.0"));
    EXPECT_TRUE(ZrGlob::StrToBool("false", "false.true"));
    EXPECT_FALSE(ZrGlob::StrToBool("true", "false.true"));
    EXPECT_TRUE(ZrGlob::StrToBool("True", nullptr));
    EXPECT_FALSE(ZrGlob::StrToBool("Tru", "True.False"));
    EXPECT_STREQ(ZrGlob::BoolToStr(true), "True");
    EXPECT_STREQ(ZrGlob::BoolToStr(false), "False");
}

// Each path with its directory, name and extension.
TEST(HostGlob, SepfileSplitsAndJoinsBack) {
    const std::pair<const char*, const char*> cases[] = {
        {"a/b.c.xsd", "a/|b.c|.xsd"},
        {"b.xsd", "|b|.xsd"},
        {"dir\\sub\\x.xsd", "dir\\sub\\|x|.xsd"},
        {"C:\\x/y\\z.xsd", "C:\\x/y\\|z|.xsd"},
        {"/abs/name", "/abs/|name|"},
        {"a.d/name", "a.d/|name|"},
        {"dir/.hidden", "dir/|.hidden|"},
        {"dir/x.", "dir/|x|."},
        {"dir/", "dir/||"},
        {"", "||"},
    };
    for (const auto& [whole, parts] : cases) {
        ZrString path(whole), name("junk"), ext("junk");
        ZrGlob::sepfile(path, name, ext);
        EXPECT_EQ(path.str() + "|" + name.str() + "|" + ext.str(), parts);
        ZrGlob::appndnam(path, name.c_str());
        ZrGlob::appndext(path, ext.c_str());
        EXPECT_STREQ(path.c_str(), whole) << "round trip";
    }
    // Joining adds the separator (the one the path uses) and the dot where missing.
    ZrString path("dir"), windows("C:\\dir"), empty;
    ZrGlob::appndnam(path, "x");
    ZrGlob::appndext(path, "xsd");
    ZrGlob::appndnam(windows, "x");
    ZrGlob::appndnam(empty, "x");
    ZrGlob::appndext(empty, nullptr);
    ZrGlob::appndext(empty, "");
    EXPECT_EQ(path.str() + " " + windows.str() + " " + empty.str(), "dir/x.xsd C:\\dir\\x x");
}

TEST(HostGlob, ParserTextCopies) {
    ZrWString out(u"old");
    ZrXmlUtils::XMLChToWchar(u" \t\r\n a b \n", out, true);
    EXPECT_EQ(out.str(), u"a b");
    ZrXmlUtils::XMLChToWchar(u" a ", out, false);
    EXPECT_EQ(out.str(), u" a ");
    ZrXmlUtils::XMLChToWchar(u" \n ", out, true);
    EXPECT_EQ(out.str(), u"");
    ZrXmlUtils::XMLChToWchar(nullptr, out, true);
    EXPECT_EQ(out.str(), u"");
    EXPECT_EQ(ZrXmlUtils::XMLChToWchar(u"x y").str(), u"x y");
}

} // namespace
