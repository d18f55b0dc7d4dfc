// The simulated LTE baseband decoded by the real LTE generator: every section filled, values within their
// physical ranges and consistent with the radio world, records at the baseband's rates, serving-cell changes
// on a drive, and the same bytes for the same seed.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <map>
#include <string>
#include <vector>

#include "logfile/records/LteRecords.h"
#include "tests/sim/SimDecoding.h"
#include "tests/support/LogCapture.h"

namespace velmar::testing {
namespace {

// The number at the start of a shown value ("-87.25 dBm" -> -87.25); fails the test when there is none.
double numberIn(const PlistValue& value) {
    const std::string* text = value.string();
    EXPECT_NE(text, nullptr);
    if (text == nullptr) {
        return 0;
    }
    char* end = nullptr;
    const double number = std::strtod(text->c_str(), &end);
    EXPECT_NE(end, text->c_str()) << *text;
    return number;
}

std::string textIn(const PlistValue& value) {
    const std::string* text = value.string();
    return text ? *text : std::string("<not a string>");
}

void expectWithin(const PlistValue& value, double low, double high, const std::string& what) {
    const double number = numberIn(value);
    EXPECT_GE(number, low) << what << " = " << textIn(value);
    EXPECT_LE(number, high) << what << " = " << textIn(value);
}

class LteSimulation : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        LogCapture quiet;
        SimDecodingSettings settings;
        settings.technology = "lte";
        settings.seconds = 30;
        run_ = new SimDecodingResult(runSimDecoding(settings));
    }
    static void TearDownTestSuite() {
        delete run_;
        run_ = nullptr;
    }
    static PlistValue section(std::string_view name) { return findInDisplay(run_->display(), name); }

    static SimDecodingResult* run_;
};

SimDecodingResult* LteSimulation::run_ = nullptr;

TEST_F(LteSimulation, FillsEveryKeySectionOfTheTemplate) {
    const std::map<std::string, std::vector<std::string>> keySections = {
        {"Serving Cell Info",
         {"Physical Cell ID", "Download Frequency", "Upload Frequency", "Download Bandwidth",
          "Upload Bandwidth", "Cell Identity", "Tracking Area Code", "Freq Band Indicator", "Num Tx Antennas",
          "UARFCN"}},
        {"Serving Cell Measurements",
         {"Version", "E-ARFCN", "Physical Cell ID", "Serving Layer Priority", "Measured RSRP", "Average RSRP",
          "Measured RSRQ", "Average RSRQ", "Measured RSSI", "Qrxlevmin", "P_Max", "Max UE Tx Power", "Srxlev",
          "Num of Consecutive DRX Cycles of S < 0", "S Intra Search", "S Non Intra Search",
          "Measurement Rules Updated", "Measurement Rules"}},
        {"Connected mode LTE Intra-frequency Measurement",
         {"E-ARFCN", "Serving Physical Cell ID", "Subframe Number", "Serving Filtered RSRP",
          "Serving Filtered RSRQ"}},
        {"Neighbor Measurements", {"Version", "E-ARFCN", "Qrxlevmin"}},
        {"Reselection Candidates", {"Version", "Serving EARFCN", "Serving Cell ID"}},
        {"SIM Info",
         {"EF-ICCID", "EF-MSISDN", "EF-3GPP MAIL BOX DIALING NUMBER", "EF-HPPLMN SEARCH PERIOD", "EF-LOCI",
          "EF-GPRS/PS-LOCI", "EF-ACCESS CONTROL CLASS", "EF-ADMINISTRATIVE DATA", "EF-FPLMN",
          "EF-ACTING HPLMN", "EF-RAT MODE", "EF-PLMN NETWORK NAME", "EF-OPERATOR PLMN LIST", "EF-OPLMNAcT"}},
    };
    for (const auto& [name, keys] : keySections) {
        const PlistValue value = section(name);
        ASSERT_TRUE(value.isDictionary()) << name;
        for (const std::string& key : keys) {
            const PlistValue* shown = value.dictionary()->find(key);
            ASSERT_NE(shown, nullptr) << name << ": " << key;
            ASSERT_TRUE(shown->isString()) << name << ": " << key;
            EXPECT_FALSE(shown->string()->empty()) << name << ": " << key;
        }
    }
}

TEST_F(LteSimulation, FillsEveryListSectionOfTheTemplate) {
    for (const char* name : {"Measured Neighbor Cells", "Detected Cells", "Neighbor Cells List",
                             "Reselection Candidates List", "PDP Context Info"}) {
        const PlistValue value = section(name);
        ASSERT_TRUE(value.isArray()) << name;
        EXPECT_GE(value.array()->size(), 1U) << name;
    }
}

