// ReselectionCandidatesMisc: the "Reselection Candidates" key section, the serving-cell scalars of the idle-
// mode reselection-candidates record 0xB186.
//
// Contract: a record under 21 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class ReselectionCandidatesMisc : public TableDecoder {
  public:
    ReselectionCandidatesMisc();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
