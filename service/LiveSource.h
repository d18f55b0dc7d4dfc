// LiveSource: a live modem's diagnostic port (a character device, or a FIFO that a capture is fed into),
// read as a raw capture stream.
//
// Contract: prepare() opens the port for reading (non-blocking); anything but a character device or a FIFO
// is refused. Bytes are deframed as they arrive (DiagStreamDeframer) and every log packet goes to the sink
// at once: a baseband does not wait for its clients. When the writer of a FIFO closes it, the partial frame
// is dropped and the port is opened again for the next writer; a character device that ends or fails is
// opened again a second later. Damaged frames are counted and logged as warnings, as for a capture file.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "logfile/DiagStreamDeframer.h"
#include "service/BasebandSource.h"

namespace velmar {

class LiveSource : public BasebandSource {
  public:
    explicit LiveSource(std::string device);
    ~LiveSource() override;

    bool prepare(std::string& error) override;
    void start(MainQueue& queue, BlobSink& sink) override;
    void stop() override;
    std::string description() const override;

  private:
    static constexpr std::size_t kReadSize = 64 * 1024;
    static constexpr int kReadsPerWake = 16;
    static constexpr double kReopenDelaySeconds = 1.0;

    bool openDevice(std::string& error);
    void closeDevice();
    void watch();
    void onReadable();
    // The stream ended or failed: finish its frames and open the port again (now, or after a delay).
    void restart(bool immediately);

    std::string device_;
    bool fifo_ = false;
    int fd_ = -1;
    MainQueue* queue_ = nullptr;
    BlobSink* sink_ = nullptr;
    MainQueue::Handle watch_ = 0;
    MainQueue::Handle reopenTimer_ = 0;
    std::shared_ptr<bool> alive_;
    DiagStreamDeframer deframer_;
    std::uint64_t blobs_ = 0;
    PlistData buffer_;
};

}  // namespace velmar
