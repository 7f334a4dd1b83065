#include "SchemaReader.h"
#include "zrglob.h"

namespace {

bool isSeparator(char c) { return c == '/' || c == '\\'; }

// A location that names its own root: a leading separator, or a drive letter and
// a colon.
bool isAbsoluteLocation(const char* location) {
    if (isSeparator(location[0]))
        return true;
    const bool letter =
        (location[0] >= 'A' && location[0] <= 'Z') || (location[0] >= 'a' && location[0] <= 'z');
    return letter && location[1] == ':';
}

} // namespace

// Queues the included document; it is parsed after the current one. A relative
// location is taken from the directory of the document that holds the include,
// its own directory part kept.
void SchemaReader::doInclude(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        if (nameBuffer.view() != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);

        ZrWString location = valueBuffer;
        const ZrURI includeURI(valueBuffer.c_str());
        if (documentURI.protocol() == ZRP_NONE && includeURI.protocol() == ZRP_NONE &&
            !isAbsoluteLocation(includeURI.path())) {
            ZrString directory(documentURI.path());
            ZrString name;
            ZrString extension;
            ZrGlob::sepfile(directory, name, extension);
            if (!directory.empty()) {
                ZrGlob::appndnam(directory, includeURI.path());
                location.Assign(directory.c_str(), ZR_CSET_DEFAULT, -1);
            }
        }
        queueDocument(location);
    }
}
