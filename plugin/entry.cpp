// The library's exported factory and, on Windows, its entry point.
#include "ZrXmlSchemaDict.h"

#include <new>

#ifdef _WIN32
#include <windows.h>

// The plug-in keeps no per-thread state, so thread notifications are not wanted.
BOOL APIENTRY DllMain(HMODULE module, DWORD reason, LPVOID /*reserved*/) {
    if (reason == DLL_PROCESS_ATTACH)
        DisableThreadLibraryCalls(module);
    return TRUE;
}
#endif

extern "C" {

// Allocation failure gives null; so does any exception out of construction, which
// must not cross into the host.
ZRBXMLS_API ZrDictBrowser* NewBrowser(ZrSpoke* spoke) {
    try {
        return new (std::nothrow) ZrXmlSchemaDict(spoke);
    } catch (...) {
        return nullptr;
    }
}

ZRBXMLS_API void DeleteBrowser(ZrDictBrowser* browser) { delete browser; }
}
