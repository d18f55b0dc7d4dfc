// C2KLogParsers: the parsers of the eight log codes that the CDMA2000 generator decodes, and the table that
// says which parser handles which code.
//
// Contract: a parser receives the packet (channel prefix removed, log type at offset 0, fields from 13) and
// writes what it decodes through the context's lookup (C2KDisplaySetter.h). A packet that fails a length or
// version check is logged at error priority and leaves the display unchanged; nothing is thrown. Fields are
// read through RecordReader, so a field past the end of a packet that passed its checks reads as zero.
#pragma once

#include <cstdint>

#include "LogGenerator/C2K/C2KDisplaySetter.h"
#include "core/platform/RecordReader.h"
#include "core/platform/logcodes/CdmaLogCodes.h"

namespace velmar::c2k {

using C2KLogParser = void (*)(const RecordReader& packet, const C2KRecordContext& context);

void parseFingerC2I(const RecordReader& packet, const C2KRecordContext& context);
void parseEvdoStatus(const RecordReader& packet, const C2KRecordContext& context);
void parseForwardLinkRate(const RecordReader& packet, const C2KRecordContext& context);
void parseEvdoActiveSet(const RecordReader& packet, const C2KRecordContext& context);
void parse1xStatus(const RecordReader& packet, const C2KRecordContext& context);
void parse1xTrafficFrameErrors(const RecordReader& packet, const C2KRecordContext& context);
void parseReverseLinkRate(const RecordReader& packet, const C2KRecordContext& context);
void parse1xSystemIdentity(const RecordReader& packet, const C2KRecordContext& context);

struct C2KParserRow {
    std::int32_t code;
    const char* name;
    C2KLogParser parse;
};

// Every code the generator decodes with its parser, in the order in which the start command asks for them.
inline constexpr C2KParserRow kParsers[] = {
    {kLogCodeCdmaFingerC2I, "parseFingerC2I", &parseFingerC2I},
    {kLogCodeCdmaEvdoStatus, "parseEvdoStatus", &parseEvdoStatus},
    {kLogCodeCdmaForwardLinkRate, "parseForwardLinkRate", &parseForwardLinkRate},
    {kLogCodeCdmaEvdoActiveSet, "parseEvdoActiveSet", &parseEvdoActiveSet},
    {kLogCodeCdma1xStatus, "parse1xStatus", &parse1xStatus},
    {kLogCodeCdma1xTraffic, "parse1xTrafficFrameErrors", &parse1xTrafficFrameErrors},
    {kLogCodeCdmaReverseLinkRate, "parseReverseLinkRate", &parseReverseLinkRate},
    {kLogCodeCdma1xSystemIdentity, "parse1xSystemIdentity", &parse1xSystemIdentity},
};

// The parser of a 32-bit log code, or null for a code the generator does not decode.
C2KLogParser parserForCode(std::int32_t code);

}  // namespace velmar::c2k
