// Record flattening: field copies one level deep, connector translation with the
// source length kept, and the record-length rule.
#include "TestSupport.h"
#include "ZrXmlSchemaDict.h"

#include <climits>
#include <gtest/gtest.h>
#include <new>
#include <stdexcept>
#include <string>
#include <tuple>
#include <vector>

namespace {

// Translates every type to text of its own choosing, length included; call
// `failAt` throws what `failure` names.
class TextSpoke : public ZrSpoke {
  public:
    ZrDType MapDataType(const ZrDType& type) override {
        if (++calls == failAt) {
            if (failure == std::string("no such type here"))
                throw std::runtime_error(failure);
            if (failure == std::string("unknown error"))
                throw 42;
            throw std::bad_alloc();
        }
        ZrDType text;
        text.Define("Text;alias=Character;padchar_invalid;usage=0");
        text.Length(type.Length() + 1000);
        return text;
    }

    int calls = 0;
    int failAt = 0;
    const char* failure = "";
};

// Fields f0, f1, ... of the given lengths, each with an alias and a description.
ZrRecord sourceRecord(const std::vector<long>& lengths) {
    ZrRecord record;
    record.name = u"source";
    for (long length : lengths) {
        ZrDType type;
        type.Define("Number;alias=int;precision=10;usage=48");
        type.Length(length);
        const std::u16string name = u"f" + std::u16string(1, u'0' + record.FieldCount());
        ZrField* field = record.NewField(type, ZrWString(name));
        field->Alias(u"own alias");
        field->Description(("described " + std::to_string(length)).c_str());
    }
    return record;
}

// The record length, then each field as name[/alias when not the name]:type=length.
std::string dump(const ZrRecord& record) {
    std::string out = "(" + std::to_string(record.RecordLength()) + ")";
    for (int i = 0; i < record.FieldCount(); ++i) {
        const ZrField* f = record.GetFieldbyPos(i);
        out += " " + zrUtf16ToUtf8(f->FieldName().view());
        if (f->Alias() != f->FieldName())
            out += "/" + zrUtf16ToUtf8(f->Alias().view());
        out +=
            std::string(":") + f->DataType().Alias() + "=" + std::to_string(f->DataType().Length());
    }
    return out;
}

// A record length of 0 is the sum of the field lengths, saturating; any other is
// kept.
TEST(PluginFlatten, CopiesFieldsAndSetsLength) {
    const struct {
        std::vector<long> targetLengths; // fields the target holds before the call
        long targetLength;               // its record length before the call
        std::vector<long> sourceLengths;
        long expected;
    } cases[] = {
        {{}, 0, {3, 4}, 7},
        {{10}, 0, {3}, 13},
        {{10}, 5, {3, 4}, 5},
        {{10, 2}, 0, {}, 12},
        {{}, 0, {}, 0},
        {{10}, 3, {}, 3},
        {{LONG_MAX}, 0, {5}, LONG_MAX},
        {{LONG_MIN}, 0, {-5}, LONG_MIN},
    };

    for (const auto& c : cases) {
        ZrXmlSchemaDict dict(nullptr);
        const ZrRecord source = sourceRecord(c.sourceLengths);
        const ZrRecord earlier = sourceRecord(c.targetLengths);
        ZrRecord target;
        ZrDictBrowser& base = dict;
        ASSERT_EQ(base.FlattenDictRecord(&earlier, &target, nullptr), BE_OK);
        target.RecordLength(c.targetLength);
        ASSERT_EQ(base.FlattenDictRecord(&source, &target, nullptr), BE_OK);
        EXPECT_EQ(target.RecordLength(), c.expected) << dump(target);
        EXPECT_EQ(target.FieldCount(), c.targetLengths.size() + c.sourceLengths.size());
    }

    // Without a connector the type is copied whole; the field's alias becomes its name.
    ZrXmlSchemaDict dict(nullptr);
    ZrRecord source = sourceRecord({6});
    ZrDType& type = source.GetFieldbyPos(0)->DataType();
    type.Precision(4);
    type.DecimalPlaces(2);
    type.Nulls(true);
    type.Usage(304);
    type.Alias("int attribute");
    ZrRecord target;
    ASSERT_EQ(dict.FlattenDictRecord(&source, &target, nullptr), BE_OK);
    const ZrField* field = target.GetFieldbyPos(0);
    const ZrDType& copy = field->DataType();
    EXPECT_EQ(dump(target), "(6) f0:int attribute=6");
    EXPECT_EQ(std::make_tuple(copy.Usage(), copy.Precision(), copy.DecimalPlaces(), copy.Nulls()),
              std::make_tuple(304, 4L, short(2), true));
    EXPECT_STREQ(field->Description(), "described 6");

    EXPECT_EQ(dict.FlattenDictRecord(nullptr, &target, nullptr), BE_INVALID_ARGUMENT);
    EXPECT_EQ(dict.FlattenDictRecord(&source, nullptr, nullptr), BE_INVALID_ARGUMENT);

    // A record flattened into itself gets each of its fields once more.
    ZrRecord record = sourceRecord({1, 2});
    ASSERT_EQ(dict.FlattenDictRecord(&record, &record, nullptr), BE_OK);
    EXPECT_EQ(dump(record), "(6) f0/own alias:int=1 f1/own alias:int=2 f0:int=1 f1:int=2");
}

// Everything but the length is the connector's. Whatever the connector throws stays
// in the plug-in: the call fails with 5 and a message, and keeps the fields appended
// before and the record length.
TEST(PluginFlatten, ConnectorTranslatesAndItsFailuresStayInside) {
    ZrXmlSchemaDict dict(nullptr);
    TextSpoke spoke;
    const ZrRecord source = sourceRecord({3, 0, 8});
    ZrRecord target;
    ASSERT_EQ(dict.FlattenDictRecord(&source, &target, &spoke), BE_OK);
    EXPECT_EQ(dump(target), "(11) f0:Character=3 f1:Character=0 f2:Character=8");

    const ZrRecord longer = sourceRecord({3, 4, 5, 6});
    for (const char* reason : {"out of memory", "no such type here", "unknown error"}) {
        TextSpoke failing;
        failing.failAt = 3;
        failing.failure = reason;
        ZrRecord partial;
        zrtest::LogCapture log;
        EXPECT_EQ(dict.FlattenDictRecord(&longer, &partial, &failing), BE_NO_MEMORY);
        EXPECT_EQ(dump(partial), "(0) f0:Character=3 f1:Character=4");
        EXPECT_EQ(
            log.lines(),
            std::string("4 5 ZrXmlSchemaDict: Flattening record source stopped at field f2: ") +
                reason + "\n");
    }
}

} // namespace
