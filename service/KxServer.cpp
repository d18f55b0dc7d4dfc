#include "service/KxServer.h"

#include <unistd.h>

#include <algorithm>
#include <chrono>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "service/KxReplies.h"

namespace velmar {

namespace {

// A port name is a socket file's name in the runtime directory: no path, nothing hidden in it.
bool isPortName(const std::string& name) {
    constexpr std::size_t kMaxPortName = 96;
    return !name.empty() && name.size() <= kMaxPortName && name != "." && name != ".." &&
           std::none_of(name.begin(), name.end(), [](char c) { return c == '/' || c == '\0'; });
}

}  // namespace

KxServer::KxServer(MainQueue& queue, std::string_view technology, bool objectBased, Limits limits)
    : queue_(queue),
      technology_(technology),
      objectBased_(objectBased),
      limits_(limits),
      budget_(limits.queueBytes),
      rejections_("control requests rejected", kLogError),
      alive_(std::make_shared<bool>(true)) {}

KxServer::~KxServer() {
    shutdown();
}

KxServer::OpenResult KxServer::open(std::string* failure) {
    const std::string controlName(kKxServerControlPortName);
    bool held = false;
    std::string reason;
    lock_ = InstanceLock::acquire(controlName, &held, &reason);
    if (!lock_) {
        if (failure != nullptr) {
            *failure = reason;
        }
        return held ? OpenResult::AlreadyRunning : OpenResult::Failed;
    }
    // Holding the lock, this is the only service here: the channel sockets of any earlier one are stale.
    MessagePort::removeStalePorts(kChannelPortPrefix);
    bool exists = false;
    controlPort_ = MessagePort::createLocal(
        controlName, [this](std::int32_t, ByteView data) { return onControlMessage(data); }, &exists,
        MessagePort::LocalMode::Serving, &reason);
    if (exists || !controlPort_) {
        controlPort_.reset();
        lock_.reset();
        if (failure != nullptr) {
            *failure = exists ? "a process that holds no lock listens on " + controlName : reason;
        }
        return exists ? OpenResult::AlreadyRunning : OpenResult::Failed;
    }
    controlPort_->setMaxConnections(limits_.connections);
    controlPort_->setDispatchQueue(queue_);
    return OpenResult::Serving;
}

void KxServer::shutdown() {
    *alive_ = false;
    ready_ = nullptr;
    demandObserver_ = nullptr;
    // The list is emptied first, so that nothing walks it while the channels end.
    const std::vector<std::shared_ptr<LogChannel>> channels = std::move(channels_);
    channels_.clear();
    for (const std::shared_ptr<LogChannel>& channel : channels) {
        channel->end("service stopping");
    }
    if (controlPort_) {
        controlPort_->setInvalidationCallback(nullptr);
        controlPort_->invalidate();
        controlPort_.reset();
    }
    lock_.reset();
}

PlistData KxServer::reject(std::int32_t error, const std::string& reason) {
    if (rejections_.allow()) {
        SystemLog::log(kLogError, "control request rejected: %s", reason.c_str());
    }
    return kxErrorReply(error, reason);
}

std::size_t KxServer::openChannels() const {
    return static_cast<std::size_t>(std::count_if(channels_.begin(), channels_.end(),
                                                  [](const auto& channel) { return !channel->ended(); }));
}

std::optional<PlistData> KxServer::onControlMessage(ByteView data) {
    const std::optional<PlistValue> message = parsePropertyList(data);
    const PlistDictionaryRef request = message ? message->dictionary() : nullptr;
    if (!request) {
        return reject(kKxErrorBadRequest, "request is not a property-list dictionary");
    }
    const std::string* name = request->get(kKxRequestKey).string();
    if (name == nullptr) {
        return reject(kKxErrorBadRequest, "request has no Request string");
    }
    if (*name != kKxRequestCreateLogChannel) {
        return reject(kKxErrorBadRequest, "unknown request " + quotedForLog(*name));
    }
    const std::string* receivePort = request->get(kKxReceivePortKey).string();
    if (receivePort == nullptr) {
        return reject(kKxErrorBadRequest, "CreateLogChannel has no ReceivePort string");
    }
    if (!isPortName(*receivePort)) {
        return reject(kKxErrorBadRequest,
                      "ReceivePort " + quotedForLog(*receivePort) + " is not a port name");
    }
    const std::string controlName(kKxServerControlPortName);
    if (*receivePort == controlName || receivePort->starts_with(controlName + ".")) {
        return reject(kKxErrorBadRequest,
                      "ReceivePort " + quotedForLog(*receivePort) + " names one of the service's own ports");
    }
    if (openChannels() >= limits_.channels) {
        return reject(kKxErrorTooManyChannels, std::to_string(openChannels()) +
                                                   " channels are open, the most this service takes "
                                                   "(--max-channels)");
    }

    LogChannel::Settings settings;
    settings.id = nextChannelId_++;
    settings.channelPortName =
        std::string(kChannelPortPrefix) + std::to_string(getpid()) + "." + std::to_string(settings.id);
    settings.receivePortName = *receivePort;
    settings.technology = technology_;
    settings.objectBased = objectBased_;
    settings.budget = &budget_;
    if (const MessagePort::Peer* sender = controlPort_->messageSender()) {
        settings.clientPid = sender->pid;
    }
    std::int32_t error = 0;
    std::string reason;
    std::shared_ptr<LogChannel> channel = LogChannel::open(settings, queue_, *this, error, reason);
    if (!channel) {
        if (rejections_.allow()) {
            SystemLog::log(kLogError, "channel %u not created: %s", settings.id, reason.c_str());
        }
        return kxErrorReply(error, reason);
    }
    SystemLog::log(kLogNotice, "channel %u: created for receive port %s, listening on %s", settings.id,
                   quotedForLog(*receivePort).c_str(), settings.channelPortName.c_str());
    channels_.push_back(std::move(channel));
    return kxChannelCreatedReply(settings.channelPortName);
}

void KxServer::deliver(const BasebandBlob& blob) {
    // A channel that ends meanwhile stays in the list (not streaming) until the queued pruning.
    for (const std::shared_ptr<LogChannel>& channel : channels_) {
        channel->offer(blob);
    }
}

bool KxServer::canTakeMore() const {
    const auto now = std::chrono::steady_clock::now();
    bool someKeepsUp = false;
    for (const std::shared_ptr<LogChannel>& channel : channels_) {
        if (channel->keepsUp()) {
            someKeepsUp = true;
        } else if (channel->streaming() && !channel->stalled(now)) {
            return false;  // behind, but its client reads: wait for it
        }
    }
    return someKeepsUp;
}

void KxServer::notifyWhenReady(std::function<void()> ready) {
    ready_ = std::move(ready);
}

void KxServer::channelReady(LogChannel& /*channel*/) {
    wakeSource();
}

void KxServer::wakeSource() {
    if (!ready_) {
        return;
    }
    queue_.async(std::move(ready_));
    ready_ = nullptr;
}

LogCodeFilter KxServer::streamingDemand() const {
    LogCodeFilter demand;
    for (const std::shared_ptr<LogChannel>& channel : channels_) {
        if (channel->streaming()) {
            demand.unite(channel->filter());
        }
    }
    return demand;
}

void KxServer::observeStreamingDemand(std::function<void()> changed) {
    demandObserver_ = std::move(changed);
}

void KxServer::channelStreamingChanged(LogChannel& /*channel*/) {
    demandChanged();
}

void KxServer::demandChanged() {
    if (demandNoticeQueued_ || !demandObserver_) {
        return;
    }
    demandNoticeQueued_ = true;
    queue_.async([this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (!live || !*live) {
            return;
        }
        demandNoticeQueued_ = false;
        if (demandObserver_) {
            demandObserver_();
        }
    });
}

void KxServer::channelEnded(LogChannel& /*channel*/) {
    demandChanged();
    if (pruneQueued_) {
        return;
    }
    pruneQueued_ = true;
    queue_.async([this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (!live || !*live) {
            return;
        }
        pruneQueued_ = false;
        std::erase_if(channels_, [](const std::shared_ptr<LogChannel>& channel) { return channel->ended(); });
        // The channels left may keep up where the one that went did not.
        if (canTakeMore()) {
            wakeSource();
        }
    });
}

}  // namespace velmar
