#include "ui/qt/VelmarChartController.h"

#include <QApplication>
#include <QVBoxLayout>

#include "ui/ChartText.h"
#include "ui/qt/NavigationController.h"
#include "ui/qt/VelmarApp.h"

namespace velmar {

VelmarChartController::VelmarChartController(Kind kind, VelmarModelNodeRef node, std::string path,
                                             VelmarApp& application)
    : kind_(kind), node_(std::move(node)), path_(std::move(path)), application_(application) {
    paintWhite();
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    summary_ = new QLabel(this);
    summary_->setObjectName(QStringLiteral("chartSummary"));
    QFont font = QApplication::font();
    font.setPixelSize(15);
    summary_->setFont(font);
    summary_->setTextFormat(Qt::PlainText);
    summary_->setAlignment(Qt::AlignCenter);
    summary_->setContentsMargins(10, 8, 10, 0);
    summary_->setVisible(kind_ == Kind::Value);
    layout->addWidget(summary_);
    chart_ = new ValueChartView(this);
    layout->addWidget(chart_, 1);
    legendArea_ = new QScrollArea(this);
    legendArea_->setFrameShape(QFrame::NoFrame);
    legendArea_->setWidgetResizable(true);
    legendArea_->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    legend_ = new ChartLegend();
    legendArea_->setWidget(legend_);
    legendArea_->setVisible(kind_ == Kind::Pane);
    layout->addWidget(legendArea_);
    connect(legend_, &ChartLegend::toggled, this, [this](int index) {
        const auto line = static_cast<std::size_t>(index);
        if (line < chart_->lineCount()) {
            chart_->setLineVisible(line, !chart_->isLineVisible(line));
            updateLegend();
        }
    });
    toolbar_ = new PaneToolbar(this);
    toolbar_->setSaveAction([this] { application_.showSaveView(); });
    layout->addWidget(toolbar_);
    setFocusProxy(chart_);
    connect(chart_, &ValueChartView::spanChanged, this, [this] { updateSummary(); });
    updateTitle(nullptr);
    refresh();
}

QString VelmarChartController::title() const {
    return node_ ? QString::fromStdString(node_->displayName()) : QString();
}

void VelmarChartController::viewWillAppear() {
    updateTitle(application_.navigationController());
    toolbar_->setItems(QString::fromStdString(status_), isLoading_, application_.allowSaveButton());
}

void VelmarChartController::setStatus(const std::string& status, bool isLoading) {
    status_ = status;
    isLoading_ = isLoading;
    toolbar_->setItems(QString::fromStdString(status_), isLoading_, application_.allowSaveButton());
}

void VelmarChartController::reloadWithNode(const VelmarModelNodeRef& node) {
    node_ = node;
    updateTitle(application_.navigationController());
    refresh();
}

void VelmarChartController::refresh() {
    const VelmarModel* model = application_.shell().model();
    if (model == nullptr || !node_) {
        return;
    }
    std::vector<ValueChartView::Line> lines;
    values_.clear();
    auto add = [&](const std::string& path, const VelmarModelNode& leaf) {
        lines.push_back({path, QString::fromStdString(leaf.displayName())});
        values_[path] = QString::fromStdString(leaf.value() ? *leaf.value() : std::string());
    };
    if (kind_ == Kind::Value) {
        add(path_, *node_);
    } else if (const NodeList* children = node_->childNodes()) {
        for (const VelmarModelNodeRef& child : *children) {
            if (child->childNodes() == nullptr) {
                add(joinDisplayPath(path_, child->displayName()), *child);
            }
        }
    }
    chart_->showLines(lines, model->history());
    updateSummary();
    updateLegend();
}

void VelmarChartController::updateLegend() {
    if (kind_ != Kind::Pane) {
        return;
    }
    std::vector<ChartLegend::Entry> entries;
    for (std::size_t i = 0; i < chart_->lineCount(); ++i) {
        const auto value = values_.find(chart_->pathOf(i));
        entries.push_back({chart_->series(i)->name(), value != values_.end() ? value->second : QString(),
                           chart_->lineColour(i), chart_->isLineVisible(i)});
    }
    legend_->setEntries(entries);
    resizeEvent(nullptr);  // more entries or wider values may take more rows
}

void VelmarChartController::resizeEvent(QResizeEvent* event) {
    if (event != nullptr) {
        NavigationScreen::resizeEvent(event);
    }
    // The whole legend where it fits in a third of the height; beyond that it scrolls.
    legendArea_->setFixedHeight(std::min(legend_->heightForWidth(width()), height() / 3));
}

void VelmarChartController::updateSummary() {
    if (kind_ != Kind::Value) {
        return;
    }
    if (chart_->lineCount() == 0) {
        summary_->setText(QStringLiteral("No values yet"));
        return;
    }
    // The value now as the pane shows it; the least and greatest of the span printed alike, their unit once.
    const auto shown = values_.find(path_);
    QString text = QStringLiteral("now ") + (shown != values_.end() ? shown->second : QString());
    const VelmarModel* model = application_.shell().model();
    const ValueSeries* series = model != nullptr ? model->history().series(path_) : nullptr;
    const int decimals = series != nullptr ? series->decimals() : 2;
    if (const auto range = chart_->visibleRange(0)) {
        text += QString::fromStdString("   min " + formatReading(range->first, decimals, {}) + "   max " +
                                       formatReading(range->second, decimals, {}));
    }
    summary_->setText(text);
}

}  // namespace velmar
