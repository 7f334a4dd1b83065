// Host strings: wide (16-bit code units), narrow (UTF-8 bytes) and charset-tagged text.
#pragma once

#include "zrtypes.h"

#include <functional>
#include <string>
#include <string_view>

// Wide host string. A null text assigns as the empty string.
class ZRHOST_API ZrWString {
  public:
    ZrWString() = default;
    ZrWString(const ZrWString&) = default;
    ZrWString(ZrWString&&) noexcept = default;

    // `len` -1 takes the text up to its terminator.
    ZrWString(const ZrWChar* text, long len = -1) { set(text, len); }

    explicit ZrWString(std::u16string_view text) : s_(text) {}

    explicit ZrWString(std::u16string&& text) noexcept : s_(std::move(text)) {}

    ~ZrWString() = default;

    ZrWString& operator=(const ZrWString&) = default;
    ZrWString& operator=(ZrWString&&) noexcept = default;

    ZrWString& operator=(const ZrWChar* text) {
        set(text, -1);
        return *this;
    }

    ZrWString& operator=(std::u16string_view text) {
        s_.assign(text);
        return *this;
    }

    ZrWString& operator=(ZrWChar c) {
        s_.assign(1, c);
        return *this;
    }

    ZrWString& operator+=(const ZrWString& other) {
        s_ += other.s_;
        return *this;
    }

    ZrWString& operator+=(const ZrWChar* text) {
        if (text)
            s_ += text;
        return *this;
    }

    ZrWString& operator+=(std::u16string_view text) {
        s_ += text;
        return *this;
    }

    ZrWString& operator+=(ZrWChar c) {
        s_ += c;
        return *this;
    }

    bool operator==(const ZrWString& other) const { return s_ == other.s_; }

    bool operator!=(const ZrWString& other) const { return s_ != other.s_; }

    bool operator==(std::u16string_view other) const { return view() == other; }

    bool operator!=(std::u16string_view other) const { return view() != other; }

    // Code-unit order; the key order of maps keyed by host strings.
    bool operator<(const ZrWString& other) const { return s_ < other.s_; }

    // Copies at most `count` code units of `text` (stopping at a terminator).
    // `flags` is reserved and must be 0.
    ZrWString& CopyN(const ZrWChar* text, long count, int flags);
    // Decodes narrow text in `cset`; `len` -1 takes the text up to its terminator.
    // Invalid UTF-8 becomes U+FFFD.
    ZrWString& Assign(const char* text, ZR_CSET cset, int len);

    const ZrWChar* c_str() const { return s_.c_str(); }

    long length() const { return static_cast<long>(s_.size()); }

    bool empty() const { return s_.empty(); }

    std::u16string_view view() const { return s_; }

    const std::u16string& str() const { return s_; }

    void clear() { s_.clear(); }

    bool startsWith(std::u16string_view prefix) const {
        return s_.size() >= prefix.size() && view().substr(0, prefix.size()) == prefix;
    }

  private:
    void set(const ZrWChar* text, long len) {
        if (!text)
            s_.clear();
        else if (len < 0)
            s_.assign(text);
        else
            s_.assign(text, static_cast<size_t>(len));
    }

    std::u16string s_;
};

namespace std {
template <> struct hash<ZrWString> {
    size_t operator()(const ZrWString& s) const noexcept {
        return hash<u16string_view>()(s.view());
    }
};
} // namespace std

// Narrow host string (UTF-8 bytes).
class ZRHOST_API ZrString {
  public:
    ZrString() = default;

    ZrString(const char* text) : s_(text ? text : "") {}

    ZrString(const ZrString&) = default;
    ZrString(ZrString&&) noexcept = default;
    ~ZrString() = default;

    ZrString& operator=(const ZrString&) = default;
    ZrString& operator=(ZrString&&) noexcept = default;

    ZrString& operator=(const char* text) {
        s_.assign(text ? text : "");
        return *this;
    }

    ZrString& operator+=(const ZrString& other) {
        s_ += other.s_;
        return *this;
    }

    ZrString& operator+=(const char* text) {
        if (text)
            s_ += text;
        return *this;
    }

    bool operator==(const ZrString& other) const { return s_ == other.s_; }

    // Encodes wide text in `cset`; `len` -1 takes the text up to its terminator.
    // A lone surrogate becomes U+FFFD.
    ZrString& Assign(const ZrWChar* text, ZR_CSET cset, int len);

    const char* c_str() const { return s_.c_str(); }

    long length() const { return static_cast<long>(s_.size()); }

    bool empty() const { return s_.empty(); }

    const std::string& str() const { return s_; }

    void clear() { s_.clear(); }

  private:
    std::string s_;
};

// Text tagged with the character set it came from; held as wide text.
class ZRHOST_API ZrXString {
  public:
    static constexpr long npos = -1;

    explicit ZrXString(ZR_CSET cset = ZR_CSET_DEFAULT) : cset_(cset) {}

    ZrXString(const char* text, ZR_CSET cset = ZR_CSET_DEFAULT);
    ZrXString(const ZrWChar* text, long len, ZR_CSET cset = ZR_CSET_DEFAULT);
    ZrXString(const ZrXString&) = default;
    ZrXString(ZrXString&&) noexcept = default;
    ~ZrXString() = default;
    ZrXString& operator=(const ZrXString&) = default;
    ZrXString& operator=(ZrXString&&) noexcept = default;

    // Position of `what` at or after `from`, or npos.
    long find(const ZrXString& what, long from) const;
    // `count` -1 takes the rest; positions past the end give the empty text.
    ZrXString substr(long pos, long count = -1) const;

    long size() const { return static_cast<long>(s_.size()); }

    const ZrWChar* w_str() const { return s_.c_str(); }

    ZR_CSET cset() const { return cset_; }

  private:
    std::u16string s_;
    ZR_CSET cset_;
};

// UTF-8 <-> UTF-16 conversions used by the host classes and host programs.
ZRHOST_API std::u16string zrUtf8ToUtf16(std::string_view text);
ZRHOST_API std::string zrUtf16ToUtf8(std::u16string_view text);
// Appends `text` as UTF-8 to `out`, as zrUtf16ToUtf8 converts it: a surrogate without
// its partner becomes U+FFFD.
ZRHOST_API void zrAppendUtf8(std::string& out, std::u16string_view text);
