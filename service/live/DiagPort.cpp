#include "service/live/DiagPort.h"

#include <fcntl.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace velmar::live {

namespace {

// Raw 8-bit, no flow control, modem-control lines ignored. USB modem drivers ignore the speed.
void makeRaw(int fd) {
    termios settings{};
    if (tcgetattr(fd, &settings) != 0) {
        return;  // not a tty: a character device that is not a serial port
    }
    cfmakeraw(&settings);
    settings.c_cflag |= CS8 | CREAD | CLOCAL;
    settings.c_cflag &= ~static_cast<tcflag_t>(CRTSCTS);
    settings.c_iflag &= ~static_cast<tcflag_t>(IXON | IXOFF | IXANY);
    settings.c_cc[VMIN] = 1;
    settings.c_cc[VTIME] = 0;
    cfsetispeed(&settings, B115200);
    cfsetospeed(&settings, B115200);
    tcsetattr(fd, TCSANOW, &settings);
    int lines = TIOCM_DTR | TIOCM_RTS;
    ioctl(fd, TIOCMBIS, &lines);  // pseudo-terminals have no modem lines: failure is fine
    tcflush(fd, TCIOFLUSH);
}

}  // namespace

std::unique_ptr<DiagPort> DiagPort::open(const std::string& path, std::string& error) {
    struct stat info {};
    if (stat(path.c_str(), &info) != 0) {
        error = path + ": " + std::strerror(errno);
        return nullptr;
    }
    if (!S_ISCHR(info.st_mode) && !S_ISFIFO(info.st_mode)) {
        error = path + ": not a character device or FIFO";
        return nullptr;
    }
    const bool fifo = S_ISFIFO(info.st_mode);
    const int flags = (fifo ? O_RDONLY : O_RDWR) | O_NONBLOCK | O_NOCTTY | O_CLOEXEC;
    const int fd = ::open(path.c_str(), flags);
    if (fd < 0) {
        error = path + ": cannot open: " + std::strerror(errno);
        if (errno == EACCES) {
            error += " (is the user in the dialout group?)";
        }
        return nullptr;
    }
    if (!fifo) {
        makeRaw(fd);
    }
    return std::unique_ptr<DiagPort>(new DiagPort(path, fd, fifo ? Kind::Fifo : Kind::Device));
}

DiagPort::~DiagPort() {
    detach();
    if (fd_ >= 0) {
        close(fd_);
    }
}

void DiagPort::detach() {
    if (queue_ != nullptr) {
        if (readWatch_ != 0) {
            queue_->unwatch(readWatch_);
        }
        if (writeWatch_ != 0) {
            queue_->unwatch(writeWatch_);
        }
    }
    readWatch_ = 0;
    writeWatch_ = 0;
    queue_ = nullptr;
    onFailed_ = nullptr;
}

void DiagPort::attach(MainQueue& queue, std::function<void()> onReadable,
                      std::function<void(std::string)> onFailed) {
    queue_ = &queue;
    onFailed_ = std::move(onFailed);
    readWatch_ = queue.watchReadable(fd_, std::move(onReadable));
    if (queuedBytes() != 0) {
        flush();
    }
}

std::ptrdiff_t DiagPort::read(std::span<std::uint8_t> buffer) {
    while (true) {
        const ssize_t got = ::read(fd_, buffer.data(), buffer.size());
        if (got > 0) {
            return got;
        }
        if (got == 0) {
            error_ = kind_ == Kind::Fifo ? "the writer closed it" : "the device hung up";
            return kEnded;
        }
        if (errno == EINTR) {
            continue;
        }
        if (errno == EAGAIN || errno == EWOULDBLOCK) {
            return 0;
        }
        error_ = std::string("read failed: ") + std::strerror(errno);
        return kEnded;
    }
}

bool DiagPort::write(ByteView bytes) {
    if (kind_ == Kind::Fifo || broken_) {
        return false;
    }
    if (queuedBytes() + bytes.size() > kMaxQueuedBytes) {
        return false;
    }
    if (sent_ == queued_.size()) {
        queued_.clear();
        sent_ = 0;
    }
    queued_.insert(queued_.end(), bytes.begin(), bytes.end());
    flush();
    return true;
}

void DiagPort::flush() {
    while (sent_ < queued_.size() && !broken_) {
        const ssize_t wrote = ::write(fd_, queued_.data() + sent_, queued_.size() - sent_);
        if (wrote > 0) {
            sent_ += static_cast<std::size_t>(wrote);
            continue;
        }
        if (wrote < 0 && errno == EINTR) {
            continue;
        }
        if (wrote < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) {
            break;
        }
        failed(wrote < 0 ? errno : EIO);
        return;
    }
    if (sent_ == queued_.size()) {
        queued_.clear();
        sent_ = 0;
    }
    if (queue_ == nullptr) {
        return;
    }
    const bool waiting = queuedBytes() != 0 && !broken_;
    if (waiting && writeWatch_ == 0) {
        writeWatch_ = queue_->watchWritable(fd_, [this] { flush(); });
    } else if (!waiting && writeWatch_ != 0) {
        queue_->unwatch(writeWatch_);
        writeWatch_ = 0;
    }
}

void DiagPort::failed(int error) {
    broken_ = true;
    error_ = std::string("write failed: ") + std::strerror(error);
    queued_.clear();
    sent_ = 0;
    if (queue_ != nullptr && writeWatch_ != 0) {
        queue_->unwatch(writeWatch_);
        writeWatch_ = 0;
    }
    if (onFailed_ && queue_ != nullptr) {
        // Reported from the queue, never from inside the write() that a caller is making.
        queue_->async([report = onFailed_, message = error_] { report(message); });
    }
}

}  // namespace velmar::live
