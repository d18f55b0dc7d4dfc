// kxserverd's log channels, with real processes and sockets: channel creation, "GetTechnology", start
// commands and their filters, several clients at once, stuck and vanishing clients, malformed requests and
// shutdown.
#include <gtest/gtest.h>

#include <signal.h>
#include <sys/stat.h>

#include <algorithm>
#include <chrono>
#include <regex>
#include <string>
#include <vector>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/MessagePort.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

using ChannelTest = ServiceTest;

// The blobs of tests/data/service/filter.hex, by line number there, written out by hand.
const std::vector<std::string> kFilterBlobs = {
    "01 0e 00 c1 b0 00 00 00 00 00 00 00 00 aa bb",        // 1: ordinary 0xB0C1
    "01 0e 00 c2 b0 00 00 00 00 00 00 00 00 cc dd",        // 2: ordinary 0xB0C2
    "ff 0d 00 01 00 00 00 00 00 00 00 00 00 01",           // 3: extended 0x0001
    "ff 0d 00 00 00 00 00 00 00 00 00 00 00 02",           // 4: extended 0x0000
    "81 07 01 0e 00 79 b1 00 00 00 00 00 00 00 00 11 22",  // 5: prefixed ordinary 0xB179
    "02 0e 00 c1 b0 00 00 00 00 00 00 00 00 33 44",        // 6: log type 2
    "01 0e",                                               // 7: too short
    "01 0d 00 c1 b0 00 00 00 00 00 00 00 00 ee",           // 8: ordinary 0xB0C1
    "01 0d 00 c1 00 00 00 00 00 00 00 00 00 55",           // 9: ordinary 0x00C1
    "ff 0d 00 c1 b0 00 00 00 00 00 00 00 00 66",           // 10: extended 0xB0C1
    "01 0d 00 01 00 00 00 00 00 00 00 00 00 77",           // 11: ordinary 0x0001
    "01 0d 00 79 b1 00 00 00 00 00 00 00 00 ff",           // 12: ordinary 0xB179
};

std::string line(int number) {
    return kFilterBlobs.at(static_cast<std::size_t>(number - 1));
}

std::vector<std::string> hexOfAll(const std::vector<PlistData>& blobs) {
    std::vector<std::string> texts;
    for (const PlistData& blob : blobs) {
        texts.push_back(hexOf(blob));
    }
    return texts;
}

// Whether received is pattern repeated, starting anywhere in it.
::testing::AssertionResult isCyclicRun(const std::vector<std::string>& received,
                                       const std::vector<std::string>& pattern) {
    if (received.empty()) {
        return ::testing::AssertionFailure() << "nothing received";
    }
    const auto first = std::find(pattern.begin(), pattern.end(), received[0]);
    if (first == pattern.end()) {
        return ::testing::AssertionFailure() << "unexpected blob " << received[0];
    }
    const std::size_t phase = static_cast<std::size_t>(first - pattern.begin());
    for (std::size_t i = 0; i < received.size(); ++i) {
        if (received[i] != pattern[(phase + i) % pattern.size()]) {
            return ::testing::AssertionFailure() << "blob " << i << " is " << received[i] << ", expected "
                                                 << pattern[(phase + i) % pattern.size()];
        }
    }
    return ::testing::AssertionSuccess();
}

bool fileExists(const std::string& path) {
    struct stat info {};
    return lstat(path.c_str(), &info) == 0;
}

PlistValue dictionary(std::initializer_list<std::pair<std::string, PlistValue>> entries) {
    auto result = PlistDictionary::create();
    for (const auto& [key, value] : entries) {
        result->set(key, value);
    }
    return result;
}

