#include "SchemaGenerator.h"

#include <algorithm>
#include <cstdio>
#include <initializer_list>
#include <stdexcept>
#include <string>
#include <unordered_set>
#include <vector>

namespace zrgen {
namespace {

constexpr const char* kXsdNs = "http://www.w3.org/2001/XMLSchema";
constexpr const char* kTargetNs = "urn:zr:bench:orders";
constexpr uint64_t kSeed = 0x5eed2024c0ffee01ull;

// splitmix64: a few lines, and the same sequence on every platform and compiler,
// which std::mt19937 with the standard distributions does not promise.
class Rng {
  public:
    explicit Rng(uint64_t seed) : state_(seed) {}

    uint64_t next() {
        uint64_t z = (state_ += 0x9E3779B97F4A7C15ull);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
        return z ^ (z >> 31);
    }

    // Uniform in [0, n); 0 when n is 0.
    uint32_t below(uint32_t n) { return n == 0 ? 0 : static_cast<uint32_t>(next() % n); }

    // Uniform in [lo, hi].
    int range(int lo, int hi) { return lo + static_cast<int>(below(hi - lo + 1)); }

    bool percent(uint32_t p) { return below(100) < p; }

    template <class T, size_t N> const T& pick(const T (&items)[N]) { return items[below(N)]; }

    template <class T> const T& pick(const std::vector<T>& items) {
        return items[below(static_cast<uint32_t>(items.size()))];
    }

    template <class T> T pickOf(std::initializer_list<T> items) {
        return items.begin()[below(static_cast<uint32_t>(items.size()))];
    }

