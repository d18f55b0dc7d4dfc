#include "tools/modem-emulator/ModemEmulator.h"

#include <fcntl.h>
#include <poll.h>
#include <termios.h>
#include <unistd.h>

#include <algorithm>
#include <bitset>
#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "core/platform/RecordReader.h"
#include "core/platform/RecordWriter.h"
#include "core/platform/WholeFile.h"
#include "logfile/DiagFraming.h"

namespace velmar::testing {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kMaxRequestBytes = 64 * 1024;
constexpr std::size_t kMaxRequestsKept = 100000;
constexpr std::size_t kMaxPendingOutput = 64 * 1024;
constexpr std::size_t kMaxStreamedCapture = 32 * 1024 * 1024;
constexpr std::size_t kSplitPiece = 5;
constexpr int kTickMs = 10;
constexpr std::uint8_t kBadCommand = 0x13;
constexpr std::uint8_t kBadLength = 0x15;

void putText(PlistData& out, const char* text, std::size_t width) {
    for (std::size_t i = 0; i < width; ++i) {
        out.push_back(static_cast<std::uint8_t>(text[i]));
    }
}

// The frames of a byte stream whose CRC checks, unescaped and without CRC; the bytes after the last 0x7E
// stay in rest.
std::vector<PlistData> checkedFrames(ByteView bytes, PlistData* rest, std::uint64_t* bad) {
    std::vector<PlistData> frames;
    PlistData frame;
    bool escaped = false;
    std::size_t start = 0;
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        const std::uint8_t byte = bytes[i];
        if (byte == kDiagFrameEnd) {
            if (frame.size() >= 3 && !escaped) {
                const std::size_t body = frame.size() - 2;
                const unsigned sent = RecordReader(frame).u16(body);
                if (crc16X25(ByteView(frame.data(), body)) == sent) {
                    frame.resize(body);
                    frames.push_back(std::move(frame));
                } else if (bad != nullptr) {
                    ++*bad;
                }
            } else if (!frame.empty() && bad != nullptr) {
                ++*bad;
            }
            frame.clear();
            escaped = false;
            start = i + 1;
            continue;
        }
        if (escaped) {
            frame.push_back(byte ^ kDiagEscapeXor);
            escaped = false;
        } else if (byte == kDiagEscape) {
            escaped = true;
        } else {
            frame.push_back(byte);
        }
    }
    if (rest != nullptr) {
        rest->assign(bytes.begin() + static_cast<std::ptrdiff_t>(start), bytes.end());
    }
    return frames;
}

// The log code of a log packet, inside its wrappers; nullopt for other frames.
std::optional<std::uint16_t> logCodeOf(ByteView payload) {
    while (payload.size() > 8 && payload[0] == kDiagWrapper && payload[1] == 0x01) {
        payload = payload.subspan(8);
    }
    if (payload.size() < 16 || payload[0] != kDiagLogPacket) {
        return std::nullopt;
    }
    return static_cast<std::uint16_t>(RecordReader(payload).u16(6));
}

}  // namespace

ModemEmulator::ModemEmulator(Settings settings) : settings_(std::move(settings)) {}

ModemEmulator::~ModemEmulator() {
    stopping_ = true;
    if (wake_[1] >= 0) {
        const char byte = 1;
        [[maybe_unused]] const ssize_t ignored = write(wake_[1], &byte, 1);
    }
    if (thread_.joinable()) {
        thread_.join();
    }
    closePty();
    for (const int fd : wake_) {
        if (fd >= 0) {
            close(fd);
        }
    }
}

bool ModemEmulator::start(std::string& error) {
    if (!settings_.capturePath.empty()) {
        PlistData bytes;
        if (const FileOutcome read = readWholeFile(settings_.capturePath, bytes); !read.ok()) {
            error = read.message(settings_.capturePath);
            return false;
        }
        for (PlistData& payload : checkedFrames(bytes, nullptr, nullptr)) {
            const std::optional<std::uint16_t> code = logCodeOf(payload);
            if (!code) {
                continue;  // the capture's own command replies are not streamed
            }
            CaptureFrame frame{*code, {}};
            appendDiagFrame(frame.wire, payload);
            capture_.push_back(std::move(frame));
        }
    }
    if (pipe2(wake_, O_CLOEXEC | O_NONBLOCK) != 0) {
        error = std::string("pipe: ") + std::strerror(errno);
        return false;
    }
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        if (!openPty(error)) {
            return false;
        }
    }
    thread_ = std::thread([this] { run(); });
    return true;
}

