#include "logfile/LogByteStream.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "logfile/DiagCapture.h"
#include "logfile/DlfFile.h"
#include "logfile/HexBlobFile.h"
#include "logfile/LogFormat.h"
#include "logfile/SnapshotFile.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// A log packet [0x10][0][len][len][code][timestamp][payload] holding payloadSize bytes, some of them framing
// bytes so that escapes fall on the buffer's ends too.
Bytes logPacket(std::uint16_t code, std::size_t payloadSize, std::uint8_t seed) {
    const std::size_t length = kDlfHeaderSize + payloadSize;
    Bytes packet = {0x10,
                    0x00,
                    static_cast<std::uint8_t>(length),
                    static_cast<std::uint8_t>(length >> 8),
                    static_cast<std::uint8_t>(length),
                    static_cast<std::uint8_t>(length >> 8),
                    static_cast<std::uint8_t>(code),
                    static_cast<std::uint8_t>(code >> 8)};
    for (int i = 0; i < 8; ++i) {
        packet.push_back(static_cast<std::uint8_t>(seed + i));
    }
    for (std::size_t i = 0; i < payloadSize; ++i) {
        packet.push_back(i % 5 == 0 ? 0x7E : i % 7 == 0 ? 0x7D : static_cast<std::uint8_t>(seed * 3 + i));
    }
    return packet;
}

// Three log packets, an empty frame and a command reply: 0x7E and 0x7D inside, so escapes are split too.
Bytes smallCapture() {
    Bytes capture;
    appendDiagFrame(capture, logPacket(0xB0C2, 9, 1));
    capture.push_back(0x7E);
    appendDiagFrame(capture, Bytes{0x4B, 0x12, 0x7E, 0x7D});
    appendDiagFrame(capture, logPacket(0xB193, 23, 2));
    appendDiagFrame(capture, logPacket(0x4116, 0, 3));
    return capture;
}

struct Seen {
    std::vector<LogItem> items;
    LogReadStats stats;
    std::string error;
    bool ok = false;
};

template <typename Scan>
Seen readThrough(LogByteStream& stream, const std::string& name, Scan scan) {
    Seen seen;
    seen.ok = scan(
        stream, name,
        [&seen](const LogItemView& item) {
            seen.items.push_back(item.toItem());
            return true;
        },
        seen.error, &seen.stats);
    return seen;
}

Seen readFileThrough(const std::string& path, std::size_t capacity, auto scan) {
    LogByteStream stream(capacity);
    std::string error;
    EXPECT_TRUE(stream.open(path, error)) << error;
    return readThrough(stream, path, scan);
}

TEST(LogByteStream, SlidesAWindowOfFixedSizeAlongAFile) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("digits");
    testing::writeWholeFile(path, "0123456789");
    LogByteStream stream(4);
    ASSERT_TRUE(stream.open(path).ok());
    ASSERT_TRUE(stream.fill(3));
    EXPECT_EQ(stream.available().size(), 4u);  // a read takes what fits
    EXPECT_EQ(stream.available()[0], '0');
    stream.consume(3);
    EXPECT_EQ(stream.offset(), 3u);
    ASSERT_TRUE(stream.fill(4));  // slides "3" to the front and reads behind it
    ASSERT_EQ(stream.available().size(), 4u);
    EXPECT_EQ(std::string(stream.available().begin(), stream.available().end()), "3456");
    ASSERT_TRUE(stream.fill(100));  // never more than the window
    EXPECT_EQ(stream.available().size(), 4u);
    stream.consume(4);
    ASSERT_TRUE(stream.fill(4));
    EXPECT_EQ(std::string(stream.available().begin(), stream.available().end()), "789");
    EXPECT_TRUE(stream.ended());
    EXPECT_FALSE(stream.atEnd());
    stream.consume(3);
    EXPECT_TRUE(stream.atEnd());
    EXPECT_EQ(stream.offset(), 10u);
}

TEST(LogByteStream, SaysWhyAFileCannotBeRead) {
    testing::TemporaryDirectory directory;
    LogByteStream stream;
    std::string error;
    EXPECT_FALSE(stream.open(directory.file("absent"), error));
    EXPECT_EQ(error, directory.file("absent") + ": cannot open: No such file or directory");
    EXPECT_FALSE(stream.open(directory.path(), error));
    EXPECT_EQ(error, directory.path() + ": cannot read: Is a directory");
}

TEST(LogByteStream, ACaptureSplitAtEveryByteAcrossTheWindowGivesTheSamePackets) {
    const Bytes capture = smallCapture();
    const LogReadResult whole = parseDiagCaptureBytes(capture, "cap.qmdl");
    ASSERT_TRUE(whole.ok());
    ASSERT_EQ(whole.items.size(), 3u);
    ASSERT_EQ(whole.stats.otherFrames, 1u);
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("cap.qmdl");
    testing::writeWholeFile(path, std::string(capture.begin(), capture.end()));
    // A window of n bytes cuts the input at n, 2n, ...: every position is a cut for some n.
    for (std::size_t capacity = 1; capacity <= capture.size(); ++capacity) {
        const Seen seen = readFileThrough(path, capacity, scanDiagCaptureStream);
        ASSERT_TRUE(seen.ok) << capacity << ": " << seen.error;
        EXPECT_EQ(seen.items, whole.items) << "window of " << capacity;
        EXPECT_EQ(seen.stats.frames, whole.stats.frames) << capacity;
        EXPECT_EQ(seen.stats.otherFrames, 1u) << capacity;
        EXPECT_EQ(seen.stats.badFrames, 0u) << capacity;
    }
}

