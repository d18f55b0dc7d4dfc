// LogCapture: while alive, every system-log line (all priorities) is recorded instead of sent to syslog.
#pragma once

#include <string>
#include <utility>
#include <vector>

namespace velmar::testing {

class LogCapture {
  public:
    struct Line {
        int priority;
        std::string text;
        bool operator==(const Line&) const = default;
    };

    LogCapture();
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    const std::vector<Line>& lines() const { return lines_; }
    // The texts alone, in order.
    std::vector<std::string> texts() const;
    // The texts logged at exactly this priority, in order.
    std::vector<std::string> textsAt(int priority) const;
    bool contains(const std::string& text) const;
    void clear() { lines_.clear(); }

  private:
    std::vector<Line> lines_;
    int previousThreshold_;
};

}  // namespace velmar::testing
