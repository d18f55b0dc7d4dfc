// VelmarShell: the toolkit-free application shell. It owns the monitor model, keeps the toolbar status
// ("Connecting..." while disconnected, else the time of the last update), carries the model's redraw requests
// to every pane on the navigation stack, decides once whether the save button is offered, and runs the launch
// and termination sequences. The front ends (Qt, terminal, headless) provide the panes and the stack.
//
// Contract: launch() must be called once the front end's root pane and stack exist; it gives the root pane
// the status "Connecting" with the busy indicator and queues the first restartMonitor on the main queue, so
// the window is up before the first connection attempt. Redraw: each pane, bottom first, gets its node (the
// root the top-level nodes, the others the node at their path); a pane whose path has gone pops the stack to
// its parent and ends the pass. terminate() resets the home screen's "HxShowGSMRSSI" to false and releases
// the model. At most one save screen exists: showSaveView creates it from the model's save contents and has
// the front end's presenter show it; closeSaveView has it taken away and releases it.
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "core/VelmarModel.h"
#include "ui/Pane.h"
#include "ui/SaveScreenPresenter.h"
#include "ui/VelmarSaveViewController.h"

namespace velmar {

class VelmarShell : public VelmarModelDelegate {
  public:
    static constexpr const char* kInternalBuildMarker =
        "/BrindleInternal/Library/PreferenceBundles/Carrier Settings.bundle";
    static constexpr const char* kConnectingStatus = "Connecting...";
    static constexpr const char* kLaunchStatus = "Connecting";
    static constexpr const char* kGsmRssiPreference = "HxShowGSMRSSI";

    VelmarShell(GeneratorFactory factory, MainQueue& queue);
    ~VelmarShell() override;

    // The front end calls these.
    void launch(NavigationStack& stack);
    void terminate();
    void navigationWillShow(Pane& pane);

    void getSaveButtonPref();
    void setGSMRSSI(bool value);
    void updateStatusForViewController(Pane& pane);
    void updateViewControllerFromModel() override;

    // The save flow. The presenter is the front end's; without one the save screen exists but is not shown.
    void setSaveScreenPresenter(SaveScreenPresenter* presenter) { savePresenter_ = presenter; }
    void showSaveView();
    void closeSaveView();
    VelmarSaveViewController* saveViewController() const { return _saveViewController.get(); }
    // Shown by the presenter; without one the alert is only logged.
    void showAlert(const std::string& title, const std::string& message,
                   const std::string& cancelButtonTitle);
    MainQueue& queue() const { return queue_; }
    // Expires when the shell goes, so that work queued for it can tell.
    std::weak_ptr<bool> aliveToken() const { return alive_; }

    bool allowSaveButton() const { return _allowSaveButton; }
    const std::string& updateMessage() const { return _updateMessage; }
    VelmarModel* model() const { return _model.get(); }
    // Called after every redraw pass (the headless front end prints then).
    void setRedrawObserver(std::function<void()> observer) { redrawObserver_ = std::move(observer); }

    // "Updated yyyy-MM-dd at HH:mm:ss" of the instant, in local time.
    static std::string formatUpdateMessage(double secondsSince1970);
    // The internal-build marker's path, under $VELMAR_SYSROOT when that is set.
    static std::string internalBuildMarkerPath();

  private:
    GeneratorFactory factory_;
    MainQueue& queue_;
    NavigationStack* _navController = nullptr;
    std::unique_ptr<VelmarSaveViewController> _saveViewController;
    SaveScreenPresenter* savePresenter_ = nullptr;
    std::unique_ptr<VelmarModel> _model;
    bool _allowSaveButton = false;
    std::string _updateMessage;
    std::function<void()> redrawObserver_;
    std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace velmar
