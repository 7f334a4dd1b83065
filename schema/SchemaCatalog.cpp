#include "SchemaCatalog.h"

#include "FPInput.h"
#include "ParserConfig.h"
#include "zrfile.h"
#include "zrglob.h"

#include <deque>
#include <memory>
#include <new>
#include <string>
#include <xercesc/framework/MemBufInputSource.hpp>
#include <xercesc/sax/AttributeList.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/sax/SAXException.hpp>
#include <xercesc/sax/SAXParseException.hpp>
#include <xercesc/util/OutOfMemoryException.hpp>
#include <xercesc/util/XMLException.hpp>

static_assert(std::is_same_v<XMLCh, char16_t>, "the host's wide text must be the parser's XMLCh");

namespace catalog_uri {

namespace {

bool isAsciiLetter(char16_t c) { return (c >= u'A' && c <= u'Z') || (c >= u'a' && c <= u'z'); }

int hexValue(char c) {
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    return -1;
}

// Length of the scheme, colon excluded; 0 when there is none.
size_t schemeLength(std::u16string_view text) {
    if (text.empty() || !isAsciiLetter(text[0]))
        return 0;
    size_t i = 1;
    while (i < text.size() && (isAsciiLetter(text[i]) || (text[i] >= u'0' && text[i] <= u'9') ||
                               text[i] == u'+' || text[i] == u'-' || text[i] == u'.'))
        ++i;
    return i >= 2 && i < text.size() && text[i] == u':' ? i : 0;
}

// Percent escapes decoded, as UTF-8 bytes, into UTF-16.
std::u16string percentDecoded(std::u16string_view text) {
    const std::string bytes = zrUtf16ToUtf8(text);
    std::string out;
    out.reserve(bytes.size());
    for (size_t i = 0; i < bytes.size(); ++i) {
        if (bytes[i] == '%' && i + 2 < bytes.size() && hexValue(bytes[i + 1]) >= 0 &&
            hexValue(bytes[i + 2]) >= 0) {
            out += static_cast<char>(hexValue(bytes[i + 1]) * 16 + hexValue(bytes[i + 2]));
            i += 2;
        } else {
            out += bytes[i];
        }
    }
    return zrUtf8ToUtf16(out);
}

} // namespace

std::u16string withoutDotSegments(std::u16string_view path) {
    const bool rooted = !path.empty() && path[0] == u'/';
    if (rooted)
        path.remove_prefix(1);
    std::vector<std::u16string_view> segments;
    bool trailing = false;
    size_t pos = 0;
    while (true) {
        const size_t slash = path.find(u'/', pos);
        const bool last = slash == std::u16string_view::npos;
        const std::u16string_view segment =
            path.substr(pos, last ? path.size() - pos : slash - pos);
        trailing = false;
        if (segment == u".") {
            trailing = true;
        } else if (segment == u"..") {
            if (!segments.empty() && segments.back() != u"..")
                segments.pop_back();
            else if (!rooted)
                segments.push_back(segment);
            trailing = true;
        } else if (!last || !segment.empty()) {
            segments.push_back(segment);
        } else {
            trailing = !segments.empty();
        }
        if (last)
            break;
        pos = slash + 1;
    }
    std::u16string out = rooted ? u"/" : u"";
    for (size_t i = 0; i < segments.size(); ++i) {
        if (i > 0)
            out += u'/';
        out.append(segments[i]);
    }
    if (trailing && !segments.empty())
        out += u'/';
    return out;
}

std::u16string pathAsUri(std::u16string_view path) {
    std::u16string text;
    for (char16_t c : path) {
        if (c == u'\\')
            text += u'/';
        else if (c == u'%')
            text += u"%25";
        else
            text += c;
    }
    return normalise(text);
}

std::u16string resolved(std::u16string_view base, std::u16string_view reference) {
    if (hasScheme(reference))
        return std::u16string(reference);
    const size_t scheme = schemeLength(base);
    const std::u16string_view schemePart = base.substr(0, scheme ? scheme + 1 : 0);
    std::u16string_view rest = base.substr(schemePart.size());
    std::u16string_view authority;
    if (rest.substr(0, 2) == u"//") {
        const size_t slash = rest.find(u'/', 2);
        authority = rest.substr(0, slash == std::u16string_view::npos ? rest.size() : slash);
        rest.remove_prefix(authority.size());
    }
    std::u16string out(schemePart);
    if (reference.substr(0, 2) == u"//")
        return out + std::u16string(reference);
    out.append(authority);
    if (!reference.empty() && reference[0] == u'/')
        return out + withoutDotSegments(reference);
    const size_t lastSlash = rest.rfind(u'/');
    std::u16string merged(lastSlash == std::u16string_view::npos ? std::u16string_view()
                                                                 : rest.substr(0, lastSlash + 1));
    if (merged.empty() && !authority.empty())
        merged = u"/";
    merged.append(reference);
    return out + withoutDotSegments(merged);
}

bool hasScheme(std::u16string_view text) { return schemeLength(text) != 0; }

std::u16string normalise(std::u16string_view text) {
    static const char kHex[] = "0123456789ABCDEF";
    const std::string bytes = zrUtf16ToUtf8(text);
    std::u16string out;
    out.reserve(bytes.size());
    for (size_t i = 0; i < bytes.size(); ++i) {
        const auto byte = static_cast<unsigned char>(bytes[i]);
        if (byte == '%' && i + 2 < bytes.size() && hexValue(bytes[i + 1]) >= 0 &&
            hexValue(bytes[i + 2]) >= 0) {
            out += u'%';
            out += static_cast<char16_t>(kHex[hexValue(bytes[i + 1])]);
            out += static_cast<char16_t>(kHex[hexValue(bytes[i + 2])]);
            i += 2;
        } else if (byte <= 0x20 || byte >= 0x7F ||
                   std::string_view("\"<>\\^`{|}").find(static_cast<char>(byte)) !=
                       std::string_view::npos) {
            out += u'%';
            out += static_cast<char16_t>(kHex[byte >> 4]);
            out += static_cast<char16_t>(kHex[byte & 15]);
        } else {
            out += static_cast<char16_t>(byte);
        }
    }
    return out;
}

std::optional<std::u16string> localPath(std::u16string_view uri) {
    const size_t scheme = schemeLength(uri);
    if (scheme == 0)
        return percentDecoded(uri);
    const std::u16string_view name = uri.substr(0, scheme);
    if (name.size() != 4 || (name[0] | 0x20) != u'f' || (name[1] | 0x20) != u'i' ||
        (name[2] | 0x20) != u'l' || (name[3] | 0x20) != u'e')
        return std::nullopt;
    std::u16string_view rest = uri.substr(scheme + 1);
    if (rest.substr(0, 2) == u"//") {
        rest.remove_prefix(2);
        const size_t slash = rest.find(u'/');
        const std::u16string_view host = rest.substr(0, slash);
        if (!host.empty() && host != u"localhost") {
            // A file on another machine, as a network path.
            return u"//" + percentDecoded(rest);
        }
        rest = slash == std::u16string_view::npos ? std::u16string_view() : rest.substr(slash);
    }
    // "/C:/dir" is a drive path written as a URI path.
    if (rest.size() >= 3 && rest[0] == u'/' && isAsciiLetter(rest[1]) && rest[2] == u':')
        rest.remove_prefix(1);
    return percentDecoded(rest);
}

} // namespace catalog_uri