  private:
    uint64_t state_;
};

// Word lists. The lists that form component names are disjoint and free of digits,
// so "word + number + suffix" names never collide across kinds, and none begins
// with "anon".
const char* const kTypeWords[] = {
    "Party",     "Address",    "Contact",   "Order",    "Invoice",  "Shipment",  "Consignment",
    "Delivery",  "Payment",    "Account",   "Contract", "Document", "Location",  "Period",
    "Price",     "Tax",        "Allowance", "Charge",   "Item",     "Catalogue", "Despatch",
    "Receipt",   "Transport",  "Customer",  "Supplier", "Project",  "Tender",    "Certificate",
    "Signature", "Attachment", "Statement", "Reminder", "Budget",   "Service",   "Product",
    "Package",   "Vehicle",    "Route",     "Event",    "Person"};
const char* const kContentWords[] = {"Amount", "Quantity", "Measure", "Text", "Identifier",
                                     "Code",   "Binary",   "Volume",  "Rate", "Weight"};
const char* const kSimpleWords[] = {
    "CurrencyCode", "CountryCode",    "LanguageCode", "UnitCode",        "StatusCode",
    "ReasonCode",   "IdentifierText", "NameText",     "Percentage",      "QuantityValue",
    "Numeric",      "MeasureValue",   "RateValue",    "LineNumber",      "YearCount",
    "ChannelCode",  "PriorityCode",   "PostalZone",   "TelephoneNumber", "AccountNumber"};
const char* const kGroupWords[] = {"Header",         "Summary", "Totals", "References",
                                   "Dates",          "Parties", "Terms",  "Conditions",
                                   "Identification", "Tracking"};
const char* const kPrefixes[] = {
    "Issue",    "Due",      "Tax",      "Line",  "Payment", "Delivery",  "Order",    "Billing",
    "Total",    "Base",     "Net",      "Gross", "Actual",  "Requested", "Promised", "Latest",
    "Earliest", "Customer", "Supplier", "Buyer", "Seller",  "Note",      "Legal",    "Trade"};
const char* const kSuffixes[] = {"Identifier", "Name",    "Description", "Amount",   "Quantity",
                                 "Code",       "Date",    "Time",        "Note",     "Status",
                                 "Reference",  "Percent", "Indicator",   "Text",     "Value",
                                 "Measure",    "Count",   "Number",      "TypeCode", "Reason"};
const char* const kNestedWords[] = {"Line", "Details", "Entry", "Block", "Segment", "Component"};
const char* const kAttrWords[] = {
    "currencyID",       "languageID", "listID",   "listAgencyID", "schemeID",
    "schemeAgencyID",   "unitCode",   "format",   "version",      "encodingCode",
    "characterSetCode", "mimeCode",   "filename", "uri",          "listVersionID",
    "schemeVersionID"};
const char* const kProse[] = {
    "the",        "of",        "a",          "for",      "this",        "is",        "and",
    "identifies", "describes", "document",   "party",    "amount",      "date",      "code",
    "used",       "when",      "which",      "must",     "be",          "given",     "each",
    "line",       "order",     "invoice",    "value",    "reference",   "according", "to",
    "agreed",     "between",   "buyer",      "seller",   "information", "relevant",  "delivery",
    "payment",    "terms",     "conditions", "optional", "required",    "in",        "contract"};
// Built-in types of simple elements and attributes, repeated to weight them.
const char* const kBuiltins[] = {"xs:string",
                                 "xs:string",
                                 "xs:string",
                                 "xs:string",
                                 "xs:token",
                                 "xs:normalizedString",
                                 "xs:int",
                                 "xs:integer",
                                 "xs:decimal",
                                 "xs:decimal",
                                 "xs:boolean",
                                 "xs:date",
                                 "xs:date",
                                 "xs:dateTime",
                                 "xs:time",
                                 "xs:double",
                                 "xs:anyURI",
                                 "xs:positiveInteger",
                                 "xs:nonNegativeInteger",
                                 "xs:long",
                                 "xs:base64Binary",
                                 "xs:gYear",
                                 "xs:NMTOKEN"};
const char* const kContentBases[] = {"xs:decimal",      "xs:decimal", "xs:string",
                                     "xs:string",       "xs:token",   "xs:normalizedString",
                                     "xs:base64Binary", "xs:date"};
const char* const kPatterns[] = {"[A-Z]{3}",
                                 "\\d{4}-\\d{2}-\\d{2}",
                                 "[A-Z]{2}[0-9]{2}[A-Z0-9]{1,30}",
                                 "(\\+|00)[0-9]{6,15}",
                                 "[0-9]{5}(-[0-9]{4})?",
                                 "[A-Za-z0-9._%-]+@[A-Za-z0-9.-]+",
                                 "(ABC|DEF|GHIJ)\\d{3}",
                                 "\\p{Lu}{2}\\d{1,8}",
                                 "[A-Z0-9]{1,10}(/[A-Z0-9]{1,4})?",
                                 "\\d{1,3}(\\.\\d{1,3}){3}"};

enum class Kind : uint8_t { Sequence, Choice, Extension, SimpleContent };

struct NamedType {
    Kind kind = Kind::Sequence;
    uint8_t level = 0;    // references go only to types of lower levels
    uint8_t extDepth = 0; // extension steps down to a type that extends nothing
    uint8_t anon = 0;     // anonymous complex types nested inside it
    bool global = false;  // has a top-level element of its own
    int32_t base = -1;    // Extension: the base type
};

enum class SimpleKind : uint8_t {
    MaxLength,
    Length,
    Enumeration,
    Range,
    Decimal,
    Pattern,
    List,
    Derived
};

struct SimpleType {
    SimpleKind kind = SimpleKind::MaxLength;
    uint8_t depth = 0;  // restriction steps down to a built-in type
    int32_t maxLen = 0; // its maxLength when it has one and no length facet
};

int partsFor(long complexTypes) {
    return static_cast<int>(std::clamp(complexTypes / 250, 1L, 20L));
}

// First index of document `doc` when `count` items are split in order over `docs`.
long blockBegin(long count, int doc, int docs) {
    return (static_cast<long>(doc) * count + docs - 1) / docs;
}

// Buffered output of one document.
class Writer {
  public:
    explicit Writer(const std::string& path) : path_(path), file_(std::fopen(path.c_str(), "wb")) {
        if (!file_)
            throw std::runtime_error("cannot create " + path);
        buffer_.reserve(kFlushAt + 4096);
    }

    Writer(const Writer&) = delete;
    Writer& operator=(const Writer&) = delete;

    ~Writer() {
        if (file_)
            std::fclose(file_);
    }

    // One line of markup at the given indentation.
    void line(int indent, const std::string& text) {
        buffer_.append(static_cast<size_t>(indent) * 2, ' ');
        buffer_ += text;
        buffer_ += '\n';
        if (buffer_.size() >= kFlushAt)
            flush();
    }

    // Closes the file; returns the number of bytes written.
    uint64_t close() {
        flush();
        const bool ok = std::fclose(file_) == 0;
        file_ = nullptr;
        if (!ok)
            throw std::runtime_error("cannot write " + path_);
        return written_;
    }

  private:
    static constexpr size_t kFlushAt = 1 << 20;

    void flush() {
        if (!buffer_.empty() &&
            std::fwrite(buffer_.data(), 1, buffer_.size(), file_) != buffer_.size())
            throw std::runtime_error("cannot write " + path_);
        written_ += buffer_.size();
        buffer_.clear();
    }

