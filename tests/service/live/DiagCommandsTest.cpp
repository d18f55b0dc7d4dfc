// The requests of the live session byte for byte, and the reading of real modems' responses: which frame
// answers which request, identification, log configuration statuses and ranges, and short responses.
#include "service/live/DiagCommands.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace velmar::live {
namespace {

using Bytes = std::vector<std::uint8_t>;

Bytes bytesOf(const std::string& text) {
    return Bytes(text.begin(), text.end());
}

Bytes concat(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& part : parts) {
        all.insert(all.end(), part.begin(), part.end());
    }
    return all;
}

// A phone's version response, as recorded (55 bytes).
const Bytes kVersionResponse = concat({{0x00},
                                       bytesOf("Apr 21 201521:45:40Feb 19 201508:00:00FAAAANUZ"),
                                       {0x3A, 0x09, 0xFF, 0x64, 0x00, 0x02, 0x09, 0x0B}});
// The same phone's build id response.
const Bytes kBuildIdResponse =
    concat({{0x7C, 0x01, 0x00, 0x00, 0xB0, 0x90, 0x00, 0x00, 0x07, 0x10, 0x00, 0x00},
            bytesOf("NX511J_Z0_CN_CSXPK1JF11J119"),
            {0x00, 0x00}});
// A 5G module's retrieve-ranges response.
const Bytes kRangesResponse = {0x73, 0,    0,    0,    0x01, 0,    0,    0,
                               0,    0,    0,    0,                              // header, status success
                               0x00, 0x00, 0x00, 0x00, 0xff, 0x0f, 0x00, 0x00,   // 0, 1
                               0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00,   // 2, 3
                               0xf7, 0x0f, 0x00, 0x00, 0xf7, 0x0f, 0x00, 0x00,   // 4, 5
                               0x1c, 0x00, 0x00, 0x00, 0x5e, 0x0b, 0x00, 0x00,   // 6, 7
                               0x00, 0x00, 0x00, 0x00, 0x16, 0x08, 0x00, 0x00,   // 8, 9
                               0x92, 0x03, 0x00, 0x00, 0x09, 0x02, 0x00, 0x00,   // 10, 11
                               0x00, 0x00, 0x00, 0x00, 0x07, 0x02, 0x00, 0x00,   // 12, 13
                               0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00};  // 14, 15

