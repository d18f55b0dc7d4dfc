// DiagPort: the device file of a modem's diagnostic port, opened so that it never blocks the service.
//
// Contract:
// - open() takes a character device (a tty, a /dev/serial/by-id link to one) or a FIFO fed with a capture.
//   A device is opened read-write, non-blocking, without becoming the controlling terminal; a tty is made
//   raw (8 bits, receiver on, modem-control lines ignored, no flow control of either kind: the data hold
//   0x11 and 0x13), DTR and RTS are asserted where the driver has them, and both directions are flushed. A
//   FIFO is opened read-only: it can only be listened to. Anything else is refused.
// - read() answers the bytes read (0 when nothing is waiting), or Ended when the device hung up, the writer
//   of a FIFO closed it, or a read failed (the reason in error()).
// - write() queues bytes and writes what the device takes now; the rest goes out when the main queue sees
//   the device writable. At most kMaxQueuedBytes wait: beyond that write() refuses (false) rather than grow.
//   A failed write is reported once through the failure callback.
// - Closing (destructor) stops every watch; nothing scheduled runs afterwards.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <span>
#include <string>

#include "core/platform/ByteView.h"
#include "core/platform/MainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::live {

class DiagPort {
  public:
    enum class Kind { Device, Fifo };
    static constexpr std::size_t kMaxQueuedBytes = 256 * 1024;
    static constexpr std::ptrdiff_t kEnded = -1;

    // Null with "path: reason" in error.
    static std::unique_ptr<DiagPort> open(const std::string& path, std::string& error);
    ~DiagPort();
    DiagPort(const DiagPort&) = delete;
    DiagPort& operator=(const DiagPort&) = delete;

    // Watches the device on queue: onReadable whenever it has data or hung up, onFailed when a queued write
    // fails (once).
    void attach(MainQueue& queue, std::function<void()> onReadable,
                std::function<void(std::string)> onFailed);

    // Stops watching the device (the descriptor stays open until the port goes).
    void detach();
    // Bytes read into buffer, 0 when none are waiting, or kEnded.
    std::ptrdiff_t read(std::span<std::uint8_t> buffer);
    bool write(ByteView bytes);

    Kind kind() const { return kind_; }
    const std::string& path() const { return path_; }
    const std::string& error() const { return error_; }
    std::size_t queuedBytes() const { return queued_.size() - sent_; }

  private:
    DiagPort(std::string path, int fd, Kind kind) : path_(std::move(path)), fd_(fd), kind_(kind) {}
    void flush();
    void failed(int error);

    std::string path_;
    int fd_ = -1;
    Kind kind_ = Kind::Device;
    MainQueue* queue_ = nullptr;
    MainQueue::Handle readWatch_ = 0;
    MainQueue::Handle writeWatch_ = 0;
    std::function<void(std::string)> onFailed_;
    PlistData queued_;
    std::size_t sent_ = 0;  // bytes of queued_ already written
    bool broken_ = false;
    std::string error_;
};

}  // namespace velmar::live
