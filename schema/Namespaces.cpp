#include "SchemaReader.h"
#include "zrglob.h"

#include <iterator>
#include <string_view>

const std::u16string& SchemaReader::xmlNamespace() {
    static const std::u16string uri(kXmlNamespace);
    return uri;
}

// Only the first element of each document declares namespaces; its declarations
// apply to its own name too, so they are read before that name is resolved.
void SchemaReader::FirstElementAttrs(xercesc::AttributeList& attrs) {
    recentPrefixesStale = true;
    NamespaceBindings& declared = *bindings;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        if (nameBuffer.startsWith(u"xmlns")) {
            // "xmlnsFoo" declares the default namespace as well: only a colon after
            // the five letters introduces a prefix.
            if (nameBuffer.length() > 5 && nameBuffer.view()[5] == u':')
                declared.prefixes[std::u16string(nameBuffer.view().substr(6))] = valueBuffer.view();
            else
                declared.defaultNamespace = valueBuffer.view();
        } else if (nameBuffer.view() == u"targetNamespace") {
            declared.targetNamespace = valueBuffer.view();
        } else if (nameBuffer.view() == u"elementFormDefault" ||
                   nameBuffer.view() == u"attributeFormDefault" ||
                   nameBuffer.view() == u"version") {
            // Accepted; they change neither names nor records.
        } else {
            ZrGlob::LogMessage(ZR_SEV_NOTICE, 0, "Unknown first element attribute '%S'",
                               nameBuffer.c_str());
        }
    }
}

void SchemaReader::parseName(const XMLCh* name, bool useDefault, ZrName& localPart, ZrName& ns) {
    const XmlQualifiedName text(name);
    const std::u16string* uri =
        useDefault ? &bindings->defaultNamespace : &bindings->targetNamespace;
    if (text.prefixed())
        uri = namespaceOfPrefix(text.prefix);
    if (uri && *uri == kXmlNamespace)
        usesXmlNamespace = true;
    // Both results are taken before either output changes, since the name may be
    // the text of one of them. An unknown prefix leaves no namespace: the empty text.
    ZrName foundNs = uri ? namespaceName(*uri) : ZrName();
    ZrName foundLocal = model.names.intern(text.local);
    ns = std::move(foundNs);
    localPart = std::move(foundLocal);
}

// A schema names its few namespaces over and over: the last ones met are compared
// before the pool is asked.
ZrName SchemaReader::namespaceName(std::u16string_view uri) {
    for (const ZrName& recent : recentNamespaces) {
        if (zrSameText(recent.view(), uri))
            return recent;
    }
    ZrName name = model.names.intern(uri);
    recentNamespaces[nextRecentNamespace] = name;
    nextRecentNamespace = (nextRecentNamespace + 1) % std::size(recentNamespaces);
    return name;
}

// Runs for nearly every tag and qualified attribute value, which mostly use one or
// two prefixes: the last answers are kept, and forgotten when the table changes
// (FirstElementAttrs, or a change in its size).
const std::u16string* SchemaReader::namespaceOfPrefix(std::u16string_view prefix) {
    const NamespaceBindings& declared = *bindings;
    if (prefix == kTargetPrefix)
        return &declared.targetNamespace;
    if (recentPrefixesStale || recentPrefixesTableSize != declared.prefixes.size()) {
        for (RecentPrefix& recent : recentPrefixes)
            recent.used = false;
        recentPrefixesTableSize = declared.prefixes.size();
        recentPrefixesStale = false;
    }
    for (const RecentPrefix& recent : recentPrefixes) {
        if (recent.used && zrSameText(recent.prefix, prefix))
            return recent.uri;
    }
    const auto it = declared.prefixes.find(prefix);
    // "xml" is bound in every document without being declared.
    const std::u16string* uri = it != declared.prefixes.end() ? &it->second
                                : prefix == u"xml"            ? &xmlNamespace()
                                                              : nullptr;
    RecentPrefix& slot = recentPrefixes[nextRecentPrefix];
    nextRecentPrefix = (nextRecentPrefix + 1) % std::size(recentPrefixes);
    slot.prefix = prefix;
    slot.uri = uri;
    slot.used = true;
    return uri;
}
