// kxserverd's command line, as a process: help, usage errors, the simulator's options, a second instance
// and sources that cannot start.
#include <gtest/gtest.h>

#include <dirent.h>

#include <string>
#include <vector>

#include "service/ServiceOptions.h"
#include "tests/support/Process.h"
#include "tests/support/ServiceTestFixture.h"

namespace velmar::testing {
namespace {

ProcessResult runService(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), KXSERVERD_PATH);
    return runProcess(arguments);
}

std::vector<std::string> filesIn(const std::string& directory) {
    std::vector<std::string> names;
    if (DIR* dir = opendir(directory.c_str())) {
        while (const dirent* entry = readdir(dir)) {
            const std::string name = entry->d_name;
            if (name != "." && name != "..") {
                names.push_back(name);
            }
        }
        closedir(dir);
    }
    return names;
}

using ServiceArgumentsTest = ServiceTest;

TEST_F(ServiceArgumentsTest, HelpPrintsTheUsageAndExitsZero) {
    const ProcessResult result = runService({"--help"});
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.err, "");
    const std::vector<std::string> lines = linesOf(result.out);
    ASSERT_GE(lines.size(), 2U);
    EXPECT_EQ(
        lines[0],
        "Usage: kxserverd [--source sim|replay|live] [--technology gsm|lte|utran|cdma|ifx] [--input FILE]");
    EXPECT_EQ(lines[1],
              "                 [--speed X | --fast] [--loop] [--seed N] [--device PATH] [--log-stderr]");
    // Help wins over anything else on the line, even arguments that are errors.
    EXPECT_EQ(runService({"--bogus", "--help"}).exitCode, 0);
}

TEST_F(ServiceArgumentsTest, UsageErrorsPrintOneLineAndExitTwo) {
    const struct {
        std::vector<std::string> arguments;
        std::string message;
    } cases[] = {
        {{"--bogus"}, "kxserverd: unknown option --bogus (see --help)\n"},
        {{"trace.hex"}, "kxserverd: unexpected argument \"trace.hex\" (see --help)\n"},
        {{"--technology"}, "kxserverd: --technology needs a value (see --help)\n"},
        {{"--technology", "wimax"},
         "kxserverd: unknown technology \"wimax\" (gsm, lte, utran, cdma or ifx) (see --help)\n"},
        {{"--source", "tape"}, "kxserverd: unknown source \"tape\" (sim, replay or live) (see --help)\n"},
        {{"--source", "replay"}, "kxserverd: --source replay needs --input FILE (see --help)\n"},
        {{"--source", "live"}, "kxserverd: --source live needs --device PATH (see --help)\n"},
        {{"--source", "replay", "--input", "x.hex", "--speed", "2", "--fast"},
         "kxserverd: --speed and --fast exclude each other (see --help)\n"},
        {{"--source", "replay", "--input", "x.hex", "--speed", "0"},
         "kxserverd: --speed needs a positive number, not \"0\" (see --help)\n"},
        {{"--source=replay", "--input=x.hex", "--speed=quick"},
         "kxserverd: --speed needs a positive number, not \"quick\" (see --help)\n"},
        {{"--source", "live", "--device", "/dev/null", "--loop"},
         "kxserverd: --loop does not apply to --source live (see --help)\n"},
        {{"--source", "replay", "--input", "x.hex", "--seed", "7"},
         "kxserverd: --seed does not apply to --source replay (see --help)\n"},
        {{"--seed", "-1"}, "kxserverd: --seed needs a non-negative integer, not \"-1\" (see --help)\n"},
        {{"--fast=yes"}, "kxserverd: --fast takes no value (see --help)\n"},
        {{"--input", ""}, "kxserverd: --input needs a value (see --help)\n"},
    };
    for (const auto& testCase : cases) {
        const ProcessResult result = runService(testCase.arguments);
        EXPECT_EQ(result.exitCode, 2) << testCase.message;
        EXPECT_EQ(result.err, testCase.message);
        EXPECT_EQ(result.out, "");
    }
}

