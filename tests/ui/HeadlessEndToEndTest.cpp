// velmar --headless as a user runs it, against a real kxserverd: it connects and shows a tree that changes,
// velmar --headless as a user runs it, against a real kxserverd: it connects and shows a tree that changes,
// survives the service being killed and shows living values again when it is back (every technology), lets
// four monitors share one service, finds a truly taken port name taken, clears the ports of killed
// monitors, redraws at most once per display tick whatever other clients do, and ends promptly on SIGTERM
// even under a flood; and the same against a live modem (the emulator on a pseudo-terminal) that kxserverd
// finds by itself and that is unplugged and plugged in again.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>

#include <chrono>
#include <cstdint>
#include <memory>
#include <numeric>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "tests/support/BackgroundProcess.h"
#include "tests/support/Json.h"
#include "tests/support/KxTestClient.h"
#include "tests/support/LiveModem.h"
#include "tests/support/ProcessStats.h"
#include "tests/support/RawPeer.h"
#include "tests/support/ServiceProcess.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/ChangingValues.h"
#include "tests/ui/KxServerProcess.h"
#include "tools/modem-emulator/ModemEmulator.h"

extern char** environ;

namespace velmar {
namespace {

// One JSON line of the headless monitor.
struct HeadlessLine {
    bool connected = false;
    std::string status;
    PlistValue tree;
};

std::vector<HeadlessLine> headlessLines(const std::string& output) {
    std::vector<HeadlessLine> lines;
    for (const std::string& text : testing::linesOf(output)) {
        const auto parsed = testing::parseJson(text);
        if (!parsed || !parsed->isDictionary()) {
            ADD_FAILURE() << "not a JSON object: " << text;
            continue;
        }
        const PlistDictionary& line = *parsed->dictionary();
        HeadlessLine entry;
        entry.connected = line.get("connected").booleanValue().value_or(false);
        entry.status = line.get("status").isString() ? *line.get("status").string() : std::string("?");
        entry.tree = line.get("tree");
        lines.push_back(std::move(entry));
    }
    return lines;
}

std::size_t connectedLines(const std::string& output) {
    std::size_t count = 0;
    for (const HeadlessLine& line : headlessLines(output)) {
        count += line.connected ? 1 : 0;
    }
    return count;
}

class HeadlessEndToEndTest : public ::testing::Test {
  protected:
    std::vector<std::string> environment() const {
        return {"VELMAR_RUNTIME_DIR=" + runtime_.path(),
                "XDG_CONFIG_HOME=" + config_.path(),
                "XDG_STATE_HOME=" + state_.path(),
                "DISPLAY=",
                "WAYLAND_DISPLAY=",
                "QT_QPA_PLATFORM="};
    }
    std::unique_ptr<testing::BackgroundProcess> startMonitor(const std::string& directory) const {
        return std::make_unique<testing::BackgroundProcess>(
            VELMAR_PATH, std::vector<std::string>{"--headless", "--log-stderr"}, directory, environment());
    }
    void TearDown() override { unsetenv("VELMAR_RUNTIME_DIR"); }

