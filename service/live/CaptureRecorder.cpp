#include "service/live/CaptureRecorder.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cinttypes>
#include <cstring>

#include "core/platform/SystemLog.h"
#include "logfile/DiagFraming.h"

namespace velmar::live {

CaptureRecorder::~CaptureRecorder() {
    close();
}

bool CaptureRecorder::open(std::string& error) {
    const int fd =
        ::open(path_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_NONBLOCK | O_NOCTTY | O_CLOEXEC, 0600);
    if (fd < 0) {
        error = path_ + ": cannot record: " + std::strerror(errno);
        return false;
    }
    struct stat info {};
    if (fstat(fd, &info) != 0 || !S_ISREG(info.st_mode)) {
        ::close(fd);
        error = path_ + ": cannot record: not a regular file";
        return false;
    }
    fchmod(fd, 0600);
    fd_ = fd;
    SystemLog::log(kLogNotice, "live: recording every frame from the port to %s", path_.c_str());
    return true;
}

void CaptureRecorder::append(ByteView escapedFrame) {
    if (fd_ < 0) {
        return;
    }
    buffer_.insert(buffer_.end(), escapedFrame.begin(), escapedFrame.end());
    buffer_.push_back(kDiagFrameEnd);
    if (buffer_.size() >= kFlushBytes) {
        flush();
        return;
    }
    if (timer_ == 0 && queue_ != nullptr) {
        timer_ = queue_->after(kFlushSeconds, [this] {
            timer_ = 0;
            flush();
        });
    }
}

void CaptureRecorder::flush() {
    std::size_t done = 0;
    while (fd_ >= 0 && done < buffer_.size()) {
        const ssize_t wrote = ::write(fd_, buffer_.data() + done, buffer_.size() - done);
        if (wrote > 0) {
            done += static_cast<std::size_t>(wrote);
            continue;
        }
        if (wrote < 0 && errno == EINTR) {
            continue;
        }
        const int reason = wrote < 0 ? errno : ENOSPC;
        SystemLog::log(kLogError, "live: recording to %s stopped after %" PRIu64 " bytes: %s", path_.c_str(),
                       written_ + done, std::strerror(reason));
        ::close(fd_);
        fd_ = -1;
    }
    written_ += done;
    buffer_.clear();
}

void CaptureRecorder::close() {
    if (timer_ != 0 && queue_ != nullptr) {
        queue_->cancelTimer(timer_);
    }
    timer_ = 0;
    if (fd_ < 0) {
        return;
    }
    flush();
    if (fd_ >= 0) {
        ::close(fd_);
        fd_ = -1;
        SystemLog::log(kLogNotice, "live: recording to %s closed after %" PRIu64 " bytes", path_.c_str(),
                       written_);
    }
}

}  // namespace velmar::live
