// The parse driver: which documents a read takes in, in which order, where included
// documents are looked for, failed reads and the parser's diagnostics (hostile
// documents have tests of their own).
#include "model_dump.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>
#include <vector>
#include <xercesc/sax/SAXParseException.hpp>

namespace {

using namespace zrtest;

// A document that declares one element named `name` and includes `locations`.
std::string doc(const std::string& name, const std::vector<std::string>& locations = {},
                const std::string& schemaAttrs = "") {
    std::string body;
    for (const std::string& location : locations)
        body += "<xs:include schemaLocation=\"" + location + "\"/>\n";
    body += "<xs:element name=\"" + name + "\" type=\"xs:string\"/>";
    return schemaDoc(body, schemaAttrs);
}

// The model of documents read in the order given, each declaring one element.
std::string globals(const std::vector<std::string>& names) {
    std::string out;
    for (const std::string& name : names)
        out += "global element name=" + name + " type={xs}string\n";
    return out;
}

struct DriverCase {
    const char* name;
    std::string model;
    std::vector<std::pair<std::string, std::string>> files; // name, then content
    const char* log = "";                                   // '*' stands for any text
    bool ok = true;
    const char* read = "main.xsd";
};

const DriverCase kDriverCases[] = {
    {"EmptySchema", "", {{"main.xsd", schemaDoc("")}}},
    {"WarningsAloneDoNotFailTheRead",
     globals({"injected"}),
     {{"main.xsd", replaceAll(doc("injected"), "?>\n",
                              "?>\n<!DOCTYPE xs:schema [<!ATTLIST xs:schema a CDATA #IMPLIED>\n"
                              "<!ATTLIST xs:schema a CDATA #IMPLIED>]>\n")}},
     "2 4 Schema: Warning: At line 3, column * of file $DIR/main.xsd: attribute 'a' *\n"},
    {"MalformedDocument",
     "",
     {{"main.xsd", schemaDoc("<xs:annotation></xs:annot>")}},
     "8 4 Schema: Fatal: At line 3, column * of file $DIR/main.xsd: *\n",
     false},
    {"ErrorInIncludedDocumentStopsTheRead",
     globals({"main"}),
     {{"main.xsd", doc("main", {"bad.xsd", "good.xsd"})},
      {"bad.xsd", schemaDoc("<xs:element name=\"bad\" type=\"xs:string\">")},
      {"good.xsd", schemaDoc("", "unknown=\"1\"")}},
     "8 4 Schema: Fatal: At line 4, column 3 of file $DIR/bad.xsd: expected end of tag *\n",
     false},
    {"MissingInclude",
     globals({"main"}),
     {{"main.xsd", doc("main", {"missing.xsd"})}},
     "8 4 Schema: Fatal: At line 0, column 0 of file : *'$DIR/missing.xsd'\n",
     false},
    {"MissingFile",
     "",
     {},
     "8 4 Schema: Fatal: At line 0, column 0 of file : *'$DIR/x'\n",
     false,
     "x"},
    {"DirectoryAsSchema",
     "",
     {{"folder/inner.xsd", ""}},
     "8 4 Schema: Fatal: At line 0, column 0 of file : *'$DIR/folder'\n",
     false,
     "folder"},
    {"IncludeChainOfThree",
     globals({"main", "a", "b"}),
     {{"main.xsd", doc("main", {"a.xsd"})}, {"a.xsd", doc("a", {"b.xsd"})}, {"b.xsd", doc("b")}}},
    {"IncludesBreadthFirst",
     globals({"main", "a", "b", "c"}),
     {{"main.xsd", doc("main", {"a.xsd", "b.xsd"})},
      {"a.xsd", doc("a", {"c.xsd"})},
      {"b.xsd", doc("b")},
      {"c.xsd", doc("c")}}},
    {"SelfInclude", globals({"main"}), {{"main.xsd", doc("main", {"main.xsd", "./main.xsd"})}}},
    {"IncludeCycleOfThree",
     globals({"main", "a", "b"}),
     {{"main.xsd", doc("main", {"a.xsd"})},
      {"a.xsd", doc("a", {"b.xsd"})},
      {"b.xsd", doc("b", {"main.xsd"})}}},
    {"IncludedTwiceIsReadOnce",
     globals({"main", "a", "b", "c"}),
     {{"main.xsd", doc("main", {"a.xsd", "sub/../b.xsd"})},
      {"a.xsd", doc("a", {"c.xsd"})},
      {"b.xsd", doc("b", {".//c.xsd"})},
      {"c.xsd", doc("c")},
      {"sub/unused.xsd", doc("unused")}}},
    // A location keeps its directory and is taken from the including document's
    // directory: sub/a.xsd includes b.xsd, which is sub/b.xsd, not the b.xsd
    // beside main.xsd.
    {"IncludeRelativeToTheIncludingDocument",
     globals({"main", "a", "subB", "c"}),
     {{"main.xsd", doc("main", {"sub/a.xsd"})},
      {"sub/a.xsd", doc("a", {"b.xsd", "../c.xsd"})},
      {"sub/b.xsd", doc("subB")},
      {"b.xsd", doc("decoy")},
      {"c.xsd", doc("c")}}},
    {"IncludeWithoutLocationOrInsideAnnotation",
     globals({"main"}),
     {{"main.xsd", schemaDoc(R"(<xs:include id="x"/><xs:annotation><xs:appinfo>
                      <xs:include schemaLocation="missing.xsd"/></xs:appinfo></xs:annotation>
                    <xs:element name="main" type="xs:string"/>)")}}},
    // Included documents share the namespace state: one without targetNamespace keeps
    // the including document's, and a prefix declared again is rebound.
    {"IncludedDocumentsShareTheNamespaceState",
     "global element name={urn:t}main type={xs}string\n"
     "global element name={urn:t}a type={urn:p2}T\n"
     "global element name={urn:u}b type={urn:p2}T\n",
     {{"main.xsd", doc("main", {"a.xsd", "b.xsd"}, R"(targetNamespace="urn:t" xmlns:p="urn:p1")")},
      {"a.xsd", schemaDoc(R"(<xs:element name="a" type="p:T"/>)", R"(xmlns:p="urn:p2")")},
      {"b.xsd", schemaDoc(R"(<xs:element name="b" type="p:T"/>)", R"(targetNamespace="urn:u")")}}},
};

class Driver : public ::testing::TestWithParam<DriverCase> {};

TEST_P(Driver, ReadsOrFailsWithTheExpectedMessages) {
    const DriverCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const ReadOutcome read = readSchemaFile((dir.path() / c.read).string(), dir.path().string());
    EXPECT_EQ(read.ok, c.ok);
    EXPECT_EQ(read.model, c.model);
    EXPECT_TRUE(globMatch(c.log, read.log)) << read.log;
}

INSTANTIATE_TEST_SUITE_P(Documents, Driver, ::testing::ValuesIn(kDriverCases),
                         [](const auto& row) { return std::string(row.param.name); });

// The model read from `path` with `cwd` as the working directory.
std::string readFrom(const std::filesystem::path& cwd, const std::string& path) {
    const std::filesystem::path saved = std::filesystem::current_path();
    std::filesystem::current_path(cwd);
    const std::string model = readSchemaFile(path, "").model;
    std::filesystem::current_path(saved);
    return model;
}

// The main document given by a relative path, with and without a directory part,
// and an include location given by an absolute path.
TEST(Driver, RelativeAndAbsoluteMainPaths) {
    TempDir dir;
    TempDir elsewhere;
    const std::string absolute = elsewhere.write("abs.xsd", doc("abs"));
    dir.write("schemas/main.xsd", doc("main", {"sub/types.xsd", absolute}));
    dir.write("schemas/sub/types.xsd", doc("types", {"more.xsd"}));
    dir.write("schemas/sub/more.xsd", doc("more"));
    dir.write("sub/types.xsd", doc("decoy"));
    const std::string expected = globals({"main", "types", "abs", "more"});

    EXPECT_EQ(readFrom("/", (dir.path() / "schemas/main.xsd").string()), expected);
    EXPECT_EQ(readFrom(dir.path(), "schemas/main.xsd"), expected);
    EXPECT_EQ(readFrom(dir.path(), "./schemas//main.xsd"), expected);
    EXPECT_EQ(readFrom(dir.path() / "schemas", "main.xsd"), expected);
}

// An error while reading bytes is logged and fails the read; it never reaches
// the parser as a byte count, which sees the document end there. The kernel
// refuses to read this file at offset 0.
TEST(Driver, UnreadableFileFailsTheRead) {
    const ReadOutcome read = readSchemaFile("/proc/self/mem", "/proc/self");
    EXPECT_FALSE(read.ok);
    EXPECT_TRUE(globMatch("4 4 Schema: Error: Reading file $DIR/mem failed\n"
                          "8 4 Schema: Fatal: At line 1, column 1 of file $DIR/mem: *\n",
                          read.log))
        << read.log;
}

// The logged text of one parser diagnostic given to a fresh reader, and whether the
// read fails.
template <class Callback> std::string diagnose(Callback callback, const char16_t* message) {
    SchemaModel model;
    SchemaReader reader(model);
    LogCapture log;
    (reader.*callback)(xercesc::SAXParseException(message, u"", u"/s.xsd", 3, 5));
    return log.lines() + (reader.hasFailed() ? "failed\n" : "");
}

TEST(Driver, DiagnosticsNameThePlaceAndKeepTheTextAfterMessage) {
    EXPECT_EQ(diagnose(&SchemaReader::warning, u"plain text"),
              "2 4 Schema: Warning: At line 3, column 5 of file /s.xsd: plain text\n");
    EXPECT_EQ(diagnose(&SchemaReader::error, u"Type:X, Message: the cause"),
              "4 4 Schema: Error: At line 3, column 5 of file /s.xsd:  the cause\nfailed\n");
    EXPECT_EQ(diagnose(&SchemaReader::fatalError, u"Message:first Message:second"),
              "8 4 Schema: Fatal: At line 3, column 5 of file /s.xsd: first Message:second\n"
              "failed\n");
}

// A read that failed half-way leaves documents queued and a non-nullable
// declaration open; the next read on the same reader starts from an empty model all
// the same, and numbers generated names from zero again.
TEST(Driver, AReaderIsReusableAfterAFailedRead) {
    TempDir dir;
    const std::string failing =
        dir.write("failing.xsd", schemaDoc(R"(<xs:include schemaLocation="later.xsd"/>
                                    <xs:element name="open" nullable="false"><xs:complexType>
                                    <xs:element name="x" type="xs:string"></xs:complexType>)"));
    dir.write("later.xsd", doc("later"));
    const std::string good = dir.write("good.xsd", schemaDoc(R"(<xs:element name="e">
        <xs:complexType><xs:attribute name="a"><xs:simpleType><xs:restriction base="xs:string"/>
        </xs:simpleType></xs:attribute></xs:complexType></xs:element>)"));
    SchemaModel model;
    SchemaReader reader(model);
    LogCapture log;
    EXPECT_FALSE(reader.read(wide(failing).c_str()));
    for (int i = 0; i < 2; ++i) {
        EXPECT_TRUE(reader.read(wide(good).c_str()));
        EXPECT_EQ(dumpModel(model), "global element name=e type=anon0\n"
                                    "complexType anon0\n"
                                    "  attribute name=a type=anon1\n"
                                    "simpleType anon1 base={xs}string\n");
    }
}

// Positions count past 4 GiB. The file lives in memory and is all hole, so
// reading it costs no disk and little time.
TEST(Driver, InputPositionsPassFourGigabytes) {
    const int fd = memfd_create("big.xsd", MFD_CLOEXEC);
    if (fd < 0)
        GTEST_SKIP() << "no memory file here";
    const off_t size = (off_t(1) << 32) + 17;
    ASSERT_EQ(ftruncate(fd, size), 0);
    {
        FPInputStream stream(wide("/proc/self/fd/" + std::to_string(fd)).c_str(), false);
        ASSERT_TRUE(stream.isOpen());
        std::vector<XMLByte> buffer(std::size_t(1) << 20);
        while (stream.readBytes(buffer.data(), buffer.size()) != 0) {
        }
        EXPECT_EQ(stream.curPos(), XMLFilePos(size));
    }
    close(fd);
}

} // namespace