    // A modem on a pseudo-terminal reached through linkPath, streaming the LTE capture at packetsPerSecond.
    static std::unique_ptr<testing::ModemEmulator> startLteModem(const std::string& linkPath,
                                                                 double packetsPerSecond) {
        testing::ModemEmulator::Settings settings;
        settings.capturePath = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/lte-connected-1.qmdl";
        settings.linkPath = linkPath;
        settings.packetsPerSecond = packetsPerSecond;
        auto modem = std::make_unique<testing::ModemEmulator>(settings);
        std::string error;
        EXPECT_TRUE(modem->start(error)) << error;
        return modem;
    }
    // kxserverd --source live with arguments and the extra assignments, its notice lines on its standard
    // error, in this test's runtime directory; this process uses that directory too (to talk to the service
    // as a second monitor) until the test ends.
    std::unique_ptr<testing::ServiceProcess> startLiveService(
        const std::vector<std::string>& arguments, const std::vector<std::string>& assignments = {}) {
        std::vector<std::string> all = {"--source", "live"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        all.push_back("--log-stderr");
        std::vector<std::string> serviceEnvironment = environment();
        serviceEnvironment.push_back("VELMAR_LOG_LEVEL=notice");
        serviceEnvironment.insert(serviceEnvironment.end(), assignments.begin(), assignments.end());
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        return std::make_unique<testing::ServiceProcess>(all, outputs_.path(), serviceEnvironment);
    }

    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    testing::TemporaryDirectory outputs_;
};

TEST_F(HeadlessEndToEndTest, ConnectsAndShowsATreeThatChanges) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());

    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 5; }, 30))
        << monitor->standardOutput() << monitor->errorOutput();
    const std::vector<HeadlessLine> lines = headlessLines(monitor->standardOutput());
    // The launch line comes before the first connection.
    EXPECT_FALSE(lines.front().connected);
    EXPECT_EQ(lines.front().status, "Connecting");  // the root pane's own launch status, without dots
    std::vector<testing::LeafValues> snapshots;
    for (const HeadlessLine& line : lines) {
        if (line.connected) {
            ASSERT_TRUE(line.tree.isDictionary());
            EXPECT_EQ(line.status.rfind("Updated ", 0), 0u) << line.status;
            snapshots.push_back(testing::leavesOfJson(line.tree));
        }
    }
    EXPECT_FALSE(snapshots.back().empty());
    EXPECT_NE(testing::busiestPane(snapshots), "")
        << "no value changed over " << snapshots.size() << " redraws";
    EXPECT_EQ(testing::occurrences(monitor->errorOutput(), " ***** Created ports (send="), 1u)
        << monitor->errorOutput();
    EXPECT_NE(monitor->errorOutput().find("Got log generated: 0x"), std::string::npos);
}

TEST_F(HeadlessEndToEndTest, SurvivesTheServiceBeingKilledAndReconnectsWhenItIsBack) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 2; }, 30))
        << monitor->errorOutput();

    service.kill();
    ASSERT_TRUE(monitor->waitForError(" ***** INVALIDATED 0x", 10)) << monitor->errorOutput();
    EXPECT_FALSE(monitor->waitForExit(1).has_value()) << "the monitor ended with the service";
    const std::size_t linesBefore = testing::linesOf(monitor->standardOutput()).size();

    ASSERT_TRUE(service.start()) << service.description();
    // Reconnected within one retry period (5 s) and a display tick, and showing data again.
    ASSERT_TRUE(monitor->waitForOutput(
        [&](const std::string& out) {
            const std::vector<HeadlessLine> lines = headlessLines(out);
            return lines.size() > linesBefore && lines.back().connected;
        },
        15))
        << monitor->errorOutput();
    EXPECT_EQ(testing::occurrences(monitor->errorOutput(), " ***** INVALIDATED 0x"), 1u);
    EXPECT_EQ(testing::occurrences(monitor->errorOutput(), " ***** Created ports (send="), 2u)
        << monitor->errorOutput();
    const std::vector<HeadlessLine> lines = headlessLines(monitor->standardOutput());
    EXPECT_TRUE(lines.back().tree.isDictionary());
    // The generator of the first connection was destroyed at the restart: its class index's own lines went
    // to standard error (--log-stderr), not into the JSON lines.
    EXPECT_NE(monitor->errorOutput().find("Deallocing LTEClassIndex\nDeallocing ClassIndex\n"),
              std::string::npos);
}

std::string receivePortFileOf(const std::string& runtime, pid_t pid) {
    return runtime + "/com.velmar.Velmar." + std::to_string(pid) + ".BasebandStateReport.LogChannel";
}

bool fileExists(const std::string& path) {
    struct stat info {};
    return lstat(path.c_str(), &info) == 0;
}

