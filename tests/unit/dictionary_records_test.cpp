// Record construction over small inline schemas: record and field names, types,
// derived and referenced content, and every failure a schema can reach.
#include "dictionary_support.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <string>

namespace {

using zrtest::LogCapture;
using zrtest::readInline;
using zrtest::SchemaRead;
using zrtest::wide;

constexpr const char* kTargetNs = R"(targetNamespace="urn:t" xmlns="urn:t")";

struct RecordCase {
    const char* label;
    const char* body;
    const char* records;
    const char* messages = ""; // a read that says something fails
    bool qualified = false;
    const char* schemaAttrs = "";
};

// Two nested records named x under different parents, one holding a record three
// deep, and a type that meets itself two records down.
constexpr const char* kTwoX = R"(<xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="a"><xs:complexType><xs:sequence>
            <xs:element name="x"><xs:complexType><xs:sequence><xs:element name="w">
              <xs:complexType><xs:sequence><xs:element name="p" type="xs:int"/></xs:sequence>
              </xs:complexType></xs:element></xs:sequence></xs:complexType></xs:element>
          </xs:sequence></xs:complexType></xs:element>
          <xs:element name="b"><xs:complexType><xs:sequence>
            <xs:element name="x"><xs:complexType><xs:sequence>
              <xs:element name="q" type="xs:int"/></xs:sequence></xs:complexType></xs:element>
          </xs:sequence></xs:complexType></xs:element>
        </xs:sequence></xs:complexType></xs:element>
        <xs:complexType name="Part"><xs:sequence>
          <xs:element name="sub"><xs:complexType><xs:sequence>
            <xs:element name="part" type="Part"/>
          </xs:sequence></xs:complexType></xs:element>
        </xs:sequence></xs:complexType>
        <xs:element name="top"><xs:complexType><xs:sequence>
          <xs:element name="part" type="Part"/>
        </xs:sequence></xs:complexType></xs:element>)";

// Failures name the row rather than dump its bytes.
void PrintTo(const RecordCase& row, std::ostream* os) { *os << row.label; }

