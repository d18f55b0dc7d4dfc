#include <gtest/gtest.h>

#include "LogGenerator/StateKeys.h"
#include "core/platform/SystemLog.h"
#include "tests/LogGenerator/RecordingDecoder.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::receivedPackets;
using testing::RecordingGenerator;

// A packet of `length` bytes: type, DLF length, code, zero timestamp and payload.
std::vector<std::uint8_t> packet(std::uint8_t type, std::uint16_t code, std::size_t length = 13) {
    std::vector<std::uint8_t> bytes(length, 0);
    bytes[0] = type;
    bytes[1] = static_cast<std::uint8_t>((length - 1) & 0xFF);
    bytes[2] = static_cast<std::uint8_t>((length - 1) >> 8);
    bytes[3] = static_cast<std::uint8_t>(code & 0xFF);
    bytes[4] = static_cast<std::uint8_t>(code >> 8);
    return bytes;
}

class IntakeTest : public ::testing::Test {
  protected:
    void SetUp() override { receivedPackets().clear(); }
    RecordingGenerator generator{"NoSuchTemplate",
                                 {{"Plain", std::vector<std::int32_t>{0xB179, 0x1234}},
                                  {"Extended", std::vector<std::int32_t>{0xFF1234}}}};
    StateDict state = PlistDictionary::create();
};

TEST_F(IntakeTest, TwelveByteBlobIsIgnoredAndThirteenByteBlobDispatched) {
    auto shortBlob = packet(1, 0xB179, 13);
    shortBlob.pop_back();
    generator.updateWithData(shortBlob);
    EXPECT_TRUE(receivedPackets().empty());
    generator.updateWithData(packet(1, 0xB179, 13));
    ASSERT_EQ(receivedPackets().size(), 1u);
    EXPECT_EQ(receivedPackets()[0].code, 0xB179);
    EXPECT_EQ(receivedPackets()[0].code, 45433);
}

TEST_F(IntakeTest, ChannelPrefixIsCutBeforeDispatch) {
    std::vector<std::uint8_t> blob{0x81, 0x00};
    const auto inner = packet(1, 0xB179, 20);
    blob.insert(blob.end(), inner.begin(), inner.end());
    generator.updateWithData(blob);
    ASSERT_EQ(receivedPackets().size(), 1u);
    EXPECT_EQ(receivedPackets()[0].packet, inner);
}

TEST_F(IntakeTest, PrefixedThirteenByteBlobPassesWithElevenBytePacket) {
    std::vector<std::uint8_t> blob{0x81, 0x00};
    const auto inner = packet(1, 0xB179, 11);
    blob.insert(blob.end(), inner.begin(), inner.end());
    ASSERT_EQ(blob.size(), 13u);
    generator.updateWithData(blob);
    ASSERT_EQ(receivedPackets().size(), 1u);
    EXPECT_EQ(receivedPackets()[0].packet.size(), 11u);
}

TEST_F(IntakeTest, InvalidLogTypeIsLoggedAndDropped) {
    testing::LogCapture capture;
    generator.updateWithData(packet(2, 0xB179));
    EXPECT_TRUE(receivedPackets().empty());
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogError, "Invalid log type: 2. Dropping."}}));
    capture.clear();
    generator.updateWithData(packet(0xAB, 0xB179));
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"Invalid log type: ab. Dropping."});
}

TEST_F(IntakeTest, ExtendedTypeAddsTheExtendedBase) {
    generator.updateWithData(packet(0xFF, 0x1234));
    ASSERT_EQ(receivedPackets().size(), 1u);
    EXPECT_EQ(receivedPackets()[0].decoder, "Extended");
    EXPECT_EQ(receivedPackets()[0].code, 16716340);
}

TEST_F(IntakeTest, CodeBytesAreLittleEndian) {
    auto bytes = packet(1, 0);
    bytes[3] = 0x79;
    bytes[4] = 0xB1;
    generator.updateWithData(bytes);
    ASSERT_EQ(receivedPackets().size(), 1u);
    EXPECT_EQ(receivedPackets()[0].code, 0xB179);
}

TEST_F(IntakeTest, UnknownCodeChangesNothingButBinData) {
    testing::LogCapture capture;
    const auto blob = packet(1, 0x4242);
    generator.updateState(state, blob);
    EXPECT_TRUE(receivedPackets().empty());
    EXPECT_EQ(*generator.binData(), PlistData(blob.begin(), blob.end()));
    EXPECT_FALSE(capture.contains("Invalid log type: 1. Dropping."));
}

TEST_F(IntakeTest, EveryBlobIsAppendedToBinDataAsReceived) {
    testing::LogCapture capture;
    const std::vector<std::uint8_t> shortBlob{1, 2, 3};
    const auto invalid = packet(2, 0xB179);
    std::vector<std::uint8_t> prefixed{0x81, 0x05};
    const auto inner = packet(1, 0xB179);
    prefixed.insert(prefixed.end(), inner.begin(), inner.end());
    generator.updateState(state, shortBlob);
    generator.updateState(state, invalid);
    generator.updateState(state, prefixed);
    PlistData expected(shortBlob.begin(), shortBlob.end());
    expected.insert(expected.end(), invalid.begin(), invalid.end());
    expected.insert(expected.end(), prefixed.begin(), prefixed.end());
    EXPECT_EQ(*generator.binData(), expected);
    EXPECT_EQ(receivedPackets().size(), 1u);
}

TEST_F(IntakeTest, SubscribersReceiveTheSamePacketInOrder) {
    RecordingGenerator shared{"NoSuchTemplate",
                              {{"One", std::vector<std::int32_t>{5}}, {"Two", std::vector<std::int32_t>{5}}}};
    shared.updateWithData(packet(1, 5, 30));
    ASSERT_EQ(receivedPackets().size(), 2u);
    EXPECT_EQ(receivedPackets()[0].decoder, "One");
    EXPECT_EQ(receivedPackets()[1].decoder, "Two");
    EXPECT_EQ(receivedPackets()[0].packet, receivedPackets()[1].packet);
}

}  // namespace
}  // namespace velmar
