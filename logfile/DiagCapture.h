// DiagCapture: raw diagnostic-port captures, the byte stream exactly as it came off the port.
//
// Framing and frame kinds: DiagFraming.h. A frame that is damaged (bad CRC, an escape with nothing after it,
// fewer than 3 bytes, bytes after the last 0x7E, a log packet whose record length is below the DLF header or
// past the frame's end) is counted as bad and skipped: captures from real phones hold a few of those and the
// rest of the stream is still good. Empty frames (0x7E 0x7E) are ignored; frames other than log packets
// (command replies) are counted as "other" and skipped. Each blob's offset is where its frame starts in the
// input. The fatal errors are an unreadable file and a frame longer than kMaxDiagFrameBytes (a stream that
// is not a capture, or an endless one without a 0x7E): "cap.qmdl: offset 0: frame longer than 262144 bytes".
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "logfile/DiagFraming.h"
#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

class LogByteStream;

// Streams the log packets of a capture read through stream (DiagStreamDeframer fed chunk by chunk); name is
// used in messages. Fills the frame counters of stats.
bool scanDiagCaptureStream(LogByteStream& stream, const std::string& name, const LogItemCallback& callback,
                           std::string& error, LogReadStats* stats = nullptr);
// The same for a capture held in memory.
bool scanDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                          const LogItemCallback& callback, std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name);

bool forEachDiagCaptureItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats = nullptr);
LogReadResult readDiagCapture(const std::string& path);

}  // namespace velmar
