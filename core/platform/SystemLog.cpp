#include "core/platform/SystemLog.h"

#include <syslog.h>

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <vector>

namespace velmar {

namespace {

struct LogSettings {
    int threshold = kLogError;
    bool mirrorToStderr = false;
    SystemLog::Sink sink;
};

LogSettings& settings() {
    static LogSettings instance;
    return instance;
}

// The priority that filtering and syslog(3) see: anything outside syslog's 0..7 counts as an error.
int effectivePriority(int priority) {
    return (priority < 0 || priority > kLogDebug) ? kLogError : priority;
}

}  // namespace

bool SystemLog::isEnabled(int priority) {
    return effectivePriority(priority) <= settings().threshold;
}

void SystemLog::log(int priority, const char* format, ...) {
    if (!isEnabled(priority)) {
        return;
    }
    char small[512];
    va_list args;
    va_start(args, format);
    va_list again;
    va_copy(again, args);
    const int needed = std::vsnprintf(small, sizeof small, format, args);
    va_end(args);
    std::string text;
    if (needed < 0) {
        text = format;
    } else if (static_cast<std::size_t>(needed) < sizeof small) {
        text.assign(small, static_cast<std::size_t>(needed));
    } else {
        std::vector<char> large(static_cast<std::size_t>(needed) + 1);
        std::vsnprintf(large.data(), large.size(), format, again);
        text.assign(large.data(), static_cast<std::size_t>(needed));
    }
    va_end(again);

    LogSettings& current = settings();
    if (current.mirrorToStderr) {
        std::fprintf(stderr, "<%d> %s\n", priority, text.c_str());
    }
    if (current.sink) {
        current.sink(priority, text);
    } else {
        syslog(LOG_USER | effectivePriority(priority), "%s", text.c_str());
    }
}

int SystemLog::parseLevel(const std::string& text) {
    static const struct {
        const char* name;
        int priority;
    } kNames[] = {{"error", kLogError},
                  {"warning", kLogWarning},
                  {"notice", kLogNotice},
                  {"info", kLogInfo},
                  {"debug", kLogDebug}};
    for (const auto& entry : kNames) {
        if (text == entry.name) {
            return entry.priority;
        }
    }
    if (!text.empty() && text.find_first_not_of("0123456789") == std::string::npos && text.size() < 3) {
        return std::atoi(text.c_str());
    }
    return -1;
}

void SystemLog::configureFromEnvironment(const char* programName) {
    openlog(programName, LOG_PID, LOG_USER);
    if (const char* level = std::getenv("VELMAR_LOG_LEVEL")) {
        const int parsed = parseLevel(level);
        if (parsed >= 0) {
            setThreshold(parsed);
        }
    }
}

void SystemLog::setThreshold(int priority) {
    settings().threshold = priority;
}
int SystemLog::threshold() {
    return settings().threshold;
}
void SystemLog::setMirrorToStderr(bool mirror) {
    settings().mirrorToStderr = mirror;
}
void SystemLog::setSink(Sink sink) {
    settings().sink = std::move(sink);
}

}  // namespace velmar
