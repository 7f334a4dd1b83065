// The command-line contract of zrdict as other programs rely on it: exit statuses,
// where output goes, and the shape of the JSON documents.
#include "ZrdictRunner.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

namespace fs = std::filesystem;

namespace {

std::string example() { return examplesDir() + "/purchase-order.xsd"; }

bool contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

template <class Case> std::string caseName(const ::testing::TestParamInfo<Case>& param) {
    return param.param.name;
}

bool startsWith(const std::string& text, const std::string& prefix) {
    return text.compare(0, prefix.size(), prefix) == 0;
}

// An object's keys in document order.
std::vector<std::string> keysOf(const Json& object) {
    std::vector<std::string> keys;
    for (auto it = object.begin(); it != object.end(); ++it)
        keys.push_back(it.key());
    return keys;
}

struct StatusCase {
    const char* name;
    std::vector<std::string> args;
    int exitStatus;
    const char* stderrMentions; // a text stderr must contain, or null
};

const StatusCase kStatusCases[] = {
    {"NoCommand", {}, 2, "subcommand"},
    {"UnknownCommand", {"frobnicate"}, 2, "frobnicate"},
    {"UnknownFlag", {"read", "--bogus", example()}, 2, "--bogus"},
    {"UnknownTopLevelFlag", {"--bogus", "types"}, 2, "--bogus"},
    {"MissingSchema", {"read"}, 2, "SCHEMA"},
    {"MissingFlattenRecord", {"flatten", example()}, 2, "RECORD"},
    {"ExtraArgument", {"read", example(), "surplus"}, 2, "surplus"},
    {"UnknownFormat", {"types", "--format", "yaml"}, 2, "yaml"},
    {"OptionWithoutValue",
     {"read", "--option", "QualifiedRecordNames", example()},
     2,
     "NAME=VALUE"},
    {"UnknownOptionName", {"read", "--option", "NoSuchOption=1", example()}, 2, "NoSuchOption"},
    {"UnknownOptionNameBeforeOptions", {"options", "--option", "Qualified=True"}, 2, "Qualified"},
    {"UnknownSpoke", {"flatten", "--spoke", "csv", example(), "item"}, 2, "csv"},
    {"UnknownFlattenRecord", {"flatten", example(), "noSuchRecord"}, 2, "noSuchRecord"},
    {"MissingPlugin",
     {"--plugin", "/nonexistent/libzrbxmls.so", "types"},
     3,
     "/nonexistent/libzrbxmls.so"},
    {"MissingPluginAfterCommand",
     {"types", "--plugin", "/nonexistent/libzrbxmls.so"},
     3,
     "/nonexistent/libzrbxmls.so"},
    {"PluginWithoutEntryPoints", {"types", "--plugin", utilLibraryPath()}, 3, "NewBrowser"},
    {"Help", {"--help"}, 0, nullptr},
    {"CommandHelp", {"flatten", "--help"}, 0, nullptr},
    {"Version", {"--version"}, 0, nullptr},
    {"PluginBeforeCommand", {"--plugin", pluginPath(), "types"}, 0, nullptr},
    {"PluginAfterCommand", {"options", "--plugin", pluginPath()}, 0, nullptr},
    {"ReadMissingFile", {"read", "/nonexistent/missing.xsd"}, 19, "fatal 4: Schema: Fatal: "},
    {"FlattenExample", {"flatten", "--spoke", "text", example(), "item"}, 0, nullptr},
    {"FlattenMissingFile", {"flatten", "/nonexistent/missing.xsd", "item"}, 19, nullptr},
    {"ReadTree", {"read", "--format", "tree", example()}, 0, nullptr},
    {"ReadDot", {"read", "--format=dot", example()}, 0, nullptr},
    {"FlattenTree", {"flatten", "--format", "tree", example(), "item"}, 0, nullptr},
    {"TreeMissingFile",
     {"read", "--format", "tree", "/nonexistent/missing.xsd"},
     19,
     "fatal 4: Schema: Fatal: "},
    {"DotMissingFile", {"read", "--format", "dot", "/nonexistent/missing.xsd"}, 19, "fatal 4: "},
    {"TreeOnlyForRecords", {"options", "--format", "tree"}, 2, "tree"},
    {"DotOnlyForRecords", {"types", "--format", "dot"}, 2, "dot"},
    {"HelpWithMissingPlugin", {"read", "--help", "--plugin", "/nonexistent/lib.so"}, 0, nullptr},
};

// Test listings show the row's label rather than its bytes.
void PrintTo(const StatusCase& c, std::ostream* out) { *out << c.name; }

class ExitStatus : public ::testing::TestWithParam<StatusCase> {};

TEST_P(ExitStatus, MatchesContract) {
    const StatusCase& c = GetParam();
    RunResult run = runZrdict(c.args);
    EXPECT_EQ(run.exitStatus, c.exitStatus) << "stdout:\n" << run.out << "\nstderr:\n" << run.err;
    if (c.stderrMentions) {
        EXPECT_TRUE(contains(run.err, c.stderrMentions)) << "stderr:\n" << run.err;
    }
    if (c.exitStatus == 0) {
        EXPECT_EQ(run.err, "");
    }
}

INSTANTIATE_TEST_SUITE_P(Zrdict, ExitStatus, ::testing::ValuesIn(kStatusCases),
                         caseName<StatusCase>);

TEST(Usage, HelpAndVersionGoToStdout) {
    RunResult help = runZrdict({"--help"});
    for (const char* command : {"read", "options", "types", "flatten"})
        EXPECT_TRUE(contains(help.out, command)) << help.out;
    RunResult commandHelp = runZrdict({"flatten", "--help"});
    for (const char* part : {"SCHEMA", "RECORD", "--spoke", "--option", "--format", "--plugin"})
        EXPECT_TRUE(contains(commandHelp.out, part)) << commandHelp.out;
    RunResult version = runZrdict({"--version"});
    EXPECT_TRUE(startsWith(version.out, "zrdict ")) << version.out;
}

std::string indented(const std::string& text) {
    std::string out;
    for (size_t start = 0; start < text.size();) {
        size_t end = text.find('\n', start);
        if (end > start)
            out += "  ";
        out += text.substr(start, end - start + 1);
        start = end + 1;
    }
    return out;
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

// The help's worked example is what zrdict really prints for the example schema it
// shows, and the plug-in's options come from the plug-in.
TEST(Usage, HelpShowsAWorkedExampleAndThePluginsOptions) {
    const std::string schema = examplesDir() + "/order.xsd";
    RunResult tree = runZrdict({"read", "--format", "tree", schema});
    RunResult tables = runZrdict({"read", schema});
    ASSERT_EQ(tree.exitStatus, 0);
    ASSERT_EQ(tables.exitStatus, 0);
    const std::string options = "--option NAME=VALUE ('zrdict options' shows their values):\n"
                                "  QualifiedRecordNames  default False  Strip leading blanks\n";

    RunResult help = runZrdict({"--help"});
    EXPECT_TRUE(contains(help.out, indented(readFile(schema)))) << help.out;
    EXPECT_TRUE(
        contains(help.out, "  $ zrdict read --format tree order.xsd\n" + indented(tree.out)))
        << help.out;
    EXPECT_TRUE(contains(help.out, options)) << help.out;

    RunResult readHelp = runZrdict({"read", "--help"});
    EXPECT_TRUE(contains(readHelp.out, indented(readFile(schema)))) << readHelp.out;
    EXPECT_TRUE(contains(readHelp.out, "  $ zrdict read order.xsd\n" + indented(tables.out)))
        << readHelp.out;
    EXPECT_TRUE(contains(readHelp.out, options)) << readHelp.out;
    EXPECT_TRUE(contains(readHelp.out, "{text,json,tree,dot}")) << readHelp.out;

    RunResult withoutPlugin = runZrdict({"--help", "--plugin", "/nonexistent/lib.so"});
    EXPECT_EQ(withoutPlugin.exitStatus, 0);
    EXPECT_TRUE(contains(withoutPlugin.out, "Plug-in options: not listed, cannot load plug-in "
                                            "'/nonexistent/lib.so'"))
        << withoutPlugin.out;
}

TEST(Read, TreeOpensNestedRecordsInPlaceAndEachOnce) {
    RunResult run =
        runZrdict({"read", "--format", "tree", dataDir() + "/e2e/shared-and-recursive.xsd"});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.err, "");
    EXPECT_EQ(run.out, "catalog (length 0)\n"
                       "├── node: Record, length 0\n"
                       "│   ├── label: string, length 0\n"
                       "│   └── node: Record, length 0 (recursive)\n"
                       "└── party: Record, length 0\n"
                       "    └── name: string, length 0\n"
                       "invoice (length 0)\n"
                       "├── party: Record, length 0 (shown above)\n"
                       "└── total: decimal, length 0\n");
}

TEST(Read, DotIsADigraphWithANodePerRecord) {
    RunResult run =
        runZrdict({"read", "--format", "dot", dataDir() + "/e2e/shared-and-recursive.xsd"});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_TRUE(startsWith(run.out, "digraph records {\n")) << run.out;
    for (const char* part : {"  r0 -> r1 [label=\"node\"];\n", "  r0 -> r2 [label=\"party\"];\n",
                             "  r1 -> r1 [label=\"node\"];\n", "  r3 -> r2 [label=\"party\"];\n",
                             "<b>invoice</b></td></tr><tr><td align=\"left\">total</td>"})
        EXPECT_TRUE(contains(run.out, part)) << part << " in\n" << run.out;
}

// A program that asks for JSON gets one JSON document on stdout and nothing on
// stderr, whatever went wrong, as long as the plug-in could be loaded.
struct JsonFailureCase {
    const char* name;
    std::vector<std::string> args;
    int exitStatus;
};

const JsonFailureCase kJsonFailureCases[] = {
    {"ReadMissingFile", {"read", "--format", "json", "/nonexistent/missing.xsd"}, 19},
    {"FlattenMissingFile", {"flatten", "--format", "json", "/nonexistent/missing.xsd", "x"}, 19},
    {"UnknownOptionName", {"read", "--format", "json", "--option", "Nope=1", example()}, 2},
    {"UnknownRecord", {"flatten", "--format", "json", example(), "noSuchRecord"}, 2},
    {"UnknownFlag", {"read", "--format", "json", "--bogus", example()}, 2},
    {"MissingSchema", {"read", "--format=json"}, 2},
};

void PrintTo(const JsonFailureCase& c, std::ostream* out) { *out << c.name; }

class JsonFailure : public ::testing::TestWithParam<JsonFailureCase> {};

TEST_P(JsonFailure, PrintsOneDocumentAndNothingOnStderr) {
    const JsonFailureCase& c = GetParam();
    RunResult run = runZrdict(c.args);
    EXPECT_EQ(run.exitStatus, c.exitStatus);
    EXPECT_EQ(run.err, "");
    Json doc = run.json();
    ASSERT_TRUE(doc.is_object());
    if (c.exitStatus == 2) {
        ASSERT_TRUE(doc.contains("error"));
        EXPECT_TRUE(doc["error"].is_string());
    } else {
        EXPECT_EQ(doc["status"], c.exitStatus);
        EXPECT_EQ(doc["records"], Json::array());
        ASSERT_TRUE(doc["messages"].is_array());
        EXPECT_FALSE(doc["messages"].empty());
    }
}

INSTANTIATE_TEST_SUITE_P(Zrdict, JsonFailure, ::testing::ValuesIn(kJsonFailureCases),
                         caseName<JsonFailureCase>);

TEST(Read, MissingFileReportsTheParserMessage) {
    RunResult run = runZrdict({"read", "--format", "json", "/nonexistent/missing.xsd"});
    EXPECT_EQ(run.exitStatus, 19);
    Json doc = run.json();
    ASSERT_TRUE(doc.is_object());
    EXPECT_EQ(doc.begin().key(), "status");
    ASSERT_EQ(doc["messages"].size(), 1u) << doc.dump(2);
    const Json& message = doc["messages"][0];
    EXPECT_EQ(message["severity"], 8);
    EXPECT_EQ(message["code"], 4);
    std::string text = message["text"];
    EXPECT_TRUE(startsWith(text, "Schema: Fatal: At line ")) << text;
    EXPECT_TRUE(contains(text, "/nonexistent/missing.xsd")) << text;
}

TEST(Read, TextOutputIsATablePerRecord) {
    RunResult run = runZrdict({"read", example()});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.err, "");
    EXPECT_TRUE(startsWith(run.out, "purchaseOrder (length ")) << run.out;
    EXPECT_TRUE(contains(run.out, "  field ")) << run.out;
    EXPECT_TRUE(contains(run.out, "precision  decimals  nulls\n")) << run.out;
    EXPECT_TRUE(contains(run.out, "\nitem (length ")) << run.out;
}

