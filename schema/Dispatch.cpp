#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

#include <string_view>
#include <vector>

namespace {

// Open declarations, complex types and group definitions the reader keeps state
// for at once. Real schemas nest a few dozen deep; the bound keeps a hostile
// document from growing the saved state without limit.
constexpr size_t kMaxOpenComponents = 10000;

// A dispatch table's entries grouped by the length of their names, so that a tag
// is compared only with the few names of its own length, in table order.
template <class Entry, size_t N> class TagIndex {
  public:
    explicit TagIndex(const Entry (&table)[N]) {
        for (size_t i = 0; i < N; ++i) {
            const size_t length = table[i].name.size();
            if (length >= byLength_.size())
                byLength_.resize(length + 1);
            byLength_[length].push_back(&table[i]);
        }
    }

    // The first entry named `name`, or null.
    const Entry* find(std::u16string_view name) const {
        if (name.size() >= byLength_.size())
            return nullptr;
        for (const Entry* entry : byLength_[name.size()]) {
            if (zrSameText(entry->name, name))
                return entry;
        }
        return nullptr;
    }

  private:
    std::vector<std::vector<const Entry*>> byLength_;
};

} // namespace

void ZrXmlSchemaBrowser::startElement(const XMLCh* name, xercesc::AttributeList& attrs) {
    using Action = void (ZrXmlSchemaBrowser::*)(xercesc::AttributeList&);

    struct StartAction {
        std::u16string_view name;
        Action act;
    };

    // First match acts; names not listed (compositors, wildcards, unions, imports)
    // do nothing and their content is dispatched as usual.
    static constexpr StartAction kStartTable[] = {
        {u"schema", nullptr}, // its attributes and namespace are taken above
        {u"annotation", &ZrXmlSchemaBrowser::skipSubtree},
        {u"notation", &ZrXmlSchemaBrowser::skipSubtree},
        {u"documentation", &ZrXmlSchemaBrowser::skipSubtree},
        {u"element", &ZrXmlSchemaBrowser::doElementTag},
        {u"attribute", &ZrXmlSchemaBrowser::doAttributeTag},
        {u"complexType", &ZrXmlSchemaBrowser::doComplexType},
        {u"group", &ZrXmlSchemaBrowser::doGroup},
        {u"attributeGroup", &ZrXmlSchemaBrowser::doGroup},
        {u"simpleType", &ZrXmlSchemaBrowser::doSimpleType},
        {u"restriction", &ZrXmlSchemaBrowser::doRestriction},
        {u"list", &ZrXmlSchemaBrowser::doList},
        {u"include", &ZrXmlSchemaBrowser::doInclude},
        {u"extension", &ZrXmlSchemaBrowser::doExtension},
        {u"simpleContent", &ZrXmlSchemaBrowser::doSimpleContent},
        {u"complexContent", &ZrXmlSchemaBrowser::doComplexContent},
        {u"minInclusive", &ZrXmlSchemaBrowser::doFacetTag},
        {u"maxInclusive", &ZrXmlSchemaBrowser::doFacetTag},
        {u"minExclusive", &ZrXmlSchemaBrowser::doFacetTag},
        {u"maxExclusive", &ZrXmlSchemaBrowser::doFacetTag},
        {u"length", &ZrXmlSchemaBrowser::doFacetTag},
        {u"minLength", &ZrXmlSchemaBrowser::doFacetTag},
        {u"maxLength", &ZrXmlSchemaBrowser::doFacetTag},
        {u"pattern", &ZrXmlSchemaBrowser::doFacetTag},
        {u"precision", &ZrXmlSchemaBrowser::doFacetTag},
        {u"scale", &ZrXmlSchemaBrowser::doFacetTag},
        {u"encoding", &ZrXmlSchemaBrowser::doFacetTag},
        {u"period", &ZrXmlSchemaBrowser::doFacetTag},
        {u"duration", &ZrXmlSchemaBrowser::doFacetTag},
        {u"enumeration", &ZrXmlSchemaBrowser::doFacetTag},
    };
    static const TagIndex kStartIndex(kStartTable);

    if (skipDepth != 0) {
        ++skipDepth;
        return;
    }
    if (firstElement) {
        FirstElementAttrs(attrs);
        firstElement = false;
    }
    // The tag's name resolved as parseName would, but its namespace is only compared,
    // not kept: copying it for every tag costs more than the comparison.
    const XmlQualifiedName tag(name);
    const std::u16string_view local = tag.local;
    const ZrWString* uri = tag.prefixed() ? namespaceOfPrefix(tag.prefix) : &defaultNamespace;
    // The local part ends where the tag's name does, so it stays null-terminated.
    tagLocal = local;
    const std::u16string_view ns = uri ? uri->view() : std::u16string_view();
    if (local == u"schema")
        schemaNamespace = ns;
    if (!zrSameText(ns, schemaNamespace.view())) {
        tagNamespace = ns;
        ZrGlob::LogMessage(ZR_SEV_NOTICE, 0,
                           "Element '%S' not in XMLSchema namespace (is '%S', should be '%S'",
                           ZrWString(local).c_str(), tagNamespace.c_str(), schemaNamespace.c_str());
    }

    if (const StartAction* entry = kStartIndex.find(local); entry && entry->act)
        (this->*entry->act)(attrs);
}

