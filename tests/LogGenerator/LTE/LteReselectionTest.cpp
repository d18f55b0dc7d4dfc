#include <gtest/gtest.h>

#include "LogGenerator/LTE/ReselectionCandidatesList.h"
#include "LogGenerator/LTE/ReselectionCandidatesMisc.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/LteRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::Entries;
using testing::entriesOf;
using testing::KeySectionHarness;
using testing::ListSectionHarness;
using testing::packetWithPayload;
using testing::zeroPacket;

constexpr std::int32_t kReselection = 0xB186;

// 0xB186 written out: version 2, serving EARFCN 9300, serving cell 451, count 3. Candidate headers at 21, 25
// and 29: (261, GERAN), (1000, UTRAN), (3200, LTE); the LTE candidate's fields at 33: E-ARFCN 6300 and the
// word 0xFAD5, whose bits 7..15 are 501 (bits 0..6 hold 0x55).
std::vector<std::uint8_t> handWrittenCandidates() {
    return packetWithPayload(kReselection,
                             {0x02, 0x00, 0x54, 0x24, 0xC3, 0x01, 0x03, 0x00, 0x05, 0x01, 0x02, 0x00,
                              0xE8, 0x03, 0x01, 0x00, 0x80, 0x0C, 0x00, 0x00, 0x9C, 0x18, 0xD5, 0xFA});
}

TEST(LteReselection, SectionsAndCodes) {
    EXPECT_EQ(ReselectionCandidatesMisc().getSectionName(), "Reselection Candidates");
    EXPECT_EQ(ReselectionCandidatesList().getSectionName(), "Reselection Candidates List");
    const LogCodeArray codes{std::vector<std::int32_t>{0xB186}};
    EXPECT_EQ(ReselectionCandidatesMisc().getLogCodeArray(), codes);
    EXPECT_EQ(ReselectionCandidatesList().getLogCodeArray(), codes);
}

TEST(LteReselection, ServingScalars) {
    KeySectionHarness<ReselectionCandidatesMisc> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenCandidates(), kReselection);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"Version", "Serving EARFCN", "Serving Cell ID"}));
    EXPECT_EQ(bound.text("Version"), "2");
    EXPECT_EQ(bound.text("Serving EARFCN"), "9300");
    EXPECT_EQ(bound.text("Serving Cell ID"), "451");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"Reselection Candidates"});
}

TEST(LteReselection, CandidatesReadTheirFieldsFromTheNextSlot) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenCandidates(), kReselection);
    ASSERT_EQ(bound.section->size(), 3u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"Candidate Priority", "261"},
                                                {"Candidate RAT Type", "GERAN"},
                                                {"ARFCN", "1000"},
                                                {"Band", "1"},
                                                {"BSIC ID", "0"}}));
    EXPECT_EQ(entriesOf(bound.row(1)), (Entries{{"Candidate Priority", "1000"},
                                                {"Candidate RAT Type", "UTRAN"},
                                                {"U ARFCN", "3200"},
                                                {"PSC", "0"}}));
    EXPECT_EQ(entriesOf(bound.row(2)), (Entries{{"Candidate Priority", "3200"},
                                                {"Candidate RAT Type", "LTE"},
                                                {"E ARFCN", "6300"},
                                                {"Cell ID", "501"}}));
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"Reselection Candidates List"});
}

TEST(LteReselection, GeranCandidateFromBytesFourToSeven) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    auto packet = zeroPacket(kReselection, 29);
    packet[19] = 1;
    packet[21] = 4;  // priority
    packet[23] = 2;  // GERAN
    packet[25] = 0x0A;
    packet[26] = 0x00;
    packet[27] = 0x03;
    packet[28] = 0x07;
    bound.feed(packet, kReselection);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"Candidate Priority", "4"},
                                                {"Candidate RAT Type", "GERAN"},
                                                {"ARFCN", "10"},
                                                {"Band", "3"},
                                                {"BSIC ID", "7"}}));
}

TEST(LteReselection, CdmaCandidatesDifferOnlyInTheirName) {
    const struct {
        std::uint8_t rat;
        const char* name;
    } cases[] = {{3, "CDMA1XRTT"}, {4, "CDMAHRPD"}};
    for (const auto& item : cases) {
        ListSectionHarness<ReselectionCandidatesList> bound;
        // Band byte 14 at 25; bytes 26..28 between band and channel; channel 775 at 29; pilot 420 at 31.
        const auto packet =
            packetWithPayload(kReselection, {0,        0,    0,    0,    0,    0,    0x01, 0x00, 0x09, 0x00,
                                             item.rat, 0x00, 0x0E, 0xAA, 0xBB, 0xCC, 0x07, 0x03, 0xA4, 0x01});
        bound.feed(packet, kReselection);
        ASSERT_EQ(bound.section->size(), 1u);
        EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"Candidate Priority", "9"},
                                                    {"Candidate RAT Type", item.name},
                                                    {"Band", "14"},
                                                    {"Channel", "775"},
                                                    {"Pilot", "420"}}));
    }
}

