#include "MessageLog.h"

#include "zrglob.h"
#include "zrstring.h"

#include <algorithm>
#include <cstdio>
#include <utility>

MessageLog::MessageLog(bool echoToStderr) : echo_(echoToStderr) {
    previous_ = ZrGlob::SetLogSink([this](int severity, int code, const std::u16string& text) {
        LoggedMessage message{severity, code, zrUtf16ToUtf8(text)};
        if (echo_) {
            // Same line shape as the host's own logger, so text output reads the
            // same whether or not a program installs a sink; one message, one line.
            std::string line = message.text;
            std::replace_if(
                line.begin(), line.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
            std::fprintf(stderr, "%s %d: %s\n", ZrGlob::SeverityWord(severity).c_str(), code,
                         line.c_str());
            std::fflush(stderr);
        }
        messages_.push_back(std::move(message));
    });
}

MessageLog::~MessageLog() { ZrGlob::SetLogSink(std::move(previous_)); }
