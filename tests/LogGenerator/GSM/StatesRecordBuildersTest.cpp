// The state-record builders write the bytes a baseband writes, at the offsets the record layouts give.
#include <gtest/gtest.h>

#include "logfile/records/GsmStateRecords.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

Bytes slice(const PlistData& packet, std::size_t first, std::size_t count) {
    return Bytes(packet.begin() + static_cast<std::ptrdiff_t>(first),
                 packet.begin() + static_cast<std::ptrdiff_t>(first + count));
}

TEST(StatesRecordBuilders, PlmnIdentityNibbles) {
    EXPECT_EQ(plmnIdentityBytes("310", "410"), (std::array<std::uint8_t, 3>{0x13, 0x00, 0x14}));
    EXPECT_EQ(plmnIdentityBytes("310", "41"), (std::array<std::uint8_t, 3>{0x13, 0xF0, 0x14}));
    EXPECT_EQ(plmnIdentityBytes("262", "01"), (std::array<std::uint8_t, 3>{0x62, 0xF2, 0x10}));
}

TEST(StatesRecordBuilders, HeaderAndFixedLengths) {
    const PlistData gmm =
        buildGmmStateRecord({.state = 3, .subState = 9, .updateStatus = 1}, 0x0102030405060708);
    EXPECT_EQ(gmm,
              (Bytes{0x01, 0x0F, 0x00, 0x30, 0x71, 0x08, 0x07, 0x06, 0x05, 0x04, 0x03, 0x02, 0x01, 3, 9, 1}));
    EXPECT_EQ(buildRegistrationInfoRecord({}).size(), 32u);
    EXPECT_EQ(buildGsmRrStateRecord({}).size(), 17u);
    EXPECT_EQ(buildPacketSystemInfoRecord({}).size(), 35u);
    EXPECT_EQ(buildPbcchRecord({}).size(), 34u);
    EXPECT_EQ(buildUmtsCellIdentityRecord({}).size(), 29u);
    // An explicit length cuts the packet; the length field follows.
    const PlistData cut = buildMmStateRecord({.state = 19, .length = 15});
    EXPECT_EQ(cut.size(), 15u);
    EXPECT_EQ(cut[1], 14u);
}

TEST(StatesRecordBuilders, RegistrationInfoBytes) {
    const PlistData info = buildRegistrationInfoRecord({.networkOperatingMode = 1,
                                                        .serviceType = 4,
                                                        .plmnIdentity = {0xA1, 0xB2, 0xC3},
                                                        .locationAreaCode = 0x1234,
                                                        .routingAreaCode = 0x56});
    EXPECT_EQ(slice(info, 13, 8), (Bytes{1, 4, 0xA1, 0xB2, 0xC3, 0x12, 0x34, 0x56}));
}

TEST(StatesRecordBuilders, HsdpaLayout) {
    // Sub frames 0x2C5 = 709: low byte 0xC5, high bits 2 in bits 0..1 of byte 15; carrier 3 in bits 2..3.
    const PlistData hsdpa = buildHsdpaRecord({.version = 4,
                                              .subFrames = 0x2C5,
                                              .carrier = 3,
                                              .primary = {{1, 0x11223344, 0x5566, 0x7788}},
                                              .secondary = {{2, 0x99AABBCC, 0xDDEE, 0x0102}}});
    EXPECT_EQ(slice(hsdpa, 13, 5), (Bytes{4, 0xC5, 0x0E, 1, 1}));
    EXPECT_EQ(slice(hsdpa, 18, 9), (Bytes{1, 0x44, 0x33, 0x22, 0x11, 0x66, 0x55, 0x88, 0x77}));
    EXPECT_EQ(slice(hsdpa, 180, 9), (Bytes{2, 0xCC, 0xBB, 0xAA, 0x99, 0xEE, 0xDD, 0x02, 0x01}));
    EXPECT_EQ(hsdpa.size(), 189u);
}

TEST(StatesRecordBuilders, ListRecordsAndCountOverrides) {
    const PlistData power = buildUplinkPowerRecord({.readings = {-212, 5}, .countOverride = 9});
    EXPECT_EQ(power.size(), 16u + 28u);
    EXPECT_EQ(power[14], 9u);
    EXPECT_EQ(slice(power, 20, 2), (Bytes{0x2C, 0xFF}));  // -212 = 0xFF2C
    EXPECT_EQ(slice(power, 34, 2), (Bytes{0x05, 0x00}));
    const PlistData bler = buildBlockErrorRecord({.windowSize = 0x0102, .channels = {{7, 0xA0B0C0D0, 3}}});
    EXPECT_EQ(slice(bler, 13, 12), (Bytes{1, 0x02, 0x01, 7, 0xD0, 0xC0, 0xB0, 0xA0, 3, 0, 0, 0}));
    const PlistData equivalent = buildEquivalentPlmnRecord({.count = 4, .listBytes = {3, 2, 1}});
    EXPECT_EQ(equivalent.size(), 20u);
    EXPECT_EQ(slice(equivalent, 16, 4), (Bytes{4, 3, 2, 1}));
}

}  // namespace
}  // namespace velmar