TEST_F(HeadlessEndToEndTest, FourMonitorsShareOneService) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    testing::TemporaryDirectory outputs[4];
    std::vector<std::unique_ptr<testing::BackgroundProcess>> monitors;
    for (const testing::TemporaryDirectory& directory : outputs) {
        monitors.push_back(startMonitor(directory.path()));
    }
    for (const auto& monitor : monitors) {
        ASSERT_TRUE(
            monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 2; }, 30))
            << monitor->errorOutput();
    }
    for (const auto& monitor : monitors) {
        EXPECT_EQ(monitor->errorOutput().find("Local messsage port already exists"), std::string::npos);
        EXPECT_EQ(testing::occurrences(monitor->errorOutput(), " ***** Created ports (send="), 1u)
            << monitor->errorOutput();
        // Each under its own name.
        EXPECT_TRUE(fileExists(receivePortFileOf(runtime_.path(), monitor->pid())));
        const std::vector<HeadlessLine> lines = headlessLines(monitor->standardOutput());
        EXPECT_TRUE(lines.back().connected);
        EXPECT_EQ(lines.back().status.rfind("Updated ", 0), 0u) << lines.back().status;
    }
    // A monitor that goes removes its port; the others stream on.
    monitors[0]->sendSignal(SIGTERM);
    ASSERT_EQ(monitors[0]->waitForExit(10), std::optional<int>(0));
    EXPECT_FALSE(fileExists(receivePortFileOf(runtime_.path(), monitors[0]->pid())));
    const std::size_t before = connectedLines(monitors[3]->standardOutput());
    EXPECT_TRUE(monitors[3]->waitForOutput(
        [&](const std::string& out) { return connectedLines(out) >= before + 1; }, 10));
}

TEST_F(HeadlessEndToEndTest, AReceivePortNameTrulyTakenIsReportedAndTheMonitorKeepsTrying) {
    // Another listener holds the name this monitor process will use (its pid's): a child process binds it,
    // then becomes the monitor, the listener still open in its hands but no longer its own.
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    const std::string errPath = outputs_.file("velmar.err");
    std::vector<std::string> environmentStrings;
    for (char** entry = environ; *entry != nullptr; ++entry) {
        environmentStrings.push_back(*entry);
    }
    for (const std::string& assignment : environment()) {
        environmentStrings.push_back(assignment);
    }
    std::vector<char*> envp;
    for (std::string& assignment : environmentStrings) {
        envp.push_back(assignment.data());
    }
    envp.push_back(nullptr);
    const int errFd = open(errPath.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    const int nullFd = open("/dev/null", O_RDWR | O_CLOEXEC);
    const pid_t child = fork();
    if (child == 0) {
        const std::string path = receivePortFileOf(runtime_.path(), getpid());
        const int listener = socket(AF_UNIX, SOCK_SEQPACKET, 0);
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
        if (bind(listener, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
            listen(listener, 8) != 0) {
            _exit(90);
        }
        dup2(nullFd, STDIN_FILENO);
        dup2(nullFd, STDOUT_FILENO);
        dup2(errFd, STDERR_FILENO);
        char program[] = VELMAR_PATH;
        char headless[] = "--headless";
        char logStderr[] = "--log-stderr";
        char* argv[] = {program, headless, logStderr, nullptr};
        execve(program, argv, envp.data());
        _exit(127);
    }
    close(errFd);
    close(nullFd);
    ASSERT_GT(child, 0);
    const auto errorOutput = [&] { return testing::readWholeFile(errPath); };
    EXPECT_TRUE(testing::waitUntil(
        [&] { return errorOutput().find("<3> Local messsage port already exists") != std::string::npos; },
        10))
        << errorOutput();
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, WNOHANG), 0) << "the monitor gave up";
    EXPECT_EQ(errorOutput().find(" ***** Created ports"), std::string::npos);
    EXPECT_NE(errorOutput().find("<3> Could not create the ports necessary"), std::string::npos);
    kill(child, SIGTERM);
    waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
}

