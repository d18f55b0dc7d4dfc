// ModemEmulator: a modem's diagnostic port on a pseudo-terminal, for the tests and for trying kxserverd
// without a modem. A pty is a real tty: kxserverd drives it through its real serial-port code.
//
// Contract:
// - start() opens a pty (raw from the start, so nothing is ever echoed) and, when linkPath is given,
//   points a symbolic link there at its slave (as /dev/serial/by-id links point at a tty). A thread of its
//   own then serves the port until the emulator goes: nothing here blocks the caller.
// - Requests are answered as a modem answers them (version, build id, timestamp, event reports, debug
//   messages, log configuration with its operations 0, 1, 3 and 4); an unknown command gets "bad command".
//   The log ranges reported are settings.ranges; with trimToRanges, set-mask keeps at most the reported
//   number of items of an equipment id and says so in its answer.
// - The capture's log packets are streamed, looping, at settings.packetsPerSecond, but only those whose
//   code has its mask bit set; frames are sent as the capture holds them (a multi-SIM capture's wrappers
//   included). With wrapResponses every response is wrapped too, as a multi-SIM modem wraps every frame.
//   Output that the port cannot take waits (bounded); the stream slows down rather than losing frames.
// - Controls (any thread): vanish() is an unplug (the pty closes, the link goes), comeBack() a replug (a new
//   pty, the link again); setSilent() stops every answer; setErrorResponse() answers a command (for 0x73:
//   one operation) with an error code; setMaskStatus() answers set-mask of an equipment id with a status;
//   sendRaw() writes bytes as they are (garbage, partial or damaged frames); sendFrame() frames a payload
//   and writes it (an answer nobody asked for); splitWrites() writes everything a few bytes at a time.
// - Observations (any thread): every request received, the codes enabled now, what was streamed.
#pragma once

#include <array>
#include <atomic>
#include <bitset>
#include <chrono>
#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar::testing {

class ModemEmulator {
  public:
    using Ranges = std::array<std::uint32_t, 16>;
    // The last items that a 5G module reported for equipment ids 0 to 15.
    static constexpr Ranges kModuleRanges = {0, 0xFFF, 0,     0,     0xFF7, 0xFF7, 0x1C, 0xB5E,
                                             0, 0x816, 0x392, 0x209, 0,     0x207, 0,    0};

    struct Settings {
        std::string capturePath;  // log packets to stream; empty: none
        double packetsPerSecond = 200;
        std::string linkPath;  // a symbolic link to the pty's slave; empty: none
        Ranges ranges = kModuleRanges;
        bool trimToRanges = false;
        bool wrapResponses = false;
    };

    explicit ModemEmulator(Settings settings);
    ~ModemEmulator();
    ModemEmulator(const ModemEmulator&) = delete;
    ModemEmulator& operator=(const ModemEmulator&) = delete;

    // false with a reason in error.
    bool start(std::string& error);

    // The pty's slave ("/dev/pts/7"); empty while vanished.
    std::string slavePath() const;
    void vanish();
    bool comeBack();
    void setSilent(bool silent);
    void setErrorResponse(std::uint8_t command, std::optional<std::uint32_t> logOperation, std::uint8_t code);
    void clearErrorResponses();
    void setMaskStatus(std::uint32_t equipment, std::uint32_t status);
    void sendRaw(ByteView bytes);
    void sendFrame(ByteView payload);
    void splitWrites(bool split);

    // Every request payload received, in order.
    std::vector<PlistData> requests() const;
    std::size_t requestCount() const;
    // Codes whose mask bit is set now.
    std::set<std::uint16_t> enabledCodes() const;
    bool loggingOn() const { return !enabledCodes().empty(); }
    std::uint64_t packetsStreamed() const;
    // Bytes waiting to be written to the port.
    std::size_t outputPending() const;
    // Every log-packet frame streamed so far, as sent: a raw capture of the stream.
    PlistData streamedCapture() const;
    // Requests received that were not framed well.
    std::uint64_t badRequests() const;

  private:
    struct CaptureFrame {
        std::uint16_t code;
        PlistData wire;  // framed, as it goes out
    };
    struct Pty {
        int master = -1;
        int slave = -1;  // kept open: the line stays raw and the master never reads an end
        std::string slavePath;
    };

    bool openPty(std::string& error);
    void closePty();
    void run();
    void readRequests();
    void answer(PlistData request);
    void answerLogConfig(const PlistData& request);
    void queueFrame(ByteView payload, bool response);
    void masksChanged();
    void stream(double seconds);
    void writeOutput();

    Settings settings_;
    std::vector<CaptureFrame> capture_;

    mutable std::mutex mutex_;
    Pty pty_;
    int wake_[2] = {-1, -1};
    std::thread thread_;
    std::atomic<bool> stopping_{false};
    bool silent_ = false;
    bool split_ = false;
    std::map<std::pair<std::uint8_t, std::int64_t>, std::uint8_t> errors_;  // (command, operation or -1)
    std::map<std::uint32_t, std::uint32_t> maskStatus_;
    std::array<PlistData, 16> masks_{};  // per equipment id: the mask bits in force
    std::array<std::uint32_t, 16> itemCounts_{};
    std::bitset<0x10000> enabled_;  // the codes of masks_
    PlistData output_;
    std::size_t outputSent_ = 0;
    PlistData incoming_;  // escaped bytes of a request not yet ended
    std::vector<PlistData> requests_;
    std::uint64_t badRequests_ = 0;
    std::size_t cursor_ = 0;
    double budget_ = 0;
    std::uint64_t streamed_ = 0;
    PlistData streamedCapture_;
};

}  // namespace velmar::testing
