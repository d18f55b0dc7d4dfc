#include "service/LogChannel.h"

#include <algorithm>
#include <cinttypes>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"
#include "service/KxReplies.h"

namespace velmar {

LogChannel::LogChannel(Settings settings, MainQueue& queue, Listener& listener)
    : settings_(std::move(settings)),
      queue_(queue),
      listener_(listener),
      queued_(kQueueBlobs, kQueueBytes, settings_.budget),
      rejections_("channel " + std::to_string(settings_.id) + ": rejected commands", kLogError) {
    if (settings_.budget != nullptr) {
        settings_.budget->join(*this);
    }
}

LogChannel::~LogChannel() {
    if (stallTimer_ != 0) {
        queue_.cancelTimer(stallTimer_);
    }
    if (dropTimer_ != 0) {
        queue_.cancelTimer(dropTimer_);
    }
    if (settings_.budget != nullptr) {
        settings_.budget->leave(*this);
    }
}

std::shared_ptr<LogChannel> LogChannel::open(Settings settings, MainQueue& queue, Listener& listener,
                                             std::int32_t& error, std::string& reason) {
    std::shared_ptr<LogChannel> channel(new LogChannel(std::move(settings), queue, listener));
    const Settings& names = channel->settings_;
    std::string failure;
    channel->receivePort_ = MessagePort::createRemote(names.receivePortName, &failure);
    if (!channel->receivePort_) {
        error = kKxErrorCannotReachReceivePort;
        reason = "cannot connect to receive port " + quotedForLog(names.receivePortName) + ": " + failure;
        return nullptr;
    }
    const std::weak_ptr<LogChannel> self = channel;
    bool exists = false;
    channel->channelPort_ = MessagePort::createLocal(
        names.channelPortName,
        [self](std::int32_t, ByteView data) -> std::optional<PlistData> {
            if (const std::shared_ptr<LogChannel> live = self.lock()) {
                return live->onCommand(data);
            }
            return std::nullopt;
        },
        &exists, MessagePort::LocalMode::Feeding, &failure);
    if (!channel->channelPort_ || exists) {
        error = kKxErrorCannotOpenChannelPort;
        reason = "cannot listen on channel port " + names.channelPortName + ": " +
                 (exists ? std::string("another process listens there") : failure);
        return nullptr;
    }
    // The channel is its client's: a stranger that connects could end it by hanging up.
    channel->channelPort_->setMaxConnections(kChannelPortConnections);
    if (names.clientPid != 0) {
        channel->channelPort_->acceptOnlyFrom(names.clientPid);
    }
    channel->channelPort_->setInvalidationCallback([self] {
        if (const std::shared_ptr<LogChannel> live = self.lock()) {
            live->end("client went away (its connection to the channel port closed)");
        }
    });
    channel->receivePort_->setInvalidationCallback([self] {
        if (const std::shared_ptr<LogChannel> live = self.lock()) {
            live->end("client went away (its receive port closed)");
        }
    });
    channel->channelPort_->setDispatchQueue(queue);
    // Nothing is read from the receive port; watching it tells when the client hangs up while idle.
    channel->receivePort_->setDispatchQueue(queue);
    return channel;
}

std::optional<PlistData> LogChannel::onCommand(ByteView data) {
    if (ended_) {
        return std::nullopt;
    }
    const std::optional<PlistValue> message = parsePropertyList(data);
    const PlistDictionaryRef command = message ? message->dictionary() : nullptr;
    if (!command) {
        if (rejections_.allow()) {
            SystemLog::log(kLogError, "channel %u: command rejected: not a property-list dictionary", id());
        }
        return kxErrorReply(kKxErrorBadRequest, "command is not a property-list dictionary");
    }
    std::optional<PlistData> reply;
    bool understood = false;
    if (const PlistValue* state = command->find(kKxSetStateKey)) {
        understood = true;
        if (const std::string* name = state->string()) {
            onStateCommand(*command, *name, reply);
        } else {
            if (rejections_.allow()) {
                SystemLog::log(kLogError, "channel %u: command rejected: SetState is not a string", id());
            }
            reply = kxErrorReply(kKxErrorBadRequest, "SetState is not a string");
        }
    }
    if (command->contains(kKxGetTechnologyKey)) {
        understood = true;
        if (!reply) {
            reply = kxTechnologyReply(settings_.technology);
        }
    }
    if (!understood) {
        if (rejections_.allow()) {
            SystemLog::log(kLogError, "channel %u: command rejected: neither GetTechnology nor SetState",
                           id());
        }
        reply = kxErrorReply(kKxErrorBadRequest, "unknown command: neither GetTechnology nor SetState");
    }
    return reply;
}

void LogChannel::onStateCommand(const PlistDictionary& command, const std::string& state,
                                std::optional<PlistData>& reply) {
    if (state != kKxStreamingState) {
        streaming_ = false;
        queued_.clear();
        SystemLog::log(kLogNotice, "channel %u: stopped streaming (SetState %s)", id(),
                       quotedForLog(state).c_str());
        listener_.channelStreamingChanged(*this);
        return;
    }
    if (settings_.objectBased) {
        filter_ = LogCodeFilter::everything();
        SystemLog::log(kLogNotice, "channel %u: streaming every blob", id());
    } else {
        std::size_t ignored = 0;
        std::string why;
        std::optional<LogCodeFilter> filter = LogCodeFilter::fromStartCommand(command, ignored, why);
        if (!filter) {
            SystemLog::log(kLogError, "channel %u: start command rejected: %s", id(), why.c_str());
            reply = kxErrorReply(kKxErrorBadRequest, why);
            return;
        }
        filter_ = *filter;
        SystemLog::log(kLogNotice, "channel %u: streaming %zu log codes and %zu extra codes", id(),
                       filter_.codeCount(), filter_.extraCodeCount());
        if (ignored != 0) {
            SystemLog::log(kLogError, "channel %u: ignored %zu codes that are not integers from 0 to 65535",
                           id(), ignored);
        }
    }
    streaming_ = true;
    listener_.channelStreamingChanged(*this);
    listener_.channelReady(*this);
}

void LogChannel::send(ByteView bytes) {
    if (queued_.empty()) {
        const std::int32_t status = receivePort_->sendRequest(0, bytes, 0.0, 0.0, false, nullptr);
        if (status == kMessagePortSuccess) {
            ++sent_;
            return;
        }
        if (status != kMessagePortSendTimeout) {
            sendFailed(status);
            return;
        }
        lastProgress_ = std::chrono::steady_clock::now();  // the stall clock starts with the backlog
    }
    noteDrops(queued_.push(bytes));
    scheduleFlush();
    watchForStall();
    if (settings_.budget != nullptr) {
        settings_.budget->enforce();
    }
}

void LogChannel::scheduleFlush() {
    if (flushArmed_ || ended_ || !receivePort_) {
        return;
    }
    flushArmed_ = true;
    receivePort_->whenWritable([self = weak_from_this()] {
        if (const std::shared_ptr<LogChannel> live = self.lock()) {
            live->flushArmed_ = false;
            live->flush();
        }
    });
}

void LogChannel::watchForStall() {
    if (stallTimer_ != 0 || ended_ || !streaming_ || queued_.size() < kKeepsUpBelow) {
        return;
    }
    const double since =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - lastProgress_).count();
    stallTimer_ = queue_.after(std::max(kStallSeconds - since, 0.01), [self = weak_from_this()] {
        if (const std::shared_ptr<LogChannel> live = self.lock()) {
            live->stallTimer_ = 0;
            if (live->stalled(std::chrono::steady_clock::now())) {
                live->listener_.channelReady(*live);  // a source waiting for this client waits no more
            } else {
                live->watchForStall();
            }
        }
    });
}