TEST_F(HeadlessEndToEndTest, TheReceivePortOfAKilledMonitorIsClearedByTheNext) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto killed = startMonitor(outputs_.path());
    ASSERT_TRUE(killed->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    const std::string leftBehind = receivePortFileOf(runtime_.path(), killed->pid());
    killed->sendSignal(SIGKILL);
    killed->waitForExit(10);
    ASSERT_TRUE(fileExists(leftBehind));
    testing::TemporaryDirectory nextOutputs;
    auto next = startMonitor(nextOutputs.path());
    ASSERT_TRUE(next->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    EXPECT_FALSE(fileExists(leftBehind));
}

TEST_F(HeadlessEndToEndTest, AnotherProcessCannotEndTheMonitorsChannelThroughItsReceivePort) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    // A stranger of the same user connects to the monitor's receive port, sends a blob and hangs up.
    const std::string receivePort = receivePortFileOf(runtime_.path(), monitor->pid());
    const pid_t stranger = fork();
    if (stranger == 0) {
        testing::RawPeer peer(receivePort);
        peer.send(0, 0, std::string(20, '\x01'));
        _exit(peer.connected() ? 0 : 3);
    }
    int status = 0;
    ASSERT_EQ(waitpid(stranger, &status, 0), stranger);
    EXPECT_TRUE(monitor->waitForError("Refused a connection from pid " + std::to_string(stranger) +
                                          " on port " + receivePort.substr(runtime_.path().size() + 1) +
                                          ", which serves pid ",
                                      10))
        << monitor->errorOutput();
    const std::size_t before = connectedLines(monitor->standardOutput());
    EXPECT_TRUE(monitor->waitForOutput(
        [&](const std::string& out) { return connectedLines(out) >= before + 1; }, 10));
    EXPECT_EQ(monitor->errorOutput().find("INVALIDATED"), std::string::npos) << monitor->errorOutput();
}

TEST_F(HeadlessEndToEndTest, ANeverReadingClientDoesNotStopTheMonitorsRedraws) {
    testing::KxServerProcess service(runtime_.path(), "lte", {"--rate-multiplier", "4", "--log-stderr"});
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    // A client sends request after request and reads none of the answers.
    testing::RawPeer greedy(runtime_.path() + "/com.velmar.kxserver");
    ASSERT_TRUE(greedy.connected());
    const std::size_t before = connectedLines(monitor->standardOutput());
    const auto start = std::chrono::steady_clock::now();
    int sent = 0;
    while (std::chrono::steady_clock::now() - start < std::chrono::seconds(7)) {
        if (greedy.send(0, testing::RawPeer::kReplyWanted, "<plist><dict/></plist>")) {
            ++sent;
        } else {
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
    }
    // Every tick of those seven seconds brought a redraw with new data.
    const std::size_t redraws = connectedLines(monitor->standardOutput()) - before;
    std::printf("%d requests left unread; %zu redraws in 7 s\n", sent, redraws);
    EXPECT_GE(redraws, 3u);
    EXPECT_EQ(monitor->errorOutput().find("INVALIDATED"), std::string::npos) << monitor->errorOutput();
    EXPECT_NE(service.errorOutput().find("it does not read its replies"), std::string::npos)
        << service.errorOutput();
}

TEST_F(HeadlessEndToEndTest, AFloodedMonitorHonoursSigtermPromptly) {
    // The service replays a large capture as fast as the monitor takes it: the monitor's port never runs dry.
    const std::string capture = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl";
    testing::KxServerProcess service(runtime_.path(), "gsm",
                                     {"--source", "replay", "--fast", "--loop", "--input", capture});
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 2; }, 30))
        << monitor->errorOutput();
    const auto signalled = std::chrono::steady_clock::now();
    monitor->sendSignal(SIGTERM);
    const std::optional<int> status = monitor->waitForExit(10);
    const double latency =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - signalled).count();
    std::printf("the flooded monitor ended %.0f ms after SIGTERM\n", 1000 * latency);
    ASSERT_EQ(status, std::optional<int>(0));
    EXPECT_LT(latency, 5.0);
}

TEST_F(HeadlessEndToEndTest, AFollowedPathOfThousandsOfPartsCostsMemoryInProportionToItsLength) {
    // No service: the launch line comes at once. The followed panes are made before it.
    const auto residentWith = [&](const std::string& path) -> std::size_t {
        testing::TemporaryDirectory directory;
        testing::BackgroundProcess monitor(VELMAR_PATH, {"--headless", "--path", path}, directory.path(),
                                           environment());
        EXPECT_TRUE(monitor.waitForOutput([](const std::string& out) { return !out.empty(); }, 30));
        const std::size_t kib = testing::residentKibOf(monitor.pid());
        monitor.sendSignal(SIGTERM);
        EXPECT_EQ(monitor.waitForExit(10), std::optional<int>(0));
        return kib;
    };
    std::string deep;
    for (int i = 0; i < 30000; ++i) {
        deep += "/x";
    }
    const std::size_t shallow = residentWith("/x");
    const std::size_t many = residentWith(deep);
    std::printf("resident memory: %zu KiB with one part, %zu KiB with 30000\n", shallow, many);
    // Each prefix written out would take 30000 × 30000 bytes; the panes share one copy.
    EXPECT_LT(many, shallow + 32 * 1024);
}

