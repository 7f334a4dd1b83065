#include "SchemaReader.h"
#include "zrglob.h"

// Queues the included document; it is parsed after the current one, as part of the
// schema the current one belongs to. A location that cannot be read fails the
// document.
void SchemaReader::doInclude(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        if (nameBuffer.view() != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);

        QueuedDocument included;
        ZrWString refusal;
        if (!locateDocument(valueBuffer, included.path, refusal)) {
            ZrWString text;
            wsfmt(text, lgettext(u"Schema: Error: Include of '%s' in file %s is not read: %s"),
                  valueBuffer.c_str(), documentPath_.c_str(), refusal.c_str());
            reportError(ZR_SEV_ERROR, 4, text);
            failed = true;
            continue;
        }
        included.imported = currentDocument.imported;
        included.ns = currentDocument.ns;
        included.target = bindings->targetNamespace;
        queueDocument(std::move(included));
    }
}
