#include "core/platform/MessagePort.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <vector>

#include "core/platform/RuntimeDirectory.h"
#include "core/platform/SystemLog.h"

namespace velmar {

namespace {

// Every packet: message id, flags, then the payload.
struct PacketHeader {
    std::int32_t messageId;
    std::uint32_t flags;
};
constexpr std::uint32_t kFlagReplyWanted = 1;
constexpr std::uint32_t kFlagIsReply = 2;
constexpr int kSocketBufferBytes = 4 * 1024 * 1024;

bool fillAddress(const std::string& path, sockaddr_un& address) {
    std::memset(&address, 0, sizeof address);
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path) {
        SystemLog::log(kLogError, "Socket path too long: %s", path.c_str());
        return false;
    }
    std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
    return true;
}

int newSocket() {
    const int fd = socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (fd >= 0) {
        const int size = kSocketBufferBytes;
        setsockopt(fd, SOL_SOCKET, SO_SNDBUF, &size, sizeof size);
        setsockopt(fd, SOL_SOCKET, SO_RCVBUF, &size, sizeof size);
    }
    return fd;
}

bool connectTo(int fd, const std::string& path) {
    sockaddr_un address{};
    if (!fillAddress(path, address)) {
        return false;
    }
    return connect(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
}

// Whether a live listener answers at path.
bool listenerAnswers(const std::string& path) {
    const int probe = newSocket();
    if (probe < 0) {
        return false;
    }
    const bool answers = connectTo(probe, path);
    close(probe);
    return answers;
}

int remainingMs(std::chrono::steady_clock::time_point deadline) {
    const auto left =
        std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now()).count();
    return left <= 0 ? 0 : static_cast<int>(left);
}

std::chrono::steady_clock::time_point deadlineAfter(double seconds) {
    return std::chrono::steady_clock::now() +
           std::chrono::duration_cast<std::chrono::steady_clock::duration>(
               std::chrono::duration<double>(seconds < 0 ? 0 : seconds));
}

enum class SendOutcome { Sent, TimedOut, Broken };

SendOutcome sendPacket(int fd, std::int32_t messageId, std::uint32_t flags, ByteView data, double timeout) {
    const PacketHeader header{messageId, flags};
    iovec parts[2] = {{const_cast<PacketHeader*>(&header), sizeof header},
                      {const_cast<std::uint8_t*>(data.data()), data.size()}};
    msghdr message{};
    message.msg_iov = parts;
    message.msg_iovlen = data.empty() ? 1 : 2;
    const auto deadline = deadlineAfter(timeout);
    for (;;) {
        if (sendmsg(fd, &message, MSG_DONTWAIT | MSG_NOSIGNAL) >= 0) {
            return SendOutcome::Sent;
        }
        if (errno == EINTR) {
            continue;
        }
        if (errno != EAGAIN && errno != EWOULDBLOCK) {
            return SendOutcome::Broken;
        }
        pollfd wait{fd, POLLOUT, 0};
        const int waitMs = remainingMs(deadline);
        if (waitMs == 0 || poll(&wait, 1, waitMs) <= 0) {
            return SendOutcome::TimedOut;
        }
        if (wait.revents & (POLLHUP | POLLERR)) {
            return SendOutcome::Broken;
        }
    }
}

enum class ReceiveOutcome { Message, Empty, HungUp };

// Reads one packet without blocking.
ReceiveOutcome receivePacket(int fd, PacketHeader& header, PlistData& payload) {
    for (;;) {
        const ssize_t size = recv(fd, nullptr, 0, MSG_PEEK | MSG_TRUNC | MSG_DONTWAIT);
        if (size < 0) {
            if (errno == EINTR) {
                continue;
            }
            return (errno == EAGAIN || errno == EWOULDBLOCK) ? ReceiveOutcome::Empty : ReceiveOutcome::HungUp;
        }
        if (size == 0) {
            return ReceiveOutcome::HungUp;
        }
        std::vector<std::uint8_t> packet(static_cast<std::size_t>(size));
        const ssize_t got = recv(fd, packet.data(), packet.size(), MSG_DONTWAIT);
        if (got < static_cast<ssize_t>(sizeof header)) {
            if (got < 0 && errno == EINTR) {
                continue;
            }
            if (got >= 0) {
                continue;  // a packet too short to carry a header is dropped
            }
            return ReceiveOutcome::HungUp;
        }
        std::memcpy(&header, packet.data(), sizeof header);
        payload.assign(packet.begin() + sizeof header, packet.begin() + got);
        return ReceiveOutcome::Message;
    }
}

bool peerIsTrusted(int fd) {
    ucred credentials{};
    socklen_t length = sizeof credentials;
    if (getsockopt(fd, SOL_SOCKET, SO_PEERCRED, &credentials, &length) != 0) {
        return false;
    }
    return credentials.uid == getuid() || credentials.uid == 0;
}

}  // namespace