TEST_F(HeadlessEndToEndTest, RedrawsAtMostOncePerDisplayTickUnderAFastStream) {
    // Twenty times the baseband's rates: many blobs per tick, still one redraw per tick at most.
    testing::KxServerProcess service(runtime_.path(), "lte", {"--rate-multiplier", "20"});
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    const auto started = std::chrono::steady_clock::now();
    const std::size_t before = testing::linesOf(monitor->standardOutput()).size();
    std::this_thread::sleep_for(std::chrono::seconds(9));
    const std::size_t after = testing::linesOf(monitor->standardOutput()).size();
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
    // The display timer ticks every 2 s; one line per redraw.
    EXPECT_LE(after - before, static_cast<std::size_t>(seconds / 2.0) + 1);
    EXPECT_GE(after - before, 3u) << "the monitor stopped redrawing";
}

TEST_F(HeadlessEndToEndTest, SigtermEndsTheMonitorWithStatusZero) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    ASSERT_TRUE(monitor->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));
    monitor->sendSignal(SIGTERM);
    const auto status = monitor->waitForExit(10);
    ASSERT_TRUE(status.has_value());
    EXPECT_EQ(*status, 0);
}

TEST_F(HeadlessEndToEndTest, ALiveModemFoundByItselfGivesALivingMonitorThatSurvivesAReplug) {
    using Codes = std::set<std::uint16_t>;
    const Codes lteCodes = {0xB0C1, 0xB0C2, 0xB179, 0xB17F, 0xB180, 0xB186};
    testing::TemporaryDirectory root;
    testing::FakeSysfs sysfs(root.path());
    sysfs.addUsbSerialPort({"ttyUSB0", 0, 0xFF, 0xFF, 0x30, "abcd", "0003", "usb-Maker_Modem_7-if00-port0"});
    // A pace that a monitor built with sanitizers decodes on a busy machine: each of these packets lists
    // dozens of neighbour cells.
    const std::unique_ptr<testing::ModemEmulator> modem = startLteModem(sysfs.devicePath("ttyUSB0"), 20);
    ASSERT_FALSE(::testing::Test::HasFailure());
    const std::unique_ptr<testing::ServiceProcess> running =
        startLiveService({"--device", "auto", "--modem-manager", "off"}, {"VELMAR_SYSROOT=" + root.path()});
    testing::ServiceProcess& service = *running;
    ASSERT_TRUE(service.waitUntilServing(30)) << service.errorOutput();
    testing::TemporaryDirectory monitorOutputs;
    auto monitor = startMonitor(monitorOutputs.path());

    // The capture's values on screen: its LTE intra-frequency measurement is on E-ARFCN 2075.
    const auto showsTheCapture = [](const std::string& out) {
        for (const HeadlessLine& line : headlessLines(out)) {
            for (const auto& [path, value] : testing::leavesOfJson(line.tree)) {
                if (line.connected && path.ends_with("Intra-frequency Measurement/E-ARFCN") &&
                    value == "2075") {
                    return true;
                }
            }
        }
        return false;
    };
    ASSERT_TRUE(monitor->waitForOutput(showsTheCapture, 30))
        << modem->packetsStreamed() << " packets streamed\n"
        << service.errorOutput() << monitor->errorOutput();
    EXPECT_EQ(modem->enabledCodes(), lteCodes);

    // A second monitor joins with another code, then leaves: the masks follow.
    PollMainQueue queue;
    const MainQueue::Handle tick = queue.repeating(0.01, [] {});
    {
        testing::KxTestClient second(queue, "second");
        ASSERT_TRUE(second.connect()) << second.error();
        ASSERT_TRUE(second.start({0xB193}, {}));
        Codes both = lteCodes;
        both.insert(0xB193);
        EXPECT_TRUE(queue.runUntil([&] { return modem->enabledCodes() == both; }, 30));
        EXPECT_TRUE(queue.runUntil([&] { return second.blobs().size() >= 5; }, 30));
        second.disconnect();
        EXPECT_TRUE(queue.runUntil([&] { return modem->enabledCodes() == lteCodes; }, 30));
    }
    queue.cancelTimer(tick);

    // Unplugged and plugged in again: the service heals by itself and the monitor goes on.
    modem->vanish();
    ASSERT_TRUE(service.waitForError(": the device went away (", 10)) << service.errorOutput();
    const std::size_t linesBefore = testing::linesOf(monitor->standardOutput()).size();
    ASSERT_TRUE(modem->comeBack());
    EXPECT_TRUE(testing::waitUntil([&] { return modem->enabledCodes() == lteCodes; }, 3.0))
        << service.errorOutput();
    EXPECT_TRUE(monitor->waitForOutput(
        [&](const std::string& out) {
            const std::vector<HeadlessLine> lines = headlessLines(out);
            return lines.size() >= linesBefore + 2 && lines.back().connected;
        },
        15));
    EXPECT_TRUE(
        service.waitForError("<5> live: " + sysfs.devicePath("ttyUSB0") + ": the device is back\n", 10));
    EXPECT_EQ(monitor->errorOutput().find("INVALIDATED"), std::string::npos) << "the channel survived";

    // SIGTERM leaves the modem with logging off.
    service.sendSignal(SIGTERM);
    EXPECT_EQ(service.waitForExit(10), std::optional<int>(0));
    EXPECT_TRUE(modem->enabledCodes().empty());
    const std::vector<PlistData> requests = modem->requests();
    ASSERT_GE(requests.size(), 3U);
    EXPECT_EQ(testing::hexOf(requests[requests.size() - 3]), "73 00 00 00 00 00 00 00");
    EXPECT_EQ(testing::hexOf(requests[requests.size() - 2]), "60 00");
    EXPECT_EQ(testing::hexOf(requests[requests.size() - 1]), "7d 05 00 00 00 00 00 00");
}

