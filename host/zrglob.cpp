#include "zrglob.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <mutex>
#include <string_view>

namespace {

constexpr char16_t kReplacement = 0xFFFD;
// Widths and precisions beyond this are cut to it: a format should not be able to
// ask for gigabytes of padding.
constexpr long kMaxWidth = 100000;

std::mutex& sinkMutex() {
    static std::mutex mutex;
    return mutex;
}

ZrLogSink& sinkSlot() {
    static ZrLogSink sink;
    return sink;
}

void appendCodePoint(std::u16string& out, long cp) {
    if (cp < 0 || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) {
        out += kReplacement;
    } else if (cp < 0x10000) {
        out += static_cast<char16_t>(cp);
    } else {
        cp -= 0x10000;
        out += static_cast<char16_t>(0xD800 + (cp >> 10));
        out += static_cast<char16_t>(0xDC00 + (cp & 0x3FF));
    }
}

void appendAscii(std::u16string& out, std::string_view text) {
    for (char c : text)
        out += static_cast<char16_t>(static_cast<unsigned char>(c));
}

// Pads `piece` to `width` code units on the left (or right, when `left`).
void appendPadded(std::u16string& out, const std::u16string& piece, long width, bool left,
                  char16_t pad) {
    const long fill = width - static_cast<long>(piece.size());
    if (fill > 0 && !left) {
        // Zero padding goes after a sign.
        if (pad == u'0' && !piece.empty() && (piece[0] == u'-' || piece[0] == u'+')) {
            out += piece[0];
            out.append(static_cast<size_t>(fill), pad);
            out.append(piece, 1, std::u16string::npos);
            return;
        }
        out.append(static_cast<size_t>(fill), pad);
    }
    out += piece;
    if (fill > 0 && left)
        out.append(static_cast<size_t>(fill), u' ');
}

// Formats `format` the way both LogMessage forms and wsfmt do. `Ch` is the format's
// code unit; in a narrow format %s is narrow text and %S wide text, in a wide
// format the other way round. Literal narrow text is UTF-8. A conversion this
// formatter does not know is copied as it stands and consumes no argument, so the
// arguments after it are not misread.
template <typename Ch> std::u16string formatText(const Ch* format, va_list args) {
    constexpr bool kWideFormat = sizeof(Ch) == sizeof(char16_t);
    std::u16string out;
    if (!format)
        return u"(null)";
    std::string narrowRun; // pending literal bytes of a narrow format
    auto flushNarrow = [&] {
        if (!narrowRun.empty()) {
            out += zrUtf8ToUtf16(narrowRun);
            narrowRun.clear();
        }
    };
    auto literal = [&](Ch c) {
        if constexpr (kWideFormat)
            out += static_cast<char16_t>(c);
        else
            narrowRun += static_cast<char>(c);
    };

    const Ch* p = format;
    while (*p) {
        if (*p != '%') {
            literal(*p++);
            continue;
        }
        const Ch* start = p++;
        bool left = false, plus = false, space = false;
        char16_t pad = u' ';
        for (;; ++p) {
            if (*p == '-')
                left = true;
            else if (*p == '0')
                pad = u'0';
            else if (*p == '+')
                plus = true;
            else if (*p == ' ')
                space = true;
            else
                break;
        }
        long width = 0;
        if (*p == '*') {
            width = va_arg(args, int);
            if (width < 0) {
                left = true;
                width = width < -kMaxWidth ? kMaxWidth : -width;
            }
            if (width > kMaxWidth)
                width = kMaxWidth;
            ++p;
        } else {
            for (; *p >= '0' && *p <= '9'; ++p)
                width = std::min(kMaxWidth, width * 10 + (*p - '0'));
        }
        long precision = -1;
        if (*p == '.') {
            ++p;
            precision = 0;
            if (*p == '*') {
                precision = va_arg(args, int);
                ++p;
            } else {
                for (; *p >= '0' && *p <= '9'; ++p)
                    precision = std::min(kMaxWidth, precision * 10 + (*p - '0'));
            }
        }
        int longs = 0;
        bool sizeT = false;
        if (*p == 'h') {
            while (*p == 'h')
                ++p;
        } else if (*p == 'z') {
            sizeT = true;
            ++p;
        } else {
            while (*p == 'l' && longs < 2) {
                ++longs;
                ++p;
            }
        }
        const Ch conv = *p;
        if (conv)
            ++p;
        std::u16string piece;
        switch (conv) {
        case '%':
            piece = u"%";
            break;
        case 'd':
        case 'i': {
            long long v = sizeT        ? static_cast<long long>(va_arg(args, size_t))
                          : longs == 2 ? va_arg(args, long long)
                          : longs == 1 ? va_arg(args, long)
                                       : va_arg(args, int);
            std::string digits = std::to_string(v);
            if (v >= 0 && (plus || space))
                digits.insert(digits.begin(), plus ? '+' : ' ');
            appendAscii(piece, digits);
            break;
        }
        case 'u':
        case 'x':
        case 'X': {
            unsigned long long v = sizeT        ? va_arg(args, size_t)
                                   : longs == 2 ? va_arg(args, unsigned long long)
                                   : longs == 1 ? va_arg(args, unsigned long)
                                                : va_arg(args, unsigned int);
            if (conv == 'u') {
                appendAscii(piece, std::to_string(v));
            } else {
                const char* digits = conv == 'x' ? "0123456789abcdef" : "0123456789ABCDEF";
                std::string hex;
                do {
                    hex.insert(hex.begin(), digits[v & 0xF]);
                    v >>= 4;
                } while (v);
                appendAscii(piece, hex);
            }
            break;
        }
        case 'c': {
            long c = va_arg(args, int);
            // A plain char above 0x7F arrives negative; it stands for its byte value.
            if (!kWideFormat && c < 0 && c >= -128)
                c += 256;
            appendCodePoint(piece, c);
            break;
        }
        case 's':
        case 'S': {
            const bool wideArg = (conv == 's') == kWideFormat;
            if (wideArg) {
                const auto* text = va_arg(args, const char16_t*);
                piece = text ? std::u16string(text) : u"(null)";
            } else {
                const auto* text = va_arg(args, const char*);
                piece = text ? zrUtf8ToUtf16(text) : u"(null)";
            }
            if (precision >= 0 && static_cast<size_t>(precision) < piece.size())
                piece.resize(static_cast<size_t>(precision));
            pad = u' ';
            break;
        }
        default:
            for (const Ch* q = start; q < p; ++q)
                literal(*q);
            continue;
        }
        flushNarrow();
        appendPadded(out, piece, width, left, pad);
    }
    flushNarrow();
    return out;
}

void deliver(int severity, int code, const std::u16string& text) {
    ZrLogSink sink;
    {
        std::lock_guard<std::mutex> lock(sinkMutex());
        sink = sinkSlot();
    }
    if (sink) {
        sink(severity, code, text);
        return;
    }
    const std::string line = ZrGlob::SeverityWord(severity) + " " + std::to_string(code) + ": " +
                             zrUtf16ToUtf8(text) + "\n";
    std::fputs(line.c_str(), stderr);
}

char16_t foldCase(char16_t c) {
    if ((c >= u'A' && c <= u'Z') || (c >= 0xC0 && c <= 0xDE && c != 0xD7))
        return static_cast<char16_t>(c + 0x20);
    return c;
}

bool isBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

bool isSeparator(char c) { return c == '/' || c == '\\'; }

char asciiLower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c; }