TEST_F(ServiceArgumentsTest, TheSimulatorsOptionsAreCheckedAndApplyOnlyToIt) {
    const struct {
        std::vector<std::string> arguments;
        std::string message;
    } cases[] = {
        {{"--scenario", "run"}, "kxserverd: unknown scenario \"run\" (drive, walk or static) (see --help)\n"},
        {{"--scenario"}, "kxserverd: --scenario needs a value (see --help)\n"},
        {{"--rate-multiplier", "0"},
         "kxserverd: --rate-multiplier needs a positive number of at most 1000, not \"0\" (see --help)\n"},
        {{"--rate-multiplier=-2"},
         "kxserverd: --rate-multiplier needs a positive number of at most 1000, not \"-2\" (see --help)\n"},
        {{"--rate-multiplier", "fast"},
         "kxserverd: --rate-multiplier needs a positive number of at most 1000, not \"fast\" (see --help)\n"},
        {{"--rate-multiplier", "1e9"},
         "kxserverd: --rate-multiplier needs a positive number of at most 1000, not \"1e9\" (see --help)\n"},
        {{"--rate-multiplier", "1000.5"},
         "kxserverd: --rate-multiplier needs a positive number of at most 1000, not \"1000.5\" (see "
         "--help)\n"},
        {{"--max-channels", "0"},
         "kxserverd: --max-channels needs a whole number from 1 to 1024, not \"0\" (see --help)\n"},
        {{"--max-connections", "5000"},
         "kxserverd: --max-connections needs a whole number from 1 to 4096, not \"5000\" (see --help)\n"},
        {{"--queue-memory", "1.5"},
         "kxserverd: --queue-memory needs a whole number from 1 to 4096, not \"1.5\" (see --help)\n"},
        {{"--source", "replay", "--input", "x.hex", "--scenario", "walk"},
         "kxserverd: --scenario does not apply to --source replay (see --help)\n"},
        {{"--source", "live", "--device", "/dev/null", "--rate-multiplier", "2"},
         "kxserverd: --rate-multiplier does not apply to --source live (see --help)\n"},
        {{"--fast"}, "kxserverd: --fast does not apply to --source sim (see --help)\n"},
        {{"--source", "sim", "--speed", "2"},
         "kxserverd: --speed does not apply to --source sim (see --help)\n"},
    };
    for (const auto& testCase : cases) {
        const ProcessResult result = runService(testCase.arguments);
        EXPECT_EQ(result.exitCode, 2) << testCase.message;
        EXPECT_EQ(result.err, testCase.message);
        EXPECT_EQ(result.out, "");
    }
    EXPECT_TRUE(filesIn(runtime_.path()).empty());
}

TEST(ServiceOptions, TheSimulatedBasebandIsTheDefaultSource) {
    const ParsedServiceOptions byDefault = parseServiceOptions({});
    ASSERT_EQ(byDefault.error, "");
    EXPECT_EQ(byDefault.options.source, SourceKind::Sim);
    EXPECT_EQ(byDefault.options.technologyName, "lte");
    EXPECT_EQ(byDefault.options.scenario, "drive");
    EXPECT_EQ(byDefault.options.rateMultiplier, 1.0);
    EXPECT_EQ(byDefault.options.seed, std::nullopt);

    const ParsedServiceOptions sim =
        parseServiceOptions({"--source=sim", "--scenario", "walk", "--rate-multiplier=2.5", "--seed", "7"});
    ASSERT_EQ(sim.error, "");
    EXPECT_EQ(sim.options.scenario, "walk");
    EXPECT_EQ(sim.options.rateMultiplier, 2.5);
    EXPECT_EQ(sim.options.seed, std::optional<std::uint64_t>(7));
    EXPECT_EQ(parseServiceOptions({"--scenario=static"}).options.scenario, "static");
}

TEST_F(ServiceArgumentsTest, TheHelpNamesTheSimulatorsOptions) {
    const std::vector<std::string> lines = linesOf(runService({"--help"}).out);
    ASSERT_GE(lines.size(), 6U);
    EXPECT_EQ(lines[2],
              "                 [--scenario drive|walk|static] [--rate-multiplier X] [--max-channels N]");
    EXPECT_EQ(
        lines[3],
        "                 [--max-connections N] [--queue-memory MIB] [--subscription N] [--record FILE]");
    EXPECT_EQ(
        lines[4],
        "                 [--modem-manager on|off] [--modem OBJECT-PATH|INDEX] [--bus-address ADDRESS]");
    EXPECT_EQ(lines[5], "                 | --list-devices");
}

