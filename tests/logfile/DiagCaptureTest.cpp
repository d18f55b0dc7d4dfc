#include "logfile/DiagCapture.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <map>
#include <random>
#include <string>
#include <vector>

#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// A log packet of code 0xB0C2 whose payload holds both framing bytes: 0x7E 0x7D 0x20 0x5E.
const Bytes kPacket = {0x10, 0x00, 0x10, 0x00, 0x10, 0x00, 0xC2, 0xB0, 0x11, 0x12,
                       0x13, 0x14, 0x15, 0x16, 0x17, 0x18, 0x7E, 0x7D, 0x20, 0x5E};
// kPacket as the port sends it: escaped, CRC 0x9749 little-endian, terminated.
const Bytes kPacketFrame = {0x10, 0x00, 0x10, 0x00, 0x10, 0x00, 0xC2, 0xB0, 0x11, 0x12, 0x13, 0x14, 0x15,
                            0x16, 0x17, 0x18, 0x7D, 0x5E, 0x7D, 0x5D, 0x20, 0x5E, 0x49, 0x97, 0x7E};
// The blob kPacket yields: type byte 0x01, then the DLF record (bytes 4 onward of the packet).
const Bytes kPacketBlob = {0x01, 0x10, 0x00, 0xC2, 0xB0, 0x11, 0x12, 0x13, 0x14,
                           0x15, 0x16, 0x17, 0x18, 0x7E, 0x7D, 0x20, 0x5E};
// kPacket inside a wrapper for subscription 2, framed (CRC 0x7F4D).
const Bytes kWrappedFrame = {0x98, 0x01, 0x00, 0x00, 0x02, 0x00, 0x00, 0x00, 0x10, 0x00, 0x10,
                             0x00, 0x10, 0x00, 0xC2, 0xB0, 0x11, 0x12, 0x13, 0x14, 0x15, 0x16,
                             0x17, 0x18, 0x7D, 0x5E, 0x7D, 0x5D, 0x20, 0x5E, 0x4D, 0x7F, 0x7E};
// A log packet of code 0x4116 with an empty payload, framed (CRC 0x8C7F).
const Bytes kSmallFrame = {0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x16, 0x41, 0x00, 0x00,
                           0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x7F, 0x8C, 0x7E};
const Bytes kSmallBlob = {0x01, 0x0C, 0x00, 0x16, 0x41, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00};

Bytes concat(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& part : parts) {
        all.insert(all.end(), part.begin(), part.end());
    }
    return all;
}

Bytes framed(const Bytes& content) {
    Bytes out;
    appendDiagFrame(out, content);
    return out;
}

std::vector<Bytes> blobsOf(const LogReadResult& result) {
    std::vector<Bytes> blobs;
    for (const LogItem& item : result.items) {
        EXPECT_TRUE(item.isBlob());
        blobs.push_back(item.bytes);
    }
    return blobs;
}

std::string capturePath(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

TEST(DiagCaptureCrc, MatchesTheStandardCheckValue) {
    const std::string check = "123456789";
    EXPECT_EQ(crc16X25(std::span(reinterpret_cast<const std::uint8_t*>(check.data()), check.size())), 0x906E);
    EXPECT_EQ(crc16X25({}), 0x0000);
    EXPECT_EQ(crc16X25(kPacket), 0x9749);
}

TEST(DiagCapture, UnescapesFramingBytesInsideAFrame) {
    const LogReadResult result = parseDiagCaptureBytes(kPacketFrame, "escaped.qmdl");
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 1U);
    EXPECT_EQ(result.items[0].bytes, kPacketBlob);
    EXPECT_EQ(result.items[0].offset, 0U);
    EXPECT_EQ(result.items[0].line, 0U);
    EXPECT_EQ(result.stats.frames, 1U);
    EXPECT_EQ(result.stats.logPackets, 1U);
    EXPECT_EQ(result.stats.blobs, 1U);
    EXPECT_EQ(result.stats.badFrames, 0U);
    EXPECT_EQ(result.stats.otherFrames, 0U);
    EXPECT_EQ(result.stats.wrappedFrames, 0U);
}

