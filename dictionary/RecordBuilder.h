// Record construction: turns the top-level declarations of complex type, and the
// declarations nested in them, into host records and fields.
#pragma once

#include "BuiltinTypes.h"
#include "FieldTyping.h"
#include "SchemaModel.h"
#include "zrapi.h"
#include "zrstring.h"

#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

class RecordBuilder {
  public:
    // Builds into `records` from `model`; all three must outlive the builder, and the
    // model must not change while it lives.
    RecordBuilder(const SchemaModel& model, const BuiltinTypes& builtins, ZrRecordList& records,
                  bool qualifiedRecords);
    RecordBuilder(const RecordBuilder&) = delete;
    RecordBuilder& operator=(const RecordBuilder&) = delete;

    // One record per top-level declaration of complex type, and the records nested in
    // them. False when a record could not be built; the cause has been logged.
    bool build();

    // The record of `declaration` and those nested in it, or the one built earlier
    // under the same name; null when it fails.
    ZrRecord* buildRecord(const ElementDef& declaration);
    bool addField(const ElementDef& declaration, ZrRecord* record);

  private:
    bool addDerivedContent(const ComplexTypeDef& type, const ZrWString& recordName,
                           ZrRecord* record);
    bool addSimpleContentField(const ComplexTypeDef& type, const ZrWString& recordName,
                               ZrRecord* record);
    bool addTextField(const ZrWString& recordName, const ZrName& typeName, const ZrName& typeNs,
                      ZrRecord* record);
    bool addReference(const ElementDef& reference, ZrRecord* record);
    // Whether the content of `restriction`, its attribute groups and references
    // included, declares an attribute named as `attribute`.
    bool restates(const ComplexTypeDef& restriction, const ElementDef& attribute) const;
    bool addGroup(const ElementDef& reference, ZrRecord* record);
    // `kept`: the declaration's type as kept from an earlier field, or null.
    struct FieldTypeEntry;
    bool addSimpleField(const ElementDef& declaration, ZrRecord* record,
                        const FieldTypeEntry* kept);
    // The declaration's type found and kept, or null when it cannot be typed.
    const FieldTypeEntry* fieldType(const ElementDef& declaration, const ZrWString& field);
    const FieldTypeEntry* keptFieldType(const ElementDef& declaration) const;
    void logLookupFailure(std::u16string_view local, std::u16string_view ns,
                          const ZrWString& field);
    // Whether a field of `declaration` may be null, where it is drawn in now.
    bool fieldNulls(const ElementDef& declaration) const;
    // Gives `field` the documentation of `declaration`, else that of its named type.
    void describe(ZrField& field, const ElementDef& declaration, const Description& typeText);
    // Adds a field of `type` and notes its name.
    void newSimpleField(const ElementDef& declaration, ZrDType type, ZrWString field,
                        ZrRecord* record, const Description& typeText);
    ZrWString qualifiedName(const ZrName& ns, const ZrName& local, bool useTargetPrefix) const;
    ZrWString recordName(const ZrWString& qualified) const;
    bool isExpanding(const void* component) const;
    bool takeBuildStep(const char16_t* where);
    long buildStepBudget() const;
    bool recordHasField(const ZrRecord* record, const ZrWString& name) const;
    // Notes a field just added; `name` is the field's own, which lives as long as it.
    void noteField(const ZrRecord* record, const ZrWString& name);

    const SchemaModel& model;
    const BuiltinTypes& builtins;
    ZrRecordList& records;
    const bool qualifiedRecords;
    const PrefixWriter prefixes;
    BuildDepth depth;
    TypeResolver resolver;
    // Generated names given to the text types of simple content, after the model's.
    int32_t anonCounter;

    // Qualified names of the records under construction, outermost first.
    std::vector<ZrWString> recordWorkList;

    // Records built so far, by name.
    struct TextHash {
        size_t operator()(const ZrWString& text) const { return size_t(zrTextHash(text.view())); }
    };

    std::unordered_map<ZrWString, ZrRecord*, TextHash> recordsByName;

    // Record-building guards. Groups, element references and base types being drawn
    // into the record under construction; entries below expansionFloor belong to the
    // records around it, whose expansions a nested record may legitimately repeat.
    std::vector<const void*> expansionStack;
    size_t expansionFloor = 0;
    // Restrictions whose bases are being drawn into the record under construction:
    // of those bases only the attributes no restriction here restates are taken.
    std::vector<const ComplexTypeDef*> restrictingTypes;
    // Optional group references being drawn into the record under construction: what
    // they hold may be absent however its own occurrence reads.
    int drawnOptional = 0;
    // addField and buildRecord calls so far, and their ceiling.
    long buildSteps = 0;
    long buildStepLimit = 0;

    // The names of the fields given so far to each record under construction,
    // innermost last: whether a record already has a field of some name is then a
    // lookup, not a scan of a record that may hold many thousands of fields.
    // The sets view the fields' own names. Entries past openRecordCount are kept
    // for the next records, so that their sets allocate nothing.
    struct OpenRecord {
        const ZrRecord* record = nullptr;
        ZrTextSet fieldNames;
    };

    std::vector<OpenRecord> openRecords;
    size_t openRecordCount = 0;

    // The data type each named field type comes to, by the identities of the type's
    // name and namespace (held, so they stay unique): the model does not change while
    // records are built.
    struct FieldTypeKey {
        const void* name;
        const void* ns;

        bool operator==(const FieldTypeKey& other) const {
            return name == other.name && ns == other.ns;
        }
    };

    struct FieldTypeKeyHash {
        size_t operator()(const FieldTypeKey& key) const {
            return std::hash<const void*>()(key.name) * 31 + std::hash<const void*>()(key.ns);
        }
    };

    struct FieldTypeEntry {
        ZrName name;
        ZrName ns;
        ZrDType type;
        // The named simple type's documentation, when documentation was read.
        Description description;
    };

    std::unordered_map<FieldTypeKey, FieldTypeEntry, FieldTypeKeyHash> fieldTypes;
};
