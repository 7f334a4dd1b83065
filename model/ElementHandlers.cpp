#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

// Starts a declaration; the enclosing one waits on elementStack until the end tag.
void ZrXmlSchemaBrowser::doElement(xercesc::AttributeList& attrs, bool isAttribute) {
    if (tooDeep())
        return;
    // clear() would empty everything moved out but keep nullable, which a move
    // leaves in place: the result is that of saving a copy.
    elementStack.push_back(std::move(currentElement));
    currentElement.clear();
    currentElement.isAttribute = isAttribute;

    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        if (nameBuffer.startsWith(u"xmlns")) {
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in element attrs");
        } else if (nameBuffer.view() == u"name") {
            parseName(valueBuffer.c_str(), false, currentElement.name, currentElement.nameNs);
        } else if (nameBuffer.view() == u"type") {
            parseName(valueBuffer.c_str(), true, currentElement.typeName, currentElement.typeNs);
        } else if (nameBuffer.view() == u"ref") {
            parseName(valueBuffer.c_str(), false, currentElement.refName, currentElement.refNs);
        } else if (nameBuffer.view() == u"nullable") {
            currentElement.nullable = ZrGlob::wcscmpi(valueBuffer.c_str(), u"false") != 0;
        }
    }
}

// Stores the finished declaration in the definition around it, or among the
// top-level declarations when none is open, and brings the enclosing one back.
void ZrXmlSchemaBrowser::finishElement() {
    if (complexDepth != 0)
        currentComplexType.content.push_back(std::move(currentElement));
    else
        globalElements.push_back(std::move(currentElement));
    if (elementStack.empty()) {
        currentElement = ElementDef();
        return;
    }
    currentElement = std::move(elementStack.back());
    elementStack.pop_back();
}
