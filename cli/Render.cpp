#include "Render.h"

#include "zrdtype.h"
#include "zrstring.h"

#include <algorithm>

namespace {

// Display width of UTF-8 text, counted in code points: close enough for the
// names and aliases of a schema.
size_t displayWidth(const std::string& text) {
    return static_cast<size_t>(std::count_if(text.begin(), text.end(), [](char c) {
        return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    }));
}

struct Column {
    const char* title;
    bool rightAligned;
};

using Row = std::vector<std::string>;

// Columns padded to their widest cell; the last column is not padded, so lines
// carry no trailing blanks.
void printTable(std::ostream& out, const std::vector<Column>& columns, const std::vector<Row>& rows,
                const std::string& indent) {
    std::vector<size_t> widths(columns.size());
    for (size_t c = 0; c < columns.size(); ++c)
        widths[c] = displayWidth(columns[c].title);
    for (const Row& row : rows)
        for (size_t c = 0; c < columns.size() && c < row.size(); ++c)
            widths[c] = std::max(widths[c], displayWidth(row[c]));

    auto printRow = [&](const Row& row) {
        std::string line = indent;
        for (size_t c = 0; c < columns.size(); ++c) {
            const std::string& cell = c < row.size() ? row[c] : std::string();
            std::string padding(widths[c] - displayWidth(cell), ' ');
            if (c > 0)
                line += "  ";
            if (columns[c].rightAligned)
                line += padding + cell;
            else if (c + 1 < columns.size())
                line += cell + padding;
            else
                line += cell;
        }
        while (!line.empty() && line.back() == ' ')
            line.pop_back();
        out << line << '\n';
    };

    Row titles;
    for (const Column& column : columns)
        titles.emplace_back(column.title);
    printRow(titles);
    for (const Row& row : rows)
        printRow(row);
}

} // namespace

std::string narrow(const ZrWString& text) { return zrUtf16ToUtf8(text.view()); }

Json messagesToJson(const std::vector<LoggedMessage>& messages) {
    Json out = Json::array();
    for (const LoggedMessage& message : messages) {
        Json entry;
        entry["severity"] = message.severity;
        entry["code"] = message.code;
        entry["text"] = message.text;
        out.push_back(std::move(entry));
    }
    return out;
}

Json typeDefinitionsToJson(const char* const* definitions) {
    Json out = Json::array();
    for (int i = 0; definitions && definitions[i]; ++i) {
        ZrDType type;
        type.Define(definitions[i]);
        Json entry;
        entry["index"] = i;
        entry["definition"] = definitions[i];
        entry["class"] = type.TypeClass();
        entry["alias"] = type.Alias();
        entry["usage"] = type.Usage();
        out.push_back(std::move(entry));
    }
    return out;
}

namespace {

// The definitions the dictionary offers, in its order; the count and the null
// terminator both bound the walk, whichever comes first.
std::vector<const ZrOptionDef*> optionDefinitions(const ZrDictBrowser& dict) {
    std::vector<const ZrOptionDef*> defs;
    const ZrOptionDef** table = dict.GetOptionDefs();
    for (int i = 0; table && i < dict.OptionDefCount() && table[i]; ++i)
        defs.push_back(table[i]);
    return defs;
}

std::string currentValue(const ZrDictBrowser& dict, const ZrOptionDef& def) {
    ZrWString value;
    if (dict.GetOption(def.Name().c_str(), value) != BE_OK)
        return std::string();
    return narrow(value);
}

} // namespace

Json optionsToJson(const ZrDictBrowser& dict) {
    Json out = Json::array();
    for (const ZrOptionDef* def : optionDefinitions(dict)) {
        Json entry;
        entry["key"] = narrow(def->Key());
        entry["name"] = narrow(def->Name());
        entry["description"] = narrow(def->Description());
        entry["default"] = def->DefaultValue().str();
        entry["value"] = currentValue(dict, *def);
        out.push_back(std::move(entry));
    }
    return out;
}

void printJson(std::ostream& out, const Json& document) {
    out << document.dump(2, ' ', false, Json::error_handler_t::replace) << '\n';
}

void printTypesText(std::ostream& out, const char* const* definitions) {
    static const std::vector<Column> kColumns = {
        {"index", true}, {"usage", true}, {"class", false}, {"alias", false}, {"definition", false},
    };
    std::vector<Row> rows;
    for (int i = 0; definitions && definitions[i]; ++i) {
        ZrDType type;
        type.Define(definitions[i]);
        rows.push_back({std::to_string(i), std::to_string(type.Usage()), type.TypeClass(),
                        type.Alias(), definitions[i]});
    }
    printTable(out, kColumns, rows, "");
}

void printOptionsText(std::ostream& out, const ZrDictBrowser& dict) {
    static const std::vector<Column> kColumns = {
        {"name", false},
        {"value", false},
        {"default", false},
        {"description", false},
    };
    std::vector<Row> rows;
    for (const ZrOptionDef* def : optionDefinitions(dict))
        rows.push_back({narrow(def->Name()), currentValue(dict, *def), def->DefaultValue().str(),
                        narrow(def->Description())});
    printTable(out, kColumns, rows, "");
}
