#include "LogGenerator/CellInfoArray.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

namespace {
constexpr std::size_t kRecordHeaderLength = 13;

// Dispatch hands the same cell-monitor record to each of its subscribers in turn (five of them in the
// GSM/UMTS class index), and parsing dominates their cost. The last record's bytes and parse are therefore
// kept, and a holder made for a record with exactly the same bytes shares that parse instead of parsing
// again. The parsed cells are only ever read.
struct LastParse {
    std::vector<std::uint8_t> body;
    PlistArrayRef cells;
    bool valid = false;
};

LastParse& lastParse() {
    static thread_local LastParse last;
    return last;
}

PlistArrayRef parseCells(ByteView body) {
    LastParse& last = lastParse();
    if (last.valid && std::equal(body.begin(), body.end(), last.body.begin(), last.body.end())) {
        return last.cells;
    }
    PlistArrayRef cells;
    if (auto parsed = parsePropertyList(body)) {
        cells = parsed->array();
    }
    last.body.assign(body.begin(), body.end());
    last.cells = cells;
    last.valid = true;
    return cells;
}

}  // namespace

CellInfoArray::CellInfoArray(ByteView record) {
    const ByteView body =
        record.size() > kRecordHeaderLength ? record.subspan(kRecordHeaderLength) : ByteView();
    cells_ = parseCells(body);
    if (!cells_) {
        SystemLog::log(kLogError, "Cell Info Array data could not be constructed");
    }
}

bool CellInfoArray::cellMatches(const PlistValue& entry, std::string_view technology,
                                std::string_view cellType) {
    const PlistDictionaryRef& cell = entry.dictionary();
    if (!cell) {
        return false;
    }
    const PlistValue* rat = cell->find(kKxCellMonitorCellRadioAccessTechnology);
    const PlistValue* type = cell->find(kKxCellMonitorCellType);
    if (rat == nullptr || type == nullptr || !rat->isString() || !type->isString()) {
        return false;
    }
    return *rat->string() == technology && *type->string() == cellType;
}

std::optional<std::int32_t> CellInfoArray::cellNumber(const PlistDictionary& cell, std::string_view key) {
    const PlistValue* value = cell.find(key);
    if (value == nullptr) {
        return std::nullopt;
    }
    if (const auto integer = value->integerValue()) {
        return static_cast<std::int32_t>(*integer);
    }
    if (const auto real = value->realValue()) {
        const double truncated = std::trunc(*real);
        if (!std::isfinite(truncated) || truncated < std::numeric_limits<std::int32_t>::min() ||
            truncated > std::numeric_limits<std::int32_t>::max()) {
            return std::nullopt;
        }
        return static_cast<std::int32_t>(truncated);
    }
    return std::nullopt;
}

}  // namespace velmar
