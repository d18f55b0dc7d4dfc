// velmar-decode on the GSM/UMTS state records (mobility management, PLMN, radio resource, GPRS, HSDPA, BLER),
// run as a process: the hex files under tests/data/gsm/states-*.hex with values worked out by hand from their
// bytes, and a real capture whose last records of each code are decoded here, by hand, from the capture.
#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <initializer_list>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "logfile/LogFormat.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::parseJson;
using testing::runProcess;
using Row = std::vector<std::pair<std::string, std::string>>;

const std::string kDecode = VELMAR_DECODE_PATH;

std::string statesData(const std::string& name) {
    return testing::testDataPath("gsm/" + name);
}

PlistValue rowOf(const Row& keysAndValues) {
    auto row = PlistDictionary::create();
    for (const auto& [key, value] : keysAndValues) {
        row->set(key, value);
    }
    return row;
}

PlistValue rowsOf(std::initializer_list<Row> rows) {
    auto array = PlistArray::create();
    for (const Row& row : rows) {
        array->append(rowOf(row));
    }
    return array;
}

std::vector<std::string> lines(const std::string& text) {
    std::vector<std::string> out;
    std::size_t start = 0;
    while (start < text.size()) {
        const std::size_t end = text.find('\n', start);
        out.push_back(text.substr(start, end - start));
        if (end == std::string::npos) {
            break;
        }
        start = end + 1;
    }
    return out;
}

PlistValue decodeDisplay(const std::string& file) {
    const auto result = runProcess({kDecode, "--technology", "gsm", file});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    const auto display = parseJson(result.out);
    return display ? *display : PlistValue();
}

PlistValue sectionAt(const PlistValue& display, const std::string& group, const std::string& section) {
    const PlistDictionaryRef& root = display.dictionary();
    if (!root) {
        return PlistValue();
    }
    const PlistDictionaryRef groupDictionary = root->get(group).dictionary();
    return groupDictionary ? groupDictionary->get(section) : PlistValue();
}

std::string textAt(const PlistValue& section, const std::string& key) {
    if (!section.isDictionary()) {
        return "<no section>";
    }
    const PlistValue* value = section.dictionary()->find(key);
    if (value == nullptr) {
        return "<missing>";
    }
    return value->string() ? *value->string() : "<not a string>";
}

TEST(GsmStatesDecode, MobilityAndPlmnRecords) {
    const PlistValue display = decodeDisplay(statesData("states-mobility-plmn.hex"));
    ASSERT_TRUE(display.isDictionary());
    // 0x7130 (3, 9, 1), then 0x7132 (registration state 1); the 15-byte 0x7131 changes nothing.
    EXPECT_EQ(sectionAt(display, "Mobility", "Process PS"),
              rowOf({{"MM State", "GMM_REGISTERED"},
                     {"MM Sub State", "GMM_ATTEMPING_TO_UPDATE"},
                     {"Attach Reject Cause", "GMM_GU2_NOT_UPDATED"},
                     {"MM Service State", "REG_STATE_IDLE"}}));
    EXPECT_EQ(sectionAt(display, "Mobility", "Process CO"),
              rowOf({{"MM State", "MM_IDLE"}, {"MM Service State", "REG_STATE_IDLE"}}));
    EXPECT_EQ(sectionAt(display, "Mobility", "Process CS"), rowOf({{"MM State", "MM_IDLE"},
                                                                   {"MM Sub State", "MM_NORMAL_SERVICE"},
                                                                   {"LU Reject Cause", "UPDATED"},
                                                                   {"MM Service State", "REG_STATE_IDLE"}}));
    // Selection mode 0 from 0x7132; then PLMN 13 F0 14: MCC 3,1,0; MNC 4,1,blank; LAC 0x1234; RAC 5;
    // service 3.
    EXPECT_EQ(sectionAt(display, "Network", "Serving PLMN"), rowOf({{"PLMN Sel Mod", "Automatic"},
                                                                    {"Mobile Country Code", "310"},
                                                                    {"Mobile Network Code", "41 "},
                                                                    {"Location Area Code", "4660"},
                                                                    {"Routing Area Code", "5"},
                                                                    {"Service Type", "CS_PS_SERVICE"}}));
    EXPECT_EQ(sectionAt(display, "GSM", "GPRS Information"), rowOf({{"Network Operating Mode", "Class 2"}}));
    // Entry 0: bytes 17..22 = 3,2,1,6,0,0 → 310 / 260. Entry 1: bytes 20..25 = 6,0,0,2,4,5 → 604 / 25.
    EXPECT_EQ(sectionAt(display, "Network", "Equivalent PLMN List"),
              rowsOf({{{"Mobile Country Code", "310"}, {"Mobile Network Code", "260"}},
                      {{"Mobile Country Code", "604"}, {"Mobile Network Code", "25"}}}));
}

