// kxserverd driving a modem's diagnostic port, run as a user runs it against the modem emulator on a
// pseudo-terminal: the start sequence, masks that follow the channels, logging off at the end, a silent
// device, a replug, hostile ports, error answers, trimmed masks, two SIMs, a recording, and device
// discovery.
#include <gtest/gtest.h>

#include <signal.h>
#include <sys/stat.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "logfile/DiagFraming.h"
#include "service/live/DiagCommands.h"
#include "tests/support/LiveModem.h"
#include "tests/support/Process.h"
#include "tests/support/ProcessCpu.h"
#include "tests/support/ServiceTestFixture.h"
#include "tools/modem-emulator/ModemEmulator.h"

namespace velmar::testing {
namespace {

using Bytes = std::vector<std::uint8_t>;
using Codes = std::set<std::uint16_t>;

// The LTE technology's start command.
const std::vector<std::int64_t> kLteCodes = {0xB0C2, 0xB0C1, 0xB179, 0xB17F, 0xB180, 0xB186};
const Codes kLteCodeSet = {0xB0C1, 0xB0C2, 0xB179, 0xB17F, 0xB180, 0xB186};

// Short answers where the protocol allows it, so that silent devices cost little time.
const std::vector<std::string> kQuickTiming = {"VELMAR_DIAG_RESPONSE_SECONDS=0.2"};

std::vector<std::string> hexesOf(const std::vector<PlistData>& requests, std::size_t from = 0) {
    std::vector<std::string> hexes;
    for (std::size_t i = from; i < requests.size(); ++i) {
        hexes.push_back(testing::hexOf(requests[i]));
    }
    return hexes;
}

// The blobs of a capture whose codes are in codes, in order.
std::vector<PlistData> blobsWithCodes(const std::vector<PlistData>& blobs, const Codes& codes) {
    std::vector<PlistData> kept;
    for (const PlistData& blob : blobs) {
        if (blob.size() >= 5 && codes.count(static_cast<std::uint16_t>(blob[3] | blob[4] << 8)) != 0) {
            kept.push_back(blob);
        }
    }
    return kept;
}

// Whether received starts the way expected does (as far as both go), a looped stream being allowed to
// wrap around.
bool startsLike(const std::vector<PlistData>& received, const std::vector<PlistData>& expected) {
    if (expected.empty()) {
        return received.empty();
    }
    for (std::size_t i = 0; i < received.size(); ++i) {
        if (received[i] != expected[i % expected.size()]) {
            ADD_FAILURE() << "blob " << i << ": " << testing::hexOf(received[i]) << " instead of "
                          << testing::hexOf(expected[i % expected.size()]);
            return false;
        }
    }
    return true;
}

class LiveModemTest : public ServiceTest {
  protected:
    ModemEmulator& startModem(const std::string& capture, double rate = 300,
                              std::function<void(ModemEmulator::Settings&)> adjust = {}) {
        ModemEmulator::Settings settings;
        settings.capturePath = capture.empty() ? "" : samplePath(capture);
        settings.packetsPerSecond = rate;
        settings.linkPath = modemPath();
        if (adjust) {
            adjust(settings);
        }
        modem_ = std::make_unique<ModemEmulator>(settings);
        std::string error;
        EXPECT_TRUE(modem_->start(error)) << error;
        return *modem_;
    }
    std::string modemPath() const { return files_.file("modem"); }

