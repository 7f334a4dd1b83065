#include "ZrXmlSchemaBrowser.h"
#include "zrglob.h"

#include <string_view>

namespace {

// Stands for the target namespace in names the reader writes back as text, even
// when the schema binds no prefix to it.
constexpr XMLCh kTargetPrefix[] = u"zrxxxtrg";

} // namespace

// Only the first element of each document declares namespaces; its declarations
// apply to its own name too, so they are read before that name is resolved.
void ZrXmlSchemaBrowser::FirstElementAttrs(xercesc::AttributeList& attrs) {
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

void ZrXmlSchemaBrowser::parseName(const XMLCh* name, bool useDefault, ZrWString& localPart,
                                   ZrWString& ns) {
    std::u16string_view text = name ? std::u16string_view(name) : std::u16string_view();
    // The outputs are overwritten below; a name that lives in one of them is
    // copied out first.
    ZrWString aliased;
    if (!text.empty() && (text.data() == localPart.c_str() || text.data() == ns.c_str())) {
        aliased = text;
        text = aliased.view();
    }

    const XMLCh* uri = useDefault ? defaultNamespace.c_str() : targetNamespace.c_str();
    const size_t colon = text.find(u':');
    if (colon != std::u16string_view::npos) {
        const std::u16string prefix(text.substr(0, colon));
        uri = LookupNamespace(prefix.c_str());
        text.remove_prefix(colon + 1);
    }
    // An unknown prefix leaves no namespace: the empty text.
    ns = uri ? uri : u"";
    localPart = text;
}

const XMLCh* ZrXmlSchemaBrowser::LookupNamespace(const XMLCh* prefix) {
    const std::u16string_view key = prefix ? std::u16string_view(prefix) : std::u16string_view();
    if (key == std::u16string_view(kTargetPrefix))
        return targetNamespace.c_str();
    const auto it = namespacePrefixes.find(ZrWString(key));
    return it == namespacePrefixes.end() ? nullptr : it->second.c_str();
}

const XMLCh* ZrXmlSchemaBrowser::ReverseNamespace(const XMLCh* uri, bool useTargetPrefix) {
    const std::u16string_view text = uri ? std::u16string_view(uri) : std::u16string_view();
    if (useTargetPrefix && targetNamespace == text)
        return kTargetPrefix;
    if (defaultNamespace == text || targetNamespace == text)
        return u"";
    for (const auto& [prefix, bound] : namespacePrefixes) {
        if (bound == text)
            return prefix.c_str();
    }
    return u"";
}
