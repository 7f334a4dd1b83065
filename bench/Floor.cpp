#include "Floor.h"

#include "ParserConfig.h"

#include <cctype>
#include <deque>
#include <filesystem>
#include <set>
#include <stdexcept>
#include <xercesc/util/XMLString.hpp>

using namespace xercesc;

namespace zrfloor {

namespace {

// True for a location the reader uses as written: a leading slash or backslash, or
// a drive letter and colon.
bool absoluteLocation(const std::string& location) {
    return !location.empty() && (location[0] == '/' || location[0] == '\\' ||
                                 (location.size() > 1 && location[1] == ':' &&
                                  std::isalpha((unsigned char)location[0])));
}

// A scheme such as "http:" or "file:": two or more letters and a colon.
bool hasScheme(const std::string& location) {
    size_t letters = 0;
    while (letters < location.size() && std::isalpha((unsigned char)location[letters]))
        ++letters;
    return letters >= 2 && letters < location.size() && location[letters] == ':';
}

std::string directoryOf(const std::string& path) {
    const size_t slash = path.find_last_of("/\\");
    return slash == std::string::npos ? std::string() : path.substr(0, slash + 1);
}

// Where the reader looks for an included document: a relative location is taken
// from the directory of the including document, its own directory part kept.
std::string includedPath(const std::string& including, const std::string& location) {
    if (hasScheme(including) || hasScheme(location) || absoluteLocation(location))
        return location;
    return directoryOf(including) + location;
}

// The reader parses a document once however it is named: "a/../b.xsd" and "b.xsd"
// are one document.
std::string documentKey(const std::string& path) {
    return std::filesystem::path(path).lexically_normal().string();
}

} // namespace

std::string utf8(const XMLCh* text) {
    char* s = XMLString::transcode(text);
    std::string out = s ? s : "";
    XMLString::release(&s);
    return out;
}

void FloorHandler::startElement(const XMLCh* name, AttributeList& attrs) {
    const XMLCh* local = name;
    for (const XMLCh* p = name; *p; ++p)
        if (*p == u':')
            local = p + 1;
    // The documents a read follows: included, redefined and imported ones.
    if (!XMLString::equals(local, u"include") && !XMLString::equals(local, u"import") &&
        !XMLString::equals(local, u"redefine"))
        return;
    if (const XMLCh* location = attrs.getValue(u"schemaLocation"))
        includes.push_back(utf8(location));
}

void FloorHandler::fail(const SAXParseException& e) {
    if (firstError.empty())
        firstError = utf8(e.getSystemId()) + ": " + utf8(e.getMessage());
}

std::vector<std::string> runFloor(const std::string& mainPath, FloorHandler& handler) {
    // The reader's own parser class: the same configuration and the same DTD hooks.
    SchemaParser parser;
    parser.setDocumentHandler(&handler);
    parser.setErrorHandler(&handler);

    std::vector<std::string> parsed;
    std::set<std::string> queued{documentKey(mainPath)};
    std::deque<std::string> queue{mainPath};
    while (!queue.empty()) {
        const std::string path = queue.front();
        queue.pop_front();
        handler.includes.clear();
        parser.parse(path.c_str());
        if (!handler.firstError.empty())
            throw std::runtime_error("floor parse failed: " + handler.firstError);
        parsed.push_back(path);
        for (const auto& location : handler.includes) {
            // The reader never fetches a location with a scheme; without a catalog
            // the floor reads what the reader reads.
            if (hasScheme(location))
                continue;
            std::string included = includedPath(path, location);
            if (queued.insert(documentKey(included)).second)
                queue.push_back(std::move(included));
        }
    }
    return parsed;
}

std::vector<std::string> runFloor(const std::string& mainPath) {
    FloorHandler handler;
    return runFloor(mainPath, handler);
}

} // namespace zrfloor
