// DiagStreamDeframer: cuts a diagnostic-port byte stream into frames as it arrives, in chunks of any size,
// and checks them. The capture file reader is this deframer fed once with the whole file, so a live port and
// a recorded capture are framed by the same code.
//
// Contract (the framing and frame kinds are described in DiagFraming.h):
// - feed() takes the next bytes of the stream; a frame cut between two chunks is completed by the next one.
//   Feeding a stream whole or in any chunking gives the same frames, items, offsets, counters and messages.
// - Frame mode (a DiagFrameSink): every frame whose CRC checks goes to the sink, unescaped and without its
//   CRC, with its bytes as received; the sink interprets it (readDiagFrame) and may report it bad().
// - Log-packet mode (a LogItemCallback): each log packet's blob goes to the callback; other frames are
//   counted as "other" and damaged ones as bad.
// - Bytes handed out are valid only during the call; an offset is where the frame starts in the stream
//   (bytes fed so far). A sink or callback returning false stops the deframer: later bytes are ignored.
// - A frame longer than kMaxDiagFrameBytes (escaped) is bad and skipped up to its 0x7E, so a stream that
//   never ends a frame cannot make the deframer hold more than that. A file reader calls
//   stopAtOverlongFrame(): such a frame then stops the deframer instead, and overlongFrameAt() says where it
//   started, so that an endless run of bytes without a 0x7E ends the reading.
// - finish() ends one input: bytes after the last 0x7E are a bad frame, and the bad frames beyond the first
//   kMaxReportedProblems of this input are summed up in one warning. The deframer may then be fed a new
//   input; its offsets keep counting.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

// One frame whose CRC checked.
struct DiagFrameView {
    std::uint64_t offset = 0;
    std::span<const std::uint8_t> escaped;  // the frame as received, without its closing 0x7E
    std::span<std::uint8_t> payload;        // escapes undone, CRC removed; at least one byte; writable
};

class DiagFrameSink {
  public:
    virtual ~DiagFrameSink() = default;
    // false stops the deframer.
    virtual bool onDiagFrame(const DiagFrameView& frame) = 0;
};

// The longest frame, escaped, that a deframer accepts: a 64 KiB record with every byte escaped and room
// for the packet and wrapper headers.
inline constexpr std::size_t kMaxDiagFrameBytes = 256 * 1024;

class DiagStreamDeframer {
  public:
    // name is used in messages; stats (may be null) receives the frame counters and problems.
    DiagStreamDeframer(std::string name, LogItemCallback callback, LogReadStats* stats = nullptr);
    DiagStreamDeframer(std::string name, DiagFrameSink& frames, LogReadStats* stats = nullptr);

    void feed(std::span<const std::uint8_t> bytes);
    // Sums up the bad frames beyond the first few described since the last summary, in one warning, and
    // describes the next few again: a stream that never ends reports its damage this way.
    void reportSkipped();
    // The name in later messages (a live source's next port).
    void setName(std::string name) { name_ = std::move(name); }
    void finish();

    void stopAtOverlongFrame() { stopAtOverlong_ = true; }
    // Where the frame that stopped the deframer for its length starts, if one did.
    std::optional<std::uint64_t> overlongFrameAt() const { return overlongAt_; }

    bool stopped() const { return stopped_; }
    // Bytes fed so far.
    std::uint64_t consumed() const { return consumed_; }
    const LogReadStats& stats() const { return *stats_; }
    // Counts a frame found bad (by the deframer, or by a frame sink that read it); the first few of this
    // input are also described and logged as warnings.
    void bad(std::uint64_t offset, const std::string& reason);

  private:
    void frame(std::uint64_t offset, const std::uint8_t* escaped, std::size_t size);
    bool unescape(const std::uint8_t* in, std::size_t size, std::size_t& length);
    void handle(std::uint64_t offset, std::span<const std::uint8_t> escaped, std::size_t length);
    void overlong(std::uint64_t offset);

    std::string name_;
    LogItemCallback callback_;
    DiagFrameSink* frames_ = nullptr;
    LogReadStats ownStats_;
    LogReadStats* stats_;
    PlistData frame_;    // the current frame, unescaped; grows to the largest frame
    PlistData pending_;  // escaped bytes of a frame that the chunks seen so far have not ended
    std::uint64_t pendingStart_ = 0;
    bool overlong_ = false;  // the pending frame was too long: skipping to its 0x7E
    std::uint64_t consumed_ = 0;
    std::uint64_t badHere_ = 0;  // bad frames of this input (stats_ may carry counts of earlier ones)
    bool stopped_ = false;
    bool stopAtOverlong_ = false;
    std::optional<std::uint64_t> overlongAt_;
};

}  // namespace velmar
