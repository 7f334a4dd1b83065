#include "FieldTyping.h"

#include "zrglob.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>
#include <string_view>

namespace {

// Pattern lengths saturate here, so that quantifiers such as {99999999999} and long
// patterns neither overflow nor hand the host more than a 32-bit precision.
constexpr int64_t kPatternLengthCap = INT32_MAX;

// Groups nested deeper than this make a pattern count as unbounded; the scan
// recurses once per open group, and the pattern's author decides how often.
constexpr int kMaxPatternGroupDepth = 256;

bool isBlank(char16_t c) {
    return c == u' ' || c == u'\t' || c == u'\n' || c == u'\v' || c == u'\f' || c == u'\r';
}

bool isDigit(char16_t c) { return c >= u'0' && c <= u'9'; }

// A facet's number as a base-10 integer read like wcstol: leading blanks, an
// optional sign, the longest run of digits; the rest is ignored ("1e5" is 1, "abc"
// is 0). Clamped to the 32-bit signed range.
int64_t facetNumber(const char16_t* text) {
    if (!text)
        return 0;
    while (isBlank(*text))
        ++text;
    bool negative = false;
    if (*text == u'+' || *text == u'-')
        negative = *text++ == u'-';
    int64_t magnitude = 0;
    for (; isDigit(*text); ++text) {
        // Past 2^31 the value clamps either way; stop growing so it cannot overflow.
        if (magnitude <= int64_t(INT32_MAX) + 1)
            magnitude = magnitude * 10 + (*text - u'0');
    }
    const int64_t value = negative ? -magnitude : magnitude;
    return std::clamp<int64_t>(value, INT32_MIN, INT32_MAX);
}

int64_t facetNumber(const ZrName& text) { return facetNumber(text.c_str()); }

bool isEmpty(const char16_t* text) { return !text || !*text; }

int decimalDigits(int64_t value) {
    int digits = 1;
    while (value >= 10) {
        value /= 10;
        ++digits;
    }
    return digits;
}

// A digit run of a quantifier, saturating at the pattern cap.
int64_t quantifierNumber(const char16_t*& cursor) {
    int64_t value = 0;
    for (; isDigit(*cursor); ++cursor)
        value = std::min(value * 10 + (*cursor - u'0'), kPatternLengthCap);
    return value;
}

int64_t saturatingAdd(int64_t a, int64_t b) { return std::min(a + b, kPatternLengthCap); }

// Usage codes, attribute bit cleared, whose values carry no digit count: string,
// boolean, the floating and decimal types, dates and times, binary, anyURI, the
// name and token-list types, hexBinary and base64Binary.
bool limitsIgnoredFor(int usage) {
    return (usage >= 16 && usage <= 24) || (usage >= 30 && usage <= 43) ||
           (usage >= 57 && usage <= 61) || usage == 64 || usage == 65;
}

long branchLengthAt(const char16_t*& cursor, int groupDepth);

} // namespace

bool BuildDepth::tooDeep(const char16_t* where) const {
    if (open <= kMaxBuildDepth)
        return false;
    ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Schema nesting deeper than %d levels at %S",
                       kMaxBuildDepth, where);
    return true;
}

TypeResolver::TypeResolver(const SchemaModel& model, const BuiltinTypes& builtins,
                           BuildDepth& depth)
    : model_(model), builtins_(builtins), depth_(depth),
      explained_(model.failedImports.size(), false) {}

void TypeResolver::explainMissing(std::u16string_view ns) {
    for (size_t i = 0; i < model_.failedImports.size(); ++i) {
        const SchemaModel::ImportFailure& failure = model_.failedImports[i];
        if (explained_[i] || failure.ns != ns)
            continue;
        explained_[i] = true;
        const ZrWString nsText(failure.ns);
        const ZrWString location(failure.location);
        const ZrWString reason(failure.reason);
        ZrGlob::LogMessage(ZR_SEV_ERROR, 4,
                           lgettext(u"Import of namespace '%s' from '%s' was not read: %s"),
                           nsText.c_str(), location.c_str(), reason.c_str());
    }
}

bool TypeResolver::lookupType(std::u16string_view localName, std::u16string_view namespaceURI,
                              ZrDType& type) {
    if (model_.findComplexType(localName, namespaceURI)) {
        ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "Oops, lookupType asked to lookup a complex type");
        return false;
    }
    // The two ur-types hold any text.
    const std::u16string_view name =
        localName == u"anyType" || localName == u"anySimpleType" ? u"string" : localName;

    const SimpleTypeDef* simpleType = model_.simpleTypes.find(name, namespaceURI);
    if (!simpleType) {
        // Built-in aliases answer whatever namespace the name came with.
        const ZrDType* builtin = builtins_.builtinByName(name);
        if (!builtin)
            return false;
        type = *builtin;
        return true;
    }
    if (const auto kept = resolved_.find(simpleType); kept != resolved_.end()) {
        type = kept->second;
        return true;
    }
    ZrDType resolved;
    if (!typeOfSimpleType(*simpleType, resolved))
        return false;
    type = resolved_.emplace(simpleType, resolved).first->second;
    return true;
}