TEST(Read, TextOutputSendsMessagesToStderrWithSeverityAndCode) {
    RunResult run = runZrdict({"read", dataDir() + "/e2e/malformed-xml.xsd"});
    EXPECT_EQ(run.exitStatus, 19);
    EXPECT_EQ(run.out, "");
    EXPECT_TRUE(startsWith(run.err, "fatal 4: Schema: Fatal: At line ")) << run.err;
    EXPECT_TRUE(contains(run.err, "zrdict: reading ")) << run.err;
}

TEST(Options, JsonListsTheOptionsWithTheirValues) {
    RunResult run = runZrdict({"options", "--format", "json", "--option", "SchemaCatalog=a.xml"});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.err, "");
    Json expected = Json::parse(R"({"options": [{"key": "qualifiedrecordnames",
        "name": "QualifiedRecordNames", "description": "Strip leading blanks",
        "default": "False", "value": "False"}, {"key": "schemacatalog",
        "name": "SchemaCatalog", "description": "OASIS XML catalog files, separated by \";\", through which the locations and namespaces that schemas import or include are mapped to local files",
        "default": "", "value": "a.xml"}], "messages": []})");
    // The field detail options follow, all off by default; only their names and
    // values are the contract, their descriptions are prose.
    Json got = run.json();
    ASSERT_EQ(got["options"].size(), 5u) << got.dump();
    const char* detail[] = {"DecimalDigits", "OccurrenceNulls", "FieldDescriptions"};
    for (size_t i = 0; i < 3; ++i) {
        Json& option = got["options"][2 + i];
        EXPECT_EQ(option["name"], detail[i]);
        EXPECT_EQ(option["default"], "False");
        EXPECT_EQ(option["value"], "False");
        EXPECT_FALSE(option["description"].get<std::string>().empty());
    }
    got["options"].erase(got["options"].begin() + 2, got["options"].end());
    EXPECT_EQ(got, expected);
}

