// kxserverd replaying recorded logs: pace, --fast, --loop, the idle service after the end, and every
// recorded format.
#include <gtest/gtest.h>

#include <signal.h>

#include <algorithm>
#include <chrono>
#include <string>
#include <vector>

#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

using ReplayTest = ServiceTest;

std::vector<PlistData> withCodes(const std::vector<PlistData>& blobs, std::initializer_list<int> codes) {
    std::vector<PlistData> kept;
    for (const PlistData& blob : blobs) {
        const int code = blob[3] | blob[4] << 8;
        if (blob[0] == 0x01 && std::find(codes.begin(), codes.end(), code) != codes.end()) {
            kept.push_back(blob);
        }
    }
    return kept;
}

TEST_F(ReplayTest, FastReplayDeliversAWholeCaptureByteExact) {
    const std::string capture = samplePath("mixed-large-1.qmdl");
    // Byte exact as the version adapter hands the records on: the capture's 0xB0C1 version 2, 0xB0C2
    // version 3 and 0x7150 records in the decoded layouts, every other blob as recorded.
    const std::vector<PlistData> expected = adaptedBlobsOfFile(capture);
    ASSERT_EQ(expected.size(), 47087U);
    const std::vector<PlistData> recorded = blobsOfFile(capture);
    std::size_t rewritten = 0;
    for (std::size_t i = 0; i < expected.size(); ++i) {
        rewritten += expected[i] == recorded[i] ? 0 : 1;
    }
    EXPECT_EQ(rewritten, 559U + 840U + 94U);
    ServiceProcess& service = startService({"--source", "replay", "--input", capture, "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(codesOf(expected), {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= expected.size(); })) << client.blobs().size();
    EXPECT_EQ(client.blobs().size(), expected.size());
    EXPECT_TRUE(client.blobs() == expected);
    EXPECT_TRUE(service.waitForError("<5> replay: finished after 47087 blobs"));
    EXPECT_EQ(service.errorOutput().find("dropped"), std::string::npos);
}

TEST_F(ReplayTest, FastReplayFiltersARealCapture) {
    const std::string capture = samplePath("nas-lte-1.qmdl");
    const std::vector<PlistData> expected = withCodes(adaptedBlobsOfFile(capture), {0xB0C1, 0xB0C2});
    ASSERT_FALSE(expected.empty());
    startService({"--source", "replay", "--input", capture, "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C1, 0xB0C2}, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= expected.size(); })) << client.blobs().size();
    EXPECT_TRUE(client.blobs() == expected);
}

TEST_F(ReplayTest, ReplayFollowsTheRecordedTimestamps) {
    // paced-2s.hex spans 2 seconds of baseband time; a looped round takes that long plus one 20 ms step.
    startService({"--source", "replay", "--input", dataPath("paced-2s.hex"), "--loop"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C1}, {}));
    const auto payload = [&](std::size_t index) { return client.blobs()[index].back(); };
    // Two arrivals of the recording's first blob, one round apart.
    const auto firstBlobTwice = [&] {
        return std::count_if(client.blobs().begin(), client.blobs().end(),
                             [](const PlistData& blob) { return blob.back() == 0x01; }) >= 2;
    };
    ASSERT_TRUE(runUntil(firstBlobTwice, 30));
    std::vector<std::size_t> firsts;
    for (std::size_t i = 0; i < client.blobs().size(); ++i) {
        if (payload(i) == 0x01) {
            firsts.push_back(i);
        }
    }
    ASSERT_GE(firsts.size(), 2U);
    const double round =
        std::chrono::duration<double>(client.arrivals()[firsts[1]] - client.arrivals()[firsts[0]]).count();
    EXPECT_GE(round, 1.0) << "a 2-second recording went round in " << round << " s";
    // In between, the other four, in order.
    ASSERT_EQ(firsts[1] - firsts[0], 5U);
    for (std::size_t i = 0; i < 5; ++i) {
        EXPECT_EQ(payload(firsts[0] + i), i + 1);
    }
}

TEST_F(ReplayTest, LoopStartsAgainAtTheEnd) {
    startService({"--source", "replay", "--input", dataPath("filter.hex"), "--fast", "--loop"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C1, 0xB179}, {1}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 16; }));
    // Lines 1, 3, 5, 8 and 12 of filter.hex, round after round from the first.
    const std::vector<std::string> round = {
        "01 0e 00 c1 b0 00 00 00 00 00 00 00 00 aa bb",       "ff 0d 00 01 00 00 00 00 00 00 00 00 00 01",
        "81 07 01 0e 00 79 b1 00 00 00 00 00 00 00 00 11 22", "01 0d 00 c1 b0 00 00 00 00 00 00 00 00 ee",
        "01 0d 00 79 b1 00 00 00 00 00 00 00 00 ff",
    };
    for (std::size_t i = 0; i < 16; ++i) {
        EXPECT_EQ(hexOf(client.blobs()[i]), round[i % round.size()]) << "blob " << i;
    }
}

TEST_F(ReplayTest, AfterTheEndTheServiceStaysUpIdleWithItsChannelsOpen) {
    ServiceProcess& service =
        startService({"--source", "replay", "--input", dataPath("filter.hex"), "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB179}, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 2; }));
    ASSERT_TRUE(service.waitForError("<5> replay: finished after 12 blobs"));
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
    KxTestClient& late = newClient();
    EXPECT_EQ(late.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
    EXPECT_FALSE(service.waitForExit(0.1).has_value());
    EXPECT_TRUE(client.receivePortValid());
    service.sendSignal(SIGTERM);
    EXPECT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0));
}

TEST_F(ReplayTest, ARecordingWithoutBlobsServesNothing) {
    ServiceProcess& service =
        startService({"--source", "replay", "--input", dataPath("empty.hex"), "--loop"});
    EXPECT_TRUE(service.waitForError("<5> replay: the recording holds no blobs; nothing to send"));
    KxTestClient& client = newClient();
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
}

TEST_F(ReplayTest, ReplaysDlfRecordsAsBlobs) {
    // Two DLF records: [length][code][timestamp][payload], the length counting the whole record.
    const std::string records = std::string("\x0e\x00\xc1\xb0\x00\x00\x00\x00\x00\x00\x00\x00\x12\x34", 14) +
                                std::string("\x0d\x00\xc2\xb0\x00\x00\x00\x00\x00\x00\x00\x00\x56", 13);
    const std::string path = files_.file("two.dlf");
    writeWholeFile(path, records);
    startService({"--source", "replay", "--input", path, "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C1, 0xB0C2}, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 2; }));
    ASSERT_EQ(client.blobs().size(), 2U);
    EXPECT_EQ(hexOf(client.blobs()[0]), "01 0e 00 c1 b0 00 00 00 00 00 00 00 00 12 34");
    EXPECT_EQ(hexOf(client.blobs()[1]), "01 0d 00 c2 b0 00 00 00 00 00 00 00 00 56");
}

}  // namespace
}  // namespace velmar::testing
