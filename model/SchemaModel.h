// The schema component model: plain values filled while a schema is parsed and read
// when records are built. Components refer to each other only by (local name,
// namespace) pairs. The model knows nothing of how it was read or what is built
// from it.
#pragma once

#include "ZrName.h"

#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

// A description as fields carry it: UTF-8, white space collapsed. One text is shared
// by every copy of the declaration or type it documents and every field it describes.
using Description = std::shared_ptr<const std::string>;

// The descriptions of one read, kept together. Every description handed out shares
// the store's one count, so copying one into a field, or letting one go, touches that
// count and not a block of each text's own. The texts stay while any description of
// the read does.
class DescriptionStore {
  public:
    Description add(std::string_view text) {
        if (!texts_)
            texts_ = std::make_shared<std::deque<std::string>>();
        texts_->emplace_back(text);
        return Description(texts_, &texts_->back());
    }

    // Descriptions already handed out keep their texts.
    void clear() { texts_.reset(); }

  private:
    std::shared_ptr<std::deque<std::string>> texts_;
};

// One "element" or "attribute" declaration, a reference to a global element, or a
// reference to a group. Kind, in the order record building tests it: refName set
// (element reference), else groupName set (group reference), else a declaration.
class ElementDef {
  public:
    ZrName typeName;
    ZrName typeNs;
    ZrName name;
    ZrName nameNs;
    ZrName refName;
    ZrName refNs;
    ZrName groupName;
    ZrName groupNs;
    bool isAttribute = false;
    bool nullable = true;
    // An attribute declared with use="prohibited": it gives no field, and takes
    // the attribute of that name away from the base of a restriction.
    bool prohibited = false;
    // Whether "nullable" was written on this declaration: when occurrence is read,
    // the written flag still decides. A flag only inherited does not.
    bool nullableGiven = false;
    // Occurrence, read only when the model says so (SchemaModel::occurrenceRead):
    // the entry may be absent where it stands (its own minOccurs="0", or an optional
    // compositor or a choice of several branches around it in its definition), it is
    // nillable="true", or (an attribute) use="required".
    bool optional = false;
    bool nillable = false;
    bool required = false;
    // The first documentation of the entry's own annotation, white space collapsed;
    // read only when the model says so (SchemaModel::documentationRead).
    Description documentation;

    // Empties the strings and resets isAttribute and occurrence; nullable is kept, so
    // a nested declaration inherits the flag of the one around it.
    void clear();
};

// A component named by its (local name, namespace) pair.
struct TypeRef {
    ZrName name;
    ZrName ns;
};

// One simple type with its base and facets (facet values as written), or a union of
// member types.
class SimpleTypeDef {
  public:
    ZrName name;
    ZrName nameNs;
    ZrName baseName;
    ZrName baseNs;
    ZrName minInclusive;
    ZrName maxInclusive;
    ZrName minExclusive;
    ZrName maxExclusive;
    ZrName length;
    ZrName minLength;
    ZrName maxLength;
    ZrName pattern;
    ZrName precision;
    ZrName scale;
    ZrName encoding;
    ZrName period;
    ZrName duration;
    // Read only when the reader is asked for digits; "precision" and "scale" win.
    ZrName totalDigits;
    ZrName fractionDigits;
    // The first documentation of the definition's annotation, as for ElementDef.
    Description documentation;
    int32_t maxEnumLength = 0;
    // A union: its values are those of its member types, named or nested, in order.
    bool isUnion = false;
    std::vector<TypeRef> memberTypes;

    SimpleTypeDef() = default;
    SimpleTypeDef(const SimpleTypeDef&) = default;
    SimpleTypeDef(SimpleTypeDef&&) noexcept = default;
    SimpleTypeDef& operator=(const SimpleTypeDef&) = default;
    SimpleTypeDef& operator=(SimpleTypeDef&&) noexcept = default;
    virtual ~SimpleTypeDef() = default;

