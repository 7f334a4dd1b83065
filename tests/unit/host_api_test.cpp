// Host dictionary interface: record and record-list copies and lookups, and the
// option machinery of the browser base class.
#include "zrapi.h"
#include "zrglob.h"

#include <gtest/gtest.h>
#include <string>

namespace {

ZrDType textType(long length) {
    ZrDType type;
    type.Define("Text;alias=string;padchar_invalid;usage=16");
    type.Length(length);
    return type;
}

ZrRecord makeRecord(const char16_t* name, std::initializer_list<const char16_t*> fields) {
    ZrRecord record;
    record.name = name;
    long length = 1;
    for (const char16_t* field : fields)
        record.NewField(textType(length++), field)->Description("desc");
    return record;
}

// Each field as name=length.
std::string dump(const ZrRecord& record) {
    std::string out;
    for (int i = 0; i < record.FieldCount(); ++i) {
        const ZrField* field = record.GetFieldbyPos(i);
        out += zrUtf16ToUtf8(field->FieldName().view()) + "=" +
               std::to_string(field->DataType().Length()) + ";";
    }
    return out;
}

TEST(HostRecord, CopiesLookupsAndPlacesInRecordsAndLists) {
    ZrRecord original = makeRecord(u"order", {u"id", u"item"});
    original.RecordLength(7);
    original.GetFieldbyPos(0)->Alias(u"alias");
    original.GetFieldbyPos(0)->EditPicture("999");

    ZrRecord copy(original);
    EXPECT_EQ(copy.name.str(), u"order");
    EXPECT_EQ(copy.RecordLength(), 7);
    ZrField* field = copy.GetFieldbyPos(0);
    EXPECT_EQ(field->Alias().str(), u"alias");
    EXPECT_STREQ(field->EditPicture(), "999");
    field->Description(nullptr);
    EXPECT_STREQ(field->Description(), "");
    field->FieldName(u"changed");
    field->DataType().Length(50);
    EXPECT_EQ(dump(copy), "changed=50;item=2;");
    EXPECT_EQ(dump(original), "id=1;item=2;");
    EXPECT_STREQ(original.GetFieldbyPos(0)->Description(), "desc");

    ZrRecord assigned;
    assigned = original;
    const ZrRecord& same = assigned;
    assigned = same; // self-assignment keeps the fields
    EXPECT_EQ(dump(assigned), "id=1;item=2;");

    ZrRecord record = makeRecord(u"r", {u"a", u"b", u"a"});
    EXPECT_EQ(record.GetFieldbyName(u"a"), record.GetFieldbyPos(0));
    EXPECT_EQ(record.GetFieldbyName(u"missing"), nullptr);
    EXPECT_EQ(record.GetFieldbyPos(-1), nullptr);
    EXPECT_EQ(record.GetFieldbyPos(3), nullptr);
    EXPECT_FALSE(record.AppendField(nullptr));
    EXPECT_TRUE(record.AppendField(new ZrField(textType(9))));
    EXPECT_EQ(dump(record), "a=1;b=2;a=3;=9;");

    ZrRecordList list;
    ZrRecord* empty = list.AddRecord(nullptr, -1);
    ASSERT_NE(empty, nullptr);
    EXPECT_EQ(zrUtf16ToUtf8(empty->name.view()) + dump(*empty), "");
    {
        const ZrRecord source = makeRecord(u"b", {u"x"});
        EXPECT_NE(list.AddRecord(&source, -1), &source);
    }
    EXPECT_EQ(dump(*list[u"b"]), "x=1;") << "the copy outlives its source";

    const ZrRecord front = makeRecord(u"a", {});
    const ZrRecord back = makeRecord(u"c", {});
    list.AddRecord(&front, 0);
    list.AddRecord(&back, 99);
    std::u16string order;
    for (int i = 0; i < list.Count(); ++i)
        order += list[i]->name.str() + u";";
    EXPECT_EQ(order, u"a;;b;c;");

    EXPECT_EQ(list[-1], nullptr);
    EXPECT_EQ(list[list.Count()], nullptr);
    EXPECT_EQ(list[u"B"], nullptr) << "names compare exactly";
    list.AddRecord(&back, -1);
    EXPECT_EQ(list[u"c"], list[3]) << "the first of two records with one name";

    ZrRecordList listCopy(list);
    list.Clear();
    EXPECT_EQ(list.Count(), 0);
    ASSERT_EQ(listCopy.Count(), 5);
    EXPECT_EQ(dump(*listCopy[u"b"]), "x=1;");
    ZrRecordList listAssigned;
    listAssigned = listCopy;
    listCopy[u"b"]->name = u"renamed";
    EXPECT_NE(listAssigned[u"b"], nullptr);
}

// A browser with two options: one set by a narrow callback, one by a wide one;
// neither can be read back (the plug-in's options are, through both kinds).
class OptionBrowser : public ZrDictBrowser {
  public:
    OptionBrowser() : ZrDictBrowser(nullptr, nullptr) { InitOptions(); }

