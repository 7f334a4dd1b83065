// Host data types: how a definition string is taken apart, and what setters,
// copies and redefinitions keep.
#include "ZrXmlSchemaBrowser.h"
#include "zrdtype.h"

#include <gtest/gtest.h>
#include <string>

namespace {

TEST(HostDType, DefinitionItemsSettersAndCopies) {
    ZrDType type;
    EXPECT_STREQ(type.TypeClass(), "");
    EXPECT_STREQ(type.Alias(), "");
    EXPECT_STREQ(type.DefinitionText(), "");
    EXPECT_EQ(type.Item("alias"), nullptr);
    ASSERT_TRUE(type.Define(
        "Number;alias='a; b.c';signed=false;display;maxlength=32; precision = 7 ;usage=300"));
    const auto* def = type.Parsed();
    ASSERT_NE(def, nullptr);
    EXPECT_EQ(def->typeClass, "Number");
    const std::vector<std::pair<std::string, std::string>> items = {
        {"alias", "a; b.c"}, {"signed", "false"}, {"display", ""},
        {"maxlength", "32"}, {"precision", "7"},  {"usage", "300"}};
    EXPECT_EQ(def->items, items);
    EXPECT_EQ(def->bare, (std::vector<bool>{false, false, true, false, false, false}));
    EXPECT_STREQ(type.Item("display"), "");
    EXPECT_EQ(type.Item("decimal"), nullptr);
    EXPECT_EQ(type.Precision(), 7);

    type.Length(12);
    EXPECT_FALSE(type.Define(nullptr));
    EXPECT_FALSE(type.Define(""));
    EXPECT_STREQ(type.Alias(), "a; b.c");
    EXPECT_EQ(type.Length(), 12);

    // Numbers out of range start at zero.
    ASSERT_TRUE(type.Define("Number;usage=70000;length=99999999999999999999999;decimal=x"));
    EXPECT_EQ(type.Usage(), 0);
    EXPECT_EQ(type.Length(), 0);
    EXPECT_EQ(type.DecimalPlaces(), 0);

    // Redefining resets what the setters set; copies are independent.
    ASSERT_TRUE(type.Define(kBuiltinTypeDefinitions[7]));
    type.Length(40);
    type.Precision(3);
    type.DecimalPlaces(1);
    type.Nulls(true);
    type.Usage(999);
    type.Alias(nullptr);
    EXPECT_STREQ(type.Alias(), "");

    ZrDType copy = type;
    copy.Length(1);
    copy.Alias("changed");
    EXPECT_EQ(type.Length(), 40);
    EXPECT_STREQ(type.Alias(), "");
    EXPECT_EQ(copy.Parsed(), type.Parsed());

    ASSERT_TRUE(type.Define(kBuiltinTypeDefinitions[7]));
    EXPECT_EQ(type.Length(), 0);
    EXPECT_EQ(type.Precision(), 16);
    EXPECT_EQ(type.DecimalPlaces(), 2);
    EXPECT_FALSE(type.Nulls());
    EXPECT_EQ(type.Usage(), 18);
    EXPECT_STREQ(type.Alias(), "float");
}

} // namespace
