// Hostile input: documents built to exhaust memory, time or the stack, to make the
// reader fetch something it must not, or that are not schemas at all. Every row
// states the whole outcome of a read as the host sees it: status, records and the
// messages logged (exact for the reader's own texts, a prefix for the parser's).
// Large inputs are generated here rather than stored.
#include "TestSupport.h"
#include "ZrXmlSchemaDict.h"

#include <arpa/inet.h>
#include <cerrno>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <netinet/in.h>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>
#include <vector>

namespace {

using zrtest::schemaDoc;
using zrtest::TempDir;

// A TCP port on the loopback interface that listens and never answers. Documents
// point their network references at it; a connection waiting on it afterwards
// means the reader tried to fetch something.
class Listener {
  public:
    static Listener& instance() {
        static Listener listener;
        return listener;
    }

    int port() const { return port_; }

    // True when a connection has been made since the last call.
    bool contacted() {
        const int conn = accept(fd_, nullptr, nullptr);
        if (conn < 0)
            return errno != EAGAIN && errno != EWOULDBLOCK;
        close(conn);
        return true;
    }

    Listener(const Listener&) = delete;
    Listener& operator=(const Listener&) = delete;

  private:
    Listener() {
        fd_ = socket(AF_INET, SOCK_STREAM, 0);
        sockaddr_in addr{};
        addr.sin_family = AF_INET;
        addr.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t len = sizeof addr;
        if (fd_ < 0 || bind(fd_, reinterpret_cast<sockaddr*>(&addr), len) != 0 ||
            listen(fd_, 8) != 0 ||
            getsockname(fd_, reinterpret_cast<sockaddr*>(&addr), &len) != 0 ||
            fcntl(fd_, F_SETFL, O_NONBLOCK) != 0)
            throw std::runtime_error("cannot listen on the loopback interface");
        port_ = ntohs(addr.sin_port);
    }

    ~Listener() { close(fd_); }

