// CsvTimeSeries: the display's numeric values over time, as CSV (RFC 4180 quoting, lines ended by LF).
//
// Contract: the first column is "time", the ISO 8601 UTC time of the refresh ("2024-05-01T12:00:04Z",
// with milliseconds when the time has any: "2024-05-01T12:00:04.500Z"; empty when the refresh has no
// recording time); then one column per display path, named as the panes show it ("Serving Cell/Serving Cell
// Info/Physical Cell ID"). A cell holds the leaf's number as the display prints it, without its unit
// ("-99.75 dBm" gives -99.75); it is empty where the path is absent from that refresh's display or its
// value does not read as a number (NumericValue). A field holding a comma, a double quote, CR or LF is
// quoted, its double quotes doubled.
//
// With chosen paths the header is written at once and each refresh's row as it comes. With every numeric
// leaf (no paths given) the columns are known only at the end: the rows are kept (only their non-empty
// cells) and written by finish(), the columns in the order the paths first appeared.
#pragma once

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <utility>
#include <vector>

#include "core/platform/plist/PlistValue.h"

namespace velmar {

// A CSV field as RFC 4180 writes it.
std::string csvField(std::string_view text);
// A refresh's time as the "time" column shows it; microseconds since 1970.
std::string csvTime(std::int64_t microseconds);

class CsvTimeSeries {
  public:
    // paths empty: every numeric leaf. out receives the text.
    CsvTimeSeries(std::vector<std::string> paths, std::FILE* out);

    // One refresh: the display tree at time (none: the time cell stays empty).
    void addRefresh(std::optional<std::int64_t> time, const PlistValue& display);
    // Writes what is still kept (every-leaf mode); chosen paths have written everything already.
    void finish();

  private:
    void writeLine(const std::string& time, const std::vector<std::string>& cells);

    bool everyLeaf_;
    std::vector<std::string> columns_;
    std::unordered_map<std::string, std::size_t> columnOfPath_;
    struct KeptRow {
        std::string time;
        std::vector<std::pair<std::size_t, std::string>> cells;  // column, number
    };
    std::vector<KeptRow> rows_;
    std::FILE* out_;
    std::string line_;
};

}  // namespace velmar
