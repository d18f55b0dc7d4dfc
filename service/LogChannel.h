// LogChannel: one client's log channel: the port on which the service hears the client's commands, the
// client's receive port to which it streams, the start command's filter and the queue of blobs waiting.
//
// Contract:
// - open() connects to the client's receive port and listens on a new channel port (a feeding port, so
//   the client's hanging up invalidates it). Failures answer the protocol's error code and a reason.
// - Commands on the channel port: "GetTechnology" is answered with the service's technology constant; a
//   "SetState" of "Streaming" sets the filter from the command (every blob for the object-based
//   technology) and starts streaming; any other state stops it. Until the first start command nothing is
//   sent. Other messages get an error answer.
// - Only the client's own process (the one that asked for the channel) may connect to the channel port.
// - offer() sends a blob that the filter takes as one message (id 0, no reply wanted), exactly as it came.
//   Sends never block: a blob the socket cannot take now waits in a bounded queue, sent when the socket
//   turns writable again; when the queue is full, or the service's queue budget (shared by every channel)
//   is spent and this channel is the furthest behind, the oldest blobs are dropped, counted and logged at
//   most once a second.
// - keepsUp() and stalled() tell a source that is not paced by time whether to go on: it waits for a
//   channel that is behind but moving, never for one whose client has stopped reading.
// - The channel ends when the client goes away (its channel port or receive port hangs up, or a send to it
//   fails) or when the service stops: both ports are invalidated (the channel port's socket file goes with
//   it) and the listener is told once.
#pragma once

#include <sys/types.h>

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "core/platform/LogRateLimit.h"
#include "core/platform/MainQueue.h"
#include "core/platform/MessagePort.h"
#include "service/BasebandBlob.h"
#include "service/BlobQueue.h"
#include "service/LogCodeFilter.h"
#include "service/QueueBudget.h"

namespace velmar {

class LogChannel : public std::enable_shared_from_this<LogChannel>, private QueueBudget::Member {
  public:
    // What the channel tells the service it belongs to.
    class Listener {
      public:
        virtual ~Listener() = default;
        // The channel may take more now: it has started streaming, its queue is short again, or its client
        // has stalled and no longer holds a paced source back.
        virtual void channelReady(LogChannel& channel) = 0;
        // The channel started or stopped streaming, or its filter changed.
        virtual void channelStreamingChanged(LogChannel& channel) = 0;
        virtual void channelEnded(LogChannel& channel) = 0;
    };

    struct Settings {
        unsigned id = 0;
        std::string channelPortName;
        std::string receivePortName;
        std::string_view technology;
        bool objectBased = false;       // the technology's start command names no codes: stream every blob
        pid_t clientPid = 0;            // the only process that may connect to the channel port; 0: any
        QueueBudget* budget = nullptr;  // shared by the service's channels; outlives them
    };

    // Limits of the queue of blobs that the client's socket could not take yet.
    static constexpr std::size_t kQueueBlobs = 20000;
    static constexpr std::size_t kQueueBytes = 64 * 1024 * 1024;
    // A channel with fewer blobs than this queued keeps up with the source.
    static constexpr std::size_t kKeepsUpBelow = 1024;
    // A channel that does not keep up and has sent nothing for this long has a stalled client.
    static constexpr double kStallSeconds = 0.5;
    static constexpr double kDropReportSeconds = 1.0;
    // Connections the channel port takes at once (its client needs one).
    static constexpr std::size_t kChannelPortConnections = 4;
    // Queued blobs sent per wake at most, so that one fast client does not hold the thread.
    static constexpr int kFlushPerWake = 256;

    // Null on failure, with the protocol's error code and a reason.
    static std::shared_ptr<LogChannel> open(Settings settings, MainQueue& queue, Listener& listener,
                                            std::int32_t& error, std::string& reason);
    ~LogChannel() override;
    LogChannel(const LogChannel&) = delete;
    LogChannel& operator=(const LogChannel&) = delete;

    void offer(const BasebandBlob& blob) {
        if (streaming_ && filter_.accepts(blob)) {
            send(blob.bytes);
        }
    }
    bool keepsUp() const { return streaming_ && queued_.size() < kKeepsUpBelow; }
    // Streaming, not keeping up, and nothing sent for kStallSeconds: a client that has stopped reading.
    bool stalled(std::chrono::steady_clock::time_point now) const;
    // Ends the channel (see the contract); reason goes to the log.
    void end(const std::string& reason);

    unsigned id() const { return settings_.id; }
    const std::string& channelPortName() const { return settings_.channelPortName; }
    bool streaming() const { return streaming_; }
    const LogCodeFilter& filter() const { return filter_; }
    bool ended() const { return ended_; }
    std::size_t queued() const { return queued_.size(); }
    std::uint64_t sent() const { return sent_; }
    std::uint64_t dropped() const { return dropped_; }

  private:
    LogChannel(Settings settings, MainQueue& queue, Listener& listener);

    std::optional<PlistData> onCommand(ByteView data);
    void onStateCommand(const PlistDictionary& command, const std::string& state,
                        std::optional<PlistData>& reply);
    void send(ByteView bytes);
    void flush();
    void scheduleFlush();
    // Tells the listener when a channel that is behind stops making progress (its client stalled).
    void watchForStall();
    std::size_t queuedBytes() const override { return queued_.bytes(); }
    bool clientStalled() const override { return stalled(std::chrono::steady_clock::now()); }
    bool shedOldest() override;
    void noteDrops(std::size_t count);
    void reportDrops();
    void sendFailed(std::int32_t status);

    Settings settings_;
    MainQueue& queue_;
    Listener& listener_;
    std::shared_ptr<MessagePort> channelPort_;
    std::shared_ptr<MessagePort> receivePort_;
    LogCodeFilter filter_;
    BlobQueue queued_;
    bool streaming_ = false;
    bool ended_ = false;
    bool flushArmed_ = false;
    MainQueue::Handle stallTimer_ = 0;
    MainQueue::Handle dropTimer_ = 0;
    std::chrono::steady_clock::time_point lastDropReport_{};
    std::chrono::steady_clock::time_point lastProgress_{};  // last send, or when the queue began
    std::uint64_t sent_ = 0;
    std::uint64_t dropped_ = 0;
    std::uint64_t unreportedDrops_ = 0;
    LogRateLimit rejections_;
};

}  // namespace velmar
