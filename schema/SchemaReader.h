// The schema reader: the SAX handler that parses a schema and the documents it
// includes into a component model.
#pragma once

#include "SchemaModel.h"
#include "zrfile.h"
#include "zrstring.h"

#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <type_traits>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>
#include <xercesc/sax/AttributeList.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/sax/SAXParseException.hpp>

static_assert(std::is_same_v<XMLCh, char16_t>, "the host's wide text must be the parser's XMLCh");

// The parser's text as a view; null reads as the empty text.
inline std::u16string_view xmlText(const XMLCh* text) {
    return text ? std::u16string_view(text) : std::u16string_view();
}

// XML's white space: blank, tab, line feed, carriage return. The first test settles
// nearly every character of a word.
inline bool isXmlSpace(char16_t c) {
    return c <= u' ' && (c == u' ' || c == u'\t' || c == u'\n' || c == u'\r');
}

// Whether an occurrence count ("minOccurs") is zero: digits, all of them 0, between
// optional blanks.
inline bool isZeroOccurs(const XMLCh* text) {
    std::u16string_view value = xmlText(text);
    while (!value.empty() && isXmlSpace(value.front()))
        value.remove_prefix(1);
    while (!value.empty() && isXmlSpace(value.back()))
        value.remove_suffix(1);
    return !value.empty() && value.find_first_not_of(u'0') == std::u16string_view::npos;
}

// An attribute name as the parser gives it, compared without measuring it first:
// most differ from the name sought in their first unit.
class XmlName {
  public:
    explicit XmlName(const XMLCh* text) : text_(text ? text : u"") {}

    // Stops at the first unit that differs, the terminator included.
    bool startsWith(std::u16string_view prefix) const {
        for (size_t i = 0; i < prefix.size(); ++i) {
            if (text_[i] != prefix[i])
                return false;
        }
        return true;
    }

    bool operator==(std::u16string_view name) const {
        return startsWith(name) && text_[name.size()] == u'\0';
    }

    bool operator!=(std::u16string_view name) const { return !(*this == name); }

  private:
    const XMLCh* text_;
};

// A qualified name as the parser gives it, split at its first colon in one pass.
struct XmlQualifiedName {
    explicit XmlQualifiedName(const XMLCh* text) {
        const XMLCh* p = text ? text : u"";
        // Up to the first colon, then on to the end with nothing left to test for.
        const XMLCh* end = p;
        while (*end && *end != u':')
            ++end;
        const XMLCh* colon = *end ? end : nullptr;
        while (*end)
            ++end;
        if (colon) {
            prefix = std::u16string_view(p, size_t(colon - p));
            local = std::u16string_view(colon + 1, size_t(end - colon - 1));
        } else {
            local = std::u16string_view(p, size_t(end - p));
        }
    }

    bool prefixed() const { return prefix.data() != nullptr; }

    std::u16string_view prefix; // null data when there is no colon
    std::u16string_view local;  // null-terminated where the name is
};

class SchemaCatalog;
class SchemaParser;

// What a read takes from a schema beyond what every read does. Each costs only when
// asked for: documentation, for one, is skipped like the rest of an annotation.
struct ReadDetail {
    // The facets totalDigits and fractionDigits.
    bool digits = false;
    // minOccurs, nillable and use, and the compositors around declarations.
    bool occurrence = false;
    // The first documentation of each declaration's and type's annotation.
    bool documentation = false;
};

class SchemaReader : public xercesc::HandlerBase {
  public:
    // Fills `model`, which must outlive the reader.
    explicit SchemaReader(SchemaModel& model);
    SchemaReader(const SchemaReader&) = delete;
    SchemaReader& operator=(const SchemaReader&) = delete;
    ~SchemaReader() override;

    // Empties the model, then parses the schema at `path` and the documents it
    // includes into it. False when the read failed; the cause has been logged. The
    // parser library must be initialised.
    bool read(const ZrWChar* path);

