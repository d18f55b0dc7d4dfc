// ProgressLine: how far a long decode has come, on one line of standard error that rewrites itself.
//
// Contract: shown only when the stream is a terminal and the input is a regular file of at least
// kProgressMinimumBytes; otherwise every call does nothing. update() is cheap enough to call per packet: it
// looks at the clock once per kPacketsPerClockLook packets and redraws at most every kRedrawSeconds.
// The line reads "trace.qmdl: 123.4 of 277.3 MB, 1,234,567 packets, 150.2 MB/s, 0:01 left"; finish()
// erases it, so that what follows on the terminal starts on a clean line.
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>

namespace velmar {

inline constexpr std::uint64_t kProgressMinimumBytes = 50'000'000;

class ProgressLine {
  public:
    static constexpr std::uint64_t kPacketsPerClockLook = 4096;
    static constexpr double kRedrawSeconds = 0.25;

    // path: the input; out: where the line goes (standard error).
    ProgressLine(std::FILE* out, const std::string& path);
    ~ProgressLine() { finish(); }
    ProgressLine(const ProgressLine&) = delete;
    ProgressLine& operator=(const ProgressLine&) = delete;

    bool shown() const { return enabled_; }
    // Inline: it runs once per packet, and nearly always returns at once.
    void update(std::uint64_t bytesDone, std::uint64_t packets) {
        if (enabled_ && ++sinceLook_ >= kPacketsPerClockLook) {
            look(bytesDone, packets);
        }
    }
    void finish();

    // The line's text for bytesDone of totalBytes after seconds, without the carriage return.
    static std::string text(const std::string& name, std::uint64_t bytesDone, std::uint64_t totalBytes,
                            std::uint64_t packets, double seconds);

  private:
    // Looks at the clock, and redraws when the line is due.
    void look(std::uint64_t bytesDone, std::uint64_t packets);

    std::FILE* out_;
    std::string name_;
    std::uint64_t total_ = 0;
    bool enabled_ = false;
    bool drawn_ = false;
    double start_ = 0;
    double lastDraw_ = 0;
    std::uint64_t sinceLook_ = 0;
};

}  // namespace velmar
