#include "service/modem-manager/ModemRecords.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/RecordBuilder.h"
#include "service/BasebandBlob.h"

namespace velmar::modem {
namespace {

// The XML text of a property list value without the document's head and tail, for exact comparisons.
std::string xmlOf(const PlistValue& value) {
    const auto bytes = serializeXml(value);
    if (!bytes) {
        return "(not serialisable)";
    }
    std::string text(bytes->begin(), bytes->end());
    const std::string head = "<plist version=\"1.0\">\n";
    const std::string tail = "</plist>\n";
    const std::size_t body = text.find(head);
    if (body == std::string::npos || !text.ends_with(tail)) {
        return "(unexpected document)";
    }
    return text.substr(body + head.size(), text.size() - tail.size() - body - head.size());
}

// The property list an extended record of the code carries behind its 13-byte header, as XML text.
std::string payloadOf(const PlistData& record, std::uint16_t code) {
    const BasebandBlob framed = frameBasebandBlob(ByteView(record.data(), record.size()));
    if (framed.kind != BlobKind::Extended || framed.code != code || record.size() < 13) {
        return "(not an extended record of that code)";
    }
    const auto value = parsePropertyList(std::span(record).subspan(13));
    return value ? xmlOf(*value) : std::string("(unparsable)");
}

BusDictionary lteCell(bool serving, std::string tac, std::string ci, std::string pci, std::int64_t earfcn) {
    BusDictionary cell = {
        {"cell-type", BusValue::number(5)},       {"serving", BusValue::flag(serving)},
        {"operator-id", BusValue::text("00101")}, {"physical-ci", BusValue::text(std::move(pci))},
        {"earfcn", BusValue::number(earfcn)},     {"rsrp", BusValue::real(-95.0)},
    };
    if (!tac.empty()) {
        cell["tac"] = BusValue::text(std::move(tac));
        cell["ci"] = BusValue::text(std::move(ci));
    }
    return cell;
}

TEST(ModemRecords, SimFilesCarryIccidImsiAndTheFirstOwnNumber) {
    const BusDictionary sim = {{"SimIdentifier", BusValue::text("8900101234567890123")},
                               {"Imsi", BusValue::text("001010123456789")},
                               {"OperatorName", BusValue::text("Test")}};
    const BusDictionary modem = {{"OwnNumbers", BusValue::texts({"", "+15555550123", "+15555550999"})}};
    std::vector<std::string> problems;
    const PlistData record = buildSimFilesRecord(simFilesFrom(&sim, modem, problems));
    EXPECT_TRUE(problems.empty());
    EXPECT_EQ(payloadOf(record, 0x0000),
              ("<dict>\n"
               "\t<key>kSimFile_ICCID</key>\n\t<string>8900101234567890123</string>\n"
               "\t<key>kSimFile_IMSI</key>\n\t<string>001010123456789</string>\n"
               "\t<key>kSimFile_MSISDN</key>\n\t<string>+15555550123</string>\n"
               "</dict>\n"));
}

TEST(ModemRecords, SimFilesLeaveOutAbsentAndBadValuesWithAProblemLine) {
    const BusDictionary sim = {{"SimIdentifier", BusValue::number(42)},
                               {"Imsi", BusValue::text("00101<script>")}};
    const BusDictionary modem = {{"OwnNumbers", BusValue::text("+15555550123")}};
    std::vector<std::string> problems;
    const SimFilesRecord files = simFilesFrom(&sim, modem, problems);
    EXPECT_TRUE(files.files.empty());
    EXPECT_EQ(problems, (std::vector<std::string>{
                            "SIM: SimIdentifier is not a string (D-Bus type 'u'); skipped",
                            "SIM: Imsi \"00101<script>\" is out of range; skipped",
                            "modem: OwnNumbers is not a list of strings (D-Bus type 's'); skipped",
                        }));

    problems.clear();
    EXPECT_TRUE(simFilesFrom(nullptr, {}, problems).files.empty());
    EXPECT_TRUE(problems.empty());
}

TEST(ModemRecords, AConnectedBearerIsAContextWithItsAddressAndServers) {
    const BusDictionary bearer = {
        {"Connected", BusValue::flag(true)},
        {"Interface", BusValue::text("wwan0")},
        {"Properties",
         BusValue::dictionary({{"apn", BusValue::text("internet.test")}, {"ip-type", BusValue::number(4)}})},
        {"Ip4Config", BusValue::dictionary({{"method", BusValue::number(3)},
                                            {"address", BusValue::text("10.45.17.201")},
                                            {"prefix", BusValue::number(30)},
                                            {"dns1", BusValue::text("10.45.0.1")},
                                            {"dns2", BusValue::text("10.45.0.2")}})},
        {"Ip6Config", BusValue::dictionary({{"address", BusValue::text("2001:db8::17")},
                                            {"dns1", BusValue::text("2001:db8::1")}})},
    };
    std::vector<std::string> problems;
    const auto context = bearerContextFrom("/org/freedesktop/ModemManager1/Bearer/7", bearer, problems);
    ASSERT_TRUE(context.has_value());
    EXPECT_TRUE(problems.empty());
    EXPECT_EQ(xmlOf(bearerContextDictionary(*context)),
              "<dict>\n"
              "\t<key>Context ID</key>\n\t<string>7</string>\n"
              "\t<key>APN</key>\n\t<string>internet.test</string>\n"
              "\t<key>PDP Type</key>\n\t<string>IPv4v6</string>\n"
              "\t<key>PDP Address</key>\n\t<string>10.45.17.201</string>\n"
              "\t<key>DNS</key>\n\t<array>\n\t\t<string>10.45.0.1</string>\n\t\t<string>10.45.0.2</string>\n"
              "\t\t<string>2001:db8::1</string>\n\t</array>\n"
              "\t<key>Interface</key>\n\t<string>wwan0</string>\n"
              "</dict>\n");
}

TEST(ModemRecords, ADisconnectedOrBadBearerIsNoContext) {
    std::vector<std::string> problems;
    EXPECT_FALSE(bearerContextFrom("/b/1", {{"Connected", BusValue::flag(false)}}, problems));
    EXPECT_FALSE(bearerContextFrom("/b/2", {}, problems));
    EXPECT_TRUE(problems.empty());
    EXPECT_FALSE(bearerContextFrom("/b/3", {{"Connected", BusValue::number(1)}}, problems));
    const auto context =
        bearerContextFrom("/b/4",
                          {{"Connected", BusValue::flag(true)},
                           {"Properties", BusValue::dictionary({{"ip-type", BusValue::number(3)}})}},
                          problems);
    ASSERT_TRUE(context.has_value());
    EXPECT_EQ(context->context.pdpType, "");
    EXPECT_EQ(problems, (std::vector<std::string>{
                            "bearer 3: Connected is not a boolean (D-Bus type 'u'); skipped",
                            "bearer 4: ip-type 3 is out of range; skipped",
                        }));
}

TEST(ModemRecords, BearerRecordIsAnArrayOfContexts) {
    BearerContext first;
    first.context = {1, "internet.test", "IPv4", "10.0.0.2"};
    const PlistData record = buildBearerContextsRecord({first});
    EXPECT_EQ(payloadOf(record, 0x0002), ("<array>\n\t<dict>\n"
                                          "\t\t<key>Context ID</key>\n\t\t<string>1</string>\n"
                                          "\t\t<key>APN</key>\n\t\t<string>internet.test</string>\n"
                                          "\t\t<key>PDP Type</key>\n\t\t<string>IPv4</string>\n"
                                          "\t\t<key>PDP Address</key>\n\t\t<string>10.0.0.2</string>\n"
                                          "\t</dict>\n</array>\n"));
    EXPECT_EQ(payloadOf(buildBearerContextsRecord({}), 0x0002), ("<array/>\n"));
}

TEST(ModemRecords, CellInfoBecomesTheCellMonitorArray) {
    const std::vector<BusDictionary> cells = {
        lteCell(true, "1A2B", "1234567", "1F", 1300),
        lteCell(false, "", "", "20", 1300),
        lteCell(false, "", "", "1FF", 6300),  // PCI 511: out of range, left out
        {{"cell-type", BusValue::number(6)}, {"serving", BusValue::flag(false)}},  // 5G: no cell-monitor form
        {{"cell-type", BusValue::number(2)},
         {"operator-id", BusValue::text("00102")},
         {"lac", BusValue::text("8000")},
         {"ci", BusValue::text("2B")},
         {"arfcn", BusValue::number(62)},
         {"rx-level", BusValue::number(40)}},
        {{"cell-type", BusValue::number(3)},
         {"serving", BusValue::flag(false)},
         {"uarfcn", BusValue::number(10700)},
         {"psc", BusValue::number(300)},
         {"rscp", BusValue::real(-87.6)},
         {"ecio", BusValue::real(-7.4)}},
    };
    std::vector<std::string> problems;
    const PlistValue array = cellMonitorFrom(cells, problems);
    EXPECT_EQ(problems, (std::vector<std::string>{"cell 2: physical-ci \"1FF\" is out of range; skipped"}));
    EXPECT_EQ(xmlOf(array),
              "<array>\n"
              "\t<dict>\n"
              "\t\t<key>kKxCellMonitorCellRadioAccessTechnology</key>\n"
              "\t\t<string>kKxCellMonitorRadioAccessTechnologyLTE</string>\n"
              "\t\t<key>kKxCellMonitorCellType</key>\n\t\t<string>kKxCellMonitorCellTypeServing</string>\n"
              "\t\t<key>kKxCellMonitorTAC</key>\n\t\t<integer>6699</integer>\n"
              "\t\t<key>kKxCellMonitorCellId</key>\n\t\t<integer>19088743</integer>\n"
              "\t\t<key>kKxCellMonitorPID</key>\n\t\t<integer>31</integer>\n"
              "\t\t<key>kKxCellMonitorBandInfo</key>\n\t\t<integer>3</integer>\n"
              "\t\t<key>kKxCellMonitorUARFCN</key>\n\t\t<integer>1300</integer>\n"
              "\t</dict>\n"
              "\t<dict>\n"
              "\t\t<key>kKxCellMonitorCellRadioAccessTechnology</key>\n"
              "\t\t<string>kKxCellMonitorRadioAccessTechnologyLTE</string>\n"
              "\t\t<key>kKxCellMonitorCellType</key>\n\t\t<string>kKxCellMonitorCellTypeNeighbor</string>\n"
              "\t\t<key>kKxCellMonitorPID</key>\n\t\t<integer>32</integer>\n"
              "\t\t<key>kKxCellMonitorBandInfo</key>\n\t\t<integer>3</integer>\n"
              "\t\t<key>kKxCellMonitorUARFCN</key>\n\t\t<integer>1300</integer>\n"
              "\t</dict>\n"
              "\t<dict>\n"
              "\t\t<key>kKxCellMonitorCellRadioAccessTechnology</key>\n"
              "\t\t<string>kKxCellMonitorRadioAccessTechnologyLTE</string>\n"
              "\t\t<key>kKxCellMonitorCellType</key>\n\t\t<string>kKxCellMonitorCellTypeNeighbor</string>\n"
              "\t\t<key>kKxCellMonitorBandInfo</key>\n\t\t<integer>20</integer>\n"
              "\t\t<key>kKxCellMonitorUARFCN</key>\n\t\t<integer>6300</integer>\n"
              "\t</dict>\n"
              "\t<dict>\n"
              "\t\t<key>kKxCellMonitorCellRadioAccessTechnology</key>\n"
              "\t\t<string>kKxCellMonitorRadioAccessTechnologyGSM</string>\n"
              "\t\t<key>kKxCellMonitorCellType</key>\n\t\t<string>kKxCellMonitorCellTypeNeighbor</string>\n"
              "\t\t<key>kKxCellMonitorCellId</key>\n\t\t<integer>43</integer>\n"
              "\t\t<key>kKxCellMonitorARFCN</key>\n\t\t<integer>62</integer>\n"
              "\t\t<key>kKxCellMonitorRSSI</key>\n\t\t<integer>-70</integer>\n"
              "\t\t<key>kKxCellMonitorMCC</key>\n\t\t<integer>1</integer>\n"
              "\t\t<key>kKxCellMonitorMNC</key>\n\t\t<integer>2</integer>\n"
              "\t\t<key>kKxCellMonitorLAC</key>\n\t\t<integer>32768</integer>\n"
              "\t</dict>\n"
              "\t<dict>\n"
              "\t\t<key>kKxCellMonitorCellRadioAccessTechnology</key>\n"
              "\t\t<string>kKxCellMonitorRadioAccessTechnologyUMTS</string>\n"
              "\t\t<key>kKxCellMonitorCellType</key>\n\t\t<string>kKxCellMonitorCellTypeNeighbor</string>\n"
              "\t\t<key>kKxCellMonitorUARFCN</key>\n\t\t<integer>10700</integer>\n"
              "\t\t<key>kKxCellMonitorPSC</key>\n\t\t<integer>300</integer>\n"
              "\t\t<key>kKxCellMonitorRSCP</key>\n\t\t<integer>-88</integer>\n"
              "\t\t<key>kKxCellMonitorEcN0</key>\n\t\t<integer>-7</integer>\n"
              "\t</dict>\n"
              "</array>\n");
}

TEST(ModemRecords, CellValuesOfTheWrongTypeAreSkipped) {
    const std::vector<BusDictionary> cells = {
        {{"cell-type", BusValue::text("LTE")}},
        {{"cell-type", BusValue::number(5)},
         {"serving", BusValue::flag(true)},
         {"tac", BusValue::number(7)},
         {"earfcn", BusValue::number(300000)},
         {"ci", BusValue::text("-1")}},
        {{"cell-type", BusValue::number(2)},
         {"operator-id", BusValue::text("0010")},
         {"rx-level", BusValue::number(64)}},
    };
    std::vector<std::string> problems;
    const PlistValue array = cellMonitorFrom(cells, problems);
    ASSERT_TRUE(array.isArray());
    EXPECT_EQ(array.array()->size(), 2U);
    EXPECT_EQ(problems, (std::vector<std::string>{
                            "cell 0: cell-type is not an integer (D-Bus type 's'); skipped",
                            "cell 1: tac is not a string (D-Bus type 'u'); skipped",
                            "cell 1: ci \"-1\" is out of range; skipped",
                            "cell 1: earfcn 300000 is out of range; skipped",
                            "cell 2: operator-id \"0010\" is out of range; skipped",
                            "cell 2: rx-level 64 is out of range; skipped",
                        }));
}

}  // namespace
}  // namespace velmar::modem
