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
    resolved = false;
    maxEnumLength = 0;
}

void ComplexTypeDef::clear() {
    content.clear();
    isGroup = false;
    simpleContent = false;
    SimpleTypeDef::clear();
}
