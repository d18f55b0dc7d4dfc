#include "tools/decode/ProgressLine.h"

#include <sys/stat.h>
#include <unistd.h>

#include <ctime>

namespace velmar {

namespace {

double monotonicSeconds() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}

// 1234567 as "1,234,567".
std::string grouped(std::uint64_t value) {
    std::string digits = std::to_string(value);
    for (std::size_t at = digits.size(); at > 3; at -= 3) {
        digits.insert(at - 3, ",");
    }
    return digits;
}

std::string minutesAndSeconds(double seconds) {
    const auto whole = static_cast<std::uint64_t>(seconds + 0.5);
    char text[32];
    std::snprintf(text, sizeof text, "%llu:%02llu", static_cast<unsigned long long>(whole / 60),
                  static_cast<unsigned long long>(whole % 60));
    return text;
}

}  // namespace

ProgressLine::ProgressLine(std::FILE* out, const std::string& path) : out_(out) {
    struct stat info {};
    if (isatty(fileno(out)) == 0 || stat(path.c_str(), &info) != 0 || !S_ISREG(info.st_mode) ||
        static_cast<std::uint64_t>(info.st_size) < kProgressMinimumBytes) {
        return;
    }
    const std::size_t slash = path.find_last_of('/');
    name_ = slash == std::string::npos ? path : path.substr(slash + 1);
    total_ = static_cast<std::uint64_t>(info.st_size);
    enabled_ = true;
    start_ = lastDraw_ = monotonicSeconds();
}

void ProgressLine::look(std::uint64_t bytesDone, std::uint64_t packets) {
    sinceLook_ = 0;
    const double now = monotonicSeconds();
    if (now - lastDraw_ < kRedrawSeconds) {
        return;
    }
    lastDraw_ = now;
    const std::string line = text(name_, bytesDone, total_, packets, now - start_);
    std::fprintf(out_, "\r%s\033[K", line.c_str());
    std::fflush(out_);
    drawn_ = true;
}

void ProgressLine::finish() {
    if (drawn_) {
        std::fputs("\r\033[K", out_);
        std::fflush(out_);
        drawn_ = false;
    }
    enabled_ = false;
}

std::string ProgressLine::text(const std::string& name, std::uint64_t bytesDone, std::uint64_t totalBytes,
                               std::uint64_t packets, double seconds) {
    constexpr double kMegabyte = 1e6;
    const double rate = seconds > 0 ? static_cast<double>(bytesDone) / seconds : 0;
    char figures[96];
    std::snprintf(figures, sizeof figures, "%.1f of %.1f MB", static_cast<double>(bytesDone) / kMegabyte,
                  static_cast<double>(totalBytes) / kMegabyte);
    char speed[32];
    std::snprintf(speed, sizeof speed, "%.1f MB/s", rate / kMegabyte);
    std::string line = name + ": " + figures + ", " + grouped(packets) + " packets, " + speed;
    if (rate > 0 && bytesDone <= totalBytes) {
        line += ", " + minutesAndSeconds(static_cast<double>(totalBytes - bytesDone) / rate) + " left";
    }
    return line;
}

}  // namespace velmar
