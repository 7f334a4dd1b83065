// Output written as it is produced: a buffer in front of a stream, the conversions
// of host text to UTF-8, and JSON string escaping exactly as nlohmann-json escapes
// (which built zrdict's documents before), so programs reading zrdict's output see
// the same bytes.
#pragma once

#include <ostream>
#include <string>
#include <string_view>

// Gathers bytes and hands them to the stream in large pieces. Flushes when
// destroyed; write errors are the stream's to report.
class OutputBuffer {
  public:
    explicit OutputBuffer(std::ostream& out);
    ~OutputBuffer();
    OutputBuffer(const OutputBuffer&) = delete;
    OutputBuffer& operator=(const OutputBuffer&) = delete;

    void put(char c) { write(std::string_view(&c, 1)); }

    void write(std::string_view text);
    void flush();

  private:
    static constexpr size_t kFlushAt = 1 << 16;
    std::ostream& out_;
    std::string pending_;
};

// UTF-8 checks shared by the writers of zrdict's formats. Lengths count bytes from
// `at`: of the well-formed sequence there (0 when ill-formed), or of the maximal
// ill-formed part that one U+FFFD replaces (a stray byte, or a sequence cut short by
// the byte that cannot continue it, which is then read again on its own).
size_t wellFormedLength(std::string_view text, size_t at);
size_t illFormedLength(std::string_view text, size_t at);
// Appends `text` with each maximal ill-formed part replaced by U+FFFD.
void appendValidUtf8(std::string& out, std::string_view text);

// Appends `text` as the inside of a JSON string: quotation mark, backslash and the
// control characters escaped as nlohmann-json escapes them (\b \t \n \f \r, else
// \u00xx), everything else as it is. Each maximal ill-formed part of the UTF-8
// (a stray byte, a sequence cut short, an overlong or surrogate form) becomes one
// U+FFFD, as nlohmann-json's replacing error handler does.
void appendJsonEscaped(std::string& out, std::string_view text);
// The same for 16-bit host text, which is converted on the way: a surrogate
// without its partner becomes U+FFFD.
void appendJsonEscaped(std::string& out, std::u16string_view text);
