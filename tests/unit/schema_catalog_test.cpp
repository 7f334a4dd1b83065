// OASIS XML catalogs: how identifiers are compared and resolved, which entry wins,
// how catalogs chain, and which catalog files are refused.
#include "SchemaCatalog.h"
#include "model_dump.h"

#include <gtest/gtest.h>
#include <string>
#include <utility>
#include <vector>

namespace {

using namespace zrtest;

std::u16string u16(const std::string& s) { return zrUtf8ToUtf16(s); }

TEST(CatalogUri, NormaliseResolveAndLocalPaths) {
    const std::pair<const char*, const char*> normalised[] = {
        {"http://x.org/a b.xsd", "http://x.org/a%20b.xsd"},
        {"a%2fb%7E", "a%2Fb%7E"},
        {"50%", "50%"},
        {"d\xC3\xA9j\xC3\xA0{|}\\", "d%C3%A9j%C3%A0%7B%7C%7D%5C"},
        {"urn:x:y?q#f", "urn:x:y?q#f"},
    };
    for (const auto& [in, out] : normalised)
        EXPECT_EQ(utf8(catalog_uri::normalise(u16(in))), out) << in;

    // Base, reference, resolved.
    const char* const resolved[][3] = {
        {"cat/catalog.xml", "xsd/a.xsd", "cat/xsd/a.xsd"},
        {"cat/catalog.xml", "../corpus/x/", "corpus/x/"},
        {"../shared/catalogs/c.xml", "../corpus/a.xsd", "../shared/corpus/a.xsd"},
        {"catalog.xml", "a.xsd", "a.xsd"},
        {"catalog.xml", "../a.xsd", "../a.xsd"},
        {"/etc/xml/catalog", "./sub/../a.xsd", "/etc/xml/a.xsd"},
        {"/etc/xml/catalog", "/usr/a.xsd", "/usr/a.xsd"},
        {"/etc/xml/catalog", "../../../a.xsd", "/a.xsd"},
        {"file:///etc/xml/catalog", "a.xsd", "file:///etc/xml/a.xsd"},
        {"http://h.org/dir/cat.xml", "../x/a.xsd", "http://h.org/x/a.xsd"},
        {"http://h.org", "a.xsd", "http://h.org/a.xsd"},
        {"http://h.org/dir/cat.xml", "/root.xsd", "http://h.org/root.xsd"},
        {"http://h.org/dir/cat.xml", "//other.org/a.xsd", "http://other.org/a.xsd"},
        {"/etc/cat.xml", "urn:x:y", "urn:x:y"},
        {"/etc/cat.xml", "C:/x.xsd", "/etc/C:/x.xsd"},
    };
    for (const auto& [base, ref, out] : resolved)
        EXPECT_EQ(utf8(catalog_uri::resolved(u16(base), u16(ref))), out) << base << " + " << ref;

    // A URI and the local path it names, "-" when it names none.
    const std::pair<const char*, const char*> locals[] = {
        {"a/b%20c.xsd", "a/b c.xsd"},
        {"file:///tmp/x%C3%A9.xsd", "/tmp/x\xC3\xA9.xsd"},
        {"file://localhost/tmp/x.xsd", "/tmp/x.xsd"},
        {"FILE:/tmp/x.xsd", "/tmp/x.xsd"},
        {"file:///C:/dir/x.xsd", "C:/dir/x.xsd"},
        {"file://server/share/x.xsd", "//server/share/x.xsd"},
        {"http://h.org/x.xsd", "-"},
        {"urn:x:y", "-"},
    };
    for (const auto& [uri, path] : locals) {
        const std::optional<std::u16string> local = catalog_uri::localPath(u16(uri));
        EXPECT_EQ(local ? utf8(*local) : "-", path) << uri;
    }
    EXPECT_EQ(utf8(catalog_uri::pathAsUri(u"C:\\a b\\50%.xml")), "C:/a%20b/50%25.xml");
}

const char* const kHead = "<?xml version=\"1.0\"?>\n"
                          "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\">\n";

std::string catalog(const std::string& body) { return kHead + body + "\n</catalog>\n"; }

struct CatalogCase {
    const char* name;
    std::vector<std::pair<std::string, std::string>> files;
    const char* list; // the option's value; "{dir}" is the folder of the files
    // The messages of the load, then one line per lookup, "identifier -> location"
    // ("ns identifier" looks up a namespace, "-" is no location); "{dir}" as above.
    const char* expected;
};

const CatalogCase kCases[] = {
    {"ExactEntriesRelativeToTheCatalog",
     {{"c/catalog.xml", catalog(R"(<uri name="http://x.org/a.xsd" uri="local/a.xsd"/>
                  <system systemId="urn:x:b" uri="../b.xsd"/>
                  <uri name="http://x.org/a.xsd" uri="second.xsd"/>)")}},
     "{dir}/c/catalog.xml",
     "http://x.org/a.xsd -> {dir}/c/local/a.xsd\n"
     "urn:x:b -> {dir}/b.xsd\n"
     "http://x.org/A.xsd -> -\n"
     "ns urn:x:b -> -\n"
     "ns http://x.org/a.xsd -> {dir}/c/local/a.xsd\n"},
    {"UriEntriesBeforeSystemEntries",
     {{"catalog.xml", catalog(R"(<system systemId="http://x.org/a.xsd" uri="by-system.xsd"/>
                                 <uri name="http://x.org/a.xsd" uri="by-uri.xsd"/>
                                 <rewriteSystem systemIdStartString="http://x.org/"
                                                rewritePrefix="sys/"/>)")}},
     "{dir}/catalog.xml",
     "http://x.org/a.xsd -> {dir}/by-uri.xsd\n"
     "http://x.org/c.xsd -> {dir}/sys/c.xsd\n"},
    {"ExactThenLongestPrefixThenLongestSuffix",
     {{"catalog.xml", catalog(R"(<uriSuffix uriSuffix="/a.xsd" uri="suffix-a.xsd"/>
                  <uriSuffix uriSuffix="x/y/a.xsd" uri="suffix-xya.xsd"/>
                  <rewriteURI uriStartString="http://x.org/" rewritePrefix="short/"/>
                  <rewriteURI uriStartString="http://x.org/deep/" rewritePrefix="long/"/>
                  <rewriteURI uriStartString="http://x.org/deep/" rewritePrefix="later/"/>
                  <uri name="http://x.org/deep/exact.xsd" uri="exact.xsd"/>
                  <systemSuffix systemIdSuffix=".xsd" uri="any.xsd"/>)")}},
     "{dir}/catalog.xml",
     "http://x.org/deep/exact.xsd -> {dir}/exact.xsd\n"
     "http://x.org/deep/d/e.xsd -> {dir}/long/d/e.xsd\n"
     "http://x.org/top.xsd -> {dir}/short/top.xsd\n"
     "http://y.org/x/y/a.xsd -> {dir}/suffix-xya.xsd\n"
     "http://y.org/z/a.xsd -> {dir}/suffix-a.xsd\n"
     "http://y.org/other.xsd -> {dir}/any.xsd\n"
     "http://y.org/other.dtd -> -\n"},
    {"BasesOfGroupsAndEntries",
     {{"catalog.xml", catalog(R"(<group xml:base="schemas/">
                    <uri name="urn:a" uri="a.xsd"/>
                    <group xml:base="../other/"><uri name="urn:b" uri="b.xsd"/></group>
                    <uri name="urn:c" uri="c.xsd" xml:base="file:///opt/xsd/"/>
                    <uri name="urn:d" uri="http://mirror.org/d.xsd"/>
                  </group>
                  <uri name="urn:e" uri="e%20f.xsd"/>)")}},
     "{dir}/catalog.xml",
     "urn:a -> {dir}/schemas/a.xsd\n"
     "urn:b -> {dir}/other/b.xsd\n"
     "urn:c -> /opt/xsd/c.xsd\n"
     "urn:d -> http://mirror.org/d.xsd\n"
     "urn:e -> {dir}/e f.xsd\n"},
    {"IdentifiersAreNormalisedBeforeComparing",
     {{"catalog.xml", catalog(R"(<uri name="http://x.org/a%20b.xsd" uri="ab.xsd"/>
                                 <uri name="http://x.org/%c3%a9.xsd" uri="e.xsd"/>)")}},
     "{dir}/catalog.xml",
     "http://x.org/a b.xsd -> {dir}/ab.xsd\n"
     "http://x.org/\xC3\xA9.xsd -> {dir}/e.xsd\n"},
    // A catalog's own entries come before those it chains to; the chain is searched
    // depth first in the order written, each file once.
    {"NextCatalogsInOrderAfterTheirCatalog",
     {{"main.xml", catalog(R"(<nextCatalog catalog="n1/c.xml"/>
                              <uri name="urn:own" uri="own.xsd"/>
                              <nextCatalog catalog="n2/c.xml"/>)")},
      {"n1/c.xml", catalog(R"(<uri name="urn:own" uri="n1-own.xsd"/>
                              <nextCatalog catalog="../n3/c.xml"/>
                              <uri name="urn:n1" uri="n1.xsd"/>)")},
      {"n2/c.xml", catalog(R"(<uri name="urn:deep" uri="n2-deep.xsd"/>
                              <uri name="urn:n2" uri="n2.xsd"/>
                              <nextCatalog catalog="../main.xml"/>)")},
      {"n3/c.xml", catalog(R"(<uri name="urn:deep" uri="n3-deep.xsd"/>)")}},
     "{dir}/main.xml",
     "urn:own -> {dir}/own.xsd\n"
     "urn:n1 -> {dir}/n1/n1.xsd\n"
     "urn:n2 -> {dir}/n2/n2.xsd\n"
     "urn:deep -> {dir}/n3/n3-deep.xsd\n"
     "urn:none -> -\n"},
    {"ListedCatalogsInOrder",
     {{"a.xml", catalog(R"(<uri name="urn:both" uri="a-both.xsd"/>)")},
      {"b.xml", catalog(R"(<uri name="urn:both" uri="b-both.xsd"/>
                           <uri name="urn:b" uri="b.xsd"/>)")}},
     " ; {dir}/a.xml ;;\t{dir}/b.xml ; {dir}/a.xml",
     "urn:both -> {dir}/a-both.xsd\n"
     "urn:b -> {dir}/b.xsd\n"},
    // Elements of other namespaces are not the catalog's, nor what they hold; the
    // catalog namespace may be bound to a prefix; a DTD named by an http location
    // is not fetched.
    {"ForeignElementsPrefixesAndDoctype",
     {{"catalog.xml",
       "<?xml version=\"1.0\"?>\n<!DOCTYPE c:catalog PUBLIC \"-//OASIS//DTD XML Catalogs "
       "V1.1//EN\" \"http://127.0.0.1:9/catalog.dtd\">\n"
       "<c:catalog xmlns:c=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\" "
       "xmlns:o=\"urn:other\">\n"
       "<o:ext><c:uri name=\"urn:hidden\" uri=\"hidden.xsd\"/></o:ext>\n"
       "<uri name=\"urn:unbound\" uri=\"unbound.xsd\"/>\n"
       "<c:public publicId=\"-//X//EN\" uri=\"x.dtd\"/>\n"
       "<c:uri name=\"urn:seen\" uri=\"seen.xsd\"/>\n</c:catalog>\n"}},
     "{dir}/catalog.xml",
     "urn:seen -> {dir}/seen.xsd\n"
     "urn:hidden -> -\n"
     "urn:unbound -> -\n"
     "-//X//EN -> -\n"},
    {"NoCatalogs", {}, "  ;  ", "urn:x -> -\n"},
    // A catalog that cannot be read fails the load naming the file, and nothing of
    // what was read before it is kept.
    {"Missing",
     {},
     "{dir}/none.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/none.xml is not read: it cannot be "
     "opened\n"},
    {"Folder",
     {{"folder.xml/inner.xml", catalog("")}},
     "{dir}/folder.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/folder.xml is not read: it cannot be "
     "opened\n"},
    {"NotWellFormed",
     {{"c.xml", catalog("<uri name=\"a\" uri=\"b\">")}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/c.xml is not read: line 4, column 3: "
     "expected end of tag 'uri'\n"},
    {"NotACatalog",
     {{"c.xml", "<catalog><uri name=\"a\" uri=\"b\"/></catalog>"}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/c.xml is not read: it is not an XML "
     "catalog (its root is not 'catalog' in namespace "
     "urn:oasis:names:tc:entity:xmlns:xml:catalog)\n"},
    {"EntryWithoutTarget",
     {{"c.xml", catalog("<rewriteURI uriStartString=\"http://x/\"/>")}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/c.xml is not read: 'rewriteURI' lacks "
     "its attribute 'rewritePrefix'\n"},
    {"ExternalEntity",
     {{"secret.xml", "<uri/>"},
      {"c.xml", "<!DOCTYPE catalog [<!ENTITY e SYSTEM \"secret.xml\">]>\n"
                "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\">&e;</catalog>"}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/c.xml is not read: external entity "
     "'secret.xml' is not read\n"},
    {"MissingNextCatalog",
     {{"c.xml", catalog("<nextCatalog catalog=\"sub/next.xml\"/>")}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/sub/next.xml is not read: it cannot be "
     "opened\n"},
    {"NextCatalogOverNetwork",
     {{"c.xml", catalog("<nextCatalog catalog=\"http://127.0.0.1:9/next.xml\"/>")}},
     "{dir}/c.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/c.xml is not read: its next catalog "
     "'http://127.0.0.1:9/next.xml' is not a local file\n"},
    {"SecondOfTheListMissing",
     {{"c.xml", catalog("<uri name=\"urn:x\" uri=\"x.xsd\"/>")}},
     "{dir}/c.xml;{dir}/d.xml",
     "not loaded\n4 4 Schema: Error: Catalog file {dir}/d.xml is not read: it cannot be "
     "opened\nurn:x -> -\n"},
};

// The parser library is ready (model_dump.h).
class Catalogs : public ::testing::TestWithParam<CatalogCase> {};

TEST_P(Catalogs, MapWhatTheirEntriesSayOrFailNamingTheFile) {
    const CatalogCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const std::string expected = replaceAll(c.expected, "{dir}", dir.path().string());
    LogCapture log;
    SchemaCatalog catalogs;
    const bool loaded = catalogs.load(u16(replaceAll(c.list, "{dir}", dir.path().string())));
    std::string outcome = (loaded ? "" : "not loaded\n") + log.lines();
    for (size_t at = 0, end; (end = expected.find('\n', at)) != std::string::npos; at = end + 1) {
        const std::string line = expected.substr(at, end - at);
        const size_t arrow = line.find(" -> ");
        if (arrow == std::string::npos)
            continue;
        const std::string id = line.substr(0, arrow);
        const std::optional<std::u16string> mapped = id.compare(0, 3, "ns ") == 0
                                                         ? catalogs.mapNamespace(u16(id.substr(3)))
                                                         : catalogs.mapLocation(u16(id));
        outcome += id + " -> " + (mapped ? utf8(*mapped) : "-") + "\n";
    }
    EXPECT_EQ(outcome, expected);
    EXPECT_TRUE(loaded || catalogs.empty());
}

INSTANTIATE_TEST_SUITE_P(Files, Catalogs, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.name); });

} // namespace
