// C2KLogParsers: the parsers of the eight log codes that the CDMA2000 generator decodes.
//
// Contract: a parser receives the packet (channel prefix removed, log type at offset 0, fields from 13) and
// writes what it decodes through the context's lookup (C2KDisplaySetter.h). A packet that fails a length or
// version check is logged at error priority and leaves the display unchanged; nothing is thrown. Fields are
// read through RecordReader, so a field past the end of a packet that passed its checks reads as zero.
#pragma once

#include <cstdint>

#include "LogGenerator/C2K/C2KDisplaySetter.h"
#include "core/platform/RecordReader.h"

namespace velmar::c2k {

using C2KLogParser = void (*)(const RecordReader& packet, const C2KRecordContext& context);

void parseFingerC2I(const RecordReader& packet, const C2KRecordContext& context);             // 0x108A
void parseEvdoStatus(const RecordReader& packet, const C2KRecordContext& context);            // 0x1183
void parseForwardLinkRate(const RecordReader& packet, const C2KRecordContext& context);       // 0x1192
void parseEvdoActiveSet(const RecordReader& packet, const C2KRecordContext& context);         // 0x12B6
void parse1xStatus(const RecordReader& packet, const C2KRecordContext& context);              // 0x119C
void parse1xTrafficFrameErrors(const RecordReader& packet, const C2KRecordContext& context);  // 0x119D
void parseReverseLinkRate(const RecordReader& packet, const C2KRecordContext& context);       // 0x127E
void parse1xSystemIdentity(const RecordReader& packet, const C2KRecordContext& context);      // 0x134F

// The parser of a 32-bit log code, or null for a code the generator does not decode.
C2KLogParser parserForCode(std::int32_t code);

}  // namespace velmar::c2k