TEST_F(ChannelTest, CreatesAChannelAndAnswersGetTechnologyForEachTechnology) {
    const struct {
        const char* option;
        const char* constant;
    } cases[] = {
        {"gsm", "kKxLogChannelTechnology_Orvane_GSM"},
        {"lte", "kKxLogChannelTechnology_Orvane_LTE"},
        {"utran", "kKxLogChannelTechnology_Orvane_UTRAN2"},
        {"cdma", "kKxLogChannelTechnology_Orvane_CDMA"},
        {"ifx", "kKxLogChannelTechnology_IFX"},
    };
    for (const auto& testCase : cases) {
        ServiceProcess& service = startService(
            {"--technology", testCase.option, "--source", "replay", "--input", dataPath("filter.hex")});
        KxTestClient& client = newClient();
        EXPECT_EQ(client.channelPortName(),
                  "com.velmar.kxserver.channel." + std::to_string(service.pid()) + ".1");
        EXPECT_TRUE(fileExists(runtime_.path() + "/" + client.channelPortName()));
        EXPECT_EQ(client.technology(), std::optional<std::string>(testCase.constant)) << testCase.option;
        EXPECT_TRUE(service.waitForError("<5> channel 1: created for receive port \"" +
                                         client.receivePortName() + "\", listening on " +
                                         client.channelPortName()));
        clients_.clear();
        service.sendSignal(SIGTERM);
        EXPECT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0));
    }
    // Without --technology the answer is LTE.
    startService({"--source", "replay", "--input", dataPath("filter.hex")});
    EXPECT_EQ(newClient().technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
}

TEST_F(ChannelTest, StartCommandSendsOnlyTheRequestedCodesInOrderAndByteExact) {
    ServiceProcess& service =
        startService({"--source", "replay", "--input", dataPath("filter.hex"), "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C1, 0xB179}, {1}));
    // Line 12 is the file's last blob and one the filter takes: when it is in, everything is.
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 5; })) << client.blobs().size();
    EXPECT_EQ(hexOfAll(client.blobs()),
              (std::vector<std::string>{line(1), line(3), line(5), line(8), line(12)}));
    EXPECT_TRUE(service.waitForError("<5> channel 1: streaming 2 log codes and 1 extra codes"));
    EXPECT_TRUE(service.waitForError("<5> replay: finished after 12 blobs"));
    queue_.runFor(0.2);
    EXPECT_EQ(client.blobs().size(), 5U);
}

TEST_F(ChannelTest, TheObjectBasedTechnologyStreamsEveryBlob) {
    ServiceProcess& service = startService(
        {"--technology", "ifx", "--source", "replay", "--input", dataPath("filter.hex"), "--fast"});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.send(dictionary({{"SetState", "Streaming"}})));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= kFilterBlobs.size(); }))
        << client.blobs().size();
    EXPECT_EQ(hexOfAll(client.blobs()), kFilterBlobs);
    EXPECT_TRUE(service.waitForError("<5> channel 1: streaming every blob"));
}

TEST_F(ChannelTest, NothingIsSentBeforeTheStartCommand) {
    startService({"--source", "replay", "--input", dataPath("filter.hex"), "--speed", "20", "--loop"});
    KxTestClient& streaming = newClient();
    KxTestClient& waiting = newClient();
    ASSERT_TRUE(streaming.start({0xB0C1}, {}));
    ASSERT_TRUE(waiting.technology());
    ASSERT_TRUE(runUntil([&] { return streaming.blobs().size() >= 12; }));
    EXPECT_TRUE(waiting.blobs().empty());
    ASSERT_TRUE(waiting.start({0xB0C2}, {}));
    ASSERT_TRUE(runUntil([&] { return waiting.blobs().size() >= 3; }));
    EXPECT_EQ(hexOfAll(waiting.blobs()), std::vector<std::string>(waiting.blobs().size(), line(2)));
}

TEST_F(ChannelTest, SeveralChannelsAtOnceEachGetTheirOwnCodes) {
    startService({"--source", "replay", "--input", dataPath("filter.hex"), "--speed", "20", "--loop"});
    KxTestClient& first = newClient();
    KxTestClient& second = newClient();
    KxTestClient& third = newClient();
    ASSERT_TRUE(first.start({0xB0C1}, {}));
    ASSERT_TRUE(second.start({0xB0C2, 0x00C1}, {0}));
    ASSERT_TRUE(third.start({0x0001}, {0xB0C1, 1}));
    ASSERT_TRUE(runUntil([&] {
        return first.blobs().size() >= 10 && second.blobs().size() >= 15 && third.blobs().size() >= 15;
    }));
    EXPECT_TRUE(isCyclicRun(hexOfAll(first.blobs()), {line(1), line(8)}));
    EXPECT_TRUE(isCyclicRun(hexOfAll(second.blobs()), {line(2), line(4), line(9)}));
    EXPECT_TRUE(isCyclicRun(hexOfAll(third.blobs()), {line(3), line(10), line(11)}));
}

