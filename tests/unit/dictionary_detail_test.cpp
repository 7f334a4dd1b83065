// Field detail asked for by options: digits from totalDigits and fractionDigits,
// nulls from occurrence, descriptions from documentation. Each schema is read with
// every option off, which must give what it always gave, and with its option on.
#include "dictionary_support.h"

#include <gtest/gtest.h>
#include <string>

namespace {

using zrtest::readInline;
using zrtest::SchemaRead;

enum Detail { kDigits = 1, kNulls = 2, kDescriptions = 4 };

struct DetailCase {
    const char* label;
    int detail;
    const char* body;
    const char* off;
    const char* on;
};

void PrintTo(const DetailCase& row, std::ostream* os) { *os << row.label; }

SchemaReadOptions optionsOf(int detail) {
    SchemaReadOptions options;
    options.decimalDigits = (detail & kDigits) != 0;
    options.occurrenceNulls = (detail & kNulls) != 0;
    options.fieldDescriptions = (detail & kDescriptions) != 0;
    return options;
}

const DetailCase kCases[] = {
    // An ISO 20022 amount: a decimal with both facets, inherited through a chain of
    // restrictions and through simple content; a restriction narrowing the digits;
    // precision and scale winning over the newer facets; a union of both. On integers
    // the digits are the length too; limits still narrow them.
    {"Digits", kDigits,
     R"(<xs:simpleType name="ActiveCurrencyAndAmount_SimpleType">
          <xs:restriction base="xs:decimal"><xs:fractionDigits value="5"/>
            <xs:totalDigits value="18"/><xs:minInclusive value="0"/></xs:restriction>
        </xs:simpleType>
        <xs:complexType name="ActiveCurrencyAndAmount"><xs:simpleContent>
          <xs:extension base="ActiveCurrencyAndAmount_SimpleType">
            <xs:attribute name="Ccy" type="xs:string" use="required"/>
          </xs:extension></xs:simpleContent></xs:complexType>
        <xs:simpleType name="Amount"><xs:restriction base="ActiveCurrencyAndAmount_SimpleType"/>
        </xs:simpleType>
        <xs:simpleType name="Narrowed"><xs:restriction base="Amount">
          <xs:totalDigits value="10"/><xs:fractionDigits value="2"/></xs:restriction>
        </xs:simpleType>
        <xs:simpleType name="Scaled"><xs:restriction base="xs:decimal">
          <xs:precision value="12"/><xs:scale value="3"/>
          <xs:totalDigits value="18"/><xs:fractionDigits value="17"/></xs:restriction>
        </xs:simpleType>
        <xs:simpleType name="Either"><xs:union memberTypes="Narrowed Scaled"/></xs:simpleType>
        <xs:simpleType name="Count"><xs:restriction base="xs:int">
          <xs:totalDigits value="4"/></xs:restriction></xs:simpleType>
        <xs:simpleType name="Small"><xs:restriction base="Count">
          <xs:maxInclusive value="99"/></xs:restriction></xs:simpleType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="Amt" type="ActiveCurrencyAndAmount"/>
          <xs:element name="chained" type="Amount"/>
          <xs:element name="narrow" type="Narrowed"/>
          <xs:element name="scaled" type="Scaled"/>
          <xs:element name="either" type="Either"/>
          <xs:element name="count" type="Count"/>
          <xs:element name="small" type="Small"/>
          <xs:element name="text" type="xs:string"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): Amt Record(2) notnull, chained decimal(20) 0/16/2, narrow decimal(20) 0/16/2, "
     "scaled decimal(20) 0/12/3, either decimal(20) 0/16/3, count int(48) 0/10/0, "
     "small int(48) 2/2/0, text string(16)\n"
     "Amt(0): Amt decimal(20) 0/16/2, Ccy string attribute(272)\n",
     "r(0): Amt Record(2) notnull, chained decimal(20) 0/18/5, narrow decimal(20) 0/10/2, "
     "scaled decimal(20) 0/12/3, either decimal(20) 0/12/3, count int(48) 4/4/0, "
     "small int(48) 2/2/0, text string(16)\n"
     "Amt(0): Amt decimal(20) 0/18/5, Ccy string attribute(272)\n"},