    int fd_ = -1;
    int port_ = 0;
};

std::string url(const std::string& file) {
    return "http://127.0.0.1:" + std::to_string(Listener::instance().port()) + "/" + file;
}

std::string repeat(const std::string& text, size_t count) {
    std::string out;
    out.reserve(text.size() * count);
    for (size_t i = 0; i < count; ++i)
        out += text;
    return out;
}

// A schema whose one record "root" holds `content` in a sequence, after the field a.
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

// Ten entities, each naming the one before ten times: 10^9 expansions of the last.
std::string laughs() {
    std::string dtd = "<!DOCTYPE xs:schema [\n<!ENTITY lol0 \"lol\">\n";
    for (int i = 1; i < 10; ++i)
        dtd += "<!ENTITY lol" + std::to_string(i) + " \"" +
               repeat("&lol" + std::to_string(i - 1) + ";", 10) + "\">\n";
    return dtd + "]>";
}

// The same with parameter entities, written through character references so that
// each declaration's replacement text holds the next level's references.
std::string parameterLaughs() {
    std::string dtd = "<!DOCTYPE xs:schema [\n<!ENTITY % pe0 \"<!--x-->\">\n";
    for (int i = 1; i < 10; ++i)
        dtd += "<!ENTITY % pe" + std::to_string(i) + " \"" +
               repeat("&#37;pe" + std::to_string(i - 1) + ";", 10) + "\">\n";
    return dtd + "%pe9;\n]>";
}

// Entities that build a pattern for IPv6 addresses bottom-up from small parts, the
// way type libraries write grammars: some two thousand expansions in all, a few
// dozen kilobytes of text.
std::string grammarEntities() {
    return "<!DOCTYPE xs:schema [\n"
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
           "]>";
}

// Entities that each name the one before `fanOut` times, `levels` deep, the first
// expanding to `leaf`.
std::string nestedEntities(int levels, int fanOut, const std::string& leaf) {
    std::string dtd = "<!DOCTYPE xs:schema [\n<!ENTITY n0 \"" + leaf + "\">\n";
    for (int i = 1; i <= levels; ++i)
        dtd += "<!ENTITY n" + std::to_string(i) + " \"" +
               repeat("&n" + std::to_string(i - 1) + ";", fanOut) + "\">\n";
    return dtd + "]>";
}

const std::string kOverBudget = "entity references expand the document beyond 4194304 characters";

// A simple type "P" restricting string with `pattern`, and a field f of that type.
std::string patternDoc(const std::string& pattern) {
    return rootDoc(
        "<xs:element name=\"f\" type=\"P\"/>", "",
        "<xs:simpleType name=\"P\"><xs:restriction base=\"xs:string\"><xs:pattern value=\"" +
            pattern + "\"/></xs:restriction></xs:simpleType>");
}

constexpr size_t kDeep = 100000;
constexpr size_t kChain = 20000;

struct Expected {
    int severity;
    int code;
    // "{dir}" stands for the folder the documents were written to, "{port}" for the
    // listening port.
    std::string text;
    // The parser's own texts are compared up to the end of `text` only.
    bool prefix = false;
};

struct HostileCase {
    const char* name;
    // Writes the documents and returns the path the read is given.
    std::string (*write)(const TempDir& dir);
    int status;
    // One line per record: "name: field/alias/precision ..."; long names abbreviated.
    const char* records;
    std::vector<Expected> messages;
    // When set, more messages than those listed may follow them.
    bool moreMessages = false;
};

std::string abbreviate(const ZrWString& name) {
    if (name.length() <= 40)
        return zrtest::utf8(name);
    return zrtest::utf8(name.view().substr(0, 8)) + "...[" + std::to_string(name.length()) + "]";
}

std::string dumpRecords(const ZrRecordList& records) {
    std::string out;
    for (int r = 0; r < records.Count(); ++r) {
        const ZrRecord* record = records[r];
        out += abbreviate(record->name) + ":";
        for (int f = 0; f < record->FieldCount(); ++f) {
            const ZrField* field = record->GetFieldbyPos(f);
            out += " " + abbreviate(field->FieldName()) + "/" + field->DataType().Alias() + "/" +
                   std::to_string(field->DataType().Precision());
        }
        out += "\n";
    }
    return out;
}

// Puts the folder of the documents for "{dir}" and the listening port for "{port}".
std::string expand(std::string text, const std::string& dir) {
    const std::pair<std::string, std::string> fields[] = {
        {"{dir}", dir}, {"{port}", std::to_string(Listener::instance().port())}};
    for (const auto& [field, value] : fields)
        for (size_t at = text.find(field); at != std::string::npos; at = text.find(field, at))
            text.replace(at, field.size(), value);
    return text;
}

const std::string kNest = "Schema: Error: Declarations and types nested deeper than 10000 in file ";
const std::string kFatal = "Schema: Fatal: At line ";

const HostileCase kCases[] = {
    // Entity expansion.
    {"BillionLaughsInAttribute",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element name=\"b\" type=\"xs:string\" "
                                            "default=\"&lol9;\"/>",
                                            laughs()));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: Reading file {dir}/main.xsd stopped: entity references expand the "
       "document beyond 4194304 characters (at line 16, column 93)"}}},
    {"BillionLaughsInContent",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:annotation>&lol9;</xs:annotation>", laughs()));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: Reading file {dir}/main.xsd stopped: entity references expand the "
       "document beyond 4194304 characters (at line 16, column 61)"}}},
    {"ParameterEntityLaughs",
     [](const TempDir& d) { return d.write("main.xsd", rootDoc("", parameterLaughs())); },
     19,
     "",
     {{4, 4,
       "Schema: Error: Reading file {dir}/main.xsd stopped: parameter entity 'pe1' refers to "
       "other parameter entities"}}},
    {"ParameterEntityRepeated",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("", "<!DOCTYPE xs:schema [\n<!ENTITY % c \"<!---->\">\n" +
                                        repeat("%c;", 1000000) + "\n]>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: Reading file {dir}/main.xsd stopped: the document type declaration "
       "holds more than 10000 items"}}},
    {"LongEntityRepeated",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element name=\"b\" type=\"xs:string\" default=\"" +
                                                repeat("&big;", 900) + "\"/>",
                                            "<!DOCTYPE xs:schema [<!ENTITY big \"" +
                                                std::string(100000, 'x') + "\">]>"));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Entity 'big' in file {dir}/main.xsd is longer than 4096 characters"}}},
    {"EntitiesWithinBounds",
     [](const TempDir& d) {
         return d.write(
             "main.xsd",
             rootDoc("&decl;",
                     "<!DOCTYPE xs:schema [\n<!ENTITY % empty \"\">\n%empty;\n"
                     "<!ENTITY decl \"<xs:element name='fromEntity' type='xs:int'/>\">\n]>"));
     },
     0,
     "root: a/string/0 fromEntity/int/10\n",
     {}},

    {"GrammarBuiltFromEntities",
     [](const TempDir& d) {
         std::string fields;
         std::string types;
         int count = 0;
         for (const char* pattern : {"&v6;", "&host;", "&host;(:&d;+)?", "&v4;|&v6;"}) {
             const std::string n = std::to_string(count++);
             fields += "<xs:element name=\"f" + n + "\" type=\"P" + n + "\"/>";
             types += "<xs:simpleType name=\"P" + n +
                      "\"><xs:restriction base=\"xs:string\"><xs:pattern value=\"" + pattern +
                      "\"/></xs:restriction></xs:simpleType>";
         }
         return d.write("main.xsd", rootDoc(fields, grammarEntities(), types));
     },
     0,
     "root: a/string/0 f0/string/45 f1/string/0 f2/string/0 f3/string/45\n",
     {}},
    // A hundred thousand expansions in one attribute value, producing little.
    {"NestedEntitiesInAttribute",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element name=\"b\" type=\"xs:string\" "
                                            "default=\"" +
                                                repeat("&n5;", 13) + "\"/>",
                                            nestedEntities(5, 10, "lol")));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Reading file {dir}/main.xsd stopped: " + kOverBudget, true}}},
    // Expansions that produce nothing still cost.
    {"EmptyEntitiesInContent",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("<xs:annotation>&n9;</xs:annotation>", nestedEntities(9, 10, "")));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Reading file {dir}/main.xsd stopped: " + kOverBudget, true}}},
    {"EmptyEntitiesInAttributes",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc(repeat("<xs:annotation id=\"&n3;\"/>", 10000),
                                            nestedEntities(3, 10, "")));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Reading file {dir}/main.xsd stopped: " + kOverBudget, true}}},
    // A long entity named from many start tags, and from much content.
    {"LongEntityInManyAttributes",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc(repeat("<xs:annotation id=\"&big;\"/>", 2000),
                                            "<!DOCTYPE xs:schema [<!ENTITY big \"" +
                                                std::string(4000, 'x') + "\">]>"));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Reading file {dir}/main.xsd stopped: " + kOverBudget, true}}},
    {"LongEntityInMuchContent",
     [](const TempDir& d) {
         return d.write(
             "main.xsd",
             rootDoc("<xs:annotation>" + repeat("&big;", 2000) + "</xs:annotation>",
                     "<!DOCTYPE xs:schema [<!ENTITY big \"" + std::string(4000, 'x') + "\">]>"));
     },
     19,
     "",
     {{4, 4, "Schema: Error: Reading file {dir}/main.xsd stopped: " + kOverBudget, true}}},

    // Nothing outside the schema documents is read or fetched.
    {"ExternalEntityLocalFile",
     [](const TempDir& d) {
         const std::string secret =
             d.write("secret.xml", "<xs:element name=\"secret\" type=\"xs:string\"/>");
         return d.write("main.xsd", rootDoc("&ext;", "<!DOCTYPE xs:schema [<!ENTITY ext SYSTEM \"" +
                                                         secret + "\">]>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: External entity '{dir}/secret.xml' in file {dir}/main.xsd is not read"}}},
    {"ExternalEntityFileUri",
     [](const TempDir& d) {
         const std::string secret =
             d.write("secret.xml", "<xs:element name=\"secret\" type=\"xs:string\"/>");
         return d.write("main.xsd", rootDoc("&ext;", "<!DOCTYPE xs:schema [<!ENTITY ext SYSTEM "
                                                     "\"file://" +
                                                         secret + "\">]>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: External entity 'file://{dir}/secret.xml' in file {dir}/main.xsd is not "
       "read"}}},
    {"ExternalEntityNetwork",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("&ext;", "<!DOCTYPE xs:schema [<!ENTITY ext SYSTEM \"" +
                                                         url("e.xml") + "\">]>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: External entity 'http://127.0.0.1:{port}/e.xml' in file {dir}/main.xsd "
       "is not read"}}},
    {"ExternalParameterEntityLocalFile",
     [](const TempDir& d) {
         const std::string dtd = d.write("part.dtd", "<!ENTITY broken");
         return d.write("main.xsd", rootDoc("", "<!DOCTYPE xs:schema [<!ENTITY % p SYSTEM \"" +
                                                    dtd + "\"> %p;]>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: External entity '{dir}/part.dtd' in file {dir}/main.xsd is not read"}}},
    // The external subsets are malformed: had either been read, the read would fail.
    {"ExternalDtdLocalFile",
     [](const TempDir& d) {
         const std::string dtd = d.write("ext.dtd", "<!ENTITY broken");
         return d.write("main.xsd", rootDoc("", "<!DOCTYPE xs:schema SYSTEM \"" + dtd + "\">"));
     },
     0,
     "root: a/string/0\n",
     {}},
    {"ExternalDtdNetwork",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("", "<!DOCTYPE xs:schema PUBLIC \"-//X//DTD X//EN\" \"" +
                                        url("ext.dtd") + "\">"));
     },
     0,
     "root: a/string/0\n",
     {}},
    {"IncludeOverNetwork",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("", "", "<xs:include schemaLocation=\"" + url("inc.xsd") + "\"/>"));
     },
     19,
     "",
     {{4, 4,
       "Schema: Error: Include of 'http://127.0.0.1:{port}/inc.xsd' in file {dir}/main.xsd is "
       "not read: it is not a local file, and no catalog maps it to one"}}},
    {"ImportOverNetwork",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("", "",
                                            "<xs:import namespace=\"urn:x\" schemaLocation=\"" +
                                                url("imp.xsd") + "\"/>"));
     },
     0,
     "root: a/string/0\n",
     {}},

    // Depth: 100,000 levels end at the reader's nesting bound, not in a stack overflow.
    {"DeepAnonymousTypes",
     [](const TempDir& d) {
         return d.write(
             "main.xsd",
             schemaDoc(repeat("<xs:element name=\"e\"><xs:complexType><xs:sequence>", kDeep) +
                       repeat("</xs:sequence></xs:complexType></xs:element>", kDeep)));
     },
     19,
     "",
     {{4, 4, kNest + "{dir}/main.xsd"}}},
    {"DeepElements",
     [](const TempDir& d) {
         return d.write("main.xsd", schemaDoc(repeat("<xs:element name=\"e\">", kDeep) +
                                              repeat("</xs:element>", kDeep)));
     },
     19,
     "",
     {{4, 4, kNest + "{dir}/main.xsd"}}},
    {"DeepSimpleTypes",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        schemaDoc(repeat("<xs:element name=\"e\"><xs:simpleType><xs:restriction "
                                         "base=\"xs:string\">",
                                         kDeep) +
                                  repeat("</xs:restriction></xs:simpleType></xs:element>", kDeep)));
     },
     19,
     "",
     {{4, 4, kNest + "{dir}/main.xsd"}}},
    {"DeepGroupDefinitions",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        schemaDoc(repeat("<xs:group>", kDeep) + repeat("</xs:group>", kDeep)));
     },
     19,
     "",
     {{4, 4, kNest + "{dir}/main.xsd"}}},
    // Constructs without a handler and skipped subtrees nest freely.
    {"DeepCompositors",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc(repeat("<xs:sequence>", kDeep) +
                                            "<xs:element name=\"deep\" type=\"xs:int\"/>" +
                                            repeat("</xs:sequence>", kDeep)));
     },
     0,
     "root: a/string/0 deep/int/10\n",
     {}},
    {"DeepAnnotation",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("<xs:annotation>" + repeat("<xs:documentation>", kDeep) +
                                repeat("</xs:documentation>", kDeep) + "</xs:annotation>"));
     },
     0,
     "root: a/string/0\n",
     {}},

    // Chains of references, 20,000 long, end at the record builder's depth bound.
    {"NestedRecordChain",
     [](const TempDir& d) {
         std::string body = "<xs:element name=\"root\" type=\"R0\"/>";
         for (size_t i = 0; i < kChain; ++i)
             body += "<xs:complexType name=\"R" + std::to_string(i) +
                     "\"><xs:sequence><xs:element name=\"e" + std::to_string(i) + "\" type=\"R" +
                     std::to_string(i + 1) + "\"/></xs:sequence></xs:complexType>";
         return d.write("main.xsd", schemaDoc(body));
     },
     19,
     "",
     {{4, 0, "Schema nesting deeper than 1000 levels at e999"}}},
    {"ExtensionChain",
     [](const TempDir& d) {
         std::string body = "<xs:element name=\"root\" type=\"T0\"/>";
         for (size_t i = 0; i < kChain; ++i)
             body += "<xs:complexType name=\"T" + std::to_string(i) +
                     "\"><xs:complexContent><xs:extension base=\"T" + std::to_string(i + 1) +
                     "\"/></xs:complexContent></xs:complexType>";
         return d.write("main.xsd", schemaDoc(body));
     },
     19,
     "",
     {{4, 0, "Schema nesting deeper than 1000 levels at T1000"}}},
    {"GroupReferenceChain",
     [](const TempDir& d) {
         std::string body;
         for (size_t i = 0; i < kChain; ++i)
             body += "<xs:group name=\"G" + std::to_string(i) +
                     "\"><xs:sequence><xs:group ref=\"G" + std::to_string(i + 1) +
                     "\"/></xs:sequence></xs:group>";
         return d.write("main.xsd", rootDoc("<xs:group ref=\"G0\"/>", "", body));
     },
     19,
     "",
     {{4, 0, "Schema nesting deeper than 1000 levels at G999"}}},
    {"ElementReferenceChain",
     [](const TempDir& d) {
         std::string body;
         for (size_t i = 0; i < kChain; ++i)
             body += "<xs:element name=\"E" + std::to_string(i) + "\" ref=\"E" +
                     std::to_string(i + 1) + "\"/>";
         return d.write("main.xsd", rootDoc("<xs:element ref=\"E0\"/>", "", body));
     },
     19,
     "",
     {{4, 0, "Schema nesting deeper than 1000 levels at E999"}}},
    {"SimpleTypeBaseChain",
     [](const TempDir& d) {
         std::string body;
         for (size_t i = 0; i < kChain; ++i)
             body += "<xs:simpleType name=\"S" + std::to_string(i) + "\"><xs:restriction base=\"S" +
                     std::to_string(i + 1) + "\"/></xs:simpleType>";
         return d.write("main.xsd", rootDoc("<xs:element name=\"f\" type=\"S0\"/>", "", body));
     },
     19,
     "",
     {{4, 0, "Schema nesting deeper than 1000 levels at S999"},
      {4, 0, "Error resolving simple type S999"}},
     true},

    // Cycles.
    {"GroupCycleThroughThree",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("<xs:group ref=\"g1\"/>", "",
                                "<xs:group name=\"g1\"><xs:sequence><xs:element name=\"x\" "
                                "type=\"xs:int\"/><xs:group ref=\"g2\"/></xs:sequence></xs:group>\n"
                                "<xs:group name=\"g2\"><xs:sequence><xs:group ref=\"g3\"/>"
                                "</xs:sequence></xs:group>\n"
                                "<xs:group name=\"g3\"><xs:sequence><xs:group ref=\"g1\"/>"
                                "</xs:sequence></xs:group>"));
     },
     19,
     "",
     {{4, 0, "Circular reference to group g1"}}},
    {"ElementReferenceCycle",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element ref=\"p\"/>", "",
                                            "<xs:element name=\"p\" ref=\"q\"/>"
                                            "<xs:element name=\"q\" ref=\"p\"/>"));
     },
     19,
     "",
     {{4, 0, "Circular reference to element :p"}}},
    {"ElementReferenceToItself",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element ref=\"s\"/>", "",
                                            "<xs:element name=\"s\" ref=\"s\"/>"));
     },
     19,
     "",
     {{4, 0, "Circular reference to element :s"}}},
    {"ExtensionCycle",
     [](const TempDir& d) {
         return d.write(
             "main.xsd",
             schemaDoc("<xs:element name=\"root\" type=\"A\"/>"
                       "<xs:complexType name=\"A\"><xs:complexContent><xs:extension base=\"B\">"
                       "<xs:sequence><xs:element name=\"a\" type=\"xs:int\"/></xs:sequence>"
                       "</xs:extension></xs:complexContent></xs:complexType>"
                       "<xs:complexType name=\"B\"><xs:complexContent><xs:extension base=\"A\"/>"
                       "</xs:complexContent></xs:complexType>"));
     },
     19,
     "",
     {{4, 0, "Circular base type chain at complex type A"}}},
    {"SimpleTypeBaseCycle",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("<xs:element name=\"f\" type=\"s1\"/>", "",
                                "<xs:simpleType name=\"s1\"><xs:restriction base=\"s2\"/>"
                                "</xs:simpleType><xs:simpleType name=\"s2\"><xs:restriction "
                                "base=\"s1\"/></xs:simpleType>"));
     },
     19,
     "",
     {{4, 0, "Circular base type chain at simple type s1"},
      {4, 0, "Error resolving simple type s1"},
      {4, 0, "Error resolving simple type s2"},
      {4, 0, "Error resolving simple type s1"},
      {4, 0, "Lookup of type 's1' (ns '') failed for field 'f'"}}},
    {"IncludeCycleThroughThree",
     [](const TempDir& d) {
         d.write("b.xsd", schemaDoc("<xs:include schemaLocation=\"c.xsd\"/>"
                                    "<xs:complexType name=\"T\"><xs:sequence><xs:element "
                                    "name=\"y\" type=\"xs:int\"/></xs:sequence></xs:complexType>"));
         d.write("c.xsd",
                 schemaDoc("<xs:include schemaLocation=\"main.xsd\"/>"
                           "<xs:element name=\"z\"><xs:complexType><xs:attribute name=\"q\" "
                           "type=\"xs:string\"/></xs:complexType></xs:element>"));
         return d.write("main.xsd", rootDoc("<xs:element name=\"x\" type=\"T\"/>", "",
                                            "<xs:include schemaLocation=\"b.xsd\"/>"));
     },
     0,
     "root: a/string/0 x/Record/0\nx: y/int/10\nz: q/string attribute/0\n",
     {}},
    {"SelfInclude",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("", "",
                                            "<xs:include schemaLocation=\"main.xsd\"/>"
                                            "<xs:include schemaLocation=\"./main.xsd\"/>"));
     },
     0,
     "root: a/string/0\n",
     {}},

    // Size.
    {"TenMegabytePattern",
     [](const TempDir& d) { return d.write("main.xsd", patternDoc(repeat("ab|", 3500000))); },
     0,
     "root: a/string/0 f/string/2\n",
     {}},
    {"TenMegabyteNestedPattern",
     [](const TempDir& d) { return d.write("main.xsd", patternDoc(std::string(10 << 20, '('))); },
     0,
     "root: a/string/0 f/string/0\n",
     {}},
    {"QuantifiersBeyondRange",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        rootDoc("<xs:element name=\"f\" type=\"L\"/><xs:element name=\"g\" "
                                "type=\"N\"/>",
                                "",
                                "<xs:simpleType name=\"L\"><xs:restriction base=\"xs:string\">"
                                "<xs:maxLength value=\"99999999999999999999\"/><xs:pattern "
                                "value=\"a{99999999999}b{4294967297}\"/></xs:restriction>"
                                "</xs:simpleType><xs:simpleType name=\"N\"><xs:restriction "
                                "base=\"xs:int\"><xs:minInclusive value=\"-99999999999999999999\"/>"
                                "</xs:restriction></xs:simpleType>"));
     },
     0,
     "root: a/string/0 f/string/2147483647 g/int/10\n",
     {}},
    {"MegabyteNames",
     [](const TempDir& d) {
         return d.write("main.xsd",
                        schemaDoc("<xs:element name=\"" + std::string(1 << 20, 'n') +
                                  "\"><xs:complexType><xs:sequence><xs:element name=\"" +
                                  std::string(1 << 20, 'f') +
                                  "\" type=\"xs:int\"/></xs:sequence></xs:complexType>"
                                  "</xs:element>"));
     },
     0,
     "nnnnnnnn...[1048576]: ffffffff...[1048576]/int/10\n",
     {}},

    // Not text, not XML, not a file.
    {"InvalidUtf8InName",
     [](const TempDir& d) {
         return d.write("main.xsd", rootDoc("<xs:element name=\"a\xC3\x28z\" type=\"xs:int\"/>"));
     },
     19,
     "",
     {{8, 4,
       kFatal + "1, column 22 of file {dir}/main.xsd: invalid byte '(' at position 2 of a "
                "2-byte sequence",
       true}}},
    {"InvalidUtf8InValue",
     [](const TempDir& d) { return d.write("main.xsd", patternDoc("\xFF\xFE\xED\xA0\x80")); },
     19,
     "",
     {{8, 4, kFatal + "1, column 22 of file {dir}/main.xsd: invalid byte ", true}}},
    {"LoneSurrogateInUtf16Name",
     [](const TempDir& d) {
         std::u16string doc = u"\uFEFF<?xml version=\"1.0\" encoding=\"UTF-16\"?>"
                              u"<xs:schema xmlns:xs=\"http://www.w3.org/2001/XMLSchema\">"
                              u"<xs:element name=\"a?b\" type=\"xs:int\"/></xs:schema>";
         doc[doc.find(u'?', doc.find(u"name"))] = 0xD800;
         return d.write("main.xsd", std::string(reinterpret_cast<const char*>(doc.data()),
                                                doc.size() * sizeof(char16_t)));
     },
     19,
     "",
     {{8, 4,
       kFatal + "1, column 116 of file {dir}/main.xsd: leading surrogate character is not "
                "followed by a legal second character",
       true}}},
    {"LoneSurrogateInUtf16Value",
     [](const TempDir& d) {
         std::u16string doc = u"\uFEFF<?xml version=\"1.0\" encoding=\"UTF-16\"?>"
                              u"<xs:schema xmlns:xs=\"http://www.w3.org/2001/XMLSchema\">"
                              u"<xs:element name=\"a\" type=\"xs:int\" default=\"x?y\"/>"
                              u"</xs:schema>";
         doc[doc.find(u'?', doc.find(u"default"))] = 0xDC00;
         return d.write("main.xsd", std::string(reinterpret_cast<const char*>(doc.data()),
                                                doc.size() * sizeof(char16_t)));
     },
     19,
     "",
     {{8, 4,
       kFatal + "1, column 141 of file {dir}/main.xsd: unexpected trailing surrogate character",
       true}}},
    {"NotXml",
     [](const TempDir& d) { return d.write("main.xsd", "This is not XML at all.\n"); },
     19,
     "",
     {{8, 4, kFatal + "1, column 1 of file {dir}/main.xsd: invalid document structure", true}}},
    {"BinaryBytes",
     [](const TempDir& d) {
         std::string bytes;
         for (int i = 0; i < 1024; ++i)
             bytes += static_cast<char>(i % 256);
         return d.write("main.xsd", bytes);
     },
     19,
     "",
     {{8, 4, kFatal + "1, column 1 of file {dir}/main.xsd: ", true}}},
    {"EmptyFile",
     [](const TempDir& d) { return d.write("main.xsd", ""); },
     19,
     "",
     {{8, 4, kFatal + "1, column 1 of file {dir}/main.xsd: invalid document structure", true}}},
    {"DirectoryAsSchema",
     [](const TempDir& d) {
         const std::string file = d.write("folder.xsd/inner.xsd", "");
         return file.substr(0, file.rfind('/'));
     },
     19,
     "",
     {{8, 4,
       kFatal + "0, column 0 of file : unable to open primary document entity '{dir}/folder.xsd'",
       true}}},
};

