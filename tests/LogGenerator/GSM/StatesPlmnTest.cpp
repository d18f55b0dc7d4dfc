// The PLMN decoders: ServingPLMN and EquivalentPLMNList.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/EquivalentPLMNList.h"
#include "LogGenerator/GSM/ServingPLMN.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/GsmStateRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::cut;
using testing::KeySectionHarness;
using testing::ListSectionHarness;
using testing::LogCapture;
using Strings = std::vector<std::string>;
using Lines = std::vector<LogCapture::Line>;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kLte(kKxCellMonitorRadioAccessTechnologyLTE);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

// A 0x7135 record with the three PLMN bytes and the area codes written byte by byte.
PlistData registrationInfo(std::uint8_t b15, std::uint8_t b16, std::uint8_t b17) {
    return RecordBuilder(0x7135).u8(15, b15).u8(16, b16).u8(17, b17).resize(32).build();
}

TEST(StatesPlmn, SectionNamesAndCodes) {
    KeySectionHarness<ServingPLMN> serving;
    ListSectionHarness<EquivalentPLMNList> equivalent;
    EXPECT_EQ(serving.decoder->getSectionName(), "Serving PLMN");
    EXPECT_EQ(equivalent.decoder->getSectionName(), "Equivalent PLMN List");
    EXPECT_EQ(serving.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x7135, 0x7132, 0xFF0001}));
    EXPECT_EQ(equivalent.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x7150}));
    EXPECT_EQ(testing::keysOf(serving.codeDict), (Strings{"28981", "28978", "16711681"}));
}

TEST(StatesPlmn, EntryLinesHaveBlanks) {
    KeySectionHarness<ServingPLMN> serving;
    ListSectionHarness<EquivalentPLMNList> equivalent;
    LogCapture capture;
    serving.feed(buildRegistrationStateRecord({}));
    equivalent.feed(buildEquivalentPlmnRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"}, {kLogWarning, "Equivalent PLMN List"}}));
}

TEST(StatesPlmn, BcdCodesDigitByDigit) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(registrationInfo(0x13, 0x00, 0x14));
    EXPECT_EQ(serving.text("Mobile Country Code"), "310");
    EXPECT_EQ(serving.text("Mobile Network Code"), "410");
    // The filler 0xF as the third network digit shows as a blank.
    serving.feed(registrationInfo(0x13, 0xF0, 0x14));
    EXPECT_EQ(serving.text("Mobile Country Code"), "310");
    EXPECT_EQ(serving.text("Mobile Network Code"), "41 ");
    // 0xA in any nibble is a blank too: MCC digits 1,2,3 = low(0xA2)=2, high(0xA2)=A, low(0x5A)=A → "2  ";
    // MNC digits = low(0x9A)=A, high(0x9A)=9, high(0x5A)=5 → " 95".
    serving.feed(registrationInfo(0xA2, 0x5A, 0x9A));
    EXPECT_EQ(serving.text("Mobile Country Code"), "2  ");
    EXPECT_EQ(serving.text("Mobile Network Code"), " 95");
}

TEST(StatesPlmn, RegistrationRecordWritesItsKeysInOrder) {
    KeySectionHarness<ServingPLMN> serving;
    // MCC 234, MNC 15 (two digits): bytes 0x32, 0xF4, 0x51; LAC 0x1234 big-endian = 4660; RAC 0xC8 = 200.
    serving.feed(buildRegistrationInfoRecord({.networkOperatingMode = 2,
                                              .serviceType = 3,
                                              .plmnIdentity = plmnIdentityBytes("234", "15"),
                                              .locationAreaCode = 0x1234,
                                              .routingAreaCode = 200}));
    EXPECT_EQ(serving.keys(), (Strings{"Mobile Country Code", "Mobile Network Code", "Location Area Code",
                                       "Routing Area Code", "Service Type"}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "234");
    EXPECT_EQ(serving.text("Mobile Network Code"), "15 ");
    EXPECT_EQ(serving.text("Location Area Code"), "4660");
    EXPECT_EQ(serving.text("Routing Area Code"), "200");
    EXPECT_EQ(serving.text("Service Type"), "CS_PS_SERVICE");
}

TEST(StatesPlmn, LocationAreaCodeIsBigEndian) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(RecordBuilder(0x7135).u8(18, 0x12).u8(19, 0x34).resize(32).build());
    EXPECT_EQ(serving.text("Location Area Code"), "4660");
    serving.feed(RecordBuilder(0x7135).u8(18, 0xFF).u8(19, 0xFE).resize(32).build());
    EXPECT_EQ(serving.text("Location Area Code"), "65534");
}

