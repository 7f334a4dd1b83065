// One read of a schema: the reader fills a component model from the schema and the
// documents it includes, then the builder makes host records from the model.
#pragma once

#include "BuiltinTypes.h"
#include "SchemaModel.h"
#include "zrapi.h"
#include "zrbxmls_export.h"
#include "zrdtype.h"
#include "zrstring.h"

// What a read takes from the dictionary's options.
struct SchemaReadOptions {
    // "QualifiedRecordNames": nested records carry the names of those around them.
    bool qualifiedRecords = false;
    // "SchemaCatalog": catalog files separated by ";"; empty for none.
    ZrWString catalogs;
    // "DecimalDigits": totalDigits and fractionDigits give precision and decimal places.
    bool decimalDigits = false;
    // "OccurrenceNulls": a field may be null as its occurrence says.
    bool occurrenceNulls = false;
    // "FieldDescriptions": fields carry their declaration's or type's documentation.
    bool fieldDescriptions = false;
};

class ZRBXMLS_API ZrXmlSchemaBrowser {
  public:
    ZrXmlSchemaBrowser();
    ZrXmlSchemaBrowser(const ZrXmlSchemaBrowser&) = delete;
    ZrXmlSchemaBrowser& operator=(const ZrXmlSchemaBrowser&) = delete;
    ~ZrXmlSchemaBrowser();

    // Parses the schema at `path` and the documents it includes, then builds one
    // record per top-level declaration of complex type. The catalogs of `options`
    // are read first; one that cannot be read fails the read. False when the read
    // failed; the cause has been logged.
    bool ReadSchema(const ZrWChar* path, const SchemaReadOptions& options);
    bool ReadSchema(const ZrWChar* path, bool qualified);

    // Records of the latest read, in building order; they live as long as the browser.
    const ZrRecordList& Records() const { return records; }

    // Moves the records of the latest read to the end of `target`; the browser keeps
    // none. Throws bad_alloc, nothing moved, when memory runs out.
    void TakeRecords(ZrRecordList& target) { target.TakeAll(records); }

    // The component model of the latest read.
    const SchemaModel& Model() const { return model; }

  private:
    bool initialised = true;
    ZrWString initError;
    BuiltinTypes builtins;
    SchemaModel model;
    ZrRecordList records;
};