    // Empties every name, facet and member type and resets maxEnumLength.
    virtual void clear();
};

// One complex type, or one group or attribute-group definition (isGroup).
class ComplexTypeDef : public SimpleTypeDef {
  public:
    std::vector<ElementDef> content;
    bool isGroup = false;
    bool simpleContent = false;
    // Derived from its base by restriction: the content restates what it keeps of
    // the base, so only the base's attributes that it does not restate are drawn in.
    bool restriction = false;
    // The simple type a simple-content restriction gives its text, when it names one
    // of its own.
    TypeRef contentType;

    ComplexTypeDef() = default;
    ComplexTypeDef(const ComplexTypeDef&) = default;
    ComplexTypeDef(ComplexTypeDef&&) noexcept = default;
    ComplexTypeDef& operator=(const ComplexTypeDef&) = default;
    ComplexTypeDef& operator=(ComplexTypeDef&&) noexcept = default;
    ~ComplexTypeDef() override = default;

    void clear() override;
};

// True when a name sought begins with "anon": such names match whatever namespace
// the lookup asks for.
inline bool isAnonName(std::u16string_view name) {
    return name.size() >= 4 && name.substr(0, 4) == u"anon";
}

// Names the reader generates for anonymous types end in a NUL, which no name in an
// XML document can hold, so no name a schema gives can equal one; as C text, the
// way messages print it, the name reads "anonN".
inline bool isGeneratedName(std::u16string_view name) {
    return !name.empty() && name.back() == u'\0';
}

// The symbol space a component's name belongs to: types and groups may share names.
template <class T> int namedKind(const T&) { return 0; }

inline int namedKind(const ComplexTypeDef& type) { return type.isGroup ? 1 : 0; }

