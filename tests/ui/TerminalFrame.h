// TerminalFrame: for the terminal front end's tests, the frame it would draw now on a screen of the given
// size, one UTF-8 string per row (plain characters, no attributes).
#pragma once

#include <string>
#include <vector>

namespace velmar {
class TerminalFrontEnd;
}

namespace velmar::testing {

std::vector<std::string> terminalFrame(TerminalFrontEnd& frontEnd, int rows, int columns);

}  // namespace velmar::testing
