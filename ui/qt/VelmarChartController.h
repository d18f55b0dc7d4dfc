// VelmarChartController: a chart on the navigation stack: the values of a pane's numeric leaves over time
// (a pane chart, opened by the chart button of the pane's toolbar), or of one leaf alone (a value chart,
// opened by a long press or right click on its row), with the pane's toolbar below it.
//
// Contract: the chart's path is the pane's path (pane chart) or the leaf's (value chart), so that after
// each redraw the shell hands it the same node of the new tree and the chart takes the newest samples from
// the model's value history. A pane chart draws one line per leaf child of its node that has a history,
// each named in the legend by the leaf's name and its value as shown; the legend sits below the chart and
// takes at most a third of the screen's height (it scrolls beyond that), and tapping an entry hides or shows
// its line. A value chart draws its one line without a legend, under a summary of the value now and its
// least and greatest value in the span shown. The title is the node's name. The toolbar shows the status
// like a pane's, and the save button where it is offered.
#pragma once

#include <QLabel>
#include <QScrollArea>
#include <map>
#include <string>

#include "ui/qt/ChartLegend.h"
#include "ui/qt/NavigationScreen.h"
#include "ui/qt/PaneToolbar.h"
#include "ui/qt/ValueChartView.h"

namespace velmar {

class VelmarApp;

enum class ChartKind { Pane, Value };

class VelmarChartController : public NavigationScreen {
    Q_OBJECT

  public:
    using Kind = ChartKind;

    VelmarChartController(Kind kind, VelmarModelNodeRef node, std::string path, VelmarApp& application);

    const std::string& path() const override { return path_; }
    void reloadWithNode(const VelmarModelNodeRef& node) override;
    void setStatus(const std::string& status, bool isLoading) override;
    QString title() const override;
    void viewWillAppear() override;

    Kind kind() const { return kind_; }
    ValueChartView* chartView() const { return chart_; }
    PaneToolbar* toolbar() const { return toolbar_; }
    // The value chart's summary line; hidden on a pane chart.
    QLabel* summary() const { return summary_; }
    // The pane chart's legend; hidden on a value chart.
    ChartLegend* legend() const { return legend_; }

  protected:
    void resizeEvent(QResizeEvent* event) override;

  private:
    void refresh();
    void updateSummary();
    void updateLegend();

    Kind kind_;
    VelmarModelNodeRef node_;
    std::string path_;
    std::string status_;
    bool isLoading_ = true;
    VelmarApp& application_;
    QLabel* summary_;
    ValueChartView* chart_;
    QScrollArea* legendArea_;
    ChartLegend* legend_;
    PaneToolbar* toolbar_;
    // The value each leaf shows now, by path, for the legend.
    std::map<std::string, QString> values_;
};

}  // namespace velmar
