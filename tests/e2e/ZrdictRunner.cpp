#include "ZrdictRunner.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <sys/wait.h>
#include <unistd.h>

namespace {

std::string quoted(const std::string& text) {
    std::string out = "'";
    for (char c : text)
        out += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return out + "'";
}

std::string slurp(const std::string& path) {
    std::string text = readFile(path);
    std::filesystem::remove(path);
    return text;
}

} // namespace

std::string readFile(const std::string& path) {
    std::ostringstream text;
    text << std::ifstream(path, std::ios::binary).rdbuf();
    return text.str();
}

// The shell only redirects and then becomes the program, so the status is its own.
RunResult runZrdict(const std::vector<std::string>& args, const std::string& workDir,
                    const std::string& program) {
    static int runs = 0;
    const std::string base = (std::filesystem::temp_directory_path() /
                              ("zre2e-" + std::to_string(getpid()) + "-" + std::to_string(runs++)))
                                 .string();
    std::string command = workDir.empty() ? "exec " : "cd " + quoted(workDir) + " && exec ";
    command += quoted(program);
    for (const std::string& arg : args)
        command += " " + quoted(arg);
    command += " </dev/null >" + quoted(base + ".out") + " 2>" + quoted(base + ".err");
    const int status = std::system(command.c_str());
    RunResult result;
    result.exitStatus = WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
    result.out = slurp(base + ".out");
    result.err = slurp(base + ".err");
    return result;
}
