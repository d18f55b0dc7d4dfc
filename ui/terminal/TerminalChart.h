// TerminalChart: the full-screen chart of one value in the terminal interface, as the shell sees it: the
// leaf it charts, its path, the status of its footer, and the time span it shows.
//
// Contract: the chart sits on top of the navigation stack, so after every redraw the shell hands it the
// leaf of its path in the new tree (and pops it when the path has gone). The span starts at ten minutes and
// steps through 1, 2, 5, 10, 20, 30 and 60 minutes, never beyond the longest span given. The title is the
// leaf's name. Every change tells the observer.
#pragma once

#include <functional>
#include <string>

#include "ui/Pane.h"

namespace velmar {

class TerminalChart : public Pane {
  public:
    static constexpr double kDefaultSpanSeconds = 600.0;

    TerminalChart(std::string path, VelmarModelNodeRef leaf);

    const std::string& path() const override { return path_; }
    void reloadWithNode(const VelmarModelNodeRef& node) override;
    void setStatus(const std::string& status, bool isLoading) override;
    void setChangeObserver(std::function<void()> observer) { observer_ = std::move(observer); }

    std::string title() const;
    const VelmarModelNodeRef& node() const { return leaf_; }
    const std::string& status() const { return status_; }
    bool isLoading() const { return loading_; }

    double spanSeconds() const { return span_; }
    // The next shorter span, down to a minute.
    void zoomIn();
    // The next longer span, up to longestSeconds.
    void zoomOut(double longestSeconds);

  private:
    void changed();

    std::string path_;
    VelmarModelNodeRef leaf_;
    std::string status_;
    bool loading_ = true;
    double span_ = kDefaultSpanSeconds;
    std::function<void()> observer_;
};

}  // namespace velmar