bool TypeResolver::typeOfSimpleType(const SimpleTypeDef& simpleType, ZrDType& type) {
    if (resolveSimpleType(simpleType, type))
        return true;
    ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Error resolving simple type %S", simpleType.name.c_str());
    return false;
}

bool TypeResolver::resolveSimpleType(const SimpleTypeDef& simpleType, ZrDType& type) {
    // A base chain that comes back to a type still being resolved would never end;
    // the types on the cycle fail instead, each level logging on the way back.
    if (resolving_.count(&simpleType)) {
        ZrGlob::LogMessage(ZR_SEV_ERROR, 0, "Circular base type chain at simple type %S",
                           simpleType.name.c_str());
        return false;
    }
    ++depth_.open;
    bool based = false;
    if (!depth_.tooDeep(simpleType.name.c_str())) {
        resolving_.insert(&simpleType);
        if (simpleType.isUnion) {
            based = resolveUnion(simpleType, type);
        } else {
            based = lookupType(simpleType.baseName.view(), simpleType.baseNs.view(), type);
            if (!based)
                explainMissing(simpleType.baseNs.view());
        }
        resolving_.erase(&simpleType);
    }
    --depth_.open;
    if (!based)
        return false;

    applyFacets(simpleType, type);
    return true;
}

// Members that all come to one built-in type give that type, with the largest
// length, precision and decimal places of the members, or none where a member has
// none; members of several types give text, as long as the longest member when every
// member has a length.
bool TypeResolver::resolveUnion(const SimpleTypeDef& simpleType, ZrDType& type) {
    bool first = true;
    bool common = true;
    long length = 0;
    long precision = 0;
    short decimals = 0;
    bool allLength = true;
    bool allPrecision = true;
    bool allDecimals = true;
    for (const TypeRef& member : simpleType.memberTypes) {
        ZrDType memberType;
        if (!lookupType(member.name.view(), member.ns.view(), memberType))
            return false;
        if (first)
            type = memberType;
        else if (memberType.Usage() != type.Usage())
            common = false;
        first = false;
        allLength = allLength && memberType.Length() > 0;
        allPrecision = allPrecision && memberType.Precision() > 0;
        allDecimals = allDecimals && memberType.DecimalPlaces() > 0;
        length = std::max(length, memberType.Length());
        precision = std::max(precision, memberType.Precision());
        decimals = std::max(decimals, memberType.DecimalPlaces());
    }
    if (first || !common) {
        type = *builtins_.builtinByName(u"string");
        type.Length(allLength && !first ? length : 0);
        return true;
    }
    type.Length(allLength ? length : 0);
    type.Precision(allPrecision ? precision : 0);
    type.DecimalPlaces(allDecimals ? decimals : 0);
    return true;
}

void applyFacets(const SimpleTypeDef& simpleType, ZrDType& type) {
    // Later facets override earlier ones: enumeration length beats the length facets
    // and the limits; the pattern's precision beats the limits and the precision facet.
    if (!simpleType.length.empty())
        type.Length(long(facetNumber(simpleType.length)));
    else if (!simpleType.maxLength.empty())
        type.Length(long(facetNumber(simpleType.maxLength)));
    // totalDigits and fractionDigits say the same as precision and scale, which win.
    const ZrName& decimals =
        simpleType.scale.empty() ? simpleType.fractionDigits : simpleType.scale;
    if (!decimals.empty())
        type.DecimalPlaces(short(std::clamp<int64_t>(facetNumber(decimals), SHRT_MIN, SHRT_MAX)));
    if (!simpleType.precision.empty()) {
        type.Precision(long(facetNumber(simpleType.precision)));
    } else if (!simpleType.totalDigits.empty()) {
        // An integer's digits are its length too, as its limits' are.
        const long digits = long(facetNumber(simpleType.totalDigits));
        type.Precision(digits);
        if (!limitsIgnoredFor(type.Usage() & ~256))
            type.Length(digits);
    }
    if (!simpleType.minInclusive.empty() || !simpleType.maxInclusive.empty() ||
        !simpleType.minExclusive.empty() || !simpleType.maxExclusive.empty())
        dtLimits(type, simpleType.minInclusive.c_str(), simpleType.maxInclusive.c_str(),
                 simpleType.minExclusive.c_str(), simpleType.maxExclusive.c_str());
    if (!simpleType.pattern.empty())
        dtPattern(type, simpleType.pattern.c_str());
    if (simpleType.maxEnumLength != 0)
        type.Length(simpleType.maxEnumLength);
}

