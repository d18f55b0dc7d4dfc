#include "service/live/LiveSource.h"

#include <algorithm>
#include <cinttypes>

#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "logfile/DiagFraming.h"
#include "service/live/DiagCommands.h"

namespace velmar {

using live::CandidatePort;
using live::DiagPort;
using live::DiagSession;

LiveSource::LiveSource(Settings settings)
    : settings_(std::move(settings)),
      deframer_(settings_.device, static_cast<DiagFrameSink&>(*this)),
      subscriptions_(settings_.subscription),
      alive_(std::make_shared<bool>(true)) {}

LiveSource::~LiveSource() {
    stop();
}

template <typename Function>
void LiveSource::later(double seconds, Function function) {
    if (retryTimer_ != 0) {
        queue_->cancelTimer(retryTimer_);
    }
    retryTimer_ = queue_->after(seconds, [this, function, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            retryTimer_ = 0;
            function();
        }
    });
}

bool LiveSource::prepare(std::string& error) {
    if (!settings_.recordPath.empty()) {
        recorder_ = std::make_unique<live::CaptureRecorder>(settings_.recordPath);
        if (!recorder_->open(error)) {
            recorder_.reset();
            return false;
        }
    }
    if (isAuto()) {
        return true;
    }
    std::shared_ptr<DiagPort> port = DiagPort::open(settings_.device, error);
    if (!port) {
        return false;
    }
    port_ = std::move(port);
    return true;
}

std::string LiveSource::description() const {
    if (isAuto()) {
        return "live diagnostic port, found automatically";
    }
    return "live diagnostic port " + settings_.device;
}

const live::DeviceIdentity* LiveSource::identity() const {
    return session_ && session_->isReady() ? &session_->identity() : nullptr;
}

void LiveSource::start(MainQueue& queue, BlobSink& sink) {
    queue_ = &queue;
    sink_ = &sink;
    *alive_ = true;
    buffer_.resize(kReadSize);
    if (recorder_) {
        recorder_->attach(queue);
    }
    sink.observeStreamingDemand([this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            onDemandChanged();
        }
    });
    if (settings_.modemManager && !modemManager_) {
        modemManager_ = std::make_unique<modem::ModemManagerLink>(
            *settings_.modemManager, queue, sink,
            // A candidate that "auto" is still probing is not the diagnostic port yet.
            [this] { return port_ && !probing_ ? portName_ : std::string(); });
    }
    if (modemManager_) {
        modemManager_->start();
    }
    if (port_) {
        usePort(std::move(port_));
    } else {
        lookForDevice();
    }
}

void LiveSource::usePort(std::shared_ptr<DiagPort> port) {
    port_ = std::move(port);
    portName_ = port_->path();
    deframer_.finish();
    deframer_.setName(portName_);  // whatever the previous stream left unended is not part of this one
    blobsThisStream_ = 0;
    const std::weak_ptr<bool> alive = alive_;
    port_->attach(
        *queue_,
        [this, alive] {
            const std::shared_ptr<bool> live = alive.lock();
            if (live && *live) {
                onReadable();
            }
        },
        [this, alive](const std::string& reason) {
            const std::shared_ptr<bool> live = alive.lock();
            if (live && *live) {
                deviceLost(reason);
            }
        });
    if (port_->kind() == DiagPort::Kind::Fifo) {
        return;
    }
    session_ = std::make_shared<DiagSession>(
        *queue_, portName_, settings_.timing,
        [port = std::weak_ptr<DiagPort>(port_)](ByteView frame) {
            const std::shared_ptr<DiagPort> live = port.lock();
            return live && live->write(frame);
        },
        static_cast<DiagSession::Listener&>(*this));
    session_->begin(sink_->streamingDemand());
}

void LiveSource::closePort() {
    if (port_) {
        port_->detach();
    }
    if (session_) {
        session_->abandon();
    }
    deframer_.finish();
    // The session may be the caller (a listener call): its objects go once this queue turn is over.
    queue_->async([session = std::move(session_), port = std::move(port_)] {});
    session_.reset();
    port_.reset();
}