    ServiceProcess& startLive(std::vector<std::string> arguments = {},
                              std::vector<std::string> environment = kQuickTiming) {
        // ModemManager is not the subject here: its link stays off, and the logs hold only the port's lines.
        std::vector<std::string> all = {"--source",        "live", "--device", modemPath(),
                                        "--modem-manager", "off"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        return startService(all, environment);
    }

    // Turns the clients' queue until holds, looking every 10 ms: what the modem sees changes on its own
    // thread, without waking the queue.
    bool pollUntil(const std::function<bool()>& holds, double seconds = kWaitSeconds) {
        const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
        const bool held = runUntil(holds, seconds);
        queue_.cancelTimer(tick);
        return held;
    }
    bool waitForCodes(const Codes& codes, double seconds = kWaitSeconds) {
        return pollUntil([&] { return modem_->enabledCodes() == codes; }, seconds);
    }
    bool waitForRequests(std::size_t count, double seconds = kWaitSeconds) {
        return pollUntil([&] { return modem_->requestCount() >= count; }, seconds);
    }

    // The requests that the service sends when it starts: probe, identification, set-up.
    static std::vector<std::string> startSequence() {
        return {"00",
                "7c",
                "60 00",
                "7d 05 00 00 00 00 00 00",
                "73 00 00 00 00 00 00 00",
                "73 00 00 00 01 00 00 00"};
    }
    static std::vector<std::string> stopSequence() {
        return {"73 00 00 00 00 00 00 00", "60 00", "7d 05 00 00 00 00 00 00"};
    }

    std::unique_ptr<ModemEmulator> modem_;
};

TEST_F(LiveModemTest, ProbesSetsUpMasksThatFollowTheChannelsAndEndsWithLoggingOff) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl");
    ServiceProcess& service = startLive();
    ASSERT_TRUE(waitForRequests(6));
    EXPECT_EQ(hexesOf(modem.requests()), startSequence());
    EXPECT_TRUE(service.waitForError(
        "<5> live: " + modemPath() +
        ": diagnostic port answers: version VELMAREM, compiled Jan 01 2024 12:00:00, released Feb 02 2024 "
        "08:30:00\n<5> live: " +
        modemPath() +
        ": build id EMU.1.0.0-velmar, model velmar modem emulator, hardware version 0x000000E1, model id "
        "4660\n"))
        << service.errorOutput();
    EXPECT_TRUE(modem.enabledCodes().empty()) << "no channel streams yet";

    KxTestClient& first = newClient();
    ASSERT_TRUE(first.start(kLteCodes, {0, 1, 2}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet)) << service.errorOutput();
    // One mask for equipment id 11, of the reported range (0x209 items) since the wanted items fit in it.
    const std::vector<PlistData> requests = modem.requests();
    ASSERT_EQ(requests.size(), 7U);
    EXPECT_EQ(testing::hexOf(PlistData(requests[6].begin(), requests[6].begin() + 16)),
              "73 00 00 00 03 00 00 00 0b 00 00 00 09 02 00 00");
    EXPECT_EQ(requests[6].size(), 16U + 66U);
    EXPECT_TRUE(service.waitForError("<5> live: " + modemPath() +
                                     ": equipment id 11: logging 6 codes (mask of 0x209 items)\n"));

    // Values flow: the capture's packets of the wanted codes, in the capture's order, in the decoded layouts.
    const std::vector<PlistData> expected = blobsWithCodes(
        adaptedBlobs(captureBlobs(samplePath("lte-connected-1.qmdl"), std::nullopt)), kLteCodeSet);
    ASSERT_TRUE(runUntil([&] { return first.blobs().size() >= 40; }));
    EXPECT_TRUE(startsLike(first.blobs(), expected));

    // A second monitor joins with codes of two equipment ids: the masks become the union.
    KxTestClient& second = newClient();
    ASSERT_TRUE(second.start({0xB193, 0x7130}, {}));
    Codes both = kLteCodeSet;
    both.insert({0xB193, 0x7130});
    ASSERT_TRUE(waitForCodes(both)) << service.errorOutput();
    ASSERT_TRUE(runUntil([&] { return second.blobs().size() >= 10; }));
    EXPECT_EQ(codesOf(second.blobs()), std::vector<std::int64_t>{0xB193});

