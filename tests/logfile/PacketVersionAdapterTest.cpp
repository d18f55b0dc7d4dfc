// The packet-version adapter on its own: what it rewrites and how, what it passes on untouched and without a
// copy, truncated and lying records, and the census of what it saw.
#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "logfile/HexBlobFile.h"
#include "logfile/PacketCensus.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar {
namespace {

std::vector<std::uint8_t> record(std::string_view hex) {
    const LogReadResult read = parseHexBlobText(hex, "vector");
    EXPECT_TRUE(read.ok()) << read.error;
    return read.items.empty() ? std::vector<std::uint8_t>{} : read.items.front().bytes;
}

std::vector<std::uint8_t> bytesOf(ByteView view) {
    return {view.begin(), view.end()};
}

// A record of a code with a payload, zero timestamp.
std::vector<std::uint8_t> packet(std::uint16_t code, const std::vector<std::uint8_t>& payload) {
    std::vector<std::uint8_t> bytes(13 + payload.size(), 0);
    bytes[0] = 0x01;
    bytes[3] = static_cast<std::uint8_t>(code & 0xFF);
    bytes[4] = static_cast<std::uint8_t>(code >> 8);
    for (std::size_t index = 0; index < payload.size(); ++index) {
        bytes[13 + index] = payload[index];
    }
    const std::size_t length = bytes.size() - 1;
    bytes[1] = static_cast<std::uint8_t>(length & 0xFF);
    bytes[2] = static_cast<std::uint8_t>(length >> 8);
    return bytes;
}

// Real captured records of each adapted (code, version), and hand-built ones of the documented layouts.
const std::string_view kNewerRecords[] = {
    "012900c2b01c0845bf89ced300032a001b0800006b4e00004b4b0274560001b004000000360103040100",  // 0xB0C2 v3
    "011700c1b0a20332f62952d10002bc0012a00000c4020264",                                      // 0xB0C1 v2
    "011800c1b00000000000000000032301701101005501043207",                                    // 0xB0C1 v3
    "011e00c1b00000000000000000112c00102700000800090a0b0c0d0e0f1001",                        // 0xB0C1 v17
    "01500079b16c5bd60487ced30004000000000000001b0800002a00e52059045904ed00ed0002010000d801a903a903cd00cd0000"
    "00"
    "360045044504e100e100000036000000c6040000669bd30100000000",  // 0xB179 v4
    "01400079b10000000000000000030102030000000050140101d204480548053801380101012c01fc04fc04200120010000f70100"
    "00"
    "341200000000000000000000",  // 0xB179 v3
    "012c007fb1000000000000000004000000540b7b0a00055000f00400004001001300000a0048ad560e9d020000",  // 0xB17F
                                                                                                   // v4
    "0130007fb1000000000000000005000000d00101007b0a000000055000f00400004001001300000a0048ad560e9d020000",  // v5
    "01340080b10000000000000000040000001d0c6d004b41065a000059000000130020011002dcfe0000a39db62d000000000000"
    "0000",  // 0xB180 v4
    "01580080b100000000000000000501000071110100ad0000004b41065a000059000000130020011002dcfe0000a39db62d0000"
    "000000000000b7c0034b00004c0000000a00b000400102010000c92a2d150000000000000000",  // 0xB180 v5
    "012c00054000000000000000004201cc292c01b0a1fff2f4ff00cc292d01a697ffeceaff013e002300abb0ff00",    // 0x4005
                                                                                                     // v1
    "012d0005400000000000000000800201020304053e002300abb0ff000000000000ff0317009d9cff000000000000",  // 0x4005
                                                                                                     // v2
    "011f0050710910d4fa2952d10013002101130194ffffffffffffffffffffffff",                              // 0x7150
};

TEST(PacketVersionAdapter, RewritesAServingCellInfoVersion3IntoVersion2) {
    const std::vector<std::uint8_t> recorded =
        record("012900c2b01c0845bf89ced300032a001b0800006b4e00004b4b0274560001b004000000360103040100");
    PacketVersionAdapter adapter;
    const AdaptedPacket adapted = adapter.adapt(recorded);
    EXPECT_EQ(adapted.outcome, VersionOutcome::Adapted);
    EXPECT_EQ(adapted.logCode, 0xB0C2);
    EXPECT_EQ(adapted.version, 3);
    EXPECT_EQ(adapted.tally.clamped, 0u);
    // Header with the new length (12 + 25), then version 2: PCI 42, EARFCNs 2075/20075, 75/75 RBs, cell
    // 5665794, TAC 45057, band 4, MCC 310, 3 MNC digits, MNC 260, allowed access 0.
    EXPECT_EQ(bytesOf(adapted.blob),
              record("012500c2b01c0845bf89ced300022a001b086b4e4b4b0274560001b004000000360103040100"));
}

TEST(PacketVersionAdapter, RewritesAnIntraFrequencyVersion4IntoTheDecodedLayout) {
    const std::vector<std::uint8_t> recorded = record(
        "01340079b189a8950387ced30004000000000000001b0800002a00551f55045504ff00ff0001000000d801ab03ab03d000d0"
        "000000");
    PacketVersionAdapter adapter;
    const AdaptedPacket adapted = adapter.adapt(recorded);
    EXPECT_EQ(adapted.outcome, VersionOutcome::Adapted);
    // Version 2, three neutral bytes, E-ARFCN 2075, PCI 42, subframe 8021, RSRP 117 (1109 / 4 - 160 rounded),
    // RSRQ 48 (255 / 2 - 80 rounded), N 1, D 0; neighbour 472, RSRP 75, RSRQ 24.
    EXPECT_EQ(bytesOf(adapted.blob),
              record("01220079b189a8950387ced300020000001b082a00551f750030000100d8014b00"
                     "1800"));
}

TEST(PacketVersionAdapter, AdaptingTwiceIsAdaptingOnce) {
    for (const std::string_view hex : kNewerRecords) {
        const std::vector<std::uint8_t> recorded = record(hex);
        PacketVersionAdapter first;
        const AdaptedPacket once = first.adapt(recorded);
        ASSERT_EQ(once.outcome, VersionOutcome::Adapted) << hex;
        const std::vector<std::uint8_t> adapted = bytesOf(once.blob);
        EXPECT_NE(adapted, recorded) << hex;

        PacketVersionAdapter second;
        const AdaptedPacket twice = second.adapt(adapted);
        EXPECT_EQ(twice.outcome, VersionOutcome::DecodedAsIs) << hex;
        EXPECT_EQ(twice.blob.data(), adapted.data()) << hex;  // the very bytes: no copy
        EXPECT_EQ(twice.blob.size(), adapted.size()) << hex;
    }
}

TEST(PacketVersionAdapter, TheLengthFieldOfARewrittenRecordMatchesItsLength) {
    for (const std::string_view hex : kNewerRecords) {
        PacketVersionAdapter adapter;
        const std::vector<std::uint8_t> adapted = bytesOf(adapter.adapt(record(hex)).blob);
        ASSERT_GE(adapted.size(), 13u);
        EXPECT_EQ(static_cast<std::size_t>(adapted[1] | adapted[2] << 8), adapted.size() - 1) << hex;
    }
}

TEST(PacketVersionAdapter, DecodedLayoutsPassUntouchedWithoutACopy) {
    const std::vector<std::vector<std::uint8_t>> decoded = {
        packet(0xB0C2, std::vector<std::uint8_t>(25, 0x02)),          // version 2
        packet(0xB0C1, {0x01, 0, 0, 0, 0, 0, 0, 2, 50}),              // version 1
        packet(0xB179, std::vector<std::uint8_t>(16, 0x02)),          // version 2
        packet(0xB17F, std::vector<std::uint8_t>(20, 0x03)),          // version 3
        packet(0xB180, std::vector<std::uint8_t>(8, 0x03)),           // version 3
        packet(0x4005, {0x02, 0x00, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10}),  // version 0 (top bits)
        packet(0x7150, {0x13, 0x00, 0x21, 0x01, 3, 1, 1, 0, 4, 9}),   // decimal digits: the decoded layout
    };
    PacketVersionAdapter adapter;
    for (const std::vector<std::uint8_t>& bytes : decoded) {
        const AdaptedPacket adapted = adapter.adapt(bytes);
        EXPECT_EQ(adapted.outcome, VersionOutcome::DecodedAsIs) << adapted.logCode;
        EXPECT_EQ(adapted.blob.data(), bytes.data()) << adapted.logCode;
        EXPECT_EQ(adapted.blob.size(), bytes.size()) << adapted.logCode;
    }
    // Captured records of codes with one known layout.
    const std::vector<std::vector<std::uint8_t>> onlyLayout = {
        record("010f003071c27c3a0687ced300030500"),  // 0x7130
        record("0137003571016a7307fd11d100010364f00011d6640050dead000a300010002c002000c0b0e03c2c37a011d100000"
               "a7200"
               "50010cffffffff"),                    // 0x7135
        record("010f0016410a30173c2952d10000c800"),  // 0x4116
    };
    for (const std::vector<std::uint8_t>& bytes : onlyLayout) {
        const AdaptedPacket adapted = adapter.adapt(bytes);
        EXPECT_EQ(adapted.outcome, VersionOutcome::Untracked) << adapted.logCode;
        EXPECT_EQ(adapted.blob.data(), bytes.data()) << adapted.logCode;
        EXPECT_EQ(adapted.blob.size(), bytes.size()) << adapted.logCode;
    }
}

TEST(PacketVersionAdapter, UnknownVersionsAndOtherCodesPassUntouchedWithoutACopy) {
    PacketVersionAdapter adapter;
    const std::vector<std::uint8_t> unknown = packet(0xB0C2, std::vector<std::uint8_t>(40, 0x09));
    const AdaptedPacket version9 = adapter.adapt(unknown);
    EXPECT_EQ(version9.outcome, VersionOutcome::UnknownVersion);
    EXPECT_EQ(version9.version, 9);
    EXPECT_EQ(version9.blob.data(), unknown.data());

    const std::vector<std::uint8_t> ranking3 = packet(0x4005, {0xC1, 0x00, 1, 2, 3});  // version 3
    const AdaptedPacket rankingVersion = adapter.adapt(ranking3);
    EXPECT_EQ(rankingVersion.outcome, VersionOutcome::UnknownVersion);
    EXPECT_EQ(rankingVersion.version, 3);
    EXPECT_EQ(rankingVersion.blob.data(), ranking3.data());

    const std::vector<std::uint8_t> noPayload = packet(0xB179, {});
    const AdaptedPacket empty = adapter.adapt(noPayload);
    EXPECT_EQ(empty.outcome, VersionOutcome::UnknownVersion);
    EXPECT_EQ(empty.version, kNoVersion);
    EXPECT_EQ(empty.blob.data(), noPayload.data());

    const std::vector<std::uint8_t> other = packet(0xB193, {0x01, 0x02, 0x03});
    const AdaptedPacket untracked = adapter.adapt(other);
    EXPECT_EQ(untracked.outcome, VersionOutcome::Untracked);
    EXPECT_EQ(untracked.logCode, 0xB193);
    EXPECT_EQ(untracked.blob.data(), other.data());

    const std::vector<std::uint8_t> object = {0x30, 0x02, 0x01};  // not a log packet
    const AdaptedPacket unframed = adapter.adapt(object);
    EXPECT_EQ(unframed.outcome, VersionOutcome::Unframed);
    EXPECT_EQ(unframed.blob.data(), object.data());
}

TEST(PacketVersionAdapter, TruncatedNewerRecordsAreDroppedOrShortenedWithinTheirBytes) {
    // Every prefix of every newer record, and the same bytes with a length field that claims the whole
    // record: nothing is read past the bytes given (the sanitizers watch), and a record shorter than its
    // version's fixed fields becomes its header and decoded version alone.
    for (const std::string_view hex : kNewerRecords) {
        const std::vector<std::uint8_t> whole = record(hex);
        for (std::size_t length = 0; length < whole.size(); ++length) {
            // An exact-size heap copy, so that reading past it is caught.
            const std::vector<std::uint8_t> prefix(whole.begin(), whole.begin() + static_cast<long>(length));
            PacketVersionAdapter adapter;
            const AdaptedPacket adapted = adapter.adapt(prefix);
            if (length < 5) {
                EXPECT_EQ(adapted.outcome, VersionOutcome::Unframed) << hex << " cut at " << length;
            } else if (length < 14) {
                // No payload, or no room for the version: passed on as recorded.
                EXPECT_NE(adapted.outcome, VersionOutcome::Adapted) << hex << " cut at " << length;
                EXPECT_EQ(adapted.blob.data(), prefix.data()) << hex << " cut at " << length;
            } else if (adapted.outcome == VersionOutcome::Dropped) {
                EXPECT_EQ(adapted.blob.size(), 14u) << hex << " cut at " << length;
            } else if (adapted.outcome == VersionOutcome::DecodedAsIs) {
                // 0x7150 has no version field: a record of another length is not told apart from the decoded
                // layout, and passes on as it is.
                EXPECT_EQ(adapted.logCode, 0x7150) << hex << " cut at " << length;
                EXPECT_EQ(adapted.blob.data(), prefix.data()) << hex << " cut at " << length;
            } else {
                EXPECT_EQ(adapted.outcome, VersionOutcome::Adapted) << hex << " cut at " << length;
            }
            const std::vector<std::uint8_t> again = bytesOf(adapted.blob);
            PacketVersionAdapter idempotent;
            const AdaptedPacket twice = idempotent.adapt(again);
            if (adapted.outcome == VersionOutcome::Adapted || adapted.outcome == VersionOutcome::Dropped) {
                EXPECT_EQ(twice.outcome, VersionOutcome::DecodedAsIs) << hex << " cut at " << length;
            }
        }
    }
}

TEST(PacketVersionAdapter, ListsLongerThanTheirRecordAreCountedAsMissing) {
    // 0xB179 version 4 claiming 200 neighbours and 200 detected cells in a record with one neighbour.
    std::vector<std::uint8_t> lying = record(
        "01340079b189a8950387ced30004000000000000001b0800002a00551f55045504ff00ff0001000000d801ab03ab03d000d0"
        "000000");
    lying[13 + 24] = 200;
    lying[13 + 25] = 200;
    PacketVersionAdapter adapter;
    const AdaptedPacket adapted = adapter.adapt(lying);
    EXPECT_EQ(adapted.outcome, VersionOutcome::Adapted);
    EXPECT_EQ(adapted.tally.missingEntries, 199u + 200u);
    // The decoded counts hold what was claimed; the entries that are not there are zero.
    ASSERT_EQ(adapted.blob.size(), 13u + 16u + 200u * 6u + 200u * 2u);
    EXPECT_EQ(adapted.blob[13 + 14], 200);
    EXPECT_EQ(adapted.blob[13 + 15], 200);
    EXPECT_EQ(adapted.blob[13 + 16], 0xD8);  // the first neighbour, PCI 472
    EXPECT_EQ(adapted.blob[13 + 22], 0);
}

TEST(PacketVersionAdapter, AnEmptyIdleNeighbourListIsDropped) {
    // The decoded layout counts its cells minus one, so it cannot say "no cells".
    PacketVersionAdapter adapter;
    const AdaptedPacket adapted = adapter.adapt(record("01140080b10000000000000000040000001d0c2d00"));
    EXPECT_EQ(adapted.outcome, VersionOutcome::Dropped);
    EXPECT_EQ(bytesOf(adapted.blob), record("010d0080b1000000000000000003"));
}

TEST(PacketVersionAdapter, ClampsAreCounted) {
    PacketVersionAdapter adapter;
    // 0xB0C1 version 3 with EARFCN 70000.
    const AdaptedPacket master = adapter.adapt(record("011800c1b00000000000000000032301701101005501043207"));
    EXPECT_EQ(master.outcome, VersionOutcome::Adapted);
    EXPECT_EQ(master.tally.clamped, 1u);
    EXPECT_EQ(master.blob[13 + 3], 0xFF);
    EXPECT_EQ(master.blob[13 + 4], 0xFF);
}

TEST(PacketVersionAdapter, ExtendedAndChannelPrefixedPacketsPassUntouched) {
    PacketVersionAdapter adapter;
    const std::vector<std::uint8_t> extended = {0x02, 0x05, 0x00, 0xC2, 0xB0, 0x00, 0x03, 0x01};
    const AdaptedPacket adapted = adapter.adapt(extended);
    EXPECT_NE(adapted.outcome, VersionOutcome::Adapted);
    EXPECT_EQ(adapted.blob.data(), extended.data());
}

TEST(PacketVersionAdapter, TheDecodedVersionsAreNamed) {
    EXPECT_EQ(decodedLayoutVersion(0xB0C2), 2);
    EXPECT_EQ(decodedLayoutVersion(0xB0C1), 1);
    EXPECT_EQ(decodedLayoutVersion(0xB179), 2);
    EXPECT_EQ(decodedLayoutVersion(0xB17F), 3);
    EXPECT_EQ(decodedLayoutVersion(0xB180), 3);
    EXPECT_EQ(decodedLayoutVersion(0x4005), 0);
    EXPECT_EQ(decodedLayoutVersion(0xB186), kNoVersion);
    EXPECT_EQ(decodedLayoutVersion(0x7130), kNoVersion);
}

// ---- census

TEST(PacketCensus, CountsPerCodeVersionAndOutcome) {
    PacketVersionAdapter adapter;
    PacketCensus census;
    const std::vector<std::uint8_t> b179 = record(
        "016c0079b1023e837e8aced30004000000000000001b0800002a00b41b33043304dd00dd0003020000d80118041804d200d2"
        "0000002c00c503c503b400b40000003600a203a2039400940000002c000000560500002a8d6d0c0200000036000000a60300"
        "00fa2d640c02000000");
    EXPECT_TRUE(census.add(adapter.adapt(b179)));  // the first of its (code, version)
    EXPECT_FALSE(census.add(adapter.adapt(b179)));
    const std::vector<std::uint8_t> unknown = packet(0xB0C2, std::vector<std::uint8_t>(40, 0x09));
    EXPECT_TRUE(census.add(adapter.adapt(unknown)));
    EXPECT_TRUE(census.add(adapter.adapt(record("010f003071c27c3a0687ced300030500"))));
    EXPECT_TRUE(census.add(adapter.adapt(packet(0xB193, {1, 2, 3}))));
    EXPECT_TRUE(census.add(adapter.adapt(packet(0x7130, {1, 5, 0}))) == false);
    EXPECT_TRUE(census.add(adapter.adapt(record("01140080b10000000000000000040000001d0c2d00"))));
    EXPECT_FALSE(census.add(adapter.adapt(std::vector<std::uint8_t>{0x30, 0x01})));
    EXPECT_EQ(census.records(), 7u);
    EXPECT_EQ(census.unframed(), 1u);

    const std::vector<std::string> lte = {
        "0xB0C2 v9 1 unknown version", "0xB179 v4 2 adapted, 2 values clamped",
        "0xB180 v4 1 dropped",         "0x7130 v- 2 not decoded",
        "0xB193 v- 1 not decoded",     "unframed 1"};
    EXPECT_EQ(censusReport(census, [](std::int32_t code) { return code >= 0xB0C0 && code <= 0xB186; }), lte);
    // The service decodes nothing: a code of which no other layout is known is passed on.
    const std::vector<std::string> service = {
        "0x7130 v- 2 passed on", "0xB0C2 v9 1 unknown version", "0xB179 v4 2 adapted, 2 values clamped",
        "0xB180 v4 1 dropped",   "0xB193 v- 1 passed on",       "unframed 1"};
    EXPECT_EQ(censusReport(census, nullptr), service);
}

}  // namespace
}  // namespace velmar