void LiveSource::onReadable() {
    const auto now = std::chrono::steady_clock::now();
    if (now - lastDamageReport_ >= kDamageReportInterval) {
        lastDamageReport_ = now;
        deframer_.reportSkipped();
    }
    for (int reads = 0; reads < kReadsPerWake && port_; ++reads) {
        const std::ptrdiff_t got = port_->read(buffer_);
        if (got == 0) {
            return;
        }
        if (got == DiagPort::kEnded) {
            if (port_->kind() == DiagPort::Kind::Fifo) {
                SystemLog::log(kLogNotice,
                               "live: %s: the stream ended after %" PRIu64 " blobs; opening it again",
                               portName_.c_str(), blobsThisStream_);
                const std::string path = portName_;
                closePort();
                std::string error;
                std::shared_ptr<DiagPort> again = DiagPort::open(path, error);
                if (again) {
                    usePort(std::move(again));
                } else {
                    deviceLost(error);
                }
                return;
            }
            deviceLost(port_->error());
            return;
        }
        deframer_.feed(std::span<const std::uint8_t>(buffer_.data(), static_cast<std::size_t>(got)));
    }
}

bool LiveSource::onDiagFrame(const DiagFrameView& frame) {
    if (recorder_) {
        recorder_->append(frame.escaped);
    }
    if (session_) {
        session_->heardFromDevice();
    }
    const DiagFrameContents contents = readDiagFrame(frame.payload);
    switch (contents.kind) {
        case DiagFrameContents::Kind::LogPacket:
            if (subscriptions_.streams(contents.subscription)) {
                deliverLogPacket(contents.blob());
            }
            break;
        case DiagFrameContents::Kind::Other:
            if (live::isAsynchronous(contents.packet)) {
                break;
            }
            if (contents.packet.size() > live::kMaxDiagResponseBytes) {
                ++badResponses_;
                deframer_.bad(frame.offset, "response of " + std::to_string(contents.packet.size()) +
                                                " bytes is longer than " +
                                                std::to_string(live::kMaxDiagResponseBytes));
            } else if (session_) {
                session_->onFrame(contents.packet);
            }
            break;
        case DiagFrameContents::Kind::Bad:
            deframer_.bad(frame.offset, contents.problemText());
            break;
    }
    return true;
}

// Every log packet that the port sends on its way to the channels passes here, and only here: the one
// place where a received frame becomes a blob. Records of newer firmware versions are to be adapted here,
// before the channels' log-code filters see them.
void LiveSource::deliverLogPacket(ByteView blob) {
    ++blobs_;
    ++blobsThisStream_;
    sink_->deliver(frameBasebandBlob(blob));
}

void LiveSource::onDemandChanged() {
    if (session_ && !finishing_) {
        session_->setDemand(sink_->streamingDemand());
    }
    if (modemManager_) {
        modemManager_->demandChanged();
    }
}

void LiveSource::probeFailed() {
    const std::string path = portName_;
    const std::string reason =
        stringWithFormat("no answer to a version request (%d tries, %g s each)",
                         settings_.timing.probeAttempts, settings_.timing.responseSeconds);
    if (isAuto() && probing_) {
        SystemLog::log(kLogInfo, "live: auto: %s: silent", path.c_str());
        if (probing_->tty != lastAnswered_) {
            silent_.push_back(SilentPort{probing_->tty, std::chrono::steady_clock::now()});
        }
        probing_.reset();
        closePort();
        queue_->async([this, alive = std::weak_ptr<bool>(alive_)] {
            const std::shared_ptr<bool> live = alive.lock();
            if (live && *live && !port_) {
                probeNextCandidate();
            }
        });
        return;
    }
    if (!isAuto() && !everAnswered_ && !away_) {
        closePort();
        fail(path + ": " + reason + ": not a diagnostic port");
        return;
    }
    deviceLost(reason);
}

void LiveSource::ready() {
    if (!isAuto()) {
        everAnswered_ = true;
    } else if (probing_) {
        SystemLog::log(kLogNotice, "live: auto: using %s", live::describeCandidate(*probing_).c_str());
        lastAnswered_ = probing_->tty;
        probing_.reset();
        noneFoundLogged_ = false;
    }
    if (away_) {
        away_ = false;
        SystemLog::log(kLogNotice, "live: %s: the device is back", portName_.c_str());
    }
    if (modemManager_) {
        modemManager_->diagnosticPortChanged();
    }
}