    std::string path_;
    std::FILE* file_;
    std::string buffer_;
    uint64_t written_ = 0;
};

std::string attr(const char* name, const std::string& value) {
    return std::string(" ") + name + "=\"" + value + "\"";
}

// Names already used in one content model, so no two particles or attributes of a
// type clash (the set must also load as a valid schema in other processors).
struct Scope {
    std::unordered_set<std::string> elements;
    std::unordered_set<std::string> attributes;
};

class Generator {
  public:
    Generator(long complexTypes, std::string outDir)
        : target_(complexTypes), outDir_(std::move(outDir)), parts_(partsFor(complexTypes)) {}

    GeneratedSet run() {
        plan();
        GeneratedSet set;
        const int docs = parts_ + 1;
        for (int doc = 0; doc < docs; ++doc) {
            const std::string path = outDir_ + "/" + documentName(doc);
            set.documents.push_back(path);
            set.bytes += writeDocument(doc, docs, path);
        }
        set.mainPath = set.documents.front();
        set.stats = stats_;
        return set;
    }

  private:
    // Decides the named types, simple types, groups and global elements up front,
    // so that any type can refer to any other of a lower level wherever it lies.
    void plan() {
        long budget = target_;
        // Types that may serve as bases, by level; the second set holds those that are
        // extensions themselves, which chains grow from.
        std::vector<std::vector<int32_t>> bases(kLevels);
        std::vector<std::vector<int32_t>> extensionBases(kLevels);
        while (budget > 0) {
            NamedType t;
            const uint32_t kindRoll = rng_.below(100);
            t.kind = kindRoll < 15   ? Kind::SimpleContent
                     : kindRoll < 40 ? Kind::Extension
                     : kindRoll < 48 ? Kind::Choice
                                     : Kind::Sequence;
            if (t.kind != Kind::SimpleContent) {
                const uint32_t levelRoll = rng_.below(100);
                t.level = levelRoll < 35   ? 0
                          : levelRoll < 60 ? 1
                          : levelRoll < 80 ? 2
                          : levelRoll < 92 ? 3
                                           : 4;
            }
            if (t.kind == Kind::Extension) {
                t.base = pickBase(bases, extensionBases, t.level);
                if (t.base < 0)
                    t.kind = Kind::Sequence;
                else
                    t.extDepth = static_cast<uint8_t>(named_[t.base].extDepth + 1);
            }
            if (t.kind != Kind::SimpleContent) {
                const uint32_t anonRoll = rng_.below(100);
                long anon = anonRoll < 50   ? 0
                            : anonRoll < 72 ? 1
                            : anonRoll < 85 ? 2
                            : anonRoll < 93 ? 3
                                            : rng_.range(4, 6);
                t.anon = static_cast<uint8_t>(std::min(anon, budget - 1));
            }
            t.global = rng_.percent(t.kind == Kind::SimpleContent ? 20 : 35);
            budget -= 1 + t.anon;

            const int32_t index = static_cast<int32_t>(named_.size());
            named_.push_back(t);
            if (t.kind == Kind::SimpleContent) {
                contentTypes_.push_back(index);
                if (t.global)
                    contentGlobals_.push_back(index);
            } else {
                complexByLevel_[t.level].push_back(index);
                if (t.global)
                    globalsByLevel_[t.level].push_back(index);
                if (t.extDepth < 3)
                    bases[t.level].push_back(index);
                if (t.extDepth > 0 && t.extDepth < 3)
                    extensionBases[t.level].push_back(index);
            }
        }

        const long simpleCount = std::max(1L, target_ * 6 / 10);
        for (long k = 0; k < simpleCount; ++k) {
            SimpleType s;
            const uint32_t roll = rng_.below(100);
            s.kind = roll < 25   ? SimpleKind::MaxLength
                     : roll < 32 ? SimpleKind::Length
                     : roll < 57 ? SimpleKind::Enumeration
                     : roll < 67 ? SimpleKind::Range
                     : roll < 73 ? SimpleKind::Decimal
                     : roll < 85 ? SimpleKind::Pattern
                     : roll < 92 ? SimpleKind::List
                                 : SimpleKind::Derived;
            if (s.kind == SimpleKind::Derived && k == 0)
                s.kind = SimpleKind::MaxLength;
            simple_.push_back(s);
        }
        simpleGlobals_ = std::max(1L, target_ / 20);
        groups_ = std::max(1L, target_ / 25);
        attributeGroups_ = std::max(1L, target_ / 25);
    }

    int32_t pickBase(const std::vector<std::vector<int32_t>>& bases,
                     const std::vector<std::vector<int32_t>>& extensionBases, int level) {
        if (level == 0)
            return -1;
        // Prefer extending an extension of the level just below, so that chains of two
        // and three form; fall back to any base of a lower level.
        if (rng_.percent(45) && !extensionBases[level - 1].empty())
            return rng_.pick(extensionBases[level - 1]);
        for (int tries = 0; tries < 4; ++tries) {
            const int l = tries == 0 ? level - 1 : static_cast<int>(rng_.below(level));
            if (!bases[l].empty())
                return rng_.pick(bases[l]);
        }
        return -1;
    }

