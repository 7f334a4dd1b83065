// Host file access: URIs and the file proxy through which documents are read.
#pragma once

#include "zrstring.h"
#include "zrtypes.h"

#include <cstdio>
#include <string>

class ZRHOST_API ZrURI {
  public:
    ZrURI() = default;

    explicit ZrURI(const ZrWChar* text) { *this = text; }

    ZrURI(const ZrURI&) = default;
    ZrURI& operator=(const ZrURI&) = default;
    virtual ~ZrURI() = default;

    // A null text gives the empty URI.
    ZrURI& operator=(const ZrWChar* text);

    // The local path (UTF-8): the text itself for a plain path; the part after
    // "file://" (or "file:") for a file URI; the part after the authority for other
    // schemes.
    const char* path() const { return path_.c_str(); }

    // ZRP_NONE for a plain path, a Windows drive path ("C:\x", "C:/x") or a UNC path;
    // otherwise the scheme's protocol ("file:", "http:", "https:", "ftp:", any other
    // scheme of two or more letters).
    ZRPROTOCOL protocol() const { return protocol_; }

  private:
    std::string path_;
    ZRPROTOCOL protocol_ = ZRP_NONE;
};

// Reads local files only.
class ZRHOST_API ZrFileProxy {
  public:
    ZrFileProxy() = default;
    ZrFileProxy(const ZrFileProxy&) = delete;
    ZrFileProxy& operator=(const ZrFileProxy&) = delete;
    virtual ~ZrFileProxy();

    // Opens `name` (text in `cset`) with a C mode string. Returns 0, or -1 when the
    // file cannot be opened, is not a regular file, or the name has a URI scheme.
    int openfile(const char* name, const char* mode, ZR_CSET cset);

    bool isOpen() const { return file_ != nullptr; }

    void setDesignMode(bool on) { designMode_ = on; }

    bool designMode() const { return designMode_; }

    // Reads up to `size` bytes. Returns the count, 0 at the end, -1 on an error or
    // when the proxy is not open.
    long read(char* buffer, long size);
    // `remove` true deletes the file after closing it.
    void close(bool remove);

  private:
    std::FILE* file_ = nullptr;
    std::string name_;
    bool designMode_ = false;
};
