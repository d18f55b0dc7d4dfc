// TerminalFrontEnd: the monitor as a full-screen terminal interface (velmar --terminal), on the poll main
// queue with standard input watched.
//
// Contract: the same shell and panes as the graphical interface: a title line with the pane's title and path,
// the rows, and a footer with a spinner while loading, the status text and "[s] Save" where the save button
// is offered. Keys: ↑ ↓ PgUp PgDn Home End move; Enter or → opens an inner row (→ and ← scroll a long
// selected pair sideways first); ← Backspace or Esc go back; c on a value that reads as a number opens its
// full-screen chart (on top of the stack, live, + and - zoom, Esc ← or Backspace close it); s saves; q
// quits. The save screen is a modal form; an alert is a box that Enter, Esc or Space closes. Every change
// schedules one redraw on the main queue and a redraw writes only the lines that changed; a terminal resize
// redraws everything. The spinner's timer runs only while the top screen is loading. SIGTERM, SIGINT and q
// run the termination sequence.
#pragma once

#include <cstdio>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "ui/SaveScreenPresenter.h"
#include "ui/VelmarShell.h"
#include "ui/terminal/CursesScreen.h"
#include "ui/terminal/TerminalChart.h"
#include "ui/terminal/TerminalPane.h"
#include "ui/terminal/TerminalSaveForm.h"

namespace velmar {

class TerminalFrontEnd : public NavigationStack, public SaveScreenPresenter {
  public:
    static constexpr double kSpinnerIntervalSeconds = 0.1;

    explicit TerminalFrontEnd(GeneratorFactory factory);
    ~TerminalFrontEnd() override;

    // Takes the terminal over, launches, turns the main queue until quit, terminates and gives the terminal
    // back. Answers the exit status (2 when standard input and output are not a usable terminal).
    // Runs the terminal interface on output (a terminal) and the standard input until quit.
    int run(std::FILE* output);

    // The parts below are also driven directly by the tests.
    void launch();
    void terminate();
    void handleKey(const TerminalKey& key);
    // Draws the current frame onto a canvas of the given size.
    void render(TerminalCanvas& canvas);

    // The panes, and the chart above them while one is open.
    std::size_t paneCount() const override { return panes_.size() + (chart_ ? 1 : 0); }
    Pane& paneAt(std::size_t index) override;
    void popToPane(std::size_t index, bool animated) override;

    void presentSaveScreen(VelmarSaveViewController& controller, bool animated) override;
    void dismissSaveScreen(bool animated) override;
    void showAlert(const std::string& title, const std::string& message,
                   const std::string& cancelButtonTitle) override;

    // The top pane of the display tree (under the chart, while one is open).
    TerminalPane& topPane() { return *panes_.back(); }
    TerminalChart* chart() const { return chart_.get(); }
    TerminalSaveForm* saveForm() const { return form_.get(); }
    bool isAlertShown() const { return alert_.has_value(); }
    bool isQuitRequested() const { return quit_; }
    bool isSpinning() const { return spinnerTimer_ != 0; }
    VelmarShell& shell() { return shell_; }
    PollMainQueue& queue() { return queue_; }

  private:
    struct Alert {
        std::string title;
        std::string message;
        std::string button;
    };

    TerminalPane& addPane(std::string path, VelmarModelNodeRef node);
    void pushPane(const VelmarModelNode& child, const VelmarModelNodeRef& node);
    void popPane();
    void setNeedsDisplay();
    void display();
    void updateSpinner();
    void handlePaneKey(const TerminalKey& key);
    void handleChartKey(const TerminalKey& key);
    void openChart();
    void drawAlert(TerminalCanvas& canvas) const;
    void quit();

    PollMainQueue queue_;
    VelmarShell shell_;
    CursesScreen screen_;
    std::vector<std::unique_ptr<TerminalPane>> panes_;
    std::unique_ptr<TerminalChart> chart_;
    std::unique_ptr<TerminalSaveForm> form_;
    std::optional<Alert> alert_;
    bool displayQueued_ = false;
    bool launched_ = false;
    bool terminated_ = false;
    bool quit_ = false;
    bool ascii_ = false;
    int columns_ = 80;
    int rows_ = 24;
    int spinnerFrame_ = 0;
    MainQueue::Handle spinnerTimer_ = 0;
    std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
};

}  // namespace velmar
