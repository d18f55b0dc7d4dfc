#include "logfile/SnapshotFile.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/LogFormat.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// An ordinary packet: type 0x01, record of 14 bytes (code 0xB0C2, payload AA BB).
const Bytes kFirst = {0x01, 0x0E, 0x00, 0xC2, 0xB0, 0x08, 0x07, 0x06,
                      0x05, 0x04, 0x03, 0x02, 0x01, 0xAA, 0xBB};
// The same kind of packet behind a channel prefix 0x81 0x02, record of 12 bytes (code 0x4116).
const Bytes kPrefixed = {0x81, 0x02, 0x01, 0x0C, 0x00, 0x16, 0x41, 0, 0, 0, 0, 0, 0, 0, 0};
// An extended packet: type 0xFF, record of 13 bytes (code 0x7130, payload 5A).
const Bytes kExtended = {0xFF, 0x0D, 0x00, 0x30, 0x71, 1, 2, 3, 4, 5, 6, 7, 8, 0x5A};

Bytes concat(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& part : parts) {
        all.insert(all.end(), part.begin(), part.end());
    }
    return all;
}

PlistValue entryWithState(const Bytes& state) {
    PlistDictionaryRef entry = PlistDictionary::create();
    entry->set("Description", "display interval");
    entry->set("DisplayState", PlistValue::data(state));
    return entry;
}

PlistValue snapshotOf(std::vector<PlistValue> entries) {
    PlistDictionaryRef root = PlistDictionary::create();
    root->set("Timestamp", PlistValue::date({1700000000.0}));
    root->set("Data", PlistArray::create(std::move(entries)));
    root->set("Description", "test snapshot");
    return root;
}

PlistValue closingEntry(const Bytes& dlf) {
    PlistDictionaryRef entry = PlistDictionary::create();
    entry->set("Description", "DLF binary (" + std::to_string(dlf.size()) + " bytes)");
    entry->set("DLF", PlistValue::data(dlf));
    return entry;
}

LogItem blobAt(Bytes bytes, std::size_t entry, std::uint64_t offset) {
    LogItem item = LogItem::blob(std::move(bytes), offset);
    item.entry = entry;
    return item;
}

LogItem tickAt(std::size_t entry, std::uint64_t offset) {
    LogItem item = LogItem::tick(offset);
    item.entry = entry;
    return item;
}

TEST(SnapshotFile, SplitsEachEntryIntoItsBlobsFollowedByATick) {
    const PlistValue root = snapshotOf({
        entryWithState(concat({kFirst, kPrefixed, kExtended})),
        PlistValue("not a dictionary"),
        entryWithState({}),
        entryWithState(kExtended),
        closingEntry(concat({Bytes(kFirst.begin() + 1, kFirst.end())})),
    });
    const LogReadResult result = parseSnapshotValue(root, "snap.velmar");
    ASSERT_TRUE(result.ok()) << result.error;
    const std::vector<LogItem> expected = {
        blobAt(kFirst, 1, 0),
        blobAt(kPrefixed, 1, kFirst.size()),
        blobAt(kExtended, 1, kFirst.size() + kPrefixed.size()),
        tickAt(1, kFirst.size() + kPrefixed.size() + kExtended.size()),
        tickAt(3, 0),
        blobAt(kExtended, 4, 0),
        tickAt(4, kExtended.size()),
    };
    EXPECT_EQ(result.items, expected);
    EXPECT_EQ(result.stats.entries, 3U);
    EXPECT_EQ(result.stats.badEntries, 0U);
    EXPECT_EQ(result.stats.blobs, 4U);
    EXPECT_EQ(result.stats.ticks, 3U);
    EXPECT_EQ(result.items[1].position(), "entry 1, offset 15");
}