TEST(GsmStatesDecode, RadioResourceAndGprsRecords) {
    const PlistValue display = decodeDisplay(statesData("states-radio.hex"));
    ASSERT_TRUE(display.isDictionary());
    // 0x00010020 = 65568 whole; 0xFFFFFFFE = -2.
    EXPECT_EQ(sectionAt(display, "GSM", "GSM RR Info"), rowOf({{"RR State", "RR_DATA_TRANSFER"},
                                                               {"RR Sub State", "2"},
                                                               {"RR Status", "0"},
                                                               {"RR Mode", "Data"},
                                                               {"Serving Rx Level", "60"},
                                                               {"Rx Quality Full", "65568"},
                                                               {"Rx Quality Sub", "-2"},
                                                               {"DTX Used", "ON"},
                                                               {"DRX Used", "4 sec"}}));
    EXPECT_EQ(sectionAt(display, "GSM", "GPRS Information"),
              rowOf({{"Cell Reselect Hysteresis", "Applied"},
                     {"T3192", "0 ms"},
                     {"Access Burst Type", "11-bit format"},
                     {"DRX Timer Max", "4"},
                     {"SI13 Position", "Located on Extended BCCH"},
                     {"Network Control Order", "NC1"},
                     {"PFC Supported", "Available"},
                     {"Priority Access Threshold", "1 to 3"},
                     {"PBCCH Present", "1"},
                     {"Ext Measurement Order", "1"},
                     {"Packet PSI Status", "2"},
                     {"Packet SI Status", "Not Supported"},
                     {"Count LR", "3"},
                     {"Count HR", "4"}}));
    // Readings -212 → 30 - 70 = -40 and -100 → 41 - 70 = -29 (the zero is skipped): mean -34.5.
    EXPECT_EQ(sectionAt(display, "UMTS", "UMTS RR Info"), rowOf({{"RRC State", "CELL_DCH"},
                                                                 {"Transmit Power", "-34.50 dBm"},
                                                                 {"Cell ID", "123456"},
                                                                 {"Downlink Frequency", "10563"},
                                                                 {"Uplink Frequency", "9613"},
                                                                 {"URA ID", "258"},
                                                                 {"Ciphering", "Enabled"}}));
}

TEST(GsmStatesDecode, HsdpaAndBlerRecords) {
    const PlistValue display = decodeDisplay(statesData("states-hsdpa-bler.hex"));
    ASSERT_TRUE(display.isDictionary());
    // Sub frames 0x2C + 256 × (0x05 & 3) = 300; carrier (0x05 >> 2) & 3 = 1. The secondary entry is the one
    // at 180 (18 + 162 × 1), not the decoy of nines at 27.
    auto hsdpa = PlistDictionary::create();
    hsdpa->set("Version", "1");
    hsdpa->set("Sub Frames", "300");
    hsdpa->set("Carrier Info", "MIMO");
    hsdpa->set(
        "Primary HARQ Process",
        rowsOf({{{"Process ID", "2"}, {"No Rx Bits", "100000"}, {"New Tx", "50"}, {"Block Errors", "3"}}}));
    hsdpa->set(
        "Secondary HARQ Process",
        rowsOf(
            {{{"Process ID", "5"}, {"No Rx Bits", "4294967295"}, {"New Tx", "1"}, {"Block Errors", "0"}}}));
    EXPECT_EQ(sectionAt(display, "UMTS", "HSDPA Info"), PlistValue(hsdpa));

    auto bler = PlistDictionary::create();
    bler->set("Window Size", "200");
    bler->set(
        "Transport Channels",
        rowsOf({{{"Transport Channel ID", "1"}, {"CRC Received", "1000"}, {"CRC Received in Error", "-1"}},
                {{"Transport Channel ID", "7"}, {"CRC Received", "16"}, {"CRC Received in Error", "2"}}}));
    EXPECT_EQ(sectionAt(display, "UMTS", "BLER"), PlistValue(bler));
}

