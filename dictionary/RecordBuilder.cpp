#include "RecordBuilder.h"

#include "zrglob.h"

#include <string>
#include <unordered_set>
#include <utility>

namespace {

// Every read may take this many addField and buildRecord steps, plus a number per
// component of its model. Group references that fan out, and qualified record names
// over types shared along many paths, otherwise multiply without bound; an honest
// schema takes a small multiple of its size.
constexpr long kBuildStepFloor = 1000000;
constexpr long kBuildStepsPerComponent = 64;

// Keeps a counter raised for the lifetime of a scope.
class DepthScope {
  public:
    explicit DepthScope(int& depth) : depth_(depth) { ++depth_; }

    DepthScope(const DepthScope&) = delete;
    DepthScope& operator=(const DepthScope&) = delete;

    ~DepthScope() { --depth_; }

  private:
    int& depth_;
};

// Marks a component as being drawn into the record under construction.
class ExpansionScope {
  public:
    ExpansionScope(std::vector<const void*>& stack, const void* component) : stack_(stack) {
        stack_.push_back(component);
    }

    ExpansionScope(const ExpansionScope&) = delete;
    ExpansionScope& operator=(const ExpansionScope&) = delete;

    ~ExpansionScope() { stack_.pop_back(); }

  private:
    std::vector<const void*>& stack_;
};

// Starts the expansion guards afresh for a nested record: what the records around it
// are expanding may recur inside it, since records end that recursion themselves.
class RecordScope {
  public:
    RecordScope(std::vector<const void*>& stack, size_t& floor, const void* type)
        : stack_(stack), floor_(floor), savedFloor_(floor) {
        floor_ = stack_.size();
        stack_.push_back(type);
    }

    RecordScope(const RecordScope&) = delete;
    RecordScope& operator=(const RecordScope&) = delete;

    ~RecordScope() {
        stack_.pop_back();
        floor_ = savedFloor_;
    }

  private:
    std::vector<const void*>& stack_;
    size_t& floor_;
    size_t savedFloor_;
};

// Marks a restriction whose base is being drawn in.
class RestrictionScope {
  public:
    RestrictionScope(std::vector<const ComplexTypeDef*>& stack, const ComplexTypeDef& type)
        : stack_(type.restriction ? &stack : nullptr) {
        if (stack_)
            stack_->push_back(&type);
    }

    RestrictionScope(const RestrictionScope&) = delete;
    RestrictionScope& operator=(const RestrictionScope&) = delete;

    ~RestrictionScope() {
        if (stack_)
            stack_->pop_back();
    }

  private:
    std::vector<const ComplexTypeDef*>* stack_;
};

// Sets a list of restrictions aside while content that no restriction around it
// narrows is built: a nested record, or a text field.
class RestrictionsAside {
  public:
    explicit RestrictionsAside(std::vector<const ComplexTypeDef*>& stack) : stack_(stack) {
        saved_.swap(stack_);
    }

    RestrictionsAside(const RestrictionsAside&) = delete;
    RestrictionsAside& operator=(const RestrictionsAside&) = delete;

    ~RestrictionsAside() { saved_.swap(stack_); }

  private:
    std::vector<const ComplexTypeDef*>& stack_;
    std::vector<const ComplexTypeDef*> saved_;
};

// Whether a type has any of the facets that shape a field's data type.
bool narrowsText(const SimpleTypeDef& type) {
    return !type.length.empty() || !type.maxLength.empty() || !type.scale.empty() ||
           !type.precision.empty() || !type.minInclusive.empty() || !type.maxInclusive.empty() ||
           !type.minExclusive.empty() || !type.maxExclusive.empty() || !type.pattern.empty() ||
           type.maxEnumLength != 0;
}

ZrWString generatedName(int32_t number) {
    ZrWString name(u"anon");
    for (char c : std::to_string(number))
        name += ZrWChar(c);
    name += u'\0'; // see isGeneratedName
    return name;
}

} // namespace

RecordBuilder::RecordBuilder(const SchemaModel& schema, const BuiltinTypes& types,
                             ZrRecordList& target, bool qualified)
    : model(schema), builtins(types), records(target), qualifiedRecords(qualified),
      prefixes(schema.namespaces), resolver(schema, types, depth), anonCounter(schema.anonCount) {}

