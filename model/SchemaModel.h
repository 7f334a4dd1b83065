// The schema component model: plain values filled while a schema is parsed and read
// when records are built. Components refer to each other only by (local name,
// namespace) pairs.
#pragma once

#include "zrdtype.h"
#include "zrstring.h"

#include <cstdint>
#include <deque>
#include <string_view>
#include <unordered_map>
#include <vector>

// One "element" or "attribute" declaration, a reference to a global element, or a
// reference to a group. Kind, in the order record building tests it: refName set
// (element reference), else groupName set (group reference), else a declaration.
class ElementDef {
public:
    ZrWString typeName;
    ZrWString typeNs;
    ZrWString name;
    ZrWString nameNs;
    ZrWString refName;
    ZrWString refNs;
    ZrWString groupName;
    ZrWString groupNs;
    bool isAttribute = false;
    bool nullable = true;

    // Empties the strings and resets isAttribute; nullable is kept, so a nested
    // declaration inherits the flag of the one around it.
    void clear();
};

// One simple type with its base and facets (facet values as written).
class SimpleTypeDef {
public:
    bool resolved = false;
    ZrDType dataType;
    ZrWString name;
    ZrWString nameNs;
    ZrWString baseName;
    ZrWString baseNs;
    ZrWString minInclusive;
    ZrWString maxInclusive;
    ZrWString minExclusive;
    ZrWString maxExclusive;
    ZrWString length;
    ZrWString minLength;
    ZrWString maxLength;
    ZrWString pattern;
    ZrWString precision;
    ZrWString scale;
    ZrWString encoding;
    ZrWString period;
    ZrWString duration;
    ZrWString facetAttrName;
    ZrWString facetAttrValue;
    int32_t maxEnumLength = 0;

    SimpleTypeDef() = default;
    SimpleTypeDef(const SimpleTypeDef&) = default;
    SimpleTypeDef(SimpleTypeDef&&) noexcept = default;
    SimpleTypeDef& operator=(const SimpleTypeDef&) = default;
    SimpleTypeDef& operator=(SimpleTypeDef&&) noexcept = default;
    virtual ~SimpleTypeDef() = default;

    // Empties name to duration and resets resolved and maxEnumLength; dataType and
    // the two facet scratch strings are left as they are.
    virtual void clear();
};

// One complex type, or one group or attribute-group definition (isGroup).
class ComplexTypeDef : public SimpleTypeDef {
public:
    std::vector<ElementDef> content;
    bool isGroup = false;
    bool simpleContent = false;

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

// An insertion-ordered list of named components with lookups that answer exactly
// what a first-match scan from the start would, in constant time. Entries are held
// in a deque, so references stay valid while entries are appended.
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
    // Removes the last entry and its index entries.
    void pop_back() {
        const size_t last = items_.size() - 1;
        unindex(byQName_, qkey(items_.back().name.view(), items_.back().nameNs.view()), last);
        if (isAnonName(items_.back().name.view()))
            unindex(byName_, std::u16string(items_.back().name.view()), last);
        items_.pop_back();
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
    iterator begin() { return items_.begin(); }
    iterator end() { return items_.end(); }
    const_iterator begin() const { return items_.begin(); }
    const_iterator end() const { return items_.end(); }

    // First entry whose name equals `name` and, unless `name` begins with "anon",
    // whose nameNs equals `ns`; null when none.
    T* find(std::u16string_view name, std::u16string_view ns) {
        if (isAnonName(name))
            return at(byName_, std::u16string(name));
        return findExact(name, ns);
    }
    // First entry whose name and nameNs equal `name` and `ns`; null when none.
    T* findExact(std::u16string_view name, std::u16string_view ns) {
        return at(byQName_, qkey(name, ns));
    }

private:
    using Index = std::unordered_map<std::u16string, size_t>;

    static std::u16string qkey(std::u16string_view name, std::u16string_view ns) {
        std::u16string key;
        key.reserve(name.size() + ns.size() + 1);
        key.append(ns).push_back(u'\0');
        key.append(name);
        return key;
    }
    T* at(const Index& index, const std::u16string& key) {
        auto it = index.find(key);
        return it == index.end() ? nullptr : &items_[it->second];
    }
    static void unindex(Index& index, const std::u16string& key, size_t pos) {
        auto it = index.find(key);
        if (it != index.end() && it->second == pos)
            index.erase(it);
    }
    void indexLast() {
        const size_t last = items_.size() - 1;
        const T& item = items_.back();
        byQName_.emplace(qkey(item.name.view(), item.nameNs.view()), last);
        if (isAnonName(item.name.view()))
            byName_.emplace(std::u16string(item.name.view()), last);
    }

    std::deque<T> items_;
    Index byQName_; // (namespace, name) -> first position
    Index byName_;  // names beginning with "anon" -> first position
};