    // It leaves: its codes go from the masks, the emptied equipment id included.
    second.disconnect();
    ASSERT_TRUE(waitForCodes(kLteCodeSet)) << service.errorOutput();
    EXPECT_TRUE(service.waitForError("<5> live: " + modemPath() + ": equipment id 7: logging nothing\n"));

    // No channel streaming: logging off. Streaming again: the masks again.
    ASSERT_TRUE(first.stopStreaming());
    ASSERT_TRUE(waitForCodes({}));
    EXPECT_EQ(hexesOf(modem.requests()).back(), "73 00 00 00 00 00 00 00");
    EXPECT_TRUE(service.waitForError("<5> live: " + modemPath() + ": logging off (no channel streams)\n"));
    ASSERT_TRUE(first.start(kLteCodes, {}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet));

    // SIGTERM: the stop sequence, then the service ends.
    const std::size_t before = modem.requestCount();
    service.sendSignal(SIGTERM);
    const std::optional<int> status = service.waitForExit(kWaitSeconds);
    ASSERT_TRUE(status.has_value());
    EXPECT_EQ(*status, 0);
    EXPECT_EQ(hexesOf(modem.requests(), before), stopSequence());
    EXPECT_TRUE(modem.enabledCodes().empty());
    EXPECT_NE(service.errorOutput().find("<5> kxserverd: stopping on signal 15\n<5> live: " + modemPath() +
                                         ": logging off\n"),
              std::string::npos)
        << service.errorOutput();
    EXPECT_EQ(service.errorOutput().find("matches no request"), std::string::npos) << service.errorOutput();
}

TEST_F(LiveModemTest, ASilentDeviceIsRefusedWithItsPathNamed) {
    ModemEmulator& modem = startModem("");
    modem.setSilent(true);
    ServiceProcess service({"--source", "live", "--device", modemPath(), "--modem-manager", "off"},
                           files_.path(), kQuickTiming);
    const std::optional<int> status = service.waitForExit(kWaitSeconds);
    ASSERT_TRUE(status.has_value());
    EXPECT_EQ(*status, 1);
    EXPECT_EQ(service.errorOutput(), "kxserverd: " + modemPath() +
                                         ": no answer to a version request (2 tries, 0.2 s each): not a "
                                         "diagnostic port\n");
    EXPECT_EQ(hexesOf(modem.requests()), (std::vector<std::string>{"00", "00"}));
}

TEST_F(LiveModemTest, AReplugHealsByItselfWithoutBusyWaitingMeanwhile) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl");
    // The default timing: a vanished device is looked for every second.
    ServiceProcess& service = startLive({}, {});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 10; }));

    modem.vanish();
    ASSERT_TRUE(service.waitForError(": the device went away (")) << service.errorOutput();
    const double cpuBefore = processCpuSeconds(service.pid());
    const auto outageStart = std::chrono::steady_clock::now();
    // The outage lasts a few retries; the client keeps its channel all along.
    queue_.runFor(2.5);
    const double outage =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - outageStart).count();
    const double cpuDuring = processCpuSeconds(service.pid()) - cpuBefore;
    EXPECT_LT(cpuDuring, 0.1 * outage) << "the service spun while the device was away";
    EXPECT_TRUE(client.receivePortValid());
    const std::size_t blobsBefore = client.blobs().size();

    ASSERT_TRUE(modem.comeBack());
    // Probed again and the masks sent again within 3 s of the return.
    EXPECT_TRUE(waitForCodes(kLteCodeSet, 3.0)) << service.errorOutput();
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= blobsBefore + 10; })) << "values flow again";
    EXPECT_TRUE(service.waitForError("<5> live: " + modemPath() + ": the device is back\n"));
    EXPECT_EQ(occurrences(service.errorOutput(), "the device went away"), 1U) << service.errorOutput();
    const std::string gone = "<4> live: " + modemPath() + ": the device went away (";
    const std::size_t line = service.errorOutput().find(gone);
    ASSERT_NE(line, std::string::npos);
    const std::string rest = service.errorOutput().substr(line + gone.size());
    EXPECT_TRUE(rest.rfind("the device hung up); looking for it every 1 s\n", 0) == 0 ||
                rest.rfind("read failed: Input/output error); looking for it every 1 s\n", 0) == 0)
        << rest;
}