    static std::string documentName(int doc) {
        if (doc == 0)
            return "main.xsd";
        char name[32];
        std::snprintf(name, sizeof name, "part%02d.xsd", doc);
        return name;
    }

    uint64_t writeDocument(int doc, int docs, const std::string& path) {
        Writer w(path);
        w.line(0, "<?xml version=\"1.0\" encoding=\"UTF-8\"?>");
        w.line(0, "<!-- zrgen benchmark schema: " + std::to_string(target_) +
                      " complex types; document " + std::to_string(doc + 1) + " of " +
                      std::to_string(docs) + ". -->");
        w.line(0, std::string("<xs:schema") + attr("xmlns:xs", kXsdNs) +
                      attr("xmlns:tns", kTargetNs) + attr("targetNamespace", kTargetNs) +
                      attr("elementFormDefault", "qualified") + attr("version", "1.0") + ">");
        // The main document includes every part but the last, which the first part
        // includes, so that includes nest one level.
        if (doc == 0) {
            for (int p = 1; p < docs; ++p)
                if (p < docs - 1 || docs < 3)
                    w.line(1, "<xs:include" + attr("schemaLocation", documentName(p)) + "/>");
        } else if (doc == 1 && docs >= 3) {
            w.line(1, "<xs:include" + attr("schemaLocation", documentName(docs - 1)) + "/>");
        }

        const long simpleCount = static_cast<long>(simple_.size());
        for (long k = blockBegin(simpleCount, doc, docs);
             k < blockBegin(simpleCount, doc + 1, docs); ++k)
            writeSimpleType(w, k);
        for (long k = blockBegin(simpleGlobals_, doc, docs);
             k < blockBegin(simpleGlobals_, doc + 1, docs); ++k)
            writeSimpleGlobal(w, k);
        for (long g = blockBegin(groups_, doc, docs); g < blockBegin(groups_, doc + 1, docs); ++g)
            writeGroup(w, g);
        for (long g = blockBegin(attributeGroups_, doc, docs);
             g < blockBegin(attributeGroups_, doc + 1, docs); ++g)
            writeAttributeGroup(w, g);
        const long namedCount = static_cast<long>(named_.size());
        for (long i = blockBegin(namedCount, doc, docs); i < blockBegin(namedCount, doc + 1, docs);
             ++i)
            writeNamedType(w, static_cast<int32_t>(i));
        w.line(0, "</xs:schema>");
        return w.close();
    }

    // --- names -------------------------------------------------------------------

    std::string typeName(int32_t i) const { return elementName(i) + "Type"; }

    std::string elementName(int32_t i) const {
        const auto n = static_cast<size_t>(i);
        const char* word = named_[i].kind == Kind::SimpleContent
                               ? kContentWords[n % std::size(kContentWords)]
                               : kTypeWords[n % std::size(kTypeWords)];
        return word + std::to_string(i);
    }

    static std::string simpleName(long k) {
        return std::string(kSimpleWords[static_cast<size_t>(k) % std::size(kSimpleWords)]) +
               std::to_string(k) + "Type";
    }

    static std::string simpleGlobalName(long k) {
        return std::string(kPrefixes[static_cast<size_t>(k) % std::size(kPrefixes)]) +
               kSuffixes[static_cast<size_t>(k / 7) % std::size(kSuffixes)] + "V" +
               std::to_string(k);
    }

    static std::string groupName(long g) {
        return std::string(kGroupWords[static_cast<size_t>(g) % std::size(kGroupWords)]) +
               std::to_string(g) + "Group";
    }

    static std::string attributeGroupName(long g) {
        return std::string(kGroupWords[static_cast<size_t>(g) % std::size(kGroupWords)]) +
               std::to_string(g) + "Attributes";
    }

    // Every expression below draws from the generator at most once: the order in which
    // the operands of one expression are evaluated is not fixed, the output must be.
    std::string localName() {
        std::string name = rng_.pick(kPrefixes);
        return name + rng_.pick(kSuffixes);
    }

    std::string prose(int minWords, int maxWords) {
        std::string text = "The";
        const int words = rng_.range(minWords, maxWords);
        for (int i = 0; i < words; ++i)
            text += std::string(" ") + rng_.pick(kProse);
        return text + ".";
    }

