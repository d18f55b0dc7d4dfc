// TerminalPane: one pane of the terminal interface: the node it shows, its path, its status, and where the
// user is in it (the selected row, the first row on screen, how far the selected row is scrolled sideways).
//
// Contract: reloadWithNode keeps the selected row, the first visible row and the sideways offset, clamped to
// the new rows, so that a redraw never moves the user. A pane with rows always has a selected row (the
// cursor). The title is the node's name, "Velmar" without a node.
#pragma once

#include <functional>
#include <string>

#include "ui/Pane.h"

namespace velmar {

class TerminalPane : public Pane {
  public:
    explicit TerminalPane(std::string path, VelmarModelNodeRef node = nullptr);

    const std::string& path() const override { return path_; }
    void reloadWithNode(const VelmarModelNodeRef& node) override;
    void setStatus(const std::string& status, bool isLoading) override;

    // Called whenever what the pane shows changes.
    void setChangeObserver(std::function<void()> observer) { observer_ = std::move(observer); }

    std::string title() const;
    const VelmarModelNodeRef& node() const { return node_; }
    const std::string& status() const { return status_; }
    bool isLoading() const { return loading_; }

    int rowCount() const;
    // The child at row, or null.
    const VelmarModelNode* childAt(int row) const;
    int selectedRow() const { return selected_; }
    int topRow() const { return top_; }
    int sideways() const { return sideways_; }

    // Moves the cursor by delta rows (clamped); the sideways offset starts again at 0.
    void moveSelection(int delta);
    void selectRow(int row);
    // Keeps the cursor within visibleRows rows from the top row.
    void scrollToSelection(int visibleRows);
    // Sets the selected row's sideways offset, clamped to [0, maximum].
    void setSideways(int offset, int maximum);

  private:
    void clamp();
    void changed();

    std::string path_;
    VelmarModelNodeRef node_;
    std::string status_;
    bool loading_ = true;
    int selected_ = 0;
    int top_ = 0;
    int sideways_ = 0;
    std::function<void()> observer_;
};

}  // namespace velmar
