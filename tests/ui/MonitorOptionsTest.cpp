// velmar's command line in-process: both value forms of --path, the missing value and the refusals.
#include "ui/MonitorOptions.h"

#include <gtest/gtest.h>

namespace velmar {
namespace {

TEST(MonitorOptions, ChoosesTheFrontEndAndFollowsAPathInEitherForm) {
    const ParsedMonitorOptions byDefault = parseMonitorOptions({});
    ASSERT_EQ(byDefault.error, "");
    EXPECT_EQ(byDefault.options.frontEnd, MonitorOptions::FrontEnd::Default);
    EXPECT_EQ(byDefault.options.followedPath, "/");

    const ParsedMonitorOptions spaced =
        parseMonitorOptions({"--headless", "--path", "/LTE/Serving Cell Info"});
    ASSERT_EQ(spaced.error, "");
    EXPECT_EQ(spaced.options.frontEnd, MonitorOptions::FrontEnd::Headless);
    EXPECT_EQ(spaced.options.followedPath, "/LTE/Serving Cell Info");

    const ParsedMonitorOptions joined = parseMonitorOptions({"--path=/GSM", "--headless", "--log-stderr"});
    ASSERT_EQ(joined.error, "");
    EXPECT_EQ(joined.options.followedPath, "/GSM");
    EXPECT_TRUE(joined.options.logStderr);
    EXPECT_FALSE(joined.options.fullscreen);

    const ParsedMonitorOptions terminal = parseMonitorOptions({"--terminal", "--terminal", "--fullscreen"});
    ASSERT_EQ(terminal.error, "");
    EXPECT_EQ(terminal.options.frontEnd, MonitorOptions::FrontEnd::Terminal);
    EXPECT_TRUE(terminal.options.fullscreen);
}

TEST(MonitorOptions, RefusesWhatCannotWork) {
    EXPECT_EQ(parseMonitorOptions({"--headless", "--path"}).error, "--path needs a value");
    EXPECT_EQ(parseMonitorOptions({"--path="}).error, "--path needs a value");
    EXPECT_EQ(parseMonitorOptions({"--path", "/LTE"}).error, "--path goes with --headless");
    EXPECT_EQ(parseMonitorOptions({"--headless", "--terminal"}).error,
              "--terminal and --headless exclude each other");
    EXPECT_EQ(parseMonitorOptions({"--fullscreen=yes"}).error, "--fullscreen takes no value");
    EXPECT_EQ(parseMonitorOptions({"--colour"}).error, "unknown argument '--colour'");
    EXPECT_EQ(parseMonitorOptions({"snapshot.velmar"}).error, "unknown argument 'snapshot.velmar'");
    EXPECT_TRUE(parseMonitorOptions({"--colour", "--help"}).help);
}

TEST(MonitorOptions, TheHelpEndsWithTheFrontEndsOfTheBuild) {
    const std::string both = monitorUsage(true, true);
    EXPECT_EQ(both.rfind(
                  "usage: velmar [--terminal | --headless [--path PATH]] [--fullscreen] [--log-stderr]\n", 0),
              0U);
    const std::string ending =
        "\nThis build has: the graphical interface, the terminal interface, the headless "
        "front end.\n";
    ASSERT_GE(both.size(), ending.size());
    EXPECT_EQ(both.substr(both.size() - ending.size()), ending);
    const std::string headlessOnly = monitorUsage(false, false);
    EXPECT_NE(headlessOnly.find("\nThis build has: the headless front end.\n"), std::string::npos);
}

}  // namespace
}  // namespace velmar
