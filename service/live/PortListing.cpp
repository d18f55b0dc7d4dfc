#include "service/live/PortListing.h"

#include <memory>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "service/live/DeviceDiscovery.h"
#include "service/live/DiagPort.h"
#include "service/live/DiagRequests.h"

namespace velmar::live {

namespace {

// One candidate being probed: its port, the frames it sends back and the version request in flight.
class PortProbe : private DiagFrameSink {
  public:
    PortProbe(MainQueue& queue, const CandidatePort& candidate, const DiagTiming& timing)
        : candidate_(candidate), deframer_(candidate.devicePath, static_cast<DiagFrameSink&>(*this)) {
        std::string error;
        port_ = DiagPort::open(candidate.devicePath, error);
        if (!port_ || port_->kind() != DiagPort::Kind::Device) {
            verdict_ =
                port_ ? "cannot open: not a device" : "cannot open: " + error.substr(error.rfind(": ") + 2);
            port_.reset();
            return;
        }
        port_->attach(
            queue, [this] { onReadable(); }, [](const std::string&) {});
        requests_ = std::make_unique<DiagRequests>(
            queue, [this](ByteView frame) { return port_->write(frame); }, timing.responseSeconds);
        const std::uint8_t flag = kDiagFrameEnd;
        port_->write(ByteView(&flag, 1));
        requests_->submit(versionRequest(), timing.probeAttempts,
                          [this](DiagRequests::Outcome outcome, ByteView) {
                              verdict_ = outcome == DiagRequests::Outcome::TimedOut ? "silent" : "answers";
                          });
    }

    bool done() const { return !verdict_.empty(); }
    std::string line() const { return describeCandidate(candidate_) + "  " + (done() ? verdict_ : "silent"); }

  private:
    void onReadable() {
        PlistData buffer(16 * 1024);
        for (int reads = 0; reads < 16 && port_ && !done(); ++reads) {
            const std::ptrdiff_t got = port_->read(buffer);
            if (got == 0) {
                return;
            }
            if (got == DiagPort::kEnded) {
                port_->detach();
                return;  // the request times out: silent
            }
            deframer_.feed(std::span<const std::uint8_t>(buffer.data(), static_cast<std::size_t>(got)));
        }
    }

    bool onDiagFrame(const DiagFrameView& frame) override {
        const DiagFrameContents contents = readDiagFrame(frame.payload);
        if (contents.kind == DiagFrameContents::Kind::Other && !isAsynchronous(contents.packet) &&
            requests_) {
            requests_->offer(contents.packet);
        }
        return !done();
    }

    CandidatePort candidate_;
    std::unique_ptr<DiagPort> port_;
    std::unique_ptr<DiagRequests> requests_;
    DiagStreamDeframer deframer_;
    std::string verdict_;
};

}  // namespace

void listDiagnosticPorts(const std::string& root, const DiagTiming& timing, std::FILE* out) {
    const std::vector<CandidatePort> candidates = findCandidatePorts(root);
    if (candidates.empty()) {
        std::fputs("no candidate diagnostic port: no USB serial port with a vendor-specific interface\n",
                   out);
        return;
    }
    PollMainQueue queue;
    std::vector<std::unique_ptr<PortProbe>> probes;
    for (const CandidatePort& candidate : candidates) {
        probes.push_back(std::make_unique<PortProbe>(queue, candidate, timing));
    }
    const auto allDone = [&probes] {
        for (const std::unique_ptr<PortProbe>& probe : probes) {
            if (!probe->done()) {
                return false;
            }
        }
        return true;
    };
    // Every probe ends by itself within its attempts; the bound only guards against a broken clock.
    queue.runUntil(allDone, timing.responseSeconds * (timing.probeAttempts + 1) + 1);
    for (const std::unique_ptr<PortProbe>& probe : probes) {
        std::fprintf(out, "%s\n", probe->line().c_str());
    }
}

}  // namespace velmar::live
