#include "PluginLibrary.h"

#include <dlfcn.h>
#include <filesystem>
#include <system_error>

namespace {

constexpr const char* kPluginFileName = "libzrbxmls.so";

std::string lastDlError() {
    const char* text = dlerror();
    return text ? text : "unknown error";
}

} // namespace

std::string defaultPluginPath() {
    namespace fs = std::filesystem;
    std::error_code ec;
    fs::path exe = fs::read_symlink("/proc/self/exe", ec);
    if (!ec) {
        // Beside the program (the build tree's layout), then where an installation
        // puts libraries relative to its programs.
        for (const fs::path& dir :
             {exe.parent_path(),
              (exe.parent_path() / ZRDICT_INSTALL_PLUGIN_DIR).lexically_normal()}) {
            fs::path candidate = dir / kPluginFileName;
            if (fs::exists(candidate, ec))
                return candidate.string();
        }
    }
    return std::string(ZRDICT_BUILD_PLUGIN_DIR) + "/" + kPluginFileName;
}

bool PluginLibrary::load(const std::string& path, std::string& error) {
    dlerror();
    handle_ = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!handle_) {
        error = "cannot load plug-in '" + path + "': " + lastDlError();
        return false;
    }
    // POSIX requires this cast to work for function symbols.
    auto resolve = [&](const char* name, void*& symbol) {
        dlerror();
        symbol = dlsym(handle_, name);
        if (symbol)
            return true;
        error = "plug-in '" + path + "' has no entry point " + name + ": " + lastDlError();
        return false;
    };
    void* newSymbol = nullptr;
    void* deleteSymbol = nullptr;
    if (!resolve("NewBrowser", newSymbol) || !resolve("DeleteBrowser", deleteSymbol))
        return false;
    newBrowser_ = reinterpret_cast<ZrNewBrowserFn>(newSymbol);
    deleteBrowser_ = reinterpret_cast<ZrDeleteBrowserFn>(deleteSymbol);
    return true;
}
