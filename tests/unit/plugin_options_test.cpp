// The plug-in's options, "QualifiedRecordNames", "SchemaCatalog" and the field
// detail ones, through the host's option machinery.
#include "ZrXmlSchemaDict.h"

#include <gtest/gtest.h>
#include <string>

namespace {

std::string optionText(const ZrDictBrowser& dict, const char16_t* name) {
    ZrWString value;
    EXPECT_EQ(dict.GetOption(name, value), BE_OK);
    return zrUtf16ToUtf8(value.view());
}

// Five definitions in a fixed order, shared by every dictionary; the boolean ones
// are served by narrow callbacks, the file list by wide ones. All start from their
// defaults.
TEST(PluginOptions, SharedDefinitionsStartingFromTheirDefaults) {
    ZrXmlSchemaDict dict(nullptr);
    EXPECT_EQ(dict.OptionDefCount(), 5);
    const ZrOptionDef** defs = dict.GetOptionDefs();
    ASSERT_NE(defs, nullptr);
    for (int i = 0; i < 5; ++i)
        ASSERT_NE(defs[i], nullptr) << i;
    EXPECT_EQ(defs[5], nullptr);
    const char16_t* detailNames[] = {u"DecimalDigits", u"OccurrenceNulls", u"FieldDescriptions"};
    for (int i = 0; i < 3; ++i) {
        const ZrOptionDef* def = defs[2 + i];
        EXPECT_EQ(def->Name().str(), detailNames[i]);
        EXPECT_STREQ(def->DefaultValue().c_str(), "False");
        EXPECT_NE(def->Getter(), nullptr);
        EXPECT_NE(def->Setter(), nullptr);
        EXPECT_FALSE(def->Description().empty());
        EXPECT_EQ(optionText(dict, detailNames[i]), "False");
    }
    EXPECT_EQ(defs[1]->Key().str(), u"schemacatalog");
    EXPECT_EQ(defs[1]->Name().str(), u"SchemaCatalog");
    EXPECT_STREQ(defs[1]->DefaultValue().c_str(), "");
    EXPECT_NE(defs[1]->WGetter(), nullptr);
    EXPECT_NE(defs[1]->WSetter(), nullptr);
    EXPECT_EQ(dict.CatalogFiles().str(), u"");
    EXPECT_EQ(optionText(dict, u"SchemaCatalog"), "");
    EXPECT_EQ(defs[0]->Key().str(), u"qualifiedrecordnames");
    EXPECT_STREQ(defs[0]->DefaultValue().c_str(), "False");
    EXPECT_NE(defs[0]->Getter(), nullptr);
    EXPECT_NE(defs[0]->Setter(), nullptr);
    EXPECT_EQ(defs[0]->WGetter(), nullptr);
    EXPECT_EQ(defs[0]->WSetter(), nullptr);
    EXPECT_EQ(ZrXmlSchemaDict(nullptr).GetOptionDefs()[0], defs[0]);
    EXPECT_FALSE(dict.QualifiedRecords());
    EXPECT_EQ(optionText(dict, u"QualifiedRecordNames"), "False");
}

struct SetCase {
    const char16_t* name;
    const char16_t* value;
    bool expected;
};

const SetCase kSetCases[] = {
    {u"QualifiedRecordNames", u"True", true},   {u"qualifiedrecordnames", u"true", true},
    {u"QUALIFIEDRECORDNAMES", u" TRUE ", true}, {u"QualifiedRecordNames", u"False", false},
    {u"QualifiedRecordNames", u"1", false},     {u"QualifiedRecordNames", u"yes", false},
    {u"QualifiedRecordNames", u"", false},
};

TEST(PluginOptions, SetOptionInterpretsTheText) {
    for (const auto& c : kSetCases) {
        ZrXmlSchemaDict dict(nullptr);
        dict.QualifiedRecords(!c.expected);
        EXPECT_EQ(dict.SetOption(c.name, c.value), BE_OK);
        EXPECT_EQ(dict.QualifiedRecords(), c.expected) << zrUtf16ToUtf8(c.value);
        EXPECT_EQ(optionText(dict, c.name), c.expected ? "True" : "False");
    }
}

// Each detail option sets its own flag and no other.
TEST(PluginOptions, DetailOptionsSetTheirOwnFlag) {
    const char16_t* names[] = {u"decimaldigits", u"OccurrenceNulls", u"FIELDDESCRIPTIONS"};
    for (int i = 0; i < 3; ++i) {
        ZrXmlSchemaDict dict(nullptr);
        EXPECT_EQ(dict.SetOption(names[i], u"True"), BE_OK);
        const ZrXmlSchemaDict::FieldDetail& detail = dict.Detail();
        EXPECT_EQ(detail.decimalDigits, i == 0) << i;
        EXPECT_EQ(detail.occurrenceNulls, i == 1) << i;
        EXPECT_EQ(detail.fieldDescriptions, i == 2) << i;
        EXPECT_EQ(optionText(dict, names[i]), "True");
        // A copy of the dictionary keeps the flags for its own reads.
        ZrXmlSchemaDict copy(dict);
        EXPECT_EQ(optionText(copy, names[i]), "True");
    }
}

TEST(PluginOptions, SetterReportsChanges) {
    ZrXmlSchemaDict dict(nullptr);
    const ZrOptionSetter set = dict.GetOptionDefs()[0]->Setter();
    void* owner = static_cast<ZrDictBrowser*>(&dict);

    struct Step {
        const char* value;
        bool changed;
        bool after;
    };

    const Step steps[] = {{"False", false, false},
                          {"True", true, true},
                          {"true", false, true},
                          {"junk", true, false},
                          {"false", false, false}};
    for (const auto& step : steps) {
        bool changed = !step.changed;
        EXPECT_EQ(set(owner, step.value, changed, nullptr), BE_OK);
        EXPECT_EQ(changed, step.changed) << step.value;
        EXPECT_EQ(dict.QualifiedRecords(), step.after) << step.value;
    }
}

// The file list is kept as given, whatever it holds; the next read reads it.
TEST(PluginOptions, CatalogListIsKeptAsGiven) {
    ZrXmlSchemaDict dict(nullptr);
    const ZrOptionWSetter set = dict.GetOptionDefs()[1]->WSetter();
    void* owner = static_cast<ZrDictBrowser*>(&dict);

    struct Step {
        const char16_t* value;
        bool changed;
    };

    const Step steps[] = {{u"", false},
                          {u"a.xml; d\u00E9j\u00E0/b.xml", true},
                          {u"a.xml; d\u00E9j\u00E0/b.xml", false},
                          {u"  ;  ", true},
                          {u"", true}};
    for (const auto& step : steps) {
        bool changed = !step.changed;
        EXPECT_EQ(set(owner, step.value, changed, nullptr), BE_OK);
        EXPECT_EQ(changed, step.changed) << zrUtf16ToUtf8(step.value);
        EXPECT_EQ(dict.CatalogFiles().str(), step.value);
        EXPECT_EQ(optionText(dict, u"schemacatalog"), zrUtf16ToUtf8(step.value));
    }
    EXPECT_EQ(dict.SetOption(u"SCHEMACATALOG", u"c.xml"), BE_OK);
    EXPECT_EQ(ZrXmlSchemaDict(dict).CatalogFiles().str(), u"c.xml");
    ZrXmlSchemaDict assigned(nullptr);
    assigned = dict;
    EXPECT_EQ(assigned.CatalogFiles().str(), u"c.xml");
}

TEST(PluginOptions, UnknownNamesAndLoadedOptions) {
    ZrXmlSchemaDict dict(nullptr);
    ZrWString value;
    EXPECT_EQ(dict.SetOption(u"Qualified", u"True"), BE_UNKNOWN_OPTION);
    EXPECT_EQ(dict.GetOption(u"QualifiedRecordNames ", value), BE_UNKNOWN_OPTION);
    EXPECT_FALSE(dict.QualifiedRecords());

    ZrString saved("# saved options\nQualifiedRecordNames=True\nSchemaCatalog = x.xml;y.xml \n");
    dict.LoadOptions(saved);
    EXPECT_TRUE(dict.QualifiedRecords());
    EXPECT_EQ(dict.CatalogFiles().str(), u"x.xml;y.xml");
}

} // namespace
