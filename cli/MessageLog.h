// The messages a command logs: either echoed to stderr as they arrive (text output)
// or kept, in logging order, for the JSON document.
#pragma once

#include "zrglob.h"

#include <string>
#include <vector>

struct LoggedMessage {
    int severity;
    int code;
    std::string text; // UTF-8
};

// Installs itself as the process-wide log sink for its lifetime and restores the
// previous sink when destroyed, so it must outlive every call into the plug-in.
class MessageLog {
  public:
    explicit MessageLog(bool echoToStderr);
    ~MessageLog();
    MessageLog(const MessageLog&) = delete;
    MessageLog& operator=(const MessageLog&) = delete;

    const std::vector<LoggedMessage>& messages() const { return messages_; }

  private:
    bool echo_;
    ZrLogSink previous_;
    std::vector<LoggedMessage> messages_;
};
