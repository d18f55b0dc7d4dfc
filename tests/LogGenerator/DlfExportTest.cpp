#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <ctime>

#include "LogGenerator/DlfVersionReport.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/BuildInfo.h"
#include "core/platform/Clock.h"
#include "core/platform/SystemLog.h"
#include "tests/LogGenerator/RecordingDecoder.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using namespace state_keys;

std::uint32_t le(const std::uint8_t* at, int width) {
    std::uint32_t value = 0;
    for (int i = width - 1; i >= 0; --i) {
        value = (value << 8) | at[i];
    }
    return value;
}

TEST(DlfVersionReport, TooShortBufferReturnsThreeAndWritesNothing) {
    std::vector<std::uint8_t> buffer(160, 0xEE);
    std::uint32_t written = 99;
    EXPECT_EQ(MoxDLFAddVersionReport(buffer.data(), 160, &written, 1, 1, "v", "e", "d", 0), 3);
    EXPECT_EQ(written, 0u);
    EXPECT_EQ(buffer, std::vector<std::uint8_t>(160, 0xEE));
}

TEST(DlfVersionReport, RecordByteByByte) {
    std::vector<std::uint8_t> buffer(161, 0xEE);
    std::uint32_t written = 0;
    const std::uint64_t timeInfo = packDlfTimeInfo(0x01020304u, -210, true);
    ASSERT_EQ(MoxDLFAddVersionReport(buffer.data(), 161, &written, 1, 2, "Velmar 0.1.0", "EXECUTABLE_NAME",
                                     "Nov 21 2026 18:30:45", timeInfo),
              0);
    EXPECT_EQ(written, 161u);

    std::vector<std::uint8_t> expected(161, 0);
    const std::uint8_t header[] = {0xA1, 0x00, 0xFD, 0x1F, 0, 0, 0, 0, 0, 0, 0, 0, 0x01, 0x00, 0x02, 0x00};
    std::memcpy(expected.data(), header, sizeof header);
    std::memcpy(&expected[16], "Velmar", 6);              // 7-byte field: 6 characters and the NUL
    std::memcpy(&expected[23], "EXECUTABLE_NAME", 15);    // 15 characters and the NUL, rest of 40 zero
    std::memcpy(&expected[63], "Nov 21 2026 18:30", 17);  // 18-byte field: seconds are lost
    const std::uint8_t time[] = {0x04, 0x03, 0x02, 0x01};
    std::memcpy(&expected[81], time, 4);
    expected[85] = 0x2E;  // -210 = 0xFF2E
    expected[86] = 0xFF;
    expected[87] = 1;
    expected[88] = 0;
    EXPECT_EQ(buffer, expected);
}

TEST(DlfVersionReport, ExecutableNameLongerThanFifteenCharactersIsCut) {
    std::vector<std::uint8_t> buffer(161, 0);
    std::uint32_t written = 0;
    MoxDLFAddVersionReport(buffer.data(), 161, &written, 1, 1, "", "ABCDEFGHIJKLMNOPQRSTUVWXYZ", "", 0);
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&buffer[23])), "ABCDEFGHIJKLMNO");
    for (int i = 38; i < 63; ++i) {
        EXPECT_EQ(buffer[i], 0) << i;
    }
}

class DlfExportTest : public ::testing::Test {
  protected:
    void SetUp() override {
        previousTz_ = std::getenv("TZ") ? std::getenv("TZ") : "";
        Clock::setNowForTesting(1'790'000'000.0);
    }
    void TearDown() override {
        setenv("TZ", previousTz_.c_str(), 1);
        tzset();
        Clock::setNowForTesting(std::nullopt);
    }
    static void useZone(const char* tz) {
        setenv("TZ", tz, 1);
        tzset();
    }
    static PlistDictionaryRef entryWithDisplayState(PlistValue displayState) {
        auto entry = PlistDictionary::create();
        entry->set(kDisplayState, std::move(displayState));
        return entry;
    }

    std::string previousTz_;
    testing::RecordingGenerator generator{"Test", {}};
    StateDict state = PlistDictionary::create();
};

TEST_F(DlfExportTest, WithoutHistoryTheFileIsTheVersionRecordAlone) {
    useZone("UTC0");
    const PlistArrayRef contents = generator.getSaveContentsFromState(state).array();
    ASSERT_TRUE(contents);
    ASSERT_EQ(contents->size(), 1u);
    const PlistDictionaryRef dlf = contents->at(0).dictionary();
    EXPECT_EQ(*dlf->get("Description").string(), "DLF binary (161 bytes)");
    const PlistData& file = *dlf->get("DLF").dataValue();
    ASSERT_EQ(file.size(), 161u);
    EXPECT_EQ(le(&file[0], 2), 161u);
    EXPECT_EQ(le(&file[2], 2), 0x1FFDu);
    EXPECT_EQ(le(&file[12], 2), 1u);
    EXPECT_EQ(le(&file[14], 2), 1u);
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&file[16])), "Velmar");
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&file[23])), "EXECUTABLE_NAME");
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&file[63])),
              BuildInfo::buildDateTime().substr(0, 17));
    EXPECT_EQ(le(&file[81], 4), 1'790'000'000u);
    EXPECT_EQ(le(&file[85], 2), 0u);
    EXPECT_EQ(le(&file[87], 2), 0u);
    for (int i = 89; i < 161; ++i) {
        EXPECT_EQ(file[i], 0) << i;
    }
}

