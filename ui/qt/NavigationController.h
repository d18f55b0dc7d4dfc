// NavigationController: the navigation stack of screens (panes and charts) with its title bar (a back button
// naming the screen below, the top screen's title) and animated pushes and pops.
//
// Contract: as a NavigationStack, paneCount() and paneAt() count only the panes that are on the stack; a pane
// being popped leaves the stack at once and is deleted when its slide-out animation ends. Before a pane comes
// on screen (pushed, or uncovered by a pop) it gets viewWillAppear and the delegate hears of it; the pane
// leaving gets viewWillDisappear. A transition started while another one runs finishes the earlier one at
// once. ← Backspace Esc and Alt+← pop one pane.
#pragma once

#include <QLabel>
#include <QPointer>
#include <QToolButton>
#include <QVariantAnimation>
#include <QWidget>
#include <functional>
#include <vector>

#include "ui/Pane.h"
#include "ui/qt/NavigationScreen.h"

namespace velmar {

class VelmarPaneController;

class NavigationController : public QWidget, public NavigationStack {
    Q_OBJECT

  public:
    static constexpr int kTitleBarHeight = 44;
    static constexpr int kAnimationMilliseconds = 300;

    explicit NavigationController(QWidget* parent = nullptr);
    ~NavigationController() override;

    // navigationController:willShowViewController:animated:
    void setWillShowDelegate(std::function<void(NavigationScreen&)> delegate) {
        willShow_ = std::move(delegate);
    }
    void setRootPane(NavigationScreen* pane);
    void pushPane(NavigationScreen* pane, bool animated);
    void popPane(bool animated);

    std::size_t paneCount() const override { return panes_.size(); }
    Pane& paneAt(std::size_t index) override;
    void popToPane(std::size_t index, bool animated) override;

    NavigationScreen* screen(std::size_t index) const { return panes_.at(index); }
    NavigationScreen* topScreen() const { return panes_.empty() ? nullptr : panes_.back(); }
    // The pane of the display tree at index or on top; null when that screen is a chart.
    VelmarPaneController* pane(std::size_t index) const;
    VelmarPaneController* topPane() const;
    bool isAnimating() const { return animation_ != nullptr; }
    // Ends a running transition at once.
    void finishAnimation();
    // A pane's title changed; the bar follows when it is the top pane or the one below it.
    void paneTitleChanged(NavigationScreen* pane);

    QLabel* titleLabel() const { return title_; }
    QToolButton* backButton() const { return back_; }

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;

  private:
    void transition(NavigationScreen* incoming, NavigationScreen* outgoing, bool forward, bool animated,
                    std::vector<NavigationScreen*> discarded);
    void updateTitleBar();
    QRect paneArea() const;

    QWidget* bar_;
    QToolButton* back_;
    QLabel* title_;
    QWidget* area_;
    std::vector<NavigationScreen*> panes_;
    std::function<void(NavigationScreen&)> willShow_;
    QVariantAnimation* animation_ = nullptr;
    std::function<void()> finishTransition_;
};

}  // namespace velmar