TEST_F(ChannelTest, AStuckClientDoesNotStopAnotherAndItsDropsAreLogged) {
    const std::string capture = samplePath("mixed-large-1.qmdl");
    const std::vector<PlistData> expected = adaptedBlobsOfFile(capture);
    ASSERT_EQ(expected.size(), 47087U);
    const std::vector<std::int64_t> codes = codesOf(expected);

    ServiceProcess& service = startService({"--source", "replay", "--input", capture, "--fast", "--loop"});
    KxTestClient& reader = newClient();
    KxTestClient& stuck = newClient(false);
    ASSERT_TRUE(reader.start(codes, {}));
    ASSERT_TRUE(stuck.start(codes, {}));
    // Look at the service's log now and then while the reader keeps reading.
    auto lastLook = std::chrono::steady_clock::now();
    const auto logShows = [&](const std::string& text) {
        const auto now = std::chrono::steady_clock::now();
        if (now - lastLook < std::chrono::milliseconds(50)) {
            return false;
        }
        lastLook = now;
        return service.errorOutput().find(text) != std::string::npos;
    };
    ASSERT_TRUE(runUntil([&] { return logShows("<3> channel 2: dropped "); })) << reader.blobs().size();
    const std::size_t receivedSoFar = reader.blobs().size();
    ASSERT_TRUE(runUntil([&] { return reader.blobs().size() >= receivedSoFar + 5000; }));

    // The reader got the capture from its start, in order and whole: it was never the one dropping.
    const std::size_t compared = std::min(reader.blobs().size(), expected.size());
    for (std::size_t i = 0; i < compared; ++i) {
        ASSERT_EQ(reader.blobs()[i], expected[i]) << "blob " << i;
    }
    const std::regex dropLine(R"(<3> channel 2: dropped [1-9][0-9]* blobs \(queue full\))");
    std::size_t dropLines = 0;
    for (const std::string& text : linesOf(service.errorOutput())) {
        EXPECT_EQ(text.find("channel 1: dropped"), std::string::npos) << text;
        if (text.find("channel 2: dropped") != std::string::npos) {
            EXPECT_TRUE(std::regex_match(text, dropLine)) << text;
            ++dropLines;
        }
    }
    EXPECT_GE(dropLines, 1U);
    EXPECT_TRUE(stuck.blobs().empty());
}

TEST_F(ChannelTest, AClientThatGoesAwayEndsItsChannel) {
    ServiceProcess& service =
        startService({"--source", "replay", "--input", dataPath("filter.hex"), "--speed", "20", "--loop"});
    KxTestClient& leaving = newClient();
    ASSERT_TRUE(leaving.start({0xB0C1}, {}));
    ASSERT_TRUE(runUntil([&] { return leaving.blobs().size() >= 3; }));
    const std::string channelSocket = runtime_.path() + "/" + leaving.channelPortName();
    ASSERT_TRUE(fileExists(channelSocket));
    leaving.disconnect();

    ASSERT_TRUE(service.waitForError("<5> channel 1: client went away (")) << service.errorOutput();
    const std::regex closedLine(
        R"(<5> channel 1: client went away \([^)]*\); channel closed after [0-9]+ blobs sent, 0 dropped)");
    std::size_t closedLines = 0;
    for (const std::string& text : linesOf(service.errorOutput())) {
        if (text.find("channel 1: client went away") != std::string::npos) {
            EXPECT_TRUE(std::regex_match(text, closedLine)) << text;
            ++closedLines;
        }
    }
    EXPECT_EQ(closedLines, 1U);
    ASSERT_TRUE(runUntil([&] { return !fileExists(channelSocket); }));

    // The service goes on serving newcomers.
    KxTestClient& next = newClient();
    EXPECT_EQ(next.channelPortName(), "com.velmar.kxserver.channel." + std::to_string(service.pid()) + ".2");
    ASSERT_TRUE(next.start({0xB0C2}, {}));
    ASSERT_TRUE(runUntil([&] { return next.blobs().size() >= 2; }));
    EXPECT_EQ(hexOf(next.blobs()[0]), line(2));
}