void LiveSource::stoppedAnswering(const std::string& reason) {
    deviceLost("it stopped answering: " + reason);
}

void LiveSource::deviceLost(const std::string& reason) {
    if (!away_) {
        away_ = true;
        const std::string name = portName_.empty() ? settings_.device : portName_;
        SystemLog::log(kLogWarning, "live: %s: the device went away (%s); looking for it every %g s",
                       name.c_str(), reason.c_str(), settings_.retrySeconds);
    }
    probing_.reset();
    closePort();
    lookAgainLater();
}

void LiveSource::lookAgainLater() {
    later(settings_.retrySeconds, [this] { lookForDevice(); });
}

void LiveSource::lookForDevice() {
    if (port_ || finishing_) {
        return;
    }
    if (isAuto()) {
        scanAndProbe();
        return;
    }
    std::string error;
    std::shared_ptr<DiagPort> port = DiagPort::open(settings_.device, error);
    if (!port) {
        lookAgainLater();  // still away: said once already
        return;
    }
    usePort(std::move(port));
}

void LiveSource::scanAndProbe() {
    candidates_ = live::findCandidatePorts(settings_.deviceRoot);
    // A silent port is probed again when it went away and came back, or a while later (a modem that was
    // still starting up); the port last in use is probed every time.
    const auto now = std::chrono::steady_clock::now();
    std::erase_if(silent_, [this, now](const SilentPort& silent) {
        return now - silent.since >= kSilentRetryInterval ||
               std::none_of(candidates_.begin(), candidates_.end(),
                            [&](const CandidatePort& port) { return port.tty == silent.tty; });
    });
    std::erase_if(candidates_, [this](const CandidatePort& port) {
        return std::any_of(silent_.begin(), silent_.end(),
                           [&](const SilentPort& silent) { return silent.tty == port.tty; });
    });
    nextCandidate_ = 0;
    probeNextCandidate();
}

void LiveSource::probeNextCandidate() {
    while (nextCandidate_ < candidates_.size()) {
        const CandidatePort candidate = candidates_[nextCandidate_++];
        std::string error;
        std::shared_ptr<DiagPort> port = DiagPort::open(candidate.devicePath, error);
        if (!port || port->kind() != DiagPort::Kind::Device) {
            SystemLog::log(kLogInfo, "live: auto: %s", port ? "not a device" : error.c_str());
            continue;
        }
        probing_ = candidate;
        usePort(std::move(port));
        return;
    }
    if (!noneFoundLogged_) {
        noneFoundLogged_ = true;
        SystemLog::log(kLogNotice, "live: auto: no diagnostic port answers; scanning every %g s",
                       settings_.retrySeconds);
    }
    lookAgainLater();
}

void LiveSource::finish(std::function<void()> done) {
    finishing_ = true;
    if (!session_) {
        done();
        return;
    }
    session_->stop(std::move(done));
}

void LiveSource::stop() {
    if (!*alive_ && !port_ && !session_) {
        return;
    }
    *alive_ = false;
    finishing_ = true;
    if (queue_ != nullptr && retryTimer_ != 0) {
        queue_->cancelTimer(retryTimer_);
    }
    retryTimer_ = 0;
    if (sink_ != nullptr) {
        sink_->observeStreamingDemand(nullptr);
    }
    if (modemManager_) {
        modemManager_->stop();
    }
    if (session_) {
        session_->stopNow();  // nothing when finish() has told the device already
        session_->abandon();
    }
    if (port_) {
        port_->detach();
    }
    deframer_.finish();
    if (blobs_ != 0 || subscriptions_.skipped() != 0 || deframer_.stats().badFrames != 0) {
        SystemLog::log(kLogNotice,
                       "live: %" PRIu64 " log packets streamed, %" PRIu64
                       " of other subscriptions not streamed, %" PRIu64 " bad frames",
                       blobs_, subscriptions_.skipped(), deframer_.stats().badFrames);
    }
    session_.reset();
    port_.reset();
    if (recorder_) {
        recorder_->close();
    }
}

}  // namespace velmar