    BATCHERR ReadDictionary(const char*) override { return BE_OK; }

    int OptionDefCount() const override { return 2; }

    const ZrOptionDef** GetOptionDefs() const override { return defs; }

    std::string narrow;
    std::u16string wide;

  private:
    static OptionBrowser& self(void* owner) {
        return *static_cast<OptionBrowser*>(static_cast<ZrDictBrowser*>(owner));
    }

    static BATCHERR setNarrow(void* owner, const char* value, bool&, const ZrWChar*) {
        self(owner).narrow = value;
        return BE_OK;
    }

    static BATCHERR setWide(void* owner, const ZrWChar* value, bool&, const ZrWChar*) {
        self(owner).wide = value;
        return BE_OK;
    }

    const ZrOptionDef narrowDef{
        u"narrowoption", u"NarrowOption", u"narrow", 0, "Start", nullptr, nullptr, setNarrow,
        nullptr,         nullptr,         nullptr,   0, nullptr, nullptr, 0,       0};
    const ZrOptionDef wideDef{u"wideoption", u"WideOption", u"wide", 0,       "Grüße", nullptr,
                              nullptr,       nullptr,       nullptr, setWide, nullptr, 0,
                              nullptr,       nullptr,       0,       0};
    mutable const ZrOptionDef* defs[3] = {&narrowDef, &wideDef, nullptr};
};

TEST(HostOptions, DefaultsLookupsAndCallbacks) {
    OptionBrowser browser;
    EXPECT_EQ(browser.narrow, "Start");
    EXPECT_EQ(browser.wide, u"Grüße");

    const ZrOptionDef* narrow = browser.GetOptionDefs()[0];
    for (const char16_t* name : {u"narrowoption", u"NarrowOption", u"nArRoWoPtIoN"})
        EXPECT_EQ(browser.FindOptionDef(name), narrow) << zrUtf16ToUtf8(name);
    EXPECT_EQ(browser.FindOptionDef(u"WIDEOPTION"), browser.GetOptionDefs()[1]);
    for (const char16_t* name : {u"narrow", u"", static_cast<const char16_t*>(nullptr)})
        EXPECT_EQ(browser.FindOptionDef(name), nullptr);

    EXPECT_EQ(browser.SetOption(u"NARROWOPTION", u"caf\u00E9"), BE_OK);
    EXPECT_EQ(browser.narrow, "café") << "the narrow setter gets UTF-8";
    EXPECT_EQ(browser.SetOption(u"wideoption", u"\U0001F600"), BE_OK);
    EXPECT_EQ(browser.wide, u"\U0001F600");
    ZrWString value;
    EXPECT_EQ(browser.GetOption(u"narrowOption", value), BE_INVALID_ARGUMENT);

    EXPECT_EQ(browser.SetOption(u"unknown", u"x"), BE_UNKNOWN_OPTION);
    EXPECT_EQ(browser.GetOption(u"unknown", value), BE_UNKNOWN_OPTION);

    ZrString text("# comment\r\n"
                  "; NarrowOption=ignored\n"
                  "\n"
                  "Unknown=skipped\n"
                  "no equals sign\n"
                  "  narrowoption =  a=b  \r\n"
                  "WideOption=w");
    browser.LoadOptions(text);
    EXPECT_EQ(browser.narrow, "a=b");
    EXPECT_EQ(browser.wide, u"w");

    // The base class neither flattens nor translates types.
    ZrRecord record = makeRecord(u"r", {u"f"});
    EXPECT_EQ(browser.FlattenDictRecord(&record, &record, nullptr), BE_INVALID_ARGUMENT);
    EXPECT_EQ(dump(record), "f=1;");
    EXPECT_EQ(ZrSpoke().MapDataType(textType(4)).Length(), 4);
}

} // namespace