namespace {

using catalog_uri::normalise;

constexpr std::u16string_view kCatalogNamespace = u"urn:oasis:names:tc:entity:xmlns:xml:catalog";

std::u16string_view text(const XMLCh* value) {
    return value ? std::u16string_view(value) : std::u16string_view();
}

// The parser's message from just after its "Message:" label, when it has one.
std::u16string parserMessage(const XMLCh* message) {
    std::u16string_view whole = text(message);
    const size_t at = whole.find(u"Message:");
    if (at != std::u16string_view::npos)
        whole.remove_prefix(at + 8);
    return std::u16string(whole);
}

// Reads one catalog file into a File; the first problem is kept and fails it.
class CatalogFileReader : public xercesc::HandlerBase {
  public:
    CatalogFileReader(SchemaCatalog::File& file, std::u16string base,
                      std::vector<std::u16string>& nextCatalogs)
        : file_(file), nextCatalogs_(nextCatalogs) {
        frames_.push_back({0, std::move(base), false});
    }

    bool failed() const { return !problem_.empty(); }

    const std::u16string& problem() const { return problem_; }

    void fail(std::u16string reason) {
        if (problem_.empty())
            problem_ = std::move(reason);
    }

    void startElement(const XMLCh* name, xercesc::AttributeList& attrs) override {
        const size_t bindingsBefore = bindings_.size();
        for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
            const std::u16string_view attr = text(attrs.getName(i));
            if (attr == u"xmlns")
                bindings_.emplace_back(u"", text(attrs.getValue(i)));
            else if (attr.substr(0, 6) == u"xmlns:")
                bindings_.emplace_back(attr.substr(6), text(attrs.getValue(i)));
        }
        const Frame& parent = frames_.back();
        Frame frame{bindingsBefore, parent.base, parent.skip};
        const std::u16string_view qname = text(name);
        const size_t colon = qname.find(u':');
        const std::u16string_view prefix =
            colon == std::u16string_view::npos ? std::u16string_view() : qname.substr(0, colon);
        const std::u16string_view local =
            colon == std::u16string_view::npos ? qname : qname.substr(colon + 1);
        const bool inCatalogNamespace = namespaceOf(prefix) == kCatalogNamespace;
        if (frames_.size() == 1 && (!inCatalogNamespace || local != u"catalog"))
            fail(u"it is not an XML catalog (its root is not 'catalog' in namespace " +
                 std::u16string(kCatalogNamespace) + u")");
        // Elements of other namespaces, and all they hold, are not the catalog's.
        if (!inCatalogNamespace)
            frame.skip = true;
        if (!frame.skip) {
            if (const XMLCh* base = attrs.getValue(u"xml:base"))
                frame.base = resolvedAgainst(frame.base, text(base));
            readEntry(local, attrs, frame.base);
        }
        frames_.push_back(std::move(frame));
    }

