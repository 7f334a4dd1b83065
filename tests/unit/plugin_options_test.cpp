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

// QualifiedRecordNames, DecimalDigits, OccurrenceNulls, FieldDescriptions.
std::string flags(const ZrXmlSchemaDict& dict) {
    const ZrXmlSchemaDict::FieldDetail& detail = dict.Detail();
    std::string out;
    for (bool on : {dict.QualifiedRecords(), detail.decimalDigits, detail.occurrenceNulls,
                    detail.fieldDescriptions})
        out += on ? '1' : '0';
    return out;
}

// Whatever is not a true word reads as false; each option sets its own flag only.
TEST(PluginOptions, SetOptionSetsItsOwnFlag) {
    const struct {
        const char16_t* name;
        const char16_t* value;
        const char* flags;
    } settings[] = {
        {u"QualifiedRecordNames", u"True", "1000"}, {u"QUALIFIEDRECORDNAMES", u" TRUE ", "1000"},
        {u"qualifiedrecordnames", u"yes", "0000"},  {u"decimaldigits", u"True", "0100"},
        {u"OccurrenceNulls", u"True", "0010"},      {u"FIELDDESCRIPTIONS", u"True", "0001"},
        {u"DecimalDigits", u"False", "0000"},
    };

    for (const auto& s : settings) {
        ZrXmlSchemaDict dict(nullptr);
        if (std::string(s.flags) == "0000")
            dict.SetOption(s.name, u"True"); // so that false is a change
        EXPECT_EQ(dict.SetOption(s.name, s.value), BE_OK);
        EXPECT_EQ(flags(dict), s.flags) << zrUtf16ToUtf8(s.name) << "=" << zrUtf16ToUtf8(s.value);
        EXPECT_EQ(optionText(dict, s.name), s.flags == std::string("0000") ? "False" : "True");
        // Copies keep the flags for their own reads.
        ZrXmlSchemaDict assigned(nullptr);
        assigned = dict;
        EXPECT_EQ(flags(ZrXmlSchemaDict(dict)), s.flags);
        EXPECT_EQ(flags(assigned), s.flags);
    }
}

// The setters tell the host whether the value changed; the file list is kept as
// given, whatever it holds, and read by the next read.
TEST(PluginOptions, SettersReportChangesAndKeepFileNames) {
    ZrXmlSchemaDict dict(nullptr);
    void* owner = static_cast<ZrDictBrowser*>(&dict);
    const ZrOptionDef** defs = dict.GetOptionDefs();
    std::string changes;
    for (const ZrOptionDef* def : {defs[0], defs[3]}) {
        for (const char* value : {"False", "True", "true", "junk", "false"}) {
            bool changed = false;
            EXPECT_EQ(def->Setter()(owner, value, changed, nullptr), BE_OK);
            changes += changed ? '1' : '0';
        }
        changes += ' ';
    }
    for (const char16_t* value :
         {u"", u"a.xml; d\u00E9j\u00E0/b.xml", u"a.xml; d\u00E9j\u00E0/b.xml", u"  ;  ", u""}) {
        bool changed = false;
        EXPECT_EQ(defs[1]->WSetter()(owner, value, changed, nullptr), BE_OK);
        EXPECT_EQ(dict.CatalogFiles().str(), value);
        changes += changed ? '1' : '0';
    }
    EXPECT_EQ(changes, "01010 01010 01011");

    // File names stay 16-bit text: even a lone surrogate comes back as it was given.
    ZrXmlSchemaDict kept(nullptr);
    EXPECT_EQ(optionText(kept, u"SchemaCatalog"), "");
    const std::u16string files = u"a.xml;\u00E9" + std::u16string(1, char16_t(0xD800));
    EXPECT_EQ(kept.SetOption(u"SCHEMACATALOG", files.c_str()), BE_OK);
    ZrWString value;
    EXPECT_EQ(kept.GetOption(u"schemacatalog", value), BE_OK);
    EXPECT_EQ(value.str(), files);
    EXPECT_EQ(ZrXmlSchemaDict(kept).CatalogFiles().str(), files);
    ZrXmlSchemaDict assigned(nullptr);
    assigned = kept;
    EXPECT_EQ(assigned.CatalogFiles().str(), files);
}

} // namespace
