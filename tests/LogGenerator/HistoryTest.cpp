#include <gtest/gtest.h>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/Clock.h"
#include "core/platform/KxServerProtocol.h"

namespace velmar {
namespace {

using namespace state_keys;

class HistoryTest : public ::testing::Test {
  protected:
    void SetUp() override { Clock::setNowForTesting(1'700'000'000.0); }
    void TearDown() override { Clock::setNowForTesting(std::nullopt); }

    StateDict fullState() {
        StateDict state = PlistDictionary::create();
        state->set(kDisplayState, PlistValue::data({1, 2, 3}));
        auto section = PlistDictionary::create();
        section->set("RSSI", "-70 dBm");
        auto display = PlistDictionary::create();
        display->set("Cell", section);
        state->set(kDisplay, display);
        state->set(kExtraInfo, PlistValue::newDictionary());
        return state;
    }
};

TEST_F(HistoryTest, FirstCallCreatesHistoryWithOneEntry) {
    StateDict state = fullState();
    LogGenerator::updateHistoryInState(state);
    const PlistArrayRef history = state->get(kHistory).array();
    ASSERT_TRUE(history);
    ASSERT_EQ(history->size(), 1u);
    const PlistDictionaryRef entry = history->at(0).dictionary();
    ASSERT_TRUE(entry);
    std::vector<std::string> keys;
    for (const auto& [key, value] : *entry) {
        keys.push_back(key);
    }
    EXPECT_EQ(keys,
              (std::vector<std::string>{"DisplayState", "Display", "ExtraInfo", "Date", "Description"}));
    EXPECT_EQ(*entry->get(kDate).string(), "2023-11-14 22:13:20 +0000");
    EXPECT_EQ(*entry->get(kDescription).string(), "Snapshot (2023-11-14 22:13:20 +0000)");
}

TEST_F(HistoryTest, FiveEntriesStayFiveWithNewestLast) {
    StateDict state = fullState();
    for (int i = 0; i < 5; ++i) {
        Clock::setNowForTesting(1'700'000'000.0 + i);
        LogGenerator::updateHistoryInState(state);
    }
    Clock::setNowForTesting(1'700'000'100.0);
    LogGenerator::updateHistoryInState(state);
    const PlistArrayRef history = state->get(kHistory).array();
    ASSERT_EQ(history->size(), 5u);
    EXPECT_EQ(*history->at(0).dictionary()->get(kDate).string(), "2023-11-14 22:13:21 +0000");
    EXPECT_EQ(*history->at(4).dictionary()->get(kDate).string(), "2023-11-14 22:15:00 +0000");
}

TEST_F(HistoryTest, SevenEntriesAreCutToFive) {
    StateDict state = fullState();
    auto history = PlistArray::create();
    for (int i = 0; i < 7; ++i) {
        history->append(PlistValue(std::to_string(i)));
    }
    state->set(kHistory, history);
    LogGenerator::updateHistoryInState(state);
    ASSERT_EQ(history->size(), 5u);
    EXPECT_EQ(*history->at(0).string(), "3");
    EXPECT_EQ(*history->at(3).string(), "6");
    EXPECT_TRUE(history->at(4).isDictionary());
}

TEST_F(HistoryTest, EntryStopsAtFirstAbsentValue) {
    StateDict state = PlistDictionary::create();
    state->set(kDisplayState, PlistValue::data({9}));
    state->set(kExtraInfo, PlistValue::newDictionary());
    LogGenerator::updateHistoryInState(state);
    const PlistDictionaryRef entry = state->get(kHistory).array()->at(0).dictionary();
    EXPECT_EQ(entry->size(), 1u);
    EXPECT_TRUE(entry->contains(kDisplayState));

    StateDict empty = PlistDictionary::create();
    LogGenerator::updateHistoryInState(empty);
    EXPECT_TRUE(empty->get(kHistory).array()->at(0).dictionary()->empty());
}

TEST_F(HistoryTest, OlderEntryDisplaySharesNestedSectionsButNotDisplayState) {
    StateDict state = fullState();
    LogGenerator::updateHistoryInState(state);
    const PlistDictionaryRef entry = state->get(kHistory).array()->at(0).dictionary();

    // A decoder updates its section in place and the generator replaces the raw buffer.
    state->get(kDisplay).dictionary()->get("Cell").dictionary()->set("RSSI", "-99 dBm");
    state->set(kDisplayState, PlistValue::data({7, 7}));
    state->get(kDisplay).dictionary()->set("New top-level key", "x");

    const PlistDictionaryRef oldDisplay = entry->get(kDisplay).dictionary();
    EXPECT_EQ(*oldDisplay->get("Cell").dictionary()->get("RSSI").string(), "-99 dBm");
    EXPECT_FALSE(oldDisplay->contains("New top-level key"));
    EXPECT_EQ(*entry->get(kDisplayState).dataValue(), (PlistData{1, 2, 3}));
}

TEST(GeneratorFactory, UnknownTechnologyYieldsNull) {
    EXPECT_EQ(LogGenerator::generatorFromTechnology("kKxLogChannelTechnology_Unknown"), nullptr);
    EXPECT_EQ(LogGenerator::generatorFromTechnology(""), nullptr);
    EXPECT_EQ(LogGenerator::generatorFromTechnology("kkxlogchanneltechnology_orvane_lte"), nullptr);
}

TEST(GeneratorFactory, TechnologyConstantsAreTheirOwnNames) {
    EXPECT_EQ(kKxLogChannelTechnology_Orvane_LTE, "kKxLogChannelTechnology_Orvane_LTE");
    EXPECT_EQ(kKxLogChannelTechnology_IFX, "kKxLogChannelTechnology_IFX");
    EXPECT_EQ(kKxCellMonitorCellTypeServing, "kKxCellMonitorCellTypeServing");
}

}  // namespace
}  // namespace velmar