    // Own minOccurs, nillable, an early "nullable" that still decides, an optional
    // group reference, choices of one and of several branches, optional sequences
    // around nested ones, a reference, attributes required or not, nested records
    // whose own fields keep their own occurrence, and a "nullable" only inherited,
    // which occurrence overrides. Fields drawn from a base type keep the occurrence
    // they have there; an optional sequence of a nested type does not reach the type
    // around it.
    {"NullsFromOccurrence", kNulls,
     R"(<xs:group name="optGroup"><xs:sequence>
          <xs:element name="ga" type="xs:string"/>
          <xs:element name="inner"><xs:complexType><xs:sequence>
            <xs:element name="x" type="xs:string"/></xs:sequence></xs:complexType></xs:element>
        </xs:sequence></xs:group>
        <xs:group name="reqGroup"><xs:sequence>
          <xs:element name="gb" type="xs:string"/></xs:sequence></xs:group>
        <xs:element name="top" type="xs:string" nillable="true"/>
        <xs:element name="plainTop" type="xs:string"/>
        <xs:attribute name="globalAttr" type="xs:string"/>
        <xs:complexType name="Base"><xs:sequence>
          <xs:element name="b1" type="xs:string"/>
          <xs:element name="b2" type="xs:string" minOccurs="0"/>
        </xs:sequence></xs:complexType>
        <xs:complexType name="Derived"><xs:complexContent><xs:extension base="Base">
          <xs:sequence minOccurs="0"><xs:element name="d1" type="xs:string"/></xs:sequence>
          <xs:attribute name="da" type="xs:string" use="required"/>
        </xs:extension></xs:complexContent></xs:complexType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="req" type="xs:string"/>
          <xs:element name="opt" type="xs:string" minOccurs="0"/>
          <xs:element name="nil" type="xs:string" nillable="true"/>
          <xs:element name="early" type="xs:string" minOccurs="0" nullable="false"/>
          <xs:group ref="optGroup" minOccurs="0"/>
          <xs:group ref="reqGroup"/>
          <xs:choice><xs:element name="c1" type="xs:string"/>
            <xs:sequence><xs:element name="c2" type="xs:string"/></xs:sequence></xs:choice>
          <xs:choice><xs:annotation/><xs:element name="only" type="xs:string"/></xs:choice>
          <xs:sequence minOccurs=" 0 "><xs:element name="inOpt" type="xs:string"/>
            <xs:sequence><xs:element name="deep" type="xs:string"/></xs:sequence>
            <xs:element name="d" type="Derived"/></xs:sequence>
          <xs:element ref="top"/>
          <xs:element ref="plainTop" minOccurs="0"/>
          <xs:element name="kid" minOccurs="0"><xs:complexType><xs:sequence>
            <xs:element name="k" type="xs:string"/></xs:sequence></xs:complexType></xs:element>
          <xs:element name="after" type="xs:string"/>
          <xs:element name="held" nullable="false"><xs:complexType><xs:sequence>
            <xs:element name="h1" type="xs:string"/>
            <xs:element name="h2" type="xs:string" minOccurs="0"/>
          </xs:sequence></xs:complexType></xs:element>
        </xs:sequence>
        <xs:attribute name="must" type="xs:string" use="required"/>
        <xs:attribute name="may" type="xs:string" use="optional"/>
        <xs:attribute ref="globalAttr" use="required"/>
        </xs:complexType></xs:element>)",
     "r(0): req string(16), opt string(16), nil string(16), early string(16) notnull, "
     "ga string(16), inner Record(2) notnull, gb string(16), c1 string(16), c2 string(16), "
     "only string(16), inOpt string(16), deep string(16), d Record(2) notnull, "
     "top string(16), plainTop string(16), kid Record(2) notnull, after string(16), "
     "held Record(2) notnull, must string attribute(272), may string attribute(272), "
     "globalAttr string attribute(272)\n"
     "inner(0): x string(16)\n"
     "d(0): b1 string(16), b2 string(16), d1 string(16), da string attribute(272)\n"
     "kid(0): k string(16)\n"
     "held(0): h1 string(16) notnull, h2 string(16) notnull\n",
     "r(0): req string(16) notnull, opt string(16), nil string(16), early string(16) notnull, "
     "ga string(16), inner Record(2), gb string(16) notnull, c1 string(16), c2 string(16), "
     "only string(16) notnull, inOpt string(16), deep string(16), d Record(2), "
     "top string(16), plainTop string(16), kid Record(2), after string(16) notnull, "
     "held Record(2) notnull, must string attribute(272) notnull, may string attribute(272), "
     "globalAttr string attribute(272) notnull\n"
     "inner(0): x string(16) notnull\n"
     "d(0): b1 string(16) notnull, b2 string(16), d1 string(16), "
     "da string attribute(272) notnull\n"
     "kid(0): k string(16) notnull\n"
     "held(0): h1 string(16) notnull, h2 string(16)\n"},

    // Documentation on the declaration, on its type, on both, in several languages,
    // split by references and markup, on an attribute and on a reference; an
    // annotation of a compositor or in appinfo describes nothing.
    {"DescriptionsFromDocumentation", kDescriptions,
     R"(<xs:simpleType name="Code"><xs:annotation><xs:documentation>
          A  code
             of three letters </xs:documentation></xs:annotation>
          <xs:restriction base="xs:string"/></xs:simpleType>
        <xs:complexType name="Party"><xs:annotation>
          <xs:documentation>Someone</xs:documentation></xs:annotation>
          <xs:sequence><xs:element name="name" type="xs:string"><xs:annotation>
            <xs:appinfo><xs:element name="trap" type="xs:int"/></xs:appinfo>
            <xs:documentation xml:lang="en">The name</xs:documentation>
            <xs:documentation xml:lang="de">Der Name</xs:documentation>
          </xs:annotation></xs:element></xs:sequence></xs:complexType>
        <xs:element name="global" type="xs:int"><xs:annotation>
          <xs:documentation>Global</xs:documentation></xs:annotation></xs:element>
        <xs:element name="r"><xs:complexType><xs:sequence><xs:annotation>
          <xs:documentation>Of the sequence</xs:documentation></xs:annotation>
          <xs:element name="own" type="xs:int"><xs:annotation><xs:documentation>Own
            <b>bold</b> &amp; &#233;t&#233; &#x20AC;&#x1F600;</xs:documentation></xs:annotation></xs:element>
          <xs:element name="byType" type="Code"/>
          <xs:element name="both" type="Code"><xs:annotation>
            <xs:documentation>Declared here </xs:documentation></xs:annotation></xs:element>
          <xs:element name="none" type="xs:int"/>
          <xs:element name="party" type="Party"/>
          <xs:element name="blankFirst" type="xs:int"><xs:annotation>
            <xs:documentation> </xs:documentation>
            <xs:documentation>Second</xs:documentation></xs:annotation></xs:element>
          <xs:element ref="global"/>
        </xs:sequence><xs:attribute name="a" type="xs:int"><xs:annotation>
          <xs:documentation>An  attribute</xs:documentation></xs:annotation></xs:attribute>
        </xs:complexType></xs:element>)",
     "r(0): own int(48) 0/10/0, byType string(16), both string(16), none int(48) 0/10/0, "
     "party Record(2) notnull, blankFirst int(48) 0/10/0, global int(48) 0/10/0, "
     "a int attribute(304) 0/10/0\n"
     "party(0): name string(16)\n",
     "r(0): own int(48) 0/10/0 \"Own bold & \xc3\xa9t\xc3\xa9 \xe2\x82\xac\xf0\x9f\x98\x80\", "
     "byType string(16) \"A code of three letters\", both string(16) \"Declared here\", "
     "none int(48) 0/10/0, party Record(2) notnull \"Someone\", "
     "blankFirst int(48) 0/10/0 \"Second\", global int(48) 0/10/0 \"Global\", "
     "a int attribute(304) 0/10/0 \"An attribute\"\n"
     "party(0): name string(16) \"The name\"\n"},
};