// A real capture of today's firmware, replayed by the service, reaches the screen with its true values: the
// service rewrites the newer record versions into the layouts the monitor decodes.
TEST_F(HeadlessEndToEndTest, AReplayedCaptureShowsItsTrueValues) {
    const std::string capture = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/lte-connected-1.qmdl";
    const auto service = testing::KxServerProcess::replaying(runtime_.path(), "lte", capture);
    ASSERT_TRUE(service->start()) << service->description();
    auto monitor = startMonitor(outputs_.path());
    const std::string rsrp =
        "/Serving Cell/Connected mode LTE Intra-frequency Measurement/Serving Filtered RSRP";
    testing::LeafValues shown;
    std::set<std::string> neighbours;
    const bool complete = monitor->waitForOutput(
        [&](const std::string& out) {
            for (const HeadlessLine& line : headlessLines(out)) {
                if (line.connected && line.tree.isDictionary()) {
                    shown = testing::leavesOfJson(line.tree);
                    for (const auto& [path, value] : shown) {
                        if (path.starts_with("/Neighbor Cells/Measured Neighbor Cells/") &&
                            path.ends_with("/Physical Cell ID")) {
                            neighbours.insert(value);
                        }
                    }
                }
            }
            // The last 0xB179 record of the capture: serving RSRP -111.4375 dBm.
            return shown[rsrp] == "-111.50 dBm";
        },
        30);
    ASSERT_TRUE(complete) << monitor->standardOutput() << monitor->errorOutput();
    EXPECT_EQ(shown["/Serving Cell/Serving Cell Info/Physical Cell ID"], "42");
    EXPECT_EQ(shown["/Serving Cell/Serving Cell Info/Download Frequency"], "2075");
    EXPECT_EQ(shown["/Serving Cell/Serving Cell Info/Upload Frequency"], "20075");
    EXPECT_EQ(shown["/Serving Cell/Serving Cell Info/Download Bandwidth"], "15 MHz");
    EXPECT_EQ(shown["/Serving Cell/Serving Cell Info/Freq Band Indicator"], "4");
    EXPECT_EQ(shown["/Serving Cell/Connected mode LTE Intra-frequency Measurement/E-ARFCN"], "2075");
    EXPECT_EQ(shown["/Serving Cell/Connected mode LTE Intra-frequency Measurement/Serving Physical Cell ID"],
              "42");
    EXPECT_TRUE(neighbours.contains("472")) << neighbours.size();
    EXPECT_TRUE(neighbours.contains("54")) << neighbours.size();
}