bool RecordBuilder::build() {
    for (size_t i = 0; i < model.mainElementCount; ++i) {
        const ElementDef& declaration = model.globalElements[i];
        const ComplexTypeDef* type =
            model.findComplexType(declaration.typeName.view(), declaration.typeNs.view());
        recordWorkList.clear();
        openRecordCount = 0;
        if (type && !buildRecord(declaration))
            return false;
    }
    return true;
}

ZrRecord* RecordBuilder::buildRecord(const ElementDef& declaration) {
    ZrWString qualified = qualifiedName(declaration.nameNs, declaration.name, false);
    DepthScope level(depth.open);
    if (depth.tooDeep(qualified.c_str()) || !takeBuildStep(qualified.c_str()))
        return nullptr;

    // Most records are named by their qualified name alone: no copy is made to look
    // them up, since most lookups find a record already built.
    const bool pathNamed = qualifiedRecords && recordWorkList.size() > 1;
    ZrWString pathName = pathNamed ? recordName(qualified) : ZrWString();
    const ZrWString& name = pathNamed ? pathName : qualified;
    auto existing = recordsByName.find(name);
    if (existing != recordsByName.end())
        return existing->second;

    ZrRecord* record = records.AddRecord(nullptr, -1);
    if (!record) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, BE_NO_MEMORY, "Out of memory allocating record");
        return nullptr;
    }
    record->name = name;
    recordsByName.emplace(pathNamed ? std::move(pathName) : qualified, record);
    recordWorkList.push_back(std::move(qualified));
    if (openRecordCount == openRecords.size())
        openRecords.emplace_back();
    OpenRecord& open = openRecords[openRecordCount++];
    open.record = record;
    open.fieldNames.clear();

    bool built = false;
    // A record's own fields are optional by their own occurrence, wherever it is drawn in.
    const int outerOptional = std::exchange(drawnOptional, 0);
    const ComplexTypeDef* type =
        model.findComplexType(declaration.typeName.view(), declaration.typeNs.view());
    if (!type) {
        const ZrWString typeText = qualifiedName(declaration.typeNs, declaration.typeName, true);
        ZrGlob::LogMessage(ZR_SEV_ERROR, 4, "Unable to find complex type %S", typeText.c_str());
        resolver.explainMissing(declaration.typeNs.view());
    } else {
        RecordScope scope(expansionStack, expansionFloor, type);
        RestrictionsAside aside(restrictingTypes);
        built = addDerivedContent(*type, record->name, record);
        for (auto it = type->content.begin(); built && it != type->content.end(); ++it)
            built = addField(*it, record);
    }
    drawnOptional = outerOptional;
    // A failed record stays in the list with the fields added so far; the read fails.
    --openRecordCount;
    recordWorkList.pop_back();
    return built ? record : nullptr;
}

// Fields are added only to the innermost record under construction; any other record
// (one a caller hands in directly) is searched.
bool RecordBuilder::recordHasField(const ZrRecord* record, const ZrWString& name) const {
    if (openRecordCount != 0 && openRecords[openRecordCount - 1].record == record)
        return openRecords[openRecordCount - 1].fieldNames.contains(name.view());
    return record->GetFieldbyName(name) != nullptr;
}

void RecordBuilder::noteField(const ZrRecord* record, const ZrWString& name) {
    if (openRecordCount != 0 && openRecords[openRecordCount - 1].record == record)
        openRecords[openRecordCount - 1].fieldNames.insert(name.view());
}

// Draws in what `type` inherits: the text field of simple content, or the whole base
// chain's declarations, farthest base first, so a type derived in several steps keeps
// the fields of every base and not only of the nearest one.
bool RecordBuilder::addDerivedContent(const ComplexTypeDef& type, const ZrWString& recordName,
                                      ZrRecord* record) {
    if (type.baseName.empty())
        return true;
    const ComplexTypeDef* base = model.findComplexType(type.baseName.view(), type.baseNs.view());
    if (type.simpleContent && !(base && !base->isGroup && base->simpleContent)) {
        // Text typed by a simple type. A base that is a complex type without simple
        // content cannot type text, and fails the field in lookupType.
        return addSimpleContentField(type, recordName, record);
    }
    // What remains: complex content drawing in its base, or simple content extending
    // a type that has simple content itself, whose text field and attributes come
    // first, down to the simple type at the far end of the chain.
    if (!base) {
        // A base that is no complex type is the simple type of the record's own text.
        if (type.baseName.view() == u"anyType")
            return true;
        return addTextField(recordName, type.baseName, type.baseNs, record);
    }
    if (isExpanding(base)) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Circular base type chain at complex type %S",
                           base->name.c_str());
        return false;
    }
    DepthScope level(depth.open);
    if (depth.tooDeep(base->name.c_str()))
        return false;
    ExpansionScope expanding(expansionStack, base);
    RestrictionScope restricting(restrictingTypes, type);
    bool added = addDerivedContent(*base, recordName, record);
    for (auto it = base->content.begin(); added && it != base->content.end(); ++it)
        added = addField(*it, record);
    return added;
}

