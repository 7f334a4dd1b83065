// The component model a schema is read into, and the namespaces its names take: one
// inline schema and the expected model and messages per row, each read whole and one
// byte at a time.
#include "model_dump.h"

#include <gtest/gtest.h>

namespace {

using namespace zrtest;

constexpr const char* kTns = R"(targetNamespace="urn:t" xmlns:t="urn:t")";

struct ModelCase {
    const char* name;
    const char* schemaAttrs; // null: `body` is the whole document
    const char* body;
    const char* model;
    const char* messages;
};

const ModelCase kModelCases[] = {
    {"NestedAnonymousTypesEndInnerFirst", kTns,
     R"(<xs:element name="order"><xs:complexType><xs:sequence>
          <xs:element name="id" type="xs:int"/>
          <xs:element name="item"><xs:complexType><xs:sequence>
            <xs:element name="sku" type="xs:string"/>
          </xs:sequence></xs:complexType></xs:element>
        </xs:sequence><xs:attribute name="status" type="xs:string"/></xs:complexType></xs:element>)",
     "global element name={urn:t}order type=anon0\n"
     "complexType anon1\n"
     "  element name={urn:t}sku type={xs}string\n"
     "complexType anon0\n"
     "  element name={urn:t}id type={xs}int\n"
     "  element name={urn:t}item type=anon1\n"
     "  attribute name={urn:t}status type={xs}string\n",
     ""},
    {"NullableIsFalseOnlyForFalseInAnyCase", "",
     R"(<xs:element name="a" type="xs:string" nullable="False"/>
        <xs:element name="c" type="xs:string" nullable="no"/>
        <xs:element name="e" type="xs:string" nullable=""/>)",
     "global element name=a type={xs}string !nullable\n"
     "global element name=c type={xs}string\n"
     "global element name=e type={xs}string\n",
     ""},
    {"DeclarationNamespacesHoldForTheirElement", "",
     R"(<xs:element name="a" type="foo:bar" xmlns:foo="urn:foo" minOccurs="0" maxOccurs="2"
            default="x" fixed="y" form="qualified" use="required"/>)",
     "global element name=a type={urn:foo}bar\n", "512 0 xmlns in element attrs\n"},
    // A prefix declared on an element is gone once it ends, whatever is declared next.
    {"ElementPrefixesEndWithTheirElement", "",
     R"(<xs:element name="a" type="q:T" xmlns:q="urn:q"/>
        <xs:element name="b" type="q:T" xmlns:r="urn:r"/>)",
     "global element name=a type={urn:q}T\n"
     "global element name=b type=T\n",
     "512 0 xmlns in element attrs\n512 0 xmlns in element attrs\n"},
    {"BareNamesResolveByRole", kTns,
     R"(<xs:element name="a" type="string"/>
        <xs:element ref="a"/>
        <xs:element name="b" ref="t:a"/>
        <xs:element name="c" type="xs:a:b"/>
        <xs:element name="d" type="zrxxxtrg:T"/>)",
     "global element name={urn:t}a type=string\n"
     "global element ref={urn:t}a\n"
     "global element name={urn:t}b ref={urn:t}a\n"
     "global element name={urn:t}c type={xs}a:b\n"
     "global element name={urn:t}d type={urn:t}T\n",
     ""},
    // A type attribute wins over a type defined inside the declaration; a declaration
    // inside another is stored first.
    {"TypeAttributeWinsAndInnerDeclarationsComeFirst", "",
     R"(<xs:element name="e" type="xs:string"><xs:complexType/></xs:element>
        <xs:element name="p" type="xs:string"><xs:element name="c" type="xs:int"/></xs:element>
        <xs:attribute name="lang" type="xs:language"/>)",
     "global element name=e type={xs}string\n"
     "global element name=c type={xs}int\n"
     "global element name=p type={xs}string\n"
     "global attribute name=lang type={xs}language\n"
     "complexType anon0\n",
     ""},
    {"ForeignAndUnboundTagsAreReportedAndHandled", R"(xmlns:f="urn:foreign")",
     R"(<f:element name="x" type="xs:string"/>
        <element name="y" type="xs:string"/>)",
     "global element name=x type={xs}string\n"
     "global element name=y type={xs}string\n",
     "512 0 Element 'element' not in XMLSchema namespace (is 'urn:foreign', should be "
     "'http://www.w3.org/2001/XMLSchema'\n"
     "512 0 Element 'element' not in XMLSchema namespace (is '', should be "
     "'http://www.w3.org/2001/XMLSchema'\n"},
    {"AnnotationsAndNotationsAreSkippedWhole", "",
     R"(<xs:annotation><xs:documentation><xs:element name="hidden"/>
          <foo:bar xmlns:foo="urn:foo"><deep><deeper/></deep></foo:bar></xs:documentation>
          <xs:appinfo><xs:include schemaLocation="nowhere.xsd"/></xs:appinfo></xs:annotation>
        <xs:notation name="n" public="p"><xs:element name="hidden2"/></xs:notation>
        <xs:documentation><xs:element name="hidden3"/></xs:documentation>
        <xs:element name="shown" type="xs:string"/>)",
     "global element name=shown type={xs}string\n", ""},
    {"CompositorsWildcardsAndImportsPassThrough", kTns,
     R"(<xs:import namespace="urn:other"/>
        <xs:complexType name="T"><xs:choice><xs:sequence>
          <xs:element name="a" type="xs:string"/><xs:any/></xs:sequence>
          <xs:all><xs:element name="b" type="xs:int"/></xs:all></xs:choice>
          <xs:anyAttribute/></xs:complexType>)",
     "complexType {urn:t}T\n"
     "  element name={urn:t}a type={xs}string\n"
     "  element name={urn:t}b type={xs}int\n",
     ""},
    // A restriction after an inline simple type belongs to the complex type again.
    {"BasesFromComplexTypeExtensionRestrictionAndContent", kTns,
     R"(<xs:complexType name="D" base="t:B" derivedBy="extension"/>
        <xs:complexType name="Price"><xs:simpleContent><xs:extension base="xs:decimal">
          <xs:attribute name="currency" type="xs:string"/></xs:extension></xs:simpleContent>
        </xs:complexType>
        <xs:complexType name="X"><xs:simpleContent/><xs:complexContent>
          <xs:extension base="t:Y"/></xs:complexContent></xs:complexType>
        <xs:complexType name="C">
          <xs:attribute name="a"><xs:simpleType><xs:restriction base="xs:string">
            <xs:maxLength value="5"/></xs:restriction></xs:simpleType></xs:attribute>
          <xs:complexContent><xs:restriction base="t:Base"/></xs:complexContent>
        </xs:complexType>)",
     "complexType {urn:t}D base={urn:t}B\n"
     "complexType {urn:t}Price base={xs}decimal simpleContent\n"
     "  attribute name={urn:t}currency type={xs}string\n"
     "complexType {urn:t}X base={urn:t}Y\n"
     "complexType {urn:t}C base={urn:t}Base\n"
     "  attribute name={urn:t}a type=anon0\n"
     "simpleType anon0 base={xs}string maxLength=5\n",
     ""},
    // A group reference inside a group definition keeps the definition open.
    {"GroupsAndAttributeGroups", "",
     R"(<xs:group name="g"><xs:sequence><xs:element name="a" type="xs:string"/>
          <xs:group ref="inner"/><xs:element name="b" type="xs:string"/></xs:sequence></xs:group>
        <xs:attributeGroup name="ag"><xs:attributeGroup ref="more"/>
          <xs:attribute name="x" type="xs:string"/></xs:attributeGroup>
        <xs:complexType name="T"><xs:sequence><xs:element name="first" type="xs:string"/>
          <xs:group ref="g"/></xs:sequence><xs:attribute name="before" type="xs:string"/>
          <xs:attributeGroup ref="ag"/><xs:attribute name="after" type="xs:string"/>
        </xs:complexType>
        <xs:group ref="g"/>)",
     "global element group=g\n"
     "complexType g group\n"
     "  element name=a type={xs}string\n"
     "  element group=inner\n"
     "  element name=b type={xs}string\n"
     "complexType ag group\n"
     "  element group=more\n"
     "  attribute name=x type={xs}string\n"
     "complexType T\n"
     "  element name=first type={xs}string\n"
     "  element group=g\n"
     "  attribute name=before type={xs}string\n"
     "  element group=ag\n"
     "  attribute name=after type={xs}string\n",
     ""},
    {"GroupNameAndRefAndAnonymousGroup", "",
     R"(<xs:group name="g" ref="h"><xs:element name="a" type="xs:string"/></xs:group>
        <xs:group><xs:element name="b" type="xs:string"/></xs:group>)",
     "complexType g group\n"
     "  element name=a type={xs}string\n"
     "complexType anon0 group\n"
     "  element name=b type={xs}string\n",
     "512 0 Group g has both name and ref\n"},
    {"NamespaceDeclarationsOnTypesAreReportedAndEndWithThem", "",
     R"(<xs:group name="g" xmlns:z="urn:z"/>
        <xs:complexType name="c" xmlns="urn:d"><xs:complexContent>
          <xs:extension base="b" xmlns:y="urn:y"/></xs:complexContent></xs:complexType>
        <xs:simpleType name="s" xmlns:w="urn:w"><xs:restriction base="xs:int" xmlns:v="v"/>
        </xs:simpleType>
        <xs:simpleType name="t"><xs:restriction base="b"/></xs:simpleType>)",
     "complexType g group\n"
     "complexType c base={urn:d}b\n"
     "simpleType s base={xs}int\n"
     "simpleType t base=b\n",
     "512 0 xmlns in group attrs\n"
     "512 0 xmlns in complextype attrs\n"
     "512 0 xmlns in extension attrs\n"
     "512 0 xmlns in complextype attrs\n"},
    // The last value of a facet wins, a valueless one clears it; an enumeration keeps
    // the longest value.
    {"EveryTextFacetLastOneWinsEnumerationKeepsLongest", "",
     R"(<xs:simpleType name="All"><xs:restriction base="xs:decimal">
          <xs:minInclusive value="1"/><xs:maxInclusive value="2"/>
          <xs:minExclusive value="3"/><xs:maxExclusive value="4"/>
          <xs:length value="5" fixed="true"/><xs:minLength id="x" value="6"/>
          <xs:maxLength value="7"/><xs:maxLength fixed="true"/><xs:pattern value="[A-Z]+"/>
          <xs:pattern value="8"/><xs:precision value="9"/><xs:scale value="10"/>
          <xs:encoding value="hex"/><xs:period value="P1D"/><xs:duration value="PT1H"/>
          <xs:enumeration value="a"/><xs:enumeration value="abc"/><xs:enumeration value="ab"/>
          <xs:enumeration/><xs:totalDigits value="5"/><xs:whiteSpace value="collapse"/>
        </xs:restriction></xs:simpleType>)",
     "simpleType All base={xs}decimal minInclusive=1 maxInclusive=2 minExclusive=3 "
     "maxExclusive=4 length=5 minLength=6 pattern=8 precision=9 scale=10 encoding=hex "
     "period=P1D duration=PT1H enum=3\n",
     ""},
    {"ListsAreStringsAndTheirItemTypesTypesOfTheirOwn", kTns,
     R"(<xs:simpleType name="L"><xs:list itemType="xs:int"/></xs:simpleType>
        <xs:simpleType name="L2"><xs:list><xs:simpleType><xs:restriction base="xs:int"/>
          </xs:simpleType></xs:list></xs:simpleType>
        <xs:element name="e"><xs:simpleType><xs:restriction base="xs:int"/></xs:simpleType>
        </xs:element>)",
     "global element name={urn:t}e type=anon1\n"
     "simpleType {urn:t}L base=string\n"
     "simpleType anon0 base={xs}int\n"
     "simpleType {urn:t}L2 base=string\n"
     "simpleType anon1 base={xs}int\n",
     ""},
    {"NestedSimpleTypesAreTypesOfTheirOwn", "",
     R"(<xs:simpleType name="U"><xs:union memberTypes="xs:int  xs:string"><xs:simpleType>
          <xs:restriction base="xs:int"><xs:maxInclusive value="9"/></xs:restriction>
        </xs:simpleType></xs:union></xs:simpleType>
        <xs:simpleType name="R"><xs:restriction><xs:simpleType><xs:restriction base="xs:string">
          <xs:maxLength value="5"/></xs:restriction></xs:simpleType><xs:maxLength value="3"/>
        </xs:restriction></xs:simpleType>)",
     "simpleType anon0 base={xs}int maxInclusive=9\n"
     "simpleType U union={xs}int,{xs}string,anon0\n"
     "simpleType anon1 base={xs}string maxLength=5\n"
     "simpleType R base=anon1 maxLength=3\n",
     ""},
    {"FacetsOfSimpleContentRestrictionGoToTheType", "",
     R"(<xs:simpleType name="S"><xs:restriction base="xs:string"><xs:maxLength value="4"/>
        </xs:restriction></xs:simpleType>
        <xs:complexType name="C"><xs:simpleContent><xs:restriction base="Base">
          <xs:maxLength value="8"/></xs:restriction></xs:simpleContent></xs:complexType>
        <xs:simpleType name="T"><xs:restriction base="xs:string"/></xs:simpleType>)",
     "complexType C base=Base maxLength=8 simpleContent\n"
     "simpleType S base={xs}string maxLength=4\n"
     "simpleType T base={xs}string\n",
     ""},
    {"RestrictionAndListBeforeAnyTypeGoNowhere", "",
     R"(<xs:restriction base="xs:string"><xs:maxLength value="3"/></xs:restriction>
        <xs:list itemType="xs:int"><xs:element name="hidden" type="xs:string"/></xs:list>
        <xs:element name="shown" type="xs:string"/>)",
     "global element name=shown type={xs}string\n", ""},
    {"TypesDefinedTwiceAreBothKept", kTns,
     R"(<xs:complexType name="T"><xs:attribute name="first" type="xs:string"/></xs:complexType>
        <xs:complexType name="T"><xs:attribute name="second" type="xs:string"/></xs:complexType>)",
     "complexType {urn:t}T\n"
     "  attribute name={urn:t}first type={xs}string\n"
     "complexType {urn:t}T\n"
     "  attribute name={urn:t}second type={xs}string\n",
     ""},
    // The XML Schema namespace as the default namespace reads like the prefixed form.
    {"DefaultNamespaceSchemaReadsLikeAPrefixedOne", nullptr,
     R"(<schema xmlns="http://www.w3.org/2001/XMLSchema" targetNamespace="urn:t">
           <element name="e"><complexType><sequence><element name="a" type="string"/></sequence>
             <attribute name="b"><simpleType><restriction base="int">
               <maxInclusive value="5"/></restriction></simpleType></attribute>
           </complexType></element></schema>)",
     "global element name={urn:t}e type=anon0\n"
     "complexType anon0\n"
     "  element name={urn:t}a type={xs}string\n"
     "  attribute name={urn:t}b type=anon1\n"
     "simpleType anon1 base={xs}int maxInclusive=5\n",
     ""},
    // The first element's attributes declare the namespaces: "xmlns" followed by
    // anything but a colon is the default one, "xmlns:" an empty prefix.
    {"FirstElementAttributesDeclareTheNamespaces", nullptr,
     R"(<x:schema xmlns:x="http://www.w3.org/2001/XMLSchema" xmlnsFoo="urn:d" xmlns:="urn:e"
          targetNamespace="urn:t" version="1" elementFormDefault="qualified"
          attributeFormDefault="unqualified" id="s">
          <x:element name="e" type=":T"/><x:element name="f" type="T"/></x:schema>)",
     "global element name={urn:t}e type={urn:e}T\n"
     "global element name={urn:t}f type={urn:d}T\n",
     "512 0 Unknown first element attribute 'id'\n"},
    // Only the first element of a document declares the target namespace, whatever
    // its name; prefixes declared below it hold within their element.
    {"OnlyTheFirstElementDeclaresTheTarget", nullptr,
     R"(<wrapper xmlns:xs="http://www.w3.org/2001/XMLSchema" targetNamespace="urn:w" bogus="1">
          <xs:schema targetNamespace="urn:ignored" xmlns:q="urn:q">
            <xs:element name="a" type="q:T"/></xs:schema></wrapper>)",
     "global element name={urn:w}a type={urn:q}T\n",
     "512 0 Unknown first element attribute 'bogus'\n"},
    // Before any "schema" element no schema namespace is known: every element is
    // reported.
    {"ElementsBeforeAnySchemaElementAreReported", nullptr,
     R"(<xs:element xmlns:xs="http://www.w3.org/2001/XMLSchema" name="a" type="xs:string"/>)",
     "global element name=a type={xs}string\n",
     "512 0 Unknown first element attribute 'name'\n"
     "512 0 Unknown first element attribute 'type'\n"
     "512 0 Element 'element' not in XMLSchema namespace (is "
     "'http://www.w3.org/2001/XMLSchema', should be ''\n"
     "512 0 xmlns in element attrs\n"},
};