void ZrXmlSchemaBrowser::endElement(const XMLCh* name) {
    struct EndAction {
        std::u16string_view name;
        void (ZrXmlSchemaBrowser::*act)();
    };

    static constexpr EndAction kEndTable[] = {
        {u"element", &ZrXmlSchemaBrowser::finishElement},
        {u"attribute", &ZrXmlSchemaBrowser::finishElement},
        {u"complexType", &ZrXmlSchemaBrowser::finishComplexType},
        {u"simpleType", &ZrXmlSchemaBrowser::finishSimpleType},
        {u"restriction", &ZrXmlSchemaBrowser::finishRestriction},
        {u"include", &ZrXmlSchemaBrowser::finishInclude},
        {u"group", &ZrXmlSchemaBrowser::finishGroup},
        {u"attributeGroup", &ZrXmlSchemaBrowser::finishGroup},
    };
    static const TagIndex kEndIndex(kEndTable);

    // The end tags of a skipped subtree, the skipping element's and a list's own
    // included, only unwind the count.
    if (skipDepth != 0) {
        --skipDepth;
        return;
    }
    // Only the local part chooses the action; the end tag's namespace plays no part.
    if (const EndAction* entry = kEndIndex.find(XmlQualifiedName(name).local))
        (this->*entry->act)();
}

void ZrXmlSchemaBrowser::skipSubtree(xercesc::AttributeList&) { skipDepth = 1; }

void ZrXmlSchemaBrowser::doElementTag(xercesc::AttributeList& attrs) { doElement(attrs, false); }

void ZrXmlSchemaBrowser::doAttributeTag(xercesc::AttributeList& attrs) { doElement(attrs, true); }

void ZrXmlSchemaBrowser::doFacetTag(xercesc::AttributeList& attrs) {
    doFacet(attrs, currentSimpleType, tagLocal.data());
}

void ZrXmlSchemaBrowser::doSimpleContent(xercesc::AttributeList&) {
    currentComplexType.simpleContent = true;
}

void ZrXmlSchemaBrowser::doComplexContent(xercesc::AttributeList&) {
    currentComplexType.simpleContent = false;
}

bool ZrXmlSchemaBrowser::tooDeep() {
    if (elementStack.size() + complexTypeStack.size() < kMaxOpenComponents)
        return false;
    if (!failed)
        ZrGlob::LogMessage(
            ZR_SEV_ERROR, 4,
            lgettext(u"Schema: Error: Declarations and types nested deeper than %d in file %s"),
            static_cast<int>(kMaxOpenComponents), documentPath.c_str());
    failed = true;
    skipDepth = 1;
    return true;
}
