// VelmarModel: the heart of the monitor. It owns the baseband log channel, the generator for the baseband's
// technology, the state dictionary the generator fills and the display tree the panes show.
//
// Contract: restartMonitor (= destroyPorts + startMonitor) brings the channel up: create the ports, ask
// "GetTechnology", pick the generator, send its start command, start the 2-second display timer. Any failure
// tears the ports down and queues one startMonitor 5 seconds later, for ever. An invalidated receive port
// restarts the monitor. Every blob with message id 0 goes to the generator and marks the model updated; a
// tick that finds it updated drops the display tree and asks the delegate to redraw, asynchronously on the
// main queue; the tree is rebuilt lazily, at most once per acting tick, by the first topLevelNodes or
// nodeAtPath. The state, the generator and the tree survive a restart. The receive port's name is the
// process's own (monitorReceivePortName), so several monitors of one user each get a channel; the first
// createPorts removes the receive-port files of monitors that ended without closing them. All of it runs on
// one main queue. Each build of the tree (once per redraw) samples its numeric leaves into the value history,
// which survives restarts and is cleared when the service answers another technology than before.
#pragma once

#include <memory>
#include <optional>
#include <string>

#include "core/MonitorGenerator.h"
#include "core/ValueHistory.h"
#include "core/VelmarModelNode.h"
#include "core/platform/MainQueue.h"
#include "core/platform/MessagePort.h"
#include "core/platform/TelephonyServiceConnection.h"

namespace velmar {

class VelmarModelDelegate {
  public:
    virtual ~VelmarModelDelegate() = default;
    virtual void updateViewControllerFromModel() = 0;
};

class VelmarModel {
  public:
    static constexpr double kDisplayIntervalSeconds = 2.0;
    static constexpr double kRetryDelaySeconds = 5.0;

    VelmarModel(GeneratorFactory factory, MainQueue& queue, VelmarModelDelegate* delegate);
    ~VelmarModel();
    VelmarModel(const VelmarModel&) = delete;
    VelmarModel& operator=(const VelmarModel&) = delete;

    bool isConnected() const;
    bool createPorts();
    void destroyPorts();
    void configureGenerator();
    void startMonitor();
    void restartMonitor();
    void refresh();
    void refresh(const void* sender);
    void updateWithData(ByteView data);
    VelmarModelNodeRef topLevelNodes();
    VelmarModelNodeRef nodeAtPath(const std::string& path);
    PlistValue getSaveContents();

    // Observations for the shell and the tests.
    bool isRunning() const { return _displayUpdateTimer != 0; }
    bool hasPendingRetry() const { return retryTimer_ != 0; }
    bool isUpdated() const { return _updated; }
    MonitorGenerator* generator() const { return _logGenerator.get(); }
    const PlistDictionaryRef& state() const { return _state; }
    void setReceivePortName(std::string name) { receivePortName_ = std::move(name); }
    const ValueHistory& history() const { return history_; }

  private:
    std::optional<PlistData> onLogChannelMessage(std::int32_t messageId, ByteView data);
    void onLogChannelInvalidated(MessagePort* port);
    void onTelephonyServiceEvent();
    void retryLater();

    std::shared_ptr<MessagePort> _recvPort;
    std::shared_ptr<MessagePort> _sendPort;
    MainQueue::Handle _displayUpdateTimer = 0;
    bool _updated = false;
    std::unique_ptr<MonitorGenerator> _logGenerator;
    PlistDictionaryRef _state;
    VelmarModelNodeRef _nodes;
    std::unique_ptr<NodePathDictionary> _nodesByPath;

    GeneratorFactory factory_;
    MainQueue& queue_;
    VelmarModelDelegate* delegate_;
    MainQueue::Handle retryTimer_ = 0;
    // This process's own receive port (see monitorReceivePortName); tests may choose another.
    std::string receivePortName_;
    bool staleReceivePortsRemoved_ = false;
    ValueHistory history_;
    std::string historyTechnology_;
    // Cleared when the model goes, so that redraw requests still queued do nothing.
    std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace velmar
