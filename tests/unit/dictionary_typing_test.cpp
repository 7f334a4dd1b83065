// Field typing: pattern lengths, numeric limits, simple-type resolution.
#include "FieldTyping.h"
#include "TestSupport.h"
#include "dictionary_support.h"

#include <cstdint>
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

struct PatternCase {
    const char* label;
    std::string pattern;
    long precision; // kUnchanged: no precision set
};

// Failures name the row rather than dump its bytes.
void PrintTo(const PatternCase& row, std::ostream* os) { *os << row.label; }

const PatternCase kPatterns[] = {
    {"DigitsWithDash", R"(\d{3}-\d{4})", 8},
    {"ClassAndOptionalGroup", "[A-Z]{2}(ab|cde)?", 5},
    {"LongestTopLevelBranch", "ab|cdef", 4},
    {"PlusIsUnbounded", "a+", kUnchanged},
    {"StarIsUnbounded", "ab*", kUnchanged},
    {"OpenRangeIsUnbounded", "x{2,}", kUnchanged},
    {"ZeroRepeatIsUnbounded", "{0}", kUnchanged},
    {"UnboundedLaterBranch", "abc|d+", kUnchanged},
    {"UnboundedInsideGroup", "(a|b*)c", kUnchanged},
    {"EmptyBranchOnly", "|", kUnchanged},
    {"TrailingBar", "ab|", 2},
    {"GroupTakesLongestAlternative", "(a|bc)(d|efg)", 5},
    {"QuantifiedGroup", "(ab){3}", 6},
    {"RangeTakesHigh", "a{2,5}", 5},
    {"RangeWithoutLow", "a{,8}", 8},
    {"ExactRepeat", "a{5}", 5},
    {"RepeatOfOneAddsNothing", "ab{1}", 2},
    {"OptionalCountsOnce", "a?b?", 2},
    {"NestedClassIsOneCharacter", "[[a]b]c", 2},
    {"PropertyEscape", R"(\p{L}{3})", 3},
    {"NegatedPropertyEscape", R"(\P{Lu}x)", 2},
    {"EscapedMetacharacter", R"(\(\*)", 2},
    {"NestedGroups", "((a|bb)c|d){2}", 6},
    // Malformed patterns: the scan ends inside the text and counts what it read.
    {"StrayCloseCountsAsCharacter", "ab)c", 4},
    {"StrayCloseThenQuantifier", "a){3}", 4},
    {"StrayCloseInLaterBranch", "a|b))c", 4},
    {"BackslashAtEnd", "a\\", 2},
    {"UnfinishedPropertyEscape", R"(\p{L)", 1},
    {"PropertyEscapeWithoutBrace", R"(a\p)", 2},
    {"UnclosedClass", "[abc", 1},
    {"UnclosedGroup", "(ab", 2},
    {"UnclosedGroupAfterBar", "(ab|", 2},
    {"OpenGroupAtEnd", "a(", 1},
    {"UnfinishedQuantifier", "a{3", kUnchanged},
    {"BraceAtEnd", "a{", kUnchanged},
    {"QuantifierWithoutDigits", "a{x}", kUnchanged},
    {"OnlyOpenGroups", "((((", kUnchanged},
    // Overflow: lengths saturate at the largest 32-bit value.
    {"HugeRepeat", "a{99999999999}", 2147483647},
    {"HugeRepeatOfHugeGroup", "(a{99999999999}){99999999999}", 2147483647},
    {"HugeRepeatThenMore", "a{4294967296}bc", 2147483647},
    {"LongPattern", std::string(100000, 'a'), 100000},
    // Nesting: deeper than 256 groups counts as unbounded.
    {"DeepButBounded", std::string(200, '(') + "a" + std::string(200, ')'), 1},
    {"TooDeep", std::string(300, '(') + "a" + std::string(300, ')'), kUnchanged},
    {"TooDeepUnclosed", std::string(100000, '('), kUnchanged},
};

class Pattern : public ::testing::TestWithParam<PatternCase> {};

TEST_P(Pattern, Precision) {
    EXPECT_EQ(patternPrecision(GetParam().pattern), GetParam().precision);
}

INSTANTIATE_TEST_SUITE_P(Dictionary, Pattern, ::testing::ValuesIn(kPatterns),
                         [](const auto& row) { return std::string(row.param.label); });

struct ScanCase {
    const char* text;
    long result;
    size_t consumed; // characters the cursor moved over
};

