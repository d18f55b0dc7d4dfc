#include "core/platform/InstanceLock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "core/platform/RuntimeDirectory.h"

namespace velmar {

std::unique_ptr<InstanceLock> InstanceLock::acquire(const std::string& name, bool* heldElsewhere,
                                                    std::string* failure) {
    if (heldElsewhere != nullptr) {
        *heldElsewhere = false;
    }
    std::string why;
    const auto directory = RuntimeDirectory::path(&why);
    if (!directory) {
        if (failure != nullptr) {
            *failure = why;
        }
        return nullptr;
    }
    const std::string path = *directory + "/" + name + ".lock";
    const int fd = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600);
    if (fd < 0) {
        if (failure != nullptr) {
            *failure = "cannot open the lock file " + path + ": " + std::strerror(errno);
        }
        return nullptr;
    }
    while (flock(fd, LOCK_EX | LOCK_NB) != 0) {
        if (errno == EINTR) {
            continue;
        }
        const int error = errno;
        close(fd);
        if (error == EWOULDBLOCK) {
            if (heldElsewhere != nullptr) {
                *heldElsewhere = true;
            }
        } else if (failure != nullptr) {
            *failure = "cannot lock " + path + ": " + std::strerror(error);
        }
        return nullptr;
    }
    return std::unique_ptr<InstanceLock>(new InstanceLock(fd, path));
}

InstanceLock::~InstanceLock() {
    close(fd_);
}

}  // namespace velmar
