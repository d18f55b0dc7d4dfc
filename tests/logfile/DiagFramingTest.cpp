// The diagnostic port's framing, both directions, against the published test vectors byte for byte, and
// what readDiagFrame makes of wrapped and damaged frames.
#include "logfile/DiagFraming.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "logfile/DiagStreamDeframer.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

Bytes framed(const Bytes& payload) {
    Bytes out;
    appendDiagFrame(out, payload);
    return out;
}

// Every frame the deframer hands out, as payloads.
class Frames : public DiagFrameSink {
  public:
    bool onDiagFrame(const DiagFrameView& frame) override {
        payloads.emplace_back(frame.payload.begin(), frame.payload.end());
        escaped.emplace_back(frame.escaped.begin(), frame.escaped.end());
        return true;
    }
    std::vector<Bytes> payloads;
    std::vector<Bytes> escaped;
};

struct Vector {
    const char* request;
    Bytes payload;
    Bytes wire;
};

const std::vector<Vector> kVectors = {
    {"version", {0x00}, {0x00, 0x78, 0xF0, 0x7E}},
    {"build id", {0x7C}, {0x7C, 0x93, 0x49, 0x7E}},
    {"event reports off", {0x60, 0x00}, {0x60, 0x00, 0x12, 0x6A, 0x7E}},
    {"event reports on", {0x60, 0x01}, {0x60, 0x01, 0x9B, 0x7B, 0x7E}},
    {"log config, disable all",
     {0x73, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00},
     {0x73, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0xDA, 0x81, 0x7E}},
    {"log config, retrieve ranges",
     {0x73, 0x00, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00},
     {0x73, 0x00, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00, 0x61, 0x9D, 0x7E}},
    {"debug messages, all off",
     {0x7D, 0x05, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00},
     {0x7D, 0x5D, 0x05, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x74, 0x41, 0x7E}},
    {"4B 05 08 00", {0x4B, 0x05, 0x08, 0x00}, {0x4B, 0x05, 0x08, 0x00, 0x01, 0xDD, 0x7E}},
};

TEST(DiagFraming, TheCrcHasTheStandardCheckValue) {
    const std::string check = "123456789";
    EXPECT_EQ(crc16X25(ByteView(reinterpret_cast<const std::uint8_t*>(check.data()), check.size())), 0x906E);
}

// The CRC bit by bit, as the polynomial defines it, against the table-driven one at every length and
// alignment, so that the eight-byte steps and the tail agree.
TEST(DiagFraming, TheCrcAgreesWithTheBitwiseDefinitionAtEveryLengthAndAlignment) {
    const auto bitwise = [](const std::uint8_t* data, std::size_t size) {
        unsigned crc = 0xFFFF;
        for (std::size_t i = 0; i < size; ++i) {
            crc ^= data[i];
            for (int bit = 0; bit < 8; ++bit) {
                crc = (crc & 1U) != 0 ? (crc >> 1) ^ 0x8408U : crc >> 1;
            }
        }
        return static_cast<std::uint16_t>(crc ^ 0xFFFFU);
    };
    std::vector<std::uint8_t> bytes(80);
    unsigned seed = 12345;
    for (std::uint8_t& byte : bytes) {
        seed = seed * 1103515245U + 12345U;
        byte = static_cast<std::uint8_t>(seed >> 16);
    }
    for (std::size_t start = 0; start < 8; ++start) {
        for (std::size_t size = 0; start + size <= bytes.size(); ++size) {
            EXPECT_EQ(crc16X25(ByteView(bytes.data() + start, size)), bitwise(bytes.data() + start, size))
                << start << "+" << size;
        }
    }
}

TEST(DiagFraming, EncodesEveryPublishedVectorByteForByte) {
    for (const Vector& vector : kVectors) {
        EXPECT_EQ(framed(vector.payload), vector.wire) << vector.request;
    }
}

TEST(DiagFraming, DecodesEveryPublishedVectorBackToItsPayload) {
    Bytes stream;
    for (const Vector& vector : kVectors) {
        stream.insert(stream.end(), vector.wire.begin(), vector.wire.end());
    }
    Frames frames;
    LogReadStats stats;
    DiagStreamDeframer deframer("port", frames, &stats);
    // A byte at a time: an escape ends one read and its partner begins the next.
    for (const std::uint8_t byte : stream) {
        deframer.feed(ByteView(&byte, 1));
    }
    deframer.finish();
    ASSERT_EQ(frames.payloads.size(), kVectors.size());
    for (std::size_t i = 0; i < kVectors.size(); ++i) {
        EXPECT_EQ(frames.payloads[i], kVectors[i].payload) << kVectors[i].request;
        Bytes escaped = kVectors[i].wire;
        escaped.pop_back();
        EXPECT_EQ(frames.escaped[i], escaped) << kVectors[i].request;
    }
    EXPECT_EQ(stats.badFrames, 0U);
}

