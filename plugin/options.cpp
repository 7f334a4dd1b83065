// The plug-in's one option, "QualifiedRecordNames". The host's base class looks
// options up and calls these callbacks; the value itself lives in the dictionary.
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

// Built when the library is loaded, before any dictionary can exist.
const ZrOptionDef qualifiedRecordNamesOption(u"qualifiedrecordnames", u"QualifiedRecordNames",
                                             u"Strip leading blanks", 0, "False", nullptr,
                                             GetQualifiedRecordNames, SetQualifiedRecordNames,
                                             nullptr, nullptr, nullptr, 0, nullptr, nullptr, 0, 0);

const ZrOptionDef* optionDefs[] = {&qualifiedRecordNamesOption, nullptr};

} // namespace

int ZrXmlSchemaDict::OptionDefCount() const { return 1; }

const ZrOptionDef** ZrXmlSchemaDict::GetOptionDefs() const { return optionDefs; }
