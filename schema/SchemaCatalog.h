// OASIS XML catalogs: where the documents that schemas name by location or by
// namespace are kept on the local disk.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

class SchemaCatalog {
  public:
    // Reads the catalog files of `list`, separated by ";" (blanks around a name are
    // ignored, empty entries skipped), and every catalog they chain to with
    // nextCatalog, each file once. Relative names are taken from the working
    // directory (the files of the list) or from the naming catalog's base
    // (nextCatalog). False when one of them is missing, unreadable, not well-formed
    // or not a catalog; the cause has been logged, naming the file. Replaces what
    // an earlier load read.
    bool load(std::u16string_view list);

    bool empty() const { return files_.empty(); }

    // The document to read for a location as a schema wrote it: looked up through
    // the uri-kind entries (uri, rewriteURI, uriSuffix), then the system-kind ones
    // (system, rewriteSystem, systemSuffix). A local path, or a URI with a
    // protocol when that is what the catalog maps to; nothing when no entry
    // matches.
    std::optional<std::u16string> mapLocation(std::u16string_view location) const;

    // The document to read for an import of namespace `ns`, through the uri-kind
    // entries only.
    std::optional<std::u16string> mapNamespace(std::u16string_view ns) const;

    // The two sets of entries a catalog keeps; public for the loader.
    enum Kind : std::size_t { kUri = 0, kSystem = 1 };

    // What a catalog file holds, its targets already made absolute against the base
    // in effect where they were written (URI references, percent-encoded).
    struct Rule {
        std::u16string match; // prefix or suffix, normalised
        std::u16string target;
    };

    struct Entries {
        // Exact entries by normalised identifier; the first written wins.
        std::unordered_map<std::u16string, std::u16string> exact;
        std::vector<Rule> rewrites;
        std::vector<Rule> suffixes;
    };

    struct File {
        std::u16string path;
        Entries entries[2];
        // Indexes into files_ of the catalogs named by nextCatalog, in their order.
        std::vector<std::size_t> next;
    };

  private:
    std::optional<std::u16string> resolve(Kind kind, std::u16string_view identifier) const;

    std::vector<File> files_;
    // The files of the list, in its order.
    std::vector<std::size_t> roots_;
};

// URI helpers shared by the catalog and the reader's location rules.
namespace catalog_uri {

// Whether `text` begins with a scheme of two or more characters and a colon
// ("http:", "file:", "urn:"); a drive letter ("C:") is not one.
bool hasScheme(std::u16string_view text);

// `text` with every character that may not stand in a URI percent-encoded as UTF-8
// (blanks, controls, non-ASCII and "\"<>\\^`{|}"), and the hexadecimal digits of
// existing escapes in upper case; what catalogs compare.
std::u16string normalise(std::u16string_view text);

// The path of a local file written as a URI reference: "file:" URIs lose their
// scheme and authority, percent escapes are decoded. Nothing for a URI of another
// scheme.
std::optional<std::u16string> localPath(std::u16string_view uri);

// A local path as a URI reference: separators as "/", "%" and what may not stand in
// a URI escaped.
std::u16string pathAsUri(std::u16string_view path);

// `reference` made absolute against `base`, both URI references (RFC 3986, 5.2,
// without queries and fragments, which catalogs do not use).
std::u16string resolved(std::u16string_view base, std::u16string_view reference);

// "." and ".." segments of a path taken out; a ".." that climbs above the start of
// a relative path is kept, above the root of a rooted one dropped. A trailing "/"
// stays.
std::u16string withoutDotSegments(std::u16string_view path);

} // namespace catalog_uri
