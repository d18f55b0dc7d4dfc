// velmar-decode's time series: refreshes by recording time (--every) and CSV output (--csv).
#include <gtest/gtest.h>

#include <cstdlib>
#include <regex>
#include <string>
#include <vector>

#include "core/platform/BasebandTime.h"
#include "core/platform/plist/PlistValue.h"
#include "logfile/records/LteRecords.h"
#include "tests/support/BackgroundProcess.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;
const std::string kRsrpPath =
    "Serving Cell/Connected mode LTE Intra-frequency Measurement/Serving Filtered RSRP";

std::string capture(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

// The fields of one CSV line, quotes undone (no line of these tests holds a line break).
std::vector<std::string> csvFields(const std::string& line) {
    std::vector<std::string> fields(1);
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        const char c = line[i];
        if (quoted) {
            if (c == '"' && i + 1 < line.size() && line[i + 1] == '"') {
                fields.back() += '"';
                ++i;
            } else if (c == '"') {
                quoted = false;
            } else {
                fields.back() += c;
            }
        } else if (c == '"') {
            quoted = true;
        } else if (c == ',') {
            fields.emplace_back();
        } else {
            fields.back() += c;
        }
    }
    return fields;
}

// 2024-05-01T12:00:00Z
constexpr std::int64_t kBase = 1714564800LL * 1000000;

// A DLF file of connected-mode measurements whose serving RSRP is -100, -99, -98 and -97 dBm, recorded
// 0.5 s, 1.9 s, 2.1 s and 7.0 s after kBase.
std::string measurementsFile(const testing::TemporaryDirectory& directory) {
    const struct {
        std::int64_t after;
        std::uint16_t rsrp;  // quarter dB above -140 dBm
    } packets[] = {{500000, 160}, {1900000, 164}, {2100000, 168}, {7000000, 172}};
    std::string records;
    for (const auto& packet : packets) {
        LteIntraFrequencyRecord record;
        record.earfcn = 100;
        record.servingPhysicalCellId = 7;
        record.servingFilteredRsrp = packet.rsrp;
        record.servingFilteredRsrq = 80;
        const PlistData blob =
            buildLteIntraFrequencyRecord(record, basebandTimestampOfUnixMicroseconds(kBase + packet.after));
        records.append(blob.begin() + 1, blob.end());  // a DLF file holds the record without the type byte
    }
    const std::string path = directory.file("measurements.dlf");
    testing::writeWholeFile(path, records);
    return path;
}

TEST(DecodeTimeSeries, EveryRefreshesAtTheEndOfEachPeriodOfRecordingTime) {
    testing::TemporaryDirectory directory;
    const std::string path = measurementsFile(directory);
    const auto result = runProcess({kDecode, "--technology", "lte", "--every", "2", "--every-tick", path});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const std::vector<std::string> shown = testing::linesOf(result.out);
    // 12:00:02 (after -99), 12:00:04 (after -98), and after the last packet, 12:00:08.
    ASSERT_EQ(shown.size(), 3u) << result.out;
    const std::vector<std::string> expected = {"-99.00 dBm", "-98.00 dBm", "-97.00 dBm"};
    for (std::size_t i = 0; i < shown.size(); ++i) {
        const std::optional<PlistValue> display = testing::parseJson(shown[i]);
        ASSERT_TRUE(display.has_value()) << shown[i];
        const PlistValue* value = display->dictionary()
                                      ->find("Serving Cell")
                                      ->dictionary()
                                      ->find("Connected mode LTE Intra-frequency Measurement")
                                      ->dictionary()
                                      ->find("Serving Filtered RSRP");
        ASSERT_NE(value, nullptr) << shown[i];
        EXPECT_EQ((value->string() != nullptr ? *value->string() : std::string()), expected[i]) << i;
    }
}

TEST(DecodeTimeSeries, CsvRowsCarryTheRecordingTimeOfEachRefresh) {
    testing::TemporaryDirectory directory;
    const std::string path = measurementsFile(directory);
    const auto everyTwo = runProcess({kDecode, "--technology", "lte", "--csv", kRsrpPath, path});
    ASSERT_EQ(everyTwo.exitCode, 0) << everyTwo.err;
    EXPECT_EQ(everyTwo.out, "time," + kRsrpPath +
                                "\n"
                                "2024-05-01T12:00:02Z,-99.00\n"
                                "2024-05-01T12:00:04Z,-98.00\n"
                                "2024-05-01T12:00:08Z,-97.00\n");
    // Half-second periods: times with milliseconds; a column that never has a value stays empty.
    const auto everyHalf = runProcess({kDecode, "--technology", "lte", "--every", "0.5", "--csv", kRsrpPath,
                                       "--csv", "Serving Cell/No such leaf", path});
    ASSERT_EQ(everyHalf.exitCode, 0) << everyHalf.err;
    EXPECT_EQ(everyHalf.out, "time," + kRsrpPath +
                                 ",Serving Cell/No such leaf\n"
                                 "2024-05-01T12:00:01Z,-100.00,\n"
                                 "2024-05-01T12:00:02Z,-99.00,\n"
                                 "2024-05-01T12:00:02.500Z,-98.00,\n"
                                 "2024-05-01T12:00:07.500Z,-97.00,\n");
}

