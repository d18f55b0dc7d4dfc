#include "service/LiveSource.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cinttypes>
#include <cstring>

#include "core/platform/SystemLog.h"

namespace velmar {

LiveSource::LiveSource(std::string device)
    : device_(std::move(device)),
      alive_(std::make_shared<bool>(true)),
      deframer_(device_, [this](const LogItemView& item) {
          ++blobs_;
          sink_->deliver(frameBasebandBlob(item.bytes));
          return true;
      }) {}

LiveSource::~LiveSource() {
    stop();
    closeDevice();
}

bool LiveSource::prepare(std::string& error) {
    struct stat info {};
    if (stat(device_.c_str(), &info) != 0) {
        error = device_ + ": " + std::strerror(errno);
        return false;
    }
    if (!S_ISCHR(info.st_mode) && !S_ISFIFO(info.st_mode)) {
        error = device_ + ": not a character device or FIFO";
        return false;
    }
    fifo_ = S_ISFIFO(info.st_mode);
    return openDevice(error);
}

bool LiveSource::openDevice(std::string& error) {
    fd_ = open(device_.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    if (fd_ < 0) {
        error = device_ + ": cannot open: " + std::strerror(errno);
        return false;
    }
    return true;
}

void LiveSource::closeDevice() {
    if (queue_ != nullptr && watch_ != 0) {
        queue_->unwatch(watch_);
    }
    watch_ = 0;
    if (fd_ >= 0) {
        close(fd_);
        fd_ = -1;
    }
}

std::string LiveSource::description() const {
    return "live diagnostic port " + device_;
}

void LiveSource::start(MainQueue& queue, BlobSink& sink) {
    queue_ = &queue;
    sink_ = &sink;
    *alive_ = true;
    buffer_.resize(kReadSize);
    watch();
}

void LiveSource::watch() {
    if (fd_ < 0 || watch_ != 0) {
        return;
    }
    watch_ = queue_->watchReadable(fd_, [this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            onReadable();
        }
    });
}

void LiveSource::stop() {
    *alive_ = false;
    if (queue_ != nullptr && reopenTimer_ != 0) {
        queue_->cancelTimer(reopenTimer_);
    }
    reopenTimer_ = 0;
    closeDevice();
}

void LiveSource::onReadable() {
    for (int reads = 0; reads < kReadsPerWake && fd_ >= 0 && *alive_; ++reads) {
        const ssize_t got = read(fd_, buffer_.data(), buffer_.size());
        if (got > 0) {
            deframer_.feed(ByteView(buffer_.data(), static_cast<std::size_t>(got)));
            continue;
        }
        if (got == 0) {
            SystemLog::log(kLogNotice, "live: %s: the stream ended after %" PRIu64 " blobs; opening it again",
                           device_.c_str(), blobs_);
            restart(fifo_);
            return;
        }
        if (errno == EINTR) {
            continue;
        }
        if (errno != EAGAIN && errno != EWOULDBLOCK) {
            SystemLog::log(kLogError, "live: %s: read failed: %s", device_.c_str(), std::strerror(errno));
            restart(false);
        }
        return;
    }
}

void LiveSource::restart(bool immediately) {
    deframer_.finish();
    closeDevice();
    const auto reopen = [this] {
        reopenTimer_ = 0;
        std::string error;
        if (!openDevice(error)) {
            SystemLog::log(kLogError, "live: %s; trying again in a second", error.c_str());
            restart(false);
            return;
        }
        watch();
    };
    if (immediately) {
        reopen();
        return;
    }
    reopenTimer_ = queue_->after(kReopenDelaySeconds, [reopen, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            reopen();
        }
    });
}

}  // namespace velmar
