// Field typing: pattern lengths, numeric limits, simple-type resolution.
#include "FieldTyping.h"
#include "TestSupport.h"

#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <random>
#include <sstream>
#include <string>

namespace {

using zrtest::LogCapture;
using zrtest::wide;

constexpr long kUnchanged = 777;

// A model of simple types, and a resolver over it.
struct Typing {
    SchemaModel model;
    BuiltinTypes builtins;
    BuildDepth depth;
    TypeResolver resolver{model, builtins, depth};
};

// A pattern in a buffer of exactly its length plus the terminator, so that the
// sanitizer catches any read past the end.
std::unique_ptr<char16_t[]> exactText(const std::string& text) {
    const std::u16string wideText = zrUtf8ToUtf16(text);
    auto buffer = std::make_unique<char16_t[]>(wideText.size() + 1);
    std::copy(wideText.begin(), wideText.end(), buffer.get());
    buffer[wideText.size()] = 0;
    return buffer;
}

long patternPrecision(const std::string& pattern) {
    ZrDType type;
    type.Precision(kUnchanged);
    auto text = exactText(pattern);
    dtPattern(type, text.get());
    return type.Precision();
}

// Patterns, each followed by the precision it gives ("-" for none): bounded ones,
// unbounded ones, malformed ones (the scan ends inside the text and counts what it
// read), and lengths that saturate at the largest 32-bit value.
constexpr const char* kPatterns = R"(
\d{3}-\d{4}                   8
[A-Z]{2}(ab|cde)?             5
ab|cdef                       4
ab|                           2
(a|bc)(d|efg)                 5
(ab){3}                       6
a{2,5}                        5
a{,8}                         8
a{5}                          5
ab{1}                         2
a?b?                          2
[[a]b]c                       2
\p{L}{3}                      3
\P{Lu}x                       2
\(\*                          2
((a|bb)c|d){2}                6
a+                            -
ab*                           -
x{2,}                         -
{0}                           -
abc|d+                        -
(a|b*)c                       -
|                             -
ab)c                          4
a){3}                         4
a|b))c                        4
a\                            2
\p{L                          1
a\p                           2
[abc                          1
(ab                           2
(ab|                          2
a(                            1
a{3                           -
a{                            -
a{x}                          -
((((                          -
a{99999999999}                2147483647
(a{99999999999}){99999999999} 2147483647
a{4294967296}bc               2147483647
)";

TEST(Pattern, Precision) {
    std::istringstream table(kPatterns);
    std::string pattern, precision;
    while (table >> pattern >> precision)
        EXPECT_EQ(patternPrecision(pattern), precision == "-" ? kUnchanged : std::stol(precision))
            << pattern;
    EXPECT_EQ(patternPrecision(std::string(100000, 'a')), 100000);
    // Deeper than 256 groups counts as unbounded.
    EXPECT_EQ(patternPrecision(std::string(200, '(') + "a" + std::string(200, ')')), 1);
    EXPECT_EQ(patternPrecision(std::string(300, '(') + "a" + std::string(300, ')')), kUnchanged);
    EXPECT_EQ(patternPrecision(std::string(100000, '(')), kUnchanged);
}

struct ScanCase {
    const char* text;
    long result;
    size_t consumed; // characters the cursor moved over
};

// Where each scan leaves the cursor; lengthSpec starts just past "{".
TEST(PatternScan, CursorStopsWhereTheScanEnds) {
    const ScanCase branches[] = {{"ab|cdef", 2, 3}, {"", 0, 0},          {"a*b", -1, 1},
                                 {"(x|yy)z", 3, 7}, {"a\\", 2, 2},       {"\\p{Lu", 1, 5},
                                 {"ab)c", 4, 4},    {"[a-z]{2}|q", 2, 9}};
    const ScanCase quantifiers[] = {{"5}", 5, 2},  {"2,8}", 8, 4}, {",8}", 8, 3}, {"3,}", -1, 3},
                                    {"0}", -1, 2}, {"}", -1, 1},   {"5", -1, 1},  {"5,x}", -1, 2},
                                    {"", -1, 0},   {"0,0}", 0, 4}};
    for (const ScanCase& c : branches) {
        auto text = exactText(c.text);
        const char16_t* cursor = text.get();
        EXPECT_EQ(branchLength(cursor), c.result) << c.text;
        EXPECT_EQ(size_t(cursor - text.get()), c.consumed) << c.text;
    }
    for (const ScanCase& c : quantifiers) {
        auto text = exactText(c.text);
        const char16_t* cursor = text.get();
        EXPECT_EQ(lengthSpec(cursor), c.result) << c.text;
        EXPECT_EQ(size_t(cursor - text.get()), c.consumed) << c.text;
    }
    const char16_t* huge = u"99999999999}";
    EXPECT_EQ(lengthSpec(huge), 2147483647);
    EXPECT_EQ(*huge, 0);
}

// Random patterns over the scan's metacharacters: every one ends, never reads past
// its terminator, and yields either no precision or a saturated positive one.
TEST(PatternScan, RandomPatternsEndInsideTheirText) {
    const std::string alphabet = "()[]{}\\|*+?,0123456789pPa";
    std::mt19937 random(20240611);
    for (int round = 0; round < 20000; ++round) {
        std::string pattern(random() % 40, ' ');
        for (char& c : pattern)
            c = alphabet[random() % alphabet.size()];
        SCOPED_TRACE(pattern);
        const long precision = patternPrecision(pattern);
        EXPECT_TRUE(precision == kUnchanged || (precision >= 1 && precision <= 2147483647));
    }
}

// Limits on a built-in type ("@" for its attribute variant), each "type minInclusive
// maxInclusive minExclusive maxExclusive digits" with "-" for none, and the digits
// they give its precision and length: a lower bound alone gives none, as do types
// whose values carry no digit count.
constexpr const char* kLimits = R"(
int                0            999         -           -    3
int                -            -           -           1000 3
int                -            -           -           0    1
int                -50          9           -           -    2
int                -2147483648  0           -           -    10
int                -            0           -2147483648 -    10
long               -99999999999 0           -           -    10
long               -            99999999999 -           -    10
int                -            5           99          -    3
int                5            9           99999       -    1
int                -            99          -           -    2
int                -            1e5         -           -    1
short              -            123.456     -           -    3
int@               0            99          -           -    2
normalizedString   0            999         -           -    3
token              0            999         -           -    3
Character          0            12345       -           -    5
positiveInteger    1            100         -           -    3
int                1            -           -           -    -
nonNegativeInteger -            -           0           -    -
int                -            abc         -           -    -
int                0            0           -           -    -
string             0            999         -           -    -
string@            0            999         -           -    -
decimal            0            999         -           -    -
date               0            999         -           -    -
gYear              0            9999        -           -    -
hexBinary          0            999         -           -    -
)";

TEST(Limits, Digits) {
    const BuiltinTypes builtins;
    auto digits = [&](std::string name, const std::string(&limits)[4]) {
        if (name.back() == '@')
            name = name.substr(0, name.size() - 1) + " attribute";
        ZrDType type = *builtins.builtinByName(wide(name).view());
        type.Precision(kUnchanged);
        type.Length(kUnchanged);
        std::u16string text[4];
        for (int i = 0; i < 4; ++i)
            text[i] = limits[i] == "-" ? u"" : wide(limits[i]).str();
        dtLimits(type, text[0].c_str(), text[1].c_str(), text[2].c_str(), text[3].c_str());
        EXPECT_EQ(type.Length(), type.Precision());
        return type.Precision();
    };
    std::istringstream table(kLimits);
    std::string name, limits[4], expected;
    while (table >> name >> limits[0] >> limits[1] >> limits[2] >> limits[3] >> expected)
        EXPECT_EQ(digits(name, limits), expected == "-" ? kUnchanged : std::stol(expected))
            << name << " " << limits[1];
    // Leading blanks and a sign are skipped.
    EXPECT_EQ(digits("int", {"-", "  +42", "-", "-"}), 2);
}

// Simple types placed in the model by hand, resolved by lookupType. A type is
// written "name base facet=value ...", enum= giving the longest enumeration.
SimpleTypeDef simpleType(const std::string& text) {
    std::istringstream in(text);
    std::string name, base, facet;
    in >> name >> base;
    SimpleTypeDef type;
    type.name = wide(name).view();
    type.baseName = wide(base).view();
    const std::map<std::string, ZrName SimpleTypeDef::*> members = {
        {"length", &SimpleTypeDef::length},    {"maxLength", &SimpleTypeDef::maxLength},
        {"scale", &SimpleTypeDef::scale},      {"precision", &SimpleTypeDef::precision},
        {"min", &SimpleTypeDef::minInclusive}, {"max", &SimpleTypeDef::maxInclusive},
        {"pattern", &SimpleTypeDef::pattern}};
    while (in >> facet) {
        const size_t eq = facet.find('=');
        const std::string key = facet.substr(0, eq), value = facet.substr(eq + 1);
        if (key == "enum")
            type.maxEnumLength = std::stoi(value);
        else
            type.*members.at(key) = wide(value).view();
    }
    return type;
}

// Simple types (";" between them) resolved by looking up t: the data type it gives,
// "alias length/precision/decimals", or "failed" and the messages that say why.
const std::pair<const char*, const char*> kResolves[] = {
    {"t string maxLength=20", "string 20/0/0"},
    {"t string length=10 maxLength=20", "string 10/0/0"},
    {"t string length=10 maxLength=20 enum=7", "string 7/0/0"},
    {"t int min=0 max=999", "int 3/3/0"},
    {"t int precision=5 min=0 max=999", "int 3/3/0"},
    {"t int min=0 max=999 pattern=\\d{6}", "int 3/6/0"},
    {"t int precision=9 pattern=[0-9]{4}", "int 0/4/0"},
    {"t int min=0 max=999 enum=5", "int 5/3/0"},
    {"t decimal min=0 max=999", "decimal 0/16/2"},
    {"t decimal scale=3 precision=8", "decimal 0/8/3"},
    {"t decimal scale=99999", "decimal 0/16/32767"},
    {"t anyType maxLength=12", "string 12/0/0"},
    {"t anySimpleType maxLength=5", "string 5/0/0"},
    {"t int pattern=a+", "int 0/10/0"},
    // A derived type starts from its resolved base.
    {"code string maxLength=5; t code pattern=[A-Z]{3}", "string 5/3/0"},
    {"", "failed\n"},
    {"t nothing", "failed\n4 0 Error resolving simple type t\n"},
    {"t", "failed\n4 0 Error resolving simple type t\n"},
    {"t b; b nothing", "failed\n4 0 Error resolving simple type b\n"
                       "4 0 Error resolving simple type t\n"},
    {"t t", "failed\n4 0 Circular base type chain at simple type t\n"
            "4 0 Error resolving simple type t\n"
            "4 0 Error resolving simple type t\n"},
    {"t a; a b; b a", "failed\n4 0 Circular base type chain at simple type a\n"
                      "4 0 Error resolving simple type a\n"
                      "4 0 Error resolving simple type b\n"
                      "4 0 Error resolving simple type a\n"
                      "4 0 Error resolving simple type t\n"}};

TEST(ResolveSimpleType, DerivesDataTypeOrSaysWhyNot) {
    for (const auto& [types, expected] : kResolves) {
        SCOPED_TRACE(types);
        Typing access;
        std::istringstream list(types);
        for (std::string type; std::getline(list, type, ';');)
            access.model.simpleTypes.push_back(simpleType(type));
        // A type is resolved once and kept, so a later change of its facets is not
        // seen; nothing failed is kept, so a second lookup fails again, saying why.
        for (int round = 0; round < 2; ++round) {
            LogCapture log;
            ZrDType type;
            type.Precision(kUnchanged);
            std::string got = "failed\n";
            if (access.resolver.lookupType(u"t", u"", type))
                got = std::string(type.Alias()) + " " + std::to_string(type.Length()) + "/" +
                      std::to_string(type.Precision()) + "/" + std::to_string(type.DecimalPlaces());
            else
                EXPECT_EQ(type.Precision(), kUnchanged);
            EXPECT_EQ(got + log.lines(), expected);
            for (SimpleTypeDef& simple : access.model.simpleTypes)
                simple.maxLength = u"99";
        }
    }
}

// A base chain longer than the nesting bound fails instead of exhausting the stack;
// one at the bound resolves.
TEST(ResolveSimpleType, LongBaseChainsAreBounded) {
    for (int length : {1000, 1001}) {
        Typing access;
        for (int i = 0; i < length; ++i) {
            const std::string base = i + 1 < length ? "t" + std::to_string(i + 1) : "string";
            access.model.simpleTypes.push_back(simpleType("t" + std::to_string(i) + " " + base));
        }
        LogCapture log;
        ZrDType type;
        EXPECT_EQ(access.resolver.lookupType(u"t0", u"", type), length == 1000);
        if (length > 1000) {
            ASSERT_FALSE(log.messages.empty());
            EXPECT_EQ(log.messages[0].text, "Schema nesting deeper than 1000 levels at t1000");
            EXPECT_EQ(log.messages.back().text, "Error resolving simple type t0");
        }
    }
}

} // namespace