TEST(Options, AreAppliedInOrder) {
    struct Row {
        std::vector<std::string> settings;
        const char* value;
    };

    const Row rows[] = {
        {{"QualifiedRecordNames=True"}, "True"},
        {{"QualifiedRecordNames=True", "QualifiedRecordNames=False"}, "False"},
        {{"QualifiedRecordNames=False", "QUALIFIEDRECORDNAMES=TRUE"}, "True"},
        {{"QualifiedRecordNames="}, "False"},
    };
    for (const Row& row : rows) {
        std::vector<std::string> args = {"options", "--format", "json"};
        for (const std::string& setting : row.settings) {
            args.push_back("--option");
            args.push_back(setting);
        }
        RunResult run = runZrdict(args);
        SCOPED_TRACE(::testing::PrintToString(row.settings));
        ASSERT_EQ(run.exitStatus, 0) << run.out;
        EXPECT_EQ(run.json()["options"][0]["value"], row.value);
    }
}

TEST(Types, JsonListsTheBuiltinTable) {
    RunResult run = runZrdict({"types", "--format", "json"});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.err, "");
    Json doc = run.json();
    const Json& types = doc["types"];
    ASSERT_EQ(types.size(), 95u);
    for (size_t i = 0; i < types.size(); ++i) {
        const Json& entry = types[i];
        EXPECT_EQ(keysOf(entry),
                  (std::vector<std::string>{"index", "definition", "class", "alias", "usage"}));
        EXPECT_EQ(entry["index"], i);
        // Entries 50 on are the attribute variants: element usage + 256.
        EXPECT_EQ(entry["usage"].get<int>() >= 256, i >= 50 || i == 1 || i == 4) << i;
    }

    // Quoted aliases and a picture come through whole.
    EXPECT_EQ(types[4], Json::parse(R"({"index": 4, "definition":
        "Text;alias='Unquoted attribute';padchar_invalid;usage=259", "class": "Text",
        "alias": "Unquoted attribute", "usage": 259})"));
    EXPECT_EQ(types[55], Json::parse(R"({"index": 55, "definition":
        "DateTime;alias='duration attribute';length_invalid;precision_invalid;picture='yyyy-mm-ddTH24:MM:SS';usage=277",
        "class": "DateTime", "alias": "duration attribute", "usage": 277})"));
}

