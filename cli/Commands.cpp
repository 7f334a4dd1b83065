#include "Commands.h"

#include "MessageLog.h"
#include "PluginLibrary.h"
#include "RecordOutput.h"
#include "Render.h"
#include "zrapi.h"
#include "zrstring.h"

#include <iostream>
#include <memory>

namespace {

// A connector that stores everything as text: each type becomes the general text
// type, keeping its length, as a flat-file target would.
class TextSpoke : public ZrSpoke {
  public:
    ZrDType MapDataType(const ZrDType& type) override {
        ZrDType text;
        text.Define("Text;alias=Character;padchar_invalid;usage=0");
        text.Length(type.Length());
        return text;
    }
};

std::unique_ptr<ZrSpoke> makeSpoke(const std::string& name) {
    if (name == "text")
        return std::make_unique<TextSpoke>();
    return nullptr;
}

Json usageErrorDocument(const std::string& text, const std::vector<LoggedMessage>& messages) {
    Json doc;
    doc["error"] = text;
    doc["messages"] = messagesToJson(messages);
    return doc;
}

int usageError(const Invocation& inv, const MessageLog& log, const std::string& text) {
    if (inv.format == OutputFormat::Json)
        printJson(std::cout, usageErrorDocument(text, log.messages()));
    else
        std::cerr << "zrdict: " << text << '\n';
    return ExitStatus::Usage;
}

// Applies each NAME=VALUE through the base class's option machinery, in order.
// Returns false after reporting the first one the dictionary does not accept.
bool applyOptions(const Invocation& inv, const MessageLog& log, ZrDictBrowser& dict, int& status) {
    for (const std::string& option : inv.options) {
        size_t equals = option.find('=');
        std::string name = option.substr(0, equals);
        std::string value = equals == std::string::npos ? std::string() : option.substr(equals + 1);
        std::u16string wideName = zrUtf8ToUtf16(name);
        std::u16string wideValue = zrUtf8ToUtf16(value);
        if (!dict.FindOptionDef(wideName.c_str())) {
            status = usageError(inv, log, "unknown option '" + name + "'");
            return false;
        }
        BATCHERR rc = dict.SetOption(wideName.c_str(), wideValue.c_str());
        if (rc != BE_OK) {
            status = usageError(inv, log,
                                "option '" + name + "' refused the value '" + value + "' (status " +
                                    std::to_string(static_cast<int>(rc)) + ")");
            return false;
        }
    }
    return true;
}

void printRecordResult(const Invocation& inv, const MessageLog& log, BATCHERR status,
                       const std::vector<const ZrRecord*>& records, const ZrDictBrowser& dict) {
    switch (inv.format) {
    case OutputFormat::Json:
        printRecordDocument(std::cout, static_cast<int>(status), records, log.messages());
        return;
    case OutputFormat::Text:
        if (status == BE_OK)
            printRecordsText(std::cout, records);
        return;
    case OutputFormat::Tree:
        if (status == BE_OK)
            printRecordTree(std::cout, records, dict.RecordList());
        return;
    case OutputFormat::Dot:
        if (status == BE_OK)
            printRecordGraph(std::cout, records, dict.RecordList());
        return;
    }
}

// The dictionary's records, or none after a failed read whatever the list holds.
std::vector<const ZrRecord*> listedRecords(const ZrDictBrowser& dict, BATCHERR status) {
    std::vector<const ZrRecord*> records;
    if (status != BE_OK)
        return records;
    const ZrRecordList& list = dict.RecordList();
    for (int i = 0; i < list.Count(); ++i)
        if (const ZrRecord* record = list[i])
            records.push_back(record);
    return records;
}

int readFailed(const Invocation& inv, const MessageLog& log, BATCHERR status,
               const ZrDictBrowser& dict) {
    printRecordResult(inv, log, status, {}, dict);
    if (inv.format != OutputFormat::Json)
        std::cerr << "zrdict: reading '" << inv.schema << "' failed (status "
                  << static_cast<int>(status) << ")\n";
    return ExitStatus::ReadFailed;
}

int runRead(const Invocation& inv, const MessageLog& log, ZrDictBrowser& dict) {
    BATCHERR status = dict.ReadDictionary(inv.schema.c_str());
    if (status != BE_OK)
        return readFailed(inv, log, status, dict);
    printRecordResult(inv, log, status, listedRecords(dict, status), dict);
    return ExitStatus::Success;
}

int runFlatten(const Invocation& inv, const MessageLog& log, ZrDictBrowser& dict, ZrSpoke* spoke) {
    BATCHERR status = dict.ReadDictionary(inv.schema.c_str());
    if (status != BE_OK)
        return readFailed(inv, log, status, dict);
    const ZrRecord* source = dict.RecordList()[ZrWString(zrUtf8ToUtf16(inv.record))];
    if (!source)
        return usageError(inv, log, "no record named '" + inv.record + "' in '" + inv.schema + "'");

    // The plug-in leaves the target's name alone; naming it after its source keeps
    // the output readable.
    ZrRecord target;
    target.name = source->name;
    BATCHERR flattened = dict.FlattenDictRecord(source, &target, spoke);
    printRecordResult(inv, log, flattened, {&target}, dict);
    if (flattened != BE_OK) {
        if (inv.format != OutputFormat::Json)
            std::cerr << "zrdict: flattening '" << inv.record << "' failed (status "
                      << static_cast<int>(flattened) << ")\n";
        return ExitStatus::FlattenFailed;
    }
    return ExitStatus::Success;
}

int runOptions(const Invocation& inv, const MessageLog& log, const ZrDictBrowser& dict) {
    if (inv.format == OutputFormat::Json) {
        Json doc;
        doc["options"] = optionsToJson(dict);
        doc["messages"] = messagesToJson(log.messages());
        printJson(std::cout, doc);
    } else {
        printOptionsText(std::cout, dict);
    }
    return ExitStatus::Success;
}

int runTypes(const Invocation& inv, const MessageLog& log, const ZrDictBrowser& dict) {
    if (inv.format == OutputFormat::Json) {
        Json doc;
        doc["types"] = typeDefinitionsToJson(dict.TypeDefinitions());
        doc["messages"] = messagesToJson(log.messages());
        printJson(std::cout, doc);
    } else {
        printTypesText(std::cout, dict.TypeDefinitions());
    }
    return ExitStatus::Success;
}

} // namespace

