// SystemLog: the system log that every part of the monitor writes to.
//
// Contract: log() takes a syslog priority (error 3, warning 4, notice 5) and a printf format. Lines less
// severe than the threshold (VELMAR_LOG_LEVEL, default "error") are not even formatted, so per-packet
// warnings cost nothing unless asked for. The raw priority 16, which the DLF export uses, is kept as 16 for
// a capturing sink and the stderr mirror but sent to syslog(3) at error level: never as an emergency.
// The stderr mirror (--log-stderr) writes "<priority> <text>" per line. A capturing sink, when installed,
// receives every line that passes the threshold instead of syslog(3); tests use it to compare exact texts.
#pragma once

#include <functional>
#include <string>

namespace velmar {

inline constexpr int kLogError = 3;
inline constexpr int kLogWarning = 4;
inline constexpr int kLogNotice = 5;
inline constexpr int kLogInfo = 6;
inline constexpr int kLogDebug = 7;
// The raw priority value that the DLF export logs with; treated as an error for filtering and syslog.
inline constexpr int kLogRaw16 = 16;

class SystemLog {
  public:
    using Sink = std::function<void(int priority, const std::string& text)>;

    static void log(int priority, const char* format, ...) __attribute__((format(printf, 2, 3)));
    static bool isEnabled(int priority);

    // Reads VELMAR_LOG_LEVEL (a number or error/warning/notice/info/debug) and opens syslog(3) under the
    // program's name.
    static void configureFromEnvironment(const char* programName);
    static void setThreshold(int priority);
    static int threshold();
    static void setMirrorToStderr(bool mirror);
    // Installs (or, with an empty function, removes) a sink that replaces syslog(3).
    static void setSink(Sink sink);

    // Maps a level name or number to a priority; -1 when the text names none.
    static int parseLevel(const std::string& text);
};

}  // namespace velmar
