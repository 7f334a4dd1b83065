// The model's lookups by name go through an index; they must answer exactly what a
// first-match scan of the list from its start answers. Checked directly on
// NamedList against a plain scan, and on a whole read built to trip an index: names
// repeated across namespaces and within one, "anon" names, groups and types
// sharing a name. The name pool and text set under the model are checked here too.
#include "TestSupport.h"
#include "dictionary_support.h"

#include <gtest/gtest.h>
#include <random>
#include <set>
#include <string>
#include <vector>

namespace {

using zrtest::LogCapture;
using zrtest::TempDir;
using zrtest::utf8;
using zrtest::wide;

struct Entry {
    ZrWString name;
    ZrWString nameNs;
    int id = -1;
};

// The lookup rule written out as a scan: the first entry whose name equals the
// one sought and, unless `exact` or that name begins with "anon", whose namespace
// does too.
const Entry* scan(const NamedList<Entry>& list, std::u16string_view name, std::u16string_view ns,
                  bool exact) {
    const bool anyNs = !exact && name.substr(0, 4) == u"anon";
    for (const Entry& item : list)
        if (item.name.view() == name && (anyNs || item.nameNs.view() == ns))
            return &item;
    return nullptr;
}

// Ids of what find and findExact return, -1 for none.
int idOf(const Entry* e) { return e ? e->id : -1; }

// Random pushes and clears over a small pool of colliding names; after every
// operation every name of the pool, in every namespace, is looked up both ways.
TEST(NamedListLookups, RandomOperationsAnswerLikeAScan) {
    // Names beginning with "anon" and names that only look like them.
    const std::u16string names[] = {u"T",     u"U",   u"anon0", u"anon1",      u"anonX",
                                    u"Anon0", u"ano", u"",      u"anonymousT", u"xanon"};
    const std::u16string spaces[] = {u"", u"urn:a", u"urn:b"};
    for (unsigned seed : {1u, 2u, 3u, 4u}) {
        std::mt19937 rng(seed);
        NamedList<Entry> list;
        int nextId = 0;
        for (int op = 0; op < 1500; ++op) {
            if (rng() % 100 < 2)
                list.clear();
            else
                list.push_back(Entry{ZrWString(names[rng() % std::size(names)]),
                                     ZrWString(spaces[rng() % std::size(spaces)]), nextId++});
            for (const auto& name : names)
                for (const auto& ns : spaces)
                    for (bool exact : {false, true})
                        ASSERT_EQ(idOf(exact ? list.findExact(name, ns) : list.find(name, ns)),
                                  idOf(scan(list, name, ns, exact)))
                            << "seed " << seed << " op " << op << " " << utf8(name) << " in '"
                            << utf8(ns) << "', exact " << exact;
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
}

} // namespace