TEST_F(ServiceArgumentsTest, ASecondInstanceFindsThePortHeldAndExitsOne) {
    startService({"--source", "replay", "--input", dataPath("filter.hex")});
    const ProcessResult second = runService({"--source", "replay", "--input", dataPath("filter.hex")});
    EXPECT_EQ(second.exitCode, 1);
    EXPECT_NE(second.err.find("already running"), std::string::npos) << second.err;
    EXPECT_EQ(linesOf(second.err).size(), 1U) << second.err;
    // The first one serves on, its socket file untouched.
    KxTestClient& client = newClient();
    EXPECT_EQ(client.technology(), std::optional<std::string>("kKxLogChannelTechnology_Orvane_LTE"));
}

TEST_F(ServiceArgumentsTest, UnreadableInputExitsOneAndLeavesNoSocket) {
    const ProcessResult result =
        runService({"--source", "replay", "--input", "/nonexistent/velmar/none.hex"});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_EQ(result.err,
              "kxserverd: /nonexistent/velmar/none.hex: cannot open: No such file or directory\n");
    // Only the service lock's file, which stays by design: no socket.
    EXPECT_EQ(filesIn(runtime_.path()), std::vector<std::string>{"com.velmar.kxserver.lock"});
}

TEST_F(ServiceArgumentsTest, ALiveDeviceMustBeACharacterDeviceOrFifo) {
    const std::string plain = files_.file("plain.qmdl");
    writeWholeFile(plain, "not a port");
    const ProcessResult result = runService({"--source", "live", "--device", plain});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_EQ(result.err, "kxserverd: " + plain + ": not a character device or FIFO\n");
    const ProcessResult missing = runService({"--source", "live", "--device", files_.file("none")});
    EXPECT_EQ(missing.exitCode, 1);
    EXPECT_EQ(missing.err, "kxserverd: " + files_.file("none") + ": No such file or directory\n");
}

TEST(ServiceOptions, ParsesEveryOptionInBothForms) {
    const ParsedServiceOptions parsed =
        parseServiceOptions({"--source", "replay", "--technology=ifx", "--input", "a.qmdl", "--speed=2.5",
                             "--loop", "--log-stderr"});
    ASSERT_EQ(parsed.error, "");
    EXPECT_FALSE(parsed.help);
    const ServiceOptions& options = parsed.options;
    EXPECT_EQ(options.source, SourceKind::Replay);
    EXPECT_EQ(options.technologyName, "ifx");
    EXPECT_EQ(options.technology, "kKxLogChannelTechnology_IFX");
    EXPECT_TRUE(options.objectBased);
    EXPECT_EQ(options.input, "a.qmdl");
    EXPECT_EQ(options.speed, 2.5);
    EXPECT_FALSE(options.fast);
    EXPECT_TRUE(options.loop);
    EXPECT_TRUE(options.logStderr);

    const ParsedServiceOptions live = parseServiceOptions({"--source=live", "--device", "/dev/diag"});
    ASSERT_EQ(live.error, "");
    EXPECT_EQ(live.options.source, SourceKind::Live);
    EXPECT_EQ(live.options.device, "/dev/diag");

    const ParsedServiceOptions sim =
        parseServiceOptions({"--seed", "18446744073709551615", "--rate-multiplier", "4"});
    ASSERT_EQ(sim.error, "");
    EXPECT_EQ(sim.options.source, SourceKind::Sim);
    EXPECT_EQ(sim.options.seed, std::optional<std::uint64_t>(18446744073709551615ULL));
    EXPECT_EQ(sim.options.rateMultiplier, 4.0);
    EXPECT_EQ(parseServiceOptions({"--seed", "18446744073709551616"}).error,
              "--seed needs a non-negative integer, not \"18446744073709551616\"");
    EXPECT_EQ(parseServiceOptions({"--rate-multiplier", "1000"}).options.rateMultiplier, 1000.0);

    // The limits apply to every source; their defaults suit a handful of monitors.
    EXPECT_EQ(sim.options.maxChannels, 32U);
    EXPECT_EQ(sim.options.maxConnections, 64U);
    EXPECT_EQ(sim.options.queueMebibytes, 64U);
    const ParsedServiceOptions limited =
        parseServiceOptions({"--source", "replay", "--input", "x", "--max-channels=3", "--max-connections",
                             "7", "--queue-memory", "2"});
    ASSERT_EQ(limited.error, "");
    EXPECT_EQ(limited.options.maxChannels, 3U);
    EXPECT_EQ(limited.options.maxConnections, 7U);
    EXPECT_EQ(limited.options.queueMebibytes, 2U);
}