// An insertion-ordered list of named components with lookups that answer exactly
// what a first-match scan from the start over the components of one kind (see
// namedKind) would, in constant time. Entries are held
// in a deque, so references stay valid while entries are appended. The indexes hold
// positions only and compare against the entries themselves, so a lookup allocates
// nothing; an entry's name must not change while it is in the list.
template <class T> class NamedList {
  public:
    using iterator = typename std::deque<T>::iterator;
    using const_iterator = typename std::deque<T>::const_iterator;

    void push_back(const T& item) {
        items_.push_back(item);
        indexLast();
    }

    void push_back(T&& item) {
        items_.push_back(std::move(item));
        indexLast();
    }

    void clear() {
        items_.clear();
        byQName_.clear();
        byName_.clear();
    }

    size_t size() const { return items_.size(); }

    bool empty() const { return items_.empty(); }

    T& operator[](size_t i) { return items_[i]; }

    const T& operator[](size_t i) const { return items_[i]; }

    T& back() { return items_.back(); }

    const T& back() const { return items_.back(); }

    iterator begin() { return items_.begin(); }

    iterator end() { return items_.end(); }

    const_iterator begin() const { return items_.begin(); }

    const_iterator end() const { return items_.end(); }

    // First entry of `kind` whose name equals `name` and, unless `name` begins with
    // "anon", whose nameNs equals `ns`; null when none.
    T* find(std::u16string_view name, std::u16string_view ns, int kind = 0) {
        if (isAnonName(name)) {
            const size_t pos = byName_.find(nhash(name) ^ kindHash(kind), [&](size_t at) {
                return namedKind(items_[at]) == kind && zrSameText(items_[at].name.view(), name);
            });
            return pos == npos ? nullptr : &items_[pos];
        }
        return findExact(name, ns, kind);
    }

    const T* find(std::u16string_view name, std::u16string_view ns, int kind = 0) const {
        return const_cast<NamedList*>(this)->find(name, ns, kind);
    }

    // First entry of `kind` whose name and nameNs equal `name` and `ns`; null when none.
    T* findExact(std::u16string_view name, std::u16string_view ns, int kind = 0) {
        const size_t pos = byQName_.find(qhash(name, ns) ^ kindHash(kind), [&](size_t at) {
            return namedKind(items_[at]) == kind && zrSameText(items_[at].name.view(), name) &&
                   zrSameText(items_[at].nameNs.view(), ns);
        });
        return pos == npos ? nullptr : &items_[pos];
    }

    const T* findExact(std::u16string_view name, std::u16string_view ns, int kind = 0) const {
        return const_cast<NamedList*>(this)->findExact(name, ns, kind);
    }

  private:
    static constexpr size_t npos = static_cast<size_t>(-1);

    // Open addressing with linear probing over (hash, position) slots. Only the
    // first position of each key is held: later equal entries are never answers.
    class PositionIndex {
      public:
        template <class Eq> size_t find(size_t hash, Eq&& matches) const {
            if (slots_.empty())
                return npos;
            const size_t mask = slots_.size() - 1;
            for (size_t i = hash & mask;; i = (i + 1) & mask) {
                const Slot& slot = slots_[i];
                if (slot.pos == npos)
                    return npos;
                if (slot.hash == hash && matches(slot.pos))
                    return slot.pos;
            }
        }

        // Adds `pos` under `hash` unless an entry that matches is held already.
        template <class Eq> void insertFirst(size_t hash, size_t pos, Eq&& matches) {
            if ((count_ + 1) * 4 > slots_.size() * 3)
                grow();
            const size_t mask = slots_.size() - 1;
            for (size_t i = hash & mask;; i = (i + 1) & mask) {
                Slot& slot = slots_[i];
                if (slot.pos == npos) {
                    slot = Slot{hash, pos};
                    ++count_;
                    return;
                }
                if (slot.hash == hash && matches(slot.pos))
                    return;
            }
        }

        // Removes the slot holding exactly `pos`, if any; backward-shift deletion
        // keeps every remaining key reachable from its home slot.
        void erase(size_t hash, size_t pos) {
            if (slots_.empty())
                return;
            const size_t mask = slots_.size() - 1;
            size_t i = hash & mask;
            for (;; i = (i + 1) & mask) {
                if (slots_[i].pos == npos)
                    return;
                if (slots_[i].pos == pos)
                    break;
            }
            size_t hole = i;
            for (size_t j = (hole + 1) & mask; slots_[j].pos != npos; j = (j + 1) & mask) {
                const size_t home = slots_[j].hash & mask;
                // Moves j into the hole unless its home lies cyclically in (hole, j].
                const bool stays =
                    hole <= j ? (home > hole && home <= j) : (home > hole || home <= j);
                if (!stays) {
                    slots_[hole] = slots_[j];
                    hole = j;
                }
            }
            slots_[hole].pos = npos;
            --count_;
        }

        void clear() {
            slots_.clear();
            count_ = 0;
        }

      private:
        struct Slot {
            size_t hash = 0;
            size_t pos = npos;

            bool free() const { return pos == npos; }
        };

        void grow() { zrRehashSlots(slots_, slots_.empty() ? 16 : slots_.size() * 2); }

        std::vector<Slot> slots_;
        size_t count_ = 0;
    };

    static size_t nhash(std::u16string_view name) { return size_t(zrTextHash(name)); }

    static size_t kindHash(int kind) { return size_t(kind) * 0x9e3779b97f4a7c15ull; }

    static size_t qhash(std::u16string_view name, std::u16string_view ns) {
        const size_t h = nhash(name);
        return h ^ (nhash(ns) + 0x9e3779b97f4a7c15ull + (h << 6) + (h >> 2));
    }

    void indexLast() {
        const size_t last = items_.size() - 1;
        const T& item = items_.back();
        const std::u16string_view name = item.name.view();
        const std::u16string_view ns = item.nameNs.view();
        const int kind = namedKind(item);
        byQName_.insertFirst(qhash(name, ns) ^ kindHash(kind), last, [&](size_t at) {
            return namedKind(items_[at]) == kind && items_[at].name.view() == name &&
                   items_[at].nameNs.view() == ns;
        });
        if (isAnonName(name))
            byName_.insertFirst(nhash(name) ^ kindHash(kind), last, [&](size_t at) {
                return namedKind(items_[at]) == kind && items_[at].name.view() == name;
            });
    }

    std::deque<T> items_;
    PositionIndex byQName_; // (name, namespace) -> first position
    PositionIndex byName_;  // names beginning with "anon" -> first position
};

