// The installed tree as a user gets it from `cmake --install` or the package: every file in place, and the
// programs run from the prefix with no help from the environment or the source tree.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <regex>
#include <string>

#include "core/platform/BuildInfo.h"
#include "tests/install/InstalledTree.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

namespace fs = std::filesystem;
using testing::builtProgram;
using testing::installedPath;
using testing::programNames;
using testing::runProcess;
using testing::runWithoutResourceDirectory;

std::string capture(const std::string& name) {
    return std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name;
}

TEST(InstalledTree, HoldsTheProgramsAndEverythingBesideThem) {
    for (const std::string& program : programNames()) {
        struct stat status {};
        ASSERT_EQ(stat(installedPath("bin/" + program).c_str(), &status), 0) << program;
        EXPECT_TRUE(S_ISREG(status.st_mode) && (status.st_mode & S_IXOTH) != 0) << program;
        EXPECT_TRUE(fs::is_regular_file(installedPath("share/man/man1/" + program + ".1.gz"))) << program;
        EXPECT_TRUE(fs::is_regular_file(installedPath("share/bash-completion/completions/" + program)))
            << program;
    }
    for (const char* file :
         {"share/velmar/templates/LTE.plist", "share/velmar/templates/ORV_GSM.plist",
          "share/velmar/templates/C2KTemplate.plist", "lib/systemd/user/kxserverd.service",
          "lib/udev/rules.d/60-velmar-diag-port.rules", "share/applications/velmar.desktop",
          "share/icons/hicolor/scalable/apps/velmar.svg", "share/doc/velmar/copyright",
          "share/doc/velmar/changelog.gz"}) {
        EXPECT_TRUE(fs::is_regular_file(installedPath(file))) << file;
    }
}

// Run from the prefix with VELMAR_RESOURCE_DIR unset, the decoder prints what the build tree's decoder prints
// with the source templates.
TEST(InstalledTree, DecoderDecodesFromThePrefix) {
    const std::string input = capture("lte-connected-1.qmdl");
    const auto built = runProcess({builtProgram("velmar-decode"), "--technology", "lte", input});
    ASSERT_EQ(built.exitCode, 0) << built.err;
    const auto installed =
        runWithoutResourceDirectory({installedPath("bin/velmar-decode"), "--technology", "lte", input});
    ASSERT_EQ(installed.exitCode, 0) << installed.err;
    EXPECT_EQ(installed.out, built.out);
    EXPECT_EQ(installed.err, "");
}

// The templates come from the program's own prefix, wherever that prefix is: a copy of the installation in
// another place, with one template changed, shows the change.
TEST(InstalledTree, TemplatesAreFoundRelativeToTheProgram) {
    // The moved prefix lies beside the scratch root, on its file system, so the program can be hard-linked.
    const fs::path moved = std::string(VELMAR_INSTALL_ROOT) + "-moved";
    struct Remove {
        fs::path path;
        ~Remove() {
            std::error_code ignored;
            fs::remove_all(path, ignored);
        }
    } removeMoved{moved};
    fs::remove_all(moved);
    fs::create_directories(moved / "bin");
    fs::create_directories(moved / "share/velmar");
    std::error_code linkError;
    fs::create_hard_link(installedPath("bin/velmar-decode"), moved / "bin/velmar-decode", linkError);
    if (linkError) {
        fs::copy_file(installedPath("bin/velmar-decode"), moved / "bin/velmar-decode");
    }
    fs::copy(installedPath("share/velmar/templates"), moved / "share/velmar/templates",
             fs::copy_options::recursive);

    const std::string templatePath = (moved / "share/velmar/templates/LTE.plist").string();
    std::string lteTemplate = testing::readWholeFile(templatePath);
    const std::string firstSection = "<key>Serving Cell</key>";
    const std::size_t at = lteTemplate.find(firstSection);
    ASSERT_NE(at, std::string::npos);
    lteTemplate.insert(at, "<key>Moved Prefix Marker</key>\n\t<dict/>\n\t");
    testing::writeWholeFile(templatePath, lteTemplate);

    const auto result = runWithoutResourceDirectory(
        {(moved / "bin/velmar-decode").string(), "--technology", "lte", capture("lte-connected-1.qmdl")});
    ASSERT_EQ(result.exitCode, 0) << result.err;
    EXPECT_NE(result.out.find("\"Moved Prefix Marker\""), std::string::npos) << result.out.substr(0, 400);
}

