// InstanceLock: makes sure that only one process of a kind runs per runtime directory, whatever the timing of
// their starts: an exclusive lock (flock) on the file <runtime directory>/<name>.lock, held for as long as
// the object lives and released by the kernel when the process ends, however it ends.
//
// Contract: acquire() answers the lock, or null with heldElsewhere set when another process holds it, or null
// with a reason in failure when the file cannot be opened or locked. The file itself stays (removing it would
// let a third process lock a new file while the second still holds the old one).
#pragma once

#include <memory>
#include <string>

namespace velmar {

class InstanceLock {
  public:
    static std::unique_ptr<InstanceLock> acquire(const std::string& name, bool* heldElsewhere,
                                                 std::string* failure);
    ~InstanceLock();
    InstanceLock(const InstanceLock&) = delete;
    InstanceLock& operator=(const InstanceLock&) = delete;

    const std::string& path() const { return path_; }

  private:
    InstanceLock(int fd, std::string path) : fd_(fd), path_(std::move(path)) {}

    int fd_;
    std::string path_;
};

}  // namespace velmar