TEST(LteReselection, UnknownTechnologyShowsQuestionMarksAndNoFields) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    const auto packet =
        packetWithPayload(kReselection, {0,    0,    0,    0,    0,    0,    0x01, 0x00, 0x0C, 0x00,
                                         0x09, 0x00, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77, 0x88});
    bound.feed(packet, kReselection);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"Candidate Priority", "12"}, {"Candidate RAT Type", "??"}}));
}

TEST(LteReselection, OnlyTheLowByteOfTheCountCounts) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    bound.seed();
    LteReselectionCandidatesRecord record;
    record.candidates = {{1, 0, 2, 3, 0, 0}};
    record.countOverride = 0x0100;
    bound.feed(buildLteReselectionCandidatesRecord(record), kReselection);
    EXPECT_TRUE(bound.section->empty());

    record.countOverride = 0x0201;
    bound.feed(buildLteReselectionCandidatesRecord(record), kReselection);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(
        entriesOf(bound.row(0)),
        (Entries{
            {"Candidate Priority", "1"}, {"Candidate RAT Type", "LTE"}, {"E ARFCN", "2"}, {"Cell ID", "3"}}));
}

TEST(LteReselection, BuiltCandidatesOfEveryTechnology) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    LteReselectionCandidatesRecord record;
    // Each candidate but the last has its fields overwritten by the next header: only the last keeps its own.
    record.candidates = {{7, 2, 0, 0, 0, 0}, {300, 1, 0, 0, 0, 0}, {5, 4, 620, 96, 3, 0}};
    bound.feed(buildLteReselectionCandidatesRecord(record), kReselection);
    ASSERT_EQ(bound.section->size(), 3u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"Candidate Priority", "7"},
                                                {"Candidate RAT Type", "GERAN"},
                                                {"ARFCN", "300"},
                                                {"Band", "1"},
                                                {"BSIC ID", "0"}}));
    EXPECT_EQ(
        entriesOf(bound.row(1)),
        (Entries{
            {"Candidate Priority", "300"}, {"Candidate RAT Type", "UTRAN"}, {"U ARFCN", "5"}, {"PSC", "4"}}));
    EXPECT_EQ(entriesOf(bound.row(2)), (Entries{{"Candidate Priority", "5"},
                                                {"Candidate RAT Type", "CDMAHRPD"},
                                                {"Band", "3"},
                                                {"Channel", "620"},
                                                {"Pilot", "96"}}));
}

TEST(LteReselection, CountPointingPastTheEndReadsZeros) {
    ListSectionHarness<ReselectionCandidatesList> bound;
    auto packet = zeroPacket(kReselection, 21);
    packet[19] = 0xFF;
    bound.feed(packet, kReselection);
    ASSERT_EQ(bound.section->size(), 255u);
    EXPECT_EQ(
        entriesOf(bound.row(254)),
        (Entries{
            {"Candidate Priority", "0"}, {"Candidate RAT Type", "LTE"}, {"E ARFCN", "0"}, {"Cell ID", "0"}}));
}

TEST(LteReselection, TwentyBytesChangeNothingAndOtherCodesAreReported) {
    KeySectionHarness<ReselectionCandidatesMisc> misc;
    ListSectionHarness<ReselectionCandidatesList> list;
    list.seed();
    auto packet = handWrittenCandidates();
    packet.resize(20);
    testing::LogCapture capture;
    misc.feed(packet, kReselection);
    list.feed(packet, kReselection);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(list.section->size(), 1u);
    misc.feed(handWrittenCandidates(), 0xB180);
    list.feed(handWrittenCandidates(), 0xB180);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(list.section->size(), 1u);
    EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{
                                   {kLogWarning, "Reselection Candidates"},
                                   {kLogWarning, "Reselection Candidates List"},
                                   {kLogWarning, "Reselection Candidates"},
                                   {kLogError, "Received an unknown log message: 45440"},
                                   {kLogWarning, "Reselection Candidates List"},
                                   {kLogError, "Received an unknown log message: 45440"}}));
}

}  // namespace
}  // namespace velmar
