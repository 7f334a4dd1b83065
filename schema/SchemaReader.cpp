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

SchemaReader::SchemaReader(SchemaModel& target) : model(target), bindings(&target.namespaces) {}

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

bool SchemaReader::queueDocument(QueuedDocument document) {
    if (!queuedDocuments.insert(ZrWString(normaliseLocation(document.path.view()))).second)
        return false;
    (document.imported ? importQueue : documentQueue).push_back(std::move(document));
    return true;
}

namespace {

// The XML namespace's attributes, read when the schema uses the namespace and no
// document for it is imported.
constexpr std::string_view kXmlNamespaceSchema =
    R"(<xs:schema xmlns:xs="http://www.w3.org/2001/XMLSchema"
           targetNamespace="http://www.w3.org/XML/1998/namespace">
  <xs:attribute name="lang" type="xs:language"/>
  <xs:attribute name="space"><xs:simpleType><xs:restriction base="xs:NCName">
    <xs:enumeration value="default"/><xs:enumeration value="preserve"/>
  </xs:restriction></xs:simpleType></xs:attribute>
  <xs:attribute name="base" type="xs:anyURI"/>
  <xs:attribute name="id" type="xs:ID"/>
  <xs:attributeGroup name="specialAttrs">
    <xs:attribute ref="xml:base"/><xs:attribute ref="xml:lang"/>
    <xs:attribute ref="xml:space"/><xs:attribute ref="xml:id"/>
  </xs:attributeGroup>
</xs:schema>)";

} // namespace

bool SchemaReader::read(const ZrWChar* path) {
    auto parser = std::make_unique<SchemaParser>();
    parser->setDocumentHandler(this);
    parser->setErrorHandler(this);
    parser->setEntityResolver(this);

    model.clear();
    model.occurrenceRead = detail_.occurrence;
    model.documentationRead = detail_.documentation;
    bindings = &model.namespaces;
    resetOpenComponents();
    for (ZrName& recent : recentNamespaces)
        recent.clear();
    documentQueue.clear();
    importQueue.clear();
    queuedDocuments.clear();
    usesXmlNamespace = false;
    readXmlNamespace = false;
    redefinitions.reset();
    redefineDepth = 0;

    QueuedDocument main;
    main.path = path;
    documentPath_ = path;
    queueDocument(std::move(main));
    if (!readQueue(*parser, documentQueue))
        return false;
    // What imported documents declare at the top level is theirs, not the schema's.
    model.mainElementCount = model.globalElements.size();
    readQueue(*parser, importQueue);
    if (usesXmlNamespace && !readXmlNamespace) {
        QueuedDocument xml;
        xml.path = u"xml.xsd (built in)";
        xml.imported = true;
        xml.ns = kXmlNamespace;
        xml.text = kXmlNamespaceSchema;
        queueDocument(std::move(xml));
        readQueue(*parser, importQueue);
    }
    return true;
}

bool SchemaReader::readQueue(SchemaParser& parser, std::deque<QueuedDocument>& queue) {
    while (!queue.empty()) {
        beginDocument(queue.front());
        queue.pop_front();
        if (currentDocument.imported && currentDocument.text.empty() &&
            !FPInputStream(documentPath_.c_str(), false).isOpen()) {
            noteFailedImport(ZrWString(u"the file cannot be opened"));
            continue;
        }
        parseDocument(parser);
        if (!currentDocument.imported) {
            if (failed)
                return false;
            continue;
        }
        if (failed) {
            noteFailedImport(importFailure);
            continue;
        }
        // Names of this document's namespaces that the schema binds no prefix to are
        // written with the prefix this document binds.
        for (const auto& [prefix, uri] : importBindings.prefixes)
            model.namespaces.importedPrefixes.emplace(uri, prefix);
        if (importBindings.targetNamespace == kXmlNamespace)
            readXmlNamespace = true;
    }
    return true;
}

void SchemaReader::beginDocument(const QueuedDocument& document) {
    currentDocument = document;
    documentPath_ = document.path;
    documentURI = documentPath_.c_str();
    firstElement = true;
    failed = false;
    skipDepth = 0;
    elementDepth = 0;
    scopedDeclarations.clear();
    importFailure.clear();
    recentPrefixesStale = true;
    if (!document.imported) {
        bindings = &model.namespaces;
        return;
    }
    // Each imported document starts afresh; one it includes takes its target namespace.
    resetOpenComponents();
    importBindings.clear();
    importBindings.targetNamespace = document.target;
    bindings = &importBindings;
}

void SchemaReader::noteFailedImport(const ZrWString& reason) {
    noteImportFailure(currentDocument.ns, documentPath_.view(), reason.view());
    resetOpenComponents();
}

