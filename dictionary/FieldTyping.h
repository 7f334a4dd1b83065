// Field typing: from a type name and the facets of the schema's simple types to the
// host data type of a field.
#pragma once

#include "BuiltinTypes.h"
#include "SchemaModel.h"
#include "zrdtype.h"

#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

// Nested records, groups, element references, base types and simple-type bases
// together may open this many levels. Real schemas stay far below it; the bound keeps
// the recursion that follows them well inside an 8 MB stack, sanitizers included.
constexpr int kMaxBuildDepth = 1000;

// The levels open now, shared by record building and type resolution: a simple
// type's base chain goes on where the nesting of records leaves off.
struct BuildDepth {
    int open = 0;

    // True, and logged, when more than kMaxBuildDepth levels are open at `where`.
    bool tooDeep(const char16_t* where) const;
};

// Resolves type names of one model to host data types. Each simple type of the
// model is resolved once; the model must not change while the resolver lives.
class TypeResolver {
  public:
    TypeResolver(const SchemaModel& model, const BuiltinTypes& builtins, BuildDepth& depth);

    // The data type named (`localName`, `namespaceURI`): a simple type of the model,
    // else a built-in type of that name in any namespace. False, with the cause
    // logged where there is one, for a complex type or an unknown name.
    bool lookupType(std::u16string_view localName, std::u16string_view namespaceURI, ZrDType& type);
    // The data type of `simpleType`, which need not be one of the model's: its base's
    // narrowed by its facets. False, logged, when its base chain fails.
    bool typeOfSimpleType(const SimpleTypeDef& simpleType, ZrDType& type);
    // Something sought in `ns` was not found: says, once per read, why each document
    // imported for that namespace could not be read.
    void explainMissing(std::u16string_view ns);

  private:
    bool resolveSimpleType(const SimpleTypeDef& simpleType, ZrDType& type);
    bool resolveUnion(const SimpleTypeDef& simpleType, ZrDType& type);

    const SchemaModel& model_;
    const BuiltinTypes& builtins_;
    BuildDepth& depth_;
    // The data type of each simple type of the model resolved so far.
    std::unordered_map<const SimpleTypeDef*, ZrDType> resolved_;
    // Simple types whose base chain is being resolved.
    std::unordered_set<const SimpleTypeDef*> resolving_;
    // Which failed imports of the model have been explained.
    std::vector<bool> explained_;
};

// Narrows `type` by the facets of `simpleType`, as a restriction of it does.
void applyFacets(const SimpleTypeDef& simpleType, ZrDType& type);
// Narrows a numeric type to the digits of its range facets.
void dtLimits(ZrDType& type, const char16_t* minInclusive, const char16_t* maxInclusive,
              const char16_t* minExclusive, const char16_t* maxExclusive);
// Gives a type the longest match of a pattern as its precision, unless unbounded.
void dtPattern(ZrDType& type, const char16_t* pattern);
// The longest match of the pattern branch at `cursor`, or -1 when unbounded; the
// cursor moves past the branch and its "|".
long branchLength(const char16_t*& cursor);
// The upper bound of the quantifier at `cursor` (just past its "{"), or -1 when it
// has none or is malformed; the cursor moves past the "}".
long lengthSpec(const char16_t*& cursor);
