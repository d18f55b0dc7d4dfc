// Fuzz target: what a device sends to the live diagnostic port: deframing in chunks of any size, frame
// reading (wrappers, log packets, subscriptions), and the session's matching and reading of responses
// through its start sequence and a mask update.
//
// Input: byte 0 sets the chunk size (1 to 64 bytes); the rest is the device's byte stream. The session asks
// for LTE codes and two other equipment ids' codes from the start, and for fewer codes once half of the
// stream is in; at the end it is stopped. Nothing may crash, leak or read outside a buffer.
#include <cstddef>
#include <cstdint>

#include "core/platform/PollMainQueue.h"
#include "fuzz/QuietStart.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "service/live/DiagCommands.h"
#include "service/live/DiagSession.h"
#include "service/live/SubscriptionSelector.h"

namespace velmar {
namespace {

class Device : public live::DiagSession::Listener, public DiagFrameSink {
  public:
    explicit Device(MainQueue& queue)
        : session_(
              queue, "fuzz", live::DiagTiming{}, [](ByteView) { return true; }, *this) {}

    void probeFailed() override {}
    void ready() override {}
    void stoppedAnswering(const std::string&) override {}

    bool onDiagFrame(const DiagFrameView& frame) override {
        session_.heardFromDevice();
        const DiagFrameContents contents = readDiagFrame(frame.payload);
        if (contents.kind == DiagFrameContents::Kind::LogPacket) {
            delivered_ += subscriptions_.streams(contents.subscription) ? contents.blob().size() : 0;
        } else if (contents.kind == DiagFrameContents::Kind::Other &&
                   !live::isAsynchronous(contents.packet) &&
                   contents.packet.size() <= live::kMaxDiagResponseBytes) {
            session_.onFrame(contents.packet);
        }
        return true;
    }

    live::DiagSession& session() { return session_; }

  private:
    live::DiagSession session_;
    live::SubscriptionSelector subscriptions_;
    std::size_t delivered_ = 0;
};

LogCodeFilter demandOf(std::initializer_list<std::uint16_t> codes) {
    LogCodeFilter filter;
    for (const std::uint16_t code : codes) {
        filter.addCode(code);
    }
    return filter;
}

}  // namespace
}  // namespace velmar

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    velmar::fuzzing::quietStart();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmar;
    if (size == 0) {
        return 0;
    }
    const std::size_t chunk = data[0] % 64 + 1;
    const ByteView stream(data + 1, size - 1);
    PollMainQueue queue;
    Device device(queue);
    DiagStreamDeframer deframer("fuzz", device);
    device.session().begin(demandOf({0xB0C1, 0xB0C2, 0xB179, 0xB17F, 0xB180, 0xB186, 0x4116, 0x7130}));
    for (std::size_t offset = 0; offset < stream.size(); offset += chunk) {
        if (offset >= stream.size() / 2 && offset < stream.size() / 2 + chunk) {
            device.session().setDemand(demandOf({0xB0C2}));
        }
        deframer.feed(stream.subspan(offset, std::min(chunk, stream.size() - offset)));
    }
    deframer.finish();
    bool stopped = false;
    device.session().stop([&stopped] { stopped = true; });
    device.session().stopNow();
    return 0;
}
