#include "SchemaReader.h"
#include "zrglob.h"
#include "zrstring.h"

#include <memory>
#include <string>
#include <string_view>
#include <utility>
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

void SchemaReader::startElement(const XMLCh* name, xercesc::AttributeList& attrs) {
    using Action = void (SchemaReader::*)(xercesc::AttributeList&);

    struct StartAction {
        std::u16string_view name;
        Action act;
    };

    // First match acts; names not listed (wildcards) do nothing and their content
    // is dispatched as usual.
    static constexpr StartAction kStartTable[] = {
        {u"schema", nullptr}, // its attributes and namespace are taken above
        {u"annotation", &SchemaReader::doAnnotation},
        {u"notation", &SchemaReader::skipSubtree},
        {u"documentation", &SchemaReader::skipSubtree},
        {u"element", &SchemaReader::doElementTag},
        {u"attribute", &SchemaReader::doAttributeTag},
        {u"complexType", &SchemaReader::doComplexType},
        {u"group", &SchemaReader::doGroup},
        {u"attributeGroup", &SchemaReader::doGroup},
        {u"simpleType", &SchemaReader::doSimpleType},
        {u"restriction", &SchemaReader::doRestriction},
        {u"list", &SchemaReader::doList},
        {u"union", &SchemaReader::doUnion},
        {u"include", &SchemaReader::doInclude},
        {u"import", &SchemaReader::doImport},
        {u"redefine", &SchemaReader::doRedefine},
        {u"extension", &SchemaReader::doExtension},
        {u"simpleContent", &SchemaReader::doSimpleContent},
        {u"complexContent", &SchemaReader::doComplexContent},
        {u"minInclusive", &SchemaReader::doFacetTag},
        {u"maxInclusive", &SchemaReader::doFacetTag},
        {u"minExclusive", &SchemaReader::doFacetTag},
        {u"maxExclusive", &SchemaReader::doFacetTag},
        {u"length", &SchemaReader::doFacetTag},
        {u"minLength", &SchemaReader::doFacetTag},
        {u"maxLength", &SchemaReader::doFacetTag},
        {u"pattern", &SchemaReader::doFacetTag},
        {u"precision", &SchemaReader::doFacetTag},
        {u"scale", &SchemaReader::doFacetTag},
        {u"encoding", &SchemaReader::doFacetTag},
        {u"period", &SchemaReader::doFacetTag},
        {u"duration", &SchemaReader::doFacetTag},
        {u"enumeration", &SchemaReader::doFacetTag},
        {u"totalDigits", &SchemaReader::doDigitsFacetTag},
        {u"fractionDigits", &SchemaReader::doDigitsFacetTag},
        {u"sequence", &SchemaReader::doCompositor},
        {u"choice", &SchemaReader::doCompositor},
        {u"all", &SchemaReader::doCompositor},
    };
    static const TagIndex kStartIndex(kStartTable);

    if (skipDepth != 0) {
        // Only a documentation directly inside the annotation sought is read.
        if (docOwner != DocOwner::None && skipDepth == 1 && docDepth == 0 &&
            XmlQualifiedName(name).local == u"documentation")
            docDepth = 2;
        ++skipDepth;
        return;
    }
    ++elementDepth;
    const bool first = firstElement;
    if (firstElement) {
        FirstElementAttrs(attrs);
        firstElement = false;
    } else {
        declareInScope(attrs);
    }
    // The tag's name resolved as parseName would, but its namespace is only compared,
    // not kept: copying it for every tag costs more than the comparison.
    const XmlQualifiedName tag(name);
    const std::u16string_view local = tag.local;
    const std::u16string* uri =
        tag.prefixed() ? namespaceOfPrefix(tag.prefix) : &bindings->defaultNamespace;
    // The local part ends where the tag's name does, so it stays null-terminated.
    tagLocal = local;
    const std::u16string_view ns = uri ? std::u16string_view(*uri) : std::u16string_view();
    if (first && currentDocument.imported && local != u"schema") {
        ZrWString text;
        wsfmt(text, lgettext(u"Schema: Error: File %s is not a schema document"),
              documentPath_.c_str());
        reportError(ZR_SEV_ERROR, 4, text);
        failed = true;
        skipDepth = 1;
        return;
    }
    if (local == u"schema")
        schemaNamespace = ns;
    if (!zrSameText(ns, schemaNamespace)) {
        tagNamespace = ns;
        ZrGlob::LogMessage(ZR_SEV_NOTICE, 0,
                           "Element '%S' not in XMLSchema namespace (is '%S', should be '%S'",
                           ZrWString(local).c_str(), tagNamespace.c_str(), schemaNamespace.c_str());
    }

    if (!compositors.empty())
        noteBranch();
    if (const StartAction* entry = kStartIndex.find(local); entry && entry->act)
        (this->*entry->act)(attrs);
}