bool equalsCaseBlind(std::string_view a, std::string_view b) {
    if (a.size() != b.size())
        return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (asciiLower(a[i]) != asciiLower(b[i]))
            return false;
    return true;
}

} // namespace

int ZrGlob::LogMessage(int severity, int code, const char* format, ...) {
    va_list args;
    va_start(args, format);
    std::u16string text = formatText(format, args);
    va_end(args);
    deliver(severity, code, text);
    return 0;
}

int ZrGlob::LogMessage(int severity, int code, const ZrWChar* format, ...) {
    va_list args;
    va_start(args, format);
    std::u16string text = formatText(format, args);
    va_end(args);
    deliver(severity, code, text);
    return 0;
}

ZrLogSink ZrGlob::SetLogSink(ZrLogSink sink) {
    std::lock_guard<std::mutex> lock(sinkMutex());
    ZrLogSink previous = std::move(sinkSlot());
    sinkSlot() = std::move(sink);
    return previous;
}

std::string ZrGlob::SeverityWord(int severity) {
    switch (severity) {
    case ZR_SEV_WARNING:
        return "warning";
    case ZR_SEV_ERROR:
        return "error";
    case ZR_SEV_FATAL:
        return "fatal";
    case ZR_SEV_NOTICE:
        return "notice";
    default:
        return "severity " + std::to_string(severity);
    }
}

