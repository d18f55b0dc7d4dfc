#include <gtest/gtest.h>

#include <thread>

#include "LogGenerator/GSM/LogCode_0xFF0000.h"
#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/GSM/PDPContextList.h"
#include "LogGenerator/GSM/SimInfo.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

// Records and cells are written with designated initializers; the fields left out keep their defaults.
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"

namespace velmar {
namespace {

using testing::KeySectionHarness;
using testing::ListSectionHarness;
using testing::LogCapture;
using testing::rowOf;

TEST(SimInfo, OnlyTheIccidChangesOnlyEfIccid) {
    KeySectionHarness<SimInfo> sim;
    sim.section->set("EF-MSISDN", "old number");
    sim.section->set("EF-ICCID", "old iccid");
    LogCapture capture;
    sim.feed(buildSimFilesRecord({.files = {{"kSimFile_ICCID", "8901260123456789012"}}}), 0xFF0000);
    EXPECT_EQ(PlistValue(sim.section),
              rowOf({{"EF-MSISDN", "old number"}, {"EF-ICCID", "8901260123456789012"}}));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "SimInfo"}}));
}

TEST(SimInfo, EveryFileIsCopiedInTableOrderWithItsOwnType) {
    KeySectionHarness<SimInfo> sim;
    const PlistValue loci =
        PlistValue::data({0x12, 0x34, 0x56, 0x78, 0x13, 0x00, 0x14, 0x00, 0x01, 0xFF, 0x00});
    auto fplmn = PlistArray::create();
    fplmn->append("310 410");
    fplmn->append("310 260");
    // Given in another order than the table, with an unknown key among them, in the XML encoding.
    sim.feed(buildSimFilesRecord({.files = {{"kSimFile_OPLMNAcT", "31041080C0"},
                                            {"kSimFile_Unknown", "ignored"},
                                            {"kSimFile_OPL", "none"},
                                            {"kSimFile_PNN", "Carrier"},
                                            {"kSimFile_RATMODE", PlistValue::integer(2)},
                                            {"kSimFile_AHPLMN", "310410"},
                                            {"kSimFile_FPLMN", fplmn},
                                            {"kSimFile_AD", "00000003"},
                                            {"kSimFile_ACC", "0040"},
                                            {"kSimFile_PSLOCI", "FFFFFFFF"},
                                            {"kSimFile_LOCI", loci},
                                            {"kSimFile_HPPLMN", PlistValue::integer(10)},
                                            {"kSimFile_MBDN", "+15551230000"},
                                            {"kSimFile_MSISDN", "+15551234567"},
                                            {"kSimFile_ICCID", "8901"}},
                                  .encoding = PlistEncoding::Xml}),
             0xFF0000);
    auto expected = PlistDictionary::create();
    expected->set("EF-ICCID", "8901");
    expected->set("EF-MSISDN", "+15551234567");
    expected->set("EF-3GPP MAIL BOX DIALING NUMBER", "+15551230000");
    expected->set("EF-HPPLMN SEARCH PERIOD", PlistValue::integer(10));
    expected->set("EF-LOCI", loci);
    expected->set("EF-GPRS/PS-LOCI", "FFFFFFFF");
    expected->set("EF-ACCESS CONTROL CLASS", "0040");
    expected->set("EF-ADMINISTRATIVE DATA", "00000003");
    expected->set("EF-FPLMN", fplmn);
    expected->set("EF-ACTING HPLMN", "310410");
    expected->set("EF-RAT MODE", PlistValue::integer(2));
    expected->set("EF-PLMN NETWORK NAME", "Carrier");
    expected->set("EF-OPERATOR PLMN LIST", "none");
    expected->set("EF-OPLMNAcT", "31041080C0");
    EXPECT_EQ(PlistValue(sim.section), PlistValue(expected));
}

TEST(SimInfo, OtherCodesAreIgnoredWithoutAMessage) {
    KeySectionHarness<SimInfo> sim;
    LogCapture capture;
    sim.feed(buildSimFilesRecord({.files = {{"kSimFile_ICCID", "1"}}}), 0xFF0002);
    sim.feed(RecordBuilder(0x0000, 0, kExtendedLogType).build(), 0x5134);
    EXPECT_TRUE(sim.section->empty());
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, "SimInfo"}, {kLogWarning, "SimInfo"}}));
    EXPECT_EQ(sim.decoder->getSectionName(), "SIM Info");
    EXPECT_EQ(sim.decoder->getLogCodeArray(), (LogCodeArray{{0xFF0000}}));
}

TEST(SimInfo, ThirteenByteRecordLogsAndThrowsBeforeAnyKeyChanges) {
    KeySectionHarness<SimInfo> sim;
    sim.section->set("EF-ICCID", "kept");
    LogCapture capture;
    const PlistData headerOnly = RecordBuilder(0x0000, 0, kExtendedLogType).build();
    ASSERT_EQ(headerOnly.size(), 13u);
    EXPECT_THROW(sim.feed(headerOnly, 0xFF0000), LogCode_0xFF0000::UnknownDataException);
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{
                                   {kLogWarning, "SimInfo"},
                                   {kLogError, "SIM File dictionary data could not be constructed"}}));
    EXPECT_EQ(PlistValue(sim.section), rowOf({{"EF-ICCID", "kept"}}));
}

