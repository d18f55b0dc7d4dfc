// The history of numeric values: what is sampled, the bounds of a series, the memory cap and what gives way
// under it, forgetting, and a wall clock that steps back.
#include "core/ValueHistory.h"

#include <gtest/gtest.h>

#include <iostream>
#include <map>
#include <string>

namespace velmar {
namespace {

using Leaves = std::map<std::string, std::string>;

// A display of one "Cell" dictionary holding the given leaves, as the tree builder makes it.
class Display {
  public:
    explicit Display(const Leaves& leaves) {
        auto cell = PlistDictionary::create();
        for (const auto& [name, value] : leaves) {
            cell->set(name, value);
        }
        auto root = PlistDictionary::create();
        root->set("Cell", cell);
        root->set("Mode", "Idle");
        VelmarModelNode::makeTreeFromObject(root, paths_);
    }
    const NodePathDictionary& paths() const { return paths_; }

  private:
    NodePathDictionary paths_;
};

// Leaves "L0".."L<count-1>", all numbers.
Display numbers(int count, double value) {
    Leaves leaves;
    for (int i = 0; i < count; ++i) {
        leaves["L" + std::to_string(i)] = std::to_string(static_cast<int>(value) + i) + " dB";
    }
    return Display(leaves);
}

TEST(ValueHistoryTest, SamplesEveryNumericLeafWithItsUnitUnderItsPath) {
    ValueHistory history;
    history.sample(Display(Leaves{{"RSRP", "-99.75 dBm"},
                                  {"PCI", "12"},
                                  {"RSRQ", "-10.88 dB"},
                                  {"State", "Not Present"},
                                  {"Band", "10 MHz"},
                                  {"Access", "N/A"}})
                       .paths(),
                   1000.0);
    EXPECT_EQ(history.seriesCount(), 3u);
    const ValueSeries* rsrp = history.series("/Cell/RSRP");
    ASSERT_TRUE(rsrp);
    ASSERT_EQ(rsrp->size(), 1u);
    EXPECT_EQ(rsrp->unit(), "dBm");
    EXPECT_EQ(rsrp->decimals(), 2);
    EXPECT_EQ(rsrp->newest().time, 1000.0);
    EXPECT_EQ(rsrp->newest().value, -99.75);
    ASSERT_TRUE(history.series("/Cell/PCI"));
    EXPECT_EQ(history.series("/Cell/PCI")->unit(), "");
    EXPECT_EQ(history.series("/Cell/PCI")->decimals(), 0);
    EXPECT_EQ(history.series("/Cell/RSRQ")->newest().value, -10.88);
    EXPECT_EQ(history.series("/Cell/State"), nullptr);
    EXPECT_EQ(history.series("/Cell/Band"), nullptr);
    EXPECT_EQ(history.series("/Mode"), nullptr);
    EXPECT_EQ(history.newestTime(), 1000.0);
}

TEST(ValueHistoryTest, OneHourAtTheDisplayIntervalByDefault) {
    const ValueHistory history;
    EXPECT_EQ(history.samplesPerSeries(), 1801u);  // 0 s, 2 s, ... 3600 s
    EXPECT_EQ(history.limits().maxBytes, 16u << 20);
    // What one full series costs; the cap holds a few hundred of them.
    const std::size_t full = history.bytesOfFullSeries(60);
    EXPECT_GE(full, 1801u * sizeof(ValueSample));
    EXPECT_LT(full, 1801u * sizeof(ValueSample) + 512);
    std::cout << "bytes per full series (60-byte path): " << full
              << ", full series under the cap: " << history.limits().maxBytes / full << std::endl;
}

TEST(ValueHistoryTest, ASeriesKeepsItsNewestSamplesOldestFirst) {
    ValueHistory history({.windowSeconds = 20.0, .intervalSeconds = 2.0, .maxBytes = 1u << 20});
    ASSERT_EQ(history.samplesPerSeries(), 11u);
    for (int tick = 0; tick < 30; ++tick) {
        history.sample(Display(Leaves{{"RSRP", std::to_string(-100 + tick) + " dBm"}}).paths(), 2.0 * tick);
        const ValueSeries* series = history.series("/Cell/RSRP");
        ASSERT_TRUE(series);
        EXPECT_EQ(series->size(), std::min<std::size_t>(tick + 1, 11u));
        EXPECT_LE(series->capacity(), 11u);
    }
    const ValueSeries& series = *history.series("/Cell/RSRP");
    for (std::size_t i = 0; i < series.size(); ++i) {
        EXPECT_EQ(series.at(i).time, 2.0 * (19 + static_cast<double>(i)));
        EXPECT_EQ(series.at(i).value, -100.0 + 19 + static_cast<double>(i));
    }
    EXPECT_EQ(series.firstIndexAtOrAfter(0.0), 0u);
    EXPECT_EQ(series.firstIndexAtOrAfter(45.0), 4u);  // 38, 40, 42, 44, then 46
    EXPECT_EQ(series.firstIndexAtOrAfter(46.0), 4u);
    EXPECT_EQ(series.firstIndexAtOrAfter(1000.0), series.size());
}

TEST(ValueHistoryTest, SeriesGrowAsTheyFillAndTheBytesAddUp) {
    ValueHistory history;
    const std::size_t emptyBytes = history.bytes();
    EXPECT_EQ(emptyBytes, 0u);
    history.sample(numbers(1, -90).paths(), 0.0);
    const ValueSeries* series = history.series("/Cell/L0");
    ASSERT_TRUE(series);
    EXPECT_EQ(series->capacity(), ValueHistory::kInitialSamples);
    const std::size_t oneSeries = history.bytes();
    EXPECT_GT(oneSeries, ValueHistory::kInitialSamples * sizeof(ValueSample));
    for (int tick = 1; tick <= 16; ++tick) {
        history.sample(numbers(1, -90).paths(), 2.0 * tick);
    }
    EXPECT_EQ(series->size(), 17u);
    EXPECT_EQ(series->capacity(), 2 * ValueHistory::kInitialSamples);
    EXPECT_EQ(history.bytes(), oneSeries + ValueHistory::kInitialSamples * sizeof(ValueSample));
    for (int tick = 17; tick < 2000; ++tick) {
        history.sample(numbers(1, -90).paths(), 2.0 * tick);
    }
    EXPECT_EQ(series->size(), 1801u);
    EXPECT_EQ(series->capacity(), 1801u);
    EXPECT_EQ(history.bytes(), history.bytesOfFullSeries(std::string("/Cell/L0").size()));
}

TEST(ValueHistoryTest, TheMemoryCapHoldsWhenEverySeriesIsCurrent) {
    ValueHistory::Limits limits{.windowSeconds = 3600.0, .intervalSeconds = 2.0, .maxBytes = 0};
    const std::size_t full = ValueHistory(limits).bytesOfFullSeries(8);
    limits.maxBytes = 3 * full;
    ValueHistory history(limits);
    // Five series in every tree: more than three cannot be held in full.
    std::size_t most = 0;
    for (int tick = 0; tick < 2000; ++tick) {
        history.sample(numbers(5, -90).paths(), 2.0 * tick);
        ASSERT_LE(history.bytes(), limits.maxBytes) << "tick " << tick;
        most = std::max(most, history.bytes());
    }
    EXPECT_GT(most, limits.maxBytes * 9 / 10);  // the room is used, not left idle
    EXPECT_EQ(history.seriesCount(), 5u);       // every path keeps a shorter window
    std::size_t samples = 0;
    for (int i = 0; i < 5; ++i) {
        const ValueSeries* series = history.series("/Cell/L" + std::to_string(i));
        ASSERT_TRUE(series);
        EXPECT_LT(series->size(), 1801u);
        EXPECT_EQ(series->newest().time, 2.0 * 1999);
        samples += series->size();
    }
    EXPECT_LE(samples * sizeof(ValueSample), limits.maxBytes);
    EXPECT_EQ(history.droppedSamples(), 0u);
}

TEST(ValueHistoryTest, ANewPathIsDroppedWhenThereIsNoRoomAtAll) {
    ValueHistory::Limits limits{.windowSeconds = 3600.0, .intervalSeconds = 2.0, .maxBytes = 0};
    limits.maxBytes = ValueHistory(limits).bytesOfFullSeries(8) + 100;
    ValueHistory history(limits);
    for (int tick = 0; tick < 1900; ++tick) {
        history.sample(numbers(1, -90).paths(), 2.0 * tick);
    }
    ASSERT_EQ(history.series("/Cell/L0")->size(), 1801u);
    history.sample(numbers(2, -90).paths(), 2.0 * 1900);
    EXPECT_EQ(history.series("/Cell/L1"), nullptr);
    EXPECT_EQ(history.droppedSamples(), 1u);
    EXPECT_LE(history.bytes(), limits.maxBytes);
    EXPECT_EQ(history.series("/Cell/L0")->newest().time, 2.0 * 1900);
}

TEST(ValueHistoryTest, SeriesThatLeftTheDisplayGiveWayFirstStalestFirst) {
    ValueHistory::Limits limits{.windowSeconds = 3600.0, .intervalSeconds = 2.0, .maxBytes = 0};
    limits.maxBytes = 3 * ValueHistory(limits).bytesOfFullSeries(8);
    ValueHistory history(limits);
    double time = 0.0;
    // A and B fill up; A leaves the display before B.
    for (int tick = 0; tick < 1801; ++tick, time += 2.0) {
        history.sample(Display(Leaves{{"A", "1"}, {"B", "2"}}).paths(), time);
    }
    history.sample(Display(Leaves{{"B", "2"}}).paths(), time);
    time += 2.0;
    // C and D need the room of more than one full series; A goes first, then B.
    for (int tick = 0; tick < 1801; ++tick, time += 2.0) {
        history.sample(Display(Leaves{{"C", "3"}, {"D", "4"}}).paths(), time);
        ASSERT_LE(history.bytes(), limits.maxBytes);
        ASSERT_FALSE(history.series("/Cell/A") != nullptr && history.series("/Cell/B") == nullptr)
            << "the newer series went first";
    }
    EXPECT_EQ(history.series("/Cell/A"), nullptr);
    ASSERT_TRUE(history.series("/Cell/C"));
    ASSERT_TRUE(history.series("/Cell/D"));
    EXPECT_EQ(history.series("/Cell/C")->size(), 1801u);
    EXPECT_EQ(history.series("/Cell/D")->size(), 1801u);
    EXPECT_EQ(history.droppedSamples(), 0u);
}

TEST(ValueHistoryTest, ASeriesAbsentForAWholeWindowIsForgotten) {
    ValueHistory history({.windowSeconds = 60.0, .intervalSeconds = 2.0, .maxBytes = 1u << 20});
    history.sample(Display(Leaves{{"A", "1"}, {"B", "2"}}).paths(), 0.0);
    const std::size_t both = history.bytes();
    history.sample(Display(Leaves{{"B", "2"}}).paths(), 60.0);
    EXPECT_TRUE(history.series("/Cell/A"));  // exactly a window old: still shown
    history.sample(Display(Leaves{{"B", "2"}}).paths(), 61.0);
    EXPECT_EQ(history.series("/Cell/A"), nullptr);
    EXPECT_TRUE(history.series("/Cell/B"));
    EXPECT_LT(history.bytes(), both);
}

TEST(ValueHistoryTest, AValueThatStopsBeingANumberLeavesAGapNotAZero) {
    ValueHistory history;
    history.sample(Display(Leaves{{"RSRP", "-99.75 dBm"}}).paths(), 0.0);
    history.sample(Display(Leaves{{"RSRP", "Not Present"}}).paths(), 2.0);
    history.sample(Display(Leaves{{"RSRP", "-98.00 dBm"}}).paths(), 4.0);
    const ValueSeries& series = *history.series("/Cell/RSRP");
    ASSERT_EQ(series.size(), 2u);
    EXPECT_EQ(series.at(0).time, 0.0);
    EXPECT_EQ(series.at(1).time, 4.0);
    EXPECT_EQ(series.at(1).value, -98.0);
}

TEST(ValueHistoryTest, TheUnitIsTheNewestSamples) {
    ValueHistory history;
    history.sample(Display(Leaves{{"FER", "1.56% (old)"}}).paths(), 0.0);
    history.sample(Display(Leaves{{"FER", "2.00%"}}).paths(), 2.0);
    EXPECT_EQ(history.series("/Cell/FER")->unit(), "%");
}

TEST(ValueHistoryTest, AWallClockSteppingBackClearsTheHistory) {
    ValueHistory history;
    history.sample(Display(Leaves{{"A", "1"}}).paths(), 100.0);
    history.sample(Display(Leaves{{"A", "2"}}).paths(), 100.0);  // the same instant is no step back
    EXPECT_EQ(history.series("/Cell/A")->size(), 2u);
    history.sample(Display(Leaves{{"A", "3"}}).paths(), 50.0);
    ASSERT_TRUE(history.series("/Cell/A"));
    EXPECT_EQ(history.series("/Cell/A")->size(), 1u);
    EXPECT_EQ(history.series("/Cell/A")->newest().value, 3.0);
    EXPECT_EQ(history.newestTime(), 50.0);
}

TEST(ValueHistoryTest, ClearForgetsEverything) {
    ValueHistory history;
    history.sample(numbers(4, -90).paths(), 10.0);
    ASSERT_EQ(history.seriesCount(), 4u);
    history.clear();
    EXPECT_EQ(history.seriesCount(), 0u);
    EXPECT_EQ(history.bytes(), 0u);
    EXPECT_EQ(history.newestTime(), 0.0);
    EXPECT_EQ(history.series("/Cell/L0"), nullptr);
}

}  // namespace
}  // namespace velmar
