// velmar-decode on recorded GSM/UMTS cell records and extra records, as a process, with the display checked
// against values worked out by hand from the bytes of the hex files under tests/data/gsm.
#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::parseJson;
using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

std::string gsmData(const std::string& name) {
    return testing::testDataPath("gsm/" + name);
}

using Row = std::vector<std::pair<std::string, std::string>>;

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

// The display printed for the file, or none when the run failed or printed no JSON object.
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

TEST(GsmDecode, CellRecordsShowTheirHandComputedValues) {
    const PlistValue display = decodeDisplay(gsmData("gsm-cells.hex"));
    ASSERT_TRUE(display.isDictionary());

    // 0x5137 first (level 0x3C, low 16 bits of 0x00010020 and 0x00000011), then 0x5134 (0x3039 = 12345, 80,
    // 33), then the low byte of 0x0105.
    EXPECT_EQ(sectionAt(display, "GSM", "GSM Serving Cell"), rowOf({{"RSSI", "60 dBm"},
                                                                    {"C1 Value", "32"},
                                                                    {"C2 Value", "17"},
                                                                    {"Cell ID", "12345"},
                                                                    {"ARFCN", "80"},
                                                                    {"BSIC", "33"},
                                                                    {"MA Dedicated ARFCN", "5"}}));
    // Neighbour 80 has BSIC 33 from the 0x51FF list; 1001 is not in it. C1 0xFFFFFFF6 is -10.
    EXPECT_EQ(sectionAt(display, "GSM", "Neighboring Cells"),
              rowsOf({{{"ARFCN", "80"}, {"RSSI", "42"}, {"C1 Value", "-10"}, {"BSIC", "33"}},
                      {{"ARFCN", "1001"}, {"RSSI", "16"}, {"C1 Value", "300"}}}));

    auto arfcns = PlistArray::create();
    for (const char* arfcn : {"80", "256", "1000"}) {
        arfcns->append(arfcn);
    }
    auto allocation = PlistDictionary::create();
    allocation->set("HSN", "45");
    allocation->set("ARFCNs", arfcns);
    EXPECT_EQ(sectionAt(display, "GSM", "Mobile Allocation"), PlistValue(allocation));

    // The ten bytes at 15 of 0x4005, read by both views.
    EXPECT_EQ(sectionAt(display, "UMTS", "GSM Set"),
              rowsOf({{{"ARFCN", "10000"}, {"BSIC", "313"}, {"RSSI", "-64 dBm"}, {"Ranking Value", "-10"}}}));
    EXPECT_EQ(sectionAt(display, "UMTS", "UMTS Set"), rowsOf({{{"Scrambling Code", "313"},
                                                               {"RSCP", "-85 dB"},
                                                               {"Energy Per Chip", "-6.500000 dB"},
                                                               {"Downlink Frequency", "10000"},
                                                               {"Ranking Value", "5"},
                                                               {"Rank Cell RSCP", "-10 dB"}}}));

    // 0x417A: reading 200000 is -5 dB; RSCP trunc(-488 / 10) - 106 - 5 = -159. Cell 1 is not in the active
    // set.
    EXPECT_EQ(sectionAt(display, "UMTS", "Active Set"),
              rowsOf({{{"Scrambling Code", "308"}, {"RSCP", "-159 dB"}, {"Energy Per Chip", "-5 dB"}}}));
    for (const char* set : {"Detected Set", "Monitored Set", "Virtual Active Set", "Non-Ranked UMTS Set",
                            "Non-Ranked GSM Set"}) {
        EXPECT_EQ(sectionAt(display, "UMTS", set), PlistValue(PlistArray::create())) << set;
    }
}

TEST(GsmDecode, ExtraRecordsShowCellsContextsAndSimFiles) {
    const PlistValue display = decodeDisplay(gsmData("gsm-extra.hex"));
    ASSERT_TRUE(display.isDictionary());

    EXPECT_EQ(sectionAt(display, "GSM", "GSM Serving Cell"), rowOf({{"Cell ID", "4321"}, {"ARFCN", "81"}}));
    // RSSI -45 is shown doubled; 32767 means no reading.
    EXPECT_EQ(sectionAt(display, "GSM", "Neighboring Cells"),
              rowsOf({{{"ARFCN", "82"}, {"RSSI", "-90 dBm"}}, {{"ARFCN", "83"}, {"RSSI", ""}}}));
    EXPECT_EQ(sectionAt(display, "UMTS", "UMTS Set"), rowsOf({{{"UARFCN", "10700"},
                                                               {"Scrambling Code", "201"},
                                                               {"RSCP", "-99 dBm"},
                                                               {"Energy Per Chip", "-9 dB"}}}));

    // The PDP context and the SIM files keep the types the service gave them: integers come out as numbers.
    auto context = PlistDictionary::create();
    context->set("Context ID", PlistValue::integer(1));
    context->set("APN", "internet");
    context->set("PDP Type", "IP");
    context->set("PDP Address", "10.0.0.2");
    auto contexts = PlistArray::create();
    contexts->append(context);
    EXPECT_EQ(display.dictionary()->get("PDP Context Info"), PlistValue(contexts));

    auto sim = PlistDictionary::create();
    sim->set("EF-ICCID", "89014103211118510720");
    sim->set("EF-MSISDN", "+15550100");
    sim->set("EF-HPPLMN SEARCH PERIOD", PlistValue::integer(5));
    EXPECT_EQ(display.dictionary()->get("SIM Info"), PlistValue(sim));
}

TEST(GsmDecode, StartCommandListsTheExtraCodes) {
    const auto result = runProcess({kDecode, "--technology", "gsm", "--start-command"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto command = parseJson(result.out);
    ASSERT_TRUE(command && command->isDictionary());
    auto extra = PlistArray::create();
    for (const int code : {1, 2, 0}) {
        extra->append(PlistValue::integer(code));
    }
    EXPECT_EQ(command->dictionary()->get("SetKxExtraCodes"), PlistValue(extra));
    EXPECT_EQ(command->dictionary()->get("SetOrvaneLogCodes").array()->size(), 25u);
}

TEST(GsmDecode, UnparsableSimRecordEndsTheProgram) {
    const auto result =
        runProcess({kDecode, "--technology", "gsm", "--log-stderr", gsmData("gsm-sim-unparsable.hex")});
    EXPECT_EQ(result.exitCode, 128 + 6) << result.err;  // SIGABRT from std::terminate
    EXPECT_EQ(result.out, "");
    EXPECT_NE(result.err.find("<3> SIM File dictionary data could not be constructed\n"), std::string::npos)
        << result.err;
    EXPECT_NE(result.err.find("terminate called after throwing an instance of "
                              "'velmar::LogCode_0xFF0000::UnknownDataException'"),
              std::string::npos)
        << result.err;
}

}  // namespace
}  // namespace velmar
