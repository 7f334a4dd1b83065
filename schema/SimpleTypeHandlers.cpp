#include "SchemaReader.h"
#include "zrglob.h"

#include <climits>
#include <string>
#include <string_view>

// A simple type inside another's restriction, list or union is a type of its own;
// the outer one waits on the stack until the inner one ends.
void SchemaReader::doSimpleType(xercesc::AttributeList& attrs) {
    if (tooDeep())
        return;
    if (simpleDepth != 0) {
        simpleTypeStack.push_back({std::move(currentSimpleType), currentDerivation});
    } else {
        // A simple type standing directly in a simple-content restriction types the
        // complex type's text.
        typesContent = typeTarget == &currentComplexType && currentComplexType.simpleContent &&
                       currentComplexType.restriction && !complexElementDepths.empty() &&
                       complexElementDepths.back() == elementStack.size();
    }
    ++simpleDepth;
    currentSimpleType.clear();
    currentDerivation = Derivation::None;
    typeTarget = &currentSimpleType;
    beginTypeDefinition(attrs, currentSimpleType);
    lastOpened = DocOwner::SimpleType;
    openedDepth = elementDepth;
}

// Stores the simple type. A nested one becomes the base of the restriction or a
// member of the union it stands in, and the outer type is worked on again. After
// the outermost one the working record stays filled: facets met before the next
// simple type still land in it.
void SchemaReader::finishSimpleType() {
    model.simpleTypes.push_back(currentSimpleType);
    if (simpleDepth == 0 || --simpleDepth == 0) {
        typeTarget = &currentComplexType;
        if (typesContent)
            currentComplexType.contentType = {currentSimpleType.name, currentSimpleType.nameNs};
        typesContent = false;
        return;
    }
    TypeRef inner{currentSimpleType.name, currentSimpleType.nameNs};
    currentSimpleType = std::move(simpleTypeStack.back().type);
    currentDerivation = simpleTypeStack.back().derivation;
    simpleTypeStack.pop_back();
    typeTarget = &currentSimpleType;
    if (currentDerivation == Derivation::Restriction && currentSimpleType.baseName.empty()) {
        currentSimpleType.baseName = std::move(inner.name);
        currentSimpleType.baseNs = std::move(inner.ns);
    } else if (currentDerivation == Derivation::Union) {
        currentSimpleType.memberTypes.push_back(std::move(inner));
    }
}

// Before the reader has met any complex or simple type there is nothing to restrict:
// the base is dropped.
void SchemaReader::doRestriction(xercesc::AttributeList& attrs) {
    if (simpleDepth != 0)
        currentDerivation = Derivation::Restriction;
    if (typeTarget == &currentComplexType)
        currentComplexType.restriction = true;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) != u"base" || !typeTarget)
            continue;
        parseName(attrs.getValue(i), true, typeTarget->baseName, typeTarget->baseNs);
        referToOriginal(typeTarget->baseName, typeTarget->baseNs, false);
    }
}

// A list types its values as text; its item type, named or nested, plays no part.
// Outside any simple type its content is skipped.
void SchemaReader::doList(xercesc::AttributeList&) {
    if (typeTarget)
        parseName(u"string", true, typeTarget->baseName, typeTarget->baseNs);
    if (simpleDepth != 0)
        currentDerivation = Derivation::List;
    else
        ++skipDepth;
}

// The member types named by "memberTypes"; the simple types nested in the union
// join them as they end.
void SchemaReader::doUnion(xercesc::AttributeList& attrs) {
    if (simpleDepth == 0)
        return;
    currentDerivation = Derivation::Union;
    currentSimpleType.isUnion = true;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) != u"memberTypes")
            continue;
        const std::u16string_view list = xmlText(attrs.getValue(i));
        size_t pos = 0;
        while (pos < list.size()) {
            while (pos < list.size() && isXmlSpace(list[pos]))
                ++pos;
            size_t end = pos;
            while (end < list.size() && !isXmlSpace(list[end]))
                ++end;
            if (end > pos) {
                const std::u16string member(list.substr(pos, end - pos));
                TypeRef ref;
                parseName(member.c_str(), true, ref.name, ref.ns);
                currentSimpleType.memberTypes.push_back(std::move(ref));
            }
            pos = end;
        }
    }
}

void SchemaReader::doFacet(xercesc::AttributeList& attrs, SimpleTypeDef& type,
                           const XMLCh* facetName) {
    struct TextFacet {
        std::u16string_view name;
        ZrName SimpleTypeDef::*field;
    };

    static constexpr TextFacet kTextFacets[] = {
        {u"minInclusive", &SimpleTypeDef::minInclusive},
        {u"maxInclusive", &SimpleTypeDef::maxInclusive},
        {u"minExclusive", &SimpleTypeDef::minExclusive},
        {u"maxExclusive", &SimpleTypeDef::maxExclusive},
        {u"length", &SimpleTypeDef::length},
        {u"minLength", &SimpleTypeDef::minLength},
        {u"maxLength", &SimpleTypeDef::maxLength},
        {u"pattern", &SimpleTypeDef::pattern},
        {u"precision", &SimpleTypeDef::precision},
        {u"scale", &SimpleTypeDef::scale},
        {u"encoding", &SimpleTypeDef::encoding},
        {u"period", &SimpleTypeDef::period},
        {u"duration", &SimpleTypeDef::duration},
        {u"totalDigits", &SimpleTypeDef::totalDigits},
        {u"fractionDigits", &SimpleTypeDef::fractionDigits},
    };

    ZrName value;
    bool hasValue = false;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) == u"value") {
            value = model.names.intern(xmlText(attrs.getValue(i)));
            hasValue = true;
        }
    }

    const std::u16string_view facet = facetName ? facetName : u"";
    for (const TextFacet& entry : kTextFacets) {
        if (entry.name == facet) {
            // A facet without a value empties the field: only the last occurrence
            // counts.
            type.*entry.field = std::move(value);
            return;
        }
    }
    if (facet == u"enumeration" && hasValue) {
        const long length = value.length();
        const int32_t clamped = length > INT32_MAX ? INT32_MAX : static_cast<int32_t>(length);
        if (clamped > type.maxEnumLength)
            type.maxEnumLength = clamped;
    }
}
