// Reading helpers of the schema and model tests: read a schema into a fresh
// model and print it as stable text.
#pragma once

#include "FPInput.h"
#include "ParserConfig.h"
#include "SchemaReader.h"
#include "TestSupport.h"

#include <string>
#include <utility>

namespace zrtest {

// Readers expect the parser library initialised, as the plug-in does before any read.
inline const bool kParserLibraryReady = parserLibraryError() == nullptr;

// "{ns}local", or "local" without a namespace; the XML Schema namespace prints
// as "xs". A generated name prints as messages show it, "anonN".
inline std::string qname(const ZrName& local, const ZrName& ns) {
    const std::string text = utf8(std::u16string_view(local.c_str()));
    if (ns.empty())
        return text;
    const std::string uri = utf8(ns);
    return "{" + (uri == kXsdNs ? "xs" : uri) + "}" + text;
}

inline std::string dumpElement(const ElementDef& e) {
    std::string out = e.isAttribute ? "attribute" : "element";
    auto part = [&out](const char* key, const ZrName& local, const ZrName& ns) {
        if (!local.empty() || !ns.empty())
            out += std::string(" ") + key + "=" + qname(local, ns);
    };
    part("name", e.name, e.nameNs);
    part("type", e.typeName, e.typeNs);
    part("ref", e.refName, e.refNs);
    part("group", e.groupName, e.groupNs);
    return out + (e.nullable ? "" : " !nullable");
}

// The name, base, facets as written, longest enumeration and union members.
inline std::string dumpTypeParts(const SimpleTypeDef& t) {
    std::string out = qname(t.name, t.nameNs);
    if (!t.baseName.empty() || !t.baseNs.empty())
        out += " base=" + qname(t.baseName, t.baseNs);
    const std::pair<const char*, const ZrName*> facets[] = {{"minInclusive", &t.minInclusive},
                                                            {"maxInclusive", &t.maxInclusive},
                                                            {"minExclusive", &t.minExclusive},
                                                            {"maxExclusive", &t.maxExclusive},
                                                            {"length", &t.length},
                                                            {"minLength", &t.minLength},
                                                            {"maxLength", &t.maxLength},
                                                            {"pattern", &t.pattern},
                                                            {"precision", &t.precision},
                                                            {"scale", &t.scale},
                                                            {"encoding", &t.encoding},
                                                            {"period", &t.period},
                                                            {"duration", &t.duration}};
    for (const auto& [key, value] : facets) {
        if (!value->empty())
            out += std::string(" ") + key + "=" + utf8(*value);
    }
    if (t.maxEnumLength != 0)
        out += " enum=" + std::to_string(t.maxEnumLength);
    for (size_t i = 0; t.isUnion && i < t.memberTypes.size(); ++i)
        out += (i ? "," : " union=") + qname(t.memberTypes[i].name, t.memberTypes[i].ns);
    return out;
}

// One line per component: top-level declarations, complex types (their content
// indented below them), simple types, each in stored order.
inline std::string dumpModel(const SchemaModel& model) {
    std::string out;
    for (const ElementDef& e : model.globalElements)
        out += "global " + dumpElement(e) + "\n";
    for (const ComplexTypeDef& t : model.complexTypes) {
        out += "complexType " + dumpTypeParts(t) + (t.isGroup ? " group" : "") +
               (t.simpleContent ? " simpleContent" : "") + "\n";
        for (const ElementDef& e : t.content)
            out += "  " + dumpElement(e) + "\n";
    }
    for (const SimpleTypeDef& t : model.simpleTypes)
        out += "simpleType " + dumpTypeParts(t) + "\n";
    return out;
}

// Replaces every occurrence of `from` in `text`.
inline std::string replaceAll(std::string text, const std::string& from, const std::string& to) {
    for (size_t at = text.find(from); !from.empty() && at != std::string::npos;
         at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
    return text;
}

// True when `text` matches `pattern`, in which '*' stands for any run of
// characters, line ends included; the parser's own texts are matched that way.
inline bool globMatch(const std::string& pattern, const std::string& text) {
    size_t p = 0, t = 0, star = std::string::npos, mark = 0;
    while (t < text.size()) {
        if (p < pattern.size() && pattern[p] == '*') {
            star = p++;
            mark = t;
        } else if (p < pattern.size() && pattern[p] == text[t]) {
            ++p;
            ++t;
        } else if (star != std::string::npos) {
            p = star + 1;
            t = ++mark;
        } else {
            return false;
        }
    }
    while (p < pattern.size() && pattern[p] == '*')
        ++p;
    return p == pattern.size();
}

struct ReadOutcome {
    bool ok;
    std::string model; // dumpModel after the read
    std::string log;   // LogCapture lines, the temporary folder shown as "$DIR"
};

// Reads `mainPath` into a fresh model, the input handed out at most `chunk` bytes
// at a time (0: as much as the parser asks for).
inline ReadOutcome readSchemaFile(const std::string& mainPath, const std::string& dir,
                                  XMLSize_t chunk = 0) {
    const XMLSize_t saved = FPInputStream::chunkLimit.exchange(chunk);
    LogCapture log;
    SchemaModel model;
    SchemaReader reader(model);
    const bool ok = reader.read(wide(mainPath).c_str());
    FPInputStream::chunkLimit.store(saved);
    return {ok, dumpModel(model), replaceAll(log.lines(), dir, "$DIR")};
}

// Reads one schema document given as text.
inline ReadOutcome readSchemaText(const std::string& document, XMLSize_t chunk = 0) {
    TempDir dir;
    return readSchemaFile(dir.write("main.xsd", document), dir.path().string(), chunk);
}

} // namespace zrtest