const RecordCase kCases[] = {
    // Untyped and ur-typed declarations are text, a built-in answers under any prefix,
    // attributes take their type's attribute variant where it has one, references
    // stand for their declaration, and top-level declarations of simple or unknown
    // type build nothing.
    {"SimpleFields",
     R"(<xs:element name="code" type="xs:string" nullable="false"/>
        <xs:element name="b" type="Unknown"/><xs:group ref="nowhere"/>
        <xs:attribute name="lang" type="xs:language"/>
        <xs:simpleType name="Qty"><xs:restriction base="xs:int">
          <xs:minInclusive value="0"/><xs:maxInclusive value="9999"/></xs:restriction></xs:simpleType>
        <xs:simpleType name="Status"><xs:restriction base="xs:string">
          <xs:enumeration value="open"/><xs:enumeration value="shipped"/></xs:restriction>
        </xs:simpleType>
        <xs:simpleType name="Zip"><xs:restriction base="xs:string">
          <xs:pattern value="\d{5}(-\d{4})?"/></xs:restriction></xs:simpleType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="note"/>
          <xs:element name="any" type="xs:anyType"/>
          <xs:element name="foreign" type="foo:int"/>
          <xs:element name="x" type="xs:int"/><xs:element name="x" type="xs:string"/>
          <xs:element ref="code"/><xs:element ref="code"/>
          <xs:element name="qty" type="Qty"/><xs:element name="status" type="Status"/>
          <xs:element name="zip" type="Zip"/><xs:element name="again" type="Qty"/>
        </xs:sequence>
          <xs:attribute name="untypedAttr"/>
          <xs:attribute name="when" type="xs:dateTime"/>
          <xs:attribute name="span" type="xs:duration"/>
          <xs:attribute name="count" type="xs:int"/>
          <xs:attribute name="big" type="xs:positiveInteger"/>
          <xs:attribute name="plain" type="xs:Character"/>
          <xs:attribute name="noVariant" type="xs:Record"/>
          <xs:attribute name="short"><xs:simpleType><xs:restriction base="xs:string">
            <xs:maxLength value="8"/></xs:restriction></xs:simpleType></xs:attribute>
          <xs:attribute ref="lang"/><xs:attribute name="st" type="Status"/>
        </xs:complexType></xs:element>)",
     "r(0): note string(16), any string(16), foreign int(48) 0/10/0, x int(48) 0/10/0, "
     "x string(16), code string(16) notnull, code string(16) notnull, qty int(48) 4/4/0, "
     "status string(16) 7/0/0, zip string(16) 0/10/0, again int(48) 4/4/0, "
     "untypedAttr string attribute(272), when duration attribute(277), "
     "span dateTime attribute(278), count int attribute(304) 0/10/0, "
     "big positiveInteger attribute(312) 10/0/0, plain Attribute(256), noVariant Record(258), "
     "short string attribute(272) 8/0/0, lang language attribute(292), "
     "st string attribute(272) 7/0/0\n",
     "", false, R"(xmlns:foo="urn:foo")"},

    // A type met again types its field as the first one did, with attribute and
    // nullable flags applied per field, also across records. The text of simple
    // content is typed by its own base, and a declaration's own anonymous type is its
    // type, whatever names the author gives types: a declared "anon2" answers only
    // for the fields that name it, and the generated names would be anon0 (r's type)
    // and anon1 (inline's); an author's name beginning with "anon" is found in any
    // namespace. Names written with a foreign prefix keep it.
    {"RepeatedFieldTypes",
     R"(<xs:simpleType name="Code"><xs:restriction base="xs:string">
          <xs:maxLength value="5"/></xs:restriction></xs:simpleType>
        <xs:complexType name="anon0"><xs:sequence>
          <xs:element name="wrong" type="xs:string"/></xs:sequence></xs:complexType>
        <xs:simpleType name="anon1"><xs:restriction base="xs:string">
          <xs:maxLength value="3"/></xs:restriction></xs:simpleType>
        <xs:simpleType name="anon2"><xs:restriction base="xs:string">
          <xs:maxLength value="9"/></xs:restriction></xs:simpleType>
        <xs:complexType name="Amount"><xs:simpleContent><xs:extension base="xs:decimal">
          <xs:attribute name="cur" type="Code"/></xs:extension></xs:simpleContent></xs:complexType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="inline"><xs:simpleType><xs:restriction base="xs:int">
            <xs:maxInclusive value="99999"/></xs:restriction></xs:simpleType></xs:element>
          <xs:element name="named" type="anon1"/>
          <xs:element name="box" type="anon0"/>
          <xs:element name="a" type="Code"/>
          <xs:element name="b" type="Code" nullable="false"/>
          <xs:element name="amt" type="Amount"/>
          <xs:element name="c" type="anon2"/>
          <xs:element name="amt2" type="Amount"/>
          <xs:element name="d" type="anon2"/>
        </xs:sequence><xs:attribute name="e" type="Code"/></xs:complexType></xs:element>
        <xs:element name="s"><xs:complexType><xs:sequence>
          <xs:element name="f" type="Code"/>
        </xs:sequence></xs:complexType></xs:element>
        <xs:complexType name="anonAddress"><xs:sequence>
          <xs:element name="city" type="xs:string"/></xs:sequence></xs:complexType>
        <xs:element name="o:r"><xs:complexType><xs:sequence>
          <xs:element name="home" type="o:anonAddress"/>
          <xs:element name="o:x" type="xs:int"/><xs:element name="y" type="xs:int"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): inline int(48) 5/5/0, named string(16) 3/0/0, box Record(2) notnull, "
     "a string(16) 5/0/0, b string(16) 5/0/0 notnull, amt Record(2) notnull, "
     "c string(16) 9/0/0, amt2 Record(2) notnull, d string(16) 9/0/0, "
     "e string attribute(272) 5/0/0\n"
     "box(0): wrong string(16)\n"
     "amt(0): amt decimal(20) 0/16/2, cur string attribute(272) 5/0/0\n"
     "amt2(0): amt2 decimal(20) 0/16/2, cur string attribute(272) 5/0/0\n"
     "s(0): f string(16) 5/0/0\n"
     "o:r(0): home Record(2) notnull, o:x int(48) 0/10/0, y int(48) 0/10/0\n"
     "home(0): city string(16)\n",
     "", false, R"(targetNamespace="urn:t" xmlns="urn:t" xmlns:o="urn:o")"},

    // A record met again, by a recursive type, a reference or a group, gets one field
    // in its parent; groups expand in place, as often as they are referred to. A
    // "nullable" on a declaration reaches the fields inside it, and only those.
    {"RecordsMetAgain",
     R"(<xs:element name="n" nullable="false"><xs:complexType><xs:sequence>
          <xs:element name="inherits" type="xs:int"/>
          <xs:element name="own" type="xs:int" nullable="TRUE"/>
          <xs:element name="off" type="xs:int" nullable="False"/>
        </xs:sequence></xs:complexType></xs:element>
        <xs:complexType name="Node"><xs:sequence>
          <xs:element name="value" type="xs:string"/>
          <xs:element name="node" type="Node"/>
          <xs:element name="node" type="Node"/>
        </xs:sequence></xs:complexType>
        <xs:element name="node" type="Node"/>
        <xs:group name="g"><xs:sequence><xs:element name="x" type="xs:int"/>
          <xs:group ref="inner"/><xs:element name="y" type="xs:string"/></xs:sequence></xs:group>
        <xs:group name="inner"><xs:sequence><xs:element name="z" type="xs:byte"/></xs:sequence>
        </xs:group>
        <xs:group name="nest"><xs:sequence><xs:element name="e"><xs:complexType>
          <xs:sequence><xs:group ref="nest"/></xs:sequence></xs:complexType></xs:element>
        </xs:sequence></xs:group>
        <xs:attributeGroup name="ag"><xs:attribute name="id" type="xs:ID"/></xs:attributeGroup>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="first" type="xs:int"/><xs:group ref="g"/><xs:group ref="inner"/>
          <xs:element ref="addr"/><xs:group ref="nest"/>
        </xs:sequence><xs:attributeGroup ref="ag"/></xs:complexType></xs:element>
        <xs:element name="addr"><xs:complexType><xs:sequence>
          <xs:element name="city" type="xs:string"/>
          <xs:element ref="addr"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "n(0): inherits int(48) 0/10/0 notnull, own int(48) 0/10/0, off int(48) 0/10/0 notnull\n"
     "node(0): value string(16), node Record(2) notnull\n"
     "r(0): first int(48) 0/10/0, x int(48) 0/10/0, z byte(50) 0/3/0, y string(16), "
     "z byte(50) 0/3/0, addr Record(2) notnull, e Record(2) notnull, id ID attribute(288)\n"
     "addr(0): city string(16), addr Record(2) notnull\n"
     "e(0): e Record(2) notnull\n"},

    {"SameNameSharesFirstRecord", kTwoX,
     "r(0): a Record(2) notnull, b Record(2) notnull\n"
     "a(0): x Record(2) notnull\n"
     "x(0): w Record(2) notnull\n"
     "w(0): p int(48) 0/10/0\n"
     "b(0): x Record(2) notnull\n"
     "top(0): part Record(2) notnull\n"
     "part(0): sub Record(2) notnull\n"
     "sub(0): part Record(2) notnull\n"},
    // A name already on the path stands alone.
    {"QualifiedNamesKeepDistinctRecords", kTwoX,
     "r(0): a Record(2) notnull, b Record(2) notnull\n"
     "a(0): [a]x Record(2) notnull\n"
     "[a]x(0): [a!x]w Record(2) notnull\n"
     "[a!x]w(0): p int(48) 0/10/0\n"
     "b(0): [b]x Record(2) notnull\n"
     "[b]x(0): q int(48) 0/10/0\n"
     "top(0): part Record(2) notnull\n"
     "part(0): [part]sub Record(2) notnull\n"
     "[part]sub(0): part Record(2) notnull\n",
     "", true},

    // Derived content: an extension chain gives the fields of every base, farthest
    // first; simple content gives a field named after the record, typed through the
    // whole chain, which takes the attributes of every step.
    {"DerivedContent",
     R"(<xs:complexType name="A"><xs:sequence><xs:element name="a1" type="xs:int"/></xs:sequence>
          <xs:attribute name="aa" type="xs:string"/></xs:complexType>
        <xs:complexType name="B"><xs:complexContent><xs:extension base="A"><xs:sequence>
          <xs:element name="b1" type="xs:int"/></xs:sequence></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="C"><xs:complexContent><xs:extension base="B"><xs:sequence>
          <xs:element name="c1" type="xs:int"/></xs:sequence></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="Amount"><xs:simpleContent><xs:extension base="xs:decimal">
          <xs:attribute name="currency" type="xs:string"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:complexType name="Total"><xs:complexContent><xs:extension base="Amount">
          <xs:attribute name="tax" type="xs:boolean"/></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="Charge"><xs:simpleContent><xs:extension base="Amount">
          <xs:attribute name="reason" type="xs:token"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:complexType name="Fee"><xs:simpleContent><xs:extension base="Charge">
          <xs:attribute name="waived" type="xs:boolean"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:simpleType name="Code"><xs:restriction base="xs:string">
          <xs:maxLength value="6"/></xs:restriction></xs:simpleType>
        <xs:complexType name="Tagged"><xs:simpleContent><xs:extension base="Code">
          <xs:attribute name="scheme" type="xs:token"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:complexType name="T"><xs:complexContent><xs:extension base="xs:string">
          <xs:attribute name="lang" type="xs:language"/></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:element name="c" type="C"/><xs:element name="price" type="Amount"/>
        <xs:element name="total" type="Total"/><xs:element name="fee" type="Fee"/>
        <xs:element name="tag" type="Tagged"/><xs:element name="text" type="T"/>
        <xs:element name="r"><xs:complexType><xs:complexContent>
          <xs:restriction base="xs:anyType"><xs:sequence><xs:element name="x" type="xs:int"/>
          </xs:sequence></xs:restriction></xs:complexContent></xs:complexType></xs:element>)",
     "c(0): a1 int(48) 0/10/0, aa string attribute(272), b1 int(48) 0/10/0, "
     "c1 int(48) 0/10/0\n"
     "price(0): price decimal(20) 0/16/2, currency string attribute(272)\n"
     "total(0): total decimal(20) 0/16/2, currency string attribute(272), "
     "tax boolean attribute(273)\n"
     "fee(0): fee decimal(20) 0/16/2, currency string attribute(272), "
     "reason token attribute(319), waived boolean attribute(273)\n"
     "tag(0): tag string(16) 6/0/0, scheme token attribute(319)\n"
     "text(0): text string(16), lang language attribute(292)\n"
     "r(0): x int(48) 0/10/0\n"},

    // A restriction restates the content it keeps: its own elements replace the
    // base's, and of the base's attributes those it neither restates nor prohibits
    // stay, where the base is drawn in. Restricting an extension narrows what the
    // whole chain gave; extending a restriction adds to what the restriction kept.
    {"Restrictions",
     R"(<xs:attributeGroup name="Common"><xs:attribute name="id" type="xs:ID"/>
          <xs:attribute name="lang" type="xs:language"/></xs:attributeGroup>
        <xs:attribute name="note" type="xs:string"/>
        <xs:complexType name="Base"><xs:sequence><xs:element name="a" type="xs:int"/>
          <xs:element name="b" type="xs:string" minOccurs="0"/>
          </xs:sequence><xs:attribute name="x" type="xs:string"/>
          <xs:attribute name="y" type="xs:string"/>
          <xs:attributeGroup ref="Common"/><xs:attribute ref="note"/></xs:complexType>
        <xs:complexType name="Narrow"><xs:complexContent><xs:restriction base="Base">
          <xs:sequence><xs:element name="a" type="xs:int"/></xs:sequence>
          <xs:attribute name="x"><xs:simpleType><xs:restriction base="xs:string">
            <xs:maxLength value="2"/></xs:restriction></xs:simpleType></xs:attribute>
          <xs:attribute name="y" use="prohibited"/>
          <xs:attribute name="lang" type="xs:language" use="prohibited"/>
          <xs:attribute ref="note" use="required"/>
        </xs:restriction></xs:complexContent></xs:complexType>
        <xs:element name="narrow" type="Narrow"/>
        <xs:complexType name="Ext"><xs:complexContent><xs:extension base="Base">
          <xs:sequence><xs:element name="c" type="xs:int"/></xs:sequence>
          <xs:attribute name="z" type="xs:string"/></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="ExtNarrow"><xs:complexContent><xs:restriction base="Ext">
          <xs:sequence><xs:element name="c" type="xs:int"/></xs:sequence>
          <xs:attribute name="z" type="xs:token"/></xs:restriction></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="Wide"><xs:complexContent><xs:extension base="ExtNarrow">
          <xs:sequence><xs:element name="d" type="xs:int"/></xs:sequence>
        </xs:extension></xs:complexContent></xs:complexType>
        <xs:element name="wide" type="Wide"/>)",
     "narrow(0): id ID attribute(288), a int(48) 0/10/0, x string attribute(272) 2/0/0, "
     "note string attribute(272)\n"
     "wide(0): x string attribute(272), y string attribute(272), id ID attribute(288), "
     "lang language attribute(292), note string attribute(272), c int(48) 0/10/0, "
     "z token attribute(319), d int(48) 0/10/0\n"},

    // The facets of a simple-content restriction narrow the text of the restricting
    // type only; one of a complex base without text types its text by the simple type
    // it defines.
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
        <xs:complexType name="Masked"><xs:complexContent><xs:extension base="xs:anyType">
          <xs:attribute name="mask" type="xs:boolean"/></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="Str"><xs:simpleContent><xs:restriction base="Masked">
          <xs:simpleType><xs:restriction base="xs:string"><xs:maxLength value="4"/>
          </xs:restriction></xs:simpleType>
          <xs:attribute name="kind"><xs:simpleType><xs:restriction base="xs:int"/>
          </xs:simpleType></xs:attribute></xs:restriction></xs:simpleContent></xs:complexType>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="short" type="Short"/>
          <xs:element name="kind" type="Kind"/>
          <xs:element name="long" type="code"/>
          <xs:element name="amount" type="Amount"/>
          <xs:element name="small" type="Small"/>
          <xs:element name="tiny" type="Tiny"/>
          <xs:element name="str" type="Str"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): short Record(2) notnull, kind Record(2) notnull, long string(16) 10/0/0, "
     "amount Record(2) notnull, small Record(2) notnull, tiny Record(2) notnull, "
     "str Record(2) notnull\n"
     "short(0): short string(16) 2/0/0\n"
     "kind(0): kind string(16) 6/0/0\n"
     "amount(0): amount string(16) 10/0/0, cur string attribute(272)\n"
     "small(0): small string(16) 5/0/0, cur string attribute(272)\n"
     "tiny(0): tiny string(16) 3/0/0, cur string attribute(272)\n"
     "str(0): str string(16) 4/0/0, kind int attribute(304) 0/10/0\n"},

    // Failures: the read fails and the records built so far stay with the browser.
    {"UnknownFieldType",
     R"(<xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element name="ok" type="xs:int"/>
          <xs:element name="s"><xs:complexType><xs:sequence>
            <xs:element name="bad" type="Nope"/></xs:sequence></xs:complexType></xs:element>
          <xs:element name="never" type="xs:int"/>
        </xs:sequence></xs:complexType></xs:element>)",
     "r(0): ok int(48) 0/10/0\n"
     "s(0):\n",
     "4 0 Lookup of type 'Nope' (ns 'urn:t') failed for field 'bad'\n", false, kTargetNs},

    {"MissingBaseType",
     R"(<xs:complexType name="T"><xs:complexContent><xs:extension base="Missing">
          <xs:sequence><xs:element name="x" type="xs:int"/></xs:sequence>
        </xs:extension></xs:complexContent></xs:complexType>
        <xs:element name="r" type="T"/>)",
     "r(0):\n", "4 0 Lookup of type 'Missing' (ns '') failed for field 'r'\n"},

    {"ExtensionCycle",
     R"(<xs:complexType name="A"><xs:complexContent><xs:extension base="B"><xs:sequence>
          <xs:element name="a" type="xs:int"/></xs:sequence></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="B"><xs:complexContent><xs:extension base="A"><xs:sequence>
          <xs:element name="b" type="xs:int"/></xs:sequence></xs:extension></xs:complexContent>
        </xs:complexType>
        <xs:element name="e" type="A"/>)",
     "e(0):\n", "4 0 Circular base type chain at complex type A\n"},

    {"ExtensionCycleAboveTheRecordType",
     R"(<xs:complexType name="C"><xs:complexContent><xs:extension base="A"/></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="A"><xs:complexContent><xs:extension base="B"/></xs:complexContent>
        </xs:complexType>
        <xs:complexType name="B"><xs:complexContent><xs:extension base="A"/></xs:complexContent>
        </xs:complexType>
        <xs:element name="e" type="C"/>)",
     "e(0):\n", "4 0 Circular base type chain at complex type A\n"},

    {"MissingReference",
     R"(<xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element ref="missing"/></xs:sequence></xs:complexType></xs:element>)",
     "r(0):\n", "4 0 Failed to look up ref to urn:t:missing\n", false, kTargetNs},

    {"ReferenceToItself",
     R"(<xs:element name="a" ref="a"/>
        <xs:element name="r"><xs:complexType><xs:sequence>
          <xs:element ref="a"/></xs:sequence></xs:complexType></xs:element>)",
     "r(0):\n", "4 0 Circular reference to element :a\n"},

    {"GroupReferringToItself",
     R"(<xs:group name="g"><xs:sequence><xs:element name="x" type="xs:int"/>
          <xs:group ref="g"/></xs:sequence></xs:group>
        <xs:element name="r"><xs:complexType><xs:group ref="g"/></xs:complexType></xs:element>)",
     "r(0): x int(48) 0/10/0\n", "4 0 Circular reference to group g\n"},

    // Types and groups have names of their own: a group reference finds no type.
    {"GroupReferenceFindsNoTypeOfThatName",
     R"(<xs:complexType name="T"><xs:sequence><xs:group ref="T"/></xs:sequence></xs:complexType>
        <xs:element name="r" type="T"/>)",
     "r(0):\n", "4 4 Unable to find group T\n"},
};

