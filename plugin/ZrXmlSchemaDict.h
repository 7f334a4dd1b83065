// The dictionary object a host gets from NewBrowser: reads a schema into its record
// list, carries the plug-in's option, and flattens records.
#pragma once

#include "zrapi.h"
#include "zrbxmls_export.h"
#include "zrstring.h"

class ZrXmlSchemaDictTestAccess;

class ZRBXMLS_API ZrXmlSchemaDict : public ZrDictBrowser {
  public:
    explicit ZrXmlSchemaDict(ZrSpoke* spoke);
    ZrXmlSchemaDict(const ZrXmlSchemaDict& other);
    ZrXmlSchemaDict& operator=(const ZrXmlSchemaDict& other);
    ~ZrXmlSchemaDict() override;

    // Replaces the record list by the records of the schema at `path`. 0, or 19 when
    // the read failed (the list is then empty; the cause has been logged).
    BATCHERR ReadDictionary(const char* path) override;
    int OptionDefCount() const override;
    const ZrOptionDef** GetOptionDefs() const override;
    // Appends one field per field of `source` to `target`, translating data types
    // through `spoke` when one is given. 0, or 5 when a field cannot be made: memory
    // ran out or the connector threw; the fields appended before stay.
    BATCHERR FlattenDictRecord(const ZrRecord* source, ZrRecord* target, ZrSpoke* spoke) override;

    bool QualifiedRecords() const { return qualifiedRecords; }

    void QualifiedRecords(bool on) { qualifiedRecords = on; }

    // The option "SchemaCatalog": catalog files separated by ";", read before each
    // read.
    const ZrWString& CatalogFiles() const { return catalogFiles; }

    void CatalogFiles(const ZrWString& files) { catalogFiles = files; }

    // The options that ask reads for more of each field: "DecimalDigits",
    // "OccurrenceNulls", "FieldDescriptions".
    struct FieldDetail {
        bool decimalDigits = false;
        bool occurrenceNulls = false;
        bool fieldDescriptions = false;
    };

    const FieldDetail& Detail() const { return detail; }

    FieldDetail& Detail() { return detail; }

  private:
    friend class ZrXmlSchemaDictTestAccess;

    bool initialised = true;
    bool qualifiedRecords = false;
    ZrWString initError;
    ZrWString catalogFiles;
    FieldDetail detail;
};

// A complex number; exported for hosts, unused by the plug-in itself.
class ZRBXMLS_API zrcomplex {
  public:
    double re;
    double im;

    zrcomplex() : re(0.0), im(0.0) {}

    zrcomplex(double real, double imaginary) : re(real), im(imaginary) {}
};

extern "C" {
// A new dictionary for `spoke`, owned by the caller; null when memory runs out.
ZRBXMLS_API ZrDictBrowser* NewBrowser(ZrSpoke* spoke);
// Destroys a dictionary made by NewBrowser; null is ignored.
ZRBXMLS_API void DeleteBrowser(ZrDictBrowser* browser);
}
