// GPRSInformation and the CodingScheme and CellChangeCounters placeholders.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/CellChangeCounters.h"
#include "LogGenerator/GSM/CodingScheme.h"
#include "LogGenerator/GSM/GPRSInformation.h"
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

TEST(StatesGprs, SectionNameCodesAndEntryLine) {
    KeySectionHarness<GPRSInformation> gprs;
    EXPECT_EQ(gprs.decoder->getSectionName(), "GPRS Information");
    EXPECT_EQ(gprs.decoder->getLogCodeArray(),
              (std::vector<std::int32_t>{0x51F5, 0x7135, 0x51F6, 0x51FB, 0x51FD, 0x51F4, 0x5137}));
    LogCapture capture;
    gprs.feed(buildSi13PositionRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "GPRSInformation"}}));
}

TEST(StatesGprs, TbfParameters) {
    KeySectionHarness<GPRSInformation> gprs;
    gprs.feed(RecordBuilder(0x51F6).u8(15, 3).u8(16, 4).u8(17, 1).resize(24).build());
    EXPECT_EQ(gprs.keys(), (Strings{"T3192", "Access Burst Type", "DRX Timer Max"}));
    EXPECT_EQ(gprs.text("T3192"), "0 ms");
    EXPECT_EQ(gprs.text("DRX Timer Max"), "4");
    EXPECT_EQ(gprs.text("Access Burst Type"), "11-bit format");
    gprs.feed(buildGprsTbfParametersRecord({.t3192 = 9, .drxTimerMax = 255, .accessBurstType = 0}));
    EXPECT_EQ(gprs.text("T3192"), "?? ms");
    EXPECT_EQ(gprs.text("DRX Timer Max"), "255");
    EXPECT_EQ(gprs.text("Access Burst Type"), "8-bit format");
    const Strings timers = {"500 ms", "1000 ms", "1500 ms", "0 ms", "80 ms",
                            "120 ms", "160 ms",  "200 ms",  "?? ms"};
    for (std::size_t value = 0; value < timers.size(); ++value) {
        gprs.feed(buildGprsTbfParametersRecord({.t3192 = static_cast<std::uint8_t>(value)}));
        EXPECT_EQ(gprs.text("T3192"), timers[value]) << value;
    }
    gprs.feed(buildGprsTbfParametersRecord({.accessBurstType = 200}));
    EXPECT_EQ(gprs.text("Access Burst Type"), "11-bit format");
}

TEST(StatesGprs, CellOptions) {
    KeySectionHarness<GPRSInformation> gprs;
    gprs.feed(RecordBuilder(0x51F5).u8(13, 255).u8(14, 0).u8(15, 255).resize(18).build());
    EXPECT_EQ(gprs.keys(), (Strings{"Network Control Order", "PFC Supported", "Priority Access Threshold"}));
    EXPECT_EQ(gprs.text("PFC Supported"), "Available");
    EXPECT_EQ(gprs.text("Network Control Order"), "Not Available");
    EXPECT_EQ(gprs.text("Priority Access Threshold"), "Barred (PKT access not allowed in the Cell)");

    const auto show = [&](std::uint8_t pfc, std::uint8_t threshold, std::uint8_t order) {
        gprs.feed(buildGprsCellOptionsRecord(
            {.pfcSupported = pfc, .priorityAccessThreshold = threshold, .networkControlOrder = order}));
        return Strings{gprs.text("PFC Supported"), gprs.text("Priority Access Threshold"),
                       gprs.text("Network Control Order")};
    };
    EXPECT_EQ(show(0, 1, 0), (Strings{"Not Supported", "Barred", "NC0"}));
    EXPECT_EQ(show(1, 2, 1), (Strings{"Supported", "Barred", "NC1"}));
    EXPECT_EQ(show(2, 3, 2), (Strings{"Unknown", "1 Only", "NC2"}));
    EXPECT_EQ(show(254, 4, 3), (Strings{"Unknown", "1 to 2", "Unknown"}));
    EXPECT_EQ(show(0, 5, 254), (Strings{"Not Supported", "1 to 3", "Unknown"}));
    EXPECT_EQ(show(0, 6, 0), (Strings{"Not Supported", "1 to 4", "NC0"}));
    EXPECT_EQ(show(0, 7, 0), (Strings{"Not Supported", "Allowed", "NC0"}));
    EXPECT_EQ(show(0, 8, 0), (Strings{"Not Supported", "Unknown", "NC0"}));
    EXPECT_EQ(show(0, 254, 0), (Strings{"Not Supported", "Unknown", "NC0"}));
    EXPECT_EQ(show(0, 255, 0), (Strings{"Not Supported", "Not Available", "NC0"}));
}