void SchemaReader::noteImportFailure(std::u16string_view ns, std::u16string_view location,
                                     std::u16string_view reason) {
    for (const SchemaModel::ImportFailure& noted : model.failedImports) {
        if (noted.ns == ns && noted.location == location)
            return;
    }
    model.failedImports.push_back(
        {std::u16string(ns), std::u16string(location), std::u16string(reason)});
}

void SchemaReader::resetOpenComponents() {
    elementStack.clear();
    currentElement.clear();
    // A document that failed inside a non-nullable declaration must not hand that flag
    // to the first declaration of the next one.
    currentElement.nullable = true;
    complexTypeStack.clear();
    currentComplexType.clear();
    complexDepth = 0;
    currentSimpleType.clear();
    currentDerivation = Derivation::None;
    simpleTypeStack.clear();
    simpleDepth = 0;
    complexElementDepths.clear();
    typesContent = false;
    typeTarget = nullptr;
    groupOpenedDefinition.clear();
    redefineDepth = 0;
    recentPrefixesStale = true;
    compositors.clear();
    lastOpened = DocOwner::None;
    docOwner = DocOwner::None;
    docDepth = 0;
    docText.clear();
    docWideText.clear();
    docWide = false;
    docBlank = false;
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
        if (!currentDocument.text.empty()) {
            parser.expectDocumentSize(currentDocument.text.size());
            const xercesc::MemBufInputSource source(
                reinterpret_cast<const XMLByte*>(currentDocument.text.data()),
                currentDocument.text.size(), documentPath_.c_str(), false);
            parser.parse(source);
            return;
        }
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
        ZrWString text;
        wsfmt(text, lgettext(u"Schema: Error: Entity '%s' in file %s is longer than %d characters"),
              e.name.c_str(), documentPath_.c_str(), static_cast<int>(kSchemaEntityValueLimit));
        reportError(ZR_SEV_ERROR, 4, text);
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
    ZrWString text;
    wsfmt(text, lgettext(u"Schema: Error: Reading file %s stopped: %s"), documentPath_.c_str(),
          message ? message : u"");
    reportError(ZR_SEV_ERROR, 4, text);
    failed = true;
}

void SchemaReader::reportError(int severity, int code, const ZrWString& text) {
    if (!currentDocument.imported) {
        ZrGlob::LogMessage(severity, code, u"%s", text.c_str());
        return;
    }
    if (importFailure.empty())
        importFailure = text;
}

namespace {

// One parser diagnostic: the parser's message, from just after its "Message:" label
// when it has one, with the position and the document.
ZrWString parserDiagnostic(const XMLCh* format, const SAXParseException& e) {
    const XMLCh* text = e.getMessage();
    ZrXString message(text ? text : u"", -1, ZR_CSET_DEFAULT);
    const long at = message.find(ZrXString("Message:", ZR_CSET_DEFAULT), 0);
    if (at != ZrXString::npos)
        message = message.substr(at + 8);
    const XMLCh* systemId = e.getSystemId();
    ZrXString file(systemId ? systemId : u"", -1, ZR_CSET_DEFAULT);
    ZrWString out;
    wsfmt(out, lgettext(format), static_cast<int>(e.getLineNumber()),
          static_cast<int>(e.getColumnNumber()), file.w_str(), message.w_str());
    return out;
}

} // namespace

void SchemaReader::warning(const SAXParseException& e) {
    ZrGlob::LogMessage(
        ZR_SEV_WARNING, 4, u"%s",
        parserDiagnostic(u"Schema: Warning: At line %d, column %d of file %s: %s", e).c_str());
}

void SchemaReader::error(const SAXParseException& e) {
    reportError(ZR_SEV_ERROR, 4,
                parserDiagnostic(u"Schema: Error: At line %d, column %d of file %s: %s", e));
    failed = true;
}

void SchemaReader::fatalError(const SAXParseException& e) {
    reportError(ZR_SEV_FATAL, 4,
                parserDiagnostic(u"Schema: Fatal: At line %d, column %d of file %s: %s", e));
    failed = true;
}

// Schema documents are read from the locations the reader resolves itself, never
// through entities: an external entity or DTD could make the parser open any
// local file or reach the network. The request fails the read and is answered
// with an empty document, so nothing is opened.
xercesc::InputSource* SchemaReader::resolveEntity(const XMLCh* publicId, const XMLCh* systemId) {
    const XMLCh* name = systemId && *systemId ? systemId : publicId;
    ZrWString text;
    wsfmt(text, lgettext(u"Schema: Error: External entity '%s' in file %s is not read"),
          name ? name : u"", documentPath_.c_str());
    reportError(ZR_SEV_ERROR, 4, text);
    failed = true;
    static const XMLByte kNothing[] = {0};
    return new xercesc::MemBufInputSource(kNothing, 0, systemId ? systemId : u"", false);
}