TEST_F(ChannelTest, SigtermEndsEveryChannelRemovesTheSocketsAndExitsZero) {
    ServiceProcess& service =
        startService({"--source", "replay", "--input", dataPath("filter.hex"), "--speed", "20", "--loop"});
    KxTestClient& streaming = newClient();
    KxTestClient& idle = newClient();
    ASSERT_TRUE(streaming.start({0xB0C1}, {}));
    ASSERT_TRUE(runUntil([&] { return streaming.blobs().size() >= 2; }));
    const std::vector<std::string> serviceSockets = {runtime_.path() + "/com.velmar.kxserver",
                                                     runtime_.path() + "/" + streaming.channelPortName(),
                                                     runtime_.path() + "/" + idle.channelPortName()};
    for (const std::string& socketFile : serviceSockets) {
        EXPECT_TRUE(fileExists(socketFile)) << socketFile;
    }

    service.sendSignal(SIGTERM);
    EXPECT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0)) << service.errorOutput();
    for (const std::string& socketFile : serviceSockets) {
        EXPECT_FALSE(fileExists(socketFile)) << socketFile;
    }
    const std::vector<std::string> lines = linesOf(service.errorOutput());
    EXPECT_NE(std::find(lines.begin(), lines.end(), "<5> kxserverd: stopping on signal 15"), lines.end());
    EXPECT_EQ(std::count_if(lines.begin(), lines.end(),
                            [](const std::string& text) {
                                return text.rfind("<5> channel ", 0) == 0 &&
                                       text.find(": service stopping; channel closed after ") !=
                                           std::string::npos;
                            }),
              2);
    // The streaming client sees its receive port invalidated, as a monitor does when the service goes.
    EXPECT_TRUE(runUntil([&] { return !streaming.receivePortValid(); }));
}

TEST_F(ChannelTest, SigintAlsoExitsZero) {
    ServiceProcess& service = startService({"--source", "replay", "--input", dataPath("filter.hex")});
    newClient();
    service.sendSignal(SIGINT);
    EXPECT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0)) << service.errorOutput();
    EXPECT_FALSE(fileExists(runtime_.path() + "/com.velmar.kxserver"));
}

// Sends a raw control request and answers the reply's Error and Reason.
struct ErrorAnswer {
    std::int64_t domain = -1;
    std::int64_t error = -1;
    std::string reason;
    bool operator==(const ErrorAnswer&) const = default;
};

std::ostream& operator<<(std::ostream& out, const ErrorAnswer& answer) {
    return out << "{domain " << answer.domain << ", error " << answer.error << ", reason \"" << answer.reason
               << "\"}";
}

ErrorAnswer askRaw(MessagePort& port, const PlistData& request) {
    std::optional<PlistData> reply;
    ErrorAnswer answer;
    if (port.sendRequest(0, request, 10, 10, true, &reply) != kMessagePortSuccess || !reply) {
        return answer;
    }
    const std::optional<PlistValue> parsed = parsePropertyList(*reply);
    const PlistDictionaryRef fields = parsed ? parsed->dictionary() : nullptr;
    if (fields) {
        answer.domain = fields->get("Domain").integerValue().value_or(-1);
        answer.error = fields->get("Error").integerValue().value_or(-1);
        const std::string* reason = fields->get("Reason").string();
        answer.reason = reason ? *reason : "";
    }
    return answer;
}

PlistData encoded(const PlistValue& value) {
    return serializeXml(value).value_or(PlistData());
}