    // A simple type for a field: a built-in one or a named simple type of the set.
    std::string simpleTypeRef() {
        if (rng_.percent(45))
            return "tns:" + simpleName(rng_.below(static_cast<uint32_t>(simple_.size())));
        return rng_.pick(kBuiltins);
    }

    std::string occurs() {
        const uint32_t roll = rng_.below(100);
        if (roll < 40)
            return "";
        if (roll < 75)
            return attr("minOccurs", "0");
        if (roll < 90)
            return attr("minOccurs", "0") + attr("maxOccurs", "unbounded");
        return attr("maxOccurs", std::to_string(rng_.range(2, 9)));
    }

    void annotation(Writer& w, int indent, int minWords, int maxWords) {
        ++stats_.annotations;
        w.line(indent, "<xs:annotation>");
        w.line(indent + 1, "<xs:documentation xml:lang=\"en\">" + prose(minWords, maxWords) +
                               "</xs:documentation>");
        w.line(indent, "</xs:annotation>");
    }

    // --- simple types ------------------------------------------------------------

    void writeSimpleType(Writer& w, long k) {
        SimpleType& s = simple_[k];
        ++stats_.simpleTypes;
        w.line(1, "<xs:simpleType" + attr("name", simpleName(k)) + ">");
        if (rng_.percent(30))
            annotation(w, 2, 6, 18);
        switch (s.kind) {
        case SimpleKind::MaxLength:
            s.maxLen = rng_.pickOf<int>({2, 3, 8, 10, 17, 20, 35, 70, 100, 256, 512});
            restriction(w, rng_.percent(80) ? "xs:string" : "xs:normalizedString",
                        {facet("maxLength", std::to_string(s.maxLen))});
            break;
        case SimpleKind::Length:
            restriction(w, "xs:string", {facet("length", std::to_string(rng_.range(1, 12)))});
            break;
        case SimpleKind::Enumeration: {
            std::vector<std::string> facets;
            const int values = rng_.range(3, 12);
            for (int v = 0; v < values; ++v) {
                std::string code(1, static_cast<char>('A' + rng_.below(26)));
                for (int c = rng_.range(0, 3); c > 0; --c)
                    code += static_cast<char>('A' + rng_.below(26));
                facets.push_back(facet("enumeration", code + std::to_string(v)));
            }
            restriction(w, "xs:token", facets);
            break;
        }
        case SimpleKind::Range: {
            const int digits = rng_.range(1, 9);
            std::string limit = "1" + std::string(static_cast<size_t>(digits), '0');
            std::vector<std::string> facets{facet("minInclusive", rng_.percent(50) ? "0" : "1")};
            if (rng_.percent(50))
                facets.push_back(facet("maxExclusive", limit));
            else
                facets.push_back(
                    facet("maxInclusive", std::string(static_cast<size_t>(digits), '9')));
            restriction(w,
                        rng_.pickOf<const char*>({"xs:int", "xs:integer", "xs:nonNegativeInteger"}),
                        facets);
            break;
        }
        case SimpleKind::Decimal:
            restriction(w, "xs:decimal",
                        {facet("totalDigits", "18"),
                         facet("fractionDigits", std::to_string(rng_.range(2, 4))),
                         facet("minInclusive", "0")});
            break;
        case SimpleKind::Pattern: {
            const char* base = rng_.percent(70) ? "xs:string" : "xs:token";
            restriction(w, base, {facet("pattern", rng_.pick(kPatterns))});
            break;
        }
        case SimpleKind::List:
            if (rng_.percent(60)) {
                w.line(2, "<xs:list" +
                              attr("itemType",
                                   rng_.pickOf<const char*>({"xs:token", "xs:int", "xs:date"})) +
                              "/>");
            } else {
                // An inline item type, which the reader skips with the list.
                w.line(2, "<xs:list>");
                w.line(3, "<xs:simpleType>");
                w.line(4, "<xs:restriction base=\"xs:token\">");
                for (int v = rng_.range(2, 5); v > 0; --v)
                    w.line(5, facet("enumeration", "V" + std::to_string(v)));
                w.line(4, "</xs:restriction>");
                w.line(3, "</xs:simpleType>");
                w.line(2, "</xs:list>");
            }
            break;
        case SimpleKind::Derived: {
            // Restricts an earlier named simple type: a shorter maxLength when the base
            // has one, otherwise a pattern.
            long base = rng_.below(static_cast<uint32_t>(k));
            for (int tries = 0; tries < 4 && simple_[base].depth >= 3; ++tries)
                base = rng_.below(static_cast<uint32_t>(k));
            if (simple_[base].depth >= 3) {
                restriction(w, "xs:string", {facet("pattern", rng_.pick(kPatterns))});
                break;
            }
            s.depth = static_cast<uint8_t>(simple_[base].depth + 1);
            if (simple_[base].maxLen > 1) {
                s.maxLen = rng_.range(1, simple_[base].maxLen - 1);
                restriction(w, "tns:" + simpleName(base),
                            {facet("maxLength", std::to_string(s.maxLen))});
            } else {
                restriction(w, "tns:" + simpleName(base), {facet("pattern", "[0-9A-Z]{1,10}")});
            }
            break;
        }
        }
        w.line(1, "</xs:simpleType>");
    }

