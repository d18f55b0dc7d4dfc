#include "logfile/DlfFile.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "core/platform/BasebandPacket.h"
#include "logfile/LogFormat.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// Code 0xB0C2, timestamp 0x0102030405060708, payload AA BB.
const Bytes kFirst = {0x0E, 0x00, 0xC2, 0xB0, 0x08, 0x07, 0x06, 0x05, 0x04, 0x03, 0x02, 0x01, 0xAA, 0xBB};
// Code 0x4116, timestamp 0, no payload.
const Bytes kSecond = {0x0C, 0x00, 0x16, 0x41, 0, 0, 0, 0, 0, 0, 0, 0};

Bytes concat(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& part : parts) {
        all.insert(all.end(), part.begin(), part.end());
    }
    return all;
}

Bytes blobOf(const Bytes& record) {
    return concat({{0x01}, record});
}

void writeBytes(const std::string& path, const Bytes& bytes) {
    testing::writeWholeFile(path, std::string(bytes.begin(), bytes.end()));
}

TEST(DlfFile, AppendRecordWritesTheExactLayout) {
    Bytes out;
    const Bytes payload = {0xAA, 0xBB};
    ASSERT_TRUE(appendDlfRecord(out, 0xB0C2, 0x0102030405060708ULL, payload));
    ASSERT_TRUE(appendDlfRecord(out, 0x4116, 0, {}));
    EXPECT_EQ(out, concat({kFirst, kSecond}));
}

TEST(DlfFile, AppendRecordRejectsRecordsBeyondTheLengthField) {
    Bytes out = {0x55};
    const Bytes largest(kDlfMaxRecordSize - kDlfHeaderSize, 0x33);
    EXPECT_FALSE(appendDlfRecord(out, 1, 2, Bytes(largest.size() + 1, 0x33)));
    EXPECT_EQ(out, Bytes{0x55});
    ASSERT_TRUE(appendDlfRecord(out, 1, 2, largest));
    ASSERT_EQ(out.size(), 1 + kDlfMaxRecordSize);
    EXPECT_EQ(out[1], 0xFF);
    EXPECT_EQ(out[2], 0xFF);
}

TEST(DlfFile, RoundTripThroughAFile) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("trace.dlf");
    std::string error;
    ASSERT_TRUE(appendToDlfFile(path, kFirst, error)) << error;
    ASSERT_TRUE(appendToDlfFile(path, kSecond, error)) << error;

    const LogReadResult result = readDlfFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 2U);
    EXPECT_EQ(result.items[0], LogItem::blob(blobOf(kFirst), 0));
    EXPECT_EQ(result.items[1], LogItem::blob(blobOf(kSecond), kFirst.size()));
    EXPECT_EQ(result.stats.blobs, 2U);
    for (const LogItem& item : result.items) {
        EXPECT_EQ(item.bytes[0], kPlainLogType);
        EXPECT_EQ(static_cast<std::size_t>(item.bytes[1] | item.bytes[2] << 8), item.bytes.size() - 1);
    }
}

TEST(DlfFile, EmptyInputHoldsNoRecords) {
    const LogReadResult result = parseDlfBytes({}, "empty.dlf");
    EXPECT_TRUE(result.ok()) << result.error;
    EXPECT_TRUE(result.items.empty());
}

TEST(DlfFile, ShortRecordLengthIsAnErrorNamingTheOffset) {
    const Bytes bytes = concat({kFirst, {0x03, 0x00, 0x16, 0x41, 0, 0, 0, 0, 0, 0, 0, 0}});
    const LogReadResult result = parseDlfBytes(bytes, "trace.dlf");
    EXPECT_FALSE(result.ok());
    EXPECT_TRUE(result.items.empty());
    EXPECT_EQ(result.error, "trace.dlf: offset 14: record length 3 is shorter than the 12-byte header");
}

TEST(DlfFile, RecordRunningPastTheEndIsAnErrorNamingTheOffset) {
    Bytes truncated = kFirst;
    truncated.pop_back();
    EXPECT_EQ(parseDlfBytes(concat({kSecond, truncated}), "trace.dlf").error,
              "trace.dlf: offset 12: record length 14 runs past the end of the file (13 bytes left)");
    // Too few bytes for even the header.
    EXPECT_EQ(parseDlfBytes(Bytes{0x0C, 0x00, 0x16}, "trace.dlf").error,
              "trace.dlf: offset 0: record length 12 runs past the end of the file (3 bytes left)");
    EXPECT_EQ(parseDlfBytes(concat({kSecond, {0x0C}}), "trace.dlf").error,
              "trace.dlf: offset 12: 1 trailing byte is too short for a record length");
}

