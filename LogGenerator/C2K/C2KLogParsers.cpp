#include "LogGenerator/C2K/C2KLogParsers.h"

namespace velmar::c2k {

C2KLogParser parserForCode(std::int32_t code) {
    for (const C2KParserRow& row : kParsers) {
        if (row.code == code) {
            return row.parse;
        }
    }
    return nullptr;
}

}  // namespace velmar::c2k
