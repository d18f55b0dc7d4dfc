#include "ui/qt/NavigationScreen.h"

#include "ui/qt/NavigationController.h"

namespace velmar {

void NavigationScreen::paintWhite() {
    setAutoFillBackground(true);
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, Qt::white);
    setPalette(palette);
}

void NavigationScreen::updateTitle(NavigationController* navigation) {
    const QString current = title();
    if (current != notedTitle_) {
        notedTitle_ = current;
        if (navigation != nullptr) {
            navigation->paneTitleChanged(this);
        }
    }
}

void NavigationScreen::viewWillDisappear() {
    if (QWidget* focused = focusWidget(); focused != nullptr && isAncestorOf(focused)) {
        focused->clearFocus();
    }
}

}  // namespace velmar
