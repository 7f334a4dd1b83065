#include "zrstring.h"

#include <cstring>

namespace {

constexpr char16_t kReplacement = 0xFFFD;

void appendCodePoint(std::u16string& out, char32_t cp) {
    if (cp < 0x10000) {
        out += static_cast<char16_t>(cp);
    } else {
        cp -= 0x10000;
        out += static_cast<char16_t>(0xD800 + (cp >> 10));
        out += static_cast<char16_t>(0xDC00 + (cp & 0x3FF));
    }
}

// Whether a high surrogate at `i` is followed by its low partner.
bool pairAt(std::u16string_view text, size_t i) {
    return text[i] >= 0xD800 && text[i] <= 0xDBFF && i + 1 < text.size() && text[i + 1] >= 0xDC00 &&
           text[i + 1] <= 0xDFFF;
}

// Byte count of a narrow text given with an optional length, never reading past a
// terminator.
size_t narrowLength(const char* text, long len) {
    if (len < 0)
        return std::strlen(text);
    const void* end = std::memchr(text, 0, static_cast<size_t>(len));
    return end ? static_cast<size_t>(static_cast<const char*>(end) - text)
               : static_cast<size_t>(len);
}

size_t wideLength(const ZrWChar* text, long len) {
    size_t n = 0;
    while ((len < 0 || n < static_cast<size_t>(len)) && text[n] != 0)
        ++n;
    return n;
}

} // namespace

std::u16string zrUtf8ToUtf16(std::string_view text) {
    std::u16string out;
    out.reserve(text.size());
    const size_t n = text.size();
    size_t i = 0;
    while (i < n) {
        const auto b = static_cast<unsigned char>(text[i]);
        if (b < 0x80) {
            out += static_cast<char16_t>(b);
            ++i;
            continue;
        }
        // The lead byte fixes how many continuation bytes follow and the range the
        // first of them must fall in, which rules out overlong forms, encoded
        // surrogates and values past U+10FFFF.
        int need;
        unsigned char lo = 0x80, hi = 0xBF;
        char32_t cp;
        if (b >= 0xC2 && b <= 0xDF) {
            need = 1;
            cp = b & 0x1F;
        } else if (b >= 0xE0 && b <= 0xEF) {
            need = 2;
            cp = b & 0x0F;
            if (b == 0xE0)
                lo = 0xA0;
            else if (b == 0xED)
                hi = 0x9F;
        } else if (b >= 0xF0 && b <= 0xF4) {
            need = 3;
            cp = b & 0x07;
            if (b == 0xF0)
                lo = 0x90;
            else if (b == 0xF4)
                hi = 0x8F;
        } else {
            out += kReplacement;
            ++i;
            continue;
        }
        size_t j = i + 1;
        bool ok = true;
        for (int k = 0; k < need; ++k, ++j) {
            if (j >= n) {
                ok = false;
                break;
            }
            const auto c = static_cast<unsigned char>(text[j]);
            if (c < lo || c > hi) {
                ok = false;
                break;
            }
            cp = (cp << 6) | (c & 0x3F);
            lo = 0x80;
            hi = 0xBF;
        }
        // A broken sequence becomes one replacement for its valid beginning; the
        // byte that broke it starts afresh.
        if (ok)
            appendCodePoint(out, cp);
        else
            out += kReplacement;
        i = j;
    }
    return out;
}

std::string zrUtf16ToUtf8(std::u16string_view text) {
    std::string out;
    zrAppendUtf8(out, text);
    return out;
}

// Measured first, so that the text takes exactly its space, then written into it.
// Text that is all ASCII, as names and most documentation are, is one narrowing
// copy: both loops of that path are free of branches the compiler cannot turn into
// vector code.
void zrAppendUtf8(std::string& out, std::u16string_view text) {
    const size_t n = text.size();
    char16_t units = 0;
    for (const char16_t u : text)
        units |= u;
    if (units < 0x80) {
        const size_t start = out.size();
        out.resize(start + n);
        char* p = out.data() + start;
        for (size_t i = 0; i < n; ++i)
            p[i] = static_cast<char>(text[i]);
        return;
    }
    size_t bytes = 0;
    for (size_t i = 0; i < n; ++i) {
        const char16_t u = text[i];
        if (u < 0x80) {
            bytes += 1;
        } else if (u < 0x800) {
            bytes += 2;
        } else if (pairAt(text, i)) {
            bytes += 4;
            ++i;
        } else {
            bytes += 3; // a lone surrogate's replacement too
        }
    }
    const size_t start = out.size();
    out.resize(start + bytes);
    char* p = out.data() + start;
    for (size_t i = 0; i < n; ++i) {
        char32_t c = text[i];
        if (c < 0x80) {
            *p++ = static_cast<char>(c);
            continue;
        }
        if (pairAt(text, i))
            c = 0x10000 + ((c - 0xD800) << 10) + (static_cast<char32_t>(text[++i]) - 0xDC00);
        else if (c >= 0xD800 && c <= 0xDFFF)
            c = kReplacement;
        if (c < 0x800) {
            *p++ = static_cast<char>(0xC0 | (c >> 6));
        } else if (c < 0x10000) {
            *p++ = static_cast<char>(0xE0 | (c >> 12));
            *p++ = static_cast<char>(0x80 | ((c >> 6) & 0x3F));
        } else {
            *p++ = static_cast<char>(0xF0 | (c >> 18));
            *p++ = static_cast<char>(0x80 | ((c >> 12) & 0x3F));
            *p++ = static_cast<char>(0x80 | ((c >> 6) & 0x3F));
        }
        *p++ = static_cast<char>(0x80 | (c & 0x3F));
    }
}

ZrWString& ZrWString::CopyN(const ZrWChar* text, long count, int /*flags*/) {
    if (!text || count <= 0)
        s_.clear();
    else
        s_.assign(text, wideLength(text, count));
    return *this;
}

// Every character set of this host is UTF-8, so `cset` does not change the result.
ZrWString& ZrWString::Assign(const char* text, ZR_CSET /*cset*/, int len) {
    if (!text)
        s_.clear();
    else
        s_ = zrUtf8ToUtf16(std::string_view(text, narrowLength(text, len)));
    return *this;
}

ZrString& ZrString::Assign(const ZrWChar* text, ZR_CSET /*cset*/, int len) {
    if (!text)
        s_.clear();
    else
        s_ = zrUtf16ToUtf8(std::u16string_view(text, wideLength(text, len)));
    return *this;
}

ZrXString::ZrXString(const char* text, ZR_CSET cset) : cset_(cset) {
    if (text)
        s_ = zrUtf8ToUtf16(text);
}

ZrXString::ZrXString(const ZrWChar* text, long len, ZR_CSET cset) : cset_(cset) {
    if (text)
        s_.assign(text, wideLength(text, len));
}

long ZrXString::find(const ZrXString& what, long from) const {
    if (from < 0)
        from = 0;
    if (static_cast<size_t>(from) > s_.size())
        return npos;
    const size_t at = s_.find(what.s_, static_cast<size_t>(from));
    return at == std::u16string::npos ? npos : static_cast<long>(at);
}

ZrXString ZrXString::substr(long pos, long count) const {
    ZrXString out(cset_);
    if (pos < 0)
        pos = 0;
    if (static_cast<size_t>(pos) >= s_.size())
        return out;
    out.s_ = s_.substr(static_cast<size_t>(pos),
                       count < 0 ? std::u16string::npos : static_cast<size_t>(count));
    return out;
}
