// FullPipe: a non-blocking pipe whose write end is full, for the tests of writers that must wait for room
// instead of blocking. drain() empties it, so that the write end is writable again.
#pragma once

namespace velmar::testing {

class FullPipe {
  public:
    FullPipe();
    ~FullPipe();
    FullPipe(const FullPipe&) = delete;
    FullPipe& operator=(const FullPipe&) = delete;

    bool isOpen() const { return readEnd_ >= 0; }
    int writeEnd() const { return writeEnd_; }
    void drain();

  private:
    int readEnd_ = -1;
    int writeEnd_ = -1;
};

}  // namespace velmar::testing
