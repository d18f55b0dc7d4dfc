// kxserverd --source live with its ModemManager link, run as a user runs it: the modem emulator on a
// pseudo-terminal as the diagnostic port, and a private dbus-daemon on which a ModemManager-shaped service
// (fake-modem-manager: one modem with a SIM, two connected bearers, an LTE serving cell and two neighbours)
// stands in for ModemManager, which cannot run here without modem hardware. A client asks for the three
// extra records and reads what arrives.
#include <gtest/gtest.h>

#include <signal.h>

#include <cstdlib>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/plist/PlistCodec.h"
#include "service/BasebandBlob.h"
#include "tests/support/BackgroundProcess.h"
#include "tests/support/LiveModem.h"
#include "tests/support/ServiceTestFixture.h"
#include "tools/modem-emulator/ModemEmulator.h"

namespace velmar::testing {
namespace {

const std::string kUsing = "<5> modem-manager: using modem /org/freedesktop/ModemManager1/Modem/0\n";
const std::string kUsingSecond = "<5> modem-manager: using modem /org/freedesktop/ModemManager1/Modem/1\n";
const std::string kOff = "no SIM files, cell list or data contexts until";

// What fake-modem-manager's SIMs hold: SIM/0 of Modem/0 and SIM/1 of Modem/1.
struct SimIdentities {
    std::string iccid;
    std::string imsi;
    std::string msisdn;
};
const SimIdentities kFirstSim = {"8900101234567890123", "001010123456789", "+15555550123"};
const SimIdentities kSecondSim = {"8900109876543210987", "001010987654321", "+15555550199"};

// The property list of each received extra record of code, in order of arrival.
std::vector<PlistValue> extraRecords(const std::vector<PlistData>& blobs, std::uint16_t code) {
    std::vector<PlistValue> records;
    for (const PlistData& blob : blobs) {
        const BasebandBlob framed = frameBasebandBlob(ByteView(blob.data(), blob.size()));
        if (framed.kind == BlobKind::Extended && framed.code == code && blob.size() > 13) {
            if (auto value = parsePropertyList(std::span(blob).subspan(13))) {
                records.push_back(std::move(*value));
            }
        }
    }
    return records;
}

// ModemManager names a port by its device name: the last part of the path that link leads to.
std::string deviceName(const std::string& link) {
    char* real = realpath(link.c_str(), nullptr);
    if (real == nullptr) {
        return "(no device)";
    }
    const std::string device = real;
    std::free(real);  // NOLINT(cppcoreguidelines-no-malloc): realpath allocates with malloc
    return device.substr(device.rfind('/') + 1);
}

std::string textAt(const PlistValue& dictionary, const std::string& key) {
    if (!dictionary.isDictionary()) {
        return "(not a dictionary)";
    }
    const PlistValue* value = dictionary.dictionary()->find(key);
    return value != nullptr && value->isString() ? *value->string() : "(none)";
}

std::int64_t numberAt(const PlistValue& dictionary, const std::string& key) {
    const PlistValue* value = dictionary.isDictionary() ? dictionary.dictionary()->find(key) : nullptr;
    return value != nullptr ? value->integerValue().value_or(-1) : -1;
}

class ModemManagerLinkTest : public ServiceTest {
  protected:
    void SetUp() override {
        ServiceTest::SetUp();
        ModemEmulator::Settings settings;
        settings.capturePath = samplePath("lte-connected-1.qmdl");
        settings.packetsPerSecond = 50;
        settings.linkPath = files_.file("modem");
        modem_ = std::make_unique<ModemEmulator>(settings);
        std::string error;
        ASSERT_TRUE(modem_->start(error)) << error;
        bus_ = std::make_unique<BackgroundProcess>(
            "/usr/bin/dbus-daemon",
            std::vector<std::string>{"--session", "--nofork", "--print-address=1",
                                     "--address=unix:path=" + files_.file("bus")},
            files_.path());
        ASSERT_TRUE(bus_->waitForOutput(
            [](const std::string& out) { return out.find('\n') != std::string::npos; }, kWaitSeconds))
            << bus_->errorOutput();
        const std::string out = bus_->standardOutput();
        address_ = out.substr(0, out.find('\n'));
    }
    void TearDown() override {
        clients_.clear();
        service_.reset();
        fake_.reset();
        bus_.reset();
        modem_.reset();
        ServiceTest::TearDown();
    }