void SchemaReader::endElement(const XMLCh* name) {
    struct EndAction {
        std::u16string_view name;
        void (SchemaReader::*act)();
    };

    static constexpr EndAction kEndTable[] = {
        {u"element", &SchemaReader::finishElement},
        {u"attribute", &SchemaReader::finishElement},
        {u"complexType", &SchemaReader::finishComplexType},
        {u"redefine", &SchemaReader::finishRedefine},
        {u"simpleType", &SchemaReader::finishSimpleType},
        {u"group", &SchemaReader::finishGroup},
        {u"attributeGroup", &SchemaReader::finishGroup},
        {u"sequence", &SchemaReader::finishCompositor},
        {u"choice", &SchemaReader::finishCompositor},
        {u"all", &SchemaReader::finishCompositor},
    };
    static const TagIndex kEndIndex(kEndTable);

    // The end tags of a skipped subtree, the skipping element's and a list's own
    // included, only unwind the count.
    if (skipDepth != 0) {
        if (docDepth != 0 && skipDepth == docDepth)
            finishDocumentation();
        if (--skipDepth == 0) {
            docOwner = DocOwner::None;
            endScope();
        }
        return;
    }
    // Only the local part chooses the action; the end tag's namespace plays no part.
    if (const EndAction* entry = kEndIndex.find(XmlQualifiedName(name).local))
        (this->*entry->act)();
    endScope();
}

// Namespaces declared below the first element hold for that element and what it
// contains.
void SchemaReader::declareInScope(xercesc::AttributeList& attrs) {
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (!XmlName(attrs.getName(i)).startsWith(u"xmlns"))
            continue;
        const std::u16string_view name = xmlText(attrs.getName(i));
        ScopedDeclaration saved;
        saved.depth = elementDepth;
        saved.isDefault = !(name.size() > 5 && name[5] == u':');
        if (!saved.isDefault)
            saved.prefix = name.substr(6);
        std::u16string value(xmlText(attrs.getValue(i)));
        if (saved.isDefault) {
            saved.bound = true;
            saved.previous = std::exchange(bindings->defaultNamespace, std::move(value));
        } else {
            const auto it = bindings->prefixes.find(saved.prefix);
            saved.bound = it != bindings->prefixes.end();
            if (saved.bound)
                saved.previous = std::exchange(it->second, std::move(value));
            else
                bindings->prefixes.emplace(saved.prefix, std::move(value));
        }
        scopedDeclarations.push_back(std::move(saved));
        recentPrefixesStale = true;
    }
}

void SchemaReader::endScope() {
    while (!scopedDeclarations.empty() && scopedDeclarations.back().depth == elementDepth) {
        ScopedDeclaration& saved = scopedDeclarations.back();
        if (saved.isDefault)
            bindings->defaultNamespace = std::move(saved.previous);
        else if (saved.bound)
            bindings->prefixes[saved.prefix] = std::move(saved.previous);
        else
            bindings->prefixes.erase(saved.prefix);
        scopedDeclarations.pop_back();
        recentPrefixesStale = true;
    }
    --elementDepth;
}

void SchemaReader::skipSubtree(xercesc::AttributeList&) { skipDepth = 1; }

// An annotation is skipped whole; while descriptions are read, the first
// documentation directly inside it is gathered on the way when it belongs to the
// declaration or type just opened, and that has none yet.
void SchemaReader::doAnnotation(xercesc::AttributeList&) {
    skipDepth = 1;
    if (!detail_.documentation || lastOpened == DocOwner::None || openedDepth != elementDepth - 1)
        return;
    const bool described = lastOpened == DocOwner::Element ? bool(currentElement.documentation)
                           : lastOpened == DocOwner::ComplexType
                               ? bool(currentComplexType.documentation)
                               : bool(currentSimpleType.documentation);
    if (!described)
        docOwner = lastOpened;
}

namespace {

// Appends `chars` to `text` with white space runs made single blanks, none leading;
// `blank` carries a run over from one piece of the text to the next. One pass,
// written straight into the text's own space, a word at a time.
template <class Char>
void appendCollapsed(std::basic_string<Char>& text, const XMLCh* chars, const XMLCh* end,
                     bool& blank) {
    const size_t kept = text.size();
    const size_t n = size_t(end - chars);
    text.resize(kept + n + 1);
    Char* const begin = text.data();
    Char* out = begin + kept;
    // Most pieces hold words between single blanks and nothing else below a blank:
    // such a piece is copied whole, by loops the compiler turns into vector code.
    if (n != 0 && chars[0] != u' ' && chars[n - 1] != u' ') {
        unsigned char irregular = chars[0] < u' ';
        for (size_t i = 1; i < n; ++i)
            irregular |= (chars[i] < u' ') | ((chars[i] == u' ') & (chars[i - 1] == u' '));
        if (!irregular) {
            if (blank && out != begin)
                *out++ = Char(' ');
            blank = false;
            for (size_t i = 0; i < n; ++i)
                out[i] = static_cast<Char>(chars[i]);
            text.resize(size_t(out + n - begin));
            return;
        }
    }
    while (chars != end) {
        if (isXmlSpace(*chars)) {
            blank = true;
            ++chars;
            continue;
        }
        if (blank && out != begin)
            *out++ = Char(' ');
        blank = false;
        do
            *out++ = static_cast<Char>(*chars++);
        while (chars != end && !isXmlSpace(*chars));
    }
    text.resize(size_t(out - begin));
}

} // namespace

