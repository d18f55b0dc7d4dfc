#include "core/platform/CommandLine.h"

#include <algorithm>
#include <initializer_list>

namespace velmar {

namespace {

constexpr std::size_t kHelpWidth = 100;
constexpr std::size_t kOptionIndent = 2;
constexpr std::size_t kLabelGap = 2;
constexpr std::size_t kWidestHelpColumn = 30;  // a longer label puts its paragraph on the next line

constexpr std::string_view kHelpOption = "--help";
constexpr std::string_view kHelpOptionShort = "-h";
constexpr std::string_view kHelpParagraph = "show this help and exit";
constexpr std::string_view kVersionOption = "--version";
constexpr std::string_view kVersionParagraph = "show the version and build date and exit";
constexpr std::string_view kEndOfOptions = "--";

std::string worded(std::string_view wording, std::string_view argument) {
    std::string text(wording);
    if (const std::size_t at = text.find("{}"); at != std::string::npos) {
        text.replace(at, 2, argument);
    }
    return text;
}

const CommandLineOption* findOption(const CommandLine& commandLine, std::string_view name) {
    for (const CommandLineOption& option : commandLine.options) {
        if (option.name == name) {
            return &option;
        }
    }
    return nullptr;
}

bool isOption(std::string_view argument) {
    return argument.size() > 1 && argument.front() == '-';
}

// Whether one of `names` stands among the options, that is before a "--" that ends them.
bool givenAmongOptions(const CommandLine& commandLine, const std::vector<std::string>& arguments,
                       std::initializer_list<std::string_view> names) {
    for (const std::string& argument : arguments) {
        if (argument == kEndOfOptions && commandLine.takeOperand) {
            return false;
        }
        if (std::find(names.begin(), names.end(), argument) != names.end()) {
            return true;
        }
    }
    return false;
}

std::vector<std::string_view> wordsOf(std::string_view text) {
    std::vector<std::string_view> words;
    std::size_t start = 0;
    while (start < text.size()) {
        if (text[start] == ' ') {
            ++start;
            continue;
        }
        if (text[start] == '\n') {
            words.push_back(text.substr(start, 1));
            ++start;
            continue;
        }
        const std::size_t end = text.find_first_of(" \n", start);
        const std::size_t length = (end == std::string_view::npos ? text.size() : end) - start;
        words.push_back(text.substr(start, length));
        start += length;
    }
    return words;
}

// Appends words to out as lines that start at `indent` and end before kHelpWidth; the first line continues
// whatever out already holds, whose last line is `column` characters long. A '\n' word breaks the line.
void appendWrapped(std::string& out, const std::vector<std::string_view>& words, std::size_t indent,
                   std::size_t column) {
    bool lineEmpty = true;
    for (const std::string_view word : words) {
        if (word == "\n") {
            out += '\n';
            out.append(indent, ' ');
            column = indent;
            lineEmpty = true;
            continue;
        }
        const std::size_t needed = word.size() + (lineEmpty ? 0 : 1);
        if (!lineEmpty && column + needed > kHelpWidth) {
            out += '\n';
            out.append(indent, ' ');
            column = indent;
            lineEmpty = true;
        }
        if (!lineEmpty) {
            out += ' ';
            ++column;
        }
        out += word;
        column += word.size();
        lineEmpty = false;
    }
    out += '\n';
}

std::string labelOf(const CommandLineOption& option) {
    std::string label(option.name);
    if (!option.value.empty()) {
        label += ' ';
        label += option.value;
    }
    return label;
}

std::string synopsisOf(const CommandLineOption& option) {
    if (!option.synopsis.empty()) {
        return option.synopsis;
    }
    return "[" + labelOf(option) + "]";
}

void appendParagraphs(std::string& out, const std::string& text) {
    if (text.empty()) {
        return;
    }
    out += '\n';
    appendWrapped(out, wordsOf(text), 0, 0);
}

}  // namespace

std::function<std::string(std::string_view)> setsFlag(bool& flag) {
    return [&flag](std::string_view) {
        flag = true;
        return std::string();
    };
}

std::function<std::string(std::string_view)> storesValue(std::string& into) {
    return [&into](std::string_view value) {
        into = value;
        return std::string();
    };
}

CommandLineOption logStderrOption(bool& mirror) {
    return {.name = "--log-stderr",
            .value = "",
            .help =
                "mirror system-log lines to standard error as '<priority> <text>' "
                "(VELMAR_LOG_LEVEL=error|warning|notice|info|debug sets how much; default error)",
            .apply = setsFlag(mirror)};
}

CommandLineResult parseCommandLine(const CommandLine& commandLine,
                                   const std::vector<std::string>& arguments) {
    CommandLineResult result;
    if (givenAmongOptions(commandLine, arguments, {kHelpOption, kHelpOptionShort})) {
        result.help = true;
        return result;
    }
    if (givenAmongOptions(commandLine, arguments, {kVersionOption})) {
        result.version = true;
        return result;
    }
    const auto takeOperand = [&commandLine](std::string_view operand) {
        if (!commandLine.takeOperand) {
            return worded(commandLine.wording.unexpectedArgument, operand);
        }
        return commandLine.takeOperand(operand);
    };
    for (std::size_t index = 0; index < arguments.size() && result.error.empty(); ++index) {
        const std::string_view argument = arguments[index];
        if (argument == kEndOfOptions) {
            if (!commandLine.takeOperand) {
                result.error = takeOperand(argument);
                break;
            }
            for (++index; index < arguments.size() && result.error.empty(); ++index) {
                result.error = takeOperand(arguments[index]);
            }
            break;
        }
        if (!isOption(argument)) {
            result.error = takeOperand(argument);
            continue;
        }
        std::string_view name = argument;
        std::string_view inlineValue;
        bool hasInlineValue = false;
        if (const std::size_t equals = argument.find('=');
            argument.starts_with("--") && equals != argument.npos) {
            name = argument.substr(0, equals);
            inlineValue = argument.substr(equals + 1);
            hasInlineValue = true;
        }
        const CommandLineOption* option = findOption(commandLine, name);
        if (option == nullptr) {
            result.error = worded(commandLine.wording.unknownOption, name);
            break;
        }
        std::string_view value;
        if (option->value.empty()) {
            if (hasInlineValue) {
                result.error = worded(commandLine.wording.takesNoValue, name);
                break;
            }
        } else {
            if (hasInlineValue) {
                value = inlineValue;
            } else if (index + 1 < arguments.size()) {
                value = arguments[++index];
            }
            if (value.empty()) {
                result.error = std::string(name) + " needs a value";
                break;
            }
        }
        result.given.push_back(option->name);
        result.error = option->apply(value);
    }
    return result;
}

std::vector<std::string> commandLineArguments(int argc, const char* const* argv) {
    if (argc <= 1 || argv == nullptr) {
        return {};
    }
    return std::vector<std::string>(argv + 1, argv + argc);
}

std::string commandLineHelp(const CommandLine& commandLine) {
    std::string out(commandLine.usage);
    std::vector<std::string> fragments;
    for (const CommandLineOption& option : commandLine.options) {
        if (option.inSynopsis) {
            fragments.push_back(synopsisOf(option));
        }
    }
    if (!commandLine.operands.empty()) {
        fragments.emplace_back(commandLine.operands);
    }
    // A fragment ("[--speed X | --fast]") is never split across lines.
    const std::size_t synopsisIndent = commandLine.usage.size() + 1;
    std::size_t column = out.size();
    for (const std::string& fragment : fragments) {
        if (column > synopsisIndent && column + 1 + fragment.size() > kHelpWidth) {
            out += '\n';
            out.append(synopsisIndent, ' ');
            column = synopsisIndent;
        } else {
            out += ' ';
            ++column;
        }
        out += fragment;
        column += fragment.size();
    }
    out += '\n';
    appendParagraphs(out, commandLine.description);

    std::vector<std::pair<std::string, std::string_view>> entries;
    for (const CommandLineOption& option : commandLine.options) {
        entries.emplace_back(labelOf(option), option.help);
    }
    entries.emplace_back(std::string(kHelpOption), kHelpParagraph);
    entries.emplace_back(std::string(kVersionOption), kVersionParagraph);
    std::size_t widest = 0;
    for (const auto& [label, help] : entries) {
        widest = std::max(widest, label.size());
    }
    const std::size_t helpColumn = std::min(kOptionIndent + widest + kLabelGap, kWidestHelpColumn);
    out += '\n';
    for (const auto& [label, help] : entries) {
        out.append(kOptionIndent, ' ');
        out += label;
        std::size_t labelEnd = kOptionIndent + label.size();
        if (labelEnd + kLabelGap > helpColumn) {
            out += '\n';
            labelEnd = 0;
        }
        out.append(helpColumn - labelEnd, ' ');
        appendWrapped(out, wordsOf(help), helpColumn, helpColumn);
    }
    appendParagraphs(out, commandLine.epilogue);
    return out;
}

}  // namespace velmar