bool ModemEmulator::openPty(std::string& error) {
    const int master = posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
    if (master < 0 || grantpt(master) != 0 || unlockpt(master) != 0) {
        error = std::string("cannot open a pseudo-terminal: ") + std::strerror(errno);
        if (master >= 0) {
            close(master);
        }
        return false;
    }
    char name[128];
    if (ptsname_r(master, name, sizeof name) != 0) {
        error = "ptsname failed";
        close(master);
        return false;
    }
    const int slave = open(name, O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
    if (slave < 0) {
        error = std::string(name) + ": " + std::strerror(errno);
        close(master);
        return false;
    }
    termios settings{};
    tcgetattr(slave, &settings);
    cfmakeraw(&settings);
    tcsetattr(slave, TCSANOW, &settings);
    pty_ = Pty{master, slave, name};
    if (!settings_.linkPath.empty()) {
        unlink(settings_.linkPath.c_str());
        if (symlink(name, settings_.linkPath.c_str()) != 0) {
            error = settings_.linkPath + ": " + std::strerror(errno);
            closePty();
            return false;
        }
    }
    return true;
}

void ModemEmulator::closePty() {
    if (pty_.master >= 0) {
        close(pty_.master);
    }
    if (pty_.slave >= 0) {
        close(pty_.slave);
    }
    if (!settings_.linkPath.empty()) {
        unlink(settings_.linkPath.c_str());
    }
    pty_ = Pty{};
    // A modem that goes away forgets its masks and whatever it had not sent.
    for (PlistData& mask : masks_) {
        mask.clear();
    }
    itemCounts_.fill(0);
    masksChanged();
    output_.clear();
    outputSent_ = 0;
    incoming_.clear();
}

std::string ModemEmulator::slavePath() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return pty_.slavePath;
}

void ModemEmulator::vanish() {
    const std::lock_guard<std::mutex> lock(mutex_);
    closePty();
}

bool ModemEmulator::comeBack() {
    std::string error;
    const std::lock_guard<std::mutex> lock(mutex_);
    if (pty_.master >= 0) {
        return true;
    }
    const bool opened = openPty(error);
    const char byte = 1;
    [[maybe_unused]] const ssize_t ignored = write(wake_[1], &byte, 1);
    return opened;
}

void ModemEmulator::setSilent(bool silent) {
    const std::lock_guard<std::mutex> lock(mutex_);
    silent_ = silent;
}

void ModemEmulator::setErrorResponse(std::uint8_t command, std::optional<std::uint32_t> logOperation,
                                     std::uint8_t code) {
    const std::lock_guard<std::mutex> lock(mutex_);
    errors_[{command, logOperation ? static_cast<std::int64_t>(*logOperation) : -1}] = code;
}

void ModemEmulator::clearErrorResponses() {
    const std::lock_guard<std::mutex> lock(mutex_);
    errors_.clear();
    maskStatus_.clear();
}

void ModemEmulator::setMaskStatus(std::uint32_t equipment, std::uint32_t status) {
    const std::lock_guard<std::mutex> lock(mutex_);
    maskStatus_[equipment] = status;
}

void ModemEmulator::sendRaw(ByteView bytes) {
    const std::lock_guard<std::mutex> lock(mutex_);
    output_.insert(output_.end(), bytes.begin(), bytes.end());
    const char byte = 1;
    [[maybe_unused]] const ssize_t ignored = write(wake_[1], &byte, 1);
}

void ModemEmulator::sendFrame(ByteView payload) {
    PlistData wire;
    appendDiagFrame(wire, payload);
    sendRaw(wire);
}

void ModemEmulator::splitWrites(bool split) {
    const std::lock_guard<std::mutex> lock(mutex_);
    split_ = split;
}

std::vector<PlistData> ModemEmulator::requests() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return requests_;
}

std::size_t ModemEmulator::requestCount() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return requests_.size();
}

std::set<std::uint16_t> ModemEmulator::enabledCodes() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    std::set<std::uint16_t> codes;
    for (std::size_t code = 0; code < enabled_.size(); ++code) {
        if (enabled_.test(code)) {
            codes.insert(static_cast<std::uint16_t>(code));
        }
    }
    return codes;
}

std::uint64_t ModemEmulator::packetsStreamed() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return streamed_;
}

std::size_t ModemEmulator::outputPending() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return output_.size() - outputSent_;
}

PlistData ModemEmulator::streamedCapture() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return streamedCapture_;
}

std::uint64_t ModemEmulator::badRequests() const {
    const std::lock_guard<std::mutex> lock(mutex_);
    return badRequests_;
}