TEST(SnapshotFile, DamagedDataEndsOnlyThatEntry) {
    const Bytes shortLength = {0x01, 0x05, 0x00, 0xC2, 0xB0};
    const Bytes pastEnd = {0x81, 0x02, 0x01, 0x20, 0x00, 0x16, 0x41};
    const PlistValue root = snapshotOf({
        entryWithState(concat({kFirst, shortLength, kFirst})),
        entryWithState(concat({kExtended, pastEnd})),
        entryWithState(concat({kExtended, {0x01, 0x0E}})),
        entryWithState(kFirst),
    });
    testing::LogCapture log;
    const LogReadResult result = parseSnapshotValue(root, "snap.velmar");
    ASSERT_TRUE(result.ok()) << result.error;
    const std::vector<LogItem> expected = {
        blobAt(kFirst, 1, 0),    tickAt(1, 2 * kFirst.size() + shortLength.size()),
        blobAt(kExtended, 2, 0), tickAt(2, kExtended.size() + pastEnd.size()),
        blobAt(kExtended, 3, 0), tickAt(3, kExtended.size() + 2),
        blobAt(kFirst, 4, 0),    tickAt(4, kFirst.size()),
    };
    EXPECT_EQ(result.items, expected);
    EXPECT_EQ(result.stats.entries, 4U);
    EXPECT_EQ(result.stats.badEntries, 3U);
    const std::vector<std::string> problems = {
        "snap.velmar: entry 1: offset 15: record length 5 is shorter than the 12-byte header",
        "snap.velmar: entry 2: offset 14: blob of 35 bytes runs past the end of the data (7 bytes left)",
        "snap.velmar: entry 3: offset 14: 2 trailing bytes are too few for a blob",
    };
    EXPECT_EQ(result.stats.problems, problems);
    EXPECT_EQ(log.textsAt(kLogWarning), problems);
}

TEST(SnapshotFile, RandomDataNeverYieldsABlobOutsideTheEntry) {
    std::mt19937 random(777);
    for (int round = 0; round < 300; ++round) {
        Bytes data(random() % 96);
        for (std::uint8_t& byte : data) {
            const std::uint8_t choices[] = {0x81, 0x01, 0x0C, 0x00, static_cast<std::uint8_t>(random())};
            byte = choices[random() % 5];
        }
        const LogReadResult result = parseSnapshotValue(snapshotOf({entryWithState(data)}), "random.velmar");
        ASSERT_TRUE(result.ok()) << result.error;
        ASSERT_FALSE(result.items.empty());
        EXPECT_TRUE(result.items.back().isTick());
        // The blobs tile the data from its start, each as long as its length field says.
        std::size_t covered = 0;
        for (std::size_t i = 0; i + 1 < result.items.size(); ++i) {
            const LogItem& item = result.items[i];
            ASSERT_TRUE(item.isBlob());
            EXPECT_EQ(item.offset, covered);
            const std::size_t prefix = item.bytes[0] == 0x81 ? 2 : 0;  // the channel prefix
            ASSERT_GE(item.bytes.size(), prefix + 3);
            const std::size_t length = item.bytes[prefix + 1] | item.bytes[prefix + 2] << 8;
            EXPECT_GE(length, 12U);
            EXPECT_EQ(item.bytes.size(), prefix + 1 + length);
            EXPECT_TRUE(std::equal(item.bytes.begin(), item.bytes.end(), data.begin() + covered));
            covered += item.bytes.size();
        }
        EXPECT_EQ(result.stats.badEntries, covered == data.size() ? 0U : 1U);
    }
}

TEST(SnapshotFile, SnapshotWithoutDataArrayIsAnError) {
    PlistDictionaryRef noData = PlistDictionary::create();
    noData->set("Description", "nothing");
    EXPECT_EQ(parseSnapshotValue(noData, "snap.velmar").error,
              "snap.velmar: the snapshot has no \"Data\" array");
    PlistDictionaryRef wrongType = PlistDictionary::create();
    wrongType->set("Data", PlistValue::data({0x01}));
    EXPECT_EQ(parseSnapshotValue(wrongType, "snap.velmar").error,
              "snap.velmar: the snapshot has no \"Data\" array");
    EXPECT_EQ(parseSnapshotValue(PlistValue::newArray(), "snap.velmar").error,
              "snap.velmar: the snapshot's root is not a dictionary (array)");
}