TEST(DiagCapture, WriterProducesThePortsFraming) {
    EXPECT_EQ(framed(kPacket), kPacketFrame);
    const Bytes small = {0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x16, 0x41, 0, 0, 0, 0, 0, 0, 0, 0};
    EXPECT_EQ(framed(small), kSmallFrame);
}

TEST(DiagCapture, EscapedCrcBytesAreUnescapedBeforeTheCheck) {
    // Search for a payload byte that makes the CRC itself contain a framing byte, then read it back.
    for (int value = 0; value < 256; ++value) {
        const Bytes packet = {0x10,
                              0x00,
                              0x0D,
                              0x00,
                              0x0D,
                              0x00,
                              0x01,
                              0x00,
                              0,
                              0,
                              0,
                              0,
                              0,
                              0,
                              0,
                              0,
                              static_cast<std::uint8_t>(value)};
        const std::uint16_t crc = crc16X25(packet);
        const auto low = static_cast<std::uint8_t>(crc & 0xFF);
        const auto high = static_cast<std::uint8_t>(crc >> 8);
        if (low != 0x7E && low != 0x7D && high != 0x7E && high != 0x7D) {
            continue;
        }
        const Bytes stream = framed(packet);
        EXPECT_EQ(stream.size(), packet.size() + 4);  // one escape in the CRC, the terminator
        const LogReadResult result = parseDiagCaptureBytes(stream, "crc.qmdl");
        ASSERT_EQ(result.items.size(), 1U);
        Bytes blob = {0x01};
        blob.insert(blob.end(), packet.begin() + 4, packet.end());
        EXPECT_EQ(result.items[0].bytes, blob);
        EXPECT_EQ(result.stats.badFrames, 0U);
        return;
    }
    FAIL() << "no payload byte gives a CRC holding 0x7E or 0x7D";
}

TEST(DiagCapture, BadCrcIsCountedLoggedAndSkipped) {
    Bytes damaged = kSmallFrame;
    damaged[8] ^= 0x01;  // one bit of the timestamp
    const Bytes stream = concat({damaged, kPacketFrame});
    testing::LogCapture log;
    const LogReadResult result = parseDiagCaptureBytes(stream, "noisy.qmdl");
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(blobsOf(result), std::vector<Bytes>{kPacketBlob});
    EXPECT_EQ(result.items[0].offset, kSmallFrame.size());
    EXPECT_EQ(result.stats.frames, 2U);
    EXPECT_EQ(result.stats.badFrames, 1U);
    EXPECT_EQ(result.stats.logPackets, 1U);
    EXPECT_EQ(result.stats.badFrameOffsets, std::vector<std::uint64_t>{0});
    const std::string expected =
        "noisy.qmdl: offset 0: bad frame: CRC 0x8C7F does not match the computed 0x0DC0";
    ASSERT_EQ(result.stats.problems.size(), 1U);
    EXPECT_EQ(result.stats.problems[0], expected);
    EXPECT_EQ(log.textsAt(kLogWarning), std::vector<std::string>{expected});
}

TEST(DiagCapture, UnwrapsAWrappedFrame) {
    const LogReadResult result = parseDiagCaptureBytes(concat({kSmallFrame, kWrappedFrame}), "multi.qmdl");
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(blobsOf(result), (std::vector<Bytes>{kSmallBlob, kPacketBlob}));
    EXPECT_EQ(result.items[1].offset, kSmallFrame.size());
    EXPECT_EQ(result.stats.frames, 2U);
    EXPECT_EQ(result.stats.logPackets, 2U);
    EXPECT_EQ(result.stats.wrappedFrames, 1U);
    EXPECT_EQ(result.stats.badFrames, 0U);
}

