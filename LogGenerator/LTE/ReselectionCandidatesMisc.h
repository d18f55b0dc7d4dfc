// ReselectionCandidatesMisc: the "Reselection Candidates" key section, the serving-cell scalars of the idle-
// mode reselection-candidates record 0xB186.
//
// Contract: a record under 21 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ReselectionCandidatesMisc : public KeySectionDecoder {
  public:
    ReselectionCandidatesMisc();
};

}  // namespace velmar
