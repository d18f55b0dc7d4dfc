#include "ui/qt/VelmarPaneController.h"

#include <QVBoxLayout>

#include "ui/qt/NavigationController.h"
#include "ui/qt/VelmarApp.h"
#include "ui/qt/VelmarCell.h"

namespace velmar {

VelmarPaneController::VelmarPaneController(VelmarModelNodeRef node, std::string path, VelmarApp& application)
    : _nodes(std::move(node)), _keyPath(std::move(path)), application_(application) {
    setAutoFillBackground(true);
    QPalette palette = this->palette();
    palette.setColor(QPalette::Window, Qt::white);
    setPalette(palette);
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    table_ = new TableView(this);
    table_->setRowHeight(VelmarCell::kMetrics.rowHeight);
    table_->setDataSource(this);
    layout->addWidget(table_, 1);
    toolbar_ = new PaneToolbar(this);
    toolbar_->setSaveAction([this] { application_.showSaveView(); });
    layout->addWidget(toolbar_);
    setFocusProxy(table_);
    title_ = title();
    table_->reloadData();
}

QString VelmarPaneController::title() const {
    return _nodes ? QString::fromStdString(_nodes->displayName()) : QString::fromUtf8(kNoNodeTitle);
}

void VelmarPaneController::updateTitle() {
    const QString current = title();
    if (current != title_) {
        title_ = current;
        if (NavigationController* navigation = application_.navigationController()) {
            navigation->paneTitleChanged(this);
        }
    }
}

void VelmarPaneController::viewWillAppear() {
    updateTitle();
    toolbar_->setVisible(true);
    createToolbarItems();
}

void VelmarPaneController::viewWillDisappear() {
    // Gives up first-responder status.
    if (QWidget* focused = focusWidget(); focused != nullptr && isAncestorOf(focused)) {
        focused->clearFocus();
    }
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
    updateTitle();
    table_->reloadData();
    createToolbarItems();
}

void VelmarPaneController::createToolbarItems() {
    toolbar_->setItems(QString::fromStdString(_status), _isLoading, application_.allowSaveButton());
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

}  // namespace velmar