// Stands for the target namespace in names written back as text, even when the
// schema binds no prefix to it.
inline constexpr std::u16string_view kTargetPrefix = u"zrxxxtrg";

// The namespace that the prefix "xml" is bound to in every document.
inline constexpr std::u16string_view kXmlNamespace = u"http://www.w3.org/XML/1998/namespace";

// The namespace declarations in force: the default and target namespaces and the
// prefixes bound to namespaces. Documents add to them as they are read.
struct NamespaceBindings {
    std::u16string defaultNamespace;
    std::u16string targetNamespace;
    std::map<std::u16string, std::u16string, std::less<>> prefixes;
    // Prefixes that imported documents bind, by namespace, the first one met for
    // each: names of a namespace the schema binds no prefix to are written with one.
    std::map<std::u16string, std::u16string, std::less<>> importedPrefixes;

    void clear() {
        defaultNamespace.clear();
        targetNamespace.clear();
        prefixes.clear();
        importedPrefixes.clear();
    }
};

// How a namespace is written in front of a name: for each namespace, the prefix a
// name of it carries. Built once over bindings that no longer change, so that a
// schema binding thousands of prefixes costs no scan per name written.
class PrefixWriter {
  public:
    explicit PrefixWriter(const NamespaceBindings& bindings);

    // The prefix of names in `uri`: kTargetPrefix for the target namespace when
    // `useTargetPrefix`, none for the default or target namespace, else the first
    // prefix in table order bound to it, else one an imported document binds to it,
    // "xml" for the XML namespace, none otherwise.
    std::u16string_view prefixOf(std::u16string_view uri, bool useTargetPrefix) const;

  private:
    const NamespaceBindings& bindings_;
    std::unordered_map<std::u16string_view, std::u16string_view> prefixOfUri_;
};

// Everything one read learns from a schema and the documents it includes.
struct SchemaModel {
    NamedList<ElementDef> globalElements;
    NamedList<ComplexTypeDef> complexTypes;
    NamedList<SimpleTypeDef> simpleTypes;
    // The namespace declarations of the main schema (the main document and the
    // documents it includes); imported documents have their own.
    NamespaceBindings namespaces;
    // The top-level declarations of the main schema come first; those after them come
    // from imported documents, which add components but no records of their own.
    size_t mainElementCount = 0;

    // Imported documents that could not be read: not an error until something is
    // sought in their namespace.
    struct ImportFailure {
        std::u16string ns;
        std::u16string location;
        std::u16string reason;
    };

    std::vector<ImportFailure> failedImports;
    // Generated names ("anonN") handed out so far.
    int32_t anonCount = 0;
    // Whether the entries' occurrence and the documentation of declarations and
    // types were read; without them the entries hold their defaults.
    bool occurrenceRead = false;
    bool documentationRead = false;
    // One shared copy of each name, namespace and facet value the model holds.
    ZrNamePool names;
    DescriptionStore descriptions;

    void clear();

    // Complex types and groups have names of their own: a type and a group may share one.
    const ComplexTypeDef* findComplexType(std::u16string_view localName,
                                          std::u16string_view namespaceURI) const {
        return complexTypes.find(localName, namespaceURI, 0);
    }

    const ComplexTypeDef* findGroup(std::u16string_view localName,
                                    std::u16string_view namespaceURI) const {
        return complexTypes.find(localName, namespaceURI, 1);
    }
};