    // The document being read, or the last one read; named in messages.
    const ZrWString& documentPath() const { return documentPath_; }

    // Logs that memory ran out while reading or building from the document read.
    void logOutOfMemory();

    // The catalog through which the locations and namespaces that documents name
    // are looked up; null for none. It must outlive the reads.
    void setCatalog(const SchemaCatalog* catalog) { catalog_ = catalog; }

    // What the next reads take beyond what every read does.
    void setDetail(const ReadDetail& detail) { detail_ = detail; }

    // Whether the document being read has failed so far.
    bool hasFailed() const { return failed; }

    // SAX callbacks.
    void startElement(const XMLCh* name, xercesc::AttributeList& attrs) override;
    void endElement(const XMLCh* name) override;
    void characters(const XMLCh* chars, XMLSize_t length) override;
    void warning(const xercesc::SAXParseException& e) override;
    void error(const xercesc::SAXParseException& e) override;
    void fatalError(const xercesc::SAXParseException& e) override;
    // Refuses every external entity and DTD: nothing outside the schema documents
    // themselves is ever read.
    xercesc::InputSource* resolveEntity(const XMLCh* publicId, const XMLCh* systemId) override;

    // Namespaces and qualified names, as the documents read so far declare them.
    void FirstElementAttrs(xercesc::AttributeList& attrs);
    void parseName(const XMLCh* name, bool useDefault, ZrName& localPart, ZrName& ns);

  private:
    // The namespace bound to `prefix`, or null when none is.
    const std::u16string* namespaceOfPrefix(std::u16string_view prefix);
    static const std::u16string& xmlNamespace();
    // The pool's copy of a namespace's text.
    ZrName namespaceName(std::u16string_view uri);

    // Handlers of schema constructs.
    void doElement(xercesc::AttributeList& attrs, bool isAttribute);
    void finishElement();
    void doComplexType(xercesc::AttributeList& attrs);
    void beginTypeDefinition(xercesc::AttributeList& attrs, SimpleTypeDef& type);
    void saveComplexType();
    void storeDefinition();
    void finishComplexType();
    void doExtension(xercesc::AttributeList& attrs);
    void doGroup(xercesc::AttributeList& attrs);
    void finishGroup();
    void doSimpleType(xercesc::AttributeList& attrs);
    void finishSimpleType();
    void doRestriction(xercesc::AttributeList& attrs);
    void doList(xercesc::AttributeList& attrs);
    void doUnion(xercesc::AttributeList& attrs);
    void doFacet(xercesc::AttributeList& attrs, SimpleTypeDef& type, const XMLCh* facetName);
    void doInclude(xercesc::AttributeList& attrs);
    void doImport(xercesc::AttributeList& attrs);
    void doRedefine(xercesc::AttributeList& attrs);
    void finishRedefine();
    // Inside a redefinition, a reference to the component being redefined means the
    // original: its name becomes the one the original is read under.
    void referToOriginal(ZrName& name, const ZrName& ns, bool isGroup) const;
    // A top-level definition of the document being read, or of a redefinition, under
    // the name it is kept by.
    void nameDefinition(ZrName& name, const ZrName& ns, bool isGroup);

    // Start actions of the dispatch that need more than the attributes; they read
    // the tag's local part from tagLocal.
    void doElementTag(xercesc::AttributeList& attrs);
    void doAttributeTag(xercesc::AttributeList& attrs);
    void doFacetTag(xercesc::AttributeList& attrs);
    void doDigitsFacetTag(xercesc::AttributeList& attrs);
    void doSimpleContent(xercesc::AttributeList& attrs);
    void doComplexContent(xercesc::AttributeList& attrs);
    void skipSubtree(xercesc::AttributeList& attrs);
    void doAnnotation(xercesc::AttributeList& attrs);
    void doCompositor(xercesc::AttributeList& attrs);
    void finishCompositor();
    // Whether the compositors open around the working definition's next entry make
    // it optional.
    bool optionalHere() const;
    // Counts a branch of the choice open around the tag being dispatched.
    void noteBranch();
    void finishDocumentation();
    void declareInScope(xercesc::AttributeList& attrs);
    // Ends the element at elementDepth, and the namespaces it declared.
    void endScope();
    // Logs and fails a document that nests declarations, types and groups deeper
    // than the reader keeps state for; the rest of the subtree is skipped.
    bool tooDeep();

