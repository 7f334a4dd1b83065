// The built-in type table: every entry's class, alias, usage, starting sizes and
// picture, as hosts know them, and the two lookups over it.
#include "BuiltinTypes.h"
#include "TestSupport.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <sstream>
#include <string>
#include <vector>

namespace {

using zrtest::wide;

// Entries in order, separated by "|" or a line break, each "class;alias;usage" then
// ";length/precision/decimals" when one is non-zero and ";picture" when there is one.
constexpr const char* kExpected = R"(
Text;Character;0 | Text;Attribute;256 | Structure;Record;2 | Text;Unquoted;3
Text;Unquoted attribute;259 | Text;string;16 | Boolean;boolean;17;true.false.1.0
Number;float;18;0/16/2 | Number;double;19;0/16/2 | Decimal;decimal;20;0/16/2
DateTime;dateTime;21;yyyy-mm-ddTH24:MM:SS | DateTime;duration;22;yyyy-mm-ddTH24:MM
DateTime;gYearMonth;23;yyyy-mm | DateTime;gYear;24;yyyy | DateTime;gMonthDay;59;mm-dd
DateTime;gMonth;60;mm | DateTime;gDay;61;dd | Text;binary;30 | Text;anyURI;31 | Text;ID;32
Text;IDREF;33 | Text;ENTITY;34 | Text;NOTATION;35 | Text;language;36 | Text;IDREFS;37
Text;ENTITIES;38 | Text;NMTOKEN;39 | Text;NMTOKENS;40 | Text;Name;41 | Text;QName;42
Text;NCName;43 | Number;integer;44;0/10/0 | Number;nonPositiveInteger;45;0/10/0
Number;negativeInteger;46;0/10/0 | Number;long;47;0/10/0 | Number;int;48;0/10/0
Number;short;49;0/5/0 | Number;byte;50;0/3/0 | Number;nonNegativeInteger;51;0/10/0
Number;unsignedLong;52;0/10/0 | Number;unsignedInt;53;0/10/0 | Number;unsignedShort;54;0/5/0
Number;unsignedByte;55;0/3/0 | Number;positiveInteger;56;10/0/0 | Date;date;57;yyyy-mm-dd
Time;time;58;HH:MM:SS.TTT | Text;normalizedString;62 | Text;token;63 | Text;hexBinary;64
Text;base64Binary;65 | Text;string attribute;272 | Boolean;boolean attribute;273;true.false.1.0
Number;float attribute;274;0/16/2 | Number;double attribute;275;0/16/2
Decimal;decimal attribute;276;0/16/2 | DateTime;duration attribute;277;yyyy-mm-ddTH24:MM:SS
DateTime;dateTime attribute;278;yyyy-mm-ddTH24:MM | DateTime;gYearMonth attribute;279;yyyy-mm
DateTime;gYear attribute;280;yyyy | Text;binary attribute;286 | Text;anyURI attribute;287
Text;ID attribute;288 | Text;IDREF attribute;289 | Text;ENTITY attribute;290
Text;NOTATION attribute;291 | Text;language attribute;292 | Text;IDREFS attribute;293
Text;ENTITIES attribute;294 | Text;NMTOKEN attribute;295 | Text;NMTOKENS attribute;296
Text;Name attribute;297 | Text;QName attribute;298 | Text;NCName attribute;299
Number;integer attribute;300;0/10/0 | Number;nonPositiveInteger attribute;301;0/10/0
Number;negativeInteger attribute;302;0/10/0 | Number;long attribute;303;0/10/0
Number;int attribute;304;0/10/0 | Number;short attribute;305;0/5/0
Number;byte attribute;306;0/3/0 | Number;nonNegativeInteger attribute;307;0/10/0
Number;unsignedLong attribute;308;0/10/0 | Number;unsignedInt attribute;309;0/10/0
Number;unsignedShort attribute;310;0/5/0 | Number;unsignedByte attribute;311;0/3/0
Number;positiveInteger attribute;312;0/10/0 | Date;date attribute;313;yyyy-mm-dd
Time;time attribute;314;HH:MM:SS.TTT | DateTime;gMonthDay attribute;315;mm-dd
DateTime;gMonth attribute;316;mm | DateTime;gDay attribute;317;dd
Text;normalizedString attribute;318 | Text;token attribute;319 | Text;hexBinary attribute;320
Text;base64Binary attribute;321
)";

std::vector<std::string> expectedEntries() {
    std::string text = kExpected;
    std::replace(text.begin(), text.end(), '\n', '|');
    std::istringstream in(text);
    std::vector<std::string> out;
    for (std::string entry; std::getline(in, entry, '|');)
        if (const size_t from = entry.find_first_not_of(' '); from != std::string::npos)
            out.push_back(entry.substr(from, entry.find_last_not_of(' ') + 1 - from));
    return out;
}

std::string describe(const ZrDType& t) {
    std::string out =
        std::string(t.TypeClass()) + ";" + t.Alias() + ";" + std::to_string(t.Usage());
    if (t.Length() || t.Precision() || t.DecimalPlaces())
        out += ";" + std::to_string(t.Length()) + "/" + std::to_string(t.Precision()) + "/" +
               std::to_string(t.DecimalPlaces());
    if (t.Item("picture"))
        out += std::string(";") + t.Item("picture");
    return out + (t.Nulls() ? ";nulls" : "");
}

// The table's entries and a type defined afresh from each text read back alike;
// each entry's alias and usage find that entry.
TEST(BuiltinTypes, EveryEntryReadsBackAndIsFound) {
    const std::vector<std::string> expected = expectedEntries();
    ASSERT_EQ(expected.size(), size_t(kBuiltinTypeCount));
    const BuiltinTypes builtins;
    const ZrDType* const* types = builtins.types();
    for (int i = 0; i < kBuiltinTypeCount; ++i) {
        SCOPED_TRACE("entry " + std::to_string(i));
        ASSERT_NE(kBuiltinTypeDefinitions[i], nullptr);
        ASSERT_NE(types[i], nullptr);
        ZrDType fresh;
        ASSERT_TRUE(fresh.Define(kBuiltinTypeDefinitions[i]));
        EXPECT_EQ(describe(fresh), expected[i]);
        EXPECT_EQ(describe(*types[i]), expected[i]);
        EXPECT_STREQ(types[i]->DefinitionText(), kBuiltinTypeDefinitions[i]);
        EXPECT_EQ(builtins.TypeByUsage(types[i]->Usage()), types[i]);
        EXPECT_EQ(builtins.builtinByName(wide(types[i]->Alias()).view()), types[i]);
    }
    EXPECT_EQ(kBuiltinTypeDefinitions[kBuiltinTypeCount], nullptr);
    EXPECT_EQ(types[kBuiltinTypeCount], nullptr);
    EXPECT_STREQ(builtins.recordType().DefinitionText(), "Structure;alias=Record;usage=2");
}

// Names and usages no entry carries: lookups compare exactly.
TEST(BuiltinTypes, LookupsMissWhatNoEntryCarries) {
    const BuiltinTypes builtins;
    for (const char* name : {"String", "anyType", "", "int ", "xs:int"})
        EXPECT_EQ(builtins.builtinByName(wide(name).view()), nullptr) << name;
    for (short usage : {1, 25, 258, 281, -1})
        EXPECT_EQ(builtins.TypeByUsage(usage), nullptr) << usage;
}

} // namespace