TEST_F(LiveModemTest, ADeviceThatStopsAnsweringIsLookedForAgain) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl");
    std::vector<std::string> environment = kQuickTiming;
    environment.push_back("VELMAR_DIAG_RETRY_SECONDS=0.2");
    ServiceProcess& service = startLive({}, environment);
    KxTestClient& first = newClient();
    ASSERT_TRUE(first.start(kLteCodes, {}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet));

    // The device keeps streaming but answers nothing: the next mask update gets no answer.
    modem.setSilent(true);
    KxTestClient& second = newClient();
    ASSERT_TRUE(second.start({0x7130}, {}));
    ASSERT_TRUE(
        service.waitForError("<4> live: " + modemPath() +
                             ": the device went away (it stopped answering: no answer to set log mask); "
                             "looking for it every 0.2 s\n"))
        << service.errorOutput();
    const std::size_t asked = modem.requestCount();
    // Looked for again without end while it stays silent, probed each time, said once.
    ASSERT_TRUE(pollUntil([&] { return modem.requestCount() >= asked + 4; }));
    EXPECT_EQ(occurrences(service.errorOutput(), "the device went away"), 1U);

    modem.setSilent(false);
    Codes both = kLteCodeSet;
    both.insert(0x7130);
    ASSERT_TRUE(waitForCodes(both)) << service.errorOutput();
    EXPECT_TRUE(service.waitForError("<5> live: " + modemPath() + ": the device is back\n"));
    EXPECT_TRUE(first.receivePortValid());
    EXPECT_TRUE(second.receivePortValid());
}

TEST_F(LiveModemTest, HostileBytesNeverStopTheStream) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl");
    ServiceProcess& service = startLive();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 5; }));

    // A frame far past every limit, an overlong response, a damaged frame: each described.
    Bytes overlong(300 * 1024, 0x41);
    overlong.push_back(0x7E);
    modem.sendRaw(overlong);
    Bytes longResponse(20000, 0x00);
    longResponse[0] = 0x4B;
    modem.sendFrame(longResponse);
    modem.sendRaw(Bytes{0x7E, 0x10, 0x00, 0x0C, 0x00, 0x0C, 0x00, 0x16, 0x41, 0,
                        0,    0,    0,    0,    0,    0,    0,    0x00, 0x00, 0x7E});
    EXPECT_TRUE(service.waitForError(": bad frame: frame longer than 262144 bytes\n"))
        << service.errorOutput();
    EXPECT_TRUE(service.waitForError(": bad frame: response of 20000 bytes is longer than 16384\n"))
        << service.errorOutput();
    EXPECT_TRUE(service.waitForError(": bad frame: CRC 0x0000 does not match the computed 0x"))
        << service.errorOutput();

    // Then a flood of garbage (frames of random bytes, none of which checks), and a stream written a few
    // bytes at a time.
    std::mt19937 random(7);
    Bytes garbage;
    constexpr std::size_t kSegment = 96;  // bytes between flags, no escapes among them
    while (garbage.size() < 512 * 1024) {
        Bytes segment(kSegment);
        for (std::uint8_t& byte : segment) {
            byte = static_cast<std::uint8_t>(random() % 0x7D);
        }
        const std::uint16_t crc = crc16X25(ByteView(segment.data(), kSegment - 2));
        if ((segment[kSegment - 2] | segment[kSegment - 1] << 8) == crc) {
            segment[0] ^= 1;  // not by chance a frame that checks
        }
        garbage.insert(garbage.end(), segment.begin(), segment.end());
        garbage.push_back(0x7E);
    }
    modem.sendRaw(garbage);
    ASSERT_TRUE(pollUntil([&] { return modem.outputPending() == 0; }));
    modem.splitWrites(true);
    const std::size_t before = client.blobs().size();
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= before + 30; })) << service.errorOutput();
    modem.splitWrites(false);
    for (const PlistData& blob : client.blobs()) {
        ASSERT_GE(blob.size(), 13U);
        EXPECT_EQ(kLteCodeSet.count(static_cast<std::uint16_t>(blob[3] | blob[4] << 8)), 1U) << hexOf(blob);
    }
    EXPECT_TRUE(client.receivePortValid());
    EXPECT_FALSE(service.waitForExit(0).has_value());

    // An answer that nobody asked for: another program on the port. Said once.
    const Bytes stray = {0x73, 0, 0, 0, 3, 0, 0, 0, 0, 0, 0, 0, 0x0B, 0, 0, 0, 0, 0, 0, 0};
    modem.sendFrame(stray);
    modem.sendFrame(stray);
    EXPECT_TRUE(service.waitForError("<4> live: " + modemPath() +
                                     ": a response (command 0x73) matches no request: another program is "
                                     "talking to the port; the udev rule 60-velmar-diag-port.rules keeps "
                                     "ModemManager away from it\n"));
    const std::size_t more = client.blobs().size();
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= more + 10; }));
    EXPECT_EQ(occurrences(service.errorOutput(), "matches no request"), 1U);
}