    // Where to read the document that the current document names by `location`
    // (include, import, redefine): the catalog's mapping of the location as
    // written, else the location itself, a relative one taken from the current
    // document's directory. False, with `refusal` saying why, when that is not a
    // local file: nothing is ever fetched over a network.
    bool locateDocument(const ZrWString& location, ZrWString& path, ZrWString& refusal) const;

    // A type (isGroup false) or group definition that a redefinition replaces.
    struct RedefinedName {
        TypeRef ref;
        bool isGroup;
    };

    // Parse driver steps.
    struct QueuedDocument;
    // Appends a document to its queue unless the read has queued it already.
    bool queueDocument(QueuedDocument document);
    // Parses the current document; any failure, thrown or reported, sets `failed`.
    void parseDocument(SchemaParser& parser);
    // Reads the queued documents of one queue; false when a document of the main
    // schema failed.
    bool readQueue(SchemaParser& parser, std::deque<QueuedDocument>& queue);
    void beginDocument(const QueuedDocument& document);
    // An imported document that failed: noted in the model, its partial state dropped.
    void noteFailedImport(const ZrWString& reason);
    // Notes once why a document imported for `ns` from `location` was not read.
    void noteImportFailure(std::u16string_view ns, std::u16string_view location,
                           std::u16string_view reason);
    void resetOpenComponents();
    void queueSchemaDocument(const XMLCh* format,
                             std::shared_ptr<const std::vector<RedefinedName>> redefined);
    void logParseStopped(const XMLCh* message);
    // Logs an error of the document being read; an imported document's first error
    // is kept as the reason it could not be read instead.
    void reportError(int severity, int code, const ZrWString& text);

    SchemaModel& model;
    const SchemaCatalog* catalog_ = nullptr;
    ReadDetail detail_;

    // Parse driver state.
    bool failed = false;
    bool firstElement = true;
    int32_t skipDepth = 0;
    // Elements open and read (not skipped), and the namespace declarations they made,
    // with what each replaced.
    int32_t elementDepth = 0;

    struct ScopedDeclaration {
        int32_t depth = 0;
        bool isDefault = false;
        bool bound = false;
        std::u16string prefix;
        std::u16string previous;
    };

    std::vector<ScopedDeclaration> scopedDeclarations;

    // Components under construction.
    ElementDef currentElement;
    std::vector<ElementDef> elementStack;
    ComplexTypeDef currentComplexType;
    std::vector<ComplexTypeDef> complexTypeStack;
    // Emptied content vectors of finished definitions, with their room, for the next
    // ones opened: no more of them than definitions were ever open at once.
    std::vector<std::vector<ElementDef>> spareContent;
    int32_t complexDepth = 0;
    SimpleTypeDef currentSimpleType;
    SimpleTypeDef* typeTarget = nullptr;
    // How the open simple type derives, which decides what a simple type nested in
    // it becomes: its base (restriction), a member (union) or nothing (list).
    enum class Derivation : uint8_t { None, Restriction, List, Union };
    Derivation currentDerivation = Derivation::None;

    // Simple types open around the working one, innermost last.
    struct OpenSimpleType {
        SimpleTypeDef type;
        Derivation derivation;
    };

    std::vector<OpenSimpleType> simpleTypeStack;
    int32_t simpleDepth = 0;
    // The declarations open when each saved complex type or group started, and
    // whether the outermost open simple type types the working complex type's text.
    std::vector<size_t> complexElementDepths;
    bool typesContent = false;

