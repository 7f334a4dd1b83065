// The command-line contract of zrdict as other programs rely on it: exit statuses,
// where output goes, and the shape of the JSON documents.
#include "ZrdictRunner.h"

#include <algorithm>
#include <filesystem>
#include <gtest/gtest.h>

namespace fs = std::filesystem;

namespace {

const std::string kExample = ZR_EXAMPLES_DIR "/purchase-order.xsd";
const std::string kShared = ZR_TEST_DATA_DIR "/e2e/shared-and-recursive.xsd";
const std::string kMalformed = ZR_TEST_DATA_DIR "/e2e/malformed-xml.xsd";
const std::string kMissing = "/nonexistent/missing.xsd";
const std::string kNoPlugin = "/nonexistent/libzrbxmls.so";

bool contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

struct Case {
    const char* name;
    std::vector<std::string> args;
    int exitStatus;
    const char* errMentions = nullptr; // a text stderr must contain
    const char* outMentions = nullptr; // a text stdout must contain
};

const Case kCases[] = {
    {"NoCommand", {}, 2, "subcommand"},
    {"UnknownCommand", {"frobnicate"}, 2, "frobnicate"},
    {"UnknownFlag", {"read", "--bogus", kExample}, 2, "--bogus"},
    {"UnknownTopLevelFlag", {"--bogus", "types"}, 2, "--bogus"},
    {"MissingSchema", {"read"}, 2, "SCHEMA"},
    {"MissingFlattenRecord", {"flatten", kExample}, 2, "RECORD"},
    {"ExtraArgument", {"read", kExample, "surplus"}, 2, "surplus"},
    {"UnknownFormat", {"types", "--format", "yaml"}, 2, "yaml"},
    {"OptionWithoutValue", {"read", "--option", "QualifiedRecordNames", kExample}, 2, "NAME=VALUE"},
    {"UnknownOptionName", {"read", "--option", "NoSuchOption=1", kExample}, 2, "NoSuchOption"},
    {"UnknownOptionNameBeforeOptions", {"options", "--option", "Qualified=True"}, 2, "Qualified"},
    {"UnknownSpoke", {"flatten", "--spoke", "csv", kExample, "item"}, 2, "csv"},
    {"UnknownFlattenRecord", {"flatten", kExample, "noSuchRecord"}, 2, "noSuchRecord"},
    {"TreeOnlyForRecords", {"options", "--format", "tree"}, 2, "tree"},
    {"DotOnlyForRecords", {"types", "--format", "dot"}, 2, "dot"},
    {"MissingPlugin", {"--plugin", kNoPlugin, "types"}, 3, kNoPlugin.c_str()},
    {"MissingPluginAfterCommand", {"types", "--plugin", kNoPlugin}, 3, kNoPlugin.c_str()},
    {"PluginWithoutEntryPoints", {"types", "--plugin", ZRUTIL_PATH}, 3, "NewBrowser"},
    {"Help", {"--help"}, 0, nullptr, "flatten"},
    {"CommandHelp", {"flatten", "--help"}, 0, nullptr, "SCHEMA RECORD"},
    {"HelpWithMissingPlugin", {"read", "--help", "--plugin", kNoPlugin}, 0, nullptr, "SCHEMA"},
    {"Version", {"--version"}, 0, nullptr, "zrdict "},
    {"PluginBeforeCommand", {"--plugin", ZRBXMLS_PATH, "types"}, 0, nullptr, "'string attribute'"},
    {"PluginAfterCommand", {"options", "--plugin", ZRBXMLS_PATH}, 0, nullptr, "SchemaCatalog"},
    {"ReadText", {"read", kExample}, 0, nullptr, "precision  decimals  nulls\n"},
    {"ReadTree", {"read", "--format", "tree", kShared}, 0, nullptr, "length 0 (recursive)\n"},
    {"ReadDot", {"read", "--format=dot", kShared}, 0, nullptr, "  r3 -> r2 [label=\"party\"];\n"},
    {"FlattenText", {"flatten", "--spoke", "text", kExample, "item"}, 0, nullptr, "Character"},
    {"FlattenTree", {"flatten", "--format", "tree", kExample, "item"}, 0, nullptr, "item (length"},
    {"ReadMissingFile", {"read", kMissing}, 19, "zrdict: reading "},
    {"FlattenMissingFile", {"flatten", kMissing, "item"}, 19, "fatal 4: "},
    {"TreeMissingFile", {"read", "--format", "tree", kMissing}, 19, "fatal 4: Schema: Fatal: "},
    {"DotMissingFile", {"read", "--format", "dot", kMissing}, 19, "fatal 4: "},
    {"MalformedText", {"read", kMalformed}, 19, "fatal 4: Schema: Fatal: At line "},
    // A program that asks for JSON gets one document on stdout and nothing on
    // stderr, whatever went wrong, as long as the plug-in could be loaded.
    {"JsonReadMissingFile", {"read", "--format", "json", kMissing}, 19},
    {"JsonFlattenMissingFile", {"flatten", "--format", "json", kMissing, "x"}, 19},
    {"JsonUnknownOptionName", {"read", "--format", "json", "--option", "Nope=1", kExample}, 2},
    {"JsonUnknownRecord", {"flatten", "--format", "json", kExample, "noSuchRecord"}, 2},
    {"JsonUnknownFlag", {"read", "--format", "json", "--bogus", kExample}, 2},
    {"JsonMissingSchema", {"read", "--format=json"}, 2},
};

class Zrdict : public ::testing::TestWithParam<Case> {};

TEST_P(Zrdict, ExitStatusAndOutputAsPromised) {
    const Case& c = GetParam();
    const RunResult run = runZrdict(c.args);
    SCOPED_TRACE("stdout:\n" + run.out + "\nstderr:\n" + run.err);
    EXPECT_EQ(run.exitStatus, c.exitStatus);
    EXPECT_TRUE(!c.errMentions || contains(run.err, c.errMentions));
    EXPECT_TRUE(!c.outMentions || contains(run.out, c.outMentions));
    const bool json = std::any_of(c.args.begin(), c.args.end(),
                                  [](const std::string& a) { return contains(a, "json"); });
    EXPECT_TRUE(run.err.empty() || (c.exitStatus != 0 && !json));
    if (!json)
        return;
    const Json doc = Json::parse(run.out);
    if (c.exitStatus == 2) {
        EXPECT_TRUE(doc["error"].is_string()) << doc;
        return;
    }
    EXPECT_EQ(doc.begin().key(), "status");
    EXPECT_EQ(doc["status"], c.exitStatus);
    EXPECT_EQ(doc["records"], Json::array());
    ASSERT_EQ(doc["messages"].size(), 1u) << doc;
    EXPECT_EQ(doc["messages"][0]["severity"], 8);
    EXPECT_EQ(doc["messages"][0]["code"], 4);
    EXPECT_TRUE(contains(doc["messages"][0]["text"], kMissing)) << doc;
}

INSTANTIATE_TEST_SUITE_P(Zrdict, Zrdict, ::testing::ValuesIn(kCases),
                         [](const auto& row) { return std::string(row.param.name); });

std::string indented(const std::string& text) {
    std::string out;
    for (size_t start = 0; start < text.size();) {
        const size_t end = text.find('\n', start);
        out += (end > start ? "  " : "") + text.substr(start, end - start + 1);
        start = end + 1;
    }
    return out;
}

// The help's worked example is what zrdict really prints for the example schema it
// shows, and the plug-in's options come from the plug-in.
TEST(Usage, HelpShowsAWorkedExampleAndThePluginsOptions) {
    const std::string schema = ZR_EXAMPLES_DIR "/order.xsd";
    const std::string text = readFile(schema);
    const RunResult tree = runZrdict({"read", "--format", "tree", schema});
    const RunResult tables = runZrdict({"read", schema});
    const std::string options = "--option NAME=VALUE ('zrdict options' shows their values):\n"
                                "  QualifiedRecordNames  default False  Strip leading blanks\n";

    const RunResult help = runZrdict({"--help"});
    for (const std::string& part :
         {indented(text), "  $ zrdict read --format tree order.xsd\n" + indented(tree.out), options,
          std::string("types")})
        EXPECT_TRUE(contains(help.out, part)) << part << " in\n" << help.out;
    const RunResult readHelp = runZrdict({"read", "--help"});
    for (const std::string& part :
         {indented(text), "  $ zrdict read order.xsd\n" + indented(tables.out), options,
          std::string("{text,json,tree,dot}")})
        EXPECT_TRUE(contains(readHelp.out, part)) << part << " in\n" << readHelp.out;

    const RunResult withoutPlugin = runZrdict({"--help", "--plugin", "/nonexistent/lib.so"});
    EXPECT_TRUE(contains(withoutPlugin.out, "Plug-in options: not listed, cannot load plug-in "
                                            "'/nonexistent/lib.so'"))
        << withoutPlugin.out;
}

// Options are applied in the order given, by the name as written or all lower case.
TEST(Options, JsonListsTheOptionsWithTheirValues) {
    const RunResult run =
        runZrdict({"options", "--format", "json", "--option", "QualifiedRecordNames=True",
                   "--option", "SchemaCatalog=a.xml", "--option", "qualifiedrecordnames=False",
                   "--option", "OccurrenceNulls=True"});
    ASSERT_EQ(run.exitStatus, 0) << run.err;
    EXPECT_EQ(run.err, "");
    const Json got = Json::parse(run.out);
    // Only the names and values are the contract; descriptions are prose.
    std::string values;
    for (const Json& option : got["options"])
        values += option["name"].get<std::string>() + "=" + option["value"].get<std::string>() +
                  " (" + option["default"].get<std::string>() + ") ";
    EXPECT_EQ(values,
              "QualifiedRecordNames=False (False) SchemaCatalog=a.xml () DecimalDigits=False "
              "(False) OccurrenceNulls=True (False) FieldDescriptions=False (False) ");
}

// A copy of zrdict in a directory of its own looks for the plug-in beside itself
// first and falls back to the build tree only when nothing is there. The types
// come from that plug-in, in its order.
TEST(PluginLookup, BesideTheProgramThenTheBuildTreeListingItsTypes) {
    std::string pattern = (fs::temp_directory_path() / "zre2e-XXXXXX").string();
    ASSERT_NE(mkdtemp(pattern.data()), nullptr);
    const fs::path dir = pattern;
    // The host libraries go along: zrdict finds them beside itself too.
    for (const fs::path& file : {fs::path(ZRDICT_PATH), fs::path(ZRUTIL_PATH),
                                 fs::path(ZRUTIL_PATH).parent_path() / "libzrapi.so"})
        fs::copy_file(file, dir / file.filename());
    const std::string copy = (dir / "zrdict").string();

    const RunResult fallback = runZrdict({"types", "--format", "json"}, {}, copy);
    EXPECT_EQ(fallback.exitStatus, 0) << fallback.err;
    // Not a plug-in at all: if zrdict takes it, loading must fail and name it.
    fs::copy_file(ZRUTIL_PATH, dir / "libzrbxmls.so");
    const RunResult beside = runZrdict({"types"}, {}, copy);
    EXPECT_EQ(beside.exitStatus, 3);
    EXPECT_TRUE(contains(beside.err, (dir / "libzrbxmls.so").string())) << beside.err;
    EXPECT_TRUE(contains(beside.err, "NewBrowser")) << beside.err;
    const RunResult text = runZrdict({"types", "--plugin", ZRBXMLS_PATH}, {}, copy);
    EXPECT_EQ(text.exitStatus, 0);
    EXPECT_EQ(std::count(text.out.begin(), text.out.end(), '\n'), 96) << "a heading and 95 types";
    fs::remove_all(dir);

    const Json types = Json::parse(fallback.out)["types"];
    ASSERT_EQ(types.size(), 95u);
    for (size_t i = 0; i < types.size(); ++i)
        EXPECT_EQ(types[i]["index"], i);
    // Quoted aliases and a picture come through whole.
    EXPECT_EQ(types[55], Json::parse(R"({"index": 55, "definition":
        "DateTime;alias='duration attribute';length_invalid;precision_invalid;picture='yyyy-mm-ddTH24:MM:SS';usage=277",
        "class": "DateTime", "alias": "duration attribute", "usage": 277})"));
}

} // namespace
