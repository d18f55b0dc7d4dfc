#include "tests/support/RawPeer.h"

#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <vector>

namespace velmar::testing {

RawPeer::RawPeer(const std::string& path) {
    fd_ = socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strncpy(address.sun_path, path.c_str(), sizeof address.sun_path - 1);
    connected_ = fd_ >= 0 && connect(fd_, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
}

RawPeer::~RawPeer() {
    if (fd_ >= 0) {
        close(fd_);
    }
}

bool RawPeer::send(std::int32_t messageId, std::uint32_t flags, const std::string& payload) {
    std::vector<std::uint8_t> packet(8 + payload.size());
    std::memcpy(packet.data(), &messageId, 4);
    std::memcpy(packet.data() + 4, &flags, 4);
    std::memcpy(packet.data() + 8, payload.data(), payload.size());
    return ::send(fd_, packet.data(), packet.size(), MSG_DONTWAIT | MSG_NOSIGNAL) ==
           static_cast<ssize_t>(packet.size());
}

bool RawPeer::sendEmpty() {
    return ::send(fd_, "", 0, MSG_DONTWAIT | MSG_NOSIGNAL) == 0;
}

std::optional<std::string> RawPeer::receive() {
    std::vector<char> buffer(1 << 16);
    const ssize_t got = recv(fd_, buffer.data(), buffer.size(), MSG_DONTWAIT);
    if (got == 0 || (got < 0 && errno != EAGAIN && errno != EWOULDBLOCK && errno != EINTR)) {
        return std::string("<hung up>");  // closed, or reset with our packets unread
    }
    if (got < 8) {
        return std::nullopt;
    }
    return std::string(buffer.data() + 8, buffer.data() + got);
}

std::optional<std::string> RawPeer::receiveWithin(double seconds) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
    for (;;) {
        if (std::optional<std::string> packet = receive()) {
            return packet;
        }
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
            deadline - std::chrono::steady_clock::now());
        if (left.count() <= 0) {
            return std::nullopt;
        }
        pollfd wait{fd_, POLLIN, 0};
        poll(&wait, 1, static_cast<int>(left.count()));
    }
}

}  // namespace velmar::testing
