#include "ui/terminal/TerminalFrontEnd.h"

#include <poll.h>
#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "core/ArrayLock.h"
#include "ui/terminal/TerminalChartView.h"
#include "ui/terminal/TerminalPaneView.h"
#include "ui/terminal/TerminalText.h"

namespace velmar {

namespace {
// Columns that → and ← scroll a long pair sideways per press.
constexpr int kSidewaysStep = 8;
}  // namespace

TerminalFrontEnd::TerminalFrontEnd(GeneratorFactory factory) : shell_(std::move(factory), queue_) {
    MainQueue::setCurrent(&queue_);
    shell_.setSaveScreenPresenter(this);
    addPane("/", nullptr);
}

TerminalFrontEnd::~TerminalFrontEnd() {
    terminate();
    *alive_ = false;
    shell_.setSaveScreenPresenter(nullptr);
    screen_.close();
    MainQueue::setCurrent(nullptr);
}

TerminalPane& TerminalFrontEnd::addPane(std::string path, VelmarModelNodeRef node) {
    auto pane = std::make_unique<TerminalPane>(std::move(path), std::move(node));
    pane->setChangeObserver([this] { setNeedsDisplay(); });
    panes_.push_back(std::move(pane));
    return *panes_.back();
}

void TerminalFrontEnd::launch() {
    if (launched_) {
        return;
    }
    launched_ = true;
    shell_.launch(*this);
    setNeedsDisplay();
}

void TerminalFrontEnd::terminate() {
    if (!launched_ || terminated_) {
        return;
    }
    terminated_ = true;
    if (spinnerTimer_ != 0) {
        queue_.cancelTimer(spinnerTimer_);
        spinnerTimer_ = 0;
    }
    shell_.terminate();
}

void TerminalFrontEnd::quit() {
    quit_ = true;
    queue_.stop();
}

int TerminalFrontEnd::run(std::FILE* output) {
    if (!screen_.open(output)) {
        std::fputs("velmar: the terminal interface needs a terminal on standard input and output\n", stderr);
        return 2;
    }
    ascii_ = !screen_.isUtf8();

    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGWINCH);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGHUP);
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    const int signalFd = signalfd(-1, &signals, SFD_CLOEXEC | SFD_NONBLOCK);
    MainQueue::Handle signalWatch = 0;
    if (signalFd >= 0) {
        signalWatch = queue_.watchReadable(signalFd, [this, signalFd] {
            signalfd_siginfo info{};
            while (read(signalFd, &info, sizeof info) == sizeof info) {
                if (info.ssi_signo == SIGWINCH) {
                    screen_.resize();
                    setNeedsDisplay();
                } else {
                    quit();
                }
            }
        });
    }
    const MainQueue::Handle inputWatch = queue_.watchReadable(STDIN_FILENO, [this] {
        const std::vector<TerminalKey> keys = screen_.readKeys();
        if (keys.empty()) {
            // Readable with nothing to read: the terminal has gone.
            pollfd input{STDIN_FILENO, POLLIN, 0};
            if (poll(&input, 1, 0) > 0 && (input.revents & (POLLHUP | POLLERR | POLLNVAL)) != 0) {
                quit();
            }
            return;
        }
        for (const TerminalKey& key : keys) {
            handleKey(key);
            if (quit_) {
                break;
            }
        }
    });

    launch();
    display();
    if (!quit_) {
        queue_.run();
    }
    terminate();
    queue_.unwatch(inputWatch);
    if (signalWatch != 0) {
        queue_.unwatch(signalWatch);
    }
    screen_.close();
    if (signalFd >= 0) {
        close(signalFd);
    }
    ArrayLock::releaseOutstandingForTesting();
    return 0;
}

void TerminalFrontEnd::setNeedsDisplay() {
    if (displayQueued_) {
        return;
    }
    displayQueued_ = true;
    std::weak_ptr<bool> alive = alive_;
    queue_.async([this, alive] {
        if (alive.expired()) {
            return;
        }
        displayQueued_ = false;
        display();
    });
}

void TerminalFrontEnd::display() {
    updateSpinner();
    if (!screen_.isOpen()) {
        return;
    }
    TerminalCanvas canvas(screen_.rows(), screen_.columns(), ascii_);
    render(canvas);
    screen_.present(canvas);
}