class RecordLayout : public ::testing::TestWithParam<RecordCase> {};

TEST_P(RecordLayout, Builds) {
    const RecordCase& c = GetParam();
    const SchemaRead read = readInline(c.body, c.qualified, c.schemaAttrs);
    EXPECT_EQ(read.ok, !*c.messages);
    EXPECT_EQ(read.records, c.records);
    EXPECT_EQ(read.messages, c.messages);
}

INSTANTIATE_TEST_SUITE_P(Dictionary, RecordLayout, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.label); });

// No schema reaches a record whose type is missing: ReadSchema and addField look the
// type up before they ask for the record. Asked directly, the record is left empty.
TEST(RecordBuilding, MissingComplexTypeLeavesEmptyRecord) {
    const SchemaModel model;
    const BuiltinTypes builtins;
    ZrRecordList records;
    RecordBuilder builder(model, builtins, records, false);
    ElementDef declaration;
    declaration.name = u"r";
    declaration.typeName = u"Missing";
    LogCapture log;
    EXPECT_EQ(builder.buildRecord(declaration), nullptr);
    EXPECT_EQ(log.lines(), "4 4 Unable to find complex type zrxxxtrg:Missing\n");
    EXPECT_EQ(zrtest::dumpRecords(records), "r(0):\n");
}

