#include "ParserConfig.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>
#include <xercesc/framework/XMLErrorCodes.hpp>
#include <xercesc/internal/XMLScanner.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/sax/Locator.hpp>
#include <xercesc/sax/SAXException.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/SecurityManager.hpp>
#include <xercesc/util/XMLException.hpp>
#include <xercesc/util/XMLUni.hpp>
#include <xercesc/validators/DTD/DTDEntityDecl.hpp>

namespace {

// Before any document declares entities, a parser counts expansions against what
// the floor pays for at the longest replacement text allowed.
constexpr std::size_t kDefaultExpansionLimit =
    kSchemaEntityGrowthFloor / (kSchemaEntityValueLimit + kSchemaEntityExpansionCost);

class SchemaSecurityManager : public xercesc::SecurityManager {
  public:
    SchemaSecurityManager() { setEntityExpansionLimit(kDefaultExpansionLimit); }
};

// Shared by every parser configured here and never changed after it is built; a
// function-local static outlives every parser that points at it.
xercesc::SecurityManager& schemaSecurityManager() {
    static SchemaSecurityManager manager;
    return manager;
}

// Large enough that no budget reaches it, small enough that adding two never
// overflows.
constexpr std::uint64_t kSaturated = std::uint64_t(1) << 62;

std::uint64_t saturatingAdd(std::uint64_t a, std::uint64_t b) {
    return a + b >= kSaturated ? kSaturated : a + b;
}

std::uint64_t costOfExpansions(std::uint64_t expansions) {
    return expansions >= kSaturated / kSchemaEntityExpansionCost
               ? kSaturated
               : expansions * kSchemaEntityExpansionCost;
}

// The scanner counts the expansions it performs in a protected member and offers
// no getter; a pointer to that member, taken through a class derived from the
// scanner, reads it without touching anything else.
struct ExpansionCountOf : xercesc::XMLScanner {
    static XMLSize_t of(const xercesc::XMLScanner& scanner) {
        return scanner.*(&ExpansionCountOf::fEntityExpansionCount);
    }
};

bool endsEntityName(char16_t c) {
    switch (c) {
    case u';':
    case u'&':
    case u'<':
    case u'>':
    case u'"':
    case u'\'':
    case u'%':
    case u' ':
    case u'\t':
    case u'\r':
    case u'\n':
        return true;
    default:
        return false;
    }
}

} // namespace

const std::u16string* parserLibraryError() {
    // A function-local static is initialised once, other threads waiting for it.
    static const std::optional<std::u16string> error = []() -> std::optional<std::u16string> {
        try {
            xercesc::XMLPlatformUtils::Initialize(xercesc::XMLUni::fgXercescDefaultLocale, nullptr,
                                                  nullptr, nullptr);
        } catch (const xercesc::XMLException& e) {
            const XMLCh* message = e.getMessage();
            return std::u16string(message ? message : u"");
        }
        return std::nullopt;
    }();
    return error ? &*error : nullptr;
}

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
    : xercesc::SAXParser(nullptr, xercesc::XMLPlatformUtils::fgMemoryManager, nullptr),
      security(std::make_unique<xercesc::SecurityManager>()) {
    configureSchemaParser(*this);
    // A manager of its own: the window of expansions changes during a parse.
    security->setEntityExpansionLimit(kDefaultExpansionLimit);
    setSecurityManager(security.get());
    // The parser reports entity declarations only while a DTD handler is
    // installed; this one ignores what it is told.
    static xercesc::HandlerBase ignoredDtdEvents;
    setDTDHandler(&ignoredDtdEvents);
}

std::uint64_t SchemaParser::entityBudget(std::uint64_t documentBytes) {
    const std::uint64_t scaled = documentBytes >= kSaturated / kSchemaEntityGrowthFactor
                                     ? kSaturated
                                     : documentBytes * kSchemaEntityGrowthFactor;
    return scaled > kSchemaEntityGrowthFloor ? scaled : kSchemaEntityGrowthFloor;
}

void SchemaParser::resetDocument() {
    budget = entityBudget(nextDocumentBytes);
    nextDocumentBytes = 0;
    spent = 0;
    costPerExpansion = kSchemaEntityValueLimit + kSchemaEntityExpansionCost;
    entityDepth = 0;
    entities.clear();
    xercesc::SAXParser::resetDocument();
    // What the scanner counted belongs to the document before.
    openWindow();
}

void SchemaParser::settle(std::uint64_t characters) {
    spent = saturatingAdd(spent, characters);
    spent = saturatingAdd(spent, costOfExpansions(ExpansionCountOf::of(getScanner())));
    if (spent > budget)
        throwOverBudget();
    openWindow();
}

void SchemaParser::openWindow() {
    // The scanner is the parser's own and not const; only its accessor is.
    auto& scanner = const_cast<xercesc::XMLScanner&>(getScanner());
    const std::uint64_t window = (budget - spent) / costPerExpansion;
    security->setEntityExpansionLimit(static_cast<XMLSize_t>(window));
    // Takes the new limit and starts counting from zero.
    scanner.setSecurityManager(security.get());
}

