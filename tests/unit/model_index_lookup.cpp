// The model's lookups by name go through an index; they must answer exactly what a
// first-match scan of the list from its start answers. Checked directly on
// NamedList against a plain scan, and on a whole read built to trip an index: names
// repeated across namespaces and within one, "anon" names, groups and types
// sharing a name.
#include "TestSupport.h"
#include "dictionary_support.h"

#include <gtest/gtest.h>
#include <ostream>
#include <random>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace {

using zrtest::LogCapture;
using zrtest::TempDir;
using zrtest::utf8;
using zrtest::wide;

// The lookup rule written out as a scan: the first entry whose name equals the
// one sought and, unless that name begins with "anon", whose namespace does too.
bool beginsWithAnon(std::u16string_view name) {
    return name.size() >= 4 && name[0] == u'a' && name[1] == u'n' && name[2] == u'o' &&
           name[3] == u'n';
}

template <class T>
const T* scanFind(const NamedList<T>& list, std::u16string_view name, std::u16string_view ns,
                  int kind = 0) {
    for (const T& item : list)
        if (namedKind(item) == kind && item.name.view() == name &&
            (beginsWithAnon(name) || item.nameNs.view() == ns))
            return &item;
    return nullptr;
}

template <class T>
const T* scanFindExact(const NamedList<T>& list, std::u16string_view name, std::u16string_view ns,
                       int kind = 0) {
    for (const T& item : list)
        if (namedKind(item) == kind && item.name.view() == name && item.nameNs.view() == ns)
            return &item;
    return nullptr;
}

struct Entry {
    ZrWString name;
    ZrWString nameNs;
    int id = -1;
};

// Ids of what find and findExact return, -1 for none.
int idOf(const Entry* e) { return e ? e->id : -1; }

// --- NamedList against the scan, case by case ------------------------------------------

struct Step {
    enum Kind { Push, Find, FindExact } kind;

    const char16_t* name = u"";
    const char16_t* ns = u"";
    int id = -1; // Push: the new entry's id; Find*: the id expected, -1 for none
};

Step push(const char16_t* name, const char16_t* ns, int id) { return {Step::Push, name, ns, id}; }

Step find(const char16_t* name, const char16_t* ns, int id) { return {Step::Find, name, ns, id}; }

Step exact(const char16_t* name, const char16_t* ns, int id) {
    return {Step::FindExact, name, ns, id};
}

struct ListCase {
    const char* label;
    std::vector<Step> steps;
};

const ListCase kListCases[] = {
    {"SameNameInThreeNamespaces",
     {push(u"Party", u"urn:a", 0), push(u"Party", u"urn:b", 1), push(u"Party", u"", 2),
      find(u"Party", u"urn:b", 1), find(u"Party", u"", 2), find(u"Party", u"urn:a", 0),
      find(u"Party", u"urn:c", -1), exact(u"Party", u"urn:b", 1), exact(u"Party", u"urn:c", -1)}},
    {"GeneratedNamesIgnoreTheNamespaceSought",
     {push(u"anon3", u"urn:a", 0), push(u"anon3", u"", 1), find(u"anon3", u"urn:zzz", 0),
      find(u"anon3", u"", 0), exact(u"anon3", u"", 1), exact(u"anon3", u"urn:b", -1),
      find(u"anon4", u"", -1)}},
    {"NamesThatOnlyLookLikeAnonNeedTheirNamespace",
     // An author's name beginning with "anon" follows the generated names' rule.
     {push(u"ano", u"urn:a", 0), push(u"Anon1", u"urn:a", 1), push(u"xanon", u"urn:a", 2),
      push(u"anonymousParty", u"urn:a", 3), find(u"ano", u"urn:b", -1),
      find(u"Anon1", u"urn:b", -1), find(u"xanon", u"", -1), find(u"Anon1", u"urn:a", 1),
      find(u"anonymousParty", u"urn:b", 3), exact(u"anonymousParty", u"urn:b", -1)}},
    {"NameAndNamespaceDoNotRunTogether",
     {push(u"ab", u"urn:", 0), push(u"b", u"urn:a", 1), find(u"b", u"urn:a", 1),
      find(u"ab", u"urn:", 0), find(u"b", u"urn:", -1), find(u"rn:ab", u"u", -1)}},
};

void PrintTo(const ListCase& c, std::ostream* os) { *os << c.label; }

class NamedListCases : public ::testing::TestWithParam<ListCase> {};