    // options: those of fake-modem-manager after the bus address.
    void startFakeModemManager(const std::vector<std::string>& options = {}) {
        std::vector<std::string> arguments = {address_};
        arguments.insert(arguments.end(), options.begin(), options.end());
        fake_ = std::make_unique<BackgroundProcess>(FAKE_MODEM_MANAGER_PATH, arguments, files_.path());
        ASSERT_TRUE(fake_->waitForOutput(
            [](const std::string& out) { return out.find("ready\n") != std::string::npos; }, kWaitSeconds))
            << fake_->errorOutput();
    }
    ServiceProcess& startLive(const std::string& address, const std::vector<std::string>& options = {},
                              const std::vector<std::string>& environment = {}) {
        std::vector<std::string> arguments = {"--source",           "live",          "--device",
                                              files_.file("modem"), "--bus-address", address};
        arguments.insert(arguments.end(), options.begin(), options.end());
        std::vector<std::string> assignments = {"VELMAR_DIAG_RESPONSE_SECONDS=0.2",
                                                "VELMAR_MODEM_MANAGER_RETRY_SECONDS=0.2"};
        assignments.insert(assignments.end(), environment.begin(), environment.end());
        return startService(arguments, assignments);
    }
    // Waits for a SIM record and checks that the last one holds the identities of the modem's SIM.
    void expectSim(const KxTestClient& client, const ServiceProcess& service, const SimIdentities& expected) {
        ASSERT_TRUE(waitForRecords(client, 0, 1)) << service.errorOutput();
        const PlistValue sim = extraRecords(client.blobs(), 0).back();
        EXPECT_EQ(textAt(sim, "kSimFile_ICCID"), expected.iccid);
        EXPECT_EQ(textAt(sim, "kSimFile_IMSI"), expected.imsi);
        EXPECT_EQ(textAt(sim, "kSimFile_MSISDN"), expected.msisdn);
    }
    // The SIM and bearer records of the second modem, once they have arrived.
    void expectSecondModemsRecords(const KxTestClient& client, const ServiceProcess& service) {
        expectSim(client, service, kSecondSim);
        ASSERT_TRUE(waitForRecords(client, 2, 1)) << service.errorOutput();
        const PlistValue contexts = extraRecords(client.blobs(), 2).back();
        ASSERT_TRUE(contexts.isArray());
        ASSERT_EQ(contexts.array()->size(), 1U);
        EXPECT_EQ(textAt(contexts.array()->at(0), "Context ID"), "2");
        EXPECT_EQ(textAt(contexts.array()->at(0), "APN"), "second.test");
        EXPECT_EQ(textAt(contexts.array()->at(0), "PDP Address"), "10.45.18.1");
        EXPECT_EQ(textAt(contexts.array()->at(0), "Interface"), "wwan2");
    }
    // SIGTERM ends the service with status 0. Under the leak checker the exit fails instead when anything
    // of the bus connection (the connection, its slots, the handlers they own, messages) was not released.
    static void expectCleanStop(ServiceProcess& service) {
        service.sendSignal(SIGTERM);
        EXPECT_EQ(service.waitForExit(kWaitSeconds), std::optional<int>(0)) << service.errorOutput();
    }
    // A client that asks for the three extra records only.
    KxTestClient& extrasClient() {
        KxTestClient& client = newClient();
        EXPECT_TRUE(client.start({}, {0, 1, 2})) << client.error();
        return client;
    }
    bool waitForRecords(const KxTestClient& client, std::uint16_t code, std::size_t count) {
        const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
        const bool held = runUntil([&] { return extraRecords(client.blobs(), code).size() >= count; });
        queue_.cancelTimer(tick);
        return held;
    }

