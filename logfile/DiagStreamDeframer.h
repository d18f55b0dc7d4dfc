// DiagStreamDeframer: cuts a diagnostic-port byte stream into frames as it arrives, in chunks of any size,
// and hands out the log packets it finds. The capture file reader is this deframer fed once with the whole
// file, so a live port and a recorded capture are framed by the same code.
//
// Contract (the framing and frame kinds are described in DiagCapture.h):
// - feed() takes the next bytes of the stream; a frame cut between two chunks is completed by the next one.
//   Feeding a stream whole or in any chunking gives the same items, offsets, counters and messages.
// - Each blob goes to the callback as it is found; its bytes are valid only during the call and its offset
//   is where its frame starts in the stream (bytes fed so far). The callback returning false stops the
//   deframer: later bytes are ignored.
// - A frame longer than kMaxDiagFrameBytes (escaped) is bad and skipped up to its 0x7E, so a stream that
//   never ends a frame cannot make the deframer hold more than that.
// - finish() ends one input: bytes after the last 0x7E are a bad frame, and the bad frames beyond the first
//   kMaxReportedProblems of this input are summed up in one warning. The deframer may then be fed a new
//   input; its offsets keep counting.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

// The longest frame, escaped, that a deframer accepts: a 64 KiB record with every byte escaped and room
// for the packet and wrapper headers.
inline constexpr std::size_t kMaxDiagFrameBytes = 256 * 1024;

class DiagStreamDeframer {
  public:
    // name is used in messages; stats (may be null) receives the frame counters and problems.
    DiagStreamDeframer(std::string name, LogItemCallback callback, LogReadStats* stats = nullptr);

    void feed(std::span<const std::uint8_t> bytes);
    void finish();

    bool stopped() const { return stopped_; }
    // Bytes fed so far.
    std::uint64_t consumed() const { return consumed_; }
    const LogReadStats& stats() const { return *stats_; }

  private:
    void frame(std::uint64_t offset, const std::uint8_t* escaped, std::size_t size);
    bool unescape(const std::uint8_t* in, std::size_t size, std::size_t& length);
    void handle(std::uint64_t offset, std::size_t length);
    void bad(std::uint64_t offset, const std::string& reason);

    std::string name_;
    LogItemCallback callback_;
    LogReadStats ownStats_;
    LogReadStats* stats_;
    PlistData frame_;    // the current frame, unescaped; grows to the largest frame
    PlistData pending_;  // escaped bytes of a frame that the chunks seen so far have not ended
    std::uint64_t pendingStart_ = 0;
    bool overlong_ = false;  // the pending frame was too long: skipping to its 0x7E
    std::uint64_t consumed_ = 0;
    std::uint64_t badHere_ = 0;  // bad frames of this input (stats_ may carry counts of earlier ones)
    bool stopped_ = false;
};

}  // namespace velmar