void TerminalFrontEnd::updateSpinner() {
    const bool loading = !terminated_ && (chart_ ? chart_->isLoading() : topPane().isLoading());
    if (loading && spinnerTimer_ == 0) {
        std::weak_ptr<bool> alive = alive_;
        spinnerTimer_ = queue_.repeating(kSpinnerIntervalSeconds, [this, alive] {
            if (alive.expired()) {
                return;
            }
            ++spinnerFrame_;
            setNeedsDisplay();
        });
    } else if (!loading && spinnerTimer_ != 0) {
        queue_.cancelTimer(spinnerTimer_);
        spinnerTimer_ = 0;
    }
}

void TerminalFrontEnd::render(TerminalCanvas& canvas) {
    rows_ = canvas.rows();
    columns_ = canvas.columns();
    if (chart_) {
        const VelmarModel* model = shell_.model();
        TerminalChartView::draw(canvas, *chart_, model ? model->history().series(chart_->path()) : nullptr,
                                model ? model->history().newestTime() : 0.0, {spinnerFrame_, false});
    } else {
        TerminalPaneView::draw(canvas, topPane(), {spinnerFrame_, shell_.allowSaveButton()});
    }
    if (form_) {
        form_->draw(canvas);
    }
    if (alert_) {
        drawAlert(canvas);
    }
}

void TerminalFrontEnd::drawAlert(TerminalCanvas& canvas) const {
    const bool ascii = canvas.ascii();
    const std::string button = "[ " + alert_->button + " ]";
    const int textWidth =
        std::max({TerminalText::width(alert_->title, ascii), TerminalText::width(alert_->message, ascii),
                  TerminalText::width(button, ascii)});
    const int width = std::min(canvas.columns(), textWidth + 6);
    const int height = 6;
    const int top = std::max(0, (canvas.rows() - height) / 2);
    const int left = std::max(0, (canvas.columns() - width) / 2);
    canvas.box(top, left, height, width);
    auto centred = [&](int row, const std::string& text, std::uint8_t attr) {
        const int textColumns = TerminalText::width(text, ascii);
        canvas.put(row, left + std::max(1, (width - textColumns) / 2), TerminalText::decodeUtf8(text), attr,
                   left + 1, left + width - 1);
    };
    centred(top + 1, alert_->title, kAttrBold);
    centred(top + 2, alert_->message, kAttrNormal);
    centred(top + 4, button, kAttrReverse | kAttrBold);
}

void TerminalFrontEnd::handleKey(const TerminalKey& key) {
    using Kind = TerminalKey::Kind;
    if (alert_) {
        if (key.kind == Kind::Enter || key.kind == Kind::Escape || key.is(U' ')) {
            alert_.reset();
            setNeedsDisplay();
        }
        return;
    }
    if (form_) {
        form_->handleKey(key);
        setNeedsDisplay();
        return;
    }
    if (chart_) {
        handleChartKey(key);
        return;
    }
    handlePaneKey(key);
}

void TerminalFrontEnd::handleChartKey(const TerminalKey& key) {
    using Kind = TerminalKey::Kind;
    if (key.kind == Kind::Escape || key.kind == Kind::Left || key.kind == Kind::Backspace) {
        popToPane(panes_.size() - 1, true);
    } else if (key.is(U'+') || key.is(U'=')) {
        chart_->zoomIn();
    } else if (key.is(U'-')) {
        const VelmarModel* model = shell_.model();
        chart_->zoomOut(model ? model->history().limits().windowSeconds : TerminalChart::kDefaultSpanSeconds);
    } else if (key.is(U'q') || key.is(U'Q')) {
        quit();
    }
}

void TerminalFrontEnd::openChart() {
    TerminalPane& pane = topPane();
    if (!isNumericLeaf(pane.childAt(pane.selectedRow()))) {
        return;  // only a number has a chart
    }
    const auto row = static_cast<std::size_t>(pane.selectedRow());
    const VelmarModelNodeRef& leaf = pane.node()->childNodes()->at(row);
    chart_ = std::make_unique<TerminalChart>(joinDisplayPath(pane.path(), leaf->displayName()), leaf);
    chart_->setChangeObserver([this] { setNeedsDisplay(); });
    chart_->setStatus(pane.status(), pane.isLoading());
    shell_.navigationWillShow(*chart_);
    setNeedsDisplay();
}

