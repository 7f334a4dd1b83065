#include "SchemaCatalog.h"
#include "SchemaReader.h"
#include "zrglob.h"

#include <string>

namespace {

// The name a component redefined elsewhere keeps in its own document; no schema
// name can take it, since names hold no blanks.
ZrName originalName(ZrNamePool& names, const ZrName& name) {
    std::u16string original(name.view());
    original += u" (redefined)";
    return names.intern(original);
}

} // namespace

// Queues the imported document, read after the whole main schema with namespace
// declarations of its own. One that cannot be read is noted, not reported: it
// matters only if something is sought in its namespace.
void SchemaReader::doImport(xercesc::AttributeList& attrs) {
    QueuedDocument imported;
    imported.imported = true;
    bool located = false;
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        const XmlName attr(attrs.getName(i));
        if (attr == u"namespace") {
            imported.ns = xmlText(attrs.getValue(i));
        } else if (attr == u"schemaLocation") {
            ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
            located = true;
        }
    }
    // A location that no catalog entry maps is tried by the namespace.
    ZrWString refusal;
    if (located && locateDocument(valueBuffer, imported.path, refusal)) {
        queueDocument(std::move(imported));
        return;
    }
    if (catalog_) {
        if (std::optional<std::u16string> mapped = catalog_->mapNamespace(imported.ns)) {
            if (locateDocument(ZrWString(std::u16string_view(*mapped)), imported.path, refusal)) {
                queueDocument(std::move(imported));
                return;
            }
        }
    }
    if (!located) {
        if (imported.ns != kXmlNamespace)
            noteImportFailure(imported.ns, u"", u"the import gives no location");
        return;
    }
    noteImportFailure(imported.ns, valueBuffer.view(), refusal.view());
}

// Reads the redefined document like an included one; the definitions inside
// "redefine" replace those of the same name there, which are kept under other names
// for the redefinitions' references to them.
void SchemaReader::doRedefine(xercesc::AttributeList& attrs) {
    ++redefineDepth;
    redefinitions = std::make_shared<std::vector<RedefinedName>>();
    redefining = TypeRef();
    for (XMLSize_t i = 0; i < attrs.getLength(); ++i) {
        if (XmlName(attrs.getName(i)) != u"schemaLocation")
            continue;
        ZrXmlUtils::XMLChToWchar(attrs.getValue(i), valueBuffer, false);
        queueSchemaDocument(u"Schema: Error: Redefine of '%s' in file %s is not read: %s",
                            redefinitions);
    }
}

void SchemaReader::finishRedefine() {
    if (redefineDepth == 0 || --redefineDepth != 0)
        return;
    redefinitions.reset();
    redefining = TypeRef();
}

void SchemaReader::nameDefinition(ZrName& name, const ZrName& ns, bool isGroup) {
    if (name.empty())
        return;
    if (redefineDepth != 0 && redefinitions) {
        redefinitions->push_back({{name, ns}, isGroup});
        redefining = {name, ns};
        redefiningGroup = isGroup;
        return;
    }
    const auto& redefined = currentDocument.redefined;
    if (!redefined)
        return;
    for (const RedefinedName& entry : *redefined) {
        if (entry.isGroup == isGroup && entry.ref.name == name && entry.ref.ns == ns) {
            name = originalName(model.names, name);
            return;
        }
    }
}

void SchemaReader::referToOriginal(ZrName& name, const ZrName& ns, bool isGroup) const {
    if (redefineDepth == 0 || redefining.name.empty() || isGroup != redefiningGroup)
        return;
    if (name == redefining.name && ns == redefining.ns)
        name = originalName(model.names, name);
}
