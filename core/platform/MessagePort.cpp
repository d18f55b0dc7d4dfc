#include "core/platform/MessagePort.h"

#include <dirent.h>
#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
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
// A port that cannot accept (out of descriptors) waits this long before it tries again, doubling up to the
// longest wait while the failures go on.
constexpr double kFirstAcceptBackoffSeconds = 0.05;
constexpr double kLongestAcceptBackoffSeconds = 1.0;

bool fillAddress(const std::string& path, sockaddr_un& address) {
    std::memset(&address, 0, sizeof address);
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path) {
        errno = ENAMETOOLONG;
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

enum class Listener { Answers, None, Unknown };

// Whether a live listener answers at path. A listener whose backlog is full still answers; when no probe can
// be made (out of descriptors) nobody can tell.
Listener probeListener(const std::string& path, int* error = nullptr) {
    const int probe = socket(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (probe < 0) {
        if (error != nullptr) {
            *error = errno;
        }
        return Listener::Unknown;
    }
    const bool connected = connectTo(probe, path);
    const int reason = errno;
    close(probe);
    if (connected || reason == EAGAIN) {
        return Listener::Answers;
    }
    if (reason == ECONNREFUSED || reason == ENOENT) {
        return Listener::None;
    }
    if (error != nullptr) {
        *error = reason;
    }
    return Listener::Unknown;
}

int remainingMs(std::chrono::steady_clock::time_point deadline) {
    const auto left =
        std::chrono::duration_cast<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now())
            .count();
    return left <= 0 ? 0 : static_cast<int>(left);
}

std::chrono::steady_clock::time_point deadlineAfter(double seconds) {
    return std::chrono::steady_clock::now() + std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                                                  std::chrono::duration<double>(seconds < 0 ? 0 : seconds));
}

enum class SendOutcome { Sent, TimedOut, Broken };

// Writes one packet without blocking: Sent, TimedOut when the socket cannot take it now, or Broken.
SendOutcome sendNow(int fd, const iovec* parts, std::size_t count) {
    msghdr message{};
    message.msg_iov = const_cast<iovec*>(parts);
    message.msg_iovlen = count;
    for (;;) {
        if (sendmsg(fd, &message, MSG_DONTWAIT | MSG_NOSIGNAL) >= 0) {
            return SendOutcome::Sent;
        }
        if (errno == EINTR) {
            continue;
        }
        return (errno == EAGAIN || errno == EWOULDBLOCK) ? SendOutcome::TimedOut : SendOutcome::Broken;
    }
}

