#include "service/modem-manager/BusConnection.h"

#include <poll.h>
#include <systemd/sd-bus.h>

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <ctime>

namespace velmar::modem {

namespace {

// How many messages one turn of the queue processes, so that a flood on the bus never starves the service.
constexpr int kMessagesPerPump = 64;
constexpr const char* kSystemBusAddress = "unix:path=/run/dbus/system_bus_socket";

std::string errorText(int negativeErrno) {
    return std::strerror(-negativeErrno);
}

std::uint64_t monotonicMicroseconds() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<std::uint64_t>(now.tv_sec) * 1000000U +
           static_cast<std::uint64_t>(now.tv_nsec) / 1000U;
}

int onReply(sd_bus_message* message, void* userdata, sd_bus_error* /*error*/) {
    auto* handler = static_cast<BusConnection::ReplyHandler*>(userdata);
    if (sd_bus_message_is_method_error(message, nullptr) != 0) {
        const sd_bus_error* failure = sd_bus_message_get_error(message);
        std::string reason = failure != nullptr && failure->name != nullptr ? failure->name : "error";
        if (failure != nullptr && failure->message != nullptr) {
            reason += std::string(": ") + failure->message;
        }
        (*handler)(nullptr, reason);
    } else {
        (*handler)(message, std::string());
    }
    return 0;
}

int onSignal(sd_bus_message* message, void* userdata, sd_bus_error* /*error*/) {
    (*static_cast<BusConnection::SignalHandler*>(userdata))(message);
    return 0;
}

template <typename Handler>
void destroyHandler(void* userdata) {
    delete static_cast<Handler*>(userdata);
}

// Hands slot to the bus (which frees it, and the handler with it, when it is done or the bus goes).
template <typename Handler>
void floatSlot(sd_bus_slot* slot, Handler* handler) {
    sd_bus_slot_set_destroy_callback(slot, &destroyHandler<Handler>);
    sd_bus_slot_set_floating(slot, 1);
    sd_bus_slot_unref(slot);
    (void)handler;
}

}  // namespace

BusConnection::BusConnection(MainQueue& queue) : queue_(queue), alive_(std::make_shared<bool>(true)) {}

BusConnection::~BusConnection() {
    *alive_ = false;
    release();
}

bool BusConnection::open(const std::string& address, std::string& error) {
    close();
    closeRequested_ = false;
    lostReason_.clear();
    std::string target = address;
    if (target.empty()) {
        const char* system = std::getenv("DBUS_SYSTEM_BUS_ADDRESS");
        target = system != nullptr && *system != '\0' ? system : kSystemBusAddress;
    }
    sd_bus* bus = nullptr;
    int result = sd_bus_new(&bus);
    if (result >= 0) {
        result = sd_bus_set_address(bus, target.c_str());
    }
    if (result >= 0) {
        result = sd_bus_set_bus_client(bus, 1);
    }
    if (result >= 0) {
        result = sd_bus_start(bus);  // the socket is non-blocking: this only begins connecting
    }
    if (result < 0) {
        error = target + ": " + errorText(result);
        sd_bus_close_unref(bus);
        return false;
    }
    bus_ = bus;
    const std::weak_ptr<bool> alive = alive_;
    readWatch_ = queue_.watchReadable(sd_bus_get_fd(bus_), [this, alive] {
        if (const auto live = alive.lock(); live && *live) {
            pump();
        }
    });
    schedulePump();
    return true;
}

void BusConnection::close() {
    if (pumping_) {
        closeRequested_ = true;  // released when the processing returns
        return;
    }
    release();
}

void BusConnection::release() {
    if (readWatch_ != 0) {
        queue_.unwatch(readWatch_);
        readWatch_ = 0;
    }
    if (writeWatch_ != 0) {
        queue_.unwatch(writeWatch_);
        writeWatch_ = 0;
    }
    if (timer_ != 0) {
        queue_.cancelTimer(timer_);
        timer_ = 0;
    }
    if (bus_ != nullptr) {
        sd_bus* bus = bus_;
        bus_ = nullptr;
        sd_bus_close_unref(bus);  // never flushes: closing must not wait for the peer
    }
}

