// Records of newer firmware versions through the packet-version adapter and the real generators: the display
// shows the values the records hold. The LTE vectors are real captured records with the values read off them
// by their own layout; the other records are built by hand from the newer layouts.
#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "core/platform/KxServerProtocol.h"
#include "logfile/HexBlobFile.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar {
namespace {

using Entries = std::vector<std::pair<std::string, std::string>>;

std::vector<std::uint8_t> record(std::string_view hex) {
    const LogReadResult read = parseHexBlobText(hex, "vector");
    EXPECT_TRUE(read.ok()) << read.error;
    return read.items.empty() ? std::vector<std::uint8_t>{} : read.items.front().bytes;
}

// The display after the records went through one adapter and the technology's generator.
class AdaptedDisplay {
  public:
    AdaptedDisplay(std::string_view technology, std::initializer_list<std::string_view> records)
        : generator_(LogGenerator::generatorFromTechnology(technology)) {
        EXPECT_TRUE(generator_);
        for (const std::string_view hex : records) {
            const std::vector<std::uint8_t> bytes = record(hex);
            const AdaptedPacket adapted = adapter_.adapt(bytes);
            EXPECT_EQ(adapted.outcome, VersionOutcome::Adapted) << hex;
            generator_->updateState(state_, adapted.blob);
        }
        generator_->generateLogUsingState(state_);
    }

    PlistValue at(std::initializer_list<const char*> path) const {
        PlistValue value = state_->get(state_keys::kDisplay);
        for (const char* key : path) {
            value = value.isDictionary() ? value.dictionary()->get(key) : PlistValue();
        }
        return value;
    }
    Entries entries(std::initializer_list<const char*> path) const { return entriesOf(at(path)); }
    std::vector<Entries> rows(std::initializer_list<const char*> path) const {
        std::vector<Entries> out;
        const PlistValue list = at(path);
        if (list.isArray()) {
            for (const PlistValue& row : *list.array()) {
                out.push_back(entriesOf(row));
            }
        }
        return out;
    }

  private:
    static Entries entriesOf(const PlistValue& dictionary) {
        Entries out;
        if (dictionary.isDictionary()) {
            for (const auto& [key, value] : *dictionary.dictionary()) {
                out.emplace_back(key, value.string() ? *value.string() : std::string("<not a string>"));
            }
        }
        return out;
    }