TEST_F(DlfExportTest, ZoneWestOfUtcByThreeAndAHalfHours) {
    useZone("NST3:30");
    const PlistDataRef file = generator.generateDlfFromState(state);
    ASSERT_TRUE(file);
    EXPECT_EQ(static_cast<std::int16_t>(le(&(*file)[85], 2)), -210);
    EXPECT_EQ(le(&(*file)[87], 2), 0u);
}

TEST_F(DlfExportTest, ZoneEastOfUtcByFiveHoursAndThreeQuarters) {
    useZone("NPT-5:45");
    const PlistDataRef file = generator.generateDlfFromState(state);
    ASSERT_TRUE(file);
    EXPECT_EQ(static_cast<std::int16_t>(le(&(*file)[85], 2)), 345);
}

TEST_F(DlfExportTest, DaylightSavingFlagFollowsTheZone) {
    // 1,790,000,000 s is in September 2026, summer time in this zone.
    useZone("CET-1CEST,M3.5.0,M10.5.0/3");
    const PlistDataRef file = generator.generateDlfFromState(state);
    ASSERT_TRUE(file);
    EXPECT_EQ(static_cast<std::int16_t>(le(&(*file)[85], 2)), 120);
    EXPECT_EQ(le(&(*file)[87], 2), 1u);
}

TEST_F(DlfExportTest, VersionTextIsTruncatedToSixCharactersOrShowsNone) {
    EXPECT_EQ(ORVLogGenerator::dlfVersionText(std::string("1234")), "Velmar 1234");
    EXPECT_EQ(ORVLogGenerator::dlfVersionText(std::nullopt), "(none)");
    generator.version = std::string("1234");
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&(*generator.generateDlfFromState(state))[16])),
              "Velmar");
    generator.version = std::nullopt;
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(&(*generator.generateDlfFromState(state))[16])),
              "(none)");
}

TEST_F(DlfExportTest, EachHistoryEntryContributesItsBytesAfterTheFirst) {
    PlistData thirteen(13);
    for (std::size_t i = 0; i < thirteen.size(); ++i) {
        thirteen[i] = static_cast<std::uint8_t>(0x10 + i);
    }
    auto history = PlistArray::create({PlistValue(entryWithDisplayState(PlistValue::data({0x55}))),
                                       PlistValue(PlistDictionary::create()),
                                       PlistValue(entryWithDisplayState(PlistValue::data(thirteen)))});
    state->set(kHistory, history);
    const PlistArrayRef contents = generator.getSaveContentsFromState(state).array();
    ASSERT_EQ(contents->size(), 4u);
    EXPECT_EQ(contents->at(0), history->at(0));
    const PlistDictionaryRef dlf = contents->at(3).dictionary();
    EXPECT_EQ(*dlf->get("Description").string(), "DLF binary (173 bytes)");
    const PlistData& file = *dlf->get("DLF").dataValue();
    ASSERT_EQ(file.size(), 173u);
    EXPECT_EQ(PlistData(file.begin() + 161, file.end()), PlistData(thirteen.begin() + 1, thirteen.end()));
}

TEST_F(DlfExportTest, NonDataDisplayStateAbortsTheDlfButKeepsTheHistory) {
    auto history = PlistArray::create({PlistValue(entryWithDisplayState(PlistValue("not bytes")))});
    state->set(kHistory, history);
    testing::LogCapture capture;
    const PlistArrayRef contents = generator.getSaveContentsFromState(state).array();
    ASSERT_EQ(contents->size(), 1u);
    EXPECT_EQ(contents->at(0), history->at(0));
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{
                  {16, "Got wrong class writing history to DLF; aborting writing the DLF file"}}));
}

}  // namespace
}  // namespace velmar
