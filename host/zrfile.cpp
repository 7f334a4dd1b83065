#include "zrfile.h"

#include <fcntl.h>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

namespace {

bool isAlpha(char c) { return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z'); }

bool isDigit(char c) { return c >= '0' && c <= '9'; }

// Length of the URI scheme that starts `text` (without its colon), or 0. A single
// letter before the colon is a drive letter, not a scheme.
size_t schemeLength(std::string_view text) {
    if (text.empty() || !isAlpha(text[0]))
        return 0;
    size_t i = 1;
    while (i < text.size() && (isAlpha(text[i]) || isDigit(text[i]) || text[i] == '+' ||
                               text[i] == '-' || text[i] == '.'))
        ++i;
    if (i >= text.size() || text[i] != ':' || i < 2)
        return 0;
    return i;
}

bool equalsLower(std::string_view text, std::string_view lower) {
    if (text.size() != lower.size())
        return false;
    for (size_t i = 0; i < text.size(); ++i) {
        const char c = text[i] >= 'A' && text[i] <= 'Z' ? static_cast<char>(text[i] + 32) : text[i];
        if (c != lower[i])
            return false;
    }
    return true;
}

ZRPROTOCOL protocolOf(std::string_view scheme) {
    if (equalsLower(scheme, "file"))
        return ZRP_FILE;
    if (equalsLower(scheme, "http"))
        return ZRP_HTTP;
    if (equalsLower(scheme, "https"))
        return ZRP_HTTPS;
    if (equalsLower(scheme, "ftp"))
        return ZRP_FTP;
    return ZRP_OTHER;
}

} // namespace

ZrURI& ZrURI::operator=(const ZrWChar* text) {
    const std::string whole = text ? zrUtf16ToUtf8(text) : std::string();
    const size_t scheme = schemeLength(whole);
    if (scheme == 0) {
        protocol_ = ZRP_NONE;
        path_ = whole;
        return *this;
    }
    protocol_ = protocolOf(std::string_view(whole).substr(0, scheme));
    std::string_view rest = std::string_view(whole).substr(scheme + 1);
    const bool authority = rest.substr(0, 2) == "//";
    if (authority)
        rest.remove_prefix(2);
    if (authority && protocol_ != ZRP_FILE) {
        const size_t slash = rest.find('/');
        rest = slash == std::string_view::npos ? std::string_view() : rest.substr(slash);
    }
    path_.assign(rest);
    return *this;
}

ZrFileProxy::~ZrFileProxy() { close(false); }

// The file is opened without blocking and checked before it is handed to stdio:
// a FIFO would otherwise block the open, and a directory or a device would give
// errors or endless data later.
int ZrFileProxy::openfile(const char* name, const char* mode, ZR_CSET /*cset*/) {
    close(false);
    if (!name || !*name || !mode || mode[0] != 'r' || schemeLength(name) != 0)
        return -1;
    const bool update = std::string_view(mode).find('+') != std::string_view::npos;
    const int fd = ::open(name, (update ? O_RDWR : O_RDONLY) | O_NONBLOCK | O_CLOEXEC);
    if (fd < 0)
        return -1;
    struct stat info;
    if (::fstat(fd, &info) != 0 || !S_ISREG(info.st_mode)) {
        ::close(fd);
        return -1;
    }
    const int flags = ::fcntl(fd, F_GETFL);
    if (flags >= 0)
        ::fcntl(fd, F_SETFL, flags & ~O_NONBLOCK);
    file_ = ::fdopen(fd, mode);
    if (!file_) {
        ::close(fd);
        return -1;
    }
    name_ = name;
    return 0;
}

long ZrFileProxy::read(char* buffer, long size) {
    if (!file_ || !buffer || size < 0)
        return -1;
    const size_t got = std::fread(buffer, 1, static_cast<size_t>(size), file_);
    if (got == 0 && std::ferror(file_))
        return -1;
    return static_cast<long>(got);
}

void ZrFileProxy::close(bool remove) {
    if (!file_)
        return;
    std::fclose(file_);
    file_ = nullptr;
    if (remove)
        std::remove(name_.c_str());
    name_.clear();
}
