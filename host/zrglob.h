// Host services: logging, boolean texts, file-name helpers, parser-text conversion.
#pragma once

#include "zrstring.h"
#include "zrtypes.h"

#include <functional>
#include <string>

// Receives every logged message, fully formatted. Installed by the host program.
using ZrLogSink = std::function<void(int severity, int code, const std::u16string& text)>;

class ZRHOST_API ZrGlob {
  public:
    // printf-style logging. Narrow formats: %s is narrow (UTF-8) text, %S wide text.
    // Wide formats: %s is wide text, %S narrow text. Both: %d an int, %ld a long,
    // %u an unsigned int, %c a character, %% a percent sign. A null text argument
    // prints "(null)". The message goes to the installed sink, else to stderr as
    // one line "<severity word> <code>: <text>". Returns 0.
    static int LogMessage(int severity, int code, const char* format, ...);
    static int LogMessage(int severity, int code, const ZrWChar* format, ...);
    // Installs the process-wide sink; an empty function restores stderr. Returns
    // the sink it replaces.
    static ZrLogSink SetLogSink(ZrLogSink sink);
    // The word for a severity: "warning", "error", "fatal", "notice", or "severity N".
    static std::string SeverityWord(int severity);

    // Case-blind comparison (simple case folding of ASCII and Latin-1); 0 when equal,
    // negative or positive as a sorts before or after b. Null compares as "".
    static int wcscmpi(const ZrWChar* a, const ZrWChar* b);

    // "True" or "False".
    static const char* BoolToStr(bool value);
    // True when `value`, blank-trimmed and case-blind, equals one of the true words
    // of `picture`: words separated by '.', true and false alternating
    // ("True.False.true.false"). False otherwise, and for a null value.
    static bool StrToBool(const char* value, const char* picture);

    // Splits a path in place: `path` keeps the directory with its trailing separator
    // ('/' or '\'), `name` receives the file name without extension, `ext` the
    // extension with its dot ("" when none). "a/b.c.xsd" gives "a/", "b.c", ".xsd".
    static void sepfile(ZrString& path, ZrString& name, ZrString& ext);
    // Appends a file name to a directory (adding '/' when the directory is not
    // empty and does not end in a separator).
    static void appndnam(ZrString& path, const char* name);
    // Appends an extension; one without a dot gets one.
    static void appndext(ZrString& path, const char* ext);
};

class ZRHOST_API ZrXmlUtils {
  public:
    // Copies parser text into `out`; a null text gives "". `trim` strips leading and
    // trailing XML blanks (space, tab, CR, LF).
    static void XMLChToWchar(const ZrWChar* text, ZrWString& out, bool trim);
    static ZrWString XMLChToWchar(const ZrWChar* text);
};

// The text to use for a message; this host has no catalogue and returns `key`.
ZRHOST_API const ZrWChar* lgettext(const ZrWChar* key);
// Formats wide text into `buffer` with the conventions of the wide LogMessage.
// Returns the length written.
ZRHOST_API int wsfmt(ZrWString& buffer, const ZrWChar* format, ...);
