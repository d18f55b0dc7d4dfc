// The bash completion, as bash runs it: the installed script is sourced, a command line is laid out in
// COMP_WORDS and the completion function fills COMPREPLY. The programs completed are the installed ones,
// whose
// --help the script reads.
#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "tests/install/InstalledTree.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

using testing::installedPath;
using testing::runProcess;

// Quotes a word for bash: single quotes, with each single quote written as '\''.
std::string shellQuoted(const std::string& word) {
    std::string quoted = "'";
    for (const char c : word) {
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    }
    return quoted + "'";
}

// The words that completing the last of `words` offers; words[0] is a program name, run from the prefix.
std::set<std::string> completions(const std::string& program, const std::vector<std::string>& words) {
    std::string script = "source ";
    script.append(shellQuoted(installedPath("share/bash-completion/completions/" + program)));
    script.append(" || exit 3\ncomplete -p ").append(program).append(" >/dev/null || exit 4\n");
    script.append("COMP_WORDS=(").append(shellQuoted(installedPath("bin/" + program)));
    for (const std::string& word : words) {
        script.append(" ").append(shellQuoted(word));
    }
    script.append(
        ")\n"
        "COMP_CWORD=$(( ${#COMP_WORDS[@]} - 1 ))\n"
        "_velmar_complete \"${COMP_WORDS[0]}\" \"${COMP_WORDS[COMP_CWORD]}\" "
        "\"${COMP_WORDS[COMP_CWORD-1]}\"\n"
        "printf '%s\\n' \"${COMPREPLY[@]}\"\n");
    const auto result = runProcess({"/bin/bash", "--norc", "--noprofile", "-c", script});
    EXPECT_EQ(result.exitCode, 0) << result.err;
    std::set<std::string> offered;
    std::istringstream lines(result.out);
    std::string line;
    while (std::getline(lines, line)) {
        if (!line.empty()) {
            offered.insert(line);
        }
    }
    return offered;
}

using Words = std::set<std::string>;

TEST(Completion, OffersEveryOptionOfHelp) {
    for (const std::string& program : testing::programNames()) {
        const auto help = runProcess({installedPath("bin/" + program), "--help"});
        EXPECT_EQ(completions(program, {"--"}), testing::optionsNamedIn(help.out)) << program;
    }
}

TEST(Completion, CompletesAnOptionFromItsBeginning) {
    EXPECT_EQ(completions("kxserverd", {"--so"}), (Words{"--source"}));
    EXPECT_EQ(completions("velmar-decode", {"--s"}), (Words{"--save-contents", "--start-command"}));
    EXPECT_EQ(completions("velmar", {"--f"}), (Words{"--fullscreen"}));
}

TEST(Completion, OffersTheChoicesOfAnOption) {
    EXPECT_EQ(completions("kxserverd", {"--source", ""}), (Words{"sim", "replay", "live"}));
    EXPECT_EQ(completions("kxserverd", {"--technology", "u"}), (Words{"utran"}));
    EXPECT_EQ(completions("kxserverd", {"--scenario", ""}), (Words{"drive", "walk", "static"}));
    EXPECT_EQ(completions("velmar-decode", {"--technology", ""}),
              (Words{"gsm", "lte", "utran", "cdma", "ifx"}));
    EXPECT_EQ(completions("velmar-decode", {"--format", ""}),
              (Words{"auto", "hex", "dlf", "qmdl", "velmar"}));
    EXPECT_EQ(completions("velmar-decode", {"--output", "d"}), (Words{"display"}));
}

TEST(Completion, OffersChoicesAfterAnEqualsSign) {
    EXPECT_EQ(completions("kxserverd", {"--source", "=", ""}), (Words{"sim", "replay", "live"}));
    EXPECT_EQ(completions("kxserverd", {"--source", "=", "re"}), (Words{"replay"}));
}

TEST(Completion, OffersFileNamesForAFileAndNothingForANumber) {
    const testing::TemporaryDirectory directory;
    testing::writeWholeFile(directory.file("capture.qmdl"), "");
    const Words file{directory.file("capture.qmdl")};
    EXPECT_EQ(completions("kxserverd", {"--input", directory.file("cap")}), file);
    EXPECT_EQ(completions("velmar-decode", {"--technology", "lte", directory.file("cap")}), file);
    EXPECT_EQ(completions("kxserverd", {"--seed", ""}), Words{});
    EXPECT_EQ(completions("kxserverd", {"--speed", ""}), Words{});
}

}  // namespace
}  // namespace velmar
