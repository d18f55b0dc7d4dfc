// SaveScreenPresenter and SaveScreenView: what the toolkit-free save flow needs of a front end.
//
// Contract: the shell asks the presenter to show the one save screen modally over the navigation stack and
// to take it away again; the presenter builds its own view for the controller and hands it over with
// VelmarSaveViewController::setView, and clears it (setView(nullptr)) no later than dismissSaveScreen
// returns, since the controller is released right after. Alerts are the presenter's too: an alert stays up
// after the save screen has closed, until the user closes it, and it never blocks the main queue.
#pragma once

#include <string>

namespace velmar {

class VelmarSaveViewController;

class SaveScreenView {
  public:
    virtual ~SaveScreenView() = default;
    // The description field's text as typed (UTF-8); empty when nothing was typed.
    virtual std::string descriptionText() const = 0;
    // Takes the keyboard focus away from the description field (hides the keyboard).
    virtual void resignDescriptionFocus() = 0;
};

class SaveScreenPresenter {
  public:
    virtual ~SaveScreenPresenter() = default;
    virtual void presentSaveScreen(VelmarSaveViewController& controller, bool animated) = 0;
    virtual void dismissSaveScreen(bool animated) = 0;
    // An alert with a title, a message and a single button that closes it; no delegate.
    virtual void showAlert(const std::string& title, const std::string& message,
                           const std::string& cancelButtonTitle) = 0;
};

}  // namespace velmar