MessagePort::MessagePort(std::string name, bool local) : name_(std::move(name)), local_(local) {}

MessagePort::~MessagePort() { closeEverything(); }

std::shared_ptr<MessagePort> MessagePort::createLocal(const std::string& name, MessageCallback callback,
                                                      bool* alreadyExists, LocalMode mode) {
    if (alreadyExists) {
        *alreadyExists = false;
    }
    const auto path = RuntimeDirectory::socketPathFor(name);
    if (!path) {
        return nullptr;
    }
    std::shared_ptr<MessagePort> port(new MessagePort(name, true));
    port->mode_ = mode;
    port->callback_ = std::move(callback);
    port->socketPath_ = *path;
    if (listenerAnswers(*path)) {
        if (alreadyExists) {
            *alreadyExists = true;
        }
        port->valid_ = false;
        return port;
    }
    const int fd = newSocket();
    if (fd < 0) {
        return nullptr;
    }
    sockaddr_un address{};
    if (!fillAddress(*path, address)) {
        close(fd);
        return nullptr;
    }
    unlink(path->c_str());  // a stale file with no listener is removed and reused
    if (bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 || listen(fd, 64) != 0) {
        SystemLog::log(kLogError, "Cannot listen on %s: %s", path->c_str(), std::strerror(errno));
        close(fd);
        return nullptr;
    }
    port->fd_ = fd;
    port->owner_ = true;
    return port;
}

std::shared_ptr<MessagePort> MessagePort::createRemote(const std::string& name) {
    const auto path = RuntimeDirectory::socketPathFor(name);
    if (!path) {
        return nullptr;
    }
    const int fd = newSocket();
    if (fd < 0) {
        return nullptr;
    }
    if (!connectTo(fd, *path)) {
        close(fd);
        return nullptr;
    }
    std::shared_ptr<MessagePort> port(new MessagePort(name, false));
    port->fd_ = fd;
    port->socketPath_ = *path;
    return port;
}

void MessagePort::setDispatchQueue(MainQueue& queue) {
    stopWatching();
    queue_ = &queue;
    if (!valid_ || fd_ < 0) {
        return;
    }
    std::weak_ptr<MessagePort> self = weak_from_this();
    if (local_) {
        listenWatch_ = queue.watchReadable(fd_, [self] {
            if (auto port = self.lock()) {
                port->acceptConnections();
            }
        });
        for (auto& [fd, connection] : connections_) {
            const int connectionFd = fd;
            connection.watch = queue.watchReadable(fd, [self, connectionFd] {
                if (auto port = self.lock()) {
                    port->readConnection(connectionFd);
                }
            });
        }
    } else {
        listenWatch_ = queue.watchReadable(fd_, [self] {
            if (auto port = self.lock()) {
                port->readRemote();
            }
        });
    }
}

void MessagePort::setInvalidationCallback(InvalidationCallback callback) {
    invalidationCallback_ = std::move(callback);
}

void MessagePort::setNotificationCallback(MessageCallback callback) { notificationCallback_ = std::move(callback); }

void MessagePort::acceptConnections() {
    for (;;) {
        const int fd = accept4(fd_, nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK);
        if (fd < 0) {
            return;
        }
        if (!peerIsTrusted(fd)) {
            ucred credentials{};
            socklen_t length = sizeof credentials;
            getsockopt(fd, SOL_SOCKET, SO_PEERCRED, &credentials, &length);
            SystemLog::log(kLogError, "Refused a connection from uid %u on port %s",
                           static_cast<unsigned>(credentials.uid), name_.c_str());
            close(fd);
            continue;
        }
        Connection connection;
        connection.fd = fd;
        if (queue_ != nullptr) {
            std::weak_ptr<MessagePort> self = weak_from_this();
            connection.watch = queue_->watchReadable(fd, [self, fd] {
                if (auto port = self.lock()) {
                    port->readConnection(fd);
                }
            });
        }
        connections_.emplace(fd, connection);
    }
}

