#include "zrdtype.h"

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <mutex>
#include <string_view>
#include <unordered_map>

namespace {

std::string_view trimBlanks(std::string_view s) {
    while (!s.empty() && (s.front() == ' ' || s.front() == '\t'))
        s.remove_prefix(1);
    while (!s.empty() && (s.back() == ' ' || s.back() == '\t'))
        s.remove_suffix(1);
    return s;
}

std::shared_ptr<const ZrDType::Definition> parseDefinition(std::string_view text) {
    auto def = std::make_shared<ZrDType::Definition>();
    def->text.assign(text);
    // Items are split at every ';' outside single quotes: a quoted value may hold
    // blanks and dots and should not be cut by a stray separator either.
    size_t start = 0;
    bool quoted = false;
    bool first = true;
    for (size_t i = 0; i <= text.size(); ++i) {
        if (i < text.size()) {
            if (text[i] == '\'')
                quoted = !quoted;
            if (quoted || text[i] != ';')
                continue;
        }
        const std::string_view item = trimBlanks(text.substr(start, i - start));
        start = i + 1;
        if (first) {
            def->typeClass.assign(item);
            first = false;
            continue;
        }
        if (item.empty())
            continue;
        const size_t eq = item.find('=');
        if (eq == std::string_view::npos) {
            def->items.emplace_back(std::string(item), std::string());
            def->bare.push_back(true);
            continue;
        }
        std::string_view value = trimBlanks(item.substr(eq + 1));
        if (value.size() >= 2 && value.front() == '\'' && value.back() == '\'')
            value = value.substr(1, value.size() - 2);
        def->items.emplace_back(std::string(trimBlanks(item.substr(0, eq))), std::string(value));
        def->bare.push_back(false);
    }
    return def;
}

// Definitions come from a handful of static tables and each read defines the same
// ~96 strings again, so parsed definitions are shared by text. The cap keeps a host
// that defines many distinct strings from growing the cache without end.
std::shared_ptr<const ZrDType::Definition> sharedDefinition(const char* text) {
    constexpr size_t kCacheCap = 1024;
    static std::mutex mutex;
    static std::unordered_map<std::string, std::shared_ptr<const ZrDType::Definition>> cache;

    std::lock_guard<std::mutex> lock(mutex);
    auto it = cache.find(text);
    if (it != cache.end())
        return it->second;
    auto def = parseDefinition(text);
    if (cache.size() < kCacheCap)
        cache.emplace(def->text, def);
    return def;
}

long itemNumber(const ZrDType::Definition& def, const char* key) {
    for (const auto& item : def.items) {
        if (item.first != key)
            continue;
        errno = 0;
        const long value = std::strtol(item.second.c_str(), nullptr, 10);
        return errno == ERANGE ? 0 : value;
    }
    return 0;
}

short toShort(long value) {
    if (value < SHRT_MIN || value > SHRT_MAX)
        return 0;
    return static_cast<short>(value);
}

} // namespace

ZrDType::ZrDType() = default;

bool ZrDType::Define(const char* definition) {
    if (!definition || !*definition)
        return false;
    def_ = sharedDefinition(definition);
    alias_.clear();
    if (const char* alias = Item("alias"))
        alias_ = alias;
    usage_ = toShort(itemNumber(*def_, "usage"));
    length_ = itemNumber(*def_, "length");
    precision_ = itemNumber(*def_, "precision");
    decimals_ = toShort(itemNumber(*def_, "decimal"));
    nulls_ = false;
    return true;
}

const char* ZrDType::TypeClass() const { return def_ ? def_->typeClass.c_str() : ""; }

const char* ZrDType::DefinitionText() const { return def_ ? def_->text.c_str() : ""; }

const char* ZrDType::Item(const char* key) const {
    if (!def_ || !key)
        return nullptr;
    for (const auto& item : def_->items)
        if (item.first == key)
            return item.second.c_str();
    return nullptr;
}
