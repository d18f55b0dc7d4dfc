#include "logfile/LogByteStream.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace velmar {

LogByteStream::LogByteStream(std::span<const std::uint8_t> bytes)
    : data_(bytes.data()), capacity_(bytes.size()), end_(bytes.size()), ended_(true) {}

LogByteStream::LogByteStream(std::size_t capacity) : capacity_(std::max<std::size_t>(capacity, 1)) {
    ended_ = true;  // until open() succeeds
}

LogByteStream::~LogByteStream() {
    if (fd_ >= 0) {
        close(fd_);
    }
}

FileOutcome LogByteStream::open(const std::string& path) {
    const int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NOCTTY);
    if (fd < 0) {
        return FileOutcome{"cannot open", errno};
    }
    struct stat info {};
    if (fstat(fd, &info) == 0 && S_ISDIR(info.st_mode)) {
        close(fd);
        return FileOutcome{"cannot read", EISDIR};
    }
    if (fd_ >= 0) {
        close(fd_);
    }
    fd_ = fd;
    buffer_.resize(capacity_);
    data_ = buffer_.data();
    begin_ = end_ = 0;
    consumed_ = 0;
    ended_ = false;
    failure_ = FileOutcome{};
    return failure_;
}

bool LogByteStream::open(const std::string& path, std::string& error) {
    const FileOutcome opened = open(path);
    if (!opened.ok()) {
        error = opened.message(path);
    }
    return opened.ok();
}

bool LogByteStream::fill(std::size_t wanted, const std::string& name, std::string& error) {
    if (!fill(wanted)) {
        error = failure_.message(name);
        return false;
    }
    return true;
}

bool LogByteStream::fill(std::size_t wanted) {
    wanted = std::min(wanted, capacity_);
    if (end_ - begin_ >= wanted || ended_) {
        return failure_.ok();
    }
    if (capacity_ - begin_ < wanted) {
        // Slide what is left to the front so that the wanted bytes fit behind it.
        std::memmove(buffer_.data(), buffer_.data() + begin_, end_ - begin_);
        end_ -= begin_;
        begin_ = 0;
    }
    while (end_ - begin_ < wanted) {
        const ssize_t got = read(fd_, buffer_.data() + end_, capacity_ - end_);
        if (got < 0) {
            if (errno == EINTR) {
                continue;
            }
            failure_ = FileOutcome{"cannot read", errno};
            ended_ = true;
            return false;
        }
        if (got == 0) {
            ended_ = true;
            close(fd_);
            fd_ = -1;
            break;
        }
        end_ += static_cast<std::size_t>(got);
    }
    return true;
}

void LogByteStream::consume(std::size_t count) {
    count = std::min(count, end_ - begin_);
    begin_ += count;
    consumed_ += count;
    if (begin_ == end_) {
        begin_ = end_ = 0;
    }
}

}  // namespace velmar
