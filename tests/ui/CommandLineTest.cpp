// velmar's command line: the help, the choice of front end, and the combinations it refuses.
#include <gtest/gtest.h>

#include "tests/support/Json.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

class CommandLineTest : public ::testing::Test {
  protected:
    // No display, a runtime directory of its own (no service there), and the given extras.
    std::vector<std::string> environment(std::vector<std::string> extra = {}) const {
        std::vector<std::string> base = {"VELMAR_RUNTIME_DIR=" + runtime_.path(),
                                         "XDG_CONFIG_HOME=" + config_.path(),
                                         "DISPLAY=", "WAYLAND_DISPLAY=", "QT_QPA_PLATFORM="};
        base.insert(base.end(), extra.begin(), extra.end());
        return base;
    }
    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
};

TEST_F(CommandLineTest, HelpNamesEveryOptionAndWhatThisBuildHas) {
    const auto result = testing::runProcess({VELMAR_PATH, "--help"}, "", environment());
    EXPECT_EQ(result.exitCode, 0);
    EXPECT_EQ(result.out.rfind(
                  "usage: velmar [--terminal | --headless [--path PATH]] [--fullscreen] [--log-stderr]\n", 0),
              0u);
    for (const char* option :
         {"--terminal", "--headless", "--path PATH", "--fullscreen", "--log-stderr", "--help"}) {
        EXPECT_NE(result.out.find(std::string("\n  ") + option), std::string::npos) << option;
    }
    std::string built = "\nThis build has: ";
#ifdef VELMAR_WITH_QT
    built += "the graphical interface, ";
#endif
#ifdef VELMAR_WITH_TERMINAL
    built += "the terminal interface, ";
#endif
    built += "the headless front end.\n";
    EXPECT_NE(result.out.find(built), std::string::npos) << result.out;
}

TEST_F(CommandLineTest, RefusesCombinationsThatCannotWork) {
    const std::vector<std::pair<std::vector<std::string>, std::string>> cases = {
        {{"--terminal", "--headless"}, "velmar: --terminal and --headless exclude each other (see --help)\n"},
        {{"--path", "/LTE"}, "velmar: --path goes with --headless (see --help)\n"},
        {{"--fullscreen"},
         "velmar: --fullscreen needs the graphical interface (a display, and a build with Qt)\n"},
        {{"--colour"}, "velmar: unknown argument '--colour' (see --help)\n"},
        {{"--headless", "--path"}, "velmar: --path needs a value (see --help)\n"},
    };
    for (const auto& [arguments, message] : cases) {
        std::vector<std::string> command = {VELMAR_PATH};
        command.insert(command.end(), arguments.begin(), arguments.end());
        const auto result = testing::runProcess(command, "", environment());
        EXPECT_EQ(result.exitCode, 2) << arguments[0];
        EXPECT_EQ(result.err, message);
    }
}

#ifdef VELMAR_WITH_TERMINAL
TEST_F(CommandLineTest, TheTerminalInterfaceNeedsATerminal) {
    const auto result = testing::runProcess({VELMAR_PATH, "--terminal"}, "", environment());
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_EQ(result.err, "velmar: the terminal interface needs a terminal on standard input and output\n");
}
#endif

TEST_F(CommandLineTest, WithoutDisplayOrTerminalTheDefaultIsHeadless) {
    // Ended after two seconds by SIGTERM, which runs the termination sequence and exits with status 0.
    const auto result = testing::runProcess(
        {"/usr/bin/timeout", "--preserve-status", "-s", "TERM", "2", VELMAR_PATH}, "", environment());
    EXPECT_EQ(result.exitCode, 0);
    const std::string first = result.out.substr(0, result.out.find('\n'));
    const auto line = testing::parseJson(first);
    ASSERT_TRUE(line) << result.out;
    EXPECT_EQ(line->dictionary()->get("connected"), PlistValue::boolean(false));
    EXPECT_EQ(*line->dictionary()->get("status").string(), "Connecting");
}

#ifdef VELMAR_WITH_QT
TEST_F(CommandLineTest, WithADisplayTheDefaultIsTheGraphicalInterface) {
    // The offscreen platform stands for a display; the GUI writes nothing on standard output.
    const auto result = testing::runProcess(
        {"/usr/bin/timeout", "--preserve-status", "-s", "TERM", "3", VELMAR_PATH, "--fullscreen"}, "",
        environment({"QT_QPA_PLATFORM=offscreen"}));
    EXPECT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out, "");
    // The termination sequence ran on SIGTERM.
    EXPECT_NE(testing::readWholeFile(config_.path() + "/velmar/preferences/com.velmar.homescreen.plist")
                  .find("<key>HxShowGSMRSSI</key>"),
              std::string::npos);
}
#endif

}  // namespace
}  // namespace velmar
