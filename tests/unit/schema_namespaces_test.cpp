// Namespace state, name resolution and the first element's attributes.
#include "model_dump.h"

#include <gtest/gtest.h>

namespace {

using namespace zrtest;

// Default namespace urn:d, target namespace urn:t, prefixes a, b and t (t also
// bound to the target namespace), and "zrxxxtrg" declared by the schema itself.
void setUpNamespaces(ZrXmlSchemaBrowserTestAccess& a) {
    a.defaultNamespace() = wide("urn:d");
    a.targetNamespace() = wide("urn:t");
    a.namespacePrefixes()[wide("a")] = wide("urn:shared");
    a.namespacePrefixes()[wide("b")] = wide("urn:shared");
    a.namespacePrefixes()[wide("t")] = wide("urn:t");
    a.namespacePrefixes()[wide("zrxxxtrg")] = wide("urn:own");
    a.namespacePrefixes()[wide("")] = wide("urn:empty");
}

struct ParseCase {
    const char* name;
    bool useDefault;
    const char* local;
    const char* ns;
};

TEST(Namespaces, ParseNameSplitsAtTheFirstColonAndResolvesThePrefix) {
    const ParseCase cases[] = {
        {"plain", true, "plain", "urn:d"},  {"plain", false, "plain", "urn:t"},
        {"a:x", false, "x", "urn:shared"},  {"a:b:c", true, "b:c", "urn:shared"},
        {"zrxxxtrg:x", true, "x", "urn:t"}, {"unbound:x", true, "x", ""},
        {":x", true, "x", "urn:empty"},     {"a:", true, "", "urn:shared"},
        {"", false, "", "urn:t"},
    };
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    setUpNamespaces(access);
    for (const ParseCase& c : cases) {
        SCOPED_TRACE(std::string(c.name) + (c.useDefault ? " default" : " target"));
        ZrWString local = wide("old");
        ZrWString ns = wide("old");
        access.parseName(wide(c.name).c_str(), c.useDefault, local, ns);
        EXPECT_EQ(utf8(local), c.local);
        EXPECT_EQ(utf8(ns), c.ns);
    }
    // The text may live in an output.
    ZrName local(u"a:in");
    ZrName ns;
    access.parseName(local.c_str(), true, local, ns);
    EXPECT_EQ(utf8(local) + " " + utf8(ns), "in urn:shared");
}

TEST(Namespaces, LookupAndReverse) {
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    setUpNamespaces(access);
    EXPECT_EQ(utf8(std::u16string_view(access.LookupNamespace(u"a"))), "urn:shared");
    EXPECT_EQ(utf8(std::u16string_view(access.LookupNamespace(u"zrxxxtrg"))), "urn:t");
    EXPECT_EQ(access.LookupNamespace(u"nope"), nullptr);

    struct ReverseCase {
        const char* uri;
        bool useTargetPrefix;
        const char* prefix;
    };

    const ReverseCase cases[] = {
        {"urn:t", true, "zrxxxtrg"}, {"urn:t", false, ""},           {"urn:d", true, ""},
        {"urn:shared", true, "a"},   {"urn:own", false, "zrxxxtrg"}, {"urn:none", true, ""},
        {"urn:empty", false, ""},
    };
    for (const ReverseCase& c : cases) {
        SCOPED_TRACE(c.uri);
        const XMLCh* prefix = access.ReverseNamespace(wide(c.uri).c_str(), c.useTargetPrefix);
        ASSERT_NE(prefix, nullptr);
        EXPECT_EQ(utf8(std::u16string_view(prefix)), c.prefix);
    }
    // Default and target namespace the same URI.
    access.defaultNamespace() = wide("urn:t");
    EXPECT_EQ(utf8(std::u16string_view(access.ReverseNamespace(u"urn:t", false))), "");
    EXPECT_EQ(utf8(std::u16string_view(access.ReverseNamespace(u"urn:t", true))), "zrxxxtrg");
}

TEST(Namespaces, FirstElementAttributesDeclareTheNamespaces) {
    TempDir dir;
    ZrXmlSchemaBrowser browser;
    ZrXmlSchemaBrowserTestAccess access(browser);
    LogCapture log;
    const std::string valid = dir.write(
        "valid.xsd", std::string("<x:schema xmlns:x=\"") + kXsdNs +
                         R"(" xmlnsFoo="urn:d" xmlns:="urn:e" targetNamespace="urn:t" version="1"
                 elementFormDefault="qualified" attributeFormDefault="unqualified" id="s">
               <x:element name="e" type=":T"/><x:element name="f" type="T"/></x:schema>)");
    EXPECT_TRUE(browser.ReadSchema(wide(valid).c_str(), false));
    EXPECT_EQ(log.lines(), "512 0 Unknown first element attribute 'id'\n");
    EXPECT_EQ(dumpModel(access), "global element name={urn:t}e type={urn:e}T\n"
                                 "global element name={urn:t}f type={urn:d}T\n");
    EXPECT_EQ(utf8(access.schemaNamespace()), kXsdNs);
}

// Only the first element of a document declares namespaces, whatever its name.
TEST(Namespaces, OnlyTheFirstElementDeclares) {
    const std::string document = std::string("<wrapper xmlns:xs=\"") + kXsdNs +
                                 R"(" targetNamespace="urn:w" bogus="1">
          <xs:schema targetNamespace="urn:ignored" xmlns:q="urn:q">
            <xs:element name="a" type="q:T"/></xs:schema></wrapper>)";
    const ReadOutcome read = readSchemaText(document);
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.model, "global element name={urn:w}a type=T\n");
    EXPECT_EQ(read.log, "512 0 Unknown first element attribute 'bogus'\n");
}

// Before any "schema" element the browser knows no schema namespace, so every
// element is reported.
TEST(Namespaces, ElementsBeforeAnySchemaElementAreReported) {
    const std::string document =
        std::string("<xs:element xmlns:xs=\"") + kXsdNs + R"(" name="a" type="xs:string"/>)";
    const ReadOutcome read = readSchemaText(document);
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.model, "global element name=a type={xs}string\n");
    EXPECT_EQ(read.log, "512 0 Unknown first element attribute 'name'\n"
                        "512 0 Unknown first element attribute 'type'\n"
                        "512 0 Element 'element' not in XMLSchema namespace (is "
                        "'http://www.w3.org/2001/XMLSchema', should be ''\n"
                        "512 0 xmlns in element attrs\n");
}

} // namespace
