#include "service/ReplaySource.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cinttypes>
#include <cstring>

#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"

namespace velmar {

ReplaySource::ReplaySource(Settings settings)
    : settings_(std::move(settings)), pacer_(settings_.speed), alive_(std::make_shared<bool>(true)) {}

ReplaySource::~ReplaySource() {
    stop();
    closeStream();
}

bool ReplaySource::keepBlobs(const std::function<bool(const LogItemCallback&, std::string&)>& read,
                             std::string& error) {
    bytes_.clear();
    ends_.clear();
    const bool done = read(
        [this](const LogItemView& item) {
            if (item.isBlob()) {
                bytes_.insert(bytes_.end(), item.bytes.begin(), item.bytes.end());
                ends_.push_back(bytes_.size());
            }
            return true;
        },
        error);
    if (!done) {
        bytes_.clear();
        ends_.clear();
        return false;
    }
    SystemLog::log(kLogNotice, "replay: %s holds %zu blobs", settings_.path.c_str(), ends_.size());
    return true;
}

bool ReplaySource::prepare(std::string& error) {
    closeStream();
    // Never waits: a FIFO without a writer opens at once and is read once a writer comes.
    const int fd = open(settings_.path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    if (fd < 0) {
        error = settings_.path + ": cannot open: " + std::strerror(errno);
        return false;
    }
    struct stat info {};
    if (fstat(fd, &info) != 0) {
        error = settings_.path + ": cannot read: " + std::strerror(errno);
        close(fd);
        return false;
    }
    if (S_ISDIR(info.st_mode)) {
        close(fd);
        error = settings_.path + ": cannot read: " + std::strerror(EISDIR);
        return false;
    }
    if (!S_ISREG(info.st_mode)) {
        streamFd_ = fd;
        return true;
    }
    close(fd);
    if (static_cast<std::uint64_t>(info.st_size) > kMaxRecordingBytes) {
        error = stringWithFormat("%s: %lld bytes; a replay takes recordings of at most %zu MiB",
                                 settings_.path.c_str(), static_cast<long long>(info.st_size),
                                 kMaxRecordingBytes / (1024 * 1024));
        return false;
    }
    return keepBlobs(
        [this](const LogItemCallback& keep, std::string& message) {
            return forEachLogItem(settings_.path, LogFormat::Auto, keep, message);
        },
        error);
}

void ReplaySource::readStream() {
    std::size_t used = streamed_.size();
    streamed_.resize(used + kReadChunkBytes);
    const ssize_t got = read(streamFd_, streamed_.data() + used, kReadChunkBytes);
    streamed_.resize(used + static_cast<std::size_t>(got > 0 ? got : 0));
    if (got < 0) {
        if (errno != EAGAIN && errno != EWOULDBLOCK && errno != EINTR) {
            streamFailed(std::string("cannot read: ") + std::strerror(errno));
        }
        return;
    }
    std::string error;
    if (got == 0) {
        closeStream();  // the writer has finished
        const PlistData recording = std::move(streamed_);
        streamed_ = PlistData();
        const bool read = keepBlobs(
            [&](const LogItemCallback& keep, std::string& message) {
                return forEachLogItemInBytes(recording, settings_.path, LogFormat::Auto, keep, message);
            },
            error);
        if (!read) {
            SystemLog::log(kLogError, "replay: %s; nothing to replay", error.c_str());
            return;
        }
        beginReplay();
        return;
    }
    if (streamed_.size() > kMaxRecordingBytes) {
        streamFailed(stringWithFormat("more than %zu MiB; a replay takes no more",
                                      kMaxRecordingBytes / (1024 * 1024)));
        return;
    }
    if (!probed_ && streamed_.size() >= kProbeBytes) {
        probed_ = true;
        if (!probeStream(error)) {
            SystemLog::log(kLogError, "replay: %s; nothing to replay", error.c_str());
            closeStream();
            streamed_ = PlistData();
        }
    }
}

bool ReplaySource::probeStream(std::string& error) {
    const std::optional<LogFormat> named = logFormatForExtension(settings_.path);
    const LogFormat format =
        named.value_or(logFormatForContent(ByteView(streamed_).first(kLogFormatProbeSize)));
    if (format == LogFormat::Snapshot) {
        return true;  // a property list reads only whole
    }
    bool sawBlob = false;
    const bool read = forEachLogItemInBytes(
        streamed_, settings_.path, format,
        [&sawBlob](const LogItemView& item) {
            sawBlob = sawBlob || item.isBlob();
            return !sawBlob;
        },
        error);
    // Stopped at the first blob, or read through: the input reads as a recording so far. Failing before any
    // blob on this much input is damage, not a record cut short by the chunk's end.
    return read || sawBlob;
}

void ReplaySource::streamFailed(const std::string& reason) {
    SystemLog::log(kLogError, "replay: %s: %s; nothing to replay", settings_.path.c_str(), reason.c_str());
    closeStream();
    streamed_ = PlistData();
}

void ReplaySource::closeStream() {
    if (streamWatch_ != 0 && queue_ != nullptr) {
        queue_->unwatch(streamWatch_);
    }
    streamWatch_ = 0;
    if (streamFd_ >= 0) {
        close(streamFd_);
        streamFd_ = -1;
    }
}

std::string ReplaySource::description() const {
    std::string text = "replay of " + settings_.path;
    text +=
        settings_.fast ? ", as fast as the channels take it" : stringWithFormat(" at %gx", settings_.speed);
    if (settings_.loop) {
        text += ", looped";
    }
    return text;
}

ByteView ReplaySource::blob(std::size_t index) const {
    const std::size_t begin = index == 0 ? 0 : ends_[index - 1];
    return ByteView(bytes_.data() + begin, ends_[index] - begin);
}

void ReplaySource::start(MainQueue& queue, BlobSink& sink) {
    queue_ = &queue;
    sink_ = &sink;
    *alive_ = true;
    if (streamFd_ >= 0) {
        SystemLog::log(kLogNotice, "replay: reading %s as it comes; the replay starts at its end",
                       settings_.path.c_str());
        streamWatch_ = queue.watchReadable(streamFd_, [this, alive = std::weak_ptr<bool>(alive_)] {
            const std::shared_ptr<bool> live = alive.lock();
            if (live && *live) {
                readStream();
            }
        });
        return;
    }
    beginReplay();
}

void ReplaySource::beginReplay() {
    next_ = 0;
    finished_ = ends_.empty();
    if (finished_) {
        SystemLog::log(kLogNotice, "replay: the recording holds no blobs; nothing to send");
        return;
    }
    due_ = pacer_.next(blob(0));
    started_ = Clock::now();
    if (settings_.fast) {
        schedule([this] { pumpFast(); });
    } else {
        schedule([this] { pumpPaced(); });
    }
}

void ReplaySource::stop() {
    *alive_ = false;
    closeStream();
    if (queue_ != nullptr && timer_ != 0) {
        queue_->cancelTimer(timer_);
    }
    timer_ = 0;
}

template <typename Step>
void ReplaySource::schedule(Step step) {
    queue_->async([alive = std::weak_ptr<bool>(alive_), step] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            step();
        }
    });
}