    static std::string facet(const char* name, const std::string& value) {
        return std::string("<xs:") + name + attr("value", value) + "/>";
    }

    static void restriction(Writer& w, const std::string& base,
                            const std::vector<std::string>& facets, int indent = 2) {
        w.line(indent, "<xs:restriction" + attr("base", base) + ">");
        for (const auto& f : facets)
            w.line(indent + 1, f);
        w.line(indent, "</xs:restriction>");
    }

    void writeSimpleGlobal(Writer& w, long k) {
        ++stats_.globalElements;
        w.line(1, "<xs:element" + attr("name", simpleGlobalName(k)) +
                      attr("type", simpleTypeRef()) + "/>");
    }

    // --- groups ------------------------------------------------------------------

    void writeGroup(Writer& w, long g) {
        ++stats_.groups;
        w.line(1, "<xs:group" + attr("name", groupName(g)) + ">");
        w.line(2, "<xs:sequence>");
        Scope scope;
        for (int n = rng_.range(2, 5); n > 0; --n) {
            // Members are local declarations whose names carry the group's number, so
            // they never meet a particle of the same name in a type that uses the
            // group (which would make its content model ambiguous).
            const std::string name = localName() + "G" + std::to_string(g);
            if (!scope.elements.insert(name).second)
                continue;
            ++stats_.elements;
            const std::string type = simpleTypeRef();
            w.line(3, "<xs:element" + attr("name", name) + attr("type", type) + occurs() + "/>");
        }
        w.line(2, "</xs:sequence>");
        w.line(1, "</xs:group>");
    }

    void writeAttributeGroup(Writer& w, long g) {
        ++stats_.attributeGroups;
        w.line(1, "<xs:attributeGroup" + attr("name", attributeGroupName(g)) + ">");
        Scope scope;
        for (int n = rng_.range(2, 4); n > 0; --n) {
            const std::string name = std::string(rng_.pick(kAttrWords)) + std::to_string(g);
            if (!scope.attributes.insert(name).second)
                continue;
            ++stats_.attributes;
            const std::string type = simpleTypeRef();
            const std::string use = rng_.percent(20) ? attr("use", "required") : "";
            w.line(2, "<xs:attribute" + attr("name", name) + attr("type", type) + use + "/>");
        }
        w.line(1, "</xs:attributeGroup>");
    }

    // --- complex types -----------------------------------------------------------

    struct Context {
        int32_t type; // the named type being written
        int depth;    // complexType nesting: 1 for the named type
        int anonLeft; // anonymous types still to place inside the named type
        bool extension;
    };

    void writeNamedType(Writer& w, int32_t i) {
        const NamedType& t = named_[i];
        ++stats_.complexTypes;
        ++stats_.namedComplexTypes;
        w.line(1, "<xs:complexType" + attr("name", typeName(i)) + ">");
        if (rng_.percent(55))
            annotation(w, 2, 12, 45);
        Context ctx{i, 1, t.anon, false};
        Scope scope;
        switch (t.kind) {
        case Kind::SimpleContent: {
            ++stats_.simpleContentTypes;
            w.line(2, "<xs:simpleContent>");
            const std::string base =
                rng_.percent(30)
                    ? "tns:" + simpleName(rng_.below(static_cast<uint32_t>(simple_.size())))
                    : rng_.pick(kContentBases);
            w.line(3, "<xs:extension" + attr("base", base) + ">");
            writeAttributes(w, 4, ctx, scope, 1, 3);
            w.line(3, "</xs:extension>");
            w.line(2, "</xs:simpleContent>");
            break;
        }
        case Kind::Extension:
            ++stats_.extensionTypes;
            stats_.longestExtensionChain = std::max<long>(stats_.longestExtensionChain, t.extDepth);
            ctx.extension = true;
            w.line(2, "<xs:complexContent>");
            w.line(3, "<xs:extension" + attr("base", "tns:" + typeName(t.base)) + ">");
            writeModel(w, 4, ctx, scope, "xs:sequence", 1, 5);
            writeAttributes(w, 4, ctx, scope, 0, 2);
            w.line(3, "</xs:extension>");
            w.line(2, "</xs:complexContent>");
            break;
        case Kind::Choice:
            writeModel(w, 2, ctx, scope, "xs:choice", 2, 6);
            writeAttributes(w, 2, ctx, scope, 0, 2);
            break;
        case Kind::Sequence:
            writeModel(w, 2, ctx, scope, "xs:sequence", 3, 12);
            writeAttributes(w, 2, ctx, scope, 0, 3);
            break;
        }
        w.line(1, "</xs:complexType>");
        if (t.global) {
            ++stats_.globalElements;
            w.line(1, "<xs:element" + attr("name", elementName(i)) +
                          attr("type", "tns:" + typeName(i)) + "/>");
        }
    }

