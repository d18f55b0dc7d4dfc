// StandardOutputDiversion: the consumer's stream reaches the original standard output; what else is written
// to the C library's stdout meanwhile goes to standard error or nowhere; afterwards stdout is as it was.
#include "core/platform/StandardOutputDiversion.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>
#include <string>

#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

// Points descriptor fd at a file for the lifetime of the object.
class DescriptorToFile {
  public:
    DescriptorToFile(int fd, const std::string& path) : fd_(fd), saved_(dup(fd)) {
        std::fflush(nullptr);
        const int file = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
        dup2(file, fd);
        close(file);
    }
    ~DescriptorToFile() {
        std::fflush(nullptr);
        dup2(saved_, fd_);
        close(saved_);
    }

  private:
    int fd_;
    int saved_;
};

void runDiverted(bool toStandardError, const std::string& directory) {
    const DescriptorToFile out(STDOUT_FILENO, directory + "/out");
    const DescriptorToFile err(STDERR_FILENO, directory + "/err");
    {
        const StandardOutputDiversion diversion(toStandardError);
        std::fputs("Deallocing ClassIndex\n", stdout);
        std::fflush(stdout);
        std::fputs("{\"json\": 1}\n", diversion.stream());
        std::fflush(diversion.stream());
    }
    std::fputs("after\n", stdout);
    std::fflush(stdout);
}

TEST(StandardOutputDiversion, StrayLinesGoNowhereByDefault) {
    testing::TemporaryDirectory directory;
    runDiverted(false, directory.path());
    EXPECT_EQ(testing::readWholeFile(directory.path() + "/out"), "{\"json\": 1}\nafter\n");
    EXPECT_EQ(testing::readWholeFile(directory.path() + "/err"), "");
}

TEST(StandardOutputDiversion, StrayLinesGoToStandardErrorWhenAsked) {
    testing::TemporaryDirectory directory;
    runDiverted(true, directory.path());
    EXPECT_EQ(testing::readWholeFile(directory.path() + "/out"), "{\"json\": 1}\nafter\n");
    EXPECT_EQ(testing::readWholeFile(directory.path() + "/err"), "Deallocing ClassIndex\n");
}

}  // namespace
}  // namespace velmar
