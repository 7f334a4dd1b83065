#include "TextOutput.h"

#include "zrstring.h"

OutputBuffer::OutputBuffer(std::ostream& out) : out_(out) { pending_.reserve(kFlushAt); }

OutputBuffer::~OutputBuffer() { flush(); }

void OutputBuffer::write(std::string_view text) {
    if (pending_.size() + text.size() > kFlushAt) {
        flush();
        // A piece larger than the buffer goes straight to the stream.
        if (text.size() >= kFlushAt) {
            out_.write(text.data(), static_cast<std::streamsize>(text.size()));
            return;
        }
    }
    pending_.append(text);
}

void OutputBuffer::flush() {
    if (pending_.empty())
        return;
    out_.write(pending_.data(), static_cast<std::streamsize>(pending_.size()));
    pending_.clear();
}

namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";

// Bytes that stand for themselves inside a JSON string.
bool plain(unsigned char c) { return c >= 0x20 && c != '"' && c != '\\' && c < 0x80; }

void appendEscapedAscii(std::string& out, unsigned char c) {
    switch (c) {
    case '"':
        out += "\\\"";
        return;
    case '\\':
        out += "\\\\";
        return;
    case '\b':
        out += "\\b";
        return;
    case '\t':
        out += "\\t";
        return;
    case '\n':
        out += "\\n";
        return;
    case '\f':
        out += "\\f";
        return;
    case '\r':
        out += "\\r";
        return;
    default:
        break;
    }
    if (c < 0x20) {
        static const char kHex[] = "0123456789abcdef";
        const char escaped[] = {'\\', 'u', '0', '0', kHex[c >> 4], kHex[c & 0xF]};
        out.append(escaped, sizeof escaped);
    } else {
        out += static_cast<char>(c);
    }
}

// The range the second byte of a sequence must fall in, by its lead byte (Unicode's
// table of well-formed UTF-8); false for a byte that leads nothing.
bool sequenceShape(unsigned char lead, size_t& length, unsigned char& low, unsigned char& high) {
    low = 0x80;
    high = 0xBF;
    if (lead >= 0xC2 && lead <= 0xDF) {
        length = 2;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
        length = 3;
        if (lead == 0xE0)
            low = 0xA0;
        else if (lead == 0xED)
            high = 0x9F;
    } else if (lead >= 0xF0 && lead <= 0xF4) {
        length = 4;
        if (lead == 0xF0)
            low = 0x90;
        else if (lead == 0xF4)
            high = 0x8F;
    } else {
        return false;
    }
    return true;
}

// How many bytes from `at` begin a well-formed sequence: all of it, or the part
// before the first byte that cannot continue it (at least 1).
size_t wellFormedPrefix(std::string_view text, size_t at, size_t& length) {
    const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
    unsigned char low = 0;
    unsigned char high = 0;
    length = 1;
    if (!sequenceShape(bytes[at], length, low, high))
        return 1;
    size_t good = 1;
    while (good < length && at + good < text.size()) {
        const unsigned char next = bytes[at + good];
        if (next < (good == 1 ? low : 0x80) || next > (good == 1 ? high : 0xBF))
            break;
        ++good;
    }
    return good;
}

} // namespace

size_t wellFormedLength(std::string_view text, size_t at) {
    if (static_cast<unsigned char>(text[at]) < 0x80)
        return 1;
    size_t length = 0;
    const size_t good = wellFormedPrefix(text, at, length);
    return good == length && length > 1 ? length : 0;
}

size_t illFormedLength(std::string_view text, size_t at) {
    size_t length = 0;
    return wellFormedPrefix(text, at, length);
}

namespace {

// Appends the sequence at `at` if well-formed, else one U+FFFD for its ill-formed
// part; returns the bytes taken.
size_t appendSequence(std::string& out, std::string_view text, size_t at) {
    if (const size_t length = wellFormedLength(text, at); length > 0) {
        out.append(text.data() + at, length);
        return length;
    }
    out += kReplacement;
    return illFormedLength(text, at);
}

} // namespace

void appendValidUtf8(std::string& out, std::string_view text) {
    for (size_t i = 0; i < text.size();)
        i += appendSequence(out, text, i);
}

void appendJsonEscaped(std::string& out, std::string_view text) {
    const auto* bytes = reinterpret_cast<const unsigned char*>(text.data());
    const size_t n = text.size();
    size_t i = 0;
    while (i < n) {
        size_t run = i;
        while (run < n && plain(bytes[run]))
            ++run;
        out.append(text.data() + i, run - i);
        i = run;
        if (i == n)
            break;
        const unsigned char lead = bytes[i];
        if (lead < 0x80) {
            appendEscapedAscii(out, lead);
            ++i;
            continue;
        }
        i += appendSequence(out, text, i);
    }
}

// Only ASCII is ever escaped, so a run of everything else, converted as the host
// converts, never splits a surrogate pair.
void appendJsonEscaped(std::string& out, std::u16string_view text) {
    const size_t n = text.size();
    size_t i = 0;
    while (i < n) {
        size_t run = i;
        while (run < n && (text[run] >= 0x80 || plain(static_cast<unsigned char>(text[run]))))
            ++run;
        zrAppendUtf8(out, text.substr(i, run - i));
        if (run == n)
            break;
        appendEscapedAscii(out, static_cast<unsigned char>(text[run]));
        i = run + 1;
    }
}
