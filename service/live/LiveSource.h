// LiveSource: a live modem's diagnostic port as the service's baseband: the device found and kept open
// through unplugs, the session that makes it log what the channels want, and the stream of its log packets
// to the channels.
//
// Contract:
// - The device is a path (a tty, a /dev/serial/by-id link, or a FIFO fed with a capture) or "auto".
//   prepare() opens a path (a missing or unusable one fails the start) and the recording, if any.
// - A FIFO is only listened to, as a capture stream: when its writer closes it, the partial frame is
//   dropped and it is opened again for the next writer.
// - A device is driven by a DiagSession: probed, identified, set up, its log masks following the channels'
//   demand (BlobSink::streamingDemand). A device named on the command line that does not answer the first
//   probe is reported to the failure handler (the service ends). "auto" scans the USB serial ports
//   (DeviceDiscovery), probes the candidates in order and takes the first that answers; candidates that
//   stayed silent are probed again only when they went away and came back or kSilentRetryInterval later
//   (the port last in use, every time).
// - When the device goes away (a read or write fails, it hangs up) or stops answering, that is logged once,
//   the channels stay, and the device is looked for again every retrySeconds (opened again, or, for "auto",
//   scanned again) without spinning; when it is back it is probed and its masks are sent again.
// - Every frame whose CRC checks is recorded as received when --record is given. Log packets of the
//   streaming subscription (SubscriptionSelector) go to the sink, each in the one place where a received
//   frame becomes a blob (deliverLogPacket); responses go to the session; damaged frames and responses
//   longer than kMaxDiagResponseBytes are counted as bad (the first few of each kDamageReportInterval are
//   described, the others summed up). Bytes are read kReadSize at a time, at most
//   kReadsPerWake reads per wake-up, so a flood never starves the channels and the control port.
// - With Settings::modemManager, a ModemManagerLink supplies the extra records beside the port, told of the
//   port in use (to find its modem: a port that answers, never a candidate still probed) and of every
//   change of the channels' demand.
// - finish(done) sends the stop sequence (logging off) and runs done; stop() closes everything, writing the
//   stop sequence at once if finish() did not run.
#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "logfile/DiagStreamDeframer.h"
#include "service/BasebandSource.h"
#include "service/live/CaptureRecorder.h"
#include "service/live/DeviceDiscovery.h"
#include "service/live/DiagPort.h"
#include "service/live/DiagSession.h"
#include "service/live/SubscriptionSelector.h"
#include "service/modem-manager/ModemManagerLink.h"

namespace velmar {

class LiveSource : public BasebandSource, private live::DiagSession::Listener, private DiagFrameSink {
  public:
    static constexpr std::string_view kAutoDevice = "auto";

    struct Settings {
        std::string device;  // a path, or kAutoDevice
        std::optional<std::uint32_t> subscription;
        std::string recordPath;  // empty: no recording
        live::DiagTiming timing;
        double retrySeconds = 1.0;  // between looks for a device that went away
        std::string deviceRoot;     // root of the sysfs and /dev lookups of "auto" ("" = the system's)
        // The extra records from ModemManager; none: not read.
        std::optional<modem::ModemManagerLink::Settings> modemManager;
    };

    explicit LiveSource(Settings settings);
    ~LiveSource() override;

    bool prepare(std::string& error) override;
    void start(MainQueue& queue, BlobSink& sink) override;
    void stop() override;
    void finish(std::function<void()> done) override;
    std::string description() const override;

    // What the device in use said about itself; null while none answers.
    const live::DeviceIdentity* identity() const;

  private:
    static constexpr std::size_t kReadSize = 64 * 1024;
    static constexpr int kReadsPerWake = 16;
    // How often the damage of a long stream is summed up (a few bad frames are described in full).
    static constexpr std::chrono::seconds kDamageReportInterval{60};
    // How long "auto" leaves a candidate that stayed silent before it probes it again.
    static constexpr std::chrono::seconds kSilentRetryInterval{30};

    bool isAuto() const { return settings_.device == kAutoDevice; }
    // Takes port into use: watches it and, for a device, starts a session on it.
    void usePort(std::shared_ptr<live::DiagPort> port);
    // Closes the port in use; the session and port objects go on the next queue turn.
    void closePort();
    void onReadable();
    bool onDiagFrame(const DiagFrameView& frame) override;
    void deliverLogPacket(ByteView blob);
    void onDemandChanged();

    // The device went away or stopped answering: log once, close, look again later.
    void deviceLost(const std::string& reason);
    void lookAgainLater();
    void lookForDevice();
    void scanAndProbe();
    void probeNextCandidate();

    void probeFailed() override;
    void ready() override;
    void stoppedAnswering(const std::string& reason) override;

    template <typename Function>
    void later(double seconds, Function function);

    Settings settings_;
    MainQueue* queue_ = nullptr;
    BlobSink* sink_ = nullptr;
    std::shared_ptr<live::DiagPort> port_;
    std::shared_ptr<live::DiagSession> session_;
    std::string portName_;  // the path of the port in use, for messages
    DiagStreamDeframer deframer_;
    live::SubscriptionSelector subscriptions_;
    std::unique_ptr<live::CaptureRecorder> recorder_;
    PlistData buffer_;
    MainQueue::Handle retryTimer_ = 0;
    std::shared_ptr<bool> alive_;

    bool everAnswered_ = false;  // a device named on the command line answered once
    bool away_ = false;          // lost and logged; the next answer is "back"
    bool finishing_ = false;
    bool noneFoundLogged_ = false;
    std::vector<live::CandidatePort> candidates_;
    std::size_t nextCandidate_ = 0;
    struct SilentPort {
        std::string tty;
        std::chrono::steady_clock::time_point since;
    };
    std::vector<SilentPort> silent_;  // candidates that did not answer
    std::string lastAnswered_;        // the tty of the device last in use
    std::optional<live::CandidatePort> probing_;

    std::chrono::steady_clock::time_point lastDamageReport_ = std::chrono::steady_clock::now();
    std::uint64_t blobs_ = 0;
    std::uint64_t blobsThisStream_ = 0;
    std::uint64_t badResponses_ = 0;
    std::unique_ptr<modem::ModemManagerLink> modemManager_;
};

}  // namespace velmar
