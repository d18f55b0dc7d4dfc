// StandardOutputDiversion: gives the process's standard output to one consumer (JSON lines, a curses screen)
// and diverts everything else that the C library would write there.
//
// The generator family writes a few lines of its own ("Deallocing ...") to the C library's standard output
// when a class index is destroyed, which would otherwise mix into JSON or draw over a full-screen terminal.
// Contract: stream() writes to a duplicate of the original descriptor 1; descriptor 1 itself points at
// standard error (toStandardError: those lines are diagnostics, kept with the log lines) or at /dev/null for
// as long as the object lives (line-buffered, so that diverted lines show as they come), and is pointed back
// at the original when it goes. When the duplicate cannot be
// made, stream() is stdout and nothing is diverted.
#pragma once

#include <cstdio>

namespace velmar {

class StandardOutputDiversion {
  public:
    explicit StandardOutputDiversion(bool toStandardError);
    ~StandardOutputDiversion();
    StandardOutputDiversion(const StandardOutputDiversion&) = delete;
    StandardOutputDiversion& operator=(const StandardOutputDiversion&) = delete;

    std::FILE* stream() const { return stream_; }

  private:
    std::FILE* stream_ = stdout;
    int savedDescriptor_ = -1;  // the original descriptor 1, to restore
};

}  // namespace velmar
