// VelmarApp: the graphical application: the one window with the navigation stack of panes, the save screen
// presented over it, and alerts. The toolkit-free shell it owns does the application's work (model, status,
// redraws, save flow, termination); VelmarApp gives it the Qt panes and the presentation.
//
// Contract: applicationDidFinishLaunching builds the window (full screen, or a phone-sized 400 by 720
// window), the root pane with the status "Connecting" and a spinning indicator, shows the window and lets the
// shell queue the first connection attempt. applicationWillTerminate runs the shell's termination sequence
// once and takes the window off screen. The save screen covers the window and slides up over the panes;
// Ctrl+S opens it where the save button is offered.
#pragma once

#include <QMessageBox>
#include <QObject>
#include <QPointer>
#include <QWidget>
#include <memory>

#include "core/MonitorGenerator.h"
#include "core/platform/MainQueue.h"
#include "ui/SaveScreenPresenter.h"
#include "ui/VelmarShell.h"
#include "ui/qt/VelmarSaveView.h"

namespace velmar {

class NavigationController;
class VelmarPaneController;

class VelmarApp : public QObject, public SaveScreenPresenter {
    Q_OBJECT

  public:
    static constexpr int kPhoneWidth = 400;
    static constexpr int kPhoneHeight = 720;

    VelmarApp(GeneratorFactory factory, MainQueue& queue);
    ~VelmarApp() override;

    void applicationDidFinishLaunching(bool fullscreen);
    void applicationWillTerminate();

    bool allowSaveButton() const { return shell_.allowSaveButton(); }
    QWidget* window() const { return _window.get(); }
    NavigationController* navigationController() const { return _navController; }
    VelmarShell& shell() { return shell_; }
    // The save screen's view while one is presented.
    VelmarSaveView* saveView() const { return saveView_; }
    // The newest alert while it is open.
    QMessageBox* alert() const { return alert_; }

    void showSaveView() { shell_.showSaveView(); }
    void closeSaveView() { shell_.closeSaveView(); }

    void presentSaveScreen(VelmarSaveViewController& controller, bool animated) override;
    void dismissSaveScreen(bool animated) override;
    void showAlert(const std::string& title, const std::string& message,
                   const std::string& cancelButtonTitle) override;

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    VelmarShell shell_;
    std::unique_ptr<QWidget> _window;
    NavigationController* _navController = nullptr;
    QPointer<VelmarSaveView> saveView_;
    QPointer<QMessageBox> alert_;
    bool terminated_ = false;
};

}  // namespace velmar
