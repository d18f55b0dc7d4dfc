// The radio-resource decoders: GSMRRInfo, UMTSRRInfo and the UMTSRRMeasurement placeholder.
#include <gtest/gtest.h>

#include <cstdio>

#include "LogGenerator/GSM/GSMRRInfo.h"
#include "LogGenerator/GSM/UMTSRRInfo.h"
#include "LogGenerator/GSM/UMTSRRMeasurement.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/GsmStateRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::cut;
using testing::KeySectionHarness;
using testing::LogCapture;
using Strings = std::vector<std::string>;
using Lines = std::vector<LogCapture::Line>;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

// ---- GSMRRInfo ----

TEST(StatesRadioResource, GsmSectionNameCodesAndEntryLine) {
    KeySectionHarness<GSMRRInfo> gsm;
    EXPECT_EQ(gsm.decoder->getSectionName(), "GSM RR Info");
    EXPECT_EQ(gsm.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x512C, 0x5137, 0x5072, 0x51F6}));
    LogCapture capture;
    gsm.feed(buildGsmRrStateRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "GSMRRInfo"}}));
}

TEST(StatesRadioResource, GsmRrStateRecord) {
    KeySectionHarness<GSMRRInfo> gsm;
    gsm.feed(RecordBuilder(0x512C).u8(13, 9).u8(14, 2).u8(15, 0).u8(16, 1).build());
    EXPECT_EQ(gsm.keys(), (Strings{"RR State", "RR Sub State", "RR Status", "RR Mode"}));
    EXPECT_EQ(gsm.text("RR State"), "RR_DATA_TRANSFER");
    EXPECT_EQ(gsm.text("RR Sub State"), "2");
    EXPECT_EQ(gsm.text("RR Status"), "0");
    EXPECT_EQ(gsm.text("RR Mode"), "Data");
    gsm.feed(buildGsmRrStateRecord({.state = 22, .subState = 255, .status = 17, .mode = 0}));
    EXPECT_EQ(gsm.text("RR State"), "Unknown");
    EXPECT_EQ(gsm.text("RR Sub State"), "255");
    EXPECT_EQ(gsm.text("RR Status"), "17");
    EXPECT_EQ(gsm.text("RR Mode"), "Voice");
    gsm.feed(buildGsmRrStateRecord({.mode = 200}));
    EXPECT_EQ(gsm.text("RR Mode"), "Data");
}

TEST(StatesRadioResource, GsmRrStateTableWithItsBlanks) {
    const Strings names = {"RR_INACTIVE",
                           "RR_GOING_ACTIVE",
                           "RR_GOING_INACTIVE",
                           "RR_CELL_SELECTION",
                           "RR_PLMN_LIST_CONSTRUCTION",
                           "RR_IDLE",
                           "RR_CELL_RESELECTION",
                           "RR_CONNECTION_PENDING",
                           "RR_CHOOSE_CELL",
                           "RR_DATA_TRANSFER",
                           "RR_NO_CHANNELS",
                           "RR_CONNECTION_RELEASE",
                           "RR_EARLY_CAMPED_WAIT_FOR_SI",
                           "RR_W2G_INTERRAT_HANDOVER_ PROGRESS",
                           "RR_W2G_INTERRAT_RESELECTION_PROGRESS",
                           "RR_WAIT_FOR_EARLY_PSCAN",
                           "GRR51",
                           "GRR52",
                           "RR_G2W_INTERRAT_RESELECTION_PROGRESS",
                           "RR_G2W_INTERRAT_HANDOVER_ PROGRESS",
                           "RR_CELL_REEST",
                           "RR_W2G_INTERRAT_CC_ORDER_ PROGRESS",
                           "Unknown"};
    KeySectionHarness<GSMRRInfo> gsm;
    for (std::size_t value = 0; value < names.size(); ++value) {
        gsm.feed(buildGsmRrStateRecord({.state = static_cast<std::uint8_t>(value)}));
        EXPECT_EQ(gsm.text("RR State"), names[value]) << value;
    }
    gsm.feed(buildGsmRrStateRecord({.state = 255}));
    EXPECT_EQ(gsm.text("RR State"), "Unknown");
}