TEST_F(LteSimulation, ShowsLevelsWithinTheirPhysicalRanges) {
    const PlistValue serving = section("Serving Cell Measurements");
    const PlistDictionary& measured = *serving.dictionary();
    expectWithin(measured.get("Measured RSRP"), -140, -44, "Measured RSRP");
    expectWithin(measured.get("Average RSRP"), -140, -44, "Average RSRP");
    expectWithin(measured.get("Measured RSRQ"), -19.5, -3, "Measured RSRQ");
    expectWithin(measured.get("Average RSRQ"), -19.5, -3, "Average RSRQ");
    expectWithin(measured.get("Measured RSSI"), -100, -20, "Measured RSSI");
    expectWithin(measured.get("Srxlev"), -30, 80, "Srxlev");
    expectWithin(measured.get("Physical Cell ID"), 0, 503, "Physical Cell ID");
    EXPECT_EQ(textIn(measured.get("E-ARFCN")), "1300");
    EXPECT_EQ(textIn(measured.get("Qrxlevmin")), "-124 dBm");
    EXPECT_EQ(textIn(measured.get("P_Max")), "23 dBm");

    const PlistDictionary& connected =
        *section("Connected mode LTE Intra-frequency Measurement").dictionary();
    expectWithin(connected.get("Serving Filtered RSRP"), -140, -44, "Serving Filtered RSRP");
    expectWithin(connected.get("Serving Filtered RSRQ"), -19.5, -3, "Serving Filtered RSRQ");
    expectWithin(connected.get("Subframe Number"), 0, 10239, "Subframe Number");

    for (const PlistValue& row : section("Measured Neighbor Cells").array()->items()) {
        expectWithin(row.dictionary()->get("Physical Cell ID"), 0, 503, "neighbour PCI");
        expectWithin(row.dictionary()->get("Filtered RSRP"), -140, -44, "neighbour RSRP");
        expectWithin(row.dictionary()->get("Filtered RSRQ"), -19.5, -3, "neighbour RSRQ");
    }
    for (const PlistValue& row : section("Neighbor Cells List").array()->items()) {
        const PlistDictionary& cell = *row.dictionary();
        expectWithin(cell.get("Measured RSRP"), -140, -44, "idle neighbour RSRP");
        expectWithin(cell.get("Average RSRP"), -140, -44, "idle neighbour average RSRP");
        expectWithin(cell.get("Measured RSRQ"), -19.5, -3, "idle neighbour RSRQ");
        expectWithin(cell.get("Measured RSSI"), -100, -20, "idle neighbour RSSI");
        expectWithin(cell.get("Srxlev"), -30, 80, "idle neighbour Srxlev");
    }
    const PlistDictionary& candidate = *section("Reselection Candidates List").array()->at(0).dictionary();
    EXPECT_EQ(textIn(candidate.get("Candidate RAT Type")), "LTE");
    EXPECT_EQ(textIn(candidate.get("E ARFCN")), "1300");
    expectWithin(candidate.get("Cell ID"), 0, 503, "candidate PCI");
}

TEST_F(LteSimulation, ShowsTheServingCellOfTheWorld) {
    const sim::RadioSnapshot& last = run_->snapshots.back();
    ASSERT_GE(last.servingCell, 0);
    const sim::SimCell& cell = last.cells[static_cast<std::size_t>(last.servingCell)];
    const PlistDictionary& info = *section("Serving Cell Info").dictionary();
    EXPECT_EQ(textIn(info.get("Physical Cell ID")), std::to_string(cell.physicalId));
    EXPECT_EQ(textIn(info.get("Cell Identity")), std::to_string(cell.cellId));
    EXPECT_EQ(textIn(info.get("Tracking Area Code")), std::to_string(cell.areaCode));
    EXPECT_EQ(textIn(info.get("Download Frequency")), "1300");
    EXPECT_EQ(textIn(info.get("Upload Frequency")), "19300");
    EXPECT_EQ(textIn(info.get("Download Bandwidth")), "20 MHz");
    EXPECT_EQ(textIn(info.get("Upload Bandwidth")), "20 MHz");
    EXPECT_EQ(textIn(info.get("Freq Band Indicator")), "3");
    EXPECT_EQ(textIn(info.get("Num Tx Antennas")), "2");
    EXPECT_EQ(textIn(info.get("UARFCN")), "1300");
    // The cell id is a 28-bit E-UTRAN cell id; PLMN 001-01 SIM identities are clearly fake.
    EXPECT_LT(cell.cellId, 1U << 28);
    const PlistDictionary& sim = *section("SIM Info").dictionary();
    EXPECT_EQ(textIn(sim.get("EF-ICCID")).rfind("8900101", 0), 0U);
    EXPECT_EQ(textIn(sim.get("EF-MSISDN")).rfind("+1555", 0), 0U);
    EXPECT_EQ(textIn(sim.get("EF-ACTING HPLMN")), "001-01");
}

