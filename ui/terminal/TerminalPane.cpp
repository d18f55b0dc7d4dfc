#include "ui/terminal/TerminalPane.h"

#include <algorithm>

namespace velmar {

TerminalPane::TerminalPane(std::string path, VelmarModelNodeRef node)
    : path_(std::move(path)), node_(std::move(node)) {}

void TerminalPane::changed() {
    if (observer_) {
        observer_();
    }
}

std::string TerminalPane::title() const {
    return node_ ? node_->displayName() : std::string("Velmar");
}

int TerminalPane::rowCount() const {
    const NodeList* children = node_ ? node_->childNodes() : nullptr;
    return children ? static_cast<int>(children->size()) : 0;
}

const VelmarModelNode* TerminalPane::childAt(int row) const {
    const NodeList* children = node_ ? node_->childNodes() : nullptr;
    if (children == nullptr || row < 0 || static_cast<std::size_t>(row) >= children->size()) {
        return nullptr;
    }
    return (*children)[static_cast<std::size_t>(row)].get();
}

void TerminalPane::clamp() {
    const int rows = rowCount();
    selected_ = rows == 0 ? 0 : std::clamp(selected_, 0, rows - 1);
    top_ = rows == 0 ? 0 : std::clamp(top_, 0, rows - 1);
    if (sideways_ < 0) {
        sideways_ = 0;
    }
}

void TerminalPane::reloadWithNode(const VelmarModelNodeRef& node) {
    node_ = node;
    clamp();
    changed();
}

void TerminalPane::setStatus(const std::string& status, bool isLoading) {
    if (status == status_ && isLoading == loading_) {
        return;
    }
    status_ = status;
    loading_ = isLoading;
    changed();
}

void TerminalPane::moveSelection(int delta) {
    selectRow(selected_ + delta);
}

void TerminalPane::selectRow(int row) {
    const int before = selected_;
    selected_ = row;
    clamp();
    if (selected_ != before) {
        sideways_ = 0;
    }
    changed();
}

void TerminalPane::scrollToSelection(int visibleRows) {
    const int rows = rowCount();
    const int height = std::max(1, visibleRows);
    if (selected_ < top_) {
        top_ = selected_;
    } else if (selected_ >= top_ + height) {
        top_ = selected_ - height + 1;
    }
    // No empty space below the last row while rows are hidden above.
    top_ = std::clamp(top_, 0, std::max(0, rows - height));
}

void TerminalPane::setSideways(int offset, int maximum) {
    const int clamped = std::clamp(offset, 0, std::max(0, maximum));
    if (clamped != sideways_) {
        sideways_ = clamped;
        changed();
    }
}

}  // namespace velmar
