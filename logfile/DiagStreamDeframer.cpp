#include "logfile/DiagStreamDeframer.h"

#include <cinttypes>
#include <cstdio>
#include <cstring>

#include "core/platform/RecordReader.h"
#include "core/platform/SystemLog.h"
#include "logfile/DiagFraming.h"

namespace velmar {

namespace {

std::string hex16(unsigned value) {
    char text[8];
    std::snprintf(text, sizeof text, "0x%04X", value & 0xFFFFU);
    return text;
}

const std::string& overlongReason() {
    static const std::string reason = "frame longer than " + std::to_string(kMaxDiagFrameBytes) + " bytes";
    return reason;
}

}  // namespace

DiagStreamDeframer::DiagStreamDeframer(std::string name, LogItemCallback callback, LogReadStats* stats)
    : name_(std::move(name)), callback_(std::move(callback)), stats_(stats != nullptr ? stats : &ownStats_) {}

DiagStreamDeframer::DiagStreamDeframer(std::string name, DiagFrameSink& frames, LogReadStats* stats)
    : name_(std::move(name)), frames_(&frames), stats_(stats != nullptr ? stats : &ownStats_) {}

void DiagStreamDeframer::feed(std::span<const std::uint8_t> bytes) {
    const std::uint8_t* const data = bytes.data();
    const std::size_t size = bytes.size();
    std::size_t position = 0;
    while (position < size && !stopped_) {
        const auto* terminator =
            static_cast<const std::uint8_t*>(std::memchr(data + position, kDiagFrameEnd, size - position));
        if (terminator == nullptr) {
            // The frame goes on in a later chunk: keep its bytes, unless it has grown too long.
            const std::size_t count = size - position;
            if (overlong_) {
                break;
            }
            if (pending_.empty()) {
                pendingStart_ = consumed_ + position;
            }
            if (pending_.size() + count > kMaxDiagFrameBytes) {
                overlong(pendingStart_);
                pending_.clear();
                overlong_ = !stopped_;
                break;
            }
            pending_.insert(pending_.end(), data + position, data + size);
            break;
        }
        const std::size_t end = static_cast<std::size_t>(terminator - data);
        if (overlong_) {
            overlong_ = false;  // the rest of a frame already counted as bad ends here
        } else if (pending_.empty()) {
            frame(consumed_ + position, data + position, end - position);
        } else if (pending_.size() + (end - position) > kMaxDiagFrameBytes) {
            overlong(pendingStart_);
            pending_.clear();
        } else {
            pending_.insert(pending_.end(), data + position, data + end);
            frame(pendingStart_, pending_.data(), pending_.size());
            pending_.clear();
        }
        position = end + 1;
    }
    consumed_ += size;
}

void DiagStreamDeframer::finish() {
    if (!stopped_ && !overlong_ && !pending_.empty()) {
        ++stats_->frames;
        bad(pendingStart_, "no 0x7E after the last " + std::to_string(pending_.size()) + " bytes");
    }
    pending_.clear();
    overlong_ = false;
    reportSkipped();
}

void DiagStreamDeframer::reportSkipped() {
    if (badHere_ > kMaxReportedProblems) {
        const std::uint64_t unreported = badHere_ - kMaxReportedProblems;
        SystemLog::log(kLogWarning, "%s: %" PRIu64 " more bad frames skipped", name_.c_str(), unreported);
    }
    badHere_ = 0;
}

// Checks and classifies one frame (its escaped bytes, 0x7E excluded) that starts at offset in the stream.
void DiagStreamDeframer::frame(std::uint64_t offset, const std::uint8_t* escaped, std::size_t size) {
    if (size == 0) {
        return;  // an empty frame: 0x7E 0x7E
    }
    if (size > kMaxDiagFrameBytes) {
        overlong(offset);
        return;
    }
    ++stats_->frames;
    std::size_t length = 0;
    if (!unescape(escaped, size, length)) {
        bad(offset, "escape byte 0x7D at the end of the frame");
        return;
    }
    if (length < 3) {
        bad(offset,
            std::to_string(length) + (length == 1 ? " byte is" : " bytes are") + " too few for a frame");
        return;
    }
    const auto sent =
        static_cast<std::uint16_t>(RecordReader(ByteView(frame_.data(), length)).u16(length - 2));
    const std::uint16_t computed = crc16X25(std::span(frame_.data(), length - 2));
    if (sent != computed) {
        bad(offset, "CRC " + hex16(sent) + " does not match the computed " + hex16(computed));
        return;
    }
    handle(offset, std::span(escaped, size), length - 2);
}

// Copies the escaped bytes into frame_ without their escapes; false on an escape with nothing after it.
bool DiagStreamDeframer::unescape(const std::uint8_t* in, std::size_t size, std::size_t& length) {
    if (frame_.size() < size) {
        frame_.resize(size);
    }
    std::uint8_t* const out = frame_.data();
    std::size_t used = 0;
    std::size_t index = 0;
    while (index < size) {
        const auto* escape =
            static_cast<const std::uint8_t*>(std::memchr(in + index, kDiagEscape, size - index));
        const std::size_t stop = escape != nullptr ? static_cast<std::size_t>(escape - in) : size;
        std::memcpy(out + used, in + index, stop - index);
        used += stop - index;
        index = stop;
        if (index < size) {
            if (index + 1 == size) {
                return false;
            }
            out[used++] = in[index + 1] ^ kDiagEscapeXor;
            index += 2;
        }
    }
    length = used;
    return true;
}

// Hands on the checked frame frame_[0, length), length >= 1, that starts at offset in the input.
void DiagStreamDeframer::handle(std::uint64_t offset, std::span<const std::uint8_t> escaped,
                                std::size_t length) {
    const std::span<std::uint8_t> payload(frame_.data(), length);
    if (frames_ != nullptr) {
        if (!frames_->onDiagFrame(DiagFrameView{offset, escaped, payload})) {
            stopped_ = true;
        }
        return;
    }
    const DiagFrameContents contents = readDiagFrame(payload);
    if (contents.subscription) {
        ++stats_->wrappedFrames;
    }
    switch (contents.kind) {
        case DiagFrameContents::Kind::Bad:
            bad(offset, contents.problemText());
            return;
        case DiagFrameContents::Kind::Other:
            ++stats_->otherFrames;
            return;
        case DiagFrameContents::Kind::LogPacket:
            break;
    }
    ++stats_->logPackets;
    ++stats_->blobs;
    LogItemView item;
    item.bytes = contents.blob();
    item.offset = offset;
    if (!callback_(item)) {
        stopped_ = true;
    }
}

// Counts a frame too long to hold as bad, and stops there when asked to.
void DiagStreamDeframer::overlong(std::uint64_t offset) {
    ++stats_->frames;
    bad(offset, overlongReason());
    if (stopAtOverlong_) {
        overlongAt_ = offset;
        stopped_ = true;
    }
}

// Counts a bad frame; the first few of this input are also described and logged.
void DiagStreamDeframer::bad(std::uint64_t offset, const std::string& reason) {
    ++stats_->badFrames;
    ++badHere_;
    if (stats_->badFrameOffsets.size() < kMaxReportedProblems) {
        stats_->badFrameOffsets.push_back(offset);
    }
    if (badHere_ <= kMaxReportedProblems) {
        std::string message = name_ + ": offset " + std::to_string(offset) + ": bad frame: " + reason;
        SystemLog::log(kLogWarning, "%s", message.c_str());
        stats_->addProblem(std::move(message));
    }
}

}  // namespace velmar
