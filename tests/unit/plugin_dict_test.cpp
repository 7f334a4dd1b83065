// The dictionary the host gets from NewBrowser: construction, copies, reads and
// the failure of a parser library that did not initialise.
#include "TestSupport.h"
#include "ZrXmlSchemaDict.h"

#include <gtest/gtest.h>
#include <string>

// Reaches the dictionary's private state.
class ZrXmlSchemaDictTestAccess {
  public:
    explicit ZrXmlSchemaDictTestAccess(ZrXmlSchemaDict& dict) : d(dict) {}

    bool& initialised() { return d.initialised; }

    ZrWString& initError() { return d.initError; }

  private:
    ZrXmlSchemaDict& d;
};

namespace {

using zrtest::LogCapture;
using zrtest::schemaDoc;
using zrtest::TempDir;

// One line per record: "name(length): field type-alias(usage), ...".
std::string dump(const ZrRecordList& list) {
    std::string out;
    for (int i = 0; i < list.Count(); ++i) {
        const ZrRecord& r = *list[i];
        out += zrtest::utf8(r.name) + "(" + std::to_string(r.RecordLength()) + "):";
        for (int f = 0; f < r.FieldCount(); ++f) {
            const ZrField& field = *r.GetFieldbyPos(f);
            out += std::string(f ? ", " : " ") + zrtest::utf8(field.FieldName()) + " " +
                   field.DataType().Alias() + "(" + std::to_string(field.DataType().Usage()) + ")";
        }
        out += "\n";
    }
    return out;
}

// The worked example: a record with a nested record, an element and an attribute.
const char* const kOrderSchema = R"(
<xs:element name="order"><xs:complexType><xs:sequence>
  <xs:element name="id" type="xs:int"/>
  <xs:element name="item"><xs:complexType><xs:sequence>
    <xs:element name="sku" type="xs:string"/>
  </xs:sequence></xs:complexType></xs:element>
</xs:sequence><xs:attribute name="status" type="xs:string"/></xs:complexType></xs:element>)";

const char* const kOrderRecords =
    "order(0): id int(48), item Record(2), status string attribute(272)\n"
    "item(0): sku string(16)\n";

// Records nested three levels below the top.
const char* const kDeepSchema = R"(
<xs:element name="order"><xs:complexType><xs:sequence>
  <xs:element name="item"><xs:complexType><xs:sequence>
    <xs:element name="detail"><xs:complexType><xs:sequence>
      <xs:element name="note"><xs:complexType><xs:sequence>
        <xs:element name="text" type="xs:string"/>
      </xs:sequence></xs:complexType></xs:element>
    </xs:sequence></xs:complexType></xs:element>
  </xs:sequence></xs:complexType></xs:element>
</xs:sequence></xs:complexType></xs:element>)";

std::string recordNames(const ZrRecordList& list) {
    std::string out;
    for (int i = 0; i < list.Count(); ++i)
        out += zrtest::utf8(list[i]->name) + ";";
    return out;
}

TEST(PluginEntry, NewBrowserAndDeleteBrowser) {
    ZrSpoke spoke;
    ZrDictBrowser* browser = NewBrowser(&spoke);
    ASSERT_NE(browser, nullptr);
    auto* dict = dynamic_cast<ZrXmlSchemaDict*>(browser);
    ASSERT_NE(dict, nullptr);
    EXPECT_EQ(browser->Spoke(), &spoke);
    EXPECT_EQ(browser->TypeDefinitions(), kBuiltinTypeDefinitions);
    EXPECT_STREQ(browser->TypeDefinitions()[0], "Text;alias=Character;padchar_invalid;usage=0");
    EXPECT_FALSE(dict->QualifiedRecords());
    EXPECT_TRUE(ZrXmlSchemaDictTestAccess(*dict).initialised());
    EXPECT_EQ(browser->RecordList().Count(), 0);
    DeleteBrowser(browser);
    DeleteBrowser(nullptr);
}

TEST(PluginDict, CopiesCarryStateAndRecords) {
    ZrXmlSchemaDict source(nullptr);
    ZrXmlSchemaDictTestAccess(source).initialised() = false;
    ZrXmlSchemaDictTestAccess(source).initError() = u"boom";
    source.QualifiedRecords(true);
    source.RecordList().AddRecord(nullptr, -1)->name = u"kept";

    ZrXmlSchemaDict copy(source);
    ZrXmlSchemaDict assigned(nullptr);
    assigned = source;
    for (ZrXmlSchemaDict* d : {&copy, &assigned}) {
        ZrXmlSchemaDictTestAccess access(*d);
        EXPECT_FALSE(access.initialised());
        EXPECT_EQ(access.initError().str(), u"boom");
        EXPECT_TRUE(d->QualifiedRecords());
        EXPECT_EQ(recordNames(d->RecordList()), "kept;");
    }
    source.RecordList().Clear();
    EXPECT_EQ(copy.RecordList().Count(), 1);
}