class HostileInput : public ::testing::TestWithParam<HostileCase> {};

TEST_P(HostileInput, EndsWithRecordsOrALoggedReason) {
    const HostileCase& c = GetParam();
    TempDir dir;
    const std::string path = c.write(dir);
    Listener::instance().contacted();

    zrtest::LogCapture log;
    ZrXmlSchemaDict dict(nullptr);
    const BATCHERR status = dict.ReadDictionary(path.c_str());

    EXPECT_EQ(status, c.status);
    EXPECT_EQ(dumpRecords(dict.RecordList()), c.records);
    EXPECT_FALSE(Listener::instance().contacted()) << "the read opened a network connection";

    if (c.moreMessages)
        ASSERT_GE(log.messages.size(), c.messages.size()) << log.lines();
    else
        ASSERT_EQ(log.messages.size(), c.messages.size()) << log.lines();
    for (size_t i = 0; i < c.messages.size(); ++i) {
        const Expected& want = c.messages[i];
        const zrtest::LoggedMessage& got = log.messages[i];
        const std::string text = expand(want.text, dir.path().string());
        EXPECT_EQ(got.severity, want.severity) << got.text;
        EXPECT_EQ(got.code, want.code) << got.text;
        if (want.prefix)
            EXPECT_EQ(got.text.substr(0, text.size()), text);
        else
            EXPECT_EQ(got.text, text);
    }
}