// The text of a simple-content type becomes one field named after the record, typed
// by a simple type of its own: the complex type's base and facets under a fresh
// generated name, which messages show. Restrictions of the type further along the
// record's base chain narrow the text in turn, nearest first.
bool RecordBuilder::addSimpleContentField(const ComplexTypeDef& type, const ZrWString& recordName,
                                          ZrRecord* record) {
    if (!takeBuildStep(record->name.c_str()))
        return false;
    SimpleTypeDef text(static_cast<const SimpleTypeDef&>(type));
    text.name = generatedName(anonCounter++).view();
    // A complex base cannot type text; the restriction's own simple type does.
    if (!type.contentType.name.empty() &&
        model.findComplexType(type.baseName.view(), type.baseNs.view())) {
        text.baseName = type.contentType.name;
        text.baseNs = type.contentType.ns;
    }
    ElementDef declaration;
    declaration.name = recordName.view();
    ZrWString field = qualifiedName(declaration.nameNs, declaration.name, false);
    ZrDType dataType;
    if (!resolver.typeOfSimpleType(text, dataType)) {
        logLookupFailure(text.name.view(), {}, field);
        return false;
    }
    for (auto it = restrictingTypes.rbegin(); it != restrictingTypes.rend(); ++it) {
        if ((*it)->simpleContent && narrowsText(**it))
            applyFacets(**it, dataType);
    }
    newSimpleField(declaration, dataType, std::move(field), record, Description());
    return true;
}

bool RecordBuilder::addTextField(const ZrWString& recordName, const ZrName& typeName,
                                 const ZrName& typeNs, ZrRecord* record) {
    ElementDef text;
    text.name = recordName.view();
    text.typeName = typeName;
    text.typeNs = typeNs;
    RestrictionsAside aside(restrictingTypes);
    return addField(text, record);
}

bool RecordBuilder::addField(const ElementDef& declaration, ZrRecord* record) {
    if (!takeBuildStep(record->name.c_str()))
        return false;
    if (!declaration.refName.empty())
        return addReference(declaration, record);
    if (!declaration.groupName.empty())
        return addGroup(declaration, record);
    if (declaration.prohibited)
        return true;
    // Of a restricted base, the restriction's own content replaces the elements and
    // restates the attributes it changes.
    if (!restrictingTypes.empty()) {
        if (!declaration.isAttribute)
            return true;
        for (const ComplexTypeDef* restriction : restrictingTypes) {
            if (restates(*restriction, declaration))
                return true;
        }
    }

    // Only names that found no complex type are kept as field types, so a kept one
    // spares the complex-type lookup.
    const FieldTypeEntry* kept = keptFieldType(declaration);
    const ComplexTypeDef* complex =
        kept ? nullptr
             : model.findComplexType(declaration.typeName.view(), declaration.typeNs.view());
    if (complex) {
        const ZrRecord* nested = buildRecord(declaration);
        if (!nested)
            return false;
        // A record met again (a recursive type, or a name shared under unqualified
        // record names) gets one field in its parent, not one per occurrence.
        if (!recordHasField(record, nested->name)) {
            ZrField* field = record->NewField(builtins.recordType(), nested->name);
            if (model.occurrenceRead)
                field->DataType().Nulls(fieldNulls(declaration));
            describe(*field, declaration, complex->documentation);
            noteField(record, field->FieldName());
        }
        return true;
    }
    return addSimpleField(declaration, record, kept);
}

