// Record flattening: field copies one level deep, connector translation with the
// source length kept, and the record-length rule.
#include "TestSupport.h"
#include "ZrXmlSchemaDict.h"

#include <gtest/gtest.h>
#include <new>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

ZrDType numberType(long length) {
    ZrDType type;
    type.Define("Number;alias=int;signed_invalid;display;maxlength=32;precision=10;"
                "scale_invalid;usage=48");
    type.Length(length);
    return type;
}

// Translates every type to text of its own choosing, length included.
class TextSpoke : public ZrSpoke {
  public:
    ZrDType MapDataType(const ZrDType& type) override {
        ++calls;
        if (failAtCall == calls) {
            if (failure == Failure::Runtime)
                throw std::runtime_error("no such type here");
            if (failure == Failure::Foreign)
                throw 42;
            throw std::bad_alloc();
        }
        ZrDType text;
        text.Define("Text;alias=Character;padchar_invalid;usage=0");
        text.Length(type.Length() + 1000);
        text.Precision(77);
        return text;
    }

    enum class Failure { OutOfMemory, Runtime, Foreign };

    int calls = 0;
    int failAtCall = 0;
    Failure failure = Failure::OutOfMemory;
};

ZrRecord sourceRecord(const std::vector<long>& lengths) {
    ZrRecord record;
    record.name = u"source";
    int n = 0;
    for (long length : lengths) {
        const std::u16string name = u"f" + std::u16string(1, char16_t(u'0' + n++));
        ZrField* field = record.NewField(numberType(length), ZrWString(name));
        field->Alias(u"own alias");
        field->Description(("described " + std::to_string(length)).c_str());
    }
    return record;
}

std::string dump(const ZrRecord& record) {
    std::string out = "(" + std::to_string(record.RecordLength()) + ")";
    for (int i = 0; i < record.FieldCount(); ++i) {
        const ZrField* f = record.GetFieldbyPos(i);
        out += " " + zrUtf16ToUtf8(f->FieldName().view()) + "/" + zrUtf16ToUtf8(f->Alias().view()) +
               ":" + f->DataType().Alias() + "=" + std::to_string(f->DataType().Length());
    }
    return out;
}

struct LengthCase {
    const char* name;
    std::vector<long> targetLengths; // fields the target holds before the call
    long targetLength;               // its record length before the call
    std::vector<long> sourceLengths;
    std::string expected;
};

const LengthCase kLengthCases[] = {
    {"EmptyTargetGetsSum", {}, 0, {3, 4}, "(7) f0/f0:int=3 f1/f1:int=4"},
    {"ExistingFieldsCount", {10}, 0, {3}, "(13) f0/f0:int=10 f0/f0:int=3"},
    {"NonZeroLengthKept", {10}, 5, {3, 4}, "(5) f0/f0:int=10 f0/f0:int=3 f1/f1:int=4"},
    {"EmptySourceSumsExisting", {10, 2}, 0, {}, "(12) f0/f0:int=10 f1/f1:int=2"},
    {"EmptySourceEmptyTarget", {}, 0, {}, "(0)"},
    {"EmptySourceKeepsLength", {10}, 3, {}, "(3) f0/f0:int=10"},
};

class FlattenLength : public ::testing::TestWithParam<LengthCase> {};

TEST_P(FlattenLength, AppendsAndSetsLength) {
    const auto& c = GetParam();
    ZrXmlSchemaDict dict(nullptr);
    const ZrRecord source = sourceRecord(c.sourceLengths);
    const ZrRecord earlier = sourceRecord(c.targetLengths);
    ZrRecord target;
    ZrDictBrowser& base = dict;
    ASSERT_EQ(base.FlattenDictRecord(&earlier, &target, nullptr), BE_OK);
    target.RecordLength(c.targetLength);
    ASSERT_EQ(base.FlattenDictRecord(&source, &target, nullptr), BE_OK);
    EXPECT_EQ(dump(target), c.expected);
}

INSTANTIATE_TEST_SUITE_P(Plugin, FlattenLength, ::testing::ValuesIn(kLengthCases),
                         [](const auto& i) { return std::string(i.param.name); });

