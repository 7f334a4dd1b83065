#include "SchemaReader.h"

#include "FPInput.h"
#include "ParserConfig.h"
#include "zrglob.h"

#include <filesystem>
#include <new>
#include <string_view>
#include <system_error>
#include <xercesc/framework/MemBufInputSource.hpp>
#include <xercesc/sax/SAXException.hpp>
#include <xercesc/util/OutOfMemoryException.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLException.hpp>
#include <xercesc/util/XMLUni.hpp>

using xercesc::SAXParseException;
using xercesc::XMLPlatformUtils;

SchemaReader::SchemaReader(SchemaModel& target) : model(target) {}

SchemaReader::~SchemaReader() = default;

namespace {

// Lexical form of a document location used to recognise a document queued twice:
// both separators count alike, "." segments and empty segments go, and "dir/.."
// cancels out. A leading separator (two for a network path) or drive is kept.
std::u16string normaliseLocation(std::u16string_view location) {
    auto isSep = [](char16_t c) { return c == u'/' || c == u'\\'; };
    std::u16string root;
    size_t pos = 0;
    if (location.size() >= 2 && location[1] == u':' && !isSep(location[0])) {
        root.assign(location.substr(0, 2));
        pos = 2;
    }
    size_t leading = 0;
    while (pos + leading < location.size() && isSep(location[pos + leading]))
        ++leading;
    if (leading > 0)
        root.append(leading == 2 && pos == 0 ? u"//" : u"/");
    pos += leading;
    const bool rooted = leading > 0;

    std::vector<std::u16string_view> segments;
    while (pos < location.size()) {
        size_t end = pos;
        while (end < location.size() && !isSep(location[end]))
            ++end;
        std::u16string_view segment = location.substr(pos, end - pos);
        if (segment.empty() || segment == u".") {
            // nothing: a duplicate separator or a "this directory" step
        } else if (segment == u"..") {
            if (!segments.empty() && segments.back() != u"..")
                segments.pop_back();
            else if (!rooted)
                segments.push_back(segment);
        } else {
            segments.push_back(segment);
        }
        pos = end + 1;
    }
    std::u16string out = root;
    for (size_t i = 0; i < segments.size(); ++i) {
        if (i > 0)
            out += u'/';
        out.append(segments[i]);
    }
    return out;
}

} // namespace

bool SchemaReader::queueDocument(const ZrWString& location) {
    if (!queuedDocuments.insert(ZrWString(normaliseLocation(location.view()))).second)
        return false;
    documentQueue.push_back(location);
    return true;
}

bool SchemaReader::read(const ZrWChar* path) {
    auto parser = std::make_unique<SchemaParser>();
    parser->setDocumentHandler(this);
    parser->setErrorHandler(this);
    parser->setEntityResolver(this);

    model.clear();
    recentPrefixesStale = true;
    elementStack.clear();
    currentElement.clear();
    // A read that failed inside a non-nullable declaration must not hand that flag
    // to the first declaration of this one.
    currentElement.nullable = true;
    complexTypeStack.clear();
    currentComplexType.clear();
    complexDepth = 0;
    currentSimpleType.clear();
    typeTarget = nullptr;
    groupOpenedDefinition.clear();
    for (ZrName& recent : recentNamespaces)
        recent.clear();
    documentQueue.clear();
    queuedDocuments.clear();

    documentPath_ = path;
    queueDocument(documentPath_);

    while (!documentQueue.empty()) {
        firstElement = true;
        failed = false;
        skipDepth = 0;
        documentPath_ = std::move(documentQueue.front());
        documentQueue.pop_front();
        documentURI = documentPath_.c_str();
        parseDocument(*parser);
        if (failed)
            return false;
    }
    return true;
}

// Formatting the message may itself run out of memory; nothing may leave the read.
void SchemaReader::logOutOfMemory() {
    try {
        ZrGlob::LogMessage(ZR_SEV_ERROR, BE_NO_MEMORY,
                           lgettext(u"Schema: Out of memory reading file %s"),
                           documentPath_.c_str());
    } catch (...) {
    }
}

