#include "core/platform/StandardOutputDiversion.h"

#include <fcntl.h>
#include <unistd.h>

namespace velmar {

StandardOutputDiversion::StandardOutputDiversion(bool toStandardError) {
    std::fflush(stdout);
    const int consumer = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0);
    savedDescriptor_ = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0);
    std::FILE* stream = consumer >= 0 ? fdopen(consumer, "w") : nullptr;
    if (stream == nullptr || savedDescriptor_ < 0) {
        if (stream != nullptr) {
            std::fclose(stream);
        } else if (consumer >= 0) {
            close(consumer);
        }
        if (savedDescriptor_ >= 0) {
            close(savedDescriptor_);
            savedDescriptor_ = -1;
        }
        return;
    }
    stream_ = stream;
    // Diverted lines are diagnostics: they should show as they come, not when a buffer fills.
    std::setvbuf(stdout, nullptr, _IOLBF, BUFSIZ);
    const int target = toStandardError ? STDERR_FILENO : open("/dev/null", O_WRONLY | O_CLOEXEC);
    dup2(target >= 0 ? target : STDERR_FILENO, STDOUT_FILENO);
    if (!toStandardError && target >= 0) {
        close(target);
    }
}

StandardOutputDiversion::~StandardOutputDiversion() {
    if (stream_ == stdout) {
        return;
    }
    std::fflush(stdout);
    std::fclose(stream_);
    dup2(savedDescriptor_, STDOUT_FILENO);
    close(savedDescriptor_);
}

}  // namespace velmar
