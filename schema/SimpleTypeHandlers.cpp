#include "SchemaReader.h"
#include "zrglob.h"

#include <climits>
#include <string_view>

// Simple types do not nest: a simple type starting inside another replaces the
// working record, and the outer one's end stores what the inner one left.
void SchemaReader::doSimpleType(xercesc::AttributeList& attrs) {
    currentSimpleType.clear();
    typeTarget = &currentSimpleType;
    beginTypeDefinition(attrs, currentSimpleType);
}

// The working record stays filled: facets met before the next simple type still
// land in it, and an enclosing simple type stores it once more.
void SchemaReader::finishSimpleType() {
    model.simpleTypes.push_back(currentSimpleType);
    typeTarget = &currentComplexType;
}

// Before the browser has met any complex or simple type there is nothing to
// restrict: the base is dropped.
void SchemaReader::doRestriction(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) != u"base" || !typeTarget)
            continue;
        parseName(attrs.getValue(i), true, typeTarget->baseName, typeTarget->baseNs);
    }
}

// A list types its values as text; its item type, named or inline, plays no part,
// so its content is skipped together with its end tag.
void SchemaReader::doList(xercesc::AttributeList&) {
    if (typeTarget)
        parseName(u"string", true, typeTarget->baseName, typeTarget->baseNs);
    ++skipDepth;
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
