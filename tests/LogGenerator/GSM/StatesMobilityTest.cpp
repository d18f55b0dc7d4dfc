// The mobility-management state decoders: ProcessPS, ProcessCO and ProcessCS.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/ProcessCO.h"
#include "LogGenerator/GSM/ProcessCS.h"
#include "LogGenerator/GSM/ProcessPS.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/GsmStateRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::cut;
using testing::KeySectionHarness;
using testing::keysOf;
using testing::LogCapture;
using Strings = std::vector<std::string>;
using Lines = std::vector<LogCapture::Line>;

PlistData mmState(std::uint8_t state, std::uint8_t subState, std::uint8_t status) {
    return buildMmStateRecord({.state = state, .subState = subState, .locationUpdateStatus = status});
}
PlistData gmmState(std::uint8_t state, std::uint8_t subState, std::uint8_t status) {
    return buildGmmStateRecord({.state = state, .subState = subState, .updateStatus = status});
}
PlistData registrationState(std::uint8_t state) {
    return buildRegistrationStateRecord({.registrationState = state});
}

TEST(StatesMobility, SectionNamesAndCodes) {
    KeySectionHarness<ProcessPS> ps;
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    EXPECT_EQ(ps.decoder->getSectionName(), "Process PS");
    EXPECT_EQ(co.decoder->getSectionName(), "Process CO");
    EXPECT_EQ(cs.decoder->getSectionName(), "Process CS");
    EXPECT_EQ(ps.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x7130, 0x7132}));
    EXPECT_EQ(co.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x7131, 0x7132}));
    EXPECT_EQ(cs.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x7131, 0x7132}));
    // 0x7130 = 28976, 0x7131 = 28977, 0x7132 = 28978.
    EXPECT_EQ(keysOf(ps.codeDict), (Strings{"28976", "28978"}));
    EXPECT_EQ(keysOf(co.codeDict), (Strings{"28977", "28978"}));
    EXPECT_EQ(keysOf(ps.classDict), (Strings{"Process PS"}));
}

TEST(StatesMobility, EntryLinesAndProcessCOLogsProcessCS) {
    KeySectionHarness<ProcessPS> ps;
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    LogCapture capture;
    ps.feed(registrationState(1));
    co.feed(registrationState(1));
    cs.feed(registrationState(1));
    EXPECT_EQ(capture.lines(),
              (Lines{{kLogWarning, "ProcessPS"}, {kLogWarning, "ProcessCS"}, {kLogWarning, "ProcessCS"}}));
}

TEST(StatesMobility, MmIdleRecordInProcessCSAndProcessCO) {
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    const PlistData record = mmState(19, 8, 0);
    co.feed(record);
    cs.feed(record);
    EXPECT_EQ(cs.keys(), (Strings{"MM State", "MM Sub State", "LU Reject Cause"}));
    EXPECT_EQ(cs.text("MM State"), "MM_IDLE");
    EXPECT_EQ(cs.text("MM Sub State"), "MM_NORMAL_SERVICE");
    EXPECT_EQ(cs.text("LU Reject Cause"), "UPDATED");
    EXPECT_EQ(co.keys(), (Strings{"MM State"}));
    EXPECT_EQ(co.text("MM State"), "MM_IDLE");
}

TEST(StatesMobility, MmStateTableWithItsHoles) {
    // Index = raw value; the holes of the table are "Unknown", as is everything from 26 on.
    const Strings expected = {
        "MM_NULL",
        "Unknown",
        "Unknown",
        "MM_LOCATION_UPDATE_INITIATED",
        "Unknown",
        "MM_WAIT_FOR_OUTGOING_MM_CONNECTION",
        "MM_CONNECTION_ACTIVE",
        "MM_IMSI_DETACH_INITIATED",
        "MM_PROCESS_CM_SERVICE_PROMPT",
        "MM_WAIT_FOR_NETWORK_COMMAND",
        "MM_LOCATION_UPDATE_REJECTED",
        "Unknown",
        "Unknown",
        "MM_WAIT_FOR_RR_CONNECTION_LU",
        "MM_WAIT_FOR_RR_CONNECTION_MM",
        "MM_WAIT_FOR_RR_CONNECTION_IMSI_DETACH",
        "Unknown",
        "MM_REESTABLISHMENT_INITIATED",
        "MM_WAIT_FOR_RR_ACTIVE",
        "MM_IDLE",
        "MM_WAIT_FOR_ADDITIONAL_OUTGOING_MM_ CONNECTION",
        "MM_WAIT_FOR_RR_CONNECTION_ REESTABLISHMENT",
        "MM_WAIT_FOR_REESTABLISH_DECISION",
        "MM_LOCATION_UPDATING_PENDING",
        "Unknown",
        "MM_RR_CONNECTION_RELEASE_NOT_ALLOWED",
        "Unknown",
    };
    KeySectionHarness<ProcessCS> cs;
    KeySectionHarness<ProcessCO> co;
    for (std::size_t value = 0; value < expected.size(); ++value) {
        cs.feed(mmState(static_cast<std::uint8_t>(value), 0, 0));
        co.feed(mmState(static_cast<std::uint8_t>(value), 0, 0));
        EXPECT_EQ(cs.text("MM State"), expected[value]) << value;
        EXPECT_EQ(co.text("MM State"), expected[value]) << value;
    }
    cs.feed(mmState(16, 0, 0));
    EXPECT_EQ(cs.text("MM State"), "Unknown");
    cs.feed(mmState(200, 0, 0));
    EXPECT_EQ(cs.text("MM State"), "Unknown");
}

