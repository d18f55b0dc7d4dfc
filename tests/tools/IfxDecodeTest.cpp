// velmar-decode with --technology ifx, run as a process: object blobs of both encodings shown collapsed, and
// a blob that cannot be decoded ending the program with the generator's uncaught assertion failure.
#include <gtest/gtest.h>

#include "tests/support/Json.h"
#include "tests/support/Process.h"

namespace velmar {
namespace {

const std::string kIfxData = std::string(VELMAR_TEST_DATA_DIR) + "/ifx/";
constexpr int kAbortExit = 128 + 6;  // SIGABRT, raised by std::terminate

testing::ProcessResult decode(const std::vector<std::string>& options, const std::string& file) {
    std::vector<std::string> arguments{VELMAR_DECODE_PATH, "--technology", "ifx"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    arguments.push_back(kIfxData + file);
    return testing::runProcess(arguments);
}

std::vector<std::string> lines(const std::string& text) {
    std::vector<std::string> out;
    std::size_t start = 0;
    while (start < text.size()) {
        const std::size_t end = text.find('\n', start);
        if (end == std::string::npos) {
            out.push_back(text.substr(start));  // an unterminated last line
            break;
        }
        out.push_back(text.substr(start, end - start));
        start = end + 1;
    }
    return out;
}

TEST(IfxDecode, StartCommandOnlyStartsStreaming) {
    const testing::ProcessResult result =
        testing::runProcess({VELMAR_DECODE_PATH, "--technology", "ifx", "--start-command"});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.out, "{\"SetState\": \"Streaming\"}\n");
}

TEST(IfxDecode, XmlAndBinaryBlobsAreShownCollapsed) {
    const testing::ProcessResult result = decode({"--every-tick"}, "cells.hex");
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const std::vector<std::string> refreshes = lines(result.out);
    ASSERT_EQ(refreshes.size(), 2u) << result.out;

    const auto first = testing::parseJson(refreshes[0]);
    ASSERT_TRUE(first);
    auto serving = PlistDictionary::create();
    serving->set("ARFCN", "62");
    serving->set("RSSI", "-71");
    auto neighbour = PlistDictionary::create();
    neighbour->set("ARFCN", "75");
    neighbour->set("RSSI", "-90");
    auto neighbours = PlistArray::create();
    neighbours->append("70");
    neighbours->append(neighbour);
    auto expected = PlistDictionary::create();
    expected->set("Serving Cell", serving);
    expected->set("Neighbours", neighbours);
    expected->set("Status", "Yes");
    EXPECT_EQ(*first, PlistValue(expected)) << refreshes[0];

    EXPECT_EQ(refreshes[1], R"({"Serving Cell": {"ARFCN": "64", "RSSI": "-80"}, "Neighbours": []})");
}

TEST(IfxDecode, StateKeepsTheDeserialisedObject) {
    const testing::ProcessResult result = decode({"--output", "state"}, "cells.hex");
    ASSERT_EQ(result.exitCode, 0) << result.err;
    const auto state = testing::parseJson(result.out);
    ASSERT_TRUE(state && state->dictionary());
    const PlistValue displayState = state->dictionary()->get("DisplayState");
    ASSERT_TRUE(displayState.dictionary());
    EXPECT_EQ(displayState.dictionary()->get("Serving Cell").dictionary()->get("RSSI"), PlistValue("-80"));
    EXPECT_TRUE(state->dictionary()->get("ExtraInfo").dictionary()->empty());
    EXPECT_EQ(state->dictionary()->get("History").array()->size(), 2u);
}

TEST(IfxDecode, UndecodableBlobEndsTheProgramAndNothingHalfWrittenIsOutput) {
    const testing::ProcessResult result = decode({}, "undecodable.hex");
    EXPECT_EQ(result.exitCode, kAbortExit);
    EXPECT_EQ(result.out, "");
    EXPECT_NE(
        result.err.find("Assertion failure in updateState:withData: (LogGenerator/GSM/GSMLogGenerator:90): "
                        "Could not deserialize the object"),
        std::string::npos)
        << result.err;
}

TEST(IfxDecode, RefreshesBeforeTheUndecodableBlobAreTheOnlyOutput) {
    const testing::ProcessResult result = decode({"--every-tick"}, "undecodable.hex");
    EXPECT_EQ(result.exitCode, kAbortExit);
    const std::vector<std::string> refreshes = lines(result.out);
    ASSERT_EQ(refreshes.size(), 1u) << result.out;
    ASSERT_TRUE(result.out.ends_with("\n"));
    EXPECT_EQ(refreshes[0], R"({"Cell": "12"})");
}

TEST(IfxDecode, NumberLeafEndsTheProgramWithTheUnknownObjectFailure) {
    const testing::ProcessResult result = decode({}, "number-leaf.hex");
    EXPECT_EQ(result.exitCode, kAbortExit);
    EXPECT_EQ(result.out, "");
    EXPECT_NE(
        result.err.find("(LogGenerator/GSM/GSMLogGenerator:78): Unknown object of type integer encountered"),
        std::string::npos)
        << result.err;
}

}  // namespace
}  // namespace velmar
