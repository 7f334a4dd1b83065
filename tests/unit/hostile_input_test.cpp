// Hostile input: documents built to exhaust memory, time or the stack, to make the
// reader fetch something it must not, or that are not schemas at all. Every row
// states the whole outcome of a read as the host sees it: status, records and the
// messages logged. Large inputs are generated here rather than stored.
#include "ZrXmlSchemaDict.h"
#include "model_dump.h"

#include <arpa/inet.h>
#include <cerrno>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <netinet/in.h>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <unistd.h>
#include <vector>

namespace {

using namespace zrtest;

// A TCP port on the loopback interface that listens and never answers. Documents
// point their network references at it; a connection waiting on it afterwards
// means the reader tried to fetch something.
struct Listener {
    int fd = socket(AF_INET, SOCK_STREAM, 0);
    std::string port;

    Listener() {
        sockaddr_in addr{};
        addr.sin_family = AF_INET;
        addr.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t len = sizeof addr;
        if (fd < 0 || bind(fd, reinterpret_cast<sockaddr*>(&addr), len) != 0 ||
            listen(fd, 8) != 0 || getsockname(fd, reinterpret_cast<sockaddr*>(&addr), &len) != 0 ||
            fcntl(fd, F_SETFL, O_NONBLOCK) != 0)
            throw std::runtime_error("cannot listen on the loopback interface");
        port = std::to_string(ntohs(addr.sin_port));
    }

    ~Listener() { close(fd); }

