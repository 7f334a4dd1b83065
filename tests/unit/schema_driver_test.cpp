// The parse driver: failed reads, parser diagnostics, unreadable files, nesting
// and entity bounds at their edges (hostile documents have tests of their own).
#include "ParserConfig.h"
#include "model_dump.h"

#include <gtest/gtest.h>
#include <sstream>
#include <sys/mman.h>
#include <unistd.h>
#include <vector>
#include <xercesc/sax/SAXParseException.hpp>

namespace {

using namespace zrtest;

// True when `text` matches `pattern`, in which '*' stands for any run of
// characters; the parser's own texts are matched that way.
bool globMatch(const std::string& pattern, const std::string& text) {
    size_t p = 0, t = 0, star = std::string::npos, mark = 0;
    while (t < text.size()) {
        if (p < pattern.size() && pattern[p] == '*') {
            star = p++;
            mark = t;
        } else if (p < pattern.size() && pattern[p] == text[t]) {
            ++p;
            ++t;
        } else if (star != std::string::npos) {
            p = star + 1;
            t = ++mark;
        } else {
            return false;
        }
    }
    while (p < pattern.size() && pattern[p] == '*')
        ++p;
    return p == pattern.size();
}

// Each line of `log` against the pattern on the same line of `patterns`.
void expectLog(const std::string& log, const std::string& patterns) {
    std::istringstream actual(log), expected(patterns);
    std::string a, e;
    while (true) {
        const bool moreActual = static_cast<bool>(std::getline(actual, a));
        const bool moreExpected = static_cast<bool>(std::getline(expected, e));
        if (!moreActual && !moreExpected)
            return;
        ASSERT_EQ(moreActual, moreExpected) << "log:\n" << log << "expected:\n" << patterns;
        EXPECT_TRUE(globMatch(e, a)) << "line:     " << a << "\npattern:  " << e;
    }
}

struct DriverCase {
    const char* name;
    // Files of the case: name, then content; "main.xsd" is read.
    std::vector<std::pair<std::string, std::string>> files;
    bool ok;
    const char* model;
    const char* log;
};

std::string withDoctype(const std::string& doctype, const std::string& body) {
    return "<?xml version=\"1.0\"?>\n" + doctype + "\n<xs:schema xmlns:xs=\"" + kXsdNs + "\">\n" +
           body + "\n</xs:schema>\n";
}

const std::string kInjected = R"(<xs:element name="injected" type="xs:string"/>)";

const DriverCase kDriverCases[] = {
    {"EmptySchema", {{"main.xsd", schemaDoc("")}}, true, "", ""},
    {"WarningsAloneDoNotFailTheRead",
     {{"main.xsd", withDoctype(R"(<!DOCTYPE xs:schema [<!ATTLIST xs:schema a CDATA #IMPLIED>
                                   <!ATTLIST xs:schema a CDATA #IMPLIED>]>)",
                               kInjected)}},
     true,
     "global element name=injected type={xs}string\n",
     "2 4 Schema: Warning: At line 3, column * of file $DIR/main.xsd: attribute 'a' *\n"},
    {"MalformedDocument",
     {{"main.xsd", std::string("<?xml version=\"1.0\"?>\n<xs:schema xmlns:xs=\"") + kXsdNs +
                       "\">\n<xs:annotation></xs:annot>\n</xs:schema>\n"}},
     false,
     "",
     "8 4 Schema: Fatal: At line 3, column * of file $DIR/main.xsd: *\n"},
    {"ErrorInIncludedDocumentStopsTheRead",
     {{"main.xsd", schemaDoc(R"(<xs:include schemaLocation="bad.xsd"/>
                                <xs:include schemaLocation="good.xsd"/>
                                <xs:element name="main" type="xs:string"/>)")},
      {"bad.xsd", schemaDoc("<xs:element name=\"bad\" type=\"xs:string\">")},
      {"good.xsd", schemaDoc("", "unknown=\"1\"")}},
     false,
     "global element name=main type={xs}string\n",
     "8 4 Schema: Fatal: At line 4, column 3 of file $DIR/bad.xsd: expected end of tag *\n"},
    {"MissingInclude",
     {{"main.xsd", schemaDoc(R"(<xs:include schemaLocation="missing.xsd"/>)")}},
     false,
     "",
     "8 4 Schema: Fatal: At line 0, column 0 of file : *'$DIR/missing.xsd'\n"},
};

class Driver : public ::testing::TestWithParam<DriverCase> {};

TEST_P(Driver, ReadsOrFailsWithTheExpectedMessages) {
    const DriverCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const ReadOutcome read =
        readSchemaFile((dir.path() / "main.xsd").string(), dir.path().string());
    EXPECT_EQ(read.ok, c.ok);
    EXPECT_EQ(read.model, c.model);
    expectLog(read.log, c.log);
}

INSTANTIATE_TEST_SUITE_P(Documents, Driver, ::testing::ValuesIn(kDriverCases),
                         [](const auto& row) { return std::string(row.param.name); });

// Unopenable paths: the stream cannot be made and the parser says so.
TEST(Driver, MissingFileAndDirectoryFailWithTheParsersMessage) {
    TempDir dir;
    const std::string base = dir.path().string();
    for (const std::string& path : {base + "/missing.xsd", base}) {
        SCOPED_TRACE(path);
        const ReadOutcome read = readSchemaFile(path, base);
        EXPECT_FALSE(read.ok);
        expectLog(read.log, "8 4 Schema: Fatal: At line 0, column 0 of file : *'" +
                                replaceAll(path, base, "$DIR") + "'\n");
    }
}

// An error while reading bytes is logged and fails the read; it never reaches
// the parser as a byte count, which sees the document end there. The kernel
// refuses to read this file at offset 0.
TEST(Driver, UnreadableFileFailsTheRead) {
    const ReadOutcome read = readSchemaFile("/proc/self/mem", "/proc/self");
    EXPECT_FALSE(read.ok);
    expectLog(read.log, "4 4 Schema: Error: Reading file $DIR/mem failed\n"
                        "8 4 Schema: Fatal: At line 1, column 1 of file $DIR/mem: *\n");
}

TEST(Driver, DiagnosticsNameThePlaceAndKeepTheTextAfterMessage) {
    struct Row {
        void (SchemaReader::*callback)(const xercesc::SAXParseException&);
        const char16_t* message;
        bool fails;
        const char* logged;
    };

    const Row rows[] = {
        {&SchemaReader::warning, u"plain text", false,
         "2 4 Schema: Warning: At line 3, column 5 of file /s.xsd: plain text\n"},
        {&SchemaReader::error, u"Type:X, Message: the cause", true,
         "4 4 Schema: Error: At line 3, column 5 of file /s.xsd:  the cause\n"},
        {&SchemaReader::fatalError, u"Message:first Message:second", true,
         "8 4 Schema: Fatal: At line 3, column 5 of file /s.xsd: first Message:second\n"},
    };
    for (const Row& row : rows) {
        SchemaModel model;
        SchemaReader reader(model);
        LogCapture log;
        const xercesc::SAXParseException e(row.message, u"", u"/s.xsd", 3, 5);
        (reader.*row.callback)(e);
        EXPECT_EQ(log.lines(), row.logged);
        EXPECT_EQ(reader.hasFailed(), row.fails);
    }
}

// A read that failed half-way leaves documents queued and a declaration open;
// the next read on the same reader starts clean all the same.
TEST(Driver, AReaderIsReusableAfterAFailedRead) {
    TempDir dir;
    const std::string failing =
        dir.write("failing.xsd", schemaDoc(R"(<xs:include schemaLocation="later.xsd"/>
                                    <xs:element name="open" nullable="false"><xs:complexType>
                                    <xs:element name="x" type="xs:string"></xs:complexType>)"));
    dir.write("later.xsd", schemaDoc(R"(<xs:element name="later" type="xs:string"/>)"));
    const std::string good =
        dir.write("good.xsd", schemaDoc(R"(<xs:element name="good" type="xs:string"/>)"));
    SchemaModel model;
    SchemaReader reader(model);
    LogCapture log;
    EXPECT_FALSE(reader.read(wide(failing).c_str()));
    // Neither the queued document nor the open declaration's flag carries over.
    EXPECT_TRUE(reader.read(wide(good).c_str()));
    EXPECT_EQ(dumpModel(model), "global element name=good type={xs}string\n");
}

// Declarations, types and groups nested without end are refused before the state
// saved for them grows without bound.
TEST(Driver, NestingIsBounded) {
    auto nested = [](int depth) {
        std::string body;
        for (int i = 0; i < depth; ++i)
            body += "<xs:group>";
        for (int i = 0; i < depth; ++i)
            body += "</xs:group>";
        return schemaDoc(body + R"(<xs:element name="after" type="xs:string"/>)");
    };
    const ReadOutcome deep = readSchemaText(nested(10001));
    EXPECT_FALSE(deep.ok);
    EXPECT_EQ(deep.log,
              "4 4 Schema: Error: Declarations and types nested deeper than 10000 in file "
              "$DIR/main.xsd\n");
    const ReadOutcome fits = readSchemaText(nested(10000));
    EXPECT_TRUE(fits.ok);
    EXPECT_EQ(fits.log, "");
}

// Documents commonly escape text with the predefined entities; they cost nothing
// against the bound of what entities may add, however many there are.
TEST(Driver, PredefinedEntitiesAreNotLimited) {
    std::string text;
    for (size_t i = 0; i < 2 * kSchemaEntityGrowthFloor / kSchemaEntityExpansionCost; ++i)
        text += "&lt;&amp;&#65;";
    const ReadOutcome read = readSchemaText(schemaDoc("<xs:annotation><xs:documentation>" + text +
                                                      "</xs:documentation></xs:annotation>"));
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.log, "");
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
