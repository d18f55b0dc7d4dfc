// TelephonyServiceConnection: a connection to the telephony service's control port.
//
// Contract: create() answers none when no service listens. createLogChannel asks the service to create a log
// channel that streams to the named local port; it answers a status of two words (domain, error code; only
// the error code means anything: 0 is success) and, on success, the name of the port on which the service
// listens for that channel (which may be absent or empty). Every notification the service sends on the
// connection calls the notification callback on the dispatch queue.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>

#include "core/platform/MainQueue.h"
#include "core/platform/MessagePort.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class TelephonyServiceConnection {
  public:
    using NotificationCallback = std::function<void(const std::string& name, const PlistValue& data)>;
    struct Status {
        std::int32_t domain = 0;
        std::int32_t error = 0;
        std::string reason;  // the service's own words on a refusal, for diagnostics
    };

    static std::unique_ptr<TelephonyServiceConnection> create(NotificationCallback callback,
                                                              MainQueue& queue);

    Status createLogChannel(const std::string& receivePortName, std::optional<std::string>* remotePortName);
    // The service's process, so that the receive port can take its connections only; 0 when unknown.
    pid_t servicePid() const;

  private:
    explicit TelephonyServiceConnection(std::shared_ptr<MessagePort> control)
        : control_(std::move(control)) {}
    std::shared_ptr<MessagePort> control_;
};

}  // namespace velmar
