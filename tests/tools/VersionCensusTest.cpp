// velmar-decode --census on the real captures: one line per (log code, version) with what the packet-version
// adapter did, the technology's codes first; and the true values the adapter lets the decoders show.
#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>
#include <string>
#include <vector>

#include "tests/support/BackgroundProcess.h"
#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::runProcess;

const std::string kDecode = VELMAR_DECODE_PATH;

std::string capturePath(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

struct Census {
    std::vector<std::string> technology;  // the lines before the first "not decoded" one
    std::vector<std::string> others;
};

Census censusOf(const std::string& technology, const std::vector<std::string>& captures) {
    std::vector<std::string> arguments = {kDecode, "--technology", technology, "--census"};
    for (const std::string& capture : captures) {
        arguments.push_back(capturePath(capture));
    }
    const auto result = runProcess(arguments);
    EXPECT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.err, "");
    Census census;
    for (const std::string& line : testing::linesOf(result.out)) {
        const bool notDecoded = line.find(" not decoded") != std::string::npos;
        if (!notDecoded) {
            EXPECT_TRUE(census.others.empty()) << "a code of the technology after the others: " << line;
            census.technology.push_back(line);
        } else {
            census.others.push_back(line);
        }
    }
    return census;
}

TEST(VersionCensus, ConnectedModeCapture) {
    const Census lte = censusOf("lte", {"lte-connected-1.qmdl"});
    // RSRQ below -20 dB does not fit the decoded layout: 37 neighbour values are clamped.
    EXPECT_EQ(lte.technology,
              (std::vector<std::string>{"0xB0C2 v3 3 adapted", "0xB179 v4 237 adapted, 37 values clamped"}));
    EXPECT_EQ(lte.others,
              (std::vector<std::string>{
                  "0x7130 v- 2 not decoded", "0x7131 v- 1 not decoded", "0xB063 v- 141 not decoded",
                  "0xB064 v- 100 not decoded", "0xB0C0 v- 109 not decoded", "0xB0E2 v- 2 not decoded",
                  "0xB0E3 v- 2 not decoded", "0xB0EC v- 9 not decoded", "0xB0ED v- 11 not decoded",
                  "0xB0EE v- 11 not decoded", "0xB126 v- 225 not decoded", "0xB187 v- 6 not decoded",
                  "0xB193 v- 1071 not decoded", "0xB195 v- 237 not decoded"}));
    const Census gsm = censusOf("gsm", {"lte-connected-1.qmdl"});
    EXPECT_EQ(gsm.technology,
              (std::vector<std::string>{"0x7130 v- 2 decoded as is", "0x7131 v- 1 decoded as is"}));
    EXPECT_EQ(gsm.others.size(), 14u);
}

TEST(VersionCensus, MixedCapture) {
    EXPECT_EQ(censusOf("lte", {"mixed-large-1.qmdl"}).technology,
              (std::vector<std::string>{"0xB0C1 v2 559 adapted", "0xB0C2 v3 840 adapted"}));
    const Census gsm = censusOf("gsm", {"mixed-large-1.qmdl"});
    EXPECT_EQ(gsm.technology,
              (std::vector<std::string>{"0x4116 v- 14011 decoded as is", "0x7130 v- 520 decoded as is",
                                        "0x7131 v- 11 decoded as is", "0x7132 v- 18 decoded as is",
                                        "0x7150 v- 94 adapted"}));
    EXPECT_NE(std::find(gsm.others.begin(), gsm.others.end(), "0xB0C2 v3 840 not decoded"), gsm.others.end());
}

TEST(VersionCensus, MultiSubscriptionCapture) {
    EXPECT_EQ(censusOf("lte", {"multisim-1.qmdl"}).technology,
              (std::vector<std::string>{"0xB0C1 v2 53 adapted", "0xB0C2 v3 28 adapted"}));
}

TEST(VersionCensus, NasCapture) {
    EXPECT_EQ(censusOf("lte", {"nas-lte-1.qmdl"}).technology,
              (std::vector<std::string>{"0xB0C1 v2 97 adapted", "0xB0C2 v3 62 adapted"}));
    EXPECT_EQ(censusOf("gsm", {"nas-lte-1.qmdl"}).technology,
              (std::vector<std::string>{"0x7130 v- 68 decoded as is", "0x7131 v- 55 decoded as is",
                                        "0x7132 v- 8 decoded as is", "0x7135 v- 13 decoded as is",
                                        "0x7150 v- 7 adapted"}));
}

TEST(VersionCensus, CountsAddUpOverSeveralFiles) {
    EXPECT_EQ(censusOf("lte", {"multisim-1.qmdl", "nas-lte-1.qmdl"}).technology,
              (std::vector<std::string>{"0xB0C1 v2 150 adapted", "0xB0C2 v3 90 adapted"}));
}

TEST(VersionCensus, UnknownVersionsAreCounted) {
    // all-codes.hex carries a 0xB0C1 record of version 0, which no table knows.
    const auto result =
        runProcess({kDecode, "--technology", "lte", "--census", testing::testDataPath("lte/all-codes.hex")});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.out.find("0xB0C1 v0 1 unknown version\n"), std::string::npos) << result.out;
    EXPECT_NE(result.out.find("0xB179 v2 1 decoded as is\n"), std::string::npos) << result.out;
}

// ---- the true values of the captures

PlistValue displayOf(const std::string& technology, const std::string& capture) {
    const auto result = runProcess({kDecode, "--technology", technology, capturePath(capture)});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    return testing::parseJson(result.out).value_or(PlistValue());
}

std::string textAt(const PlistValue& root, std::initializer_list<const char*> path) {
    PlistValue value = root;
    for (const char* key : path) {
        value = value.isDictionary() ? value.dictionary()->get(key) : PlistValue();
    }
    return value.string() ? *value.string() : std::string("<missing>");
}

TEST(VersionCensus, TheConnectedModeCaptureShowsItsTrueValues) {
    const PlistValue display = displayOf("lte", "lte-connected-1.qmdl");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Physical Cell ID"}), "42");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Download Frequency"}), "2075");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Upload Frequency"}), "20075");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Download Bandwidth"}), "15 MHz");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Freq Band Indicator"}), "4");
    const char* connected = "Connected mode LTE Intra-frequency Measurement";
    EXPECT_EQ(textAt(display, {"Serving Cell", connected, "E-ARFCN"}), "2075");
    EXPECT_EQ(textAt(display, {"Serving Cell", connected, "Serving Physical Cell ID"}), "42");
    EXPECT_EQ(textAt(display, {"Serving Cell", connected, "Serving Filtered RSRP"}), "-111.50 dBm");
}

TEST(VersionCensus, TheMixedCaptureShowsTwoTransmitAntennas) {
    const PlistValue display = displayOf("lte", "mixed-large-1.qmdl");
    EXPECT_EQ(textAt(display, {"Serving Cell", "Serving Cell Info", "Num Tx Antennas"}), "2");
}

}  // namespace
}  // namespace velmar