TEST(SimInfo, RecordWhoseRootIsNotADictionaryThrows) {
    KeySectionHarness<SimInfo> sim;
    auto files = PlistArray::create();
    files->append("kSimFile_ICCID");
    const auto payload = serializeBinary(files);
    ASSERT_TRUE(payload.has_value());
    LogCapture capture;
    EXPECT_THROW(sim.feed(buildExtendedPacket(0x0000, *payload), 0xFF0000),
                 LogCode_0xFF0000::UnknownDataException);
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"SIM File dictionary data could not be constructed"});
    EXPECT_TRUE(sim.section->empty());
}

TEST(SimInfo, UnbindableRecordStillThrowsWhenUnbound) {
    SimInfo sim;
    EXPECT_THROW(sim.updateWithData(RecordBuilder(0x0000, 0, kExtendedLogType).build(), 0xFF0000),
                 LogCode_0xFF0000::UnknownDataException);
}

// Nothing catches the parser's exception: a SIM record that cannot be parsed, handed to the generator as the
// model hands blobs over, ends the program. (The death-test machinery would catch an exception thrown
// straight from its statement, so the blob is handed over on a thread of its own, where nothing above the
// generator catches either.) The child mirrors the log to standard error so that the message before the
// exception shows.
TEST(SimInfoDeathTest, UnparsableSimRecordTerminatesTheProgram) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    const PlistData headerOnly = RecordBuilder(0x0000, 0, kExtendedLogType).build();
    EXPECT_DEATH(
        {
            SystemLog::setSink([](int, const std::string&) {});
            SystemLog::setMirrorToStderr(true);
            testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
            std::thread intake([&] { harness.feed(headerOnly); });
            intake.join();
        },
        "<3> SIM File dictionary data could not be constructed\n"
        "terminate called after throwing an instance of 'velmar::LogCode_0xFF0000::UnknownDataException'");
}

TEST(PDPContextList, ArrayOfContextsReplacesTheRows) {
    ListSectionHarness<PDPContextList> contexts;
    contexts.section->append(rowOf({{"APN", "old"}}));
    LogCapture capture;
    contexts.feed(
        buildPdpContextsRecord({{.contextId = 1, .apn = "internet", .pdpType = "IP", .address = "10.1.2.3"},
                                {.contextId = 5, .apn = "ims", .pdpType = "IPV6", .address = "fe80::1"}}),
        0xFF0002);
    auto first = PlistDictionary::create();
    first->set("Context ID", "1");
    first->set("APN", "internet");
    first->set("PDP Type", "IP");
    first->set("PDP Address", "10.1.2.3");
    auto second = PlistDictionary::create();
    second->set("Context ID", "5");
    second->set("APN", "ims");
    second->set("PDP Type", "IPV6");
    second->set("PDP Address", "fe80::1");
    EXPECT_EQ(contexts.rows(), PlistValue(PlistArray::create({first, second})));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "PDPContextList"}}));
}

TEST(PDPContextList, DictionaryRootLeavesTheRowsAndEmptyArrayEmptiesThem) {
    ListSectionHarness<PDPContextList> contexts;
    contexts.section->append(rowOf({{"APN", "old"}}));
    LogCapture capture;
    auto dictionary = PlistDictionary::create();
    dictionary->set("APN", "new");
    contexts.feed(buildExtendedPacket(0x0002, *serializeXml(dictionary)), 0xFF0002);
    EXPECT_EQ(contexts.rows(), testing::rowsOf({{{"APN", "old"}}}));
    // Neither unparsable data nor a header-only record is logged.
    contexts.feed(RecordBuilder(0x0002, 0, kExtendedLogType).build(), 0xFF0002);
    EXPECT_EQ(contexts.section->size(), 1u);
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "PDPContextList"},
                                                              {kLogWarning, "PDPContextList"}}));
    contexts.feed(buildPdpContextsRecord({}), 0xFF0002);
    EXPECT_TRUE(contexts.section->empty());
}

TEST(PDPContextList, TheCodeIsNotExamined) {
    ListSectionHarness<PDPContextList> contexts;
    contexts.feed(
        buildPdpContextsRecord({{.contextId = 3, .apn = "a", .pdpType = "IP", .address = "1.2.3.4"}}),
        0x1234);
    EXPECT_EQ(contexts.section->size(), 1u);
    EXPECT_EQ(contexts.decoder->getSectionName(), "PDP Context Info");
    EXPECT_EQ(contexts.decoder->getLogCodeArray(), (LogCodeArray{{0xFF0002}}));
}

TEST(PDPContextList, ThroughTheGeneratorTheDisplayShowsTheContexts) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(
        buildPdpContextsRecord({{.contextId = 2, .apn = "web", .pdpType = "IP", .address = "100.64.0.9"}}));
    const PlistArrayRef rows = harness.listSection("PDP Context Info");
    ASSERT_NE(rows, nullptr);
    ASSERT_EQ(rows->size(), 1u);
    EXPECT_EQ(testing::textOf(*rows->at(0).dictionary(), "APN"), "web");
}

}  // namespace
}  // namespace velmar
