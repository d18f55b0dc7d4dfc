// Reading and writing whole files: contents, the beginning of a file, the three ways of writing, and the
// messages of each failed step.
#include "core/platform/WholeFile.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

std::vector<std::uint8_t> bytesOf(const std::string& text) {
    return std::vector<std::uint8_t>(text.begin(), text.end());
}

TEST(WholeFile, WritesAndReadsTheSameBytes) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("blob.bin");
    std::vector<std::uint8_t> written(200000);
    for (std::size_t i = 0; i < written.size(); ++i) {
        written[i] = static_cast<std::uint8_t>(i * 7);
    }
    ASSERT_TRUE(writeWholeFile(path, written).ok());
    std::vector<std::uint8_t> read = {1, 2, 3};
    ASSERT_TRUE(readWholeFile(path, read).ok());
    EXPECT_EQ(read, written);

    ASSERT_TRUE(readWholeFile(path, read, 10).ok());
    EXPECT_EQ(read, std::vector<std::uint8_t>(written.begin(), written.begin() + 10));

    // Replace truncates what was there.
    ASSERT_TRUE(writeWholeFile(path, bytesOf("short")).ok());
    ASSERT_TRUE(readWholeFile(path, read).ok());
    EXPECT_EQ(read, bytesOf("short"));

    ASSERT_TRUE(writeWholeFile(directory.file("empty"), {}).ok());
    ASSERT_TRUE(readWholeFile(directory.file("empty"), read).ok());
    EXPECT_TRUE(read.empty());
}

TEST(WholeFile, AppendAddsToTheEndAndCreatesAMissingFile) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("records.dlf");
    ASSERT_TRUE(writeWholeFile(path, bytesOf("one,"), FileWrite::Append).ok());
    ASSERT_TRUE(writeWholeFile(path, bytesOf("two"), FileWrite::Append).ok());
    EXPECT_EQ(testing::readWholeFile(path), "one,two");
}

TEST(WholeFile, APrivateFileIsOnlyItsOwnersAndNeverWrittenThroughALink) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("snapshot.velmar");
    testing::writeWholeFile(path, "old contents, readable by all");
    ASSERT_EQ(chmod(path.c_str(), 0644), 0);
    ASSERT_TRUE(writeWholeFile(path, bytesOf("new"), FileWrite::Private).ok());
    struct stat info {};
    ASSERT_EQ(stat(path.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777, 0600U);
    EXPECT_EQ(testing::readWholeFile(path), "new");

    const std::string link = directory.file("link.velmar");
    ASSERT_EQ(symlink(path.c_str(), link.c_str()), 0);
    const FileOutcome refused = writeWholeFile(link, bytesOf("through the link"), FileWrite::Private);
    EXPECT_FALSE(refused.ok());
    EXPECT_EQ(refused.message(link), link + ": cannot create: Too many levels of symbolic links");
    EXPECT_EQ(testing::readWholeFile(path), "new");
}

TEST(WholeFile, EachFailedStepIsNamed) {
    testing::TemporaryDirectory directory;
    std::vector<std::uint8_t> bytes = {9};
    const std::string missing = directory.file("none");
    const FileOutcome notThere = readWholeFile(missing, bytes);
    EXPECT_FALSE(notThere.ok());
    EXPECT_EQ(notThere.message(missing), missing + ": cannot open: No such file or directory");
    EXPECT_EQ(notThere.reason(), "No such file or directory");
    EXPECT_TRUE(bytes.empty());

    EXPECT_EQ(readWholeFile(directory.path(), bytes).message(directory.path()),
              directory.path() + ": cannot read: Is a directory");

    const std::string nowhere = directory.file("no/such/dir.hex");
    EXPECT_EQ(writeWholeFile(nowhere, bytesOf("x")).message(nowhere),
              nowhere + ": cannot create: No such file or directory");
    EXPECT_EQ(writeWholeFile(nowhere, bytesOf("x"), FileWrite::Append).message(nowhere),
              nowhere + ": cannot open for appending: No such file or directory");
    // A full device: the write itself fails.
    if (access("/dev/full", W_OK) == 0) {
        EXPECT_EQ(writeWholeFile("/dev/full", bytesOf("x")).message("/dev/full"),
                  "/dev/full: cannot write: No space left on device");
    }
}

}  // namespace
}  // namespace velmar
