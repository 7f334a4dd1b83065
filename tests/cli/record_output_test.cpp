// The record views of zrdict over records made through the host's API: the JSON
// document against the document the library built before, the tables, the tree and
// the graph.
#include "RecordOutput.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <gtest/gtest.h>
#include <limits>
#include <nlohmann/json.hpp>
#include <sstream>

namespace {

using Json = nlohmann::ordered_json;

ZrDType makeType(const char* definition) {
    ZrDType type;
    type.Define(definition);
    return type;
}

const char* const kString = "Text;alias=string;padchar_invalid;usage=16";
const char* const kRecord = "Structure;alias=Record;usage=2";

// A record with fields given as (name, definition); a definition of null makes a
// field of the record type.
ZrRecord* addRecord(ZrRecordList& list, const std::u16string& name,
                    std::vector<std::pair<std::u16string, const char*>> fields) {
    ZrRecord* record = list.AddRecord(nullptr, -1);
    record->name = ZrWString(name);
    for (const auto& [field, definition] : fields)
        record->NewField(makeType(definition ? definition : kRecord), ZrWString(field));
    return record;
}

std::vector<const ZrRecord*> all(const ZrRecordList& list) {
    std::vector<const ZrRecord*> records;
    for (int i = 0; i < list.Count(); ++i)
        records.push_back(list[i]);
    return records;
}

// The document as zrdict built it with the document library.
Json referenceRecord(const ZrRecord& record) {
    Json fields = Json::array();
    for (int i = 0; i < record.FieldCount(); ++i) {
        const ZrField* field = record.GetFieldbyPos(i);
        const ZrDType& type = field->DataType();
        Json t = {{"class", type.TypeClass()},     {"alias", type.Alias()},
                  {"usage", type.Usage()},         {"length", type.Length()},
                  {"precision", type.Precision()}, {"decimals", type.DecimalPlaces()},
                  {"nulls", type.Nulls()}};
        if (const char* maxLength = type.Item("maxlength")) {
            char* end = nullptr;
            errno = 0;
            long value = std::strtol(maxLength, &end, 10);
            if (end != maxLength && *end == '\0' && errno == 0)
                t["maxlength"] = value;
            else
                t["maxlength"] = maxLength;
        }
        if (const char* picture = type.Item("picture"))
            t["picture"] = picture;
        if (const char* isSigned = type.Item("signed"))
            t["signed"] = std::string(isSigned) == "true";
        fields.push_back({{"name", zrUtf16ToUtf8(field->FieldName().view())},
                          {"alias", zrUtf16ToUtf8(field->Alias().view())},
                          {"description", field->Description()},
                          {"type", t}});
    }
    return {{"name", zrUtf16ToUtf8(record.name.view())},
            {"length", record.RecordLength()},
            {"fields", fields}};
}

TEST(RecordDocument, SameBytesAsTheDocumentLibrary) {
    ZrRecordList list;
    ZrRecord* order = addRecord(list, u"order", {});
    order->RecordLength(std::numeric_limits<long>::min());
    const char* const definitions[] = {
        "Number;alias=int;signed;display;maxlength=11;precision=10;usage=48",
        "Number;alias=uint;signed=false;maxlength=' 7';usage=49",
        "Text;alias='odd max';maxlength=12x;usage=16",
        "Text;alias=huge;maxlength=99999999999999999999;signed=true;usage=16",
        "DateTime;alias='date\tattribute';picture='yyyy-mm-dd';picture=second;usage=313",
    };
    for (int n = 0; n < 5; ++n) {
        ZrField* field = order->NewField(makeType(definitions[n]),
                                         ZrWString(u"f" + std::u16string(1, u'a' + n)));
        field->DataType().Nulls(n % 2 == 0);
        field->DataType().Precision(n * 1000);
        field->DataType().DecimalPlaces(static_cast<short>(-n));
    }
    // Ill-formed text from the plug-in: a lone surrogate in a name, bytes that are
    // not UTF-8 and control characters in a description.
    order->GetFieldbyPos(0)->FieldName(ZrWString(std::u16string{u'x', 0xD800, 0xD83D, 0xDE00}));
    order->GetFieldbyPos(1)->Alias(ZrWString(std::u16string{0xDC00}));
    order->GetFieldbyPos(2)->Description("bad \xff\xfe and \x01\n\"quoted\"");
    addRecord(list, std::u16string{u'e', 0xDFFF}, {});

    const std::vector<LoggedMessage> messages = {{512, 0, "note \xe2\x82"}, {4, 19, "x"}};
    std::ostringstream streamed;
    printRecordDocument(streamed, 0, all(list), messages);

    Json doc = {{"status", 0}, {"records", Json::array()}, {"messages", Json::array()}};
    for (const ZrRecord* record : all(list))
        doc["records"].push_back(referenceRecord(*record));
    for (const LoggedMessage& message : messages)
        doc["messages"].push_back(
            {{"severity", message.severity}, {"code", message.code}, {"text", message.text}});
    EXPECT_EQ(streamed.str(), doc.dump(2, ' ', false, Json::error_handler_t::replace) + "\n");

    std::ostringstream failed;
    printRecordDocument(failed, 19, {}, {});
    EXPECT_EQ(failed.str(), "{\n  \"status\": 19,\n  \"records\": [],\n  \"messages\": []\n}\n");
}

// Columns fit the widest cell in code points; only a record with a described field
// gets that column, and its other fields end at their nulls cell.
TEST(RecordTables, ColumnsFitTheWidestCellInCodePoints) {
    ZrRecordList list;
    ZrRecord* order = addRecord(list, u"order", {{u"id", kString}, {u"r\u00e9sum\u00e9", kString}});
    order->GetFieldbyPos(0)->DataType().Nulls(true);
    order->GetFieldbyPos(1)->DataType().Length(123456);
    order->GetFieldbyPos(1)->DataType().Usage(-3);
    order->GetFieldbyPos(1)->Description("Free text, \xc3\xa9t\xc3\xa9");
    addRecord(list, u"item", {{u"sku", "Text;alias=\xc3\xa9t\xc3\xa9;usage=16"}});
    addRecord(list, u"empty", {});
    std::ostringstream out;
    printRecordsText(out, all(list));
    EXPECT_EQ(out.str(),
              "order (length 0, 2 fields)\n"
              "  field   type    usage  length  precision  decimals  nulls  description\n"
              "  id      string     16       0          0         0  yes\n"
              "  r\u00e9sum\u00e9  string     -3  123456          0         0  no     Free text, "
              "\xc3\xa9t\xc3\xa9\n"
              "\n"
              "item (length 0, 1 field)\n"
              "  field  type  usage  length  precision  decimals  nulls\n"
              "  sku    \xc3\xa9t\xc3\xa9      16       0          0         0  no\n"
              "\n"
              "empty (length 0, 0 fields)\n"
              "  field  type  usage  length  precision  decimals  nulls\n");

    std::ostringstream none;
    printRecordsText(none, {});
    EXPECT_EQ(none.str(), "(no records)\n");
}

std::string tree(const ZrRecordList& list, std::vector<const ZrRecord*> roots) {
    std::ostringstream out;
    printRecordTree(out, roots, list);
    return out.str();
}

TEST(RecordTree, OpensEachRecordOnceAtAnyDepth) {
    ZrRecordList list;
    addRecord(list, u"a", {{u"b", nullptr}, {u"c", nullptr}, {u"x", kString}});
    addRecord(list, u"b", {{u"d", nullptr}, {u"a", nullptr}});
    addRecord(list, u"c", {{u"d", nullptr}, {u"missing", nullptr}});
    addRecord(list, u"d", {{u"d", nullptr}, {u"y", kString}});
    addRecord(list, u"e", {{u"d", nullptr}});
    EXPECT_EQ(tree(list, all(list)), "a (length 0)\n"
                                     "├── b: Record, length 0\n"
                                     "│   ├── d: Record, length 0\n"
                                     "│   │   ├── d: Record, length 0 (recursive)\n"
                                     "│   │   └── y: string, length 0\n"
                                     "│   └── a: Record, length 0 (recursive)\n"
                                     "├── c: Record, length 0\n"
                                     "│   ├── d: Record, length 0 (shown above)\n"
                                     "│   └── missing: Record, length 0 (no such record)\n"
                                     "└── x: string, length 0\n"
                                     "e (length 0)\n"
                                     "└── d: Record, length 0 (shown above)\n");

    // A flattening's target stands for the dictionary's record of its name.
    ZrRecord target;
    target.name = u"b";
    target.NewField(makeType(kRecord), u"b");
    target.NewField(makeType(kRecord), u"d");
    EXPECT_EQ(tree(list, {&target}), "b (length 0)\n"
                                     "├── b: Record, length 0 (recursive)\n"
                                     "└── d: Record, length 0\n"
                                     "    ├── d: Record, length 0 (recursive)\n"
                                     "    └── y: string, length 0\n");
    EXPECT_EQ(tree(list, {}), "(no records)\n");

    // Nesting as deep as a schema makes it: no recursion in the printer, and lines
    // stop growing past a fixed depth, where they carry their level instead.
    const int depth = 20000;
    ZrRecordList deep;
    for (int i = 0; i < depth; ++i) {
        std::vector<std::pair<std::u16string, const char*>> fields = {{u"v", kString}};
        if (i + 1 < depth)
            fields.emplace_back(zrUtf8ToUtf16("r" + std::to_string(i + 1)), nullptr);
        addRecord(deep, zrUtf8ToUtf16("r" + std::to_string(i)), fields);
    }
    const std::string out = tree(deep, all(deep));
    size_t longest = 0;
    for (size_t start = 0, end; (end = out.find('\n', start)) != std::string::npos; start = end + 1)
        longest = std::max(longest, end - start);
    EXPECT_EQ(std::count(out.begin(), out.end(), '\n'), 2 * depth);
    EXPECT_LT(longest, 300u);
    EXPECT_NE(out.find("[20000] v: string"), std::string::npos);
}

TEST(RecordGraph, NodesListSimpleFieldsAndEdgesNameTheRecordFields) {
    ZrRecordList list;
    addRecord(list, u"a<&>",
              {{u"b\"q", nullptr}, {u"x", "Text;alias='s\x01\xff';usage=16"}, {u"gone", nullptr}});
    addRecord(list, u"b\"q", {{u"a<&>", nullptr}});
    list[1]->GetFieldbyPos(0)->DataType().Length(5);
    std::ostringstream out;
    printRecordGraph(out, all(list), list);
    const std::string graph = out.str();
    const char* const expected[] = {
        "digraph records {\n",
        "<b>a&lt;&amp;&gt;</b>",
        "<td align=\"left\">x</td><td align=\"left\">s\xef\xbf\xbd\xef\xbf\xbd</td>",
        "  r0 -> r1 [label=\"b\\\"q\"];\n",
        "  r0 -> \"missing gone\" [style=dashed, label=\"gone\"];\n",
        "<b>b&quot;q</b></td></tr></table>>];\n",
        "  r1 -> r0 [label=\"a<&>\"];\n",
    };
    for (const char* part : expected)
        EXPECT_NE(graph.find(part), std::string::npos) << part << "\nin:\n" << graph;

    // Only the records a flattening's target leads to join it.
    ZrRecord target;
    target.name = u"t";
    target.NewField(makeType(kRecord), u"b\"q");
    std::ostringstream flattened;
    printRecordGraph(flattened, {&target}, list);
    EXPECT_NE(flattened.str().find("r0 -> r1"), std::string::npos) << flattened.str();
    EXPECT_NE(flattened.str().find("r1 -> r2"), std::string::npos) << flattened.str();
    EXPECT_EQ(flattened.str().find("r3"), std::string::npos) << flattened.str();
}

} // namespace
