// kxserverd reading a live diagnostic port: a FIFO fed with a real two-SIM capture in odd-sized pieces
// (the lowest subscription streams), then a second writer after the first one closed it.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <string>
#include <thread>
#include <vector>

#include "tests/support/LiveModem.h"
#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

using LiveTest = ServiceTest;

// Writes bytes into the FIFO in pieces of the given sizes, round robin, then closes it.
void feedFifo(const std::string& path, const std::string& bytes, std::vector<std::size_t> pieces) {
    const int fd = open(path.c_str(), O_WRONLY | O_CLOEXEC);
    if (fd < 0) {
        return;
    }
    std::size_t offset = 0;
    for (std::size_t turn = 0; offset < bytes.size(); ++turn) {
        const std::size_t size = std::min(pieces[turn % pieces.size()], bytes.size() - offset);
        const ssize_t written = write(fd, bytes.data() + offset, size);
        if (written <= 0) {
            break;
        }
        offset += static_cast<std::size_t>(written);
    }
    close(fd);
}

TEST_F(LiveTest, ReadsACaptureThroughAFifoAndTheNextWriterToo) {
    const std::string fifo = files_.file("diag");
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    const std::string capture = samplePath("multisim-1.qmdl");
    const std::vector<PlistData> expected = adaptedBlobs(captureBlobs(capture, 1));
    ASSERT_EQ(expected.size(), 734U);

    ServiceProcess& service = startService({"--source", "live", "--device", fifo, "--modem-manager", "off"});
    KxTestClient& client = newClient();
    std::vector<std::int64_t> codes = codesOf(blobsOfFile(capture));
    codes.push_back(0x4116);
    ASSERT_TRUE(client.start(codes, {}));
    ASSERT_TRUE(client.technology());  // the start command has been read when this is answered

    std::thread writer(feedFifo, fifo, readWholeFile(capture),
                       std::vector<std::size_t>{1, 333, 4096, 7, 65536});
    const bool all = runUntil([&] { return client.blobs().size() >= expected.size(); });
    writer.join();
    ASSERT_TRUE(all) << client.blobs().size();
    EXPECT_TRUE(client.blobs() == expected);
    EXPECT_TRUE(
        service.waitForError("<5> live: " + fifo + ": the stream ended after 734 blobs; opening it again"));
    EXPECT_TRUE(
        service.waitForError("<5> live: streaming subscription 1 (the lowest seen; --subscription picks "
                             "another)\n<5> live: subscription 2: not streamed (streaming subscription 1)\n"))
        << service.errorOutput();

    // A log packet of code 0x4116 with an empty payload, as the port frames it (CRC 0x8C7F).
    const std::string frame("\x10\x00\x0c\x00\x0c\x00\x16\x41\x00\x00\x00\x00\x00\x00\x00\x00\x7f\x8c\x7e",
                            19);
    std::thread second(feedFifo, fifo, frame, std::vector<std::size_t>{5});
    const bool more = runUntil([&] { return client.blobs().size() >= expected.size() + 1; });
    second.join();
    ASSERT_TRUE(more);
    EXPECT_EQ(hexOf(client.blobs().back()), "01 0c 00 16 41 00 00 00 00 00 00 00 00");
}

}  // namespace
}  // namespace velmar::testing