// A live modem whose SIM, bearers and cells come from a ModemManager-shaped service on a private bus (the
// real ModemManager needs modem hardware): "SIM Info", "PDP Context Info" and the serving-cell keys that
// the cell monitor feeds fill in; the modem goes away (the values stay, the service lives) and comes back.
TEST_F(HeadlessEndToEndTest, ModemManagerFillsTheSimContextsAndCellMonitorKeys) {
    testing::TemporaryDirectory files;
    testing::BackgroundProcess bus(
        "/usr/bin/dbus-daemon",
        {"--session", "--nofork", "--print-address=1", "--address=unix:path=" + files.path() + "/bus"},
        files.path());
    ASSERT_TRUE(
        bus.waitForOutput([](const std::string& out) { return out.find('\n') != std::string::npos; }, 30))
        << bus.errorOutput();
    const std::string address = bus.standardOutput().substr(0, bus.standardOutput().find('\n'));
    testing::BackgroundProcess fake(FAKE_MODEM_MANAGER_PATH, {address}, files.path());
    ASSERT_TRUE(fake.waitForOutput(
        [](const std::string& out) { return out.find("ready\n") != std::string::npos; }, 30))
        << fake.errorOutput();
    const std::string modemLink = files.path() + "/modem";
    const std::unique_ptr<testing::ModemEmulator> modem = startLteModem(modemLink, 20);
    ASSERT_FALSE(::testing::Test::HasFailure());
    const std::unique_ptr<testing::ServiceProcess> running =
        startLiveService({"--device", modemLink, "--bus-address", address});
    testing::ServiceProcess& service = *running;
    ASSERT_TRUE(service.waitUntilServing(30)) << service.errorOutput();
    auto monitor = startMonitor(files.path());

    // Each fact shows in some connected redraw (the capture's own serving-cell records overwrite some of
    // the cell monitor's keys between two of its arrays).
    std::set<std::string> seen;
    const auto showsAll = [&seen](const std::string& out) {
        seen.clear();
        for (const HeadlessLine& line : headlessLines(out)) {
            if (!line.connected) {
                continue;
            }
            for (const auto& [path, value] : testing::leavesOfJson(line.tree)) {
                if (path.ends_with("SIM Info/EF-ICCID") && value == "8900101234567890123") {
                    seen.insert("iccid");
                } else if (path.ends_with("SIM Info/EF-MSISDN") && value == "+15555550123") {
                    seen.insert("msisdn");
                } else if (path.find("PDP Context Info") != std::string::npos && value == "internet.test") {
                    seen.insert("first bearer");
                } else if (path.find("PDP Context Info") != std::string::npos && value == "ims.test") {
                    seen.insert("second bearer");
                } else if (path.ends_with("Serving Cell Info/UARFCN") && value == "1300") {
                    seen.insert("uarfcn");
                } else if (path.ends_with("Serving Cell Info/Tracking Area Code") && value == "6699") {
                    seen.insert("tac");
                } else if (path.ends_with("Serving Cell Info/Freq Band Indicator") && value == "3") {
                    seen.insert("band");
                } else if (path.ends_with("PDP Context Info/1/Context ID") && value == "1") {
                    seen.insert("context id");
                }
            }
        }
        return seen.size() == 8;
    };
    ASSERT_TRUE(monitor->waitForOutput(showsAll, 30))
        << "seen: "
        << std::accumulate(seen.begin(), seen.end(), std::string(),
                           [](std::string all, const std::string& one) { return all + one + "; "; })
        << "\n"
        << service.errorOutput() << monitor->errorOutput();

    // The modem goes: the service says so once and lives on, the monitor keeps the last values.
    fake.sendSignal(SIGUSR1);
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no modem; ", 10)) << service.errorOutput();
    const std::size_t linesBefore = testing::linesOf(monitor->standardOutput()).size();
    EXPECT_TRUE(monitor->waitForOutput(
        [&](const std::string& out) {
            const std::vector<HeadlessLine> lines = headlessLines(out);
            if (lines.size() < linesBefore + 2 || !lines.back().connected) {
                return false;
            }
            for (const auto& [path, value] : testing::leavesOfJson(lines.back().tree)) {
                if (path.ends_with("SIM Info/EF-ICCID")) {
                    return value == "8900101234567890123";
                }
            }
            return false;
        },
        15))
        << monitor->standardOutput().substr(0, 2000);
    fake.sendSignal(SIGUSR2);
    EXPECT_TRUE(testing::waitUntil(
        [&] {
            const std::string err = service.errorOutput();
            const std::string line =
                "<5> modem-manager: using modem /org/freedesktop/ModemManager1/Modem/0\n";
            const std::size_t first = err.find(line);
            return first != std::string::npos && err.find(line, first + line.size()) != std::string::npos;
        },
        10))
        << service.errorOutput();
    EXPECT_FALSE(service.waitForExit(0).has_value());
}