TEST(DiagCapture, UnwrapsNestedWrappersUpToTheLimit) {
    const Bytes header = {0x98, 0x01, 0x00, 0x00, 0x05, 0x00, 0x00, 0x00};
    Bytes content = kPacket;
    for (int depth = 1; depth <= kMaxDiagWrapperDepth; ++depth) {
        content.insert(content.begin(), header.begin(), header.end());
        const LogReadResult result = parseDiagCaptureBytes(framed(content), "nested.qmdl");
        EXPECT_EQ(blobsOf(result), std::vector<Bytes>{kPacketBlob}) << "depth " << depth;
        EXPECT_EQ(result.stats.wrappedFrames, 1U);
    }
    content.insert(content.begin(), header.begin(), header.end());
    const LogReadResult tooDeep = parseDiagCaptureBytes(framed(content), "nested.qmdl");
    EXPECT_TRUE(tooDeep.items.empty());
    EXPECT_EQ(tooDeep.stats.badFrames, 1U);
    ASSERT_EQ(tooDeep.stats.problems.size(), 1U);
    EXPECT_EQ(tooDeep.stats.problems[0],
              "nested.qmdl: offset 0: bad frame: wrappers nested deeper than 4 levels");
}

TEST(DiagCapture, WrapperWithoutInnerFrameIsBadAndOtherVersionsAreOther) {
    const LogReadResult empty =
        parseDiagCaptureBytes(framed({0x98, 0x01, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00}), "w.qmdl");
    EXPECT_TRUE(empty.items.empty());
    EXPECT_EQ(empty.stats.badFrames, 1U);
    ASSERT_EQ(empty.stats.problems.size(), 1U);
    EXPECT_EQ(empty.stats.problems[0], "w.qmdl: offset 0: bad frame: wrapper of 8 bytes holds no frame");

    Bytes otherVersion = kPacket;
    const Bytes header = {0x98, 0x02, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00};
    otherVersion.insert(otherVersion.begin(), header.begin(), header.end());
    const LogReadResult other = parseDiagCaptureBytes(framed(otherVersion), "w.qmdl");
    EXPECT_TRUE(other.items.empty());
    EXPECT_EQ(other.stats.otherFrames, 1U);
    EXPECT_EQ(other.stats.badFrames, 0U);
    EXPECT_EQ(other.stats.wrappedFrames, 0U);

    const LogReadResult reply = parseDiagCaptureBytes(
        framed({0x98, 0x01, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00, 0x4B, 0x12, 0x0F, 0x02}), "w.qmdl");
    EXPECT_TRUE(reply.items.empty());
    EXPECT_EQ(reply.stats.otherFrames, 1U);
    EXPECT_EQ(reply.stats.wrappedFrames, 1U);
    EXPECT_EQ(reply.stats.badFrames, 0U);
}

TEST(DiagCapture, CommandRepliesAreCountedAsOtherAndEmptyFramesIgnored) {
    const Bytes reply = framed({0x4B, 0x12, 0x0F, 0x02});
    const Bytes stream = concat({{0x7E, 0x7E}, reply, {0x7E}, kSmallFrame, {0x7E}});
    const LogReadResult result = parseDiagCaptureBytes(stream, "mixed.qmdl");
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(blobsOf(result), std::vector<Bytes>{kSmallBlob});
    EXPECT_EQ(result.items[0].offset, 2 + reply.size() + 1);
    EXPECT_EQ(result.stats.frames, 2U);
    EXPECT_EQ(result.stats.otherFrames, 1U);
    EXPECT_EQ(result.stats.logPackets, 1U);
    EXPECT_EQ(result.stats.badFrames, 0U);
    EXPECT_TRUE(result.stats.problems.empty());
}

TEST(DiagCapture, ShortFramesDanglingEscapesAndUnterminatedTailsAreBad) {
    // A 2-byte frame, a frame ending in a bare escape, a good packet, then bytes with no terminator.
    const Bytes stream =
        concat({{0x01, 0x02, 0x7E}, {0x10, 0x22, 0x7D, 0x7E}, kSmallFrame, {0x10, 0x00, 0x0C}});
    const LogReadResult result = parseDiagCaptureBytes(stream, "cut.qmdl");
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(blobsOf(result), std::vector<Bytes>{kSmallBlob});
    EXPECT_EQ(result.stats.frames, 4U);
    EXPECT_EQ(result.stats.badFrames, 3U);
    EXPECT_EQ(result.stats.logPackets, 1U);
    EXPECT_EQ(result.stats.badFrameOffsets, (std::vector<std::uint64_t>{0, 3, 26}));
    EXPECT_EQ(
        result.stats.problems,
        (std::vector<std::string>{"cut.qmdl: offset 0: bad frame: 2 bytes are too few for a frame",
                                  "cut.qmdl: offset 3: bad frame: escape byte 0x7D at the end of the frame",
                                  "cut.qmdl: offset 26: bad frame: no 0x7E after the last 3 bytes"}));
}