TEST(ServiceOptions, TheLiveSourcesOwnOptions) {
    const ParsedServiceOptions live = parseServiceOptions(
        {"--source", "live", "--device", "auto", "--subscription", "4294967295", "--record=/tmp/port.qmdl"});
    ASSERT_EQ(live.error, "");
    EXPECT_EQ(live.options.device, "auto");
    EXPECT_EQ(live.options.subscription, std::optional<std::uint32_t>(4294967295U));
    EXPECT_EQ(live.options.record, "/tmp/port.qmdl");
    EXPECT_FALSE(live.options.listDevices);
    EXPECT_FALSE(
        parseServiceOptions({"--source", "live", "--device", "auto"}).options.subscription.has_value());

    // ModemManager is read by default; --modem and --bus-address are kept as given.
    EXPECT_TRUE(live.options.modemManager);
    EXPECT_EQ(live.options.modem, "");
    EXPECT_EQ(live.options.busAddress, "");
    const ParsedServiceOptions modem = parseServiceOptions(
        {"--source", "live", "--device", "auto", "--modem-manager=off", "--modem",
         "/org/freedesktop/ModemManager1/Modem/3", "--bus-address", "unix:path=/tmp/bus"});
    ASSERT_EQ(modem.error, "");
    EXPECT_FALSE(modem.options.modemManager);
    EXPECT_EQ(modem.options.modem, "/org/freedesktop/ModemManager1/Modem/3");
    EXPECT_EQ(modem.options.busAddress, "unix:path=/tmp/bus");
    EXPECT_EQ(parseServiceOptions({"--source", "live", "--device", "auto", "--modem", "2"}).options.modem,
              "2");

    const struct {
        std::vector<std::string> arguments;
        std::string message;
    } errors[] = {
        {{"--source", "live", "--device", "auto", "--subscription", "4294967296"},
         "--subscription needs an integer from 0 to 4294967295, not \"4294967296\""},
        {{"--source", "live", "--device", "auto", "--subscription", "-1"},
         "--subscription needs an integer from 0 to 4294967295, not \"-1\""},
        {{"--subscription", "1"}, "--subscription does not apply to --source sim"},
        {{"--source", "replay", "--input", "x", "--record", "y"},
         "--record does not apply to --source replay"},
        {{"--list-devices=yes"}, "--list-devices takes no value"},
        {{"--source", "live", "--device", "auto", "--modem-manager", "yes"},
         "--modem-manager needs on or off, not \"yes\""},
        {{"--source", "live", "--device", "auto", "--modem", "first"},
         "--modem needs an object path or an index, not \"first\""},
        {{"--modem-manager", "off"}, "--modem-manager does not apply to --source sim"},
        {{"--source", "replay", "--input", "x", "--modem", "0"}, "--modem does not apply to --source replay"},
        {{"--bus-address", "unix:path=/tmp/bus"}, "--bus-address does not apply to --source sim"},
    };
    for (const auto& testCase : errors) {
        EXPECT_EQ(parseServiceOptions(testCase.arguments).error, testCase.message);
    }

    // Listing the ports needs no source.
    const ParsedServiceOptions listing = parseServiceOptions({"--list-devices"});
    ASSERT_EQ(listing.error, "");
    EXPECT_TRUE(listing.options.listDevices);
    EXPECT_EQ(parseServiceOptions({"--source", "live", "--list-devices"}).error, "");
}

TEST(ServiceOptions, MapsEachTechnologyToItsConstant) {
    const struct {
        const char* name;
        const char* constant;
        bool objectBased;
    } cases[] = {
        {"gsm", "kKxLogChannelTechnology_Orvane_GSM", false},
        {"lte", "kKxLogChannelTechnology_Orvane_LTE", false},
        {"utran", "kKxLogChannelTechnology_Orvane_UTRAN2", false},
        {"cdma", "kKxLogChannelTechnology_Orvane_CDMA", false},
        {"ifx", "kKxLogChannelTechnology_IFX", true},
    };
    for (const auto& testCase : cases) {
        const ParsedServiceOptions parsed =
            parseServiceOptions({"--technology", testCase.name, "--source", "replay", "--input", "x"});
        ASSERT_EQ(parsed.error, "") << testCase.name;
        EXPECT_EQ(parsed.options.technology, testCase.constant);
        EXPECT_EQ(parsed.options.objectBased, testCase.objectBased) << testCase.name;
    }
    const ParsedServiceOptions byDefault = parseServiceOptions({"--source", "replay", "--input", "x"});
    EXPECT_EQ(byDefault.options.technology, "kKxLogChannelTechnology_Orvane_LTE");
}

}  // namespace
}  // namespace velmar::testing