TEST(StatesGprs, Si13Position) {
    KeySectionHarness<GPRSInformation> gprs;
    const auto show = [&](std::uint8_t position) {
        gprs.feed(RecordBuilder(0x51F4).u8(14, position).build());
        return gprs.text("SI13 Position");
    };
    EXPECT_EQ(show(7), "Unknown");
    EXPECT_EQ(show(0), "Located on BCCH");
    EXPECT_EQ(show(1), "Located on Extended BCCH");
    EXPECT_EQ(show(2), "Unknown");
    EXPECT_EQ(show(254), "Unknown");
    EXPECT_EQ(show(255), "Not Available");
}

TEST(StatesGprs, NetworkOperatingModeFromTheRegistrationRecord) {
    KeySectionHarness<GPRSInformation> gprs;
    const Strings modes = {"Class 1", "Class 2", "Class 3", "Unknown"};
    for (std::size_t value = 0; value < modes.size(); ++value) {
        gprs.feed(buildRegistrationInfoRecord({.networkOperatingMode = static_cast<std::uint8_t>(value),
                                               .serviceType = 3,
                                               .plmnIdentity = plmnIdentityBytes("310", "410")}));
        EXPECT_EQ(gprs.text("Network Operating Mode"), modes[value]) << value;
    }
    EXPECT_EQ(gprs.keys(), (Strings{"Network Operating Mode"}));
}

TEST(StatesGprs, PbcchAndPacketSystemInformation) {
    KeySectionHarness<GPRSInformation> gprs;
    gprs.feed(buildPbcchRecord({.pbcchPresent = 1}));
    EXPECT_EQ(gprs.text("PBCCH Present"), "1");
    gprs.feed(buildPacketSystemInfoRecord({.packetPsiStatus = 2,
                                           .countLr = 11,
                                           .countHr = 200,
                                           .extMeasurementOrder = 3,
                                           .packetSiStatus = 9}));
    EXPECT_EQ(gprs.keys(), (Strings{"PBCCH Present", "Ext Measurement Order", "Packet PSI Status",
                                    "Packet SI Status", "Count LR", "Count HR"}));
    EXPECT_EQ(gprs.text("Ext Measurement Order"), "3");
    EXPECT_EQ(gprs.text("Packet PSI Status"), "2");
    EXPECT_EQ(gprs.text("Packet SI Status"), "Supported");
    EXPECT_EQ(gprs.text("Count LR"), "11");
    EXPECT_EQ(gprs.text("Count HR"), "200");
    gprs.feed(buildPacketSystemInfoRecord({.packetSiStatus = 0}));
    EXPECT_EQ(gprs.text("Packet SI Status"), "Not Supported");
}

TEST(StatesGprs, CellReselectHysteresisFromTheMeasurementRecord) {
    KeySectionHarness<GPRSInformation> gprs;
    gprs.feed(buildGsmMeasurementRecord({.rxLevel = 40, .c1 = 0, .c2 = 0, .reselectHysteresis = 0}));
    EXPECT_EQ(gprs.keys(), (Strings{"Cell Reselect Hysteresis"}));
    EXPECT_EQ(gprs.text("Cell Reselect Hysteresis"), "Not Applied");
    gprs.feed(buildGsmMeasurementRecord({.rxLevel = 0, .c1 = 0, .c2 = 0, .reselectHysteresis = 4}));
    EXPECT_EQ(gprs.text("Cell Reselect Hysteresis"), "Applied");
}