    // The latest answers of namespaceOfPrefix; the URIs live in the table's nodes.
    struct RecentPrefix {
        std::u16string prefix;
        const std::u16string* uri = nullptr;
        bool used = false;
    };

    RecentPrefix recentPrefixes[2];
    size_t nextRecentPrefix = 0;
    bool recentPrefixesStale = true;
    size_t recentPrefixesTableSize = 0;
    std::u16string schemaNamespace;

    // Scratch text of the current tag and attribute.
    ZrWString nameBuffer;
    ZrWString valueBuffer;
    ZrName recentNamespaces[4];
    size_t nextRecentNamespace = 0;

    // A document to read. The main schema is the main document and what it includes
    // or redefines; imported documents and what they include are read after it,
    // each with namespace declarations of its own.
    struct QueuedDocument {
        ZrWString path;
        bool imported = false;
        // The namespace an import expects, and the target namespace an included
        // document without one of its own takes.
        std::u16string ns;
        std::u16string target;
        // Names redefined in the document that redefines this one: its own
        // definitions of those names are kept as the originals, under other names.
        std::shared_ptr<const std::vector<RedefinedName>> redefined;
        // Built-in text to read instead of a file.
        std::string_view text;
    };

    std::deque<QueuedDocument> documentQueue;
    std::deque<QueuedDocument> importQueue;
    QueuedDocument currentDocument;
    // The namespace declarations in force: the main schema's in the model, or the
    // current imported document's own.
    NamespaceBindings* bindings = nullptr;
    NamespaceBindings importBindings;
    // The first error of the imported document being read.
    ZrWString importFailure;
    // Whether any name of the main schema is in the XML namespace, and whether a
    // document for it has been read.
    bool usesXmlNamespace = false;
    bool readXmlNamespace = false;
    // The redefinition being read: its names so far, and the top-level definition
    // open in it.
    std::shared_ptr<std::vector<RedefinedName>> redefinitions;
    int32_t redefineDepth = 0;
    TypeRef redefining;
    bool redefiningGroup = false;
    ZrURI documentURI;
    // Path of the document being parsed, as queued; named in messages.
    ZrWString documentPath_;
    // Local part of the tag being dispatched, inside the parser's own name (and
    // null-terminated there), and its namespace when a notice names it.
    std::u16string_view tagLocal;
    ZrWString tagNamespace;

    // Open sequences, choices and alls, innermost last, kept while occurrence is read.
    struct OpenCompositor {
        int32_t depth = 0;        // elementDepth of its tag
        int32_t complexDepth = 0; // the definition whose content it orders
        bool optional = false;    // it, or one around it in that definition, may be absent
        bool choice = false;
        int32_t branches = 0;
        size_t firstEntry = 0; // the definition's content entries from here are inside it
    };

    std::vector<OpenCompositor> compositors;

    // The component whose annotation's documentation gives its description: the
    // latest declaration or type opened (at openedDepth); the owner of the annotation
    // being skipped, while its documentation is sought; the skip depth of the
    // documentation whose text is gathered (0: none).
    enum class DocOwner : uint8_t { None, Element, ComplexType, SimpleType };
    DocOwner lastOpened = DocOwner::None;
    int32_t openedDepth = 0;
    DocOwner docOwner = DocOwner::None;
    int32_t docDepth = 0;
    // The gathered text: UTF-8 while it is all ASCII, as nearly all documentation
    // is, so that it needs no conversion; 16-bit text from the first other character
    // on (docWide), since the parser may hand a surrogate pair over in two pieces.
    std::string docText;
    std::u16string docWideText;
    bool docWide = false;
    bool docBlank = false;

    // For each open "group"/"attributeGroup" element: whether its start opened a
    // definition (true) or was a reference (false).
    std::vector<bool> groupOpenedDefinition;
    // Every location queued during the current read, so a document is parsed once
    // however often it is included.
    std::unordered_set<ZrWString> queuedDocuments;
};
