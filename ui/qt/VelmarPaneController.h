// VelmarPaneController: one pane of the navigation stack: a table of one inner node's children with the
// pane's toolbar below it.
//
// Contract: the pane keeps its node and its path ("/" for the root pane). Each child is a row, made from the
// one reuse identifier "VelmarPaneControllerCell": an inner child as a key-only cell with a disclosure
// indicator, a leaf as a key/value cell; a reused cell is used whatever kind it was made as. Tapping a leaf
// only deselects it; tapping an inner child pushes a new pane for it, at this pane's path joined with the
// child's name, carrying this pane's status. The title is the node's name, "Velmar" without a node.
// reloadWithNode keeps the scroll position and the selected row. setStatus with a null text shows an empty
// status. Where the node has leaves whose values read as numbers, the toolbar offers the chart button, which
// pushes the chart of those leaves; a long press or right click on such a leaf's row pushes the chart of
// that value alone.
#pragma once

#include <QWidget>
#include <string>

#include "ui/qt/NavigationScreen.h"
#include "ui/qt/PaneToolbar.h"
#include "ui/qt/TableView.h"

namespace velmar {

class VelmarApp;
enum class ChartKind;

class VelmarPaneController : public NavigationScreen, public TableViewDataSource {
    Q_OBJECT

  public:
    static constexpr const char* kCellIdentifier = "VelmarPaneControllerCell";
    static constexpr const char* kNoNodeTitle = "Velmar";

    // initWithNode:atPath:
    VelmarPaneController(VelmarModelNodeRef node, std::string path, VelmarApp& application);

    const std::string& path() const override { return _keyPath; }
    void reloadWithNode(const VelmarModelNodeRef& node) override;
    void setStatus(const std::string& status, bool isLoading) override;
    // A null text is an empty status.
    void setStatus(const char* status, bool isLoading);

    void viewWillAppear() override;
    void createToolbarItems();

    QString title() const override;
    // Whether the node has a leaf whose value reads as a number.
    bool hasNumericLeaves() const;
    const VelmarModelNodeRef& node() const { return _nodes; }
    const std::string& status() const { return _status; }
    bool isLoading() const { return _isLoading; }
    TableView* tableView() const { return table_; }
    PaneToolbar* toolbar() const { return toolbar_; }

    int numberOfRows(TableView& table) override;
    TableViewCell* cellForRow(TableView& table, int row) override;
    void didSelectRow(TableView& table, int row) override;
    void didLongPressRow(TableView& table, int row) override;

  private:
    const VelmarModelNodeRef* childAt(int row) const;
    void pushChart(ChartKind kind, const VelmarModelNodeRef& node, std::string path);

    VelmarModelNodeRef _nodes;
    std::string _keyPath;
    std::string _status;
    bool _isLoading = true;
    VelmarApp& application_;
    TableView* table_;
    PaneToolbar* toolbar_;
};

}  // namespace velmar