TEST_F(LiveModemTest, ErrorAnswersAreLoggedAndWhatWorksIsKept) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl");
    modem.setErrorResponse(live::kDiagBuildIdCommand, std::nullopt, 0x13);
    modem.setErrorResponse(live::kDiagLogConfigCommand, 3, 0x14);
    ServiceProcess& service = startLive();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    EXPECT_TRUE(service.waitForError("<4> live: " + modemPath() +
                                     ": build id request: refused: bad command (0x13)\n"))
        << service.errorOutput();
    EXPECT_TRUE(service.waitForError("<3> live: " + modemPath() +
                                     ": equipment id 11: set log mask refused: bad parameter (0x14)\n"))
        << service.errorOutput();
    EXPECT_TRUE(modem.enabledCodes().empty());

    // One equipment id fails, the other works.
    modem.clearErrorResponses();
    modem.setMaskStatus(7, 2);
    KxTestClient& second = newClient();
    ASSERT_TRUE(second.start({0x7130, 0xB193}, {}));
    Codes wanted = kLteCodeSet;
    wanted.insert(0xB193);
    ASSERT_TRUE(waitForCodes(wanted)) << service.errorOutput();
    EXPECT_TRUE(
        service.waitForError("<3> live: " + modemPath() + ": equipment id 7: set log mask failed: fail\n"))
        << service.errorOutput();
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 5; }));
    EXPECT_FALSE(service.waitForExit(0).has_value());
}

TEST_F(LiveModemTest, AMaskTheDeviceTrimsIsReported) {
    startModem("lte-connected-1.qmdl", 300, [](ModemEmulator::Settings& settings) {
        settings.trimToRanges = true;
        settings.ranges[0xB] = 0x100;
    });
    ServiceProcess& service = startLive();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    // N = 0x187 (the highest wanted item 0x186, above the reported 0x100); the device keeps 0x100 items.
    ASSERT_TRUE(waitForCodes({0xB0C1, 0xB0C2})) << service.errorOutput();
    EXPECT_TRUE(
        service.waitForError("<4> live: " + modemPath() +
                             ": equipment id 11: the device kept 256 of 391 mask items; 4 wanted codes "
                             "are not logged\n"))
        << service.errorOutput();
}

