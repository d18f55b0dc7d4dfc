#include "logfile/HexBlobFile.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "logfile/LogFormat.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

LogItem blobAt(Bytes bytes, std::size_t line, std::uint64_t offset) {
    LogItem item = LogItem::blob(std::move(bytes), offset);
    item.line = line;
    return item;
}

LogItem tickAt(std::size_t line, std::uint64_t offset) {
    LogItem item = LogItem::tick(offset);
    item.line = line;
    return item;
}

TEST(HexBlobFile, ReadsBlobsTicksCommentsAndBlankLines) {
    const std::string text =
        "# two packets and a refresh\n"  // line 1, offset 0
        "01 1c00 3041\n"                 // line 2, offset 28
        "\n"                             // line 3
        "   tick   # refresh\n"          // line 4, offset 42
        "  # only a comment\n"           // line 5
        "0A0b0C\r\n"                     // line 6, offset 81
        "\t\n"                           // line 7
        "tick";                          // line 8, offset 91, no final newline
    LogReadStats stats;
    std::vector<LogItem> items;
    std::string error;
    ASSERT_TRUE(scanHexBlobText(
        text, "capture.hex",
        [&items](const LogItemView& item) {
            items.push_back(item.toItem());
            return true;
        },
        error, &stats))
        << error;
    const std::vector<LogItem> expected = {blobAt({0x01, 0x1C, 0x00, 0x30, 0x41}, 2, 28), tickAt(4, 42),
                                           blobAt({0x0A, 0x0B, 0x0C}, 6, 81), tickAt(8, 91)};
    EXPECT_EQ(items, expected);
    EXPECT_EQ(stats.blobs, 2U);
    EXPECT_EQ(stats.ticks, 2U);
    EXPECT_EQ(items[0].position(), "line 2");
}

TEST(HexBlobFile, SpacesMaySeparateDigitsAndTheByteOrderMarkIsIgnored) {
    const LogReadResult result = parseHexBlobText(
        "\xEF\xBB\xBF"
        "0 1 2\t3 ff\n",
        "spaced.hex");
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 1U);
    EXPECT_EQ(result.items[0].bytes, (Bytes{0x01, 0x23, 0xFF}));
    EXPECT_EQ(result.items[0].line, 1U);
    EXPECT_EQ(result.items[0].offset, 3U);
}

TEST(HexBlobFile, OddDigitCountIsAnErrorNamingTheLine) {
    const LogReadResult result = parseHexBlobText("01\n\n0 1 2 # three digits\n01\n", "capture.hex");
    EXPECT_FALSE(result.ok());
    EXPECT_TRUE(result.items.empty());
    EXPECT_EQ(result.error, "capture.hex:3: odd number of hex digits (3)");
}

TEST(HexBlobFile, InvalidCharactersAreErrorsNamingTheLine) {
    EXPECT_EQ(parseHexBlobText("01 02\n# fine\n0g\n", "capture.hex").error,
              "capture.hex:3: invalid hex digit 'g'");
    EXPECT_EQ(parseHexBlobText("0x01\n", "capture.hex").error, "capture.hex:1: invalid hex digit 'x'");
    EXPECT_EQ(parseHexBlobText("01\n02\x01\n", "capture.hex").error,
              "capture.hex:2: invalid hex digit '\\x01'");
    // Only a line holding exactly "tick" is a tick.
    EXPECT_EQ(parseHexBlobText("ticks\n", "capture.hex").error, "capture.hex:1: invalid hex digit 't'");
    EXPECT_EQ(parseHexBlobText("tick 01\n", "capture.hex").error, "capture.hex:1: invalid hex digit 't'");
}

TEST(HexBlobFile, EmptyAndCommentOnlyTextHoldsNoItems) {
    for (const char* text : {"", "\n\n", "# nothing\n   # at all", "\r\n"}) {
        const LogReadResult result = parseHexBlobText(text, "empty.hex");
        EXPECT_TRUE(result.ok()) << result.error;
        EXPECT_TRUE(result.items.empty()) << text;
    }
}

TEST(HexBlobFile, WriterProducesExactTextThatReadsBack) {
    const std::vector<LogItem> items = {LogItem::blob({0x01, 0x0E, 0x00, 0xC2, 0xB0}), LogItem::tick(),
                                        LogItem::blob({0xFF}), LogItem::tick()};
    const std::string text = formatHexBlobText(items, "made by a test\nsecond line");
    EXPECT_EQ(text, "# made by a test\n# second line\n01 0e 00 c2 b0\ntick\nff\ntick\n");

    const LogReadResult back = parseHexBlobText(text, "back.hex");
    ASSERT_TRUE(back.ok()) << back.error;
    ASSERT_EQ(back.items.size(), items.size());
    for (std::size_t i = 0; i < items.size(); ++i) {
        EXPECT_EQ(back.items[i].kind, items[i].kind);
        EXPECT_EQ(back.items[i].bytes, items[i].bytes);
        EXPECT_EQ(back.items[i].line, i + 3);
    }
    EXPECT_EQ(formatHexBlobText({}), "");
}