void MessagePort::readConnection(int fd) {
    // The port may go (invalidation from inside a callback) while we are in here: hold it.
    const std::shared_ptr<MessagePort> keep = shared_from_this();
    for (;;) {
        if (!valid_ || connections_.find(fd) == connections_.end()) {
            return;
        }
        PacketHeader header{};
        PlistData payload;
        const ReceiveOutcome outcome = receivePacket(fd, header, payload);
        if (outcome == ReceiveOutcome::Empty) {
            return;
        }
        if (outcome == ReceiveOutcome::HungUp) {
            const bool fed = connections_[fd].delivered;
            closeConnection(fd);
            if (fed && mode_ == LocalMode::Feeding) {
                invalidate();
            }
            return;
        }
        connections_[fd].delivered = true;
        std::optional<PlistData> reply;
        if (callback_) {
            reply = callback_(header.messageId, payload);
        }
        if ((header.flags & kFlagReplyWanted) && valid_ && connections_.count(fd) != 0) {
            const ByteView answer = reply ? ByteView(*reply) : ByteView();
            sendPacket(fd, header.messageId, kFlagIsReply, answer, 1.0);
        }
    }
}

void MessagePort::readRemote() {
    const std::shared_ptr<MessagePort> keep = shared_from_this();
    for (;;) {
        if (!valid_ || fd_ < 0) {
            return;
        }
        PacketHeader header{};
        PlistData payload;
        const ReceiveOutcome outcome = receivePacket(fd_, header, payload);
        if (outcome == ReceiveOutcome::Empty) {
            return;
        }
        if (outcome == ReceiveOutcome::HungUp) {
            invalidate();
            return;
        }
        if ((header.flags & kFlagIsReply) == 0 && notificationCallback_) {
            notificationCallback_(header.messageId, payload);
        }
    }
}

std::int32_t MessagePort::sendRequest(std::int32_t messageId, ByteView data, double sendTimeout,
                                      double receiveTimeout, bool wantReply, std::optional<PlistData>* reply) {
    if (reply) {
        reply->reset();
    }
    if (local_ || !valid_ || fd_ < 0) {
        return kMessagePortIsInvalid;
    }
    switch (sendPacket(fd_, messageId, wantReply ? kFlagReplyWanted : 0, data, sendTimeout)) {
        case SendOutcome::Sent:
            break;
        case SendOutcome::TimedOut:
            return kMessagePortSendTimeout;
        case SendOutcome::Broken:
            return kMessagePortTransportError;
    }
    if (!wantReply) {
        return kMessagePortSuccess;
    }
    const auto deadline = deadlineAfter(receiveTimeout);
    for (;;) {
        PacketHeader header{};
        PlistData payload;
        const ReceiveOutcome outcome = receivePacket(fd_, header, payload);
        if (outcome == ReceiveOutcome::HungUp) {
            return kMessagePortTransportError;
        }
        if (outcome == ReceiveOutcome::Message) {
            if (header.flags & kFlagIsReply) {
                if (reply && !payload.empty()) {
                    *reply = std::move(payload);
                }
                return kMessagePortSuccess;
            }
            if (notificationCallback_) {
                notificationCallback_(header.messageId, payload);
            }
            continue;
        }
        pollfd wait{fd_, POLLIN, 0};
        const int waitMs = remainingMs(deadline);
        if (waitMs == 0 || poll(&wait, 1, waitMs) <= 0) {
            return kMessagePortReceiveTimeout;
        }
    }
}

bool MessagePort::isValid() {
    if (!valid_) {
        return false;
    }
    if (!local_ && fd_ >= 0) {
        pollfd check{fd_, POLLRDHUP, 0};
        if (poll(&check, 1, 0) > 0 && (check.revents & (POLLHUP | POLLRDHUP | POLLERR))) {
            valid_ = false;
        }
    }
    return valid_;
}

void MessagePort::invalidate() {
    if (!valid_) {
        return;
    }
    valid_ = false;
    closeEverything();
    fireInvalidation();
}

void MessagePort::fireInvalidation() {
    if (invalidationCallback_) {
        InvalidationCallback callback = std::move(invalidationCallback_);
        invalidationCallback_ = nullptr;
        callback();
    }
}

void MessagePort::closeConnection(int fd) {
    const auto found = connections_.find(fd);
    if (found == connections_.end()) {
        return;
    }
    if (queue_ != nullptr && found->second.watch != 0) {
        queue_->unwatch(found->second.watch);
    }
    close(fd);
    connections_.erase(found);
}

void MessagePort::stopWatching() {
    if (queue_ == nullptr) {
        return;
    }
    if (listenWatch_ != 0) {
        queue_->unwatch(listenWatch_);
        listenWatch_ = 0;
    }
    for (auto& [fd, connection] : connections_) {
        if (connection.watch != 0) {
            queue_->unwatch(connection.watch);
            connection.watch = 0;
        }
    }
}

void MessagePort::closeEverything() {
    stopWatching();
    while (!connections_.empty()) {
        closeConnection(connections_.begin()->first);
    }
    if (fd_ >= 0) {
        close(fd_);
        fd_ = -1;
    }
    if (owner_) {
        unlink(socketPath_.c_str());
        owner_ = false;
    }
}

}  // namespace velmar