    // The particles of one content model. Anonymous types are placed at random
    // while the named type's share lasts; what is left is placed at the end of the
    // named type's own model, so every set holds exactly the planned count.
    void writeModel(Writer& w, int indent, Context& ctx, Scope& scope, const char* compositor,
                    int minChildren, int maxChildren) {
        w.line(indent, std::string("<") + compositor + ">");
        bool groupRefDone = ctx.extension; // an extension's base may use the same group
        const int children = rng_.range(minChildren, maxChildren);
        for (int c = 0; c < children; ++c) {
            if (ctx.anonLeft > 0 && ctx.depth < 4 && rng_.percent(30)) {
                writeAnonymous(w, indent + 1, ctx);
                continue;
            }
            const uint32_t roll = rng_.below(100);
            if (roll < 16 && writeComplexElement(w, indent + 1, ctx, scope))
                continue;
            if (roll >= 16 && roll < 28 && writeElementRef(w, indent + 1, ctx, scope))
                continue;
            if (roll >= 28 && roll < 33 && !groupRefDone) {
                groupRefDone = true;
                ++stats_.groupRefs;
                const std::string ref = groupName(rng_.below(static_cast<uint32_t>(groups_)));
                w.line(indent + 1, "<xs:group" + attr("ref", "tns:" + ref) + occurs() + "/>");
                continue;
            }
            writeSimpleElement(w, indent + 1, ctx, scope);
        }
        if (ctx.depth == 1)
            while (ctx.anonLeft > 0)
                writeAnonymous(w, indent + 1, ctx);
        w.line(indent, std::string("</") + compositor + ">");
    }

    void writeAnonymous(Writer& w, int indent, Context& ctx) {
        --ctx.anonLeft;
        ++stats_.complexTypes;
        ++stats_.anonymousComplexTypes;
        ++stats_.elements;
        std::string name = rng_.pick(kPrefixes);
        name += rng_.pick(kNestedWords) + std::to_string(nestedSerial_++);
        w.line(indent, "<xs:element" + attr("name", name) + occurs() + ">");
        if (rng_.percent(15))
            annotation(w, indent + 1, 5, 15);
        w.line(indent + 1, "<xs:complexType>");
        Context inner{ctx.type, ctx.depth + 1, ctx.anonLeft, false};
        Scope scope;
        writeModel(w, indent + 2, inner, scope, rng_.percent(85) ? "xs:sequence" : "xs:choice", 2,
                   7);
        writeAttributes(w, indent + 2, inner, scope, 0, 2);
        ctx.anonLeft = inner.anonLeft;
        w.line(indent + 1, "</xs:complexType>");
        w.line(indent, "</xs:element>");
    }

    // An element typed by a named complex type of a lower level, or by a simple-content
    // type; false when there is none to refer to.
    bool writeComplexElement(Writer& w, int indent, const Context& ctx, Scope& scope) {
        const int level = named_[ctx.type].level;
        int32_t target = -1;
        if (level > 0 && rng_.percent(50)) {
            const auto& pool = complexByLevel_[rng_.below(level)];
            if (!pool.empty())
                target = rng_.pick(pool);
        }
        if (target < 0 && !contentTypes_.empty())
            target = rng_.pick(contentTypes_);
        if (target < 0)
            return false;
        std::string name = elementName(target);
        if (ctx.extension)
            name += "X" + std::to_string(ctx.type);
        if (!scope.elements.insert(name).second)
            return false;
        ++stats_.elements;
        w.line(indent, "<xs:element" + attr("name", name) +
                           attr("type", "tns:" + typeName(target)) + occurs() + "/>");
        return true;
    }

