// ReselectionCandidatesList: the "Reselection Candidates List" list section, one row per reselection
// candidate of the record 0xB186, described according to its radio access technology.
//
// Contract: only the low 8 bits of the count are used (a count of 0x0100 gives an empty list). Candidate k's
// 4-byte header lies at 21 + 4k and its technology fields are read from the bytes that follow it, which are
// the next candidate's slot: the overlap is the record's layout as this decoder reads it. An unknown
// technology is shown as "??" with no fields of its own.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class ReselectionCandidatesList : public TableDecoder {
  public:
    ReselectionCandidatesList();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
