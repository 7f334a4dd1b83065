// The schema reader: the SAX handler that parses a schema and the documents it
// includes into the component model, then builds host records from the model.
#pragma once

#include "SchemaModel.h"
#include "zrapi.h"
#include "zrbxmls_export.h"
#include "zrdtype.h"
#include "zrfile.h"
#include "zrstring.h"

#include <xercesc/sax/AttributeList.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/sax/InputSource.hpp>
#include <xercesc/sax/SAXParseException.hpp>
#include <xercesc/util/BinInputStream.hpp>

#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <string_view>
#include <type_traits>
#include <unordered_map>
#include <unordered_set>
#include <utility>
#include <vector>

static_assert(std::is_same_v<XMLCh, char16_t>, "the host's wide text must be the parser's XMLCh");

// The parser's text as a view; null reads as the empty text.
inline std::u16string_view xmlText(const XMLCh* text) {
    return text ? std::u16string_view(text) : std::u16string_view();
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

XERCES_CPP_NAMESPACE_BEGIN
class SAXParser;
XERCES_CPP_NAMESPACE_END

class ZrXmlSchemaBrowserTestAccess;

// Number of built-in type-definition strings.
constexpr int kBuiltinTypeCount = 95;
// The built-in type-definition strings, null-terminated, in lookup order.
extern const char* const kBuiltinTypeDefinitions[kBuiltinTypeCount + 1];

// Orders the prefix table and lets it be searched with a view of the prefix, so
// resolving a name copies nothing.
struct PrefixOrder {
    using is_transparent = void;
    bool operator()(const ZrWString& a, const ZrWString& b) const { return a.view() < b.view(); }
    bool operator()(const ZrWString& a, std::u16string_view b) const { return a.view() < b; }
    bool operator()(std::u16string_view a, const ZrWString& b) const { return a < b.view(); }
};

class ZRBXMLS_API ZrXmlSchemaBrowser : public xercesc::HandlerBase {
public:
    ZrXmlSchemaBrowser();
    ZrXmlSchemaBrowser(const ZrXmlSchemaBrowser&) = delete;
    ZrXmlSchemaBrowser& operator=(const ZrXmlSchemaBrowser&) = delete;
    ~ZrXmlSchemaBrowser() override;

    // Parses the schema at `path` and the documents it includes, then builds one
    // record per top-level declaration of complex type. False when the read failed;
    // the cause has been logged.
    bool ReadSchema(const ZrWChar* path, bool qualified);
    // Records of the latest read, in building order; they live as long as the browser.
    const ZrRecordList& Records() const { return records; }
    // Moves the records of the latest read to the end of `target`; the browser keeps
    // none. Throws bad_alloc, nothing moved, when memory runs out.
    void TakeRecords(ZrRecordList& target) {
        target.TakeAll(records);
        recordsByName.clear();
    }

    // First built-in type whose alias equals `name` (compared as UTF-8 bytes), or null.
    const ZrDType* TypeByName(const XMLCh* name) const;
    // First built-in type with that usage code, or null.
    const ZrDType* TypeByUsage(short usage) const;

    // SAX callbacks.
    void startElement(const XMLCh* name, xercesc::AttributeList& attrs) override;
    void endElement(const XMLCh* name) override;
    void warning(const xercesc::SAXParseException& e) override;
    void error(const xercesc::SAXParseException& e) override;
    void fatalError(const xercesc::SAXParseException& e) override;
    // Refuses every external entity and DTD: nothing outside the schema documents
    // themselves is ever read.
    xercesc::InputSource* resolveEntity(const XMLCh* publicId, const XMLCh* systemId) override;

private:
    friend class ZrXmlSchemaBrowserTestAccess;

    // Namespaces and qualified names.
    void FirstElementAttrs(xercesc::AttributeList& attrs);
    void parseName(const XMLCh* name, bool useDefault, ZrName& localPart, ZrName& ns);
    const XMLCh* LookupNamespace(const XMLCh* prefix);
    // The namespace bound to `prefix`, or null when none is.
    const ZrWString* namespaceOfPrefix(std::u16string_view prefix);
    // The pool's copy of a namespace's text.
    ZrName namespaceName(std::u16string_view uri);
    const XMLCh* ReverseNamespace(const XMLCh* uri, bool useTargetPrefix);

    // Handlers of schema constructs.
    void doElement(xercesc::AttributeList& attrs, bool isAttribute);
    void finishElement();
    void doComplexType(xercesc::AttributeList& attrs);
    void beginTypeDefinition(xercesc::AttributeList& attrs, SimpleTypeDef& type);
    void finishComplexType();
    void doExtension(xercesc::AttributeList& attrs);
    void finishExtension();
    void doGroup(xercesc::AttributeList& attrs);
    void finishGroup();
    void doSimpleType(xercesc::AttributeList& attrs);
    void finishSimpleType();
    void doRestriction(xercesc::AttributeList& attrs);
    void finishRestriction();
    void doList(xercesc::AttributeList& attrs);
    void doFacet(xercesc::AttributeList& attrs, SimpleTypeDef& type, const XMLCh* facetName);
    void doInclude(xercesc::AttributeList& attrs);
    void finishInclude();

    // Start actions of the dispatch that need more than the attributes; they read
    // the tag's local part from tagLocal.
    void doElementTag(xercesc::AttributeList& attrs);
    void doAttributeTag(xercesc::AttributeList& attrs);
    void doFacetTag(xercesc::AttributeList& attrs);
    void doSimpleContent(xercesc::AttributeList& attrs);
    void doComplexContent(xercesc::AttributeList& attrs);
    void skipSubtree(xercesc::AttributeList& attrs);
    // Logs and fails a document that nests declarations, types and groups deeper
    // than the reader keeps state for; the rest of the subtree is skipped.
    bool tooDeep();

    // Parse driver steps.
    // Appends a location to documentQueue unless the read has queued it already.
    bool queueDocument(const ZrWString& location);
    // Parses documentPath; any failure, thrown or reported, sets `failed`.
    void parseDocument(xercesc::SAXParser& parser);
    void logParseStopped(const XMLCh* message);
    void logOutOfMemory();

    // Defines the built-in types and the record type; called by the constructor.
    void defineBuiltinTypes();

    // Model lookups.
    ComplexTypeDef* findComplexType(std::u16string_view localName, std::u16string_view namespaceURI);

    // Record construction.
    ZrRecord* buildRecord(const ElementDef& declaration);
    bool addField(const ElementDef& declaration, ZrRecord* record);
    bool addDerivedContent(const ComplexTypeDef& type, const ZrWString& recordName,
                           ZrRecord* record);
    bool addSimpleContentField(const ComplexTypeDef& type, const ZrWString& recordName,
                               ZrRecord* record);
    bool addTextField(const ZrWString& recordName, const ZrName& typeName, const ZrName& typeNs,
                      ZrRecord* record);
    bool addReference(const ElementDef& reference, ZrRecord* record);
    bool addGroup(const ElementDef& reference, ZrRecord* record);
    // `kept`: the declaration's type as kept from an earlier field, or null.
    bool addSimpleField(const ElementDef& declaration, ZrRecord* record, const ZrDType* kept);
    bool fieldType(const ElementDef& declaration, const ZrWString& field, ZrDType& type);
    const ZrDType* keptFieldType(const ElementDef& declaration) const;
    ZrWString qualifiedName(const ZrName& ns, const ZrName& local, bool useTargetPrefix);
    ZrWString recordName(const ZrWString& qualified) const;
    bool isExpanding(const void* component) const;
    bool nestingTooDeep(const XMLCh* where);
    bool takeBuildStep(const XMLCh* where);
    long buildStepBudget() const;
    bool recordHasField(const ZrRecord* record, const ZrWString& name) const;
    // Notes a field just added; `name` is the field's own, which lives as long as it.
    void noteField(const ZrRecord* record, const ZrWString& name);

    // Field typing.
    bool lookupType(std::u16string_view localName, std::u16string_view namespaceURI, ZrDType& type);
    // The first built-in type whose alias is `name`, or null.
    const ZrDType* builtinByName(std::u16string_view name) const;
    bool resolveSimpleType(SimpleTypeDef& simpleType);
    void dtLimits(ZrDType& type, const XMLCh* minInclusive, const XMLCh* maxInclusive,
                  const XMLCh* minExclusive, const XMLCh* maxExclusive);
    void dtPattern(ZrDType& type, const XMLCh* pattern);
    long branchLength(const XMLCh*& cursor);
    long lengthSpec(const XMLCh*& cursor);
    long branchLengthAt(const XMLCh*& cursor, int groupDepth);

    // Parse driver state.
    bool initialised = true;
    bool failed = false;
    ZrWString initError;
    bool firstElement = true;
    int32_t skipDepth = 0;

    // Built-in type table.
    std::unique_ptr<ZrDType[]> builtinTypes;
    std::unique_ptr<const ZrDType*[]> builtinTypePointers;
    ZrDType recordType;
    // First built-in type per alias and per usage code: the answers of a scan in
    // list order, without the scan.
    std::unordered_map<std::string, const ZrDType*> builtinByAlias;
    // The same, keyed by the aliases as wide text, which the views below point into.
    std::vector<std::u16string> builtinWideAliases;
    std::unordered_map<std::u16string_view, const ZrDType*> builtinByWideAlias;
    std::unordered_map<short, const ZrDType*> builtinByUsage;

    ZrRecordList records;
    bool qualifiedRecords = false;

    // Component model.
    ElementDef currentElement;
    std::vector<ElementDef> elementStack;
    NamedList<ElementDef> globalElements;
    ComplexTypeDef currentComplexType;
    std::vector<ComplexTypeDef> complexTypeStack;
    NamedList<ComplexTypeDef> complexTypes;
    int32_t complexDepth = 0;
    int32_t anonCounter = 0;
    SimpleTypeDef currentSimpleType;
    NamedList<SimpleTypeDef> simpleTypes;
    SimpleTypeDef* typeTarget = nullptr;

    // Namespace state.
    ZrWString defaultNamespace;
    ZrWString targetNamespace;
    std::map<ZrWString, ZrWString, PrefixOrder> namespacePrefixes;
    // Scratch key of the URI index's lookups.
    ZrWString prefixKey;
    // ReverseNamespace's scan of namespacePrefixes kept as an index: for each URI the
    // first prefix in table order bound to it. Rebuilt before use when the table may
    // have changed, so a schema binding thousands of prefixes does not cost a scan per
    // name it writes back.
    std::unordered_map<ZrWString, ZrWString> prefixOfUri;
    bool prefixOfUriStale = true;
    // The latest answers of namespaceOfPrefix; the URIs live in the table's nodes.
    struct RecentPrefix {
        ZrWString prefix;
        const ZrWString* uri = nullptr;
        bool used = false;
    };
    RecentPrefix recentPrefixes[2];
    size_t nextRecentPrefix = 0;
    bool recentPrefixesStale = true;
    size_t recentPrefixesTableSize = 0;
    size_t prefixOfUriSize = 0;
    ZrWString schemaNamespace;

    // Scratch text of the current tag and attribute.
    ZrWString nameBuffer;
    ZrWString valueBuffer;
    // One shared copy of each name, namespace and facet value the model holds.
    ZrNamePool names;
    ZrName recentNamespaces[4];
    size_t nextRecentNamespace = 0;

    // Scratch text of addSimpleField: the field's type name as text, and the local
    // part and namespace read back from it.
    ZrWString fieldTypeText;
    ZrName fieldTypeLocal;
    ZrName fieldTypeNs;

    // Qualified names of the records under construction, outermost first.
    std::vector<ZrWString> recordWorkList;

    std::deque<ZrWString> documentQueue;
    ZrURI documentURI;
    // Path of the document being parsed, as queued; named in messages.
    ZrWString documentPath;
    // Local part of the tag being dispatched, inside the parser's own name (and
    // null-terminated there), and its namespace when a notice names it.
    std::u16string_view tagLocal;
    ZrWString tagNamespace;

    // For each open "group"/"attributeGroup" element: whether its start opened a
    // definition (true) or was a reference (false).
    std::vector<bool> groupOpenedDefinition;
    // Every location queued during the current read, so a document is parsed once
    // however often it is included.
    std::unordered_set<ZrWString> queuedDocuments;
    // Records built in the current read, by name.
    struct TextHash {
        size_t operator()(const ZrWString& text) const { return size_t(zrTextHash(text.view())); }
    };
    std::unordered_map<ZrWString, ZrRecord*, TextHash> recordsByName;

    // Record-building guards. Groups, element references and base types being drawn
    // into the record under construction; entries below expansionFloor belong to the
    // records around it, whose expansions a nested record may legitimately repeat.
    std::vector<const void*> expansionStack;
    size_t expansionFloor = 0;
    // Simple types whose base chain is being resolved.
    std::unordered_set<const SimpleTypeDef*> resolvingTypes;
    // Nested buildRecord, group, reference, base-type and simple-type steps open now.
    int buildDepth = 0;
    // addField and buildRecord calls of the current read, and their ceiling.
    long buildSteps = 0;
    long buildStepLimit = 0;
    // The names of the fields given so far to each record under construction,
    // innermost last: whether a record already has a field of some name is then a
    // lookup, not a scan of a record that may hold many thousands of fields.
    // The sets view the fields' own names. Entries past openRecordCount are kept
    // for the next records, so that their sets allocate nothing.
    struct OpenRecord {
        const ZrRecord* record = nullptr;
        ZrTextSet fieldNames;
    };
    std::vector<OpenRecord> openRecords;
    size_t openRecordCount = 0;
    // The data type each named field type comes to, by the identities of the type's
    // name and namespace (held, so they stay unique), for the rest of the read's
    // record building: the namespaces and the model no longer change then.
    struct FieldTypeKey {
        const void* name;
        const void* ns;
        bool operator==(const FieldTypeKey& other) const {
            return name == other.name && ns == other.ns;
        }
    };
    struct FieldTypeKeyHash {
        size_t operator()(const FieldTypeKey& key) const {
            return std::hash<const void*>()(key.name) * 31 + std::hash<const void*>()(key.ns);
        }
    };
    struct FieldTypeEntry {
        ZrName name;
        ZrName ns;
        ZrDType type;
    };
    std::unordered_map<FieldTypeKey, FieldTypeEntry, FieldTypeKeyHash> fieldTypes;
    // Temporary simple types of simple content in the model now.
    int temporaryTypes = 0;
};

// Parser input over the host file proxy.
class FPInputSource : public xercesc::InputSource {
public:
    explicit FPInputSource(const ZrWChar* path);
    FPInputSource(const FPInputSource&) = delete;
    FPInputSource& operator=(const FPInputSource&) = delete;
    ~FPInputSource() override;

    xercesc::BinInputStream* makeStream() const override;
    // True once a stream of this source failed to read its file; the parse then
    // saw the document end early.
    bool readFailed() const { return *readError; }

private:
    ZrWString path;
    XMLCh* systemId = nullptr;
    bool designMode = false;
    // Shared with the streams, which the parser may keep a little longer.
    std::shared_ptr<bool> readError = std::make_shared<bool>(false);
};

class FPInputStream : public xercesc::BinInputStream {
public:
    FPInputStream(const ZrWChar* path, bool designMode);
    FPInputStream(const FPInputStream&) = delete;
    FPInputStream& operator=(const FPInputStream&) = delete;
    ~FPInputStream() override;

    bool isOpen() const { return fileProxy.isOpen(); }
    XMLFilePos curPos() const override;
    XMLSize_t readBytes(XMLByte* buffer, XMLSize_t maxToRead) override;
    const XMLCh* getContentType() const override;
    // Where a failed read is recorded.
    void reportReadErrorTo(std::shared_ptr<bool> flag) { readError = std::move(flag); }

    // Largest number of bytes one readBytes call hands out; 0 for no limit. Tests
    // lower it to prove the reader does not depend on how the input is chunked.
    static XMLSize_t chunkLimit;

private:
    ZrFileProxy fileProxy;
    uint32_t position = 0;
    ZrWString path;
    std::shared_ptr<bool> readError;
};