    std::unique_ptr<ModemEmulator> modem_;
    std::unique_ptr<BackgroundProcess> bus_;
    std::unique_ptr<BackgroundProcess> fake_;
    std::string address_;
};

TEST_F(ModemManagerLinkTest, SimFilesBearersAndCellsComeFromTheModemWhichMayGoAndComeBack) {
    startFakeModemManager();
    ServiceProcess& service = startLive(address_);
    ASSERT_TRUE(service.waitForError(kUsing)) << service.errorOutput();
    KxTestClient& client = extrasClient();
    expectSim(client, service, kFirstSim);
    ASSERT_TRUE(waitForRecords(client, 2, 1)) << service.errorOutput();
    ASSERT_TRUE(waitForRecords(client, 1, 1)) << service.errorOutput();

    const PlistValue contexts = extraRecords(client.blobs(), 2).back();
    ASSERT_TRUE(contexts.isArray());
    ASSERT_EQ(contexts.array()->size(), 2U);
    const PlistValue& first = contexts.array()->at(0);
    const PlistValue& second = contexts.array()->at(1);
    EXPECT_EQ(textAt(first, "Context ID"), "0");
    EXPECT_EQ(textAt(first, "APN"), "internet.test");
    EXPECT_EQ(textAt(first, "PDP Type"), "IPv4");
    EXPECT_EQ(textAt(first, "PDP Address"), "10.45.17.201");
    EXPECT_EQ(textAt(first, "Interface"), "wwan0");
    EXPECT_EQ(textAt(second, "Context ID"), "1");
    EXPECT_EQ(textAt(second, "APN"), "ims.test");
    EXPECT_EQ(textAt(second, "PDP Type"), "IPv4v6");
    EXPECT_EQ(textAt(second, "PDP Address"), "10.45.17.202");

    const PlistValue cells = extraRecords(client.blobs(), 1).back();
    ASSERT_TRUE(cells.isArray());
    ASSERT_EQ(cells.array()->size(), 3U);
    const PlistValue& serving = cells.array()->at(0);
    EXPECT_EQ(textAt(serving, "kKxCellMonitorCellType"), "kKxCellMonitorCellTypeServing");
    EXPECT_EQ(textAt(serving, "kKxCellMonitorCellRadioAccessTechnology"),
              "kKxCellMonitorRadioAccessTechnologyLTE");
    EXPECT_EQ(numberAt(serving, "kKxCellMonitorTAC"), 0x1A2B);
    EXPECT_EQ(numberAt(serving, "kKxCellMonitorCellId"), 0x1234567);
    EXPECT_EQ(numberAt(serving, "kKxCellMonitorPID"), 0x1F);
    EXPECT_EQ(numberAt(serving, "kKxCellMonitorUARFCN"), 1300);
    EXPECT_EQ(textAt(cells.array()->at(1), "kKxCellMonitorCellType"), "kKxCellMonitorCellTypeNeighbor");
    EXPECT_EQ(numberAt(cells.array()->at(2), "kKxCellMonitorPID"), 0x2A);
    EXPECT_EQ(numberAt(cells.array()->at(2), "kKxCellMonitorUARFCN"), 6300);

    // The modem goes: one notice, the service goes on; it comes back: picked up, its records sent again.
    fake_->sendSignal(SIGUSR1);
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no modem; " + kOff + " one appears\n"))
        << service.errorOutput();
    const std::size_t simRecords = extraRecords(client.blobs(), 0).size();
    fake_->sendSignal(SIGUSR2);
    ASSERT_TRUE(runUntil([&] { return occurrences(service.errorOutput(), kUsing) == 2; }, kWaitSeconds))
        << service.errorOutput();
    EXPECT_TRUE(waitForRecords(client, 0, simRecords + 1)) << service.errorOutput();
    EXPECT_FALSE(service.waitForExit(0).has_value());
    expectCleanStop(service);
}

TEST_F(ModemManagerLinkTest, ModemManagerAbsentAtStartIsPickedUpWhenItAppears) {
    ServiceProcess& service = startLive(address_);
    ASSERT_TRUE(
        service.waitForError("<5> modem-manager: ModemManager is not on the bus "
                             "(org.freedesktop.DBus.Error.ServiceUnknown); " +
                             kOff + " it appears\n"))
        << service.errorOutput();
    KxTestClient& client = extrasClient();
    startFakeModemManager();
    ASSERT_TRUE(service.waitForError(kUsing)) << service.errorOutput();
    expectSim(client, service, kFirstSim);
}

TEST_F(ModemManagerLinkTest, NoBusIsOneNoticeAndTheDiagnosticPortStillServes) {
    const std::string missing = "unix:path=" + files_.file("no-bus");
    ServiceProcess& service = startLive(missing);
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no bus (" + missing +
                                     ": No such file or directory); " + kOff + " it is there\n"))
        << service.errorOutput();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C2, 0xB0C1}, {0, 1, 2})) << client.error();
    const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
    EXPECT_TRUE(runUntil([&] { return !client.blobs().empty(); })) << service.errorOutput();
    queue_.cancelTimer(tick);
    EXPECT_TRUE(extraRecords(client.blobs(), 0).empty());
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: no bus"), 1U);
}

