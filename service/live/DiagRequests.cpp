#include "service/live/DiagRequests.h"

#include "logfile/DiagFraming.h"
#include "service/live/DiagCommands.h"

namespace velmar::live {

DiagRequests::DiagRequests(MainQueue& queue, Writer writer, double responseSeconds)
    : queue_(queue),
      writer_(std::move(writer)),
      responseSeconds_(responseSeconds),
      alive_(std::make_shared<bool>(true)) {}

DiagRequests::~DiagRequests() {
    cancelAll();
    *alive_ = false;
}

void DiagRequests::submit(PlistData request, int attempts, Done done) {
    pending_.push_back(Request{std::move(request), attempts < 1 ? 1 : attempts, std::move(done)});
    if (!inFlight_) {
        sendNext();
    }
}

void DiagRequests::sendNext() {
    if (inFlight_ || pending_.empty()) {
        return;
    }
    current_ = std::move(pending_.front());
    pending_.pop_front();
    inFlight_ = true;
    attemptsMade_ = 0;
    sendAttempt();
}

void DiagRequests::sendAttempt() {
    ++attemptsMade_;
    frame_.clear();
    appendDiagFrame(frame_, current_.payload);
    writer_(frame_);  // a refused write is an attempt that gets no answer: the timeout handles it
    timer_ = queue_.after(responseSeconds_, [this, alive = std::weak_ptr<bool>(alive_)] {
        const std::shared_ptr<bool> live = alive.lock();
        if (live && *live) {
            timer_ = 0;
            onTimeout();
        }
    });
}

void DiagRequests::onTimeout() {
    if (!inFlight_) {
        return;
    }
    if (attemptsMade_ < current_.attempts) {
        sendAttempt();
        return;
    }
    latePayload_ = current_.payload;
    lateAnswers_ = attemptsMade_;
    lateUntil_ =
        std::chrono::steady_clock::now() + std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                                               std::chrono::duration<double>(kLateWindowSeconds));
    finish(Outcome::TimedOut, {});
}

DiagRequests::Offer DiagRequests::offer(ByteView packet) {
    if (inFlight_ && answers(current_.payload, packet)) {
        if (attemptsMade_ > 1) {
            latePayload_ = current_.payload;
            lateAnswers_ = attemptsMade_ - 1;
            lateUntil_ = std::chrono::steady_clock::now() +
                         std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                             std::chrono::duration<double>(kLateWindowSeconds));
        }
        finish(isErrorResponse(packet) ? Outcome::ErrorResponse : Outcome::Answered, packet);
        return Offer::Matched;
    }
    if (lateAnswers_ > 0 && std::chrono::steady_clock::now() < lateUntil_ && answers(latePayload_, packet)) {
        --lateAnswers_;
        return Offer::Late;
    }
    return Offer::Unmatched;
}

void DiagRequests::finish(Outcome outcome, ByteView response) {
    if (timer_ != 0) {
        queue_.cancelTimer(timer_);
        timer_ = 0;
    }
    inFlight_ = false;
    Done done = std::move(current_.done);
    current_ = Request{};
    // done may submit more, cancel everything, or even end the owner of this queue.
    const std::weak_ptr<bool> alive = alive_;
    if (done) {
        done(outcome, response);
    }
    if (const std::shared_ptr<bool> live = alive.lock(); live && *live) {
        sendNext();
    }
}

void DiagRequests::cancelAll() {
    if (timer_ != 0) {
        queue_.cancelTimer(timer_);
        timer_ = 0;
    }
    inFlight_ = false;
    current_ = Request{};
    pending_.clear();
    lateAnswers_ = 0;
}

}  // namespace velmar::live
