// Schemas spread over documents: imports, redefinitions and the XML namespace, read
// through the browser and checked by the records they give.
#include "dictionary_support.h"
#include "model_dump.h"

#include <gtest/gtest.h>
#include <map>
#include <string>

namespace {

using zrtest::LogCapture;
using zrtest::TempDir;
using zrtest::wide;

struct DocumentsCase {
    const char* label;
    // Documents by file name; the read starts at "main.xsd".
    std::map<std::string, std::string> files;
    const char* records;
    const char* messages = "";
    bool ok = true;
};

void PrintTo(const DocumentsCase& row, std::ostream* os) { *os << row.label; }

std::string doc(const std::string& attrs, const std::string& body) {
    return std::string(R"(<xs:schema xmlns:xs="http://www.w3.org/2001/XMLSchema" )") + attrs +
           ">\n" + body + "\n</xs:schema>\n";
}

const std::string kMainA = R"(targetNamespace="urn:a" xmlns="urn:a" xmlns:b="urn:b")";
const std::string kB = R"(targetNamespace="urn:b" xmlns="urn:b")";

// A document of urn:b: a type Code of its own, an element of complex type, a group.
const std::string kDocB = doc(kB, R"(<xs:simpleType name="Code"><xs:restriction base="xs:string">
                 <xs:maxLength value="9"/></xs:restriction></xs:simpleType>
               <xs:complexType name="Party"><xs:sequence>
                 <xs:element name="id" type="Code"/></xs:sequence></xs:complexType>
               <xs:element name="party" type="Party"/>
               <xs:group name="G"><xs:sequence><xs:element name="g" type="xs:int"/>
               </xs:sequence></xs:group>)");

const DocumentsCase kCases[] = {
    // The main schema's own Code answers its own lookups, urn:b's those of urn:b.
    {"ImportedComponentsTypeFieldsButMakeNoRecordsOfTheirOwn",
     {{"main.xsd", doc(kMainA, R"(<xs:import namespace="urn:b" schemaLocation="sub/b.xsd"/>
               <xs:simpleType name="Code"><xs:restriction base="xs:string">
                 <xs:maxLength value="3"/></xs:restriction></xs:simpleType>
               <xs:element name="r"><xs:complexType><xs:sequence>
                 <xs:element ref="b:party"/><xs:element name="code" type="b:Code"/>
                 <xs:element name="c" type="Code"/>
                 <xs:group ref="b:G"/></xs:sequence></xs:complexType></xs:element>)")},
      {"sub/b.xsd", kDocB}},
     "r(0): b:party Record(2) notnull, code string(16) 9/0/0, c string(16) 3/0/0, "
     "b:g int(48) 0/10/0\n"
     "b:party(0): b:id string(16) 9/0/0\n"},
    // An import of the XML namespace that cannot be read leaves the built-in one.
    {"UnusedImportsThatCannotBeReadAreSilent",
     {{"main.xsd", doc(kMainA + R"( xmlns:xml="http://www.w3.org/XML/1998/namespace")",
                       R"(<xs:import namespace="urn:m" schemaLocation="missing.xsd"/>
               <xs:import namespace="urn:h" schemaLocation="http://127.0.0.1:9/h.xsd"/>
               <xs:import namespace="urn:n"/>
               <xs:import namespace="urn:p" schemaLocation="page.xsd"/>
               <xs:import namespace="http://www.w3.org/XML/1998/namespace"
                          schemaLocation="http://www.w3.org/2001/xml.xsd"/>
               <xs:element name="r"><xs:complexType><xs:attribute ref="xml:space"/>
               </xs:complexType></xs:element>)")},
      {"page.xsd", "<html><body>not a schema</body></html>"}},
     "r(0): xml:space NCName attribute(299) 8/0/0\n"},
    {"NeededImportThatCannotBeReadNamesItsDocument",
     {{"main.xsd", doc(kMainA + R"( xmlns:m="urn:m")",
                       R"(<xs:import namespace="urn:m" schemaLocation="missing.xsd"/>
               <xs:element name="r"><xs:complexType><xs:sequence>
                 <xs:element name="x" type="m:T"/></xs:sequence></xs:complexType></xs:element>)")}},
     "r(0):\n",
     "4 0 Lookup of type 'T' (ns 'urn:m') failed for field 'x'\n"
     "4 4 Import of namespace 'urn:m' from '$DIR/missing.xsd' was not read: the file cannot be "
     "opened\n",
     false},
    {"NeededImportWithAProtocolIsNotFetched",
     {{"main.xsd", doc(kMainA + R"( xmlns:h="urn:h")",
                       R"(<xs:import namespace="urn:h" schemaLocation="http://127.0.0.1:9/h.xsd"/>
               <xs:element name="r"><xs:complexType><xs:sequence>
                 <xs:element ref="h:e"/></xs:sequence></xs:complexType></xs:element>)")}},
     "r(0):\n",
     "4 0 Failed to look up ref to urn:h:e\n"
     "4 4 Import of namespace 'urn:h' from 'http://127.0.0.1:9/h.xsd' was not read: it is not a "
     "local file, and no catalog maps it to one\n",
     false},
    {"ImportedDocumentThatIsNoSchema",
     {{"main.xsd", doc(kMainA, R"(<xs:import namespace="urn:b" schemaLocation="b.xsd"/>
               <xs:element name="r"><xs:complexType><xs:sequence>
                 <xs:element name="p" type="b:Party"/></xs:sequence></xs:complexType>
               </xs:element>)")},
      {"b.xsd", "<html/>"}},
     "r(0):\n",
     "4 0 Lookup of type 'Party' (ns 'urn:b') failed for field 'p'\n"
     "4 4 Import of namespace 'urn:b' from '$DIR/b.xsd' was not read: Schema: Error: File "
     "$DIR/b.xsd is not a schema document\n",
     false},
    // Each document is read once, however the imports and includes go round.
    {"ImportedIncludesTakeTheImportedTargetNamespaceAndCyclesEnd",
     {{"main.xsd", doc(kMainA, R"(<xs:import namespace="urn:b" schemaLocation="b.xsd"/>
               <xs:element name="r"><xs:complexType><xs:sequence>
                 <xs:element name="t" type="b:T"/></xs:sequence></xs:complexType></xs:element>)")},
      {"b.xsd", doc(kB, R"(<xs:include schemaLocation="chameleon.xsd"/>
               <xs:import namespace="urn:a" schemaLocation="main.xsd"/>)")},
      {"chameleon.xsd", doc("", R"(<xs:include schemaLocation="b.xsd"/>
               <xs:simpleType name="T"><xs:restriction base="xs:string">
                 <xs:maxLength value="7"/></xs:restriction></xs:simpleType>)")}},
     "r(0): t string(16) 7/0/0\n"},
    {"RedefinitionsReplaceAndReferToTheOriginal",
     {{"main.xsd", doc(kMainA, R"(<xs:redefine schemaLocation="base.xsd">
                 <xs:complexType name="T"><xs:complexContent><xs:extension base="T">
                   <xs:sequence><xs:element name="added" type="xs:int"/></xs:sequence>
                 </xs:extension></xs:complexContent></xs:complexType>
                 <xs:group name="G"><xs:sequence><xs:group ref="G"/>
                   <xs:element name="more" type="xs:string"/></xs:sequence></xs:group>
               </xs:redefine>
               <xs:element name="r" type="T"/>
               <xs:element name="s"><xs:complexType><xs:group ref="G"/></xs:complexType>
               </xs:element>)")},
      {"base.xsd", doc(kMainA, R"(<xs:complexType name="T"><xs:sequence>
                 <xs:element name="kept" type="xs:string"/></xs:sequence></xs:complexType>
               <xs:group name="G"><xs:sequence><xs:element name="g" type="xs:date"/>
               </xs:sequence></xs:group>
               <xs:element name="u" type="T"/>)")}},
     "r(0): kept string(16), added int(48) 0/10/0\n"
     "s(0): g date(57), more string(16)\n"
     "u(0): kept string(16), added int(48) 0/10/0\n"},
    {"XmlNamespaceIsBuiltIn",
     {{"main.xsd", doc(kMainA, R"(<xs:element name="r"><xs:complexType>
                 <xs:attribute ref="xml:lang"/>
                 <xs:attributeGroup ref="xml:specialAttrs"/></xs:complexType></xs:element>)")}},
     "r(0): xml:lang language attribute(292), xml:base anyURI attribute(287), "
     "xml:lang language attribute(292), xml:space NCName attribute(299) 8/0/0, "
     "xml:id ID attribute(288)\n"},
    {"ImportedXmlNamespaceDocumentWins",
     {{"main.xsd", doc(kMainA, R"(<xs:import namespace="http://www.w3.org/XML/1998/namespace"
                                schemaLocation="xml.xsd"/>
               <xs:element name="r"><xs:complexType><xs:attribute ref="xml:lang"/>
               </xs:complexType></xs:element>)")},
      {"xml.xsd", doc(R"(targetNamespace="http://www.w3.org/XML/1998/namespace")",
                      R"(<xs:attribute name="lang"><xs:simpleType><xs:restriction
                   base="xs:string"><xs:maxLength value="35"/></xs:restriction>
                 </xs:simpleType></xs:attribute>)")}},
     "r(0): xml:lang string attribute(272) 35/0/0\n"},
};

class Documents : public ::testing::TestWithParam<DocumentsCase> {};

TEST_P(Documents, GiveRecords) {
    const DocumentsCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, text] : c.files)
        dir.write(name, text);
    LogCapture log;
    ZrXmlSchemaBrowser browser;
    const bool ok = browser.ReadSchema(wide((dir.path() / "main.xsd").string()).c_str(), false);
    EXPECT_EQ(ok, c.ok);
    EXPECT_EQ(zrtest::dumpRecords(browser.Records()), c.records);
    EXPECT_EQ(zrtest::replaceAll(log.lines(), dir.path().string(), "$DIR"), c.messages);
}

INSTANTIATE_TEST_SUITE_P(Schemas, Documents, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.label); });

} // namespace