TEST(DiagCapture, RecordLengthsOutsideThePacketAreBad) {
    // len2 of 11 (below the DLF header) and of 17 (one more than the 16 bytes present).
    const Bytes shortRecord = {0x10, 0x00, 0x10, 0x00, 0x0B, 0x00, 0xC2, 0xB0, 0, 0,
                               0,    0,    0,    0,    0,    0,    1,    2,    3, 4};
    const Bytes longRecord = {0x10, 0x00, 0x10, 0x00, 0x11, 0x00, 0xC2, 0xB0, 0, 0,
                              0,    0,    0,    0,    0,    0,    1,    2,    3, 4};
    const Bytes tiny = {0x10, 0x00, 0x10, 0x00, 0x0B};
    const Bytes first = framed(shortRecord);
    const Bytes second = framed(longRecord);
    const LogReadResult result = parseDiagCaptureBytes(concat({first, second, framed(tiny)}), "len.qmdl");
    EXPECT_TRUE(result.items.empty());
    EXPECT_EQ(result.stats.badFrames, 3U);
    EXPECT_EQ(result.stats.logPackets, 0U);
    const std::string secondOffset = std::to_string(first.size());
    const std::string thirdOffset = std::to_string(first.size() + second.size());
    EXPECT_EQ(result.stats.problems,
              (std::vector<std::string>{
                  "len.qmdl: offset 0: bad frame: record length 11 is shorter than the 12-byte header",
                  "len.qmdl: offset " + secondOffset +
                      ": bad frame: record length 17 runs past the end of the 20-byte log packet",
                  "len.qmdl: offset " + thirdOffset +
                      ": bad frame: log packet of 5 bytes is too short for a record length"}));
}

TEST(DiagCapture, ReportsOnlyTheFirstBadFramesButCountsThemAll) {
    Bytes stream;
    for (int i = 0; i < 20; ++i) {
        stream.insert(stream.end(), {0x01, 0x7E});
    }
    testing::LogCapture log;
    const LogReadResult result = parseDiagCaptureBytes(stream, "junk.qmdl");
    EXPECT_EQ(result.stats.badFrames, 20U);
    EXPECT_EQ(result.stats.problems.size(), kMaxReportedProblems);
    EXPECT_EQ(result.stats.badFrameOffsets.size(), kMaxReportedProblems);
    EXPECT_EQ(result.stats.badFrameOffsets.back(), 2 * (kMaxReportedProblems - 1));
    const std::vector<std::string> warnings = log.textsAt(kLogWarning);
    ASSERT_EQ(warnings.size(), kMaxReportedProblems + 1);
    EXPECT_EQ(warnings.back(), "junk.qmdl: 12 more bad frames skipped");
}

TEST(DiagCapture, CallbackCanStopTheReader) {
    const Bytes stream = concat({kSmallFrame, kPacketFrame, kSmallFrame});
    std::vector<Bytes> seen;
    std::string error;
    LogReadStats stats;
    const bool ok = scanDiagCaptureBytes(
        stream, "stop.qmdl",
        [&seen](const LogItemView& item) {
            seen.emplace_back(item.bytes.begin(), item.bytes.end());
            return seen.size() < 2;
        },
        error, &stats);
    EXPECT_TRUE(ok);
    EXPECT_TRUE(error.empty());
    EXPECT_EQ(seen, (std::vector<Bytes>{kSmallBlob, kPacketBlob}));
    EXPECT_EQ(stats.logPackets, 2U);
}

