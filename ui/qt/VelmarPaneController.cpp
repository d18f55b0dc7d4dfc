#include "ui/qt/VelmarPaneController.h"

#include <QVBoxLayout>
#include <algorithm>

#include "core/ValueHistory.h"
#include "ui/qt/NavigationController.h"
#include "ui/qt/VelmarApp.h"
#include "ui/qt/VelmarCell.h"
#include "ui/qt/VelmarChartController.h"

namespace velmar {

VelmarPaneController::VelmarPaneController(VelmarModelNodeRef node, std::string path, VelmarApp& application)
    : _nodes(std::move(node)), _keyPath(std::move(path)), application_(application) {
    paintWhite();
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    table_ = new TableView(this);
    table_->setRowHeight(VelmarCell::kMetrics.rowHeight);
    table_->setDataSource(this);
    layout->addWidget(table_, 1);
    toolbar_ = new PaneToolbar(this);
    toolbar_->setSaveAction([this] { application_.showSaveView(); });
    toolbar_->setChartAction([this] { pushChart(ChartKind::Pane, _nodes, _keyPath); });
    layout->addWidget(toolbar_);
    setFocusProxy(table_);
    updateTitle(nullptr);
    table_->reloadData();
}

QString VelmarPaneController::title() const {
    return _nodes ? QString::fromStdString(_nodes->displayName()) : QString::fromUtf8(kNoNodeTitle);
}

void VelmarPaneController::viewWillAppear() {
    updateTitle(application_.navigationController());
    toolbar_->setVisible(true);
    createToolbarItems();
}

void VelmarPaneController::setStatus(const std::string& status, bool isLoading) {
    _status = status;
    _isLoading = isLoading;
    createToolbarItems();
}

void VelmarPaneController::setStatus(const char* status, bool isLoading) {
    setStatus(std::string(status != nullptr ? status : ""), isLoading);
}

void VelmarPaneController::reloadWithNode(const VelmarModelNodeRef& node) {
    _nodes = node;
    updateTitle(application_.navigationController());
    table_->reloadData();
    createToolbarItems();
}

void VelmarPaneController::createToolbarItems() {
    toolbar_->setItems(QString::fromStdString(_status), _isLoading, application_.allowSaveButton());
    toolbar_->setChartButtonShown(hasNumericLeaves());
}

bool VelmarPaneController::hasNumericLeaves() const {
    const NodeList* children = _nodes ? _nodes->childNodes() : nullptr;
    if (children == nullptr) {
        return false;
    }
    return std::any_of(children->begin(), children->end(),
                       [](const VelmarModelNodeRef& child) { return isNumericLeaf(child.get()); });
}

const VelmarModelNodeRef* VelmarPaneController::childAt(int row) const {
    const NodeList* children = _nodes ? _nodes->childNodes() : nullptr;
    if (children == nullptr || row < 0 || static_cast<std::size_t>(row) >= children->size()) {
        return nullptr;
    }
    return &(*children)[static_cast<std::size_t>(row)];
}

int VelmarPaneController::numberOfRows(TableView&) {
    const NodeList* children = _nodes ? _nodes->childNodes() : nullptr;
    return children ? static_cast<int>(children->size()) : 0;
}

TableViewCell* VelmarPaneController::cellForRow(TableView& table, int row) {
    const VelmarModelNodeRef* child = childAt(row);
    if (child == nullptr) {
        return nullptr;
    }
    const QString identifier = QString::fromUtf8(kCellIdentifier);
    auto* cell = static_cast<VelmarCell*>(table.dequeueReusableCell(identifier));
    const QString name = QString::fromStdString((*child)->displayName());
    if ((*child)->childNodes() != nullptr) {
        if (cell == nullptr) {
            cell = VelmarCell::initWithStyleKey(identifier);
        }
        cell->setKey(name);
        cell->setAccessory(TableViewCell::Accessory::DisclosureIndicator);
        cell->setValue(QString());
        cell->setLayoutKey();
    } else {
        if (cell == nullptr) {
            cell = VelmarCell::initWithStyle(identifier);
        }
        cell->setKey(name);
        cell->setAccessory(TableViewCell::Accessory::None);
        const std::string* value = (*child)->value();
        cell->setValue(value ? QString::fromStdString(*value) : QString());
        cell->setLayout();
    }
    return cell;
}

void VelmarPaneController::didSelectRow(TableView& table, int row) {
    const VelmarModelNodeRef* child = childAt(row);
    if (child == nullptr) {
        return;
    }
    if ((*child)->childNodes() == nullptr) {
        table.deselectRow(row);
        return;
    }
    NavigationController* navigation = application_.navigationController();
    if (navigation == nullptr) {
        return;
    }
    auto* pane =
        new VelmarPaneController(*child, joinDisplayPath(_keyPath, (*child)->displayName()), application_);
    pane->setStatus(_status, _isLoading);
    navigation->pushPane(pane, true);
}

void VelmarPaneController::didLongPressRow(TableView&, int row) {
    const VelmarModelNodeRef* child = childAt(row);
    if (child == nullptr || !isNumericLeaf(child->get())) {
        return;  // only a number has a chart
    }
    pushChart(ChartKind::Value, *child, joinDisplayPath(_keyPath, (*child)->displayName()));
}

void VelmarPaneController::pushChart(ChartKind kind, const VelmarModelNodeRef& node, std::string path) {
    NavigationController* navigation = application_.navigationController();
    if (navigation == nullptr || !node) {
        return;
    }
    auto* chart = new VelmarChartController(kind, node, std::move(path), application_);
    chart->setStatus(_status, _isLoading);
    navigation->pushPane(chart, true);
}

}  // namespace velmar