int ZrGlob::wcscmpi(const ZrWChar* a, const ZrWChar* b) {
    if (!a)
        a = u"";
    if (!b)
        b = u"";
    for (;; ++a, ++b) {
        const char16_t ca = foldCase(*a), cb = foldCase(*b);
        if (ca != cb)
            return ca < cb ? -1 : 1;
        if (ca == 0)
            return 0;
    }
}

const char* ZrGlob::BoolToStr(bool value) { return value ? "True" : "False"; }

bool ZrGlob::StrToBool(const char* value, const char* picture) {
    if (!value)
        return false;
    std::string_view text(value);
    while (!text.empty() && isBlank(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && isBlank(text.back()))
        text.remove_suffix(1);
    const std::string_view words(picture ? picture : "True.False");
    size_t start = 0;
    for (int index = 0; start <= words.size(); ++index) {
        size_t dot = words.find('.', start);
        if (dot == std::string_view::npos)
            dot = words.size();
        if (index % 2 == 0 && equalsCaseBlind(text, words.substr(start, dot - start)))
            return true;
        start = dot + 1;
    }
    return false;
}

void ZrGlob::sepfile(ZrString& path, ZrString& name, ZrString& ext) {
    const std::string& whole = path.str();
    size_t cut = 0;
    for (size_t i = whole.size(); i > 0; --i) {
        if (isSeparator(whole[i - 1])) {
            cut = i;
            break;
        }
    }
    const std::string file = whole.substr(cut);
    // A leading dot starts a hidden file's name, not an extension.
    const size_t dot = file.rfind('.');
    if (dot == std::string::npos || dot == 0) {
        name = file.c_str();
        ext = "";
    } else {
        name = file.substr(0, dot).c_str();
        ext = file.substr(dot).c_str();
    }
    path = whole.substr(0, cut).c_str();
}

void ZrGlob::appndnam(ZrString& path, const char* name) {
    const std::string& dir = path.str();
    if (!dir.empty() && !isSeparator(dir.back())) {
        // Keep to the separator the directory already uses.
        const bool backslash =
            dir.find('/') == std::string::npos && dir.find('\\') != std::string::npos;
        path += backslash ? "\\" : "/";
    }
    path += name;
}

void ZrGlob::appndext(ZrString& path, const char* ext) {
    if (!ext || !*ext)
        return;
    if (*ext != '.')
        path += ".";
    path += ext;
}

void ZrXmlUtils::XMLChToWchar(const ZrWChar* text, ZrWString& out, bool trim) {
    if (!text) {
        out.clear();
        return;
    }
    std::u16string_view view(text);
    if (trim) {
        auto blank = [](char16_t c) { return c == u' ' || c == u'\t' || c == u'\r' || c == u'\n'; };
        while (!view.empty() && blank(view.front()))
            view.remove_prefix(1);
        while (!view.empty() && blank(view.back()))
            view.remove_suffix(1);
    }
    out = view;
}

ZrWString ZrXmlUtils::XMLChToWchar(const ZrWChar* text) {
    ZrWString out;
    XMLChToWchar(text, out, false);
    return out;
}

const ZrWChar* lgettext(const ZrWChar* key) { return key; }

int wsfmt(ZrWString& buffer, const ZrWChar* format, ...) {
    va_list args;
    va_start(args, format);
    buffer = ZrWString(formatText(format, args));
    va_end(args);
    return static_cast<int>(buffer.length());
}
