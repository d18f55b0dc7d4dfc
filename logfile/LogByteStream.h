// LogByteStream: the bounded window through which every log-file reader sees its input.
//
// A stream reads a file (or a pipe, a FIFO, a character device) in chunks into one buffer of a fixed
// capacity, or stands over bytes already in memory. A reader asks fill(n) for at least n bytes (n at most
// capacity()), looks at available(), and consume()s what it has used; the window slides along the input, so
// a reader holds at most capacity() bytes of it whatever the input's size, and an input that never ends is
// read as long as the reader keeps consuming it. A unit (frame, record, line) that does not fit in the
// window is the reader's error to report: the stream never grows.
//
// Offsets count from the start of the input. Interrupted reads are resumed; a failed read ends the stream
// with failure() telling why.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/platform/WholeFile.h"

namespace velmar {

class LogByteStream {
  public:
    // The window of a file stream: larger than any frame or record a reader accepts, small enough that
    // decoding a file of any size stays in a few megabytes.
    static constexpr std::size_t kDefaultCapacity = 1024 * 1024;

    // A stream over bytes in memory: the whole input is available at once, capacity() is its size.
    explicit LogByteStream(std::span<const std::uint8_t> bytes);
    // A stream not yet open; open() gives it a file.
    explicit LogByteStream(std::size_t capacity = kDefaultCapacity);
    ~LogByteStream();
    LogByteStream(const LogByteStream&) = delete;
    LogByteStream& operator=(const LogByteStream&) = delete;

    // Opens path for reading; a directory fails as "cannot read" (EISDIR).
    FileOutcome open(const std::string& path);
    // The same, with the failure as a message naming path ("trace.dlf: cannot open: No such file or ...").
    bool open(const std::string& path, std::string& error);

    // Reads until at least wanted bytes are available or the input ends; false only on a read error.
    // wanted above capacity() is treated as capacity().
    bool fill(std::size_t wanted);
    std::span<const std::uint8_t> available() const { return {data_ + begin_, end_ - begin_}; }
    void consume(std::size_t count);
    // Offset in the input of available().front().
    std::uint64_t offset() const { return consumed_; }
    // True once the input has ended: what is available is all that is left.
    bool ended() const { return ended_; }
    // True when the input has ended and every byte was consumed.
    bool atEnd() const { return ended_ && begin_ == end_; }
    std::size_t capacity() const { return capacity_; }
    const FileOutcome& failure() const { return failure_; }
    // fill(), with a read error as a message naming name.
    bool fill(std::size_t wanted, const std::string& name, std::string& error);

  private:
    std::vector<std::uint8_t> buffer_;
    const std::uint8_t* data_ = nullptr;
    std::size_t capacity_ = 0;
    std::size_t begin_ = 0;
    std::size_t end_ = 0;
    std::uint64_t consumed_ = 0;
    int fd_ = -1;
    bool ended_ = false;
    FileOutcome failure_;
};

}  // namespace velmar
