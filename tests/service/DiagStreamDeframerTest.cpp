#include "logfile/DiagStreamDeframer.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "logfile/DiagCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// A log packet of code 0x4116 with an empty payload, framed (CRC 0x8C7F), and the blob it yields.
const Bytes kSmallFrame = {0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x16, 0x41, 0x00, 0x00,
                           0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x7F, 0x8C, 0x7E};
const Bytes kSmallBlob = {0x01, 0x0C, 0x00, 0x16, 0x41, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00};

struct Seen {
    std::vector<Bytes> blobs;
    std::vector<std::uint64_t> offsets;
};

LogItemCallback keepInto(Seen& seen) {
    return [&seen](const LogItemView& item) {
        seen.blobs.emplace_back(item.bytes.begin(), item.bytes.end());
        seen.offsets.push_back(item.offset);
        return true;
    };
}

// Feeds bytes in pieces of the given sizes, round robin, then finishes.
void feedInPieces(DiagStreamDeframer& deframer, const Bytes& bytes, const std::vector<std::size_t>& pieces) {
    std::size_t offset = 0;
    for (std::size_t turn = 0; offset < bytes.size(); ++turn) {
        const std::size_t size = std::min(pieces[turn % pieces.size()], bytes.size() - offset);
        deframer.feed(std::span(bytes.data() + offset, size));
        offset += size;
    }
    deframer.finish();
}

TEST(DiagStreamDeframer, CompletesAFrameCutAnywhereBetweenTwoChunks) {
    Bytes stream = {0x7E, 0x7E};  // two empty frames first: the packet starts at offset 2
    stream.insert(stream.end(), kSmallFrame.begin(), kSmallFrame.end());
    for (std::size_t cut = 0; cut <= stream.size(); ++cut) {
        Seen seen;
        LogReadStats stats;
        DiagStreamDeframer deframer("port", keepInto(seen), &stats);
        deframer.feed(std::span(stream.data(), cut));
        deframer.feed(std::span(stream.data() + cut, stream.size() - cut));
        deframer.finish();
        ASSERT_EQ(seen.blobs, std::vector<Bytes>{kSmallBlob}) << "cut at " << cut;
        EXPECT_EQ(seen.offsets, std::vector<std::uint64_t>{2});
        EXPECT_EQ(stats.frames, 1U);
        EXPECT_EQ(stats.badFrames, 0U);
        EXPECT_EQ(deframer.consumed(), stream.size());
    }
}

TEST(DiagStreamDeframer, AnyChunkingOfARealCaptureMatchesTheFileReader) {
    const std::string contents =
        testing::readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/samples/captures/multisim-1.qmdl");
    const Bytes capture(contents.begin(), contents.end());
    ASSERT_GT(capture.size(), 100000U);
    const LogReadResult whole = parseDiagCaptureBytes(capture, "port");
    ASSERT_EQ(whole.items.size(), 1207U);
    for (const std::vector<std::size_t>& pieces :
         {std::vector<std::size_t>{1}, {2, 3, 5, 7}, {4096}, {65536, 1, 100}}) {
        Seen seen;
        LogReadStats stats;
        DiagStreamDeframer deframer("port", keepInto(seen), &stats);
        feedInPieces(deframer, capture, pieces);
        ASSERT_EQ(seen.blobs.size(), whole.items.size());
        for (std::size_t i = 0; i < seen.blobs.size(); ++i) {
            ASSERT_EQ(seen.blobs[i], whole.items[i].bytes) << "blob " << i;
            ASSERT_EQ(seen.offsets[i], whole.items[i].offset) << "blob " << i;
        }
        EXPECT_EQ(stats.frames, whole.stats.frames);
        EXPECT_EQ(stats.badFrames, whole.stats.badFrames);
        EXPECT_EQ(stats.otherFrames, whole.stats.otherFrames);
        EXPECT_EQ(stats.wrappedFrames, whole.stats.wrappedFrames);
        EXPECT_EQ(stats.problems, whole.stats.problems);
    }
}

TEST(DiagStreamDeframer, AnOverlongFrameIsBadAndTheStreamGoesOn) {
    Bytes stream(300000, 0x00);
    stream.push_back(0x7E);
    stream.insert(stream.end(), kSmallFrame.begin(), kSmallFrame.end());
    const std::vector<std::string> expectedProblems = {
        "port: offset 0: bad frame: frame longer than 262144 bytes"};

    Seen seen;
    LogReadStats stats;
    DiagStreamDeframer deframer("port", keepInto(seen), &stats);
    feedInPieces(deframer, stream, {4096});
    EXPECT_EQ(seen.blobs, std::vector<Bytes>{kSmallBlob});
    EXPECT_EQ(seen.offsets, std::vector<std::uint64_t>{300001});
    EXPECT_EQ(stats.frames, 2U);
    EXPECT_EQ(stats.badFrames, 1U);
    EXPECT_EQ(stats.problems, expectedProblems);

    // A capture file is no port: there such a frame says the input is no capture (or one that never ends a
    // frame), and the reading ends with an error instead of going on.
    std::string error;
    LogReadStats fileStats;
    std::size_t blobs = 0;
    EXPECT_FALSE(scanDiagCaptureBytes(
        stream, "cap.qmdl",
        [&blobs](const LogItemView&) {
            ++blobs;
            return true;
        },
        error, &fileStats));
    EXPECT_EQ(error, "cap.qmdl: offset 0: frame longer than 262144 bytes");
    EXPECT_EQ(blobs, 0U);
    EXPECT_EQ(fileStats.badFrames, 1U);
}

TEST(DiagStreamDeframer, FinishEndsAnInputAndOffsetsKeepCounting) {
    Seen seen;
    LogReadStats stats;
    DiagStreamDeframer deframer("port", keepInto(seen), &stats);
    deframer.feed(std::span(kSmallFrame.data(), kSmallFrame.size() - 1));  // the writer went before the 0x7E
    deframer.finish();
    EXPECT_TRUE(seen.blobs.empty());
    EXPECT_EQ(stats.problems,
              std::vector<std::string>{"port: offset 0: bad frame: no 0x7E after the last 18 bytes"});
    deframer.feed(kSmallFrame);
    deframer.finish();
    EXPECT_EQ(seen.blobs, std::vector<Bytes>{kSmallBlob});
    EXPECT_EQ(seen.offsets, std::vector<std::uint64_t>{18});
    EXPECT_EQ(stats.frames, 2U);
    EXPECT_EQ(stats.badFrames, 1U);
}

TEST(DiagStreamDeframer, StopsWhenTheCallbackSaysSo) {
    std::size_t calls = 0;
    DiagStreamDeframer deframer("port", [&calls](const LogItemView&) { return ++calls < 2; });
    Bytes stream;
    for (int i = 0; i < 3; ++i) {
        stream.insert(stream.end(), kSmallFrame.begin(), kSmallFrame.end());
    }
    deframer.feed(stream);
    deframer.feed(kSmallFrame);
    deframer.finish();
    EXPECT_EQ(calls, 2U);
    EXPECT_TRUE(deframer.stopped());
    EXPECT_EQ(deframer.stats().logPackets, 2U);
}

}  // namespace
}  // namespace velmar