    std::unique_ptr<LogGenerator> generator_;
    PacketVersionAdapter adapter_;
    StateDict state_ = PlistDictionary::create();
};

constexpr std::string_view kLte = kKxLogChannelTechnology_Orvane_LTE;
constexpr std::string_view kGsm = kKxLogChannelTechnology_Orvane_GSM;

// ---- captured 0xB0C2 version 3 and 0xB0C1 version 2 records

TEST(VersionAdaptedDisplay, ServingCellInfoVersion3FromTheCaptures) {
    struct Vector {
        std::string_view hex;
        Entries shown;
    };
    const Vector vectors[] = {
        {"012900c2b01c0845bf89ced300032a001b0800006b4e00004b4b0274560001b004000000360103040100",
         {{"Physical Cell ID", "42"},
          {"Download Frequency", "2075"},
          {"Upload Frequency", "20075"},
          {"Download Bandwidth", "15 MHz"},
          {"Upload Bandwidth", "15 MHz"},
          {"Cell Identity", "5665794"},
          {"Tracking Area Code", "45057"},
          {"Freq Band Indicator", "4"}}},
        {"012900c2b01d79adaf2952d100031800d92100002968000019190175c10b0a5e19000000360103780000",
         {{"Physical Cell ID", "24"},
          {"Download Frequency", "8665"},
          {"Upload Frequency", "26665"},
          {"Download Bandwidth", "5 MHz"},
          {"Upload Bandwidth", "5 MHz"},
          {"Cell Identity", "197227777"},
          {"Tracking Area Code", "24074"},
          {"Freq Band Indicator", "25"}}},
        {"012900c2b08ab64277e031f000038400ec980000ec98000064640b862c01281028000000cc0102000000",
         {{"Physical Cell ID", "132"},
          {"Download Frequency", "39148"},
          {"Upload Frequency", "39148"},
          {"Download Bandwidth", "20 MHz"},
          {"Upload Bandwidth", "20 MHz"},
          {"Cell Identity", "19695115"},
          {"Tracking Area Code", "4136"},
          {"Freq Band Indicator", "40"}}},
        {"012900c2b04c624b48a611d10003d900d2940000d2940000646402fa1101d61126000000cc0102000000",
         {{"Physical Cell ID", "217"},
          {"Download Frequency", "38098"},
          {"Upload Frequency", "38098"},
          {"Download Bandwidth", "20 MHz"},
          {"Upload Bandwidth", "20 MHz"},
          {"Cell Identity", "17955330"},
          {"Tracking Area Code", "4566"},
          {"Freq Band Indicator", "38"}}},
    };
    for (const Vector& vector : vectors) {
        const AdaptedDisplay display(kLte, {vector.hex});
        EXPECT_EQ(display.entries({"Serving Cell", "Serving Cell Info"}), vector.shown) << vector.hex;
    }
}

TEST(VersionAdaptedDisplay, MasterInformationVersion2FromTheCaptures) {
    for (const std::string_view hex : {"011700c1b0a20332f62952d10002bc0012a00000c4020264",
                                       "011700c1b0214c366ce031f000028400ec9800006c000264",
                                       "011700c1b067173948a611d10002d900d29400000c010264"}) {
        const AdaptedDisplay display(kLte, {hex});
        EXPECT_EQ(display.entries({"Serving Cell", "Serving Cell Info"}), (Entries{{"Num Tx Antennas", "2"}}))
            << hex;
    }
}

// ---- captured 0xB179 version 4 records: levels in 1/16 dB become the nearest quarter dB (RSRP) and eighth
// dB (RSRQ); an RSRQ below -20 dB, which the decoded layout cannot hold, shows as -20.00 dB.

TEST(VersionAdaptedDisplay, IntraFrequencyVersion4WithOneNeighbour) {
    const AdaptedDisplay display(kLte, {"01340079b189a8950387ced30004000000000000001b0800002a00551f55045504ff"
                                        "00ff0001000000d801ab03ab03d000d0"
                                        "000000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Connected mode LTE Intra-frequency Measurement"}),
              (Entries{{"E-ARFCN", "2075"},
                       {"Serving Physical Cell ID", "42"},
                       {"Subframe Number", "8021"},
                       {"Serving Filtered RSRP", "-110.75 dBm"},   // -110.6875
                       {"Serving Filtered RSRQ", "-14.00 dB"}}));  // -14.0625
    EXPECT_EQ(display.rows({"Neighbor Cells", "Measured Neighbor Cells"}),
              (std::vector<Entries>{{{"Physical Cell ID", "472"},
                                     {"Filtered RSRP", "-121.25 dBm"},  // -121.3125
                                     {"Filtered RSRQ", "-17.00 dB"}}}));
    EXPECT_TRUE(display.rows({"Neighbor Cells", "Detected Cells"}).empty());
}

