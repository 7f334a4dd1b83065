// The built-in type table: every entry's class, alias and usage, and the two lookups.
#include "TestSupport.h"

#include <gtest/gtest.h>
#include <string>

namespace {

using zrtest::wide;

struct Entry {
    const char* typeClass;
    const char* alias;
    short usage;
};

// The table as hosts know it, entry by entry.
const Entry kExpected[kBuiltinTypeCount] = {
    {"Text", "Character", 0},
    {"Text", "Attribute", 256},
    {"Structure", "Record", 2},
    {"Text", "Unquoted", 3},
    {"Text", "Unquoted attribute", 259},
    {"Text", "string", 16},
    {"Boolean", "boolean", 17},
    {"Number", "float", 18},
    {"Number", "double", 19},
    {"Decimal", "decimal", 20},
    {"DateTime", "dateTime", 21},
    {"DateTime", "duration", 22},
    {"DateTime", "gYearMonth", 23},
    {"DateTime", "gYear", 24},
    {"DateTime", "gMonthDay", 59},
    {"DateTime", "gMonth", 60},
    {"DateTime", "gDay", 61},
    {"Text", "binary", 30},
    {"Text", "anyURI", 31},
    {"Text", "ID", 32},
    {"Text", "IDREF", 33},
    {"Text", "ENTITY", 34},
    {"Text", "NOTATION", 35},
    {"Text", "language", 36},
    {"Text", "IDREFS", 37},
    {"Text", "ENTITIES", 38},
    {"Text", "NMTOKEN", 39},
    {"Text", "NMTOKENS", 40},
    {"Text", "Name", 41},
    {"Text", "QName", 42},
    {"Text", "NCName", 43},
    {"Number", "integer", 44},
    {"Number", "nonPositiveInteger", 45},
    {"Number", "negativeInteger", 46},
    {"Number", "long", 47},
    {"Number", "int", 48},
    {"Number", "short", 49},
    {"Number", "byte", 50},
    {"Number", "nonNegativeInteger", 51},
    {"Number", "unsignedLong", 52},
    {"Number", "unsignedInt", 53},
    {"Number", "unsignedShort", 54},
    {"Number", "unsignedByte", 55},
    {"Number", "positiveInteger", 56},
    {"Date", "date", 57},
    {"Time", "time", 58},
    {"Text", "normalizedString", 62},
    {"Text", "token", 63},
    {"Text", "hexBinary", 64},
    {"Text", "base64Binary", 65},
    {"Text", "string attribute", 272},
    {"Boolean", "boolean attribute", 273},
    {"Number", "float attribute", 274},
    {"Number", "double attribute", 275},
    {"Decimal", "decimal attribute", 276},
    {"DateTime", "duration attribute", 277},
    {"DateTime", "dateTime attribute", 278},
    {"DateTime", "gYearMonth attribute", 279},
    {"DateTime", "gYear attribute", 280},
    {"Text", "binary attribute", 286},
    {"Text", "anyURI attribute", 287},
    {"Text", "ID attribute", 288},
    {"Text", "IDREF attribute", 289},
    {"Text", "ENTITY attribute", 290},
    {"Text", "NOTATION attribute", 291},
    {"Text", "language attribute", 292},
    {"Text", "IDREFS attribute", 293},
    {"Text", "ENTITIES attribute", 294},
    {"Text", "NMTOKEN attribute", 295},
    {"Text", "NMTOKENS attribute", 296},
    {"Text", "Name attribute", 297},
    {"Text", "QName attribute", 298},
    {"Text", "NCName attribute", 299},
    {"Number", "integer attribute", 300},
    {"Number", "nonPositiveInteger attribute", 301},
    {"Number", "negativeInteger attribute", 302},
    {"Number", "long attribute", 303},
    {"Number", "int attribute", 304},
    {"Number", "short attribute", 305},
    {"Number", "byte attribute", 306},
    {"Number", "nonNegativeInteger attribute", 307},
    {"Number", "unsignedLong attribute", 308},
    {"Number", "unsignedInt attribute", 309},
    {"Number", "unsignedShort attribute", 310},
    {"Number", "unsignedByte attribute", 311},
    {"Number", "positiveInteger attribute", 312},
    {"Date", "date attribute", 313},
    {"Time", "time attribute", 314},
    {"DateTime", "gMonthDay attribute", 315},
    {"DateTime", "gMonth attribute", 316},
    {"DateTime", "gDay attribute", 317},
    {"Text", "normalizedString attribute", 318},
    {"Text", "token attribute", 319},
    {"Text", "hexBinary attribute", 320},
    {"Text", "base64Binary attribute", 321},
};

TEST(BuiltinTypes, EveryEntryDefinesItsClassAliasAndUsage) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    const ZrDType* const* types = access.builtinTypePointers();
    for (int i = 0; i < kBuiltinTypeCount; ++i) {
        SCOPED_TRACE("entry " + std::to_string(i));
        ASSERT_NE(kBuiltinTypeDefinitions[i], nullptr);
        ASSERT_NE(types[i], nullptr);
        EXPECT_STREQ(types[i]->TypeClass(), kExpected[i].typeClass);
        EXPECT_STREQ(types[i]->Alias(), kExpected[i].alias);
        EXPECT_EQ(types[i]->Usage(), kExpected[i].usage);
        EXPECT_STREQ(types[i]->DefinitionText(), kBuiltinTypeDefinitions[i]);
    }
    EXPECT_EQ(kBuiltinTypeDefinitions[kBuiltinTypeCount], nullptr);
    EXPECT_EQ(types[kBuiltinTypeCount], nullptr);
}

