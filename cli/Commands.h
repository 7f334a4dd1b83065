// The subcommands of zrdict, run against a plug-in loaded for the purpose.
#pragma once

#include <string>
#include <vector>

// Exit statuses, as programs that run zrdict rely on them.
namespace ExitStatus {
constexpr int Success = 0;
constexpr int Usage = 2;
constexpr int PluginLoad = 3;
constexpr int FlattenFailed = 5;
constexpr int ReadFailed = 19;
} // namespace ExitStatus

// text and json for every command; tree and dot for the records of read and flatten.
enum class OutputFormat { Text, Json, Tree, Dot };

// What the command line asked for, once parsed.
struct Invocation {
    std::string command; // "read", "options", "types" or "flatten"
    OutputFormat format = OutputFormat::Text;
    std::string pluginPath;           // empty: look in the usual places
    std::vector<std::string> options; // "NAME=VALUE", applied in order
    std::string schema;
    std::string record;
    std::string spoke; // empty: no connector
};

// Names of the sample connectors --spoke accepts.
const std::vector<std::string>& spokeNames();

// Runs the command and returns the exit status.
int runCommand(const Invocation& invocation);

// Reports a usage error in the requested format (on stdout as a JSON document,
// else on stderr) and returns ExitStatus::Usage.
int reportUsageError(OutputFormat format, const std::string& text);