    void endElement(const XMLCh* /*name*/) override {
        if (frames_.size() <= 1)
            return;
        bindings_.resize(frames_.back().bindingsBefore);
        frames_.pop_back();
    }

    void error(const xercesc::SAXParseException& e) override { failAt(e); }

    void fatalError(const xercesc::SAXParseException& e) override { failAt(e); }

    // A catalog is read alone: an external entity or DTD it names is never opened.
    xercesc::InputSource* resolveEntity(const XMLCh* publicId, const XMLCh* systemId) override {
        const std::u16string_view name = systemId && *systemId ? text(systemId) : text(publicId);
        fail(u"external entity '" + std::u16string(name) + u"' is not read");
        static const XMLByte kNothing[] = {0};
        return new xercesc::MemBufInputSource(kNothing, 0, systemId ? systemId : u"", false);
    }

  private:
    struct Frame {
        size_t bindingsBefore;
        std::u16string base;
        bool skip;
    };

    std::u16string_view namespaceOf(std::u16string_view prefix) const {
        for (auto it = bindings_.rbegin(); it != bindings_.rend(); ++it) {
            if (it->first == prefix)
                return it->second;
        }
        return {};
    }

    static std::u16string resolvedAgainst(const std::u16string& base, std::u16string_view ref) {
        return catalog_uri::resolved(base, normalise(ref));
    }

    void failAt(const xercesc::SAXParseException& e) {
        fail(u"line " + zrUtf8ToUtf16(std::to_string(e.getLineNumber())) + u", column " +
             zrUtf8ToUtf16(std::to_string(e.getColumnNumber())) + u": " +
             parserMessage(e.getMessage()));
    }

    // The value of attribute `name`, or a problem when the entry lacks it.
    const XMLCh* required(std::u16string_view element, xercesc::AttributeList& attrs,
                          const char16_t* name) {
        const XMLCh* value = attrs.getValue(name);
        if (!value)
            fail(u"'" + std::u16string(element) + u"' lacks its attribute '" +
                 std::u16string(name) + u"'");
        return value;
    }

