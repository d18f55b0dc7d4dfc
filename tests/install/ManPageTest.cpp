// The manual pages tell the truth about the programs: the options that a page lists under OPTIONS are exactly
// the options that the program's --help names, the installed page is the page in the repository, and the
// page renders without a formatter warning.
#include <gtest/gtest.h>
#include <unistd.h>

#include <regex>
#include <set>
#include <sstream>
#include <string>

#include "tests/install/InstalledTree.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::builtProgram;
using testing::installedPath;
using testing::programNames;
using testing::runProcess;

std::string manPageSource(const std::string& program) {
    return testing::readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/contrib/man/" + program + ".1");
}

// The option that each item of the OPTIONS section stands for: the first word of the line after each ".TP",
// with the page's escaped hyphens ("\-") read as hyphens.
std::set<std::string> optionsListedInManPage(const std::string& page) {
    std::set<std::string> options;
    std::istringstream lines(page);
    std::string line;
    bool inOptions = false;
    bool afterItem = false;
    static const std::regex kItem(R"(^\.(B|BI|BR|I|IR)? *((\\-)+[a-z][a-z0-9]*(\\-[a-z0-9]+)*))");
    while (std::getline(lines, line)) {
        if (line.rfind(".SH", 0) == 0) {
            inOptions = line == ".SH OPTIONS";
            continue;
        }
        if (!inOptions) {
            continue;
        }
        if (line.rfind(".TP", 0) == 0) {
            afterItem = true;
            continue;
        }
        if (afterItem) {
            std::smatch match;
            if (std::regex_search(line, match, kItem)) {
                options.insert(std::regex_replace(match[2].str(), std::regex(R"(\\-)"), "-"));
            }
            afterItem = false;
        }
    }
    return options;
}

std::string listed(const std::set<std::string>& options) {
    std::string text;
    for (const std::string& option : options) {
        text += (text.empty() ? "" : " ") + option;
    }
    return text.empty() ? "(none)" : text;
}

TEST(ManPage, ListsExactlyTheOptionsOfHelp) {
    for (const std::string& program : programNames()) {
        const auto help = runProcess({builtProgram(program), "--help"});
        ASSERT_EQ(help.exitCode, 0) << program;
        const std::set<std::string> inHelp = testing::optionsNamedIn(help.out);
        const std::set<std::string> inPage = optionsListedInManPage(manPageSource(program));
        ASSERT_FALSE(inHelp.empty()) << program;
        std::set<std::string> missing;
        std::set<std::string> extra;
        for (const std::string& option : inHelp) {
            if (inPage.count(option) == 0) {
                missing.insert(option);
            }
        }
        for (const std::string& option : inPage) {
            if (inHelp.count(option) == 0) {
                extra.insert(option);
            }
        }
        EXPECT_TRUE(missing.empty()) << "contrib/man/" << program
                                     << ".1 does not describe: " << listed(missing);
        EXPECT_TRUE(extra.empty()) << "contrib/man/" << program
                                   << ".1 describes options that --help does not name: " << listed(extra);
    }
}

TEST(ManPage, ItemsAreReadAsOptions) {
    const std::string page =
        ".SH OPTIONS\n.TP\n.BI \\-\\-input \" FILE\"\ntext\n.TP\n.B \\-\\-every\\-tick\ntext\n.TP\n"
        ".BR \\-\\-source \" sim\" | replay\n.TP\n.B hex\n.SH ENVIRONMENT\n.TP\n.B \\-\\-not\\-an\\-option\n";
    EXPECT_EQ(optionsListedInManPage(page), (std::set<std::string>{"--input", "--every-tick", "--source"}));
}

TEST(ManPage, InstalledPageIsTheRepositoryPageCompressed) {
    for (const std::string& program : programNames()) {
        const auto unpacked =
            runProcess({"/bin/gzip", "-dc", installedPath("share/man/man1/" + program + ".1.gz")});
        ASSERT_EQ(unpacked.exitCode, 0) << program << ": " << unpacked.err;
        EXPECT_EQ(unpacked.out, manPageSource(program)) << program;
    }
}

TEST(ManPage, RendersWithoutWarnings) {
    if (access("/usr/bin/man", X_OK) != 0) {
        GTEST_SKIP() << "man is not installed";
    }
    for (const std::string& program : programNames()) {
        const auto rendered =
            runProcess({"/usr/bin/env", "MANWIDTH=80", "LC_ALL=C.UTF-8", "/usr/bin/man", "--warnings", "-l",
                        installedPath("share/man/man1/" + program + ".1.gz")});
        EXPECT_EQ(rendered.exitCode, 0) << program;
        EXPECT_EQ(rendered.err, "") << program;
        EXPECT_NE(rendered.out.find("--version"), std::string::npos) << program;
    }
}

}  // namespace
}  // namespace velmar