class FieldDetail : public ::testing::TestWithParam<DetailCase> {};

TEST_P(FieldDetail, OffAsAlwaysOnAsAsked) {
    const DetailCase& c = GetParam();
    const SchemaRead off = readInline(c.body, SchemaReadOptions());
    EXPECT_TRUE(off.ok) << off.messages;
    EXPECT_EQ(off.records, c.off);
    const SchemaRead on = readInline(c.body, optionsOf(c.detail));
    EXPECT_TRUE(on.ok) << on.messages;
    EXPECT_EQ(on.records, c.on);
    EXPECT_EQ(on.messages, off.messages);
}

INSTANTIATE_TEST_SUITE_P(Dictionary, FieldDetail, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.label); });

// The options do not disturb each other: all three on give each one's result.
TEST(FieldDetailTogether, AllOptionsOnCombineTheirResults) {
    const SchemaRead read = readInline(R"(<xs:simpleType name="Amount"><xs:annotation>
                        <xs:documentation>Money</xs:documentation></xs:annotation>
                        <xs:restriction base="xs:decimal"><xs:totalDigits value="18"/>
                        <xs:fractionDigits value="5"/></xs:restriction></xs:simpleType>
                      <xs:element name="r"><xs:complexType><xs:choice>
                        <xs:element name="a" type="Amount"/>
                        <xs:element name="b" type="Amount" nillable="true"><xs:annotation>
                          <xs:documentation>Other</xs:documentation></xs:annotation></xs:element>
                      </xs:choice><xs:attribute name="n" type="Amount" use="required"/>
                      </xs:complexType></xs:element>)",
                                       optionsOf(kDigits | kNulls | kDescriptions));
    EXPECT_TRUE(read.ok) << read.messages;
    EXPECT_EQ(read.records, "r(0): a decimal(20) 0/18/5 \"Money\", b decimal(20) 0/18/5 \"Other\", "
                            "n decimal attribute(276) 0/18/5 notnull \"Money\"\n");
}

} // namespace
