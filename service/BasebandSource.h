// BasebandSource: where the service's blobs come from (the simulated baseband, a replayed recording, a live
// diagnostic port), and BlobSink, where a source delivers them (the service's log channels).
//
// Contract:
// - prepare() does everything that can fail before the service starts serving (opening the device, reading
//   the recording); false with a one-line reason.
// - start() begins producing on the queue: every blob is handed to BlobSink::deliver from a queue callback,
//   never re-entrantly from inside a sink call. A source paced by time (a baseband, a replay at its
//   recorded pace) delivers whatever the channels' state; a source that is not paced by time produces only
//   while BlobSink::canTakeMore() holds, and otherwise asks notifyWhenReady() to resume it.
// - stop() ends production: nothing is delivered after it returns, and nothing the source scheduled on the
//   queue does anything any more, even once the source is gone.
// - finish(done) is called before stop() when the service ends normally: a source that must tell its
//   device something first (a live modem: logging off) does it on the queue and then runs done, at most
//   once; the others run done at once. The service waits for done a bounded time only.
// - A source that finds, after start(), that it cannot serve at all (a device named on the command line that
//   is not a diagnostic port) reports it once to the failure handler, with a one-line reason; the service
//   then ends with an error.
#pragma once

#include <functional>
#include <string>

#include "core/platform/MainQueue.h"
#include "service/BasebandBlob.h"
#include "service/LogCodeFilter.h"

namespace velmar {

class BlobSink {
  public:
    virtual ~BlobSink() = default;

    // Hands blob to every streaming channel whose start command takes it. The bytes are copied if kept.
    virtual void deliver(const BasebandBlob& blob) = 0;
    // Whether some streaming channel keeps up, so that a blob produced now would be sent soon.
    virtual bool canTakeMore() const = 0;
    // Runs ready once on the queue when canTakeMore() may have become true; replaces an earlier request.
    virtual void notifyWhenReady(std::function<void()> ready) = 0;
    // What the streaming channels ask for together: the union of their start commands' filters. A source
    // that tells its device what to log (a live modem's log masks) follows it.
    virtual LogCodeFilter streamingDemand() const = 0;
    // Runs changed on the queue whenever streamingDemand() may have changed (a channel started streaming,
    // changed its start command, stopped or closed); replaces an earlier observer, null removes it.
    virtual void observeStreamingDemand(std::function<void()> changed) = 0;
};

class BasebandSource {
  public:
    virtual ~BasebandSource() = default;

    virtual bool prepare(std::string& error) = 0;
    virtual void start(MainQueue& queue, BlobSink& sink) = 0;
    virtual void stop() = 0;
    virtual void finish(std::function<void()> done) { done(); }
    void setFailureHandler(std::function<void(const std::string&)> failed) { failed_ = std::move(failed); }
    // What the source is, for the service's log ("replay of trace.qmdl at 2x").
    virtual std::string description() const = 0;

  protected:
    void fail(const std::string& reason) {
        if (failed_) {
            failed_(reason);
        }
    }

  private:
    std::function<void(const std::string&)> failed_;
};

}  // namespace velmar
