// tinyhost SCHEMA [PLUGIN]: loads the plug-in as an engine does, reads SCHEMA and
// prints each record's name and field count. Exits 1 when anything fails.
#include "zrapi.h"
#include "zrglob.h"

#include <cstdio>
#include <dlfcn.h>

int main(int argc, char** argv) {
    if (argc < 2) {
        std::fprintf(stderr, "usage: tinyhost SCHEMA [PLUGIN]\n");
        return 1;
    }
#ifndef ZRBXMLS_PLUGIN
#define ZRBXMLS_PLUGIN nullptr
#endif
    const char* path = argc > 2 ? argv[2] : ZRBXMLS_PLUGIN;
    void* plugin = path ? dlopen(path, RTLD_NOW | RTLD_LOCAL) : nullptr;
    if (!plugin) {
        std::fprintf(stderr, "tinyhost: cannot load the plug-in: %s\n", path ? dlerror() : "");
        return 1;
    }
    auto newBrowser = reinterpret_cast<ZrNewBrowserFn>(dlsym(plugin, "NewBrowser"));
    auto deleteBrowser = reinterpret_cast<ZrDeleteBrowserFn>(dlsym(plugin, "DeleteBrowser"));
    if (!newBrowser || !deleteBrowser)
        return 1;

    ZrGlob::SetLogSink([](int severity, int code, const std::u16string& text) {
        std::fprintf(stderr, "%s %d: %s\n", ZrGlob::SeverityWord(severity).c_str(), code,
                     zrUtf16ToUtf8(text).c_str());
    });
    ZrDictBrowser* dict = newBrowser(nullptr);
    const BATCHERR status = dict->ReadDictionary(argv[1]);
    const ZrRecordList& records = dict->RecordList();
    for (int i = 0; i < records.Count(); ++i)
        std::printf("%s %d\n", zrUtf16ToUtf8(records[i]->name.view()).c_str(),
                    records[i]->FieldCount());
    deleteBrowser(dict);
    ZrGlob::SetLogSink({});
    return status == BE_OK ? 0 : 1;
}
