// Names resolved through the namespace state, and namespaces written back as prefixes
// (documents that declare namespaces are read in model_reading_test.cpp).
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

} // namespace
