// PaneToolbar: the bar at the bottom of a pane: a small grey busy indicator that hides when stopped, the
// status text in the system font of 14 pixels, a flexible space, the chart button where the screen has
// values to chart and, on internal builds, the save button.
//
// Contract: setItems and setChartButtonShown change only what differs from what is shown, so the status of
// every redraw repaints the label and nothing else.
#pragma once

#include <QLabel>
#include <QToolButton>
#include <QWidget>
#include <functional>

#include "ui/qt/BusyIndicator.h"

namespace velmar {

class PaneToolbar : public QWidget {
    Q_OBJECT

  public:
    static constexpr int kHeight = 44;

    explicit PaneToolbar(QWidget* parent = nullptr);

    void setItems(const QString& status, bool isLoading, bool withSaveButton);
    void setSaveAction(std::function<void()> action) { saveAction_ = std::move(action); }
    void setChartButtonShown(bool shown);
    void setChartAction(std::function<void()> action) { chartAction_ = std::move(action); }

    BusyIndicator* busyIndicator() const { return indicator_; }
    QLabel* statusLabel() const { return status_; }
    // Null unless the save button is offered.
    QToolButton* saveButton() const { return saveButton_; }
    // Hidden unless the chart button is offered.
    QToolButton* chartButton() const { return chartButton_; }

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    BusyIndicator* indicator_;
    QLabel* status_;
    QToolButton* saveButton_ = nullptr;
    QToolButton* chartButton_;
    std::function<void()> saveAction_;
    std::function<void()> chartAction_;
};

}  // namespace velmar
