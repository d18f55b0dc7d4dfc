// NavigationScreen: what the navigation stack holds: a widget with a title that is also a pane for the
// shell (a path, a node after each redraw, a status). The panes of the display tree and the charts of their
// values are navigation screens.
//
// Contract: the stack calls viewWillAppear before a screen comes on screen and viewWillDisappear before it
// leaves; a screen whose title changes tells the stack (updateTitle), so that the title bar follows.
#pragma once

#include <QWidget>

#include "ui/Pane.h"

namespace velmar {

class NavigationController;

class NavigationScreen : public QWidget, public Pane {
    Q_OBJECT

  public:
    using QWidget::QWidget;

    virtual QString title() const = 0;
    virtual void viewWillAppear() {}
    // Gives up first-responder status.
    virtual void viewWillDisappear();

  protected:
    // A white background, as the panes have.
    void paintWhite();
    // Tells navigation (if any) when title() is no longer the title last noted.
    void updateTitle(NavigationController* navigation);

  private:
    QString notedTitle_;
};

}  // namespace velmar
