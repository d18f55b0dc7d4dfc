// DiagSession: the conversation with one modem's diagnostic port while it is open: probe, identification,
// set-up, log masks that follow the channels, and logging off at the end.
//
// Contract:
// - begin() sends a lone 0x7E (flushing the device's receiver) and probes with a version request: a device
//   that does not answer it probeAttempts times within responseSeconds each is not a diagnostic port
//   (Listener::probeFailed). Then, in order: build id, event reports off, debug messages off, log disable,
//   log ranges, and one set-mask per equipment id that the demand wants; each answer's status is checked and
//   a failure logged (with its equipment id) without ending the session. The version and build id are
//   logged at notice and kept in identity(). Listener::ready() follows the first masks.
// - setDemand() may come at any time: masks are recomputed (LogMasks) and what changed is sent once the
//   set-up is done and no mask update is in flight; with nothing wanted, logging is disabled.
// - Frames that the owner hands to onFrame() are the device's non-asynchronous packets: responses. One that
//   matches no request once the probe has been answered is counted, and the first one is logged as a sign
//   of another program on the port.
// - After the set-up, a request that gets no answer, or a device silent for keepAliveSeconds that does not
//   answer a version request, means the device stopped answering (Listener::stoppedAnswering).
// - The listener is never called from inside a call into the session other than onFrame(), and may not
//   destroy the session from inside a listener call (it may abandon() it).
// - stop(done) sends the stop sequence (log disable, event reports off, debug messages off), one attempt
//   each, and runs done when the last has been answered or given up on. Nothing else is sent after it.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/MainQueue.h"
#include "service/LogCodeFilter.h"
#include "service/live/DiagCommands.h"
#include "service/live/DiagRequests.h"

namespace velmar::live {

struct DiagTiming {
    double responseSeconds = 1.0;
    int probeAttempts = 2;
    int attempts = 3;
    double keepAliveSeconds = 10.0;
};

// What the device said about itself; empty fields until it has.
struct DeviceIdentity {
    std::optional<VersionInfo> version;
    std::optional<BuildIdInfo> build;
};

class DiagSession {
  public:
    class Listener {
      public:
        virtual ~Listener() = default;
        virtual void probeFailed() = 0;
        virtual void ready() = 0;
        virtual void stoppedAnswering(const std::string& reason) = 0;
    };

    // name is the port's path, for messages; writer sends one framed request.
    DiagSession(MainQueue& queue, std::string name, DiagTiming timing, DiagRequests::Writer writer,
                Listener& listener);
    ~DiagSession();
    DiagSession(const DiagSession&) = delete;
    DiagSession& operator=(const DiagSession&) = delete;

    void begin(const LogCodeFilter& demand);
    void setDemand(const LogCodeFilter& demand);
    void onFrame(ByteView packet);
    // Any frame at all arrived (the device is alive).
    void heardFromDevice();
    void stop(std::function<void()> done);
    // The stop sequence written at once, answers not awaited: for an exit that cannot wait. Nothing when
    // the device never answered or has been told already.
    void stopNow();
    // Ends the session without a word to the device (it is gone): no request, timer or listener call
    // follows.
    void abandon();

    bool isReady() const { return state_ == State::Ready; }
    const DeviceIdentity& identity() const { return identity_; }
    const EquipmentRanges& ranges() const { return ranges_; }
    const std::vector<EquipmentLogMask>& masksInForce() const { return inForce_; }
    std::uint64_t unmatchedResponses() const { return unmatched_; }

  private:
    enum class State { Idle, Probing, SettingUp, Ready, Stopping, Stopped };
    using Step = std::function<void(DiagRequests::Outcome, ByteView)>;

    void setUpStep(PlistData request, Step check);
    void onVersion(DiagRequests::Outcome outcome, ByteView response);
    void onBuildId(DiagRequests::Outcome outcome, ByteView response);
    void checkPlain(const std::string& what, DiagRequests::Outcome outcome, ByteView response);
    void checkLogConfig(const std::string& what, DiagRequests::Outcome outcome, ByteView response);
    void onRanges(DiagRequests::Outcome outcome, ByteView response);
    void setUpDone();
    void sendMasks();
    void onMaskAnswer(const EquipmentLogMask& sent, DiagRequests::Outcome outcome, ByteView response);
    void masksSent();
    // A request after the set-up got no answer.
    void lostDevice(const std::string& what);
    void armKeepAlive();
    void keepAlive();
    // "name: refused: bad command (0x13)"-style description of a failed outcome; empty on success.
    std::string failure(DiagRequests::Outcome outcome, ByteView response) const;
    static std::vector<PlistData> stopRequests();

    MainQueue& queue_;
    std::string name_;
    DiagTiming timing_;
    Listener& listener_;
    DiagRequests::Writer writer_;
    DiagRequests requests_;
    State state_ = State::Idle;
    LogCodeFilter demand_;
    EquipmentRanges ranges_{};
    std::vector<EquipmentLogMask> inForce_;
    bool mayBeLogging_ = false;  // a mask may be set on the device: nothing wanted means disable
    bool masksInFlight_ = false;
    bool demandChanged_ = false;
    bool readyTold_ = false;
    std::size_t maskAnswersDue_ = 0;
    DeviceIdentity identity_;
    std::uint64_t unmatched_ = 0;
    MainQueue::Handle keepAliveTimer_ = 0;
    bool heard_ = false;  // a frame arrived since the keep-alive timer was armed
    std::shared_ptr<bool> alive_;
};

}  // namespace velmar::live
