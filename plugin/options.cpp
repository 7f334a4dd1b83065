// The plug-in's options, "QualifiedRecordNames" and "SchemaCatalog". The host's
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

const ZrOptionDef* optionDefs[] = {&qualifiedRecordNamesOption, &schemaCatalogOption, nullptr};

} // namespace

int ZrXmlSchemaDict::OptionDefCount() const { return 2; }

const ZrOptionDef** ZrXmlSchemaDict::GetOptionDefs() const { return optionDefs; }
