// ReplaySource: a recorded log (hex blob file, DLF, raw diagnostic-port capture or snapshot, told apart by
// extension or content) replayed as the baseband.
//
// Contract: prepare() reads the whole recording of a regular file of at most kMaxRecordingBytes (tick items
// are skipped: refreshes are the monitor's business, not the baseband's). Any other input (a pipe, a FIFO, a
// character device) is opened without waiting for a writer and read on the queue as it comes, at most one
// chunk per wake and kMaxRecordingBytes in all; its first kProbeBytes must read as a recording, and its
// replay starts when its writer has finished. Such an input that goes wrong is logged and leaves the source
// silent; the service stays up. Replay starts with start(). At its recorded pace (ReplayPacer, times the
// speed) blobs go out when they are due whether or not a channel is streaming, as a baseband's would. In
// fast mode blobs go out as fast as the channels take them: only while BlobSink::canTakeMore() holds, so the
// replay waits for a first streaming channel and never outruns every client. With loop the replay starts
// over at the end; otherwise the source falls silent and the service stays up.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "logfile/LogReadResult.h"
#include "service/BasebandSource.h"
#include "service/ReplayPacer.h"

namespace velmar {

class ReplaySource : public BasebandSource {
  public:
    struct Settings {
        std::string path;
        double speed = 1.0;
        bool fast = false;
        bool loop = false;
    };

    static constexpr std::size_t kMaxRecordingBytes = 256 * 1024 * 1024;
    static constexpr std::size_t kReadChunkBytes = 64 * 1024;
    static constexpr std::size_t kProbeBytes = 128 * 1024;

    explicit ReplaySource(Settings settings);
    ~ReplaySource() override;

    bool prepare(std::string& error) override;
    void start(MainQueue& queue, BlobSink& sink) override;
    void stop() override;
    std::string description() const override;

    std::size_t blobCount() const { return ends_.size(); }

  private:
    using Clock = std::chrono::steady_clock;
    // Blobs delivered per queue turn at most, so that ports and timers are served in between.
    static constexpr int kBatch = 256;

    ByteView blob(std::size_t index) const;
    bool keepBlobs(const std::function<bool(const LogItemCallback&, std::string&)>& read, std::string& error);
    void beginReplay();
    void readStream();
    // Whether the first bytes of a streamed input read as a recording; false with the reader's message.
    bool probeStream(std::string& error);
    void streamFailed(const std::string& reason);
    void closeStream();
    template <typename Step>
    void schedule(Step step);
    void pumpPaced();
    void pumpFast();
    // Delivers the current blob and moves on to the next; false when the replay is over.
    bool deliverAndAdvance();

    Settings settings_;
    PlistData bytes_;                // every blob, one after the other
    std::vector<std::size_t> ends_;  // blob i is bytes_[ends_[i - 1], ends_[i])
    ReplayPacer pacer_;
    MainQueue* queue_ = nullptr;
    BlobSink* sink_ = nullptr;
    std::shared_ptr<bool> alive_;  // tasks scheduled on the queue hold it weakly
    MainQueue::Handle timer_ = 0;
    Clock::time_point started_;
    double due_ = 0;  // seconds after started_ at which blob next_ is due
    std::size_t next_ = 0;
    std::uint64_t round_ = 1;
    std::uint64_t delivered_ = 0;
    bool finished_ = false;
    bool waiting_ = false;  // fast mode: waiting for a channel to take blobs
    // A streamed input: its descriptor while it is read, and what has come so far.
    int streamFd_ = -1;
    MainQueue::Handle streamWatch_ = 0;
    PlistData streamed_;
    bool probed_ = false;
};

}  // namespace velmar