void BusConnection::call(const char* destination, const char* path, const char* interface, const char* member,
                         const char* argument, ReplyHandler handler) {
    if (bus_ == nullptr) {
        return;
    }
    sd_bus_message* message = nullptr;
    int result = sd_bus_message_new_method_call(bus_, &message, destination, path, interface, member);
    if (result >= 0 && argument != nullptr) {
        result = sd_bus_message_append(message, "s", argument);
    }
    auto* owned = new ReplyHandler(std::move(handler));
    sd_bus_slot* slot = nullptr;
    if (result >= 0) {
        result = sd_bus_call_async(bus_, &slot, message, &onReply, owned,
                                   static_cast<std::uint64_t>(kCallTimeoutSeconds * 1e6));
    }
    sd_bus_message_unref(message);
    if (result < 0) {
        // Not sent: the answer is the failure, on the queue like any other answer.
        const std::string reason = std::string(member) + ": " + errorText(result);
        const std::weak_ptr<bool> alive = alive_;
        queue_.async([owned, reason, alive] {
            if (const auto live = alive.lock(); live && *live) {
                (*owned)(nullptr, reason);
            }
            delete owned;
        });
        return;
    }
    floatSlot(slot, owned);
    schedulePump();
}

void BusConnection::match(const std::string& rule, SignalHandler handler) {
    if (bus_ == nullptr) {
        return;
    }
    auto* owned = new SignalHandler(std::move(handler));
    sd_bus_slot* slot = nullptr;
    const int result = sd_bus_add_match_async(bus_, &slot, rule.c_str(), &onSignal, nullptr, owned);
    if (result < 0) {
        delete owned;
        return;
    }
    floatSlot(slot, owned);
    schedulePump();
}

void BusConnection::schedulePump() {
    if (pumpScheduled_) {
        return;
    }
    pumpScheduled_ = true;
    const std::weak_ptr<bool> alive = alive_;
    queue_.async([this, alive] {
        if (const auto live = alive.lock(); live && *live) {
            pumpScheduled_ = false;
            pump();
        }
    });
}

void BusConnection::pump() {
    if (bus_ == nullptr) {
        return;
    }
    pumping_ = true;
    bool more = false;
    for (int processed = 0; processed < kMessagesPerPump && !closeRequested_; ++processed) {
        const int result = sd_bus_process(bus_, nullptr);
        if (result < 0) {
            lostReason_ = errorText(result);
            break;
        }
        if (result == 0) {
            break;
        }
        more = processed + 1 == kMessagesPerPump;
    }
    pumping_ = false;
    if (lostReason_.empty() && !closeRequested_ && sd_bus_is_open(bus_) <= 0) {
        lostReason_ = "the bus closed the connection";
    }
    if (closeRequested_ || !lostReason_.empty()) {
        const std::string reason = lostReason_;
        const bool requested = closeRequested_;
        release();
        if (!requested && lost_) {
            lost_(reason);
        }
        return;
    }
    if (more) {
        schedulePump();
    }
    rearm();
}

void BusConnection::rearm() {
    const std::weak_ptr<bool> alive = alive_;
    const int events = sd_bus_get_events(bus_);
    const bool wantsWrite = events > 0 && (events & POLLOUT) != 0;
    if (wantsWrite && writeWatch_ == 0) {
        writeWatch_ = queue_.watchWritable(sd_bus_get_fd(bus_), [this, alive] {
            if (const auto live = alive.lock(); live && *live) {
                pump();
            }
        });
    } else if (!wantsWrite && writeWatch_ != 0) {
        queue_.unwatch(writeWatch_);
        writeWatch_ = 0;
    }
    if (timer_ != 0) {
        queue_.cancelTimer(timer_);
        timer_ = 0;
    }
    std::uint64_t due = 0;
    if (sd_bus_get_timeout(bus_, &due) >= 0 && due != UINT64_MAX) {
        const std::uint64_t now = monotonicMicroseconds();
        const double delay = due > now ? static_cast<double>(due - now) / 1e6 : 0.0;
        timer_ = queue_.after(delay, [this, alive] {
            if (const auto live = alive.lock(); live && *live) {
                timer_ = 0;
                pump();
            }
        });
    }
}

}  // namespace velmar::modem