TEST(StatesRadioResource, GsmServingMeasurementsShowWhole32BitValues) {
    KeySectionHarness<GSMRRInfo> gsm;
    // 0x00012345 = 74565 (its low 16 bits alone would be 9029); 0xFFFFFFFE through "%d" is -2.
    gsm.feed(buildGsmMeasurementRecord(
        {.rxLevel = 201, .c1 = 0x00012345, .c2 = 0xFFFFFFFE, .reselectHysteresis = 0}));
    EXPECT_EQ(gsm.keys(), (Strings{"Serving Rx Level", "Rx Quality Full", "Rx Quality Sub"}));
    EXPECT_EQ(gsm.text("Serving Rx Level"), "201");
    EXPECT_EQ(gsm.text("Rx Quality Full"), "74565");
    EXPECT_EQ(gsm.text("Rx Quality Sub"), "-2");
}

TEST(StatesRadioResource, GsmDtxAndDrx) {
    KeySectionHarness<GSMRRInfo> gsm;
    gsm.feed(buildGsmChannelParametersRecord({.dtxUsed = 0}));
    EXPECT_EQ(gsm.text("DTX Used"), "OFF");
    gsm.feed(buildGsmChannelParametersRecord({.dtxUsed = 3}));
    EXPECT_EQ(gsm.text("DTX Used"), "ON");
    gsm.feed(buildGprsTbfParametersRecord({.t3192 = 7, .drxTimerMax = 12, .accessBurstType = 1}));
    EXPECT_EQ(gsm.text("DRX Used"), "12 sec");
    EXPECT_EQ(gsm.keys(), (Strings{"DTX Used", "DRX Used"}));
}

TEST(StatesRadioResource, GsmMinimumLengths) {
    KeySectionHarness<GSMRRInfo> gsm;
    LogCapture capture;
    gsm.feed(cut(buildGsmRrStateRecord({.state = 5}), 16));
    gsm.feed(cut(buildGsmMeasurementRecord({.rxLevel = 5, .c1 = 0, .c2 = 0, .reselectHysteresis = 0}), 28));
    gsm.feed(cut(buildGsmChannelParametersRecord({.dtxUsed = 1}), 19));
    gsm.feed(cut(buildGprsTbfParametersRecord({.drxTimerMax = 4}), 23));
    EXPECT_TRUE(gsm.section->empty());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    gsm.feed(cut(buildGsmRrStateRecord({.state = 5}), 17));
    gsm.feed(cut(buildGsmMeasurementRecord({.rxLevel = 5, .c1 = 0, .c2 = 0, .reselectHysteresis = 0}), 29));
    gsm.feed(cut(buildGsmChannelParametersRecord({.dtxUsed = 1}), 20));
    gsm.feed(cut(buildGprsTbfParametersRecord({.drxTimerMax = 4}), 24));
    EXPECT_EQ(gsm.text("RR State"), "RR_IDLE");
    EXPECT_EQ(gsm.text("Serving Rx Level"), "5");
    EXPECT_EQ(gsm.text("DTX Used"), "ON");
    EXPECT_EQ(gsm.text("DRX Used"), "4 sec");
}

TEST(StatesRadioResource, GsmUnknownCodes) {
    KeySectionHarness<GSMRRInfo> gsm;
    LogCapture capture;
    gsm.feed(buildGsmRrStateRecord({}), 0x5138);  // 20792
    gsm.feed(buildGsmRrStateRecord({}), 0x51F5);  // 20981
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "GSMRRInfo"},
                                      {kLogError, "Received an unknown log message: 20792"},
                                      {kLogWarning, "GSMRRInfo"},
                                      {kLogError, "Received an unknown log message: 20981"}}));
    EXPECT_TRUE(gsm.section->empty());
}

// ---- UMTSRRInfo ----

