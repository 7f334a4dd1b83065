// Included documents: where they are looked for, in which order they are read,
// and that every document is read once however the includes loop.
#include "model_dump.h"

#include <filesystem>
#include <gtest/gtest.h>

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

std::string globals(const std::vector<std::string>& names) {
    std::string out;
    for (const std::string& name : names)
        out += "global element name=" + name + " type={xs}string\n";
    return out;
}

struct IncludeCase {
    const char* name;
    std::vector<std::pair<std::string, std::string>> files; // "main.xsd" is read
    std::vector<std::string> order;                         // elements, in reading order
};

const IncludeCase kIncludeCases[] = {
    {"ChainOfThree",
     {{"main.xsd", doc("main", {"a.xsd"})}, {"a.xsd", doc("a", {"b.xsd"})}, {"b.xsd", doc("b")}},
     {"main", "a", "b"}},
    {"BreadthFirst",
     {{"main.xsd", doc("main", {"a.xsd", "b.xsd"})},
      {"a.xsd", doc("a", {"c.xsd"})},
      {"b.xsd", doc("b")},
      {"c.xsd", doc("c")}},
     {"main", "a", "b", "c"}},
    {"SelfInclude", {{"main.xsd", doc("main", {"main.xsd", "./main.xsd"})}}, {"main"}},
    {"MutualInclude",
     {{"main.xsd", doc("main", {"a.xsd"})}, {"a.xsd", doc("a", {"main.xsd"})}},
     {"main", "a"}},
    {"ThreeDocumentCycle",
     {{"main.xsd", doc("main", {"a.xsd"})},
      {"a.xsd", doc("a", {"b.xsd"})},
      {"b.xsd", doc("b", {"main.xsd"})}},
     {"main", "a", "b"}},
    {"IncludedTwiceIsReadOnce",
     {{"main.xsd", doc("main", {"a.xsd", "sub/../b.xsd"})},
      {"a.xsd", doc("a", {"c.xsd"})},
      {"b.xsd", doc("b", {".//c.xsd"})},
      {"c.xsd", doc("c")},
      {"sub/unused.xsd", doc("unused")}},
     {"main", "a", "b", "c"}},
    // A location keeps its directory and is taken from the including document's
    // directory: sub/a.xsd includes b.xsd, which is sub/b.xsd, not the b.xsd
    // beside main.xsd.
    {"RelativeToTheIncludingDocument",
     {{"main.xsd", doc("main", {"sub/a.xsd"})},
      {"sub/a.xsd", doc("a", {"b.xsd", "../c.xsd"})},
      {"sub/b.xsd", doc("subB")},
      {"b.xsd", doc("decoy")},
      {"c.xsd", doc("c")}},
     {"main", "a", "subB", "c"}},
    {"IncludeWithoutLocationOrInsideAnnotation",
     {{"main.xsd", schemaDoc(R"(<xs:include id="x"/><xs:annotation><xs:appinfo>
                      <xs:include schemaLocation="missing.xsd"/></xs:appinfo></xs:annotation>
                    <xs:element name="main" type="xs:string"/>)")}},
     {"main"}},
};

class Includes : public ::testing::TestWithParam<IncludeCase> {};

TEST_P(Includes, ReadsEachDocumentOnceInQueueOrder) {
    const IncludeCase& c = GetParam();
    TempDir dir;
    for (const auto& [name, content] : c.files)
        dir.write(name, content);
    const ReadOutcome read =
        readSchemaFile((dir.path() / "main.xsd").string(), dir.path().string());
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.model, globals(c.order));
    EXPECT_EQ(read.log, "");
}

INSTANTIATE_TEST_SUITE_P(Documents, Includes, ::testing::ValuesIn(kIncludeCases),
                         [](const auto& row) { return std::string(row.param.name); });

// Runs a test body in another working directory.
class WorkingDirectory {
  public:
    explicit WorkingDirectory(const std::filesystem::path& dir)
        : saved_(std::filesystem::current_path()) {
        std::filesystem::current_path(dir);
    }

    WorkingDirectory(const WorkingDirectory&) = delete;
    WorkingDirectory& operator=(const WorkingDirectory&) = delete;

    ~WorkingDirectory() { std::filesystem::current_path(saved_); }

  private:
    std::filesystem::path saved_;
};

// The main document given by a relative path, with and without a directory part,
// and an include location given by an absolute path.
TEST(Includes, RelativeAndAbsoluteMainPaths) {
    TempDir dir;
    TempDir elsewhere;
    const std::string absolute = elsewhere.write("abs.xsd", doc("abs"));
    dir.write("schemas/main.xsd", doc("main", {"sub/types.xsd", absolute}));
    dir.write("schemas/sub/types.xsd", doc("types", {"more.xsd"}));
    dir.write("schemas/sub/more.xsd", doc("more"));
    dir.write("sub/types.xsd", doc("decoy"));
    const std::string expected = globals({"main", "types", "abs", "more"});

    const std::string root = dir.path().string();
    EXPECT_EQ(readSchemaFile(root + "/schemas/main.xsd", root).model, expected);
    {
        WorkingDirectory cwd(dir.path());
        EXPECT_EQ(readSchemaFile("schemas/main.xsd", root).model, expected);
        EXPECT_EQ(readSchemaFile("./schemas//main.xsd", root).model, expected);
    }
    {
        WorkingDirectory cwd(dir.path() / "schemas");
        EXPECT_EQ(readSchemaFile("main.xsd", root).model, expected);
    }
}

// Included documents share the namespace state: one without targetNamespace keeps
// the including document's, and a prefix declared again is rebound.
TEST(Includes, NamespaceStateCarriesOver) {
    TempDir dir;
    dir.write("main.xsd",
              doc("main", {"a.xsd", "b.xsd"}, R"(targetNamespace="urn:t" xmlns:p="urn:p1")"));
    dir.write("a.xsd", schemaDoc(R"(<xs:element name="a" type="p:T"/>)", R"(xmlns:p="urn:p2")"));
    dir.write("b.xsd",
              schemaDoc(R"(<xs:element name="b" type="p:T"/>)", R"(targetNamespace="urn:u")"));
    const ReadOutcome read =
        readSchemaFile((dir.path() / "main.xsd").string(), dir.path().string());
    EXPECT_TRUE(read.ok);
    EXPECT_EQ(read.model, "global element name={urn:t}main type={xs}string\n"
                          "global element name={urn:t}a type={urn:p2}T\n"
                          "global element name={urn:u}b type={urn:p2}T\n");
}

} // namespace
