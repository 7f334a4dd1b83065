#include "SchemaReader.h"
#include "zrglob.h"

#include <iterator>

namespace {

// Gives a component without a name the next generated one (see isGeneratedName).
void nameIfAnonymous(ZrName& name, int32_t& anonCount) {
    if (!name.empty())
        return;
    ZrWString generated;
    wsfmt(generated, u"anon%d", anonCount++);
    generated += u'\0';
    name = generated.view();
}

} // namespace

// Saves the working complex type, and how many declarations were open around it, on
// the stacks and leaves it cleared; the content moves, and the new definition's
// content grows in room a finished one gave back.
void SchemaReader::saveComplexType() {
    complexTypeStack.push_back(std::move(currentComplexType));
    complexElementDepths.push_back(elementStack.size());
    currentComplexType.clear();
    if (!spareContent.empty()) {
        currentComplexType.content = std::move(spareContent.back());
        spareContent.pop_back();
    }
}

void SchemaReader::doComplexType(xercesc::AttributeList& attrs) {
    if (tooDeep())
        return;
    saveComplexType();
    typeTarget = &currentComplexType;
    beginTypeDefinition(attrs, currentComplexType);
    ++complexDepth;
    lastOpened = DocOwner::ComplexType;
    openedDepth = elementDepth;
}

// The start of a simple or complex type: its name and base, a generated name when it
// has none, and the type of the declaration around it when that names none.
void SchemaReader::beginTypeDefinition(xercesc::AttributeList& attrs, SimpleTypeDef& type) {
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
    referToOriginal(type.baseName, type.baseNs, false);
    const bool topLevel = elementStack.empty() && complexDepth == 0 &&
                          simpleDepth <= (&type == &currentSimpleType ? 1 : 0);
    if (topLevel)
        nameDefinition(type.name, type.nameNs, false);
    nameIfAnonymous(type.name, model.anonCount);

    // A type defined inside a declaration without a "type" attribute becomes its
    // type; outside any declaration this lands in the idle record.
    if (currentElement.typeName.empty()) {
        currentElement.typeName = type.name;
        currentElement.typeNs = type.nameNs;
    }
}

// Stores the finished definition and brings back the one it stood in. The model
// keeps every definition's content for the whole read: it takes a copy of exactly
// its size, and the room the content grew in serves the next definition opened.
void SchemaReader::storeDefinition() {
    std::vector<ElementDef> built = std::move(currentComplexType.content);
    currentComplexType.content.assign(std::make_move_iterator(built.begin()),
                                      std::make_move_iterator(built.end()));
    built.clear();
    spareContent.push_back(std::move(built));
    model.complexTypes.push_back(std::move(currentComplexType));
    currentComplexType = std::move(complexTypeStack.back());
    complexTypeStack.pop_back();
    complexElementDepths.pop_back();
    --complexDepth;
}

void SchemaReader::finishComplexType() {
    if (complexTypeStack.empty())
        return;
    storeDefinition();
    typeTarget = &currentComplexType;
}

// The base always belongs to the working complex type, whatever typeTarget says.
void SchemaReader::doExtension(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns"))
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in extension attrs");
        else if (attr == u"base")
            parseName(value, true, currentComplexType.baseName, currentComplexType.baseNs);
    }
    referToOriginal(currentComplexType.baseName, currentComplexType.baseNs, false);
}

// "group" and "attributeGroup" alike: a reference becomes an entry of the
// enclosing content (or a top-level entry); anything else opens a definition.
void SchemaReader::doGroup(xercesc::AttributeList& attrs) {
    ZrName groupName;
    ZrName groupNs;
    ZrName refName;
    ZrName refNs;
    bool optional = detail_.occurrence && optionalHere();
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        const XMLCh* value = attrs.getValue(i);
        if (attr.startsWith(u"xmlns"))
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "xmlns in group attrs");
        else if (attr == u"name")
            parseName(value, false, groupName, groupNs);
        else if (attr == u"ref")
            parseName(value, false, refName, refNs);
        else if (attr == u"minOccurs" && detail_.occurrence && isZeroOccurs(value))
            optional = true;
    }
    if (!groupName.empty() && !refName.empty()) {
        ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "Group %S has both name and ref", groupName.c_str());
        refName.clear();
    }

    if (!refName.empty()) {
        referToOriginal(refName, refNs, true);
        ElementDef reference;
        reference.groupName = std::move(refName);
        reference.groupNs = std::move(refNs);
        reference.optional = optional;
        if (complexDepth != 0)
            currentComplexType.content.push_back(std::move(reference));
        else
            model.globalElements.push_back(std::move(reference));
        groupOpenedDefinition.push_back(false);
        return;
    }

    if (tooDeep())
        return;
    if (elementStack.empty() && complexDepth == 0 && simpleDepth == 0)
        nameDefinition(groupName, groupNs, true);
    saveComplexType();
    currentComplexType.name = std::move(groupName);
    currentComplexType.nameNs = std::move(groupNs);
    currentComplexType.isGroup = true;
    nameIfAnonymous(currentComplexType.name, model.anonCount);
    ++complexDepth;
    groupOpenedDefinition.push_back(true);
}

// Closes a definition only if this element's own start opened one: the end of a
// reference, even one standing directly inside a group definition, closes
// nothing.
void SchemaReader::finishGroup() {
    if (groupOpenedDefinition.empty())
        return;
    const bool openedDefinition = groupOpenedDefinition.back();
    groupOpenedDefinition.pop_back();
    if (!openedDefinition || complexTypeStack.empty())
        return;
    storeDefinition();
}