bool LogChannel::stalled(std::chrono::steady_clock::time_point now) const {
    return streaming_ && queued_.size() >= kKeepsUpBelow &&
           std::chrono::duration<double>(now - lastProgress_).count() >= kStallSeconds;
}

void LogChannel::flush() {
    const std::uint64_t sentBefore = sent_;
    for (int sent = 0; !queued_.empty() && !ended_; ++sent) {
        if (sent == kFlushPerWake) {
            scheduleFlush();  // the rest on a later wake: other channels and timers first
            break;
        }
        const std::int32_t status = receivePort_->sendRequest(0, queued_.front(), 0.0, 0.0, false, nullptr);
        if (status == kMessagePortSuccess) {
            ++sent_;
            queued_.pop();
        } else if (status == kMessagePortSendTimeout) {
            scheduleFlush();
            break;
        } else {
            sendFailed(status);
            return;
        }
    }
    const auto now = std::chrono::steady_clock::now();
    if (sent_ != sentBefore) {
        lastProgress_ = now;
    }
    if (streaming_ && (queued_.size() < kKeepsUpBelow || stalled(now))) {
        listener_.channelReady(*this);
    }
}

bool LogChannel::shedOldest() {
    if (queued_.empty()) {
        return false;
    }
    queued_.pop();
    noteDrops(1);
    return true;
}

void LogChannel::noteDrops(std::size_t count) {
    if (count == 0) {
        return;
    }
    dropped_ += count;
    unreportedDrops_ += count;
    if (dropTimer_ != 0) {
        return;
    }
    const auto sinceReport = std::chrono::steady_clock::now() - lastDropReport_;
    const double wait = kDropReportSeconds - std::chrono::duration<double>(sinceReport).count();
    if (wait <= 0) {
        reportDrops();
        return;
    }
    dropTimer_ = queue_.after(wait, [self = weak_from_this()] {
        if (const std::shared_ptr<LogChannel> live = self.lock()) {
            live->dropTimer_ = 0;
            live->reportDrops();
        }
    });
}

void LogChannel::reportDrops() {
    if (unreportedDrops_ == 0) {
        return;
    }
    SystemLog::log(kLogError, "channel %u: dropped %" PRIu64 " blobs (queue full)", id(), unreportedDrops_);
    unreportedDrops_ = 0;
    lastDropReport_ = std::chrono::steady_clock::now();
}

void LogChannel::sendFailed(std::int32_t status) {
    end(stringWithFormat("client went away (sending to its receive port failed with status %d)", status));
}

void LogChannel::end(const std::string& reason) {
    if (ended_) {
        return;
    }
    ended_ = true;
    streaming_ = false;
    if (stallTimer_ != 0) {
        queue_.cancelTimer(stallTimer_);
        stallTimer_ = 0;
    }
    if (dropTimer_ != 0) {
        queue_.cancelTimer(dropTimer_);
        dropTimer_ = 0;
    }
    reportDrops();
    SystemLog::log(kLogNotice,
                   "channel %u: %s; channel closed after %" PRIu64 " blobs sent, %" PRIu64 " dropped", id(),
                   reason.c_str(), sent_, dropped_);
    queued_.clear();
    for (const std::shared_ptr<MessagePort>& port : {channelPort_, receivePort_}) {
        if (port) {
            port->setInvalidationCallback(nullptr);
            port->invalidate();
        }
    }
    listener_.channelEnded(*this);
}

}  // namespace velmar