TEST(BuiltinTypes, RecordTypeIsEntryTwo) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    EXPECT_STREQ(access.recordType().DefinitionText(), "Structure;alias=Record;usage=2");
    EXPECT_EQ(access.recordType().Usage(), 2);
}

// Each element alias and each usage code finds the first entry that carries it.
TEST(BuiltinTypes, LookupsFindEveryEntry) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    const ZrDType* const* types = access.builtinTypePointers();
    for (int i = 0; i < kBuiltinTypeCount; ++i) {
        SCOPED_TRACE(kExpected[i].alias);
        EXPECT_EQ(browser.TypeByUsage(kExpected[i].usage), types[i]);
        EXPECT_EQ(browser.TypeByName(wide(kExpected[i].alias).c_str()), types[i]);
    }
}

struct NameCase {
    const char* name;
    int entry; // -1: no type
};

const NameCase kNames[] = {
    {"string", 5},    {"String", -1},   {"anyType", -1},  {"Record", 2}, {"Character", 0},
    {"Attribute", 1}, {"Unquoted", 3},  {"int", 35},      {"", -1},      {"int ", -1},
    {"xs:int", -1},   {"dateTime", 10}, {"duration", 11},
};

TEST(BuiltinTypes, TypeByName) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    for (const NameCase& c : kNames) {
        SCOPED_TRACE(c.name);
        const ZrDType* expected = c.entry < 0 ? nullptr : access.builtinTypePointers()[c.entry];
        EXPECT_EQ(browser.TypeByName(wide(c.name).c_str()), expected);
    }
    EXPECT_EQ(browser.TypeByName(nullptr), nullptr);
}

struct UsageCase {
    short usage;
    int entry;
};

const UsageCase kUsages[] = {
    {272, 50}, {277, 55}, {278, 56}, {258, -1}, {0, 0},   {256, 1},  {2, 2},
    {1, -1},   {25, -1},  {281, -1}, {-1, -1},  {48, 35}, {321, 94},
};

TEST(BuiltinTypes, TypeByUsage) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    for (const UsageCase& c : kUsages) {
        SCOPED_TRACE(c.usage);
        const ZrDType* expected = c.entry < 0 ? nullptr : access.builtinTypePointers()[c.entry];
        EXPECT_EQ(browser.TypeByUsage(c.usage), expected);
    }
}

} // namespace
