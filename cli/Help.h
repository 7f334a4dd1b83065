// What --help shows beyond CLI11's usage lines: a worked example, and the plug-in's
// options with their defaults, taken from the plug-in's own option table.
#pragma once

#include <string>

// The schema of the worked examples, as examples/order.xsd holds it.
extern const char* const kExampleSchema;

// `zrdict --help`: the example read as a tree, then the plug-in's options.
std::string mainHelpFooter(const std::string& pluginPath);
// `zrdict read --help`: the example read as tables, then the plug-in's options.
std::string readHelpFooter(const std::string& pluginPath);
// The plug-in's options, one a line with its default and description; loads the
// plug-in (`pluginPath`, or the default one when empty) to ask it. When it cannot be
// loaded, a line saying so instead.
std::string pluginOptionsHelp(const std::string& pluginPath);