// Every technology of the simulated baseband reaches the screen as a connected tree whose values change.
class HeadlessTechnologyTest : public HeadlessEndToEndTest,
                               public ::testing::WithParamInterface<const char*> {};

TEST_P(HeadlessTechnologyTest, TheSimulatedBasebandShowsALivingTreeAgainAfterTheServiceIsKilled) {
    auto service = std::make_unique<testing::KxServerProcess>(
        runtime_.path(), GetParam(), std::vector<std::string>{"--rate-multiplier", "4"});
    ASSERT_TRUE(service->start()) << service->description();
    auto monitor = startMonitor(outputs_.path());
    // The connected redraws from line `from` on, and whether their values changed.
    std::vector<testing::LeafValues> snapshots;
    const auto changesFrom = [&](std::size_t from) {
        return [&, from](const std::string& out) {
            snapshots.clear();
            const std::vector<HeadlessLine> lines = headlessLines(out);
            for (std::size_t i = from; i < lines.size(); ++i) {
                if (lines[i].connected && lines[i].tree.isDictionary()) {
                    snapshots.push_back(testing::leavesOfJson(lines[i].tree));
                }
            }
            return snapshots.size() >= 2 && !testing::busiestPane(snapshots).empty();
        };
    };
    ASSERT_TRUE(monitor->waitForOutput(changesFrom(0), 40)) << snapshots.size() << " connected redraws\n"
                                                            << monitor->errorOutput();
    EXPECT_GE(snapshots.back().size(), 5u) << "only " << snapshots.back().size() << " values shown";

    // The service dies as a crash would and comes back with another seed: the values live again.
    service->kill();
    ASSERT_TRUE(monitor->waitForError(" ***** INVALIDATED 0x", 10)) << monitor->errorOutput();
    const std::size_t linesBefore = testing::linesOf(monitor->standardOutput()).size();
    service = std::make_unique<testing::KxServerProcess>(
        runtime_.path(), GetParam(), std::vector<std::string>{"--rate-multiplier", "4", "--seed", "7"});
    const auto restarted = std::chrono::steady_clock::now();
    ASSERT_TRUE(service->start()) << service->description();
    ASSERT_TRUE(monitor->waitForOutput(changesFrom(linesBefore), 40))
        << snapshots.size() << " connected redraws since the restart, none changed\n"
        << monitor->errorOutput();
    std::printf("%s: values changed again %.1f s after the service restarted\n", GetParam(),
                std::chrono::duration<double>(std::chrono::steady_clock::now() - restarted).count());
    EXPECT_EQ(testing::occurrences(monitor->errorOutput(), " ***** Created ports (send="), 2u)
        << monitor->errorOutput();
}

INSTANTIATE_TEST_SUITE_P(EveryTechnology, HeadlessTechnologyTest,
                         ::testing::Values("gsm", "lte", "utran", "cdma", "ifx"),
                         [](const ::testing::TestParamInfo<const char*>& info) {
                             return std::string(info.param);
                         });

}  // namespace
}  // namespace velmar
