// How the schema reader's SAX parser behaves, kept in one place so that anything
// measuring the bare parser configures it exactly like a read does.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <xercesc/parsers/SAXParser.hpp>
#include <xercesc/util/SecurityManager.hpp>

// What general entities may add to one document, in characters of replacement
// text: kSchemaEntityGrowthFactor times the document's size in bytes, but never
// less than kSchemaEntityGrowthFloor. Type libraries build long patterns out of
// many small entities and expand them thousands of times, which a bound on the
// number of expansions refuses; a "billion laughs" or a long entity repeated
// many times passes any sensible size within a few levels or references (the
// predefined entities and character references never count).
constexpr std::size_t kSchemaEntityGrowthFactor = 10;
constexpr std::size_t kSchemaEntityGrowthFloor = std::size_t(4) << 20;
// What one expansion costs on top of the characters it produces: the parser sets
// up a reader with buffers of its own for each, so expansions that produce
// nothing still have to be paid for.
constexpr std::size_t kSchemaEntityExpansionCost = 1024;
// Longest replacement text an entity declaration may have. It also bounds what
// one expansion adds before the parser reports it.
constexpr std::size_t kSchemaEntityValueLimit = 4096;

// Most declarations, comments, processing instructions and blank runs the document
// type declaration of one document may hold, the replacement texts of parameter
// entities included. Real schemas declare a few hundred at most; the bound keeps a
// small document from repeating a parameter entity into millions of them.
constexpr std::size_t kSchemaDtdItemLimit = 10000;

// Initialises the parser library the first time any thread asks, and only then:
// its initialisation is not safe against concurrent calls. The library is never
// terminated, since the host or other plug-ins in the process may use it. Null
// when the library is ready, else the message of its failure.
const std::u16string* parserLibraryError();

// Configures `parser` for reading schema documents: no validation, no namespace
// processing (the reader resolves prefixes itself), no external DTD, no default
// resolution of external entities (nothing is fetched from disk or network
// except through an installed resolver), and a bounded number of entity
// expansions per document (the bound a parser without SchemaParser's accounting
// keeps: kSchemaEntityGrowthFloor / kSchemaEntityValueLimit). The caller installs
// its handlers.
void configureSchemaParser(xercesc::SAXParser& parser);

// Thrown out of the parse when a document declares an entity whose replacement
// text is longer than kSchemaEntityValueLimit.
struct SchemaEntityTooLong {
    std::u16string name;
    std::size_t length;
};

// The parser a read uses: configured by configureSchemaParser, refusing entity
// declarations with long replacement texts, and bounding what entity expansions
// cost each document by its size (kSchemaEntityGrowthFactor): the characters
// they produce plus kSchemaEntityExpansionCost per expansion.
//
// An expansion in content is announced before the parser reads it; its whole
// cost, nested references included, is worked out from the declarations and
// refused at once when it is over the budget. Expansions inside attribute values
// are announced to nobody: between two announcements the parser may perform only
// as many expansions as the rest of the budget pays for at the highest cost per
// expansion that any declared entity reaches, and each start tag then pays for
// its attribute values and the expansions performed. Exceeding either stops the
// parse with a SAXException.
class SchemaParser : public xercesc::SAXParser {
  public:
    SchemaParser();

    // Sizes the budget of the next document parsed: `documentBytes` is its size,
    // 0 when unknown (the floor applies).
    void expectDocumentSize(std::uint64_t documentBytes) { nextDocumentBytes = documentBytes; }

    // Characters entity expansions may add to a document of `documentBytes` bytes.
    static std::uint64_t entityBudget(std::uint64_t documentBytes);

    void resetDocument() override;
    void entityDecl(const xercesc::DTDEntityDecl& decl, bool isPEDecl, bool isIgnored) override;
    void endIntSubset() override;
    void startEntityReference(const xercesc::XMLEntityDecl& decl) override;
    void endEntityReference(const xercesc::XMLEntityDecl& decl) override;
    void startElement(const xercesc::XMLElementDecl& decl, unsigned int urlId, const XMLCh* prefix,
                      const xercesc::RefVectorOf<xercesc::XMLAttr>& attrs, XMLSize_t attrCount,
                      bool isEmpty, bool isRoot) override;
    void error(unsigned int code, const XMLCh* domain, xercesc::XMLErrorReporter::ErrTypes type,
               const XMLCh* text, const XMLCh* systemId, const XMLCh* publicId, XMLFileLoc line,
               XMLFileLoc column) override;

    // The security manager counts general entities only. A parameter entity whose
    // replacement text refers to further parameter entities is refused (nesting them
    // is how a "billion laughs" hides in the DTD), and each of these items counts
    // against kSchemaDtdItemLimit; either stops the parse with a SAXException.
    void doctypeDecl(const xercesc::DTDElementDecl& root, const XMLCh* publicId,
                     const XMLCh* systemId, bool hasIntSubset, bool hasExtSubset) override;
    void doctypeComment(const XMLCh* comment) override;
    void doctypePI(const XMLCh* target, const XMLCh* data) override;
    void doctypeWhitespace(const XMLCh* chars, XMLSize_t length) override;
    void elementDecl(const xercesc::DTDElementDecl& decl, bool isIgnored) override;
    void attDef(const xercesc::DTDElementDecl& element, const xercesc::DTDAttDef& attribute,
                bool ignore) override;
    void notationDecl(const xercesc::XMLNotationDecl& decl, bool isIgnored) override;

  private:
    void countDtdItem();
    // Charges what entities produced since the last call, `characters` and the
    // expansions the parser counted, and opens a new window of expansions: as many
    // as the rest of the budget pays for at `costPerExpansion`, counted from zero.
    // Throws once the budget is spent.
    void settle(std::uint64_t characters);
    void openWindow();
    [[noreturn]] void throwOverBudget() const;

    // One general entity: its replacement text, and once the internal subset has
    // been read, the characters one reference to it produces and the expansions it
    // takes, nested references included.
    struct Entity {
        std::u16string value;
        std::uint64_t produced = 0;
        std::uint64_t expansions = 0;
        int state = 0; // 0 not measured, 1 being measured, 2 measured
    };

    // Measures every declared entity without recursing: a reference chain is as
    // long as the document makes it.
    void measureEntities();

    std::size_t dtdItems = 0;
    std::uint64_t nextDocumentBytes = 0;
    std::uint64_t budget = 0;
    std::uint64_t spent = 0;
    // Highest characters plus expansion cost per expansion of any declared entity;
    // until the declarations are known, what the longest allowed one would cost.
    std::uint64_t costPerExpansion = kSchemaEntityValueLimit + kSchemaEntityExpansionCost;
    std::size_t entityDepth = 0;
    std::unordered_map<std::u16string, Entity> entities;
    std::unique_ptr<xercesc::SecurityManager> security;
};
