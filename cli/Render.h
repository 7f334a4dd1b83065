// What zrdict prints about the plug-in itself (options, types) and on usage errors:
// small JSON documents for programs and aligned tables for people. Records are
// printed by RecordOutput.h.
#pragma once

#include "MessageLog.h"
#include "zrapi.h"

#include <nlohmann/json.hpp>
#include <ostream>
#include <string>
#include <vector>

using Json = nlohmann::ordered_json;

Json messagesToJson(const std::vector<LoggedMessage>& messages);
// One entry per type-definition string, up to the terminating null.
Json typeDefinitionsToJson(const char* const* definitions);
// One entry per option definition with its current value in `dict`.
Json optionsToJson(const ZrDictBrowser& dict);

// Writes one document and a newline. Text that is not valid UTF-8 is replaced
// rather than failing the whole output.
void printJson(std::ostream& out, const Json& document);

void printTypesText(std::ostream& out, const char* const* definitions);
void printOptionsText(std::ostream& out, const ZrDictBrowser& dict);

// UTF-8 of host wide text.
std::string narrow(const ZrWString& text);
