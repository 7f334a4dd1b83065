// Helpers of the dictionary tests: read an inline schema and dump the records it
// builds as stable text.
#pragma once

#include "RecordBuilder.h"
#include "TestSupport.h"
#include "ZrXmlSchemaBrowser.h"

#include <string>

namespace zrtest {

// One line per record: "name(length):", then its fields separated by ", ", each
// "name alias(usage)" with " length/precision/decimals" when any is non-zero,
// " notnull" when it takes no nulls, and its description in quotes when it has one.
inline std::string dumpRecords(const ZrRecordList& records) {
    std::string out;
    for (int r = 0; r < records.Count(); ++r) {
        const ZrRecord* record = records[r];
        out += utf8(record->name) + "(" + std::to_string(record->RecordLength()) + "):";
        for (int f = 0; f < record->FieldCount(); ++f) {
            const ZrField* field = record->GetFieldbyPos(f);
            const ZrDType& type = field->DataType();
            out += std::string(f ? ", " : " ") + utf8(field->FieldName()) + " " + type.Alias() +
                   "(" + std::to_string(type.Usage()) + ")";
            if (type.Length() || type.Precision() || type.DecimalPlaces())
                out += " " + std::to_string(type.Length()) + "/" +
                       std::to_string(type.Precision()) + "/" +
                       std::to_string(type.DecimalPlaces());
            if (!type.Nulls())
                out += " notnull";
            if (*field->Description())
                out += std::string(" \"") + field->Description() + "\"";
        }
        out += "\n";
    }
    return out;
}

struct SchemaRead {
    bool ok = false;
    std::string records;  // dumpRecords of the browser's records, failed or not
    std::string messages; // LogCapture::lines()
};

// Reads `body` wrapped in a schema element (with `schemaAttrs` on it) through a
// fresh browser.
inline SchemaRead readInline(const std::string& body, const SchemaReadOptions& options,
                             const std::string& schemaAttrs = "") {
    TempDir dir;
    const std::string path = dir.write("schema.xsd", schemaDoc(body, schemaAttrs));
    ZrXmlSchemaBrowser browser;
    LogCapture log;
    SchemaRead result;
    result.ok = browser.ReadSchema(wide(path).c_str(), options);
    result.records = dumpRecords(browser.Records());
    result.messages = log.lines();
    return result;
}

inline SchemaRead readInline(const std::string& body, bool qualified = false,
                             const std::string& schemaAttrs = "") {
    SchemaReadOptions options;
    options.qualifiedRecords = qualified;
    return readInline(body, options, schemaAttrs);
}

} // namespace zrtest
