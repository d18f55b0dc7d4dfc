#include "tests/support/FullPipe.h"

#include <fcntl.h>
#include <unistd.h>

#include <string>

namespace velmar::testing {

FullPipe::FullPipe() {
    int fds[2];
    if (pipe2(fds, O_NONBLOCK | O_CLOEXEC) != 0) {
        return;
    }
    readEnd_ = fds[0];
    writeEnd_ = fds[1];
    const std::string block(4096, 'x');
    while (write(writeEnd_, block.data(), block.size()) > 0) {
    }
}

FullPipe::~FullPipe() {
    if (readEnd_ >= 0) {
        close(readEnd_);
        close(writeEnd_);
    }
}

void FullPipe::drain() {
    char buffer[65536];
    while (read(readEnd_, buffer, sizeof buffer) > 0) {
    }
}

}  // namespace velmar::testing