TEST(StatesPlmn, ServiceTypeAndSelectionModeTables) {
    KeySectionHarness<ServingPLMN> serving;
    const Strings services = {"NO_SERVICE",    "CS_ONLY",         "PS_ONLY",
                              "CS_PS_SERVICE", "LIMITED_SERVICE", "Unknown"};
    for (std::size_t value = 0; value < services.size(); ++value) {
        serving.feed(buildRegistrationInfoRecord({.serviceType = static_cast<std::uint8_t>(value)}));
        EXPECT_EQ(serving.text("Service Type"), services[value]) << value;
    }
    const Strings modes = {"Automatic",          "Manual", "Limited", "LIMITED_ROUTINE_ACQ",
                           "LIMITED_MANUAL_ACQ", "Unknown"};
    for (std::size_t value = 0; value < modes.size(); ++value) {
        serving.feed(buildRegistrationStateRecord(
            {.registrationState = 1, .plmnSelectionMode = static_cast<std::uint8_t>(value)}));
        EXPECT_EQ(serving.text("PLMN Sel Mod"), modes[value]) << value;
    }
    serving.feed(buildRegistrationStateRecord({.plmnSelectionMode = 250}));
    EXPECT_EQ(serving.text("PLMN Sel Mod"), "Unknown");
}

TEST(StatesPlmn, SelectionModeRecordWritesOnlyItsKey) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(buildRegistrationStateRecord({.registrationState = 6, .plmnSelectionMode = 1}));
    EXPECT_EQ(serving.keys(), (Strings{"PLMN Sel Mod"}));
    EXPECT_EQ(serving.text("PLMN Sel Mod"), "Manual");
}

TEST(StatesPlmn, MinimumLengths) {
    KeySectionHarness<ServingPLMN> serving;
    LogCapture capture;
    serving.feed(cut(registrationInfo(0x13, 0x00, 0x14), 31));
    serving.feed(cut(buildRegistrationStateRecord({.plmnSelectionMode = 1}), 15));
    EXPECT_TRUE(serving.section->empty());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    serving.feed(cut(registrationInfo(0x13, 0x00, 0x14), 32));
    EXPECT_EQ(serving.text("Mobile Country Code"), "310");
    serving.feed(cut(buildRegistrationStateRecord({.plmnSelectionMode = 1}), 16));
    EXPECT_EQ(serving.text("PLMN Sel Mod"), "Manual");

    ListSectionHarness<EquivalentPLMNList> equivalent;
    equivalent.section->append(PlistValue("old row"));
    equivalent.feed(cut(buildEquivalentPlmnRecord({.count = 1, .listBytes = {3, 2, 1, 6, 0, 0}}), 16));
    EXPECT_EQ(equivalent.section->size(), 1u);
    EXPECT_EQ(*equivalent.section->at(0).string(), "old row");
    // Exactly 17 bytes: the count is read and its entry lies wholly past the end, so it reads as zeros.
    equivalent.feed(cut(buildEquivalentPlmnRecord({.count = 1, .listBytes = {3, 2, 1, 6, 0, 0}}), 17));
    EXPECT_EQ(equivalent.rowTexts(), (Strings{"Mobile Country Code=0, Mobile Network Code=0"}));
}

