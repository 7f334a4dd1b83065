#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

#include <iterator>
#include <string_view>

namespace {

// Stands for the target namespace in names the reader writes back as text, even
// when the schema binds no prefix to it.
constexpr XMLCh kTargetPrefix[] = u"zrxxxtrg";
constexpr std::u16string_view kTargetPrefixText = kTargetPrefix;

} // namespace

// Only the first element of each document declares namespaces; its declarations
// apply to its own name too, so they are read before that name is resolved.
void ZrXmlSchemaBrowser::FirstElementAttrs(xercesc::AttributeList& attrs) {
    prefixOfUriStale = true;
    recentPrefixesStale = true;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        ZrXmlUtils::XMLChToWchar(attrs.getName(i), nameBuffer, false);
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        if (nameBuffer.startsWith(u"xmlns")) {
            // "xmlnsFoo" declares the default namespace as well: only a colon after
            // the five letters introduces a prefix.
            if (nameBuffer.length() > 5 && nameBuffer.view()[5] == u':')
                namespacePrefixes[ZrWString(nameBuffer.view().substr(6))] = valueBuffer;
            else
                defaultNamespace = valueBuffer;
        } else if (nameBuffer.view() == u"targetNamespace") {
            targetNamespace = valueBuffer;
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

void ZrXmlSchemaBrowser::parseName(const XMLCh* name, bool useDefault, ZrName& localPart,
                                   ZrName& ns) {
    const XmlQualifiedName text(name);
    const ZrWString* uri = useDefault ? &defaultNamespace : &targetNamespace;
    if (text.prefixed())
        uri = namespaceOfPrefix(text.prefix);
    // Both results are taken before either output changes, since the name may be
    // the text of one of them. An unknown prefix leaves no namespace: the empty text.
    ZrName foundNs = uri ? namespaceName(uri->view()) : ZrName();
    ZrName foundLocal = names.intern(text.local);
    ns = std::move(foundNs);
    localPart = std::move(foundLocal);
}

// A schema names its few namespaces over and over: the last ones met are compared
// before the pool is asked.
ZrName ZrXmlSchemaBrowser::namespaceName(std::u16string_view uri) {
    for (const ZrName& recent : recentNamespaces) {
        if (zrSameText(recent.view(), uri))
            return recent;
    }
    ZrName name = names.intern(uri);
    recentNamespaces[nextRecentNamespace] = name;
    nextRecentNamespace = (nextRecentNamespace + 1) % std::size(recentNamespaces);
    return name;
}

const XMLCh* ZrXmlSchemaBrowser::LookupNamespace(const XMLCh* prefix) {
    const ZrWString* uri =
        namespaceOfPrefix(prefix ? std::u16string_view(prefix) : std::u16string_view());
    return uri ? uri->c_str() : nullptr;
}

// Runs for nearly every tag and qualified attribute value, which mostly use one or
// two prefixes: the last answers are kept, and forgotten when the table changes
// (FirstElementAttrs, or a change in its size).
const ZrWString* ZrXmlSchemaBrowser::namespaceOfPrefix(std::u16string_view prefix) {
    if (prefix == kTargetPrefixText)
        return &targetNamespace;
    if (recentPrefixesStale || recentPrefixesTableSize != namespacePrefixes.size()) {
        for (RecentPrefix& recent : recentPrefixes)
            recent.used = false;
        recentPrefixesTableSize = namespacePrefixes.size();
        recentPrefixesStale = false;
    }
    for (const RecentPrefix& recent : recentPrefixes) {
        if (recent.used && zrSameText(recent.prefix.view(), prefix))
            return recent.uri;
    }
    const auto it = namespacePrefixes.find(prefix);
    const ZrWString* uri = it == namespacePrefixes.end() ? nullptr : &it->second;
    RecentPrefix& slot = recentPrefixes[nextRecentPrefix];
    nextRecentPrefix = (nextRecentPrefix + 1) % std::size(recentPrefixes);
    slot.prefix = prefix;
    slot.uri = uri;
    slot.used = true;
    return uri;
}

const XMLCh* ZrXmlSchemaBrowser::ReverseNamespace(const XMLCh* uri, bool useTargetPrefix) {
    const std::u16string_view text = uri ? std::u16string_view(uri) : std::u16string_view();
    if (useTargetPrefix && zrSameText(targetNamespace.view(), text))
        return kTargetPrefix;
    if (zrSameText(defaultNamespace.view(), text) || zrSameText(targetNamespace.view(), text))
        return u"";
    // The table changes only here (FirstElementAttrs) and when a read empties it;
    // the size check also covers a table filled by other means.
    if (prefixOfUriStale || prefixOfUriSize != namespacePrefixes.size()) {
        prefixOfUri.clear();
        for (const auto& [prefix, bound] : namespacePrefixes)
            prefixOfUri.emplace(bound, prefix); // keeps the first in table order
        prefixOfUriSize = namespacePrefixes.size();
        prefixOfUriStale = false;
    }
    prefixKey = text;
    const auto it = prefixOfUri.find(prefixKey);
    return it == prefixOfUri.end() ? u"" : it->second.c_str();
}
