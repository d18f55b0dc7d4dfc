// BusyIndicator: the small grey spinning indicator of a pane's toolbar.
//
// Contract: 20 by 20 pixels; startAnimating() shows it and turns it, stopAnimating() stops it and, with
// hidesWhenStopped (on by default), hides it. It only keeps a timer while it spins, so a stopped indicator
// costs nothing.
#pragma once

#include <QBasicTimer>
#include <QWidget>

namespace velmar {

class BusyIndicator : public QWidget {
    Q_OBJECT

  public:
    explicit BusyIndicator(QWidget* parent = nullptr);

    void startAnimating();
    void stopAnimating();
    bool isAnimating() const { return timer_.isActive(); }
    void setHidesWhenStopped(bool hides);
    // The spoke drawn darkest (0 to 11); it advances with each frame.
    int phase() const { return phase_; }

    QSize sizeHint() const override { return {20, 20}; }

  protected:
    void paintEvent(QPaintEvent* event) override;
    void timerEvent(QTimerEvent* event) override;

  private:
    QBasicTimer timer_;
    int phase_ = 0;
    bool hidesWhenStopped_ = true;
};

}  // namespace velmar