void SchemaReader::parseDocument(SchemaParser& parser) {
    try {
        // The document's size sets what its entities may add; a file that cannot be
        // measured gets the floor and fails when it is opened.
        ZrString narrowPath;
        narrowPath.Assign(documentPath_.c_str(), ZR_CSET_DEFAULT, -1);
        std::error_code sizeError;
        const auto size = std::filesystem::file_size(narrowPath.c_str(), sizeError);
        parser.expectDocumentSize(sizeError ? 0 : static_cast<std::uint64_t>(size));
        FPInputSource source(documentPath_.c_str());
        parser.parse(source);
        if (source.readFailed())
            failed = true;
    } catch (const xercesc::OutOfMemoryException&) {
        logOutOfMemory();
        failed = true;
    } catch (const std::bad_alloc&) {
        logOutOfMemory();
        failed = true;
    } catch (const SchemaEntityTooLong& e) {
        ZrGlob::LogMessage(
            ZR_SEV_ERROR, 4,
            lgettext(u"Schema: Error: Entity '%s' in file %s is longer than %d characters"),
            e.name.c_str(), documentPath_.c_str(), static_cast<int>(kSchemaEntityValueLimit));
        failed = true;
    } catch (const xercesc::XMLException& e) {
        logParseStopped(e.getMessage());
    } catch (const xercesc::SAXException& e) {
        logParseStopped(e.getMessage());
    } catch (const std::exception& e) {
        ZrWString message;
        message.Assign(e.what(), ZR_CSET_DEFAULT, -1);
        logParseStopped(message.c_str());
    } catch (...) {
        logParseStopped(u"unknown error");
    }
}

void SchemaReader::logParseStopped(const XMLCh* message) {
    ZrGlob::LogMessage(ZR_SEV_ERROR, 4, lgettext(u"Schema: Error: Reading file %s stopped: %s"),
                       documentPath_.c_str(), message ? message : u"");
    failed = true;
}

namespace {

// Logs one parser diagnostic: the parser's message, from just after its
// "Message:" label when it has one, with the position and the document.
void logParserDiagnostic(int severity, const XMLCh* format, const SAXParseException& e) {
    const XMLCh* text = e.getMessage();
    ZrXString message(text ? text : u"", -1, ZR_CSET_DEFAULT);
    const long at = message.find(ZrXString("Message:", ZR_CSET_DEFAULT), 0);
    if (at != ZrXString::npos)
        message = message.substr(at + 8);
    const XMLCh* systemId = e.getSystemId();
    ZrXString file(systemId ? systemId : u"", -1, ZR_CSET_DEFAULT);
    ZrGlob::LogMessage(severity, 4, lgettext(format), static_cast<int>(e.getLineNumber()),
                       static_cast<int>(e.getColumnNumber()), file.w_str(), message.w_str());
}

} // namespace

void SchemaReader::warning(const SAXParseException& e) {
    logParserDiagnostic(ZR_SEV_WARNING, u"Schema: Warning: At line %d, column %d of file %s: %s",
                        e);
}

void SchemaReader::error(const SAXParseException& e) {
    logParserDiagnostic(ZR_SEV_ERROR, u"Schema: Error: At line %d, column %d of file %s: %s", e);
    failed = true;
}

void SchemaReader::fatalError(const SAXParseException& e) {
    logParserDiagnostic(ZR_SEV_FATAL, u"Schema: Fatal: At line %d, column %d of file %s: %s", e);
    failed = true;
}

// Schema documents are read from the locations the reader resolves itself, never
// through entities: an external entity or DTD could make the parser open any
// local file or reach the network. The request fails the read and is answered
// with an empty document, so nothing is opened.
xercesc::InputSource* SchemaReader::resolveEntity(const XMLCh* publicId, const XMLCh* systemId) {
    const XMLCh* name = systemId && *systemId ? systemId : publicId;
    ZrGlob::LogMessage(ZR_SEV_ERROR, 4,
                       lgettext(u"Schema: Error: External entity '%s' in file %s is not read"),
                       name ? name : u"", documentPath_.c_str());
    failed = true;
    static const XMLByte kNothing[] = {0};
    return new xercesc::MemBufInputSource(kNothing, 0, systemId ? systemId : u"", false);
}
