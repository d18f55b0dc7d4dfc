#include "ui/VelmarShell.h"

#include <sys/stat.h>

#include <cstdlib>

#include "core/platform/Clock.h"
#include "core/platform/PreferencesStore.h"

namespace velmar {

VelmarShell::VelmarShell(GeneratorFactory factory, MainQueue& queue)
    : factory_(std::move(factory)), queue_(queue) {}

VelmarShell::~VelmarShell() {
    *alive_ = false;
}

std::string VelmarShell::internalBuildMarkerPath() {
    const char* sysroot = std::getenv("VELMAR_SYSROOT");
    return (sysroot && *sysroot ? std::string(sysroot) : std::string()) + kInternalBuildMarker;
}

void VelmarShell::getSaveButtonPref() {
    struct stat info {};
    _allowSaveButton = stat(internalBuildMarkerPath().c_str(), &info) == 0;
}

std::string VelmarShell::formatUpdateMessage(double secondsSince1970) {
    return Clock::localText(secondsSince1970, "Updated %Y-%m-%d at %H:%M:%S");
}

void VelmarShell::launch(NavigationStack& stack) {
    getSaveButtonPref();
    _navController = &stack;
    _model = std::make_unique<VelmarModel>(factory_, queue_, this);
    _updateMessage = kConnectingStatus;
    if (stack.paneCount() > 0) {
        stack.paneAt(0).setStatus(kLaunchStatus, true);
    }
    std::weak_ptr<bool> alive = alive_;
    queue_.async([this, alive] {
        if (!alive.expired() && _model) {
            _model->restartMonitor();
        }
    });
}

void VelmarShell::terminate() {
    setGSMRSSI(false);
    _updateMessage.clear();
    if (_saveViewController && savePresenter_ != nullptr) {
        savePresenter_->dismissSaveScreen(false);
    }
    _saveViewController.reset();
    _model.reset();
    _navController = nullptr;
}

void VelmarShell::showSaveView() {
    if (_saveViewController) {
        return;
    }
    const PlistValue contents = _model ? _model->getSaveContents() : PlistValue();
    _saveViewController = std::make_unique<VelmarSaveViewController>(contents, *this);
    if (savePresenter_ != nullptr) {
        savePresenter_->presentSaveScreen(*_saveViewController, true);
    }
}

void VelmarShell::closeSaveView() {
    if (!_saveViewController) {
        return;
    }
    if (savePresenter_ != nullptr) {
        savePresenter_->dismissSaveScreen(true);
    }
    _saveViewController.reset();
}

void VelmarShell::showAlert(const std::string& title, const std::string& message,
                            const std::string& cancelButtonTitle) {
    if (savePresenter_ != nullptr) {
        savePresenter_->showAlert(title, message, cancelButtonTitle);
    }
}

void VelmarShell::setGSMRSSI(bool value) {
    PreferencesStore preferences(PreferencesStore::kHomeScreenDomain);
    preferences.setValue(kGsmRssiPreference, PlistValue::boolean(value));
    preferences.synchronize();
    preferences.postChanged(kGsmRssiPreference);
}

void VelmarShell::updateStatusForViewController(Pane& pane) {
    if (_model && _model->isConnected()) {
        pane.setStatus(_updateMessage, false);
    } else {
        pane.setStatus(kConnectingStatus, true);
    }
}

void VelmarShell::navigationWillShow(Pane& pane) {
    updateStatusForViewController(pane);
}

void VelmarShell::updateViewControllerFromModel() {
    if (!_model || _navController == nullptr) {
        return;
    }
    NavigationStack& stack = *_navController;
    for (std::size_t index = 0; index < stack.paneCount(); ++index) {
        Pane& pane = stack.paneAt(index);
        VelmarModelNodeRef node;
        if (index == 0) {
            node = _model->topLevelNodes();
        } else {
            node = _model->nodeAtPath(pane.path());
            if (!node) {
                stack.popToPane(index - 1, true);
                break;
            }
        }
        pane.reloadWithNode(node);
    }
    if (stack.paneCount() > 0) {
        Pane& top = stack.paneAt(stack.paneCount() - 1);
        if (_model->isConnected()) {
            _updateMessage = formatUpdateMessage(Clock::now());
        }
        updateStatusForViewController(top);
    }
    if (redrawObserver_) {
        redrawObserver_();
    }
}

}  // namespace velmar