TEST_P(NamedListCases, AnswerLikeAScan) {
    NamedList<Entry> list;
    int stepNo = 0;
    for (const Step& step : GetParam().steps) {
        SCOPED_TRACE("step " + std::to_string(stepNo++));
        switch (step.kind) {
        case Step::Push:
            list.push_back(Entry{ZrWString(step.name), ZrWString(step.ns), step.id});
            break;
        case Step::Find:
            EXPECT_EQ(idOf(list.find(step.name, step.ns)), step.id);
            EXPECT_EQ(idOf(scanFind(list, step.name, step.ns)), step.id) << "the case itself";
            break;
        case Step::FindExact:
            EXPECT_EQ(idOf(list.findExact(step.name, step.ns)), step.id);
            EXPECT_EQ(idOf(scanFindExact(list, step.name, step.ns)), step.id) << "the case itself";
            break;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Lookups, NamedListCases, ::testing::ValuesIn(kListCases),
                         [](const auto& row) { return std::string(row.param.label); });

// Random pushes and clears over a small pool of colliding names; after every
// operation every name of the pool, in every namespace, is looked up both ways.
TEST(NamedListLookups, RandomOperationsAnswerLikeAScan) {
    const std::u16string names[] = {u"T",     u"U",   u"anon0", u"anon1",     u"anonX",
                                    u"Anon0", u"ano", u"",      u"anonymousT"};
    const std::u16string spaces[] = {u"", u"urn:a", u"urn:b"};
    for (unsigned seed : {1u, 2u, 3u, 4u}) {
        std::mt19937 rng(seed);
        NamedList<Entry> list;
        int nextId = 0;
        for (int op = 0; op < 1500; ++op) {
            const unsigned roll = rng() % 100;
            if (roll < 2) {
                list.clear();
            } else {
                list.push_back(Entry{ZrWString(names[rng() % std::size(names)]),
                                     ZrWString(spaces[rng() % std::size(spaces)]), nextId++});
            }
            for (const auto& name : names) {
                for (const auto& ns : spaces) {
                    ASSERT_EQ(idOf(list.find(name, ns)), idOf(scanFind(list, name, ns)))
                        << "seed " << seed << " op " << op << " find " << utf8(name) << " in '"
                        << utf8(ns) << "'";
                    ASSERT_EQ(idOf(list.findExact(name, ns)), idOf(scanFindExact(list, name, ns)))
                        << "seed " << seed << " op " << op << " findExact " << utf8(name) << " in '"
                        << utf8(ns) << "'";
                }
            }
        }
    }
}

// The pool hands out one shared text per distinct text, also across its growth:
// field types are kept by that identity, and equal texts with two identities would
// only cost lookups, but two texts with one identity would mistype fields. Texts
// differing only in their last unit, or in length, sit side by side.
TEST(NamePool, OneIdentityPerTextThroughGrowth) {
    ZrNamePool pool;
    std::vector<std::u16string> texts;
    for (int i = 0; i < 5000; ++i) {
        std::u16string text = wide("name" + std::to_string(i)).str();
        texts.push_back(text);
        texts.push_back(text + u'\0');
        texts.push_back(text.substr(0, text.size() - 1) + u'\xFFFF');
    }
    std::vector<ZrName> first;
    for (const auto& text : texts)
        first.push_back(pool.intern(text));
    std::set<const void*> identities;
    for (size_t i = 0; i < texts.size(); ++i) {
        const ZrName again = pool.intern(texts[i]);
        ASSERT_EQ(again.identity(), first[i].identity()) << i;
        ASSERT_EQ(again.view(), std::u16string_view(texts[i])) << i;
        identities.insert(again.identity());
    }
    // As many identities as distinct texts: the variants of name0 to name9 with their
    // last unit replaced are one text.
    EXPECT_EQ(identities.size(), std::set<std::u16string>(texts.begin(), texts.end()).size());
    EXPECT_TRUE(pool.intern(u"").empty());
    // Names outlive the pool's table.
    pool.clear();
    EXPECT_EQ(first[3].view(), std::u16string_view(texts[3]));
}

// A set answers like std::set at every size, across the change from the texts held in
// place to a table and after being cleared and used again (as the field names of one
// record after another are).
TEST(TextSet, AgreesWithAnOrderedSetAcrossGrowthAndReuse) {
    std::vector<std::u16string> texts;
    for (int i = 0; i < 200; ++i)
        texts.push_back(wide("field" + std::to_string(i % 70)).str()); // repeats from 70 on
    texts.push_back(u"");
    texts.push_back(std::u16string(u"field1") + u'\0');
    ZrTextSet set;
    for (size_t size : {0, 1, 8, 9, 33, 203, 5}) {
        set.clear();
        std::set<std::u16string> expected;
        for (size_t i = 0; i < size && i < texts.size(); ++i) {
            set.insert(texts[texts.size() - 1 - i]);
            expected.insert(texts[texts.size() - 1 - i]);
        }
        for (const auto& text : texts)
            ASSERT_EQ(set.contains(text), expected.count(text) == 1) << size << " " << text.size();
        EXPECT_FALSE(set.contains(u"absent"));
    }
}

// --- whole reads ----------------------------------------------------------------------

// Every lookup record building can make on the model of a finished read (each name
// a component or declaration refers to, and each component's own name asked in
// every namespace of the read) gives the entry a scan gives. Record building only
// looks names up in these lists, so the read's records are those a scanning
// reader would build.
void expectLookupsAgreeWithScans(const SchemaModel& model) {
    auto& complexTypes = model.complexTypes;
    auto& simpleTypes = model.simpleTypes;
    auto& globals = model.globalElements;

    // Every name met, each asked in every namespace met: a lookup may carry any of them.
    std::set<std::u16string> names;
    std::set<std::u16string> spaces{u""};
    auto addKey = [&](const ZrName& name, const ZrName& ns) {
        names.emplace(name.view());
        spaces.emplace(ns.view());
    };
    auto addDeclaration = [&](const ElementDef& e) {
        addKey(e.typeName, e.typeNs);
        addKey(e.refName, e.refNs);
        addKey(e.groupName, e.groupNs);
        addKey(e.name, e.nameNs);
    };
    for (const ElementDef& e : globals)
        addDeclaration(e);
    for (const ComplexTypeDef& t : complexTypes) {
        addKey(t.name, t.nameNs);
        addKey(t.baseName, t.baseNs);
        for (const ElementDef& e : t.content)
            addDeclaration(e);
    }
    for (const SimpleTypeDef& t : simpleTypes) {
        addKey(t.name, t.nameNs);
        addKey(t.baseName, t.baseNs);
    }
    for (const auto& name : names) {
        for (const auto& ns : spaces) {
            const std::u16string_view n = name;
            const std::u16string_view s = ns;
            ASSERT_EQ(complexTypes.find(n, s), scanFind(complexTypes, n, s))
                << "complex type " << utf8(name) << " in '" << utf8(ns) << "'";
            ASSERT_EQ(complexTypes.find(n, s, 1), scanFind(complexTypes, n, s, 1))
                << "group " << utf8(name) << " in '" << utf8(ns) << "'";
            ASSERT_EQ(simpleTypes.find(n, s), scanFind(simpleTypes, n, s))
                << "simple type " << utf8(name) << " in '" << utf8(ns) << "'";
            ASSERT_EQ(globals.findExact(n, s), scanFindExact(globals, n, s))
                << "global declaration " << utf8(name) << " in '" << utf8(ns) << "'";
            ASSERT_EQ(complexTypes.findExact(n, s), scanFindExact(complexTypes, n, s));
            ASSERT_EQ(simpleTypes.findExact(n, s), scanFindExact(simpleTypes, n, s));
            ASSERT_EQ(globals.find(n, s), scanFind(globals, n, s));
        }
    }
}

// The main document is in urn:a; the part it includes switches the target namespace
// to urn:b, which therefore holds while records are built: names in urn:a carry the
// prefix a, names in urn:b none.
constexpr const char* kStressMain = R"(<?xml version="1.0"?>
<xs:schema xmlns:xs="http://www.w3.org/2001/XMLSchema" xmlns:a="urn:a" xmlns:b="urn:b"
           targetNamespace="urn:a">
  <xs:include schemaLocation="part.xsd"/>
  <xs:complexType name="Dup"><xs:sequence>
    <xs:element name="first" type="xs:int"/>
  </xs:sequence></xs:complexType>
  <xs:complexType name="Dup"><xs:sequence>
    <xs:element name="second" type="xs:int"/>
  </xs:sequence></xs:complexType>
  <xs:group name="Shared"><xs:sequence>
    <xs:element name="fromGroupA" type="xs:string"/>
  </xs:sequence></xs:group>
  <xs:complexType name="Shared"><xs:sequence>
    <xs:element name="fromTypeA" type="xs:string"/>
  </xs:sequence></xs:complexType>
  <xs:simpleType name="Code"><xs:restriction base="xs:string">
    <xs:maxLength value="3"/>
  </xs:restriction></xs:simpleType>
  <xs:complexType name="anonymousParty"><xs:sequence>
    <xs:element name="partyId" type="xs:string"/>
  </xs:sequence></xs:complexType>
  <xs:simpleType name="anon1"><xs:restriction base="xs:string">
    <xs:maxLength value="9"/>
  </xs:restriction></xs:simpleType>
  <xs:complexType name="Money"><xs:simpleContent><xs:extension base="xs:decimal">
    <xs:attribute name="currency" type="a:Code"/>
  </xs:extension></xs:simpleContent></xs:complexType>
  <xs:element name="root"><xs:complexType><xs:sequence>
    <xs:element name="dup" type="a:Dup"/>
    <xs:element name="sharedA" type="a:Shared"/>
    <xs:group ref="a:Shared"/>
    <xs:element name="sharedB" type="b:Shared"/>
    <xs:group ref="b:Shared"/>
    <xs:element name="codeA" type="a:Code"/>
    <xs:element name="codeB" type="b:Code"/>
    <xs:element name="party" type="b:anonymousParty"/>
    <xs:element name="price" type="a:Money"/>
    <xs:element name="tax" type="a:Money"/>
    <xs:element name="later" type="a:anon1"/>
    <xs:element ref="b:item"/>
    <xs:element ref="a:item"/>
  </xs:sequence></xs:complexType></xs:element>
  <xs:element name="item" type="xs:int"/>
  <xs:element name="item" type="xs:string"/>
</xs:schema>
)";

constexpr const char* kStressPart = R"(<?xml version="1.0"?>
<xs:schema xmlns:xs="http://www.w3.org/2001/XMLSchema" targetNamespace="urn:b">
  <xs:complexType name="Shared"><xs:sequence>
    <xs:element name="fromTypeB" type="xs:string"/>
  </xs:sequence></xs:complexType>
  <xs:group name="Shared"><xs:sequence>
    <xs:element name="fromGroupB" type="xs:string"/>
  </xs:sequence></xs:group>
  <xs:simpleType name="Code"><xs:restriction base="xs:string">
    <xs:maxLength value="7"/>
  </xs:restriction></xs:simpleType>
  <xs:complexType name="Dup"><xs:sequence>
    <xs:element name="inB" type="xs:int"/>
  </xs:sequence></xs:complexType>
  <xs:element name="item" type="xs:date"/>
</xs:schema>
)";

