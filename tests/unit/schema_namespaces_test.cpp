// Namespace state, name resolution and the first element's attributes.
#include "model_dump.h"

#include <gtest/gtest.h>

namespace {

using namespace zrtest;

// Default namespace urn:d, target namespace urn:t, prefixes a, b and t (t also
// bound to the target namespace), and "zrxxxtrg" declared by the schema itself.
void setUpNamespaces(NamespaceBindings& bindings) {
    bindings.defaultNamespace = u"urn:d";
    bindings.targetNamespace = u"urn:t";
    bindings.prefixes[u"a"] = u"urn:shared";
    bindings.prefixes[u"b"] = u"urn:shared";
    bindings.prefixes[u"t"] = u"urn:t";
    bindings.prefixes[u"zrxxxtrg"] = u"urn:own";
    bindings.prefixes[u""] = u"urn:empty";
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
    SchemaModel model;
    SchemaReader reader(model);
    setUpNamespaces(model.namespaces);
    for (const ParseCase& c : cases) {
        SCOPED_TRACE(std::string(c.name) + (c.useDefault ? " default" : " target"));
        ZrName local(u"old");
        ZrName ns(u"old");
        reader.parseName(wide(c.name).c_str(), c.useDefault, local, ns);
        EXPECT_EQ(utf8(local), c.local);
        EXPECT_EQ(utf8(ns), c.ns);
    }
    // The text may live in an output.
    ZrName local(u"a:in");
    ZrName ns;
    reader.parseName(local.c_str(), true, local, ns);
    EXPECT_EQ(utf8(local) + " " + utf8(ns), "in urn:shared");
}

TEST(Namespaces, Reverse) {
    SchemaModel model;
    setUpNamespaces(model.namespaces);

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
    const PrefixWriter writer(model.namespaces);
    for (const ReverseCase& c : cases) {
        SCOPED_TRACE(c.uri);
        EXPECT_EQ(utf8(writer.prefixOf(zrUtf8ToUtf16(c.uri), c.useTargetPrefix)), c.prefix);
    }
    // Default and target namespace the same URI.
    model.namespaces.defaultNamespace = u"urn:t";
    const PrefixWriter sameUri(model.namespaces);
    EXPECT_EQ(utf8(sameUri.prefixOf(u"urn:t", false)), "");
    EXPECT_EQ(utf8(sameUri.prefixOf(u"urn:t", true)), "zrxxxtrg");
}

TEST(Namespaces, FirstElementAttributesDeclareTheNamespaces) {
    TempDir dir;
    LogCapture log;
    const std::string valid = dir.write(
        "valid.xsd", std::string("<x:schema xmlns:x=\"") + kXsdNs +
                         R"(" xmlnsFoo="urn:d" xmlns:="urn:e" targetNamespace="urn:t" version="1"
                 elementFormDefault="qualified" attributeFormDefault="unqualified" id="s">
               <x:element name="e" type=":T"/><x:element name="f" type="T"/></x:schema>)");
    const ReadOutcome read = readSchemaFile(valid, dir.path().string());
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.log, "512 0 Unknown first element attribute 'id'\n");
    EXPECT_EQ(read.model, "global element name={urn:t}e type={urn:e}T\n"
                          "global element name={urn:t}f type={urn:d}T\n");
}

// Only the first element of a document declares the target namespace, whatever its
// name; prefixes declared below it hold within their element.
TEST(Namespaces, OnlyTheFirstElementDeclaresTheTarget) {
    const std::string document = std::string("<wrapper xmlns:xs=\"") + kXsdNs +
                                 R"(" targetNamespace="urn:w" bogus="1">
          <xs:schema targetNamespace="urn:ignored" xmlns:q="urn:q">
            <xs:element name="a" type="q:T"/></xs:schema></wrapper>)";
    const ReadOutcome read = readSchemaText(document);
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.model, "global element name={urn:w}a type={urn:q}T\n");
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