TEST_F(LteSimulation, TheServingCellChangesOnADrive) {
    EXPECT_GE(run_->snapshots.back().servingChanges, 1U);
    // The serving cell the display showed at some second differs from the one at the end.
    int first = -1;
    bool changed = false;
    for (const sim::RadioSnapshot& snapshot : run_->snapshots) {
        if (snapshot.servingCell >= 0 && first < 0) {
            first = snapshot.servingCell;
        }
        changed = changed || (first >= 0 && snapshot.servingCell != first);
    }
    EXPECT_TRUE(changed);
}

// Timestamps of the blobs of one code, in 1/800 s.
std::vector<std::uint64_t> ticksOf(const std::vector<PlistData>& blobs, std::int32_t code) {
    std::vector<std::uint64_t> ticks;
    for (const PlistData& blob : blobs) {
        if (logCodeOf(blob) == code) {
            std::uint64_t timestamp = 0;
            for (int byte = 7; byte >= 0; --byte) {
                timestamp = (timestamp << 8) | blob[5 + static_cast<std::size_t>(byte)];
            }
            ticks.push_back(timestamp >> 16);
        }
    }
    return ticks;
}

TEST_F(LteSimulation, LogsAtTheBasebandsRates) {
    // In idle mode the serving measurement comes every DRX cycle of 1.28 s (1024 ticks); a connected
    // period (15 s at least) pauses it.
    const std::vector<std::uint64_t> idle = ticksOf(run_->blobs, 0xB17F);
    ASSERT_GE(idle.size(), 5U);
    for (std::size_t index = 1; index < idle.size(); ++index) {
        const std::uint64_t gap = idle[index] - idle[index - 1];
        EXPECT_TRUE(gap == 1024 || gap > 15 * 800) << gap;
    }
    // Connected: the intra-frequency measurement every 200 ms (160 ticks); idle periods (6 s at least)
    // pause it.
    const std::vector<std::uint64_t> connected = ticksOf(run_->blobs, 0xB179);
    ASSERT_GE(connected.size(), 20U);
    for (std::size_t index = 1; index < connected.size(); ++index) {
        const std::uint64_t gap = connected[index] - connected[index - 1];
        EXPECT_TRUE(gap == 160 || gap > 6 * 800) << gap;
    }
    // The serving-cell information at least on every change of serving cell.
    EXPECT_GE(ticksOf(run_->blobs, 0xB0C2).size(), 1U + run_->snapshots.back().servingChanges);
    // Every blob's timestamp lies on the 20 ms step grid from the start, in order.
    std::uint64_t previous = 0;
    for (const PlistData& blob : run_->blobs) {
        std::uint64_t timestamp = 0;
        for (int byte = 7; byte >= 0; --byte) {
            timestamp = (timestamp << 8) | blob[5 + static_cast<std::size_t>(byte)];
        }
        const std::uint64_t ticks = (timestamp >> 16) - (SimDecodingSettings::kDefaultStartTimestamp >> 16);
        EXPECT_EQ(ticks % 16, 0U);
        EXPECT_GE(timestamp, previous);
        previous = timestamp;
    }
}

TEST(LteSimulationSeeds, TheSameSeedGivesTheSameBytesAndAnotherSeedOthers) {
    SimDecodingSettings settings;
    settings.decode = false;
    settings.seconds = 30;
    const std::vector<PlistData> first = runSimDecoding(settings).blobs;
    const std::vector<PlistData> second = runSimDecoding(settings).blobs;
    settings.seed = 2;
    const std::vector<PlistData> other = runSimDecoding(settings).blobs;
    ASSERT_GT(first.size(), 50U);
    EXPECT_EQ(first, second);
    EXPECT_NE(first, other);
}

TEST(LteSimulationScenarios, WalkingAndStandingStillFillTheSectionsToo) {
    LogCapture quiet;
    for (const sim::Scenario scenario : {sim::Scenario::Walk, sim::Scenario::Static}) {
        SimDecodingSettings settings;
        settings.scenario = scenario;
        settings.seed = 5;
        const SimDecodingResult run = runSimDecoding(settings);
        for (const char* name :
             {"Serving Cell Measurements", "Connected mode LTE Intra-frequency Measurement",
              "Serving Cell Info", "SIM Info"}) {
            const PlistValue value = findInDisplay(run.display(), name);
            ASSERT_TRUE(value.isDictionary()) << name;
            EXPECT_GE(value.dictionary()->size(), 3U) << name;
        }
        EXPECT_GE(findInDisplay(run.display(), "Neighbor Cells List").array()->size(), 1U);
        const double moved = std::hypot(run.snapshots.back().x - run.snapshots.front().x,
                                        run.snapshots.back().y - run.snapshots.front().y);
        if (scenario == sim::Scenario::Static) {
            EXPECT_EQ(moved, 0.0);
        } else {
            EXPECT_GT(moved, 30.0);              // 41.7 m along the loop in 30 s at 5 km/h
            EXPECT_LE(moved, 30.0 * 5.0 / 3.6);  // a chord is never longer than the arc
        }
    }
}

}  // namespace
}  // namespace velmar::testing
