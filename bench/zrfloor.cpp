// zrfloor [--list] MAIN: the benchmarks' floor as a process of its own. Parses MAIN
// and every document it includes with the reader's own parser and settings, and does
// nothing else, so that a whole zrdict process reading the same set can be set
// against the least any process reading it must spend. --list prints the documents
// parsed, one a line. Exit status 1 when a document cannot be parsed.
#include "Floor.h"

#include <cstdio>
#include <cstring>
#include <exception>
#include <xercesc/util/PlatformUtils.hpp>
#include <xercesc/util/XMLException.hpp>

int main(int argc, char** argv) {
    bool list = false;
    const char* mainPath = nullptr;
    bool usable = true;
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--list") == 0)
            list = true;
        else if (!mainPath && argv[i][0] != '-')
            mainPath = argv[i];
        else
            usable = false;
    }
    if (!mainPath || !usable) {
        std::fprintf(stderr, "usage: zrfloor [--list] MAIN.xsd\n");
        return 2;
    }
    try {
        // Like the plug-in, the process leaves the parser library initialised at exit.
        xercesc::XMLPlatformUtils::Initialize();
        const std::vector<std::string> documents = zrfloor::runFloor(mainPath);
        if (list)
            for (const std::string& document : documents)
                std::printf("%s\n", document.c_str());
        return 0;
    } catch (const xercesc::XMLException& e) {
        std::fprintf(stderr, "zrfloor: %s\n", zrfloor::utf8(e.getMessage()).c_str());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "zrfloor: %s\n", e.what());
    }
    return 1;
}
