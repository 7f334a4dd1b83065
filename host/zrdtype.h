// Host data type: defined from a type-definition string such as
// "Number;alias=int;signed_invalid;display;maxlength=32;precision=10;scale_invalid;usage=48".
#pragma once

#include "zrtypes.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

class ZRHOST_API ZrDType {
  public:
    // The parsed definition string: the class word, then each item as written
    // (key and value for "key=value", key alone for a bare word; single quotes
    // around a value are removed). Shared by every copy of a type.
    struct Definition {
        std::string text;
        std::string typeClass;
        std::vector<std::pair<std::string, std::string>> items;
        std::vector<bool> bare; // bare[i]: item i is a word without "="
    };

    ZrDType();
    ZrDType(const ZrDType&) = default;
    ZrDType(ZrDType&&) noexcept = default;
    ZrDType& operator=(const ZrDType&) = default;
    ZrDType& operator=(ZrDType&&) noexcept = default;
    virtual ~ZrDType() = default;

    // Replaces the type by the one a definition string describes; usage, alias,
    // length, precision and decimals start from its items (0 or "" when absent) and
    // nulls starts false. Returns false, leaving the type unchanged, for a null or
    // empty string.
    bool Define(const char* definition);

    short Usage() const { return usage_; }

    void Usage(short usage) { usage_ = usage; }

    // Never null; "" for an undefined type.
    const char* Alias() const { return alias_.c_str(); }

    // A null alias sets the empty text.
    void Alias(const char* alias) { alias_.assign(alias ? alias : ""); }

    long Length() const { return length_; }

    void Length(long length) { length_ = length; }

    long Precision() const { return precision_; }

    void Precision(long precision) { precision_ = precision; }

    short DecimalPlaces() const { return decimals_; }

    void DecimalPlaces(short decimals) { decimals_ = decimals; }

    bool Nulls() const { return nulls_; }

    void Nulls(bool nulls) { nulls_ = nulls; }

    // Inspection for host programs.
    // The class word ("Text", "Number", ...), "" for an undefined type.
    const char* TypeClass() const;
    // The whole definition string, "" for an undefined type.
    const char* DefinitionText() const;
    // The value of item `key` ("" for a bare word), or null when the definition lacks it.
    const char* Item(const char* key) const;

    const Definition* Parsed() const { return def_.get(); }

  private:
    std::shared_ptr<const Definition> def_;
    std::string alias_;
    long length_ = 0;
    long precision_ = 0;
    short usage_ = 0;
    short decimals_ = 0;
    bool nulls_ = false;
};