TEST(PluginFlatten, WithoutConnectorCopiesTypeExactly) {
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
    ASSERT_EQ(target.FieldCount(), 1);
    const ZrField* field = target.GetFieldbyPos(0);
    const ZrDType& copy = field->DataType();
    EXPECT_EQ(copy.Parsed(), type.Parsed());
    EXPECT_STREQ(copy.Alias(), "int attribute");
    EXPECT_EQ(copy.Usage(), 304);
    EXPECT_EQ(copy.Length(), 6);
    EXPECT_EQ(copy.Precision(), 4);
    EXPECT_EQ(copy.DecimalPlaces(), 2);
    EXPECT_TRUE(copy.Nulls());
    EXPECT_EQ(field->FieldName().str(), u"f0");
    EXPECT_EQ(field->Alias().str(), u"f0") << "alias is the name, not the source's alias";
    EXPECT_STREQ(field->Description(), "described 6");
    EXPECT_NE(field, source.GetFieldbyPos(0));
}

TEST(PluginFlatten, ConnectorTranslatesButSourceLengthWins) {
    ZrXmlSchemaDict dict(nullptr);
    const ZrRecord source = sourceRecord({3, 0, 8});
    TextSpoke spoke;
    ZrRecord target;
    ASSERT_EQ(dict.FlattenDictRecord(&source, &target, &spoke), BE_OK);
    EXPECT_EQ(spoke.calls, 3);
    EXPECT_EQ(dump(target), "(11) f0/f0:Character=3 f1/f1:Character=0 f2/f2:Character=8");
    // Everything but the length is the connector's.
    const ZrDType& type = target.GetFieldbyPos(2)->DataType();
    EXPECT_STREQ(type.TypeClass(), "Text");
    EXPECT_EQ(type.Usage(), 0);
    EXPECT_EQ(type.Precision(), 77);
    EXPECT_STREQ(target.GetFieldbyPos(1)->Description(), "described 0");
}

// Whatever the connector throws stays in the plug-in: the call fails with 5 and a
// message, and keeps the fields appended before.
TEST(PluginFlatten, ConnectorFailureKeepsEarlierFieldsAndLength) {
    const struct {
        TextSpoke::Failure failure;
        const char* reason;
    } cases[] = {
        {TextSpoke::Failure::OutOfMemory, "out of memory"},
        {TextSpoke::Failure::Runtime, "no such type here"},
        {TextSpoke::Failure::Foreign, "unknown error"},
    };

    for (const auto& c : cases) {
        ZrXmlSchemaDict dict(nullptr);
        const ZrRecord source = sourceRecord({3, 4, 5, 6});
        TextSpoke spoke;
        spoke.failAtCall = 3;
        spoke.failure = c.failure;
        ZrRecord target;
        zrtest::LogCapture log;
        EXPECT_EQ(dict.FlattenDictRecord(&source, &target, &spoke), BE_NO_MEMORY) << c.reason;
        EXPECT_EQ(dump(target), "(0) f0/f0:Character=3 f1/f1:Character=4");
        EXPECT_EQ(
            log.lines(),
            std::string("4 5 ZrXmlSchemaDict: Flattening record source stopped at field f2: ") +
                c.reason + "\n");
    }
}

TEST(PluginFlatten, RecordIntoItselfCopiesEachFieldOnce) {
    ZrXmlSchemaDict dict(nullptr);
    ZrRecord record = sourceRecord({1, 2});
    ASSERT_EQ(dict.FlattenDictRecord(&record, &record, nullptr), BE_OK);
    EXPECT_EQ(dump(record), "(6) f0/own alias:int=1 f1/own alias:int=2 f0/f0:int=1 f1/f1:int=2");
}

TEST(PluginFlatten, NullRecordsAreRefused) {
    ZrXmlSchemaDict dict(nullptr);
    ZrRecord record;
    EXPECT_EQ(dict.FlattenDictRecord(nullptr, &record, nullptr), BE_INVALID_ARGUMENT);
    EXPECT_EQ(dict.FlattenDictRecord(&record, nullptr, nullptr), BE_INVALID_ARGUMENT);
}

} // namespace
