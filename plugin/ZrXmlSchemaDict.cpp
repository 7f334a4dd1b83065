#include "ZrXmlSchemaDict.h"

#include "ParserConfig.h"
#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

#include <new>

ZrXmlSchemaDict::ZrXmlSchemaDict(ZrSpoke* spoke) : ZrDictBrowser(spoke, kBuiltinTypeDefinitions) {
    // Dictionaries may be made on several threads at once; the library is
    // initialised once for all of them.
    if (const std::u16string* error = parserLibraryError()) {
        initialised = false;
        initError = *error;
    }
    // Gives qualifiedRecords its first value from the option's default.
    InitOptions();
}

ZrXmlSchemaDict::ZrXmlSchemaDict(const ZrXmlSchemaDict& other)
    : ZrDictBrowser(other), initialised(other.initialised),
      qualifiedRecords(other.qualifiedRecords), initError(other.initError),
      catalogFiles(other.catalogFiles), detail(other.detail) {}

ZrXmlSchemaDict& ZrXmlSchemaDict::operator=(const ZrXmlSchemaDict& other) {
    if (this != &other) {
        ZrDictBrowser::operator=(other);
        initialised = other.initialised;
        qualifiedRecords = other.qualifiedRecords;
        initError = other.initError;
        catalogFiles = other.catalogFiles;
        detail = other.detail;
    }
    return *this;
}

ZrXmlSchemaDict::~ZrXmlSchemaDict() = default;

BATCHERR ZrXmlSchemaDict::ReadDictionary(const char* path) {
    if (!initialised) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, BE_READ_FAILED,
                           lgettext(u"ZrXmlSchemaDict: Initialization error: %s"),
                           initError.c_str());
        return BE_READ_FAILED;
    }
    RecordList().Clear();
    ZrWString widePath;
    // No exception may reach the host. The browser catches everything around the
    // parser itself; what is left is running out of memory while building or
    // handing over records, which fails the read like any other cause.
    try {
        widePath.Assign(path, ZR_CSET_DEFAULT, -1);
        ZrXmlSchemaBrowser browser;
        SchemaReadOptions options;
        options.qualifiedRecords = qualifiedRecords;
        options.catalogs = catalogFiles;
        options.decimalDigits = detail.decimalDigits;
        options.occurrenceNulls = detail.occurrenceNulls;
        options.fieldDescriptions = detail.fieldDescriptions;
        if (!browser.ReadSchema(widePath.c_str(), options))
            return BE_READ_FAILED;
        // The browser goes away with this scope: its records move rather than copy.
        browser.TakeRecords(RecordList());
    } catch (const std::bad_alloc&) {
        RecordList().Clear();
        ZrGlob::LogMessage(ZR_SEV_ERROR, BE_NO_MEMORY,
                           lgettext(u"ZrXmlSchemaDict: Out of memory reading %s"),
                           widePath.c_str());
        return BE_READ_FAILED;
    }
    return BE_OK;
}
