// Runs the real zrdict binary and captures what it says.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

using Json = nlohmann::ordered_json;

struct RunResult {
    int exitStatus = -1; // the exit status, or 128 + the signal that ended the process
    std::string out;
    std::string err;
};

// Runs `program` (the built zrdict by default) with `args` in `workDir` (the
// current directory when empty), with stdin from /dev/null.
RunResult runZrdict(const std::vector<std::string>& args, const std::string& workDir = {},
                    const std::string& program = ZRDICT_PATH);

// The whole of a file; empty when it cannot be read.
std::string readFile(const std::string& path);