// Derived by hand from the lookup rule:
// - a:Dup is defined twice: the first definition (field first) is used;
// - a:Shared and b:Shared each name a group and a type: group references find the
//   group, type references the type, whichever ended first;
// - b:anonymousParty finds the type of urn:a, since the name begins with "anon";
// - price and tax have simple content: each text field is typed by the record's own
//   base (decimal), whatever the author names a type (here anon1, which later names);
// - b:item and a:item: the urn:b declaration (a date) and the first urn:a one (int).
constexpr const char* kStressRecords =
    "a:root(0): a:dup Record(2) notnull, a:sharedA Record(2) notnull, "
    "a:fromGroupA string(16), a:sharedB Record(2) notnull, fromGroupB string(16), "
    "a:codeA string(16) 3/0/0, a:codeB string(16) 7/0/0, a:party Record(2) notnull, "
    "a:price Record(2) notnull, a:tax Record(2) notnull, a:later string(16) 9/0/0, "
    "item date(57), a:item int(48) 0/10/0\n"
    "a:dup(0): a:first int(48) 0/10/0\n"
    "a:sharedA(0): a:fromTypeA string(16)\n"
    "a:sharedB(0): fromTypeB string(16)\n"
    "a:party(0): a:partyId string(16)\n"
    "a:price(0): a:price decimal(20) 0/16/2, a:currency string attribute(272) 3/0/0\n"
    "a:tax(0): a:tax decimal(20) 0/16/2, a:currency string attribute(272) 3/0/0\n";

TEST(IndexedReads, StressSchemaGivesTheRecordsOfTheFirstMatchRule) {
    TempDir dir;
    const std::string mainPath = dir.write("main.xsd", kStressMain);
    dir.write("part.xsd", kStressPart);
    LogCapture log;
    ZrXmlSchemaBrowser browser;
    ASSERT_TRUE(browser.ReadSchema(wide(mainPath).c_str(), false)) << log.lines();
    EXPECT_EQ(zrtest::dumpRecords(browser.Records()), kStressRecords);
    EXPECT_EQ(log.lines(), "");
    // Building records adds nothing to the model.
    EXPECT_EQ(browser.Model().simpleTypes.size(), 3u);
    expectLookupsAgreeWithScans(browser.Model());
}

} // namespace