TEST_F(LiveModemTest, TheLowestSubscriptionOfATwoSimModemStreamsByDefault) {
    startModem("multisim-1.qmdl", 400,
               [](ModemEmulator::Settings& settings) { settings.wrapResponses = true; });
    ServiceProcess& service = startLive();
    KxTestClient& client = newClient();
    const std::string capture = samplePath("multisim-1.qmdl");
    ASSERT_TRUE(client.start(codesOf(blobsOfFile(capture)), {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 60; })) << service.errorOutput();
    EXPECT_TRUE(startsLike(client.blobs(), adaptedBlobs(captureBlobs(capture, 1))));
    EXPECT_TRUE(service.waitForError("<5> live: subscription 2: not streamed (streaming subscription 1)\n"));
    EXPECT_EQ(occurrences(service.errorOutput(), "not streamed"), 1U);
}

TEST_F(LiveModemTest, SubscriptionPicksAnotherSim) {
    startModem("multisim-1.qmdl", 400,
               [](ModemEmulator::Settings& settings) { settings.wrapResponses = true; });
    ServiceProcess& service = startLive({"--subscription", "2"});
    KxTestClient& client = newClient();
    const std::string capture = samplePath("multisim-1.qmdl");
    ASSERT_TRUE(client.start(codesOf(blobsOfFile(capture)), {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 60; })) << service.errorOutput();
    EXPECT_TRUE(startsLike(client.blobs(), adaptedBlobs(captureBlobs(capture, 2))));
    EXPECT_TRUE(service.waitForError("<5> live: subscription 1: not streamed (streaming subscription 2)\n"));
}

TEST_F(LiveModemTest, ARecordingDecodesToTheDisplayOfTheStreamedPackets) {
    ModemEmulator& modem = startModem("lte-connected-1.qmdl", 500);
    const std::string recording = files_.file("recorded.qmdl");
    ServiceProcess& service = startLive({"--record", recording});
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 150; }));
    // Logging off; once the last streamed packet has arrived, the service ends and closes the recording.
    ASSERT_TRUE(client.stopStreaming());
    ASSERT_TRUE(waitForCodes({}));
    ASSERT_TRUE(pollUntil([&] { return modem.packetsStreamed() == client.blobs().size(); }))
        << modem.packetsStreamed() << " streamed, " << client.blobs().size() << " received";
    service.sendSignal(SIGTERM);
    ASSERT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0));

    struct stat info {};
    ASSERT_EQ(stat(recording.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777, 0600U);
    const std::string streamed = files_.file("streamed.qmdl");
    const PlistData bytes = modem.streamedCapture();
    writeWholeFile(streamed, std::string(bytes.begin(), bytes.end()));
    EXPECT_EQ(captureBlobs(recording, std::nullopt), captureBlobs(streamed, std::nullopt));
    const ProcessResult fromRecording =
        runProcess({VELMAR_DECODE_PATH, "--technology", "lte", "--format", "qmdl", recording});
    const ProcessResult fromStream =
        runProcess({VELMAR_DECODE_PATH, "--technology", "lte", "--format", "qmdl", streamed});
    ASSERT_EQ(fromRecording.exitCode, 0) << fromRecording.err;
    EXPECT_EQ(fromRecording.out, fromStream.out);
    EXPECT_NE(fromRecording.out.find("\"Physical Cell ID\""), std::string::npos);
    EXPECT_TRUE(service.waitForError("<5> live: recording to " + recording + " closed after "));
}