TEST(StatesMobility, MmSubStateAndLocationUpdateTables) {
    const Strings subStates = {"MM_NULL_SUBSTATE",        "MM_NO_IMSI",
                               "MM_PLMN_SEARCH",          "MM_LIMITED_SERVICE",
                               "MM_ATTEMPTING_TO_UPDATE", "MM_LOCATION_UPDATE_NEEDED",
                               "MM_NO_CELL_AVAILABLE",    "MM_PLMN_SEARCH_NORMAL_SERVICE",
                               "MM_NORMAL_SERVICE",       "Unknown"};
    const Strings statuses = {"UPDATED", "NOT_UPDATED", "ROAMING_NOT_ALLOWED", "LOCATION_AREA_NOT_ALLOWED",
                              "Unknown"};
    KeySectionHarness<ProcessCS> cs;
    for (std::size_t value = 0; value < subStates.size(); ++value) {
        cs.feed(mmState(0, static_cast<std::uint8_t>(value), 0));
        EXPECT_EQ(cs.text("MM Sub State"), subStates[value]) << value;
    }
    for (std::size_t value = 0; value < statuses.size(); ++value) {
        cs.feed(mmState(0, 0, static_cast<std::uint8_t>(value)));
        EXPECT_EQ(cs.text("LU Reject Cause"), statuses[value]) << value;
    }
    cs.feed(mmState(0, 255, 255));
    EXPECT_EQ(cs.text("MM Sub State"), "Unknown");
    EXPECT_EQ(cs.text("LU Reject Cause"), "Unknown");
}

TEST(StatesMobility, GmmRecordInProcessPS) {
    KeySectionHarness<ProcessPS> ps;
    ps.feed(gmmState(3, 9, 2));
    EXPECT_EQ(ps.keys(), (Strings{"MM State", "MM Sub State", "Attach Reject Cause"}));
    EXPECT_EQ(ps.text("MM State"), "GMM_REGISTERED");
    EXPECT_EQ(ps.text("MM Sub State"), "GMM_ATTEMPING_TO_UPDATE");  // spelled without the T
    EXPECT_EQ(ps.text("Attach Reject Cause"), "GMM_GU3_PLMN_NOT_ALLOWED");
}

TEST(StatesMobility, GmmTables) {
    const Strings states = {"GMM_NULL",
                            "GMM_DEREGISTERED",
                            "GMM_REGISTERED_INITIATED",
                            "GMM_REGISTERED",
                            "GMM_DEREGISTERED_INITIATED",
                            "GMM_ROUTING_AREA_UPDATE_INITIATED",
                            "GMM_SERVICE_REQUEST_INITIATED",
                            "Unknown"};
    const Strings subStates = {"GMM_NORMAL_SERVICE",
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
                               "GMM_NULL_SUBSTATE",
                               "Unknown"};
    const Strings statuses = {"GMM_GU1_UPDATED", "GMM_GU2_NOT_UPDATED", "GMM_GU3_PLMN_NOT_ALLOWED",
                              "GMM_GU3_ROUTING_AREA_NOT_ALLOWED", "Unknown"};
    KeySectionHarness<ProcessPS> ps;
    for (std::size_t value = 0; value < states.size(); ++value) {
        ps.feed(gmmState(static_cast<std::uint8_t>(value), 0, 0));
        EXPECT_EQ(ps.text("MM State"), states[value]) << value;
    }
    for (std::size_t value = 0; value < subStates.size(); ++value) {
        ps.feed(gmmState(0, static_cast<std::uint8_t>(value), 0));
        EXPECT_EQ(ps.text("MM Sub State"), subStates[value]) << value;
    }
    for (std::size_t value = 0; value < statuses.size(); ++value) {
        ps.feed(gmmState(0, 0, static_cast<std::uint8_t>(value)));
        EXPECT_EQ(ps.text("Attach Reject Cause"), statuses[value]) << value;
    }
}

TEST(StatesMobility, RegistrationStateInAllThreeSections) {
    KeySectionHarness<ProcessPS> ps;
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    const PlistData offline = registrationState(6);
    ps.feed(offline);
    co.feed(offline);
    cs.feed(offline);
    for (const PlistDictionaryRef& section : {ps.section, co.section, cs.section}) {
        EXPECT_EQ(keysOf(*section), (Strings{"MM Service State"}));
        EXPECT_EQ(testing::textOf(*section, "MM Service State"), "REG_STATE_OFFLINE");
    }
    const Strings names = {"REG_STATE_INACTIVE",      "REG_STATE_IDLE",
                           "REG_STATE_REGISTERING",   "REG_STATE_DEREGISTERING",
                           "REG_STATE_MANUAL_SEARCH", "REG_STATE_AUTOMATIC_SEARCH",
                           "REG_STATE_OFFLINE",       "Unknown"};
    for (std::size_t value = 0; value < names.size(); ++value) {
        ps.feed(registrationState(static_cast<std::uint8_t>(value)));
        EXPECT_EQ(ps.text("MM Service State"), names[value]) << value;
    }
    ps.feed(registrationState(255));
    EXPECT_EQ(ps.text("MM Service State"), "Unknown");
}