TEST(DecodeTimeSeries, CsvFieldsAreQuotedWhereTheyMustBe) {
    testing::TemporaryDirectory directory;
    const std::string path = measurementsFile(directory);
    const auto result = runProcess(
        {kDecode, "--technology", "lte", "--every", "10", "--csv", "a,b", "--csv", "say \"x\"", path});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out, "time,\"a,b\",\"say \"\"x\"\"\"\n2024-05-01T12:00:10Z,,\n");
}

TEST(DecodeTimeSeries, CsvUsageErrors) {
    const std::vector<std::pair<std::vector<std::string>, std::string>> cases = {
        {{"--every", "0", "x.dlf"}, "--every needs a number of seconds from 0.001 to 86400, not '0'"},
        {{"--every", "2s", "x.dlf"}, "--every needs a number of seconds from 0.001 to 86400, not '2s'"},
        {{"--csv", "all", "--csv", "a", "x.dlf"}, "--csv all takes no other paths"},
        {{"--csv", "a", "--every-tick", "x.dlf"}, "--csv does not combine with --every-tick"},
        {{"--csv", "a", "--census", "x.dlf"}, "--csv does not combine with --census"},
    };
    for (const auto& [arguments, message] : cases) {
        std::vector<std::string> command = {kDecode, "--technology", "lte"};
        command.insert(command.end(), arguments.begin(), arguments.end());
        const auto result = runProcess(command);
        EXPECT_EQ(result.exitCode, 2);
        EXPECT_EQ(result.err, "velmar-decode: " + message + " (see --help)\n");
    }
}

// Every numeric leaf of the real captures: one header, times rising and ISO 8601, cells that are numbers.
TEST(DecodeTimeSeries, CsvOfEveryNumericLeafOfTheRealCaptures) {
    const std::regex iso(R"(\d{4}-\d{2}-\d{2}T\d{2}:\d{2}:\d{2}(\.\d{3})?Z)");
    for (const char* name :
         {"lte-connected-1.qmdl", "nas-lte-1.qmdl", "mixed-large-1.qmdl", "multisim-1.qmdl"}) {
        const auto result = runProcess({kDecode, "--technology", "lte", "--csv", "all", capture(name)});
        ASSERT_EQ(result.exitCode, 0) << name << ": " << result.err;
        const std::vector<std::string> rows = testing::linesOf(result.out);
        ASSERT_GE(rows.size(), 3u) << name;
        const std::vector<std::string> header = csvFields(rows[0]);
        ASSERT_GE(header.size(), 2u) << name;
        EXPECT_EQ(header[0], "time");
        EXPECT_NE(std::find(header.begin(), header.end(), "Serving Cell/Serving Cell Info/Physical Cell ID"),
                  header.end())
            << name << ": " << rows[0];
        std::string previous;
        std::size_t numbers = 0;
        for (std::size_t i = 1; i < rows.size(); ++i) {
            const std::vector<std::string> fields = csvFields(rows[i]);
            ASSERT_EQ(fields.size(), header.size()) << name << " row " << i;
            EXPECT_TRUE(std::regex_match(fields[0], iso)) << name << ": " << fields[0];
            EXPECT_GT(fields[0], previous) << name << " row " << i;  // ISO 8601 text sorts as time does
            previous = fields[0];
            for (std::size_t column = 1; column < fields.size(); ++column) {
                if (fields[column].empty()) {
                    continue;
                }
                char* end = nullptr;
                std::strtod(fields[column].c_str(), &end);
                EXPECT_EQ(*end, '\0') << name << ": " << header[column] << " = " << fields[column];
                ++numbers;
            }
        }
        EXPECT_GT(numbers, rows.size()) << name;
    }
}

// A column agrees with the display that --every-tick prints at the same refresh, its unit left out.
TEST(DecodeTimeSeries, CsvColumnsAgreeWithTheDisplayAtEachRefresh) {
    const std::string path = capture("lte-connected-1.qmdl");
    const auto csv = runProcess({kDecode, "--technology", "lte", "--csv", kRsrpPath, path});
    const auto json = runProcess({kDecode, "--technology", "lte", "--every", "2", "--every-tick", path});
    ASSERT_EQ(csv.exitCode, 0) << csv.err;
    ASSERT_EQ(json.exitCode, 0) << json.err;
    const std::vector<std::string> rows = testing::linesOf(csv.out);
    const std::vector<std::string> displays = testing::linesOf(json.out);
    ASSERT_EQ(rows.size(), displays.size() + 1);
    EXPECT_EQ(rows[0], "time," + kRsrpPath);
    std::size_t compared = 0;
    for (std::size_t i = 0; i < displays.size(); ++i) {
        const std::optional<PlistValue> display = testing::parseJson(displays[i]);
        ASSERT_TRUE(display.has_value());
        std::string shown;
        if (const PlistValue* cell = display->dictionary()->find("Serving Cell")) {
            if (const PlistValue* pane =
                    cell->dictionary()->find("Connected mode LTE Intra-frequency Measurement")) {
                if (const PlistValue* value = pane->dictionary()->find("Serving Filtered RSRP")) {
                    shown = (value->string() != nullptr ? *value->string() : std::string());
                }
            }
        }
        const std::string number = csvFields(rows[i + 1])[1];
        if (shown.empty()) {
            EXPECT_EQ(number, "") << i;
        } else {
            EXPECT_EQ(number + " dBm", shown) << i;
            ++compared;
        }
    }
    EXPECT_GT(compared, 10u);
}

}  // namespace
}  // namespace velmar
