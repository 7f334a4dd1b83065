#include "ZrXmlSchemaBrowser.h"

#include "ParserConfig.h"
#include "RecordBuilder.h"
#include "SchemaCatalog.h"
#include "SchemaReader.h"
#include "zrglob.h"

#include <new>
#include <xercesc/util/OutOfMemoryException.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLException.hpp>
#include <xercesc/util/XMLUni.hpp>

ZrXmlSchemaBrowser::ZrXmlSchemaBrowser() {
    if (const std::u16string* error = parserLibraryError()) {
        initialised = false;
        initError = *error;
    }
}

ZrXmlSchemaBrowser::~ZrXmlSchemaBrowser() = default;

bool ZrXmlSchemaBrowser::ReadSchema(const ZrWChar* path, bool qualified) {
    SchemaReadOptions options;
    options.qualifiedRecords = qualified;
    return ReadSchema(path, options);
}

bool ZrXmlSchemaBrowser::ReadSchema(const ZrWChar* path, const SchemaReadOptions& options) {
    if (!initialised) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, BE_READ_FAILED,
                           lgettext(u"SchemaBrowser: Initialization error: %s"), initError.c_str());
        return false;
    }
    records.Clear();
    SchemaCatalog catalog;
    SchemaReader reader(model);
    reader.setCatalog(&catalog);
    ReadDetail detail;
    detail.digits = options.decimalDigits;
    detail.occurrence = options.occurrenceNulls;
    detail.documentation = options.fieldDescriptions;
    reader.setDetail(detail);
    try {
        if (!catalog.load(options.catalogs.view())) {
            model.clear();
            return false;
        }
        if (!reader.read(path))
            return false;
        RecordBuilder builder(model, builtins, records, options.qualifiedRecords);
        return builder.build();
    } catch (const xercesc::OutOfMemoryException&) {
        reader.logOutOfMemory();
    } catch (const std::bad_alloc&) {
        reader.logOutOfMemory();
    }
    return false;
}
