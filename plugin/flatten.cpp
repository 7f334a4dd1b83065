// Copying the fields of any record into another, one level deep, with data types
// translated by the host's connector when one is given.
#include "ZrXmlSchemaDict.h"
#include "zrglob.h"

#include <climits>
#include <exception>
#include <memory>
#include <new>

namespace {

long addLengths(long a, long b) {
    long sum;
    if (__builtin_add_overflow(a, b, &sum))
        return b > 0 ? LONG_MAX : LONG_MIN;
    return sum;
}

// Formatting the message may itself run out of memory; nothing may reach the host.
void logFlattenStopped(const ZrRecord& source, const ZrField& field, const ZrWChar* reason) {
    try {
        ZrGlob::LogMessage(
            ZR_SEV_ERROR, BE_NO_MEMORY,
            lgettext(u"ZrXmlSchemaDict: Flattening record %s stopped at field %s: %s"),
            source.name.c_str(), field.FieldName().c_str(), reason);
    } catch (...) {
    }
}

} // namespace

BATCHERR ZrXmlSchemaDict::FlattenDictRecord(const ZrRecord* source, ZrRecord* target,
                                            ZrSpoke* spoke) {
    if (!source || !target)
        return BE_INVALID_ARGUMENT;
    const long initialLength = target->RecordLength();
    // The source's count is asked at every step; a record flattened into itself
    // would keep growing, so there its fields are taken as they were at the start.
    const int selfCount = source == target ? source->FieldCount() : -1;
    for (int pos = 0; pos < (selfCount >= 0 ? selfCount : source->FieldCount()); ++pos) {
        const ZrField* from = source->GetFieldbyPos(pos);
        if (!from)
            continue;
        std::unique_ptr<ZrField> field;
        // Anything thrown while making the field, in this code or in the connector's
        // translation, stops the copy: the fields already appended stay, and the
        // record length is left alone.
        try {
            if (spoke) {
                ZrDType mapped = spoke->MapDataType(from->DataType());
                mapped.Length(from->DataType().Length());
                field.reset(new (std::nothrow) ZrField(mapped));
            } else {
                field.reset(new (std::nothrow) ZrField(from->DataType()));
            }
            if (!field)
                return BE_NO_MEMORY;
            field->FieldName(from->FieldName());
            field->Alias(from->FieldName());
            field->Description(from->Description());
            if (!target->AppendField(field.get()))
                return BE_NO_MEMORY;
            field.release();
        } catch (const std::bad_alloc&) {
            logFlattenStopped(*source, *from, u"out of memory");
            return BE_NO_MEMORY;
        } catch (const std::exception& e) {
            ZrWString reason;
            try {
                reason.Assign(e.what(), ZR_CSET_DEFAULT, -1);
            } catch (...) {
            }
            logFlattenStopped(*source, *from, reason.c_str());
            return BE_NO_MEMORY;
        } catch (...) {
            logFlattenStopped(*source, *from, u"unknown error");
            return BE_NO_MEMORY;
        }
    }
    if (initialLength != 0)
        return BE_OK;
    long total = 0;
    for (int pos = 0; pos < target->FieldCount(); ++pos)
        total = addLengths(total, target->GetFieldbyPos(pos)->DataType().Length());
    target->RecordLength(total);
    return BE_OK;
}
