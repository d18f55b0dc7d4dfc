// TerminalSaveForm: the save screen of the terminal interface: a modal form over the panes with the
// description field, the history list (a check mark and each entry's description) and the Save and Cancel
// buttons. It forwards the user's actions to the toolkit-free VelmarSaveViewController.
//
// Contract: the form opens with the description field focused. Tab and Shift+Tab move the focus (field,
// history, Save, Cancel); typing edits the field (← → Home End Backspace Delete move and delete within it);
// Enter in the field saves (the field gives up its focus first); Enter on a history row hides the keyboard
// focus and does nothing else; Enter on Save saves, on Cancel cancels; Esc cancels. While the form is up it
// takes every key. detach() cuts it from its controller, which is released right after.
#pragma once

#include <string>

#include "ui/SaveScreenPresenter.h"
#include "ui/terminal/TerminalCanvas.h"
#include "ui/terminal/TerminalKey.h"

namespace velmar {

class TerminalSaveForm : public SaveScreenView {
  public:
    enum class Focus { Description, History, Save, Cancel };

    explicit TerminalSaveForm(VelmarSaveViewController& controller);
    ~TerminalSaveForm() override;

    void detach();
    bool isAttached() const { return controller_ != nullptr; }

    std::string descriptionText() const override;
    void resignDescriptionFocus() override;

    void handleKey(const TerminalKey& key);
    void draw(TerminalCanvas& canvas) const;

    Focus focus() const { return focus_; }
    int historyRow() const { return historyRow_; }
    int cursor() const { return cursor_; }

  private:
    void moveFocus(int step);
    std::size_t rows() const;

    VelmarSaveViewController* controller_;
    std::u32string text_;
    int cursor_ = 0;
    Focus focus_ = Focus::Description;
    int historyRow_ = 0;
    mutable int historyTop_ = 0;
};

}  // namespace velmar
