#include "LogGenerator/C2K/C2KLogParsers.h"

#include <array>

#include "LogGenerator/C2K/C2KLogCodes.h"

namespace velmar::c2k {

namespace {

struct ParserEntry {
    std::int32_t code;
    C2KLogParser parse;
};

constexpr std::array<ParserEntry, 8> kParsers{{
    {kFingerC2ICode, &parseFingerC2I},
    {kEvdoStatusCode, &parseEvdoStatus},
    {kForwardLinkRateCode, &parseForwardLinkRate},
    {kEvdoActiveSetCode, &parseEvdoActiveSet},
    {k1xStatusCode, &parse1xStatus},
    {k1xTrafficCode, &parse1xTrafficFrameErrors},
    {kReverseLinkRateCode, &parseReverseLinkRate},
    {k1xSystemIdentityCode, &parse1xSystemIdentity},
}};

}  // namespace

C2KLogParser parserForCode(std::int32_t code) {
    for (const ParserEntry& entry : kParsers) {
        if (entry.code == code) {
            return entry.parse;
        }
    }
    return nullptr;
}

}  // namespace velmar::c2k
