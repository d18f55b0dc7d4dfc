// Every row of the CDMA2000 value-name tables, shown through the packets that carry each value, and the
// generator's answer to a template resource that cannot be read.
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "LogGenerator/StateKeys.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::C2KHarness;
using Strings = std::vector<std::string>;

const Strings kBandNames = {
    "800 MHz cellular band [0]",
    "1.8 to 2.0GHz PCS band [1]",
    "872 to 960MHz TACS band [2]",
    "832 to 925MHz JTACS band [3]",
    "1.75 to 1.87GHz Korean PCS band [4]",
    "450MHz band [5]",
    "2GHz band [6]",
    "700MHz band [7]",
    "1800 MHz band [8]",
    "900 MHzband [9]",
    "Secondary 800 MHz band [10]",
    "400 MHz European PAMR band [11]",
    "800 MHz European PAMR band [12]",
};

EvdoStatusRecord evdoStatus(std::uint8_t deviceState, std::uint8_t sessionState, std::uint8_t bandClass) {
    EvdoStatusRecord status;
    status.channel = 100;
    status.bandClass = bandClass;
    status.deviceState = deviceState;
    status.sessionState = sessionState;
    return status;
}

PlistData oneXStatus(std::uint8_t deviceState, std::uint8_t rx0Band, std::uint8_t rx1Band) {
    Cdma1xRadio radio;
    radio.rx0BandClass = rx0Band;
    radio.rx1BandClass = rx1Band;
    CdmaSubpacketRecord record;
    record.subpackets = {cdma1xStateSubpacket(deviceState), cdma1xRadioSubpacket(radio),
                         cdma1xActiveSetSubpacket(Cdma1xActiveSet{}), cdma1xFingerSubpacket()};
    record.trailingBytes = 4;
    return build1xStatusRecord(record);
}

TEST(C2KValueTables, EvdoDeviceStates) {
    C2KHarness harness;
    const Strings names = {"Inactive [0]", "Acquisition [1]", "Sync [2]",
                           "Idle [3]",     "Access [4]",      "Connected [5]"};
    for (std::size_t state = 0; state < names.size(); ++state) {
        harness.feed(buildEvdoStatusRecord(evdoStatus(static_cast<std::uint8_t>(state), 0, 0)));
        EXPECT_EQ(harness.shown("k1xEVDODeviceState"), names[state]) << state;
    }
    harness.feed(buildEvdoStatusRecord(evdoStatus(255, 0, 0)));
    EXPECT_EQ(harness.shown("k1xEVDODeviceState"), "[Reserved 255]");
}

TEST(C2KValueTables, EvdoSessionStates) {
    C2KHarness harness;
    const Strings names = {"Closed [0]", "AMP setup [1]", "AT-initiated neg [2]", "Initiated neg [3]",
                           "Open [4]"};
    for (std::size_t state = 0; state < names.size(); ++state) {
        harness.feed(buildEvdoStatusRecord(evdoStatus(5, static_cast<std::uint8_t>(state), 0)));
        EXPECT_EQ(harness.shown("kSessionState"), names[state]) << state;
    }
    harness.feed(buildEvdoStatusRecord(evdoStatus(5, 200, 0)));
    EXPECT_EQ(harness.shown("kSessionState"), "[Reserved 200]");
}

TEST(C2KValueTables, EvdoBandClasses) {
    C2KHarness harness;
    for (std::size_t band = 0; band < kBandNames.size(); ++band) {
        harness.feed(buildEvdoStatusRecord(evdoStatus(5, 4, static_cast<std::uint8_t>(band))));
        EXPECT_EQ(harness.shown("kBandClass"), kBandNames[band]) << band;
    }
    // Five bits of byte 14: 31 is the largest band class a record can carry.
    harness.feed(buildEvdoStatusRecord(evdoStatus(5, 4, 31)));
    EXPECT_EQ(harness.shown("kBandClass"), "[Bad Value 31]");
}

