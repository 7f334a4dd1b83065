#include "SchemaCatalog.h"
#include "SchemaReader.h"
#include "zrglob.h"

namespace {

bool isSeparator(char c) { return c == '/' || c == '\\'; }

// A location that names its own root: a leading separator, or a drive letter and
// a colon.
bool isAbsoluteLocation(const char* location) {
    if (isSeparator(location[0]))
        return true;
    const bool letter =
        (location[0] >= 'A' && location[0] <= 'Z') || (location[0] >= 'a' && location[0] <= 'z');
    return letter && location[1] == ':';
}

} // namespace

bool SchemaReader::locateDocument(const ZrWString& location, ZrWString& path,
                                  ZrWString& refusal) const {
    if (catalog_) {
        if (std::optional<std::u16string> mapped = catalog_->mapLocation(location.view())) {
            if (ZrURI(mapped->c_str()).protocol() != ZRP_NONE) {
                refusal = u"the catalog maps it to '" + *mapped + u"', which is not a local file";
                return false;
            }
            path = std::u16string_view(*mapped);
            return true;
        }
    }

    const ZrURI uri(location.c_str());
    if (uri.protocol() == ZRP_FILE) {
        if (std::optional<std::u16string> local = catalog_uri::localPath(location.view())) {
            path = std::u16string_view(*local);
            return true;
        }
    }
    if (uri.protocol() != ZRP_NONE) {
        refusal = u"it is not a local file, and no catalog maps it to one";
        return false;
    }

    // A relative location is taken from the directory of the document that names
    // it, its own directory part kept.
    path = location;
    if (documentURI.protocol() == ZRP_NONE && !isAbsoluteLocation(uri.path())) {
        ZrString directory(documentURI.path());
        ZrString name;
        ZrString extension;
        ZrGlob::sepfile(directory, name, extension);
        if (!directory.empty()) {
            ZrGlob::appndnam(directory, uri.path());
            path.Assign(directory.c_str(), ZR_CSET_DEFAULT, -1);
        }
    }
    return true;
}
