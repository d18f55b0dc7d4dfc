// Paths the suites use: the committed test data and a fresh temporary directory per test.
#pragma once

#include <string>

namespace velmar::testing {

// A file under tests/data.
std::string testDataPath(const std::string& name);
// A new empty directory under the system's temporary directory, removed with its contents on destruction.
class TemporaryDirectory {
  public:
    TemporaryDirectory();
    ~TemporaryDirectory();
    TemporaryDirectory(const TemporaryDirectory&) = delete;
    TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;
    const std::string& path() const { return path_; }
    std::string file(const std::string& name) const { return path_ + "/" + name; }

  private:
    std::string path_;
};

// Reads a whole file; empty when it cannot be read.
std::string readWholeFile(const std::string& path);
void writeWholeFile(const std::string& path, const std::string& contents);

}  // namespace velmar::testing
