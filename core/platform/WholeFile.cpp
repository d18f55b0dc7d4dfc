#include "core/platform/WholeFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace velmar {

namespace {

constexpr std::size_t kReadChunk = 64 * 1024;

FileOutcome failed(std::string_view step, int errorNumber) {
    return FileOutcome{step, errorNumber};
}

// Closes fd, keeping the first error: that of the step before it, else that of close itself.
FileOutcome closing(int fd, FileOutcome outcome, std::string_view closeStep) {
    if (close(fd) != 0 && outcome.ok()) {
        return failed(closeStep, errno);
    }
    return outcome;
}

}  // namespace

std::string FileOutcome::reason() const {
    return std::strerror(errorNumber);
}

std::string FileOutcome::message(const std::string& path) const {
    return path + ": " + std::string(failedStep) + ": " + reason();
}

FileOutcome readWholeFile(const std::string& path, std::vector<std::uint8_t>& bytes, std::size_t maxBytes) {
    bytes.clear();
    const int fd = open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) {
        return failed("cannot open", errno);
    }
    std::size_t chunk = kReadChunk;
    struct stat info {};
    if (fstat(fd, &info) == 0) {
        if (S_ISDIR(info.st_mode)) {
            return closing(fd, failed("cannot read", EISDIR), "cannot read");
        }
        if (S_ISREG(info.st_mode) && info.st_size > 0) {
            // One more than the size, so that a file read whole needs no second round to see its end.
            chunk = std::min(static_cast<std::size_t>(info.st_size) + 1, maxBytes);
        }
    }
    while (bytes.size() < maxBytes) {
        const std::size_t used = bytes.size();
        const std::size_t want = std::min(std::max<std::size_t>(chunk, 1), maxBytes - used);
        bytes.resize(used + want);
        const ssize_t got = read(fd, bytes.data() + used, want);
        if (got < 0) {
            bytes.resize(used);
            if (errno == EINTR) {
                continue;
            }
            const int readErrno = errno;
            bytes.clear();
            return closing(fd, failed("cannot read", readErrno), "cannot read");
        }
        bytes.resize(used + static_cast<std::size_t>(got));
        if (got == 0) {
            break;
        }
        chunk = kReadChunk;
    }
    return closing(fd, FileOutcome{}, "cannot read");
}

FileOutcome writeWholeFile(const std::string& path, ByteView bytes, FileWrite mode) {
    int flags = O_WRONLY | O_CREAT | O_CLOEXEC;
    mode_t permissions = 0666;
    std::string_view openStep = "cannot create";
    switch (mode) {
        case FileWrite::Replace:
            flags |= O_TRUNC;
            break;
        case FileWrite::Private:
            flags |= O_TRUNC | O_NOFOLLOW;
            permissions = 0600;
            break;
        case FileWrite::Append:
            flags |= O_APPEND;
            openStep = "cannot open for appending";
            break;
    }
    const int fd = open(path.c_str(), flags, permissions);
    if (fd < 0) {
        return failed(openStep, errno);
    }
    if (mode == FileWrite::Private && fchmod(fd, 0600) != 0) {
        return closing(fd, failed("cannot write", errno), "cannot write");
    }
    std::size_t done = 0;
    while (done < bytes.size()) {
        const ssize_t count = write(fd, bytes.data() + done, bytes.size() - done);
        if (count < 0 && errno == EINTR) {
            continue;
        }
        if (count <= 0) {
            return closing(fd, failed("cannot write", count < 0 ? errno : EIO), "cannot write");
        }
        done += static_cast<std::size_t>(count);
    }
    return closing(fd, FileOutcome{}, "cannot write");
}

}  // namespace velmar
