// CommandLine: the one option parser of velmar, kxserverd and velmar-decode.
//
// A program declares its command line as a table: one CommandLineOption row per option, holding the
// option's name, the placeholder of its value (none for a flag), its help paragraph and the function that
// takes its value. The parser and the --help text both come from that table, so adding an option is one row.
//
// Contract of parseCommandLine, for every program alike:
//   - "--help" or "-h" anywhere before a "--" wins over everything else on the line, errors included;
//     after it, "--version" anywhere before a "--" does the same (the program prints BuildInfo::versionText);
//   - an option's value follows it as "--name=value" or as the next argument "--name value"; an option
//     that takes a value and has none (end of line, or an empty value) fails with "--name needs a value";
//   - a flag given a value ("--flag=x") and an option that is not in the table are usage errors;
//   - an argument that does not begin with "-" (and "-" alone) is an operand: it goes to takeOperand, and a
//     program that takes no operands refuses it; where operands are taken, "--" ends the options;
//   - the rows' functions run in the order in which the options are given; the first error they answer
//     stops the parse. A repeated option runs its row again (the last value wins unless the row objects).
// The answer is one line of text without the program's name, for the caller to print.
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace velmar {

struct CommandLineOption {
    std::string_view name;   // "--speed"
    std::string_view value;  // the value's placeholder ("X", "FILE"); empty for a flag
    std::string help;        // one paragraph, word-wrapped to the help's width; '\n' forces a break
    // Takes the option's value (empty for a flag) and answers a usage error, or "" when it is accepted.
    std::function<std::string(std::string_view value)> apply;
    std::string synopsis = {};  // the usage line's fragment; empty: "[--name VALUE]"
    bool inSynopsis = true;     // false: another row's fragment already shows this option
};

// How a program words its usage errors; "{}" stands for the argument. The defaults suit most programs;
// one that has always worded an error differently keeps its wording here.
struct CommandLineWording {
    std::string_view unknownOption = "unknown option {}";
    std::string_view unexpectedArgument = "unexpected argument \"{}\"";
    std::string_view takesNoValue = "{} takes no value";
};

struct CommandLine {
    std::string_view usage;   // how the usage line begins: "usage: velmar-decode"
    std::string description;  // text between the usage line and the options; '\n' ends a paragraph
    std::vector<CommandLineOption> options;
    std::string_view operands = {};  // the operands on the usage line ("FILE..."); empty: none are taken
    std::function<std::string(std::string_view operand)> takeOperand = {};
    std::string epilogue = {};  // text after the options; '\n' ends a paragraph
    CommandLineWording wording = {};
};

struct CommandLineResult {
    bool help = false;
    bool version = false;
    std::string error;                    // the usage error; empty when the line was understood
    std::vector<std::string_view> given;  // the options given, spelled as in the table, in order
};

// Rows' functions for the common cases: a flag that sets a bool, an option whose value is stored as given.
std::function<std::string(std::string_view)> setsFlag(bool& flag);
std::function<std::string(std::string_view)> storesValue(std::string& into);

// --log-stderr, which every program has: mirror the system log's lines to standard error.
CommandLineOption logStderrOption(bool& mirror);

CommandLineResult parseCommandLine(const CommandLine& commandLine, const std::vector<std::string>& arguments);

// The arguments after the program's name.
std::vector<std::string> commandLineArguments(int argc, const char* const* argv);

// The --help text, every line within 100 columns: the usage line (the rows' fragments, then the operands),
// the description, every option with its help paragraph (and --help and --version), then the epilogue.
std::string commandLineHelp(const CommandLine& commandLine);

}  // namespace velmar
