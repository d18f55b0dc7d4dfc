// CaptureRecorder: --record FILE, every frame received from the diagnostic port written as received (its
// escaped bytes and the closing 0x7E) to a raw capture that velmar-decode and --source replay read.
//
// Contract:
// - open() creates or truncates a regular file with mode 0600 (an existing file is set to 0600 too); a path
//   that is not a regular file is refused, so the service can never block on it.
// - append() buffers; the buffer is written when it holds kFlushBytes, and a timer writes what it holds at
//   most kFlushSeconds after the first byte went into it. close() (and the destructor) writes the rest.
// - A write that fails (a full disk, an I/O error) is logged once as an error and ends the recording: later
//   frames are dropped, the service goes on. The buffer never holds more than kFlushBytes plus one frame.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "core/platform/ByteView.h"
#include "core/platform/MainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::live {

class CaptureRecorder {
  public:
    static constexpr std::size_t kFlushBytes = 64 * 1024;
    static constexpr double kFlushSeconds = 1.0;

    explicit CaptureRecorder(std::string path) : path_(std::move(path)) {}
    ~CaptureRecorder();
    CaptureRecorder(const CaptureRecorder&) = delete;
    CaptureRecorder& operator=(const CaptureRecorder&) = delete;

    // false with "path: reason" in error.
    bool open(std::string& error);
    // The timer that flushes runs on queue (until then, only the size flushes).
    void attach(MainQueue& queue) { queue_ = &queue; }
    void append(ByteView escapedFrame);
    void close();

    bool recording() const { return fd_ >= 0; }
    const std::string& path() const { return path_; }
    std::uint64_t written() const { return written_; }

  private:
    void flush();

    std::string path_;
    int fd_ = -1;
    PlistData buffer_;
    MainQueue* queue_ = nullptr;
    MainQueue::Handle timer_ = 0;
    std::uint64_t written_ = 0;
};

}  // namespace velmar::live
