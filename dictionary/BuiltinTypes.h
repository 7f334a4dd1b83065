// The built-in data types: the fixed list of type-definition strings that every
// field type comes from, and lookups into it.
#pragma once

#include "zrdtype.h"

#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

// Number of built-in type-definition strings.
constexpr int kBuiltinTypeCount = 95;
// The built-in type-definition strings, null-terminated, in lookup order.
extern const char* const kBuiltinTypeDefinitions[kBuiltinTypeCount + 1];

class BuiltinTypes {
  public:
    BuiltinTypes();
    BuiltinTypes(const BuiltinTypes&) = delete;
    BuiltinTypes& operator=(const BuiltinTypes&) = delete;

    // First built-in type with that usage code, or null.
    const ZrDType* TypeByUsage(short usage) const;
    // The first built-in type whose alias is `name`, or null.
    const ZrDType* builtinByName(std::u16string_view name) const;

    // The type of fields that stand for nested records.
    const ZrDType& recordType() const { return recordType_; }

    // Every built-in type in list order, null-terminated.
    const ZrDType* const* types() const { return pointers_.get(); }

  private:
    std::unique_ptr<ZrDType[]> types_;
    std::unique_ptr<const ZrDType*[]> pointers_;
    ZrDType recordType_;
    // First built-in type per alias (as wide text, which the views point into) and
    // per usage code: the answers of a scan in list order, without the scan.
    std::vector<std::u16string> wideAliases_;
    std::unordered_map<std::u16string_view, const ZrDType*> byWideAlias_;
    std::unordered_map<short, const ZrDType*> byUsage_;
};