TEST(C2KValueTables, OneXDeviceStates) {
    C2KHarness harness;
    const Strings names = {"Inactive [0]",
                           "Deep sleep in start state [1]",
                           "Initial state for CDMA operation [2]",
                           "Acquisition [3]",
                           "Sync [4]",
                           "Slew [5]",
                           "Paging [6]",
                           "Slotted mode sleep state [7]",
                           "Traffic [8]",
                           "UnSlew [9]",
                           "Operation in PCG state [10]",
                           "Powerup state [11]"};
    for (std::size_t state = 0; state < names.size(); ++state) {
        harness.feed(oneXStatus(static_cast<std::uint8_t>(state), 0, 0));
        EXPECT_EQ(harness.shown("k1xDeviceState"), names[state]) << state;
    }
    harness.feed(oneXStatus(255, 0, 0));
    EXPECT_EQ(harness.shown("k1xDeviceState"), "[Bad Value 255]");
}

TEST(C2KValueTables, OneXBandClassesOfBothReceiveChains) {
    C2KHarness harness;
    for (std::size_t band = 0; band < kBandNames.size(); ++band) {
        // The second chain counts down, so that the two chains never show the same row.
        const std::size_t other = kBandNames.size() - 1 - band;
        harness.feed(oneXStatus(8, static_cast<std::uint8_t>(band), static_cast<std::uint8_t>(other)));
        EXPECT_EQ(harness.shown("k1xRx0BandClass"), kBandNames[band]) << band;
        EXPECT_EQ(harness.shown("k1xRx1BandClass"), kBandNames[other]) << other;
    }
    harness.feed(oneXStatus(8, 13, 255));
    EXPECT_EQ(harness.shown("k1xRx0BandClass"), "[Bad Value 13]");
    EXPECT_EQ(harness.shown("k1xRx1BandClass"), "[Bad Value 255]");
}

TEST(C2KValueTables, RoamingIndicators) {
    C2KHarness harness;
    const Strings names = {"OFF [0]",
                           "ON [1]",
                           "Flashing [2]",
                           "Out of Neighborhood [3]",
                           "Out of Building [4]",
                           "Preferred system [5]",
                           "Available system [6]",
                           "Alliance partner [7]",
                           "Premium partner [8]",
                           "Full service functionality [9]",
                           "Partial service functionality [10]",
                           "Banner ON [11]",
                           "Banner OFF [12]"};
    Cdma1xSystemIdentityRecord identity;
    identity.systemType = 2;
    for (std::size_t indicator = 0; indicator < names.size(); ++indicator) {
        identity.roamingIndicator = static_cast<std::uint32_t>(indicator);
        harness.feed(build1xSystemIdentityRecord(identity));
        EXPECT_EQ(harness.shown("k1xRoamingHome"), names[indicator]) << indicator;
    }
    identity.roamingIndicator = 100;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "ERI - 100");
}

TEST(C2KTemplateResource, UnreadableTemplateIsLoggedAndNothingIsBuilt) {
    // A resource directory searched first, whose C2KTemplate is not a property list.
    testing::TemporaryDirectory resources;
    testing::writeWholeFile(resources.file("C2KTemplate.plist"), "not a property list");
    const char* previous = std::getenv("VELMAR_RESOURCE_DIR");
    const std::string previousValue = previous ? previous : "";
    setenv("VELMAR_RESOURCE_DIR", resources.path().c_str(), 1);
    StateDict state = PlistDictionary::create();
    testing::LogCapture capture;
    const PlistDictionaryRef display = C2KLogGenerator::getDisplayFromState(state);
    setenv("VELMAR_RESOURCE_DIR", previousValue.c_str(), 1);
    EXPECT_EQ(display, nullptr);
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogError, "Cannot load C2K template for display"}}));
    EXPECT_FALSE(state->contains(state_keys::kTemplate));
    EXPECT_FALSE(state->contains(state_keys::kDisplay));
    EXPECT_FALSE(state->contains(state_keys::kExtraInfo));
}

}  // namespace
}  // namespace velmar
