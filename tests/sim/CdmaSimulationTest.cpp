// The simulated CDMA2000 baseband decoded by the real CDMA2000 generator: every display key filled, values
// within their physical ranges, 1x traffic with frame errors, EV-DO data with growing link counters.
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "tests/sim/SimDecoding.h"
#include "tests/support/LogCapture.h"

namespace velmar::testing {
namespace {

std::string textIn(const PlistValue& value) {
    const std::string* text = value.string();
    return text ? *text : std::string("<not a string>");
}

// The number in a shown value, after an optional prefix such as "(ref pilot) ".
double numberIn(const std::string& text) {
    const std::size_t start = text.find_first_of("+-0123456789");
    EXPECT_NE(start, std::string::npos) << text;
    if (start == std::string::npos) {
        return 0;
    }
    return std::strtod(text.c_str() + start, nullptr);
}

class CdmaSimulation : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        LogCapture capture;
        SimDecodingSettings settings;
        settings.technology = "cdma";
        settings.seconds = 30;
        run_ = new SimDecodingResult(runSimDecoding(settings));
        errors_ = new std::vector<std::string>(capture.textsAt(3));
    }
    static void TearDownTestSuite() {
        delete run_;
        delete errors_;
        run_ = nullptr;
        errors_ = nullptr;
    }
    static std::string shown(std::string_view key) {
        // The C2K template nests its keys under labels; the generator's lookup knows where each one is.
        const PlistValue lookup = run_->state->get("Lookup");
        const PlistValue* places = lookup.dictionary() ? lookup.dictionary()->find(key) : nullptr;
        if (places == nullptr || !places->isArray() || places->array()->empty()) {
            return "<no place>";
        }
        const PlistDictionary& place = *places->array()->at(0).dictionary();
        const std::string label = textIn(place.get("key"));
        const PlistValue& value = place.get("dict").dictionary()->get(label);
        if (value.isDictionary()) {
            return "<dictionary>";
        }
        return textIn(value);
    }
    static PlistDictionaryRef shownDictionary(std::string_view key) {
        const PlistValue lookup = run_->state->get("Lookup");
        const PlistDictionary& place = *lookup.dictionary()->get(key).array()->at(0).dictionary();
        return place.get("dict").dictionary()->get(textIn(place.get("key"))).dictionary();
    }

    static SimDecodingResult* run_;
    static std::vector<std::string>* errors_;
};

SimDecodingResult* CdmaSimulation::run_ = nullptr;
std::vector<std::string>* CdmaSimulation::errors_ = nullptr;

TEST_F(CdmaSimulation, FillsEveryDisplayKey) {
    const char* keys[] = {"kChannel",         "k1xEVDODeviceState",
                          "kBandClass",       "kRxAGC0",
                          "kRxAGC1",          "kTxAGC",
                          "kServingPNOffset", "kSessionState",
                          "kUATI24",          "kColorCode",
                          "kActiveSetPilots", "kFingerC2I",
                          "k1xDeviceState",   "k1xRx0BandClass",
                          "k1xRx0ChanNum",    "k1xRxAGC0",
                          "k1xRx1BandClass",  "k1xRx1ChanNum",
                          "k1xRxAGC1",        "k1xTxAGC",
                          "k1xActiveSetInfo", "k1xTrafficFER",
                          "k1xRoamingHome",   "kSystemId",
                          "kNetworkId",       "kPacketZoneId",
                          "kBaseId",          "kProtocolRevision",
                          "kFLDataRate",      "kRLDataRate"};
    for (const char* key : keys) {
        const std::string value = shown(key);
        EXPECT_NE(value, "") << key;
        EXPECT_NE(value, "<no place>") << key;
    }
    // Every packet was well formed: no length, version or subpacket complaint.
    EXPECT_EQ(*errors_, std::vector<std::string>{});
}

TEST_F(CdmaSimulation, ShowsValuesWithinTheirPhysicalRanges) {
    EXPECT_EQ(shown("kBandClass"), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(shown("k1xRx0BandClass"), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(shown("k1xRx0ChanNum"), "25");
    EXPECT_EQ(shown("kSessionState"), "Open [4]");
    EXPECT_EQ(shown("kProtocolRevision"), "6");
    const double rx = numberIn(shown("k1xRxAGC0"));
    EXPECT_GE(rx, -105.0);
    EXPECT_LE(rx, -25.0);
    const double evdoRx = numberIn(shown("kRxAGC0"));
    EXPECT_GE(evdoRx, -105.0);
    EXPECT_LE(evdoRx, -25.0);
    const double fer = numberIn(shown("k1xTrafficFER"));
    EXPECT_GE(fer, 0.0);
    EXPECT_LE(fer, 20.0);
    for (const auto& [key, value] : shownDictionary("k1xActiveSetInfo")->entries()) {
        if (key == "_sorted") {
            continue;
        }
        const double ecio = numberIn(textIn(value));
        EXPECT_GE(ecio, -32.0) << key;
        EXPECT_LE(ecio, 0.0) << key;
    }
    const PlistDictionaryRef pilots = shownDictionary("kActiveSetPilots");
    EXPECT_GE(pilots->size(), 2U);  // "_sorted" and at least the serving pilot
    // The serving PN offset and the system identity are those of the world's serving cell.
    const sim::RadioSnapshot& last = run_->snapshots.back();
    const sim::SimCell& cell = last.cells[static_cast<std::size_t>(last.servingCell)];
    EXPECT_EQ(shown("kServingPNOffset"), std::to_string(cell.physicalId) + " \u00d7 64chips");
    EXPECT_EQ(shown("kSystemId"), std::to_string(cell.systemId));
    EXPECT_EQ(shown("kBaseId"), std::to_string(cell.cellId));
}

TEST_F(CdmaSimulation, TheFirstConnectionIsAVoiceCallOnTheTrafficChannel) {
    EXPECT_EQ(shown("k1xDeviceState"), "Traffic [8]");
    EXPECT_NE(shown("k1xTxAGC"), "N/A");
    // Frame error records come every 100 ms during the call.
    int trafficRecords = 0;
    for (const PlistData& blob : run_->blobs) {
        trafficRecords += logCodeOf(blob) == 0x119D ? 1 : 0;
    }
    EXPECT_GE(trafficRecords, 50);
}

TEST(CdmaSimulationData, TheForwardLinkCountersGrowWithADataConnection) {
    SimDecodingSettings settings;
    settings.technology = "cdma";
    settings.decode = false;
    settings.seconds = 300;
    const SimDecodingResult run = runSimDecoding(settings);
    // The forward counter of the 1024-bit class (offset 17 + 4 × 3) from one second to the next.
    std::uint32_t previous = 0;
    std::uint32_t fastest = 0;
    for (const PlistData& blob : run.blobs) {
        if (logCodeOf(blob) != 0x1192) {
            continue;
        }
        ASSERT_EQ(blob.size(), 241U);
        const std::size_t at = 17 + 4 * 3;
        const std::uint32_t counter = static_cast<std::uint32_t>(blob[at] | (blob[at + 1] << 8) |
                                                                 (blob[at + 2] << 16) | (blob[at + 3] << 24));
        ASSERT_GE(counter, previous);
        fastest = std::max(fastest, counter - previous);
        previous = counter;
    }
    // Some second carried more than 500 kbps (about 490 packets of 1024 bits).
    EXPECT_GT(fastest, 480U);
}

}  // namespace
}  // namespace velmar::testing