TEST(GsmStatesDecode, CellMonitorAndCellIdentityTakeTurnsWithTheUarfcn) {
    const auto result =
        runProcess({kDecode, "--technology", "gsm", "--every-tick", statesData("states-cellmonitor.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto printed = lines(result.out);
    ASSERT_EQ(printed.size(), 3u);
    std::vector<PlistValue> displays;
    for (const std::string& line : printed) {
        const auto display = parseJson(line);
        ASSERT_TRUE(display.has_value()) << line;
        displays.push_back(*display);
    }
    // The first serving cell of UMTS or GSM is the GSM one; UMTS RR Info takes the UMTS serving cell.
    EXPECT_EQ(
        sectionAt(displays[0], "Network", "Serving PLMN"),
        rowOf({{"Mobile Country Code", "234"}, {"Mobile Network Code", "15"}, {"Location Area Code", "77"}}));
    EXPECT_EQ(sectionAt(displays[0], "UMTS", "UMTS RR Info"),
              rowOf({{"Cell ID", "28000"}, {"UARFCN", "10700"}, {"Scrambling Code", "300"}}));
    EXPECT_EQ(sectionAt(displays[1], "UMTS", "UMTS RR Info"), rowOf({{"Cell ID", "123456"},
                                                                     {"Scrambling Code", "300"},
                                                                     {"Downlink Frequency", "10563"},
                                                                     {"Uplink Frequency", "9613"},
                                                                     {"URA ID", "258"}}));
    EXPECT_EQ(sectionAt(displays[2], "UMTS", "UMTS RR Info"), rowOf({{"Cell ID", "28000"},
                                                                     {"Scrambling Code", "300"},
                                                                     {"Downlink Frequency", "10563"},
                                                                     {"Uplink Frequency", "9613"},
                                                                     {"URA ID", "258"},
                                                                     {"UARFCN", "10700"}}));
}

// ---- a real capture ----

// The value names, written out here independently of the decoders.
const std::vector<std::string> kRegistrationStates = {"REG_STATE_INACTIVE",      "REG_STATE_IDLE",
                                                      "REG_STATE_REGISTERING",   "REG_STATE_DEREGISTERING",
                                                      "REG_STATE_MANUAL_SEARCH", "REG_STATE_AUTOMATIC_SEARCH",
                                                      "REG_STATE_OFFLINE"};
const std::map<unsigned, std::string> kMmStates = {
    {0, "MM_NULL"},
    {3, "MM_LOCATION_UPDATE_INITIATED"},
    {5, "MM_WAIT_FOR_OUTGOING_MM_CONNECTION"},
    {6, "MM_CONNECTION_ACTIVE"},
    {7, "MM_IMSI_DETACH_INITIATED"},
    {8, "MM_PROCESS_CM_SERVICE_PROMPT"},
    {9, "MM_WAIT_FOR_NETWORK_COMMAND"},
    {10, "MM_LOCATION_UPDATE_REJECTED"},
    {13, "MM_WAIT_FOR_RR_CONNECTION_LU"},
    {14, "MM_WAIT_FOR_RR_CONNECTION_MM"},
    {15, "MM_WAIT_FOR_RR_CONNECTION_IMSI_DETACH"},
    {17, "MM_REESTABLISHMENT_INITIATED"},
    {18, "MM_WAIT_FOR_RR_ACTIVE"},
    {19, "MM_IDLE"},
    {20, "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION"},
    {21, "MM_WAIT_FOR_RR_CONNECTION_ REESTABLISHMENT"},
    {22, "MM_WAIT_FOR_REESTABLISH_DECISION"},
    {23, "MM_LOCATION_UPDATING_PENDING"},
    {25, "MM_RR_CONNECTION_RELEASE_NOT_ALLOWED"},
};
const std::vector<std::string> kMmSubStates = {"MM_NULL_SUBSTATE",        "MM_NO_IMSI",
                                               "MM_PLMN_SEARCH",          "MM_LIMITED_SERVICE",
                                               "MM_ATTEMPTING_TO_UPDATE", "MM_LOCATION_UPDATE_NEEDED",
                                               "MM_NO_CELL_AVAILABLE",    "MM_PLMN_SEARCH_NORMAL_SERVICE",
                                               "MM_NORMAL_SERVICE"};
const std::vector<std::string> kLuStatuses = {"UPDATED", "NOT_UPDATED", "ROAMING_NOT_ALLOWED",
                                              "LOCATION_AREA_NOT_ALLOWED"};
const std::vector<std::string> kGmmStates = {"GMM_NULL",
                                             "GMM_DEREGISTERED",
                                             "GMM_REGISTERED_INITIATED",
                                             "GMM_REGISTERED",
                                             "GMM_DEREGISTERED_INITIATED",
                                             "GMM_ROUTING_AREA_UPDATE_INITIATED",
                                             "GMM_SERVICE_REQUEST_INITIATED"};
const std::vector<std::string> kGmmSubStates = {"GMM_NORMAL_SERVICE",
                                                "GMM_LIMITED_SERVICE",
                                                "GMM_ATTACH_NEEDED",
                                                "GMM_ATTEMPTING_TO_ATTACH",
                                                "GMM_NO_IMSI",
                                                "GMM_NO_CELL_AVAILABLE",
                                                "GMM_PLMN_SEARCH",
                                                "GMM_SUSPENDED",
                                                "GMM_UPDATE_NEEDED",
                                                "GMM_ATTEMPING_TO_UPDATE",
                                                "GMM_ATTEMPTING_TO_UPDATE_MM",
                                                "GMM_IMSI_DETACH_INITIATED",
                                                "GMM_NULL_SUBSTATE"};
const std::vector<std::string> kGmmUpdateStatuses = {
    "GMM_GU1_UPDATED", "GMM_GU2_NOT_UPDATED", "GMM_GU3_PLMN_NOT_ALLOWED", "GMM_GU3_ROUTING_AREA_NOT_ALLOWED"};
const std::vector<std::string> kServiceTypes = {"NO_SERVICE", "CS_ONLY", "PS_ONLY", "CS_PS_SERVICE",
                                                "LIMITED_SERVICE"};
const std::vector<std::string> kSelectionModes = {"Automatic", "Manual", "Limited", "LIMITED_ROUTINE_ACQ",
                                                  "LIMITED_MANUAL_ACQ"};
const std::vector<std::string> kOperatingModes = {"Class 1", "Class 2", "Class 3"};

std::string nameIn(const std::vector<std::string>& table, unsigned value) {
    return value < table.size() ? table[value] : "Unknown";
}
std::string mmStateName(unsigned value) {
    const auto found = kMmStates.find(value);
    return found == kMmStates.end() ? "Unknown" : found->second;
}
char bcd(unsigned nibble) {
    return nibble < 10 ? static_cast<char>('0' + nibble) : ' ';
}

// The last packet of each code long enough to be decoded (shorter ones change nothing).
struct LastRecords {
    std::map<unsigned, std::vector<std::uint8_t>> byCode;
    std::map<unsigned, std::size_t> seen;
};

LastRecords lastRecordsOf(const std::string& path) {
    const std::map<unsigned, std::size_t> minimumLength = {
        {0x7130, 16}, {0x7131, 16}, {0x7132, 16}, {0x7135, 32}, {0x7150, 17}};
    LastRecords last;
    std::string error;
    const bool read = forEachLogItem(
        path, LogFormat::DiagCapture,
        [&](const LogItemView& item) {
            if (!item.isBlob() || item.bytes.size() < 13 || item.bytes[0] != 1) {
                return true;
            }
            const unsigned code = item.bytes[3] | (item.bytes[4] << 8);
            const auto minimum = minimumLength.find(code);
            if (minimum != minimumLength.end()) {
                ++last.seen[code];
                if (item.bytes.size() >= minimum->second) {
                    last.byCode[code].assign(item.bytes.begin(), item.bytes.end());
                }
            }
            return true;
        },
        error);
    EXPECT_TRUE(read) << error;
    return last;
}

TEST(GsmStatesDecode, RealCaptureShowsItsLastStateRecords) {
    const std::string capture = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/nas-lte-1.qmdl";
    const LastRecords last = lastRecordsOf(capture);
    for (const unsigned code : {0x7130u, 0x7131u, 0x7132u, 0x7135u}) {
        ASSERT_TRUE(last.byCode.contains(code)) << std::hex << code;
    }
    const auto& gmm = last.byCode.at(0x7130);
    const auto& mm = last.byCode.at(0x7131);
    const auto& registration = last.byCode.at(0x7132);
    const auto& info = last.byCode.at(0x7135);

    const PlistValue display = decodeDisplay(capture);
    ASSERT_TRUE(display.isDictionary());
    const PlistValue ps = sectionAt(display, "Mobility", "Process PS");
    const PlistValue co = sectionAt(display, "Mobility", "Process CO");
    const PlistValue cs = sectionAt(display, "Mobility", "Process CS");
    const PlistValue plmn = sectionAt(display, "Network", "Serving PLMN");
    const PlistValue gprs = sectionAt(display, "GSM", "GPRS Information");

    EXPECT_EQ(textAt(ps, "MM State"), nameIn(kGmmStates, gmm[13]));
    EXPECT_EQ(textAt(ps, "MM Sub State"), nameIn(kGmmSubStates, gmm[14]));
    EXPECT_EQ(textAt(ps, "Attach Reject Cause"), nameIn(kGmmUpdateStatuses, gmm[15]));
    EXPECT_EQ(textAt(co, "MM State"), mmStateName(mm[13]));
    EXPECT_EQ(textAt(cs, "MM State"), mmStateName(mm[13]));
    EXPECT_EQ(textAt(cs, "MM Sub State"), nameIn(kMmSubStates, mm[14]));
    EXPECT_EQ(textAt(cs, "LU Reject Cause"), nameIn(kLuStatuses, mm[15]));
    for (const PlistValue* section : {&ps, &co, &cs}) {
        EXPECT_EQ(textAt(*section, "MM Service State"), nameIn(kRegistrationStates, registration[13]));
    }
    EXPECT_EQ(textAt(plmn, "PLMN Sel Mod"), nameIn(kSelectionModes, registration[14]));

    const std::string mcc{bcd(info[15] & 0xF), bcd(info[15] >> 4), bcd(info[16] & 0xF)};
    const std::string mnc{bcd(info[17] & 0xF), bcd(info[17] >> 4), bcd(info[16] >> 4)};
    EXPECT_EQ(textAt(plmn, "Mobile Country Code"), mcc);
    EXPECT_EQ(textAt(plmn, "Mobile Network Code"), mnc);
    EXPECT_EQ(textAt(plmn, "Location Area Code"), std::to_string(info[18] << 8 | info[19]));
    EXPECT_EQ(textAt(plmn, "Routing Area Code"), std::to_string(info[20]));
    EXPECT_EQ(textAt(plmn, "Service Type"), nameIn(kServiceTypes, info[14]));
    EXPECT_EQ(textAt(gprs, "Network Operating Mode"), nameIn(kOperatingModes, info[13]));

    // The equivalent list of the last 0x7150, if the capture holds one: six digit bytes every 3 bytes.
    if (last.byCode.contains(0x7150)) {
        const auto& list = last.byCode.at(0x7150);
        const auto at = [&](std::size_t offset) -> unsigned {
            return offset < list.size() ? list[offset] : 0u;
        };
        auto rows = PlistArray::create();
        for (std::size_t entry = 0; entry < at(16); ++entry) {
            const std::size_t first = 17 + 3 * entry;
            rows->append(rowOf({{"Mobile Country Code",
                                 std::to_string(100 * at(first) + 10 * at(first + 2) + at(first + 4))},
                                {"Mobile Network Code",
                                 std::to_string(100 * at(first + 1) + 10 * at(first + 3) + at(first + 5))}}));
        }
        EXPECT_EQ(sectionAt(display, "Network", "Equivalent PLMN List"), PlistValue(rows));
    }
}

}  // namespace
}  // namespace velmar
