// KxServer: the service's control port and its log channels; the sink into which the baseband source
// delivers.
//
// Contract:
// - open() takes the runtime directory's service lock (com.velmar.kxserver.lock), so that of two services
//   started at once only one serves, removes the channel sockets that services which ended without closing
//   them left behind, and listens on the control port com.velmar.kxserver (a serving port: clients come and
//   go). A held lock or a live listener at the port means another service is running: AlreadyRunning, and
//   this one must not serve. Failed comes with the reason.
// - {"Request": "CreateLogChannel", "ReceivePort": name} creates a channel (LogChannel) streaming to that
//   port, listening on "com.velmar.kxserver.channel.<pid>.<n>", which only the requesting process may use,
//   and answers {"Domain": 1, "Error": 0, "ChannelPort": name}. Anything else (a receive port named like the
//   service's own ports, more channels than Limits::channels) is answered with a non-zero Error and a
//   Reason, and logged (at most a few such lines a second).
// - Limits: channels open at once, connections to the control port at once, and one memory budget for the
//   blobs that every channel holds for its client.
// - streamingDemand() is the union of the streaming channels' filters; the demand observer hears of every
//   change of it on the queue (coalesced within one queue turn).
// - deliver() offers each blob to every channel. canTakeMore() holds when some streaming channel keeps up
//   and none is behind with a client still reading: a source that is not paced by time goes at the pace of
//   the slowest live client, while a stalled client only loses its own oldest blobs.
// - shutdown() ends every channel and closes the control port; the socket files go with them.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "core/platform/InstanceLock.h"
#include "core/platform/LogRateLimit.h"
#include "core/platform/MainQueue.h"
#include "core/platform/MessagePort.h"
#include "service/BasebandSource.h"
#include "service/LogChannel.h"
#include "service/QueueBudget.h"

namespace velmar {

class KxServer : public BlobSink, private LogChannel::Listener {
  public:
    enum class OpenResult { Serving, AlreadyRunning, Failed };
    struct Limits {
        std::size_t channels = 32;
        std::size_t connections = 64;
        std::size_t queueBytes = 64 * 1024 * 1024;
    };
    static constexpr std::string_view kChannelPortPrefix = "com.velmar.kxserver.channel.";

    // technology is the answer to "GetTechnology"; objectBased streams every blob to every channel.
    KxServer(MainQueue& queue, std::string_view technology, bool objectBased, Limits limits);
    KxServer(MainQueue& queue, std::string_view technology, bool objectBased)
        : KxServer(queue, technology, objectBased, Limits{}) {}
    ~KxServer() override;
    KxServer(const KxServer&) = delete;
    KxServer& operator=(const KxServer&) = delete;

    OpenResult open(std::string* failure = nullptr);
    void shutdown();

    void deliver(const BasebandBlob& blob) override;
    bool canTakeMore() const override;
    void notifyWhenReady(std::function<void()> ready) override;
    LogCodeFilter streamingDemand() const override;
    void observeStreamingDemand(std::function<void()> changed) override;

    std::size_t channelCount() const { return channels_.size(); }
    const QueueBudget& queueBudget() const { return budget_; }

  private:
    std::optional<PlistData> onControlMessage(ByteView data);
    PlistData reject(std::int32_t error, const std::string& reason);
    void channelReady(LogChannel& channel) override;
    void channelStreamingChanged(LogChannel& channel) override;
    void channelEnded(LogChannel& channel) override;
    // Tells the demand observer, once per queue turn however many channels changed.
    void demandChanged();
    // Resumes a source that waits for the channels to take more.
    void wakeSource();

    std::size_t openChannels() const;

    MainQueue& queue_;
    std::string_view technology_;
    bool objectBased_;
    Limits limits_;
    // Declared before the channels, which count their queues into it until they go.
    QueueBudget budget_;
    std::unique_ptr<InstanceLock> lock_;
    LogRateLimit rejections_;
    std::shared_ptr<MessagePort> controlPort_;
    std::vector<std::shared_ptr<LogChannel>> channels_;
    unsigned nextChannelId_ = 1;
    std::function<void()> ready_;
    std::function<void()> demandObserver_;
    bool pruneQueued_ = false;
    bool demandNoticeQueued_ = false;
    std::shared_ptr<bool> alive_;
};

}  // namespace velmar
