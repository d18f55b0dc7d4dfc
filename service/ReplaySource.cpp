#include "service/ReplaySource.h"

#include <cinttypes>

#include "core/platform/StringFormat.h"
#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"

namespace velmar {

ReplaySource::ReplaySource(Settings settings)
    : settings_(std::move(settings)), pacer_(settings_.speed), alive_(std::make_shared<bool>(true)) {}

ReplaySource::~ReplaySource() {
    stop();
}

bool ReplaySource::prepare(std::string& error) {
    bytes_.clear();
    ends_.clear();
    const bool read = forEachLogItem(
        settings_.path, LogFormat::Auto,
        [this](const LogItemView& item) {
            if (item.isBlob()) {
                bytes_.insert(bytes_.end(), item.bytes.begin(), item.bytes.end());
                ends_.push_back(bytes_.size());
            }
            return true;
        },
        error);
    if (!read) {
        bytes_.clear();
        ends_.clear();
        return false;
    }
    SystemLog::log(kLogNotice, "replay: %s holds %zu blobs", settings_.path.c_str(), ends_.size());
    return true;
}

std::string ReplaySource::description() const {
    std::string text = "replay of " + settings_.path;
    text +=
        settings_.fast ? ", as fast as the channels take it" : stringWithFormat(" at %gx", settings_.speed);
    if (settings_.loop) {
        text += ", looped";
    }
    return text;
}

ByteView ReplaySource::blob(std::size_t index) const {
    const std::size_t begin = index == 0 ? 0 : ends_[index - 1];
    return ByteView(bytes_.data() + begin, ends_[index] - begin);
}

void ReplaySource::start(MainQueue& queue, BlobSink& sink) {
    queue_ = &queue;
    sink_ = &sink;
    *alive_ = true;
    next_ = 0;
    finished_ = ends_.empty();
    if (finished_) {
        SystemLog::log(kLogNotice, "replay: the recording holds no blobs; nothing to send");
        return;
    }
    due_ = pacer_.next(blob(0));
    started_ = Clock::now();
    if (settings_.fast) {
        schedule([this] { pumpFast(); });
    } else {
        schedule([this] { pumpPaced(); });
    }
}

void ReplaySource::stop() {
    *alive_ = false;
    if (queue_ != nullptr && timer_ != 0) {
        queue_->cancelTimer(timer_);
    }
    timer_ = 0;
}

template <typename Step>
void ReplaySource::schedule(Step step) {
    queue_->async([alive = std::weak_ptr<bool>(alive_), step] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            step();
        }
    });
}

bool ReplaySource::deliverAndAdvance() {
    const ByteView current = blob(next_);
    sink_->deliver(frameBasebandBlob(current));
    ++delivered_;
    if (++next_ == ends_.size()) {
        if (!settings_.loop) {
            finished_ = true;
            SystemLog::log(kLogNotice, "replay: finished after %" PRIu64 " blobs", delivered_);
            return false;
        }
        next_ = 0;
        ++round_;
        pacer_.newRound();
    }
    if (!settings_.fast) {
        due_ = pacer_.next(blob(next_));
    }
    return true;
}

void ReplaySource::pumpPaced() {
    timer_ = 0;
    const Clock::time_point now = Clock::now();
    for (int sent = 0; !finished_; ++sent) {
        const Clock::time_point due =
            started_ + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(due_));
        if (due > now) {
            const double wait = std::chrono::duration<double>(due - now).count();
            timer_ = queue_->after(wait, [this, alive = std::weak_ptr<bool>(alive_)] {
                const std::shared_ptr<bool> live = alive.lock();
                if (live && *live) {
                    pumpPaced();
                }
            });
            return;
        }
        if (sent == kBatch) {
            schedule([this] { pumpPaced(); });
            return;
        }
        if (!deliverAndAdvance()) {
            return;
        }
    }
}

void ReplaySource::pumpFast() {
    for (int sent = 0; !finished_; ++sent) {
        if (!sink_->canTakeMore()) {
            if (!waiting_ && delivered_ == 0) {
                SystemLog::log(kLogNotice, "replay: waiting for a streaming channel");
            }
            waiting_ = true;
            sink_->notifyWhenReady([this, alive = std::weak_ptr<bool>(alive_)] {
                const std::shared_ptr<bool> live = alive.lock();
                if (live && *live) {
                    pumpFast();
                }
            });
            return;
        }
        waiting_ = false;
        if (sent == kBatch) {
            schedule([this] { pumpFast(); });
            return;
        }
        if (!deliverAndAdvance()) {
            return;
        }
    }
}

}  // namespace velmar