TEST(DiagCapture, MissingFileIsAnError) {
    const LogReadResult result = readDiagCapture("/nonexistent/velmar/none.qmdl");
    EXPECT_FALSE(result.ok());
    EXPECT_EQ(result.error, "/nonexistent/velmar/none.qmdl: cannot open: No such file or directory");
}

TEST(DiagCapture, DetectedByExtensionAndByContent) {
    EXPECT_EQ(logFormatForExtension("/x/trace.qmdl"), LogFormat::DiagCapture);
    EXPECT_EQ(logFormatForExtension("TRACE.QMDL"), LogFormat::DiagCapture);
    EXPECT_EQ(parseLogFormatName("qmdl"), LogFormat::DiagCapture);
    EXPECT_EQ(logFormatName(LogFormat::DiagCapture), "qmdl");
    EXPECT_EQ(logFormatForContent(concat({kSmallFrame, kPacketFrame})), LogFormat::DiagCapture);
    // A capture that starts in the middle of a frame is still recognised by the frames after it.
    EXPECT_EQ(logFormatForContent(concat({{0x33, 0x44, 0x7E}, kWrappedFrame})), LogFormat::DiagCapture);

    testing::TemporaryDirectory directory;
    const std::string path = directory.file("capture.bin");
    const Bytes stream = concat({kPacketFrame, kWrappedFrame});
    testing::writeWholeFile(path, std::string(stream.begin(), stream.end()));
    std::string error;
    EXPECT_EQ(detectLogFormat(path, error), LogFormat::DiagCapture) << error;
    const LogReadResult result = readLogFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(blobsOf(result), (std::vector<Bytes>{kPacketBlob, kPacketBlob}));
    EXPECT_EQ(result.stats.wrappedFrames, 1U);
}

struct CaptureExpectation {
    const char* file;
    std::uint64_t frames;
    std::uint64_t logPackets;
    std::uint64_t otherFrames;
    std::uint64_t badFrames;
    std::uint64_t wrappedFrames;
    std::vector<std::uint64_t> badFrameOffsets;
    std::uint64_t blobBytes;
    std::map<std::uint16_t, std::uint64_t> codeCounts;
};

// Counts made independently of this reader, from the recorded streams.
const std::vector<CaptureExpectation> kCaptures = {
    {"nas-lte-1.qmdl", 5501, 5483, 17, 1, 0, {0}, 281200, {{0xB0C0, 4343}, {0xB0C1, 97}, {0xB0C2, 62}}},
    {"lte-connected-1.qmdl", 2167, 2167, 0, 0, 0, {}, 510641, {{0xB179, 237}, {0xB0C2, 3}}},
    {"mixed-large-1.qmdl", 47107, 47087, 19, 1, 0, {0}, 2482752, {{0x4116, 14011}, {0xB0C2, 840}}},
    {"multisim-1.qmdl", 1209, 1207, 1, 1, 1207, {10473}, 87609, {{0xB0C1, 53}, {0xB0C2, 28}}},
};

TEST(DiagCaptureSamples, ReproduceTheRecordedCounts) {
    for (const CaptureExpectation& expected : kCaptures) {
        SCOPED_TRACE(expected.file);
        const std::string path = capturePath(expected.file);
        std::map<std::uint16_t, std::uint64_t> codes;
        std::uint64_t blobBytes = 0;
        std::uint64_t malformed = 0;
        std::uint64_t previousOffset = 0;
        bool ordered = true;
        LogReadStats stats;
        std::string error;
        const auto started = std::chrono::steady_clock::now();
        const bool ok = forEachDiagCaptureItem(
            path,
            [&](const LogItemView& item) {
                const std::size_t length = item.bytes.size() >= 3 ? item.bytes[1] | item.bytes[2] << 8 : 0;
                if (!item.isBlob() || item.bytes.size() < 13 || item.bytes[0] != 0x01 ||
                    length != item.bytes.size() - 1) {
                    ++malformed;
                    return true;
                }
                ++codes[static_cast<std::uint16_t>(item.bytes[3] | item.bytes[4] << 8)];
                blobBytes += item.bytes.size();
                ordered = ordered && item.offset >= previousOffset;
                previousOffset = item.offset;
                return true;
            },
            error, &stats);
        const auto elapsed =
            std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - started);
        std::printf("%s: %.1f ms\n", expected.file, elapsed.count());
        ASSERT_TRUE(ok) << error;
        EXPECT_EQ(malformed, 0U);
        EXPECT_TRUE(ordered);
        EXPECT_EQ(stats.logPackets, expected.logPackets);
        EXPECT_EQ(stats.blobs, expected.logPackets);
        EXPECT_EQ(stats.frames, expected.frames);
        EXPECT_EQ(stats.otherFrames, expected.otherFrames);
        EXPECT_EQ(stats.badFrames, expected.badFrames);
        EXPECT_EQ(stats.wrappedFrames, expected.wrappedFrames);
        EXPECT_EQ(stats.frames, stats.logPackets + stats.otherFrames + stats.badFrames);
        EXPECT_EQ(stats.badFrameOffsets, expected.badFrameOffsets);
        EXPECT_EQ(blobBytes, expected.blobBytes);
        for (const auto& [code, count] : expected.codeCounts) {
            EXPECT_EQ(codes[code], count) << "code " << code;
        }
    }
}

