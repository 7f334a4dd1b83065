// zrdict: a small command-line host for the zrbxmls plug-in. It loads the plug-in
// at run time and drives it only through the dictionary-browser interface, as the
// engine does, so what it prints is what the engine would see.
#include "Commands.h"
#include "Help.h"

#include <CLI/CLI.hpp>
#include <cstring>
#include <string>

namespace {

constexpr const char* kExitStatusHelp =
    "Exit status: 0 success, 2 usage error, 3 plug-in not loaded, 5 flattening failed,\n"
    "19 the read failed (the messages say why).";

OutputFormat formatNamed(const std::string& name) {
    if (name == "json")
        return OutputFormat::Json;
    if (name == "tree")
        return OutputFormat::Tree;
    if (name == "dot")
        return OutputFormat::Dot;
    return OutputFormat::Text;
}

// CLI11 reports usage errors before the --format option has been stored, yet a
// program that asked for JSON expects JSON even then; so look for it directly.
OutputFormat requestedFormat(int argc, char** argv) {
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--format=json") == 0)
            return OutputFormat::Json;
        if (std::strcmp(argv[i], "--format") == 0 && i + 1 < argc &&
            std::strcmp(argv[i + 1], "json") == 0)
            return OutputFormat::Json;
    }
    return OutputFormat::Text;
}

// Every subcommand takes --plugin too, so it may stand before or after the name.
void addPluginOption(CLI::App& app, std::string& path) {
    app.add_option("--plugin", path,
                   "Plug-in library to load (default: libzrbxmls.so beside zrdict, else in "
                   "the installation's library folder, else the build tree's)")
        ->type_name("PATH");
}

void addFormatOption(CLI::App& app, std::string& format) {
    app.add_option("--format", format, "Output: text for people (default) or json for programs")
        ->type_name("FORMAT")
        ->check(CLI::IsMember({"text", "json"}));
}

// read and flatten print records, which have two more views.
void addRecordFormatOption(CLI::App& app, std::string& format) {
    app.add_option("--format", format,
                   "Output: text, tables for people (default); json, one document for "
                   "programs; tree, how records nest; dot, a Graphviz graph of the records")
        ->type_name("FORMAT")
        ->check(CLI::IsMember({"text", "json", "tree", "dot"}));
}

void addOptionOption(CLI::App& app, std::vector<std::string>& options) {
    const CLI::Validator nameValue(
        [](std::string& text) {
            return text.find('=') == std::string::npos || text.front() == '='
                       ? std::string("expected NAME=VALUE, got '" + text + "'")
                       : std::string();
        },
        "");
    app.add_option("--option", options,
                   "Set a plug-in option before anything else, e.g. QualifiedRecordNames=True "
                   "(repeatable, applied in order)")
        ->type_name("NAME=VALUE")
        ->allow_extra_args(false)
        ->check(nameValue);
}

} // namespace

int main(int argc, char** argv) {
    Invocation inv;
    std::string format = "text";

    CLI::App app{"Reads XML Schema documents into record dictionaries through the zrbxmls "
                 "plug-in.",
                 "zrdict"};
    app.footer([&inv] { return mainHelpFooter(inv.pluginPath); });
    app.set_version_flag("--version", std::string("zrdict ") + ZRDICT_VERSION);
    app.require_subcommand(1);
    app.footer(kExitStatusHelp);
    addPluginOption(app, inv.pluginPath);
    // Help is printed once the command line is parsed, so a --plugin given with
    // --help names the plug-in whose options are listed.
    auto optionsFooter = [&inv] { return pluginOptionsHelp(inv.pluginPath); };

    CLI::App* read = app.add_subcommand("read", "Read SCHEMA and print its records");
    addPluginOption(*read, inv.pluginPath);
    addOptionOption(*read, inv.options);
    addRecordFormatOption(*read, format);
    read->footer([&inv] { return readHelpFooter(inv.pluginPath); });
    read->add_option("SCHEMA", inv.schema, "Schema document")->type_name("PATH")->required();

    CLI::App* options =
        app.add_subcommand("options", "List the plug-in's options with their current values");
    addPluginOption(*options, inv.pluginPath);
    addOptionOption(*options, inv.options);
    addFormatOption(*options, format);
    options->footer(optionsFooter);

    CLI::App* types =
        app.add_subcommand("types", "List the plug-in's built-in type definitions in order");
    addPluginOption(*types, inv.pluginPath);
    addFormatOption(*types, format);

    CLI::App* flatten = app.add_subcommand(
        "flatten", "Read SCHEMA, flatten its record RECORD into a new record and print that");
    addPluginOption(*flatten, inv.pluginPath);
    addOptionOption(*flatten, inv.options);
    addRecordFormatOption(*flatten, format);
    flatten->footer(optionsFooter);
    flatten
        ->add_option("--spoke", inv.spoke,
                     "Sample connector that translates data types (text: every type becomes "
                     "text of the same length); default: none")
        ->type_name("NAME")
        ->check(CLI::IsMember(spokeNames()));
    flatten->add_option("SCHEMA", inv.schema, "Schema document")->type_name("PATH")->required();
    flatten->add_option("RECORD", inv.record, "Name of the record to flatten")
        ->type_name("NAME")
        ->required();

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        // Help and version end here with status 0; everything else CLI11 rejects is
        // a usage error, whatever code CLI11 would give it.
        if (e.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
            app.exit(e);
            return ExitStatus::Success;
        }
        // CLI11 calls a stray first word "a missing subcommand"; name the word.
        std::string text = e.what();
        if (app.get_subcommands().empty() && !app.remaining().empty())
            text = "unknown command '" + app.remaining().front() + "'";
        if (requestedFormat(argc, argv) == OutputFormat::Json)
            return reportUsageError(OutputFormat::Json, text);
        if (text != e.what())
            return reportUsageError(OutputFormat::Text, text + " (run with --help for usage)");
        app.exit(e);
        return ExitStatus::Usage;
    }

    inv.format = formatNamed(format);
    for (CLI::App* command : {read, options, types, flatten})
        if (command->parsed())
            inv.command = command->get_name();
    return runCommand(inv);
}
