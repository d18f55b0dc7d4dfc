#include "tools/decode/CsvTimeSeries.h"

#include <cmath>

#include "core/NumericValue.h"
#include "core/VelmarModelNode.h"
#include "core/platform/plist/Iso8601.h"

namespace velmar {

namespace {

// The display's leaves by path as the panes name them: the tree's paths without their leading "/".
std::string columnName(const std::string& path) {
    return path.starts_with('/') ? path.substr(1) : path;
}

// The number a leaf shows, without its unit, or nothing when the leaf is not numeric.
std::optional<std::string> numberOf(const VelmarModelNode& node) {
    const std::string* value = node.childNodes() == nullptr ? node.value() : nullptr;
    if (value == nullptr) {
        return std::nullopt;
    }
    const std::optional<NumericValue> number = parseNumericValue(*value);
    if (!number) {
        return std::nullopt;
    }
    char text[64];
    const int length = std::snprintf(text, sizeof text, "%.*f", number->decimals, number->value);
    if (length <= 0 || static_cast<std::size_t>(length) >= sizeof text) {
        return std::nullopt;
    }
    return std::string(text, static_cast<std::size_t>(length));
}

}  // namespace

std::string csvField(std::string_view text) {
    if (text.find_first_of(",\"\r\n") == std::string_view::npos) {
        return std::string(text);
    }
    std::string quoted = "\"";
    for (const char c : text) {
        if (c == '"') {
            quoted += '"';
        }
        quoted += c;
    }
    quoted += '"';
    return quoted;
}

std::string csvTime(std::int64_t microseconds) {
    std::int64_t seconds = microseconds / 1000000;
    std::int64_t rest = microseconds % 1000000;
    if (rest < 0) {
        --seconds;
        rest += 1000000;
    }
    std::optional<std::string> text = formatIso8601Utc(static_cast<double>(seconds));
    if (!text) {
        return "";
    }
    if (const std::int64_t milliseconds = rest / 1000; milliseconds != 0) {
        char fraction[8];
        std::snprintf(fraction, sizeof fraction, ".%03d", static_cast<int>(milliseconds));
        text->insert(text->size() - 1, fraction);
    }
    return *text;
}

CsvTimeSeries::CsvTimeSeries(std::vector<std::string> paths, std::FILE* out)
    : everyLeaf_(paths.empty()), columns_(std::move(paths)), out_(out) {
    for (std::string& column : columns_) {
        column = columnName(column);
    }
    for (std::size_t index = 0; index < columns_.size(); ++index) {
        columnOfPath_.emplace("/" + columns_[index], index);
    }
    if (!everyLeaf_) {
        writeLine("time", columns_);
    }
}

void CsvTimeSeries::addRefresh(std::optional<std::int64_t> time, const PlistValue& display) {
    NodePathDictionary nodes;
    VelmarModelNode::makeTreeFromObject(display, nodes);
    const std::string timeText = time ? csvTime(*time) : std::string();
    if (!everyLeaf_) {
        std::vector<std::string> cells(columns_.size());
        for (std::size_t index = 0; index < columns_.size(); ++index) {
            const VelmarModelNodeRef* node = nodes.find("/" + columns_[index]);
            if (node != nullptr && *node) {
                cells[index] = numberOf(**node).value_or("");
            }
        }
        writeLine(timeText, cells);
        return;
    }
    KeptRow row{timeText, {}};
    for (const auto& [path, node] : nodes) {
        if (!node) {
            continue;
        }
        std::optional<std::string> number = numberOf(*node);
        if (!number) {
            continue;
        }
        auto [where, added] = columnOfPath_.emplace(path, columns_.size());
        if (added) {
            columns_.push_back(columnName(path));
        }
        row.cells.emplace_back(where->second, std::move(*number));
    }
    rows_.push_back(std::move(row));
}

void CsvTimeSeries::finish() {
    if (!everyLeaf_) {
        std::fflush(out_);
        return;
    }
    writeLine("time", columns_);
    std::vector<std::string> cells;
    for (KeptRow& row : rows_) {
        cells.assign(columns_.size(), std::string());
        for (auto& [column, number] : row.cells) {
            cells[column] = std::move(number);
        }
        writeLine(row.time, cells);
    }
    rows_.clear();
    std::fflush(out_);
}

void CsvTimeSeries::writeLine(const std::string& time, const std::vector<std::string>& cells) {
    line_ = csvField(time);
    for (const std::string& cell : cells) {
        line_ += ',';
        line_ += csvField(cell);
    }
    line_ += '\n';
    std::fwrite(line_.data(), 1, line_.size(), out_);
}

}  // namespace velmar