INSTANTIATE_TEST_SUITE_P(Documents, HostileInput, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.name); });

// Network locations are read only where a catalog maps them to a local file; a
// catalog that maps them elsewhere on the network fetches nothing either.
TEST(NetworkLocations, ReadOnlyThroughACatalogThatMapsThemToLocalFiles) {
    struct Row {
        const char* name;
        std::string include;
        std::string catalogBody; // empty: no catalog
        int status;
        const char* records;
        std::string message; // "{dir}" and "{port}" as in the table above
    };

    const std::string port = std::to_string(Listener::instance().port());
    const Row rows[] = {
        {"Rewritten", url("mapped/types.xsd"),
         "<rewriteURI uriStartString=\"http://127.0.0.1:" + port +
             "/mapped/\" rewritePrefix=\"local/\"/>",
         0, "root: a/string/0\nincluded: b/int/10\n", ""},
        {"BySystemEntry", url("sys.xsd"),
         "<system systemId=\"" + url("sys.xsd") + "\" uri=\"local/types.xsd\"/>", 0,
         "root: a/string/0\nincluded: b/int/10\n", ""},
        {"MappedToTheNetwork", url("x.xsd"),
         "<uri name=\"" + url("x.xsd") + "\" uri=\"" + url("elsewhere.xsd") + "\"/>", 19, "",
         "Schema: Error: Include of 'http://127.0.0.1:{port}/x.xsd' in file {dir}/main.xsd is not "
         "read: the catalog maps it to 'http://127.0.0.1:{port}/elsewhere.xsd', which is not a "
         "local file"},
        {"NotMapped", url("other.xsd"), "<uri name=\"urn:x\" uri=\"x.xsd\"/>", 19, "",
         "Schema: Error: Include of 'http://127.0.0.1:{port}/other.xsd' in file {dir}/main.xsd is "
         "not read: it is not a local file, and no catalog maps it to one"},
        {"FileUri", "file://{dir}/local/types%2Exsd", "", 0,
         "root: a/string/0\nincluded: b/int/10\n", ""},
        {"MissingCatalog", "local/types.xsd", "-", 19, "",
         "Schema: Error: Catalog file {dir}/none.xml is not read: it cannot be opened"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        TempDir dir;
        const std::string folder = dir.path().string();
        dir.write("local/types.xsd",
                  schemaDoc("<xs:element name=\"included\"><xs:complexType><xs:sequence>"
                            "<xs:element name=\"b\" type=\"xs:int\"/></xs:sequence>"
                            "</xs:complexType></xs:element>"));
        const std::string path =
            dir.write("main.xsd", rootDoc("", "",
                                          "<xs:include schemaLocation=\"" +
                                              expand(row.include, folder) + "\"/>"));
        ZrXmlSchemaDict dict(nullptr);
        if (row.catalogBody == "-")
            dict.SetOption(u"SchemaCatalog", zrtest::wide(folder + "/none.xml").c_str());
        else if (!row.catalogBody.empty())
            dict.SetOption(
                u"SchemaCatalog",
                zrtest::wide(
                    dir.write("catalog.xml", "<catalog xmlns=\"urn:oasis:names:tc:entity:xmlns:xml:"
                                             "catalog\">" +
                                                 row.catalogBody + "</catalog>"))
                    .c_str());
        Listener::instance().contacted();
        zrtest::LogCapture log;
        EXPECT_EQ(dict.ReadDictionary(path.c_str()), row.status);
        EXPECT_EQ(dumpRecords(dict.RecordList()), row.records);
        EXPECT_FALSE(Listener::instance().contacted()) << "the read opened a network connection";
        EXPECT_EQ(log.lines(),
                  row.message.empty() ? "" : "4 4 " + expand(row.message, folder) + "\n");
    }
}

} // namespace