TEST(StatesRadioResource, UmtsSectionNameCodesAndEntryLine) {
    KeySectionHarness<UMTSRRInfo> umts;
    EXPECT_EQ(umts.decoder->getSectionName(), "UMTS RR Info");
    EXPECT_EQ(umts.decoder->getLogCodeArray(),
              (std::vector<std::int32_t>{0x4125, 0x4031, 0x4127, 0x4157, 0xFF0001}));
    LogCapture capture;
    umts.feed(buildRrcStateRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"}}));
}

TEST(StatesRadioResource, UmtsRrcStateTable) {
    const Strings names = {"Disconnected", "Connecting", "CELL_FACH", "CELL_DCH",
                           "CELL_PCH",     "URA_PCH",    "Unknown"};
    KeySectionHarness<UMTSRRInfo> umts;
    for (std::size_t value = 0; value < names.size(); ++value) {
        umts.feed(buildRrcStateRecord({.state = static_cast<std::uint8_t>(value)}));
        EXPECT_EQ(umts.text("RRC State"), names[value]) << value;
    }
    umts.feed(buildRrcStateRecord({.state = 128}));
    EXPECT_EQ(umts.text("RRC State"), "Unknown");
}

TEST(StatesRadioResource, UmtsTransmitPowerMeanOfNonZeroReadings) {
    KeySectionHarness<UMTSRRInfo> umts;
    // (-212 + 512) / 10 = 30, 30 - 70 = -40; the zero reading is skipped.
    umts.feed(buildUplinkPowerRecord({.readings = {-212, 0}}));
    EXPECT_EQ(umts.text("Transmit Power"), "-40.00 dBm");
    // trunc(299 / 10) = 29 → -41; trunc(412 / 10) = 41 → -29; mean -35.
    umts.feed(buildUplinkPowerRecord({.readings = {-213, -100}}));
    EXPECT_EQ(umts.text("Transmit Power"), "-35.00 dBm");
    // Division toward zero for negative sums: (-600 + 512) / 10 = -8.8 → -8, -8 - 70 = -78; with 188: 70 - 70
    // = 0; with 1: 51 - 70 = -19. Mean (-78 + 0 - 19) / 3 = -32.333...
    umts.feed(buildUplinkPowerRecord({.readings = {-600, 188, 1}}));
    EXPECT_EQ(umts.text("Transmit Power"), "-32.33 dBm");
}

TEST(StatesRadioResource, UmtsTransmitPowerWithoutReadingsIsNotANumber) {
    // 0 / 0 as the processor computes it, formatted as the decoder formats it.
    volatile double zero = 0.0;
    const double quotient = zero / zero;
    char expected[32];
    std::snprintf(expected, sizeof expected, "%4.2lf dBm", quotient);
    ASSERT_NE(std::string(expected).find("nan"), std::string::npos);

    KeySectionHarness<UMTSRRInfo> umts;
    umts.feed(buildUplinkPowerRecord({.readings = {}}));
    EXPECT_EQ(umts.text("Transmit Power"), expected);
    umts.feed(buildUplinkPowerRecord({.readings = {-100}}));
    EXPECT_EQ(umts.text("Transmit Power"), "-29.00 dBm");
    umts.feed(buildUplinkPowerRecord({.readings = {0, 0, 0}}));
    EXPECT_EQ(umts.text("Transmit Power"), expected);
}

TEST(StatesRadioResource, UmtsTransmitPowerCountPastTheEnd) {
    KeySectionHarness<UMTSRRInfo> umts;
    // 200 entries announced, one present: the missing readings read zero and are skipped.
    umts.feed(buildUplinkPowerRecord({.readings = {-312}, .countOverride = 200}));
    EXPECT_EQ(umts.text("Transmit Power"), "-50.00 dBm");  // (200 / 10) - 70
    // The record really holds one 14-byte entry from offset 16, nothing more.
    EXPECT_EQ(buildUplinkPowerRecord({.readings = {-312}}).size(), 30u);
}

TEST(StatesRadioResource, UmtsCellIdentityRecord) {
    KeySectionHarness<UMTSRRInfo> umts;
    umts.feed(buildUmtsCellIdentityRecord(
        {.uplinkFrequency = 9613, .downlinkFrequency = 10563, .cellId = 0x80000001u, .uraId = 0xFFFE}));
    EXPECT_EQ(umts.keys(), (Strings{"Cell ID", "Downlink Frequency", "Uplink Frequency", "URA ID"}));
    EXPECT_EQ(umts.text("Cell ID"), "-2147483647");
    EXPECT_EQ(umts.text("Downlink Frequency"), "10563");
    EXPECT_EQ(umts.text("Uplink Frequency"), "9613");
    EXPECT_EQ(umts.text("URA ID"), "65534");
}

TEST(StatesRadioResource, UmtsCellIdentityRemovesTheUarfcnOfCellInformation) {
    KeySectionHarness<UMTSRRInfo> umts;
    const PlistData cellInfo = buildCellMonitorEntries(
        {{.technology = kUmts, .cellType = kServing, .cellId = 77, .uarfcn = 10700, .psc = 300}});
    umts.feed(cellInfo, 0xFF0001);
    EXPECT_EQ(umts.keys(), (Strings{"Cell ID", "UARFCN", "Scrambling Code"}));
    EXPECT_EQ(umts.text("UARFCN"), "10700");
    umts.feed(
        buildUmtsCellIdentityRecord({.uplinkFrequency = 1, .downlinkFrequency = 2, .cellId = 3, .uraId = 4}));
    EXPECT_EQ(umts.keys(),
              (Strings{"Cell ID", "Scrambling Code", "Downlink Frequency", "Uplink Frequency", "URA ID"}));
    EXPECT_EQ(umts.text("Cell ID"), "3");
    umts.feed(cellInfo, 0xFF0001);
    EXPECT_EQ(umts.text("UARFCN"), "10700");
    EXPECT_EQ(umts.text("Cell ID"), "77");
    EXPECT_EQ(umts.text("Scrambling Code"), "300");
}

TEST(StatesRadioResource, UmtsCiphering) {
    KeySectionHarness<UMTSRRInfo> umts;
    umts.feed(buildCipheringRecord({.ciphering = 2}));
    EXPECT_EQ(umts.text("Ciphering"), "Enabled");
    umts.feed(buildCipheringRecord({.ciphering = 0}));
    EXPECT_EQ(umts.text("Ciphering"), "Disabled");
}

TEST(StatesRadioResource, UmtsMinimumLengths) {
    KeySectionHarness<UMTSRRInfo> umts;
    LogCapture capture;
    umts.feed(cut(buildRrcStateRecord({.state = 3}), 13));
    umts.feed(cut(buildUplinkPowerRecord({.readings = {-212}}), 15));
    umts.feed(cut(buildUmtsCellIdentityRecord({.cellId = 5}), 28));
    umts.feed(cut(buildCipheringRecord({.ciphering = 1}), 18));
    EXPECT_TRUE(umts.section->empty());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    umts.feed(cut(buildRrcStateRecord({.state = 3}), 14));
    EXPECT_EQ(umts.text("RRC State"), "CELL_DCH");
    // 16 bytes: the count byte 14 (1) is there, the entry's reading is past the end and reads zero.
    volatile double zero = 0.0;
    char nan[32];
    std::snprintf(nan, sizeof nan, "%4.2lf dBm", zero / zero);
    umts.feed(cut(buildUplinkPowerRecord({.readings = {-212}}), 16));
    EXPECT_EQ(umts.text("Transmit Power"), nan);
    umts.feed(cut(buildUmtsCellIdentityRecord({.cellId = 5, .uraId = 9}), 29));
    EXPECT_EQ(umts.text("Cell ID"), "5");
    EXPECT_EQ(umts.text("URA ID"), "9");
    umts.feed(cut(buildCipheringRecord({.ciphering = 1}), 19));
    EXPECT_EQ(umts.text("Ciphering"), "Enabled");
}

TEST(StatesRadioResource, UmtsUnknownCodes) {
    KeySectionHarness<UMTSRRInfo> umts;
    LogCapture capture;
    umts.feed(buildRrcStateRecord({.state = 1}), 0x4126);  // 16678
    umts.feed(buildRrcStateRecord({.state = 1}), 0x4128);  // 16680
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"},
                                      {kLogError, "Received an unknown log message: 16678"},
                                      {kLogWarning, "UMTSRRInfo"},
                                      {kLogError, "Received an unknown log message: 16680"}}));
    EXPECT_TRUE(umts.section->empty());
}

