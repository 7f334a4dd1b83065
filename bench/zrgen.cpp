// zrgen: writes a benchmark schema set. `zrgen [--check] SIZE OUTDIR` generates a
// set of SIZE complex types into OUTDIR (created when missing) and prints what it
// holds; --check then parses every document as XML and loads the set as a schema
// with the XML parser's own schema processor, and fails on any error. With --check
// and no OUTDIR the set goes to a temporary folder that is removed afterwards.
#include "SchemaGenerator.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>
#include <system_error>
#include <xercesc/framework/XMLGrammarPool.hpp>
#include <xercesc/parsers/SAXParser.hpp>
#include <xercesc/sax/HandlerBase.hpp>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLString.hpp>
#include <xercesc/validators/common/Grammar.hpp>

namespace {

using namespace xercesc;

std::string narrow(const XMLCh* text) {
    char* s = XMLString::transcode(text);
    std::string out = s ? s : "";
    XMLString::release(&s);
    return out;
}

// Counts errors and complexType elements; prints the first few errors.
class CheckHandler : public HandlerBase {
  public:
    void startElement(const XMLCh* name, AttributeList&) override {
        const XMLCh* colon = XMLString::findAny(name, u":");
        const XMLCh* local = colon ? colon + 1 : name;
        if (XMLString::equals(local, u"complexType"))
            ++complexTypes;
    }

    void warning(const SAXParseException&) override {}

    void error(const SAXParseException& e) override { report("error", e); }

    void fatalError(const SAXParseException& e) override { report("fatal", e); }

    long complexTypes = 0;
    long errors = 0;

  private:
    void report(const char* kind, const SAXParseException& e) {
        if (++errors <= 10)
            std::fprintf(stderr, "%s: %s:%llu:%llu: %s\n", kind, narrow(e.getSystemId()).c_str(),
                         static_cast<unsigned long long>(e.getLineNumber()),
                         static_cast<unsigned long long>(e.getColumnNumber()),
                         narrow(e.getMessage()).c_str());
    }
};

// Every document must be well-formed, and together they must hold `expected`
// complexType elements.
bool checkWellFormed(const zrgen::GeneratedSet& set, long expected) {
    CheckHandler handler;
    SAXParser parser;
    parser.setDocumentHandler(&handler);
    parser.setErrorHandler(&handler);
    for (const auto& doc : set.documents)
        parser.parse(doc.c_str());
    if (handler.complexTypes != expected) {
        std::fprintf(stderr, "expected %ld complexType elements, found %ld\n", expected,
                     handler.complexTypes);
        return false;
    }
    return handler.errors == 0;
}

// The set must load as a valid schema: every type, group and element it refers to
// defined, facets fitting their bases, content models unambiguous.
bool checkSchema(const zrgen::GeneratedSet& set) {
    CheckHandler handler;
    SAXParser parser;
    parser.setDoNamespaces(true);
    parser.setDoSchema(true);
    parser.setValidationScheme(SAXParser::Val_Always);
    parser.setValidationSchemaFullChecking(true);
    parser.setErrorHandler(&handler);
    const Grammar* grammar = parser.loadGrammar(set.mainPath.c_str(), Grammar::SchemaGrammarType);
    return grammar && handler.errors == 0;
}

// A fresh folder under the system's temporary folder, removed with its content.
struct TempFolder {
    TempFolder() {
        std::string pattern = (std::filesystem::temp_directory_path() / "zrgen-XXXXXX").string();
        if (!mkdtemp(pattern.data()))
            throw std::runtime_error("cannot create a temporary folder");
        path = pattern;
    }

    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;

    ~TempFolder() {
        std::error_code ec;
        std::filesystem::remove_all(path, ec);
    }

    std::string path;
};

int usage() {
    std::fprintf(stderr, "usage: zrgen [--check] SIZE OUTDIR\n"
                         "       zrgen --check SIZE\n"
                         "  SIZE    number of complex types (for example 1000, 10000, 100000)\n"
                         "  OUTDIR  folder to write main.xsd and partNN.xsd into\n"
                         "  --check parse the set and load it as a schema; exit 1 on an error\n");
    return 2;
}

} // namespace

int main(int argc, char** argv) {
    bool check = false;
    int arg = 1;
    if (arg < argc && std::strcmp(argv[arg], "--check") == 0) {
        check = true;
        ++arg;
    }
    if (argc - arg != 2 && !(check && argc - arg == 1))
        return usage();
    char* end = nullptr;
    const long size = std::strtol(argv[arg], &end, 10);
    if (*end != '\0' || size < 1)
        return usage();

    try {
        std::string outDir;
        std::unique_ptr<TempFolder> temp;
        if (arg + 1 < argc) {
            std::filesystem::create_directories(argv[arg + 1]);
            outDir = std::filesystem::absolute(argv[arg + 1]).string();
        } else {
            temp = std::make_unique<TempFolder>();
            outDir = temp->path;
        }
        const zrgen::GeneratedSet set = zrgen::generateSchemaSet(size, outDir);
        const zrgen::SetStats& s = set.stats;
        std::printf("main                  %s\n", set.mainPath.c_str());
        std::printf("documents             %zu\n", set.documents.size());
        std::printf("bytes                 %llu\n", static_cast<unsigned long long>(set.bytes));
        std::printf("complex types         %ld (%ld named, %ld anonymous)\n", s.complexTypes,
                    s.namedComplexTypes, s.anonymousComplexTypes);
        std::printf("extension types       %ld (longest chain %ld)\n", s.extensionTypes,
                    s.longestExtensionChain);
        std::printf("simple-content types  %ld\n", s.simpleContentTypes);
        std::printf("simple types          %ld named, %ld inline\n", s.simpleTypes,
                    s.inlineSimpleTypes);
        std::printf("groups                %ld (+%ld attribute groups)\n", s.groups,
                    s.attributeGroups);
        std::printf("global elements       %ld\n", s.globalElements);
        std::printf("local elements        %ld\n", s.elements);
        std::printf("attributes            %ld\n", s.attributes);
        std::printf("references            %ld element, %ld group, %ld attribute group\n",
                    s.elementRefs, s.groupRefs, s.attributeGroupRefs);
        std::printf("annotations           %ld\n", s.annotations);
        if (!check)
            return 0;

        XMLPlatformUtils::Initialize();
        bool ok = checkWellFormed(set, size);
        std::printf("well-formed           %s\n", ok ? "yes" : "NO");
        if (ok) {
            ok = checkSchema(set);
            std::printf("valid schema          %s\n", ok ? "yes" : "NO");
        }
        return ok ? 0 : 1;
    } catch (const XMLException& e) {
        std::fprintf(stderr, "zrgen: %s\n", narrow(e.getMessage()).c_str());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "zrgen: %s\n", e.what());
    }
    return 1;
}
