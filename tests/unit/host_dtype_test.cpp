// Host data types: every built-in definition string parses into the class word,
// alias, usage and starting length/precision/decimals it spells out.
#include "ZrXmlSchemaBrowser.h"
#include "zrdtype.h"

#include <gtest/gtest.h>
#include <string>

namespace {

struct DefinitionRow {
    int index;
    const char* typeClass;
    const char* alias;
    short usage;
    long length;
    long precision;
    short decimals;
    const char* picture; // null when the definition has none
};

// What each entry of the built-in list must read back as.
const DefinitionRow kRows[] = {
    {0, "Text", "Character", 0, 0, 0, 0, nullptr},
    {1, "Text", "Attribute", 256, 0, 0, 0, nullptr},
    {2, "Structure", "Record", 2, 0, 0, 0, nullptr},
    {3, "Text", "Unquoted", 3, 0, 0, 0, nullptr},
    {4, "Text", "Unquoted attribute", 259, 0, 0, 0, nullptr},
    {5, "Text", "string", 16, 0, 0, 0, nullptr},
    {6, "Boolean", "boolean", 17, 0, 0, 0, "true.false.1.0"},
    {7, "Number", "float", 18, 0, 16, 2, nullptr},
    {8, "Number", "double", 19, 0, 16, 2, nullptr},
    {9, "Decimal", "decimal", 20, 0, 16, 2, nullptr},
    {10, "DateTime", "dateTime", 21, 0, 0, 0, "yyyy-mm-ddTH24:MM:SS"},
    {11, "DateTime", "duration", 22, 0, 0, 0, "yyyy-mm-ddTH24:MM"},
    {12, "DateTime", "gYearMonth", 23, 0, 0, 0, "yyyy-mm"},
    {13, "DateTime", "gYear", 24, 0, 0, 0, "yyyy"},
    {14, "DateTime", "gMonthDay", 59, 0, 0, 0, "mm-dd"},
    {15, "DateTime", "gMonth", 60, 0, 0, 0, "mm"},
    {16, "DateTime", "gDay", 61, 0, 0, 0, "dd"},
    {17, "Text", "binary", 30, 0, 0, 0, nullptr},
    {18, "Text", "anyURI", 31, 0, 0, 0, nullptr},
    {19, "Text", "ID", 32, 0, 0, 0, nullptr},
    {20, "Text", "IDREF", 33, 0, 0, 0, nullptr},
    {21, "Text", "ENTITY", 34, 0, 0, 0, nullptr},
    {22, "Text", "NOTATION", 35, 0, 0, 0, nullptr},
    {23, "Text", "language", 36, 0, 0, 0, nullptr},
    {24, "Text", "IDREFS", 37, 0, 0, 0, nullptr},
    {25, "Text", "ENTITIES", 38, 0, 0, 0, nullptr},
    {26, "Text", "NMTOKEN", 39, 0, 0, 0, nullptr},
    {27, "Text", "NMTOKENS", 40, 0, 0, 0, nullptr},
    {28, "Text", "Name", 41, 0, 0, 0, nullptr},
    {29, "Text", "QName", 42, 0, 0, 0, nullptr},
    {30, "Text", "NCName", 43, 0, 0, 0, nullptr},
    {31, "Number", "integer", 44, 0, 10, 0, nullptr},
    {32, "Number", "nonPositiveInteger", 45, 0, 10, 0, nullptr},
    {33, "Number", "negativeInteger", 46, 0, 10, 0, nullptr},
    {34, "Number", "long", 47, 0, 10, 0, nullptr},
    {35, "Number", "int", 48, 0, 10, 0, nullptr},
    {36, "Number", "short", 49, 0, 5, 0, nullptr},
    {37, "Number", "byte", 50, 0, 3, 0, nullptr},
    {38, "Number", "nonNegativeInteger", 51, 0, 10, 0, nullptr},
    {39, "Number", "unsignedLong", 52, 0, 10, 0, nullptr},
    {40, "Number", "unsignedInt", 53, 0, 10, 0, nullptr},
    {41, "Number", "unsignedShort", 54, 0, 5, 0, nullptr},
    {42, "Number", "unsignedByte", 55, 0, 3, 0, nullptr},
    {43, "Number", "positiveInteger", 56, 10, 0, 0, nullptr},
    {44, "Date", "date", 57, 0, 0, 0, "yyyy-mm-dd"},
    {45, "Time", "time", 58, 0, 0, 0, "HH:MM:SS.TTT"},
    {46, "Text", "normalizedString", 62, 0, 0, 0, nullptr},
    {47, "Text", "token", 63, 0, 0, 0, nullptr},
    {48, "Text", "hexBinary", 64, 0, 0, 0, nullptr},
    {49, "Text", "base64Binary", 65, 0, 0, 0, nullptr},
    {50, "Text", "string attribute", 272, 0, 0, 0, nullptr},
    {51, "Boolean", "boolean attribute", 273, 0, 0, 0, "true.false.1.0"},
    {52, "Number", "float attribute", 274, 0, 16, 2, nullptr},
    {53, "Number", "double attribute", 275, 0, 16, 2, nullptr},
    {54, "Decimal", "decimal attribute", 276, 0, 16, 2, nullptr},
    {55, "DateTime", "duration attribute", 277, 0, 0, 0, "yyyy-mm-ddTH24:MM:SS"},
    {56, "DateTime", "dateTime attribute", 278, 0, 0, 0, "yyyy-mm-ddTH24:MM"},
    {57, "DateTime", "gYearMonth attribute", 279, 0, 0, 0, "yyyy-mm"},
    {58, "DateTime", "gYear attribute", 280, 0, 0, 0, "yyyy"},
    {59, "Text", "binary attribute", 286, 0, 0, 0, nullptr},
    {60, "Text", "anyURI attribute", 287, 0, 0, 0, nullptr},
    {61, "Text", "ID attribute", 288, 0, 0, 0, nullptr},
    {62, "Text", "IDREF attribute", 289, 0, 0, 0, nullptr},
    {63, "Text", "ENTITY attribute", 290, 0, 0, 0, nullptr},
    {64, "Text", "NOTATION attribute", 291, 0, 0, 0, nullptr},
    {65, "Text", "language attribute", 292, 0, 0, 0, nullptr},
    {66, "Text", "IDREFS attribute", 293, 0, 0, 0, nullptr},
    {67, "Text", "ENTITIES attribute", 294, 0, 0, 0, nullptr},
    {68, "Text", "NMTOKEN attribute", 295, 0, 0, 0, nullptr},
    {69, "Text", "NMTOKENS attribute", 296, 0, 0, 0, nullptr},
    {70, "Text", "Name attribute", 297, 0, 0, 0, nullptr},
    {71, "Text", "QName attribute", 298, 0, 0, 0, nullptr},
    {72, "Text", "NCName attribute", 299, 0, 0, 0, nullptr},
    {73, "Number", "integer attribute", 300, 0, 10, 0, nullptr},
    {74, "Number", "nonPositiveInteger attribute", 301, 0, 10, 0, nullptr},
    {75, "Number", "negativeInteger attribute", 302, 0, 10, 0, nullptr},
    {76, "Number", "long attribute", 303, 0, 10, 0, nullptr},
    {77, "Number", "int attribute", 304, 0, 10, 0, nullptr},
    {78, "Number", "short attribute", 305, 0, 5, 0, nullptr},
    {79, "Number", "byte attribute", 306, 0, 3, 0, nullptr},
    {80, "Number", "nonNegativeInteger attribute", 307, 0, 10, 0, nullptr},
    {81, "Number", "unsignedLong attribute", 308, 0, 10, 0, nullptr},
    {82, "Number", "unsignedInt attribute", 309, 0, 10, 0, nullptr},
    {83, "Number", "unsignedShort attribute", 310, 0, 5, 0, nullptr},
    {84, "Number", "unsignedByte attribute", 311, 0, 3, 0, nullptr},
    {85, "Number", "positiveInteger attribute", 312, 0, 10, 0, nullptr},
    {86, "Date", "date attribute", 313, 0, 0, 0, "yyyy-mm-dd"},
    {87, "Time", "time attribute", 314, 0, 0, 0, "HH:MM:SS.TTT"},
    {88, "DateTime", "gMonthDay attribute", 315, 0, 0, 0, "mm-dd"},
    {89, "DateTime", "gMonth attribute", 316, 0, 0, 0, "mm"},
    {90, "DateTime", "gDay attribute", 317, 0, 0, 0, "dd"},
    {91, "Text", "normalizedString attribute", 318, 0, 0, 0, nullptr},
    {92, "Text", "token attribute", 319, 0, 0, 0, nullptr},
    {93, "Text", "hexBinary attribute", 320, 0, 0, 0, nullptr},
    {94, "Text", "base64Binary attribute", 321, 0, 0, 0, nullptr},
};

class BuiltinDefinition : public ::testing::TestWithParam<DefinitionRow> {};

TEST_P(BuiltinDefinition, ReadsBackItsItems) {
    const auto& row = GetParam();
    const char* text = kBuiltinTypeDefinitions[row.index];
    ASSERT_NE(text, nullptr);
    ZrDType type;
    ASSERT_TRUE(type.Define(text));
    EXPECT_STREQ(type.TypeClass(), row.typeClass);
    EXPECT_STREQ(type.Alias(), row.alias);
    EXPECT_EQ(type.Usage(), row.usage);
    EXPECT_EQ(type.Length(), row.length);
    EXPECT_EQ(type.Precision(), row.precision);
    EXPECT_EQ(type.DecimalPlaces(), row.decimals);
    EXPECT_FALSE(type.Nulls());
    EXPECT_STREQ(type.DefinitionText(), text);
    if (row.picture)
        EXPECT_STREQ(type.Item("picture"), row.picture);
    else
        EXPECT_EQ(type.Item("picture"), nullptr);
}

INSTANTIATE_TEST_SUITE_P(Host, BuiltinDefinition, ::testing::ValuesIn(kRows),
                         [](const auto& i) { return "Entry" + std::to_string(i.param.index); });

TEST(HostDType, ListHasExactlyTheRowsAbove) {
    EXPECT_EQ(std::size(kRows), static_cast<size_t>(kBuiltinTypeCount));
    EXPECT_EQ(kBuiltinTypeDefinitions[kBuiltinTypeCount], nullptr);
}

TEST(HostDType, KeepsEveryItemInOrder) {
    ZrDType type;
    ASSERT_TRUE(type.Define(
        "Number;alias='a b.c';signed=false;display;maxlength=32; precision = 7 ;usage=300"));
    const auto* def = type.Parsed();
    ASSERT_NE(def, nullptr);
    EXPECT_EQ(def->typeClass, "Number");
    const std::vector<std::pair<std::string, std::string>> items = {
        {"alias", "a b.c"},  {"signed", "false"}, {"display", ""},
        {"maxlength", "32"}, {"precision", "7"},  {"usage", "300"}};
    EXPECT_EQ(def->items, items);
    EXPECT_EQ(def->bare, (std::vector<bool>{false, false, true, false, false, false}));
    EXPECT_STREQ(type.Item("display"), "");
    EXPECT_EQ(type.Item("decimal"), nullptr);
    EXPECT_EQ(type.Precision(), 7);
}

TEST(HostDType, QuotedValueKeepsSeparators) {
    ZrDType type;
    ASSERT_TRUE(type.Define("Text;alias='x;y';usage=5"));
    EXPECT_STREQ(type.Alias(), "x;y");
    EXPECT_EQ(type.Usage(), 5);
}

TEST(HostDType, RefusesEmptyDefinitionAndKeepsType) {
    ZrDType type;
    EXPECT_STREQ(type.TypeClass(), "");
    EXPECT_STREQ(type.Alias(), "");
    EXPECT_STREQ(type.DefinitionText(), "");
    EXPECT_EQ(type.Item("alias"), nullptr);

    ASSERT_TRUE(type.Define("Text;alias=string;usage=16"));
    type.Length(12);
    EXPECT_FALSE(type.Define(nullptr));
    EXPECT_FALSE(type.Define(""));
    EXPECT_STREQ(type.Alias(), "string");
    EXPECT_EQ(type.Length(), 12);
}

TEST(HostDType, RedefineResetsSettersAndCopiesAreIndependent) {
    ZrDType type;
    ASSERT_TRUE(type.Define(kBuiltinTypeDefinitions[7]));
    type.Length(40);
    type.Precision(3);
    type.DecimalPlaces(1);
    type.Nulls(true);
    type.Usage(999);
    type.Alias(nullptr);
    EXPECT_STREQ(type.Alias(), "");

    ZrDType copy = type;
    copy.Length(1);
    copy.Alias("changed");
    EXPECT_EQ(type.Length(), 40);
    EXPECT_STREQ(type.Alias(), "");
    EXPECT_EQ(copy.Parsed(), type.Parsed());

    ASSERT_TRUE(type.Define(kBuiltinTypeDefinitions[7]));
    EXPECT_EQ(type.Length(), 0);
    EXPECT_EQ(type.Precision(), 16);
    EXPECT_EQ(type.DecimalPlaces(), 2);
    EXPECT_FALSE(type.Nulls());
    EXPECT_EQ(type.Usage(), 18);
    EXPECT_STREQ(type.Alias(), "float");
}

TEST(HostDType, OutOfRangeNumbersStartAtZero) {
    ZrDType type;
    ASSERT_TRUE(type.Define("Number;usage=70000;length=99999999999999999999999;decimal=x"));
    EXPECT_EQ(type.Usage(), 0);
    EXPECT_EQ(type.Length(), 0);
    EXPECT_EQ(type.DecimalPlaces(), 0);
}

} // namespace