// Each installed program answers --help and --version from the prefix as the build tree's program does.
TEST(InstalledTree, ProgramsAnswerHelpAndVersionFromThePrefix) {
    for (const std::string& program : programNames()) {
        for (const char* option : {"--help", "--version"}) {
            const auto built = runProcess({builtProgram(program), option});
            const auto installed = runWithoutResourceDirectory({installedPath("bin/" + program), option});
            EXPECT_EQ(installed.exitCode, 0) << program << " " << option;
            EXPECT_EQ(installed.out, built.out) << program << " " << option;
            EXPECT_EQ(installed.err, "") << program << " " << option;
        }
    }
}

// "--version": the program's name, the project's version and the build date, on one line.
TEST(Version, EveryProgramPrintsItsVersionAndBuildDate) {
    for (const std::string& program : programNames()) {
        const auto result = runProcess({builtProgram(program), "--version"});
        EXPECT_EQ(result.exitCode, 0) << program;
        EXPECT_EQ(result.err, "") << program;
        const std::regex expected(
            program + " " + std::regex_replace(*BuildInfo::applicationVersion(), std::regex("\\."), "\\.") +
            " \\(built [A-Z][a-z]{2} [ 0-3][0-9] [0-9]{4} [0-2][0-9]:[0-5][0-9]:[0-6][0-9]\\)\n");
        EXPECT_TRUE(std::regex_match(result.out, expected)) << program << ": " << result.out;
    }
}

TEST(Version, DecoderAnswersVersionBeforeCheckingItsOtherArguments) {
    const auto result = runProcess({builtProgram("velmar-decode"), "--version"});
    EXPECT_EQ(result.exitCode, 0);
    const auto withOthers = runProcess({builtProgram("velmar-decode"), "--technology", "lte", "--version"});
    EXPECT_EQ(withOthers.exitCode, 0);
    EXPECT_EQ(withOthers.out, result.out);
}

TEST(Version, ServiceHelpWinsOverVersion) {
    const auto help = runProcess({builtProgram("kxserverd"), "--help"});
    const auto both = runProcess({builtProgram("kxserverd"), "--version", "--help"});
    EXPECT_EQ(both.exitCode, 0);
    EXPECT_EQ(both.out, help.out);
}

// The package's changelog names the version that the programs report.
TEST(Version, ChangelogNamesTheProjectVersion) {
    const std::string changelog =
        testing::readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/contrib/debian/changelog");
    EXPECT_EQ(changelog.substr(0, changelog.find('\n')),
              "velmar (" + *BuildInfo::applicationVersion() + ") unstable; urgency=medium");
}

// The desktop entry starts an installed program and shows the installed icon.
TEST(InstalledTree, DesktopEntryNamesTheInstalledProgramAndIcon) {
    const std::string entry = testing::readWholeFile(installedPath("share/applications/velmar.desktop"));
    std::smatch match;
    ASSERT_TRUE(std::regex_search(entry, match, std::regex("\nExec=([^ \n]+)")));
    EXPECT_TRUE(fs::is_regular_file(installedPath("bin/" + match[1].str()))) << match[1];
    ASSERT_TRUE(std::regex_search(entry, match, std::regex("\nIcon=([^\n]+)")));
    EXPECT_TRUE(
        fs::is_regular_file(installedPath("share/icons/hicolor/scalable/apps/" + match[1].str() + ".svg")))
        << match[1];
    EXPECT_NE(entry.find("\nType=Application\n"), std::string::npos);
}

}  // namespace
}  // namespace velmar
