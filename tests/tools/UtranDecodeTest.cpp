// velmar-decode --technology utran as a process: every UTRAN code from a hex file, and real captures (which
// carry no UTRAN record: they must go through with every list empty).
#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "logfile/LogFormat.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::parseJson;
using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

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

using Entries = std::vector<std::pair<std::string, std::string>>;
Entries entries(const PlistValue& dictionary) {
    Entries out;
    if (dictionary.isDictionary()) {
        for (const auto& [key, value] : *dictionary.dictionary()) {
            out.emplace_back(key, value.string() ? *value.string() : std::string("<not a string>"));
        }
    }
    return out;
}

std::vector<std::string> strings(const PlistValue& array) {
    std::vector<std::string> out;
    if (array.isArray()) {
        for (const auto& value : *array.array()) {
            out.push_back(value.string() ? *value.string() : std::string("<not a string>"));
        }
    }
    return out;
}

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

TEST(UtranDecode, EveryCodeOfTheHexFile) {
    const PlistValue display =
        decode({kDecode, "--technology", "utran", testing::testDataPath("utran/all-codes.hex")});
    ASSERT_TRUE(display.isDictionary());

    EXPECT_EQ(entries(at(display, {"RRC Info"})), (Entries{{"State", "Cell DCH"}}));
    // The cell-monitor array came after 0xD0E2: its cell id and UARFCN replaced the record's.
    EXPECT_EQ(entries(at(display, {"Serving Cell Info"})),
              (Entries{{"Cell Access Restrictions", "2"},
                       {"Cell ID", "65537"},
                       {"Downlink UARFCN", "10700"},
                       {"Uplink UARFCN", "10700"},
                       {"URA ID", "31"},
                       {"Allowed Access", "Emergency Calls Only"},
                       {"Local Area Code", "4321"},
                       {"Freq Band Indicator", "34"},
                       {"Cell Scrambling Code", "88"}}));
    const PlistValue neighbours = at(display, {"Neighbor Cells", "Neighbor Cell List"});
    ASSERT_EQ(lengthOf(neighbours), 2u);
    EXPECT_EQ(entries(neighbours.array()->at(0)), (Entries{{"UARFCN", "10838"},
                                                           {"Cell ID", "91"},
                                                           {"Filter RSCP", "0.500000"},
                                                           {"Status", "MSET"},
                                                           {"inJDCS", "TRUE"}}));
    EXPECT_EQ(
        entries(neighbours.array()->at(1)),
        (Entries{{"UARFCN", "9712"}, {"Cell ID", "38"}, {"Filter RSCP", "0.761719"}, {"inJDCS", "FALSE"}}));
    EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "GSM Neighbor Cell List"})), 0u);

    const PlistValue bler = at(display, {"Channel Quality", "TRCH BLER"});
    ASSERT_EQ(lengthOf(bler), 3u);
    EXPECT_EQ(entries(bler.array()->at(2)), (Entries{{"TRCH ID", "31"}, {"TRCH BLER Measurement", "200"}}));
    const PlistValue sir = at(display, {"Channel Quality", "CCTRCH SIR"});
    ASSERT_EQ(lengthOf(sir), 2u);
    EXPECT_EQ(*sir.array()->at(1).dictionary()->get("CCTRCH ID").string(), "9");
    EXPECT_EQ(*sir.array()->at(1).dictionary()->get("TSNUM").string(), "4");
    EXPECT_EQ(strings(sir.array()->at(1).dictionary()->get("SIR")),
              (std::vector<std::string>{"255", "1", "2", "3", "4", "128"}));
    EXPECT_EQ(strings(sir.array()->at(0).dictionary()->get("SIR")),
              (std::vector<std::string>{"10", "20", "30", "40", "50", "60"}));

    EXPECT_EQ(*at(display, {"SIM Info", "EF-ICCID"}).string(), "8944110068256270054");
    const PlistValue contexts = at(display, {"PDP Context Info"});
    ASSERT_EQ(lengthOf(contexts), 1u);
    EXPECT_EQ(entries(contexts.array()->at(0)), (Entries{{"Context ID", "1"}, {"APN", "internet"}}));
}

TEST(UtranDecode, StartCommandListsTheUtranCodes) {
    const PlistValue command = decode({kDecode, "--technology", "utran", "--start-command"});
    ASSERT_TRUE(command.isDictionary());
    std::vector<std::int64_t> plain;
    for (const auto& code : *command.dictionary()->get("SetOrvaneLogCodes").array()) {
        plain.push_back(code.integerValue().value_or(-1));
    }
    EXPECT_EQ(plain, (std::vector<std::int64_t>{0xD0E0, 0xD0E2, 0xD00A, 0xD00E, 0xD00C}));
    std::vector<std::int64_t> extra;
    for (const auto& code : *command.dictionary()->get("SetKxExtraCodes").array()) {
        extra.push_back(code.integerValue().value_or(-1));
    }
    EXPECT_EQ(extra, (std::vector<std::int64_t>{1, 2, 0}));
}

// The UTRAN list lengths that the last relevant record of a capture gives, read with the log-file reader.
struct ExpectedUtran {
    std::size_t neighbours = 0;
    std::size_t transportChannels = 0;
    std::size_t compositeChannels = 0;
};

ExpectedUtran expectedFromCapture(const std::string& path) {
    ExpectedUtran expected;
    std::string error;
    const bool read = forEachLogItem(
        path, LogFormat::DiagCapture,
        [&](const LogItemView& item) {
            if (!item.isBlob() || item.bytes.size() < 13 || item.bytes[0] != 1) {
                return true;
            }
            const unsigned code = item.bytes[3] | (item.bytes[4] << 8);
            if (code == 0xD00A && item.bytes.size() >= 21) {
                expected.neighbours = item.bytes[16] >> 1;
            } else if (code == 0xD00C && item.bytes.size() >= 17) {
                expected.transportChannels = ((item.bytes[14] | (item.bytes[15] << 8)) >> 6) & 0x3F;
                expected.compositeChannels = item.bytes[15] >> 4;
            }
            return true;
        },
        error);
    EXPECT_TRUE(read) << error;
    return expected;
}

TEST(UtranDecode, RealCapturesGoThroughWithListsOfTheirCounts) {
    for (const char* name : {"lte-connected-1.qmdl", "multisim-1.qmdl"}) {
        const std::string path = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
        const ExpectedUtran expected = expectedFromCapture(path);
        const PlistValue display = decode({kDecode, "--technology", "utran", path});
        ASSERT_TRUE(display.isDictionary()) << name;
        EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "Neighbor Cell List"})), expected.neighbours)
            << name;
        EXPECT_EQ(lengthOf(at(display, {"Neighbor Cells", "GSM Neighbor Cell List"})), 0u) << name;
        EXPECT_EQ(lengthOf(at(display, {"Channel Quality", "TRCH BLER"})), expected.transportChannels)
            << name;
        EXPECT_EQ(lengthOf(at(display, {"Channel Quality", "CCTRCH SIR"})), expected.compositeChannels)
            << name;
    }
}

}  // namespace
}  // namespace velmar
