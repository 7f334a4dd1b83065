#include "SchemaReader.h"
#include "zrglob.h"

// Starts a declaration; the enclosing one waits on elementStack until the end tag.
void SchemaReader::doElement(xercesc::AttributeList& attrs, bool isAttribute) {
    if (tooDeep())
        return;
    // clear() would empty everything moved out but keep nullable, which a move
    // leaves in place: the result is that of saving a copy.
    elementStack.push_back(std::move(currentElement));
    currentElement.clear();
    currentElement.isAttribute = isAttribute;
    lastOpened = DocOwner::Element;
    openedDepth = elementDepth;
    if (detail_.occurrence)
        currentElement.optional = optionalHere();

    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns")) {
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in element attrs");
        } else if (attr == u"name") {
            parseName(value, false, currentElement.name, currentElement.nameNs);
        } else if (attr == u"type") {
            parseName(value, true, currentElement.typeName, currentElement.typeNs);
        } else if (attr == u"ref") {
            parseName(value, false, currentElement.refName, currentElement.refNs);
        } else if (attr == u"use") {
            const std::u16string_view use = xmlText(value);
            currentElement.prohibited = isAttribute && use == u"prohibited";
            currentElement.required = detail_.occurrence && use == u"required";
        } else if (attr == u"nullable") {
            currentElement.nullable = ZrGlob::wcscmpi(value ? value : u"", u"false") != 0;
            currentElement.nullableGiven = true;
        } else if (!detail_.occurrence) {
            continue;
        } else if (attr == u"minOccurs") {
            currentElement.optional = currentElement.optional || isZeroOccurs(value);
        } else if (attr == u"nillable") {
            const std::u16string_view flag = xmlText(value);
            currentElement.nillable = flag == u"true" || flag == u"1";
        }
    }
}

// Stores the finished declaration in the definition around it, or among the
// top-level declarations when none is open, and brings the enclosing one back.
void SchemaReader::finishElement() {
    if (complexDepth != 0)
        currentComplexType.content.push_back(std::move(currentElement));
    else
        model.globalElements.push_back(std::move(currentElement));
    if (elementStack.empty()) {
        currentElement = ElementDef();
        return;
    }
    currentElement = std::move(elementStack.back());
    elementStack.pop_back();
}