// The global declaration stands in for the reference entirely, its attribute and
// nullable flags included.
bool RecordBuilder::addReference(const ElementDef& reference, ZrRecord* record) {
    const ElementDef* target =
        model.globalElements.findExact(reference.refName.view(), reference.refNs.view());
    if (!target) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Failed to look up ref to %S:%S",
                           reference.refNs.c_str(), reference.refName.c_str());
        resolver.explainMissing(reference.refNs.view());
        return false;
    }
    if (isExpanding(target)) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Circular reference to element %S:%S",
                           reference.refNs.c_str(), reference.refName.c_str());
        return false;
    }
    DepthScope level(depth.open);
    if (depth.tooDeep(reference.refName.c_str()))
        return false;
    ExpansionScope expanding(expansionStack, target);
    if (!model.occurrenceRead && !model.documentationRead)
        return addField(*target, record);
    // Occurrence belongs to the place of the reference; a "nullable" written on the
    // declaration still decides, and the reference's own documentation comes first.
    ElementDef drawn(*target);
    drawn.optional = reference.optional;
    drawn.required = reference.required;
    drawn.nillable = target->nillable || reference.nillable;
    if (!target->nullableGiven && reference.nullableGiven) {
        drawn.nullableGiven = true;
        drawn.nullable = reference.nullable;
    }
    if (reference.documentation)
        drawn.documentation = reference.documentation;
    return addField(drawn, record);
}

bool RecordBuilder::restates(const ComplexTypeDef& restriction, const ElementDef& attribute) const {
    std::vector<const std::vector<ElementDef>*> pending{&restriction.content};
    // Each group is looked into once, however often it is referred to.
    std::unordered_set<const ComplexTypeDef*> seen;
    while (!pending.empty()) {
        const std::vector<ElementDef>& content = *pending.back();
        pending.pop_back();
        for (const ElementDef& entry : content) {
            const ElementDef* declared = &entry;
            if (!entry.refName.empty()) {
                declared = model.globalElements.findExact(entry.refName.view(), entry.refNs.view());
            } else if (!entry.groupName.empty()) {
                const ComplexTypeDef* group =
                    model.findGroup(entry.groupName.view(), entry.groupNs.view());
                if (group && seen.insert(group).second)
                    pending.push_back(&group->content);
                continue;
            }
            if (declared && declared->isAttribute && declared->name == attribute.name &&
                declared->nameNs == attribute.nameNs)
                return true;
        }
    }
    return false;
}

bool RecordBuilder::addGroup(const ElementDef& reference, ZrRecord* record) {
    const ComplexTypeDef* group =
        model.findGroup(reference.groupName.view(), reference.groupNs.view());
    if (!group) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 4, "Unable to find group %S", reference.groupName.c_str());
        resolver.explainMissing(reference.groupNs.view());
        return false;
    }
    if (isExpanding(group)) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Circular reference to group %S",
                           reference.groupName.c_str());
        return false;
    }
    DepthScope level(depth.open);
    if (depth.tooDeep(reference.groupName.c_str()))
        return false;
    ExpansionScope expanding(expansionStack, group);
    const int outerOptional = drawnOptional;
    drawnOptional += reference.optional ? 1 : 0;
    bool added = true;
    for (auto it = group->content.begin(); added && it != group->content.end(); ++it)
        added = addField(*it, record);
    drawnOptional = outerOptional;
    return added;
}

bool RecordBuilder::addSimpleField(const ElementDef& declaration, ZrRecord* record,
                                   const FieldTypeEntry* kept) {
    ZrWString field = qualifiedName(declaration.nameNs, declaration.name, false);
    if (!kept && !(kept = fieldType(declaration, field)))
        return false;
    newSimpleField(declaration, kept->type, std::move(field), record, kept->description);
    return true;
}

void RecordBuilder::newSimpleField(const ElementDef& declaration, ZrDType type, ZrWString field,
                                   ZrRecord* record, const Description& typeText) {
    if (declaration.isAttribute) {
        // Only usage and alias change; a type without an attribute variant keeps its alias.
        const short usage = short(type.Usage() + 256);
        type.Usage(usage);
        if (const ZrDType* variant = builtins.TypeByUsage(usage))
            type.Alias(variant->Alias());
    }
    type.Nulls(fieldNulls(declaration));
    // The host's NewField fails only by throwing bad_alloc, so its result needs no test.
    ZrField* added = record->NewField(type, std::move(field));
    describe(*added, declaration, typeText);
    noteField(record, added->FieldName());
}

// An attribute may be null unless required; an element when it may be absent where it
// stands or where it is drawn in, or is nillable.
bool RecordBuilder::fieldNulls(const ElementDef& declaration) const {
    if (!model.occurrenceRead || declaration.nullableGiven)
        return declaration.nullable;
    if (declaration.isAttribute)
        return !declaration.required;
    return declaration.optional || declaration.nillable || drawnOptional != 0;
}