TEST(PatternScan, BranchLengthStopsAfterItsBar) {
    Typing access;
    const ScanCase cases[] = {
        {"ab|cdef", 2, 3}, {"", 0, 0},       {"a*b", -1, 1}, {"(x|yy)z", 3, 7},
        {"a\\", 2, 2},     {"\\p{Lu", 1, 5}, {"ab)c", 4, 4}, {"[a-z]{2}|q", 2, 9},
    };
    for (const ScanCase& c : cases) {
        SCOPED_TRACE(c.text);
        auto text = exactText(c.text);
        const char16_t* cursor = text.get();
        EXPECT_EQ(branchLength(cursor), c.result);
        EXPECT_EQ(size_t(cursor - text.get()), c.consumed);
    }
}

TEST(PatternScan, LengthSpec) {
    Typing access;
    // The cursor starts just past "{".
    const ScanCase cases[] = {
        {"5}", 5, 2},
        {"2,8}", 8, 4},
        {",8}", 8, 3},
        {"3,}", -1, 3},
        {"0}", -1, 2},
        {"}", -1, 1},
        {"5", -1, 1},
        {"5,x}", -1, 2},
        {"", -1, 0},
        {"0,0}", 0, 4},
        {"99999999999}", 2147483647, 12},
    };
    for (const ScanCase& c : cases) {
        SCOPED_TRACE(c.text);
        auto text = exactText(c.text);
        const char16_t* cursor = text.get();
        EXPECT_EQ(lengthSpec(cursor), c.result);
        EXPECT_EQ(size_t(cursor - text.get()), c.consumed);
    }
}