    void readEntry(std::u16string_view local, xercesc::AttributeList& attrs,
                   const std::u16string& base) {
        struct EntryKind {
            std::u16string_view element;
            SchemaCatalog::Kind kind;

            enum { kExact, kRewrite, kSuffix } form;

            const char16_t* key;
            const char16_t* target;
        };

        static const EntryKind kEntries[] = {
            {u"uri", SchemaCatalog::kUri, EntryKind::kExact, u"name", u"uri"},
            {u"system", SchemaCatalog::kSystem, EntryKind::kExact, u"systemId", u"uri"},
            {u"rewriteURI", SchemaCatalog::kUri, EntryKind::kRewrite, u"uriStartString",
             u"rewritePrefix"},
            {u"rewriteSystem", SchemaCatalog::kSystem, EntryKind::kRewrite, u"systemIdStartString",
             u"rewritePrefix"},
            {u"uriSuffix", SchemaCatalog::kUri, EntryKind::kSuffix, u"uriSuffix", u"uri"},
            {u"systemSuffix", SchemaCatalog::kSystem, EntryKind::kSuffix, u"systemIdSuffix",
             u"uri"},
        };

        if (local == u"nextCatalog") {
            if (const XMLCh* next = required(local, attrs, u"catalog"))
                nextCatalogs_.push_back(resolvedAgainst(base, text(next)));
            return;
        }
        for (const EntryKind& entry : kEntries) {
            if (entry.element != local)
                continue;
            const XMLCh* key = required(local, attrs, entry.key);
            const XMLCh* target = required(local, attrs, entry.target);
            if (!key || !target)
                return;
            SchemaCatalog::Entries& entries = file_.entries[entry.kind];
            std::u16string match = normalise(text(key));
            std::u16string resolvedTarget = resolvedAgainst(base, text(target));
            if (entry.form == EntryKind::kExact)
                entries.exact.emplace(std::move(match), std::move(resolvedTarget));
            else if (entry.form == EntryKind::kRewrite)
                entries.rewrites.push_back({std::move(match), std::move(resolvedTarget)});
            else
                entries.suffixes.push_back({std::move(match), std::move(resolvedTarget)});
            return;
        }
        // "group" and "catalog" only set a base; public identifiers, delegation and
        // the rest concern no schema location.
    }

    SchemaCatalog::File& file_;
    std::vector<std::u16string>& nextCatalogs_;
    std::vector<Frame> frames_;
    std::vector<std::pair<std::u16string, std::u16string>> bindings_;
    std::u16string problem_;
};

void logCatalogProblem(const std::u16string& path, const std::u16string& reason) {
    ZrGlob::LogMessage(ZR_SEV_ERROR, 4, lgettext(u"Schema: Error: Catalog file %s is not read: %s"),
                       path.c_str(), reason.c_str());
}

// Reads the catalog file `file.path` into `file`, and the catalogs it names with
// nextCatalog, made absolute, into `nextCatalogs`. False when it failed; the cause
// has been logged.
bool readCatalogFile(SchemaCatalog::File& file, std::vector<std::u16string>& nextCatalogs) {
    ZrString narrowPath;
    narrowPath.Assign(file.path.c_str(), ZR_CSET_DEFAULT, -1);
    {
        ZrFileProxy probe;
        if (probe.openfile(narrowPath.c_str(), "rb", ZR_CSET_FILESYSTEM) == -1) {
            logCatalogProblem(file.path, u"it cannot be opened");
            return false;
        }
    }
    CatalogFileReader reader(file, catalog_uri::pathAsUri(file.path), nextCatalogs);
    SchemaParser parser;
    parser.setDocumentHandler(&reader);
    parser.setErrorHandler(&reader);
    parser.setEntityResolver(&reader);
    try {
        FPInputSource source(file.path.c_str());
        parser.parse(source);
        if (source.readFailed())
            reader.fail(u"reading it failed");
    } catch (const SchemaEntityTooLong& e) {
        reader.fail(u"entity '" + e.name + u"' is too long");
    } catch (const xercesc::OutOfMemoryException&) {
        throw std::bad_alloc();
    } catch (const xercesc::XMLException& e) {
        reader.fail(std::u16string(text(e.getMessage())));
    } catch (const xercesc::SAXException& e) {
        reader.fail(std::u16string(text(e.getMessage())));
    }
    if (reader.failed()) {
        logCatalogProblem(file.path, reader.problem());
        return false;
    }
    return true;
}

// Lexical form of a catalog file's path that recognises a file named twice.
std::u16string fileKey(std::u16string_view path) {
    std::u16string slashes(path);
    for (char16_t& c : slashes) {
        if (c == u'\\')
            c = u'/';
    }
    return catalog_uri::withoutDotSegments(slashes);
}

