// The one option parser: both value forms, missing values, unknown options, operands and the generated help.
#include "core/platform/CommandLine.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace velmar {
namespace {

// A small program's command line: a value option, a flag, a value option whose usage fragment also shows
// the flag, and a row that refuses a value.
struct Sample {
    std::string input;
    std::string speed;
    bool fast = false;
    bool loop = false;
    std::vector<std::string> operands;
};

CommandLine sampleCommandLine(Sample& sample, bool takesOperands) {
    CommandLine commandLine{
        .usage = "usage: sample",
        .description = "Reads a log.",
        .options =
            {
                {.name = "--input",
                 .value = "FILE",
                 .help = "the recorded log",
                 .apply = [&sample](std::string_view value) -> std::string {
                     sample.input = value;
                     return "";
                 }},
                {.name = "--speed",
                 .value = "X",
                 .help = "X times the recorded pace",
                 .apply = [&sample](std::string_view value) -> std::string {
                     if (value == "0") {
                         return "--speed needs a positive number";
                     }
                     sample.speed = value;
                     return "";
                 },
                 .synopsis = "[--speed X | --fast]"},
                {.name = "--fast",
                 .value = "",
                 .help = "as fast as possible",
                 .apply = [&sample](std::string_view value) -> std::string {
                     sample.fast = value.empty();
                     return "";
                 },
                 .inSynopsis = false},
                {.name = "--loop",
                 .value = "",
                 .help = "start again at the end",
                 .apply = [&sample](std::string_view) -> std::string {
                     sample.loop = true;
                     return "";
                 }},
            },
        .epilogue = "Exit status 2: usage error.",
    };
    if (takesOperands) {
        commandLine.operands = "FILE...";
        commandLine.takeOperand = [&sample](std::string_view operand) -> std::string {
            if (operand == "bad") {
                return "bad operand";
            }
            sample.operands.emplace_back(operand);
            return "";
        };
    }
    return commandLine;
}

TEST(CommandLine, TakesAValueInEitherForm) {
    Sample sample;
    const CommandLineResult result =
        parseCommandLine(sampleCommandLine(sample, false), {"--input", "a.hex", "--speed=2.5", "--loop"});
    EXPECT_EQ(result.error, "");
    EXPECT_FALSE(result.help);
    EXPECT_EQ(sample.input, "a.hex");
    EXPECT_EQ(sample.speed, "2.5");
    EXPECT_TRUE(sample.loop);
    EXPECT_FALSE(sample.fast);
    EXPECT_EQ(result.given, (std::vector<std::string_view>{"--input", "--speed", "--loop"}));
}

TEST(CommandLine, AValueMayHoldEqualsSignsAndLeadingDashes) {
    Sample sample;
    EXPECT_EQ(parseCommandLine(sampleCommandLine(sample, false), {"--input=a=b.hex"}).error, "");
    EXPECT_EQ(sample.input, "a=b.hex");
    EXPECT_EQ(parseCommandLine(sampleCommandLine(sample, false), {"--input", "--loop"}).error, "");
    EXPECT_EQ(sample.input, "--loop");
    EXPECT_FALSE(sample.loop);
}

TEST(CommandLine, AMissingOrEmptyValueNeedsAValue) {
    Sample sample;
    const CommandLine commandLine = sampleCommandLine(sample, false);
    EXPECT_EQ(parseCommandLine(commandLine, {"--input"}).error, "--input needs a value");
    EXPECT_EQ(parseCommandLine(commandLine, {"--loop", "--speed"}).error, "--speed needs a value");
    EXPECT_EQ(parseCommandLine(commandLine, {"--input="}).error, "--input needs a value");
    EXPECT_EQ(parseCommandLine(commandLine, {"--input", ""}).error, "--input needs a value");
    EXPECT_EQ(sample.input, "");
}

TEST(CommandLine, UnknownOptionsFlagsWithValuesAndOperandsAreRefused) {
    Sample sample;
    const CommandLine commandLine = sampleCommandLine(sample, false);
    EXPECT_EQ(parseCommandLine(commandLine, {"--bogus"}).error, "unknown option --bogus");
    EXPECT_EQ(parseCommandLine(commandLine, {"--bogus=1"}).error, "unknown option --bogus");
    EXPECT_EQ(parseCommandLine(commandLine, {"-x"}).error, "unknown option -x");
    EXPECT_EQ(parseCommandLine(commandLine, {"--loop=yes"}).error, "--loop takes no value");
    EXPECT_EQ(parseCommandLine(commandLine, {"trace.hex"}).error, "unexpected argument \"trace.hex\"");
    EXPECT_EQ(parseCommandLine(commandLine, {"--"}).error, "unexpected argument \"--\"");
    EXPECT_FALSE(sample.loop);
}

TEST(CommandLine, AProgramKeepsItsOwnWording) {
    Sample sample;
    CommandLine commandLine = sampleCommandLine(sample, false);
    commandLine.wording = {.unknownOption = "unknown argument '{}'",
                           .unexpectedArgument = "stray '{}'",
                           .takesNoValue = "option {} takes no value"};
    EXPECT_EQ(parseCommandLine(commandLine, {"--colour"}).error, "unknown argument '--colour'");
    EXPECT_EQ(parseCommandLine(commandLine, {"x"}).error, "stray 'x'");
    EXPECT_EQ(parseCommandLine(commandLine, {"--fast=1"}).error, "option --fast takes no value");
    // The missing value reads the same in every program.
    EXPECT_EQ(parseCommandLine(commandLine, {"--input"}).error, "--input needs a value");
}

TEST(CommandLine, TheFirstErrorOfARowStopsTheParse) {
    Sample sample;
    const CommandLineResult result =
        parseCommandLine(sampleCommandLine(sample, false), {"--speed", "0", "--input", "a.hex"});
    EXPECT_EQ(result.error, "--speed needs a positive number");
    EXPECT_EQ(sample.input, "");
}

TEST(CommandLine, OperandsGoToTheProgramAndDoubleDashEndsTheOptions) {
    Sample sample;
    const CommandLine commandLine = sampleCommandLine(sample, true);
    const CommandLineResult result =
        parseCommandLine(commandLine, {"a.hex", "--loop", "-", "--", "--fast", "--help"});
    EXPECT_EQ(result.error, "");
    EXPECT_FALSE(result.help);
    EXPECT_TRUE(sample.loop);
    EXPECT_FALSE(sample.fast);
    EXPECT_EQ(sample.operands, (std::vector<std::string>{"a.hex", "-", "--fast", "--help"}));
    EXPECT_EQ(parseCommandLine(commandLine, {"bad", "--loop"}).error, "bad operand");
    EXPECT_EQ(parseCommandLine(commandLine, {"--", "bad"}).error, "bad operand");
}

TEST(CommandLine, HelpWinsOverEverythingElse) {
    Sample sample;
    const CommandLine commandLine = sampleCommandLine(sample, false);
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {"--help"}, {"-h"}, {"--bogus", "--help"}, {"--speed", "0", "-h"}, {"--input", "x", "--help"}}) {
        const CommandLineResult result = parseCommandLine(commandLine, arguments);
        EXPECT_TRUE(result.help) << arguments.front();
        EXPECT_EQ(result.error, "") << arguments.front();
    }
    EXPECT_EQ(sample.input, "");
    EXPECT_EQ(sample.speed, "");
}