void ModemEmulator::run() {
    Clock::time_point last = Clock::now();
    while (!stopping_) {
        pollfd fds[2] = {{wake_[0], POLLIN, 0}, {-1, 0, 0}};
        bool splitting = false;
        {
            const std::lock_guard<std::mutex> lock(mutex_);
            splitting = split_ && outputSent_ < output_.size();
            if (pty_.master >= 0) {
                // Split output goes a piece per millisecond, so that the port reads it in pieces.
                const bool waitForRoom = outputSent_ < output_.size() && !splitting;
                fds[1] = {pty_.master, static_cast<short>(POLLIN | (waitForRoom ? POLLOUT : 0)), 0};
            }
        }
        poll(fds, 2, splitting ? 1 : kTickMs);
        if (stopping_) {
            break;
        }
        char drain[64];
        while (read(wake_[0], drain, sizeof drain) > 0) {
        }
        const Clock::time_point now = Clock::now();
        const std::lock_guard<std::mutex> lock(mutex_);
        if (pty_.master < 0) {
            last = now;
            continue;
        }
        readRequests();
        stream(std::chrono::duration<double>(now - last).count());
        last = now;
        writeOutput();
    }
}

void ModemEmulator::readRequests() {
    std::uint8_t buffer[4096];
    while (true) {
        const ssize_t got = read(pty_.master, buffer, sizeof buffer);
        if (got <= 0) {
            return;
        }
        incoming_.insert(incoming_.end(), buffer, buffer + got);
        PlistData rest;
        std::vector<PlistData> frames = checkedFrames(incoming_, &rest, &badRequests_);
        incoming_ = std::move(rest);
        if (incoming_.size() > kMaxRequestBytes) {
            incoming_.clear();
            ++badRequests_;
        }
        for (PlistData& frame : frames) {
            answer(std::move(frame));
        }
    }
}

void ModemEmulator::queueFrame(ByteView payload, bool response) {
    if (response && settings_.wrapResponses) {
        PlistData wrapped = {kDiagWrapper, 0x01, 0x00, 0x00};
        RecordWriter(wrapped).appendLE(4, 1);
        wrapped.insert(wrapped.end(), payload.begin(), payload.end());
        appendDiagFrame(output_, wrapped);
        return;
    }
    appendDiagFrame(output_, payload);
}

void ModemEmulator::answer(PlistData request) {
    if (requests_.size() < kMaxRequestsKept) {
        requests_.push_back(request);
    }
    if (silent_ || request.empty()) {
        return;
    }
    const std::uint8_t command = request[0];
    std::int64_t operation = -1;
    if (command == 0x73 && request.size() >= 8) {
        operation = RecordReader(request).u32(4);
    }
    for (const std::int64_t key : {operation, std::int64_t{-1}}) {
        const auto error = errors_.find({command, key});
        if (error != errors_.end()) {
            PlistData reply = {error->second};
            reply.insert(reply.end(), request.begin(), request.end());
            queueFrame(reply, true);
            return;
        }
    }
    PlistData reply;
    switch (command) {
        case 0x00:
            reply.push_back(0x00);
            putText(reply, "Jan 01 2024", 11);
            putText(reply, "12:00:00", 8);
            putText(reply, "Feb 02 2024", 11);
            putText(reply, "08:30:00", 8);
            putText(reply, "VELMAREM", 8);
            reply.insert(reply.end(), {0x09, 0xFF, 0x64, 0x00, 0x02, 0x09, 0x0B, 0x00});
            break;
        case 0x7C: {
            reply = {0x7C, 0x01, 0x00, 0x00};
            RecordWriter(reply).appendLE(4, 0x000000E1);
            RecordWriter(reply).appendLE(4, 0x00001234);
            const std::string build = "EMU.1.0.0-velmar";
            const std::string model = "velmar modem emulator";
            reply.insert(reply.end(), build.begin(), build.end());
            reply.push_back(0);
            reply.insert(reply.end(), model.begin(), model.end());
            reply.push_back(0);
            break;
        }
        case 0x1D:
            reply = {0x1D, 0, 0, 0, 0, 0, 0, 0, 0};
            break;
        case 0x60:
            reply = {0x60, 0x00, 0x00};
            break;
        case 0x7D:
            if (request.size() < 8) {
                reply = {kBadLength};
                reply.insert(reply.end(), request.begin(), request.end());
            } else {
                reply = {0x7D, request[1], 0x01, 0x00};
                reply.insert(reply.end(), request.begin() + 4, request.begin() + 8);
            }
            break;
        case 0x73:
            answerLogConfig(request);
            return;
        default:
            reply = {kBadCommand};
            reply.insert(reply.end(), request.begin(), request.end());
            break;
    }
    queueFrame(reply, true);
}