std::u16string_view trimmed(std::u16string_view text) {
    auto blank = [](char16_t c) { return c == u' ' || c == u'\t' || c == u'\r' || c == u'\n'; };
    while (!text.empty() && blank(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && blank(text.back()))
        text.remove_suffix(1);
    return text;
}

// The target of the first exact entry, else of the longest matching prefix, else of
// the longest matching suffix (the first written wins a tie).
std::optional<std::u16string> matchIn(const SchemaCatalog::Entries& entries,
                                      const std::u16string& key) {
    const auto exact = entries.exact.find(key);
    if (exact != entries.exact.end())
        return exact->second;
    const SchemaCatalog::Rule* best = nullptr;
    for (const SchemaCatalog::Rule& rule : entries.rewrites) {
        if (key.compare(0, rule.match.size(), rule.match) == 0 &&
            (!best || rule.match.size() > best->match.size()))
            best = &rule;
    }
    if (best)
        return best->target + key.substr(best->match.size());
    for (const SchemaCatalog::Rule& rule : entries.suffixes) {
        if (key.size() >= rule.match.size() &&
            key.compare(key.size() - rule.match.size(), rule.match.size(), rule.match) == 0 &&
            (!best || rule.match.size() > best->match.size()))
            best = &rule;
    }
    if (best)
        return best->target;
    return std::nullopt;
}

} // namespace

bool SchemaCatalog::load(std::u16string_view list) {
    files_.clear();
    roots_.clear();
    std::unordered_map<std::u16string, size_t> known;
    std::deque<size_t> pending;
    auto add = [&](std::u16string path) {
        const auto [it, fresh] = known.emplace(fileKey(path), files_.size());
        if (fresh) {
            files_.emplace_back();
            files_.back().path = std::move(path);
            pending.push_back(it->second);
        }
        return it->second;
    };

    size_t pos = 0;
    while (pos <= list.size()) {
        const size_t semicolon = std::min(list.find(u';', pos), list.size());
        const std::u16string_view name = trimmed(list.substr(pos, semicolon - pos));
        if (!name.empty())
            roots_.push_back(add(std::u16string(name)));
        pos = semicolon + 1;
    }

    // Every file is read before any lookup, in the order they are first named;
    // each once, so chains that loop end.
    while (!pending.empty()) {
        const size_t index = pending.front();
        pending.pop_front();
        File file;
        file.path = files_[index].path;
        std::vector<std::u16string> nextCatalogs;
        if (!readCatalogFile(file, nextCatalogs)) {
            files_.clear();
            roots_.clear();
            return false;
        }
        for (const std::u16string& next : nextCatalogs) {
            std::optional<std::u16string> path = catalog_uri::localPath(next);
            if (!path) {
                logCatalogProblem(file.path,
                                  u"its next catalog '" + next + u"' is not a local file");
                files_.clear();
                roots_.clear();
                return false;
            }
            file.next.push_back(add(std::move(*path)));
        }
        files_[index] = std::move(file);
    }
    return true;
}

std::optional<std::u16string> SchemaCatalog::resolve(Kind kind,
                                                     std::u16string_view identifier) const {
    if (files_.empty())
        return std::nullopt;
    const std::u16string key = normalise(identifier);
    // Each file's own entries before the catalogs it chains to, depth first, and
    // every file once: chains are as deep as the catalogs make them.
    std::vector<char> visited(files_.size(), 0);
    std::vector<size_t> stack;
    for (const size_t root : roots_) {
        stack.push_back(root);
        while (!stack.empty()) {
            const size_t index = stack.back();
            stack.pop_back();
            if (visited[index])
                continue;
            visited[index] = 1;
            const File& file = files_[index];
            if (std::optional<std::u16string> target = matchIn(file.entries[kind], key)) {
                if (std::optional<std::u16string> path = catalog_uri::localPath(*target))
                    return path;
                return target;
            }
            for (auto it = file.next.rbegin(); it != file.next.rend(); ++it)
                stack.push_back(*it);
        }
    }
    return std::nullopt;
}

std::optional<std::u16string> SchemaCatalog::mapLocation(std::u16string_view location) const {
    if (std::optional<std::u16string> target = resolve(kUri, location))
        return target;
    return resolve(kSystem, location);
}

std::optional<std::u16string> SchemaCatalog::mapNamespace(std::u16string_view ns) const {
    return resolve(kUri, ns);
}