TEST(StatesRadioResource, UmtsCellMonitorTakesTheFirstServingUmtsCell) {
    KeySectionHarness<UMTSRRInfo> umts;
    LogCapture capture;
    umts.feed(buildCellMonitorEntries({
                  {.technology = kGsm, .cellType = kServing, .cellId = 1, .uarfcn = 1, .psc = 1},
                  {.technology = kUmts, .cellType = kNeighbor, .cellId = 2, .uarfcn = 2, .psc = 2},
                  {.technology = kUmts, .cellType = kServing, .cellId = 123456, .uarfcn = 10836, .psc = 511},
                  {.technology = kUmts, .cellType = kServing, .cellId = 4, .uarfcn = 4, .psc = 4},
              }),
              0xFF0001);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"}}));
    EXPECT_EQ(umts.text("Cell ID"), "123456");
    EXPECT_EQ(umts.text("UARFCN"), "10836");
    EXPECT_EQ(umts.text("Scrambling Code"), "511");
}

TEST(StatesRadioResource, UmtsCellMonitorFailuresDoNotStopTheOtherKeys) {
    KeySectionHarness<UMTSRRInfo> umts;
    auto cell = PlistDictionary::create();
    cell->set(kKxCellMonitorCellRadioAccessTechnology, kUmts);
    cell->set(kKxCellMonitorCellType, kServing);
    cell->set(kKxCellMonitorUARFCN, PlistValue::newArray());  // wrong type
    cell->set(kKxCellMonitorPSC, PlistValue::real(-7.8));     // truncated toward zero
    auto cells = PlistArray::create();
    cells->append(cell);
    LogCapture capture;
    umts.feed(buildCellMonitorPacket(cells), 0xFF0001);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"},
                                      {kLogError, "UMTSRRInfo: Failed to retrieve Cell ID\n"},
                                      {kLogError, "UMTSRRInfo: Failed to retrieve UARFCN\n"}}));
    EXPECT_EQ(umts.keys(), (Strings{"Scrambling Code"}));
    EXPECT_EQ(umts.text("Scrambling Code"), "-7");
    capture.clear();
    umts.feed(buildCellMonitorEntries({{.technology = kUmts, .cellType = kServing}}), 0xFF0001);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"},
                                      {kLogError, "UMTSRRInfo: Failed to retrieve Cell ID\n"},
                                      {kLogError, "UMTSRRInfo: Failed to retrieve UARFCN\n"},
                                      {kLogError, "UMTSRRInfo: Failed to retrieve Scrambling Code\n"}}));
    EXPECT_EQ(umts.text("Scrambling Code"), "-7");
}

