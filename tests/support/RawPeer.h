// RawPeer: a peer of a message port that speaks the packet format by hand (message id, flags, payload), so
// that tests can behave as no well-made client would: send empty packets, flood, never read their replies,
// connect where they should not.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace velmar::testing {

class RawPeer {
  public:
    static constexpr std::uint32_t kReplyWanted = 1;

    // Connects to the socket file at path (non-blocking).
    explicit RawPeer(const std::string& path);
    ~RawPeer();
    RawPeer(const RawPeer&) = delete;
    RawPeer& operator=(const RawPeer&) = delete;

    bool connected() const { return connected_; }
    // One packet; false when the socket would block or is broken.
    bool send(std::int32_t messageId, std::uint32_t flags, const std::string& payload);
    bool sendEmpty();
    // The payload of the next packet if one is there; "<hung up>" once the other side has closed.
    std::optional<std::string> receive();
    // Waits up to seconds for receive() to answer something.
    std::optional<std::string> receiveWithin(double seconds);

  private:
    int fd_ = -1;
    bool connected_ = false;
};

}  // namespace velmar::testing