TEST_F(ChannelTest, MalformedControlRequestsAreAnsweredWithAnError) {
    ServiceProcess& service = startService({"--source", "replay", "--input", dataPath("filter.hex")});
    const std::shared_ptr<MessagePort> control = MessagePort::createRemote("com.velmar.kxserver");
    ASSERT_TRUE(control);
    const std::string garbage = "hello, service";
    EXPECT_EQ(askRaw(*control, PlistData(garbage.begin(), garbage.end())),
              (ErrorAnswer{1, 1, "request is not a property-list dictionary"}));
    EXPECT_EQ(askRaw(*control, encoded(PlistValue::newArray())),
              (ErrorAnswer{1, 1, "request is not a property-list dictionary"}));
    EXPECT_EQ(askRaw(*control, encoded(dictionary({{"ReceivePort", "com.velmar.test.x"}}))),
              (ErrorAnswer{1, 1, "request has no Request string"}));
    EXPECT_EQ(askRaw(*control, encoded(dictionary({{"Request", "Frobnicate"}}))),
              (ErrorAnswer{1, 1, "unknown request \"Frobnicate\""}));
    EXPECT_EQ(askRaw(*control, encoded(dictionary({{"Request", "CreateLogChannel"}}))),
              (ErrorAnswer{1, 1, "CreateLogChannel has no ReceivePort string"}));
    EXPECT_EQ(askRaw(*control, encoded(dictionary({{"Request", "CreateLogChannel"},
                                                   {"ReceivePort", PlistValue::integer(7)}}))),
              (ErrorAnswer{1, 1, "CreateLogChannel has no ReceivePort string"}));
    EXPECT_EQ(askRaw(*control,
                     encoded(dictionary({{"Request", "CreateLogChannel"}, {"ReceivePort", "../escape"}}))),
              (ErrorAnswer{1, 1, "ReceivePort \"../escape\" is not a port name"}));
    EXPECT_EQ(
        askRaw(*control, encoded(dictionary(
                             {{"Request", "CreateLogChannel"}, {"ReceivePort", "com.velmar.test.nobody"}}))),
        (ErrorAnswer{
            1, 2, "cannot connect to receive port \"com.velmar.test.nobody\": No such file or directory"}));

    EXPECT_TRUE(
        service.waitForError("<3> control request rejected: request is not a property-list dictionary"));
    EXPECT_TRUE(service.waitForError("<3> control request rejected: unknown request \"Frobnicate\""));
    EXPECT_TRUE(
        service.waitForError("<3> channel 1 not created: cannot connect to receive port "
                             "\"com.velmar.test.nobody\": No such file or "
                             "directory"));

    // The same connection still creates a channel when asked properly.
    KxTestClient& client = newClient();
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
}

TEST_F(ChannelTest, MalformedChannelCommandsAreAnsweredWithAnError) {
    ServiceProcess& service = startService({"--source", "replay", "--input", dataPath("filter.hex")});
    KxTestClient& client = newClient();
    const std::shared_ptr<MessagePort> channel = MessagePort::createRemote(client.channelPortName());
    ASSERT_TRUE(channel);
    const std::string garbage = "<plist";
    EXPECT_EQ(askRaw(*channel, PlistData(garbage.begin(), garbage.end())),
              (ErrorAnswer{1, 1, "command is not a property-list dictionary"}));
    EXPECT_EQ(askRaw(*channel, encoded(dictionary({{"Hello", PlistValue::integer(1)}}))),
              (ErrorAnswer{1, 1, "unknown command: neither GetTechnology nor SetState"}));
    EXPECT_EQ(askRaw(*channel, encoded(dictionary({{"SetState", PlistValue::integer(1)}}))),
              (ErrorAnswer{1, 1, "SetState is not a string"}));
    EXPECT_EQ(
        askRaw(*channel, encoded(dictionary({{"SetState", "Streaming"}, {"SetOrvaneLogCodes", "all"}}))),
        (ErrorAnswer{1, 1, "SetOrvaneLogCodes is not an array"}));
    EXPECT_TRUE(
        service.waitForError("<3> channel 1: start command rejected: SetOrvaneLogCodes is not an array"));
    // Codes outside 0..65535 are skipped and reported; the others count.
    auto codes = PlistArray::create();
    codes->append(PlistValue::integer(0xB0C1));
    codes->append(PlistValue::integer(-1));
    codes->append(PlistValue::integer(0x10000));
    codes->append("45250");
    ASSERT_TRUE(client.send(dictionary({{"SetState", "Streaming"}, {"SetOrvaneLogCodes", codes}})));
    EXPECT_TRUE(service.waitForError("<5> channel 1: streaming 1 log codes and 0 extra codes"));
    EXPECT_TRUE(service.waitForError("<3> channel 1: ignored 3 codes that are not integers from 0 to 65535"));
}

}  // namespace
}  // namespace velmar::testing
