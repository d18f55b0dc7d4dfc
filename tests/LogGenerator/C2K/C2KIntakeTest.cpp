// Intake of the CDMA2000 generator: framing, the log-type message that does not drop, the extended codes,
// the binary buffer of handled packets, refresh, history and save contents.
#include <gtest/gtest.h>

#include "LogGenerator/StateKeys.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::C2KHarness;

PlistData statusPacket(std::uint16_t channel) {
    EvdoStatusRecord status;
    status.channel = channel;
    status.deviceState = 5;
    return buildEvdoStatusRecord(status);
}

PlistData withPrefix(const PlistData& packet) {
    PlistData blob;
    blob.reserve(2 + packet.size());
    blob.push_back(0x81);
    blob.push_back(0x00);
    blob.insert(blob.end(), packet.begin(), packet.end());
    return blob;
}

PlistData displayState(const StateDict& state) {
    const PlistDataRef bytes = state->get(state_keys::kDisplayState).dataValue();
    return bytes ? *bytes : PlistData{0xEE};
}

TEST(C2KIntake, TwelveByteBlobIsIgnoredAndNotKept) {
    C2KHarness harness;
    testing::LogCapture capture;
    PlistData blob = statusPacket(283);
    blob.resize(12);
    harness.feed(blob);
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), PlistData{});
}

TEST(C2KIntake, ThirteenByteBlobReachesItsParserAndIsKept) {
    C2KHarness harness;
    testing::LogCapture capture;
    const PlistData blob = RecordBuilder(0x1183).build();
    ASSERT_EQ(blob.size(), 13u);
    harness.feed(blob);
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code 0x1183 is 13 bytes long but should be 50 bytes."});
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), blob);
}

TEST(C2KIntake, ChannelPrefixIsCutBeforeParsingAndKeeping) {
    C2KHarness harness;
    const PlistData packet = statusPacket(283);
    harness.feed(withPrefix(packet));
    EXPECT_EQ(harness.shown("kChannel"), "283");
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), packet);
}

TEST(C2KIntake, PrefixedThirteenByteBlobPassesWithAnElevenBytePacket) {
    C2KHarness harness;
    testing::LogCapture capture;
    PlistData blob = withPrefix(RecordBuilder(0x1183).build());
    blob.resize(13);
    harness.feed(blob);
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code 0x1183 is 11 bytes long but should be 50 bytes."});
}

TEST(C2KIntake, InvalidLogTypeIsLoggedButThePacketIsProcessed) {
    C2KHarness harness;
    testing::LogCapture capture;
    PlistData packet = statusPacket(777);
    packet[0] = 0x02;
    harness.feed(packet);
    EXPECT_EQ(capture.textsAt(kLogError), std::vector<std::string>{"Invalid log type: 2. Dropping."});
    EXPECT_EQ(harness.shown("kChannel"), "777");
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), packet);
}

TEST(C2KIntake, ExtendedLogTypeIsLoggedAndItsCodeMatchesNoParser) {
    C2KHarness harness;
    testing::LogCapture capture;
    PlistData packet = statusPacket(777);
    packet[0] = 0xFF;  // code 0xFF1183
    harness.feed(packet);
    EXPECT_EQ(capture.textsAt(kLogError), std::vector<std::string>{"Invalid log type: ff. Dropping."});
    EXPECT_EQ(harness.shown("kChannel"), "");
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), PlistData{});
}

TEST(C2KIntake, OtherCodesAreIgnoredAndNotKept) {
    C2KHarness harness;
    testing::LogCapture capture;
    harness.feed(RecordBuilder(0xB0C1).resize(60).build());
    harness.feed(RecordBuilder(0x1184).resize(50).build());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), PlistData{});
}

TEST(C2KIntake, RefreshMovesTheHandledPacketsUnderDisplayStateAndAppendsHistory) {
    C2KHarness harness;
    const PlistData first = statusPacket(1);
    const PlistData second = statusPacket(2);
    harness.feed(first);
    harness.feed(second);
    const PlistValue shown = harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(shown.dictionary(), harness.state->get(state_keys::kDisplay).dictionary());
    PlistData both = first;
    both.insert(both.end(), second.begin(), second.end());
    EXPECT_EQ(displayState(harness.state), both);

    harness.generator.generateLogUsingState(harness.state);
    EXPECT_EQ(displayState(harness.state), PlistData{});
    const PlistArrayRef history = harness.state->get(state_keys::kHistory).array();
    ASSERT_TRUE(history);
    ASSERT_EQ(history->size(), 2u);
    EXPECT_EQ(*history->at(0).dictionary()->get(state_keys::kDisplayState).dataValue(), both);
}

TEST(C2KIntake, RefreshBeforeAnyBlobAnswersNoDisplay) {
    C2KLogGenerator generator;
    const StateDict state = PlistDictionary::create();
    EXPECT_TRUE(generator.generateLogUsingState(state).isNone());
    EXPECT_EQ(*state->get(state_keys::kDisplayState).dataValue(), PlistData{});
}

TEST(C2KIntake, SaveContentsCarryTheHistoryAndADlfOfThePackets) {
    C2KHarness harness;
    const PlistData packet = statusPacket(283);
    harness.feed(packet);
    harness.generator.generateLogUsingState(harness.state);
    const PlistArrayRef contents = harness.generator.getSaveContentsFromState(harness.state).array();
    ASSERT_TRUE(contents);
    ASSERT_EQ(contents->size(), 2u);
    EXPECT_TRUE(contents->at(0).dictionary()->contains(state_keys::kDisplay));
    const PlistDictionaryRef dlf = contents->at(1).dictionary();
    // 161 bytes of version report, then the 50-byte packet without its log-type byte.
    EXPECT_EQ(dlf->get("Description"), PlistValue("DLF binary (210 bytes)"));
    const PlistDataRef file = dlf->get("DLF").dataValue();
    ASSERT_TRUE(file);
    ASSERT_EQ(file->size(), 210u);
    EXPECT_EQ(PlistData(file->begin() + 161, file->end()), PlistData(packet.begin() + 1, packet.end()));
}

}  // namespace
}  // namespace velmar
