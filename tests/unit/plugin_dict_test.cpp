// The dictionary the host gets from NewBrowser: construction, copies, reads and
// the failure of a parser library that did not initialise.
#include "ZrXmlSchemaDict.h"
#include "dictionary_support.h"

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

using zrtest::dumpRecords;
using zrtest::LogCapture;
using zrtest::schemaDoc;
using zrtest::TempDir;

// A record with a nested record two deep, an element and an attribute.
const char* const kOrderSchema = R"(
<xs:element name="order"><xs:complexType><xs:sequence>
  <xs:element name="id" type="xs:int"/>
  <xs:element name="item"><xs:complexType><xs:sequence>
    <xs:element name="detail"><xs:complexType><xs:sequence>
      <xs:element name="note" type="xs:string"/>
    </xs:sequence></xs:complexType></xs:element>
  </xs:sequence></xs:complexType></xs:element>
</xs:sequence><xs:attribute name="status" type="xs:string"/></xs:complexType></xs:element>)";

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

// A read copies the browser's records in place of the previous read's; a failed
// read leaves none, and says why. An option changed reaches the next read only.
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
    EXPECT_EQ(dumpRecords(dict.RecordList()),
              "order(0): id int(48) 0/10/0, item Record(2) notnull, status string attribute(272)\n"
              "item(0): detail Record(2) notnull\n"
              "detail(0): note string(16)\n");
    ASSERT_EQ(dict.SetOption(u"QualifiedRecordNames", u"True"), BE_OK);
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;detail;");
    ASSERT_EQ(dict.ReadDictionary(order.c_str()), BE_OK);
    EXPECT_EQ(recordNames(dict.RecordList()), "order;item;[item]detail;");

    // A clean parse without record-forming declarations.
    EXPECT_EQ(dict.ReadDictionary(simpleOnly.c_str()), BE_OK);
    EXPECT_EQ(dict.RecordList().Count(), 0);
    EXPECT_EQ(log.lines(), "");

    for (const std::string& failing : {missing, malformed, std::string()}) {
        ASSERT_EQ(dict.ReadDictionary(order.c_str()), BE_OK);
        log.messages.clear();
        EXPECT_EQ(dict.ReadDictionary(failing.c_str()), BE_READ_FAILED) << failing;
        EXPECT_EQ(dict.RecordList().Count(), 0) << failing;
        EXPECT_FALSE(log.messages.empty()) << failing;
    }
    EXPECT_EQ(dict.ReadDictionary(nullptr), BE_READ_FAILED);
}

} // namespace
