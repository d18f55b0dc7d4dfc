// BusConnection: one client connection to a D-Bus bus (sd-bus), driven by the service's MainQueue: its
// socket is watched on the queue, its timeouts are queue timers, and nothing ever waits on the bus.
//
// Contract:
// - open() connects to an address ("unix:path=..."; the system bus when empty: DBUS_SYSTEM_BUS_ADDRESS, else
//   the standard socket). The connection and the authentication go on asynchronously; a failure found
//   later is reported once through the lost handler.
// - call() sends a method call; the reply (or the error, including a timeout) comes back to the handler on
//   the queue, at most once; calls still out when close() is called never answer.
// - match() subscribes to signals by a match rule (the rule is sent asynchronously, never waited for).
// - Handlers run from inside the bus's processing: they may call close(), which takes effect when the
//   processing returns; they must not destroy the connection. After close() or the lost handler nothing
//   else is called. When the peer goes, calls still out are answered with an error before the lost handler.
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "core/platform/MainQueue.h"

struct sd_bus;
struct sd_bus_message;

namespace velmar::modem {

class BusConnection {
  public:
    // reply is null when the call failed; error then says why in one line.
    using ReplyHandler = std::function<void(sd_bus_message* reply, const std::string& error)>;
    using SignalHandler = std::function<void(sd_bus_message* signal)>;

    explicit BusConnection(MainQueue& queue);
    ~BusConnection();
    BusConnection(const BusConnection&) = delete;
    BusConnection& operator=(const BusConnection&) = delete;

    // False with a one-line reason when the connection cannot even be started.
    bool open(const std::string& address, std::string& error);
    void close();
    bool isOpen() const { return bus_ != nullptr; }
    void setLostHandler(std::function<void(const std::string& reason)> lost) { lost_ = std::move(lost); }

    // A method call with no argument, or with one string argument when argument is not null.
    void call(const char* destination, const char* path, const char* interface, const char* member,
              const char* argument, ReplyHandler handler);
    void match(const std::string& rule, SignalHandler handler);

    static constexpr double kCallTimeoutSeconds = 10.0;

  private:
    void schedulePump();
    void pump();
    void rearm();
    void release();

    MainQueue& queue_;
    sd_bus* bus_ = nullptr;
    MainQueue::Handle readWatch_ = 0;
    MainQueue::Handle writeWatch_ = 0;
    MainQueue::Handle timer_ = 0;
    bool pumpScheduled_ = false;
    bool pumping_ = false;
    bool closeRequested_ = false;
    std::string lostReason_;
    std::function<void(const std::string&)> lost_;
    std::shared_ptr<bool> alive_;
};

}  // namespace velmar::modem
