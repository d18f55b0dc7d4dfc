// MessagePort: a named message port over Unix-domain SOCK_SEQPACKET sockets, one message per packet.
//
// Contract:
// - A local port named N listens on the socket file N in the runtime directory. "Already exists" means a live
//   listener answers at that name: the port handed back then is not a new one and never listens. A stale
//   socket file with no listener is removed and reused.
// - Every accepted connection is checked with SO_PEERCRED: only the same user, or root, may connect; others
//   are closed and logged. Messages arrive on the port's dispatch queue through the message callback; when the
//   sender asked for a reply, the callback's answer (or an empty reply) goes back on the same connection.
// - A feeding local port (the default) becomes invalid when a connection that has delivered messages hangs
//   up; a serving local port (a service's control port) outlives its clients. Invalidation (from either cause,
//   or invalidate()) fires the invalidation callback once; release (destruction) never fires it.
// - A remote port connects to a named port. sendRequest writes one message within the send timeout and, when
//   a reply is wanted, waits for it on the same connection within the receive timeout. A remote port is
//   invalid once its connection has hung up. Messages that arrive on a remote port unasked (notifications)
//   go to its notification callback on the dispatch queue.
// - Status 0 is success; the other statuses tell send timeout, receive timeout, invalid port and transport
//   error apart.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>

#include "core/platform/ByteView.h"
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

    ~MessagePort();
    MessagePort(const MessagePort&) = delete;
    MessagePort& operator=(const MessagePort&) = delete;

    // Null on failure (logged). alreadyExists is set when a live listener holds the name.
    static std::shared_ptr<MessagePort> createLocal(const std::string& name, MessageCallback callback,
                                                    bool* alreadyExists, LocalMode mode = LocalMode::Feeding);
    static std::shared_ptr<MessagePort> createRemote(const std::string& name);

    // All callbacks of the port run on this queue from now on (a local port starts accepting here).
    void setDispatchQueue(MainQueue& queue);
    void setInvalidationCallback(InvalidationCallback callback);
    void setNotificationCallback(MessageCallback callback);

    std::int32_t sendRequest(std::int32_t messageId, ByteView data, double sendTimeout, double receiveTimeout,
                             bool wantReply, std::optional<PlistData>* reply);
    bool isValid();
    void invalidate();

    const std::string& name() const { return name_; }
    bool isLocal() const { return local_; }
    // How many connections are open on a local port (diagnostics and tests).
    std::size_t connectionCount() const { return connections_.size(); }

private:
    struct Connection {
        int fd = -1;
        MainQueue::Handle watch = 0;
        bool delivered = false;
    };

    MessagePort(std::string name, bool local);
    void acceptConnections();
    void readConnection(int fd);
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
    std::map<int, Connection> connections_;
    MessageCallback callback_;
    MessageCallback notificationCallback_;
    InvalidationCallback invalidationCallback_;
};

}  // namespace velmar