TEST(PluginDict, InitialisationFailureFailsEveryReadAndKeepsRecords) {
    TempDir dir;
    const std::string path = dir.write("order.xsd", schemaDoc(kOrderSchema));
    ZrXmlSchemaDict dict(nullptr);
    ZrXmlSchemaDictTestAccess(dict).initialised() = false;
    ZrXmlSchemaDictTestAccess(dict).initError() = u"no locale \u00E9";
    dict.RecordList().AddRecord(nullptr, -1)->name = u"earlier";

    LogCapture log;
    EXPECT_EQ(dict.ReadDictionary(path.c_str()), BE_READ_FAILED);
    EXPECT_EQ(dict.ReadDictionary(path.c_str()), BE_READ_FAILED);
    EXPECT_EQ(log.lines(), "4 19 ZrXmlSchemaDict: Initialization error: no locale é\n"
                           "4 19 ZrXmlSchemaDict: Initialization error: no locale é\n");
    EXPECT_EQ(recordNames(dict.RecordList()), "earlier;");
}

TEST(PluginDict, ReadCopiesTheBrowsersRecords) {
    TempDir dir;
    const std::string path = dir.write("order.xsd", schemaDoc(kOrderSchema));
    ZrXmlSchemaDict dict(nullptr);
    LogCapture log;
    ASSERT_EQ(dict.ReadDictionary(path.c_str()), BE_OK) << log.lines();
    EXPECT_EQ(dump(dict.RecordList()), kOrderRecords);
    EXPECT_EQ(log.lines(), "");
}

TEST(PluginDict, EachReadReplacesTheRecords) {
    TempDir dir;
    const std::string order = dir.write("order.xsd", schemaDoc(kOrderSchema));
    const std::string simpleOnly =
        dir.write("simple.xsd", schemaDoc(R"(<xs:element name="n" type="xs:int"/>)"));
    const std::string malformed = dir.write("bad.xsd", "<xs:schema");
    const std::string missing = (dir.path() / "missing.xsd").string();

    ZrXmlSchemaDict dict(nullptr);
    LogCapture log;
    ASSERT_EQ(dict.ReadDictionary(order.c_str()), BE_OK);
    ASSERT_EQ(dict.ReadDictionary(order.c_str()), BE_OK);
    EXPECT_EQ(dump(dict.RecordList()), kOrderRecords) << "a second read does not add to the first";

    // A clean parse without record-forming declarations.
    EXPECT_EQ(dict.ReadDictionary(simpleOnly.c_str()), BE_OK);
    EXPECT_EQ(dict.RecordList().Count(), 0);
    EXPECT_EQ(log.lines(), "");

    for (const std::string& failing : {missing, malformed, std::string()}) {
        ASSERT_EQ(dict.ReadDictionary(order.c_str()), BE_OK);
        log.messages.clear();
        EXPECT_EQ(dict.ReadDictionary(failing.c_str()), BE_READ_FAILED) << failing;
        EXPECT_EQ(dict.RecordList().Count(), 0) << failing;
        EXPECT_FALSE(log.messages.empty()) << "the browser logs why: " << failing;
    }
    EXPECT_EQ(dict.ReadDictionary(nullptr), BE_READ_FAILED);
}

TEST(PluginDict, OptionChangeReachesTheNextReadOnly) {
    TempDir dir;
    const std::string path = dir.write("deep.xsd", schemaDoc(kDeepSchema));
    ZrXmlSchemaDict dict(nullptr);
    LogCapture log;
    ASSERT_EQ(dict.ReadDictionary(path.c_str()), BE_OK) << log.lines();
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;detail;note;");

    ASSERT_EQ(dict.SetOption(u"QualifiedRecordNames", u"True"), BE_OK);
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;detail;note;");
    ASSERT_EQ(dict.ReadDictionary(path.c_str()), BE_OK) << log.lines();
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;[item]detail;[item!detail]note;");

    dict.QualifiedRecords(false);
    ASSERT_EQ(dict.ReadDictionary(path.c_str()), BE_OK);
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;detail;note;");
}

} // namespace
