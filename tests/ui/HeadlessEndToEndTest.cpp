// velmar --headless as a user runs it, against a real kxserverd: it connects and shows a tree that changes,
// survives the service being killed and reconnects when it is back, lets a second monitor find its port
// taken, redraws at most once per display tick, and ends cleanly on SIGTERM; and the same against a live
// modem (the emulator on a pseudo-terminal) that kxserverd finds by itself and that is unplugged and
// plugged in again.
#include <gtest/gtest.h>
#include <signal.h>

#include <chrono>
#include <cstdint>
#include <memory>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "tests/support/BackgroundProcess.h"
#include "tests/support/Json.h"
#include "tests/support/KxTestClient.h"
#include "tests/support/LiveModem.h"
#include "tests/support/ServiceProcess.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/ChangingValues.h"
#include "tests/ui/KxServerProcess.h"
#include "tools/modem-emulator/ModemEmulator.h"

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

TEST_F(HeadlessEndToEndTest, ASecondMonitorFindsItsPortTakenAndKeepsTrying) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    auto first = startMonitor(outputs_.path());
    ASSERT_TRUE(first->waitForOutput([](const std::string& out) { return connectedLines(out) >= 1; }, 30));

    testing::TemporaryDirectory secondOutputs;
    auto second = startMonitor(secondOutputs.path());
    ASSERT_TRUE(second->waitForError("Local messsage port already exists", 10)) << second->errorOutput();
    EXPECT_FALSE(second->waitForExit(1).has_value()) << "the second monitor gave up";
    EXPECT_EQ(second->errorOutput().find(" ***** Created ports"), std::string::npos);
    // The first one is not disturbed: it keeps redrawing with data.
    const std::size_t firstConnected = connectedLines(first->standardOutput());
    EXPECT_TRUE(first->waitForOutput(
        [&](const std::string& out) { return connectedLines(out) >= firstConnected + 2; }, 15));
    EXPECT_EQ(first->errorOutput().find("INVALIDATED"), std::string::npos) << first->errorOutput();
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
    testing::ModemEmulator::Settings settings;
    settings.capturePath = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/lte-connected-1.qmdl";
    settings.linkPath = sysfs.devicePath("ttyUSB0");
    // A pace that a monitor built with sanitizers decodes on a busy machine: each of these packets lists
    // dozens of neighbour cells.
    settings.packetsPerSecond = 20;
    testing::ModemEmulator modem(settings);
    std::string error;
    ASSERT_TRUE(modem.start(error)) << error;
    std::vector<std::string> serviceEnvironment = environment();
    serviceEnvironment.push_back("VELMAR_SYSROOT=" + root.path());
    serviceEnvironment.push_back("VELMAR_LOG_LEVEL=notice");
    // This process talks to the service too (as a second monitor): in the same runtime directory.
    setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
    struct Unset {
        ~Unset() { unsetenv("VELMAR_RUNTIME_DIR"); }
    } unset;
    testing::ServiceProcess service({"--source", "live", "--device", "auto", "--log-stderr"}, outputs_.path(),
                                    serviceEnvironment);
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
        << modem.packetsStreamed() << " packets streamed\n"
        << service.errorOutput() << monitor->errorOutput();
    EXPECT_EQ(modem.enabledCodes(), lteCodes);

    // A second monitor joins with another code, then leaves: the masks follow.
    PollMainQueue queue;
    const MainQueue::Handle tick = queue.repeating(0.01, [] {});
    {
        testing::KxTestClient second(queue, "second");
        ASSERT_TRUE(second.connect()) << second.error();
        ASSERT_TRUE(second.start({0xB193}, {}));
        Codes both = lteCodes;
        both.insert(0xB193);
        EXPECT_TRUE(queue.runUntil([&] { return modem.enabledCodes() == both; }, 30));
        EXPECT_TRUE(queue.runUntil([&] { return second.blobs().size() >= 5; }, 30));
        second.disconnect();
        EXPECT_TRUE(queue.runUntil([&] { return modem.enabledCodes() == lteCodes; }, 30));
    }
    queue.cancelTimer(tick);

    // Unplugged and plugged in again: the service heals by itself and the monitor goes on.
    modem.vanish();
    ASSERT_TRUE(service.waitForError(": the device went away (", 10)) << service.errorOutput();
    const std::size_t linesBefore = testing::linesOf(monitor->standardOutput()).size();
    ASSERT_TRUE(modem.comeBack());
    EXPECT_TRUE(testing::waitUntil([&] { return modem.enabledCodes() == lteCodes; }, 3.0))
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
    EXPECT_TRUE(modem.enabledCodes().empty());
    const std::vector<PlistData> requests = modem.requests();
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

// Every technology of the simulated baseband reaches the screen as a connected tree whose values change.
class HeadlessTechnologyTest : public HeadlessEndToEndTest,
                               public ::testing::WithParamInterface<const char*> {};

TEST_P(HeadlessTechnologyTest, TheSimulatedBasebandShowsALivingTree) {
    testing::KxServerProcess service(runtime_.path(), GetParam(), {"--rate-multiplier", "4"});
    ASSERT_TRUE(service.start()) << service.description();
    auto monitor = startMonitor(outputs_.path());
    std::vector<testing::LeafValues> snapshots;
    const bool changed = monitor->waitForOutput(
        [&](const std::string& out) {
            snapshots.clear();
            for (const HeadlessLine& line : headlessLines(out)) {
                if (line.connected && line.tree.isDictionary()) {
                    snapshots.push_back(testing::leavesOfJson(line.tree));
                }
            }
            return snapshots.size() >= 2 && !testing::busiestPane(snapshots).empty();
        },
        40);
    ASSERT_TRUE(changed) << snapshots.size() << " connected redraws\n" << monitor->errorOutput();
    EXPECT_GE(snapshots.back().size(), 5u) << "only " << snapshots.back().size() << " values shown";
}

INSTANTIATE_TEST_SUITE_P(EveryTechnology, HeadlessTechnologyTest,
                         ::testing::Values("gsm", "lte", "utran", "cdma", "ifx"),
                         [](const ::testing::TestParamInfo<const char*>& info) {
                             return std::string(info.param);
                         });

}  // namespace
}  // namespace velmar