TEST(SnapshotFile, CallbackCanStopTheReader) {
    const PlistValue root = snapshotOf({entryWithState(concat({kFirst, kExtended})), entryWithState(kFirst)});
    std::vector<LogItem> seen;
    std::string error;
    EXPECT_TRUE(scanSnapshotValue(
        root, "stop.velmar",
        [&seen](const LogItemView& item) {
            seen.push_back(item.toItem());
            return !item.isTick();
        },
        error));
    EXPECT_EQ(seen, (std::vector<LogItem>{blobAt(kFirst, 1, 0), blobAt(kExtended, 1, kFirst.size()),
                                          tickAt(1, kFirst.size() + kExtended.size())}));
}

TEST(SnapshotFile, ReadsAWrittenSnapshotFile) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("saved.velmar");
    const PlistValue root = snapshotOf({entryWithState(concat({kPrefixed, kFirst})), closingEntry(kFirst)});
    ASSERT_TRUE(writeXmlFile(root, path));

    const LogReadResult result = readSnapshotFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(result.items,
              (std::vector<LogItem>{blobAt(kPrefixed, 1, 0), blobAt(kFirst, 1, kPrefixed.size()),
                                    tickAt(1, kPrefixed.size() + kFirst.size())}));
    const LogReadResult automatic = readLogFile(path);
    ASSERT_TRUE(automatic.ok()) << automatic.error;
    EXPECT_EQ(automatic.items, result.items);
}

TEST(SnapshotFile, ReadsLiteralXmlDetectedByContent) {
    // Two blobs (kFirst, then kExtended) in one entry; base64 of their 29 bytes.
    const std::string xml =
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
        "<plist version=\"1.0\">\n"
        "<dict>\n"
        "\t<key>Timestamp</key>\n\t<date>2024-01-02T03:04:05Z</date>\n"
        "\t<key>Data</key>\n"
        "\t<array>\n"
        "\t\t<dict>\n"
        "\t\t\t<key>DisplayState</key>\n"
        "\t\t\t<data>AQ4AwrAIBwYFBAMCAaq7/w0AMHEBAgMEBQYHCFo=</data>\n"
        "\t\t</dict>\n"
        "\t</array>\n"
        "\t<key>Description</key>\n\t<string>hand-written</string>\n"
        "</dict>\n"
        "</plist>\n";
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("snapshot.plist");
    testing::writeWholeFile(path, xml);
    std::string error;
    EXPECT_EQ(detectLogFormat(path, error), LogFormat::Snapshot);
    const LogReadResult result = readLogFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    EXPECT_EQ(result.items, (std::vector<LogItem>{blobAt(kFirst, 1, 0), blobAt(kExtended, 1, kFirst.size()),
                                                  tickAt(1, kFirst.size() + kExtended.size())}));
}

TEST(SnapshotFile, UnreadableFilesAreErrorsNamingThePath) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("broken.velmar");
    testing::writeWholeFile(path, "<?xml version=\"1.0\"?><plist><dict><key>Data</key>");
    const LogReadResult broken = readSnapshotFile(path);
    EXPECT_FALSE(broken.ok());
    EXPECT_EQ(broken.error.rfind(path + ": ", 0), 0U) << broken.error;

    const std::string missing = directory.file("missing.velmar");
    const LogReadResult absent = readSnapshotFile(missing);
    EXPECT_FALSE(absent.ok());
    EXPECT_EQ(absent.error.rfind(missing + ": ", 0), 0U) << absent.error;
}

TEST(SnapshotFile, DetectedByExtensionAndByContent) {
    EXPECT_EQ(logFormatForExtension("saved.velmar"), LogFormat::Snapshot);
    EXPECT_EQ(parseLogFormatName("velmar"), LogFormat::Snapshot);
    EXPECT_EQ(logFormatName(LogFormat::Snapshot), "velmar");
    const auto content = [](std::string_view text) {
        return logFormatForContent(
            std::span(reinterpret_cast<const std::uint8_t*>(text.data()), text.size()));
    };
    EXPECT_EQ(content("<?xml version=\"1.0\"?>"), LogFormat::Snapshot);
    EXPECT_EQ(content("\n  <?xml version=\"1.0\"?>"), LogFormat::Snapshot);
    EXPECT_EQ(content("bplist00\xD1\x01\x02"), LogFormat::Snapshot);
}

}  // namespace
}  // namespace velmar
