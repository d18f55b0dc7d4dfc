// DiagRequests: requests to a diagnostic port matched with their responses, one at a time, with a timeout
// and retries, while log packets keep flowing around them.
//
// Contract:
// - submit() appends a request; requests go out in order, the next one only when the one before has been
//   answered or has given up. Each attempt waits responseSeconds for its response; a request that has no
//   answer after its attempts ends TimedOut. Every request ends exactly once (done runs on the queue or from
//   offer()), unless cancelAll() drops it, which does not call done.
// - offer() takes a frame that is not asynchronous (a candidate response). It answers Matched when it
//   answered the request in flight (done is then called with Answered, or ErrorResponse for an error
//   response), Late when it is the expected late answer to an attempt that was already given up on (a
//   retried or timed-out request's earlier attempt), and Unmatched otherwise: another program may be
//   talking to the port.
// - The writer is called with each framed request; it answers false when the port refused it, which counts
//   as an attempt that got no answer.
#pragma once

#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <string>

#include "core/platform/ByteView.h"
#include "core/platform/MainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::live {

class DiagRequests {
  public:
    enum class Outcome { Answered, ErrorResponse, TimedOut };
    enum class Offer { Matched, Late, Unmatched };
    using Done = std::function<void(Outcome outcome, ByteView response)>;
    using Writer = std::function<bool(ByteView frame)>;

    DiagRequests(MainQueue& queue, Writer writer, double responseSeconds);
    ~DiagRequests();
    DiagRequests(const DiagRequests&) = delete;
    DiagRequests& operator=(const DiagRequests&) = delete;

    void submit(PlistData request, int attempts, Done done);
    Offer offer(ByteView packet);
    void cancelAll();

    bool idle() const { return !inFlight_ && pending_.empty(); }
    double responseSeconds() const { return responseSeconds_; }

  private:
    struct Request {
        PlistData payload;
        int attempts = 1;
        Done done;
    };
    // How long an answer to an abandoned attempt is still expected.
    static constexpr double kLateWindowSeconds = 5.0;

    void sendNext();
    void sendAttempt();
    void onTimeout();
    void finish(Outcome outcome, ByteView response);

    MainQueue& queue_;
    Writer writer_;
    double responseSeconds_;
    std::deque<Request> pending_;
    bool inFlight_ = false;
    Request current_;
    int attemptsMade_ = 0;
    MainQueue::Handle timer_ = 0;
    PlistData frame_;
    // Answers still owed by attempts that were given up on: the request they answer, how many, until when.
    PlistData latePayload_;
    int lateAnswers_ = 0;
    std::chrono::steady_clock::time_point lateUntil_{};
    std::shared_ptr<bool> alive_;
};

}  // namespace velmar::live
