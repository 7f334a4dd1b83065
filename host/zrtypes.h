// Basic types shared by the host libraries and everything built against them.
#pragma once

#include <cstdint>

#if defined(_WIN32)
#define ZRHOST_API __declspec(dllexport)
#else
#define ZRHOST_API __attribute__((visibility("default")))
#endif

// Wide text is 16-bit code units, the same unit as the XML parser's XMLCh.
using ZrWChar = char16_t;

// Character-set codes for narrow/wide conversions. Both are UTF-8 on this host;
// 1 names the file system's encoding, which is UTF-8 as well.
using ZR_CSET = int;
constexpr ZR_CSET ZR_CSET_DEFAULT = 0;
constexpr ZR_CSET ZR_CSET_FILESYSTEM = 1;

// Result codes of host-facing operations.
enum BATCHERR : int {
    BE_OK = 0,
    BE_INVALID_ARGUMENT = 2,
    BE_NO_MEMORY = 5,
    BE_UNKNOWN_OPTION = 7,
    BE_READ_FAILED = 19,
};

// What kind of location a URI names. 0 is a plain local path.
enum ZRPROTOCOL : int {
    ZRP_NONE = 0,
    ZRP_FILE = 1,
    ZRP_HTTP = 2,
    ZRP_HTTPS = 3,
    ZRP_FTP = 4,
    ZRP_OTHER = 5,
};

// Log severities.
constexpr int ZR_SEV_WARNING = 2;
constexpr int ZR_SEV_ERROR = 4;
constexpr int ZR_SEV_FATAL = 8;
constexpr int ZR_SEV_NOTICE = 512;