TEST(Types, TextListsOneLinePerType) {
    RunResult run = runZrdict({"types"});
    ASSERT_EQ(run.exitStatus, 0);
    size_t lines = 0;
    for (char c : run.out)
        lines += c == '\n';
    EXPECT_EQ(lines, 96u) << "a heading and 95 types:\n" << run.out;
    EXPECT_TRUE(contains(run.out, "'string attribute'")) << run.out;
}

// A copy of zrdict in a directory of its own: it looks beside itself first and
// falls back to the build tree only when nothing is there.
class PluginLookup : public ::testing::Test {
  protected:
    void SetUp() override {
        std::string pattern = (fs::temp_directory_path() / "zre2e-XXXXXX").string();
        ASSERT_NE(mkdtemp(pattern.data()), nullptr);
        dir = pattern;
        // The host libraries go along: zrdict finds them beside itself too.
        for (const fs::path& file : {fs::path(ZRDICT_PATH), fs::path(utilLibraryPath()),
                                     fs::path(utilLibraryPath()).parent_path() / "libzrapi.so"})
            fs::copy_file(file, dir / file.filename());
    }

    void TearDown() override { fs::remove_all(dir); }

    RunResult runCopy(const std::vector<std::string>& args) {
        return runZrdict(args, {}, (dir / "zrdict").string());
    }

    fs::path dir;
};

TEST_F(PluginLookup, FallsBackToTheBuildTree) {
    RunResult run = runCopy({"types", "--format", "json"});
    EXPECT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.json()["types"].size(), 95u);
}

TEST_F(PluginLookup, PrefersTheLibraryBesideTheProgram) {
    // Not a plug-in at all: if zrdict takes it, loading must fail and name it.
    fs::copy_file(utilLibraryPath(), dir / "libzrbxmls.so");
    RunResult run = runCopy({"types"});
    EXPECT_EQ(run.exitStatus, 3);
    EXPECT_TRUE(contains(run.err, (dir / "libzrbxmls.so").string())) << run.err;
    EXPECT_TRUE(contains(run.err, "NewBrowser")) << run.err;
    EXPECT_EQ(run.out, "");
}

TEST_F(PluginLookup, ExplicitPathWins) {
    fs::copy_file(utilLibraryPath(), dir / "libzrbxmls.so");
    RunResult run = runCopy({"types", "--plugin", pluginPath()});
    EXPECT_EQ(run.exitStatus, 0) << run.err;
}

} // namespace
