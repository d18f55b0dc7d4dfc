#include "core/platform/TelephonyServiceConnection.h"

#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {
constexpr double kRequestTimeoutSeconds = 2.0;
constexpr std::int32_t kTransportDomain = -1;
}  // namespace

std::unique_ptr<TelephonyServiceConnection> TelephonyServiceConnection::create(NotificationCallback callback,
                                                                               MainQueue& queue) {
    auto control = MessagePort::createRemote(std::string(kKxServerControlPortName));
    if (!control) {
        return nullptr;
    }
    control->setNotificationCallback([callback](std::int32_t, ByteView data) -> std::optional<PlistData> {
        const auto message = parsePropertyList(data);
        const PlistDictionaryRef fields = message ? message->dictionary() : nullptr;
        const std::string* name = fields ? fields->get(kKxNotificationKey).string() : nullptr;
        if (callback) {
            callback(name ? *name : std::string(),
                     fields ? fields->get(kKxNotificationDataKey) : PlistValue());
        }
        return std::nullopt;
    });
    control->setDispatchQueue(queue);
    return std::unique_ptr<TelephonyServiceConnection>(new TelephonyServiceConnection(std::move(control)));
}

TelephonyServiceConnection::Status TelephonyServiceConnection::createLogChannel(
    const std::string& receivePortName, std::optional<std::string>* remotePortName) {
    if (remotePortName) {
        remotePortName->reset();
    }
    auto request = PlistDictionary::create();
    request->set(kKxRequestKey, kKxRequestCreateLogChannel);
    request->set(kKxReceivePortKey, receivePortName);
    const auto encoded = serializeXml(request);
    if (!encoded) {
        return {kTransportDomain, kMessagePortTransportError, {}};
    }
    std::optional<PlistData> replyData;
    const std::int32_t sent =
        control_->sendRequest(0, *encoded, kRequestTimeoutSeconds, kRequestTimeoutSeconds, true, &replyData);
    if (sent != kMessagePortSuccess) {
        return {kTransportDomain, sent, {}};
    }
    const auto reply = replyData ? parsePropertyList(*replyData) : std::nullopt;
    const PlistDictionaryRef fields = reply ? reply->dictionary() : nullptr;
    if (!fields) {
        return {kTransportDomain, kMessagePortTransportError, {}};
    }
    Status status;
    status.domain = static_cast<std::int32_t>(fields->get(kKxDomainKey).integerValue().value_or(0));
    status.error =
        static_cast<std::int32_t>(fields->get(kKxErrorKey).integerValue().value_or(kKxErrorBadRequest));
    if (const std::string* reason = fields->get(kKxReasonKey).string()) {
        status.reason = *reason;
    }
    if (status.error == 0 && remotePortName) {
        if (const std::string* port = fields->get(kKxChannelPortKey).string()) {
            *remotePortName = *port;
        }
    }
    return status;
}

pid_t TelephonyServiceConnection::servicePid() const {
    const std::optional<MessagePort::Peer> service = control_->listener();
    return service ? service->pid : 0;
}

}  // namespace velmar
