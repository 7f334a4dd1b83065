#include "SchemaReader.h"
#include "zrglob.h"

// Queues the included document; it is parsed after the current one. A location
// that cannot be read fails the read.
void SchemaReader::doInclude(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        if (nameBuffer.view() != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);

        ZrWString location;
        ZrWString refusal;
        if (!locateDocument(valueBuffer, location, refusal)) {
            ZrGlob::LogMessage(
                ZR_SEV_ERROR, 4,
                lgettext(u"Schema: Error: Include of '%s' in file %s is not read: %s"),
                valueBuffer.c_str(), documentPath_.c_str(), refusal.c_str());
            failed = true;
            continue;
        }
        queueDocument(location);
    }
}
