// The log channel of VelmarModel: opening the ports, the technology query and the port callbacks.
#include "core/VelmarModel.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

bool VelmarModel::createPorts() {
    if (!staleReceivePortsRemoved_) {
        // The receive ports of monitors that were killed stay behind as socket files; the first channel
        // of this monitor clears them away.
        staleReceivePortsRemoved_ = true;
        MessagePort::removeStalePorts(kMonitorReceivePortPrefix, kMonitorReceivePortSuffix);
    }
    const std::string receiveName = receivePortName_;
    bool alreadyExists = false;
    std::weak_ptr<bool> alive = alive_;
    _recvPort = MessagePort::createLocal(
        receiveName,
        [this, alive](std::int32_t messageId, ByteView data) -> std::optional<PlistData> {
            return alive.expired() ? std::nullopt : onLogChannelMessage(messageId, data);
        },
        &alreadyExists);
    if (!_recvPort) {
        SystemLog::log(kLogError, "Could not create local message port");
        return false;
    }
    if (alreadyExists) {
        SystemLog::log(kLogError, "Local messsage port already exists");
        return false;
    }
    _recvPort->setDispatchQueue(queue_);
    MessagePort* receivePort = _recvPort.get();
    _recvPort->setInvalidationCallback([this, alive, receivePort] {
        if (!alive.expired()) {
            onLogChannelInvalidated(receivePort);
        }
    });

    auto connection = TelephonyServiceConnection::create(
        [this, alive](const std::string&, const PlistValue&) {
            if (!alive.expired()) {
                onTelephonyServiceEvent();
            }
        },
        queue_);
    if (!connection) {
        SystemLog::log(kLogError, "Could not create KxServerConnection");
        return false;
    }
    std::optional<std::string> remoteName;
    const TelephonyServiceConnection::Status status = connection->createLogChannel(receiveName, &remoteName);
    if (const pid_t service = connection->servicePid(); service != 0) {
        // Only the service may feed the receive port: another process could end the channel by hanging up.
        _recvPort->acceptOnlyFrom(service);
    }
    connection.reset();  // used for this one request only
    if (status.error != 0) {
        SystemLog::log(kLogError, "_KxServerConnectionNetworkMonitorCreateLogChannel returns error: %ld!",
                       static_cast<long>(status.error));
        return false;
    }
    if (!remoteName || remoteName->empty()) {
        SystemLog::log(kLogError, "Could not create a log channel (Kx returned null port)!");
        return false;
    }
    _sendPort = MessagePort::createRemote(*remoteName);
    if (!_sendPort) {
        SystemLog::log(kLogError, "Could not create the remote port!");
        return false;
    }
    SystemLog::log(kLogError, " ***** Created ports (send=%p, recv=%p)", static_cast<void*>(_sendPort.get()),
                   static_cast<void*>(_recvPort.get()));
    return true;
}

void VelmarModel::configureGenerator() {
    auto request = PlistDictionary::create();
    request->set(kKxGetTechnologyKey, kKxGetTechnologyKey);
    const auto encoded = serializeXml(request);
    if (!encoded) {
        SystemLog::log(kLogError, " Could not generate GetTechnology command; cannot configure");
        return;
    }
    std::optional<PlistData> replyData;
    const std::int32_t status = _sendPort->sendRequest(0, *encoded, 1.0, 1.0, true, &replyData);
    if (status != kMessagePortSuccess) {
        SystemLog::log(kLogError, " ***** Could not send the GetTechnology command (got error=%d)", status);
        return;
    }
    if (!replyData) {
        SystemLog::log(kLogError, " ***** No response to GetTechnology; cannot configure");
        return;
    }
    const auto reply = parsePropertyList(*replyData);
    if (!reply) {
        SystemLog::log(kLogError, " ***** Could not parse reply to GetTechnology; cannot configure");
        return;
    }
    const PlistDictionaryRef& fields = reply->dictionary();
    const PlistValue* answer = fields ? fields->find(kKxGetTechnologyKey) : nullptr;
    if (answer == nullptr) {
        SystemLog::log(kLogError, " ***** Reply to GetTechnology had no answer; cannot configure");
        return;
    }
    const std::string* technology = answer->string();
    _logGenerator = technology && factory_ ? factory_(*technology) : nullptr;
    if (_logGenerator && *technology != historyTechnology_) {
        history_.clear();  // other paths, other meanings
        historyTechnology_ = *technology;
    }
    SystemLog::log(kLogError, "Got log generated: %p", static_cast<void*>(_logGenerator.get()));
}

std::optional<PlistData> VelmarModel::onLogChannelMessage(std::int32_t messageId, ByteView data) {
    if (messageId == 0) {
        updateWithData(data);
    }
    return std::nullopt;
}

void VelmarModel::onLogChannelInvalidated(MessagePort* port) {
    SystemLog::log(kLogError, " ***** INVALIDATED %p *****", static_cast<void*>(port));
    restartMonitor();
}

void VelmarModel::onTelephonyServiceEvent() {
    refresh();
}

}  // namespace velmar
