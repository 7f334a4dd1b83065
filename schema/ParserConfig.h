// How the schema reader's SAX parser behaves, kept in one place so that anything
// measuring the bare parser configures it exactly like a read does.
#pragma once

#include <cstddef>
#include <string>
#include <xercesc/parsers/SAXParser.hpp>

// Most general-entity expansions one document may perform (the predefined
// entities and character references do not count). Schema documents rarely
// declare entities at all; the bound stops exponential ("billion laughs")
// expansion early.
constexpr std::size_t kSchemaEntityExpansionLimit = 1000;
// Longest replacement text an entity declaration may have. Together with the
// expansion bound it caps the text entities can produce in one document at four
// million characters, however the references repeat and nest.
constexpr std::size_t kSchemaEntityValueLimit = 4096;

// Most declarations, comments, processing instructions and blank runs the document
// type declaration of one document may hold, the replacement texts of parameter
// entities included. Real schemas declare a few hundred at most; the bound keeps a
// small document from repeating a parameter entity into millions of them.
constexpr std::size_t kSchemaDtdItemLimit = 10000;

// Configures `parser` for reading schema documents: no validation, no namespace
// processing (the reader resolves prefixes itself), no external DTD, no default
// resolution of external entities (nothing is fetched from disk or network
// except through an installed resolver), and a bounded number of entity
// expansions. The caller installs its handlers.
void configureSchemaParser(xercesc::SAXParser& parser);

// Thrown out of the parse when a document declares an entity whose replacement
// text is longer than kSchemaEntityValueLimit.
struct SchemaEntityTooLong {
    std::u16string name;
    std::size_t length;
};

// The parser a read uses: configured by configureSchemaParser, and refusing
// entity declarations with long replacement texts, which the expansion count
// alone cannot keep from multiplying a small document into gigabytes.
class SchemaParser : public xercesc::SAXParser {
  public:
    SchemaParser();

    void entityDecl(const xercesc::DTDEntityDecl& decl, bool isPEDecl, bool isIgnored) override;

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

    std::size_t dtdItems = 0;
};
