#include "SchemaReader.h"
#include "zrglob.h"

// Queues the included document; it is parsed after the current one, as part of the
// schema the current one belongs to.
void SchemaReader::doInclude(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        if (nameBuffer.view() != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        queueSchemaDocument(u"Schema: Error: Include of '%s' in file %s is not read: %s", nullptr);
    }
}

// The document valueBuffer names joins the schema the current document belongs to;
// a location that cannot be read fails the current document, `format` saying so.
void SchemaReader::queueSchemaDocument(
    const XMLCh* format, std::shared_ptr<const std::vector<RedefinedName>> redefined) {
    QueuedDocument document;
    ZrWString refusal;
    if (!locateDocument(valueBuffer, document.path, refusal)) {
        ZrWString text;
        wsfmt(text, lgettext(format), valueBuffer.c_str(), documentPath_.c_str(), refusal.c_str());
        reportError(ZR_SEV_ERROR, 4, text);
        failed = true;
        return;
    }
    document.imported = currentDocument.imported;
    document.ns = currentDocument.ns;
    document.target = bindings->targetNamespace;
    document.redefined = std::move(redefined);
    queueDocument(std::move(document));
}