bool ReplaySource::deliverAndAdvance() {
    const ByteView current = blob(next_);
    sink_->deliver(frameBasebandBlob(current));
    ++delivered_;
    if (++next_ == ends_.size()) {
        if (!settings_.loop) {
            finished_ = true;
            SystemLog::log(kLogNotice, "replay: finished after %" PRIu64 " blobs", delivered_);
            return false;
        }
        next_ = 0;
        ++round_;
        pacer_.newRound();
    }
    if (!settings_.fast) {
        due_ = pacer_.next(blob(next_));
    }
    return true;
}

void ReplaySource::pumpPaced() {
    timer_ = 0;
    const Clock::time_point now = Clock::now();
    for (int sent = 0; !finished_; ++sent) {
        const Clock::time_point due =
            started_ + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(due_));
        if (due > now) {
            const double wait = std::chrono::duration<double>(due - now).count();
            timer_ = queue_->after(wait, [this, alive = std::weak_ptr<bool>(alive_)] {
                const std::shared_ptr<bool> live = alive.lock();
                if (live && *live) {
                    pumpPaced();
                }
            });
            return;
        }
        if (sent == kBatch) {
            schedule([this] { pumpPaced(); });
            return;
        }
        if (!deliverAndAdvance()) {
            return;
        }
    }
}

void ReplaySource::pumpFast() {
    for (int sent = 0; !finished_; ++sent) {
        if (!sink_->canTakeMore()) {
            if (!waiting_ && delivered_ == 0) {
                SystemLog::log(kLogNotice, "replay: waiting for a streaming channel");
            }
            waiting_ = true;
            sink_->notifyWhenReady([this, alive = std::weak_ptr<bool>(alive_)] {
                const std::shared_ptr<bool> live = alive.lock();
                if (live && *live) {
                    pumpFast();
                }
            });
            return;
        }
        waiting_ = false;
        if (sent == kBatch) {
            schedule([this] { pumpFast(); });
            return;
        }
        if (!deliverAndAdvance()) {
            return;
        }
    }
}

}  // namespace velmar