TEST(CommandLine, VersionWinsOverEverythingButHelp) {
    Sample sample;
    const CommandLine commandLine = sampleCommandLine(sample, true);
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"--version"},
                                               {"--bogus", "--version"},
                                               {"--speed", "0", "--version"},
                                               {"a.hex", "--version"}}) {
        const CommandLineResult result = parseCommandLine(commandLine, arguments);
        EXPECT_TRUE(result.version) << arguments.front();
        EXPECT_FALSE(result.help) << arguments.front();
        EXPECT_EQ(result.error, "") << arguments.front();
    }
    const CommandLineResult both = parseCommandLine(commandLine, {"--version", "--help"});
    EXPECT_TRUE(both.help);
    EXPECT_FALSE(both.version);
    // After "--" it is an operand like any other.
    const CommandLineResult operand = parseCommandLine(commandLine, {"--", "--version"});
    EXPECT_FALSE(operand.version);
    EXPECT_EQ(sample.operands, (std::vector<std::string>{"--version"}));
}

TEST(CommandLine, HelpIsGeneratedFromTheTable) {
    Sample sample;
    EXPECT_EQ(commandLineHelp(sampleCommandLine(sample, true)),
              "usage: sample [--input FILE] [--speed X | --fast] [--loop] FILE...\n"
              "\n"
              "Reads a log.\n"
              "\n"
              "  --input FILE  the recorded log\n"
              "  --speed X     X times the recorded pace\n"
              "  --fast        as fast as possible\n"
              "  --loop        start again at the end\n"
              "  --help        show this help and exit\n"
              "  --version     show the version and build date and exit\n"
              "\n"
              "Exit status 2: usage error.\n");
}

TEST(CommandLine, HelpWrapsTheUsageLineAndLongParagraphsWithinOneHundredColumns) {
    std::vector<std::string> names;
    for (int index = 0; index < 8; ++index) {
        names.push_back("--option-number-" + std::to_string(index));
    }
    const std::string paragraph(30, 'w');
    const std::string longHelp = paragraph + " " + paragraph + " " + paragraph + " " + paragraph;
    CommandLine commandLine{.usage = "usage: wide", .description = "", .options = {}};
    for (const std::string& name : names) {
        commandLine.options.push_back(
            {.name = name, .value = "VALUE", .help = longHelp, .apply = [](std::string_view) {
                 return std::string();
             }});
    }
    const std::string help = commandLineHelp(commandLine);
    std::vector<std::string> lines;
    for (std::size_t start = 0; start < help.size();) {
        const std::size_t end = help.find('\n', start);
        lines.push_back(help.substr(start, end - start));
        start = end + 1;
    }
    ASSERT_GE(lines.size(), 4U);
    // The usage line breaks between fragments and continues under the first one.
    EXPECT_EQ(lines[0],
              "usage: wide [--option-number-0 VALUE] [--option-number-1 VALUE] [--option-number-2 VALUE]");
    EXPECT_EQ(lines[1],
              "            [--option-number-3 VALUE] [--option-number-4 VALUE] [--option-number-5 VALUE]");
    EXPECT_EQ(lines[2], "            [--option-number-6 VALUE] [--option-number-7 VALUE]");
    // Each paragraph continues under the column where it began.
    EXPECT_EQ(lines[4], "  --option-number-0 VALUE  " + paragraph + " " + paragraph);
    EXPECT_EQ(lines[5], std::string(27, ' ') + paragraph + " " + paragraph);
    for (const std::string& line : lines) {
        EXPECT_LE(line.size(), 100U) << line;
    }
}

TEST(CommandLine, ArgumentsAreThoseAfterTheProgramsName) {
    const char* const argv[] = {"prog", "--input", "a.hex"};
    EXPECT_EQ(commandLineArguments(3, argv), (std::vector<std::string>{"--input", "a.hex"}));
    EXPECT_TRUE(commandLineArguments(1, argv).empty());
}

}  // namespace
}  // namespace velmar
