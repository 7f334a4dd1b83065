// Helpers shared by the fuzz targets: a private scratch folder for the documents a
// target writes, a log sink that keeps what the read logged, and a check that stops
// the run loudly when a property of the reader does not hold.
#pragma once

#include "ZrXmlSchemaDict.h"
#include "zrglob.h"
#include "zrstring.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <string_view>
#include <system_error>
#include <unistd.h>
#include <vector>

namespace zrfuzz {

// Aborts with a message; the fuzzer and the replay programs both report the input
// that led here. Used for properties the reader promises whatever the input.
#define ZRFUZZ_CHECK(cond)                                                                         \
    do {                                                                                           \
        if (!(cond)) {                                                                             \
            std::fprintf(stderr, "%s:%d: property failed: %s\n", __FILE__, __LINE__, #cond);       \
            std::abort();                                                                          \
        }                                                                                          \
    } while (0)

// One folder per process under $TMPDIR (or /tmp), removed when the process ends, so
// two fuzzers running side by side never share files.
class ScratchDir {
  public:
    static ScratchDir& instance() {
        static ScratchDir dir;
        return dir;
    }

    const std::filesystem::path& path() const { return path_; }

    // Writes `bytes` to `name` inside the folder and returns the file's full path.
    std::string write(const std::string& name, std::string_view bytes) const {
        const std::filesystem::path file = path_ / name;
        std::ofstream out(file, std::ios::binary | std::ios::trunc);
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        out.close();
        if (!out)
            fail("cannot write " + file.string());
        return file.string();
    }

    // Removes every file left by the previous input.
    void clean() const {
        std::error_code ec;
        for (const auto& entry : std::filesystem::directory_iterator(path_, ec))
            std::filesystem::remove_all(entry.path(), ec);
    }

    ScratchDir(const ScratchDir&) = delete;
    ScratchDir& operator=(const ScratchDir&) = delete;

  private:
    ScratchDir() {
        // Memory-backed /dev/shm where there is one: a target writes a file per input,
        // and on disk that costs about as much as the read itself.
        const char* tmp = std::getenv("TMPDIR");
        std::error_code ec;
        const std::string base = tmp && *tmp                                     ? tmp
                                 : std::filesystem::is_directory("/dev/shm", ec) ? "/dev/shm"
                                                                                 : "/tmp";
        std::string pattern = base + "/zrfuzz-XXXXXX";
        std::vector<char> buf(pattern.begin(), pattern.end());
        buf.push_back('\0');
        if (!mkdtemp(buf.data()))
            fail("mkdtemp failed for " + pattern);
        path_ = buf.data();
    }

    ~ScratchDir() {
        std::error_code ec;
        std::filesystem::remove_all(path_, ec);
    }

    [[noreturn]] static void fail(const std::string& why) {
        std::fprintf(stderr, "zrfuzz: %s\n", why.c_str());
        std::abort();
    }

    std::filesystem::path path_;
};

struct Message {
    int severity;
    int code;
    std::u16string text;
};

// Keeps every message logged while it lives instead of printing it: a fuzzer logs
// millions of messages, and printing them would be most of its work.
class LogKeeper {
  public:
    LogKeeper() {
        previous_ = ZrGlob::SetLogSink([this](int severity, int code, const std::u16string& text) {
            messages.push_back({severity, code, text});
        });
    }

    ~LogKeeper() { ZrGlob::SetLogSink(previous_); }

    LogKeeper(const LogKeeper&) = delete;
    LogKeeper& operator=(const LogKeeper&) = delete;

    // True when an error or a fatal error was logged: the reason a read failed.
    bool loggedError() const {
        for (const auto& m : messages)
            if (m.severity == ZR_SEV_ERROR || m.severity == ZR_SEV_FATAL)
                return true;
        return false;
    }

    std::vector<Message> messages;

  private:
    ZrLogSink previous_;
};

// Reads the schema at `path` the way a host does and checks what a read promises
// whatever its input: records and status 0 without a logged error, or no records,
// status 19 and a logged error that says why.
inline void readAndCheck(const std::string& path, bool qualifiedRecords,
                         const std::string& catalogs = "") {
    LogKeeper log;
    ZrXmlSchemaDict dict(nullptr);
    dict.QualifiedRecords(qualifiedRecords);
    dict.CatalogFiles(ZrWString(zrUtf8ToUtf16(catalogs)));
    const BATCHERR status = dict.ReadDictionary(path.c_str());

    ZRFUZZ_CHECK(status == BE_OK || status == BE_READ_FAILED);
    if (status == BE_OK) {
        ZRFUZZ_CHECK(!log.loggedError());
    } else {
        ZRFUZZ_CHECK(dict.RecordList().Count() == 0);
        ZRFUZZ_CHECK(log.loggedError());
    }
}

} // namespace zrfuzz