TEST_F(ModemManagerLinkTest, TheBusGoingAwayIsOneNoticeAndTheServiceGoesOn) {
    startFakeModemManager();
    ServiceProcess& service = startLive(address_);
    ASSERT_TRUE(service.waitForError(kUsing)) << service.errorOutput();
    fake_.reset();
    bus_.reset();
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no bus (the connection was lost: "))
        << service.errorOutput();
    // Still serving the diagnostic port's packets, while the bus is looked for again every 0.2 s.
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C2, 0xB0C1}, {0, 1, 2})) << client.error();
    const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
    EXPECT_TRUE(runUntil([&] { return client.blobs().size() >= 3; })) << service.errorOutput();
    queue_.runFor(0.5);  // two more looks for the bus, which fail for another reason without a second notice
    queue_.cancelTimer(tick);
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: no bus"), 1U) << service.errorOutput();
    EXPECT_FALSE(service.waitForExit(0).has_value());
    expectCleanStop(service);
}

TEST_F(ModemManagerLinkTest, ModemChosenByObjectPathAmongTwo) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_, {"--modem", "/org/freedesktop/ModemManager1/Modem/1"});
    ASSERT_TRUE(service.waitForError(kUsingSecond)) << service.errorOutput();
    expectSecondModemsRecords(extrasClient(), service);
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: using modem"), 1U) << service.errorOutput();
}

TEST_F(ModemManagerLinkTest, ModemChosenByIndexAmongTwo) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_, {"--modem", "1"});
    ASSERT_TRUE(service.waitForError(kUsingSecond)) << service.errorOutput();
    expectSecondModemsRecords(extrasClient(), service);
}

TEST_F(ModemManagerLinkTest, ModemChosenByIndexZeroIsTheFirst) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_, {"--modem", "0"});
    ASSERT_TRUE(service.waitForError(kUsing)) << service.errorOutput();
    expectSim(extrasClient(), service, kFirstSim);
}

TEST_F(ModemManagerLinkTest, AnUnknownModemPathIsOneNoticeAndNoRecords) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_, {"--modem", "/org/freedesktop/ModemManager1/Modem/7"});
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no modem /org/freedesktop/ModemManager1/Modem/7; " +
                                     kOff + " one appears\n"))
        << service.errorOutput();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C2, 0xB0C1}, {0, 1, 2})) << client.error();
    const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
    EXPECT_TRUE(runUntil([&] { return client.blobs().size() >= 3; })) << service.errorOutput();
    // A change on the bus reads the objects again: still no such modem, and no second notice.
    fake_->sendSignal(SIGUSR1);
    ASSERT_TRUE(fake_->waitForOutput(
        [](const std::string& out) { return out.find("removed\n") != std::string::npos; }, kWaitSeconds));
    queue_.runFor(0.3);
    queue_.cancelTimer(tick);
    for (const std::uint16_t code : {0, 1, 2}) {
        EXPECT_TRUE(extraRecords(client.blobs(), code).empty()) << code;
    }
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: no modem"), 1U) << service.errorOutput();
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: using modem"), 0U) << service.errorOutput();
}

TEST_F(ModemManagerLinkTest, AnUnknownModemIndexIsOneNotice) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_, {"--modem", "12"});
    ASSERT_TRUE(service.waitForError("<5> modem-manager: no modem 12; " + kOff + " one appears\n"))
        << service.errorOutput();
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: using modem"), 0U) << service.errorOutput();
}

TEST_F(ModemManagerLinkTest, OfTwoModemsTheOneOwningTheDiagnosticPortIsChosen) {
    startFakeModemManager({"--two-modems", "--port", deviceName(files_.file("modem"))});
    ServiceProcess& service = startLive(address_);
    ASSERT_TRUE(service.waitForError(kUsingSecond)) << service.errorOutput();
    expectSecondModemsRecords(extrasClient(), service);
}

