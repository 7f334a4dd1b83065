#include "ParserConfig.h"

#include <string>
#include <string_view>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/sax/SAXException.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/SecurityManager.hpp>
#include <xercesc/validators/DTD/DTDEntityDecl.hpp>

namespace {

class SchemaSecurityManager : public xercesc::SecurityManager {
  public:
    SchemaSecurityManager() { setEntityExpansionLimit(kSchemaEntityExpansionLimit); }
};

// Shared by every configured parser and never changed after it is built; a
// function-local static outlives every parser that points at it.
xercesc::SecurityManager& schemaSecurityManager() {
    static SchemaSecurityManager manager;
    return manager;
}

} // namespace

void configureSchemaParser(xercesc::SAXParser& parser) {
    parser.setValidationScheme(xercesc::SAXParser::Val_Never);
    parser.setDoSchema(false);
    parser.setLoadSchema(false);
    parser.setDoNamespaces(false);
    parser.setLoadExternalDTD(false);
    parser.setSkipDTDValidation(true);
    parser.setDisableDefaultEntityResolution(true);
    parser.setExitOnFirstFatalError(true);
    parser.setSecurityManager(&schemaSecurityManager());
}

SchemaParser::SchemaParser()
    : xercesc::SAXParser(nullptr, xercesc::XMLPlatformUtils::fgMemoryManager, nullptr) {
    configureSchemaParser(*this);
    // The parser reports entity declarations only while a DTD handler is
    // installed; this one ignores what it is told.
    static xercesc::HandlerBase ignoredDtdEvents;
    setDTDHandler(&ignoredDtdEvents);
}

void SchemaParser::entityDecl(const xercesc::DTDEntityDecl& decl, bool isPEDecl, bool isIgnored) {
    if (decl.getValueLen() > kSchemaEntityValueLimit) {
        const XMLCh* name = decl.getName();
        throw SchemaEntityTooLong{name ? name : u"", decl.getValueLen()};
    }
    const XMLCh* value = decl.getValue();
    if (isPEDecl && value && std::u16string_view(value).find(u'%') != std::u16string_view::npos) {
        const XMLCh* name = decl.getName();
        const std::u16string message = u"parameter entity '" + std::u16string(name ? name : u"") +
                                       u"' refers to other parameter entities";
        throw xercesc::SAXException(message.c_str());
    }
    xercesc::SAXParser::entityDecl(decl, isPEDecl, isIgnored);
    countDtdItem();
}

void SchemaParser::countDtdItem() {
    if (++dtdItems > kSchemaDtdItemLimit) {
        const std::string message = "the document type declaration holds more than " +
                                    std::to_string(kSchemaDtdItemLimit) + " items";
        throw xercesc::SAXException(message.c_str());
    }
}

void SchemaParser::doctypeDecl(const xercesc::DTDElementDecl& root, const XMLCh* publicId,
                               const XMLCh* systemId, bool hasIntSubset, bool hasExtSubset) {
    // One document type declaration per document; the parser reads several documents.
    dtdItems = 0;
    xercesc::SAXParser::doctypeDecl(root, publicId, systemId, hasIntSubset, hasExtSubset);
}

void SchemaParser::doctypeComment(const XMLCh* comment) {
    xercesc::SAXParser::doctypeComment(comment);
    countDtdItem();
}

void SchemaParser::doctypePI(const XMLCh* target, const XMLCh* data) {
    xercesc::SAXParser::doctypePI(target, data);
    countDtdItem();
}

void SchemaParser::doctypeWhitespace(const XMLCh* chars, XMLSize_t length) {
    xercesc::SAXParser::doctypeWhitespace(chars, length);
    countDtdItem();
}

void SchemaParser::elementDecl(const xercesc::DTDElementDecl& decl, bool isIgnored) {
    xercesc::SAXParser::elementDecl(decl, isIgnored);
    countDtdItem();
}

void SchemaParser::attDef(const xercesc::DTDElementDecl& element,
                          const xercesc::DTDAttDef& attribute, bool ignore) {
    xercesc::SAXParser::attDef(element, attribute, ignore);
    countDtdItem();
}

void SchemaParser::notationDecl(const xercesc::XMLNotationDecl& decl, bool isIgnored) {
    xercesc::SAXParser::notationDecl(decl, isIgnored);
    countDtdItem();
}
