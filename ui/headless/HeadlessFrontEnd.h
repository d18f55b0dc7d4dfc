// HeadlessFrontEnd: the monitor without a user interface, for scripts and tests.
//
// Contract: the navigation stack holds the root pane and, with a followed path /A/B, the panes /A and /A/B
// above it, as if the user had opened them. After launch and after every redraw one JSON line goes to the
// output: {"time": "<ISO 8601 local>", "connected": true|false, "status": "<status text>", "tree": NODE},
// where NODE is the top pane's node, {"name": N, "value": V} for a leaf and {"name": N, "children":
// [NODE...]} for an inner node, in display order, and null without a tree. A pane whose path has gone is
// popped, so the top pane, and the tree printed, become its parent's. SIGTERM and SIGINT run the termination
// sequence.
#pragma once

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "core/platform/PollMainQueue.h"
#include "ui/Pane.h"
#include "ui/VelmarShell.h"

namespace velmar {

// A pane of the followed path: its path is the first `length` characters of the whole followed path, which
// the panes share, made into a string of its own only when asked for; so a path of any number of parts costs
// memory in proportion to its length, not to its length squared.
class HeadlessPane : public Pane {
  public:
    HeadlessPane(std::shared_ptr<const std::string> followed, std::size_t length)
        : followed_(std::move(followed)), length_(length) {}
    const std::string& path() const override {
        if (path_.empty()) {
            path_ = followed_->substr(0, length_);
        }
        return path_;
    }
    void reloadWithNode(const VelmarModelNodeRef& node) override { node_ = node; }
    void setStatus(const std::string& status, bool isLoading) override {
        status_ = status;
        loading_ = isLoading;
    }
    const VelmarModelNodeRef& node() const { return node_; }
    const std::string& status() const { return status_; }
    bool isLoading() const { return loading_; }

  private:
    std::shared_ptr<const std::string> followed_;
    std::size_t length_;
    mutable std::string path_;
    VelmarModelNodeRef node_;
    std::string status_;
    bool loading_ = false;
};

class HeadlessFrontEnd : public NavigationStack {
  public:
    HeadlessFrontEnd(GeneratorFactory factory, const std::string& followedPath, std::FILE* output);
    ~HeadlessFrontEnd() override;

    // Launches, turns the main queue until SIGTERM or SIGINT, terminates; answers the exit status.
    int run();

    std::size_t paneCount() const override { return panes_.size(); }
    Pane& paneAt(std::size_t index) override { return *panes_.at(index); }
    void popToPane(std::size_t index, bool animated) override;

    // The JSON line for the current top pane (without the newline).
    std::string statusLine() const;
    // The JSON form of one node, as the line carries it.
    static void appendNodeJson(std::string& out, const VelmarModelNodeRef& node);

  private:
    void printStatusLine();

    PollMainQueue queue_;
    VelmarShell shell_;
    std::vector<std::unique_ptr<HeadlessPane>> panes_;
    std::FILE* output_;
};

}  // namespace velmar
