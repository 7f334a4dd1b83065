// Finding and loading the plug-in library at run time, the way the engine does:
// by path, with its two factory functions resolved by name.
#pragma once

#include "zrapi.h"

#include <memory>
#include <string>

// The library to load when none is named: libzrbxmls.so next to this executable,
// else in the library folder of the installation it belongs to, else the one in
// the build tree this program was built in.
std::string defaultPluginPath();

class PluginLibrary {
  public:
    // Loads `path` and resolves NewBrowser and DeleteBrowser. On failure returns
    // false and sets `error` to a sentence naming the library and the cause.
    bool load(const std::string& path, std::string& error);

    ZrNewBrowserFn newBrowser() const { return newBrowser_; }

    ZrDeleteBrowserFn deleteBrowser() const { return deleteBrowser_; }

  private:
    // Deliberately never closed: the plug-in initialises the XML parser library and
    // never terminates it, so unloading it would strand the parser's global state.
    void* handle_ = nullptr;
    ZrNewBrowserFn newBrowser_ = nullptr;
    ZrDeleteBrowserFn deleteBrowser_ = nullptr;
};

// Owns a dictionary made by the plug-in and hands it back to DeleteBrowser.
class DictionaryHandle {
  public:
    DictionaryHandle(ZrDictBrowser* dict, ZrDeleteBrowserFn deleter)
        : dict_(dict), deleter_(deleter) {}

    ~DictionaryHandle() {
        if (dict_)
            deleter_(dict_);
    }

    DictionaryHandle(const DictionaryHandle&) = delete;
    DictionaryHandle& operator=(const DictionaryHandle&) = delete;

    ZrDictBrowser* get() const { return dict_; }

    ZrDictBrowser* operator->() const { return dict_; }

    explicit operator bool() const { return dict_ != nullptr; }

  private:
    ZrDictBrowser* dict_;
    ZrDeleteBrowserFn deleter_;
};
