// velmar-decode --technology lte as a process: every LTE code from a hex file, and real captures.
#include <gtest/gtest.h>

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::parseJson;
using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

std::string capturePath(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

// The value at a path of dictionary keys, or none.
PlistValue at(const PlistValue& root, std::initializer_list<const char*> path) {
    PlistValue value = root;
    for (const char* key : path) {
        if (!value.isDictionary()) {
            return PlistValue();
        }
        value = value.dictionary()->get(key);
    }
    return value;
}

std::string text(const PlistValue& root, std::initializer_list<const char*> path) {
    const PlistValue value = at(root, path);
    return value.string() ? *value.string() : std::string("<missing>");
}

std::vector<std::pair<std::string, std::string>> entries(const PlistValue& dictionary) {
    std::vector<std::pair<std::string, std::string>> out;
    if (dictionary.isDictionary()) {
        for (const auto& [key, value] : *dictionary.dictionary()) {
            out.emplace_back(key, value.string() ? *value.string() : std::string("<not a string>"));
        }
    }
    return out;
}
using Entries = std::vector<std::pair<std::string, std::string>>;

std::size_t lengthOf(const PlistValue& value) {
    return value.isArray() ? value.array()->size() : SIZE_MAX;
}

PlistValue decode(const std::vector<std::string>& arguments) {
    const auto result = runProcess(arguments);
    EXPECT_EQ(result.exitCode, 0) << result.err;
    const auto json = parseJson(result.out);
    EXPECT_TRUE(json.has_value()) << result.out;
    return json.value_or(PlistValue());
}

TEST(LteDecode, EveryCodeOfTheHexFile) {
    const PlistValue display =
        decode({kDecode, "--technology", "lte", testing::testDataPath("lte/all-codes.hex")});
    ASSERT_TRUE(display.isDictionary());

    // The cell-monitor array came first; 0xB0C2 then removed its UARFCN and overwrote the shared keys.
    EXPECT_EQ(entries(at(display, {"Serving Cell", "Serving Cell Info"})),
              (Entries{{"Tracking Area Code", "12345"},
                       {"Cell Identity", "27440068"},
                       {"Physical Cell ID", "377"},
                       {"Freq Band Indicator", "7"},
                       {"Download Frequency", "2850"},
                       {"Upload Frequency", "20850"},
                       {"Download Bandwidth", "10 MHz"},
                       {"Upload Bandwidth", "5 MHz"},
                       {"Num Tx Antennas", "4"}}));
    EXPECT_EQ(entries(at(display, {"Serving Cell", "Connected mode LTE Intra-frequency Measurement"})),
              (Entries{{"E-ARFCN", "1850"},
                       {"Serving Physical Cell ID", "291"},
                       {"Subframe Number", "4951"},
                       {"Serving Filtered RSRP", "-40.00 dBm"},
                       {"Serving Filtered RSRQ", "-9.25 dB"}}));
    const PlistValue serving = at(display, {"Serving Cell", "Serving Cell Measurements"});
    EXPECT_EQ(text(serving, {"Physical Cell ID"}), "453");
    EXPECT_EQ(text(serving, {"Measured RSRP"}), "-69.75 dBm");
    EXPECT_EQ(text(serving, {"P_Max"}), "23 dBm");
    EXPECT_EQ(text(serving, {"S Non Intra Search"}), "22 dBm");
    EXPECT_EQ(text(serving, {"Measurement Rules"}), "13");
    EXPECT_EQ(serving.dictionary()->size(), 18u);

    const PlistValue measured = at(display, {"Neighbor Cells", "Measured Neighbor Cells"});
    ASSERT_EQ(lengthOf(measured), 2u);
    EXPECT_EQ(entries(measured.array()->at(1)), (Entries{{"Physical Cell ID", "402"},
                                                         {"Filtered RSRP", "-139.75 dBm"},
                                                         {"Filtered RSRQ", "0.00 dB"}}));
    const PlistValue detected = at(display, {"Neighbor Cells", "Detected Cells"});
    ASSERT_EQ(lengthOf(detected), 1u);
    EXPECT_EQ(entries(detected.array()->at(0)), (Entries{{"Physical Cell ID", "503"}}));
    EXPECT_EQ(entries(at(display, {"Neighbor Cells", "Neighbor Measurements"})),
              (Entries{{"Version", "3"}, {"E-ARFCN", "3101"}, {"Qrxlevmin", "-50 dBm"}}));
    const PlistValue neighbours = at(display, {"Neighbor Cells", "Neighbor Cells List"});
    ASSERT_EQ(lengthOf(neighbours), 2u);
    EXPECT_EQ(entries(neighbours.array()->at(0)), (Entries{{"Physical Cell ID", "331"},
                                                           {"Measured RSSI", "-57.50 dBm"},
                                                           {"Measured RSRP", "-2.50 dBm"},
                                                           {"Average RSRP", "-24.50 dBm"},
                                                           {"Measured RSRQ", "-11.25 dB"},
                                                           {"Average RSRQ", "-15.75 dB"},
                                                           {"Srxlev", "53 dBm"},
                                                           {"Frequency Offset", "65244"},
                                                           {"Ant 0 Frame Offset", "1443"},
                                                           {"Ant 0 Sample Offset", "374483"},
                                                           {"Ant 1 Frame Offset", "1443"},
                                                           {"Ant 1 Sample Offset", "374483"}}));

    EXPECT_EQ(entries(at(display, {"Cell Reselection", "Reselection Candidates"})),
              (Entries{{"Version", "2"}, {"Serving EARFCN", "9300"}, {"Serving Cell ID", "451"}}));
    const PlistValue candidates = at(display, {"Cell Reselection", "Reselection Candidates List"});
    ASSERT_EQ(lengthOf(candidates), 3u);
    EXPECT_EQ(entries(candidates.array()->at(2)), (Entries{{"Candidate Priority", "3200"},
                                                           {"Candidate RAT Type", "LTE"},
                                                           {"E ARFCN", "6300"},
                                                           {"Cell ID", "501"}}));

    EXPECT_EQ(text(display, {"SIM Info", "EF-ICCID"}), "8944110068256270054");
    EXPECT_EQ(text(display, {"SIM Info", "EF-MSISDN"}), "+15550100");
    const PlistValue contexts = at(display, {"PDP Context Info"});
    ASSERT_EQ(lengthOf(contexts), 1u);
    EXPECT_EQ(entries(contexts.array()->at(0)), (Entries{{"Context ID", "1"}, {"APN", "internet"}}));
}

TEST(LteDecode, StartCommandListsTheLteCodes) {
    const PlistValue command = decode({kDecode, "--technology", "lte", "--start-command"});
    ASSERT_TRUE(command.isDictionary());
    std::vector<std::int64_t> plain;
    for (const auto& code : *command.dictionary()->get("SetOrvaneLogCodes").array()) {
        plain.push_back(code.integerValue().value_or(-1));
    }
    EXPECT_EQ(plain, (std::vector<std::int64_t>{45250, 45249, 45433, 45439, 45440, 45446}));
}

// What the last relevant record of a capture says the LTE lists hold, read with the log-file reader; a list
// that no record reached stays empty.
struct ExpectedLte {
    std::size_t measured = 0;
    std::size_t detected = 0;
    std::size_t neighbours = 0;
    std::size_t candidates = 0;
    std::optional<std::string> servingPhysicalCellId;  // from the last full 0xB0C2
    std::optional<std::string> antennas;               // from the last full 0xB0C1
    std::optional<std::string> connectedEarfcn;        // from the last full 0xB179
    std::size_t records = 0;                           // packets of the LTE codes seen
};

unsigned u16At(const std::vector<std::uint8_t>& packet, std::size_t offset) {
    return offset + 1 < packet.size() ? packet[offset] | (packet[offset + 1] << 8) : 0;
}

// What the decoders must show of a capture, read straight off its records (adapted to the decoded layouts
// first unless rawVersions).
ExpectedLte expectedFromCapture(const std::string& path, bool rawVersions) {
    ExpectedLte expected;
    std::string error;
    PacketVersionAdapter adapter;
    const bool read = forEachLogItem(
        path, LogFormat::DiagCapture,
        [&](const LogItemView& item) {
            if (!item.isBlob() || item.bytes.size() < 13 || item.bytes[0] != 1) {
                return true;
            }
            const ByteView bytes = rawVersions ? item.bytes : adapter.adapt(item.bytes).blob;
            const std::vector<std::uint8_t> packet(bytes.begin(), bytes.end());
            const unsigned code = u16At(packet, 3);
            switch (code) {
                case 0xB179:
                    ++expected.records;
                    if (packet.size() >= 29) {
                        expected.measured = packet[27];
                        expected.detected = packet[28];
                        expected.connectedEarfcn = std::to_string(u16At(packet, 17));
                    }
                    break;
                case 0xB180:
                    ++expected.records;
                    if (packet.size() >= 21) {
                        expected.neighbours = ((u16At(packet, 19) >> 6) & 0x1F) + 1;
                    }
                    break;
                case 0xB186:
                    ++expected.records;
                    if (packet.size() >= 21) {
                        expected.candidates = packet[19];
                    }
                    break;
                case 0xB0C2:
                    ++expected.records;
                    if (packet.size() >= 38) {
                        expected.servingPhysicalCellId = std::to_string(u16At(packet, 14));
                    }
                    break;
                case 0xB0C1:
                    ++expected.records;
                    if (packet.size() >= 22) {
                        expected.antennas = std::to_string(packet[20]);
                    }
                    break;
                default:
                    break;
            }
            return true;
        },
        error);
    EXPECT_TRUE(read) << error;
    return expected;
}

void checkCapture(const std::string& name, bool rawVersions) {
    const std::string path = capturePath(name);
    const ExpectedLte expected = expectedFromCapture(path, rawVersions);
    EXPECT_GT(expected.records, 0u) << name;
    const PlistValue display = rawVersions ? decode({kDecode, "--technology", "lte", "--raw-versions", path})
                                           : decode({kDecode, "--technology", "lte", path});
    ASSERT_TRUE(display.isDictionary()) << name;
    EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "Measured Neighbor Cells"})), expected.measured)
        << name;
    EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "Detected Cells"})), expected.detected) << name;
    EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "Neighbor Cells List"})), expected.neighbours) << name;
    EXPECT_EQ(lengthOf(at(display, {"Cell Reselection", "Reselection Candidates List"})), expected.candidates)
        << name;
    EXPECT_EQ(text(display, {"Serving Cell", "Serving Cell Info", "Physical Cell ID"}),
              expected.servingPhysicalCellId.value_or("<missing>"))
        << name;
    EXPECT_EQ(text(display, {"Serving Cell", "Serving Cell Info", "Num Tx Antennas"}),
              expected.antennas.value_or("<missing>"))
        << name;
    EXPECT_EQ(text(display, {"Serving Cell", "Connected mode LTE Intra-frequency Measurement", "E-ARFCN"}),
              expected.connectedEarfcn.value_or("<missing>"))
        << name;
}

TEST(LteDecode, ConnectedModeCaptureGoesThroughWithListsOfTheirCounts) {
    checkCapture("lte-connected-1.qmdl", false);
}

TEST(LteDecode, MultiSubscriptionCaptureGoesThroughWithListsOfTheirCounts) {
    checkCapture("multisim-1.qmdl", false);
}

TEST(LteDecode, RawVersionsDecodeTheRecordsAsRecorded) {
    checkCapture("lte-connected-1.qmdl", true);
    checkCapture("multisim-1.qmdl", true);
}

}  // namespace
}  // namespace velmar