TEST_F(ModemManagerLinkTest, TheModemOfAPortThatAutoFindsAfterTheModemsWereReadIsChosenThen) {
    // "auto" first probes a silent candidate, long enough for the modems to be read while no port answers.
    TemporaryDirectory root;
    FakeSysfs sysfs(root.path());
    sysfs.addUsbSerialPort({"ttyUSB3", 3, 0xFF, 0xFF, 0x30, "2c7c", "0800", ""});
    sysfs.addUsbSerialPort({"ttyUSB0", 0, 0xFF, 0xFF, 0xFF, "abcd", "0002", ""});
    ModemEmulator silent(ModemEmulator::Settings{"", 0, sysfs.devicePath("ttyUSB3"), {}, false, false});
    std::string error;
    ASSERT_TRUE(silent.start(error)) << error;
    silent.setSilent(true);
    ModemEmulator::Settings settings;
    settings.capturePath = samplePath("lte-connected-1.qmdl");
    settings.packetsPerSecond = 50;
    settings.linkPath = sysfs.devicePath("ttyUSB0");
    ModemEmulator modem(settings);
    ASSERT_TRUE(modem.start(error)) << error;
    startFakeModemManager({"--two-modems", "--port", deviceName(sysfs.devicePath("ttyUSB0"))});
    ServiceProcess& service =
        startService({"--source", "live", "--device", "auto", "--bus-address", address_},
                     {"VELMAR_DIAG_RESPONSE_SECONDS=0.2", "VELMAR_MODEM_MANAGER_RETRY_SECONDS=0.2",
                      "VELMAR_SYSROOT=" + root.path()});
    ASSERT_TRUE(service.waitForError(kUsingSecond)) << service.errorOutput();
    expectSecondModemsRecords(extrasClient(), service);
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: using modem"), 1U) << service.errorOutput();
}

TEST_F(ModemManagerLinkTest, OfTwoModemsNoneOwningTheDiagnosticPortNoneIsGuessed) {
    startFakeModemManager({"--two-modems"});
    ServiceProcess& service = startLive(address_);
    ASSERT_TRUE(service.waitForError(
        "<5> modem-manager: 2 modems and none owns the diagnostic port; choose one with --modem\n"))
        << service.errorOutput();
    KxTestClient& client = newClient();
    ASSERT_TRUE(client.start({0xB0C2, 0xB0C1}, {0, 1, 2})) << client.error();
    const MainQueue::Handle tick = queue_.repeating(0.01, [] {});
    EXPECT_TRUE(runUntil([&] { return client.blobs().size() >= 3; })) << service.errorOutput();
    queue_.cancelTimer(tick);
    EXPECT_TRUE(extraRecords(client.blobs(), 0).empty());
    EXPECT_TRUE(extraRecords(client.blobs(), 2).empty());
    EXPECT_EQ(occurrences(service.errorOutput(), "modem-manager: using modem"), 0U) << service.errorOutput();
}

TEST_F(ModemManagerLinkTest, AValueOfTheWrongTypeIsWarnedOnceAWindowNotAtEveryPoll) {
    startFakeModemManager({"--wrong-types"});
    ServiceProcess& service = startLive(address_, {}, {"VELMAR_MODEM_MANAGER_CELL_SECONDS=0.05"});
    ASSERT_TRUE(service.waitForError(kUsing)) << service.errorOutput();
    KxTestClient& client = extrasClient();
    ASSERT_TRUE(waitForRecords(client, 1, 5)) << service.errorOutput();
    const std::string log = service.errorOutput();
    EXPECT_EQ(
        occurrences(log, "<4> modem-manager: cell 1: earfcn is not an integer (D-Bus type 's'); skipped\n"),
        1U)
        << log;
    EXPECT_EQ(
        occurrences(log, "<4> modem-manager: cell 2: earfcn is not an integer (D-Bus type 's'); skipped\n"),
        1U)
        << log;
    EXPECT_EQ(occurrences(log, "<4> modem-manager:"), 2U) << log;
    // The neighbours are still sent, without the value that could not be trusted.
    const PlistValue cells = extraRecords(client.blobs(), 1).back();
    ASSERT_TRUE(cells.isArray());
    ASSERT_EQ(cells.array()->size(), 3U);
    EXPECT_EQ(numberAt(cells.array()->at(0), "kKxCellMonitorUARFCN"), 1300);
    EXPECT_EQ(numberAt(cells.array()->at(1), "kKxCellMonitorPID"), 0x20);
    EXPECT_EQ(numberAt(cells.array()->at(1), "kKxCellMonitorUARFCN"), -1);
    expectCleanStop(service);  // with cell lists asked for every 0.05 s, one is likely still out
}

}  // namespace
}  // namespace velmar::testing