TEST(StatesPlmn, UnknownCodes) {
    KeySectionHarness<ServingPLMN> serving;
    ListSectionHarness<EquivalentPLMNList> equivalent;
    LogCapture capture;
    serving.feed(registrationInfo(0x13, 0x00, 0x14), 0x7133);  // between 0x7132 and 0x7135: 28979
    serving.feed(registrationInfo(0x13, 0x00, 0x14), 0xFF0002);
    equivalent.feed(buildEquivalentPlmnRecord({.count = 1}), 0x7151);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"},
                                      {kLogError, "Received an unknown log message: 28979"},
                                      {kLogWarning, "Serving PLMN"},
                                      {kLogError, "Received an unknown log message: 16711682"},
                                      {kLogWarning, "Equivalent PLMN List"},
                                      {kLogError, "Received an unknown log message: 29009"}}));
    EXPECT_TRUE(serving.section->empty());
    EXPECT_TRUE(equivalent.section->empty());
}

TEST(StatesPlmn, EquivalentListDigitsAlternate) {
    ListSectionHarness<EquivalentPLMNList> equivalent;
    // MCC = 100·b0 + 10·b2 + b4 = 300 + 10 + 0 = 310; MNC = 100·b1 + 10·b3 + b5 = 200 + 60 + 0 = 260.
    equivalent.feed(buildEquivalentPlmnRecord({.count = 1, .listBytes = {3, 2, 1, 6, 0, 0}}));
    EXPECT_EQ(equivalent.rowTexts(), (Strings{"Mobile Country Code=310, Mobile Network Code=260"}));
}

TEST(StatesPlmn, EquivalentEntriesOverlapWithTheirThreeByteStride) {
    ListSectionHarness<EquivalentPLMNList> equivalent;
    // Bytes 17..25 = 2,3,4,1,5,6,7,8,9. Entry 0 reads 17..22 = 2,3,4,1,5,6: MCC 245, MNC 316.
    // Entry 1 reads 20..25 = 1,5,6,7,8,9: MCC 100+60+8 = 168, MNC 500+70+9 = 579.
    // Entry 2 reads 23..28 = 7,8,9,0,0,0 (26.. past the end read zero): MCC 790, MNC 800.
    equivalent.feed(buildEquivalentPlmnRecord({.count = 3, .listBytes = {2, 3, 4, 1, 5, 6, 7, 8, 9}}));
    EXPECT_EQ(equivalent.rowTexts(), (Strings{"Mobile Country Code=245, Mobile Network Code=316",
                                              "Mobile Country Code=168, Mobile Network Code=579",
                                              "Mobile Country Code=790, Mobile Network Code=800"}));
}

TEST(StatesPlmn, EquivalentCountPastTheEndKeepsItsRows) {
    ListSectionHarness<EquivalentPLMNList> equivalent;
    // 255 entries announced, 2 bytes present: entry 0 = 9,9,0,0,0,0 → MCC 900, MNC 900; the rest read zero.
    equivalent.feed(buildEquivalentPlmnRecord({.count = 255, .listBytes = {9, 9}}));
    ASSERT_EQ(equivalent.section->size(), 255u);
    const Strings rows = equivalent.rowTexts();
    EXPECT_EQ(rows.front(), "Mobile Country Code=900, Mobile Network Code=900");
    EXPECT_EQ(rows[1], "Mobile Country Code=0, Mobile Network Code=0");
    EXPECT_EQ(rows.back(), "Mobile Country Code=0, Mobile Network Code=0");
}

TEST(StatesPlmn, EquivalentCountZeroEmptiesTheList) {
    ListSectionHarness<EquivalentPLMNList> equivalent;
    equivalent.feed(buildEquivalentPlmnRecord({.count = 2, .listBytes = {3, 2, 1, 6, 0, 0, 0, 0}}));
    EXPECT_EQ(equivalent.section->size(), 2u);
    equivalent.feed(buildEquivalentPlmnRecord({.count = 0, .listBytes = {3, 2, 1, 6, 0, 0}}));
    EXPECT_TRUE(equivalent.section->empty());
}

TEST(StatesPlmn, EquivalentRowsReplaceTheOldOnes) {
    ListSectionHarness<EquivalentPLMNList> equivalent;
    equivalent.feed(buildEquivalentPlmnRecord({.count = 2, .listBytes = {1, 1, 1, 1, 1, 1, 1, 1}}));
    equivalent.feed(buildEquivalentPlmnRecord({.count = 1, .listBytes = {4, 0, 4, 1, 0, 5}}));
    EXPECT_EQ(equivalent.rowTexts(), (Strings{"Mobile Country Code=440, Mobile Network Code=15"}));
}