TEST(DlfFile, FileErrorsNameThePath) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("broken.dlf");
    writeBytes(path, concat({kFirst, kFirst, {0x00, 0x00}}));
    EXPECT_EQ(readDlfFile(path).error,
              path + ": offset 28: record length 0 is shorter than the 12-byte header");
    const std::string missing = directory.file("missing.dlf");
    EXPECT_EQ(readDlfFile(missing).error, missing + ": cannot open: No such file or directory");
    EXPECT_EQ(readDlfFile(directory.path()).error, directory.path() + ": cannot read: Is a directory");
    std::string error;
    EXPECT_FALSE(appendToDlfFile(directory.file("no/dir.dlf"), kFirst, error));
    EXPECT_EQ(error, directory.file("no/dir.dlf") + ": cannot open for appending: No such file or directory");
}

TEST(DlfFile, CallbackCanStopTheReader) {
    const Bytes bytes = concat({kFirst, kSecond, {0x01}});
    std::vector<Bytes> seen;
    std::string error;
    EXPECT_TRUE(scanDlfBytes(
        bytes, "stop.dlf",
        [&seen](const LogItemView& item) {
            seen.emplace_back(item.bytes.begin(), item.bytes.end());
            return seen.size() < 2;
        },
        error));
    EXPECT_EQ(seen, (std::vector<Bytes>{blobOf(kFirst), blobOf(kSecond)}));
    EXPECT_TRUE(error.empty());
}

TEST(DlfFile, IsDetectedByExtensionAndIsTheFallbackForBinaryContent) {
    EXPECT_EQ(logFormatForExtension("trace.DLF"), LogFormat::Dlf);
    EXPECT_EQ(parseLogFormatName("dlf"), LogFormat::Dlf);
    EXPECT_EQ(logFormatName(LogFormat::Dlf), "dlf");
    EXPECT_EQ(logFormatForContent(concat({kFirst, kSecond})), LogFormat::Dlf);
    EXPECT_EQ(logFormatForContent({}), LogFormat::Dlf);

    testing::TemporaryDirectory directory;
    const std::string path = directory.file("trace");
    writeBytes(path, concat({kSecond, kFirst}));
    std::string error;
    EXPECT_EQ(detectLogFormat(path, error), LogFormat::Dlf);
    const LogReadResult result = readLogFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 2U);
    EXPECT_EQ(result.items[0].bytes, blobOf(kSecond));
    EXPECT_EQ(result.items[1].bytes, blobOf(kFirst));
    EXPECT_EQ(result.items[1].position(), "offset 12");

    EXPECT_EQ(detectLogFormat(directory.file("absent"), error), std::nullopt);
    EXPECT_EQ(error, directory.file("absent") + ": cannot open: No such file or directory");
    EXPECT_EQ(readLogFile(directory.file("absent")).error,
              directory.file("absent") + ": cannot open: No such file or directory");
}

TEST(DlfFile, RandomBytesYieldWellFormedBlobsOrAnError) {
    std::mt19937 random(4242);
    std::size_t accepted = 0;
    for (int round = 0; round < 300; ++round) {
        // A few valid records, then in most rounds some damage: a changed byte or a cut.
        Bytes bytes;
        for (unsigned count = random() % 5; count > 0; --count) {
            const Bytes payload(random() % 6, static_cast<std::uint8_t>(random()));
            ASSERT_TRUE(appendDlfRecord(bytes, static_cast<std::uint16_t>(random()), random(), payload));
        }
        if (!bytes.empty() && random() % 3 != 0) {
            if (random() % 2 == 0) {
                bytes[random() % bytes.size()] = static_cast<std::uint8_t>(random() % 32);
            } else {
                bytes.resize(random() % bytes.size());
            }
        }
        std::size_t covered = 0;
        std::string error;
        const bool ok = scanDlfBytes(
            bytes, "random.dlf",
            [&](const LogItemView& item) {
                EXPECT_EQ(item.offset, covered);
                EXPECT_EQ(item.bytes[0], kPlainLogType);
                EXPECT_EQ(static_cast<std::size_t>(item.bytes[1] | item.bytes[2] << 8),
                          item.bytes.size() - 1);
                EXPECT_TRUE(std::equal(item.bytes.begin() + 1, item.bytes.end(), bytes.begin() + covered));
                covered += item.bytes.size() - 1;
                return true;
            },
            error);
        EXPECT_EQ(ok, covered == bytes.size());
        EXPECT_EQ(ok, error.empty());
        if (!ok) {
            EXPECT_EQ(error.rfind("random.dlf: offset " + std::to_string(covered) + ": ", 0), 0U) << error;
        }
        accepted += ok ? 1 : 0;
    }
    EXPECT_GT(accepted, 50U);
    EXPECT_LT(accepted, 250U);
}

}  // namespace
}  // namespace velmar