// The parser may hand one text over in several pieces, and a white space run may
// span two of them.
void SchemaReader::characters(const XMLCh* chars, XMLSize_t length) {
    if (docDepth == 0)
        return;
    const XMLCh* const end = chars + length;
    if (!docWide) {
        char16_t units = 0;
        for (const XMLCh* c = chars; c != end; ++c)
            units |= *c;
        if (units < 0x80) {
            appendCollapsed(docText, chars, end, docBlank);
            return;
        }
        docWideText.assign(docText.begin(), docText.end());
        docText.clear();
        docWide = true;
    }
    appendCollapsed(docWideText, chars, end, docBlank);
}

// A documentation without text leaves the next one to be read. The text is UTF-8
// from here on, as fields carry it, whatever number of fields it describes.
void SchemaReader::finishDocumentation() {
    docDepth = 0;
    docBlank = false;
    if (docWide)
        zrAppendUtf8(docText, docWideText);
    docWideText.clear();
    docWide = false;
    if (docText.empty())
        return;
    // A copy, so that the text takes only its own room and the gathering buffer
    // keeps its capacity for the next documentation.
    Description text = model.descriptions.add(docText);
    docText.clear();
    if (docOwner == DocOwner::Element)
        currentElement.documentation = std::move(text);
    else if (docOwner == DocOwner::ComplexType)
        currentComplexType.documentation = std::move(text);
    else
        currentSimpleType.documentation = std::move(text);
    docOwner = DocOwner::None;
}

bool SchemaReader::optionalHere() const {
    return !compositors.empty() && compositors.back().complexDepth == complexDepth &&
           compositors.back().optional;
}

// Every element directly inside a choice but its annotation is a branch.
void SchemaReader::noteBranch() {
    OpenCompositor& open = compositors.back();
    if (open.choice && open.depth == elementDepth - 1 && tagLocal != u"annotation")
        ++open.branches;
}

// Sequences, choices and alls matter only for the occurrence of what they hold.
void SchemaReader::doCompositor(xercesc::AttributeList& attrs) {
    if (!detail_.occurrence)
        return;
    OpenCompositor open;
    open.depth = elementDepth;
    open.complexDepth = complexDepth;
    open.optional = optionalHere();
    open.choice = tagLocal == u"choice";
    open.firstEntry = currentComplexType.content.size();
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) == u"minOccurs" && isZeroOccurs(attrs.getValue(i)))
            open.optional = true;
    }
    compositors.push_back(open);
}

// A choice of several branches leaves each of them optional.
void SchemaReader::finishCompositor() {
    if (compositors.empty() || compositors.back().depth != elementDepth)
        return;
    const OpenCompositor open = compositors.back();
    compositors.pop_back();
    if (!open.choice || open.branches < 2 || open.complexDepth != complexDepth)
        return;
    std::vector<ElementDef>& content = currentComplexType.content;
    for (size_t i = open.firstEntry; i < content.size(); ++i)
        content[i].optional = true;
}

void SchemaReader::doElementTag(xercesc::AttributeList& attrs) { doElement(attrs, false); }

void SchemaReader::doAttributeTag(xercesc::AttributeList& attrs) { doElement(attrs, true); }

// A facet of a simple-content restriction, outside any simple type of its own,
// narrows the complex type's text: its base and facets make the text field's type.
void SchemaReader::doFacetTag(xercesc::AttributeList& attrs) {
    const bool textFacet = typeTarget == &currentComplexType && currentComplexType.simpleContent;
    doFacet(attrs, textFacet ? currentComplexType : currentSimpleType, tagLocal.data());
}

void SchemaReader::doDigitsFacetTag(xercesc::AttributeList& attrs) {
    if (detail_.digits)
        doFacetTag(attrs);
}

void SchemaReader::doSimpleContent(xercesc::AttributeList&) {
    currentComplexType.simpleContent = true;
}

void SchemaReader::doComplexContent(xercesc::AttributeList&) {
    currentComplexType.simpleContent = false;
}

bool SchemaReader::tooDeep() {
    if (elementStack.size() + complexTypeStack.size() + simpleTypeStack.size() < kMaxOpenComponents)
        return false;
    if (!failed) {
        ZrWString text;
        wsfmt(text,
              lgettext(u"Schema: Error: Declarations and types nested deeper than %d in file %s"),
              static_cast<int>(kMaxOpenComponents), documentPath_.c_str());
        reportError(ZR_SEV_ERROR, 4, text);
    }
    failed = true;
    skipDepth = 1;
    return true;
}
