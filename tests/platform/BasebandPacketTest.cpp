// The one framing of baseband blobs: the channel prefix, plain and extended packets, and blobs too short to
// hold their header; and the record writer that builds such bytes.
#include "core/platform/BasebandPacket.h"

#include <gtest/gtest.h>

#include <vector>

#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"

namespace velmar {
namespace {

// A plain packet of code 0xB0C2 with timestamp 0x1122334455667788 and a 2-byte payload.
const std::vector<std::uint8_t> kPlain = {0x01, 0x0E, 0x00, 0xC2, 0xB0, 0x88, 0x77, 0x66,
                                          0x55, 0x44, 0x33, 0x22, 0x11, 0xAA, 0xBB};

TEST(BasebandPacket, FramesAPlainPacket) {
    const BasebandPacket framed = frameBasebandPacket(kPlain);
    EXPECT_EQ(framed.prefixLength, 0U);
    EXPECT_EQ(framed.packet.data(), kPlain.data());
    EXPECT_EQ(framed.packet.size(), kPlain.size());
    EXPECT_TRUE(framed.isPlain());
    EXPECT_FALSE(framed.isExtended());
    EXPECT_EQ(framed.logType, 0x01);
    EXPECT_EQ(framed.recordLength, 14);
    EXPECT_EQ(framed.code, 0xB0C2);
    EXPECT_EQ(framed.logCode(), 0xB0C2);
    EXPECT_EQ(framed.timestamp, 0x1122334455667788ULL);
    EXPECT_TRUE(framed.hasRecordLength());
    EXPECT_TRUE(framed.hasCode());
    EXPECT_TRUE(framed.hasHeader());
}

TEST(BasebandPacket, CutsTheChannelPrefix) {
    std::vector<std::uint8_t> prefixed = {0x81, 0x07};
    prefixed.insert(prefixed.end(), kPlain.begin(), kPlain.end());
    const BasebandPacket framed = frameBasebandPacket(prefixed);
    EXPECT_EQ(framed.prefixLength, 2U);
    EXPECT_EQ(framed.packet.data(), prefixed.data() + 2);
    EXPECT_EQ(framed.packet.size(), kPlain.size());
    EXPECT_EQ(framed.code, 0xB0C2);
    EXPECT_TRUE(framed.isPlain());
    EXPECT_EQ(withoutChannelPrefix(prefixed).data(), prefixed.data() + 2);
    EXPECT_EQ(withoutChannelPrefix(kPlain).data(), kPlain.data());
    // One byte 0x81 is too short for a prefix: it stays the packet, whose type is neither.
    const std::vector<std::uint8_t> lone = {0x81};
    const BasebandPacket single = frameBasebandPacket(lone);
    EXPECT_EQ(single.prefixLength, 0U);
    EXPECT_EQ(single.packet.size(), 1U);
    EXPECT_EQ(single.logType, 0x81);
    EXPECT_FALSE(single.isPlain() || single.isExtended());
}

TEST(BasebandPacket, AnExtendedPacketsCodeCarriesTheExtendedBase) {
    const std::vector<std::uint8_t> extended = {0x81, 0x00, 0xFF, 0x0C, 0x00, 0x01, 0x00, 0,
                                                0,    0,    0,    0,    0,    0,    0};
    const BasebandPacket framed = frameBasebandPacket(extended);
    EXPECT_TRUE(framed.isExtended());
    EXPECT_FALSE(framed.isPlain());
    EXPECT_EQ(framed.code, 0x0001);
    EXPECT_EQ(framed.logCode(), 0xFF0001);
    EXPECT_EQ(framed.logCode(), kExtendedCodeBase + 1);
    EXPECT_TRUE(framed.hasHeader());
}

TEST(BasebandPacket, FieldsPastTheEndOfAShortPacketReadAsZero) {
    const BasebandPacket empty = frameBasebandPacket({});
    EXPECT_EQ(empty.packet.size(), 0U);
    EXPECT_EQ(empty.logType, 0);
    EXPECT_FALSE(empty.hasRecordLength());
    EXPECT_FALSE(empty.hasCode());
    EXPECT_FALSE(empty.hasHeader());

    // Type and record length, and half a code.
    const std::vector<std::uint8_t> four = {0x01, 0x34, 0x12, 0xC2};
    const BasebandPacket cut = frameBasebandPacket(four);
    EXPECT_TRUE(cut.isPlain());
    EXPECT_TRUE(cut.hasRecordLength());
    EXPECT_EQ(cut.recordLength, 0x1234);
    EXPECT_FALSE(cut.hasCode());
    EXPECT_EQ(cut.code, 0x00C2);
    EXPECT_EQ(cut.timestamp, 0U);

    // The code is whole at 5 bytes; the header needs 13.
    const std::vector<std::uint8_t> twelve(kPlain.begin(), kPlain.begin() + 12);
    const BasebandPacket almost = frameBasebandPacket(twelve);
    EXPECT_TRUE(almost.hasCode());
    EXPECT_FALSE(almost.hasHeader());
    EXPECT_EQ(almost.code, 0xB0C2);
    EXPECT_EQ(almost.timestamp, 0x22334455667788ULL);
    EXPECT_TRUE(
        frameBasebandPacket(std::vector<std::uint8_t>(kPlain.begin(), kPlain.begin() + 13)).hasHeader());
}

TEST(RecordWriter, WritesWhatTheReaderReadsGrowingTheBytesAsNeeded) {
    std::vector<std::uint8_t> bytes(2, 0xEE);
    RecordWriter(bytes)
        .unsignedLE(2, 2, 0xB0C2)
        .unsignedBE(4, 3, 0x123456)
        .bits(7, 2, 4, 11, 0xAB)
        .bytes(10, std::vector<std::uint8_t>{0x01, 0x02})
        .appendLE(4, 0xFFFFFFFE)
        .append(std::vector<std::uint8_t>{0x7F});
    EXPECT_EQ(bytes, (std::vector<std::uint8_t>{0xEE, 0xEE, 0xC2, 0xB0, 0x12, 0x34, 0x56, 0xB0, 0x0A, 0x00,
                                                0x01, 0x02, 0xFE, 0xFF, 0xFF, 0xFF, 0x7F}));
    const RecordReader reader(bytes);
    EXPECT_EQ(reader.u16(2), 0xB0C2U);
    EXPECT_EQ(reader.unsignedBE(4, 3), 0x123456U);
    EXPECT_EQ(reader.bits(7, 2, 4, 11), 0xABU);
    EXPECT_EQ(reader.s32(12), -2);
    // Setting bits keeps the bits around them.
    std::vector<std::uint8_t> word = {0xFF, 0xFF};
    RecordWriter(word).bits(0, 2, 4, 7, 0x0);
    EXPECT_EQ(word, (std::vector<std::uint8_t>{0x0F, 0xFF}));
}

}  // namespace
}  // namespace velmar
