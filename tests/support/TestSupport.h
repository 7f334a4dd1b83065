// Shared helpers of the unit tests: a log capture, temporary schema files.
#pragma once

#include "ZrName.h"
#include "zrglob.h"
#include "zrstring.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace zrtest {

inline std::string utf8(const ZrWString& s) { return zrUtf16ToUtf8(s.view()); }

inline std::string utf8(const ZrName& s) { return zrUtf16ToUtf8(s.view()); }

inline std::string utf8(std::u16string_view s) { return zrUtf16ToUtf8(s); }

inline ZrWString wide(std::string_view s) { return ZrWString(zrUtf8ToUtf16(s)); }

struct LoggedMessage {
    int severity;
    int code;
    std::string text;

    bool operator==(const LoggedMessage& o) const {
        return severity == o.severity && code == o.code && text == o.text;
    }
};

inline std::ostream& operator<<(std::ostream& os, const LoggedMessage& m) {
    return os << "{" << m.severity << ", " << m.code << ", \"" << m.text << "\"}";
}

// Collects every message logged while it lives.
class LogCapture {
  public:
    LogCapture() {
        previous_ = ZrGlob::SetLogSink([this](int severity, int code, const std::u16string& text) {
            messages.push_back({severity, code, zrUtf16ToUtf8(text)});
        });
    }

    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    ~LogCapture() { ZrGlob::SetLogSink(previous_); }

    // All messages as "severity code text" lines, for compact expectations.
    std::string lines() const {
        std::string out;
        for (const auto& m : messages)
            out += std::to_string(m.severity) + " " + std::to_string(m.code) + " " + m.text + "\n";
        return out;
    }

    std::vector<LoggedMessage> messages;

  private:
    ZrLogSink previous_;
};

// A fresh directory under the system's temporary folder, removed with its content.
class TempDir {
  public:
    TempDir() {
        std::string pattern = (std::filesystem::temp_directory_path() / "zrtest-XXXXXX").string();
        std::vector<char> buf(pattern.begin(), pattern.end());
        buf.push_back('\0');
        if (!mkdtemp(buf.data()))
            throw std::runtime_error("mkdtemp failed");
        path_ = buf.data();
    }

    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    ~TempDir() {
        std::error_code ec;
        std::filesystem::remove_all(path_, ec);
    }

    const std::filesystem::path& path() const { return path_; }

    // Writes `content` to `name` (sub-folders are created) and returns its full path.
    std::string write(const std::string& name, const std::string& content) const {
        auto file = path_ / name;
        std::filesystem::create_directories(file.parent_path());
        std::ofstream(file, std::ios::binary) << content;
        return file.string();
    }

  private:
    std::filesystem::path path_;
};

constexpr const char* kXsdNs = "http://www.w3.org/2001/XMLSchema";

// A schema document with the prefix xs bound to the XML Schema namespace, the given
// extra attributes on the schema element, and `body` as its content.
inline std::string schemaDoc(const std::string& body, const std::string& schemaAttrs = "") {
    return std::string("<?xml version=\"1.0\"?>\n<xs:schema xmlns:xs=\"") + kXsdNs + "\"" +
           (schemaAttrs.empty() ? "" : " " + schemaAttrs) + ">\n" + body + "\n</xs:schema>\n";
}

} // namespace zrtest
