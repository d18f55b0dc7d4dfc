// Pane: what the application shell needs of one pane of the navigation stack, whatever the toolkit.
//
// Contract: a pane shows one node of the display tree, named by its path ("/" for the root pane). The shell
// hands it a new node after every redraw (null when there is no tree) and the status text of its toolbar with
// whether the busy indicator spins.
#pragma once

#include <string>

#include "core/VelmarModelNode.h"

namespace velmar {

class Pane {
  public:
    virtual ~Pane() = default;
    virtual const std::string& path() const = 0;
    virtual void reloadWithNode(const VelmarModelNodeRef& node) = 0;
    virtual void setStatus(const std::string& status, bool isLoading) = 0;
};

// The navigation stack as the shell sees it: panes bottom first.
class NavigationStack {
  public:
    virtual ~NavigationStack() = default;
    virtual std::size_t paneCount() const = 0;
    virtual Pane& paneAt(std::size_t index) = 0;
    // Pops every pane above index.
    virtual void popToPane(std::size_t index, bool animated) = 0;
};

}  // namespace velmar