void SchemaParser::throwOverBudget() const {
    std::string message =
        "entity references expand the document beyond " + std::to_string(budget) + " characters";
    if (const xercesc::Locator* at = getScanner().getLocator())
        message += " (at line " + std::to_string(at->getLineNumber()) + ", column " +
                   std::to_string(at->getColumnNumber()) + ")";
    throw xercesc::SAXException(message.c_str());
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
    // The first declaration of a name is the one that counts.
    if (!isPEDecl && !isIgnored && decl.getName() && !decl.isExternal())
        entities.emplace(decl.getName(), Entity{value ? value : u"", 0, 0, 0});
    xercesc::SAXParser::entityDecl(decl, isPEDecl, isIgnored);
    countDtdItem();
}

void SchemaParser::measureEntities() {
    struct Frame {
        Entity* entity;
        size_t pos;
    };

    std::vector<Frame> stack;
    for (auto& [rootName, root] : entities) {
        if (root.state != 0)
            continue;
        root.state = 1;
        root.expansions = 1;
        stack.push_back({&root, 0});
        while (!stack.empty()) {
            Entity& entity = *stack.back().entity;
            size_t pos = stack.back().pos;
            const std::u16string& value = entity.value;
            Entity* descend = nullptr;
            while (pos < value.size()) {
                const size_t amp = value.find(u'&', pos);
                if (amp == std::u16string::npos) {
                    entity.produced = saturatingAdd(entity.produced, value.size() - pos);
                    pos = value.size();
                    break;
                }
                entity.produced = saturatingAdd(entity.produced, amp - pos);
                size_t end = amp + 1;
                while (end < value.size() && !endsEntityName(value[end]))
                    ++end;
                const auto found = end < value.size() && value[end] == u';'
                                       ? entities.find(value.substr(amp + 1, end - amp - 1))
                                       : entities.end();
                // A character reference, a predefined entity or anything else the
                // parser takes literally costs its own length; so does a reference to
                // an entity being measured, which the parser refuses as recursive.
                if (found == entities.end() || found->second.state == 1) {
                    const size_t stop = end < value.size() && value[end] == u';' ? end + 1 : end;
                    entity.produced = saturatingAdd(entity.produced, stop - amp);
                    pos = stop;
                    continue;
                }
                Entity& child = found->second;
                if (child.state == 0) {
                    // Measured first; the reference is read again when it is done.
                    pos = amp;
                    descend = &child;
                    break;
                }
                entity.produced = saturatingAdd(entity.produced, child.produced);
                entity.expansions = saturatingAdd(entity.expansions, child.expansions);
                pos = end + 1;
            }
            stack.back().pos = pos;
            if (descend) {
                descend->state = 1;
                descend->expansions = 1;
                stack.push_back({descend, 0});
                continue;
            }
            entity.state = 2;
            stack.pop_back();
        }
    }
}

void SchemaParser::endIntSubset() {
    xercesc::SAXParser::endIntSubset();
    measureEntities();
    std::uint64_t highest = 0;
    for (const auto& [name, entity] : entities) {
        const std::uint64_t perExpansion =
            (entity.produced + entity.expansions - 1) / entity.expansions;
        if (perExpansion > highest)
            highest = perExpansion;
    }
    costPerExpansion = highest + kSchemaEntityExpansionCost;
    settle(0);
}

void SchemaParser::startEntityReference(const xercesc::XMLEntityDecl& decl) {
    std::uint64_t produced = 0;
    if (entityDepth++ == 0 && decl.getName()) {
        const auto found = entities.find(decl.getName());
        if (found != entities.end()) {
            const Entity& entity = found->second;
            // Refused before the parser reads a character of it.
            const std::uint64_t cost =
                saturatingAdd(entity.produced, costOfExpansions(entity.expansions));
            if (saturatingAdd(spent, cost) > budget)
                throwOverBudget();
            produced = entity.produced;
        }
    }
    settle(produced);
    xercesc::SAXParser::startEntityReference(decl);
}

void SchemaParser::endEntityReference(const xercesc::XMLEntityDecl& decl) {
    if (entityDepth > 0)
        --entityDepth;
    xercesc::SAXParser::endEntityReference(decl);
}

void SchemaParser::startElement(const xercesc::XMLElementDecl& decl, unsigned int urlId,
                                const XMLCh* prefix,
                                const xercesc::RefVectorOf<xercesc::XMLAttr>& attrs,
                                XMLSize_t attrCount, bool isEmpty, bool isRoot) {
    if (!entities.empty()) {
        // What entities put into the attribute values is not told apart from the
        // rest; the values are charged whole. Inside an expansion in content they
        // were paid for with it.
        std::uint64_t produced = 0;
        if (entityDepth == 0) {
            for (XMLSize_t i = 0; i < attrCount; ++i) {
                const XMLCh* value = attrs.elementAt(i)->getValue();
                produced += value ? std::char_traits<XMLCh>::length(value) : 0;
            }
        }
        settle(produced);
    }
    xercesc::SAXParser::startElement(decl, urlId, prefix, attrs, attrCount, isEmpty, isRoot);
}

void SchemaParser::error(unsigned int code, const XMLCh* domain,
                         xercesc::XMLErrorReporter::ErrTypes type, const XMLCh* text,
                         const XMLCh* systemId, const XMLCh* publicId, XMLFileLoc line,
                         XMLFileLoc column) {
    // The scanner's count of expansions ran out: the window settle opened, so the
    // budget.
    if (code == xercesc::XMLErrs::EntityExpansionLimitExceeded)
        throwOverBudget();
    xercesc::SAXParser::error(code, domain, type, text, systemId, publicId, line, column);
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