// Random patterns over the scan's metacharacters: every one ends, never reads past
// its terminator, and yields either no precision or a saturated positive one.
TEST(PatternScan, RandomPatternsEndInsideTheirText) {
    Typing access;
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

struct LimitCase {
    const char* label;
    const char* typeName; // built-in type whose usage decides
    bool attribute;
    const char* minInclusive;
    const char* maxInclusive;
    const char* minExclusive;
    const char* maxExclusive;
    long digits; // kUnchanged: precision and length untouched
};

void PrintTo(const LimitCase& row, std::ostream* os) { *os << row.label; }

const LimitCase kLimits[] = {
    {"ZeroTo999", "int", false, "0", "999", "", "", 3},
    {"MaxExclusive1000", "int", false, "", "", "", "1000", 3},
    {"MaxExclusiveZero", "int", false, "", "", "", "0", 1},
    {"SignTakesNoDigit", "int", false, "-50", "9", "", "", 2},
    {"SmallestInt", "int", false, "-2147483648", "0", "", "", 10},
    {"SmallestIntExclusive", "int", false, "", "0", "-2147483648", "", 10},
    {"ClampedBelowRange", "long", false, "-99999999999", "0", "", "", 10},
    {"ClampedAboveRange", "long", false, "", "99999999999", "", "", 10},
    {"MinExclusiveAddsOne", "int", false, "", "5", "99", "", 3},
    {"InclusiveBeatsExclusive", "int", false, "5", "9", "99999", "", 1},
    {"LowerBoundAlone", "int", false, "1", "", "", "", kUnchanged},
    {"LowerExclusiveAlone", "nonNegativeInteger", false, "", "", "0", "", kUnchanged},
    {"UpperBoundAlone", "int", false, "", "99", "", "", 2},
    {"ExponentIgnored", "int", false, "", "1e5", "", "", 1},
    {"LeadingBlanksAndSign", "int", false, "", "  +42", "", "", 2},
    {"NoNumberIsZero", "int", false, "", "abc", "", "", kUnchanged},
    {"ZeroBothSides", "int", false, "0", "0", "", "", kUnchanged},
    {"DecimalPointStops", "short", false, "", "123.456", "", "", 3},
    {"IntAttribute", "int", true, "0", "99", "", "", 2},
    {"StringUntouched", "string", false, "0", "999", "", "", kUnchanged},
    {"StringAttributeUntouched", "string", true, "0", "999", "", "", kUnchanged},
    {"DecimalUntouched", "decimal", false, "0", "999", "", "", kUnchanged},
    {"DateUntouched", "date", false, "0", "999", "", "", kUnchanged},
    {"HexBinaryUntouched", "hexBinary", false, "0", "999", "", "", kUnchanged},
    {"NormalizedStringCounted", "normalizedString", false, "0", "999", "", "", 3},
    {"TokenCounted", "token", false, "0", "999", "", "", 3},
    {"CharacterCounted", "Character", false, "0", "12345", "", "", 5},
    {"PositiveIntegerCounted", "positiveInteger", false, "1", "100", "", "", 3},
};

class Limits : public ::testing::TestWithParam<LimitCase> {};

TEST_P(Limits, Digits) {
    const LimitCase& c = GetParam();
    const BuiltinTypes builtins;
    ZrDType type = *builtins.builtinByName(wide(c.typeName).view());
    if (c.attribute)
        type.Usage(short(type.Usage() + 256));
    type.Precision(kUnchanged);
    type.Length(kUnchanged);
    dtLimits(type, wide(c.minInclusive).c_str(), wide(c.maxInclusive).c_str(),
             wide(c.minExclusive).c_str(), wide(c.maxExclusive).c_str());
    EXPECT_EQ(type.Precision(), c.digits);
    EXPECT_EQ(type.Length(), c.digits);
}

INSTANTIATE_TEST_SUITE_P(Dictionary, Limits, ::testing::ValuesIn(kLimits),
                         [](const auto& row) { return std::string(row.param.label); });

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

struct ResolveCase {
    const char* label;
    const char* type; // named t
    const char* alias;
    long length;
    long precision;
    short decimals;
};

void PrintTo(const ResolveCase& row, std::ostream* os) { *os << row.label; }

const ResolveCase kResolves[] = {
    {"MaxLength", "t string maxLength=20", "string", 20, 0, 0},
    {"LengthBeatsMaxLength", "t string length=10 maxLength=20", "string", 10, 0, 0},
    {"EnumerationBeatsLengths", "t string length=10 maxLength=20 enum=7", "string", 7, 0, 0},
    {"LimitsOnInt", "t int min=0 max=999", "int", 3, 3, 0},
    {"LimitsBeatPrecisionFacet", "t int precision=5 min=0 max=999", "int", 3, 3, 0},
    {"PatternBeatsLimits", R"(t int min=0 max=999 pattern=\d{6})", "int", 3, 6, 0},
    {"PatternBeatsPrecisionFacet", "t int precision=9 pattern=[0-9]{4}", "int", 0, 4, 0},
    {"EnumerationBeatsLimits", "t int min=0 max=999 enum=5", "int", 5, 3, 0},
    {"DecimalKeepsPrecisionOverLimits", "t decimal min=0 max=999", "decimal", 0, 16, 2},
    {"PrecisionAndScale", "t decimal scale=3 precision=8", "decimal", 0, 8, 3},
    {"ScaleClampedToShort", "t decimal scale=99999", "decimal", 0, 16, 32767},
    {"AnyTypeBaseIsString", "t anyType maxLength=12", "string", 12, 0, 0},
    {"AnySimpleTypeBaseIsString", "t anySimpleType maxLength=5", "string", 5, 0, 0},
    {"UnusablePatternLeavesPrecision", "t int pattern=a+", "int", 0, 10, 0},
};

class Resolve : public ::testing::TestWithParam<ResolveCase> {};

TEST_P(Resolve, DerivesDataType) {
    const ResolveCase& c = GetParam();
    Typing access;
    access.model.simpleTypes.push_back(simpleType(c.type));
    LogCapture log;
    ZrDType type;
    ASSERT_TRUE(access.resolver.lookupType(u"t", u"", type));
    EXPECT_STREQ(type.Alias(), c.alias);
    EXPECT_EQ(type.Length(), c.length);
    EXPECT_EQ(type.Precision(), c.precision);
    EXPECT_EQ(type.DecimalPlaces(), c.decimals);
    EXPECT_EQ(log.lines(), "");
}

INSTANTIATE_TEST_SUITE_P(Dictionary, Resolve, ::testing::ValuesIn(kResolves),
                         [](const auto& row) { return std::string(row.param.label); });

TEST(ResolveSimpleType, DerivedTypeStartsFromItsResolvedBase) {
    Typing access;
    access.model.simpleTypes.push_back(simpleType("code string maxLength=5"));
    access.model.simpleTypes.push_back(simpleType("shortCode code pattern=[A-Z]{3}"));
    ZrDType type;
    ASSERT_TRUE(access.resolver.lookupType(u"shortCode", u"", type));
    EXPECT_STREQ(type.Alias(), "string");
    EXPECT_EQ(type.Length(), 5);
    EXPECT_EQ(type.Precision(), 3);
}

TEST(ResolveSimpleType, ResolvesOncePerType) {
    Typing access;
    access.model.simpleTypes.push_back(simpleType("t string maxLength=20"));
    ZrDType first;
    ASSERT_TRUE(access.resolver.lookupType(u"t", u"", first));
    // A later change of the facets is not seen: the first derivation is reused.
    access.model.simpleTypes[0].maxLength = u"99";
    ZrDType second;
    ASSERT_TRUE(access.resolver.lookupType(u"t", u"", second));
    EXPECT_EQ(second.Length(), 20);
}

TEST(ResolveSimpleType, NamespaceMustMatchUnlessGenerated) {
    Typing access;
    SimpleTypeDef named = simpleType("t string maxLength=20");
    named.nameNs = u"urn:a";
    access.model.simpleTypes.push_back(named);
    access.model.simpleTypes.push_back(simpleType("anon3 string maxLength=30"));
    ZrDType type;
    EXPECT_FALSE(access.resolver.lookupType(u"t", u"urn:b", type));
    ASSERT_TRUE(access.resolver.lookupType(u"t", u"urn:a", type));
    EXPECT_EQ(type.Length(), 20);
    ASSERT_TRUE(access.resolver.lookupType(u"anon3", u"urn:anything", type));
    EXPECT_EQ(type.Length(), 30);
    // A built-in alias answers whatever namespace the name carries.
    ASSERT_TRUE(access.resolver.lookupType(u"int", u"urn:anything", type));
    EXPECT_EQ(type.Usage(), 48);
}

struct FailureCase {
    const char* label;
    std::vector<const char*> types;
    const char* sought;
    const char* messages;
};

void PrintTo(const FailureCase& row, std::ostream* os) { *os << row.label; }

const FailureCase kFailures[] = {
    {"UnknownName", {}, "nothing", ""},
    {"MissingBase", {"t nothing"}, "t", "4 0 Error resolving simple type t\n"},
    {"EmptyBase", {"t"}, "t", "4 0 Error resolving simple type t\n"},
    {"MissingBaseTwoLevelsDown",
     {"a b", "b nothing"},
     "a",
     "4 0 Error resolving simple type b\n"
     "4 0 Error resolving simple type a\n"},
    {"SelfBase",
     {"a a"},
     "a",
     "4 0 Circular base type chain at simple type a\n"
     "4 0 Error resolving simple type a\n"
     "4 0 Error resolving simple type a\n"},
    {"CycleBelowTheTypeSought",
     {"top a", "a b", "b a"},
     "top",
     "4 0 Circular base type chain at simple type a\n"
     "4 0 Error resolving simple type a\n"
     "4 0 Error resolving simple type b\n"
     "4 0 Error resolving simple type a\n"
     "4 0 Error resolving simple type top\n"},
};

class ResolveFailure : public ::testing::TestWithParam<FailureCase> {};

TEST_P(ResolveFailure, FailsAndLeavesTypeUnresolved) {
    const FailureCase& c = GetParam();
    Typing access;
    for (const char* f : c.types)
        access.model.simpleTypes.push_back(simpleType(f));
    LogCapture log;
    ZrDType type;
    type.Precision(kUnchanged);
    EXPECT_FALSE(access.resolver.lookupType(wide(c.sought).c_str(), u"", type));
    EXPECT_EQ(type.Precision(), kUnchanged);
    EXPECT_EQ(log.lines(), c.messages);
    // Nothing failed is kept: a second lookup fails again, saying why.
    LogCapture again;
    EXPECT_FALSE(access.resolver.lookupType(wide(c.sought).c_str(), u"", type));
    EXPECT_EQ(again.lines(), c.messages);
}

INSTANTIATE_TEST_SUITE_P(Dictionary, ResolveFailure, ::testing::ValuesIn(kFailures),
                         [](const auto& row) { return std::string(row.param.label); });

TEST(ResolveSimpleType, ComplexTypeIsRefused) {
    Typing access;
    ComplexTypeDef complex;
    complex.name = u"c";
    access.model.complexTypes.push_back(complex);
    access.model.simpleTypes.push_back(simpleType("t c"));
    LogCapture log;
    ZrDType type;
    EXPECT_FALSE(access.resolver.lookupType(u"c", u"", type));
    EXPECT_FALSE(access.resolver.lookupType(u"t", u"", type));
    EXPECT_EQ(log.lines(), "512 0 Oops, lookupType asked to lookup a complex type\n"
                           "512 0 Oops, lookupType asked to lookup a complex type\n"
                           "4 0 Error resolving simple type t\n");
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

// Field types of whole schemas, read the way a host reads them.
struct SchemaTypingCase {
    const char* label;
    const char* body;
    const char* records;
};

void PrintTo(const SchemaTypingCase& row, std::ostream* os) { *os << row.label; }

const SchemaTypingCase kSchemaTyping[] = {
    {"LowerBoundsAloneKeepTheWidth",
     R"(<xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="count"><xs:simpleType><xs:restriction base="xs:int">
            <xs:minInclusive value="1"/></xs:restriction></xs:simpleType></xs:element>
          <xs:element name="size"><xs:simpleType><xs:restriction base="xs:nonNegativeInteger">
            <xs:minExclusive value="0"/></xs:restriction></xs:simpleType></xs:element>
          <xs:element name="month"><xs:simpleType><xs:restriction base="xs:int">
            <xs:minInclusive value="1"/><xs:maxInclusive value="12"/>
          </xs:restriction></xs:simpleType></xs:element>
          <xs:element name="small"><xs:simpleType><xs:restriction base="xs:int">
            <xs:maxExclusive value="100"/></xs:restriction></xs:simpleType></xs:element>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): count int(48) 0/10/0, size nonNegativeInteger(51) 0/10/0, month int(48) 2/2/0, "
     "small int(48) 2/2/0\n"},

    // The facets narrow the text of the restricting type only.
    {"SimpleContentRestrictionFacetsNarrowTheText",
     R"(<xs:simpleType name="code"><xs:restriction base="xs:string">
          <xs:maxLength value="10"/></xs:restriction></xs:simpleType>
        <xs:complexType name="Short"><xs:simpleContent><xs:restriction base="code">
          <xs:maxLength value="2"/></xs:restriction></xs:simpleContent></xs:complexType>
        <xs:complexType name="Kind"><xs:simpleContent><xs:restriction base="xs:string">
          <xs:enumeration value="small"/><xs:enumeration value="medium"/>
        </xs:restriction></xs:simpleContent></xs:complexType>
        <xs:complexType name="Amount"><xs:simpleContent><xs:extension base="code">
          <xs:attribute name="cur" type="xs:string"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:complexType name="Small"><xs:simpleContent><xs:restriction base="Amount">
          <xs:maxLength value="5"/></xs:restriction></xs:simpleContent></xs:complexType>
        <xs:complexType name="Tiny"><xs:simpleContent><xs:restriction base="Small">
          <xs:maxLength value="3"/></xs:restriction></xs:simpleContent></xs:complexType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="short" type="Short"/>
          <xs:element name="kind" type="Kind"/>
          <xs:element name="long" type="code"/>
          <xs:element name="amount" type="Amount"/>
          <xs:element name="small" type="Small"/>
          <xs:element name="tiny" type="Tiny"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): short Record(2) notnull, kind Record(2) notnull, long string(16) 10/0/0, "
     "amount Record(2) notnull, small Record(2) notnull, tiny Record(2) notnull\n"
     "short(0): short string(16) 2/0/0\n"
     "kind(0): kind string(16) 6/0/0\n"
     "amount(0): amount string(16) 10/0/0, cur string attribute(272)\n"
     "small(0): small string(16) 5/0/0, cur string attribute(272)\n"
     "tiny(0): tiny string(16) 3/0/0, cur string attribute(272)\n"},

    // A declaration's own anonymous type is its type, whatever the schema names its
    // types: here the generated names would be anon0 (r's type) and anon1.
    {"SchemaNamesDoNotCaptureAnonymousTypes",
     R"(<xs:complexType name="anon0"><xs:sequence>
          <xs:element name="wrong" type="xs:string"/></xs:sequence></xs:complexType>
        <xs:simpleType name="anon1"><xs:restriction base="xs:string">
          <xs:maxLength value="3"/></xs:restriction></xs:simpleType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="inline"><xs:simpleType><xs:restriction base="xs:int">
            <xs:maxInclusive value="99999"/></xs:restriction></xs:simpleType></xs:element>
          <xs:element name="named" type="anon1"/>
          <xs:element name="box" type="anon0"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): inline int(48) 5/5/0, named string(16) 3/0/0, box Record(2) notnull\n"
     "box(0): wrong string(16)\n"},
};

class SchemaTyping : public ::testing::TestWithParam<SchemaTypingCase> {};

TEST_P(SchemaTyping, FieldTypes) {
    const zrtest::SchemaRead read = zrtest::readInline(GetParam().body);
    EXPECT_TRUE(read.ok) << read.messages;
    EXPECT_EQ(read.records, GetParam().records);
    EXPECT_EQ(read.messages, "");
}

INSTANTIATE_TEST_SUITE_P(Dictionary, SchemaTyping, ::testing::ValuesIn(kSchemaTyping),
                         [](const auto& row) { return std::string(row.param.label); });

} // namespace
