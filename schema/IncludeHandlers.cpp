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

ZrWString SchemaReader::locationFromDocument(const ZrWString& written) const {
    ZrWString location = written;
    const ZrURI writtenURI(written.c_str());
    if (documentURI.protocol() == ZRP_NONE && writtenURI.protocol() == ZRP_NONE &&
        !isAbsoluteLocation(writtenURI.path())) {
        ZrString directory(documentURI.path());
        ZrString name;
        ZrString extension;
        ZrGlob::sepfile(directory, name, extension);
        if (!directory.empty()) {
            ZrGlob::appndnam(directory, writtenURI.path());
            location.Assign(directory.c_str(), ZR_CSET_DEFAULT, -1);
        }
    }
    return location;
}

// Queues the included document; it is parsed after the current one, as part of the
// schema the current one belongs to. A relative location is taken from the
// directory of the document that holds the include, its own directory part kept.
void SchemaReader::doInclude(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        if (nameBuffer.view() != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        QueuedDocument included;
        included.path = locationFromDocument(valueBuffer);
        included.imported = currentDocument.imported;
        included.ns = currentDocument.ns;
        included.target = bindings->targetNamespace;
        queueDocument(std::move(included));
    }
}
