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
    // precision and scale winning over the newer facets; a union of both.
    {"DigitsOfDecimals", kDigits,
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
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="Amt" type="ActiveCurrencyAndAmount"/>
          <xs:element name="chained" type="Amount"/>
          <xs:element name="narrow" type="Narrowed"/>
          <xs:element name="scaled" type="Scaled"/>
          <xs:element name="either" type="Either"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0):\n"
     "  Amt: Record(2) 0/0/0 notnull\n"
     "  chained: decimal(20) 0/16/2 null\n"
     "  narrow: decimal(20) 0/16/2 null\n"
     "  scaled: decimal(20) 0/12/3 null\n"
     "  either: decimal(20) 0/16/3 null\n"
     "Amt(0):\n"
     "  Amt: decimal(20) 0/16/2 null\n"
     "  Ccy: string attribute(272) 0/0/0 null\n",
     "r(0):\n"
     "  Amt: Record(2) 0/0/0 notnull\n"
     "  chained: decimal(20) 0/18/5 null\n"
     "  narrow: decimal(20) 0/10/2 null\n"
     "  scaled: decimal(20) 0/12/3 null\n"
     "  either: decimal(20) 0/12/3 null\n"
     "Amt(0):\n"
     "  Amt: decimal(20) 0/18/5 null\n"
     "  Ccy: string attribute(272) 0/0/0 null\n"},

    // On integers the digits are the length too; limits still narrow them.
    {"DigitsOfIntegers", kDigits,
     R"(<xs:simpleType name="Count"><xs:restriction base="xs:int">
          <xs:totalDigits value="4"/></xs:restriction></xs:simpleType>
        <xs:simpleType name="Small"><xs:restriction base="Count">
          <xs:maxInclusive value="99"/></xs:restriction></xs:simpleType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="count" type="Count"/>
          <xs:element name="small" type="Small"/>
          <xs:element name="text" type="xs:string"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0):\n"
     "  count: int(48) 0/10/0 null\n"
     "  small: int(48) 2/2/0 null\n"
     "  text: string(16) 0/0/0 null\n",
     "r(0):\n"
     "  count: int(48) 4/4/0 null\n"
     "  small: int(48) 2/2/0 null\n"
     "  text: string(16) 0/0/0 null\n"},

    // Own minOccurs, nillable, an early "nullable" that still decides, an optional
    // group reference, choices of one and of several branches, optional sequences
    // around nested ones, a reference, attributes required or not, nested records
    // whose own fields keep their own occurrence, and a "nullable" only inherited,
    // which occurrence overrides.
    {"NullsFromOccurrence", kNulls,
     R"(<xs:group name="optGroup"><xs:sequence>
          <xs:element name="ga" type="xs:int"/>
          <xs:element name="inner"><xs:complexType><xs:sequence>
            <xs:element name="x" type="xs:int"/></xs:sequence></xs:complexType></xs:element>
        </xs:sequence></xs:group>
        <xs:group name="reqGroup"><xs:sequence>
          <xs:element name="gb" type="xs:int"/></xs:sequence></xs:group>
        <xs:element name="top" type="xs:string" nillable="true"/>
        <xs:element name="plainTop" type="xs:string"/>
        <xs:attribute name="globalAttr" type="xs:int"/>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="req" type="xs:int"/>
          <xs:element name="opt" type="xs:int" minOccurs="0"/>
          <xs:element name="nil" type="xs:int" nillable="true"/>
          <xs:element name="early" type="xs:int" minOccurs="0" nullable="false"/>
          <xs:group ref="optGroup" minOccurs="0"/>
          <xs:group ref="reqGroup"/>
          <xs:choice><xs:element name="c1" type="xs:int"/>
            <xs:sequence><xs:element name="c2" type="xs:int"/></xs:sequence></xs:choice>
          <xs:choice><xs:annotation/><xs:element name="only" type="xs:int"/></xs:choice>
          <xs:sequence minOccurs=" 0 "><xs:element name="inOpt" type="xs:int"/>
            <xs:sequence><xs:element name="deep" type="xs:int"/></xs:sequence></xs:sequence>
          <xs:element ref="top"/>
          <xs:element ref="plainTop" minOccurs="0"/>
          <xs:element name="kid" minOccurs="0"><xs:complexType><xs:sequence>
            <xs:element name="k" type="xs:int"/></xs:sequence></xs:complexType></xs:element>
          <xs:element name="after" type="xs:int"/>
          <xs:element name="held" nullable="false"><xs:complexType><xs:sequence>
            <xs:element name="h1" type="xs:int"/>
            <xs:element name="h2" type="xs:int" minOccurs="0"/>
          </xs:sequence></xs:complexType></xs:element>
        </xs:sequence>
        <xs:attribute name="must" type="xs:int" use="required"/>
        <xs:attribute name="may" type="xs:int" use="optional"/>
        <xs:attribute ref="globalAttr" use="required"/>
        </xs:complexType></xs:element>)",
     "r(0):\n"
     "  req: int(48) 0/10/0 null\n"
     "  opt: int(48) 0/10/0 null\n"
     "  nil: int(48) 0/10/0 null\n"
     "  early: int(48) 0/10/0 notnull\n"
     "  ga: int(48) 0/10/0 null\n"
     "  inner: Record(2) 0/0/0 notnull\n"
     "  gb: int(48) 0/10/0 null\n"
     "  c1: int(48) 0/10/0 null\n"
     "  c2: int(48) 0/10/0 null\n"
     "  only: int(48) 0/10/0 null\n"
     "  inOpt: int(48) 0/10/0 null\n"
     "  deep: int(48) 0/10/0 null\n"
     "  top: string(16) 0/0/0 null\n"
     "  plainTop: string(16) 0/0/0 null\n"
     "  kid: Record(2) 0/0/0 notnull\n"
     "  after: int(48) 0/10/0 null\n"
     "  held: Record(2) 0/0/0 notnull\n"
     "  must: int attribute(304) 0/10/0 null\n"
     "  may: int attribute(304) 0/10/0 null\n"
     "  globalAttr: int attribute(304) 0/10/0 null\n"
     "inner(0):\n"
     "  x: int(48) 0/10/0 null\n"
     "kid(0):\n"
     "  k: int(48) 0/10/0 null\n"
     "held(0):\n"
     "  h1: int(48) 0/10/0 notnull\n"
     "  h2: int(48) 0/10/0 notnull\n",
     "r(0):\n"
     "  req: int(48) 0/10/0 notnull\n"
     "  opt: int(48) 0/10/0 null\n"
     "  nil: int(48) 0/10/0 null\n"
     "  early: int(48) 0/10/0 notnull\n"
     "  ga: int(48) 0/10/0 null\n"
     "  inner: Record(2) 0/0/0 null\n"
     "  gb: int(48) 0/10/0 notnull\n"
     "  c1: int(48) 0/10/0 null\n"
     "  c2: int(48) 0/10/0 null\n"
     "  only: int(48) 0/10/0 notnull\n"
     "  inOpt: int(48) 0/10/0 null\n"
     "  deep: int(48) 0/10/0 null\n"
     "  top: string(16) 0/0/0 null\n"
     "  plainTop: string(16) 0/0/0 null\n"
     "  kid: Record(2) 0/0/0 null\n"
     "  after: int(48) 0/10/0 notnull\n"
     "  held: Record(2) 0/0/0 notnull\n"
     "  must: int attribute(304) 0/10/0 notnull\n"
     "  may: int attribute(304) 0/10/0 null\n"
     "  globalAttr: int attribute(304) 0/10/0 notnull\n"
     "inner(0):\n"
     "  x: int(48) 0/10/0 notnull\n"
     "kid(0):\n"
     "  k: int(48) 0/10/0 notnull\n"
     "held(0):\n"
     "  h1: int(48) 0/10/0 notnull\n"
     "  h2: int(48) 0/10/0 null\n"},

    // Fields drawn from a base type keep the occurrence they have there; an
    // optional sequence of a nested type does not reach the type around it.
    {"NullsThroughBaseTypes", kNulls,
     R"(<xs:complexType name="Base"><xs:sequence>
          <xs:element name="b1" type="xs:int"/>
          <xs:element name="b2" type="xs:int" minOccurs="0"/>
        </xs:sequence></xs:complexType>
        <xs:complexType name="Derived"><xs:complexContent><xs:extension base="Base">
          <xs:sequence minOccurs="0"><xs:element name="d1" type="xs:int"/></xs:sequence>
          <xs:attribute name="da" type="xs:int" use="required"/>
        </xs:extension></xs:complexContent></xs:complexType>
        <xs:element name="r"><xs:complexType><xs:sequence minOccurs="0">
          <xs:element name="d" type="Derived"/>
        </xs:sequence><xs:attribute name="ra" type="xs:int" use="required"/>
        </xs:complexType></xs:element>)",
     "r(0):\n"
     "  d: Record(2) 0/0/0 notnull\n"
     "  ra: int attribute(304) 0/10/0 null\n"
     "d(0):\n"
     "  b1: int(48) 0/10/0 null\n"
     "  b2: int(48) 0/10/0 null\n"
     "  d1: int(48) 0/10/0 null\n"
     "  da: int attribute(304) 0/10/0 null\n",
     "r(0):\n"
     "  d: Record(2) 0/0/0 null\n"
     "  ra: int attribute(304) 0/10/0 notnull\n"
     "d(0):\n"
     "  b1: int(48) 0/10/0 notnull\n"
     "  b2: int(48) 0/10/0 null\n"
     "  d1: int(48) 0/10/0 null\n"
     "  da: int attribute(304) 0/10/0 notnull\n"},

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
            <xs:documentation>Declared</xs:documentation></xs:annotation></xs:element>
          <xs:element name="none" type="xs:int"/>
          <xs:element name="party" type="Party"/>
          <xs:element name="blankFirst" type="xs:int"><xs:annotation>
            <xs:documentation> </xs:documentation>
            <xs:documentation>Second</xs:documentation></xs:annotation></xs:element>
          <xs:element ref="global"/>
        </xs:sequence><xs:attribute name="a" type="xs:int"><xs:annotation>
          <xs:documentation>An attribute</xs:documentation></xs:annotation></xs:attribute>
        </xs:complexType></xs:element>)",
     "r(0):\n"
     "  own: int(48) 0/10/0 null\n"
     "  byType: string(16) 0/0/0 null\n"
     "  both: string(16) 0/0/0 null\n"
     "  none: int(48) 0/10/0 null\n"
     "  party: Record(2) 0/0/0 notnull\n"
     "  blankFirst: int(48) 0/10/0 null\n"
     "  global: int(48) 0/10/0 null\n"
     "  a: int attribute(304) 0/10/0 null\n"
     "party(0):\n"
     "  name: string(16) 0/0/0 null\n",
     "r(0):\n"
     "  own: int(48) 0/10/0 null \"Own bold & \xc3\xa9t\xc3\xa9 \xe2\x82\xac\xf0\x9f\x98\x80\"\n"
     "  byType: string(16) 0/0/0 null \"A code of three letters\"\n"
     "  both: string(16) 0/0/0 null \"Declared\"\n"
     "  none: int(48) 0/10/0 null\n"
     "  party: Record(2) 0/0/0 notnull \"Someone\"\n"
     "  blankFirst: int(48) 0/10/0 null \"Second\"\n"
     "  global: int(48) 0/10/0 null \"Global\"\n"
     "  a: int attribute(304) 0/10/0 null \"An attribute\"\n"
     "party(0):\n"
     "  name: string(16) 0/0/0 null \"The name\"\n"},
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
    EXPECT_EQ(read.records, "r(0):\n"
                            "  a: decimal(20) 0/18/5 null \"Money\"\n"
                            "  b: decimal(20) 0/18/5 null \"Other\"\n"
                            "  n: decimal attribute(276) 0/18/5 notnull \"Money\"\n");
}

} // namespace