    // True when a connection has been made since the last call.
    bool contacted() const {
        const int conn = accept(fd, nullptr, nullptr);
        if (conn < 0)
            return errno != EAGAIN && errno != EWOULDBLOCK;
        close(conn);
        return true;
    }
};

// `text` `count` times, "{i}" standing for the repetition's number and "{j}" for the
// next one's.
std::string repeat(const std::string& text, size_t count) {
    std::string out;
    const bool numbered = text.find("{i}") != std::string::npos;
    for (size_t i = 0; i < count; ++i)
        out += numbered ? replaceAll(replaceAll(text, "{i}", std::to_string(i)), "{j}",
                                     std::to_string(i + 1))
                        : text;
    return out;
}

// A schema whose one record "root" holds `content` in a sequence, after the field a,
// and `more` after it.
std::string rootDoc(const std::string& content, const std::string& doctype = "",
                    const std::string& more = "") {
    std::string doc =
        schemaDoc("<xs:element name=\"root\"><xs:complexType><xs:sequence>\n"
                  "<xs:element name=\"a\" type=\"xs:string\"/>" +
                  content + "\n</xs:sequence></xs:complexType></xs:element>\n" + more);
    if (!doctype.empty())
        doc.insert(doc.find('\n') + 1, doctype + "\n");
    return doc;
}

// Entities named "{name}0" to "{name}{levels}", each but the first naming the one
// before `fanOut` times; `reference` is how they are named ("&" or "&#37;" for
// parameter entities, written through a character reference so that each
// declaration's replacement text holds the next level's references).
std::string nestedEntities(const std::string& name, int levels, int fanOut, const std::string& leaf,
                           const std::string& reference = "&") {
    const std::string kind = reference == "&" ? "" : "% ";
    std::string dtd = "<!DOCTYPE xs:schema [\n<!ENTITY " + kind + name + "0 \"" + leaf + "\">\n";
    for (int i = 1; i <= levels; ++i)
        dtd += "<!ENTITY " + kind + name + std::to_string(i) + " \"" +
               repeat(reference + name + std::to_string(i - 1) + ";", fanOut) + "\">\n";
    return dtd + (kind.empty() ? "" : "%" + name + std::to_string(levels) + ";\n") + "]>";
}

// Simple types P0, P1, ... restricting string with the patterns given.
std::string patternTypes(const std::vector<std::string>& patterns) {
    std::string out;
    for (size_t i = 0; i < patterns.size(); ++i)
        out += "<xs:simpleType name=\"P" + std::to_string(i) +
               "\"><xs:restriction base=\"xs:string\"><xs:pattern value=\"" + patterns[i] +
               "\"/></xs:restriction></xs:simpleType>";
    return out;
}

// A field of each of them.
const std::string kPatternField = "<xs:element name=\"f{i}\" type=\"P{i}\"/>";

std::string abbreviate(const ZrWString& name) {
    if (name.length() <= 40)
        return utf8(name);
    return utf8(name.view().substr(0, 8)) + "...[" + std::to_string(name.length()) + "]";
}

// One line per record: "name: field/alias/precision ...", long names abbreviated.
std::string dumpRecords(const ZrRecordList& records) {
    std::string out;
    for (int r = 0; r < records.Count(); ++r) {
        out += abbreviate(records[r]->name) + ":";
        for (int f = 0; f < records[r]->FieldCount(); ++f) {
            const ZrField* field = records[r]->GetFieldbyPos(f);
            out += " " + abbreviate(field->FieldName()) + "/" + field->DataType().Alias() + "/" +
                   std::to_string(field->DataType().Precision());
        }
        out += "\n";
    }
    return out;
}

constexpr size_t kDeep = 100000;
constexpr size_t kChain = 20000;

const std::string kRoot = "0\nroot: a/string/0";
const std::string kStopped = "19\n4 4 Schema: Error: Reading file $DIR/main.xsd stopped: ";
const std::string kOverBudget =
    kStopped + "entity references expand the document beyond 4194304 characters";
const std::string kNest =
    "19\n4 4 Schema: Error: Declarations and types nested deeper than 10000 in file "
    "$DIR/main.xsd\n";
const std::string kFatal = "19\n8 4 Schema: Fatal: At line 1, column ";

struct HostileCase {
    const char* name;
    // "status\nrecords\nmessages", messages as LogCapture lines; '*' stands for any
    // text, "$DIR" for the folder of the documents and "$PORT" for the listening port.
    std::string expected;
    // The pieces of main.xsd as rootDoc takes them ("$DIR" and "$PORT" as above) ...
    std::string content{};
    std::string doctype{};
    std::string more{};
    // ... or the whole document, when it is generated.
    std::string (*generate)() = nullptr;
    // The entries of a catalog the read is given; "-": a catalog that is missing.
    std::string catalog{};
};

const HostileCase kCases[] = {
    // Entity expansion.
    {"BillionLaughsInAttribute", kOverBudget + " (at line 16, column 93)\n",
     "<xs:element name=\"b\" type=\"xs:string\" default=\"&lol9;\"/>",
     nestedEntities("lol", 9, 10, "lol")},
    {"BillionLaughsInContent", kOverBudget + " (at line 16, column 61)\n",
     "<xs:annotation>&lol9;</xs:annotation>", nestedEntities("lol", 9, 10, "lol")},
    {"ParameterEntityLaughs",
     kStopped + "parameter entity 'pe1' refers to other parameter entities\n", "",
     nestedEntities("pe", 9, 10, "<!--x-->", "&#37;")},
    {"ParameterEntityRepeated",
     kStopped + "the document type declaration holds more than 10000 items\n", "",
     "<!DOCTYPE xs:schema [\n<!ENTITY % c \"<!---->\">\n" + repeat("%c;", 1000000) + "\n]>"},
    {"LongEntityRepeated",
     "19\n4 4 Schema: Error: Entity 'big' in file $DIR/main.xsd is longer than 4096 "
     "characters\n",
     "<xs:element name=\"b\" type=\"xs:string\" default=\"" + repeat("&big;", 900) + "\"/>",
     "<!DOCTYPE xs:schema [<!ENTITY big \"" + std::string(100000, 'x') + "\">]>"},
    // Entities that build a pattern for IPv6 addresses bottom-up from small parts,
    // the way type libraries write grammars: some two thousand expansions in all, a
    // few dozen kilobytes of text. Predefined entities cost nothing against the
    // bound, however many there are.
    {"EntitiesWithinBounds",
     kRoot + " fromEntity/int/10 f0/string/45 f1/string/0 f2/string/0 f3/string/45\n",
     "&decl;" + repeat(kPatternField, 4) + "<xs:annotation><xs:documentation>" +
         repeat("&lt;&amp;&#65;", 2 * kSchemaEntityGrowthFloor / kSchemaEntityExpansionCost) +
         "</xs:documentation></xs:annotation>",
     "<!DOCTYPE xs:schema [\n"
     "<!ENTITY % empty \"\">\n%empty;\n"
     "<!ENTITY decl \"<xs:element name='fromEntity' type='xs:int'/>\">\n"
     "<!ENTITY d \"[0-9]\">\n"
     "<!ENTITY d \"[0-7]\">\n" // a second declaration of a name is ignored
     "<!ENTITY h \"(&d;|[A-Fa-f])\">\n"
     "<!ENTITY h16 \"(&h;){1,4}\">\n"
     "<!ENTITY octet \"(&d;|[1-9]&d;|1&d;&d;|2[0-4]&d;|25[0-5])\">\n"
     "<!ENTITY v4 \"&octet;\\.&octet;\\.&octet;\\.&octet;\">\n"
     "<!ENTITY ls32 \"(&h16;:&h16;|&v4;)\">\n"
     "<!ENTITY v6 \"((&h16;:){6}&ls32;|::(&h16;:){5}&ls32;|(&h16;)?::(&h16;:){4}&ls32;|"
     "((&h16;:)?&h16;)?::(&h16;:){3}&ls32;|((&h16;:){0,2}&h16;)?::(&h16;:){2}&ls32;|"
     "((&h16;:){0,3}&h16;)?::&h16;:&ls32;|((&h16;:){0,4}&h16;)?::&ls32;|"
     "((&h16;:){0,5}&h16;)?::&h16;|((&h16;:){0,6}&h16;)?::)\">\n"
     "<!ENTITY empty \"\">\n"
     "<!ENTITY host \"(\\[&v6;\\]|&v4;|[a-z0-9.\\-]+)&empty;\">\n"
     "]>",
     patternTypes({"&v6;", "&host;", "&host;(:&d;+)?", "&v4;|&v6;"})},
    // A hundred thousand expansions in one attribute value, producing little.
    {"NestedEntitiesInAttribute", kOverBudget + "*",
     "<xs:element name=\"b\" type=\"xs:string\" default=\"" + repeat("&n5;", 13) + "\"/>",
     nestedEntities("n", 5, 10, "lol")},
    // Expansions that produce nothing still cost.
    {"EmptyEntitiesInContent", kOverBudget + "*", "<xs:annotation>&n9;</xs:annotation>",
     nestedEntities("n", 9, 10, "")},
    {"EmptyEntitiesInAttributes", kOverBudget + "*", repeat("<xs:annotation id=\"&n3;\"/>", 10000),
     nestedEntities("n", 3, 10, "")},
    // A long entity named from many start tags, and from much content.
    {"LongEntityInManyAttributes", kOverBudget + "*", repeat("<xs:annotation id=\"&big;\"/>", 2000),
     "<!DOCTYPE xs:schema [<!ENTITY big \"" + std::string(4000, 'x') + "\">]>"},
    {"LongEntityInMuchContent", kOverBudget + "*",
     "<xs:annotation>" + repeat("&big;", 2000) + "</xs:annotation>",
     "<!DOCTYPE xs:schema [<!ENTITY big \"" + std::string(4000, 'x') + "\">]>"},

    // Nothing outside the schema documents is read or fetched. The external subsets
    // are malformed: had either been read, the read would fail.
    {"ExternalEntity",
     "19\n4 4 Schema: Error: External entity 'http://127.0.0.1:$PORT/e.xml' in file "
     "$DIR/main.xsd is not read\n",
     "&ext;", "<!DOCTYPE xs:schema [<!ENTITY ext SYSTEM \"http://127.0.0.1:$PORT/e.xml\">]>"},
    {"ExternalParameterEntity",
     "19\n4 4 Schema: Error: External entity '$DIR/broken.dtd' in file $DIR/main.xsd is not "
     "read\n",
     "", "<!DOCTYPE xs:schema [<!ENTITY % p SYSTEM \"$DIR/broken.dtd\"> %p;]>"},
    {"ExternalDtd", kRoot + "\n", "", "<!DOCTYPE xs:schema SYSTEM \"$DIR/broken.dtd\">"},
    {"ExternalDtdOverTheNetwork", kRoot + "\n", "",
     "<!DOCTYPE xs:schema PUBLIC \"-//X//DTD X//EN\" \"http://127.0.0.1:$PORT/ext.dtd\">"},
    {"ImportOverTheNetwork", kRoot + "\n", "", "",
     "<xs:import namespace=\"urn:x\" schemaLocation=\"http://127.0.0.1:$PORT/imp.xsd\"/>"},
    // Network locations are read only where a catalog maps them to a local file.
    {"IncludeRewrittenByTheCatalog", kRoot + "\nincluded: b/int/10\n", "", "",
     "<xs:include schemaLocation=\"http://127.0.0.1:$PORT/mapped/types.xsd\"/>", nullptr,
     "<rewriteURI uriStartString=\"http://127.0.0.1:$PORT/mapped/\" rewritePrefix=\"local/\"/>"},
    {"IncludeMappedToTheNetwork",
     "19\n4 4 Schema: Error: Include of 'http://127.0.0.1:$PORT/x.xsd' in file $DIR/main.xsd "
     "is not read: the catalog maps it to 'http://127.0.0.1:$PORT/elsewhere.xsd', which is not "
     "a local file\n",
     "", "", "<xs:include schemaLocation=\"http://127.0.0.1:$PORT/x.xsd\"/>", nullptr,
     "<uri name=\"http://127.0.0.1:$PORT/x.xsd\" uri=\"http://127.0.0.1:$PORT/elsewhere.xsd\"/>"},
    {"IncludeNotMapped",
     "19\n4 4 Schema: Error: Include of 'http://127.0.0.1:$PORT/other.xsd' in file "
     "$DIR/main.xsd is not read: it is not a local file, and no catalog maps it to one\n",
     "", "", "<xs:include schemaLocation=\"http://127.0.0.1:$PORT/other.xsd\"/>", nullptr,
     "<uri name=\"urn:x\" uri=\"x.xsd\"/>"},
    {"IncludeByFileUri", kRoot + "\nincluded: b/int/10\n", "", "",
     "<xs:include schemaLocation=\"file://$DIR/local/types%2Exsd\"/>"},
    {"MissingCatalog",
     "19\n4 4 Schema: Error: Catalog file $DIR/none.xml is not read: it cannot be opened\n", "", "",
     "<xs:include schemaLocation=\"local/types.xsd\"/>", nullptr, "-"},

    // Depth: declarations, types and groups nest up to the reader's bound, and
    // 100,000 levels end there, not in a stack overflow; constructs without a handler
    // and skipped subtrees nest freely.
    {"GroupsNestedToTheBound", kRoot + "\n", "", "", "",
     [] { return rootDoc("", "", repeat("<xs:group>", 10000) + repeat("</xs:group>", 10000)); }},
    {"GroupsNestedBeyondTheBound", kNest, "", "", "",
     [] { return rootDoc("", "", repeat("<xs:group>", 10001) + repeat("</xs:group>", 10001)); }},
    {"DeepAnonymousTypes", kNest, "", "", "",
     [] {
         return rootDoc(repeat("<xs:element name=\"e\"><xs:complexType><xs:sequence>", kDeep) +
                        repeat("</xs:sequence></xs:complexType></xs:element>", kDeep));
     }},
    {"DeepSimpleTypes", kNest, "", "", "",
     [] {
         return rootDoc(
             repeat("<xs:element name=\"e\"><xs:simpleType><xs:restriction base=\"xs:string\">",
                    kDeep) +
             repeat("</xs:restriction></xs:simpleType></xs:element>", kDeep));
     }},
    {"DeepCompositors", kRoot + " deep/int/10\n", "", "", "",
     [] {
         return rootDoc(repeat("<xs:sequence>", kDeep) +
                        "<xs:element name=\"deep\" type=\"xs:int\"/>" +
                        repeat("</xs:sequence>", kDeep));
     }},
    {"DeepAnnotation", kRoot + "\n", "", "", "",
     [] {
         return rootDoc("<xs:annotation>" + repeat("<xs:documentation>", kDeep) +
                        repeat("</xs:documentation>", kDeep) + "</xs:annotation>");
     }},

    // Chains of references, 20,000 long, end at the record builder's depth bound.
    {"NestedRecordChain", "19\n4 0 Schema nesting deeper than 1000 levels at e998\n", "", "", "",
     [] {
         return rootDoc("<xs:element name=\"r\" type=\"R0\"/>", "",
                        repeat("<xs:complexType name=\"R{i}\"><xs:sequence><xs:element "
                               "name=\"e{i}\" type=\"R{j}\"/></xs:sequence></xs:complexType>",
                               kChain));
     }},
    {"ExtensionChain", "19\n4 0 Schema nesting deeper than 1000 levels at T999\n", "", "", "",
     [] {
         return rootDoc("<xs:element name=\"r\" type=\"T0\"/>", "",
                        repeat("<xs:complexType name=\"T{i}\"><xs:complexContent><xs:extension "
                               "base=\"T{j}\"/></xs:complexContent></xs:complexType>",
                               kChain));
     }},
    {"GroupReferenceChain", "19\n4 0 Schema nesting deeper than 1000 levels at G999\n", "", "", "",
     [] {
         return rootDoc("<xs:group ref=\"G0\"/>", "",
                        repeat("<xs:group name=\"G{i}\"><xs:sequence><xs:group ref=\"G{j}\"/>"
                               "</xs:sequence></xs:group>",
                               kChain));
     }},
    {"ElementReferenceChain", "19\n4 0 Schema nesting deeper than 1000 levels at E999\n", "", "",
     "",
     [] {
         return rootDoc("<xs:element ref=\"E0\"/>", "",
                        repeat("<xs:element name=\"E{i}\" ref=\"E{j}\"/>", kChain));
     }},
    {"SimpleTypeBaseChain",
     "19\n4 0 Schema nesting deeper than 1000 levels at S999\n"
     "4 0 Error resolving simple type S999\n*",
     "", "", "",
     [] {
         return rootDoc("<xs:element name=\"f\" type=\"S0\"/>", "",
                        repeat("<xs:simpleType name=\"S{i}\"><xs:restriction base=\"S{j}\"/>"
                               "</xs:simpleType>",
                               kChain));
     }},

    // Cycles.
    {"GroupCycleThroughThree", "19\n4 0 Circular reference to group g1\n", "<xs:group ref=\"g1\"/>",
     "",
     "<xs:group name=\"g1\"><xs:sequence><xs:element name=\"x\" type=\"xs:int\"/><xs:group "
     "ref=\"g2\"/></xs:sequence></xs:group>\n"
     "<xs:group name=\"g2\"><xs:sequence><xs:group ref=\"g3\"/></xs:sequence></xs:group>\n"
     "<xs:group name=\"g3\"><xs:sequence><xs:group ref=\"g1\"/></xs:sequence></xs:group>"},
    {"ElementReferenceCycle", "19\n4 0 Circular reference to element :p\n",
     "<xs:element ref=\"p\"/>", "",
     "<xs:element name=\"p\" ref=\"q\"/><xs:element name=\"q\" ref=\"p\"/>"},
    {"ExtensionCycle", "19\n4 0 Circular base type chain at complex type A\n",
     "<xs:element name=\"x\" type=\"A\"/>", "",
     "<xs:complexType name=\"A\"><xs:complexContent><xs:extension base=\"B\"><xs:sequence>"
     "<xs:element name=\"a\" type=\"xs:int\"/></xs:sequence></xs:extension></xs:complexContent>"
     "</xs:complexType><xs:complexType name=\"B\"><xs:complexContent><xs:extension "
     "base=\"A\"/></xs:complexContent></xs:complexType>"},
    {"SimpleTypeBaseCycle",
     "19\n4 0 Circular base type chain at simple type s1\n"
     "4 0 Error resolving simple type s1\n"
     "4 0 Error resolving simple type s2\n"
     "4 0 Error resolving simple type s1\n"
     "4 0 Lookup of type 's1' (ns '') failed for field 'f'\n",
     "<xs:element name=\"f\" type=\"s1\"/>", "",
     "<xs:simpleType name=\"s1\"><xs:restriction base=\"s2\"/></xs:simpleType>"
     "<xs:simpleType name=\"s2\"><xs:restriction base=\"s1\"/></xs:simpleType>"},

    // Size.
    {"TenMegabytePattern", kRoot + " f0/string/2\n", "", "", "",
     [] { return rootDoc(repeat(kPatternField, 1), "", patternTypes({repeat("ab|", 3500000)})); }},
    {"TenMegabyteNestedPattern", kRoot + " f0/string/0\n", "", "", "",
     [] {
         return rootDoc(repeat(kPatternField, 1), "", patternTypes({std::string(10 << 20, '(')}));
     }},
    {"QuantifiersBeyondRange", kRoot + " f/string/2147483647 g/int/10\n",
     "<xs:element name=\"f\" type=\"L\"/><xs:element name=\"g\" type=\"N\"/>", "",
     "<xs:simpleType name=\"L\"><xs:restriction base=\"xs:string\"><xs:maxLength "
     "value=\"99999999999999999999\"/><xs:pattern value=\"a{99999999999}b{4294967297}\"/>"
     "</xs:restriction></xs:simpleType><xs:simpleType name=\"N\"><xs:restriction "
     "base=\"xs:int\"><xs:minInclusive value=\"-99999999999999999999\"/></xs:restriction>"
     "</xs:simpleType>"},
    {"MegabyteNames", "0\nnnnnnnnn...[1048576]: ffffffff...[1048576]/int/10\n", "", "", "",
     [] {
         return schemaDoc("<xs:element name=\"" + std::string(1 << 20, 'n') +
                          "\"><xs:complexType><xs:sequence><xs:element name=\"" +
                          std::string(1 << 20, 'f') +
                          "\" type=\"xs:int\"/></xs:sequence></xs:complexType></xs:element>");
     }},

    // Not text, not XML.
    {"InvalidUtf8",
     kFatal + "22 of file $DIR/main.xsd: invalid byte '(' at position 2 of a 2-byte sequence*",
     "<xs:element name=\"a\xC3\x28z\" type=\"xs:int\"/>"},
    {"LoneSurrogateInUtf16",
     kFatal + "116 of file $DIR/main.xsd: leading surrogate character is not followed by a "
              "legal second character*",
     "", "", "",
     [] {
         std::u16string doc = u"\uFEFF<?xml version=\"1.0\" encoding=\"UTF-16\"?><xs:schema "
                              u"xmlns:xs=\"http://www.w3.org/2001/XMLSchema\"><xs:element "
                              u"name=\"a?b\" type=\"xs:int\"/></xs:schema>";
         doc[doc.find(u"?b")] = 0xD800;
         return std::string(reinterpret_cast<const char*>(doc.data()), doc.size() * 2);
     }},
    {"BinaryBytes", kFatal + "1 of file $DIR/main.xsd: *", "", "", "",
     [] {
         std::string bytes;
         for (int i = 0; i < 1024; ++i)
             bytes += static_cast<char>(i % 256);
         return bytes;
     }},
    {"EmptyFile", kFatal + "1 of file $DIR/main.xsd: invalid document structure*", "", "", "",
     [] { return std::string(); }},
};

void PrintTo(const HostileCase& row, std::ostream* os) { *os << row.name; }

class HostileInput : public ::testing::TestWithParam<HostileCase> {};

TEST_P(HostileInput, EndsWithRecordsOrALoggedReason) {
    const HostileCase& c = GetParam();
    static const Listener listener;
    TempDir dir;
    auto place = [&](const std::string& text) {
        return replaceAll(replaceAll(text, "$DIR", dir.path().string()), "$PORT", listener.port);
    };
    dir.write("broken.dtd", "<!ENTITY broken");
    dir.write("local/types.xsd", schemaDoc("<xs:element name=\"included\"><xs:complexType>"
                                           "<xs:sequence><xs:element name=\"b\" type=\"xs:int\"/>"
                                           "</xs:sequence></xs:complexType></xs:element>"));
    const std::string path = dir.write(
        "main.xsd", c.generate ? c.generate() : place(rootDoc(c.content, c.doctype, c.more)));
    ZrXmlSchemaDict dict(nullptr);
    if (!c.catalog.empty()) {
        const std::string catalog =
            c.catalog == "-"
                ? place("$DIR/none.xml")
                : dir.write("catalog.xml",
                            "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:catalog\">" +
                                place(c.catalog) + "</catalog>");
        dict.SetOption(u"SchemaCatalog", wide(catalog).c_str());
    }
    listener.contacted();

    LogCapture log;
    const BATCHERR status = dict.ReadDictionary(path.c_str());
    const std::string outcome =
        std::to_string(status) + "\n" + dumpRecords(dict.RecordList()) + log.lines();
    EXPECT_TRUE(globMatch(place(c.expected), outcome)) << outcome;
    EXPECT_FALSE(listener.contacted()) << "the read opened a network connection";
}

INSTANTIATE_TEST_SUITE_P(Documents, HostileInput, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.name); });

} // namespace