void TerminalFrontEnd::handlePaneKey(const TerminalKey& key) {
    using Kind = TerminalKey::Kind;
    TerminalPane& pane = topPane();
    const int page = std::max(1, rows_ - 3);
    const VelmarModelNode* selected = pane.childAt(pane.selectedRow());
    const bool inner = selected != nullptr && selected->childNodes() != nullptr;
    switch (key.kind) {
        case Kind::Up:
            pane.moveSelection(-1);
            return;
        case Kind::Down:
            pane.moveSelection(1);
            return;
        case Kind::PageUp:
            pane.moveSelection(-page);
            return;
        case Kind::PageDown:
            pane.moveSelection(page);
            return;
        case Kind::Home:
            pane.selectRow(0);
            return;
        case Kind::End:
            pane.selectRow(pane.rowCount() - 1);
            return;
        case Kind::Enter:
            if (inner) {
                pushPane(*selected,
                         pane.node()->childNodes()->at(static_cast<std::size_t>(pane.selectedRow())));
            }
            return;
        case Kind::Right:
            if (inner) {
                pushPane(*selected,
                         pane.node()->childNodes()->at(static_cast<std::size_t>(pane.selectedRow())));
            } else if (selected != nullptr) {
                pane.setSideways(pane.sideways() + kSidewaysStep,
                                 TerminalPaneView::maximumSideways(*selected, columns_, ascii_));
            }
            return;
        case Kind::Left:
            if (!inner && selected != nullptr && pane.sideways() > 0) {
                pane.setSideways(pane.sideways() - kSidewaysStep,
                                 TerminalPaneView::maximumSideways(*selected, columns_, ascii_));
            } else {
                popPane();
            }
            return;
        case Kind::Backspace:
        case Kind::Escape:
            popPane();
            return;
        default:
            break;
    }
    if (key.is(U'c') || key.is(U'C')) {
        openChart();
    } else if (key.is(U's') || key.is(U'S')) {
        if (shell_.allowSaveButton()) {
            shell_.showSaveView();
        }
    } else if (key.is(U'q') || key.is(U'Q')) {
        quit();
    }
}

void TerminalFrontEnd::pushPane(const VelmarModelNode& child, const VelmarModelNodeRef& node) {
    const TerminalPane& parent = topPane();
    const std::string status = parent.status();
    const bool loading = parent.isLoading();
    TerminalPane& pane = addPane(joinDisplayPath(parent.path(), child.displayName()), node);
    pane.setStatus(status, loading);
    shell_.navigationWillShow(pane);
    setNeedsDisplay();
}

void TerminalFrontEnd::popPane() {
    if (panes_.size() > 1) {
        popToPane(panes_.size() - 2, true);
    }
}

Pane& TerminalFrontEnd::paneAt(std::size_t index) {
    if (index == panes_.size() && chart_) {
        return *chart_;
    }
    return *panes_.at(index);
}

void TerminalFrontEnd::popToPane(std::size_t index, bool) {
    if (index + 1 >= paneCount()) {
        return;
    }
    chart_.reset();
    if (index + 1 < panes_.size()) {
        panes_.resize(index + 1);
    }
    shell_.navigationWillShow(*panes_.back());
    setNeedsDisplay();
}

void TerminalFrontEnd::presentSaveScreen(VelmarSaveViewController& controller, bool) {
    form_ = std::make_unique<TerminalSaveForm>(controller);
    setNeedsDisplay();
}

void TerminalFrontEnd::dismissSaveScreen(bool) {
    if (form_) {
        form_->detach();
        form_.reset();
    }
    setNeedsDisplay();
}

void TerminalFrontEnd::showAlert(const std::string& title, const std::string& message,
                                 const std::string& cancelButtonTitle) {
    alert_ = Alert{title, message, cancelButtonTitle};
    setNeedsDisplay();
}

}  // namespace velmar
