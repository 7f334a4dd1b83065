#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

namespace {

// Gives a component without a name the next generated one.
void nameIfAnonymous(ZrName& name, int32_t& anonCounter) {
    if (!name.empty())
        return;
    ZrWString generated;
    wsfmt(generated, u"anon%d", anonCounter++);
    name = generated;
}

// Saves the working complex type on the stack and leaves it cleared. The fields
// clear() keeps (the data type and the facet scratch) are copied back, so the
// working record ends as it would after saving a copy; the content moves.
void saveComplexType(ComplexTypeDef& working, std::vector<ComplexTypeDef>& stack) {
    stack.push_back(std::move(working));
    const ComplexTypeDef& saved = stack.back();
    working.clear();
    working.dataType = saved.dataType;
    working.facetAttrName = saved.facetAttrName;
    working.facetAttrValue = saved.facetAttrValue;
}

} // namespace

void ZrXmlSchemaBrowser::doComplexType(xercesc::AttributeList& attrs) {
    if (tooDeep())
        return;
    saveComplexType(currentComplexType, complexTypeStack);
    typeTarget = &currentComplexType;
    beginTypeDefinition(attrs, currentComplexType);
    ++complexDepth;
}

// The start of a simple or complex type: its name and base, a generated name when it
// has none, and the type of the declaration around it when that names none.
void ZrXmlSchemaBrowser::beginTypeDefinition(xercesc::AttributeList& attrs, SimpleTypeDef& type) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns"))
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in complextype attrs");
        else if (attr == u"name")
            parseName(value, false, type.name, type.nameNs);
        else if (attr == u"base")
            parseName(value, true, type.baseName, type.baseNs);
    }
    nameIfAnonymous(type.name, anonCounter);

    // A type defined inside a declaration without a "type" attribute becomes its
    // type; outside any declaration this lands in the idle record.
    if (currentElement.typeName.empty()) {
        currentElement.typeName = type.name;
        currentElement.typeNs = type.nameNs;
    }
}

void ZrXmlSchemaBrowser::finishComplexType() {
    if (complexTypeStack.empty())
        return;
    complexTypes.push_back(std::move(currentComplexType));
    currentComplexType = std::move(complexTypeStack.back());
    complexTypeStack.pop_back();
    --complexDepth;
    typeTarget = &currentComplexType;
}

// The base always belongs to the working complex type, whatever typeTarget says.
void ZrXmlSchemaBrowser::doExtension(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns"))
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in extension attrs");
        else if (attr == u"base")
            parseName(value, true, currentComplexType.baseName, currentComplexType.baseNs);
    }
}

void ZrXmlSchemaBrowser::finishExtension() {}

// "group" and "attributeGroup" alike: a reference becomes an entry of the
// enclosing content (or a top-level entry); anything else opens a definition.
void ZrXmlSchemaBrowser::doGroup(xercesc::AttributeList& attrs) {
    ZrName groupName;
    ZrName groupNs;
    ZrName refName;
    ZrName refNs;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns"))
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in group attrs");
        else if (attr == u"name")
            parseName(value, false, groupName, groupNs);
        else if (attr == u"ref")
            parseName(value, false, refName, refNs);
    }
    if (!groupName.empty() && !refName.empty()) {
        ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "Group %S has both name and ref", groupName.c_str());
        refName.clear();
    }

    if (!refName.empty()) {
        ElementDef reference;
        reference.groupName = std::move(refName);
        reference.groupNs = std::move(refNs);
        if (complexDepth != 0)
            currentComplexType.content.push_back(std::move(reference));
        else
            globalElements.push_back(std::move(reference));
        groupOpenedDefinition.push_back(false);
        return;
    }

    if (tooDeep())
        return;
    saveComplexType(currentComplexType, complexTypeStack);
    currentComplexType.name = std::move(groupName);
    currentComplexType.nameNs = std::move(groupNs);
    currentComplexType.isGroup = true;
    nameIfAnonymous(currentComplexType.name, anonCounter);
    ++complexDepth;
    groupOpenedDefinition.push_back(true);
}

// Closes a definition only if this element's own start opened one: the end of a
// reference, even one standing directly inside a group definition, closes
// nothing.
void ZrXmlSchemaBrowser::finishGroup() {
    if (groupOpenedDefinition.empty())
        return;
    const bool openedDefinition = groupOpenedDefinition.back();
    groupOpenedDefinition.pop_back();
    if (!openedDefinition || complexTypeStack.empty())
        return;
    complexTypes.push_back(std::move(currentComplexType));
    currentComplexType = std::move(complexTypeStack.back());
    complexTypeStack.pop_back();
    --complexDepth;
}

ComplexTypeDef* ZrXmlSchemaBrowser::findComplexType(std::u16string_view localName,
                                                    std::u16string_view namespaceURI) {
    return complexTypes.find(localName, namespaceURI);
}
