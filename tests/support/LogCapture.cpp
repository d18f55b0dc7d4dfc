#include "tests/support/LogCapture.h"

#include <algorithm>

#include "core/platform/SystemLog.h"

namespace velmar::testing {

LogCapture::LogCapture() : previousThreshold_(SystemLog::threshold()) {
    SystemLog::setThreshold(kLogDebug);
    SystemLog::setSink([this](int priority, const std::string& text) { lines_.push_back({priority, text}); });
}

LogCapture::~LogCapture() {
    SystemLog::setSink({});
    SystemLog::setThreshold(previousThreshold_);
}

std::vector<std::string> LogCapture::texts() const {
    std::vector<std::string> out;
    for (const auto& line : lines_) {
        out.push_back(line.text);
    }
    return out;
}

std::vector<std::string> LogCapture::textsAt(int priority) const {
    std::vector<std::string> out;
    for (const auto& line : lines_) {
        if (line.priority == priority) {
            out.push_back(line.text);
        }
    }
    return out;
}

bool LogCapture::contains(const std::string& text) const {
    return std::any_of(lines_.begin(), lines_.end(), [&](const Line& line) { return line.text == text; });
}

}  // namespace velmar::testing