TEST(DiagFraming, EscapesFlagAndEscapeBytesAndOnlyThose) {
    const Bytes payload = {0x7E, 0x7D, 0x5E, 0x5D, 0x20};
    const Bytes wire = framed(payload);
    const Bytes start = {0x7D, 0x5E, 0x7D, 0x5D, 0x5E, 0x5D, 0x20};
    ASSERT_GE(wire.size(), start.size() + 3);
    EXPECT_EQ(Bytes(wire.begin(), wire.begin() + 7), start);
    EXPECT_EQ(wire.back(), 0x7E);
    EXPECT_EQ(std::count(wire.begin(), wire.end(), 0x7E), 1);
}

TEST(DiagFraming, ReadsTheSubscriptionOfAWrappedLogPacket) {
    Bytes payload = {0x98, 0x01, 0x00, 0x00, 0x02, 0x00, 0x00, 0x00,  // wrapper, subscription 2
                     0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x16, 0x41, 1, 2, 3, 4, 5, 6, 7, 8};
    const DiagFrameContents contents = readDiagFrame(payload);
    ASSERT_EQ(contents.kind, DiagFrameContents::Kind::LogPacket);
    ASSERT_TRUE(contents.subscription.has_value());
    EXPECT_EQ(*contents.subscription, 2U);
    EXPECT_EQ(Bytes(contents.blob().begin(), contents.blob().end()),
              (Bytes{0x01, 0x0C, 0x00, 0x16, 0x41, 1, 2, 3, 4, 5, 6, 7, 8}));
    EXPECT_EQ(contents.packet.size(), 16U);
}

TEST(DiagFraming, AWrappedResponseIsOtherWithItsPacketInside) {
    Bytes payload = {0x98, 0x01, 0x00, 0x00, 0xFF, 0xFF, 0xFF, 0xFF, 0x60, 0x00, 0x00};
    const DiagFrameContents contents = readDiagFrame(payload);
    EXPECT_EQ(contents.kind, DiagFrameContents::Kind::Other);
    EXPECT_EQ(contents.subscription, 0xFFFFFFFFU);
    EXPECT_EQ(Bytes(contents.packet.begin(), contents.packet.end()), (Bytes{0x60, 0x00, 0x00}));
}

TEST(DiagFraming, DamagedContentsAreBadWithAReason) {
    const struct {
        Bytes payload;
        std::string problem;
    } cases[] = {
        {{0x98, 0x01, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00}, "wrapper of 8 bytes holds no frame"},
        {{0x10, 0x00, 0x0C}, "log packet of 3 bytes is too short for a record length"},
        {{0x10, 0x00, 0x0B, 0x00, 0x0B, 0x00, 0x16, 0x41},
         "record length 11 is shorter than the 12-byte header"},
        {{0x10, 0x00, 0x20, 0x00, 0x20, 0x00, 0x16, 0x41, 0, 0, 0, 0},
         "record length 32 runs past the end of the 12-byte log packet"},
    };
    for (const auto& testCase : cases) {
        Bytes payload = testCase.payload;
        const DiagFrameContents contents = readDiagFrame(payload);
        EXPECT_EQ(contents.kind, DiagFrameContents::Kind::Bad);
        EXPECT_EQ(contents.problemText(), testCase.problem);
    }
    Bytes deep;
    for (int level = 0; level < 5; ++level) {
        deep.insert(deep.end(), {0x98, 0x01, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00});
    }
    deep.push_back(0x60);
    EXPECT_EQ(readDiagFrame(deep).problemText(), "wrappers nested deeper than 4 levels");
    // A damaged wrapper tells no subscription; a damaged log packet keeps what its wrapper told.
    EXPECT_FALSE(readDiagFrame(deep).subscription.has_value());
    Bytes emptyWrapper = cases[0].payload;
    EXPECT_FALSE(readDiagFrame(emptyWrapper).subscription.has_value());
    Bytes wrappedShort = {0x98, 0x01, 0x00, 0x00, 0x05, 0x00, 0x00, 0x00, 0x10, 0x00, 0x0C};
    const DiagFrameContents shortPacket = readDiagFrame(wrappedShort);
    EXPECT_EQ(shortPacket.kind, DiagFrameContents::Kind::Bad);
    EXPECT_EQ(shortPacket.subscription, 5U);
    EXPECT_EQ(shortPacket.packet.size(), 3U);
    EXPECT_EQ(shortPacket.problemText(), "log packet of 3 bytes is too short for a record length");
}

}  // namespace
}  // namespace velmar