void ModemEmulator::answerLogConfig(const PlistData& request) {
    if (request.size() < 8) {
        PlistData reply = {kBadLength};
        reply.insert(reply.end(), request.begin(), request.end());
        queueFrame(reply, true);
        return;
    }
    const std::uint32_t operation = RecordReader(request).u32(4);
    PlistData reply(request.begin(), request.begin() + 8);
    switch (operation) {
        case 0:
            for (PlistData& mask : masks_) {
                mask.clear();
            }
            itemCounts_.fill(0);
            masksChanged();
            RecordWriter(reply).appendLE(4, 0);
            break;
        case 1:
            RecordWriter(reply).appendLE(4, 0);
            for (const std::uint32_t range : settings_.ranges) {
                RecordWriter(reply).appendLE(4, range);
            }
            break;
        case 3: {
            if (request.size() < 16) {
                reply = {kBadLength};
                reply.insert(reply.end(), request.begin(), request.end());
                break;
            }
            const std::uint32_t id = RecordReader(request).u32(8);
            std::uint32_t count = std::min<std::uint32_t>(RecordReader(request).u32(12), 0x1000);
            const std::size_t bytes = (count + 7) / 8;
            if (request.size() < 16 + bytes) {
                reply = {kBadLength};
                reply.insert(reply.end(), request.begin(), request.end());
                break;
            }
            if (id >= masks_.size()) {
                RecordWriter(reply).appendLE(4, 1);
                break;
            }
            const auto status = maskStatus_.find(id);
            if (status != maskStatus_.end() && status->second != 0) {
                RecordWriter(reply).appendLE(4, status->second);
                RecordWriter(reply).appendLE(4, id);
                RecordWriter(reply).appendLE(4, 0);
                break;
            }
            if (settings_.trimToRanges) {
                count = std::min(count, settings_.ranges[id]);
            }
            PlistData mask(request.begin() + 16,
                           request.begin() + 16 + static_cast<std::ptrdiff_t>((count + 7) / 8));
            if (count % 8 != 0) {
                mask.back() = static_cast<std::uint8_t>(mask.back() & ((1U << (count % 8)) - 1));
            }
            masks_[id] = mask;
            itemCounts_[id] = count;
            masksChanged();
            RecordWriter(reply).appendLE(4, 0);
            RecordWriter(reply).appendLE(4, id);
            RecordWriter(reply).appendLE(4, count);
            reply.insert(reply.end(), mask.begin(), mask.end());
            break;
        }
        case 4: {
            const std::uint32_t id = request.size() >= 12 ? RecordReader(request).u32(8) : 0;
            if (id >= masks_.size()) {
                RecordWriter(reply).appendLE(4, 1);
                break;
            }
            RecordWriter(reply).appendLE(4, 0);
            RecordWriter(reply).appendLE(4, id);
            RecordWriter(reply).appendLE(4, itemCounts_[id]);
            reply.insert(reply.end(), masks_[id].begin(), masks_[id].end());
            break;
        }
        default:
            RecordWriter(reply).appendLE(4, 1);
            break;
    }
    queueFrame(reply, true);
}

void ModemEmulator::masksChanged() {
    enabled_.reset();
    for (std::uint32_t id = 0; id < masks_.size(); ++id) {
        for (std::uint32_t item = 0; item < itemCounts_[id] && item / 8 < masks_[id].size(); ++item) {
            if ((masks_[id][item / 8] >> (item % 8) & 1U) != 0) {
                enabled_.set(id << 12 | item);
            }
        }
    }
}

void ModemEmulator::stream(double seconds) {
    const std::bitset<0x10000>& enabled = enabled_;
    if (capture_.empty() || enabled.none()) {
        budget_ = 0;
        return;
    }
    const double rate = settings_.packetsPerSecond;
    budget_ = std::min(budget_ + rate * seconds, std::max(1.0, rate * 0.1));
    std::size_t scanned = 0;
    while (budget_ >= 1 && scanned < 2 * capture_.size() &&
           output_.size() - outputSent_ < kMaxPendingOutput) {
        const CaptureFrame& frame = capture_[cursor_];
        cursor_ = (cursor_ + 1) % capture_.size();
        ++scanned;
        if (!enabled.test(frame.code)) {
            continue;
        }
        output_.insert(output_.end(), frame.wire.begin(), frame.wire.end());
        if (streamedCapture_.size() + frame.wire.size() <= kMaxStreamedCapture) {
            streamedCapture_.insert(streamedCapture_.end(), frame.wire.begin(), frame.wire.end());
        }
        ++streamed_;
        budget_ -= 1;
    }
}

void ModemEmulator::writeOutput() {
    while (outputSent_ < output_.size()) {
        std::size_t size = output_.size() - outputSent_;
        if (split_) {
            size = std::min(size, kSplitPiece);
        }
        const ssize_t wrote = write(pty_.master, output_.data() + outputSent_, size);
        if (wrote <= 0) {
            break;
        }
        outputSent_ += static_cast<std::size_t>(wrote);
        if (split_) {
            break;  // the rest after a pause, so that the port reads it in pieces
        }
    }
    if (outputSent_ == output_.size()) {
        output_.clear();
        outputSent_ = 0;
    }
}

}  // namespace velmar::testing