// Records nested deeper than the bound fail the read with one message instead of
// exhausting the stack; nesting at the bound reads.
TEST(RecordBuilding, NestingDepthIsBounded) {
    for (int depth : {1000, 1001}) {
        std::string body;
        for (int i = 0; i < depth; ++i)
            body += "<xs:element name=\"e" + std::to_string(i) + "\"><xs:complexType><xs:sequence>";
        body += "<xs:element name=\"leaf\" type=\"xs:int\"/>";
        for (int i = 0; i < depth; ++i)
            body += "</xs:sequence></xs:complexType></xs:element>";
        const SchemaRead read = readInline(body);
        EXPECT_EQ(read.ok, depth == 1000);
        EXPECT_EQ(read.messages,
                  depth == 1000 ? "" : "4 0 Schema nesting deeper than 1000 levels at e1000\n");
    }
}

// Groups that each use the next one twice would expand to 2^25 fields, and
// qualified record names over types shared along every path to 2^25 records: the
// read stops at its step ceiling instead. Without qualified names the second schema
// is small.
TEST(RecordBuilding, ExpansionIsBounded) {
    std::string groups = "<xs:element name=\"r\"><xs:complexType><xs:group ref=\"g0\"/>"
                         "</xs:complexType></xs:element>";
    std::string types;
    for (int i = 0; i < 25; ++i) {
        const std::string n = std::to_string(i), next = std::to_string(i + 1);
        const std::string ref = "<xs:group ref=\"g" + next + "\"/>";
        groups +=
            "<xs:group name=\"g" + n + "\"><xs:sequence>" + ref + ref + "</xs:sequence></xs:group>";
        types += "<xs:complexType name=\"T" + n + "\"><xs:sequence><xs:element name=\"a" + n +
                 "\" type=\"T" + next + "\"/><xs:element name=\"b" + n + "\" type=\"T" + next +
                 "\"/></xs:sequence></xs:complexType>";
    }
    groups += R"(<xs:group name="g25"><xs:sequence><xs:element name="x" type="xs:int"/>
                 </xs:sequence></xs:group>)";
    types += R"(<xs:complexType name="T25"><xs:sequence><xs:element name="x" type="xs:int"/>
                </xs:sequence></xs:complexType><xs:element name="r" type="T0"/>)";
    for (const SchemaRead& read : {readInline(groups), readInline(types, true)}) {
        EXPECT_FALSE(read.ok);
        EXPECT_EQ(read.messages.rfind("4 0 Schema expands beyond ", 0), 0u) << read.messages;
        EXPECT_EQ(std::count(read.messages.begin(), read.messages.end(), '\n'), 1);
    }
    const SchemaRead plain = readInline(types, false);
    EXPECT_TRUE(plain.ok) << plain.messages;
}

} // namespace