// ---- cell-monitor path ----

TEST(StatesPlmn, CellMonitorServingUmtsCellWritesPlainNumbers) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(buildRegistrationStateRecord({.plmnSelectionMode = 2}));
    serving.feed(buildRegistrationInfoRecord({.serviceType = 1, .routingAreaCode = 7}));
    LogCapture capture;
    serving.feed(buildCellMonitorEntries({
        {.technology = kLte, .cellType = kServing, .mcc = 999, .mnc = 99, .lac = 9},
        {.technology = kGsm, .cellType = kNeighbor, .mcc = 888, .mnc = 88, .lac = 8},
        {.technology = kUmts, .cellType = kServing, .mcc = 1, .mnc = 1, .lac = 4660},
        {.technology = kGsm, .cellType = kServing, .mcc = 777, .mnc = 77, .lac = 7},
    }));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"}}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "1");
    EXPECT_EQ(serving.text("Mobile Network Code"), "1");
    EXPECT_EQ(serving.text("Location Area Code"), "4660");
    // Not touched by this path.
    EXPECT_EQ(serving.text("PLMN Sel Mod"), "Limited");
    EXPECT_EQ(serving.text("Routing Area Code"), "7");
    EXPECT_EQ(serving.text("Service Type"), "CS_ONLY");
}

TEST(StatesPlmn, CellMonitorGsmServingCellCountsToo) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(buildCellMonitorEntries({
        {.technology = kGsm, .cellType = kServing, .mcc = 310, .mnc = 410, .lac = -2},
        {.technology = kUmts, .cellType = kServing, .mcc = 1, .mnc = 1, .lac = 1},
    }));
    EXPECT_EQ(serving.keys(), (Strings{"Mobile Country Code", "Mobile Network Code", "Location Area Code"}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "310");
    EXPECT_EQ(serving.text("Mobile Network Code"), "410");
    EXPECT_EQ(serving.text("Location Area Code"), "-2");
}

TEST(StatesPlmn, CellMonitorMissingKeysLogAndContinue) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(buildRegistrationInfoRecord({.plmnIdentity = plmnIdentityBytes("310", "410")}));
    LogCapture capture;
    // Entries lacking the technology or the type are skipped; the serving UMTS cell lacks MCC and LAC.
    serving.feed(buildCellMonitorEntries({
        {.cellType = kServing, .mcc = 5, .mnc = 5, .lac = 5},
        {.technology = kUmts, .mcc = 6, .mnc = 6, .lac = 6},
        {.technology = kUmts, .cellType = kServing, .mnc = 26},
    }));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"},
                                      {kLogError, "ServingPLMN: Failed to retrieve MCC\n"},
                                      {kLogError, "ServingPLMN: Failed to retrieve LAC\n"}}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "310");
    EXPECT_EQ(serving.text("Mobile Network Code"), "26");
    EXPECT_EQ(serving.text("Location Area Code"), "0");
}