TEST(DiagCommands, RequestsAreTheProtocolsBytes) {
    EXPECT_EQ(versionRequest(), (Bytes{0x00}));
    EXPECT_EQ(buildIdRequest(), (Bytes{0x7C}));
    EXPECT_EQ(timestampRequest(), (Bytes{0x1D}));
    EXPECT_EQ(eventReportsRequest(false), (Bytes{0x60, 0x00}));
    EXPECT_EQ(eventReportsRequest(true), (Bytes{0x60, 0x01}));
    EXPECT_EQ(debugMessagesOffRequest(), (Bytes{0x7D, 0x05, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(logConfigRequest(LogConfigOperation::DisableAll), (Bytes{0x73, 0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(logConfigRequest(LogConfigOperation::RetrieveRanges), (Bytes{0x73, 0, 0, 0, 1, 0, 0, 0}));
    EXPECT_EQ(setLogMaskRequest(EquipmentLogMask{0x4, 0x11, {0x01, 0x80, 0x01}}),
              (Bytes{0x73, 0, 0, 0, 3, 0, 0, 0, 4, 0, 0, 0, 0x11, 0, 0, 0, 0x01, 0x80, 0x01}));
}

TEST(DiagCommands, RequestsHaveNamesForMessages) {
    EXPECT_EQ(requestName(versionRequest()), "version request");
    EXPECT_EQ(requestName(logConfigRequest(LogConfigOperation::DisableAll)), "log disable");
    EXPECT_EQ(requestName(setLogMaskRequest(EquipmentLogMask{1, 8, {0}})), "set log mask");
    EXPECT_EQ(requestName(Bytes{0x4B, 0x05}), "command 0x4B");
}

TEST(DiagCommands, AResponseAnswersTheRequestOfItsCommandAndOperation) {
    const Bytes disable = logConfigRequest(LogConfigOperation::DisableAll);
    const Bytes ranges = logConfigRequest(LogConfigOperation::RetrieveRanges);
    EXPECT_TRUE(answers(versionRequest(), kVersionResponse));
    EXPECT_TRUE(answers(buildIdRequest(), kBuildIdResponse));
    EXPECT_FALSE(answers(versionRequest(), kBuildIdResponse));
    EXPECT_TRUE(answers(ranges, kRangesResponse));
    EXPECT_FALSE(answers(disable, kRangesResponse)) << "another operation";
    EXPECT_TRUE(answers(debugMessagesOffRequest(), Bytes{0x7D, 0x05, 0x01, 0x00, 0, 0, 0, 0}));
    EXPECT_FALSE(answers(debugMessagesOffRequest(), Bytes{0x7D, 0x04, 0x01, 0x00}));
    EXPECT_TRUE(answers(eventReportsRequest(false), Bytes{0x60, 0x00, 0x00}));
    // An asynchronous event report is not the answer, however it starts.
    EXPECT_FALSE(answers(eventReportsRequest(false), Bytes{0x60, 0x00, 0x00, 0x12, 0x34}));
    // Error responses carry a copy of the request they refuse.
    EXPECT_TRUE(answers(disable, concat({{0x14}, disable})));
    EXPECT_TRUE(answers(disable, Bytes{0x13}));
    EXPECT_FALSE(answers(versionRequest(), concat({{0x13}, disable})));
    // Log packets and debug messages never answer.
    EXPECT_FALSE(answers(Bytes{0x10}, Bytes{0x10, 0x00, 0x0C, 0x00}));
    EXPECT_FALSE(answers(Bytes{0x79}, Bytes{0x79, 0x00}));
}

TEST(DiagCommands, AsynchronousFramesAndErrorCodesAreKnown) {
    for (const std::uint8_t command : {0x10, 0x79, 0x92, 0x99, 0x9C, 0x9D, 0x9E}) {
        EXPECT_TRUE(isAsynchronous(Bytes{command, 0x00})) << int(command);
    }
    EXPECT_TRUE(isAsynchronous(Bytes{0x60, 0x01}));
    EXPECT_FALSE(isAsynchronous(Bytes{0x60, 0x00, 0x00}));
    EXPECT_FALSE(isAsynchronous(kVersionResponse));
    const struct {
        std::uint8_t code;
        const char* name;
    } errors[] = {{0x13, "bad command"},    {0x14, "bad parameter"}, {0x15, "bad length"},
                  {0x18, "bad mode"},       {0x42, "bad SPC mode"},  {0x47, "bad security mode"},
                  {0x95, "bad transaction"}};
    for (const auto& error : errors) {
        EXPECT_TRUE(isErrorResponse(Bytes{error.code}));
        EXPECT_EQ(errorResponseName(error.code), error.name);
    }
    EXPECT_FALSE(isErrorResponse(Bytes{0x73}));
}

TEST(DiagCommands, ReadsARealVersionResponse) {
    ASSERT_EQ(kVersionResponse.size(), 55U);
    const std::optional<VersionInfo> version = parseVersionResponse(kVersionResponse);
    ASSERT_TRUE(version.has_value());
    EXPECT_EQ(version->compileDate, "Apr 21 2015");
    EXPECT_EQ(version->compileTime, "21:45:40");
    EXPECT_EQ(version->releaseDate, "Feb 19 2015");
    EXPECT_EQ(version->releaseTime, "08:00:00");
    EXPECT_EQ(version->directory, "FAAAANUZ");
    EXPECT_FALSE(parseVersionResponse(Bytes(kVersionResponse.begin(), kVersionResponse.begin() + 46)));
}

TEST(DiagCommands, ReadsARealBuildIdResponse) {
    const std::optional<BuildIdInfo> build = parseBuildIdResponse(kBuildIdResponse);
    ASSERT_TRUE(build.has_value());
    EXPECT_EQ(build->hardwareVersion, 0x90B0U);
    EXPECT_EQ(build->modelId, 0x1007U);
    EXPECT_EQ(build->buildId, "NX511J_Z0_CN_CSXPK1JF11J119");
    EXPECT_EQ(build->model, "");
    // Strings that lose their NUL end with the response; a response without room for the ids is refused.
    const Bytes cut(kBuildIdResponse.begin(), kBuildIdResponse.begin() + 16);
    EXPECT_EQ(parseBuildIdResponse(cut)->buildId, "NX51");
    EXPECT_FALSE(parseBuildIdResponse(Bytes(kBuildIdResponse.begin(), kBuildIdResponse.begin() + 11)));
}

TEST(DiagCommands, ReadsARealRangesResponse) {
    const std::optional<LogConfigResponse> response = parseLogConfigResponse(kRangesResponse);
    ASSERT_TRUE(response.has_value());
    EXPECT_EQ(response->operation, 1U);
    EXPECT_EQ(response->status, kLogConfigSuccess);
    const std::optional<EquipmentRanges> ranges = parseLogRanges(*response);
    ASSERT_TRUE(ranges.has_value());
    const EquipmentRanges expected = {0, 0xFFF, 0,     0,     0xFF7, 0xFF7, 0x1C, 0xB5E,
                                      0, 0x816, 0x392, 0x209, 0,     0x207, 0,    0};
    EXPECT_EQ(*ranges, expected);
    const Bytes cut(kRangesResponse.begin(), kRangesResponse.end() - 1);
    EXPECT_FALSE(parseLogRanges(*parseLogConfigResponse(cut)));
}

TEST(DiagCommands, ReadsSetMaskEchoesAndStatuses) {
    const Bytes success = {0x73, 0, 0, 0, 3, 0, 0, 0, 0, 0, 0, 0, 0x0B, 0, 0, 0, 0x80, 0x01, 0, 0, 0x04};
    const std::optional<LogConfigResponse> response = parseLogConfigResponse(success);
    ASSERT_TRUE(response.has_value());
    EXPECT_EQ(response->status, 0U);
    const std::optional<SetMaskEcho> echo = parseSetMaskEcho(*response);
    ASSERT_TRUE(echo.has_value());
    EXPECT_EQ(echo->equipment, 0xBU);
    EXPECT_EQ(echo->itemCount, 0x180U);
    const Bytes failed = {0x73, 0, 0, 0, 3, 0, 0, 0, 2, 0, 0, 0};
    EXPECT_EQ(parseLogConfigResponse(failed)->status, 2U);
    EXPECT_FALSE(parseSetMaskEcho(*parseLogConfigResponse(failed)));
    EXPECT_FALSE(parseLogConfigResponse(Bytes{0x73, 0, 0, 0, 3, 0, 0, 0, 2, 0, 0}));
    EXPECT_EQ(logConfigStatusName(0), "success");
    EXPECT_EQ(logConfigStatusName(1), "invalid");
    EXPECT_EQ(logConfigStatusName(2), "fail");
    EXPECT_EQ(logConfigStatusName(7), "status 7");
}

}  // namespace
}  // namespace velmar::live
