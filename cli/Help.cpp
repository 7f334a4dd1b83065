#include "Help.h"

#include "MessageLog.h"
#include "PluginLibrary.h"
#include "zrapi.h"
#include "zrstring.h"

#include <algorithm>
#include <string_view>
#include <vector>

const char* const kExampleSchema = R"(<xs:schema xmlns:xs="http://www.w3.org/2001/XMLSchema">
  <xs:element name="order">
    <xs:complexType>
      <xs:sequence>
        <xs:element name="id" type="xs:int"/>
        <xs:element name="item" maxOccurs="unbounded">
          <xs:complexType>
            <xs:sequence>
              <xs:element name="sku" type="xs:string"/>
              <xs:element name="quantity" type="xs:positiveInteger"/>
            </xs:sequence>
          </xs:complexType>
        </xs:element>
      </xs:sequence>
      <xs:attribute name="status" type="xs:string"/>
    </xs:complexType>
  </xs:element>
</xs:schema>
)";

namespace {

// What zrdict prints for the example, kept in step with zrdict by the tests.
constexpr const char* kExampleTree = R"(order (length 0)
├── id: int, length 0
├── item: Record, length 0
│   ├── sku: string, length 0
│   └── quantity: positiveInteger, length 10
└── status: string attribute, length 0
)";

constexpr const char* kExampleTables = R"(order (length 0, 3 fields)
  field   type              usage  length  precision  decimals  nulls
  id      int                  48       0         10         0  yes
  item    Record                2       0          0         0  no
  status  string attribute    272       0          0         0  yes

item (length 0, 2 fields)
  field     type             usage  length  precision  decimals  nulls
  sku       string              16       0          0         0  yes
  quantity  positiveInteger     56      10          0         0  yes
)";

std::string indented(std::string_view text, std::string_view indent) {
    std::string out;
    size_t start = 0;
    while (start < text.size()) {
        size_t end = text.find('\n', start);
        if (end == std::string_view::npos)
            end = text.size();
        if (end > start)
            out += indent;
        out += text.substr(start, end - start);
        out += '\n';
        start = end + 1;
    }
    return out;
}

std::string exampleSchema() {
    return "Example: order.xsd (examples/ in the sources, share/zrbxmls/examples/ where "
           "installed)\n" +
           indented(kExampleSchema, "  ") + "\n";
}

} // namespace

std::string mainHelpFooter(const std::string& pluginPath) {
    return exampleSchema() +
           "How its records nest (a record field opens the record it stands for):\n"
           "  $ zrdict read --format tree order.xsd\n" +
           indented(kExampleTree, "  ") +
           "\nA picture of them: zrdict read --format dot order.xsd | dot -Tsvg > order.svg\n"
           "Each command has its own help, e.g. zrdict read --help.\n\n" +
           pluginOptionsHelp(pluginPath);
}

std::string readHelpFooter(const std::string& pluginPath) {
    return exampleSchema() +
           "One table per record, a nested record after the record it is nested in:\n"
           "  $ zrdict read order.xsd\n" +
           indented(kExampleTables, "  ") +
           "\n--format json prints the same as one document for programs, --format tree how\n"
           "the records nest, --format dot a Graphviz graph of them:\n"
           "  zrdict read --format dot order.xsd | dot -Tsvg > order.svg\n\n" +
           pluginOptionsHelp(pluginPath);
}

std::string pluginOptionsHelp(const std::string& pluginPath) {
    const std::string path = pluginPath.empty() ? defaultPluginPath() : pluginPath;
    // Anything the plug-in logs while it is asked stays out of the help text.
    MessageLog log(false);
    PluginLibrary plugin;
    std::string error;
    if (!plugin.load(path, error))
        return "Plug-in options: not listed, " + error + "\n";
    DictionaryHandle dict(plugin.newBrowser()(nullptr), plugin.deleteBrowser());
    if (!dict)
        return "Plug-in options: not listed, the plug-in made no dictionary\n";

    struct Row {
        std::string name, defaultValue, description;
    };

    std::vector<Row> rows;
    const ZrOptionDef** table = dict->GetOptionDefs();
    for (int i = 0; table && i < dict->OptionDefCount() && table[i]; ++i)
        rows.push_back({zrUtf16ToUtf8(table[i]->Name().view()), table[i]->DefaultValue().str(),
                        zrUtf16ToUtf8(table[i]->Description().view())});
    size_t nameWidth = 0;
    size_t defaultWidth = 0;
    for (const Row& row : rows) {
        nameWidth = std::max(nameWidth, row.name.size());
        defaultWidth = std::max(defaultWidth, row.defaultValue.size());
    }
    std::string out = "Plug-in options, set with --option NAME=VALUE ('zrdict options' shows "
                      "their values):\n";
    if (rows.empty())
        out += "  (none)\n";
    for (const Row& row : rows) {
        out += "  " + row.name + std::string(nameWidth - row.name.size(), ' ') + "  default " +
               row.defaultValue + std::string(defaultWidth - row.defaultValue.size(), ' ') + "  " +
               row.description + "\n";
    }
    return out;
}
