#include "SchemaModel.h"

void ElementDef::clear() {
    typeName.clear();
    typeNs.clear();
    name.clear();
    nameNs.clear();
    refName.clear();
    refNs.clear();
    groupName.clear();
    groupNs.clear();
    isAttribute = false;
    prohibited = false;
    nullableGiven = false;
    optional = false;
    nillable = false;
    required = false;
    documentation.reset();
}

void SimpleTypeDef::clear() {
    name.clear();
    nameNs.clear();
    baseName.clear();
    baseNs.clear();
    minInclusive.clear();
    maxInclusive.clear();
    minExclusive.clear();
    maxExclusive.clear();
    length.clear();
    minLength.clear();
    maxLength.clear();
    pattern.clear();
    precision.clear();
    scale.clear();
    encoding.clear();
    period.clear();
    duration.clear();
    totalDigits.clear();
    fractionDigits.clear();
    documentation.reset();
    maxEnumLength = 0;
    isUnion = false;
    memberTypes.clear();
}

void ComplexTypeDef::clear() {
    content.clear();
    isGroup = false;
    simpleContent = false;
    restriction = false;
    contentType = TypeRef();
    SimpleTypeDef::clear();
}

PrefixWriter::PrefixWriter(const NamespaceBindings& bindings) : bindings_(bindings) {
    for (const auto& [prefix, bound] : bindings.prefixes)
        prefixOfUri_.emplace(bound, prefix); // keeps the first in table order
    for (const auto& [bound, prefix] : bindings.importedPrefixes)
        prefixOfUri_.emplace(bound, prefix);
    prefixOfUri_.emplace(kXmlNamespace, u"xml");
}

std::u16string_view PrefixWriter::prefixOf(std::u16string_view uri, bool useTargetPrefix) const {
    if (useTargetPrefix && zrSameText(bindings_.targetNamespace, uri))
        return kTargetPrefix;
    if (zrSameText(bindings_.defaultNamespace, uri) || zrSameText(bindings_.targetNamespace, uri))
        return {};
    const auto it = prefixOfUri_.find(uri);
    return it == prefixOfUri_.end() ? std::u16string_view() : it->second;
}

void SchemaModel::clear() {
    globalElements.clear();
    complexTypes.clear();
    simpleTypes.clear();
    namespaces.clear();
    mainElementCount = 0;
    failedImports.clear();
    anonCount = 0;
    occurrenceRead = false;
    documentationRead = false;
    names.clear();
    descriptions.clear();
}