    // A reference to a global element: of a simple type, of a simple-content type or
    // of a complex type of a lower level.
    bool writeElementRef(Writer& w, int indent, const Context& ctx, Scope& scope) {
        // A reference in an extension could repeat one of its base's particles.
        if (ctx.extension)
            return false;
        const int level = named_[ctx.type].level;
        std::string ref;
        const uint32_t roll = rng_.below(100);
        if (roll < 40) {
            ref = simpleGlobalName(rng_.below(static_cast<uint32_t>(simpleGlobals_)));
        } else if (roll < 70 || level == 0) {
            if (contentGlobals_.empty())
                return false;
            ref = elementName(rng_.pick(contentGlobals_));
        } else {
            const auto& pool = globalsByLevel_[rng_.below(level)];
            if (pool.empty())
                return false;
            ref = elementName(rng_.pick(pool));
        }
        if (!scope.elements.insert(ref).second)
            return false;
        ++stats_.elementRefs;
        w.line(indent, "<xs:element" + attr("ref", "tns:" + ref) + occurs() + "/>");
        return true;
    }

    void writeSimpleElement(Writer& w, int indent, const Context& ctx, Scope& scope) {
        std::string name = localName();
        // An extension's own members carry the type's number, so they never clash
        // with a member of its base.
        if (ctx.extension)
            name += "X" + std::to_string(ctx.type);
        if (!scope.elements.insert(name).second)
            return;
        ++stats_.elements;
        const bool documented = rng_.percent(25);
        if (rng_.percent(6)) {
            ++stats_.inlineSimpleTypes;
            w.line(indent, "<xs:element" + attr("name", name) + occurs() + ">");
            if (documented)
                annotation(w, indent + 1, 6, 20);
            w.line(indent + 1, "<xs:simpleType>");
            restriction(w, "xs:string", {facet("maxLength", std::to_string(rng_.range(1, 80)))},
                        indent + 2);
            w.line(indent + 1, "</xs:simpleType>");
            w.line(indent, "</xs:element>");
            return;
        }
        const std::string type = simpleTypeRef();
        const std::string head = "<xs:element" + attr("name", name) + attr("type", type) + occurs();
        if (!documented) {
            w.line(indent, head + "/>");
            return;
        }
        w.line(indent, head + ">");
        annotation(w, indent + 1, 6, 20);
        w.line(indent, "</xs:element>");
    }

    void writeAttributes(Writer& w, int indent, const Context& ctx, Scope& scope, int minCount,
                         int maxCount) {
        for (int n = rng_.range(minCount, maxCount); n > 0; --n) {
            std::string name = rng_.pick(kAttrWords);
            if (ctx.extension)
                name += "X" + std::to_string(ctx.type);
            if (!scope.attributes.insert(name).second)
                continue;
            ++stats_.attributes;
            const std::string use = rng_.percent(25) ? attr("use", "required") : "";
            if (rng_.percent(8)) {
                ++stats_.inlineSimpleTypes;
                w.line(indent, "<xs:attribute" + attr("name", name) + use + ">");
                w.line(indent + 1, "<xs:simpleType>");
                std::vector<std::string> facets;
                for (int v = rng_.range(2, 6); v > 0; --v)
                    facets.push_back(facet("enumeration", "code" + std::to_string(v)));
                restriction(w, "xs:token", facets, indent + 2);
                w.line(indent + 1, "</xs:simpleType>");
                w.line(indent, "</xs:attribute>");
            } else {
                w.line(indent, "<xs:attribute" + attr("name", name) +
                                   attr("type", simpleTypeRef()) + use + "/>");
            }
        }
        // Attribute groups only on types that extend nothing: an extension would
        // repeat its base's attributes.
        if (ctx.depth == 1 && !ctx.extension && named_[ctx.type].kind != Kind::SimpleContent &&
            rng_.percent(20)) {
            ++stats_.attributeGroupRefs;
            w.line(indent, "<xs:attributeGroup" +
                               attr("ref", "tns:" + attributeGroupName(rng_.below(
                                                        static_cast<uint32_t>(attributeGroups_)))) +
                               "/>");
        }
    }

    static constexpr int kLevels = 5;

    long target_;
    std::string outDir_;
    int parts_;
    Rng rng_{kSeed};
    SetStats stats_;

    std::vector<NamedType> named_;
    std::vector<int32_t> complexByLevel_[kLevels];
    std::vector<int32_t> globalsByLevel_[kLevels];
    std::vector<int32_t> contentTypes_;
    std::vector<int32_t> contentGlobals_;
    std::vector<SimpleType> simple_;
    long simpleGlobals_ = 0;
    long groups_ = 0;
    long attributeGroups_ = 0;
    long nestedSerial_ = 0;
};

} // namespace

int partCount(long complexTypes) { return partsFor(complexTypes); }

GeneratedSet generateSchemaSet(long complexTypes, const std::string& outDir) {
    if (complexTypes < 1)
        throw std::runtime_error("the number of complex types must be at least 1");
    return Generator(complexTypes, outDir).run();
}

} // namespace zrgen