class ModelReading : public ::testing::TestWithParam<ModelCase> {};

TEST_P(ModelReading, ReadsTheSameModelWholeAndByteByByte) {
    const ModelCase& c = GetParam();
    const std::string document = c.schemaAttrs ? schemaDoc(c.body, c.schemaAttrs) : c.body;
    for (XMLSize_t chunk : {XMLSize_t(0), XMLSize_t(1)}) {
        SCOPED_TRACE("chunk " + std::to_string(chunk));
        const ReadOutcome read = readSchemaText(document, chunk);
        EXPECT_TRUE(read.ok);
        EXPECT_EQ(read.model, c.model);
        EXPECT_EQ(read.log, c.messages);
    }
}

INSTANTIATE_TEST_SUITE_P(Schemas, ModelReading, ::testing::ValuesIn(kModelCases),
                         [](const auto& row) { return std::string(row.param.name); });

// Null names are accepted: a generated-looking name is found whatever the
// namespace, no name finds nothing (the index is checked in model_index_lookup.cpp).
TEST(ModelLookup, NullNamesAndNamespaces) {
    SchemaModel model;
    ComplexTypeDef t;
    t.name = u"anonymous";
    t.nameNs = u"urn:c";
    model.complexTypes.push_back(t);
    EXPECT_EQ(model.findComplexType(u"anonymous", {}), &model.complexTypes[0]);
    EXPECT_EQ(model.findComplexType({}, {}), nullptr);
}

// The reader clears the working declaration and type after moving them away; what
// a move leaves behind must go, but a declaration's nullable flag stays.
TEST(ModelRecords, ClearKeepsWhatTheReaderReliesOn) {
    ElementDef e;
    e.name = u"n";
    e.refName = u"r";
    e.isAttribute = true;
    e.nullable = false;
    e.clear();
    EXPECT_EQ(dumpElement(e), "element !nullable");

    ComplexTypeDef t;
    t.name = u"t";
    t.maxLength = u"3";
    t.maxEnumLength = 4;
    t.content.push_back(e);
    t.isGroup = t.simpleContent = true;
    t.clear();
    EXPECT_EQ(dumpTypeParts(t), "");
    EXPECT_TRUE(t.content.empty());
    EXPECT_FALSE(t.isGroup || t.simpleContent);
}

} // namespace
