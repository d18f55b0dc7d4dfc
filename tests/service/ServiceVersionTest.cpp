// kxserverd's packet-version adapter: every source's blobs reach the channels in the decoded layouts, the
// first record of an unknown (code, version) is logged at warning, and the census at notice on SIGUSR1 and
// on exit.
#include <gtest/gtest.h>

#include <signal.h>

#include <string>
#include <vector>

#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

using VersionTest = ServiceTest;

std::size_t occurrences(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
        ++count;
    }
    return count;
}

TEST_F(VersionTest, AdaptsLogsUnknownVersionsOnceAndTheCensusOnSigusr1AndExit) {
    const std::string input = dataPath("versions.hex");
    const std::vector<PlistData> expected = adaptedBlobsOfFile(input);
    ASSERT_EQ(expected.size(), 4U);
    ServiceProcess& service = startService({"--source", "replay", "--input", input, "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C2, 0x7130}, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= expected.size(); })) << client.blobs().size();
    EXPECT_TRUE(client.blobs() == expected);
    // The version 3 record arrives as version 2, 4 bytes shorter.
    ASSERT_EQ(client.blobs()[2].size(), 38U);
    EXPECT_EQ(client.blobs()[2][13], 2);
    ASSERT_TRUE(service.waitForError("<5> replay: finished after 4 blobs"));
    EXPECT_EQ(occurrences(service.errorOutput(),
                          "<4> unknown record version: log code 0xB0C2 version 9, 33 bytes; "
                          "passed on as recorded\n"),
              1U)
        << service.errorOutput();

    const std::string census =
        "<5> version census: 4 records\n"
        "<5> version census: 0x7130 v- 1 passed on\n"
        "<5> version census: 0xB0C2 v3 1 adapted\n"
        "<5> version census: 0xB0C2 v9 2 unknown version\n";
    service.sendSignal(SIGUSR1);
    ASSERT_TRUE(service.waitForError(census)) << service.errorOutput();
    service.sendSignal(SIGTERM);
    EXPECT_EQ(service.waitForExit(), 0);
    EXPECT_EQ(occurrences(service.errorOutput(), census), 2U) << service.errorOutput();
}

}  // namespace
}  // namespace velmar::testing