TEST(DiagCaptureSamples, CollectingAndAutoDetectedReadsAgreeWithStreaming) {
    const std::string path = capturePath("nas-lte-1.qmdl");
    const LogReadResult collected = readDiagCapture(path);
    ASSERT_TRUE(collected.ok()) << collected.error;
    const LogReadResult automatic = readLogFile(path, LogFormat::Auto);
    ASSERT_TRUE(automatic.ok()) << automatic.error;
    EXPECT_EQ(collected.items.size(), 5483U);
    EXPECT_TRUE(collected.items == automatic.items);

    // Content detection alone, with the extension hidden.
    const std::string contents = testing::readWholeFile(path);
    ASSERT_FALSE(contents.empty());
    EXPECT_EQ(logFormatForContent(std::span(reinterpret_cast<const std::uint8_t*>(contents.data()),
                                            std::min<std::size_t>(contents.size(), kLogFormatProbeSize))),
              LogFormat::DiagCapture);
}

TEST(DiagCaptureSamples, RandomDamageKeepsEveryBlobWellFormed) {
    const std::string contents = testing::readWholeFile(capturePath("nas-lte-1.qmdl"));
    ASSERT_GT(contents.size(), 20000U);
    const Bytes original(contents.begin(), contents.begin() + 20000);
    std::mt19937 random(12345);
    std::uint64_t totalBad = 0;
    std::uint64_t totalBlobs = 0;
    for (int round = 0; round < 200; ++round) {
        Bytes damaged = original;
        // Flip bytes, favouring the framing bytes, and cut the stream at a random place.
        for (int flips = 0; flips < 8; ++flips) {
            const std::size_t at = random() % damaged.size();
            const std::uint8_t choices[] = {0x7E, 0x7D, 0x98, 0x10, static_cast<std::uint8_t>(random())};
            damaged[at] = choices[random() % 5];
        }
        damaged.resize(random() % damaged.size());
        LogReadStats stats;
        std::string error;
        std::uint64_t malformed = 0;
        ASSERT_TRUE(scanDiagCaptureBytes(
            damaged, "damaged.qmdl",
            [&](const LogItemView& item) {
                const bool wellFormed =
                    item.bytes.size() >= 13 && item.bytes[0] == 0x01 &&
                    static_cast<std::size_t>(item.bytes[1] | item.bytes[2] << 8) == item.bytes.size() - 1 &&
                    item.offset < damaged.size();
                malformed += wellFormed ? 0 : 1;
                return true;
            },
            error, &stats));
        EXPECT_EQ(malformed, 0U);
        EXPECT_EQ(stats.frames, stats.logPackets + stats.otherFrames + stats.badFrames);
        EXPECT_EQ(stats.blobs, stats.logPackets);
        totalBad += stats.badFrames;
        totalBlobs += stats.blobs;
    }
    EXPECT_GT(totalBad, 200U);
    EXPECT_GT(totalBlobs, 10000U);
}

}  // namespace
}  // namespace velmar
