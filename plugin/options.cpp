// The plug-in's options, "QualifiedRecordNames", "SchemaCatalog" and the three that
// ask reads for more of each field: "DecimalDigits", "OccurrenceNulls" and
// "FieldDescriptions". The host's
// base class looks options up and calls these callbacks; the values themselves
// live in the dictionary.
#include "ZrXmlSchemaDict.h"
#include "zrglob.h"

namespace {

ZrXmlSchemaDict* dictionaryOf(void* owner) {
    return static_cast<ZrXmlSchemaDict*>(static_cast<ZrDictBrowser*>(owner));
}

BATCHERR GetQualifiedRecordNames(void* owner, ZrString& value, const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    value = ZrGlob::BoolToStr(dictionaryOf(owner)->QualifiedRecords());
    return BE_OK;
}

// Every text is accepted: whatever is not a true word reads as false.
BATCHERR SetQualifiedRecordNames(void* owner, const char* value, bool& changed,
                                 const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    ZrXmlSchemaDict* dict = dictionaryOf(owner);
    const bool previous = dict->QualifiedRecords();
    dict->QualifiedRecords(ZrGlob::StrToBool(value, "True.False.true.false"));
    changed = dict->QualifiedRecords() != previous;
    return BE_OK;
}

template <bool ZrXmlSchemaDict::FieldDetail::*flag>
BATCHERR GetDetail(void* owner, ZrString& value, const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    value = ZrGlob::BoolToStr(dictionaryOf(owner)->Detail().*flag);
    return BE_OK;
}

// As for "QualifiedRecordNames", whatever is not a true word reads as false.
template <bool ZrXmlSchemaDict::FieldDetail::*flag>
BATCHERR SetDetail(void* owner, const char* value, bool& changed, const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    bool& current = dictionaryOf(owner)->Detail().*flag;
    const bool previous = current;
    current = ZrGlob::StrToBool(value, "True.False.true.false");
    changed = current != previous;
    return BE_OK;
}

// File names are kept as the host gives them, in wide text, without a round trip
// through a narrow character set.
BATCHERR GetSchemaCatalog(void* owner, ZrWString& value, const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    value = dictionaryOf(owner)->CatalogFiles();
    return BE_OK;
}

// Every text is accepted; the files are read, and a bad one reported, by the next
// read.
BATCHERR SetSchemaCatalog(void* owner, const ZrWChar* value, bool& changed,
                          const ZrWChar* /*name*/) {
    if (!owner)
        return BE_INVALID_ARGUMENT;
    ZrXmlSchemaDict* dict = dictionaryOf(owner);
    const ZrWString files(value ? value : u"");
    changed = files != dict->CatalogFiles();
    dict->CatalogFiles(files);
    return BE_OK;
}

// Built when the library is loaded, before any dictionary can exist.
const ZrOptionDef qualifiedRecordNamesOption(u"qualifiedrecordnames", u"QualifiedRecordNames",
                                             u"Strip leading blanks", 0, "False", nullptr,
                                             GetQualifiedRecordNames, SetQualifiedRecordNames,
                                             nullptr, nullptr, nullptr, 0, nullptr, nullptr, 0, 0);

const ZrOptionDef schemaCatalogOption(
    u"schemacatalog", u"SchemaCatalog",
    u"OASIS XML catalog files, separated by \";\", through which the locations and namespaces "
    u"that schemas import or include are mapped to local files",
    0, "", nullptr, nullptr, nullptr, GetSchemaCatalog, SetSchemaCatalog, nullptr, 0, nullptr,
    nullptr, 0, 0);

const ZrOptionDef decimalDigitsOption(
    u"decimaldigits", u"DecimalDigits",
    u"Take precision and decimal places from the facets totalDigits and fractionDigits "
    u"where precision and scale are not given",
    0, "False", nullptr, GetDetail<&ZrXmlSchemaDict::FieldDetail::decimalDigits>,
    SetDetail<&ZrXmlSchemaDict::FieldDetail::decimalDigits>, nullptr, nullptr, nullptr, 0, nullptr,
    nullptr, 0, 0);

const ZrOptionDef occurrenceNullsOption(
    u"occurrencenulls", u"OccurrenceNulls",
    u"Let a field be null only when it may be absent (minOccurs 0, an optional sequence, "
    u"choice or group, a choice of several branches), is nillable, or is an attribute "
    u"not required; a nullable attribute still decides",
    0, "False", nullptr, GetDetail<&ZrXmlSchemaDict::FieldDetail::occurrenceNulls>,
    SetDetail<&ZrXmlSchemaDict::FieldDetail::occurrenceNulls>, nullptr, nullptr, nullptr, 0,
    nullptr, nullptr, 0, 0);

const ZrOptionDef fieldDescriptionsOption(
    u"fielddescriptions", u"FieldDescriptions",
    u"Describe each field by the first documentation of its declaration, else of its type", 0,
    "False", nullptr, GetDetail<&ZrXmlSchemaDict::FieldDetail::fieldDescriptions>,
    SetDetail<&ZrXmlSchemaDict::FieldDetail::fieldDescriptions>, nullptr, nullptr, nullptr, 0,
    nullptr, nullptr, 0, 0);

const ZrOptionDef* optionDefs[] = {&qualifiedRecordNamesOption, &schemaCatalogOption,
                                   &decimalDigitsOption,        &occurrenceNullsOption,
                                   &fieldDescriptionsOption,    nullptr};

} // namespace

int ZrXmlSchemaDict::OptionDefCount() const { return 5; }

const ZrOptionDef** ZrXmlSchemaDict::GetOptionDefs() const { return optionDefs; }