TEST_F(LiveModemTest, AutoTakesTheFirstCandidateThatAnswers) {
    TemporaryDirectory root;
    FakeSysfs sysfs(root.path());
    // The most likely candidate stays silent; the next one is the modem.
    sysfs.addUsbSerialPort({"ttyUSB3", 3, 0xFF, 0xFF, 0x30, "2c7c", "0800", ""});
    sysfs.addUsbSerialPort({"ttyUSB0", 0, 0xFF, 0xFF, 0xFF, "abcd", "0002", "usb-Maker_Modem_42-if00-port0"});
    ModemEmulator silent(ModemEmulator::Settings{"", 0, sysfs.devicePath("ttyUSB3"), {}, false, false});
    std::string error;
    ASSERT_TRUE(silent.start(error)) << error;
    silent.setSilent(true);
    ModemEmulator& modem = startModem("lte-connected-1.qmdl", 300, [&](ModemEmulator::Settings& settings) {
        settings.linkPath = sysfs.devicePath("ttyUSB0");
    });
    std::vector<std::string> environment = kQuickTiming;
    environment.push_back("VELMAR_SYSROOT=" + root.path());
    ServiceProcess& service =
        startService({"--source", "live", "--device", "auto", "--modem-manager", "off"}, environment);
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start(kLteCodes, {}));
    ASSERT_TRUE(waitForCodes(kLteCodeSet)) << service.errorOutput();
    ASSERT_TRUE(runUntil([&] { return client.blobs().size() >= 10; }));
    EXPECT_TRUE(
        service.waitForError("<5> live: auto: using " + sysfs.devicePath("ttyUSB0") + "  " + root.path() +
                             "/dev/serial/by-id/usb-Maker_Modem_42-if00-port0  abcd:0002  interface 0 "
                             "(ff/ff/ff)\n"))
        << service.errorOutput();
    EXPECT_EQ(hexesOf(silent.requests()), (std::vector<std::string>{"00", "00"}));
    EXPECT_EQ(modem.requestCount(), 7U);
}

TEST_F(LiveModemTest, ListDevicesProbesEveryCandidate) {
    TemporaryDirectory root;
    FakeSysfs sysfs(root.path());
    sysfs.addUsbSerialPort({"ttyUSB2", 4, 0xFF, 0xFF, 0x30, "2c7c", "0800", "usb-Quick_Module-if04-port0"});
    sysfs.addUsbSerialPort({"ttyUSB0", 0, 0xFF, 0xFF, 0xFF, "abcd", "0001", ""});
    sysfs.addUsbSerialPort({"ttyUSB1", 2, 0xFF, 0x00, 0x00, "abcd", "0001", ""});
    sysfs.addUsbSerialPort({"ttyACM0", 0, 0x02, 0x02, 0x01, "1bc7", "1201", ""});
    ModemEmulator& modem = startModem(
        "", 0, [&](ModemEmulator::Settings& settings) { settings.linkPath = sysfs.devicePath("ttyUSB2"); });
    ModemEmulator silent(ModemEmulator::Settings{"", 0, sysfs.devicePath("ttyUSB0"), {}, false, false});
    std::string error;
    ASSERT_TRUE(silent.start(error)) << error;
    silent.setSilent(true);
    // ttyUSB1 has no device node.
    const ProcessResult result =
        runProcess({KXSERVERD_PATH, "--list-devices"}, "",
                   {"VELMAR_SYSROOT=" + root.path(), "VELMAR_DIAG_RESPONSE_SECONDS=0.2"});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    const std::string dev = root.path() + "/dev/";
    EXPECT_EQ(result.out,
              dev + "ttyUSB2  " + dev +
                  "serial/by-id/usb-Quick_Module-if04-port0  2c7c:0800  interface 4 (ff/ff/30)  answers\n" +
                  dev + "ttyUSB0  -  abcd:0001  interface 0 (ff/ff/ff)  silent\n" + dev +
                  "ttyUSB1  -  abcd:0001  interface 2 (ff/00/00)  cannot open: No such file or directory\n");
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(hexesOf(modem.requests()), std::vector<std::string>{"00"}) << "a probe and nothing else";
    EXPECT_TRUE(modem.enabledCodes().empty());

    TemporaryDirectory empty;
    const ProcessResult none =
        runProcess({KXSERVERD_PATH, "--list-devices"}, "", {"VELMAR_SYSROOT=" + empty.path()});
    EXPECT_EQ(none.exitCode, 0);
    EXPECT_EQ(none.out,
              "no candidate diagnostic port: no USB serial port with a vendor-specific interface\n");
}

}  // namespace
}  // namespace velmar::testing
