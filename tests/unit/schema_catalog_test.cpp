// OASIS XML catalogs: how identifiers are compared and resolved, which entry wins,
// how catalogs chain, and which catalog files are refused.
#include "SchemaCatalog.h"
#include "TestSupport.h"

#include <gtest/gtest.h>
#include <string>
#include <utility>
#include <vector>
#include <xercesc/util/PlatformUtils.hpp>

namespace {

using zrtest::LogCapture;
using zrtest::TempDir;
using zrtest::utf8;

std::u16string u16(const std::string& s) { return zrUtf8ToUtf16(s); }

std::string replaced(std::string text, const std::string& field, const std::string& value) {
    for (size_t at = text.find(field); at != std::string::npos; at = text.find(field, at))
        text.replace(at, field.size(), value);
    return text;
}

TEST(CatalogUri, NormaliseResolveAndLocalPaths) {
    struct Normalised {
        const char* in;
        const char* out;
    };

    const Normalised normalised[] = {
        {"http://x.org/a b.xsd", "http://x.org/a%20b.xsd"},
        {"a%2fb%7E", "a%2Fb%7E"},
        {"50%", "50%"},
        {"d\xC3\xA9j\xC3\xA0{|}\\", "d%C3%A9j%C3%A0%7B%7C%7D%5C"},
        {"urn:x:y?q#f", "urn:x:y?q#f"},
    };
    for (const auto& c : normalised)
        EXPECT_EQ(utf8(catalog_uri::normalise(u16(c.in))), c.out) << c.in;

    struct Resolved {
        const char* base;
        const char* ref;
        const char* out;
    };

    const Resolved resolved[] = {
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
    for (const auto& c : resolved)
        EXPECT_EQ(utf8(catalog_uri::resolved(u16(c.base), u16(c.ref))), c.out)
            << c.base << " + " << c.ref;

    struct Local {
        const char* uri;
        const char* path; // null: not a local file
    };

    const Local locals[] = {
        {"a/b%20c.xsd", "a/b c.xsd"},
        {"file:///tmp/x%C3%A9.xsd", "/tmp/x\xC3\xA9.xsd"},
        {"file://localhost/tmp/x.xsd", "/tmp/x.xsd"},
        {"FILE:/tmp/x.xsd", "/tmp/x.xsd"},
        {"file:///C:/dir/x.xsd", "C:/dir/x.xsd"},
        {"file://server/share/x.xsd", "//server/share/x.xsd"},
        {"http://h.org/x.xsd", nullptr},
        {"urn:x:y", nullptr},
    };
    for (const auto& c : locals) {
        const std::optional<std::u16string> path = catalog_uri::localPath(u16(c.uri));
        if (c.path)
            EXPECT_EQ(path ? utf8(*path) : "(none)", c.path) << c.uri;
        else
            EXPECT_FALSE(path) << c.uri;
    }
    EXPECT_EQ(utf8(catalog_uri::pathAsUri(u"C:\\a b\\50%.xml")), "C:/a%20b/50%25.xml");
}

const char* const kHead = "<?xml version=\"1.0\"?>\n"
                          "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\">\n";

std::string catalog(const std::string& body) { return kHead + body + "\n</catalog>\n"; }

struct Lookup {
    enum Kind { kLocation, kNamespace } kind;

    const char* identifier;
    const char* expected; // "{dir}" is the folder of the files; null: nothing maps it
};

struct MappingCase {
    const char* name;
    std::vector<std::pair<std::string, std::string>> files;
    const char* list; // the option's value; "{dir}" as above
    std::vector<Lookup> lookups;
};

const MappingCase kMappingCases[] = {
    {"ExactEntriesRelativeToTheCatalog",
     {{"c/catalog.xml", catalog(R"(<uri name="http://x.org/a.xsd" uri="local/a.xsd"/>
                  <system systemId="urn:x:b" uri="../b.xsd"/>
                  <uri name="http://x.org/a.xsd" uri="second.xsd"/>)")}},
     "{dir}/c/catalog.xml",
     {{Lookup::kLocation, "http://x.org/a.xsd", "{dir}/c/local/a.xsd"},
      {Lookup::kLocation, "urn:x:b", "{dir}/b.xsd"},
      {Lookup::kLocation, "http://x.org/A.xsd", nullptr},
      {Lookup::kNamespace, "urn:x:b", nullptr},
      {Lookup::kNamespace, "http://x.org/a.xsd", "{dir}/c/local/a.xsd"}}},
    {"UriEntriesBeforeSystemEntries",
     {{"catalog.xml", catalog(R"(<system systemId="http://x.org/a.xsd" uri="by-system.xsd"/>
                                 <uri name="http://x.org/a.xsd" uri="by-uri.xsd"/>
                                 <rewriteSystem systemIdStartString="http://x.org/"
                                                rewritePrefix="sys/"/>)")}},
     "{dir}/catalog.xml",
     {{Lookup::kLocation, "http://x.org/a.xsd", "{dir}/by-uri.xsd"},
      {Lookup::kLocation, "http://x.org/c.xsd", "{dir}/sys/c.xsd"}}},
    {"ExactThenLongestPrefixThenLongestSuffix",
     {{"catalog.xml", catalog(R"(<uriSuffix uriSuffix="/a.xsd" uri="suffix-a.xsd"/>
                  <uriSuffix uriSuffix="x/y/a.xsd" uri="suffix-xya.xsd"/>
                  <rewriteURI uriStartString="http://x.org/" rewritePrefix="short/"/>
                  <rewriteURI uriStartString="http://x.org/deep/" rewritePrefix="long/"/>
                  <rewriteURI uriStartString="http://x.org/deep/" rewritePrefix="later/"/>
                  <uri name="http://x.org/deep/exact.xsd" uri="exact.xsd"/>
                  <systemSuffix systemIdSuffix=".xsd" uri="any.xsd"/>)")}},
     "{dir}/catalog.xml",
     {{Lookup::kLocation, "http://x.org/deep/exact.xsd", "{dir}/exact.xsd"},
      {Lookup::kLocation, "http://x.org/deep/d/e.xsd", "{dir}/long/d/e.xsd"},
      {Lookup::kLocation, "http://x.org/top.xsd", "{dir}/short/top.xsd"},
      {Lookup::kLocation, "http://y.org/x/y/a.xsd", "{dir}/suffix-xya.xsd"},
      {Lookup::kLocation, "http://y.org/z/a.xsd", "{dir}/suffix-a.xsd"},
      {Lookup::kLocation, "http://y.org/other.xsd", "{dir}/any.xsd"},
      {Lookup::kLocation, "http://y.org/other.dtd", nullptr}}},
    {"BasesOfGroupsAndEntries",
     {{"catalog.xml", catalog(R"(<group xml:base="schemas/">
                    <uri name="urn:a" uri="a.xsd"/>
                    <group xml:base="../other/"><uri name="urn:b" uri="b.xsd"/></group>
                    <uri name="urn:c" uri="c.xsd" xml:base="file:///opt/xsd/"/>
                    <uri name="urn:d" uri="http://mirror.org/d.xsd"/>
                  </group>
                  <uri name="urn:e" uri="e%20f.xsd"/>)")}},
     "{dir}/catalog.xml",
     {{Lookup::kLocation, "urn:a", "{dir}/schemas/a.xsd"},
      {Lookup::kLocation, "urn:b", "{dir}/other/b.xsd"},
      {Lookup::kLocation, "urn:c", "/opt/xsd/c.xsd"},
      {Lookup::kLocation, "urn:d", "http://mirror.org/d.xsd"},
      {Lookup::kLocation, "urn:e", "{dir}/e f.xsd"}}},
    {"IdentifiersAreNormalisedBeforeComparing",
     {{"catalog.xml", catalog(R"(<uri name="http://x.org/a%20b.xsd" uri="ab.xsd"/>
                                 <uri name="http://x.org/%c3%a9.xsd" uri="e.xsd"/>)")}},
     "{dir}/catalog.xml",
     {{Lookup::kLocation, "http://x.org/a b.xsd", "{dir}/ab.xsd"},
      {Lookup::kLocation, "http://x.org/\xC3\xA9.xsd", "{dir}/e.xsd"}}},
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
     {{Lookup::kLocation, "urn:own", "{dir}/own.xsd"},
      {Lookup::kLocation, "urn:n1", "{dir}/n1/n1.xsd"},
      {Lookup::kLocation, "urn:n2", "{dir}/n2/n2.xsd"},
      {Lookup::kLocation, "urn:deep", "{dir}/n3/n3-deep.xsd"},
      {Lookup::kLocation, "urn:none", nullptr}}},
    {"ListedCatalogsInOrder",
     {{"a.xml", catalog(R"(<uri name="urn:both" uri="a-both.xsd"/>)")},
      {"b.xml", catalog(R"(<uri name="urn:both" uri="b-both.xsd"/>
                           <uri name="urn:b" uri="b.xsd"/>)")}},
     " ; {dir}/a.xml ;;\t{dir}/b.xml ; {dir}/a.xml",
     {{Lookup::kLocation, "urn:both", "{dir}/a-both.xsd"},
      {Lookup::kLocation, "urn:b", "{dir}/b.xsd"}}},
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
     {{Lookup::kLocation, "urn:seen", "{dir}/seen.xsd"},
      {Lookup::kLocation, "urn:hidden", nullptr},
      {Lookup::kLocation, "urn:unbound", nullptr},
      {Lookup::kLocation, "-//X//EN", nullptr}}},
    {"NoCatalogs", {}, "  ;  ", {{Lookup::kLocation, "urn:x", nullptr}}},
};

class CatalogMapping : public ::testing::TestWithParam<MappingCase> {
  protected:
    static void SetUpTestSuite() { xercesc::XMLPlatformUtils::Initialize(); }
};

TEST_P(CatalogMapping, MapsWhatItsEntriesSay) {
    const MappingCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const std::string folder = dir.path().string();
    LogCapture log;
    SchemaCatalog catalogs;
    ASSERT_TRUE(catalogs.load(u16(replaced(c.list, "{dir}", folder)))) << log.lines();
    EXPECT_EQ(log.lines(), "");
    for (const Lookup& lookup : c.lookups) {
        const std::optional<std::u16string> mapped =
            lookup.kind == Lookup::kLocation ? catalogs.mapLocation(u16(lookup.identifier))
                                             : catalogs.mapNamespace(u16(lookup.identifier));
        const std::string expected =
            lookup.expected ? replaced(lookup.expected, "{dir}", folder) : "(none)";
        EXPECT_EQ(mapped ? utf8(*mapped) : "(none)", expected) << lookup.identifier;
    }
}

INSTANTIATE_TEST_SUITE_P(Catalogs, CatalogMapping, ::testing::ValuesIn(kMappingCases),
                         [](const auto& row) { return std::string(row.param.name); });

struct RefusedCase {
    const char* name;
    std::vector<std::pair<std::string, std::string>> files;
    const char* list;
    // The one message logged; "{dir}" as above.
    const char* message;
};

const RefusedCase kRefusedCases[] = {
    {"Missing",
     {},
     "{dir}/none.xml",
     "Schema: Error: Catalog file {dir}/none.xml is not read: it cannot be opened"},
    {"Folder",
     {{"folder.xml/inner.xml", catalog("")}},
     "{dir}/folder.xml",
     "Schema: Error: Catalog file {dir}/folder.xml is not read: it cannot be opened"},
    {"NotWellFormed",
     {{"c.xml", catalog("<uri name=\"a\" uri=\"b\">")}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/c.xml is not read: line 4, column 3: expected end of "
     "tag 'uri'"},
    {"NotACatalog",
     {{"c.xml", "<catalog><uri name=\"a\" uri=\"b\"/></catalog>"}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/c.xml is not read: it is not an XML catalog (its root "
     "is not 'catalog' in namespace urn:oasis:names:tc:entity:xmlns:xml:catalog)"},
    {"EntryWithoutTarget",
     {{"c.xml", catalog("<rewriteURI uriStartString=\"http://x/\"/>")}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/c.xml is not read: 'rewriteURI' lacks its attribute "
     "'rewritePrefix'"},
    {"ExternalEntity",
     {{"secret.xml", "<uri/>"},
      {"c.xml", "<!DOCTYPE catalog [<!ENTITY e SYSTEM \"secret.xml\">]>\n"
                "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\">&e;</catalog>"}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/c.xml is not read: external entity 'secret.xml' is "
     "not read"},
    {"MissingNextCatalog",
     {{"c.xml", catalog("<nextCatalog catalog=\"sub/next.xml\"/>")}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/sub/next.xml is not read: it cannot be opened"},
    {"NextCatalogOverNetwork",
     {{"c.xml", catalog("<nextCatalog catalog=\"http://127.0.0.1:9/next.xml\"/>")}},
     "{dir}/c.xml",
     "Schema: Error: Catalog file {dir}/c.xml is not read: its next catalog "
     "'http://127.0.0.1:9/next.xml' is not a local file"},
    {"SecondOfTheListMissing",
     {{"c.xml", catalog("")}},
     "{dir}/c.xml;{dir}/d.xml",
     "Schema: Error: Catalog file {dir}/d.xml is not read: it cannot be opened"},
};

class CatalogRefused : public ::testing::TestWithParam<RefusedCase> {
  protected:
    static void SetUpTestSuite() { xercesc::XMLPlatformUtils::Initialize(); }
};

TEST_P(CatalogRefused, FailsNamingTheFile) {
    const RefusedCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const std::string folder = dir.path().string();
    LogCapture log;
    SchemaCatalog catalogs;
    EXPECT_FALSE(catalogs.load(u16(replaced(c.list, "{dir}", folder))));
    EXPECT_EQ(log.lines(), "4 4 " + replaced(c.message, "{dir}", folder) + "\n");
    EXPECT_TRUE(catalogs.empty());
    EXPECT_FALSE(catalogs.mapLocation(u"urn:x"));
}

INSTANTIATE_TEST_SUITE_P(Catalogs, CatalogRefused, ::testing::ValuesIn(kRefusedCases),
                         [](const auto& row) { return std::string(row.param.name); });

} // namespace