TEST(HexBlobFile, FileRoundTripAndErrors) {
    testing::TemporaryDirectory directory;
    const std::string path = directory.file("blobs.hex");
    const std::vector<LogItem> items = {LogItem::blob({0x01, 0x0C, 0x00, 0x16, 0x41}), LogItem::tick()};
    std::string error;
    ASSERT_TRUE(writeHexBlobFile(path, items, error)) << error;
    EXPECT_EQ(testing::readWholeFile(path), "01 0c 00 16 41\ntick\n");

    const LogReadResult result = readHexBlobFile(path);
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 2U);
    EXPECT_EQ(result.items[0].bytes, items[0].bytes);
    EXPECT_TRUE(result.items[1].isTick());
    EXPECT_EQ(result.items[1].offset, 15U);

    testing::writeWholeFile(path, "01 02\nzz\n");
    EXPECT_EQ(readHexBlobFile(path).error, path + ":2: invalid hex digit 'z'");

    const std::string missing = directory.file("missing.hex");
    EXPECT_EQ(readHexBlobFile(missing).error, missing + ": cannot open: No such file or directory");
    EXPECT_FALSE(writeHexBlobFile(directory.file("no/such/dir.hex"), items, error));
    EXPECT_EQ(error, directory.file("no/such/dir.hex") + ": cannot create: No such file or directory");
}

TEST(HexBlobFile, RandomItemsSurviveTheRoundTrip) {
    std::mt19937 random(99);
    std::vector<LogItem> items;
    for (int i = 0; i < 500; ++i) {
        if (random() % 5 == 0) {
            items.push_back(LogItem::tick());
            continue;
        }
        Bytes bytes(1 + random() % 40);
        for (std::uint8_t& byte : bytes) {
            byte = static_cast<std::uint8_t>(random());
        }
        items.push_back(LogItem::blob(std::move(bytes)));
    }
    const std::string text = formatHexBlobText(items);
    const LogReadResult back = parseHexBlobText(text, "random.hex");
    ASSERT_TRUE(back.ok()) << back.error;
    ASSERT_EQ(back.items.size(), items.size());
    std::uint64_t offset = 0;
    for (std::size_t i = 0; i < items.size(); ++i) {
        EXPECT_EQ(back.items[i].kind, items[i].kind);
        EXPECT_EQ(back.items[i].bytes, items[i].bytes);
        EXPECT_EQ(back.items[i].line, i + 1);
        EXPECT_EQ(back.items[i].offset, offset);
        offset = text.find('\n', offset) + 1;
    }
}

TEST(HexBlobFile, CallbackCanStopTheReader) {
    std::size_t seen = 0;
    std::string error;
    EXPECT_TRUE(scanHexBlobText(
        "01\ntick\n02\nzz\n", "stop.hex",
        [&seen](const LogItemView&) {
            ++seen;
            return seen < 2;
        },
        error));
    EXPECT_EQ(seen, 2U);
    EXPECT_TRUE(error.empty());
}

TEST(HexBlobFile, DetectedByExtensionAndByContent) {
    EXPECT_EQ(logFormatForExtension("a/b/blobs.hex"), LogFormat::Hex);
    EXPECT_EQ(logFormatForExtension("BLOBS.HEX"), LogFormat::Hex);
    EXPECT_EQ(logFormatForExtension("blobs.txt"), std::nullopt);
    EXPECT_EQ(logFormatForExtension("dir.hex/blobs"), std::nullopt);
    EXPECT_EQ(logFormatForExtension(".hex"), std::nullopt);
    EXPECT_EQ(parseLogFormatName("hex"), LogFormat::Hex);
    EXPECT_EQ(logFormatName(LogFormat::Hex), "hex");
    EXPECT_EQ(parseLogFormatName("auto"), LogFormat::Auto);
    EXPECT_EQ(parseLogFormatName("HEX"), std::nullopt);

    const auto content = [](std::string_view text) {
        return logFormatForContent(
            std::span(reinterpret_cast<const std::uint8_t*>(text.data()), text.size()));
    };
    EXPECT_EQ(content("# recorded by hand\n01 0c 00\n"), LogFormat::Hex);
    EXPECT_EQ(content("\n  tick\n"), LogFormat::Hex);
    EXPECT_EQ(content("010c0016"), LogFormat::Hex);
    EXPECT_EQ(content(std::string_view("01\x00\x16", 4)), LogFormat::Dlf);  // a NUL byte: binary

    testing::TemporaryDirectory directory;
    const std::string path = directory.file("blobs.txt");
    testing::writeWholeFile(path, "# hand-made\n01 0c 00 16 41 00 00 00 00 00 00 00 00\ntick\n");
    const LogReadResult result = readLogFile(path, LogFormat::Auto);
    ASSERT_TRUE(result.ok()) << result.error;
    ASSERT_EQ(result.items.size(), 2U);
    EXPECT_EQ(result.items[0].line, 2U);
    EXPECT_TRUE(result.items[1].isTick());
    // An explicit format overrides detection: the same text as DLF records is an error.
    EXPECT_FALSE(readLogFile(path, LogFormat::Dlf).ok());
}

}  // namespace
}  // namespace velmar