void dtLimits(ZrDType& type, const char16_t* minInclusive, const char16_t* maxInclusive,
              const char16_t* minExclusive, const char16_t* maxExclusive) {
    if (limitsIgnoredFor(type.Usage() & ~256))
        return;
    // A lower bound alone says nothing about how wide the values grow: xs:int from
    // 1 up still takes ten digits.
    if (isEmpty(maxInclusive) && isEmpty(maxExclusive))
        return;
    // Magnitudes in 64 bits: the smallest 32-bit value has no 32-bit magnitude.
    int64_t low = 0;
    if (!isEmpty(minInclusive))
        low = std::abs(facetNumber(minInclusive));
    else if (!isEmpty(minExclusive))
        low = std::abs(facetNumber(minExclusive)) + 1;
    int64_t high = 0;
    if (!isEmpty(maxInclusive))
        high = std::abs(facetNumber(maxInclusive));
    else if (!isEmpty(maxExclusive))
        high = std::abs(std::abs(facetNumber(maxExclusive)) - 1);
    if (low == 0 && high == 0)
        return;
    const int digits = decimalDigits(std::max(low, high));
    type.Precision(digits);
    type.Length(digits);
}

void dtPattern(ZrDType& type, const char16_t* pattern) {
    if (isEmpty(pattern))
        return;
    long best = 0;
    const char16_t* cursor = pattern;
    // Every top-level branch consumes at least one character or ends the text, and
    // an unbounded one ends the scan, so this loop always ends.
    do {
        const long n = branchLength(cursor);
        best = n == -1 ? -1 : std::max(best, n);
    } while (best >= 0 && *cursor);
    if (best >= 1)
        type.Precision(best);
}

long branchLength(const char16_t*& cursor) { return branchLengthAt(cursor, 0); }

// The longest match of one alternative, or -1 when unbounded. At the top level
// (groupDepth 0) a ")" closes nothing and counts as an ordinary character, so that
// the scan moves on; inside a group it ends the alternative. The cursor never
// passes the terminator: every step checks for it before moving.
namespace {

long branchLengthAt(const char16_t*& cursor, int groupDepth) {
    if (groupDepth > kMaxPatternGroupDepth)
        return -1;
    if (!*cursor)
        return 0;
    int64_t total = 0;
    int64_t last = 1; // length of the latest atom, which a quantifier multiplies
    for (;;) {
        switch (*cursor) {
        case u'(': {
            ++cursor;
            int64_t best = 0;
            while (*cursor && *cursor != u')') {
                const long n = branchLengthAt(cursor, groupDepth + 1);
                if (n == -1)
                    return -1;
                best = std::max<int64_t>(best, n);
            }
            total = saturatingAdd(total, best);
            last = best;
            if (*cursor)
                ++cursor;
            break;
        }
        case u')':
            if (groupDepth > 0)
                return long(total);
            total = saturatingAdd(total, 1);
            last = 1;
            ++cursor;
            break;
        case u'*':
        case u'+':
            return -1;
        case u'?':
            ++cursor;
            break;
        case u'[': {
            ++cursor;
            int depth = 1;
            for (; depth > 0 && *cursor; ++cursor) {
                if (*cursor == u'[')
                    ++depth;
                else if (*cursor == u']')
                    --depth;
            }
            total = saturatingAdd(total, 1);
            last = 1;
            break;
        }
        case u'\\':
            ++cursor;
            if (*cursor == u'p' || *cursor == u'P') {
                ++cursor;
                while (*cursor && *cursor != u'}')
                    ++cursor;
                if (*cursor)
                    ++cursor;
            } else if (*cursor) {
                ++cursor;
            }
            total = saturatingAdd(total, 1);
            last = 1;
            break;
        case u'{': {
            ++cursor;
            const long n = lengthSpec(cursor);
            if (n == -1)
                return -1;
            if (n >= 2)
                total = saturatingAdd(total, std::min((n - 1) * last, kPatternLengthCap));
            break;
        }
        case u'|':
            ++cursor;
            return long(total);
        default:
            total = saturatingAdd(total, 1);
            last = 1;
            ++cursor;
            break;
        }
        if (!*cursor)
            return long(total);
    }
}

} // namespace

long lengthSpec(const char16_t*& cursor) {
    int64_t low = 0;
    int64_t high = -1;
    if (isDigit(*cursor))
        low = quantifierNumber(cursor);
    if (*cursor == u',') {
        ++cursor;
        if (isDigit(*cursor))
            high = quantifierNumber(cursor);
    } else if (low != 0) {
        high = low;
    }
    if (*cursor != u'}')
        return -1;
    ++cursor;
    return long(high);
}