TEST(StatesGprs, MinimumLengths) {
    KeySectionHarness<GPRSInformation> gprs;
    const std::vector<std::pair<PlistData, std::size_t>> records = {
        {buildGprsCellOptionsRecord({.pfcSupported = 1}), 18},
        {buildRegistrationInfoRecord({.networkOperatingMode = 1}), 32},
        {buildGprsTbfParametersRecord({.t3192 = 1}), 24},
        {buildPbcchRecord({.pbcchPresent = 1}), 34},
        {buildPacketSystemInfoRecord({.packetSiStatus = 1}), 35},
        {buildSi13PositionRecord({.si13Position = 1}), 15},
        {buildGsmMeasurementRecord({.rxLevel = 0, .c1 = 0, .c2 = 0, .reselectHysteresis = 1}), 29},
    };
    LogCapture capture;
    for (const auto& [record, minimum] : records) {
        gprs.feed(cut(record, minimum - 1));
    }
    EXPECT_TRUE(gprs.section->empty());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    for (const auto& [record, minimum] : records) {
        gprs.feed(cut(record, minimum));
    }
    EXPECT_EQ(gprs.keys(),
              (Strings{"Network Control Order", "PFC Supported", "Priority Access Threshold",
                       "Network Operating Mode", "T3192", "Access Burst Type", "DRX Timer Max",
                       "PBCCH Present", "Ext Measurement Order", "Packet PSI Status", "Packet SI Status",
                       "Count LR", "Count HR", "SI13 Position", "Cell Reselect Hysteresis"}));
    EXPECT_EQ(gprs.text("PFC Supported"), "Supported");
    EXPECT_EQ(gprs.text("Network Operating Mode"), "Class 2");
    EXPECT_EQ(gprs.text("T3192"), "1000 ms");
    EXPECT_EQ(gprs.text("PBCCH Present"), "1");
    EXPECT_EQ(gprs.text("Packet SI Status"), "Supported");
    EXPECT_EQ(gprs.text("SI13 Position"), "Located on Extended BCCH");
    EXPECT_EQ(gprs.text("Cell Reselect Hysteresis"), "Applied");
}

TEST(StatesGprs, CodesInsideTheRangeThatAreNotSubscribed) {
    KeySectionHarness<GPRSInformation> gprs;
    LogCapture capture;
    // 0x51F7..0x51FA = 20983..20986, 0x51FC = 20988; 0x5138 = 20792.
    for (const std::int32_t code : {0x51F7, 0x51F8, 0x51F9, 0x51FA, 0x51FC, 0x5138}) {
        gprs.feed(buildPacketSystemInfoRecord({.packetSiStatus = 1}), code);
    }
    const Lines expected = {
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20983"},
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20984"},
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20985"},
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20986"},
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20988"},
        {kLogWarning, "GPRSInformation"}, {kLogError, "Received an unknown log message: 20792"},
    };
    EXPECT_EQ(capture.lines(), expected);
    EXPECT_TRUE(gprs.section->empty());
}

TEST(StatesGprs, Placeholders) {
    ClassDictionary classDict;
    CodeDictionary codeDict;
    auto coding = Base::initWithDict<CodingScheme>(classDict, codeDict);
    auto counters = Base::initWithDict<CellChangeCounters>(classDict, codeDict);
    EXPECT_EQ(coding->getSectionName(), "Coding Scheme");
    EXPECT_EQ(counters->getSectionName(), "Cell Change Counters");
    EXPECT_FALSE(coding->getLogCodeArray().has_value());
    EXPECT_FALSE(counters->getLogCodeArray().has_value());
    EXPECT_TRUE(codeDict.empty());
    EXPECT_EQ(testing::keysOf(classDict), (Strings{"Coding Scheme", "Cell Change Counters"}));
    auto section = PlistDictionary::create();
    coding->updateSectionRef(PlistValue(section));
    LogCapture capture;
    coding->updateWithData(buildSi13PositionRecord({.si13Position = 1}), 0x51F4);
    counters->updateWithData(buildSi13PositionRecord({.si13Position = 1}), 0x51F4);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "CodingScheme"}, {kLogWarning, "CellChangeCounters"}}));
    EXPECT_TRUE(section->empty());
}

}  // namespace
}  // namespace velmar
