// Fuzz target: a schema spread over three documents that may include, import or
// redefine each other, and a catalog.
//
// The input holds up to four parts separated by the line "--8<--": three documents,
// written as a.xsd, b.xsd and c.xsd in one folder (missing ones are empty), and an
// XML catalog, written as catalog.xml and named in the option SchemaCatalog when the
// part is there. a.xsd is read as the main document, so any of them can name any
// other, itself, or a file that does not exist. The read must end, with the same
// promises as a single document: records and status 0, or no records, status 19 and
// a logged error.
#include "FuzzSupport.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace {

constexpr std::string_view kSeparator = "\n--8<--\n";

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    std::string_view rest(reinterpret_cast<const char*>(data), size);
    std::string_view docs[4];
    int count = 0;
    while (count < 3) {
        const size_t cut = rest.find(kSeparator);
        if (cut == std::string_view::npos)
            break;
        docs[count++] = rest.substr(0, cut);
        rest.remove_prefix(cut + kSeparator.size());
    }
    // Whatever follows the last separator is the next document; the rest stay empty.
    docs[count] = rest;

    auto& scratch = zrfuzz::ScratchDir::instance();
    scratch.clean();
    const std::string main = scratch.write("a.xsd", docs[0]);
    scratch.write("b.xsd", docs[1]);
    scratch.write("c.xsd", docs[2]);
    const std::string catalog = count == 3 ? scratch.write("catalog.xml", docs[3]) : "";

    zrfuzz::readAndCheck(main, size % 2 == 1, catalog);
    return 0;
}
