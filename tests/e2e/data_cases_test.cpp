// Every tests/data/e2e/<name>.xsd with a sibling <name>.expected.json is one case:
// zrdict reads the schema with JSON output and must print exactly the expected
// document. <name>.args, when present, holds extra arguments one per line (blank
// lines and lines starting with '#' are skipped); a first line naming another
// subcommand ("flatten") replaces "read". The schema path always follows
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
#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <unistd.h>

namespace fs = std::filesystem;

namespace {

const char* const kExpectedSuffix = ".expected.json";

fs::path caseDir() { return fs::path(dataDir()) / "e2e"; }

bool regenerating() {
    const char* flag = std::getenv("ZR_REGEN");
    return flag && std::string(flag) == "1";
}

std::vector<std::string> listCases() {
    std::vector<std::string> names;
    std::error_code ec;
    for (const fs::directory_entry& entry : fs::directory_iterator(caseDir(), ec)) {
        std::string file = entry.path().filename().string();
        if (entry.path().extension() != ".xsd")
            continue;
        std::string name = file.substr(0, file.size() - 4);
        if (fs::exists(caseDir() / (name + kExpectedSuffix)))
            names.push_back(name);
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::string readFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

std::vector<std::string> readArgs(const fs::path& path) {
    std::vector<std::string> args;
    std::ifstream in(path);
    std::string line;
    while (std::getline(in, line)) {
        if (!line.empty() && line.back() == '\r')
            line.pop_back();
        if (line.empty() || line.front() == '#')
            continue;
        args.push_back(line);
    }
    return args;
}

std::vector<std::string> commandLine(const std::string& name, const std::string& format = "json") {
    std::vector<std::string> extra = readArgs(caseDir() / (name + ".args"));
    std::string command = "read";
    if (!extra.empty() && extra.front() == "flatten") {
        command = extra.front();
        extra.erase(extra.begin());
    }
    std::vector<std::string> args = {command, "--format", format, name + ".xsd"};
    args.insert(args.end(), extra.begin(), extra.end());
    return args;
}

void replaceAll(std::string& text, const std::string& from, const std::string& to) {
    for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
}

// The exit status that goes with a document, as the exit-status table pairs them.
int exitStatusFor(const Json& doc) {
    if (doc.contains("error"))
        return 2;
    int status = doc.value("status", -1);
    if (status == 0 || status == 19)
        return status;
    return 5;
}

std::string testName(const ::testing::TestParamInfo<std::string>& info) {
    std::string name = info.param;
    for (char& c : name)
        if (!std::isalnum(static_cast<unsigned char>(c)))
            c = '_';
    return name;
}

class SchemaFiles : public ::testing::TestWithParam<std::string> {};

TEST_P(SchemaFiles, PrintExpectedJson) {
    const std::string& name = GetParam();
    std::vector<std::string> args = commandLine(name);
    RunResult run = runZrdict(args, caseDir().string());
    replaceAll(run.out, fs::canonical(caseDir()).string(), "<data>");
    replaceAll(run.out, caseDir().string(), "<data>");

    SCOPED_TRACE("zrdict " + ::testing::PrintToString(args));
    EXPECT_EQ(run.err, "") << "JSON output must leave stderr silent";
    Json actual = run.json();
    ASSERT_FALSE(actual.is_null());
    EXPECT_EQ(run.exitStatus, exitStatusFor(actual));

    fs::path expectedPath = caseDir() / (name + kExpectedSuffix);
    if (regenerating()) {
        std::ofstream(expectedPath, std::ios::binary) << actual.dump(2) << '\n';
        std::cout << "[ REGEN    ] wrote " << expectedPath.string() << '\n';
        return;
    }
    std::string expectedText = readFile(expectedPath);
    ASSERT_FALSE(expectedText.empty())
        << expectedPath.string() << " is empty: run the tests with ZR_REGEN=1 to fill it";
    Json expected = Json::parse(expectedText);
    EXPECT_EQ(expected, actual) << "differences (JSON patch from expected to actual):\n"
                                << Json::diff(expected, actual).dump(2) << "\nactual:\n"
                                << actual.dump(2);
    // Programs may compare the output as text: the bytes are fixed too.
    EXPECT_EQ(run.out, expectedText);
}

// The views for people show every record the JSON lists, and fail as the read does.
TEST_P(SchemaFiles, TreeShowsEveryRecord) {
    const std::string& name = GetParam();
    RunResult json = runZrdict(commandLine(name), caseDir().string());
    RunResult tree = runZrdict(commandLine(name, "tree"), caseDir().string());
    EXPECT_EQ(tree.exitStatus, json.exitStatus) << tree.err;
    Json doc = json.json();
    if (!doc.contains("records"))
        return;
    for (const Json& record : doc["records"]) {
        const std::string recordName = record["name"];
        EXPECT_TRUE(tree.out.find(recordName) != std::string::npos) << recordName << " in\n"
                                                                    << tree.out;
    }
}

// Graphviz's own program, where it is installed.
std::string dotProgram() {
    const char* path = std::getenv("PATH");
    std::string dirs = path ? path : "/usr/bin";
    for (size_t start = 0; start <= dirs.size();) {
        size_t end = std::min(dirs.find(':', start), dirs.size());
        fs::path candidate = fs::path(dirs.substr(start, end - start)) / "dot";
        if (!candidate.parent_path().empty() && access(candidate.c_str(), X_OK) == 0)
            return candidate.string();
        start = end + 1;
    }
    return {};
}

TEST_P(SchemaFiles, GraphvizAcceptsTheGraph) {
    const std::string dot = dotProgram();
    if (dot.empty())
        GTEST_SKIP() << "Graphviz's dot is not installed";
    const std::string& name = GetParam();
    RunResult graph = runZrdict(commandLine(name, "dot"), caseDir().string());
    if (graph.exitStatus != 0)
        return; // a failed read prints no graph
    std::string pattern = (fs::temp_directory_path() / "zre2e-dot-XXXXXX").string();
    int fd = mkstemp(pattern.data());
    ASSERT_GE(fd, 0);
    close(fd);
    std::ofstream(pattern, std::ios::binary) << graph.out;
    RunResult svg = runZrdict({"-Tsvg", pattern}, {}, dot);
    fs::remove(pattern);
    EXPECT_EQ(svg.exitStatus, 0) << svg.err << "\nfor:\n" << graph.out;
    EXPECT_EQ(svg.err, "") << graph.out;
    EXPECT_NE(svg.out.find("<svg"), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(E2E, SchemaFiles, ::testing::ValuesIn(listCases()), testName);
GTEST_ALLOW_UNINSTANTIATED_PARAMETERIZED_TEST(SchemaFiles);

} // namespace
