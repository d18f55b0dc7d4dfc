// EquivalentPLMNList: the "Equivalent PLMN List" list section, one row per entry of record 0x7150.
//
// Contract: every call logs "Equivalent PLMN List" at warning priority; other codes log "Received an unknown
// log message: %d"; a record under 17 bytes changes nothing. Otherwise the list is emptied and, for a count
// above zero, replaced whole under the array lock. The count is not checked against the record's length:
// entries past the end read as zeros.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class EquivalentPLMNList : public TableDecoder {
  public:
    EquivalentPLMNList();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
