// 1x system identity (0x134F): roaming indicator, system and network ids, and the base id read beyond the
// checked minimum length.
#include <gtest/gtest.h>

#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::C2KHarness;

Cdma1xSystemIdentityRecord homeSystem() {
    Cdma1xSystemIdentityRecord identity;
    identity.roamingIndicator = 1;
    identity.systemType = 2;
    identity.systemId = 4139;
    identity.networkId = 65535;
    identity.packetZoneId = 17;
    identity.protocolRevision = 6;
    identity.baseId = 0xBEEF;
    return identity;
}

TEST(C2KSystemIdentity, EveryFieldIsShown) {
    C2KHarness harness;
    harness.feed(build1xSystemIdentityRecord(homeSystem()));
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "ON [1]");
    EXPECT_EQ(harness.shown("kSystemId"), "4139");
    EXPECT_EQ(harness.shown("kNetworkId"), "65535");
    EXPECT_EQ(harness.shown("kPacketZoneId"), "17");
    EXPECT_EQ(harness.shown("kBaseId"), "48879");
    EXPECT_EQ(harness.shown("kProtocolRevision"), "6");
}

TEST(C2KSystemIdentity, RoamingIndicatorBeyondTheTable) {
    C2KHarness harness;
    Cdma1xSystemIdentityRecord identity = homeSystem();
    identity.roamingIndicator = 12;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "Banner OFF [12]");
    identity.roamingIndicator = 13;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "ERI - 13");
    identity.roamingIndicator = 0x10000;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "ERI - 65536");
}

TEST(C2KSystemIdentity, OtherSystemTypesShowNoIds) {
    C2KHarness harness;
    Cdma1xSystemIdentityRecord identity = homeSystem();
    identity.systemType = 1;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("kSystemId"), "(unknown system type 1)");
    EXPECT_EQ(harness.shown("kNetworkId"), "(unknown system type 1)");
    EXPECT_EQ(harness.shown("kPacketZoneId"), "17");
}

TEST(C2KSystemIdentity, BaseIdBytesBeyondAShortRecordReadAsZero) {
    C2KHarness harness;
    Cdma1xSystemIdentityRecord identity = homeSystem();
    identity.length = 171;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("kBaseId"), "0");
    EXPECT_EQ(harness.shown("kSystemId"), "4139");
    // 185 bytes: offset 184 (0xEF) is there, offset 185 is not.
    identity.length = 185;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(harness.shown("kBaseId"), "239");
}

TEST(C2KSystemIdentity, LengthAndVersionMessages) {
    C2KHarness harness;
    testing::LogCapture capture;
    Cdma1xSystemIdentityRecord identity = homeSystem();
    identity.length = 170;
    harness.feed(build1xSystemIdentityRecord(identity));
    identity.length = 186;
    identity.version = 1;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{
                  "Log code 0x134f is 170 bytes long but must be at least 171 bytes.",
                  "Log code 0x134f has version=1; only version 2 or higher expected; dropping."}));
    EXPECT_EQ(harness.shown("kSystemId"), "");
    EXPECT_EQ(harness.shown("k1xRoamingHome"), "");

    capture.clear();
    identity.version = 3;
    harness.feed(build1xSystemIdentityRecord(identity));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    EXPECT_EQ(harness.shown("kSystemId"), "4139");
}

}  // namespace
}  // namespace velmar
