#include "ui/terminal/TerminalChart.h"

#include <array>

namespace velmar {

namespace {
constexpr std::array<double, 7> kSpans = {60.0, 120.0, 300.0, 600.0, 1200.0, 1800.0, 3600.0};
}  // namespace

TerminalChart::TerminalChart(std::string path, VelmarModelNodeRef leaf)
    : path_(std::move(path)), leaf_(std::move(leaf)) {}

void TerminalChart::changed() {
    if (observer_) {
        observer_();
    }
}

std::string TerminalChart::title() const {
    return leaf_ ? leaf_->displayName() : std::string();
}

void TerminalChart::reloadWithNode(const VelmarModelNodeRef& node) {
    leaf_ = node;
    changed();
}

void TerminalChart::setStatus(const std::string& status, bool isLoading) {
    if (status == status_ && isLoading == loading_) {
        return;
    }
    status_ = status;
    loading_ = isLoading;
    changed();
}

void TerminalChart::zoomIn() {
    for (auto span = kSpans.rbegin(); span != kSpans.rend(); ++span) {
        if (*span < span_) {
            span_ = *span;
            changed();
            return;
        }
    }
}

void TerminalChart::zoomOut(double longestSeconds) {
    for (const double span : kSpans) {
        if (span > span_ && span <= longestSeconds) {
            span_ = span;
            changed();
            return;
        }
    }
}

}  // namespace velmar