TEST(VersionAdaptedDisplay, IntraFrequencyVersion4WithTwoNeighboursAndADetectedCell) {
    const AdaptedDisplay display(kLte, {"01500079b16c5bd60487ced30004000000000000001b0800002a00e52059045904ed"
                                        "00ed0002010000d801a903a903cd00cd"
                                        "000000360045044504e100e100000036000000c6040000669bd30100000000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Connected mode LTE Intra-frequency Measurement"}),
              (Entries{{"E-ARFCN", "2075"},
                       {"Serving Physical Cell ID", "42"},
                       {"Subframe Number", "8421"},
                       {"Serving Filtered RSRP", "-110.50 dBm"},   // -110.4375
                       {"Serving Filtered RSRQ", "-15.12 dB"}}));  // -15.1875, a tie: -15.125
    EXPECT_EQ(
        display.rows({"Neighbor Cells", "Measured Neighbor Cells"}),
        (std::vector<Entries>{
            {{"Physical Cell ID", "472"}, {"Filtered RSRP", "-121.50 dBm"}, {"Filtered RSRQ", "-17.12 dB"}},
            {{"Physical Cell ID", "54"}, {"Filtered RSRP", "-111.75 dBm"}, {"Filtered RSRQ", "-15.88 dB"}}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Detected Cells"}),
              (std::vector<Entries>{{{"Physical Cell ID", "54"}}}));
}

TEST(VersionAdaptedDisplay, IntraFrequencyVersion4WithThreeNeighboursAndTwoDetectedCells) {
    const AdaptedDisplay display(kLte, {"016c0079b1023e837e8aced30004000000000000001b0800002a00b41b33043304dd"
                                        "00dd0003020000d80118041804d200d2"
                                        "0000002c00c503c503b400b40000003600a203a2039400940000002c000000560500"
                                        "002a8d6d0c0200000036000000a60300"
                                        "00fa2d640c02000000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Connected mode LTE Intra-frequency Measurement"}),
              (Entries{{"E-ARFCN", "2075"},
                       {"Serving Physical Cell ID", "42"},
                       {"Subframe Number", "7092"},
                       {"Serving Filtered RSRP", "-112.75 dBm"},   // -112.8125
                       {"Serving Filtered RSRQ", "-16.12 dB"}}));  // -16.1875
    EXPECT_EQ(
        display.rows({"Neighbor Cells", "Measured Neighbor Cells"}),
        (std::vector<Entries>{
            {{"Physical Cell ID", "472"}, {"Filtered RSRP", "-114.50 dBm"}, {"Filtered RSRQ", "-16.88 dB"}},
            {{"Physical Cell ID", "44"}, {"Filtered RSRP", "-119.75 dBm"}, {"Filtered RSRQ", "-18.75 dB"}},
            // RSRQ -20.75 dB: below what the decoded layout holds.
            {{"Physical Cell ID", "54"}, {"Filtered RSRP", "-121.75 dBm"}, {"Filtered RSRQ", "-20.00 dB"}}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Detected Cells"}),
              (std::vector<Entries>{{{"Physical Cell ID", "44"}}, {{"Physical Cell ID", "54"}}}));
}

// ---- hand-built records of the layouts known from documentation only

TEST(VersionAdaptedDisplay, MasterInformationVersions3And17) {
    // Version 3: PCI 291, EARFCN 70000, SFN 341, 4 antennas, 50 RBs, SIB1-BR 7.
    EXPECT_EQ(AdaptedDisplay(kLte, {"011800c1b00000000000000000032301701101005501043207"})
                  .entries({"Serving Cell", "Serving Cell Info"}),
              (Entries{{"Num Tx Antennas", "4"}}));
    // Version 17: PCI 44, EARFCN 10000, SFN 8, six bytes of narrowband fields, raster 0x100F, 1 antenna.
    EXPECT_EQ(AdaptedDisplay(kLte, {"011e00c1b00000000000000000112c00102700000800090a0b0c0d0e0f1001"})
                  .entries({"Serving Cell", "Serving Cell Info"}),
              (Entries{{"Num Tx Antennas", "1"}}));
}

TEST(VersionAdaptedDisplay, IntraFrequencyVersion3) {
    // E-ARFCN 5200, PCI 257, subframe 1234, RSRP raw 1352 (-95.5 dBm), RSRQ raw 312 (-10.5 dB), one
    // neighbour (PCI 300, RSRP raw 1276 = -100.25 dBm, RSRQ raw 288 = -12 dB), one detected cell (PCI 503 in
    // 32 bits).
    const AdaptedDisplay display(
        kLte,
        {"01400079b10000000000000000030102030000000050140101d204480548053801380101012c01fc04fc04200120010000"
         "f7010000341200000000000000000000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Connected mode LTE Intra-frequency Measurement"}),
              (Entries{{"E-ARFCN", "5200"},
                       {"Serving Physical Cell ID", "257"},
                       {"Subframe Number", "1234"},
                       {"Serving Filtered RSRP", "-95.50 dBm"},
                       {"Serving Filtered RSRQ", "-10.50 dB"}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Measured Neighbor Cells"}),
              (std::vector<Entries>{{{"Physical Cell ID", "300"},
                                     {"Filtered RSRP", "-100.25 dBm"},
                                     {"Filtered RSRQ", "-12.00 dB"}}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Detected Cells"}),
              (std::vector<Entries>{{{"Physical Cell ID", "503"}}}));
}

// 0xB17F version 4 or 5: PCI 123, priority 5, measured/average RSRP -100/-101 dBm, measured/average RSRQ
// -10/-11 dB, RSSI -70 dBm, Qrxlevmin raw 8, P_Max and max UE Tx power raw 53, Srxlev raw 74 (24 dB from
// -50), 3 DRX cycles, S intra search 29, S non-intra search 10.
Entries servingMeasurementShown(std::string_view earfcn) {
    return {{"Version", "3"},
            {"E-ARFCN", std::string(earfcn)},
            {"Physical Cell ID", "123"},
            {"Serving Layer Priority", "5"},
            {"Measured RSRP", "-100.00 dBm"},
            {"Average RSRP", "-101.00 dBm"},
            {"Measured RSRQ", "-10.00 dB"},
            {"Average RSRQ", "-11.00 dB"},
            {"Measured RSSI", "-70.00 dBm"},
            {"Qrxlevmin", "-124 dBm"},
            {"P_Max", "23 dBm"},
            {"Max UE Tx Power", "23 dBm"},
            {"Srxlev", "24 dBm"},
            {"Num of Consecutive DRX Cycles of S < 0", "3"},
            {"S Intra Search", "58 dB"},
            {"S Non Intra Search", "20 dBm"},
            {"Measurement Rules Updated", "False"},  // not in the newer versions: neutral
            {"Measurement Rules", "0"}};
}

TEST(VersionAdaptedDisplay, IdleServingMeasurementVersion4) {
    const AdaptedDisplay display(
        kLte, {"012c007fb1000000000000000004000000540b7b0a00055000f00400004001001300000a0048ad560e9d020000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Serving Cell Measurements"}),
              servingMeasurementShown("2900"));
}

TEST(VersionAdaptedDisplay, IdleServingMeasurementVersion5ClampsAWideEarfcn) {
    // E-ARFCN 66000 in 32 bits: the decoded 16-bit field holds 65535 at most.
    const AdaptedDisplay display(kLte, {"0130007fb1000000000000000005000000d00101007b0a000000055000f004000040"
                                        "01001300000a0048ad560e9d020000"});
    EXPECT_EQ(display.entries({"Serving Cell", "Serving Cell Measurements"}),
              servingMeasurementShown("65535"));
}

const Entries kFirstNeighbour = {{"Physical Cell ID", "331"},
                                 {"Measured RSSI", "-60.00 dBm"},
                                 {"Measured RSRP", "-90.00 dBm"},
                                 {"Average RSRP", "-91.00 dBm"},
                                 {"Measured RSRQ", "-11.00 dB"},
                                 {"Average RSRQ", "-12.00 dB"},
                                 {"Srxlev", "3 dBm"},
                                 {"Frequency Offset", "65244"},
                                 {"Ant 0 Frame Offset", "1443"},
                                 {"Ant 0 Sample Offset", "374483"},
                                 {"Ant 1 Frame Offset", "1443"},
                                 {"Ant 1 Sample Offset", "374483"}};

TEST(VersionAdaptedDisplay, IdleNeighbourMeasurementVersion4) {
    // E-ARFCN 3101, Qrxlevmin raw 45, a count of 1 (the count itself), one 32-byte cell.
    const AdaptedDisplay display(kLte, {"01340080b10000000000000000040000001d0c6d004b41065a000059000000130020"
                                        "011002dcfe0000a39db62d0000000000"
                                        "000000"});
    EXPECT_EQ(display.entries({"Neighbor Cells", "Neighbor Measurements"}),
              (Entries{{"Version", "3"}, {"E-ARFCN", "3101"}, {"Qrxlevmin", "-50 dBm"}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Neighbor Cells List"}),
              (std::vector<Entries>{kFirstNeighbour}));
}

TEST(VersionAdaptedDisplay, IdleNeighbourMeasurementVersion5WithTwoCells) {
    // E-ARFCN 70001 (clamped), count 2, the second cell: PCI 183, RSSI -80, RSRP -105, average -104, RSRQ
    // -20, average -19, Srxlev raw 20 (-10 dB), frequency offset 258, frame 713, sample 173477.
    const AdaptedDisplay display(
        kLte,
        {"01580080b100000000000000000501000071110100ad0000004b41065a000059000000130020011002dcfe0000a39db62d"
         "0000000000000000b7c0034b00004c0000000a00b000400102010000c92a2d150000000000000000"});
    EXPECT_EQ(display.entries({"Neighbor Cells", "Neighbor Measurements"}),
              (Entries{{"Version", "3"}, {"E-ARFCN", "65535"}, {"Qrxlevmin", "-50 dBm"}}));
    EXPECT_EQ(display.rows({"Neighbor Cells", "Neighbor Cells List"}),
              (std::vector<Entries>{kFirstNeighbour,
                                    {{"Physical Cell ID", "183"},
                                     {"Measured RSSI", "-80.00 dBm"},
                                     {"Measured RSRP", "-105.00 dBm"},
                                     {"Average RSRP", "-104.00 dBm"},
                                     {"Measured RSRQ", "-20.00 dB"},
                                     {"Average RSRQ", "-19.00 dB"},
                                     {"Srxlev", "-10 dBm"},
                                     {"Frequency Offset", "258"},
                                     {"Ant 0 Frame Offset", "713"},
                                     {"Ant 0 Sample Offset", "173477"},
                                     {"Ant 1 Frame Offset", "713"},
                                     {"Ant 1 Sample Offset", "173477"}}}));
}

TEST(VersionAdaptedDisplay, RankingVersion1KeepsTheWcdmaCells) {
    // Two WCDMA cells of 11 bytes and one GSM cell of 8: the decoded layout holds one list.
    const AdaptedDisplay display(
        kGsm, {"012c00054000000000000000004201cc292c01b0a1fff2f4ff00cc292d01a697ffeceaff013e002300abb0ff00"});
    EXPECT_EQ(display.rows({"UMTS", "UMTS Set"}), (std::vector<Entries>{{{"Scrambling Code", "300"},
                                                                         {"RSCP", "-101 dB"},
                                                                         {"Energy Per Chip", "-7.000000 dB"},
                                                                         {"Downlink Frequency", "10700"},
                                                                         {"Ranking Value", "-12"},
                                                                         {"Rank Cell RSCP", "-95 dB"}},
                                                                        {{"Scrambling Code", "301"},
                                                                         {"RSCP", "-111 dB"},
                                                                         {"Energy Per Chip", "-10.000000 dB"},
                                                                         {"Downlink Frequency", "10700"},
                                                                         {"Ranking Value", "-22"},
                                                                         {"Rank Cell RSCP", "-105 dB"}}}));
    EXPECT_TRUE(display.rows({"UMTS", "GSM Set"}).empty());
}

TEST(VersionAdaptedDisplay, RankingVersion2WithGsmCellsOnly) {
    const AdaptedDisplay display(
        kGsm,
        {"012d0005400000000000000000800201020304053e002300abb0ff000000000000ff0317009d9cff000000000000"});
    EXPECT_TRUE(display.rows({"UMTS", "UMTS Set"}).empty());
    EXPECT_EQ(display.rows({"UMTS", "GSM Set"}),
              (std::vector<Entries>{
                  {{"ARFCN", "62"}, {"BSIC", "35"}, {"RSSI", "-85 dBm"}, {"Ranking Value", "-80"}},
                  {{"ARFCN", "1023"}, {"BSIC", "23"}, {"RSSI", "-99 dBm"}, {"Ranking Value", "-100"}}}));
}

// ---- captured 0x7150 records: 24.008 BCD PLMNs

TEST(VersionAdaptedDisplay, EquivalentPlmnListsFromTheCaptures) {
    struct Vector {
        std::string_view hex;
        std::vector<Entries> rows;
    };
    const Vector vectors[] = {
        {"011f0050710910d4fa2952d10013002101130194ffffffffffffffffffffffff",
         {{{"Mobile Country Code", "311"}, {"Mobile Network Code", "490"}}}},
        {"011f005071f6b52f2e2d52d10013019401130021ffffffffffffffffffffffff",
         {{{"Mobile Country Code", "310"}, {"Mobile Network Code", "120"}}}},
        // MNC 07: two digits, shown as the decoded format shows a number.
        {"011f00507128488c1bfd11d10064f0000164f070ffffffffffffffffffffffff",
         {{{"Mobile Country Code", "460"}, {"Mobile Network Code", "7"}}}},
        {"011f0050715d4334e2ac11d10064f00000ffffffffffffffffffffffffffffff", {}},
    };
    for (const Vector& vector : vectors) {
        const AdaptedDisplay display(kGsm, {vector.hex});
        EXPECT_EQ(display.rows({"Network", "Equivalent PLMN List"}), vector.rows) << vector.hex;
    }
}

TEST(VersionAdaptedDisplay, EquivalentPlmnListKeepsOnlyItsFirstEntry) {
    // 310-120 registered; list [311-490, 460-07]: the decoded entries overlap, so only the first one shows.
    const AdaptedDisplay display(kGsm, {"011f00507100000000000000001300210213019464f070ffffffffffffffffff"});
    EXPECT_EQ(display.rows({"Network", "Equivalent PLMN List"}),
              (std::vector<Entries>{{{"Mobile Country Code", "311"}, {"Mobile Network Code", "490"}}}));
}

}  // namespace
}  // namespace velmar