const std::vector<std::string>& spokeNames() {
    static const std::vector<std::string> kNames = {"text"};
    return kNames;
}

int reportUsageError(OutputFormat format, const std::string& text) {
    if (format == OutputFormat::Json)
        printJson(std::cout, usageErrorDocument(text, {}));
    else
        std::cerr << "zrdict: " << text << '\n';
    return ExitStatus::Usage;
}

int runCommand(const Invocation& inv) {
    // Installed before the plug-in is loaded, so nothing it logs goes astray. In JSON
    // mode messages are only collected: stderr stays silent.
    MessageLog log(inv.format != OutputFormat::Json);

    std::string path = inv.pluginPath.empty() ? defaultPluginPath() : inv.pluginPath;
    PluginLibrary plugin;
    std::string error;
    if (!plugin.load(path, error)) {
        std::cerr << "zrdict: " << error << '\n';
        return ExitStatus::PluginLoad;
    }

    // The connector outlives the dictionary that may keep a pointer to it.
    std::unique_ptr<ZrSpoke> spoke = makeSpoke(inv.spoke);
    DictionaryHandle dict(plugin.newBrowser()(spoke.get()), plugin.deleteBrowser());
    if (!dict) {
        std::cerr << "zrdict: plug-in '" << path
                  << "' made no dictionary (NewBrowser returned null)\n";
        return ExitStatus::PluginLoad;
    }

    int status = ExitStatus::Success;
    if (!applyOptions(inv, log, *dict.get(), status))
        return status;

    if (inv.command == "read")
        return runRead(inv, log, *dict.get());
    if (inv.command == "flatten")
        return runFlatten(inv, log, *dict.get(), spoke.get());
    if (inv.command == "options")
        return runOptions(inv, log, *dict.get());
    return runTypes(inv, log, *dict.get());
}