TEST(LogByteStream, DlfRecordsSplitAtEveryByteAcrossTheWindowGiveTheSameBlobs) {
    Bytes records;
    ASSERT_TRUE(appendDlfRecord(records, 0xB0C2, 0x1122334455667788ULL, Bytes{1, 2, 3}));
    ASSERT_TRUE(appendDlfRecord(records, 0x4116, 7, Bytes{}));
    ASSERT_TRUE(appendDlfRecord(records, 0xB193, 9, Bytes(30, 0xAB)));
    const LogReadResult whole = parseDlfBytes(records, "t.dlf");
    ASSERT_TRUE(whole.ok());
    ASSERT_EQ(whole.items.size(), 3u);
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("t.dlf");
    testing::writeWholeFile(path, std::string(records.begin(), records.end()));
    const std::size_t longest = kDlfHeaderSize + 30;
    for (std::size_t capacity = longest; capacity <= records.size(); ++capacity) {
        const Seen seen = readFileThrough(path, capacity, scanDlfStream);
        ASSERT_TRUE(seen.ok) << capacity << ": " << seen.error;
        EXPECT_EQ(seen.items, whole.items) << "window of " << capacity;
    }
    const Seen narrow = readFileThrough(path, longest - 1, scanDlfStream);
    EXPECT_FALSE(narrow.ok);
    EXPECT_EQ(narrow.error, path + ": offset 27: record length 42 is longer than the 41-byte read window");
}

TEST(LogByteStream, HexLinesSplitAtEveryByteAcrossTheWindowGiveTheSameItems) {
    const std::string text = "\xEF\xBB\xBF# two blobs\r\n01 0c 00 16 41\ntick\n\n  0102 # end\r\n01";
    const LogReadResult whole = parseHexBlobText(text, "x.hex");
    ASSERT_TRUE(whole.ok()) << whole.error;
    ASSERT_EQ(whole.items.size(), 4u);
    EXPECT_EQ(whole.items[3].line, 6u);
    EXPECT_EQ(whole.items[3].offset, text.size() - 2);
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("x.hex");
    testing::writeWholeFile(path, text);
    // The longest line holds 15 bytes with its line end.
    for (std::size_t capacity = 15; capacity <= text.size(); ++capacity) {
        const Seen seen = readFileThrough(path, capacity, scanHexBlobStream);
        ASSERT_TRUE(seen.ok) << capacity << ": " << seen.error;
        EXPECT_EQ(seen.items, whole.items) << "window of " << capacity;
    }
    const Seen narrow = readFileThrough(path, 14, scanHexBlobStream);
    EXPECT_FALSE(narrow.ok);
    EXPECT_EQ(narrow.error, path + ":2: line longer than 14 bytes");
}

// An input that never ends is read only up to the largest unit a reader holds, then refused.
TEST(LogByteStream, EndlessInputStopsAtTheBoundWithAClearError) {
    struct Case {
        LogFormat format;
        std::string error;
    };
    const std::vector<Case> cases{
        {LogFormat::DiagCapture, "/dev/zero: offset 0: frame longer than 262144 bytes"},
        {LogFormat::Dlf, "/dev/zero: offset 0: record length 0 is shorter than the 12-byte header"},
        {LogFormat::Hex, "/dev/zero:1: line longer than 1048576 bytes"},
        {LogFormat::Auto, "/dev/zero: offset 0: record length 0 is shorter than the 12-byte header"},
        {LogFormat::Snapshot, "/dev/zero: larger than 32 MiB, more than a snapshot holds"},
    };
    for (const Case& c : cases) {
        std::string error;
        std::size_t items = 0;
        EXPECT_FALSE(forEachLogItem(
            "/dev/zero", c.format,
            [&items](const LogItemView&) {
                ++items;
                return true;
            },
            error));
        EXPECT_EQ(error, c.error) << logFormatName(c.format);
        EXPECT_EQ(items, 0u);
    }
}

TEST(LogByteStream, AnEndlessHexLineStopsAtTheWindow) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("long.hex");
    testing::writeWholeFile(path, "01\n" + std::string(200, '0'));
    const Seen seen = readFileThrough(path, 64, scanHexBlobStream);
    EXPECT_FALSE(seen.ok);
    EXPECT_EQ(seen.error, path + ":2: line longer than 64 bytes");
    EXPECT_EQ(seen.items.size(), 1u);
}

}  // namespace
}  // namespace velmar
