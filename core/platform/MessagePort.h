// MessagePort: a named message port over Unix-domain SOCK_SEQPACKET sockets, one message per packet.
//
// Contract:
// - A local port named N listens on the socket file N in the runtime directory. "Already exists" means a live
//   listener answers at that name: the port handed back then is not a new one and never listens. A stale
//   socket file with no listener is removed and reused; anything else at the name (a symbolic link, a file)
//   is left alone and the port is not created, with the reason.
// - Every accepted connection is checked with SO_PEERCRED: only the same user, or root, may connect; others
//   are closed and logged. A port may further take only one process's connections (acceptOnlyFrom) and at
//   most so many at once (setMaxConnections); others are closed and logged. When the process is out of file
//   descriptors the port stops accepting for a while instead of spinning, logging it once.
// - Messages arrive on the port's dispatch queue through the message callback, at most kMessagesPerWake per
//   connection each time the queue wakes, so that one busy peer cannot starve timers, signals or other
//   peers. A packet too short for the header (a zero-length one included) is dropped. When the sender asked
//   for a reply, the callback's answer (or an empty reply) goes back on the same connection without ever
//   blocking: what the socket cannot take now waits in the connection's queue, and a peer that lets more
//   than kMaxUnreadReplies replies (or kMaxUnreadReplyBytes) pile up is disconnected and logged.
// - A feeding local port (the default) becomes invalid when a connection that has delivered messages hangs
//   up (or is disconnected); a serving local port (a service's control port) outlives its clients.
//   Invalidation (from either cause, or invalidate()) fires the invalidation callback once; release
//   (destruction) never fires it.
// - A remote port connects to a named port. sendRequest writes one message within the send timeout and, when
//   a reply is wanted, waits for it on the same connection within the receive timeout. A remote port is
//   invalid once its connection has hung up. Messages that arrive on a remote port unasked (notifications)
//   go to its notification callback on the dispatch queue.
// - Status 0 is success; the other statuses tell send timeout, receive timeout, invalid port and transport
//   error apart.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "core/platform/ByteView.h"
#include "core/platform/LogRateLimit.h"
#include "core/platform/MainQueue.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

enum MessagePortStatus : std::int32_t {
    kMessagePortSuccess = 0,
    kMessagePortSendTimeout = -1,
    kMessagePortReceiveTimeout = -2,
    kMessagePortIsInvalid = -3,
    kMessagePortTransportError = -4,
};

class MessagePort : public std::enable_shared_from_this<MessagePort> {
  public:
    // Answers the reply to send back (used only when the sender wants one).
    using MessageCallback = std::function<std::optional<PlistData>(std::int32_t messageId, ByteView data)>;
    using InvalidationCallback = std::function<void()>;
    enum class LocalMode { Feeding, Serving };
    // The process at the other end of a connection, as the kernel vouches for it when it connected.
    struct Peer {
        pid_t pid = 0;
        uid_t uid = 0;
    };

    static constexpr int kMessagesPerWake = 64;
    static constexpr int kAcceptsPerWake = 16;
    static constexpr std::size_t kMaxUnreadReplies = 64;
    static constexpr std::size_t kMaxUnreadReplyBytes = 1024 * 1024;
    static constexpr std::size_t kDefaultMaxConnections = 256;

    ~MessagePort();
    MessagePort(const MessagePort&) = delete;
    MessagePort& operator=(const MessagePort&) = delete;

    // Null on failure (logged; the reason also in failure when given). alreadyExists is set when a live
    // listener holds the name.
    static std::shared_ptr<MessagePort> createLocal(const std::string& name, MessageCallback callback,
                                                    bool* alreadyExists, LocalMode mode = LocalMode::Feeding,
                                                    std::string* failure = nullptr);
    // Null when nothing listens at the name; the reason in failure when given ("Connection refused", "Too
    // many open files", a runtime directory's problem).
    static std::shared_ptr<MessagePort> createRemote(const std::string& name, std::string* failure = nullptr);

    // Removes the socket files that ended processes left behind in the runtime directory: those named
    // <prefix><pid><rest>, rest empty or starting with '.' and ending with suffix, when no process <pid> runs
    // and no listener answers there. Answers how many went.
    static int removeStalePorts(std::string_view prefix, std::string_view suffix = {});

    // All callbacks of the port run on this queue from now on (a local port starts accepting here).
    void setDispatchQueue(MainQueue& queue);
    void setInvalidationCallback(InvalidationCallback callback);
    void setNotificationCallback(MessageCallback callback);
    // Local ports: connections from any other process are refused from now on.
    void acceptOnlyFrom(pid_t pid) { onlyPid_ = pid; }
    void setMaxConnections(std::size_t count) { maxConnections_ = count == 0 ? 1 : count; }

    // Remote ports: runs ready once on the dispatch queue when the connection can take a message again (or
    // has failed); replaces an earlier request.
    void whenWritable(std::function<void()> ready);

    std::int32_t sendRequest(std::int32_t messageId, ByteView data, double sendTimeout, double receiveTimeout,
                             bool wantReply, std::optional<PlistData>* reply);
    bool isValid();
    void invalidate();

    const std::string& name() const { return name_; }
    bool isLocal() const { return local_; }
    // How many connections are open on a local port (diagnostics and tests).
    std::size_t connectionCount() const { return connections_.size(); }
    // The sender of the message being handled; only inside the message callback of a local port.
    const Peer* messageSender() const { return sender_; }
    // A remote port's listener (its process when it began listening); nullopt when unknown.
    std::optional<Peer> listener() const;

  private:
    struct Connection {
        int fd = -1;
        MainQueue::Handle watch = 0;
        MainQueue::Handle writeWatch = 0;
        bool delivered = false;
        Peer peer;
        std::deque<PlistData> unsent;  // whole packets the socket could not take yet
        std::size_t unsentBytes = 0;
    };

    MessagePort(std::string name, bool local);
    void acceptConnections();
    void acceptFailed(int error);
    void resumeAccepting();
    bool admit(int fd, Peer& peer);
    void watchConnection(Connection& connection);
    void readConnection(int fd);
    void reply(Connection& connection, std::int32_t messageId, ByteView answer);
    void flushReplies(int fd);
    // Closes a connection; a feeding port whose connection had delivered messages becomes invalid.
    void dropConnection(int fd);
    void readRemote();
    void closeConnection(int fd);
    void stopWatching();
    void closeEverything();
    void fireInvalidation();

    std::string name_;
    bool local_;
    LocalMode mode_ = LocalMode::Feeding;
    bool valid_ = true;
    bool owner_ = false;  // this port bound the socket file and removes it when it goes
    int fd_ = -1;         // listening socket (local) or connection (remote)
    std::string socketPath_;
    MainQueue* queue_ = nullptr;
    MainQueue::Handle listenWatch_ = 0;
    MainQueue::Handle acceptRetry_ = 0;
    MainQueue::Handle writableWatch_ = 0;  // remote ports: whenWritable
    double acceptBackoff_ = 0;             // seconds; 0 while accepting works
    std::map<int, Connection> connections_;
    std::size_t maxConnections_ = kDefaultMaxConnections;
    pid_t onlyPid_ = 0;
    const Peer* sender_ = nullptr;
    MessageCallback callback_;
    MessageCallback notificationCallback_;
    InvalidationCallback invalidationCallback_;
    std::unique_ptr<LogRateLimit> refusals_;
};

}  // namespace velmar
