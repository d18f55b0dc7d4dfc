#include "ui/headless/HeadlessFrontEnd.h"

#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <cmath>

#include "core/ArrayLock.h"
#include "core/platform/Clock.h"
#include "core/platform/Json.h"

namespace velmar {

namespace {

// "YYYY-MM-DDTHH:MM:SS±HH:MM" in local time.
std::string isoLocalTime(double secondsSince1970) {
    const std::string stamp = Clock::localText(secondsSince1970, "%Y-%m-%dT%H:%M:%S");
    const long offset =
        Clock::localZoneAt(static_cast<std::int64_t>(std::floor(secondsSince1970))).utcOffsetSeconds;
    const long minutes = (offset < 0 ? -offset : offset) / 60;
    char zone[48];
    std::snprintf(zone, sizeof zone, "%c%02ld:%02ld", offset < 0 ? '-' : '+', minutes / 60, minutes % 60);
    return stamp + zone;
}

// The followed path without empty parts ("/A//B/" → "/A/B"), and where each pane's path ends in it, root
// first: "/A/B" → 1 ("/"), 2 ("/A"), 4 ("/A/B").
std::shared_ptr<const std::string> normalisedPath(const std::string& followed,
                                                  std::vector<std::size_t>& ends) {
    auto path = std::make_shared<std::string>("/");
    path->reserve(followed.size() + 1);
    ends.push_back(1);
    std::size_t start = 0;
    while (start < followed.size()) {
        std::size_t end = followed.find('/', start);
        if (end == std::string::npos) {
            end = followed.size();
        }
        if (end > start) {
            if (path->size() > 1) {
                path->push_back('/');
            }
            path->append(followed, start, end - start);
            ends.push_back(path->size());
        }
        start = end + 1;
    }
    return path;
}

}  // namespace

HeadlessFrontEnd::HeadlessFrontEnd(GeneratorFactory factory, const std::string& followedPath,
                                   std::FILE* output)
    : shell_(std::move(factory), queue_), output_(output) {
    MainQueue::setCurrent(&queue_);
    std::vector<std::size_t> ends;
    const std::shared_ptr<const std::string> followed = normalisedPath(followedPath, ends);
    panes_.reserve(ends.size());
    for (const std::size_t end : ends) {
        panes_.push_back(std::make_unique<HeadlessPane>(followed, end));
    }
    shell_.setRedrawObserver([this] { printStatusLine(); });
}

HeadlessFrontEnd::~HeadlessFrontEnd() {
    MainQueue::setCurrent(nullptr);
}

void HeadlessFrontEnd::popToPane(std::size_t index, bool) {
    if (index + 1 < panes_.size()) {
        panes_.resize(index + 1);
        shell_.navigationWillShow(*panes_.back());
    }
}

void HeadlessFrontEnd::appendNodeJson(std::string& out, const VelmarModelNodeRef& node) {
    if (!node) {
        out += "null";
        return;
    }
    out += "{\"name\": ";
    appendJsonString(out, node->displayName());
    if (const NodeList* children = node->childNodes()) {
        out += ", \"children\": [";
        bool first = true;
        for (const auto& child : *children) {
            if (!first) {
                out += ", ";
            }
            first = false;
            appendNodeJson(out, child);
        }
        out += "]}";
        return;
    }
    out += ", \"value\": ";
    const std::string* value = node->value();
    appendJsonString(out, value ? *value : std::string());
    out += "}";
}

std::string HeadlessFrontEnd::statusLine() const {
    const HeadlessPane& top = *panes_.back();
    std::string line = "{\"time\": ";
    appendJsonString(line, isoLocalTime(Clock::now()));
    line += ", \"connected\": ";
    line += shell_.model() && shell_.model()->isConnected() ? "true" : "false";
    line += ", \"status\": ";
    appendJsonString(line, top.status());
    line += ", \"tree\": ";
    appendNodeJson(line, top.node());
    line += "}";
    return line;
}

void HeadlessFrontEnd::printStatusLine() {
    const std::string line = statusLine() + "\n";
    std::fwrite(line.data(), 1, line.size(), output_);
    std::fflush(output_);
}

int HeadlessFrontEnd::run() {
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    const int signalFd = signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK);
    if (signalFd >= 0) {
        queue_.watchReadable(signalFd, [this, signalFd] {
            signalfd_siginfo info{};
            while (read(signalFd, &info, sizeof info) == sizeof info) {
            }
            queue_.stop();
        });
    }
    shell_.launch(*this);
    printStatusLine();
    queue_.run();
    shell_.terminate();
    ArrayLock::releaseOutstandingForTesting();
    if (signalFd >= 0) {
        close(signalFd);
    }
    return 0;
}

}  // namespace velmar