TEST(StatesMobility, RegistrationStateDoesNotReadTheSelectionMode) {
    KeySectionHarness<ProcessCS> cs;
    cs.feed(buildRegistrationStateRecord({.registrationState = 2, .plmnSelectionMode = 1}));
    EXPECT_EQ(cs.keys(), (Strings{"MM Service State"}));
    EXPECT_EQ(cs.text("MM Service State"), "REG_STATE_REGISTERING");
}

TEST(StatesMobility, FifteenByteRecordsChangeNothingSixteenDo) {
    KeySectionHarness<ProcessPS> ps;
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    ps.feed(gmmState(1, 1, 1));
    ps.feed(registrationState(1));
    co.feed(mmState(19, 8, 0));
    co.feed(registrationState(1));
    cs.feed(mmState(19, 8, 0));
    cs.feed(registrationState(1));
    const PlistValue psBefore = PlistValue(ps.section).deepCopy();
    const PlistValue coBefore = PlistValue(co.section).deepCopy();
    const PlistValue csBefore = PlistValue(cs.section).deepCopy();

    LogCapture capture;
    ps.feed(cut(gmmState(3, 3, 3), 15));
    ps.feed(cut(registrationState(6), 15));
    co.feed(cut(mmState(0, 0, 0), 15));
    co.feed(cut(registrationState(6), 15));
    cs.feed(cut(mmState(0, 0, 0), 15));
    cs.feed(cut(registrationState(6), 15));
    EXPECT_EQ(PlistValue(ps.section), psBefore);
    EXPECT_EQ(PlistValue(co.section), coBefore);
    EXPECT_EQ(PlistValue(cs.section), csBefore);
    // Only the entry lines: a short record is dropped without a message.
    EXPECT_TRUE(capture.textsAt(kLogError).empty());

    // Exactly 16 bytes is enough.
    ps.feed(cut(gmmState(3, 3, 3), 16));
    EXPECT_EQ(ps.text("MM State"), "GMM_REGISTERED");
    co.feed(cut(registrationState(6), 16));
    EXPECT_EQ(co.text("MM Service State"), "REG_STATE_OFFLINE");
}

TEST(StatesMobility, UnknownCodesAreLoggedWithTheirDecimalValue) {
    KeySectionHarness<ProcessPS> ps;
    KeySectionHarness<ProcessCO> co;
    KeySectionHarness<ProcessCS> cs;
    LogCapture capture;
    // 0x7131 lies between ProcessPS's two codes but is not one of them: 0x7131 = 28977.
    ps.feed(mmState(19, 8, 0));
    // 0x7130 = 28976 for the MM decoders.
    co.feed(gmmState(1, 1, 1));
    cs.feed(gmmState(1, 1, 1), 0x7135);  // 0x7135 = 28981
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "ProcessPS"},
                                      {kLogError, "Received an unknown log message: 28977"},
                                      {kLogWarning, "ProcessCS"},
                                      {kLogError, "Received an unknown log message: 28976"},
                                      {kLogWarning, "ProcessCS"},
                                      {kLogError, "Received an unknown log message: 28981"}}));
    EXPECT_TRUE(ps.section->empty());
    EXPECT_TRUE(co.section->empty());
    EXPECT_TRUE(cs.section->empty());
}

TEST(StatesMobility, UnboundDecoderLogsAndWritesNowhere) {
    ClassDictionary classDict;
    CodeDictionary codeDict;
    auto ps = Base::initWithDict<ProcessPS>(classDict, codeDict);
    LogCapture capture;
    ps->updateWithData(gmmState(3, 0, 0), 0x7130);
    ps->updateWithData(gmmState(3, 0, 0), 0x7131);
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "ProcessPS"},
                                      {kLogWarning, "ProcessPS"},
                                      {kLogError, "Received an unknown log message: 28977"}}));
}

TEST(StatesMobility, LaterRecordsOverwriteOnlyTheirOwnKeys) {
    KeySectionHarness<ProcessCS> cs;
    cs.feed(registrationState(4));
    cs.feed(mmState(3, 2, 1));
    EXPECT_EQ(cs.keys(), (Strings{"MM Service State", "MM State", "MM Sub State", "LU Reject Cause"}));
    cs.feed(registrationState(5));
    EXPECT_EQ(cs.text("MM Service State"), "REG_STATE_AUTOMATIC_SEARCH");
    EXPECT_EQ(cs.text("MM State"), "MM_LOCATION_UPDATE_INITIATED");
    EXPECT_EQ(cs.text("MM Sub State"), "MM_PLMN_SEARCH");
    EXPECT_EQ(cs.text("LU Reject Cause"), "NOT_UPDATED");
}

}  // namespace
}  // namespace velmar
