// DiagCapture: raw diagnostic-port captures, the byte stream exactly as it came off the port.
//
// Framing and frame kinds: DiagFraming.h. A frame that is damaged (bad CRC, an escape with nothing after it,
// fewer than 3 bytes, bytes after the last 0x7E, a log packet whose record length is below the DLF header or
// past the frame's end) is counted as bad and skipped: captures from real phones hold a few of those and the
// rest of the stream is still good. Empty frames (0x7E 0x7E) are ignored; frames other than log packets
// (command replies) are counted as "other" and skipped. Each blob's offset is where its frame starts in the
// input. The only fatal error is an unreadable file.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "logfile/DiagFraming.h"
#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

// Streams the log packets of a capture held in memory; name is used in messages. Fills the frame counters
// of stats. Always answers true (damage is counted, not fatal).
bool scanDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                          const LogItemCallback& callback, std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name);

bool forEachDiagCaptureItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats = nullptr);
LogReadResult readDiagCapture(const std::string& path);

}  // namespace velmar
