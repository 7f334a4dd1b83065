#include "RecordOutput.h"

#include "TextOutput.h"
#include "zrstring.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>
#include <unordered_map>

namespace {

// --- JSON ---------------------------------------------------------------------------
//
// The document has a fixed shape, so it is written from literal pieces that carry the
// layout of nlohmann-json's dump(2) (newline, two spaces a level, "key": value), which
// zrdict's output had when it was built as a tree: one append per piece, no writer
// state, the same bytes.

void appendQuoted(std::string& out, std::string_view text) {
    out += '"';
    appendJsonEscaped(out, text);
    out += '"';
}

void appendQuoted(std::string& out, std::u16string_view text) {
    out += '"';
    appendJsonEscaped(out, text);
    out += '"';
}

void appendNumber(std::string& line, long long value) {
    char digits[24];
    const auto result = std::to_chars(digits, digits + sizeof digits, value);
    line.append(digits, result.ptr);
}

// The items of a definition string shown beside the fields every type has, each the
// first of its name as ZrDType::Item finds it.
struct DefinitionItems {
    const std::string* maxLength = nullptr;
    const std::string* picture = nullptr;
    const std::string* isSigned = nullptr;
};

DefinitionItems definitionItems(const ZrDType& type) {
    DefinitionItems found;
    const ZrDType::Definition* def = type.Parsed();
    if (!def)
        return found;
    for (const auto& [item, value] : def->items) {
        const std::string_view key = item;
        if (!found.maxLength && key == "maxlength")
            found.maxLength = &value;
        else if (!found.picture && key == "picture")
            found.picture = &value;
        else if (!found.isSigned && key == "signed")
            found.isSigned = &value;
    }
    return found;
}

// maxlength is a number when it reads as one, as strtol reads it; signed is a truth
// value; picture stays text.
void appendDefinitionItems(std::string& out, const ZrDType& type) {
    const DefinitionItems items = definitionItems(type);
    if (items.maxLength) {
        const char* text = items.maxLength->c_str();
        char* end = nullptr;
        errno = 0;
        const long value = std::strtol(text, &end, 10);
        out += ",\n            \"maxlength\": ";
        if (end != text && *end == '\0' && errno == 0)
            appendNumber(out, value);
        else
            appendQuoted(out, *items.maxLength);
    }
    if (items.picture) {
        out += ",\n            \"picture\": ";
        appendQuoted(out, *items.picture);
    }
    if (items.isSigned)
        out += *items.isSigned == "true" ? ",\n            \"signed\": true"
                                         : ",\n            \"signed\": false";
}

void appendField(std::string& out, const ZrField& field) {
    const ZrDType& type = field.DataType();
    out += "        {\n          \"name\": ";
    appendQuoted(out, field.FieldName().view());
    out += ",\n          \"alias\": ";
    appendQuoted(out, field.Alias().view());
    out += ",\n          \"description\": ";
    appendQuoted(out, std::string_view(field.Description()));
    out += ",\n          \"type\": {\n            \"class\": ";
    appendQuoted(out, std::string_view(type.TypeClass()));
    out += ",\n            \"alias\": ";
    appendQuoted(out, std::string_view(type.Alias()));
    out += ",\n            \"usage\": ";
    appendNumber(out, type.Usage());
    out += ",\n            \"length\": ";
    appendNumber(out, type.Length());
    out += ",\n            \"precision\": ";
    appendNumber(out, type.Precision());
    out += ",\n            \"decimals\": ";
    appendNumber(out, type.DecimalPlaces());
    out += type.Nulls() ? ",\n            \"nulls\": true" : ",\n            \"nulls\": false";
    appendDefinitionItems(out, type);
    out += "\n          }\n        }";
}

// One element of the records array, without the separator before it.
void writeRecord(OutputBuffer& out, std::string& text, const ZrRecord& record) {
    text.assign("    {\n      \"name\": ");
    appendQuoted(text, record.name.view());
    text += ",\n      \"length\": ";
    appendNumber(text, record.RecordLength());
    text += ",\n      \"fields\": [";
    bool anyField = false;
    for (int i = 0; i < record.FieldCount(); ++i) {
        const ZrField* field = record.GetFieldbyPos(i);
        if (!field)
            continue;
        text += anyField ? ",\n" : "\n";
        anyField = true;
        appendField(text, *field);
        // A record of many fields goes out in pieces, not held whole.
        if (text.size() >= (1 << 16)) {
            out.write(text);
            text.clear();
        }
    }
    text += anyField ? "\n      ]\n    }" : "]\n    }";
    out.write(text);
}

// --- text ---------------------------------------------------------------------------

// Display width of UTF-8 text, counted in code points: close enough for the names
// and aliases of a schema.
size_t displayWidth(std::string_view text) {
    size_t width = 0;
    for (char c : text)
        width += (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    return width;
}

// The columns of a record's table, in order; numbers are right-aligned and the
// last column is not padded, so lines carry no trailing blanks. The description
// column is there only when some field of the record has a description.
enum Column {
    kField,
    kType,
    kUsage,
    kLength,
    kPrecision,
    kDecimals,
    kNulls,
    kDescription,
    kColumns
};

constexpr std::string_view kTitles[kColumns] = {"field",     "type",     "usage", "length",
                                                "precision", "decimals", "nulls", "description"};

class RecordTable {
  public:
    void print(OutputBuffer& out, const ZrRecord& record) {
        size_t count = 0;
        columns_ = kDescription;
        for (size_t c = 0; c < kColumns; ++c)
            widths_[c] = kTitles[c].size();
        for (int i = 0; i < record.FieldCount(); ++i) {
            const ZrField* field = record.GetFieldbyPos(i);
            if (!field)
                continue;
            if (rows_.size() <= count)
                rows_.emplace_back();
            Row& row = rows_[count++];
            const ZrDType& type = field->DataType();
            row.name.clear();
            zrAppendUtf8(row.name, field->FieldName().view());
            row.alias = type.Alias();
            row.widths[kField] = displayWidth(row.name);
            row.widths[kType] = displayWidth(row.alias);
            row.numbers.clear();
            const long long numbers[] = {type.Usage(), type.Length(), type.Precision(),
                                         type.DecimalPlaces()};
            for (size_t n = 0; n < 4; ++n) {
                const size_t before = row.numbers.size();
                appendNumber(row.numbers, numbers[n]);
                row.widths[kUsage + n] = row.numbers.size() - before;
            }
            row.nulls = type.Nulls();
            row.widths[kNulls] = row.nulls ? 3 : 2;
            row.description = field->Description();
            row.widths[kDescription] = displayWidth(row.description);
            if (!row.description.empty())
                columns_ = kColumns;
            for (size_t c = 0; c < kColumns; ++c)
                widths_[c] = std::max(widths_[c], row.widths[c]);
        }

        text_.clear();
        zrAppendUtf8(text_, record.name.view());
        text_ += " (length ";
        appendNumber(text_, record.RecordLength());
        text_ += ", ";
        appendNumber(text_, record.FieldCount());
        text_ += record.FieldCount() == 1 ? " field)\n  " : " fields)\n  ";
        for (size_t c = 0; c < columns_; ++c)
            cell(c, kTitles[c], kTitles[c].size());
        text_ += '\n';

        // Every line fits in the widths of its columns and their separators; it is
        // written into that room and the room it did not use is given back.
        size_t lineRoom = 3;
        for (size_t c = 0; c < columns_; ++c)
            lineRoom += widths_[c] + 2;
        for (size_t f = 0; f < count; ++f) {
            const Row& row = rows_[f];
            // Widths count code points; the room is counted in bytes.
            const size_t multibyte = row.name.size() - row.widths[kField] + row.alias.size() -
                                     row.widths[kType] + row.description.size() -
                                     row.widths[kDescription];
            const size_t start = text_.size();
            text_.resize(start + lineRoom + multibyte);
            char* const begin = text_.data() + start;
            char* p = begin;
            *p++ = ' ';
            *p++ = ' ';
            p = cell(p, kField, row.name, row.widths[kField]);
            p = cell(p, kType, row.alias, row.widths[kType]);
            size_t at = 0;
            for (size_t c = kUsage; c <= kDecimals; ++c) {
                p = cell(p, c, std::string_view(row.numbers).substr(at, row.widths[c]),
                         row.widths[c]);
                at += row.widths[c];
            }
            p = cell(p, kNulls, row.nulls ? "yes" : "no", row.widths[kNulls]);
            if (columns_ == kColumns && !row.description.empty())
                p = cell(p, kDescription, row.description, row.widths[kDescription]);
            // A field without a description ends in the padding of its nulls cell.
            while (columns_ == kColumns && p[-1] == ' ')
                --p;
            *p++ = '\n';
            text_.resize(start + size_t(p - begin));
            // A record of many fields goes out in pieces, not held whole.
            if (text_.size() >= (1 << 16)) {
                out.write(text_);
                text_.clear();
            }
        }
        out.write(text_);
    }

  private:
    // A field's cells as they are printed, with their display widths.
    struct Row {
        std::string name;
        std::string_view alias;
        std::string numbers; // usage, length, precision and decimals, one after another
        bool nulls = false;
        std::string_view description; // the field's own, which outlives the table
        size_t widths[kColumns] = {};
    };

    // The title line's cells.
    void cell(size_t column, std::string_view text, size_t width) {
        const size_t start = text_.size();
        text_.resize(start + widths_[column] + 2 + text.size());
        char* const begin = text_.data() + start;
        text_.resize(start + size_t(cell(begin, column, text, width) - begin));
    }

    // Writes one cell at `p`, with the separator before it, and returns where it ends.
    char* cell(char* p, size_t column, std::string_view text, size_t width) const {
        if (column > 0) {
            *p++ = ' ';
            *p++ = ' ';
        }
        const size_t padding = column + 1 < columns_ ? widths_[column] - width : 0;
        const bool right = column >= kUsage && column <= kDecimals;
        if (right)
            p = std::fill_n(p, padding, ' ');
        p = std::copy(text.begin(), text.end(), p);
        if (!right)
            p = std::fill_n(p, padding, ' ');
        return p;
    }

    std::vector<Row> rows_;
    size_t widths_[kColumns] = {};
    size_t columns_ = kDescription;
    std::string text_;
};

// --- links between records ----------------------------------------------------------

bool isRecordField(const ZrField& field) {
    return std::strcmp(field.DataType().TypeClass(), "Structure") == 0;
}

// The dictionary's records by name, the first of each name, as the host's list
// finds them; numbered by position.
class RecordIndex {
  public:
    static constexpr size_t npos = static_cast<size_t>(-1);

    explicit RecordIndex(const ZrRecordList& dictionary) {
        records_.reserve(static_cast<size_t>(dictionary.Count()));
        byName_.reserve(static_cast<size_t>(dictionary.Count()));
        for (int i = 0; i < dictionary.Count(); ++i) {
            const ZrRecord* record = dictionary[i];
            if (!record)
                continue;
            byName_.emplace(record->name.view(), records_.size());
            records_.push_back(record);
        }
    }

    size_t find(std::u16string_view name) const {
        const auto it = byName_.find(name);
        return it == byName_.end() ? npos : it->second;
    }

    const ZrRecord* operator[](size_t at) const { return records_[at]; }

    size_t size() const { return records_.size(); }

  private:
    std::vector<const ZrRecord*> records_;
    std::unordered_map<std::u16string_view, size_t> byName_;
};

// --- tree ---------------------------------------------------------------------------

// Deeper than this, lines stop moving right and carry their level instead, so a
// chain of nested records as long as the schema makes it gives lines of bounded
// length.
constexpr size_t kDrawnLevels = 48;

class TreePrinter {
  public:
    TreePrinter(OutputBuffer& out, const RecordIndex& index)
        : out_(out), index_(index), shown_(index.size()), onPath_(index.size()) {}

    // A record not in the dictionary (a flattening's target) stands for the one of
    // its name there.
    void root(const ZrRecord& record) {
        const size_t at = index_.find(record.name.view());
        if (at != RecordIndex::npos) {
            if (shown_[at])
                return;
            shown_[at] = true;
        }
        line_.clear();
        zrAppendUtf8(line_, record.name.view());
        line_ += " (length ";
        appendNumber(line_, record.RecordLength());
        line_ += ")\n";
        out_.write(line_);
        prefix_.clear();
        open(record, at);
        walk();
    }

  private:
    // An opened record: the next field to show, and the prefix of its fields' lines.
    struct Frame {
        const ZrRecord* record;
        size_t at; // in the index, or npos
        int next;
        size_t prefixLength;
    };

    void open(const ZrRecord& record, size_t at) {
        if (at != RecordIndex::npos)
            onPath_[at] = true;
        stack_.push_back(Frame{&record, at, 0, prefix_.size()});
    }

    // Depth first with a stack of its own, so nesting as deep as the schema makes it
    // costs memory, not the call stack.
    void walk() {
        while (!stack_.empty()) {
            Frame& frame = stack_.back();
            if (frame.next >= frame.record->FieldCount()) {
                if (frame.at != RecordIndex::npos)
                    onPath_[frame.at] = false;
                stack_.pop_back();
                if (!stack_.empty())
                    prefix_.resize(stack_.back().prefixLength);
                continue;
            }
            const ZrField* field = frame.record->GetFieldbyPos(frame.next++);
            if (!field)
                continue;
            const bool last = frame.next >= frame.record->FieldCount();
            const ZrDType& type = field->DataType();
            line_.assign(prefix_);
            line_ += last ? "\u2514\u2500\u2500 " : "\u251c\u2500\u2500 ";
            if (stack_.size() > kDrawnLevels) {
                line_ += '[';
                appendNumber(line_, static_cast<long long>(stack_.size()));
                line_ += "] ";
            }
            zrAppendUtf8(line_, field->FieldName().view());
            line_ += ": ";
            line_ += type.Alias();
            line_ += ", length ";
            appendNumber(line_, type.Length());
            const ZrRecord* nested = nullptr;
            size_t nestedAt = RecordIndex::npos;
            if (isRecordField(*field)) {
                nestedAt = index_.find(field->FieldName().view());
                if (nestedAt == RecordIndex::npos)
                    line_ += " (no such record)";
                else if (onPath_[nestedAt])
                    line_ += " (recursive)";
                else if (shown_[nestedAt])
                    line_ += " (shown above)";
                else
                    nested = index_[nestedAt];
            }
            line_ += '\n';
            out_.write(line_);
            if (nested) {
                shown_[nestedAt] = true;
                if (stack_.size() < kDrawnLevels)
                    prefix_ += last ? "    " : "\u2502   ";
                open(*nested, nestedAt);
            }
        }
    }

    OutputBuffer& out_;
    const RecordIndex& index_;
    std::vector<bool> shown_;
    std::vector<bool> onPath_;
    std::vector<Frame> stack_;
    std::string prefix_;
    std::string line_;
};

// --- graph --------------------------------------------------------------------------

// Text for an HTML-like label: well-formed UTF-8, markup characters as entities,
// control characters (which the label's XML cannot hold) as U+FFFD.
void appendLabelText(std::string& out, std::string_view text) {
    std::string valid;
    appendValidUtf8(valid, text);
    for (char c : valid) {
        switch (c) {
        case '&':
            out += "&amp;";
            break;
        case '<':
            out += "&lt;";
            break;
        case '>':
            out += "&gt;";
            break;
        case '"':
            out += "&quot;";
            break;
        default:
            if (static_cast<unsigned char>(c) < 0x20)
                out += "\xEF\xBF\xBD";
            else
                out += c;
        }
    }
}

// Text inside a quoted DOT string.
void appendQuotedText(std::string& out, std::string_view text) {
    std::string valid;
    appendValidUtf8(valid, text);
    for (char c : valid) {
        if (c == '"' || c == '\\')
            out += '\\';
        out += static_cast<unsigned char>(c) < 0x20 ? ' ' : c;
    }
}

class GraphPrinter {
  public:
    GraphPrinter(OutputBuffer& out, const RecordIndex& index) : out_(out), index_(index) {}

    void print(const std::vector<const ZrRecord*>& roots) {
        out_.write("digraph records {\n"
                   "  rankdir=LR;\n"
                   "  node [shape=plaintext, fontname=\"Helvetica\", fontsize=10];\n"
                   "  edge [fontname=\"Helvetica\", fontsize=9];\n");
        for (const ZrRecord* root : roots)
            node(root);
        // Records reached only through fields are added as they are found.
        for (size_t i = 0; i < order_.size(); ++i)
            printNode(i);
        out_.write("}\n");
    }

  private:
    size_t node(const ZrRecord* record) {
        const auto [it, added] = ids_.emplace(record, order_.size());
        if (added)
            order_.push_back(record);
        return it->second;
    }

    void printNode(size_t id) {
        const ZrRecord& record = *order_[id];
        std::string name;
        zrAppendUtf8(name, record.name.view());
        line_ = "  r";
        appendNumber(line_, static_cast<long long>(id));
        line_ += " [label=<<table border=\"0\" cellborder=\"1\" cellspacing=\"0\" "
                 "cellpadding=\"3\"><tr><td colspan=\"2\" bgcolor=\"lightgrey\"><b>";
        appendLabelText(line_, name);
        line_ += "</b></td></tr>";
        for (int i = 0; i < record.FieldCount(); ++i) {
            const ZrField* field = record.GetFieldbyPos(i);
            if (!field || isRecordField(*field))
                continue;
            const ZrDType& type = field->DataType();
            line_ += "<tr><td align=\"left\">";
            name.clear();
            zrAppendUtf8(name, field->FieldName().view());
            appendLabelText(line_, name);
            line_ += "</td><td align=\"left\">";
            appendLabelText(line_, type.Alias());
            if (type.Length() != 0) {
                line_ += '(';
                appendNumber(line_, type.Length());
                line_ += ')';
            }
            line_ += "</td></tr>";
        }
        line_ += "</table>>];\n";
        out_.write(line_);

        for (int i = 0; i < record.FieldCount(); ++i) {
            const ZrField* field = record.GetFieldbyPos(i);
            if (!field || !isRecordField(*field))
                continue;
            name.clear();
            zrAppendUtf8(name, field->FieldName().view());
            line_ = "  r";
            appendNumber(line_, static_cast<long long>(id));
            line_ += " -> ";
            const size_t at = index_.find(field->FieldName().view());
            if (at == RecordIndex::npos) {
                // A record the dictionary lacks still gets a node, drawn as missing.
                line_ += "\"missing ";
                appendQuotedText(line_, name);
                line_ += "\" [style=dashed, label=\"";
            } else {
                line_ += 'r';
                appendNumber(line_, static_cast<long long>(node(index_[at])));
                line_ += " [label=\"";
            }
            appendQuotedText(line_, name);
            line_ += "\"];\n";
            out_.write(line_);
        }
    }

    OutputBuffer& out_;
    const RecordIndex& index_;
    std::unordered_map<const ZrRecord*, size_t> ids_;
    std::vector<const ZrRecord*> order_;
    std::string line_;
};

} // namespace

void printRecordDocument(std::ostream& out, int status, const std::vector<const ZrRecord*>& records,
                         const std::vector<LoggedMessage>& messages) {
    OutputBuffer buffer(out);
    std::string text = "{\n  \"status\": ";
    appendNumber(text, status);
    text += ",\n  \"records\": [";
    buffer.write(text);
    bool first = true;
    for (const ZrRecord* record : records) {
        buffer.write(first ? "\n" : ",\n");
        first = false;
        writeRecord(buffer, text, *record);
    }
    text.assign(records.empty() ? "],\n  \"messages\": [" : "\n  ],\n  \"messages\": [");
    for (size_t i = 0; i < messages.size(); ++i) {
        text += i == 0 ? "\n    {\n      \"severity\": " : ",\n    {\n      \"severity\": ";
        appendNumber(text, messages[i].severity);
        text += ",\n      \"code\": ";
        appendNumber(text, messages[i].code);
        text += ",\n      \"text\": ";
        appendQuoted(text, messages[i].text);
        text += "\n    }";
    }
    text += messages.empty() ? "]\n}\n" : "\n  ]\n}\n";
    buffer.write(text);
}

void printRecordsText(std::ostream& out, const std::vector<const ZrRecord*>& records) {
    OutputBuffer buffer(out);
    if (records.empty()) {
        buffer.write("(no records)\n");
        return;
    }
    RecordTable table;
    bool first = true;
    for (const ZrRecord* record : records) {
        if (!first)
            buffer.put('\n');
        first = false;
        table.print(buffer, *record);
    }
}

void printRecordTree(std::ostream& out, const std::vector<const ZrRecord*>& roots,
                     const ZrRecordList& dictionary) {
    OutputBuffer buffer(out);
    if (roots.empty()) {
        buffer.write("(no records)\n");
        return;
    }
    const RecordIndex index(dictionary);
    TreePrinter tree(buffer, index);
    for (const ZrRecord* root : roots)
        tree.root(*root);
}

void printRecordGraph(std::ostream& out, const std::vector<const ZrRecord*>& roots,
                      const ZrRecordList& dictionary) {
    OutputBuffer buffer(out);
    const RecordIndex index(dictionary);
    GraphPrinter(buffer, index).print(roots);
}
