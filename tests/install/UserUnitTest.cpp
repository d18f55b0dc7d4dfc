// The systemd user unit of kxserverd: it starts the installed program, and systemd finds nothing to object to
// in it (systemd-analyze verify, where systemd is installed).
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <string>

#include "tests/install/InstalledTree.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::installedPath;
using testing::runProcess;

const std::string kUnit = "lib/systemd/user/kxserverd.service";

std::string execStartLine(const std::string& unit) {
    const std::size_t start = unit.find("\nExecStart=");
    if (start == std::string::npos) {
        return std::string();
    }
    return unit.substr(start + 1, unit.find('\n', start + 1) - start - 1);
}

std::string systemdAnalyze() {
    for (const char* path : {"/usr/bin/systemd-analyze", "/bin/systemd-analyze"}) {
        if (access(path, X_OK) == 0) {
            return path;
        }
    }
    return std::string();
}

// The unit is written at install time, for the prefix that the installation was given.
TEST(UserUnit, StartsTheProgramOfItsOwnPrefix) {
    const std::string unit = testing::readWholeFile(installedPath(kUnit));
    EXPECT_EQ(execStartLine(unit),
              std::string("ExecStart=") + VELMAR_INSTALL_PREFIX + "/bin/kxserverd $KXSERVERD_OPTIONS");
    EXPECT_EQ(unit.find("@VELMAR_"), std::string::npos) << "a placeholder was left in the unit";
}

// systemd-analyze checks every key and that ExecStart names an executable. The installed unit names the
// program where a real installation would have it, so the check runs on a copy whose ExecStart points
// into the scratch root; its manual page is looked up in the scratch root too.
TEST(UserUnit, PassesSystemdAnalyzeVerify) {
    const std::string analyze = systemdAnalyze();
    if (analyze.empty()) {
        GTEST_SKIP() << "systemd-analyze is not installed";
    }
    const testing::TemporaryDirectory scratch;
    std::string unit = testing::readWholeFile(installedPath(kUnit));
    const std::string execStart = execStartLine(unit);
    ASSERT_FALSE(execStart.empty());
    const std::string moved = std::string("ExecStart=") + VELMAR_INSTALL_ROOT + execStart.substr(10);
    unit.replace(unit.find(execStart), execStart.size(), moved);
    const std::string copy = scratch.file("kxserverd.service");
    testing::writeWholeFile(copy, unit);
    std::filesystem::create_directory(scratch.file("runtime"));

    const auto result =
        runProcess({"/usr/bin/env", "XDG_RUNTIME_DIR=" + scratch.file("runtime"),
                    "MANPATH=" + installedPath("share/man"), analyze, "--user", "verify", copy});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    EXPECT_EQ(result.out + result.err, "");
}

}  // namespace
}  // namespace velmar
