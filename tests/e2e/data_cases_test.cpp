// Every tests/data/e2e/<name>.xsd with a sibling <name>.expected.json is one case:
// zrdict reads the schema with JSON output and must print exactly the expected
// document. <name>.args, when present, holds extra arguments one per line; a first
// line naming another subcommand ("flatten") replaces "read". The schema path always follows
// "--format json", the rest after it, e.g. for flatten the record's name.
//
// zrdict runs inside the data directory with a relative schema path, so the paths
// in messages do not depend on where the tree is checked out; any absolute
// mention of that directory is replaced by "<data>" as well.
//
// ZR_REGEN=1 rewrites each expected file from what zrdict prints instead of
// comparing; review the diff before keeping it. To add a case, create an empty
// <name>.expected.json beside <name>.xsd and regenerate.
#include "ZrdictRunner.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

namespace fs = std::filesystem;

namespace {

const fs::path kCaseDir = fs::path(ZR_TEST_DATA_DIR) / "e2e";

std::vector<std::string> listCases() {
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : fs::directory_iterator(kCaseDir))
        if (entry.path().extension() == ".xsd" &&
            fs::exists(fs::path(entry.path()).replace_extension(".expected.json")))
            names.push_back(entry.path().stem().string());
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> commandLine(const std::string& name, const std::string& format) {
    std::vector<std::string> args = {"read", "--format", format, name + ".xsd"};
    std::istringstream lines(readFile(kCaseDir / (name + ".args")));
    for (std::string line; std::getline(lines, line);) {
        if (line == "flatten" && args.size() == 4)
            args[0] = line;
        else
            args.push_back(line);
    }
    return args;
}

void replaceAll(std::string& text, const std::string& from, const std::string& to) {
    for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
}

class SchemaFiles : public ::testing::TestWithParam<std::string> {};

// The views for people show every record the JSON lists and fail as the read does;
// Graphviz's own program, where it is installed, accepts the graph.
TEST_P(SchemaFiles, PrintExpectedJsonTreeAndGraph) {
    const std::string& name = GetParam();
    const std::vector<std::string> args = commandLine(name, "json");
    RunResult run = runZrdict(args, kCaseDir.string());
    replaceAll(run.out, fs::canonical(kCaseDir).string(), "<data>");
    replaceAll(run.out, kCaseDir.string(), "<data>");

    SCOPED_TRACE("zrdict " + ::testing::PrintToString(args));
    EXPECT_EQ(run.err, "") << "JSON output must leave stderr silent";
    const Json actual = Json::parse(run.out);
    EXPECT_EQ(run.exitStatus, actual["status"]) << "zrdict exits with the status it prints";

    const fs::path expectedPath = kCaseDir / (name + ".expected.json");
    const char* regen = std::getenv("ZR_REGEN");
    if (regen && std::string(regen) == "1") {
        std::ofstream(expectedPath, std::ios::binary) << actual.dump(2) << '\n';
        return;
    }
    const std::string expectedText = readFile(expectedPath);
    ASSERT_FALSE(expectedText.empty()) << expectedPath << " is empty: regenerate with ZR_REGEN=1";
    const Json expected = Json::parse(expectedText);
    EXPECT_EQ(expected, actual) << "differences (JSON patch from expected to actual):\n"
                                << Json::diff(expected, actual).dump(2);
    // Programs may compare the output as text: the bytes are fixed too.
    EXPECT_EQ(run.out, expectedText);

    const RunResult tree = runZrdict(commandLine(name, "tree"), kCaseDir.string());
    EXPECT_EQ(tree.exitStatus, run.exitStatus) << tree.err;
    for (const Json& record : actual.value("records", Json::array()))
        EXPECT_NE(tree.out.find(record["name"].get<std::string>()), std::string::npos)
            << record["name"] << " in\n"
            << tree.out;
    const RunResult graph = runZrdict(commandLine(name, "dot"), kCaseDir.string());
    EXPECT_EQ(graph.exitStatus, run.exitStatus) << graph.err;
    if (graph.exitStatus != 0)
        return; // a failed read prints no graph
    const fs::path file = fs::temp_directory_path() / ("zre2e-" + name + ".dot");
    std::ofstream(file, std::ios::binary) << graph.out;
    const RunResult svg = runZrdict(
        {"-c", "command -v dot >/dev/null || exit 77; exec dot -Tsvg \"$0\"", file.string()}, {},
        "/bin/sh");
    fs::remove(file);
    if (svg.exitStatus == 77)
        GTEST_SKIP() << "Graphviz's dot is not installed";
    EXPECT_EQ(svg.exitStatus, 0) << svg.err << "\nfor:\n" << graph.out;
    EXPECT_EQ(svg.err, "") << graph.out;
    EXPECT_NE(svg.out.find("<svg"), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(E2E, SchemaFiles, ::testing::ValuesIn(listCases()), [](const auto& row) {
    std::string name = row.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
});

} // namespace
