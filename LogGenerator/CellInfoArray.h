// CellInfoArray: the cell-monitor array that the telephony service supplies as the extra record 0xFF0001.
//
// Contract: the holder copies the record, drops its 13-byte header and parses the rest as a property list
// (any encoding the reader knows). When that fails, or the root is not an array, it logs "Cell Info Array
// data could not be constructed" (error priority) and holds nothing. It holds the parsed value until it goes
// out of scope, on every path; holders made one after another for records of identical bytes (the subscribers
// of one dispatched record) share one parse, so the cells must only be read. Cells are dictionaries keyed by
// the cell-monitor keys; a cell-monitor number is read as a signed 32-bit integer from an integer or a real
// (truncated toward zero); any other type counts as missing.
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class CellInfoArray {
  public:
    explicit CellInfoArray(ByteView record);
    CellInfoArray(const CellInfoArray&) = delete;
    CellInfoArray& operator=(const CellInfoArray&) = delete;

    // The parsed cells, or null when the holder holds nothing.
    const PlistArrayRef& cells() const { return cells_; }
    bool holdsNothing() const { return cells_ == nullptr; }

    // Whether the entry is a dictionary whose technology and cell type are both present and equal to the
    // given values. Entries lacking either key do not match.
    static bool cellMatches(const PlistValue& entry, std::string_view technology, std::string_view cellType);
    // The entry's number under key as a signed 32-bit integer, or nullopt when missing or not a number.
    static std::optional<std::int32_t> cellNumber(const PlistDictionary& cell, std::string_view key);

  private:
    PlistArrayRef cells_;
};

}  // namespace velmar
