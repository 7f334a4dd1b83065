// Names resolved through the namespace state, and namespaces written back as prefixes
// (documents that declare namespaces are read in model_reading_test.cpp).
#include "model_dump.h"

#include <gtest/gtest.h>
#include <tuple>

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

TEST(Namespaces, ParseNameSplitsAtTheFirstColonAndResolvesThePrefix) {
    // The name, whether a bare name takes the default namespace (else the target one),
    // the local part and namespace it resolves to.
    const std::tuple<const char*, bool, const char*, const char*> cases[] = {
        {"plain", true, "plain", "urn:d"},  {"plain", false, "plain", "urn:t"},
        {"a:x", false, "x", "urn:shared"},  {"a:b:c", true, "b:c", "urn:shared"},
        {"zrxxxtrg:x", true, "x", "urn:t"}, {"unbound:x", true, "x", ""},
        {":x", true, "x", "urn:empty"},     {"a:", true, "", "urn:shared"},
        {"", false, "", "urn:t"},
    };
    SchemaModel model;
    SchemaReader reader(model);
    setUpNamespaces(model.namespaces);
    for (const auto& [name, useDefault, wantLocal, wantNs] : cases) {
        ZrName local(u"old");
        ZrName ns(u"old");
        reader.parseName(wide(name).c_str(), useDefault, local, ns);
        EXPECT_EQ(utf8(local) + " " + utf8(ns), std::string(wantLocal) + " " + wantNs)
            << name << (useDefault ? " default" : " target");
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
    // The URI, whether the target namespace takes its own prefix, the prefix written.
    const std::tuple<const char*, bool, const char*> cases[] = {
        {"urn:t", true, "zrxxxtrg"}, {"urn:t", false, ""},           {"urn:d", true, ""},
        {"urn:shared", true, "a"},   {"urn:own", false, "zrxxxtrg"}, {"urn:none", true, ""},
        {"urn:empty", false, ""},
    };
    const PrefixWriter writer(model.namespaces);
    for (const auto& [uri, useTargetPrefix, prefix] : cases)
        EXPECT_EQ(utf8(writer.prefixOf(zrUtf8ToUtf16(uri), useTargetPrefix)), prefix) << uri;
    // Default and target namespace the same URI.
    model.namespaces.defaultNamespace = u"urn:t";
    const PrefixWriter sameUri(model.namespaces);
    EXPECT_EQ(utf8(sameUri.prefixOf(u"urn:t", false)), "");
    EXPECT_EQ(utf8(sameUri.prefixOf(u"urn:t", true)), "zrxxxtrg");
}

} // namespace
