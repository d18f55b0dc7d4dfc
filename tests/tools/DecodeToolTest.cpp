// velmar-decode as a user runs it: as a process, with its output parsed as JSON.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <string>
#include <vector>

#include "LogGenerator/DlfVersionReport.h"
#include "core/platform/plist/Base64.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/LogFormat.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::parseJson;
using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

std::string dataFile(const std::string& name) {
    return testing::testDataPath("decode/" + name);
}
std::string capture(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

std::vector<std::string> lines(const std::string& text) {
    std::vector<std::string> out;
    std::size_t start = 0;
    while (start < text.size()) {
        const std::size_t end = text.find('\n', start);
        out.push_back(text.substr(start, end - start));
        if (end == std::string::npos) {
            break;
        }
        start = end + 1;
    }
    return out;
}

TEST(DecodeTool, HelpDescribesTheCommandLine) {
    const auto result = runProcess({kDecode, "--help"});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.out.rfind("usage: velmar-decode --technology {gsm|lte|utran|cdma|ifx}", 0), 0u);
    EXPECT_NE(result.out.find("--every-tick"), std::string::npos);
}

TEST(DecodeTool, UsageErrorsAreOneLineWithStatusTwo) {
    struct Case {
        std::vector<std::string> arguments;
        std::string message;
    };
    const std::vector<Case> cases{
        {{}, "velmar-decode: --technology is required (gsm, lte, utran, cdma or ifx) (see --help)\n"},
        {{"--technology", "wimax", "x.hex"},
         "velmar-decode: unknown technology 'wimax' (expected gsm, lte, utran, cdma or ifx) (see --help)\n"},
        {{"--technology", "lte"}, "velmar-decode: no input file given (see --help)\n"},
        {{"--technology", "lte", "--format", "pcap", "x"},
         "velmar-decode: unknown format 'pcap' (expected auto, hex, dlf, qmdl or velmar) (see --help)\n"},
        {{"--technology", "lte", "--output", "tree", "x"},
         "velmar-decode: unknown output 'tree' (expected display or state) (see --help)\n"},
        {{"--technology", "lte", "--bogus", "x"}, "velmar-decode: unknown option '--bogus' (see --help)\n"},
        {{"--technology"}, "velmar-decode: --technology needs a value (see --help)\n"},
        {{"--technology=lte", "--output=", "x"}, "velmar-decode: --output needs a value (see --help)\n"},
    };
    for (const Case& c : cases) {
        std::vector<std::string> arguments{kDecode};
        arguments.insert(arguments.end(), c.arguments.begin(), c.arguments.end());
        const auto result = runProcess(arguments);
        EXPECT_EQ(result.exitCode, 2);
        EXPECT_EQ(result.err, c.message);
        EXPECT_EQ(result.out, "");
    }
}

TEST(DecodeTool, UnreadableInputNamesTheFile) {
    const auto missing = runProcess({kDecode, "--technology", "lte", "/nonexistent/trace.dlf"});
    EXPECT_EQ(missing.exitCode, 2);
    EXPECT_EQ(lines(missing.err).size(), 1u);
    EXPECT_NE(missing.err.find("/nonexistent/trace.dlf"), std::string::npos);
    EXPECT_EQ(missing.out, "");

    const auto badHex = runProcess({kDecode, "--technology", "lte", dataFile("bad-digit.hex")});
    EXPECT_EQ(badHex.exitCode, 2);
    EXPECT_EQ(lines(badHex.err).size(), 1u);
    EXPECT_NE(badHex.err.find("bad-digit.hex:3:"), std::string::npos) << badHex.err;
}

TEST(DecodeTool, ADirectoryIsSaidToBeOneWhateverTheFormat) {
    testing::TemporaryDirectory directory;
    const std::string named = directory.file("trace.velmar");
    ASSERT_EQ(mkdir(named.c_str(), 0700), 0);
    const auto snapshot = runProcess({kDecode, "--technology", "lte", named});
    EXPECT_EQ(snapshot.exitCode, 2);
    EXPECT_EQ(snapshot.err, "velmar-decode: " + named + ": Is a directory\n");
    for (const char* format : {"velmar", "hex", "dlf", "qmdl", "auto"}) {
        const auto result =
            runProcess({kDecode, "--technology", "lte", "--format", format, directory.path()});
        EXPECT_EQ(result.exitCode, 2) << format;
        EXPECT_NE(result.err.find(directory.path() + ": "), std::string::npos)
            << format << ": " << result.err;
        EXPECT_NE(result.err.find("Is a directory"), std::string::npos) << format << ": " << result.err;
        EXPECT_EQ(lines(result.err).size(), 1u) << result.err;
    }
}

