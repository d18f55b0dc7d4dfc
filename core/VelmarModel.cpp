#include "core/VelmarModel.h"

#include <unistd.h>

#include "core/platform/Clock.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

VelmarModel::VelmarModel(GeneratorFactory factory, MainQueue& queue, VelmarModelDelegate* delegate)
    : _state(PlistDictionary::create()),
      factory_(std::move(factory)),
      queue_(queue),
      delegate_(delegate),
      receivePortName_(monitorReceivePortName(getpid())) {}

VelmarModel::~VelmarModel() {
    *alive_ = false;
    if (retryTimer_ != 0) {
        queue_.cancelTimer(retryTimer_);
        retryTimer_ = 0;
    }
    destroyPorts();
}

bool VelmarModel::isConnected() const {
    return _recvPort != nullptr && _sendPort != nullptr;
}

void VelmarModel::destroyPorts() {
    if (_displayUpdateTimer != 0) {
        queue_.cancelTimer(_displayUpdateTimer);
        _displayUpdateTimer = 0;
    }
    for (std::shared_ptr<MessagePort>* field : {&_recvPort, &_sendPort}) {
        if (std::shared_ptr<MessagePort> port = std::move(*field)) {
            field->reset();
            port->setInvalidationCallback(nullptr);  // a deliberate teardown never restarts the monitor
            port->invalidate();
        }
    }
}

void VelmarModel::startMonitor() {
    retryTimer_ = 0;
    if (_displayUpdateTimer != 0) {
        return;  // already running
    }
    if (!createPorts()) {
        SystemLog::log(kLogError, "Could not create the ports necessary");
        retryLater();
        return;
    }
    configureGenerator();
    if (!_logGenerator) {
        SystemLog::log(kLogError, "No log generator technology works");
        retryLater();
        return;
    }
    const auto command = serializeXml(_logGenerator->getStartCommand());
    if (!command) {
        SystemLog::log(kLogError, " Could not generate PLIST");
        retryLater();
        return;
    }
    const std::int32_t status = _sendPort->sendRequest(0, *command, 1.0, 0.0, false, nullptr);
    if (status != kMessagePortSuccess) {
        SystemLog::log(kLogError, " ***** Could not send the START command (got error=%d)", status);
        retryLater();
        return;
    }
    SystemLog::log(kLogError, "Starting the display update timer");
    std::weak_ptr<bool> alive = alive_;
    _displayUpdateTimer = queue_.repeating(kDisplayIntervalSeconds, [this, alive] {
        if (!alive.expired()) {
            refresh();
        }
    });
}

void VelmarModel::retryLater() {
    destroyPorts();
    if (retryTimer_ != 0) {
        queue_.cancelTimer(retryTimer_);  // one retry is pending at a time
    }
    std::weak_ptr<bool> alive = alive_;
    retryTimer_ = queue_.after(kRetryDelaySeconds, [this, alive] {
        if (!alive.expired()) {
            startMonitor();
        }
    });
}

void VelmarModel::restartMonitor() {
    destroyPorts();
    startMonitor();
}

void VelmarModel::refresh() {
    if (_sendPort && _recvPort && !_sendPort->isValid()) {
        const std::shared_ptr<MessagePort> port = _recvPort;  // the callback releases the field
        port->invalidate();
    }
    if (!_updated) {
        return;
    }
    _updated = false;
    _nodes.reset();
    _nodesByPath.reset();
    std::weak_ptr<bool> alive = alive_;
    queue_.async([this, alive] {
        if (!alive.expired() && delegate_ != nullptr) {
            delegate_->updateViewControllerFromModel();
        }
    });
}

void VelmarModel::refresh(const void*) {
    refresh();
}

void VelmarModel::updateWithData(ByteView data) {
    if (_logGenerator) {
        _logGenerator->updateState(_state, data);
    }
    _updated = true;
}

VelmarModelNodeRef VelmarModel::topLevelNodes() {
    if (_nodes) {
        return _nodes;
    }
    if (!_logGenerator) {
        return nullptr;
    }
    const PlistValue display = _logGenerator->generateLogUsingState(_state);
    auto paths = std::make_unique<NodePathDictionary>();
    _nodes = VelmarModelNode::makeTreeFromObject(display, *paths);
    _nodesByPath = std::move(paths);
    history_.sample(*_nodesByPath, Clock::now());
    return _nodes;
}

VelmarModelNodeRef VelmarModel::nodeAtPath(const std::string& path) {
    if (!_nodesByPath) {
        topLevelNodes();
    }
    if (!_nodesByPath) {
        return nullptr;
    }
    const VelmarModelNodeRef* node = _nodesByPath->find(path);
    return node ? *node : nullptr;
}

PlistValue VelmarModel::getSaveContents() {
    return _logGenerator ? _logGenerator->getSaveContentsFromState(_state) : PlistValue();
}

}  // namespace velmar