TEST(StatesRadioResource, UmtsCellMonitorUnparsableOrEmpty) {
    KeySectionHarness<UMTSRRInfo> umts;
    LogCapture capture;
    const std::uint8_t garbage[] = {0x00, 0x01, 0x02};
    umts.feed(buildExtendedPacket(0x0001, garbage), 0xFF0001);
    umts.feed(buildCellMonitorEntries({}), 0xFF0001);
    umts.feed(buildCellMonitorEntries({{.technology = kGsm, .cellType = kServing, .cellId = 1}}), 0xFF0001);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRInfo"},
                                      {kLogError, "Cell Info Array data could not be constructed"},
                                      {kLogError, "Failed to get Cell Array\n"},
                                      {kLogWarning, "UMTSRRInfo"},
                                      {kLogWarning, "UMTSRRInfo"}}));
    EXPECT_TRUE(umts.section->empty());
}

// ---- UMTSRRMeasurement ----

TEST(StatesRadioResource, MeasurementPlaceholder) {
    ClassDictionary classDict;
    CodeDictionary codeDict;
    LogCapture capture;
    auto placeholder = Base::initWithDict<UMTSRRMeasurement>(classDict, codeDict);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Array Count: 0"}}));
    EXPECT_EQ(placeholder->getSectionName(), "UMTS RR Measurement");
    EXPECT_FALSE(placeholder->getLogCodeArray().has_value());
    EXPECT_TRUE(codeDict.empty());
    EXPECT_EQ(testing::keysOf(classDict), (Strings{"UMTS RR Measurement"}));
    auto section = PlistDictionary::create();
    placeholder->updateSectionRef(PlistValue(section));
    capture.clear();
    placeholder->updateWithData(buildRrcStateRecord({.state = 1}), 0x4125);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "UMTSRRMeasurement"}}));
    EXPECT_TRUE(section->empty());
}

}  // namespace
}  // namespace velmar