TEST(DecodeTool, StartCommandIsPrintedAsJson) {
    const auto result = runProcess({kDecode, "--technology", "lte", "--start-command"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto command = parseJson(result.out);
    ASSERT_TRUE(command && command->isDictionary());
    EXPECT_EQ(*command->dictionary()->get("SetState").string(), "Streaming");
    EXPECT_TRUE(command->dictionary()->get("SetOrvaneLogCodes").isArray());
    EXPECT_TRUE(command->dictionary()->get("SetKxExtraCodes").isArray());
}

TEST(DecodeTool, ListDecodersPrintsTheUtranClassIndexInDispatchOrder) {
    const auto result = runProcess({kDecode, "--technology", "utran", "--list-decoders"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out,
              "code      decoder                     section\n"
              "0xD0E0    RRC_State                   RRC Info\n"
              "0xD0E2    UTRANServingCellInfo        Serving Cell Info\n"
              "0xFF0001  UTRANServingCellInfo        Serving Cell Info\n"
              "0xD00A    UTRANNeighbhorMeasurements  Neighbor Cell List\n"
              "0xD00E    GSMNeighbhorMeasurements    GSM Neighbor Cell List\n"
              "0xD00C    TRCHBLERMeasurement         TRCH BLER\n"
              "0xD00C    CCTRCHSIRMeasurement        CCTRCH SIR\n"
              "0xFF0002  PDPContextList              PDP Context Info\n"
              "0xFF0000  SimInfo                     SIM Info\n");
    EXPECT_EQ(result.err, "");
}

TEST(DecodeTool, ListDecodersPrintsTheLteClassIndexInDispatchOrder) {
    const auto result = runProcess({kDecode, "--technology", "lte", "--list-decoders"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out,
              "code      decoder                       section\n"
              "0xB0C2    LTEServingCellInfo            Serving Cell Info\n"
              "0xB0C1    LTEServingCellInfo            Serving Cell Info\n"
              "0xFF0001  LTEServingCellInfo            Serving Cell Info\n"
              "0xB179    ConnectedModeMeasurementMisc  Connected mode LTE Intra-frequency Measurement\n"
              "0xB179    MeasuredNeighborCells         Measured Neighbor Cells\n"
              "0xB179    DetectedCells                 Detected Cells\n"
              "0xB17F    ServingCellMeasurement        Serving Cell Measurements\n"
              "0xB180    NeighborMeasurementMisc       Neighbor Measurements\n"
              "0xB180    NeighborCellsList             Neighbor Cells List\n"
              "0xB186    ReselectionCandidatesMisc     Reselection Candidates\n"
              "0xB186    ReselectionCandidatesList     Reselection Candidates List\n"
              "0xFF0000  SimInfo                       SIM Info\n"
              "0xFF0002  PDPContextList                PDP Context Info\n");
}

TEST(DecodeTool, ListDecodersShowsTheSharedGsmCodesAndThePlaceholdersLast) {
    const auto result = runProcess({kDecode, "--technology", "gsm", "--list-decoders"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto printed = lines(result.out);
    // The heading, 45 subscriptions of the 21 decoders with codes, and the 5 placeholders.
    ASSERT_EQ(printed.size(), 1u + 45u + 5u);
    EXPECT_EQ(printed[0], "code      decoder             section");
    EXPECT_EQ(printed[1], "0x417A    ActiveSet           Active Set");
    EXPECT_EQ(printed[4], "0x417A    VirtualActiveSet    Virtual Active Set");
    std::vector<std::string> cellMonitor;
    for (const std::string& line : printed) {
        if (line.rfind("0xFF0001", 0) == 0) {
            cellMonitor.push_back(line);
        }
    }
    EXPECT_EQ(cellMonitor, (std::vector<std::string>{
                               "0xFF0001  GSMServingCell      GSM Serving Cell",
                               "0xFF0001  NeighboringCells    Neighboring Cells",
                               "0xFF0001  ServingPLMN         Serving PLMN",
                               "0xFF0001  UMTSSet             UMTS Set",
                               "0xFF0001  UMTSRRInfo          UMTS RR Info",
                           }));
    EXPECT_EQ(std::vector<std::string>(printed.end() - 5, printed.end()),
              (std::vector<std::string>{
                  "none      CodingScheme        Coding Scheme",
                  "none      UMTSRRMeasurement   UMTS RR Measurement",
                  "none      CellChangeCounters  Cell Change Counters",
                  "none      NonRankedGSMSet     Non-Ranked GSM Set",
                  "none      NonRankedUMTSSet    Non-Ranked UMTS Set",
              }));
}

TEST(DecodeTool, ListDecodersPrintsTheCdmaParserTable) {
    const auto result = runProcess({kDecode, "--technology", "cdma", "--list-decoders"});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out,
              "code    decoder\n"
              "0x108A  parseFingerC2I\n"
              "0x1183  parseEvdoStatus\n"
              "0x1192  parseForwardLinkRate\n"
              "0x12B6  parseEvdoActiveSet\n"
              "0x119C  parse1xStatus\n"
              "0x119D  parse1xTrafficFrameErrors\n"
              "0x127E  parseReverseLinkRate\n"
              "0x134F  parse1xSystemIdentity\n");
}

TEST(DecodeTool, ListDecodersOfTheObjectBasedTechnologyIsAnError) {
    const auto result = runProcess({kDecode, "--technology", "ifx", "--list-decoders"});
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, "velmar-decode: technology 'ifx' dispatches no log codes\n");
}

TEST(DecodeTool, EveryTickPrintsOneLinePerRefresh) {
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--every-tick", dataFile("two-intervals.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto printed = lines(result.out);
    ASSERT_EQ(printed.size(), 2u);  // the tick, then the refresh after the last blob
    for (const std::string& line : printed) {
        const auto display = parseJson(line);
        ASSERT_TRUE(display && display->isDictionary()) << line;
    }
}

TEST(DecodeTool, StandardOutputHoldsJsonOnly) {
    const auto result = runProcess({kDecode, "--technology", "lte", dataFile("two-intervals.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_TRUE(parseJson(result.out).has_value());
    EXPECT_EQ(result.out.find("Deallocing"), std::string::npos);
    EXPECT_EQ(result.err, "");
}

TEST(DecodeTool, TheGeneratorsOwnLinesGoToStandardErrorWithLogStderr) {
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--log-stderr", dataFile("two-intervals.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_TRUE(parseJson(result.out).has_value());
    EXPECT_EQ(result.out.find("Deallocing"), std::string::npos);
    EXPECT_NE(result.err.find("Deallocing LTEClassIndex\nDeallocing ClassIndex\n"), std::string::npos)
        << result.err;
}

TEST(DecodeTool, StateOutputHoldsTheStateKeys) {
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--output", "state", dataFile("two-intervals.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto state = parseJson(result.out);
    ASSERT_TRUE(state && state->isDictionary());
    for (const char* key : {"Template", "Display", "ExtraInfo", "DisplayState", "History"}) {
        EXPECT_TRUE(state->dictionary()->contains(key)) << key;
    }
    EXPECT_EQ(state->dictionary()->get("History").array()->size(), 2u);
    // The last interval held the second record and the record of unknown code: 38 + 13 bytes.
    const PlistDictionaryRef lastState = state->dictionary()->get("DisplayState").dictionary();
    ASSERT_TRUE(lastState);
    const auto bytes = decodeBase64(*lastState->get("$data").string());
    ASSERT_TRUE(bytes);
    EXPECT_EQ(bytes->size(), 38u + 13u);
}

TEST(DecodeTool, SaveContentsEndWithTheDlfFile) {
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--save-contents", dataFile("two-intervals.hex")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto contents = parseJson(result.out);
    ASSERT_TRUE(contents && contents->isArray());
    ASSERT_EQ(contents->array()->size(), 3u);
    const PlistDictionaryRef dlf = contents->array()->at(2).dictionary();
    // 161-byte version record, then each interval's blobs without their first byte: 37 + (37 + 13).
    EXPECT_EQ(*dlf->get("Description").string(), "DLF binary (248 bytes)");
    const auto file = decodeBase64(*dlf->get("DLF").dictionary()->get("$data").string());
    ASSERT_TRUE(file);
    ASSERT_EQ(file->size(), 248u);
    EXPECT_EQ((*file)[0] | ((*file)[1] << 8), 161);
    EXPECT_EQ((*file)[2] | ((*file)[3] << 8), kDlfVersionReportCode);
    // The first interval's packet follows as a clean DLF record: length 0x25, code 0xB0C2.
    EXPECT_EQ((*file)[161], 0x25);
    EXPECT_EQ((*file)[163], 0xC2);
    EXPECT_EQ((*file)[164], 0xB0);
}

TEST(DecodeTool, DlfInputIsFedAsLogPackets) {
    testing::TemporaryDirectory directory;
    // Two DLF records: a serving-cell record and one of an unknown code.
    std::string dlf;
    const std::vector<std::uint8_t> serving{0x25, 0x00, 0xC2, 0xB0, 0,    0,    0,    0,    0,    0,
                                            0,    0,    0x01, 0xF4, 0x01, 0x2C, 0x01, 0x4E, 0x4B, 0x64,
                                            0x64, 0x78, 0x56, 0x34, 0x12, 0x39, 0x30, 0x03, 0,    0,
                                            0,    0,    0,    0,    0,    0,    0};
    dlf.append(serving.begin(), serving.end());
    const std::vector<std::uint8_t> unknown{0x0C, 0x00, 0x34, 0x12, 0, 0, 0, 0, 0, 0, 0, 0};
    dlf.append(unknown.begin(), unknown.end());
    testing::writeWholeFile(directory.file("trace.dlf"), dlf);
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--output", "state", directory.file("trace.dlf")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto state = parseJson(result.out);
    ASSERT_TRUE(state);
    const auto bytes =
        decodeBase64(*state->dictionary()->get("DisplayState").dictionary()->get("$data").string());
    ASSERT_TRUE(bytes);
    EXPECT_EQ(bytes->size(), 1u + 37u + 1u + 12u);
    EXPECT_EQ((*bytes)[0], 1);
    EXPECT_EQ((*bytes)[38], 1);
}

TEST(DecodeTool, RealCaptureDecodesWithoutError) {
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--log-stderr", capture("lte-connected-1.qmdl")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto display = parseJson(result.out);
    ASSERT_TRUE(display && display->isDictionary());
    EXPECT_FALSE(display->dictionary()->empty());
}

TEST(DecodeTool, SnapshotFileReplaysItsHistory) {
    testing::TemporaryDirectory directory;
    const auto saved =
        runProcess({kDecode, "--technology", "lte", "--save-contents", dataFile("two-intervals.hex")});
    ASSERT_EQ(saved.exitCode, 0);
    // Rebuild a snapshot file from the history entries' raw data, as the save screen writes it.
    const auto contents = parseJson(saved.out);
    ASSERT_TRUE(contents);
    auto data = PlistArray::create();
    for (const PlistValue& entry : *contents->array()) {
        const PlistValue* raw = entry.dictionary()->find("DisplayState");
        if (raw == nullptr) {
            continue;
        }
        auto rebuilt = PlistDictionary::create();
        rebuilt->set("DisplayState",
                     PlistValue::data(*decodeBase64(*raw->dictionary()->get("$data").string())));
        rebuilt->set("Description", *entry.dictionary()->get("Description").string());
        data->append(rebuilt);
    }
    auto snapshot = PlistDictionary::create();
    snapshot->set("Timestamp", PlistValue::date({1790000000.0}));
    snapshot->set("Data", data);
    snapshot->set("Description", "drive test");
    ASSERT_TRUE(writeXmlFile(snapshot, directory.file("saved.velmar")));

    const auto replayed = runProcess({kDecode, "--technology", "lte", "--output", "state", "--every-tick",
                                      directory.file("saved.velmar")});
    ASSERT_EQ(replayed.exitCode, 0) << replayed.err;
    EXPECT_EQ(lines(replayed.out).size(), 3u);  // a refresh after each of the two entries, and the last one
}

}  // namespace
}  // namespace velmar