TEST(StatesPlmn, CellMonitorMissingNetworkCodeLogsAndKeepsTheOldOne) {
    KeySectionHarness<ServingPLMN> serving;
    // MCC 310, MNC 41 (two digits, so the third is a blank), LAC 0x0102 = 258.
    serving.feed(RecordBuilder(0x7135)
                     .u8(15, 0x13)
                     .u8(16, 0xF0)
                     .u8(17, 0x14)
                     .u8(18, 0x01)
                     .u8(19, 0x02)
                     .resize(32)
                     .build());
    ASSERT_EQ(serving.text("Mobile Network Code"), "41 ");
    LogCapture capture;
    serving.feed(buildCellMonitorEntries({{.technology = kGsm, .cellType = kServing, .mcc = 234, .lac = 9}}));
    EXPECT_EQ(capture.lines(),
              (Lines{{kLogWarning, "Serving PLMN"}, {kLogError, "ServingPLMN: Failed to retrieve MNC\n"}}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "234");
    EXPECT_EQ(serving.text("Mobile Network Code"), "41 ");
    EXPECT_EQ(serving.text("Location Area Code"), "9");
}

TEST(StatesPlmn, CellMonitorKeysOfTheWrongType) {
    KeySectionHarness<ServingPLMN> serving;
    auto wrongTechnology = PlistDictionary::create();
    wrongTechnology->set(kKxCellMonitorCellRadioAccessTechnology, PlistValue::integer(1));
    wrongTechnology->set(kKxCellMonitorCellType, kServing);
    wrongTechnology->set(kKxCellMonitorMCC, PlistValue::integer(111));
    auto cell = PlistDictionary::create();
    cell->set(kKxCellMonitorCellRadioAccessTechnology, kUmts);
    cell->set(kKxCellMonitorCellType, kServing);
    cell->set(kKxCellMonitorMCC, "310");                      // a string is not a number
    cell->set(kKxCellMonitorMNC, PlistValue::real(260.9));    // a real is truncated toward zero
    cell->set(kKxCellMonitorLAC, PlistValue::boolean(true));  // neither
    auto cells = PlistArray::create();
    cells->append(PlistValue("not a dictionary"));
    cells->append(wrongTechnology);
    cells->append(cell);
    LogCapture capture;
    serving.feed(buildCellMonitorPacket(cells));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"},
                                      {kLogError, "ServingPLMN: Failed to retrieve MCC\n"},
                                      {kLogError, "ServingPLMN: Failed to retrieve LAC\n"}}));
    EXPECT_EQ(serving.keys(), (Strings{"Mobile Network Code"}));
    EXPECT_EQ(serving.text("Mobile Network Code"), "260");
}

TEST(StatesPlmn, CellMonitorUnparsableEmptyOrWithoutMatch) {
    KeySectionHarness<ServingPLMN> serving;
    LogCapture capture;
    // Only the header: nothing to parse.
    serving.feed(RecordBuilder(0x0001, 0, kExtendedLogType).build(), 0xFF0001);
    // Garbage after the header.
    const std::uint8_t garbage[] = {'n', 'o', 't', ' ', 'a', ' ', 'p', 'l', 'i', 's', 't'};
    serving.feed(buildExtendedPacket(0x0001, garbage), 0xFF0001);
    // A dictionary root is not a cell array.
    serving.feed(buildCellMonitorPacket(PlistValue::newDictionary()), 0xFF0001);
    const Lines unparsable = {{kLogWarning, "Serving PLMN"},
                              {kLogError, "Cell Info Array data could not be constructed"},
                              {kLogError, "Failed to get Cell Array\n"}};
    Lines expected;
    for (int i = 0; i < 3; ++i) {
        expected.insert(expected.end(), unparsable.begin(), unparsable.end());
    }
    EXPECT_EQ(capture.lines(), expected);
    capture.clear();
    // An empty array and an array without a serving GSM/UMTS cell change nothing, silently.
    serving.feed(buildCellMonitorEntries({}), 0xFF0001);
    serving.feed(buildCellMonitorEntries({{.technology = kLte, .cellType = kServing, .mcc = 1},
                                          {.technology = kUmts, .cellType = kNeighbor, .mcc = 2}}),
                 0xFF0001);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "Serving PLMN"}, {kLogWarning, "Serving PLMN"}}));
    EXPECT_TRUE(serving.section->empty());
}

TEST(StatesPlmn, CellMonitorNumberFormsDifferFromTheBcdForm) {
    KeySectionHarness<ServingPLMN> serving;
    serving.feed(buildRegistrationInfoRecord({.plmnIdentity = plmnIdentityBytes("001", "01")}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "001");
    EXPECT_EQ(serving.text("Mobile Network Code"), "01 ");
    serving.feed(
        buildCellMonitorEntries({{.technology = kGsm, .cellType = kServing, .mcc = 1, .mnc = 1, .lac = 1}}));
    EXPECT_EQ(serving.text("Mobile Country Code"), "1");
    EXPECT_EQ(serving.text("Mobile Network Code"), "1");
}

}  // namespace
}  // namespace velmar