SendOutcome sendPacket(int fd, std::int32_t messageId, std::uint32_t flags, ByteView data, double timeout) {
    const PacketHeader header{messageId, flags};
    const iovec parts[2] = {{const_cast<PacketHeader*>(&header), sizeof header},
                            {const_cast<std::uint8_t*>(data.data()), data.size()}};
    const auto deadline = deadlineAfter(timeout);
    for (;;) {
        const SendOutcome outcome = sendNow(fd, parts, data.empty() ? 1 : 2);
        if (outcome != SendOutcome::TimedOut) {
            return outcome;
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

PlistData encodePacket(std::int32_t messageId, std::uint32_t flags, ByteView data) {
    const PacketHeader header{messageId, flags};
    PlistData packet(sizeof header + data.size());
    std::memcpy(packet.data(), &header, sizeof header);
    if (!data.empty()) {
        std::memcpy(packet.data() + sizeof header, data.data(), data.size());
    }
    return packet;
}

enum class ReceiveOutcome { Message, Empty, HungUp };

// Whether the peer of fd has hung up (a zero-byte read means either that or an empty packet).
bool peerHungUp(int fd) {
    pollfd check{fd, POLLRDHUP, 0};
    return poll(&check, 1, 0) > 0 && (check.revents & (POLLRDHUP | POLLHUP | POLLERR)) != 0;
}

// Reads one packet without blocking. Packets too short to carry a header, empty ones included, are dropped.
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
            if (peerHungUp(fd)) {
                return ReceiveOutcome::HungUp;
            }
            std::uint8_t none = 0;
            if (recv(fd, &none, 0, MSG_DONTWAIT) < 0 && errno != EINTR) {
                return (errno == EAGAIN || errno == EWOULDBLOCK) ? ReceiveOutcome::Empty
                                                                 : ReceiveOutcome::HungUp;
            }
            continue;
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

bool processRuns(pid_t pid) {
    return pid > 0 && (kill(pid, 0) == 0 || errno == EPERM);
}

}  // namespace

MessagePort::MessagePort(std::string name, bool local) : name_(std::move(name)), local_(local) {}

MessagePort::~MessagePort() {
    closeEverything();
}

std::shared_ptr<MessagePort> MessagePort::createLocal(const std::string& name, MessageCallback callback,
                                                      bool* alreadyExists, LocalMode mode,
                                                      std::string* failure) {
    if (alreadyExists) {
        *alreadyExists = false;
    }
    const auto fail = [&](const std::string& reason) -> std::shared_ptr<MessagePort> {
        SystemLog::log(kLogError, "Cannot create port %s: %s", name.c_str(), reason.c_str());
        if (failure != nullptr) {
            *failure = reason;
        }
        return nullptr;
    };
    std::string why;
    const auto path = RuntimeDirectory::socketPathFor(name, &why);
    if (!path) {
        if (failure != nullptr) {
            *failure = why;
        }
        return nullptr;
    }
    std::shared_ptr<MessagePort> port(new MessagePort(name, true));
    port->mode_ = mode;
    port->callback_ = std::move(callback);
    port->socketPath_ = *path;
    struct stat info {};
    if (lstat(path->c_str(), &info) == 0) {
        // Only a socket file is ours to judge: anything else at the name was put there by someone else.
        if (S_ISLNK(info.st_mode)) {
            return fail(*path + " is a symbolic link, not a socket");
        }
        if (!S_ISSOCK(info.st_mode)) {
            return fail(*path + " exists and is not a socket");
        }
        int error = 0;
        switch (probeListener(*path, &error)) {
            case Listener::Answers:
                if (alreadyExists) {
                    *alreadyExists = true;
                }
                port->valid_ = false;
                return port;
            case Listener::Unknown:
                return fail("cannot tell whether " + *path + " is in use: " + std::strerror(error));
            case Listener::None:
                unlink(path->c_str());  // a stale file with no listener is removed and reused
                break;
        }
    }
    const int fd = newSocket();
    if (fd < 0) {
        return fail(std::string("cannot create a socket: ") + std::strerror(errno));
    }
    sockaddr_un address{};
    fillAddress(*path, address);
    if (bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 || listen(fd, 64) != 0) {
        const int error = errno;
        close(fd);
        return fail("cannot listen on " + *path + ": " + std::strerror(error));
    }
    port->fd_ = fd;
    port->owner_ = true;
    return port;
}

std::shared_ptr<MessagePort> MessagePort::createRemote(const std::string& name, std::string* failure) {
    std::string why;
    const auto path = RuntimeDirectory::socketPathFor(name, &why);
    if (!path) {
        if (failure != nullptr) {
            *failure = why;
        }
        return nullptr;
    }
    const int fd = newSocket();
    if (fd < 0) {
        if (failure != nullptr) {
            *failure = std::strerror(errno);
        }
        return nullptr;
    }
    if (!connectTo(fd, *path)) {
        if (failure != nullptr) {
            *failure = std::strerror(errno);
        }
        close(fd);
        return nullptr;
    }
    std::shared_ptr<MessagePort> port(new MessagePort(name, false));
    port->fd_ = fd;
    port->socketPath_ = *path;
    return port;
}

int MessagePort::removeStalePorts(std::string_view prefix, std::string_view suffix) {
    const auto directory = RuntimeDirectory::path();
    if (!directory) {
        return 0;
    }
    DIR* listing = opendir(directory->c_str());
    if (listing == nullptr) {
        return 0;
    }
    int removed = 0;
    while (const dirent* entry = readdir(listing)) {
        const std::string_view name = entry->d_name;
        if (!name.starts_with(prefix)) {
            continue;
        }
        const std::string_view tail = name.substr(prefix.size());
        pid_t pid = 0;
        const auto [end, error] = std::from_chars(tail.data(), tail.data() + tail.size(), pid);
        const std::string_view rest(end, static_cast<std::size_t>(tail.data() + tail.size() - end));
        if (error != std::errc() || end == tail.data() || (!rest.empty() && rest.front() != '.') ||
            !rest.ends_with(suffix) || processRuns(pid)) {
            continue;
        }
        const std::string path = *directory + "/" + std::string(name);
        struct stat info {};
        if (lstat(path.c_str(), &info) != 0 || !S_ISSOCK(info.st_mode) || info.st_uid != getuid() ||
            probeListener(path) != Listener::None) {
            continue;
        }
        if (unlink(path.c_str()) == 0) {
            ++removed;
        }
    }
    closedir(listing);
    if (removed != 0) {
        SystemLog::log(kLogNotice, "Removed %d socket files that ended processes left behind", removed);
    }
    return removed;
}

void MessagePort::setDispatchQueue(MainQueue& queue) {
    stopWatching();
    acceptBackoff_ = 0;
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
            watchConnection(connection);
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

void MessagePort::setNotificationCallback(MessageCallback callback) {
    notificationCallback_ = std::move(callback);
}

void MessagePort::watchConnection(Connection& connection) {
    if (queue_ == nullptr) {
        return;
    }
    std::weak_ptr<MessagePort> self = weak_from_this();
    const int fd = connection.fd;
    connection.watch = queue_->watchReadable(fd, [self, fd] {
        if (auto port = self.lock()) {
            port->readConnection(fd);
        }
    });
    if (!connection.unsent.empty()) {
        connection.writeWatch = queue_->watchWritable(fd, [self, fd] {
            if (auto port = self.lock()) {
                port->flushReplies(fd);
            }
        });
    }
}

bool MessagePort::admit(int fd, Peer& peer) {
    if (!refusals_) {
        refusals_ = std::make_unique<LogRateLimit>("port " + name_ + ": refused connections", kLogError);
    }
    ucred credentials{};
    socklen_t length = sizeof credentials;
    if (getsockopt(fd, SOL_SOCKET, SO_PEERCRED, &credentials, &length) != 0) {
        if (refusals_->allow()) {
            SystemLog::log(kLogError, "Refused a connection on port %s: its peer is unknown (%s)",
                           name_.c_str(), std::strerror(errno));
        }
        return false;
    }
    peer.pid = credentials.pid;
    peer.uid = credentials.uid;
    if (credentials.uid != getuid() && credentials.uid != 0) {
        if (refusals_->allow()) {
            SystemLog::log(kLogError, "Refused a connection from uid %u on port %s",
                           static_cast<unsigned>(credentials.uid), name_.c_str());
        }
        return false;
    }
    if (onlyPid_ != 0 && credentials.pid != onlyPid_) {
        if (refusals_->allow()) {
            SystemLog::log(kLogError, "Refused a connection from pid %d on port %s, which serves pid %d only",
                           static_cast<int>(credentials.pid), name_.c_str(), static_cast<int>(onlyPid_));
        }
        return false;
    }
    if (connections_.size() >= maxConnections_) {
        if (refusals_->allow()) {
            SystemLog::log(kLogError,
                           "Refused a connection from pid %d on port %s: %zu connections are open, "
                           "the most it takes",
                           static_cast<int>(credentials.pid), name_.c_str(), connections_.size());
        }
        return false;
    }
    return true;
}

void MessagePort::acceptConnections() {
    for (int accepted = 0; accepted < kAcceptsPerWake && valid_ && fd_ >= 0; ++accepted) {
        const int fd = accept4(fd_, nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK);
        if (fd < 0) {
            if (errno == EINTR || errno == ECONNABORTED) {
                continue;
            }
            if (errno != EAGAIN && errno != EWOULDBLOCK) {
                acceptFailed(errno);
            } else if (acceptBackoff_ > 0) {
                // Every waiting connection taken: the trouble is over.
                acceptBackoff_ = 0;
                SystemLog::log(kLogError, "Accepting connections on port %s again", name_.c_str());
            }
            return;
        }
        Connection connection;
        connection.fd = fd;
        if (!admit(fd, connection.peer)) {
            close(fd);
            continue;
        }
        watchConnection(connection);
        connections_.emplace(fd, std::move(connection));
    }
}

void MessagePort::acceptFailed(int error) {
    // Out of descriptors (or memory) the listening socket stays readable: watching it would spin. The port
    // stops watching it for a while, longer while the failures go on, and says so once.
    if (acceptBackoff_ == 0) {
        SystemLog::log(kLogError, "Cannot accept connections on port %s: %s; trying again now and then",
                       name_.c_str(), std::strerror(error));
        acceptBackoff_ = kFirstAcceptBackoffSeconds;
    } else {
        acceptBackoff_ = std::min(acceptBackoff_ * 2, kLongestAcceptBackoffSeconds);
    }
    // While connections still wait, the trouble goes on (one accepted between failures does not end it).
    if (queue_ == nullptr) {
        return;
    }
    if (listenWatch_ != 0) {
        queue_->unwatch(listenWatch_);
        listenWatch_ = 0;
    }
    if (acceptRetry_ == 0) {
        std::weak_ptr<MessagePort> self = weak_from_this();
        acceptRetry_ = queue_->after(acceptBackoff_, [self] {
            if (auto port = self.lock()) {
                port->acceptRetry_ = 0;
                port->resumeAccepting();
            }
        });
    }
}

void MessagePort::resumeAccepting() {
    if (queue_ == nullptr || !valid_ || fd_ < 0 || listenWatch_ != 0) {
        return;
    }
    std::weak_ptr<MessagePort> self = weak_from_this();
    listenWatch_ = queue_->watchReadable(fd_, [self] {
        if (auto port = self.lock()) {
            port->acceptConnections();
        }
    });
}

void MessagePort::readConnection(int fd) {
    // The port may go (invalidation from inside a callback) while we are in here: hold it.
    const std::shared_ptr<MessagePort> keep = shared_from_this();
    for (int handled = 0; handled < kMessagesPerWake; ++handled) {
        auto found = connections_.find(fd);
        if (!valid_ || found == connections_.end()) {
            return;
        }
        PacketHeader header{};
        PlistData payload;
        const ReceiveOutcome outcome = receivePacket(fd, header, payload);
        if (outcome == ReceiveOutcome::Empty) {
            return;
        }
        if (outcome == ReceiveOutcome::HungUp) {
            dropConnection(fd);
            return;
        }
        found->second.delivered = true;
        const Peer peer = found->second.peer;
        std::optional<PlistData> answer;
        if (callback_) {
            sender_ = &peer;
            answer = callback_(header.messageId, payload);
            sender_ = nullptr;
        }
        if ((header.flags & kFlagReplyWanted) == 0 || !valid_) {
            continue;
        }
        found = connections_.find(fd);
        if (found != connections_.end()) {
            reply(found->second, header.messageId, answer ? ByteView(*answer) : ByteView());
        }
    }
}

void MessagePort::reply(Connection& connection, std::int32_t messageId, ByteView answer) {
    const int fd = connection.fd;
    if (connection.unsent.empty()) {
        const PacketHeader header{messageId, kFlagIsReply};
        const iovec parts[2] = {{const_cast<PacketHeader*>(&header), sizeof header},
                                {const_cast<std::uint8_t*>(answer.data()), answer.size()}};
        switch (sendNow(fd, parts, answer.empty() ? 1 : 2)) {
            case SendOutcome::Sent:
                return;
            case SendOutcome::Broken:
                dropConnection(fd);
                return;
            case SendOutcome::TimedOut:
                break;
        }
    }
    const std::size_t packetSize = sizeof(PacketHeader) + answer.size();
    if (connection.unsent.size() >= kMaxUnreadReplies ||
        connection.unsentBytes + packetSize > kMaxUnreadReplyBytes) {
        if (!refusals_) {
            refusals_ = std::make_unique<LogRateLimit>("port " + name_ + ": refused connections", kLogError);
        }
        if (refusals_->allow()) {
            SystemLog::log(kLogError,
                           "Closed a connection from pid %d on port %s: it does not read its replies "
                           "(%zu waiting)",
                           static_cast<int>(connection.peer.pid), name_.c_str(),
                           connection.unsent.size() + 1);
        }
        dropConnection(fd);
        return;
    }
    connection.unsent.push_back(encodePacket(messageId, kFlagIsReply, answer));
    connection.unsentBytes += packetSize;
    if (connection.writeWatch == 0 && queue_ != nullptr) {
        std::weak_ptr<MessagePort> self = weak_from_this();
        connection.writeWatch = queue_->watchWritable(fd, [self, fd] {
            if (auto port = self.lock()) {
                port->flushReplies(fd);
            }
        });
    }
}

void MessagePort::flushReplies(int fd) {
    const auto found = connections_.find(fd);
    if (found == connections_.end()) {
        return;
    }
    Connection& connection = found->second;
    while (!connection.unsent.empty()) {
        const PlistData& packet = connection.unsent.front();
        const iovec part{const_cast<std::uint8_t*>(packet.data()), packet.size()};
        const SendOutcome outcome = sendNow(fd, &part, 1);
        if (outcome == SendOutcome::TimedOut) {
            return;
        }
        if (outcome == SendOutcome::Broken) {
            dropConnection(fd);
            return;
        }
        connection.unsentBytes -= packet.size();
        connection.unsent.pop_front();
    }
    if (connection.writeWatch != 0 && queue_ != nullptr) {
        queue_->unwatch(connection.writeWatch);
        connection.writeWatch = 0;
    }
}

void MessagePort::dropConnection(int fd) {
    const auto found = connections_.find(fd);
    if (found == connections_.end()) {
        return;
    }
    const bool fed = found->second.delivered;
    closeConnection(fd);
    if (fed && mode_ == LocalMode::Feeding) {
        invalidate();
    }
}

void MessagePort::whenWritable(std::function<void()> ready) {
    if (queue_ == nullptr || local_ || !valid_ || fd_ < 0) {
        return;
    }
    if (writableWatch_ != 0) {
        queue_->unwatch(writableWatch_);
    }
    std::weak_ptr<MessagePort> self = weak_from_this();
    writableWatch_ = queue_->watchWritable(fd_, [self, ready = std::move(ready)] {
        const std::shared_ptr<MessagePort> port = self.lock();
        if (!port) {
            return;
        }
        if (port->writableWatch_ != 0) {
            port->queue_->unwatch(port->writableWatch_);
            port->writableWatch_ = 0;
        }
        ready();
    });
}

void MessagePort::readRemote() {
    const std::shared_ptr<MessagePort> keep = shared_from_this();
    for (int handled = 0; handled < kMessagesPerWake; ++handled) {
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
                                      double receiveTimeout, bool wantReply,
                                      std::optional<PlistData>* reply) {
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

std::optional<MessagePort::Peer> MessagePort::listener() const {
    ucred credentials{};
    socklen_t length = sizeof credentials;
    if (local_ || fd_ < 0 || getsockopt(fd_, SOL_SOCKET, SO_PEERCRED, &credentials, &length) != 0) {
        return std::nullopt;
    }
    return Peer{credentials.pid, credentials.uid};
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
    if (queue_ != nullptr) {
        for (const MainQueue::Handle watch : {found->second.watch, found->second.writeWatch}) {
            if (watch != 0) {
                queue_->unwatch(watch);
            }
        }
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
    if (acceptRetry_ != 0) {
        queue_->cancelTimer(acceptRetry_);
        acceptRetry_ = 0;
    }
    if (writableWatch_ != 0) {
        queue_->unwatch(writableWatch_);
        writableWatch_ = 0;
    }
    for (auto& [fd, connection] : connections_) {
        for (MainQueue::Handle* watch : {&connection.watch, &connection.writeWatch}) {
            if (*watch != 0) {
                queue_->unwatch(*watch);
                *watch = 0;
            }
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