void RecordBuilder::describe(ZrField& field, const ElementDef& declaration,
                             const Description& typeText) {
    if (declaration.documentation)
        field.Description(declaration.documentation);
    else if (typeText)
        field.Description(typeText);
}

// The data type of a field declared with the declaration's type name, before its
// attribute and nullable flags. A type found once is kept: with the model complete,
// lookups of one name give one answer for the rest of the build. Failures are looked
// up again, so each says why.
const RecordBuilder::FieldTypeEntry* RecordBuilder::fieldType(const ElementDef& declaration,
                                                              const ZrWString& field) {
    const std::u16string_view local =
        declaration.typeName.empty() ? u"string" : declaration.typeName.view();
    ZrDType type;
    if (!resolver.lookupType(local, declaration.typeNs.view(), type)) {
        logLookupFailure(local, declaration.typeNs.view(), field);
        return nullptr;
    }
    Description description;
    if (model.documentationRead && !declaration.typeName.empty()) {
        if (const SimpleTypeDef* simple = model.simpleTypes.find(local, declaration.typeNs.view()))
            description = simple->documentation;
    }
    return &fieldTypes
                .emplace(
                    FieldTypeKey{declaration.typeName.identity(), declaration.typeNs.identity()},
                    FieldTypeEntry{declaration.typeName, declaration.typeNs, type,
                                   std::move(description)})
                .first->second;
}

// The namespace is shown as it reads back from the type's name written with its
// prefix: one that has no prefix of its own reads as the default namespace.
void RecordBuilder::logLookupFailure(std::u16string_view local, std::u16string_view ns,
                                     const ZrWString& field) {
    const ZrWString localText(local);
    const ZrWString nsText(prefixes.prefixOf(ns, true).empty()
                               ? std::u16string_view(model.namespaces.defaultNamespace)
                               : ns);
    ZrGlob::LogMessage(ZR_SEV_ERROR, 0,
                       lgettext(u"Lookup of type '%s' (ns '%s') failed for field '%s'"),
                       localText.c_str(), nsText.c_str(), field.c_str());
    resolver.explainMissing(ns);
}

const RecordBuilder::FieldTypeEntry*
RecordBuilder::keptFieldType(const ElementDef& declaration) const {
    const auto it = fieldTypes.find(
        FieldTypeKey{declaration.typeName.identity(), declaration.typeNs.identity()});
    return it == fieldTypes.end() ? nullptr : &it->second;
}

ZrWString RecordBuilder::qualifiedName(const ZrName& ns, const ZrName& local,
                                       bool useTargetPrefix) const {
    const std::u16string_view prefix = prefixes.prefixOf(ns.view(), useTargetPrefix);
    if (prefix.empty())
        return ZrWString(local.view());
    ZrWString name(prefix);
    name += u':';
    name += local.view();
    return name;
}

// With qualified record names, a record nested two or more levels deep carries the
// path of the records around it, the outermost left out: [item!detail]note. A name
// already on that path stands alone, which ends the path of a recursive type.
ZrWString RecordBuilder::recordName(const ZrWString& qualified) const {
    if (!qualifiedRecords || recordWorkList.size() <= 1)
        return qualified;
    ZrWString name(u"[");
    for (size_t i = 1; i < recordWorkList.size(); ++i) {
        const ZrWString& entry = recordWorkList[i];
        if (entry == qualified)
            return qualified;
        if (name.length() > 1)
            name += u'!';
        name += entry;
    }
    name += u']';
    name += qualified;
    return name;
}

bool RecordBuilder::isExpanding(const void* component) const {
    for (size_t i = expansionFloor; i < expansionStack.size(); ++i) {
        if (expansionStack[i] == component)
            return true;
    }
    return false;
}

bool RecordBuilder::takeBuildStep(const char16_t* where) {
    if (buildStepLimit == 0)
        buildStepLimit = buildStepBudget();
    if (++buildSteps <= buildStepLimit)
        return true;
    // Said once: the failure unwinds the whole build without taking further steps.
    if (buildSteps == buildStepLimit + 1)
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Schema expands beyond %ld record-building steps at %S",
                           buildStepLimit, where);
    return false;
}

long RecordBuilder::buildStepBudget() const {
    long components = long(model.globalElements.size() + model.simpleTypes.size());
    for (const ComplexTypeDef& type : model.complexTypes)
        components += 1 + long(type.content.size());
    return kBuildStepFloor + kBuildStepsPerComponent * components;
}
